"""hcli manages the machine's own initiator: discovery, sessions whose values are the kernel's, refusals, and what others do."""

import json

import targets
from machine import Machine
from support.program import check

TGT, KERNEL = "iqn.2026-11.org.example:tgt", "iqn.2026-11.org.example:kernel"
KERNEL_SESSION = "/sys/class/iscsi_session/session"
# What hcli shows, and the file of the kernel that says so.
SESSION = {"FirstBurstLength": "first_burst_len", "MaxBurstLength": "max_burst_len",
           "MaxOutstandingR2T": "max_outstanding_r2t", "InitialR2T": "initial_r2t", "ImmediateData": "immediate_data",
           "ErrorRecoveryLevel": "erl", "DataPduInOrder": "data_pdu_in_order",
           "DataSequenceInOrder": "data_seq_in_order", "TargetPortalGroupTag": "tpgt"}
CONNECTION = {"HeaderDigest": "header_digest", "DataDigest": "data_digest",
              "MaxRecvDataSegmentLength": "max_recv_dlength", "MaxTransmitDataSegmentLength": "max_xmit_dlength",
              "RemoteAddress": "address"}
WORDS = {"True": "1", "False": "0", "NONE": "0", "CRC32C": "1"}


def result(machine, line):
    return json.loads(machine.succeed(f"hcli {line} --output json"))["result"]


def refused(machine, line, *texts):
    done = machine.run(f"hcli {line}")
    check(done.returncode not in (0, 2) and all(text in done.stderr for text in texts), line, done)


def kernel_sessions(machine):
    return machine.succeed("ls /sys/class/iscsi_session").split()


def as_kernel_says(machine):
    """Each value of each session and connection, one by one."""
    rows, connections = result(machine, "iscsi session list"), result(machine, "iscsi session connection list")
    check(len(rows) == len(connections) == len(kernel_sessions(machine)), rows, connections)
    for found, names, folder in ((rows, SESSION, KERNEL_SESSION + "{}"),
                                 (connections, CONNECTION, "/sys/class/iscsi_connection/connection{}:0")):
        for row in found:
            number = int(row["ISID"][6:], 16)
            files = " ".join(f"{folder.format(number)}/{name}" for name in names.values())
            said = machine.succeed(f"cat {files}").split()
            shown = [WORDS.get(str(row[name]), str(row[name])) for name in names]
            check(shown == said, row, dict(zip(names.values(), said)))


def adopted(machine):
    machine.succeed("killall iscsid; while pidof iscsid; do sleep 0.1; done >/dev/null")
    refused(machine, "linux adopt", "systemctl enable --now iscsid")
    machine.succeed("iscsid")
    machine.succeed("hcli iscsi adapter set -A hba2 -a changed")
    refused(machine, "linux adopt", "--replace")
    machine.succeed("hcli simulator reset && hcli linux adopt")
    adapters = result(machine, "iscsi adapter list")
    check([(row["Adapter"], row["UID"]) for row in adapters] == [("hba0", "iqn.2026-11.org.example:machine")], adapters)


def disk(machine):
    """A disk for as long as its session lasts; values that were set are agreed on."""
    machine.succeed("hcli iscsi adapter param set -A hba0 -k FirstBurstLength -v 4096")
    refused(machine, "iscsi adapter param set -A hba0 -k DelayedAck -v false", "")
    for port, name in (3260, TGT), (targets.KERNEL_PORT, KERNEL):
        machine.succeed(f"hcli iscsi adapter discovery sendtarget add -A hba0 -a 127.0.0.1:{port}")
    machine.succeed("hcli iscsi adapter discovery rediscover -A hba0")
    check(len(kernel_sessions(machine)) == 2, kernel_sessions(machine))
    as_kernel_says(machine)
    check({row["FirstBurstLength"] for row in result(machine, "iscsi session list")} == {"4096"}, "not as it was set")
    for name in TGT, KERNEL:
        machine.succeed(f"hcli iscsi session remove -A hba0 -n {name}")
        check(TGT not in str(result(machine, "iscsi session list")), "a session is shown that was removed")
    machine.until("! test -e /dev/sda")
    machine.succeed(f"hcli iscsi session add -A hba0 -n {TGT}")
    machine.until("test -b /dev/sda")
    as_kernel_says(machine)


def others(machine):
    """What somebody else does with open-iscsi is seen at the next look."""
    machine.succeed(f"iscsiadm -m node -T {TGT} -u")
    check(result(machine, "iscsi session list") == [], "a session is shown that others have ended")
    machine.succeed(f"""iscsiadm -m node -T {KERNEL} -p 127.0.0.1:{targets.KERNEL_PORT},1 -I default -o new
iscsiadm -m node -T {KERNEL} -p 127.0.0.1:{targets.KERNEL_PORT},1 -I default -l""")
    as_kernel_says(machine)
    refused(machine, f"iscsi session remove -A hba0 -n {KERNEL}", "interface default")
    check(len(kernel_sessions(machine)) == 1, "a session of others was ended")
    machine.succeed(f"iscsiadm -m node -T {KERNEL} -u && iscsiadm -m node -T {KERNEL} -o delete")


def not_waiting(machine):
    """While a login waits for a portal that says nothing, others read and write."""
    machine.succeed("sleep 99 | nc -l -p 3998 >/dev/null & sleep 0.2; hcli iscsi adapter discovery sendtarget add "
                    "-A hba0 -a 127.0.0.1:3998")
    machine.succeed("hcli --timeout 15 iscsi adapter discovery rediscover -A hba0 >/tmp/waiting 2>&1 & sleep 2")
    machine.succeed("hcli --timeout 1 iscsi adapter set -A hba0 -a written && hcli iscsi adapter list | grep -q hba0")
    machine.succeed("pidof hcli >/dev/null")  # or nothing was waited for
    machine.succeed("while pidof hcli; do sleep 0.2; done >/dev/null")
    machine.succeed("hcli iscsi adapter discovery sendtarget remove -A hba0 -a 127.0.0.1:3998")
    check(result(machine, "iscsi adapter get -A hba0")[0]["Alias"] == "written", "what was written meanwhile is lost")


def released(machine):
    before = kernel_sessions(machine)
    check(before, "no session is left to be kept")
    machine.succeed("hcli linux release")
    check(kernel_sessions(machine) == before, "sessions did not survive")
    check(len(result(machine, "iscsi adapter list")) == 3, "not the host of a first run")
    refused(machine, "linux release", "nothing was adopted")


with Machine() as emulated:
    emulated.succeed("modprobe -a iscsi_tcp sd_mod && iscsid")
    targets.start_tgt(emulated)
    targets.add_tgt(emulated, 1, TGT)
    targets.start_kernel(emulated)
    targets.add_kernel(emulated, KERNEL)
    for part in adopted, disk, others, not_waiting, released:
        part(emulated)
