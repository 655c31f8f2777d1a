"""Bytes of the host's file that nobody wrote: each command has a result, or a text that names the file; none crashes,
hangs, or puts another host in its place. flipped.py [CASES OF EACH KIND]"""

import contextlib
import json
import os
import random
import sqlite3
import sys

from support.program import SOURCE, Host, beside, check, contents, is_sound, read
from support.records import decoded, encoded

CASES = int(sys.argv[1]) if len(sys.argv) > 1 else 25
SEED = 20261122
PAGE = 4096
MARK = "an alias of its own"

SHOW = "simulator show --secrets"
READ = ["iscsi adapter list", "iscsi session list", "iscsi adapter target list", "iscsi networkportal list",
        "iscsi adapter param get -A hba0", "iscsi adapter discovery sendtarget list", "iscsi software get",
        "iscsi adapter discovery statictarget list", "iscsi physicalnetworkportal list", "iscsi plugin list",
        "iscsi adapter target portal list", "iscsi session connection list", "iscsi adapter capabilities get -A hba1"]
WRITE = ["iscsi adapter set -A hba2 -a other", "iscsi adapter discovery rediscover -A hba0", "simulator reboot",
         "iscsi adapter discovery sendtarget add -A hba0 -a 10.0.0.1", "iscsi session remove -A hba0",
         "iscsi software set --enabled false", "iscsi adapter param set -A hba0 -k MaxBurstLength -v 1024",
         "simulator reset", "iscsi session add -A hba0"]


def flipped(old, at, value=None):
    """One bit of the byte is another, or the byte has the `value`."""
    return old[:at] + bytes([old[at] ^ 1 << random.randrange(8) if value is None else value]) + old[at + 1:]


def byte_cases(old):
    """By kind: all changes of the file's bytes."""
    pages = range(0, len(old), PAGE)
    values = [None, 0, 2, 0xff]
    several = lambda at: flipped(flipped(old, at), random.randrange(len(old)))
    return {
        "file header": [lambda at=at, v=v: flipped(old, at, v) for at in range(100) for v in values],
        "page header": [lambda at=at + (100 if at == 0 else 0) + n, v=v: flipped(old, at, v)
                        for at in pages for n in range(12) for v in values],
        "page of zeros": [lambda at=at: old[:at] + bytes(PAGE) + old[at + PAGE:] for at in pages],
        "page of noise": [lambda at=at: old[:at] + random.randbytes(PAGE) + old[at + PAGE:] for at in pages],
        "page twice": [lambda at=at: old[:at] + old[PAGE:2 * PAGE] + old[at + PAGE:] for at in pages],
        "end": [lambda at=at: old[:at] for at in [1, 16, 99, 100, 512, *pages[1:], *(at + 7 for at in pages)]],
        "one bit": [lambda at=at: flipped(old, at) for at in range(len(old))],
        "several bits": [lambda at=at: several(at) for at in range(len(old))],
    }


def any_of(old):
    """Bytes of a record that are wrong by a little: one changed, lost or doubled, or a value of another kind."""
    at = random.randrange(len(old))
    if random.randrange(2):
        return old[:at] + random.choice([b"", old[at:at + 1] * 2, random.randbytes(1)]) + old[at + 1:]
    record = decoded(old)
    place = record
    while True:
        key = random.choice(list(place) if isinstance(place, dict) else range(len(place)))
        if not isinstance(place[key], (dict, list)) or not place[key] or not random.randrange(4):
            break
        place = place[key]
    place[key] = random.choice([None, True, -1, 0, 2**31, 2**62, 1e300, "", "x", "\u00e4" * 300, [], {}, [{}],
                                {"x": []}])
    return encoded(record)[1]


def change_row(path):
    with contextlib.closing(sqlite3.connect(path)) as database, database:
        database.text_factory = bytes
        number, record = random.choice(database.execute("SELECT id, record FROM object").fetchall())
        if random.randrange(4):
            column, value = "record", any_of(record)
        else:
            column = random.choice(["parent", "kind"])
            value = random.choice([-1, 0, 1, number, number + 1, 3, 2**62])
        database.execute(f"UPDATE OR REPLACE object SET {column} = ? WHERE id = ?", (value, number))


def change_journal(path):
    kind = random.choice(["-journal", "-journal", "-wal", "-shm"])
    begin = random.choice([b"", bytes.fromhex("d9d505f920a163d7"), bytes.fromhex("377f0682002de218")])
    with open(path + kind, "wb") as file:
        file.write(begin + random.randbytes(random.choice([0, 1, 20, 512, 9000])))


def judge(what, host, line, changes=False):
    """Runs the line, and holds against its outcome what holds for all."""
    with open(host.database, "rb") as file:
        before, number = file.read(), os.fstat(file.fileno()).st_ino
        done = host.run("--trace " + line)
        shown = (what, done)
        # 4 where a command has no handler for the library's refusal of a value that is none any more.
        check(done.returncode in (0, 1, 3) or done.returncode == 4 and "! NodeCtlException: " in done.stderr, *shown)
        check("anitizer" not in done.stderr and "runtime error" not in done.stderr, *shown)
        reports = done.stderr.splitlines()
        check(done.returncode == 0 or reports, *shown, "not a word")
        for report in reports:
            check("damaged" not in report or host.database in report, *shown, "not named")
            check("exception." not in report, *shown, "no words for an administrator")
        check(os.stat(host.database).st_ino == number, *shown, "another file")
        file.seek(0)
        check(changes or file.read() == before or "journal" in what, *shown, "changed")
    return done


def main():
    random.seed(SEED)
    description = json.loads(read(os.path.join(SOURCE, "hosts/demo.json")))
    for adapter in description["adapters"]:
        adapter["alias"] = MARK
    host = Host(description)
    old = contents(host.root)[host.database]

    def write(changed):
        with open(host.database, "wb") as file:
            file.write(changed)

    kinds = {kind: [lambda case=case: write(case()) for case in cases] for kind, cases in byte_cases(old).items()}
    kinds["row"] = [lambda: change_row(host.database)] * 3 * CASES
    kinds["journal"] = [lambda: change_journal(host.database)] * CASES
    for kind, cases in kinds.items():
        outcomes = {"shown": 0, "refused": 0}
        cases = random.sample(cases, min(len(cases), 3 * CASES if kind == "row" else CASES))
        for number, change in enumerate(cases):
            for name in beside(host.database):
                os.remove(os.path.join(os.path.dirname(host.database), name))
            write(old)
            change()
            what = f"{kind}, case {number}"
            sound = is_sound(host.database)
            shown = judge(what, host, SHOW)
            if shown.returncode == 0:
                outcomes["shown"] += 1
                check(sound, what, "is damaged, and shown as if it were not", shown)
                check(shown.stdout.count(MARK) >= len(description["adapters"]) - 1, what, "another host", shown)
            else:
                outcomes["refused"] += 1
                check(host.database in shown.stderr, what, "not named", shown)
            judge(what, host, random.choice(READ))
            # A login that fails is a result that is kept, too.
            written = judge(what, host, random.choice(WRITE), changes=sound)
            check(sound or written.returncode == 1, what, "is damaged, and written to", written)
        print(f"{kind}: {len(cases)} cases, {outcomes}")


main()
