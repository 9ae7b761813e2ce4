"""Runs one scenario: builds its device tree, runs kestrel on it through the
device sandbox, and compares standard error, exit and the tree afterwards.

    python3 -m harness.run_scenario --kestrel build/kestrel
                                    [--timeout SECONDS] SCENARIO_FILE

Prints a readable diff and exits 1 when anything differs, or when kestrel is
still running after the timeout (it is killed then: a hang is a failure,
never a wait without end).
"""

import argparse
import os
import sys
import tempfile

from . import layout, sandbox, scenario
from . import tree as trees

ANY_ERRNO = ": any"


def stderr_matches(expected, actual):
    if len(expected) != len(actual):
        return False
    for want, got in zip(expected, actual):
        if want.endswith(ANY_ERRNO):
            prefix = want[: -len("any")]
            rest = got[len(prefix) :]
            if not got.startswith(prefix) or not rest or ": " in rest:
                return False
        elif want != got:
            return False
    return True


def read_peak(peak_file, returncode):
    """The peak in KiB, and the run's return code as if it had not gone
    through GNU time, which turns a death by signal N into status 128+N."""
    with open(peak_file, encoding="ascii") as lines:
        words = lines.read().split()
    if words[:3] == ["Command", "terminated", "by"]:
        returncode = -int(words[4])
    return int(words[-1]), returncode


def scratch_parent():
    """TMPDIR if set, else memory where there is such a file system: trees of
    100,000 entries build in a second there, and in a minute on a busy
    disk."""
    if os.environ.get("TMPDIR") or not os.path.isdir("/dev/shm"):
        return None
    return "/dev/shm"


def run_on_scratch(before, kestrel, arguments, timeout, limit, env):
    """The run, its peak memory in KiB (None without a limit or after a
    hang) and the tree it leaves. With a limit, GNU time writes the peak
    memory of the largest process of the run: it forks the run from its own
    small image, where a fork of this interpreter would count the
    interpreter's memory."""
    scratch = tempfile.mkdtemp(prefix="kestrel-scenario.", dir=scratch_parent())
    try:
        root = os.path.join(scratch, "device")
        os.mkdir(root)
        os.umask(0o022)
        trees.build(root, before)
        peak_file = os.path.join(scratch, "peak")
        prefix = ["/usr/bin/time", "-f", "%M", "-o", peak_file] if limit else []
        run = sandbox.run_kestrel(root, kestrel, arguments, timeout, env, prefix)
        peak = None
        if limit and not run.timed_out:
            peak, run.returncode = read_peak(peak_file, run.returncode)
        return run, peak, trees.read(root)
    finally:
        trees.remove(scratch)


def run(scenario_file, kestrel, timeout, env=None):
    """Whether kestrel did what the scenario says; prints what differs."""
    sections = scenario.parse(scenario_file)
    before = scenario.tree_from(sections["before"])
    unchanged = [line for line, _ in sections["after"]] == ["unchanged"]
    after = before if unchanged else scenario.tree_from(sections["after"])
    expected_stderr = [
        scenario.expected_stderr_line(line, where) for line, where in sections["stderr"]
    ]
    expected_exit = " ".join(line for line, _ in sections["exit"])
    arguments = " ".join(line for line, _ in sections.get("arguments", []))
    limit = scenario.memory_limit(sections.get("memory"))

    ran, peak, actual = run_on_scratch(
        before, kestrel, arguments.split(), timeout, limit, env
    )
    failed = False
    if peak is not None:
        print(f"peak memory of the run: {peak} KiB")
    if not stderr_matches(expected_stderr, ran.lines()):
        trees.print_diff("standard error", expected_stderr, ran.lines())
        failed = True
    if ran.exit_text() != expected_exit:
        print(
            f"exit: expected {expected_exit}, got {ran.exit_text()}"
            + (f" (killed after {timeout} s)" if ran.timed_out else "")
        )
        failed = True
    if after != actual:
        trees.print_diff("device after", trees.listing(after), trees.listing(actual))
        failed = True
    lost = [
        path
        for path in before
        if path.startswith(layout.STAGED) and actual.get(path) != before[path]
    ]
    if lost:
        print(
            f"changed or removed under {layout.STAGED.rstrip('/')}: "
            + ", ".join(trees.show_path(path) for path in lost)
        )
        failed = True
    if peak is not None and peak >= limit:
        print(f"memory: expected below {limit} KiB, peak {peak} KiB")
        failed = True
    return not failed


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--kestrel", required=True)
    parser.add_argument(
        "--timeout",
        type=float,
        default=30,
        help="seconds before a run counts as a hang",
    )
    parser.add_argument("scenario")
    options = parser.parse_args()
    try:
        passed = run(
            options.scenario, os.path.abspath(options.kestrel), options.timeout
        )
    except scenario.ScenarioError as error:
        print(f"run-scenario: {error}")
        return 2
    print(("passed: " if passed else "FAILED: ") + options.scenario)
    return 0 if passed else 1


if __name__ == "__main__":
    sys.exit(main())
