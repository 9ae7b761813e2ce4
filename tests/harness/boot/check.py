"""Checks one boot's results against the state's expectations and against
the device sandbox's run of the same state with the same binary. Each check
returns the list of what is wrong."""

import json
import os

from .. import tree as trees

STARTING = "7d4958e842da4a758f6c1cdc7b36dcc5"  # systemd's "Starting ..." job
# Ordinary services of the test system that read the local time.
READERS = ["cron.service", "systemd-timesyncd.service"]


def read_show(path):
    """systemctl show output: one dict per unit, split on blank lines."""
    units, unit = [], {}
    with open(path) as show:
        for line in show.read().splitlines() + [""]:
            if not line:
                if unit:
                    units.append(unit)
                unit = {}
                continue
            key, _, value = line.partition("=")
            unit[key] = value
    return units


def read_journal(path):
    with open(path) as journal:
        return [json.loads(line) for line in journal if line.strip()]


class results:
    """One boot's results as the collector wrote them."""

    def __init__(self, directory):
        self.directory = directory
        self.kestrel = read_show(os.path.join(directory, "kestrel.show"))[0]
        self.clean = read_show(os.path.join(directory, "clean.show"))[0]
        self.units = {
            unit["Id"]: unit
            for unit in read_show(os.path.join(directory, "units.show"))
        }
        self.journal = read_journal(os.path.join(directory, "journal.json"))
        self.date = self.lines("date")
        self.zdump = self.lines("zdump")

    def lines(self, name):
        with open(os.path.join(self.directory, name)) as text:
            return text.read().splitlines()

    def warnings(self, unit="kestrel.service"):
        return [
            entry["MESSAGE"]
            for entry in self.journal
            if entry.get("_SYSTEMD_UNIT") == unit
        ]

    def starts(self, unit):
        """systemd's "Starting" job messages for UNIT."""
        return [
            entry
            for entry in self.journal
            if entry.get("UNIT") == unit and entry.get("MESSAGE_ID") == STARTING
        ]

    def microseconds(self, key, unit=None):
        """A value of kestrel's systemctl show, of the agent's ("clean") or of
        another unit's."""
        if unit is None:
            shown = self.kestrel
        elif unit == "clean":
            shown = self.clean
        else:
            shown = self.units[unit]
        return int(shown.get(key) or 0)

    def duration_ms(self):
        return (
            self.microseconds("ExecMainExitTimestampMonotonic")
            - self.microseconds("ExecMainStartTimestampMonotonic")
        ) / 1000


def unit_ran_once(got):
    wrong = []
    want = {
        "Result": "success",
        "ExecMainStatus": "0",
        "ExecMainCode": "1",
        "ActiveState": "active",
        "NRestarts": "0",
    }
    for key, value in want.items():
        if got.kestrel.get(key) != value:
            wrong.append(
                f"kestrel.service {key}={got.kestrel.get(key)}, " f"expected {value}"
            )
    starts = got.starts("kestrel.service")
    if len(starts) != 1:
        wrong.append(f"the journal holds {len(starts)} starts of kestrel")
    pids = {
        entry.get("_PID")
        for entry in got.journal
        if entry.get("_SYSTEMD_UNIT") == "kestrel.service"
    }
    if len(pids) > 1:
        wrong.append(f"kestrel wrote from {len(pids)} processes")
    return wrong


def warnings_match(got, sandbox_lines, expected):
    wrong = []
    lines = got.warnings()
    if lines != sandbox_lines:
        wrong.append(
            f"journal lines {lines} differ from the device "
            f"sandbox's {sandbox_lines}"
        )
    if expected is not None:
        prefixes = [line.rsplit(": ", 1)[0] for line in lines]
        if prefixes != ["kestrel: " + text for text in expected]:
            wrong.append(f"warnings {lines}, expected {expected}")
    return wrong


def clean_up_agent(got, sandbox_clean, expected):
    """The agent (kestrel-clean.service, started by its path unit) ran once,
    after kestrel had finished, and said and ended as kestrel-data clean did
    in the device sandbox, exactly when kestrel left its marker; otherwise it
    never started. EXPECTED says whether the state's boot sets the marker."""
    unit = "kestrel-clean.service"
    started = got.microseconds("InactiveExitTimestampMonotonic", "clean")
    starts = len(got.starts(unit))
    lines = got.warnings(unit)
    if sandbox_clean is None:
        wrong = [] if not expected else ["kestrel set no clean-up marker"]
        if started or starts or lines:
            wrong.append(
                f"{unit} ran ({starts} starts, lines {lines}) without a marker"
            )
        return wrong
    wrong = [] if expected else ["kestrel set the clean-up marker"]
    ended = got.microseconds("ExecMainExitTimestampMonotonic")
    if starts != 1 or not started > ended:
        wrong.append(
            f"{unit} started {starts} times, at {started} us, kestrel ended at {ended}"
        )
    status = got.clean.get("ExecMainStatus")
    if status != str(sandbox_clean["status"]) or (
        status == "0" and got.clean.get("Result") != "success"
    ):
        wrong.append(
            f"{unit} Result={got.clean.get('Result')} status {status}, "
            f"sandbox status {sandbox_clean['status']}"
        )
    if lines != sandbox_clean["lines"]:
        wrong.append(
            f"{unit} said {lines}, the sandbox's clean {sandbox_clean['lines']}"
        )
    return wrong


def finished_first(got):
    end = got.microseconds("ExecMainExitTimestampMonotonic")
    if not end:
        return ["kestrel has no exit time"]
    wrong = []
    sysinit = got.microseconds("ActiveEnterTimestampMonotonic", "sysinit.target")
    if not end < sysinit:
        wrong.append(f"kestrel ended at {end} us, sysinit.target at {sysinit}")
    for reader in READERS:
        start = got.microseconds("InactiveExitTimestampMonotonic", reader)
        if not end < start:
            wrong.append(f"kestrel ended at {end} us, {reader} started at {start}")
    return wrong


def tree_matches(tree, sandbox_tree, expected):
    wrong = []

    def show(path, entry):
        return "absent" if entry is None else trees.describe(path, entry)

    for path in sorted(set(tree) | set(sandbox_tree)):
        if tree.get(path) != sandbox_tree.get(path):
            wrong.append(
                f"booted {show(path, tree.get(path))}, "
                f"sandbox {show(path, sandbox_tree.get(path))}"
            )
    for path, target in expected["links"].items():
        if tree.get(path) != ("link", target):
            wrong.append(f"{show(path, tree.get(path))}, expected link to {target}")
    for path, content in expected["files"].items():
        entry = tree.get(path)
        if entry is None or entry[0] != "file" or entry[2] != content:
            wrong.append(f"{show(path, entry)}, expected {content!r}")
    for path in expected["absent"]:
        if path in tree:
            wrong.append(f"{show(path, tree[path])}, expected absent")
    return wrong


def local_time_matches(got, sandbox_dates, sandbox_zdump, expected):
    wrong = []
    if got.date != expected["date"] or sandbox_dates != expected["date"]:
        wrong.append(
            f"date reports {got.date} (sandbox {sandbox_dates}), "
            f"expected {expected['date']}"
        )
    if got.zdump != sandbox_zdump:
        wrong.append(f"zdump reports {got.zdump}, sandbox {sandbox_zdump}")
    return wrong


def boot_matches(got, run, tree, expected):
    """One boot against the device sandbox's RUN of the same start and the
    EXPECTED links, files, absences, warnings, agent and dates."""
    return (
        unit_ran_once(got)
        + warnings_match(got, run["lines"], expected["warnings"])
        + finished_first(got)
        + clean_up_agent(got, run["clean"], expected["agent"])
        + tree_matches(tree, run["tree"], expected)
        + local_time_matches(got, run["dates"], run["zdump"], expected)
    )
