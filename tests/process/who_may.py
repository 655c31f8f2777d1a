"""Whose the host's files are, what stands in their place and is not followed, and which plug-ins root runs."""

import os
import shutil
import stat

from support.program import (DENIED, HCLI, NAME_FILE, READ, SET_NAME, WRITE, Host, beside, check, contents, refused,
                             write)

# Where every user can run it.
TREE = Host()
os.chmod(TREE.root, 0o755)
for part in "bin", "lib":
    shutil.copytree(os.path.join(os.path.dirname(os.path.dirname(HCLI)), part), os.path.join(TREE.root, part),
                    ignore=shutil.ignore_patterns("hcli-*"))
PROGRAM = os.path.join(TREE.root, "bin/hcli")


def mode(path):
    return stat.S_IMODE(os.stat(path).st_mode)


def masks():
    """What is made is its owner's alone, and its folders can be used, whatever the caller's umask."""
    for mask in 0, 0o022, 0o077, 0o277, 0o777:
        # As somebody whom modes concern.
        for user in (None, 4321) if os.geteuid() == 0 else (None,):
            host = Host()
            if user is not None:
                os.chown(host.root, user, -1)
            for line in SET_NAME, WRITE, SET_NAME:
                done = host.run(line, umask=mask, user=user, executable=PROGRAM)
                check(done.returncode == 0, f"umask {mask:o}, user {user}", done)
            for path in host.database, host.names:
                check(mode(path) == 0o600, f"umask {mask:o}, user {user}: {path} has mode {mode(path):o}")
                folder = os.path.dirname(path)
                check(mode(folder) == 0o755 & ~mask | 0o700, f"umask {mask:o}: {folder} has mode {mode(folder):o}")
                check(not beside(path), f"umask {mask:o}, user {user}: left {beside(path)}")


def kept():
    """The file of the initiator's name stays whose it was, also where others may read and write it."""
    host = Host()
    host.succeed(SET_NAME)
    owner = 4321 if os.geteuid() == 0 else os.geteuid()
    os.chown(host.names, owner, -1)
    os.chmod(host.names, 0o646)
    host.succeed(SET_NAME + "2")
    check((mode(host.names), os.stat(host.names).st_uid) == (0o646, owner), "another owner or mode", os.stat(host.names))


def taken_back():
    """What a copy or another program has opened to others is its owner's alone again."""
    host = Host()
    host.show()
    journal = host.database + "-journal"
    write(journal, "")
    for path in host.database, journal:
        os.chmod(path, 0o664)
    host.succeed("iscsi adapter list")
    check(mode(host.database) == mode(journal) == 0o600, "modes", mode(host.database), mode(journal))


def modes():
    """Whom a file's mode keeps out is told so, and makes nothing."""
    host = Host()
    host.show()
    os.chmod(host.root, 0o755)
    nobody = {"user": 65534, "executable": PROGRAM}
    for mode_, line, text in (0o600, READ, "opened: Permission denied"), (0o644, WRITE, "written: it is read-only"):
        os.chmod(host.database, mode_)
        refused(f"mode {mode_:o}", host.run("--exit-codes " + line, **nobody), f"{host.database} cannot be {text}",
                status=DENIED)
    host.succeed("iscsi adapter list", **nobody)
    os.remove(host.database)
    refused("a folder of others", host.run(READ, **nobody), f"{host.database} cannot be written: Permission denied")
    check(not os.path.exists(host.database), "a host in the folder of others")


FOLLOWED = "is a symbolic link, and that is not followed."
# What stands in a file's place, and what the text says of it.
STRANGERS = {
    "a link": (lambda path, target: os.symlink(target, path), FOLLOWED),
    "a link to nowhere": (lambda path, target: os.symlink(target + ".nowhere", path), FOLLOWED),
    "a pipe": (lambda path, target: os.mkfifo(path), "is not a regular file."),
    "a folder": (lambda path, target: os.mkdir(path), "is not a regular file."),
}
# The file, and the command lines that would use it.
PLACES = {
    "var/lib/tessaro/host.db": [READ, WRITE, "simulator reset"],
    "var/lib/tessaro/host.db-journal": [READ, WRITE],
    "var/lib/tessaro/host.db-wal": [READ, WRITE],
    "var/lib/tessaro/host.db-shm": [READ, WRITE],
    NAME_FILE: [SET_NAME, "iscsi software set --enabled true"],
    os.path.join(os.path.dirname(NAME_FILE), ".initiatorname.iscsi.new"): [SET_NAME],
}


def strangers():
    for place, lines in PLACES.items():
        for case, (put, text) in STRANGERS.items():
            host = Host()
            for line in SET_NAME, "iscsi software set --enabled false", "simulator reboot":
                host.succeed(line)
            path, target = os.path.join(host.root, place), os.path.join(host.root, "target")
            if os.path.exists(path):
                os.rename(path, target)
            else:
                shutil.copy(host.database, target)
            put(path, target)
            before = contents(host.root)
            for line in lines:
                refused(f"{case} at {place}", host.run(line), f"{path} {text}")
                check(contents(host.root) == before, f"{case} at {place}: {line} has changed the files")


def linked_folder():
    """The way to the host's files may lead over a link."""
    host = Host()
    link = os.path.join(host.root, "link")
    os.symlink(host.root, link)
    for line in SET_NAME, "iscsi adapter set -A hba2 -a other":
        host.succeed(line, env=host.environment(HCLI_ROOT=link))
    check(host.show()["adapters"][2]["alias"] == "other", "another host over the link")


def lone_journal():
    """What is left of a host is not taken for none."""
    host = Host()
    host.show()
    os.rename(host.database, host.database + "-journal")
    refused("a lone journal", host.run(READ), f"its journal {host.database}-journal is still there: put the database "
            "back, or remove the journal for a new host.")
    check(not os.path.exists(host.database), "a new host beside an old journal")


def plugins():
    """Root runs no code of others; without being told, the program's own folder is not judged."""
    host, line = Host(), "iscsi adapter --help"
    folder = os.path.join(TREE.root, "lib/hcli/plugins")
    file = os.path.join(folder, "iscsi.so")
    others = "others can write to it, its mode is "
    for path, mode_, owner, text in (
            (folder, 0o775, 0, others + "0775"), (folder, 0o1777, 0, others + "1777"),
            (folder, 0o755, 4321, "it belongs to user 4321"),
            (file, 0o646, 0, others + "0646"), (file, 0o644, 4321, "it belongs to user 4321")):
        host.succeed(f"--plugins {folder} {line}")
        before = mode(path)
        os.chown(path, owner, 0)
        os.chmod(path, mode_)
        what = f'the plug-in folder "{folder}"' if path == folder else f'plug-in "{file}"'
        expected = f"hcli: {what} is left out: {text}; run by root, it has to belong to root and be writable by root alone\n"
        for done in host.run(line, env=host.environment(HCLI_PLUGINS=folder)), host.run(f"--plugins {folder} {line}"):
            check(done.returncode == 2 and done.stderr.startswith(expected), "expected", expected, done)
        # Whom else it concerns is that user's own matter.
        host.succeed(f"--plugins {folder} {line}", user=4322, executable=PROGRAM)
        os.chown(path, 0, 0)
        os.chmod(path, before)
    for path, _, files in os.walk(TREE.root):
        for name in ".", *files:
            os.chown(os.path.join(path, name), 4321, 4321)
    host.succeed(line, executable=PROGRAM)


masks()
kept()
taken_back()
strangers()
linked_folder()
lone_journal()
if os.geteuid() == 0:
    modes()
    plugins()
else:
    print("left out, for it takes root: whom modes keep out, and which plug-ins root runs")
