"""Kills kestrel just before each system call that changes the file system,
starts it again, and compares the device with one uninterrupted run; or
kills a kestrel-data command there and checks what it left.

    python3 -m harness.crash_points --kestrel build/kestrel [--jobs 2]
        [--state NAME]... [--windows FILE]
    python3 -m harness.crash_points --kestrel build/kestrel
        --data build/kestrel-data --command stage|clean [--state NAME]...

For every representative device state (harness.states.faults) it records
kestrel's own system calls, picks those that change the file system, and for
each one runs kestrel on a fresh copy of the state with strace delivering
SIGKILL on entry to that call (the call itself never runs: checked in the
trace, and on the device wherever the call changes it). Then it runs kestrel
again, uninterrupted, and compares the device's three links (zoneinfo,
icutz, localtime), then also TZVersionDiffRecord, needs_cleanup and
/var/db/icutz, with what one uninterrupted run from the state leaves.

Prints, per state and in all, how many crash points converge on the links
and on everything, and every window that does not converge with what it
leaves on the device. With --windows, the windows found must be exactly the
ones listed in FILE (one "STATE LEVEL kill before ACTION" per line); any
difference is printed as the lines to add or remove, and fails.

With --data, the same kills land in `kestrel-data stage` (of the small set,
harness.small_set) or `kestrel-data clean`, over their own states
(harness.states.data_commands), and what each kill leaves is judged by
harness.stage_checks or harness.clean_checks; every problem fails.
"""

import collections
import concurrent.futures
import shutil
import sys
import tempfile
import time

from . import data_runs, layout, strace, traced
from . import tree as trees

# Calls whose success always shows in the device tree.
VISIBLE = {
    "unlink",
    "unlinkat",
    "rmdir",
    "symlink",
    "symlinkat",
    "link",
    "linkat",
    "rename",
    "renameat",
    "renameat2",
    "mkdir",
    "mkdirat",
}
PLAIN_NAMES = {
    "unlinkat": "unlink",
    "symlinkat": "symlink",
    "linkat": "link",
    "renameat": "rename",
    "renameat2": "rename",
    "mkdirat": "mkdir",
    "mknodat": "mknod",
    "fchmodat": "chmod",
    "fchownat": "chown",
    "pwrite64": "write",
    "writev": "write",
    "pwritev": "write",
    "pwritev2": "write",
}


def action(call):
    """The call in words that stay when the calls are spelled otherwise
    (unlink or unlinkat, open or openat): "symlink LINK -> TARGET"."""
    names = strace.QUOTED.findall(call.arguments)
    if call.name in strace.OPENING or call.name == "creat":
        verb = {
            (True, True): "rewrite",
            (True, False): "create",
            (False, True): "truncate",
        }[("O_CREAT" in call.arguments, "O_TRUNC" in call.arguments)]
        return f"{verb} {names[0]}"
    name = PLAIN_NAMES.get(call.name, call.name)
    described = strace.DESCRIPTOR.findall(call.arguments)
    if described and not call.arguments.startswith("AT_FDCWD"):
        return f"{name} {described[0]}"
    if name in ("symlink", "link", "rename") and len(names) == 2:
        return f"{name} {names[1]} -> {names[0]}"
    return " ".join([name] + names)


class Point:
    def __init__(self, state, call, label, tree, expected):
        self.state = state
        self.call = call
        self.label = label
        self.tree = tree
        self.expected = expected


def record(state, tree, program):
    run = traced.record(state, tree, program)
    seen = collections.Counter()
    points = []
    for call in run.trace.calls:
        if not strace.changes_files(call):
            continue
        words = action(call)
        seen[words] += 1
        label = words if seen[words] == 1 else f"{words} #{seen[words]}"
        points.append(Point(state, call, label, tree, run.after))
    return points


class Result:
    """Whether the kill landed, the device it left (as a listing) and what
    judge made of that device: kestrel's run on it, or a kestrel-data
    command's outcome and problems."""

    def __init__(self, killed, crashed, judged):
        self.killed = killed
        self.crashed = crashed
        self.judged = judged


def crash(point, program, judge):
    scratch = tempfile.mkdtemp(prefix="kestrel-crash.")
    try:
        device = traced.build_device(scratch, point.tree)
        killed = traced.run(
            program, device, strace.injection_options(point.call, "signal=KILL")
        )
        # The trace tells the death: util-linux's unshare reports a child
        # killed by SIGKILL as exit status 1, not as that signal.
        ok = (
            killed.returncode != 0
            and killed.trace is not None
            and killed.trace.killed
            and strace.hit(killed.trace, point.call)
        )
        return Result(ok, trees.listing(killed.after), judge(point, device, killed))
    finally:
        shutil.rmtree(scratch, ignore_errors=True)


def rerun(kestrel):
    """kestrel started again on the device a kill left."""
    return lambda point, device, killed: traced.run(kestrel, device)


def kill_everywhere(chosen, program, judge, jobs):
    """The crash points of every state, and the result of each."""
    with concurrent.futures.ThreadPoolExecutor(jobs) as pool:
        recorded = list(
            pool.map(lambda state: record(state[0], state[1], program), chosen)
        )
        points = [point for state_points in recorded for point in state_points]
        results = list(pool.map(lambda point: crash(point, program, judge), points))
    return recorded, points, results


def main():
    options, kestrel, chosen = traced.command_line(__doc__, ("--windows", {}))
    started = time.monotonic()
    if options.data:
        with data_runs.checks(options, kestrel) as checks:
            judge = data_runs.judge_kill(checks)
            recorded, points, results = kill_everywhere(
                chosen, checks.program, judge, options.jobs
            )
        problems = check_kills(recorded, points, results)
        titles = [(p.state, f"{p.state}: kill before {p.label}") for p in points]
        judged = [result.judged for result in results]
        problems += data_runs.report(chosen, titles, judged, checks.KILLS_REACH)
        print(f"{time.monotonic() - started:.0f} s")
        for problem in problems:
            print("PROBLEM " + problem)
        return 1 if problems else 0

    recorded, points, results = kill_everywhere(
        chosen, kestrel, rerun(kestrel), options.jobs
    )
    problems = check_kills(recorded, points, results)
    windows = report(chosen, points, results)
    print(f"{time.monotonic() - started:.0f} s")
    for problem in problems:
        print("PROBLEM " + problem)
    if options.windows:
        problems += compare_windows(
            options.windows, windows, [name for name, _ in chosen]
        )
    return 1 if problems else 0


def check_kills(recorded, points, results):
    """Every kill landed on its call before the call ran: the trace shows
    the call unfinished, and a call that changes the device when it runs
    left the device as the kill at the next crash point finds it changed."""
    problems = []
    by_point = dict(zip(map(id, points), results))
    verified = 0
    for state_points in recorded:
        for number, point in enumerate(state_points):
            result = by_point[id(point)]
            if not result.killed:
                problems.append(
                    f"{point.state}: kill before {point.label} "
                    "did not land on that call"
                )
                continue
            if point.call.name not in VISIBLE or point.call.failed():
                continue
            if number + 1 < len(state_points):
                later = by_point[id(state_points[number + 1])].crashed
            else:
                later = trees.listing(point.expected)
            if result.crashed == later:
                problems.append(
                    f"{point.state}: {point.label} ran although "
                    "kestrel was killed on entering it"
                )
            else:
                verified += 1
    print(f"kills checked on the device: {verified} calls did not run")
    return problems


def report(chosen, points, results):
    links = layout.DEVICE_LINKS
    everything = layout.DEVICE_LINKS + layout.DEVICE_RECORDS
    totals = collections.Counter()
    windows = []
    for state, _ in chosen:
        counts = collections.Counter()
        for point, result in zip(points, results):
            if point.state != state:
                continue
            counts["points"] += 1
            got = traced.outcome(result.judged.after, everything)
            want = traced.outcome(point.expected, everything)
            if all(got[path] == want[path] for path in links):
                counts["links"] += 1
                level = "records"
            else:
                level = "links"
            if got == want:
                counts["everything"] += 1
                continue
            consequence = "; ".join(
                f"{path}: {got[path]} instead of {want[path]}"
                for path in everything
                if got[path] != want[path]
            )
            windows.append((f"{state} {level} kill before {point.label}", consequence))
        totals.update(counts)
        print(
            f"{state}: {counts['points']} crash points, "
            f"{counts['links']} converge on the links, "
            f"{counts['everything']} on everything"
        )
    print(
        f"crash points {totals['points']}, converge on the links "
        f"{totals['links']}, on everything {totals['everything']}"
    )
    for window, consequence in windows:
        print(f"WINDOW {window}\n  leaves {consequence}")
    return [window for window, _ in windows]


def compare_windows(file_name, windows, names):
    with open(file_name, encoding="utf-8") as listed:
        expected = [
            line.strip()
            for line in listed
            if line.strip() and not line.startswith("#") and line.split()[0] in names
        ]
    new = [window for window in windows if window not in expected]
    gone = [window for window in expected if window not in windows]
    for window in new:
        print(f"NEW WINDOW (add to {file_name} once understood): {window}")
    for window in gone:
        print(f"CLOSED WINDOW (remove from {file_name}): {window}")
    if not new and not gone:
        print(f"the windows are the {len(expected)} listed in {file_name}")
    return new + gone


if __name__ == "__main__":
    sys.exit(main())
