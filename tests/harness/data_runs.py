"""The fault matrix's and the crash points' part for kestrel-data: the
checks of the command chosen, and the report of what each run left."""

import collections
import contextlib
import tempfile

from . import clean_checks, stage_checks

CHECKS = {"stage": stage_checks.Stage, "clean": clean_checks.Clean}


@contextlib.contextmanager
def checks(options, kestrel):
    """The checks of options.command, with a scratch directory for their
    lifetime (the small set that stage installs is built there)."""
    with tempfile.TemporaryDirectory(prefix="kestrel-data-runs.") as scratch:
        yield CHECKS[options.command](options.data, kestrel, scratch)


def judge_kill(command_checks):
    """What a kill left: (outcome, problems)."""
    return lambda point, device, killed: command_checks.after_kill(
        point.state, point.tree, point.expected, killed.after
    )


def report(chosen, titles, judged, required=()):
    """Prints, per state, how many runs ended in each outcome; returns every
    problem, each after the title of its run (titles and judged go
    together, one (state, title) and one (outcome, problems) a run), and
    the outcomes of required that a state never reached."""
    problems = []
    for state, _ in chosen:
        outcomes = collections.Counter()
        for (run_state, title), (outcome, found) in zip(titles, judged):
            if run_state != state:
                continue
            outcomes[outcome] += 1
            problems += [f"{title}: {problem}" for problem in found]
        print(f"{state}: {sum(outcomes.values())} runs")
        for outcome, count in sorted(outcomes.items()):
            print(f"  {count:5}  {outcome}")
        problems += [
            f"{state}: no run ends with {outcome}"
            for outcome in required
            if outcome not in outcomes
        ]
    return problems
