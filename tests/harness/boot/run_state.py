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


class packaged:
    """The package's programs, unpacked into WORK, for the device sandbox and
    for making data sets on this machine."""

    def __init__(self, deb, work):
        tree = os.path.join(work, "unpacked")
        shutil.rmtree(tree, ignore_errors=True)
        subprocess.run(["dpkg-deb", "-x", deb, tree], check=True)
        self.kestrel = os.path.join(tree, "usr/sbin/kestrel")
        self.data = os.path.join(tree, "usr/bin/kestrel-data")
        self.probe = os.path.join(tree, "usr/libexec/kestrel/kestrel-icu-probe")


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


def clean_up_agent(root, programs):
    """What the clean-up agent does on the device root when kestrel left its
    marker there: kestrel-data clean's lines (standard output and error, as
    the journal takes them) and status; None without the marker."""
    if not os.path.exists(os.path.join(root, layout.rel(layout.NEEDS_CLEANUP))):
        return None
    ran = subprocess.run(
        [sandbox.SANDBOX, root, programs.data, "clean"],
        stdin=subprocess.DEVNULL,
        stdout=subprocess.PIPE,
        stderr=subprocess.STDOUT,
        timeout=SANDBOX_TIMEOUT,
        check=False,
    )
    return {"lines": ran.stdout.decode().splitlines(), "status": ran.returncode}


def sandbox_boot(root, programs):
    """A boot's work on the device root: kestrel, then the clean-up agent if
    kestrel set the marker; their lines and status, what date and zdump
    report and the var/db tree afterwards."""
    # A hang gives no lines and the status "timeout".
    ran = sandbox.run_kestrel(root, programs.kestrel, timeout=SANDBOX_TIMEOUT)
    lines = [] if ran.timed_out else ran.lines()
    status = "timeout" if ran.timed_out else ran.returncode
    clean = clean_up_agent(root, programs)
    dates, zdump = read_local_time(root)
    return {
        "lines": lines,
        "status": status,
        "clean": clean,
        "dates": dates,
        "zdump": zdump,
        "tree": trees.read(os.path.join(root, "var/db"), "var/db/"),
    }


def sandbox_runs(prepared, work, name, programs):
    """The state on a bare device root, booted twice."""
    root = bare_device(prepared, work)
    states.lay_out(root, name)
    runs = [sandbox_boot(root, programs) for _ in range(2)]
    shutil.rmtree(root)
    return runs


def links_and_record(tree):
    return {
        path: entry
        for path, entry in tree.items()
        if entry[0] == "link" or path.endswith("/TZVersionDiffRecord")
    }


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
    runs = sandbox_runs(prepared, work, name, packaged(deb, work))
    for number, run in enumerate(runs, 1):
        if run["status"] != 0:
            log(
                f"{name}: the device sandbox's run {number} ended with "
                f"{run['status']} {run['lines']}"
            )
    wrong, booted = [], []
    for number, run in enumerate(runs, 1):
        boot_name = f"boot{number}"
        booted_now = qemu.boot_or_report(root_image, prepared, work, boot_name, wrong)
        if booted_now is None:
            break
        results, seconds = booted_now
        got = check.results(results)
        tree = trees.from_tar(os.path.join(results, "var-db.tar"), "var/db")
        row[boot_name] = seconds
        row["kestrel" + str(number)] = got.duration_ms()
        log(
            f"{name}: {boot_name} took {seconds:.0f} s, kestrel "
            f"{got.duration_ms():.1f} ms, lines {got.warnings()}"
        )
        if number == 2:
            # The first boot's agent consumed the marker.
            expected = dict(expected, warnings=None, files={}, absent=[], agent=False)
            if links_and_record(tree) != links_and_record(booted[0]):
                wrong.append(
                    "boot2: the second boot changed the links or " "the record"
                )
        wrong += [
            f"{boot_name}: {text}"
            for text in check.boot_matches(got, run, tree, expected)
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
