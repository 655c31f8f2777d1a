"""Whose the host's files are, what stands in their place and is not followed, and which plug-ins root runs."""

import os
import shutil
import stat

from support.program import HCLI, Host, check

NAME_FILE = "etc/tessaro/coreiscsid/initiatorname.iscsi"
SET_NAME = "iscsi software set --enabled true --name iqn.2026-11.org.example:host1"
# Where every user can run it.
TREE = Host()
os.chmod(TREE.root, 0o755)
for part in "bin", "lib":
    shutil.copytree(os.path.join(os.path.dirname(os.path.dirname(HCLI)), part), os.path.join(TREE.root, part),
                    ignore=shutil.ignore_patterns("hcli-*"))
PROGRAM = os.path.join(TREE.root, "bin/hcli")
READ, WRITE = "--trace iscsi adapter list", "--trace iscsi adapter set -A hba2 -a other"


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
            for path in host.database, os.path.join(host.root, NAME_FILE):
                check(mode(path) == 0o600, f"umask {mask:o}, user {user}: {path} has mode {mode(path):o}")
                folder = os.path.dirname(path)
                check(mode(folder) == 0o755 & ~mask | 0o700, f"umask {mask:o}: {folder} has mode {mode(folder):o}")
                check(os.listdir(folder) == [os.path.basename(path)], os.listdir(folder))


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
    NAME_FILE: [SET_NAME, "--trace iscsi software set --enabled true"],
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
            with open(target, "rb") as file:
                before = file.read()
            put(path, target)
            for line in lines:
                done = host.run(line)
                check(done.returncode == 1 and f"{path} {text}" in done.stderr, f"{case} at {place}", done)
                with open(target, "rb") as file:
                    check(file.read() == before, f"{case} at {place}: {line} has changed the file behind")
                check(not os.path.exists(target + ".nowhere"), f"{case} at {place}: {line} has made the file behind")
                check(not os.path.isfile(path) or os.path.islink(path), f"{case} at {place}: {line} has replaced it")


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
    done = host.run(READ)
    check(done.returncode == 1 and f"its journal {host.database}-journal is still there" in done.stderr, done)
    check(not os.path.exists(host.database), "a new host beside an old journal")


def plugins():
    """Root runs no code of others; without being told, the program's own folder is not judged."""
    folder_text = 'the plug-in folder "{folder}" is left out: '
    file_text = 'plug-in "{folder}/iscsi.so" is left out: '
    right = "; run by root, it has to belong to root and be writable by root alone\n"
    others = "others can write to it, its mode is %s" + right
    owned = "it belongs to user 4321" + right
    # mode and owner of the folder, of the file; whose text tells what; None where the plug-in works
    cases = [
        ((0o755, 0), (0o644, 0), None),
        ((0o700, 0), (0o600, 0), None),
        ((0o775, 0), (0o644, 0), folder_text + others % "0775"),
        ((0o757, 0), (0o644, 0), folder_text + others % "0757"),
        ((0o1777, 0), (0o644, 0), folder_text + others % "1777"),
        ((0o755, 4321), (0o644, 0), folder_text + owned),
        ((0o755, 0), (0o664, 0), file_text + others % "0664"),
        ((0o755, 0), (0o646, 0), file_text + others % "0646"),
        ((0o755, 0), (0o644, 4321), file_text + owned),
    ]
    host = Host()
    folder = os.path.join(TREE.root, "lib/hcli/plugins")
    file = os.path.join(folder, "iscsi.so")
    line = "iscsi adapter --help"
    for (folder_mode, folder_owner), (file_mode, file_owner), text in cases:
        for path, mode_, owner in (folder, folder_mode, folder_owner), (file, file_mode, file_owner):
            os.chown(path, owner, 0)
            os.chmod(path, mode_)
        for done in host.run(line, env=host.environment(HCLI_PLUGINS=folder)), host.run(f"--plugins {folder} {line}"):
            if text is None:
                check(done.returncode == 0 and not done.stderr, oct(folder_mode), oct(file_mode), done)
            else:
                expected = "hcli: " + text.format(folder=folder)
                check(done.returncode == 2 and done.stderr.startswith(expected), "expected", expected, done)
        # Whom else it concerns is that user's own matter.
        if folder_mode & 0o005 and file_mode & 0o004:
            done = host.run(f"--plugins {folder} {line}", user=4322, executable=PROGRAM)
            check(done.returncode == 0 and not done.stderr, "another user", done)
    for path, _, files in os.walk(TREE.root):
        for name in ".", *files:
            os.chown(os.path.join(path, name), 4321, 4321)
    done = host.run(line, executable=PROGRAM)
    check(done.returncode == 0 and not done.stderr, "a tree of another user", done)


masks()
strangers()
linked_folder()
lone_journal()
if os.geteuid() == 0:
    plugins()
else:
    print("left out, for it takes root: which plug-ins root runs")
