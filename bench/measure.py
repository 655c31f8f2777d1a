"""What the scripts of this folder share: whole processes, measured in turn."""

import fcntl
import os
import random
import shutil
import statistics
import sys
import time

TOP = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
PROGRAM = os.path.join(TOP, "build/bench/bin/hcli")


def program(path):
    """The path, where there is a program."""
    if not os.access(path, os.X_OK):
        sys.exit(f"{path}: no such program; cmake --preset bench && ninja -C build/bench makes one")
    return os.path.abspath(path)


def installed(path, folder):
    """The program as installing it would leave it, beside its libraries. What the linker has just written lies in the
    page cache in small pieces, which costs each start; the peers are installed, too."""
    tree = os.path.join(folder, "installed")
    for part in "bin", "lib":
        shutil.copytree(os.path.join(os.path.dirname(path), "..", part), os.path.join(tree, part), symlinks=True)
    return os.path.join(tree, "bin", os.path.basename(path))


def spawn(words, output, root=None):
    environment = {**os.environ, "HCLI_ROOT": root} if root else os.environ
    files = [(os.POSIX_SPAWN_DUP2, output, 1), (os.POSIX_SPAWN_OPEN, 2, os.devnull, os.O_WRONLY, 0)]
    return os.posix_spawnp(words[0], words, environment, file_actions=files)


def finish(words, pid, statuses=(0,)):
    """Waits for the process and returns what it used."""
    _, status, usage = os.wait4(pid, 0)
    if os.waitstatus_to_exitcode(status) not in statuses:
        sys.exit(f"{' '.join(words)}: status {os.waitstatus_to_exitcode(status)}")
    return usage


class Work:
    """A command line, its host where it is one of hcli, and the wall times of its runs in milliseconds."""

    def __init__(self, words, root=None, statuses=(0,)):
        self.words, self.root, self.statuses, self.times = words, root, statuses, []

    def run(self, output):
        begin = time.perf_counter()
        usage = finish(self.words, spawn(self.words, output, self.root), self.statuses)
        self.times.append((time.perf_counter() - begin) * 1000)
        return usage

    def median(self):
        return statistics.median(self.times)

    def fast(self):
        """The fastest tenth, which other work of the machine has not slowed down."""
        return statistics.quantiles(self.times, n=10)[0]

    def mebibytes(self):
        """The most memory of one run, read while it waits to write its result. What wait4 tells begins with the memory
        of the process that starts another, and this one is larger than hcli."""
        reader, writer = os.pipe()
        os.write(writer, bytes(fcntl.fcntl(writer, fcntl.F_SETPIPE_SZ, 4096)))
        pid = spawn(self.words, writer, self.root)
        os.close(writer)
        asleep, status = 0, {}
        while asleep < 20:
            time.sleep(0.005)
            with open(f"/proc/{pid}/status", encoding="utf-8") as file:
                status = dict(line.split(":", 1) for line in file)
            asleep = asleep + 1 if status["State"].strip().startswith("S") else 0
        while os.read(reader, 65536):
            pass
        os.close(reader)
        finish(self.words, pid)
        return int(status["VmHWM"].split()[0]) / 1024


def undisturbed():
    """Lets nothing else run on this processor meanwhile, where that is allowed: a run that is interrupted says nothing."""
    try:
        os.sched_setscheduler(0, os.SCHED_FIFO, os.sched_param(1))
    except PermissionError:
        print("measured without priority over other work; as root the medians are steadier", file=sys.stderr)


def in_turn(works, runs, warm=2):
    """Runs each of them so many times, in turn, so that what else the machine does falls on all alike.
    The first runs fill the caches."""
    with open(os.devnull, "w", encoding="utf-8") as output:
        for _ in range(runs + warm):
            for work in random.sample(works, len(works)):  # whom another one follows matters to the caches
                work.run(output.fileno())
    for work in works:
        del work.times[:warm]
