"""Fails each file-system system call of kestrel, one at a time, and checks
that the device still starts.

    python3 -m harness.fault_matrix --kestrel build/kestrel [--jobs 2]
        [--state NAME]... [--costs] [--outcomes FILE]
    python3 -m harness.fault_matrix --kestrel build/kestrel
        --data build/kestrel-data --command stage|clean [--state NAME]...

For every representative device state (harness.states.faults) it records
kestrel's own system calls in the device sandbox, then, for every call that
names a file or acts on a file's descriptor and for each errno below, makes
that one call fail with strace's --inject at that one occurrence and runs
kestrel again on a fresh copy of the state. Every run must end with status
0, or abort only where the system is meant to (a reset to the system
partition that fails inside the reconciliation's outer guard, or a default
local-time link that cannot be made); must end at all; must write only the
system's own warning lines; and must leave var/db/timezone/tz as it was.
Prints the totals and every defect, and exits 1 if there is one.

--costs lists, per state, the faults after which the device ends otherwise
than after a run without faults; --outcomes writes every run's outcome to a
file, so that two builds can be compared run by run.

With --data BINARY --command stage|clean it fails every file-system call of
that kestrel-data command instead (harness.states.data_commands; stage
installs the small set of harness.small_set), and harness.stage_checks or
harness.clean_checks judge each run and the next uninterrupted one; every
problem is a defect.
"""

import concurrent.futures
import signal
import sys
import time

from . import data_runs, layout, messages, strace, traced
from . import tree as trees

ERRNOS = ("EACCES", "EIO", "EROFS", "ENOSPC", "ENOMEM", "ELOOP", "ENAMETOOLONG")

RESET_IN_OUTER_GUARD = "kestrel: Unable to locate data; resetting to system partition: "
DEFAULT_LOCALTIME = (
    f"kestrel: localtime link invalid; resetting to {layout.DEFAULT_ZONE}: "
)
DEFAULT_LINK_FAILED = (
    f"kestrel: create_symlink: from {layout.LOCALTIME_LINK} to "
    f"{layout.zone_link_target(layout.DEFAULT_ZONE)}: "
)
TERMINATE = "terminate called after throwing an instance of 'int'"
LOCALTIME_PHASE = ("kestrel: Correcting localtime link to ", DEFAULT_LOCALTIME)


def specified_abort(stderr):
    """The two places where the system is meant to terminate: the outer
    guard's own reset failed (nothing of the local-time phase followed), or
    the default local-time link could not be made."""
    if (
        len(stderr) >= 2
        and stderr[-2].startswith(DEFAULT_LOCALTIME)
        and stderr[-1].startswith(DEFAULT_LINK_FAILED)
    ):
        return True
    for number, line in enumerate(stderr):
        if line.startswith(RESET_IN_OUTER_GUARD):
            return not any(
                later.startswith(LOCALTIME_PHASE) for later in stderr[number + 1 :]
            )
    return False


def device_outcome(tree):
    return traced.outcome(tree, layout.DEVICE_LINKS + layout.DEVICE_RECORDS)


class Fault:
    def __init__(self, state, call, errno_name):
        self.state = state
        self.call = call
        self.errno_name = errno_name

    def describe(self):
        return (
            f"{self.state}: {self.call.name} #{self.call.occurrence} "
            f"[{self.call.arguments[:90]}] {self.errno_name}"
        )


def judge(fault, run, tree):
    """The defects of one run, empty when it behaved as specified."""
    defects = []
    warnings = run.stderr
    if run.timed_out:
        defects.append(f"no end within {traced.TIMEOUT} s")
    elif run.returncode == -signal.SIGABRT:
        # The C++ run time's terminate handler says why it aborts.
        if warnings[-1:] == [TERMINATE]:
            warnings = warnings[:-1]
        if not specified_abort(warnings):
            defects.append("abort where the system is not meant to stop")
    elif run.returncode != 0:
        defects.append("exit " + run.exit_text())
    if not strace.hit(run.trace, fault.call):
        defects.append(
            "the fault did not land on that call (tool or kestrel not deterministic)"
        )
    defects += [
        "foreign warning line: " + line
        for line in warnings
        if not messages.WARNING.fullmatch(line)
    ]
    changed = trees.changed(tree, run.after, layout.STAGED)
    if changed:
        defects.append(
            f"changed under {layout.STAGED.rstrip('/')}: " + ", ".join(changed)
        )
    return defects


def record(state, tree, program):
    run = traced.record(state, tree, program)
    return tree, run, [call for call in run.trace.calls if strace.touches_files(call)]


def inject(fault, state, program, judge_run):
    options = strace.injection_options(fault.call, "error=" + fault.errno_name)
    run = traced.run_fresh(program, state[0], options)
    return run, judge_run(fault, run, state)


def fail_everywhere(chosen, program, judge_run, jobs):
    """The recording of every state (its tree, its run and its file-system
    calls), its faults, and each fault's run with what judge_run(fault,
    run, recorded state) made of it."""
    with concurrent.futures.ThreadPoolExecutor(jobs) as pool:
        recorded = dict(
            zip(
                (name for name, _ in chosen),
                pool.map(lambda state: record(state[0], state[1], program), chosen),
            )
        )
        faults = [
            Fault(state, call, errno_name)
            for state, _ in chosen
            for call in recorded[state][2]
            for errno_name in ERRNOS
        ]
        results = list(
            pool.map(
                lambda fault: inject(fault, recorded[fault.state], program, judge_run),
                faults,
            )
        )
    return recorded, faults, results


def data_main(options, kestrel, chosen, started):
    """The matrix of a kestrel-data command: a defect is a problem that its
    checks find in a run, or a fault that did not land."""
    with data_runs.checks(options, kestrel) as checks:

        def judge_run(fault, run, state):
            before, recorded_run, _ = state
            outcome, problems = checks.after_fault(
                fault.state, before, recorded_run.after, run
            )
            if not strace.hit(run.trace, fault.call):
                problems.append("the fault did not land on that call")
            # Judged: thousands of devices holding a set would not fit in
            # memory.
            run.after = run.trace = None
            return outcome, problems

        recorded, faults, results = fail_everywhere(
            chosen, checks.program, judge_run, options.jobs
        )
    for state, _ in chosen:
        count = sum(1 for fault in faults if fault.state == state)
        print(f"{state}: {len(recorded[state][2])} file-system calls, {count} runs")
    titles = [(fault.state, fault.describe()) for fault in faults]
    judged = [outcome for _, outcome in results]
    defects = data_runs.report(chosen, titles, judged, checks.FAULTS_REACH)
    for defect in defects:
        print("DEFECT " + defect)
    print(
        f"runs {len(faults)}, defects {len(defects)} "
        f"({time.monotonic() - started:.0f} s)"
    )
    return 1 if defects else 0


def main():
    options, kestrel, chosen = traced.command_line(
        __doc__, ("--costs", {"action": "store_true"}), ("--outcomes", {})
    )
    started = time.monotonic()
    if options.data:
        return data_main(options, kestrel, chosen, started)

    recorded, faults, results = fail_everywhere(
        chosen,
        kestrel,
        lambda fault, run, state: judge(fault, run, state[0]),
        options.jobs,
    )

    clean = terminations = 0
    defects = []
    for fault, (run, found) in zip(faults, results):
        if found:
            defects.append((fault, found))
        elif run.returncode == 0:
            clean += 1
        else:
            terminations += 1
    for state, _ in chosen:
        count = sum(1 for fault in faults if fault.state == state)
        print(f"{state}: {len(recorded[state][2])} file-system calls, {count} runs")
    if options.costs:
        print_costs(chosen, recorded, faults, results)
    if options.outcomes:
        write_outcomes(options.outcomes, faults, results)
    for fault, found in defects:
        print("DEFECT " + fault.describe())
        for line in found:
            print("  " + line)
    print(
        f"runs {len(faults)}, clean exits {clean}, specified terminations "
        f"{terminations}, defects {len(defects)} "
        f"({time.monotonic() - started:.0f} s)"
    )
    return 1 if defects else 0


def print_costs(chosen, recorded, faults, results):
    """What one fault leaves on the device that a run without faults does
    not, grouped by that difference."""
    for state, _ in chosen:
        expected = device_outcome(recorded[state][1].after)
        costs = {}
        for fault, (run, _) in zip(faults, results):
            if fault.state != state:
                continue
            outcome = device_outcome(run.after)
            difference = "; ".join(
                f"{path} {expected[path]} => {outcome[path]}"
                for path in outcome
                if outcome[path] != expected[path]
            )
            if run.returncode != 0:
                difference = run.exit_text() + ("; " + difference if difference else "")
            if difference:
                call = (
                    f"{fault.call.name} #{fault.call.occurrence} "
                    f"[{fault.call.arguments[:70]}]"
                )
                costs.setdefault(difference, {}).setdefault(call, []).append(
                    fault.errno_name
                )
        print(f"== {state}: {len(costs)} outcomes other than the clean run's")
        for difference, calls in sorted(costs.items()):
            print(f"  {difference}")
            for call, errnos in calls.items():
                which = "any" if len(errnos) == len(ERRNOS) else ",".join(errnos)
                print(f"      {call} {which}")


def write_outcomes(file_name, faults, results):
    with open(file_name, "w", encoding="utf-8") as out:
        for fault, (run, _) in zip(faults, results):
            out.write(fault.describe() + "\n  exit " + run.exit_text() + "\n")
            out.writelines(f"  ! {line}\n" for line in run.stderr)
            out.writelines(f"  {line}\n" for line in trees.listing(run.after))


if __name__ == "__main__":
    sys.exit(main())
