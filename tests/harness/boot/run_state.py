"""One device state: its disk image, the device sandbox's two runs of the
same state with the packaged binary, two boots, and every check."""

import os
import shutil
import subprocess
import time

from .. import layout, sandbox
from .. import tree as trees
from ..states import boot as states
from . import check, image, qemu

# The collector's instants: 2025-01-15 and 2025-07-15, 12:00 UTC.
INSTANTS = ["1736942400", "1752580800"]
SANDBOX_TIMEOUT = 60


def packaged_kestrel(deb, work):
    tree = os.path.join(work, "unpacked")
    shutil.rmtree(tree, ignore_errors=True)
    subprocess.run(["dpkg-deb", "-x", deb, tree], check=True)
    return os.path.join(tree, "usr/sbin/kestrel")


def read_local_time(root):
    """date and zdump of this machine, reading the device's links."""

    def reader(*command):
        return sandbox.reader(
            root, command, capture_output=True, text=True, check=True
        ).stdout.splitlines()

    dates = []
    for instant in INSTANTS:
        dates += reader(
            "env",
            "TZ=:" + layout.LOCALTIME_LINK,
            "date",
            "-d",
            "@" + instant,
            "+%Z%z",
        )
    zdump = reader("zdump", "-v", "-c", "2025,2026", layout.LOCALTIME_LINK)
    return dates, zdump


def bare_device(prepared, work):
    """A device root in WORK with only the system partition of the prepared
    test system (hard-linked), for a state to be laid out on."""
    root = os.path.join(work, "device")
    shutil.rmtree(root, ignore_errors=True)
    os.makedirs(os.path.join(root, "usr/share"))
    for entry in map(layout.rel, (layout.SYSTEM_ZONEINFO, layout.SYSTEM_ICU)):
        subprocess.run(
            ["cp", "-al", os.path.join(prepared, entry), os.path.join(root, entry)],
            check=True,
        )
    return root


def sandbox_runs(prepared, work, name, kestrel):
    """The state on a bare device root, run twice: per run the lines, the
    var/db tree and what date and zdump report."""
    root = bare_device(prepared, work)
    states.lay_out(root, name)
    runs = []
    for _ in range(2):
        # A hang gives no lines and the status "timeout".
        ran = sandbox.run_kestrel(root, kestrel, timeout=SANDBOX_TIMEOUT)
        lines = [] if ran.timed_out else ran.lines()
        status = "timeout" if ran.timed_out else ran.returncode
        dates, zdump = read_local_time(root)
        tree = trees.read(os.path.join(root, "var/db"), "var/db/")
        runs.append(
            {
                "lines": lines,
                "status": status,
                "dates": dates,
                "zdump": zdump,
                "tree": tree,
            }
        )
    shutil.rmtree(root)
    return runs


def links_and_record(tree):
    return {
        path: entry
        for path, entry in tree.items()
        if entry[0] == "link" or path.endswith("/TZVersionDiffRecord")
    }


def check_boot(got, run, expected, tree):
    return (
        check.unit_ran_once(got)
        + check.warnings_match(got, run["lines"], expected["warnings"])
        + check.finished_first(got)
        + check.tree_matches(tree, run["tree"], expected)
        + check.local_time_matches(got, run["dates"], run["zdump"], expected)
    )


def run_state(name, prepared, deb, work, log):
    work = os.path.join(work, "states", name)
    shutil.rmtree(work, ignore_errors=True)
    os.makedirs(work)
    row = {
        "name": name,
        "image": 0,
        "boot1": 0,
        "boot2": 0,
        "kestrel1": 0,
        "kestrel2": 0,
        "result": "FAILED",
    }
    started = time.monotonic()
    root_image, expected = image.state_image(prepared, work, name)
    row["image"] = time.monotonic() - started
    runs = sandbox_runs(prepared, work, name, packaged_kestrel(deb, work))
    for number, run in enumerate(runs, 1):
        if run["status"] != 0:
            log(
                f"{name}: the device sandbox's run {number} ended with "
                f"{run['status']} {run['lines']}"
            )
    wrong, booted = [], []
    for number, run in enumerate(runs, 1):
        boot_name = f"boot{number}"
        try:
            results, seconds = qemu.boot(root_image, prepared, work, boot_name)
        except qemu.boot_failed as failure:
            wrong.append(f"{boot_name}: {failure}")
            break
        got = check.results(results)
        tree = trees.from_tar(os.path.join(results, "var-db.tar"), "var/db")
        row[boot_name] = seconds
        row["kestrel" + str(number)] = got.duration_ms()
        log(
            f"{name}: {boot_name} took {seconds:.0f} s, kestrel "
            f"{got.duration_ms():.1f} ms, lines {got.warnings()}"
        )
        if number == 2:
            expected = dict(expected, warnings=None, files={}, absent=[])
            if links_and_record(tree) != links_and_record(booted[0]):
                wrong.append(
                    "boot2: the second boot changed the links or " "the record"
                )
        wrong += [
            f"{boot_name}: {text}" for text in check_boot(got, run, expected, tree)
        ]
        booted.append(tree)
    if wrong:
        log(f"{name}: FAILED\n  " + "\n  ".join(wrong))
        for number in (1, 2):
            log(
                f"{name}: tail of boot{number}.serial.log:\n"
                + qemu.serial_tail(work, f"boot{number}")
            )
    else:
        row["result"] = "passed"
        os.remove(root_image)
        log(f"{name}: passed")
    return row
