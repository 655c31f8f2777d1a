"""Several hcli at once on one host: no change is lost, nobody is turned away, and one first run makes the host.
together.py [SECONDS] lets eight writers and eight readers work for so long."""

import os
import sys
import threading
import time

from support.program import Host, check

ADAPTERS = 4  # writers share them, so that they change the same lists


def description(folder):
    path = os.path.join(folder, "host.json")
    capabilities = '{"Name And Alias Settable": true, "Sendtarget Discovery Settable": true}'
    with open(path, "w", encoding="utf-8") as file:
        rows = [f'{{"name": "hba{number}", "capabilities": {capabilities}}}' for number in range(ADAPTERS)]
        file.write(f'{{"adapters": [{", ".join(rows)}]}}')
    return path


class Worker(threading.Thread):
    """Runs one command line after the other, at least two, until the time is over or one fails."""

    def __init__(self, host, number, until):
        super().__init__()
        self.host, self.number, self.until = host, number, until
        self.done, self.fault = 0, None
        self.start()

    def run(self):
        while (self.done < 2 or time.monotonic() < self.until) and not self.fault:
            line = self.line(self.done + 1)
            done = self.host.run(line)
            if done.returncode != 0 or done.stderr or not done.stdout:
                self.fault = done
            else:
                self.done += 1


class Writer(Worker):
    def address(self, count):
        return f"10.{self.number}.{count // 250}.{count % 250 + 1}:3260"

    def line(self, count):
        adapter = self.number % ADAPTERS
        if count % 3 == 0:
            return f"iscsi adapter discovery sendtarget remove -A hba{adapter} -a {self.address(count - 1)}"
        return f"iscsi adapter discovery sendtarget add -A hba{adapter} -a {self.address(count)}"

    def expected(self):
        kept = {count for count in range(1, self.done + 1) if count % 3 != 0}
        kept -= {count - 1 for count in range(3, self.done + 1, 3)}
        return {(f"hba{self.number % ADAPTERS}", self.address(count)) for count in kept}


class Reader(Worker):
    def line(self, count):
        return ["iscsi adapter list", "iscsi adapter discovery sendtarget list", "simulator show"][count % 3]


def work(writers, readers, seconds=1.5):
    host = Host()
    host.succeed(f"simulator load {description(host.root)}")
    until = time.monotonic() + seconds
    workers = [Writer(host, number, until) for number in range(writers)]
    workers += [Reader(host, number, until) for number in range(readers)]
    for worker in workers:
        worker.join()
        check(not worker.fault, f"{writers} writers, {readers} readers:", worker.fault)
    expected = set().union(*(worker.expected() for worker in workers if isinstance(worker, Writer)))
    rows = host.result("iscsi adapter discovery sendtarget list")
    found = {(row["Adapter"], row["Sendtarget"]) for row in rows}
    check(found == expected and len(rows) == len(found), f"lost {expected - found}, too many {found - expected}")
    counts = [sum(worker.done for worker in workers if isinstance(worker, kind)) for kind in (Writer, Reader)]
    print(f"{writers} writers made {counts[0]} changes, {readers} readers read {counts[1]} times")


def first_runs(count):
    host = Host()
    processes = [host.start(f"iscsi adapter discovery sendtarget add -A hba2 -a 10.0.0.{number}:3260")
                 for number in range(1, count + 1)]
    for process in processes:
        out, err = process.communicate(timeout=60)
        check(process.returncode == 0 and not err, "a first run of several:", process.returncode, out, err)
    addresses = {row["Sendtarget"] for row in host.result("iscsi adapter discovery sendtarget list")}
    missing = {f"10.0.0.{number}:3260" for number in range(1, count + 1)} - addresses
    check(not missing, f"first runs at once: the changes with {missing} are lost")
    files = os.listdir(os.path.dirname(host.database))
    check(files == ["host.db"], f"first runs at once leave {files}")


def names_at_once(count):
    host = Host()
    path = os.path.join(host.root, "etc/tessaro/coreiscsid/initiatorname.iscsi")
    names = [f"iqn.2026-11.org.example:host{number}" for number in range(count)]
    processes = [host.start(f"iscsi software set --enabled true --name {name}") for name in names]
    for process in processes:
        out, err = process.communicate(timeout=60)
        check(process.returncode == 0 and not err, "names at once:", process.returncode, out, err)
    with open(path, encoding="utf-8") as file:
        found = file.read()
    check(found in {f"InitiatorName={name}\n" for name in names}, "names at once made", found)
    check(os.listdir(os.path.dirname(path)) == [os.path.basename(path)], os.listdir(os.path.dirname(path)))


def main():
    if len(sys.argv) > 1:
        return work(8, 8, float(sys.argv[1]))
    for _ in range(3):
        first_runs(8)
        names_at_once(8)
    work(1, 1)
    work(2, 0)
    work(5, 3)


if __name__ == "__main__":
    sys.exit(main())
