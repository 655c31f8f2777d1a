"""An installed tree works wherever it is moved to: programs, libraries, plug-ins and host descriptions find each other."""

import json
import os
import re
import tempfile

from support.program import Host, check, read, run, succeeded

with tempfile.TemporaryDirectory(prefix="hcli installed ") as folder:
    installed, moved = os.path.join(folder, "installed"), os.path.join(folder, "moved away")
    done = run("cmake", "--install", os.environ["HCLI_BUILD_DIR"], "--prefix", installed)
    check(done.returncode == 0, done.stderr)
    os.rename(installed, moved)
    host = Host()
    hcli = os.path.join(moved, "bin", "hcli")
    catalogue = json.loads(host.succeed("catalogue --output json", executable=hcli))
    missing = {"iscsi adapter list", "simulator load", "catalogue"} - {node["path"] for node in catalogue["result"]}
    check(not missing, f"not in the catalogue: {missing}")
    check("hba0" in host.succeed("iscsi adapter list", executable=hcli), "no demo host")
    check(os.path.exists(host.database), "the host was not kept below HCLI_ROOT")
    for shell, script in (("bash", "bash-completion/completions/hcli"), ("zsh", "zsh/site-functions/_hcli"),
                          ("fish", "fish/vendor_completions.d/hcli.fish")):
        check(read(os.path.join(moved, "share", script)) == host.succeed(f"completion {shell}"), script)
    proposed = host.succeed("propose fish", executable=hcli, env=host.environment(COMP_LINE="hcli iscsi adapter get -A "))
    check("hba0" in proposed, proposed)
    pages = os.path.join(moved, "share/man")
    page = succeeded(run("man", "-M", pages, "hcli-iscsi-adapter-list", MANWIDTH="80", LC_ALL="C.UTF-8", MANPAGER="cat"))
    check("List all the iSCSI Host Bus Adapters on the system." in page, page)
    # A guide that is wrong is told where pages are made of it, and costs help no more than its texts.
    with open(os.path.join(moved, "share/hcli/guides/iscsi.yaml"), "a", encoding="utf-8") as guide:
        guide.write("filds: {}\n")
    done = host.run(f"manual --folder '{folder}'", executable=hcli)
    check(done.returncode == 4 and re.search(r'iscsi\.yaml:\d+: there is no key "filds"', done.stderr), done)
    check("Examples:" not in host.succeed("iscsi adapter list --help", executable=hcli), "a wrong guide was read")
    # Nothing in the tree may lead back to where it was built.
    for path, _, names in os.walk(moved):
        for file in (os.path.join(path, name) for name in names):
            check(not os.path.islink(file), f"{file} is a link to {os.path.realpath(file)}")
