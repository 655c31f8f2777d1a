"""Help in each of its forms, and the keys of parameters in it, which it asks the host for."""

import contextlib
import os
import sqlite3
import time

from support.program import Host, check

KEYS = 'One of what "hcli iscsi adapter param get" shows as Name'
HELP = "help iscsi adapter param set --output json"

new, demo = Host(), Host()
for node in demo.result("catalogue"):
    if node["path"] != "help":
        before, behind = demo.run(f"help {node['path']}"), demo.run(f"{node['path']} --help")
        check((before.stdout, before.returncode) == (behind.stdout, 0), before, behind)
check(demo.succeed("help") == demo.succeed("--help") and demo.succeed("-V") == demo.succeed("--version"), "help, -V")
check(demo.succeed("help iscsi -h") == demo.succeed("iscsi"), "help twice")
check(demo.succeed("explain") == demo.succeed("explain -h"), "explain alone")


def text(host, line=HELP):
    """What help shows, its lines put together again."""
    return " ".join(host.result(line.removesuffix(" --output json")).split())


for adapter in ("hba1", "hba2"):
    keys = ", ".join(row["Name"] for row in demo.result(f"iscsi adapter param get -A {adapter}"))
    shown = text(demo, f"iscsi adapter param set -A {adapter} --help")
    check(f"{KEYS}: {keys}." in shown, shown)
check(f"{KEYS}: ErrorRecoveryLevel" in text(new) and not os.listdir(new.root), "help made a host", os.listdir(new.root))
with contextlib.closing(sqlite3.connect(demo.database)) as other:
    other.execute("BEGIN EXCLUSIVE")
    begin = time.monotonic()
    check(f"{KEYS}. " in text(demo) and time.monotonic() - begin < 10, "help waited for the host")
