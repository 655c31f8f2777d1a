"""A database of an earlier version: the same host, whole, or the old database where it cannot be converted."""

import contextlib
import json
import os
import random
import resource
import sqlite3
import time

from support.program import SOURCE, Host, beside, check, contents, finished, is_sound, read, refused
from support.records import nested

OLD = os.path.join(SOURCE, "tests/golden/host-version-1")
SHOW = "simulator show --secrets"
SEED = 20261123


def sql(path, script):
    with contextlib.closing(sqlite3.connect(path)) as database:
        database.executescript(script)


def version(path):
    with contextlib.closing(sqlite3.connect(path)) as database:
        return database.execute("PRAGMA user_version").fetchone()[0]


def old_host(script=""):
    host = Host()
    os.makedirs(os.path.dirname(host.database))
    sql(host.database, read(OLD + ".sql") + script)
    os.chmod(host.database, 0o600)
    return host


now = Host(json.loads(read(OLD + ".json"))).succeed(SHOW)


def converted():
    host = old_host("UPDATE sqlite_sequence SET seq = 1000")
    host.succeed("iscsi adapter list")
    check(host.succeed(SHOW) == now, "another host", host.succeed(SHOW))
    check(version(host.database) > 1 and is_sound(host.database) and not beside(host.database), "not whole")
    check(os.stat(host.database).st_mode & 0o777 == 0o600, "its mode has become another")
    with contextlib.closing(sqlite3.connect(host.database)) as database:
        check(database.execute("SELECT seq FROM sqlite_sequence").fetchall() == [(1000,)], "ids would be used again")


def kept():
    """Where it cannot be converted nothing changes, and the text names the reason."""
    deep = "'" + '{"a":' * 50000 + "1" + "}" * 50000 + "'"
    for change, text in {
        f"UPDATE object SET record = {deep} WHERE id = 41": "is damaged: a record is nested too deeply.",
        "UPDATE object SET record = '[]' WHERE id = 48": "is damaged: a record is not a JSON object.",
    }.items():
        host = old_host(change)
        before = contents(host.root)
        refused(text, host.run(SHOW), host.database, text)
        check(contents(host.root) == before, text, "the files have changed")
    host = old_host()
    before, size = contents(host.root), os.path.getsize(host.database)
    full = host.run(SHOW, preexec_fn=lambda: resource.setrlimit(resource.RLIMIT_FSIZE, (size, size)))
    refused("no room", full, host.database, "File too large")
    check(contents(host.root) == before, "no room: the files have changed")
    check(host.succeed(SHOW) == now, "not converted once there is room")


def killed():
    random.seed(SEED)
    begin = time.monotonic()
    old_host().succeed(SHOW)
    longest, seen = time.monotonic() - begin, {1: 0, 2: 0}
    while sum(seen.values()) < 40 or not all(seen.values()):
        host = old_host()
        process = host.start(SHOW, env=host.environment(ASAN_OPTIONS="detect_leaks=0"))
        time.sleep(random.uniform(0, longest))
        process.kill()
        finished(process)
        # A journal that was left is played back by who opens the file next.
        seen[version(host.database)] += 1
        check(is_sound(host.database), "the database is damaged")
        check(host.succeed(SHOW) == now, "another host")
    print(f"killed: {seen[1]} not converted, {seen[2]} converted")


def nested_deep():
    host = Host({})
    with contextlib.closing(sqlite3.connect(host.database)) as database, database:
        database.execute("UPDATE object SET record = ?", (nested(50000),))
    refused("nested deep", host.run(SHOW), host.database, "is damaged: a record is nested too deeply.")


converted()
kept()
killed()
nested_deep()
