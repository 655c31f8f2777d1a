"""The network that open-iscsi is: targets that are found, logged in to and out of, and refusals with their reasons."""

import json
import shlex

import targets
from machine import Machine
from support.program import check

TGT, MOVING, KERNEL, CLOSED = (f"iqn.2026-11.org.example:{name}" for name in ("tgt", "moving", "kernel", "closed"))
SECRET, OTHER, MUTUAL = "a secret of sixteen", "another of sixteen.", "mutual and sixteen"
DONE, NO_ANSWER, MOVED = 0, 0x10000, 0x50101
# What logins do not talk about, as the driver asks for it and open-iscsi names it.
TIMING = {"node.session.initial_login_retry_max": 3, "node.session.cmds_max": 64, "node.conn[0].timeo.login_timeout": 9,
          "node.conn[0].timeo.logout_timeout": 8, "node.conn[0].timeo.noop_out_interval": 7,
          "node.conn[0].timeo.noop_out_timeout": 6, "node.session.timeo.replacement_timeout": 45}
NOT_AUTHENTICATED, NOT_ALLOWED, NOT_FOUND, UNAVAILABLE = 0x50201, 0x50202, 0x50203, 0x50301
TARGET_UNPROVEN, TARGET_WITHOUT_CHAP, NO_COMMON_DIGEST = 0x60201, 0x60202, 0x60203
SESSION_EXISTS = 0x60204
DEMANDS = PROHIBITED, DISCOURAGED, PREFERRED, REQUIRED = range(4)


def driver(machine, operation, port=3260, **given):
    asked = json.dumps({"operation": operation, "host": "127.0.0.1", "port": port} | given)
    done = machine.succeed(f"echo {shlex.quote(asked)} | LD_LIBRARY_PATH=/usr/lib linux-driver")
    return json.loads(done)


def sessions(machine):
    return machine.succeed("ls /sys/class/iscsi_session").split()


def kernel_says(machine, session, *names):
    folder = f"/sys/class/iscsi_session/session{session}"
    return machine.succeed("; ".join(f"cat {folder}/{name}" for name in names)).split()


def records(machine):
    """All files that open-iscsi has of us, with their modes."""
    lines = machine.succeed("cd /etc/iscsi && find * -mindepth 1 -type f -exec stat -c '%a %n' {} +").split("\n")
    return {name: mode for mode, _, name in (line.partition(" ") for line in lines if line)}


def refused(machine, status, **given):
    """No session, and no record of a node, comes of a refusal."""
    before = sessions(machine), set(records(machine)) | {"ifaces/hcli.hba0"}
    answer = driver(machine, "login", **given)
    check(answer.get("status") == status, f"not refused with {status:#x}:", given, answer)
    check((sessions(machine), set(records(machine))) == before, given, "left:", sessions(machine), records(machine))


def found(machine):
    for port, name in (3260, TGT), (targets.KERNEL_PORT, KERNEL):
        answer = driver(machine, "sendtargets", port)
        check(answer["targets"].get(name) == [["127.0.0.1", port, 1]], answer)
    check(driver(machine, "sendtargets", 3999)["status"] == NO_ANSWER, "somebody answers at a closed port")
    # Nothing is left of what was asked, and nobody has to have asked before.
    check(set(records(machine)) == {"ifaces/hcli.hba0"}, records(machine))


def logged_in(machine):
    for port, name in (3260, TGT), (targets.KERNEL_PORT, KERNEL):
        chap = {"uni": ["user", SECRET], "mutual": ["target", MUTUAL]} if name == TGT else {}
        given = {"port": port, "target": name, **chap}
        answer = driver(machine, "login", firstBurstLength=4096, **given)
        session = answer["tsih"]
        check((answer["status"], answer["chap"], answer["firstBurst"]) == (DONE, bool(chap), 4096), answer)
        seen = kernel_says(machine, session, "initiatorname", "ifacename", "first_burst_len", "recovery_tmo")
        check(seen == ["iqn.2026-11.org.example:hba0", "hcli.hba0", "4096", "45"], seen)
        node = f"nodes/{name}/127.0.0.1,{port},1/hcli.hba0"
        check(records(machine) == {"ifaces/hcli.hba0": "600", node: "600"}, records(machine))
        shown = machine.succeed(f"iscsiadm -m node -T {name} -o show").splitlines()
        missing = {f"{record} = {value}" for record, value in TIMING.items()} | {"node.startup = automatic"}
        missing -= set(shown)
        check(not missing, "not what open-iscsi reads:", missing, *shown)
        again = driver(machine, "login", **given)
        check(again.get("status") == SESSION_EXISTS and sessions(machine) == [f"session{session}"], again)
        machine.succeed(f"grep -qx 'node.startup = automatic' /etc/iscsi/{node}")
        # A number that is another target's by now ends nothing.
        driver(machine, "logout", target=CLOSED, session=session)
        check(sessions(machine) == [f"session{session}"], "another target's session was ended")
        driver(machine, "logout", target=name, session=session)
        check(sessions(machine) == [] and set(records(machine)) == {"ifaces/hcli.hba0"}, records(machine))


def digests(machine):
    """With a target that takes either and would rather have one."""
    for word, used in zip(DEMANDS, "0011"):
        answer = driver(machine, "login", targets.KERNEL_PORT, target=KERNEL, headerDigest=word)
        seen = machine.succeed("cat /sys/class/iscsi_connection/*/header_digest").split()
        driver(machine, "logout", target=KERNEL, session=answer["tsih"])
        check(seen == [used], f"word {word}:", seen)


def chap_words(machine):
    """A target that asks for CHAP, and one that does not."""
    for demand, name, port, used in ((DISCOURAGED, TGT, 3260, True), (PREFERRED, TGT, 3260, True),
                                     (DISCOURAGED, KERNEL, 3261, False), (PREFERRED, KERNEL, 3261, False)):
        answer = driver(machine, "login", port, target=name, uni=["user", SECRET], demand=demand)
        check((answer["status"], answer["chap"]) == (DONE, used), demand, name, answer)
        driver(machine, "logout", target=name, session=answer["tsih"])


def moved(machine):
    machine.succeed("; ".join(f"{targets.TGT} --op update --mode target --tid 2 --name Redirect{name} --value {value}"
                              for name, value in (("Address", "127.0.0.2"), ("Port", 3261), ("Reason", "Temporary"))))
    answer = driver(machine, "login", target=MOVING)
    check((answer["status"], answer.get("movedTo")) == (MOVED, ["127.0.0.2", 3261]), answer)


def ipv6(machine):
    machine.succeed("modprobe dummy && ip link add eth1 type dummy && ip link set eth1 up && ip -6 addr add fe80::10/64 dev eth1")
    machine.until("! ip -6 addr | grep tentative")
    for address in "::1", "fe80::10%eth1":
        given = {"target": TGT, "uni": ["user", SECRET], "host": address}
        answer = driver(machine, "login", **given)
        check(answer["status"] == DONE, address, answer)
        check(driver(machine, "login", **given).get("status") == SESSION_EXISTS, "no session was found at", address)
        driver(machine, "logout", target=TGT, session=answer["tsih"])
        check(sessions(machine) == [] and set(records(machine)) == {"ifaces/hcli.hba0"}, address, records(machine))


def killed(machine):
    """At any time of a login: at most one session comes of it, and the next login or logout works."""
    outcomes = {"a session": 0, "none": 0}
    given = {"target": TGT, "uni": ["user", SECRET]}
    asked = shlex.quote(json.dumps({"operation": "login", "host": "127.0.0.1", "port": 3260, **given}))
    for kill in range(20):
        machine.succeed(f"(echo {asked} | LD_LIBRARY_PATH=/usr/lib linux-driver & p=$!; usleep {kill * 30000}; kill -9 $p) "
                        ">/dev/null 2>&1; while pidof iscsiadm; do sleep 0.1; done >/dev/null")
        left = sessions(machine)
        outcomes["a session" if left else "none"] += 1
        answer = driver(machine, "login", **given)
        check(answer.get("status") == SESSION_EXISTS if left else answer.get("status") == DONE, kill, left, answer)
        now = sessions(machine)
        check(len(now) == 1 and (not left or left == now), kill, left, now)
        driver(machine, "logout", target=TGT, session=int(now[0].removeprefix("session")))
        check(sessions(machine) == [] and set(records(machine)) == {"ifaces/hcli.hba0"}, kill, records(machine))
    check(all(outcomes.values()), "the delays miss what they are for:", outcomes)


def refusals(machine):
    kernel = {"port": targets.KERNEL_PORT}
    refused(machine, NOT_FOUND, target="iqn.2026-11.org.example:none")
    refused(machine, UNAVAILABLE, target="iqn.2026-11.org.example:none", **kernel)  # which is what that one says
    refused(machine, NOT_ALLOWED, target=CLOSED, **kernel)
    refused(machine, NOT_AUTHENTICATED, target=TGT, uni=["user", OTHER])
    refused(machine, NOT_AUTHENTICATED, target=TGT)
    refused(machine, TARGET_UNPROVEN, target=TGT, uni=["user", SECRET], mutual=["target", OTHER])
    refused(machine, TARGET_WITHOUT_CHAP, target=KERNEL, uni=["user", SECRET], **kernel)
    machine.succeed(f"{targets.TGT} --op update --mode target --tid 1 --name HeaderDigest --value None")
    refused(machine, NO_COMMON_DIGEST, target=TGT, uni=["user", SECRET], headerDigest=REQUIRED)
    refused(machine, NO_ANSWER, target=TGT, port=3999)
    machine.succeed("sleep 99 | nc -l -p 3998 >/dev/null & sleep 0.2")  # takes connections, and says nothing
    refused(machine, NO_ANSWER, target=TGT, port=3998, limit=3000)


def without_daemon(machine):
    machine.succeed("kill $(pidof iscsid)")
    machine.until("! pidof iscsid")
    answer = driver(machine, "login", target=TGT, uni=["user", SECRET])
    check("hcli linux check" in answer.get("error", ""), answer)
    check(set(records(machine)) == {"ifaces/hcli.hba0"}, records(machine))


with Machine() as emulated:
    emulated.succeed("modprobe -a iscsi_tcp sd_mod && iscsid")
    targets.start_tgt(emulated)
    targets.add_tgt(emulated, 1, TGT)
    targets.add_tgt(emulated, 2, MOVING)
    emulated.succeed(f"""set -e
{targets.TGT} --op new --mode account --user user --password '{SECRET}'
{targets.TGT} --op bind --mode account --tid 1 --user user
{targets.TGT} --op new --mode account --user target --password '{MUTUAL}'
{targets.TGT} --op bind --mode account --tid 1 --user target --outgoing""")
    targets.start_kernel(emulated)
    for name in KERNEL, CLOSED:
        targets.add_kernel(emulated, name)
    emulated.succeed(f"echo 0 >{targets.CONFIG}/iscsi/{CLOSED}/tpgt_1/attrib/generate_node_acls")
    # Everything that anybody could see of a process is looked at throughout.
    emulated.succeed("while :; do cat /proc/[0-9]*/cmdline; done >/tmp/command-lines 2>/dev/null &")
    for part in found, logged_in, digests, chap_words, ipv6, killed, moved, refusals, without_daemon:
        part(emulated)
    lines = emulated.succeed(r"tr '\0' '\n' </tmp/command-lines | sort -u")
    check("--login" in lines, "no login was seen in the list of processes")
    shown = [secret for secret in (SECRET, OTHER, MUTUAL) if secret in lines]
    check(not shown, "in the list of processes:", shown)
