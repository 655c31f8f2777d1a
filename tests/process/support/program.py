"""What tests of the built program share: running it on a host of their own, and saying what was wrong."""

import contextlib
import difflib
import json
import os
import pty
import shlex
import shutil
import sqlite3
import subprocess
import sys
import tempfile

HCLI = os.environ["HCLI_BIN"]
SOURCE = os.environ["HCLI_SOURCE_DIR"]
NAME_FILE = "etc/tessaro/coreiscsid/initiatorname.iscsi"
SET_NAME = "iscsi software set --enabled true --name iqn.2026-11.org.example:host"
# Commands have texts of their own for what fails below them; the trace has the reason.
READ, WRITE = "--trace iscsi adapter list", "--trace iscsi adapter set -A hba2 -a other"


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


def succeeded(done):
    """The standard output of a command that has to work without a word on standard error."""
    check(done.returncode == 0 and not done.stderr, done)
    return done.stdout


def refused(case, done, *texts):
    """A report with these texts, and no result."""
    missing = [text for text in texts if text not in done.stderr]
    check(done.returncode == 1 and not done.stdout and not missing, f"{case}: expected {missing}", done)


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

    def succeed(self, line, text="", **options):
        return succeeded(self.run(line, text, **options))

    def result(self, line):
        return json.loads(self.succeed(line + " --output json"))["result"]

    def show(self):
        return json.loads(self.succeed("simulator show --secrets"))
