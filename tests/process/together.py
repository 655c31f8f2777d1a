"""Several hcli at once on one host: no change is lost, nobody is turned away, and one first run makes the host.
together.py [SECONDS] lets eight writers and eight readers work for so long."""

import fcntl
import itertools
import os
import subprocess
import sys
import threading
import time
from concurrent.futures import ThreadPoolExecutor

from support.program import SET_NAME, Host, beside, check, finished, read, succeeded, until_asleep

ADAPTERS = 4  # writers share them, so that they change the same lists
SENDTARGET = "iscsi adapter discovery sendtarget"


def address(number, count):
    return f"10.{number}.{count // 250}.{count % 250 + 1}:3260"


def writing(number, count):
    """Every third removes what the one before it has added."""
    verb, count = ("add", count) if count % 3 else ("remove", count - 1)
    return f"{SENDTARGET} {verb} -A hba{number % ADAPTERS} -a {address(number, count)}"


def reading(_, count):
    return ["iscsi adapter list", f"{SENDTARGET} list", "simulator show"][count % 3]


def sendtargets(host):
    rows = [(row["Adapter"], row["Sendtarget"]) for row in host.result(f"{SENDTARGET} list")]
    check(len(rows) == len(set(rows)), "twice in", rows)
    return set(rows)


def with_adapters(count):
    capabilities = {"Name And Alias Settable": True, "Sendtarget Discovery Settable": True}
    return Host({"adapters": [{"name": f"hba{number}", "capabilities": capabilities} for number in range(count)]})


def work(writers, readers, seconds=1.5):
    host = with_adapters(ADAPTERS)
    until = time.monotonic() + seconds

    def worker(line, number):
        """Runs one command line after the other, at least two, until the time is over; returns how many."""
        for count in itertools.count(1):
            if count > 2 and time.monotonic() >= until:
                return count - 1
            check(host.succeed(line(number, count)), "no result of", line(number, count))

    with ThreadPoolExecutor(writers + readers) as pool:
        tasks = [pool.submit(worker, *task) for task in
                 [(writing, number) for number in range(writers)] + [(reading, 0)] * readers]
    done = [task.result() for task in tasks]
    expected = {(f"hba{number % ADAPTERS}", address(number, count)) for number in range(writers)
                for count in range(1, done[number] + 1) if count % 3 == 1 or count % 3 == 2 and count == done[number]}
    found = sendtargets(host)
    check(found == expected, f"lost {expected - found}, too many {found - expected}")
    print(f"{writers} writers made {sum(done[:writers])} changes, {readers} readers read {sum(done[writers:])} times")


def at_once(host, lines):
    for process in [host.start(line) for line in lines]:
        succeeded(finished(process))


def keys_at_once(pairs):
    """Both keys of one record are set at once; each command writes the record back as a whole."""
    host = with_adapters(1)
    places = {"-A hba0": "iscsi adapter param", "-A hba0 -a 10.0.0.1": f"{SENDTARGET} param"}
    host.succeed(f"{SENDTARGET} add -A hba0 -a 10.0.0.1:3260")
    for number in range(pairs):
        wanted = {"LoginTimeout": str(number % 50 + 1), "LogoutTimeout": str(number % 50 + 2)}
        for place, command in places.items():
            at_once(host, [f"{command} set {place} -k {key} -v {value}" for key, value in wanted.items()])
            found = {row["Name"]: row["Current"] for row in host.result(f"{command} get {place}")}
            check(found.items() >= wanted.items(), f"of {wanted} at {command} one is lost:", found)


def batch_among_others():
    """Lines that are made durable together keep others waiting for a moment, and take nothing of theirs."""
    host = with_adapters(ADAPTERS)
    lines = [writing(9, 3 * count + 1) for count in range(2500)]
    batch = host.start("--batch -", stdin=subprocess.PIPE)
    writer = threading.Thread(target=batch.communicate, args=["\n".join(lines)])
    writer.start()
    count = 0
    while writer.is_alive() or count < 2:
        count += 1
        host.succeed("--timeout 10 " + writing(count % 2, 3 * count + 1))
    writer.join()
    expected = {(f"hba{9 % ADAPTERS}", address(9, 3 * number + 1)) for number in range(len(lines))}
    expected |= {(f"hba{number % 2}", address(number % 2, 3 * number + 1)) for number in range(1, count + 1)}
    check(batch.returncode == 0 and sendtargets(host) == expected, "a batch and others: lost or too many", batch.returncode)
    print(f"a batch made {len(lines)} changes, others {count} meanwhile")


def unread_trace():
    """Whoever does not read on keeps one command waiting, and no other."""
    host = with_adapters(1000)
    waiting = host.start("--trace iscsi adapter list")
    check("GetiScsiInterfaces" in waiting.stderr.readline(), "no trace")
    host.succeed("iscsi adapter set -A hba1 -a other")
    check(waiting.poll() is None, "all of the trace was written at once")
    waiting.kill()
    waiting.communicate()


def unread_report():
    """Nor does a report that nobody reads: what the command held of the host is released before it is written."""
    host = with_adapters(2)
    reader, writer = os.pipe()
    os.write(writer, bytes(fcntl.fcntl(writer, fcntl.F_SETPIPE_SZ, 4096)))
    waiting = host.start("iscsi adapter param set -A hba0 -k Nothing -v 1", stderr=writer)
    os.close(writer)
    until_asleep(waiting)
    host.succeed("iscsi adapter set -A hba1 -a other")
    check(waiting.poll() is None, "the report was written nowhere")
    with open(reader, "rb") as full:
        check(b"Unable to set parameters." in full.read(), "the report is lost")
    waiting.communicate()


def first_runs(count):
    host = Host()
    at_once(host, [f"{SENDTARGET} add -A hba2 -a 10.0.0.{number}:3260" for number in range(count)])
    missing = {("hba2", f"10.0.0.{number}:3260") for number in range(count)} - sendtargets(host)
    check(not missing, f"first runs at once: the changes with {missing} are lost")
    check(not beside(host.database), f"first runs at once leave {beside(host.database)}")


def names_at_once(count):
    host = Host()
    lines = [f"{SET_NAME}{number}" for number in range(count)]
    at_once(host, lines)
    check(read(host.names) in {f"InitiatorName={line.split()[-1]}\n" for line in lines}, "made", read(host.names))
    check(not beside(host.names), f"names at once leave {beside(host.names)}")


if len(sys.argv) > 1:
    work(8, 8, float(sys.argv[1]))
else:
    for _ in range(3):
        first_runs(8)
        names_at_once(8)
    keys_at_once(20)
    batch_among_others()
    unread_trace()
    unread_report()
    work(1, 1)
    work(2, 0)
    work(5, 3)
