"""The arrows between the folders run downward only: each folder includes what its row allows, and nothing else."""

import glob
import os
import re

from support.program import SOURCE, check, read

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


def meant(including, name):
    """The project's files that an include may mean: beside the including file, or below an include root."""
    places = [os.path.dirname(including)] + ROOTS
    files = {os.path.normpath(os.path.join(place, name)) for place in places}
    return [file for file in files if os.path.isfile(os.path.join(SOURCE, file))]


def faults():
    for folder, (allowed, libraries) in RULES.items():
        files = glob.glob(f"{folder}/**/*.h", root_dir=SOURCE, recursive=True)
        files += glob.glob(f"{folder}/**/*.cpp", root_dir=SOURCE, recursive=True)
        check(files, f"{folder}: no sources found")
        for file in files:
            for number, line in enumerate(read(os.path.join(SOURCE, file)).splitlines(), 1):
                if folder in ("platform/plinth", "platform/hcli") and "iscsi" in line.lower():
                    yield f"{file}:{number}: the framework must know nothing of what its plug-ins manage"
                include = INCLUDE.match(line)
                name = include.group(1) if include else ""
                found = meant(file, name)
                if found and not any(f.startswith(a + "/") for f in found for a in allowed):
                    yield f"{file}:{number}: includes {found[0]}; {folder} may use {', '.join(allowed)}"
                if not found and LIBRARIES.match(name) and not name.startswith(tuple(libraries)):
                    yield f"{file}:{number}: includes {name}, which {folder} does not use"


found = list(faults())
check(not found, *found)
