"""hcli killed at any moment while it writes: the host is as before or as after, and what was said to be done is done.
killed.py [KILLS]"""

import json
import os
import random
import sys
import time

from support.program import SET_NAME, Host, beside, check, complaints, finished, is_sound, read, write

KILLS = int(sys.argv[1]) if len(sys.argv) > 1 else 160
SEED = 20261122
OTHER_LINES = "# kept\nOther='a value'\n"


def description(fillers):
    """A host that takes a while to load."""
    adapter = {"name": "hba0", "kind": "software", "alias": f"with {fillers}", "capabilities": {
        "Name And Alias Settable": True, "Sendtarget Discovery Settable": True}}
    others = [{"name": f"hba{number}", "alias": "filler"} for number in range(1, fillers + 1)]
    return json.dumps({"adapters": [adapter, *others]})


def state(host):
    """All that the changes below change."""
    adapters = host.show()["adapters"]
    names = read(host.names)
    check(names.startswith(OTHER_LINES), "the initiator's file has become", names)
    return {"alias": adapters[0]["alias"], "adapters": [adapter["name"] for adapter in adapters],
            "sendtargets": [sendtarget["host"] for sendtarget in adapters[0]["sendTargets"]],
            "name": names[len(OTHER_LINES):]}


def change(run, now, loads):
    """The command line of a run, and the state that it leads to."""
    number, kind = divmod(run, 4)
    if kind == 0:
        return f"iscsi adapter set -A hba0 --alias name{number}", {**now, "alias": f"name{number}"}
    if kind == 1:
        address = f"10.{number // 62500}.{number // 250 % 250}.{number % 250 + 1}"
        line = f"iscsi adapter discovery sendtarget add -A hba0 -a {address}"
        return line, {**now, "sendtargets": [*now["sendtargets"], address]}
    if kind == 2:
        path, loaded = loads[number % 2]
        return f"simulator load {path}", {**loaded, "name": now["name"]}
    line = f"{SET_NAME}{number}"
    return line, {**now, "name": f"InitiatorName={line.split()[-1]}\n"}


longest = {}  # how long each kind of command is let run


def killed(host, line):
    """Starts the line and kills it; returns the process when it is over, and a text that tells of it."""
    kind = line.split("-")[0]
    # Looking for leaks at the end, a sanitizer build complains when it is killed there.
    process = host.start(line, env=host.environment(ASAN_OPTIONS="detect_leaks=0"))
    delay = random.uniform(0, longest.setdefault(kind, longest["a first guess"]))
    time.sleep(delay)
    process.kill()
    done = finished(process)
    what = f"`{line}` killed after {delay * 1000:.2f} ms:"
    check(done.returncode in (0, -9) and not complaints(done), what, done)
    # However busy the machine is, most are killed at work, and some near the end of it.
    longest[kind] *= 1.03 if done.returncode else 0.9
    return done, what


def runs(outcomes, least):
    """Numbers of runs, until there were the `least` and each outcome was seen; an end where one never is: the delays
    would miss what they are for."""
    for run in range(20 * least):
        if sum(outcomes.values()) >= least and all(outcomes.values()):
            return
        yield run
    check(False, "after too many runs:", outcomes)


def changes():
    begin = time.monotonic()
    host = Host()
    host.show()
    longest["a first guess"] = time.monotonic() - begin
    os.makedirs(os.path.dirname(host.names))
    write(host.names, OTHER_LINES)
    loads = []
    for fillers in 1, 30:
        path = os.path.join(host.root, f"{fillers}.json")
        write(path, description(fillers))
        host.succeed(f"simulator load {path}")
        loads.append((path, state(host)))
    now, outcomes, ended, remains = state(host), {"killed, not done": 0, "killed, done": 0}, 0, 0
    for run in runs(outcomes, KILLS):
        before, (line, after) = now, change(run, now, loads)
        done, what = killed(host, line)
        what = f"run {run}, {what}"
        # What one killed process leaves is there for the next one of its kind: nothing piles up.
        left = beside(host.names)
        check(len(left) <= 1, what, f"left beside the initiator's file: {left}")
        remains += "software" in line and len(left)
        now = state(host)
        check(now in (before, after), what, "before", before, "now", now)
        check(now == after or not done.stdout, what, f"it said {done.stdout!r}, and the change is not there")
        if done.returncode == 0:
            ended += 1
        else:
            outcomes["killed, done" if now == after else "killed, not done"] += 1
        check(is_sound(host.database), what, "the database is damaged")
    print(outcomes, f"{ended} ended, {remains} of the kills left a part of the file of the initiator's name")
    # A journal that was never in use may stay until the next change.
    host.succeed(SET_NAME)
    check(not beside(host.database) | beside(host.names), "left:", beside(host.database), beside(host.names))


def first_runs(least):
    """Killed while it makes the host: there is none, or a whole one, and in either case the next command goes on."""
    demo, outcomes = Host().show(), {"no host": 0, "a host": 0}
    for run in runs(outcomes, least):
        host = Host()
        what = f"first run {run}, " + killed(host, "simulator show")[1]
        outcomes["a host" if os.path.exists(host.database) else "no host"] += 1
        check(host.show() == demo, what, "another host")
        check(is_sound(host.database), what, "the database is damaged")
        check(not beside(host.database), what, f"left beside the database: {beside(host.database)}")
    # The second of two first runs finds that there is a host when its own is made.
    write(os.path.join(os.path.dirname(host.database), ".host.db.new"), "a part")
    host.show()
    check(not beside(host.database), f"left by a first run that came second: {beside(host.database)}")
    print("first runs", outcomes)


random.seed(SEED)
changes()
first_runs(KILLS // 8)
