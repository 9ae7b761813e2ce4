"""Runs kestrel-preview over the sample device and checks that the device is
unchanged afterwards, to the file times, and that the preview printed what
kestrel really does: the same warning lines, the same exit, and one change
line per entry kestrel changes, with the new link targets and file contents.

    python3 -m harness.check_preview PREVIEW KESTREL WORK_DIR

The preview runs as on a device, as root over /var/db: in the device
sandbox's private user and mount namespace, where the sample device's var/db
and usr/share are mounted over /var/db and /usr/share.
"""

import os
import shutil
import sys

from . import device, sandbox
from . import tree as trees


def stamps(root):
    """Every entry's owner and modification time."""
    found = {}
    for directory, dirs, files in os.walk(root):
        for name in dirs + files:
            info = os.lstat(os.path.join(directory, name))
            found[os.path.join(directory, name)] = (
                info.st_uid,
                info.st_gid,
                info.st_mtime_ns,
            )
    return found


def expected_line_end(entry):
    if entry is None:
        return "removed"
    if entry[0] == "link":
        return f"-> {entry[1]}"
    return f'"{entry[2].decode()}"'


def section(lines, heading, end):
    start = lines.index(heading) + 1
    return lines[start : next(i for i in range(start, len(lines)) if end(lines[i]))]


def main():
    preview, kestrel, work = sys.argv[1:4]
    shutil.rmtree(work, ignore_errors=True)
    os.makedirs(work)
    sample, real = os.path.join(work, "device"), os.path.join(work, "real")
    device.sample(sample)
    before, before_stamps = trees.read(sample, "/"), stamps(sample)

    shown = sandbox.reader(
        sample,
        [preview, "--kestrel", os.path.abspath(kestrel)],
        capture_output=True,
        text=True,
    )
    print(shown.stdout, shown.stderr, sep="")
    if shown.returncode != 0:
        print(f"kestrel-preview exited with {shown.returncode}")
        return 1
    failed = False
    if trees.read(sample, "/") != before or stamps(sample) != before_stamps:
        print("FAILED: the device changed under kestrel-preview")
        failed = True

    # What kestrel really does, on a copy of the device.
    shutil.copytree(sample, real, symlinks=True)
    ran = sandbox.run_kestrel(real, os.path.abspath(kestrel))
    done = {
        path: trees.read(real, "/").get(path)
        for path in trees.changed(before, trees.read(real, "/"), "/var/db/")
    }

    lines = shown.stdout.splitlines() + ["exit:"]
    warnings = section(lines, "warnings:", lambda line: line.startswith("exit:"))
    expected_warnings = ["  " + line for line in ran.lines()] or ["  none"]
    if warnings != expected_warnings:
        print(f"FAILED: warnings {warnings}, kestrel printed {expected_warnings}")
        failed = True
    if f"exit: {ran.exit_text()}" not in lines:
        print(f"FAILED: kestrel's exit was {ran.exit_text()}")
        failed = True

    listed = {
        line.split()[1].rstrip(":"): line
        for line in section(
            lines, "changes under /var/db:", lambda line: line == "exit:"
        )
    }
    if set(listed) != set(done):
        print(f"FAILED: preview lists {sorted(listed)}, kestrel changed {sorted(done)}")
        failed = True
    for path, entry in done.items():
        line = listed.get(path, "")
        expected = expected_line_end(entry)
        if not line.rstrip().endswith(expected) and not line.split()[0] == expected:
            print(f"FAILED: for {path} expected '{expected}' in '{line}'")
            failed = True
    if not done:
        print("FAILED: the sample device should need changes")
        failed = True
    print(
        "FAILED"
        if failed
        else f"preview matched kestrel's {len(done)} changes; device unchanged"
    )
    return 1 if failed else 0


if __name__ == "__main__":
    sys.exit(main())
