"""The manual pages: one a command, set by man without a warning, with every character of options and examples."""

import os
import re
import subprocess
import sys

from support.program import Host, check, refused, run, succeeded

PAGES = os.path.join(os.environ["HCLI_BUILD_DIR"], "share/man/man1")


def words(text):
    """The text with its lines put together, also those that a backslash continues."""
    return " ".join(text.replace("\\\n", "").split())


def shown(page):
    """The words that man shows, without bold and italics."""
    man = ["man", "--warnings=w", "-E", "UTF-8", "-l", "-Tutf8", page]
    done = run(*man, MAN_KEEP_FORMATTING="0", MANPAGER="cat", LC_ALL="C.UTF-8")
    text = subprocess.run(["col", "-bx"], input=succeeded(done), capture_output=True, text=True, check=True).stdout
    return words(re.sub(r"\x1b\[[0-9;]*m", "", text))


host = Host()
nodes = {"hcli" + "".join(f"-{word}" for word in node["path"].split()): node
         for node in host.result("catalogue") if node["kind"] == "command"}
names = {name.removesuffix(".1") for name in os.listdir(PAGES)}
check(names == {"hcli", *nodes}, "pages without commands, and the other way round", names ^ {"hcli", *nodes})
host.succeed(f"--dry-run manual --folder {host.root}")
check("hcli.1" not in os.listdir(host.root), "a dry run wrote pages")
os.mkdir(os.path.join(host.root, "hcli.1"))  # no file takes its place
refused("pages", host.run(f"manual --folder {host.root}"), "cannot be written")
check(os.listdir(host.root) == ["hcli.1"], "some of the pages", os.listdir(host.root))
faults = []
for name, node in sorted(nodes.items()):
    page = os.path.join(PAGES, name + ".1")
    summary = node["description"].removesuffix(".")
    examples = host.succeed(f"help {node['path']}").partition("\nExamples:\n")[2].partition("\n\n")[0]
    examples = examples.replace("\\\n", "").splitlines()
    wanted = [f"{name} - {summary}", *examples, *(f"--{option['name']}" for option in node["parameters"])]
    text = shown(page)
    faults += [f"{name}: not shown: {part}" for part in wanted if words(part) not in text]
    if summary not in succeeded(run("lexgrog", page)):
        faults.append(f"{name}: an index does not find it")
check("--secret-file TEXT" in shown(os.path.join(PAGES, "hcli.1")), "hcli.1 has no options")
sys.exit("\n".join(faults) or 0)
