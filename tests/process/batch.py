"""Command lines of a file, in one process: what each answers, which of them fail, when the answer comes, and that what
is answered is so, also where lines are made durable together. batch.py [KILLS]"""

import contextlib
import json
import os
import random
import signal
import sqlite3
import subprocess
import sys
import time

from support.program import BUSY, Host, check, finished, is_sound, write

LINES = r"""# two changes, and what is wrong with others
iscsi adapter set -A hba2 --alias 'one  "two"'   # not a part of it

iscsi adapter set -A hba2 --alias "it's \"\$x\" \a"
  iscsi adapter set -A hba9 -a x
iscsi adapter set -A hba2 -a 'x
iscsi adapter set -A hba2 -a x\
--batch other
--plugins=/ iscsi software get
--output simple iscsi adapter get -A hba2 --fields Alias
iscsi softwar get
iscsi adapter auth chap set -A hba2 -d uni -l required -N u -S -
propose bash"""
# line: status, message
ANSWERS = {
    2: (0, ""), 4: (0, ""), 5: (1, "Invalid adapter specified or unable to get adapter."),
    6: (2, "the single quote is not closed on its line"),
    7: (2, "the line ends with a backslash; a command stands on one line"),
    8: (2, "option --batch: a line of a batch cannot be one"),
    9: (2, "option --plugins: give it beside --batch; plug-ins are loaded ahead of the first line"),
    11: (2, 'unknown command "softwar" in "iscsi"; did you mean "software"?'),
    12: (2, "option --secret (-S): standard input ended before the value; lines of a batch that comes from there have none: "
            "give --secret-file"),
    13: (2, "command propose: a shell asks it by itself; it is not for a line of a batch"),
}


def answered():
    host = Host()
    path = os.path.join(host.root, "lines")
    write(path, LINES)
    done = host.run(f"--output json --batch {path} --keep-going")
    check(done.returncode == 1, done)
    shown = done.stdout.splitlines()
    text = [shown.pop(7), shown.pop(7), shown.pop(7)]
    check(text == ["line 10: iscsi adapter get", "hba2", """   Alias: it's "$x" \\a"""], text)
    answers = {answer["line"]: (answer["status"], "".join(answer["messages"])) for answer in map(json.loads, shown)}
    check(answers == ANSWERS, answers)
    named = [line for line in done.stderr.splitlines() if line.startswith(f"hcli: {path}:")]
    check(named == [f"hcli: {path}:{line}: exit status {status}" for line, (status, _) in ANSWERS.items() if status], named)
    done = host.run(f"--batch {path}")
    check(done.stdout == "line 2: iscsi adapter set\ntrue\nline 4: iscsi adapter set\ntrue\n", done)
    reason = 'hcli: reason: The host has no adapter "hba9".'
    check(done.stderr == f"{ANSWERS[5][1]}\n{reason}\nhcli: {path}:5: exit status 1\n" and done.returncode == 1, done)
    check(aliases(host)[2] == """it's "$x" \\a""", "what was done ahead of the failing line is lost")


def refused():
    host = Host()
    for line, text, status in [
        ("--batch /nowhere", 'option --batch: "/nowhere" cannot be read: No such file or directory', 2),
        (f"--batch {host.root}", f'option --batch: "{host.root}" cannot be read: Is a directory', 2),
        ("--batch - iscsi adapter list", "option --batch: give no command beside it; they stand in the file", 2),
        ("--keep-going iscsi adapter list", "option --keep-going: it goes with --batch alone", 2),
        ("--batch - --secret-file x", "option --secret-file: give it in the line of its command", 2),
    ]:
        done = host.run(line, "iscsi adapter list\n")
        check(done.returncode == status and text in done.stderr and not done.stdout, done)
    lines = "\ufeff" + "\n".join("-V".ljust(size) for size in (1 << 20, (1 << 20) + 1, 3 << 20, 2))
    for options, statuses in ("--keep-going", [0, 2, 2, 0]), ("", [0, 2]):
        done = host.run(f"--batch - --output json {options}", lines)
        check([json.loads(line)["status"] for line in done.stdout.splitlines()] == statuses, done)
        check("the line is longer than 1048576 bytes" in done.stderr, done)
    done = host.run("--batch -", "simulator load -\n{}\n")
    check(done.returncode == 1 and "hba0" in host.succeed("iscsi adapter list"), "a command has read lines", done)


def aliases(host):
    return [adapter["alias"] for adapter in host.show()["adapters"][:3]]


def while_it_is_written():
    """The answer to a line is there before the next line is, and what it tells of outlives the process."""
    host = Host()
    process = host.start("--batch - -q --output json", stdin=subprocess.PIPE)
    change = "iscsi adapter set -A hba2 -a"
    for text, answers in [(f"{change} first\n", 1), (f"{change} second\n# a note\n\niscsi adap", 1),
                          (f"ter set -A hba1 -a x\n{change} y\n{change} z", 2)]:
        os.write(process.stdin.fileno(), text.encode())
        for _ in range(answers):
            check(json.loads(process.stdout.readline())["result"] is True, "no answer")
    process.kill()
    finished(process)
    check(aliases(host)[1:] == ["x", "y"], "what was answered is lost", aliases(host))


def unread():
    """Where nobody reads on, the program ends as others do: nothing more is done, and what was answered stands."""
    host = Host()
    before = aliases(host)
    process = host.start("--batch -", stdin=subprocess.PIPE)
    os.write(process.stdin.fileno(), b"iscsi adapter set -A hba1 -a x\n")
    check(process.stdout.readline() and process.stdout.readline() == "true\n", "no answer")
    process.stdout.close()
    done = finished(process, "iscsi adapter set -A hba2 -a y\n")
    check(done.returncode == -signal.SIGPIPE and not done.stderr, done)
    check(aliases(host) == [before[0], "x", before[2]], aliases(host))


def locked():
    """What cannot be made durable together is told of each line by itself, and lines that are not hurt by it go on."""
    host = Host()
    before = aliases(host)
    lines = [f"iscsi adapter {line}" for line in ("set -A hba1 -a x", "get -A hba2", "set -A hba2 -a y")]
    reader = sqlite3.connect(host.database, isolation_level=None)
    reader.execute("BEGIN")
    reader.execute("SELECT * FROM object").fetchone()
    for options, statuses in ("--keep-going", [BUSY, 0, BUSY]), ("", [BUSY]):
        done = host.run(f"--batch - --output json --exit-codes --timeout 0 {options}", "\n".join(lines))
        answers = [json.loads(line) for line in done.stdout.splitlines()]
        check([answer["status"] for answer in answers] == statuses and done.returncode == BUSY, done)
        check(len(answers) == 1 or answers[1]["result"][0]["Alias"] == before[2], "a change is seen that is not there", done)
        check(aliases(host) == before, aliases(host))
    begin = time.monotonic()
    host.run("--timeout 1 --batch -", "\n".join(lines))
    check(1 < time.monotonic() - begin < 10, "--timeout does not hold for what is made durable together")
    reader.execute("COMMIT")
    host.succeed("--batch -", "\n".join(lines))
    check(aliases(host) == [before[0], "x", "y"], aliases(host))


def settled():
    """What writes elsewhere, or takes its time, is begun once the changes ahead of it are kept; else it is not."""
    for line, made in (("doctor --bundle {0}/report", "report"), ("manual --folder {0}", "hcli.1"),
                       ("linux check", "asked")):
        host = Host()
        before = aliases(host)
        os.mkdir(os.path.join(host.root, "sbin"))
        write(program := os.path.join(host.root, "sbin/iscsiadm"), f"#!/bin/sh\n: > {host.root}/asked\n")
        os.chmod(program, 0o755)
        lines = f"iscsi adapter set -A hba1 -a x\n{line.format(host.root)}\n"
        reader = sqlite3.connect(host.database, isolation_level=None)
        reader.execute("BEGIN")
        reader.execute("SELECT * FROM object").fetchone()
        done = host.run("--batch - --timeout 0 --exit-codes", lines)
        check(done.returncode == BUSY and made not in os.listdir(host.root), line, done)
        reader.close()
        done = host.run("--batch -", lines)
        check(made in os.listdir(host.root) and aliases(host) == [before[0], "x", before[2]], line, done)
        check("cut off" not in done.stdout, "a change of its own batch counts as one that was cut off", done)


def killed(kills):
    """Wherever it is killed, the first lines are done, as many as were answered at least, and no others."""
    random.seed(20261123)
    addresses = [f"10.0.{number // 250}.{number % 250 + 1}:3260" for number in range(600)]
    lines = "".join(f"iscsi adapter discovery sendtarget add -A hba0 -a {address}\n" for address in addresses)

    def batch(seconds):
        """How many lines are answered, and done, where it is killed after so long; and how long it has run."""
        host = Host({"adapters": [{"name": "hba0", "capabilities": {"Sendtarget Discovery Settable": True}}]})
        write(os.path.join(host.root, "lines"), lines)
        with open(os.path.join(host.root, "answers"), "w+", encoding="utf-8") as answers:
            process = host.start(f"--batch {host.root}/lines", stdout=answers,
                                 env=host.environment(ASAN_OPTIONS="detect_leaks=0"))
            begin = time.monotonic()
            with contextlib.suppress(subprocess.TimeoutExpired):
                process.wait(seconds)
            ran = time.monotonic() - begin
            process.kill()
            done = finished(process)
            answers.seek(0)
            answered = answers.read().count("true")
        check(done.returncode in (0, -9) and not done.stderr, done)
        there = [entry["host"] + ":3260" for entry in host.show()["adapters"][0]["sendTargets"]]
        check(there == addresses[:len(there)] and len(there) >= answered, f"answered: {answered}, there:", there)
        check(is_sound(host.database), "the database is damaged")
        return answered, len(there), ran

    answered, done, longest = batch(60)
    check(answered == done == len(addresses), "not all is done", answered, done)
    runs = [batch(random.uniform(0, longest))[:2] for _ in range(kills)]
    behind = [done - answered for answered, done in runs if 0 < done < len(addresses)]
    check(behind, "none was killed in the middle", runs)
    print(f"{len(behind)} of {kills} killed in the middle, at most {max(behind)} lines done and not answered")


answered()
refused()
while_it_is_written()
unread()
locked()
settled()
killed(int(sys.argv[1]) if len(sys.argv) > 1 else 20)
