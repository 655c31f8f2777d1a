"""Every command of docs/tutorial.md, run in order on a new host, says what the page shows.

HCLI_WRITE_DOCS=1 writes what they say into the page.
"""

import os
import re
import subprocess
import sys
import tempfile

from support.program import HCLI, SOURCE, check, expect_file, read

PAGE = os.path.join(SOURCE, "docs/tutorial.md")
TIME = re.compile(r"\d\d/\d\d/\d\d \d\d:\d\d:\d\d")
MASK = "MM/DD/YY hh:mm:ss"  # the page says so too


def shown(command, environment):
    done = subprocess.run(["sh", "-c", command], stdin=subprocess.DEVNULL, stdout=subprocess.PIPE,
                          stderr=subprocess.STDOUT, text=True, env=environment, timeout=60)
    output = TIME.sub(MASK, done.stdout)
    return output if output.endswith("\n") or not output else output + "\n"


def block(text, environment):
    """A block of the page, as it should be: each command with its output, the commands as they are."""
    commands = [line[2:] for line in text.splitlines() if line.startswith("$ ")]
    return "".join(f"$ {command}\n{shown(command, environment)}" for command in commands)


page = read(PAGE)
with tempfile.TemporaryDirectory(prefix="hcli tutorial ") as root:
    path = os.path.dirname(HCLI) + os.pathsep + os.environ["PATH"]
    environment = {**os.environ, "PATH": path, "HCLI_ROOT": root, "COLUMNS": "120"}
    parts = re.split(r"(?ms)^(```console\n)(.*?)(?=^```$)", page)
    check(len(parts) > 3, f"{PAGE} has no block of commands")
    for i in range(2, len(parts), 3):
        parts[i] = block(parts[i], environment)
    run = "".join(parts)
sys.exit(expect_file(PAGE, run, os.environ.get("HCLI_WRITE_DOCS")) or 0)
