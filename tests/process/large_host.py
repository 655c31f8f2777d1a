"""scripts/make-large-host writes a host of the size that was asked for, and refuses what is no size."""

import json
import os

from support.program import SOURCE, Host, check, run

SCRIPT = os.path.join(SOURCE, "scripts/make-large-host")

host = Host(json.loads(run(SCRIPT, "3", "300", "2").stdout))
for rows, what in (3, "adapter"), (900, "adapter target"), (1800, "session"), (1800, "session connection"):
    found = {json.dumps(row) for row in host.result(f"iscsi {what} list")}
    check(len(found) == rows, f"{what}: {len(found)} different rows, not {rows}")
# The network behind it is there, too: a reboot brings one session with each target back.
host.succeed("simulator reboot")
check(len(host.result("iscsi session list")) == 900, "the reboot has lost sessions")
for words in ("x",), ("-1",), ("65536",), ("1", "2", "3", "4"):
    refused = run(SCRIPT, *words)
    check(refused.returncode != 0 and not refused.stdout and refused.stderr, words, refused)
