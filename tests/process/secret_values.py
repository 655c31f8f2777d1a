"""A secret comes from a pipe, a terminal or a file, and is seen nowhere but where the host keeps it."""

import os
import pty
import signal
import subprocess
import termios

from support.program import HCLI, Host, check, finished, read_until, until_asleep, write

SECRET = "correct horse 東"
LINE = "--trace iscsi adapter auth chap set -A hba2 -d uni -l required -N user --secret -"


def seen_of(process):
    """What others can see of the process while it waits for the secret."""
    until_asleep(process)
    folder = f"/proc/{process.pid}"
    with open(f"{folder}/cmdline", "rb") as command, open(f"{folder}/environ", "rb") as environment:
        return (command.read() + environment.read()).decode()


def is_set(host, shown):
    check(SECRET not in shown, "the secret shows", shown)
    check("***" in shown and "true" in shown, "the trace has no mark of a secret", shown)
    check(f'"{SECRET}"' in host.succeed("simulator show --secrets"), "the host does not have the secret")
    check(SECRET not in host.succeed("simulator show"), "simulator show shows the secret")


def from_pipe():
    host = Host()
    process = host.start(LINE, stdin=subprocess.PIPE)
    seen = seen_of(process)
    done = finished(process, SECRET + "\r\nnot a part of it\n")
    check(done.returncode == 0, done)
    is_set(host, done.stderr + done.stdout + seen)


def from_terminal():
    host = Host()
    shown, status = host.on_terminal(LINE, SECRET, "another")
    check(status == 2 and b"the two values differ, and neither is set" in shown, shown)
    check(SECRET not in host.succeed("simulator show --secrets"), "a secret is set that was typed in two ways")
    shown, status = host.on_terminal(LINE, SECRET, SECRET)
    check(status == 0, shown)
    is_set(host, shown.decode())


def echoes(terminal):
    return bool(termios.tcgetattr(terminal)[3] & termios.ECHO)


def when_ended():
    """Whatever ends the program while it asks, the terminal echoes again."""
    host = Host()
    ending = set(signal.valid_signals()) - {signal.SIGKILL, signal.SIGSTOP, signal.SIGCONT, signal.SIGTSTP,
             signal.SIGTTIN, signal.SIGTTOU, signal.SIGCHLD, signal.SIGURG, signal.SIGWINCH, signal.SIGPIPE, signal.SIGXFSZ}
    for number in ending:  # without the sanitizers' own ways to end by some
        leader, follower = pty.openpty()
        process = host.start(LINE, stdin=follower, stdout=follower, stderr=follower,
                             env=host.environment(ASAN_OPTIONS="handle_segv=0:handle_sigbus=0:handle_sigfpe=0"))
        read_until(leader, "secret: ")
        check(not echoes(leader), "the terminal echoes")
        process.send_signal(number)
        check(process.wait(timeout=60) == -number, number, process.returncode)
        check(echoes(leader), "no echo after", number)
        os.close(leader)
        os.close(follower)


def under_a_shell():
    """Stopped, the program leaves a terminal that echoes; when it goes on, it asks anew and the echo is off."""
    host = Host()
    pid, leader = pty.fork()
    if pid == 0:
        os.execvpe("sh", ["sh", "-i"], host.environment(PS1="shell> ", ENV=""))
    read_until(leader, "shell> ")
    shown = ""
    for typed, answer, echo in [(f"{HCLI} {LINE}", "secret: ", False), ("half\x1a", "shell> ", True),
                                ("fg", "secret: ", False), ("\x1a", "shell> ", True), ("bg", "shell> ", True),
                                ("fg", "secret: ", False), (SECRET, "secret again: ", False),
                                ("\x1a", "shell> ", True), ("fg", "secret again: ", False), (SECRET, "shell> ", True),
                                (f"{HCLI} {LINE}", "secret: ", False), ("half\x03", "shell> ", True)]:
        os.write(leader, typed.encode() if typed[-1] < " " else typed.encode() + b"\n")
        shown += read_until(leader, answer)
        check(echoes(leader) == echo, f"behind {typed}: echo is {not echo}", shown)
    check("half" not in shown, "what was typed half shows", shown)
    is_set(host, shown)
    os.close(leader)
    os.waitpid(pid, 0)


def on_command_line():
    """A note on a terminal, unless it is not wanted."""
    shown, status = Host().on_terminal(LINE.replace("--secret -", "--secret visible"))
    check(status == 0 and shown.count(b"hcli: note: ") == 1 and b"visible" not in shown, shown)
    shown, status = Host().on_terminal("-q " + LINE.replace("--secret -", "--secret visible"))
    check(status == 0 and b"note" not in shown, shown)


def from_open_pipe():
    """As a shell has it for <(command), which may take its time."""
    host = Host()
    reader, writer = os.pipe()
    process = host.start(LINE.replace("--secret -", f"--secret-file /dev/fd/{reader}"), pass_fds=[reader])
    until_asleep(process)
    os.write(writer, SECRET.encode())
    os.close(writer)
    done = finished(process)
    is_set(host, done.stderr + done.stdout)


def from_file():
    host = Host()
    path = os.path.join(host.root, "secret")
    line = LINE.replace("--secret -", f"--secret-file {path}")
    done = host.run(line)
    check(done.returncode == 2 and f'"{path}" cannot be read: No such file or directory' in done.stderr, done)
    for text, mode, owner, refusal in [
        (SECRET + "\nmore\n", 0o600, 0, ""), (SECRET, 0o400, 0, ""), ("-", 0o600, 0, ""),
        (SECRET, 0o640, 0, "has mode 0640; it has to be its owner's alone, which mode 0600 makes it"),
        (SECRET, 0o602, 0, "has mode 0602"), (SECRET, 0o600, 4711, "belongs to user 4711; it has to belong to user 0"),
        ("\n" + SECRET, 0o600, 0, "has nothing in its first line"), ("", 0o600, 0, "has nothing"),
        ("x" * 70000, 0o600, 0, "has more than 65536 bytes in its first line"), ("\r\n", 0o600, 0, "has nothing"),
        (SECRET + "\r\nmore", 0o600, 0, ""), (os.mkfifo, 0o700, 0, "has nothing in its first line"),
        (os.mkdir, 0o700, 0, "is neither a regular file nor a pipe"),
    ]:
        if owner and os.geteuid():
            continue
        if callable(text):
            os.remove(path)
            text(path, mode)
        else:
            write(path, text)
        os.chmod(path, mode)
        if owner:
            os.chown(path, owner, -1)
        done = host.run(line)
        check(done.returncode == (2 if refusal else 0) and refusal in done.stderr, text, mode, done)
        check(SECRET not in done.stderr + done.stdout, "the secret shows", done)
        if not refusal:
            check(host.show()["adapters"][2]["chap"]["uni"]["secret"] == text.splitlines()[0], text)
        if owner:
            os.chown(path, 0, -1)


from_pipe()
from_terminal()
when_ended()
under_a_shell()
on_command_line()
from_open_pipe()
from_file()
