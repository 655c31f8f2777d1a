"""A secret given as "-" comes from a pipe or a terminal, and is seen nowhere but where the host keeps it."""

import subprocess
import time

from support.program import Host, check, finished

SECRET = "correct horse 東"
LINE = "--trace iscsi adapter auth chap set -A hba2 -d uni -l required -N user --secret -"


def waiting(process):
    """Waits until the process sleeps over its reading, and returns what others can see of it."""
    folder, asleep = f"/proc/{process.pid}", 0
    while asleep < 10:
        time.sleep(0.005)
        with open(f"{folder}/stat", encoding="utf-8") as file:
            asleep = asleep + 1 if file.read().rpartition(")")[2].split()[0] == "S" else 0
    with open(f"{folder}/cmdline", "rb") as command, open(f"{folder}/environ", "rb") as environment:
        return (command.read() + environment.read()).decode()


def is_set(host, shown):
    check(SECRET not in shown, "the secret shows", shown)
    check("***" in shown and "true" in shown, "the trace has no mark of a secret", shown)
    check(SECRET in host.succeed("simulator show --secrets"), "the host does not have the secret")
    check(SECRET not in host.succeed("simulator show"), "simulator show shows the secret")


def from_pipe():
    host = Host()
    process = host.start(LINE, stdin=subprocess.PIPE)
    seen = waiting(process)
    done = finished(process, SECRET + "\nnot a part of it\n")
    check(done.returncode == 0, done)
    is_set(host, done.stderr + done.stdout + seen)


def from_terminal():
    host = Host()
    shown, status = host.on_terminal(LINE, SECRET + "\n")
    check(status == 0, shown)
    is_set(host, shown.decode())


from_pipe()
from_terminal()
