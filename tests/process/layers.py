"""The arrows between the folders run downward only: each folder includes what its row allows, and nothing else."""

import os
import re
import sys

SOURCE = os.environ["HCLI_SOURCE_DIR"]
# folder: the folders that it may include from, and the libraries beyond the standard one
FRAMEWORK = ["contracts/Plinth"]
LIBRARY = ["contracts/NodeCtl", "contracts/CoreCtl", "contracts/ima", "contracts/text", "platform/host"]
BOOST = ["boost/shared_ptr.hpp", "boost/enable_shared_from_this.hpp"]
RULES = {
    "contracts": (["contracts"], BOOST),
    "plugins/iscsi": (["contracts", "plugins/iscsi"], BOOST),
    "platform/plinth": (FRAMEWORK + ["platform/plinth"], BOOST),
    "platform/hcli": (FRAMEWORK + ["platform/plinth", "platform/hcli"], BOOST),
    "platform/host": (LIBRARY, ["sqlite3.h", "nlohmann/"]),
    "platform/corectl": (LIBRARY + ["platform/corectl"], []),
    "platform/ima": (LIBRARY + ["platform/ima"], []),
    "platform/simulator": (FRAMEWORK + ["platform/host", "platform/simulator"], BOOST),
}
ROOTS = ["contracts", "platform", "plugins/iscsi", ""]
LIBRARIES = re.compile(r"boost/|nlohmann/|sqlite3|gtest/|gmock/|benchmark/")
INCLUDE = re.compile(r'\s*#\s*include\s*[<"]([^>"]+)[>"]')


def sources(folder):
    for path, _, names in os.walk(os.path.join(SOURCE, folder)):
        for name in sorted(names):
            if name.endswith((".h", ".cpp")):
                yield os.path.relpath(os.path.join(path, name), SOURCE)


def meant(including, name):
    """The project's files that an include may mean: beside the including file, or below an include root."""
    places = [os.path.dirname(including)] + ROOTS
    files = {os.path.normpath(os.path.join(place, name)) for place in places}
    return [file for file in files if os.path.isfile(os.path.join(SOURCE, file))]


def faults():
    for folder, (allowed, libraries) in RULES.items():
        files = list(sources(folder))
        if not files:
            yield f"{folder}: no sources found"
        for file in files:
            for number, line in enumerate(open(os.path.join(SOURCE, file), encoding="utf-8"), 1):
                if folder in ("platform/plinth", "platform/hcli") and "iscsi" in line.lower():
                    yield f"{file}:{number}: the framework must know nothing of what its plug-ins manage"
                include = INCLUDE.match(line)
                if not include:
                    continue
                name = include.group(1)
                found = meant(file, name)
                if found and not any(f.startswith(a + "/") for f in found for a in allowed):
                    yield f"{file}:{number}: includes {found[0]}; {folder} may use {', '.join(allowed)}"
                if not found and LIBRARIES.match(name) and not any(name.startswith(l) for l in libraries):
                    yield f"{file}:{number}: includes {name}, which {folder} does not use"


found = list(faults())
print("\n".join(found) or "every include points downward")
sys.exit(1 if found else 0)
