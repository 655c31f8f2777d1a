"""What hcli prints, byte by byte, in each format, in a pipe and on a terminal, in any locale.

UPDATE_GOLDEN=1 in the environment writes tests/golden/ anew and shows what has changed.
"""

import json
import os
import sys

from support.program import SOURCE, Host, expect_file, finished, read

GOLDEN = os.path.join(SOURCE, "tests/golden")
FORMATS = ["simple", "table", "csv", "json", "yaml"]
# file: the command lines that it shows
CASES = {
    "list": ["iscsi adapter list", "iscsi adapter list --fields Adapter,Description"],
    "get": ["iscsi adapter get --adapter hba1"],
    "last-errors": ["iscsi adapter target list --adapter hba1"],
    "empty-list": ["iscsi adapter discovery sendtarget list"],
    "text-result": ["iscsi software set --enabled true"],
    "bool-result": ["iscsi software get", "iscsi adapter set --adapter hba1 --alias 'Büro 東京'",
                    "--quiet iscsi adapter set --adapter hba1 --alias 'Büro 東京'"],
    "failure": ["iscsi adapter set --adapter hba9 --alias x", "iscsi adapter get --adapter 'häb 1'"],
    "result-and-report": ["iscsi adapter set --adapter hba9 --name iqn.2026-11.org.example:soft"],
    "dry-run": ["--dry-run iscsi adapter set --adapter hba1 --alias x", "--dry-run iscsi software get",
                "--dry-run iscsi adapter set --adapter hba9 --name iqn.2026-11.org.example:new --alias x"],
    "usage-error": ["iscsi adapter get", "iscsi software set --enabled perhaps", "iscsi adapter set --adaptor hba1"],
    "unknown-word": ["iscsi adapter lits", "iscsi adaptor list", "söftware"],
    "help-root": ["--help"],
    "help-namespace": ["iscsi", "iscsi adapter", "iscsi software --help"],
    "help-command": ["iscsi adapter auth chap set --help", "iscsi software get --help"],
}


def piped(host, line, locale):
    """Standard output, standard error and status, with every byte."""
    done = finished(host.start(line, env=host.environment(LC_ALL=locale), text=False, encoding=None))
    return done.stdout, done.stderr, done.returncode


def section(title, text):
    if not text:
        return ""
    return f"-- {title}\n" + text.decode() + ("" if text.endswith(b"\n") else "\n-- (no newline at the end)\n")


def seen(host, line, faults):
    out, err, status = texts = piped(host, line, "C.UTF-8")
    if piped(host, line, "C") != texts:
        faults.append(f"hcli {line}: other output with LC_ALL=C than with C.UTF-8")
    # Reports stand ahead of the result.
    terminal = host.on_terminal(line)
    if terminal != (err + out, status):
        faults.append(f"hcli {line}: on a terminal {terminal}, in pipes {texts}")
    return section("output", out) + section("errors", err) + f"-- status {status}\n\n"


def transcript(host, line, faults):
    """Formats that show the same stand together."""
    shown = {}
    for form in FORMATS:
        written = f"--output {form} {line}"
        shown.setdefault(seen(host, written, faults), []).append(f"$ hcli {written}\n")
    return "".join("".join(lines) + text for text, lines in shown.items())


def main():
    host, faults = Host(json.loads(read(os.path.join(GOLDEN, "host.json")))), []
    texts = {f"{name}.txt": "".join(transcript(host, line, faults) for line in lines) for name, lines in CASES.items()}
    # All that is declared: paths, descriptions, options, fields, and how results are shown.
    texts["catalogue.json"] = json.dumps(host.result("catalogue"), indent=1, ensure_ascii=False) + "\n"
    texts["../../docs/reference/commands.md"] = host.succeed("reference")
    renewed = os.environ.get("UPDATE_GOLDEN") == "1"
    faults += filter(None, [expect_file(f"{GOLDEN}/{name}", text, renewed) for name, text in texts.items()])
    if faults:
        sys.exit("\n".join(faults) + "If this is meant: UPDATE_GOLDEN=1 ctest -R process.golden, and read the diff.")


main()
