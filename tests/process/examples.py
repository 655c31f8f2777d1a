"""Every example that help shows works on the demo host, and every command has two."""

import os
import shutil
import subprocess
import sys

from support.program import HCLI, SOURCE, Host, complaints, read, write

NEW_HOST, DEMO = Host(), Host()
DEMO.succeed("iscsi adapter list")
BESIDE = os.path.join(NEW_HOST.root, "files")  # what examples find in the folder in which they are run
os.mkdir(BESIDE)
make_image = [os.path.join(SOURCE, "scripts/make-firmware"), "--version", "3.1.0", os.path.join(BESIDE, "image.bin")]
subprocess.run(make_image, check=True, stdout=subprocess.DEVNULL)
write(os.path.join(BESIDE, "secret.txt"), "vault-secret-1\n")
os.chmod(os.path.join(BESIDE, "secret.txt"), 0o600)
write(os.path.join(BESIDE, "host.json"), read(os.path.join(SOURCE, "hosts/demo.json")))


def examples(path):
    """The command lines below "Examples:" in the help on the command; sentences have a smaller indent."""
    section = NEW_HOST.succeed(f"help {path}").partition("\nExamples:\n")[2].partition("\n\n")[0]
    return [line.strip() for line in section.replace("\\\n        ", "").splitlines() if line.startswith(" " * 6)]


def fault(path, line):
    if f" {path}" not in line:
        return f"{path}: not an example of it: {line}"
    shutil.rmtree(os.path.join(NEW_HOST.root, "var"), ignore_errors=True)
    shutil.copytree(os.path.join(DEMO.root, "var"), os.path.join(NEW_HOST.root, "var"))
    environment = NEW_HOST.environment(PATH=os.path.dirname(HCLI) + os.pathsep + os.environ["PATH"])
    done = subprocess.run(["bash", "-e", "-o", "pipefail", "-c", line], cwd=BESIDE, env=environment, text=True,
                          stdin=subprocess.DEVNULL, capture_output=True, timeout=60)
    return f"{line}: {done}" if done.returncode or complaints(done) else ""


commands = [node["path"] for node in DEMO.result("catalogue") if node["kind"] == "command"]
faults = [f"{path} has {len(lines)} examples" for path in commands if len(lines := examples(path)) != 2]
# What "linux" says depends on the machine.
ran = [path for path in commands if not path.startswith("linux ")]
faults += filter(None, (fault(path, line) for path in ran for line in examples(path)))
sys.exit("\n".join(faults) or 0)
