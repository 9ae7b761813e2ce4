"""What `kestrel-data clean` must leave after a kill or a failed call:
nothing under the designated sets lost; every other set whole under its
name or renamed ".remove-NAME" (whatever is left of it), or gone; the links
as they were; and a next run that leaves exactly what one uninterrupted run
leaves."""

from . import layout, traced
from . import data_device as device
from . import tree as trees

LINKS = tuple(
    layout.rel(path)
    for path in (
        layout.ZONEINFO_LINK,
        layout.ICUTZ_LINK,
        layout.LOCALTIME_LINK,
        layout.LATEST_LINK,
    )
)


class Clean:
    KILLS_REACH = FAULTS_REACH = ()

    def __init__(self, data, kestrel, scratch):
        self.program = traced.DataCommand(data, ["clean"])
        self.next_run = {}

    def device_problems(self, before, tree):
        """The designated sets and the links as they were, every other set
        whole, renamed or gone; and how many of those are which."""
        kept = device.designated(before)
        problems = device.left_intact(before, tree, kept)
        problems += [
            f"{path} changed"
            for path in LINKS
            if trees.pick(before, [path]) != trees.pick(tree, [path])
        ]
        counts = {"whole": 0, "renamed": 0, "gone": 0}
        for name in set(device.set_names(before)) - kept:
            now = device.subtree(tree, name)
            if now is not None:
                counts["whole"] += 1
                if now != device.subtree(before, name):
                    problems.append(f"set {name} partly removed under its name")
            elif device.subtree(tree, ".remove-" + name) is not None:
                counts["renamed"] += 1
            else:
                counts["gone"] += 1
        label = "removable sets whole {whole}, renamed {renamed}, gone {gone}"
        return label.format(**counts), problems

    def next_run_problems(self, state, expected, tree):
        """The next run's problems, each state's kept by tree."""
        by_tree = self.next_run.setdefault(
            state, device.ByTree(lambda tree: self.next_run_on(expected, tree))
        )
        return by_tree(tree)

    def next_run_on(self, expected, tree):
        again = traced.run_fresh(self.program, tree)
        if again.returncode != 0:
            return [f"the next run failed: {again.exit_text()} {again.stderr}"]
        if again.after != expected:
            return ["the next run leaves otherwise than an uninterrupted one"]
        return []

    def after_kill(self, state, before, expected, crashed):
        label, problems = self.device_problems(before, crashed)
        return label, problems + self.next_run_problems(state, expected, crashed)

    def after_fault(self, state, before, expected, run):
        problems = device.ending_problems(run, traced.TIMEOUT)
        label, found = self.device_problems(before, run.after)
        problems += found
        if run.returncode == 0:
            label = "cleaned"
            if run.after != expected:
                problems.append("status 0 but not the clean-up's result")
        return label, problems + self.next_run_problems(state, expected, run.after)
