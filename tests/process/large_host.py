"""scripts/make-large-host writes a host of the size that was asked for, and refuses what is no size."""

import json
import os
import subprocess
import sys
import tempfile

SCRIPT = os.path.join(os.environ["HCLI_SOURCE_DIR"], "scripts/make-large-host")


def run(*words, text=""):
    return subprocess.run(words, input=text, capture_output=True, text=True, timeout=120)


with tempfile.TemporaryDirectory(prefix="hcli large ") as root:
    os.environ["HCLI_ROOT"] = root
    made = run(SCRIPT, "3", "300", "2")
    loaded = run(os.environ["HCLI_BIN"], "simulator", "load", "-", text=made.stdout)
    if loaded.stdout != "true\n":
        sys.exit(f"load: {loaded}")
    for rows, words in ((3, ["adapter"]), (900, ["adapter", "target"]), (1800, ["session"]),
                        (1800, ["session", "connection"])):
        listed = run(os.environ["HCLI_BIN"], "iscsi", *words, "list", "--output", "json")
        found = {json.dumps(row) for row in json.loads(listed.stdout)["result"]}
        if len(found) != rows:
            sys.exit(f"{words}: {len(found)} different rows, not {rows}: {listed.stderr}")
    # The network behind it is there, too: a reboot brings one session with each target back.
    rebooted = run(os.environ["HCLI_BIN"], "simulator", "reboot")
    listed = run(os.environ["HCLI_BIN"], "iscsi", "session", "list", "--output", "json")
    if rebooted.stdout != "true\n" or len(json.loads(listed.stdout)["result"]) != 900:
        sys.exit(f"reboot: {rebooted}")
    for words in ("x",), ("-1",), ("65536",), ("1", "2", "3", "4"):
        refused = run(SCRIPT, *words)
        if refused.returncode == 0 or refused.stdout or not refused.stderr:
            sys.exit(f"{words}: {refused}")
