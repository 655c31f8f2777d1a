"""An emulated machine with a kernel of its own, and what runs in it."""

import base64
import os
import shlex
import socket
import subprocess
import tempfile

import image
from support.program import check, read, succeeded


class Machine:
    """Boots when it is made, and is gone with the block that it is made for."""

    def __init__(self):
        self.folder = tempfile.TemporaryDirectory(prefix="hcli-machine-")
        self.console = os.path.join(self.folder.name, "console")
        root = os.path.join(self.folder.name, "root.cpio")
        image.build(root)
        self.steps, theirs = socket.socketpair()
        # Its own emulation alone: where a machine is emulated itself, what would make it faster may hang.
        with theirs:
            self.process = subprocess.Popen(
                ["qemu-system-x86_64", "-M", "q35,accel=tcg", "-cpu", "max", "-m", "512", "-smp", "1", "-nodefaults",
                 "-display", "none", "-no-reboot", "-serial", f"file:{self.console}",
                 "-chardev", f"socket,id=steps,fd={theirs.fileno()}", "-serial", "chardev:steps",
                 "-kernel", image.kernel(), "-initrd", root, "-append", "console=ttyS0 quiet panic=-1"],
                pass_fds=[theirs.fileno()])
        self.lines = self.steps.makefile("rb")
        self.read(120)

    def __enter__(self):
        return self

    def __exit__(self, *_):
        self.process.kill()
        self.process.wait()
        self.lines.close()
        self.steps.close()
        self.folder.cleanup()

    def read(self, seconds):
        self.steps.settimeout(seconds)
        try:
            line = self.lines.readline()
        except TimeoutError:
            line = b""
        check(line.endswith(b"\n"), f"the machine has ended, or said nothing for {seconds} s; its console:",
              read(self.console))
        return line.rstrip()

    def run(self, script, seconds=60):
        """Runs a shell script in the machine, within so many seconds."""
        self.steps.sendall(base64.b64encode(script.encode()) + b"\n")
        status, *texts = self.read(seconds).split(b":")
        return subprocess.CompletedProcess(script, int(status), *(base64.b64decode(text).decode() for text in texts))

    def succeed(self, script, seconds=60):
        return succeeded(self.run(script, seconds))

    def write(self, path, text):
        self.succeed(f"mkdir -p {shlex.quote(os.path.dirname(path))} && printf %s {shlex.quote(text)} >{shlex.quote(path)}")

    def until(self, condition, seconds=20):
        """Waits until the condition, a shell command, holds."""
        waited = f"for i in $(seq {seconds * 10}); do {condition} >/dev/null 2>&1 && exit; sleep 0.1; done; {condition}"
        self.succeed(waited, 3 * seconds + 60)
