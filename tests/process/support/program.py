"""What tests of the built program share: running it on a host of their own, and saying what was wrong."""

import contextlib
import difflib
import json
import os
import pty
import select
import shlex
import shutil
import sqlite3
import subprocess
import sys
import tempfile
import termios
import threading
import time

HCLI = os.environ["HCLI_BIN"]
SOURCE = os.environ["HCLI_SOURCE_DIR"]
NAME_FILE = "etc/tessaro/coreiscsid/initiatorname.iscsi"
SET_NAME = "iscsi software set --enabled true --name iqn.2026-11.org.example:host"
END = b"\0end of output\0"  # what no program writes
# Commands have texts of their own for what fails below them; the reason stands behind those.
READ, WRITE = "iscsi adapter list", "iscsi adapter set -A hba2 -a other"


def check(holds, *shown):
    """Ends the test with what is `shown`; of a long text with its two ends."""
    if not holds:
        texts = map(str, shown)
        sys.exit("\n".join(text if len(text) < 4000 else text[:1500] + "\n...\n" + text[-1500:] for text in texts))


def read(path):
    with open(path, encoding="utf-8", newline="") as file:
        return file.read()


def write(path, text):
    with open(path, "w", encoding="utf-8", newline="") as file:
        file.write(text)


def expect_file(path, text, renewed):
    """How the file differs from the text that it should have; where it is `renewed`, it has it from now on."""
    old = read(path) if os.path.exists(path) else ""
    difference = "".join(difflib.unified_diff(old.splitlines(True), text.splitlines(True), path, "now"))
    if difference and renewed:
        write(path, text)
        print(difference)
        return ""
    return difference


def beside(path):
    """What else is in the file's folder."""
    return set(os.listdir(os.path.dirname(path))) - {os.path.basename(path)}


def contents(folder):
    """All that is below: where links lead, the bytes of files, the modes of the rest."""
    found = {}
    for path, folders, names in os.walk(folder):
        for place in (os.path.join(path, name) for name in folders + names):
            if os.path.islink(place):
                found[place] = os.readlink(place)
            elif os.path.isfile(place):
                with open(place, "rb") as file:
                    found[place] = file.read()
            else:
                found[place] = os.stat(place).st_mode
    return found


def is_sound(path):
    """What SQLite itself finds; a copy is looked at, for looking can change the file."""
    with tempfile.TemporaryDirectory(prefix="hcli-sound-") as folder:
        with contextlib.closing(sqlite3.connect(shutil.copy(path, folder))) as database:
            database.text_factory = bytes
            try:
                return database.execute("PRAGMA integrity_check").fetchall() == [(b"ok",)]
            except (sqlite3.DatabaseError, UnicodeDecodeError):  # a schema that is noise
                return False


def run(*words, **environment):
    return subprocess.run(words, capture_output=True, text=True, env={**os.environ, **environment})


def finished(process, text=None):
    out, err = process.communicate(text, timeout=60)
    return subprocess.CompletedProcess(process.args, process.returncode, out, err)


def until_asleep(process):
    """Waits until the process can do no more than wait itself, for input or for somebody to read."""
    asleep = 0
    while asleep < 10:
        time.sleep(0.005)
        asleep = asleep + 1 if state_of(process.pid) == "S" else 0


def state_of(pid):
    """One letter, such as R, S, T (stopped), Z (ended)."""
    with open(f"/proc/{pid}/stat", encoding="utf-8") as file:
        return file.read().rpartition(")")[2].split()[0]


def read_until(terminal, text):
    """What the terminal shows, up to and with `text`."""
    shown = b""
    while not shown.endswith(text.encode()):
        ready, _, _ = select.select([terminal], [], [], 30)
        check(ready, f"no {text!r} in", shown)
        shown += os.read(terminal, 1)
    return shown.decode()


def complaints(done):
    """What is on standard error, but for notes: those stand behind what went well too."""
    return [line for line in done.stderr.splitlines() if not line.startswith("hcli: note: ")]


def succeeded(done):
    """The standard output of a command that has to work without a complaint."""
    check(done.returncode == 0 and not complaints(done), done)
    return done.stdout


# Of the codes of reasons, with --exit-codes.
NOT_SUPPORTED, BUSY, DENIED, DAMAGED, NO_SPACE = 16, 20, 21, 22, 23


def refused(case, done, *texts, status=1):
    """A report with these texts, and no result."""
    missing = [text for text in texts if text not in done.stderr]
    check(done.returncode == status and not done.stdout and not missing, f"{case}: expected {missing}", done)


class Host:
    """A folder that stands for /. `description` is loaded; without one, the first command makes the demo host."""

    def __init__(self, description=None):
        self.folder = tempfile.TemporaryDirectory(prefix="hcli-root-")
        self.root = self.folder.name
        self.database = os.path.join(self.root, "var/lib/tessaro/host.db")
        self.names = os.path.join(self.root, NAME_FILE)
        if description is not None:
            self.succeed("simulator load -", json.dumps(description))

    def environment(self, **more):
        """Nothing that the caller of the tests has set for hcli reaches it."""
        clean = {name: value for name, value in os.environ.items() if not name.startswith(("HCLI_", "LC_", "LANG"))}
        return {**clean, "HCLI_ROOT": self.root, **more}

    def start(self, line, **options):
        """A process with its texts in pipes, as str; `line` is split as a shell would."""
        options = {"stdin": subprocess.DEVNULL, "stdout": subprocess.PIPE, "stderr": subprocess.PIPE, "text": True,
                   "encoding": "utf-8", "env": self.environment(), **options}
        return subprocess.Popen([HCLI, *shlex.split(line)], **options)

    def run(self, line, text="", **options):
        return finished(self.start(line, stdin=subprocess.PIPE, **options), text)

    def on_terminal(self, line, *answers, rows=0, **environment):
        """What a terminal shows, and the status. Each of the `answers` is typed once there is a question. The terminal
        has `rows` of 80 columns; without, it does not tell its size."""
        leader, follower = pty.openpty()
        termios.tcsetwinsize(follower, (rows, 80 if rows else 0))
        process = self.start(line, stdin=follower, stdout=follower, stderr=follower,
                             env=self.environment(NO_COLOR="1", **environment))
        # Linux may drop what is written to a terminal right before its last user closes it: the end is told in words.
        ended = threading.Thread(target=lambda: (process.wait(), os.write(follower, END)), daemon=True)
        ended.start()
        shown = b""
        for number, answer in enumerate(answers, 1):
            while shown.count(b": ") < number:  # what is typed before the question would be echoed
                shown += os.read(leader, 4096)
            os.write(leader, answer.encode() + b"\n")
        while not shown.endswith(END):
            ready, _, _ = select.select([leader], [], [], 60)
            check(ready, line, shown)
            shown += os.read(leader, 65536)
        ended.join()
        os.close(follower)
        os.close(leader)
        return shown.removesuffix(END).replace(b"\r\n", b"\n"), process.returncode

    def succeed(self, line, text="", **options):
        return succeeded(self.run(line, text, **options))

    def result(self, line):
        return json.loads(self.succeed(line + " --output json"))["result"]

    def show(self):
        return json.loads(self.succeed("simulator show --secrets"))
