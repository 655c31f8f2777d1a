"""Whatever stands in the database's place or keeps it from being written: a text that names the file, and no change."""

import os
import resource
import signal
import subprocess

from support.damages import DAMAGES, sql
from support.program import (DAMAGED, DENIED, HCLI, NO_SPACE, NOT_SUPPORTED, READ, SET_NAME, WRITE, Host, check,
                             contents, refused, run, succeeded, write)

BIG = '{"adapters": [{"name": "x", "alias": "' + "x" * 200000 + '"}]}'


def damaged():
    for case, (damage, text) in DAMAGES.items():
        host = Host()
        host.show()
        damage(host.database)
        before = contents(host.root)
        for line in READ, WRITE:
            status = NOT_SUPPORTED if case == "a newer version" else DAMAGED
            refused(f"{case}, {line}", host.run("--exit-codes " + line), host.database, text, status=status)
            check(contents(host.root) == before, f"{case}: {line} has changed the files")


def isid():
    host = Host()
    host.show()
    sql(host.database, "UPDATE object SET record = CAST(replace(CAST(record AS TEXT), '80107e02', '80107ezz') AS BLOB)")
    shown = host.run("iscsi session list")
    check("is not twelve hexadecimal digits" in shown.stderr and shown.returncode == 1, "a damaged ISID", shown)


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


def can_mount(way):
    return subprocess.run(f"{way} mount -t tmpfs none /mnt", shell=True, capture_output=True).returncode == 0


def unwritable(way):
    host = Host()
    host.succeed(SET_NAME)
    database, names = (os.path.join(host.root, name) for name in ("database", "names"))
    os.rename(host.names, names)
    os.link(host.database, database)
    kibibytes = os.path.getsize(database) // 1024

    def run(line, file, kept, size, options):
        words = ["sh", "-c", MOUNTED, "sh", file, kept, size, options, HCLI, *line.split()]
        return subprocess.run([*way.split(), *words], input=BIG, capture_output=True, text=True, env=host.environment(),
                              timeout=60)

    done = run(READ, host.database, database, "1m", "ro")
    check(done.returncode == 0 and "hba2" in done.stdout, "reading where nothing can be written", done)
    # The line, the file, its contents if it is there, size and options of the file system, the reason told.
    cases = [
        (WRITE, host.database, database, "1m", "ro", "cannot be written: it is read-only"),
        (WRITE, host.database, database, f"{kibibytes}k", "", "cannot be written: No space left on device"),
        ("simulator load -", host.database, database, f"{kibibytes + 24}k", "", "cannot be written: No space left on device"),
        (READ, host.database, "", "1m", "ro", "cannot be written: Read-only file system"),
        (READ, host.database, "", "8k", "", "cannot be written: No space left on device"),
        (SET_NAME + "2", host.names, names, "1m", "ro", "cannot be written: Read-only file system."),
        (SET_NAME + "2", host.names, names, "4k", "", "cannot be written: No space left on device"),
        (SET_NAME, host.names, "", "4k,nr_inodes=1", "", "cannot be written: No space left on device"),
    ]
    for line, file, kept, size, options, text in cases:
        refused(f"{size} {options}, {line}", run("--exit-codes " + line, file, kept, size, options), f"{file} {text}",
                status=DENIED if options == "ro" else NO_SPACE)


def limited():
    """A limit to the size of files is a full disk, and no signal."""
    host = Host()
    host.show()
    before = contents(host.root)
    for line, most in ("simulator load -", os.path.getsize(host.database)), (WRITE, 1024):
        done = host.run("--exit-codes " + line, BIG, preexec_fn=lambda: resource.setrlimit(resource.RLIMIT_FSIZE, (most, most)))
        refused(f"limited to {most} bytes, {line}", done, host.database, "File too large", status=NO_SPACE)
        check(contents(host.root) == before, f"limited to {most} bytes: {line} has changed the files")


def full_output():
    """A result that cannot be written is a failure, and the change that it tells of stands."""
    host = Host()
    with open("/dev/full", "w") as full:
        done = host.run(WRITE, stdout=full)
    check(done.returncode == 4 and "No space left on device" in done.stderr, done)
    check(host.show()["adapters"][2]["alias"] == "other", "the change is lost")
    # Where nobody reads, it is the end that the signal brings; for a caller that ignores it, a status without a text.
    for ignored, status in (False, -signal.SIGPIPE), (True, 4):
        reader, writer = os.pipe()
        os.close(reader)
        done = host.run("simulator show", stdout=writer, restore_signals=not ignored)
        os.close(writer)
        check(done.returncode == status and not done.stderr, done)


def room_for_few(way):
    """Where there is room for each change, and not for all of them together, each is made."""
    host = Host({"adapters": [{"name": f"hba{number}", "alias": "x" * 1800, "capabilities": {"Name And Alias Settable": True}}
                              for number in range(40)]})
    lines = "".join(f"iscsi adapter set -A hba{number} -a new\n" for number in range(40))
    mounted = ('mount -t tmpfs -o size=$2k none "$(dirname "$1")" && cat "$3" > "$1" && chmod 600 "$1" && '
               '"$0" --batch - --keep-going --output json && "$0" simulator show')
    kept = os.path.join(host.root, "kept")
    os.link(host.database, kept)
    size = str(os.path.getsize(kept) // 1024 + 40)
    done = subprocess.run([*way.split(), "sh", "-c", mounted, HCLI, host.database, size, kept], input=lines,
                          capture_output=True, text=True, env=host.environment(), timeout=60)
    check(done.stdout.count('"result": true') == done.stdout.count('"alias": "new"') == 40, done)


def without_proc(way):
    """The program finds its plug-ins, wherever it is called, where nothing but the kernel's word tells its place."""
    host = Host()
    libraries = os.path.join(os.path.dirname(os.path.dirname(HCLI)), "lib")
    mounted = 'mount -t tmpfs none /proc && cd / && exec env LD_LIBRARY_PATH="$1" "$0" iscsi adapter list'
    done = run(*way.split(), "sh", "-c", mounted, HCLI, libraries, HCLI_ROOT=host.root)
    check("hba0" in done.stdout, done)  # without /proc, the leak checker of a build that has it ends with status 1


damaged()
isid()
limited()
full_output()
way = next(filter(can_mount, ["unshare --mount", "unshare --map-root-user --mount"]), None)
if way:
    unwritable(way)
    room_for_few(way)
    without_proc(way)
else:
    print("left out, for no file system can be mounted here: read-only and full ones")
