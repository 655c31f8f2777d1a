"""scripts/run, on a project so small that building it takes no time: what it says and where, and what it leaves."""

import os
import shutil
import subprocess
import tempfile

from support.program import SOURCE, check, finished, write

LISTS = """cmake_minimum_required(VERSION 3.25)
project(small LANGUAGES NONE)
add_custom_command(OUTPUT bin/hcli DEPENDS ${PROJECT_SOURCE_DIR}/hcli
  COMMAND sh -n ${PROJECT_SOURCE_DIR}/hcli
  COMMAND ${CMAKE_COMMAND} -E copy ${PROJECT_SOURCE_DIR}/hcli bin/hcli VERBATIM)
add_custom_target(all-of-it ALL DEPENDS bin/hcli)
"""
PRESETS = """{"version": 6, "configurePresets": [
  {"name": "release", "generator": "Ninja", "binaryDir": "${sourceDir}/build/release"}]}
"""
PROGRAM = '#!/bin/sh\necho "root $HCLI_ROOT"\nprintf "%s|" "$@"\nexit 3\n'


def start(tree, *words, **environment):
    clean = {name: value for name, value in os.environ.items() if name != "HCLI_ROOT"}
    return subprocess.Popen([os.path.join(tree, "scripts/run"), *words], cwd="/", text=True, stdout=subprocess.PIPE,
                            stderr=subprocess.PIPE, env={**clean, "HCLI_NO_SETUP": "1", **environment})


def expect(name, process, status, out, err):
    """Standard output is held against `out` to the letter; standard error needs to have `err` in it."""
    done = finished(process)
    check((done.returncode, done.stdout) == (status, out) and err in done.stderr and bool(err) == bool(done.stderr), name, done)


with tempfile.TemporaryDirectory(prefix="hcli with blanks ") as folder:
    tree = os.path.join(os.path.realpath(folder), "a tree")
    shutil.copytree(os.path.join(SOURCE, "scripts"), os.path.join(tree, "scripts"))
    program = os.path.join(tree, "hcli")
    write(os.path.join(tree, "CMakeLists.txt"), LISTS)
    write(os.path.join(tree, "CMakePresets.json"), PRESETS)
    write(program, PROGRAM)
    os.chmod(program, 0o755)
    own_root = f"root {tree}/build/root\n"

    both = start(tree, "first"), start(tree, "second")
    done = [finished(process) for process in both]
    check([each.stdout for each in done] == [own_root + "first|", own_root + "second|"], "two first runs at once", done)
    check([bool(each.stderr) for each in done].count(True) == 1, "one of the two should have said that it builds", done)

    expect("arguments as given", start(tree, "", "a b", "--x=*"), 3, own_root + "|a b|--x=*|", "")
    given = os.path.join(folder, "given")
    expect("a root of the caller's", start(tree, HCLI_ROOT=given), 3, f"root {given}\n|", "")

    write(program, PROGRAM.replace("exit 3", "exit 4"))
    expect("an edit is built", start(tree, "x"), 4, own_root + "x|", "")
    write(program, "if\n")
    expect("a failed build runs nothing", start(tree, "x"), 1, "", "FAILED: bin/hcli")

    write(os.path.join(tree, "scripts/packages"), "run no-such-package-as-this\n")
    os.mkdir(os.path.join(folder, "bin"))
    for tool in "bash", "dirname", "readlink", "mkdir", "flock", "sed", "xargs", "sort":
        os.symlink(shutil.which(tool), os.path.join(folder, "bin", tool))
    expect("a system without packages", start(tree, HCLI_NO_SETUP="", PATH=os.path.join(folder, "bin")), 1, "",
           "no-such-package-as-this")
