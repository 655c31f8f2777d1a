"""A dry run leaves every file as it was, keeps nobody waiting, and is refused where it could not be undone."""

import fcntl
import json
import os

from support.program import SET_NAME, Host, check, contents, finished, until_asleep, write

SET = "iscsi adapter set -A hba2 -a other"


def nothing_is_written():
    host = Host()
    shown = host.succeed(f"--dry-run {SET}")
    check(shown == 'dry run: SetInitiatorAlias(hba2, "other")\ntrue\n', shown)
    check(not contents(host.root), "a first run has made files", contents(host.root))
    host.succeed(SET_NAME)
    other = os.path.join(host.root, "other")
    write(other, '{"adapters": [{"name": "one"}]}')
    before = contents(host.root)
    for line, call in [
        (SET, "SetInitiatorAlias"), (SET_NAME.replace(":host", ":new"), "Save"), ("simulator reset", "Load"),
        ("simulator reboot", "Reboot"), (f"simulator load {other}", "Load"), ("iscsi adapter list", None),
        ("catalogue", None),
    ]:
        calls = json.loads(host.succeed(f"--dry-run --output json {line}"))["calls"]
        check(any(text.startswith(call) for text in calls) if call else not calls, line, calls)
        check(contents(host.root) == before, f"{line}: files differ")


def batch():
    """Lines see what those before them have done, also to files; nothing of it stays."""
    host = Host()
    before = host.show()
    lines = [SET, "iscsi adapter get -A hba2", SET_NAME, "simulator reboot", "simulator show"]
    done = host.run("--dry-run --output json --batch -", "\n".join(lines))
    answers = [json.loads(line) for line in done.stdout.splitlines()]
    check(done.returncode == 0 and [answer["line"] for answer in answers] == [1, 2, 3, 4, 5], done)
    check(answers[1]["result"][0]["Alias"] == "other" and not answers[1]["calls"], answers[1])
    check("iqn.2026-11.org.example:host" in answers[4]["result"], answers[4])
    check(host.show() == before and not os.path.exists(host.names), "something stays")
    done = host.run("--dry-run --batch -", f"{SET}\n--dry-run=no {SET}\n{SET}\n")
    check(done.returncode == 2 and "cannot be for real" in done.stderr and done.stdout.count("line ") == 1, done)
    check(host.show() == before, "something stays")
    # Records of several lines are one table for whoever reads them, and nothing stands between them.
    get = "--fields ID,Alias iscsi adapter get -A"
    done = host.run("--dry-run --output csv --no-header -q --batch -", f"{get} hba1\n{SET}\n{get} hba2\n")
    check(done.stdout == "hba1,\nhba2,other\n" and "dry run: SetInitiatorAlias(hba2" in done.stderr, done)


def nobody_waits():
    """Neither for whoever reads the trace, nor for whoever reads the result."""
    host = Host()
    host.succeed(SET)
    reader, writer = os.pipe()
    size = fcntl.fcntl(writer, fcntl.F_GETPIPE_SZ)
    os.write(writer, b"x" * size)
    stuck = host.start(f"--trace --dry-run {SET}", stdout=writer, stderr=writer)
    until_asleep(stuck)
    host.succeed(f"--timeout 0 {SET}")
    os.close(writer)
    while os.read(reader, 65536):
        pass
    check(finished(stuck).returncode == 0, stuck)


def refused():
    host = Host()
    done = host.run(f"--plugins {host.root} --dry-run catalogue")
    check(done.returncode == 2 and "no plug-in that is loaded can undo" in done.stderr and not done.stdout, done)


nothing_is_written()
batch()
nobody_waits()
refused()
