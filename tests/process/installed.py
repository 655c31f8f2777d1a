"""An installed tree works wherever it is moved to: programs, libraries, plug-ins and host descriptions find each other."""

import json
import os
import tempfile

from support.program import check, run

with tempfile.TemporaryDirectory(prefix="hcli installed ") as folder:
    installed, moved, root = (os.path.join(folder, name) for name in ("installed", "moved away", "root"))
    done = run("cmake", "--install", os.environ["HCLI_BUILD_DIR"], "--prefix", installed)
    check(done.returncode == 0, done.stderr)
    os.rename(installed, moved)
    os.mkdir(root)
    hcli = os.path.join(moved, "bin", "hcli")

    catalogue = run(hcli, "catalogue", "--output", "json", HCLI_ROOT=root)
    paths = {node["path"] for node in json.loads(catalogue.stdout)["result"]}
    for path in "iscsi adapter list", "simulator load", "catalogue":
        check(path in paths, f"no '{path}' in the catalogue; standard error: {catalogue.stderr}")

    adapters = run(hcli, "iscsi", "adapter", "list", "--output", "json", HCLI_ROOT=root)
    check(adapters.returncode == 0 and json.loads(adapters.stdout)["result"], adapters)
    check(adapters.stderr == "", adapters.stderr)
    check(os.path.exists(os.path.join(root, "var/lib/tessaro/host.db")), "the host was not kept below HCLI_ROOT")

    # Nothing in the tree may lead back to where it was built.
    for path, _, names in os.walk(moved):
        for file in (os.path.join(path, name) for name in names):
            check(not os.path.islink(file), f"{file} is a link to {os.path.realpath(file)}")
