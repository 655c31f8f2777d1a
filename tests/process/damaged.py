"""Whatever stands in the database's place or keeps it from being written: a text that names the file, and no change."""

import os
import resource
import shutil
import sqlite3
import subprocess

from support.program import HCLI, Host, check

# Commands have texts of their own for what fails below them; the trace has the reason.
READ, WRITE = "--trace iscsi adapter list", "--trace iscsi adapter set -A hba2 -a other"


def rewritten(path, change):
    with open(path, "rb") as file:
        bytes_ = file.read()
    with open(path, "wb") as file:
        file.write(change(bytes_))


def sql(path, *statements):
    with sqlite3.connect(path) as database:
        for statement in statements:
            database.execute(statement)
    database.close()


def to_link(path):
    os.rename(path, path + ".other")
    os.symlink(path + ".other", path)


def to_folder(path):
    os.remove(path)
    os.mkdir(path)


# What is done to the file, and what the text says of it.
DAMAGES = {
    "a text": (lambda path: rewritten(path, lambda _: b"#!/bin/sh\nexit 1\n" * 900), "is damaged: file is not a database"),
    "zeros": (lambda path: rewritten(path, lambda old: bytes(len(old))), "is damaged: file is not a database"),
    "the first half": (lambda path: rewritten(path, lambda old: old[: len(old) // 2]), "is damaged: "),
    "the first page": (lambda path: rewritten(path, lambda old: old[:4096]), "is damaged: "),
    "nothing": (lambda path: rewritten(path, lambda _: b""), "is damaged: it is empty"),
    "zeroed behind the first page": (lambda path: rewritten(path, lambda old: old[:4096] + bytes(len(old) - 4096)),
                                     "is damaged: "),
    "another program's database": (lambda path: (os.remove(path), sql(path, "CREATE TABLE mine(x)")),
                                   "is not a host database"),
    "a newer version": (lambda path: sql(path, "PRAGMA user_version=99"), "belongs to a newer version of this program"),
    "no version": (lambda path: sql(path, "PRAGMA user_version=0"), "is damaged: it has no schema version"),
    "records that are none": (lambda path: sql(path, "UPDATE object SET record = '[]'"), "is damaged: a record is not"),
    "records without keys": (lambda path: sql(path, "UPDATE object SET record = '{}'"), "is damaged: a record has nothing"),
    "a link": (to_link, "is a symbolic link"),
    "a folder": (to_folder, "is not a regular file"),
}


def contents(folder):
    """Every file below, with its bytes."""
    found = {}
    for path, _, names in os.walk(folder):
        for name in names:
            file = os.path.join(path, name)
            found[file] = os.readlink(file) if os.path.islink(file) else open(file, "rb").read()
    return found


def refused(case, done, *texts):
    """A report and no result."""
    missing = [text for text in texts if text not in done.stderr]
    check(done.returncode == 1 and not done.stdout and not missing, f"{case}: expected {missing}", done)


def damaged():
    for case, (damage, text) in DAMAGES.items():
        host = Host()
        host.show()
        damage(host.database)
        before = contents(host.root)
        for line in READ, WRITE:
            refused(f"{case}, {line}", host.run(line), host.database, text)
            check(contents(host.root) == before, f"{case}: {line} has changed the files")


# Runs in a mount namespace of its own: what is mounted there is seen by nobody else, and goes with it. The file's
# folder becomes a small file system that holds nothing but the file.
MOUNTED = """
set -e
file=$1 contents=$2 size=$3 options=$4; shift 4
folder=$(dirname "$file")
mount -t tmpfs -o size=$size,mode=700 none "$folder"
if [ -n "$contents" ]; then cat "$contents" > "$file"; fi
if [ -n "$options" ]; then mount -o remount,$options "$folder"; fi
status=0; "$@" || status=$?
if [ -n "$contents" ]; then
  cmp "$contents" "$file" >&2 || exit 99
  "$1" simulator show > /dev/null || exit 97
fi
[ "$(ls -A "$folder")" = "${contents:+$(basename "$file")}" ] || { ls -A "$folder" >&2; exit 98; }
exit $status
"""
NAMESPACES = [["unshare", "--mount"], ["unshare", "--map-root-user", "--mount"]]


def mounts():
    """The way to a mount namespace that works here, or None."""
    for way in NAMESPACES:
        try:
            if subprocess.run([*way, "mount", "-t", "tmpfs", "none", "/mnt"], capture_output=True).returncode == 0:
                return way
        except FileNotFoundError:
            return None
    return None


def unwritable(way):
    host = Host()
    host.show()
    copy = os.path.join(host.root, "copy")
    shutil.copy(host.database, copy)
    kibibytes = os.path.getsize(copy) // 1024
    big = os.path.join(host.root, "big.json")
    with open(big, "w", encoding="utf-8") as file:
        adapters = ", ".join(f'{{"name": "hba{number}"}}' for number in range(200))
        file.write(f'{{"adapters": [{adapters}]}}')

    def run(line, contents, size, options="", file=host.database):
        words = ["sh", "-c", MOUNTED, "sh", file, contents, size, options, HCLI, *line.split()]
        return subprocess.run([*way, *words], capture_output=True, text=True, env=host.environment(), timeout=60)

    done = run(READ, copy, "1m", "ro")
    check(done.returncode == 0 and "hba2" in done.stdout, "reading where nothing can be written", done)
    # case: its line, whether there is a database already, size and options of the file system, the reason told
    cases = {
        "read-only, a change": (WRITE, True, "1m", "ro", "cannot be written: it is read-only"),
        "read-only, a load": (f"simulator load {big}", True, "1m", "ro", "cannot be written: it is read-only"),
        "read-only, a first run": (READ, False, "1m", "ro", "cannot be written: Read-only file system"),
        "full, a load": (f"simulator load {big}", True, f"{kibibytes + 24}k", "", "cannot be written: No space left on device"),
        "full, a change": (WRITE, True, f"{kibibytes}k", "", "No space left on device"),
        "full, a first run": (READ, False, "8k", "", "cannot be written: No space left on device"),
    }
    for case, (line, exists, size, options, text) in cases.items():
        refused(case, run(line, copy if exists else "", size, options), host.database, text)

    names = os.path.join(host.root, "etc/tessaro/coreiscsid/initiatorname.iscsi")
    os.makedirs(os.path.dirname(names))
    kept = os.path.join(host.root, "kept")
    with open(kept, "w", encoding="utf-8") as file:
        file.write("# kept\nInitiatorName=iqn.2026-11.org.example:old\n")
    cases = {
        "read-only, a name": (True, "1m", "ro", "Read-only file system"),
        "read-only, a first name": (False, "1m", "ro", "Read-only file system"),
        "full, a name": (True, "4k", "", "No space left on device"),
        "full, a first name": (False, "4k,nr_inodes=1", "", "No space left on device"),
    }
    for case, (exists, size, options, text) in cases.items():
        done = run("iscsi software set --enabled true --name iqn.2026-11.org.example:new", kept if exists else "", size,
                   options, names)
        refused(case, done, f"The file {names} cannot be written: {text}.")


def limited():
    """A limit to the size of files is a full disk, and no signal."""
    host = Host()
    host.show()
    big = os.path.join(host.root, "big.json")
    with open(big, "w", encoding="utf-8") as file:
        file.write(f'{{"adapters": [{{"name": "x", "alias": "{"x" * 200000}"}}]}}')
    before = contents(host.root)
    for line, most in (f"simulator load {big}", os.path.getsize(host.database)), (WRITE, 1024):
        done = host.run(line, preexec_fn=lambda: resource.setrlimit(resource.RLIMIT_FSIZE, (most, most)))
        refused(f"limited to {most} bytes, {line}", done, host.database, "File too large")
        check(contents(host.root) == before, f"limited to {most} bytes: {line} has changed the files")


def full_output():
    """A result that cannot be written is a failure, and the change that it tells of stands."""
    host = Host()
    with open("/dev/full", "w") as full:
        done = host.run(WRITE, stdout=full)
    check(done.returncode == 4 and "No space left on device" in done.stderr, done)
    check(host.show()["adapters"][2]["alias"] == "other", "the change is lost")


damaged()
limited()
full_output()
way = mounts()
if way:
    unwritable(way)
else:
    print("left out, for no file system can be mounted here: read-only and full ones")
