"""Command lines of a file, in one process: what each answers, which of them fail, when the answer comes."""

import json
import os
import subprocess

from support.program import Host, check, finished, write

LINES = r"""# two changes, and what is wrong with others
iscsi adapter set -A hba2 --alias 'one  "two"'   # not a part of it

iscsi adapter set -A hba2 --alias "it's \"\$x\" \a"
  iscsi adapter set -A hba9 -a x
iscsi adapter set -A hba2 -a 'x
iscsi adapter set -A hba2 -a x\
--batch other
--plugins=/ iscsi software get
--output simple iscsi adapter get -A hba2 --fields Alias
software get"""
# line: status, message
ANSWERS = {
    2: (0, ""), 4: (0, ""), 5: (1, "Invalid adapter specified or unable to get adapter."),
    6: (2, "the single quote is not closed on its line"),
    7: (2, "the line ends with a backslash; a command stands on one line"),
    8: (2, "option --batch: a line of a batch cannot be one"),
    9: (2, "option --plugins: give it beside --batch; plug-ins are loaded ahead of the first line"),
    11: (2, 'unknown command "software"; there are: iscsi, simulator, catalogue, completion'),
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


def refused():
    host = Host()
    for line, text, status in [
        ("--batch /nowhere", 'option --batch: "/nowhere" cannot be read: No such file or directory', 2),
        (f"--batch {host.root}", f"{host.root} cannot be read: Is a directory", 4),
        ("--batch - iscsi adapter list", "option --batch: give no command beside it; they stand in the file", 2),
        ("--keep-going iscsi adapter list", "option --keep-going: it goes with --batch alone", 2),
        ("--batch - --secret-file x", "option --secret-file: give it in the line of its command", 2),
    ]:
        done = host.run(line, "iscsi adapter list\n")
        check(done.returncode == status and text in done.stderr and not done.stdout, done)
    done = host.run("--batch -", "#" * (1 << 21))
    check(done.returncode == 4 and "standard input, line 1: it is longer than 1048576 bytes" in done.stderr, done)
    done = host.run("--batch -", "simulator load -\n{}\n")
    check(done.returncode == 1 and "hba0" in host.succeed("iscsi adapter list"), "a command has read lines", done)


def while_it_is_written():
    """The answer to a line is there before the next line is, and what it tells of outlives the process."""
    host = Host()
    process = host.start("--batch - -q --output json", stdin=subprocess.PIPE)
    for name in "first", "second":
        os.write(process.stdin.fileno(), f"iscsi adapter set -A hba2 -a {name}\n".encode())
        check(json.loads(process.stdout.readline())["result"] is True, "no answer")
    process.kill()
    finished(process)
    check(host.show()["adapters"][2]["alias"] == "second", "what was answered is lost")


answered()
refused()
while_it_is_written()
