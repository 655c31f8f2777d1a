"""What hcli proposes behind a beginning of a line, and what bash, zsh and fish make of it."""

import json
import os
import pty
import re
import select
import shutil
import sqlite3
import statistics
import subprocess
import tempfile
import termios
import time

from support.program import HCLI, Host, check, contents, run, succeeded, write

ADAPTERS = ["hba0", "hba1", "hba2"]
TRUTH = ["true", "false"]
GET, CHAP, PARAM = "iscsi adapter get", "iscsi adapter auth chap set", "iscsi adapter discovery sendtarget param set"
FILES, FOLDERS = "files", "folders"
TRIES = 5  # on a crowded machine, a host may not answer for longer than a person waits

# A line, and all that may follow; a text is the kind of name that a shell knows by itself.
CASES = {
    "isc": ["iscsi"],
    "nothing ": [],
    "iscsi nothing a": [],
    "iscsi software ": ["get", "set"],
    "--output json iscsi software ": ["get", "set"],
    "iscsi --output=json software s": ["set"],
    "iscsi 'soft": ["software"],
    "help iscsi soft": ["software"],
    "explain iscsi soft": ["software"],
    "explain iscsi soft adapter": [],
    # Options: each once, but for lists; those of the command alone until a dash is written.
    f"{GET} ": ["--adapter"],
    f"{GET} -A hba0 ": [],
    f"{GET} --o": ["--output"],
    f"{GET} --output json --o": [],
    f"--output json {GET} --o": [],
    f"{GET} -q": ["-q"],
    f"{GET} -qA": [f"-qA{name}" for name in ADAPTERS],
    f"{GET} -- --": [],
    "iscsi networkportal ipv6config address add --address-list a --address": ["--address-list"],
    "--plug": ["--plugins"],
    "iscsi --plug": [],
    f"{GET} --plug": [],
    # Values that are declared.
    "completion ": ["bash", "zsh", "fish", "--shell"],
    "completion z": ["zsh"],
    f"{CHAP} -d ": ["uni", "mutual"],
    f"{CHAP} --direction=m": ["--direction=mutual"],
    f"{CHAP} -dm": ["-dmutual"],
    "iscsi software set -e ": TRUTH,
    "iscsi software set -e y": ["yes"],
    f"{CHAP} --default=": [f"--default={word}" for word in TRUTH],
    f"{GET} --color ": ["auto", "always", "never"],
    "iscsi adapter list --fields ": ["Adapter", "State", "Driver", "UID", "Description"],
    "iscsi adapter list --fields State,Adapter,D": ["State,Adapter,Driver", "State,Adapter,Description"],
    "iscsi adapter discovery statictarget list --fields='Target N": ["--fields=Target Name"],
    "simulator reset --fields ": [],
    # Values that the host has.
    f"{GET} --adapter ": ADAPTERS,
    f"{GET} --adapter=": [f"--adapter={name}" for name in ADAPTERS],
    f"{GET} -A": [f"-A{name}" for name in ADAPTERS],
    "iscsi adapter param set -A hba1 --key MaxB": ["MaxBurstLength"],
    "iscsi adapter param set --key MaxB": [],
    "iscsi adapter param set -A nothing --key MaxB": [],
    "iscsi session remove -A hba2 --name ": ["iqn.2026-11.org.example:mirror"],
    # Files, where they are wanted.
    "simulator load ": FILES,
    "simulator load --file=": FILES,
    "iscsi adapter firmware set -A hba2 --file ": FILES,
    "--batch ": FILES,
    f"{CHAP} --secret-file ": FILES,
    "--plugins=": FOLDERS,
    f"{GET} > ": FILES,
    f"{GET} 2>&1 -A hba0 --no-p": ["--no-pager"],
    f"{CHAP} --authname ": [],
    # Secrets: nothing, whatever there is.
    f"{CHAP} --secret ": [],
    f"{CHAP} --secret=": [],
    f"{CHAP} -S": [],
}


def propose(host, line, **more):
    """The first line, and the candidates without their descriptions."""
    done = host.run("propose fish", env=host.environment(COMP_LINE=f"hcli {line}", **more))
    kind, *words = succeeded(done).splitlines()
    check(not done.stderr, line, done)
    return kind, [word.split("\t")[0] for word in words]


def expect(host, line, expected):
    for _ in range(TRIES):
        kind, words = propose(host, line)
        if (kind if isinstance(expected, str) else words) == expected:
            return
    check(False, repr(line), "expected", expected, "not", kind, words)


host = Host()
for case, result in CASES.items():
    expect(host, case, result)
check(not contents(host.root), "looking for values has made", contents(host.root))

# A host that gives no values at once gives none: no waiting, no texts, and nothing is touched.
host.succeed("iscsi adapter list")
expect(host, f"{GET} -A ", ADAPTERS)
check(propose(host, f"{GET} -A ", HCLI_TRACE="1", HCLI_OUTPUT="json")[1] == ADAPTERS, "a trace stands in the way")
# A key that is pressed is answered at once. Builds that look at themselves are slow: there, as fast as a few commands.
took = {"propose fish": [], "iscsi adapter list": []}
for _ in range(15):
    for line, seconds in took.items():
        begin = time.monotonic()
        host.succeed(line, env=host.environment(COMP_LINE=f"hcli {GET} -A "))
        seconds.append(time.monotonic() - begin)
answer, command = map(statistics.median, took.values())
check(answer < max(0.05, 3 * command), f"an answer takes {answer:.3f} s, a command {command:.3f} s")
lock = sqlite3.connect(host.database, isolation_level=None)
lock.execute("BEGIN EXCLUSIVE")
expect(host, f"{GET} -A ", [])
check(host.run(f"--timeout 0 {GET} -A hba0").returncode != 0, "the host was not locked")
lock.close()
expect(host, f"{GET} -A ", ADAPTERS)
write(host.database, "noise")
before = contents(host.root)
expect(host, f"{GET} -A ", [])
check(contents(host.root) == before, "a damaged host was changed")

# Real shells: what the line is when the key was pressed, as words, behind the words "hcli NAME".
host = Host()
IQN = "iqn.2026-11.org.example:"
REMOVE = "iscsi session remove -A hba2 -n"
LINES = {
    "isc": ["iscsi"],
    "--output json iscsi so": ["--output", "json", "iscsi", "software"],
    f"{GET} --adapter=hba2": [*GET.split(), "--adapter=hba2"],
    f"{GET} -A ": [*GET.split(), "-A", *ADAPTERS],
    f"{CHAP} -A hba0 --level=re": [*CHAP.split(), "-A", "hba0", "--level=required"],
    f"{REMOVE} iqn.2026-11.org.example:m": [*REMOVE.split(), f"{IQN}mirror"],
    f"{REMOVE} 'iqn.2026-11.org.example:m": [*REMOVE.split(), f"{IQN}mirror"],
    f"{REMOVE} ": [*REMOVE.split(), f"{IQN}mirror"],
    "iscsi adapter discovery statictarget list --fields Target\\ N":
        "iscsi adapter discovery statictarget list --fields".split() + ["Target Name"],
    "simulator load a": ["simulator", "load", "a file:1"],
    "--batch=a": ["--batch=a file:1"],
    f"{CHAP} --secret ": [*CHAP.split(), "--secret"],
    f"{CHAP} --secret geheim --auth": [*CHAP.split(), "--secret", "geheim", "--authname"],
}

SHOW = r"""hcli() { printf '\002'; printf '%s\n' "$@"; printf '\003'; }; printf '\002\003'"""
ALL = "\x14"  # the key that puts in every candidate
READY = {
    "bash": ["bash --norc --noprofile -i", "PS1=", "source FILE", "bind 'set page-completions off'",
             "bind '\"\\C-t\": insert-completions'", "bind 'set completion-query-items 0'"],
    "zsh": ["zsh -f -i", "PS1=", "autoload -Uz compinit", "LOADED", "zle -C all complete-word _generic",
            "bindkey '^T' all", "zstyle ':completion:all:*' insert true",
            "zstyle ':completion:all::::' completer _all_matches _complete"],
}


class Terminal:
    """An interactive shell. `keys` are pressed and the line is run, as a function that shows its words."""

    def __init__(self, setup, environment, folder):
        self.leader, follower = pty.openpty()
        termios.tcsetwinsize(follower, (50, 100))
        self.process = subprocess.Popen(setup[0].split(), stdin=follower, stdout=follower, stderr=follower,
                                        env=environment, cwd=folder, start_new_session=True)
        os.close(follower)
        os.write(self.leader, "; ".join([*setup[1:], SHOW]).encode() + b"\n")
        self.read(b"\x02\x03")

    def read(self, end):
        shown = b""
        while not re.search(end, shown):
            ready, _, _ = select.select([self.leader], [], [], 30)
            check(ready, self.process.args, "shows no more than", shown)
            shown += os.read(self.leader, 65536)
        return shown.decode()

    def words(self, keys):
        os.write(self.leader, keys.encode() + b"\n")
        return re.findall("\x02([^\x03]*)\x03", self.read(b"\x02[^\x03]*\x03"))[-1].splitlines()

    def close(self):
        os.close(self.leader)
        self.process.kill()
        self.process.wait()


with tempfile.TemporaryDirectory(prefix="hcli-completion-") as folder:
    scripts = {name: os.path.join(folder, name) for name in ("bash", "zsh", "fish")}
    for name, path in scripts.items():
        write(path, succeeded(run(HCLI, "completion", name)))
    os.makedirs(functions := os.path.join(folder, "functions"))
    shutil.copy(scripts["zsh"], os.path.join(functions, "_hcli"))
    os.makedirs(programs := os.path.join(folder, "programs"))
    os.makedirs(work := os.path.join(folder, "work"))
    write(os.path.join(work, "a file:1"), "")
    # What every process that a shell starts is given, where all can see it.
    log = os.path.join(folder, "log")
    write(program := os.path.join(programs, "hcli"), f'#!/bin/sh\nprintf "%s\\n" "$*" >> "{log}"\nexec "{HCLI}" "$@"\n')
    os.chmod(program, 0o755)
    environment = host.environment(PATH=f"{programs}:{os.environ['PATH']}", TERM="xterm", LC_ALL="C.UTF-8")

    for name, loaded in (("bash", ""), ("zsh", f"compinit -u -D; source {scripts['zsh']}"),
                         ("zsh", f"fpath=({functions} $fpath); compinit -u -D")):
        if not shutil.which(name):
            print(f"there is no {name} here")
            continue
        setup = [part.replace("FILE", scripts["bash"]).replace("LOADED", loaded) for part in READY[name]]
        terminal = Terminal(setup, environment, work)
        for line, expected in LINES.items():
            for _ in range(TRIES):
                words = terminal.words(f"hcli {line}{ALL}")
                if words == expected:
                    break
            check(words == expected, name, repr(line), "expected", expected, "not", words)
        os.write(terminal.leader, f"hcli {GET} -A \t\t\t".encode())
        terminal.read(rb"hba1 *-- Halden HX2 dependent")
        terminal.close()

    if shutil.which("fish"):
        for line, expected in {
            "--output json iscsi so": ["software\tOperations that can be performed on software iSCSI"],
            f"{GET} --adapter=hba1": ["--adapter=hba1\tHalden HX2 dependent iSCSI adapter"],
            f"{REMOVE} iqn.2026-11.org.example:": [f"{IQN}mirror\t"],
            "--batch=a": ["--batch=a file:1"],
            "simulator load ": ["a file:1"],
            f"{CHAP} --secret ": [],
            f"{CHAP} --secret geheim --auth": ["--authname\tThe iSCSI CHAP authentication name"],
        }.items():
            command = f"source {scripts['fish']}; complete -C {json.dumps('hcli ' + line)}"
            for _ in range(TRIES):
                done = subprocess.run(["fish", "--no-config", "-c", command], capture_output=True, text=True,
                                      env={**environment, "HOME": folder}, cwd=work)
                words = succeeded(done).splitlines()
                if len(words) == len(expected) and all(map(str.startswith, words, expected)):
                    break
            else:
                check(False, "fish", repr(line), "expected", expected, "not", words)
    else:
        print("there is no fish here")
    with open(log, encoding="utf-8") as file:
        given = file.read()
    check("propose" in given and "geheim" not in given, "a secret stands on a command line", given)
