"""What bash proposes with the script that hcli writes for it."""

import subprocess

from support.program import HCLI, check, run, succeeded

# The line up to the cursor as bash splits it, and some of what is proposed; an empty text is no proposal.
CASES = [
    (["isc"], "iscsi"),
    (["iscsi", "adapter", "li"], "list"),
    (["iscsi", "adapter", "list", "--out"], "--output"),
    (["iscsi", "adapter", "list", "--output", ""], "simple table csv json yaml"),
    (["iscsi", "adapter", "list", "--output", "="], "simple table csv json yaml"),
    (["iscsi", "adapter", "list", "--output", "=", "js"], "json"),
    (["iscsi", "adapter", "list", "--plug"], ""),
    (["iscsi", "adapter", "get", "--adapter", ""], ""),
    (["iscsi", "adapter", "get", "--adapter", "hba0", "--ou"], "--output"),
    (["iscsi", "software", "set", "-e", "t"], "true"),
    (["iscsi", "adapter", "auth", "chap", "set", "-d", ""], "uni mutual"),
    (["simulator", "load", "--file", ""], ""),
    (["completion", "z"], "zsh"),
]

script = succeeded(run(HCLI, "completion", "bash"))
for words, expected in CASES:
    line = 'eval "$SCRIPT"; COMP_WORDS=(hcli "$@"); COMP_CWORD=$#; _hcli; echo "${COMPREPLY[@]}"'
    done = subprocess.run(["bash", "-c", line, "bash", *words], capture_output=True, text=True, env={"SCRIPT": script})
    check(succeeded(done).strip() == expected, words, "expected", expected, done)
