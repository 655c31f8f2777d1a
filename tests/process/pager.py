"""A result that the terminal does not hold goes through the pager that is named, and none loses it."""

from support.program import Host, check

host = Host()
LINE = "iscsi adapter get --adapter hba1"
whole = host.succeed(LINE)
height = whole.count("\n")
paged = "".join(f"P:{line}\n" for line in whole.splitlines())
CASES = [
    (height, LINE, {"HCLI_PAGER": "sed s/^/P:/"}, paged),
    (height + 1, LINE, {"HCLI_PAGER": "sed s/^/P:/"}, whole),
    (5, LINE, {"PAGER": "sed s/^/P:/"}, paged),
    (5, LINE, {"PAGER": "sed s/^/P:/", "HCLI_PAGER": ""}, whole),
    (5, LINE, {"HCLI_PAGER": " "}, whole),
    (5, LINE, {"PAGER": "sed s/^/P:/", "TERM": "dumb"}, whole),
    (5, LINE + " --no-pager", {"PAGER": "sed s/^/P:/"}, whole),
    (5, LINE, {"PAGER": "exit 127"}, whole),
    # It ends without reading, long before there is nothing more to write.
    (5, "catalogue --output json", {"PAGER": "exec <&-; echo enough"}, "enough\n"),
]
for rows, line, environment, expected in CASES:
    shown = host.on_terminal(line, rows=rows, **{"TERM": "xterm", **environment})
    check(shown == (expected.encode(), 0), f"{line} on {rows} rows with {environment}", shown, "expected", expected)
