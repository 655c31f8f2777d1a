"""hcli doctor finds what is broken, says what mends it, changes nothing, and survives it; its report has no secrets."""

import fcntl
import json
import os
import re
import shutil
import struct
import subprocess

from support.damages import DAMAGES, sql
from support.program import HCLI, SET_NAME, SOURCE, Host, beside, check, contents, read, run, write

BUILD = os.environ["HCLI_BUILD_DIR"]
SECRET = "vault-secret-1"  # of the demo host


def findings(host, line="doctor", status=None, **options):
    """By their state, each as "check: seen"."""
    done = host.run("--output json " + line, **options)
    check(done.stdout, done)
    answer = json.loads(done.stdout)
    found = {"ok": [], "warning": [], "fault": []}
    for row in answer["result"]:
        found[row["State"]].append(f"{row['Check']}: {row['Seen']}")
        check(row["State"] == "ok" or row["Mend"], "nothing mends", row)
    count = len(found["fault"])
    reported = [f"{count} fault{'s' if count > 1 else ''} {'were' if count > 1 else 'was'} found."] if count else []
    check(answer["messages"] == reported and done.returncode == (status or (3 if count else 0)), done)
    order = [row["State"] for row in answer["result"]]
    check(order == sorted(order, key=["fault", "warning", "ok"].index), order)
    return found


def has(found, state, text):
    check(any(text in line for line in found[state]), f"no {state} with {text!r} in", found)


def healthy():
    host = Host()
    found = findings(host)
    check(not found["fault"] and not found["warning"] and not os.listdir(host.root), found)
    has(found, "ok", "is not there yet")
    host.succeed(SET_NAME)
    found = findings(host)
    check(not found["fault"] and not found["warning"], found)
    for text in "host.db is sound", "iqn.2026-11.org.example:host", "All of them make sense", "It brings: iscsi":
        has(found, "ok", text)
    shown, status = host.on_terminal("status", rows=99)
    long = [line for line in shown.decode().splitlines() if len(line) > 80]
    check(status == 0 and not long and b"\n      iqn.2026-11.org.example:vault" in shown, shown)
    # Once each in a batch, in a dry run, and in a text form.
    done = host.run("--batch -", "doctor\nstatus\n")
    check(done.returncode == 0 and "host.db is sound" in done.stdout, done)
    check("dry run: nothing would change" in host.succeed("--dry-run doctor"), "a dry run")


def damaged():
    for case, (damage, text) in DAMAGES.items():
        host = Host()
        host.show()
        damage(host.database)
        before = contents(host.root)
        has(findings(host), "fault", text)
        check(contents(host.root) == before, f"{case}: doctor has changed the files")


def set_names(text):
    def do(host):
        os.makedirs(os.path.dirname(host.names), exist_ok=True)
        write(host.names, text)
    return do


def lay_journal(host):
    """What a process leaves that is killed while it writes: a header, and a page that is to be put back."""
    page = os.path.getsize(host.database) // 4096
    head = bytes.fromhex("d9d505f920a163d7") + struct.pack(">IIIII", 1, 7, page, 512, 4096)
    with open(host.database, "rb") as database:
        first = database.read(4096)
    total = 7 + sum(first[i] for i in range(4096 - 200, 0, -200))
    with open(host.database + "-journal", "wb") as journal:
        journal.write(head.ljust(512, b"\0") + struct.pack(">I", 1) + first + struct.pack(">I", total & 0xffffffff))


# What is done to a healthy host: the state and the text of a finding.
CASES = {
    "other modes": (lambda host: os.chmod(host.database, 0o644), "warning", "mode 0644"),
    "another's file": (lambda host: os.chown(host.database, 4321, -1), "warning", "belongs to user 4321"),
    "a link": (lambda host: (os.rename(host.database, host.root + "/db"), os.symlink(host.root + "/db", host.database)),
               "fault", "is a symbolic link"),
    "a folder in its place": (lambda host: (os.remove(host.database), os.mkdir(host.database)), "fault",
                              "is not a regular file"),
    "a journal alone": (lambda host: os.rename(host.database, host.database + "-journal"), "fault", "is still there"),
    "a change cut off": (lay_journal, "warning", "A change was cut off"),
    "a log": (lambda host: sql(host.database, "PRAGMA journal_mode=wal"), "fault", "a form with a log"),
    "an earlier version": (lambda host: (os.remove(host.database), earlier(host)), "ok", "belongs to an earlier version"),
    "no name": (set_names("InitiatorName=nobody\n"), "fault", "is no iSCSI name"),
    "another name": (set_names("InitiatorName=iqn.2026-11.org.example:b\n"), "warning", "the software initiator is"),
    "nonsense for a name": (set_names("what\n"), "fault", "line 1"),
}


def earlier(host):
    with open(os.path.join(SOURCE, "tests/golden/host-version-1.sql"), encoding="utf-8") as file:
        subprocess.run(["python3", "-c", "import sqlite3, sys; sqlite3.connect(sys.argv[1]).executescript(sys.stdin.read())",
                        host.database], stdin=file, check=True)


def broken():
    for case, (do, state, text) in CASES.items():
        if case == "another's file" and os.geteuid() != 0:
            continue
        host = Host()
        host.show()
        do(host)
        before = contents(host.root)
        has(findings(host), state, text)
        check(contents(host.root) == before, f"{case}: doctor has changed the files")


def locked():
    """Who keeps the database locked; nobody is waited for longer than a second."""
    host = Host()
    host.show()
    with open(host.database, "rb+") as file:
        for first, length, state in (0x40000001, 1, "warning"), (0x40000000, 512, "fault"):
            fcntl.lockf(file, fcntl.LOCK_EX, length, first)
            found = findings(host)
            has(found, "warning", f"The process {os.getpid()} (python3)")
            check(bool(found["fault"]) == (state == "fault"), found)
            check(not found["fault"] or "is locked by another process" in found["fault"][0], found)


def as_nobody():
    if os.geteuid() != 0:
        return
    host = Host()
    host.show()
    os.chmod(host.root, 0o755)
    for part in "bin", "lib":
        shutil.copytree(os.path.join(BUILD, part), os.path.join(host.root, part), ignore=shutil.ignore_patterns("hcli-*"))
    found = findings(host, user=4321, executable=os.path.join(host.root, "bin/hcli"))
    has(found, "fault", "host.db cannot be read: Permission denied")
    has(found, "warning", "cannot be written to")


BAD_PLUGINS = {
    "crash.so": ("__builtin_trap();", "it crashes while it is loaded: Illegal instruction"),
    "end.so": ("_exit(0);", "it ends the program while it is loaded"),
    "wait.so": ("for (;;) pause();", "it does not come back from being loaded"),
    "none.so": ("", "it has no entry point AutoCli_RegisterNamespaces"),
}


def plugins():
    """A plug-in that crashes, ends the process or never comes back is a finding; those that work are used."""
    host = Host()
    folder = os.path.join(host.root, "plugins")
    shutil.copytree(os.path.join(BUILD, "lib/hcli/plugins"), folder)
    write(os.path.join(folder, "text.so"), "no library\n")
    compiler = re.search(r"^CMAKE_CXX_COMPILER:\w+=(.*)$", read(os.path.join(BUILD, "CMakeCache.txt")), re.MULTILINE)
    for name, (body, _) in BAD_PLUGINS.items():
        source = os.path.join(host.root, "plugin.cpp")
        write(source, "#include <unistd.h>\n__attribute__((constructor)) static void Load() {" + body + "}\n")
        done = run(compiler.group(1), "-shared", "-fPIC", source, "-o", os.path.join(folder, name))
        check(done.returncode == 0, done)
    found = findings(host, f"--plugins {folder} doctor")
    check(len(found["fault"]) == len(BAD_PLUGINS) + 1, found)
    for _, text in BAD_PLUGINS.values():
        has(found, "fault", text)
    for text in "plug-in iscsi.so", "is not there yet":
        has(found, "ok", text)


def variables():
    host = Host()
    found = findings(host, env=host.environment(HCLI_RROT="s3cr3t", HCLI_ROOT=""))
    has(found, "fault", "HCLI_ROOT is empty")
    has(found, "warning", "variable HCLI_RROT")


def bundle():
    host = Host()
    host.succeed(SET_NAME)
    path = os.path.join(host.root, "report.txt")
    line = "doctor --bundle " + path
    check("would have the findings" in host.succeed("--dry-run " + line) and not os.path.exists(path), "a dry run writes")
    host.succeed(line, umask=0, env=host.environment(HCLI_OTHER="s3cr3t"))
    text = read(path)
    check(os.stat(path).st_mode & 0o777 == 0o600 and beside(path) == {"etc", "var"}, beside(path))
    for part in "hcli 0.", "iscsi adapter list\n", "iqn.2026-11.org.example:vault", "HCLI_ROOT=" + host.root, "HCLI_OTHER is set":
        check(part in text, f"no {part!r} in", text)
    check("s3cr3t" not in text and SECRET not in text and SECRET in json.dumps(host.show()), "a secret in", text)
    for where, reason in (path, "is there already"), ("/nowhere/report", "No such file or directory"), ("/dev/full", "already"):
        done = host.run("doctor --bundle " + where)
        check(done.returncode == 3 and reason in done.stderr and read(path) == text, done)


healthy()
damaged()
broken()
locked()
as_nobody()
plugins()
variables()
bundle()
