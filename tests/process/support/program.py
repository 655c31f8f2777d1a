"""What tests of the built program share: running it on a host of their own, and saying what was wrong."""

import json
import os
import pty
import shlex
import subprocess
import sys
import tempfile

HCLI = os.environ["HCLI_BIN"]
SOURCE = os.environ["HCLI_SOURCE_DIR"]
DATABASE = "var/lib/tessaro/host.db"


def check(holds, *shown):
    """Ends the test with what is `shown`; of a long text with its two ends."""
    if not holds:
        texts = map(str, shown)
        sys.exit("\n".join(text if len(text) < 4000 else text[:1500] + "\n...\n" + text[-1500:] for text in texts))


def run(*words, **environment):
    return subprocess.run(words, capture_output=True, text=True, env={**os.environ, **environment})


class Host:
    """A folder that stands for /. `description` is loaded; without one, the first command makes the demo host."""

    def __init__(self, description=None):
        self.folder = tempfile.TemporaryDirectory(prefix="hcli-root-")
        self.root = self.folder.name
        self.database = os.path.join(self.root, DATABASE)
        if description is not None:
            self.succeed(f"simulator load {shlex.quote(description)}")

    def environment(self, **more):
        """Nothing that the caller of the tests has set for hcli reaches it."""
        clean = {name: value for name, value in os.environ.items() if not name.startswith(("HCLI_", "LC_", "LANG"))}
        return {**clean, "HCLI_ROOT": self.root, **more}

    def start(self, line, **options):
        """A process with its texts in pipes, as str; `line` is split as a shell would."""
        options = {"stdin": subprocess.DEVNULL, "stdout": subprocess.PIPE, "stderr": subprocess.PIPE, "text": True,
                   "encoding": "utf-8", "env": self.environment(), **options}
        return subprocess.Popen([HCLI, *shlex.split(line)], **options)

    def run(self, line, **options):
        process = self.start(line, **options)
        out, err = process.communicate(timeout=60)
        return subprocess.CompletedProcess(line, process.returncode, out, err)

    def on_terminal(self, line, answer=""):
        """What a terminal shows, and the status. `answer` is typed once there is a question."""
        leader, follower = pty.openpty()
        process = self.start(line, stdin=follower, stdout=follower, stderr=follower)
        os.close(follower)
        shown = b""
        while answer and b": " not in shown:  # what is typed before the question would be echoed
            shown += os.read(leader, 4096)
        os.write(leader, answer.encode())
        try:
            while part := os.read(leader, 65536):
                shown += part
        except OSError:  # how Linux says that the last program has closed the terminal
            pass
        os.close(leader)
        return shown.replace(b"\r\n", b"\n"), process.wait(timeout=60)

    def succeed(self, line, **options):
        """The standard output of a command that has to work without a word on standard error."""
        done = self.run(line, **options)
        check(done.returncode == 0 and not done.stderr, done)
        return done.stdout

    def result(self, line):
        return json.loads(self.succeed(line + " --output json"))["result"]

    def show(self):
        return json.loads(self.succeed("simulator show --secrets"))
