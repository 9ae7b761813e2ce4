"""Checks that every warning the tool can print is explained in the
DIAGNOSTICS section of its manual page.

    python3 -m harness.check_diagnostics PAGE

The warnings are the message catalogue (harness.messages); each must appear
in the section's rendered text, any text standing for a %s or %d.
"""

import os
import re
import subprocess
import sys

from . import messages

HEADING = re.compile(r"^[A-Z][A-Z ]+$")


def section(page, title):
    rendered = subprocess.run(
        ["man", "-l", page],
        check=True,
        capture_output=True,
        text=True,
        env=dict(os.environ, MANWIDTH="1000", MAN_KEEP_FORMATTING=""),
    ).stdout
    lines, inside = [], False
    for line in rendered.splitlines():
        if HEADING.match(line):
            inside = line == title
        elif inside:
            lines.append(line.strip())
    return " ".join(" ".join(lines).split())


def main():
    page = sys.argv[1]
    formats = messages.formats()
    text = section(page, "DIAGNOSTICS")
    if not formats or not text:
        print(
            f"found {len(formats)} warnings and {len(text)} characters of DIAGNOSTICS"
        )
        return 1
    missing = [
        format_string
        for format_string in formats
        if not re.search(messages.pattern(format_string, ".+?", ".+?"), text)
    ]
    for format_string in missing:
        print(f"not in DIAGNOSTICS: {format_string}")
    print(f"{len(formats) - len(missing)} of {len(formats)} warnings explained")
    return 1 if missing else 0


if __name__ == "__main__":
    sys.exit(main())
