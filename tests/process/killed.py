"""hcli killed at any moment while it writes: the host is as before or as after, and what was said to be done is done.
killed.py [KILLS]"""

import itertools
import json
import os
import random
import sqlite3
import sys
import time

from support.program import Host, check

KILLS = int(sys.argv[1]) if len(sys.argv) > 1 else 160
SEED = 20261122
NAME_FILE = "etc/tessaro/coreiscsid/initiatorname.iscsi"
OTHER_LINES = "# kept\nOther='a value'\n"


def description(host, fillers):
    """A host that takes a while to load."""
    path = os.path.join(host.root, f"{fillers}.json")
    adapter = {"name": "hba0", "kind": "software", "alias": f"with {fillers}", "capabilities": {
        "Name And Alias Settable": True, "Sendtarget Discovery Settable": True}}
    others = [{"name": f"hba{number}", "alias": "filler"} for number in range(1, fillers + 1)]
    with open(path, "w", encoding="utf-8") as file:
        json.dump({"adapters": [adapter, *others]}, file)
    return path


def state(host):
    """All that the changes below change."""
    adapters = host.show()["adapters"]
    with open(os.path.join(host.root, NAME_FILE), encoding="utf-8") as file:
        names = file.read()
    check(names.startswith(OTHER_LINES), "the initiator's file has become", names)
    return (adapters[0]["alias"], tuple(sendtarget["host"] for sendtarget in adapters[0]["sendTargets"]),
            tuple(adapter["name"] for adapter in adapters), names[len(OTHER_LINES):])


def changes(paths, loaded):
    """Kinds of change without end: the command line, and the state that it leads to."""
    number = 0
    while True:
        number += 1
        yield f"iscsi adapter set -A hba0 --alias name{number}", lambda old, n=number: (f"name{n}", *old[1:])
        address = f"10.{number // 62500}.{number // 250 % 250}.{number % 250 + 1}"
        yield (f"iscsi adapter discovery sendtarget add -A hba0 -a {address}",
               lambda old, a=address: (old[0], (*old[1], a), *old[2:]))
        which = number % 2
        yield f"simulator load {paths[which]}", lambda old, w=which: (*loaded[w][:3], old[3])
        name = f"iqn.2026-11.org.example:host{number}"
        yield (f"iscsi software set --enabled true --name {name}",
               lambda old, n=name: (*old[:3], f"InitiatorName={n}\n"))


def check_database(path, *shown):
    with sqlite3.connect(path) as database:
        found = database.execute("PRAGMA integrity_check").fetchall()
    database.close()
    check(found == [("ok",)], *shown, found)


def left(path):
    """What stands beside the file."""
    return set(os.listdir(os.path.dirname(path))) - {os.path.basename(path)}


longest = {}  # how long each kind of command is let run


def killed(host, line):
    """Starts the line and kills it; returns the exit status, the standard output and a text that tells of it."""
    kind = line.split("-")[0]
    # Looking for leaks at the end, a sanitizer build complains when it is killed there.
    process = host.start(line, env=host.environment(ASAN_OPTIONS="detect_leaks=0"))
    delay = random.uniform(0, longest.setdefault(kind, longest["a first guess"]))
    time.sleep(delay)
    process.kill()
    out, err = process.communicate(timeout=60)
    what = f"`{line}` killed after {delay * 1000:.2f} ms:"
    check(process.returncode in (0, -9) and not err, what, process.returncode, out, err)
    # However busy the machine is, most are killed at work, and some near the end of it.
    longest[kind] *= 1.03 if process.returncode else 0.9
    return process.returncode, out, what


def enough(outcomes, run, least):
    """True behind the `least` runs once each outcome was seen, and an end where one never is: the delays would miss what
    they are for."""
    check(run < 20 * least, f"after {run} runs:", outcomes)
    return run >= least and all(outcomes.values())


def first_runs(least):
    """Killed while it makes the host: there is none, or a whole one, and in either case the next command goes on."""
    demo, outcomes = Host().show(), {"no host": 0, "a host": 0}
    for run in itertools.count():
        if enough(outcomes, run, least):
            break
        host = Host()
        what = f"first run {run}, " + killed(host, "simulator show")[2]
        outcomes["a host" if os.path.exists(host.database) else "no host"] += 1
        check(host.show() == demo, what, "another host")
        check_database(host.database, what)
        check(not left(host.database), what, f"left beside the database: {left(host.database)}")
    print("first runs", outcomes)


def main():
    random.seed(SEED)
    begin = time.monotonic()
    host = Host()
    host.show()
    longest["a first guess"] = time.monotonic() - begin
    names = os.path.join(host.root, NAME_FILE)
    os.makedirs(os.path.dirname(names))
    with open(names, "w", encoding="utf-8") as file:
        file.write(OTHER_LINES)
    paths = [description(host, fillers) for fillers in (1, 30)]
    loaded = []
    for path in paths:
        host.succeed(f"simulator load {path}")
        loaded.append(state(host))
    now, outcomes, ended, remains = loaded[1], {"killed, not done": 0, "killed, done": 0}, 0, 0
    for run, (line, after) in enumerate(changes(paths, loaded)):
        if enough(outcomes, run - ended, KILLS):
            break
        status, said, what = killed(host, line)
        what = f"run {run}, {what}"
        # What one killed process leaves is there for the next one of its kind: nothing piles up.
        check(len(left(names)) <= 1, what, f"left beside the initiator's file: {left(names)}")
        remains += "software" in line and len(left(names))
        before, now, expected = now, state(host), after(now)
        check(now in (before, expected), what, "before", before, "now", now)
        if said:
            check(now == expected, what, f"it said {said!r}, and the change is not there")
        if status == 0:
            ended += 1
        else:
            outcomes["killed, done" if now == expected else "killed, not done"] += 1
        check_database(host.database, what)
    print(outcomes, f"{ended} ended, {remains} of the kills left a part of the file of the initiator's name")
    # A journal that was never in use may stay until the next change.
    host.succeed("iscsi software set --enabled true --name iqn.2026-11.org.example:last")
    check(not left(host.database) and not left(names), "left:", left(host.database), left(names))
    first_runs(KILLS // 8)


main()
