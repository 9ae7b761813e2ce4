"""The message catalogue: the format strings of kestrel's warn() calls,
read from its sources, and patterns that find them in text."""

import os
import re

from . import SOURCE

WARN_CALL = re.compile(r'\bwarn\(\s*((?:"(?:[^"\\]|\\.)*"\s*)+)', re.S)
STRING = re.compile(r'"((?:[^"\\]|\\.)*)"')
CONVERSION = re.compile(r"(%s|%d)")
SOURCES = os.path.join(SOURCE, "src")


def formats(source_dir=SOURCES):
    """Every format string given to warn() in the .cc files below
    source_dir, adjacent literals joined, sorted."""
    found = set()
    for directory, _, names in os.walk(source_dir):
        for name in names:
            if name.endswith(".cc"):
                with open(os.path.join(directory, name)) as source:
                    for call in WARN_CALL.finditer(source.read()):
                        found.add("".join(STRING.findall(call.group(1))))
    return sorted(found)


def pattern(format_string, text=".*", number="-?[0-9]+"):
    """A regular expression for the format's output: text stands for a %s,
    number for a %d."""
    parts = CONVERSION.split(format_string)
    return "".join(
        text if part == "%s" else number if part == "%d" else re.escape(part)
        for part in parts
    )


# Every line kestrel's code writes: "kestrel: MESSAGE: ERRNO-TEXT".
ERRNO_TEXTS = sorted(
    {os.strerror(number) for number in range(0, 134)}, key=len, reverse=True
)
WARNING = re.compile(
    "kestrel: (?:"
    + "|".join(pattern(message) for message in formats())
    + "): (?:"
    + "|".join(re.escape(text) for text in ERRNO_TEXTS)
    + ")"
)
