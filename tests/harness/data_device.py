"""What kestrel-data's runs may do to a device tree: its staged sets, the
sets the links designate, the entries whose names start with "." (never a
data set: scratch directories, sets being removed, the lock file, the new
tz_latest link) and the lines it may print."""

import hashlib
import os

from . import layout, messages

STAGED = layout.STAGED.rstrip("/")
LATEST = layout.rel(layout.LATEST_LINK)
LOCK = layout.rel(layout.TIMEZONE_DIR) + ".kestrel-data.lock"
NEW_LATEST = layout.rel(layout.TIMEZONE_DIR) + ".tz_latest.new"
# kestrel-data's own lines: "kestrel-data: ..." and "kestrel-data clean: ...".
# Reading the device's data sets it shares kestrel's code, whose warnings
# (harness.messages) it prints as kestrel does.
OWN_LINES = ("kestrel-data: ", "kestrel-data clean: ")


def set_names(tree, hidden=False):
    """The names of the directories in tz/, only those that start with "."
    when hidden, else only the others."""
    return sorted(
        os.path.basename(path)
        for path, entry in tree.items()
        if os.path.dirname(path) == STAGED
        and entry[0] == "dir"
        and os.path.basename(path).startswith(".") == hidden
    )


def subtree(tree, name):
    """The entries of tz/NAME, by their paths inside it; None when absent."""
    top = f"{STAGED}/{name}"
    if top not in tree:
        return None
    return {
        path[len(top) :]: entry
        for path, entry in tree.items()
        if path == top or path.startswith(top + "/")
    }


def designated(tree):
    """The names of the sets that the zoneinfo link and tz_latest name."""
    names = set()
    for path, suffix in ((layout.rel(layout.ZONEINFO_LINK), "/zoneinfo"), (LATEST, "")):
        entry = tree.get(path)
        prefix = layout.STAGED_DIR
        if entry and entry[0] == "link" and entry[1].startswith(prefix):
            name = entry[1][len(prefix) :]
            names.add(name[: len(name) - len(suffix)] if suffix else name)
    return names & set(set_names(tree))


def without_leftovers(tree):
    """The tree without the lock file, the new tz_latest link, scratch
    directories and the tz/ directory itself (which staging makes)."""
    scratch = f"{STAGED}/.stage-"
    return {
        path: entry
        for path, entry in tree.items()
        if path not in (LOCK, NEW_LATEST, STAGED) and not path.startswith(scratch)
    }


def ending_problems(run, timeout):
    """The ways a run may not end: a hang, a death by a signal, a line that
    is neither kestrel-data's own nor a warning of kestrel's code."""
    problems = []
    if run.timed_out:
        problems.append(f"no end within {timeout} s")
    elif run.returncode < 0 or (run.trace is not None and run.trace.signal):
        signal = run.trace.signal if run.trace is not None else None
        problems.append("killed by " + (signal or run.exit_text()))
    problems += [
        "foreign line: " + line
        for line in run.stderr
        if not line.startswith(OWN_LINES) and not messages.WARNING.fullmatch(line)
    ]
    return problems


def left_intact(before, after, names):
    """The sets among names whose tree differs."""
    return [
        f"set {name} changed or lost"
        for name in sorted(names)
        if subtree(before, name) != subtree(after, name)
    ]


class ByTree:
    """The result of a function of a device tree, kept for every tree seen:
    a next run is the same on the same device, and most faults leave the
    same device."""

    def __init__(self, function):
        self.function = function
        self.seen = {}

    def __call__(self, tree):
        key = hashlib.sha256(repr(sorted(tree.items())).encode()).digest()
        if key not in self.seen:
            self.seen[key] = self.function(tree)
        return self.seen[key]
