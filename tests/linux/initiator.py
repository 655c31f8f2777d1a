"""An emulated machine, its kernel's initiator, and a disk of each of two targets; hcli runs beside them."""

import json

import targets
from machine import Machine
from support.program import check

NAMES = {3260: "iqn.2026-11.org.example:tgt", targets.KERNEL_PORT: "iqn.2026-11.org.example:kernel"}


def missing(machine):
    """What `hcli linux check` misses; its status says so too."""
    done = machine.run("hcli linux check --output json")
    parts = [row["Part"] for row in json.loads(done.stdout)["result"] if row["State"] != "ok"]
    check(done.returncode == (3 if parts else 0), done)
    return parts


def logged_in(machine, port):
    """A disk that appears keeps what is written to it; it goes with its session."""
    name, portal = NAMES[port], f"127.0.0.1:{port}"
    found = machine.succeed(f"iscsiadm -m discovery -t sendtargets -p {portal}")
    check(found.split() == [f"{portal},1", name], found)
    machine.succeed(f"iscsiadm -m node -T {name} -p {portal} --login")
    machine.until("test -b /dev/sda")
    machine.succeed("""set -e
echo written | dd of=/dev/sda conv=fsync
echo 3 >/proc/sys/vm/drop_caches
dd if=/dev/sda bs=8 count=1 | grep written""".replace("dd ", "dd status=none "))
    session = "/sys/class/iscsi_session/session*"
    seen = machine.succeed(f"cat {session}/targetname {session}/state").split()
    check(seen == [name, "LOGGED_IN"], seen)
    machine.succeed(f"iscsiadm -m node -T {name} -p {portal} --logout")
    machine.until("! test -e /dev/sda")
    left = machine.succeed("ls /sys/class/iscsi_session")
    check(left == "", left)


with Machine() as machine:
    adapters = json.loads(machine.succeed("hcli iscsi adapter list --output json"))["result"]
    check([adapter["Adapter"] for adapter in adapters][0] == "hba0", adapters)
    for repair, parts in (("true", ["module", "socket", "daemon"]),
                          ("modprobe -a iscsi_tcp sd_mod", ["socket", "daemon"]), ("iscsid", [])):
        machine.succeed(repair)
        check(missing(machine) == parts, repair, missing(machine))
    targets.start_tgt(machine)
    targets.add_tgt(machine, 1, NAMES[3260])
    targets.start_kernel(machine)
    targets.add_kernel(machine, NAMES[targets.KERNEL_PORT])
    for portal_port in NAMES:
        logged_in(machine, portal_port)
