"""What `kestrel-data stage SET` must leave after a kill or a failed call:
tz_latest naming the previous target or the complete new set, never a
partial one; every set that was there as it was; kestrel's next start giving
the outcome it gives from the state before staging or after a whole one;
and a next staging that succeeds and leaves no scratch directory."""

from . import layout, small_set, traced
from . import data_device as device
from . import tree as trees

OUTCOME = layout.DEVICE_LINKS + layout.DEVICE_RECORDS


class Stage:
    # Kills on both sides of the re-pointing of tz_latest, and faults that
    # the staging refuses with the device as it was, in every state.
    KILLS_REACH = ("tz_latest old", "tz_latest new")
    FAULTS_REACH = ("refused, device as it was",)

    def __init__(self, data, kestrel, scratch):
        self.kestrel = kestrel
        set_dir = small_set.build(data, scratch)
        self.new_set = {
            path[len(set_dir) :]: entry
            for path, entry in trees.read(set_dir, set_dir + "/").items()
        }
        self.new_set[""] = ("dir", 0o755)
        self.program = traced.DataCommand(data, ["stage", set_dir])
        self.outcomes = {}
        self.next_staging = device.ByTree(self.next_staging_problems)

    def kestrel_outcome(self, tree):
        started = traced.run_fresh(self.kestrel, tree)
        return started.exit_text(), traced.outcome(started.after, OUTCOME)

    def latest_problems(self, before, tree):
        """Whether tz_latest is the previous link or names the complete new
        set; and which."""
        latest = tree.get(device.LATEST)
        if latest == before.get(device.LATEST):
            return "tz_latest old", []
        name = latest[1][len(layout.STAGED_DIR) :] if latest else ""
        if latest and latest[0] == "link" and latest[1].startswith(layout.STAGED_DIR):
            if device.subtree(tree, name) == self.new_set:
                return "tz_latest new", []
        return "tz_latest broken", [f"tz_latest is {trees.show_entry(latest)}"]

    def set_problems(self, before, tree):
        """Sets that were there changed; a new one not the complete set."""
        problems = device.left_intact(before, tree, device.set_names(before))
        for name in set(device.set_names(tree)) - set(device.set_names(before)):
            if device.subtree(tree, name) != self.new_set:
                problems.append(f"partial set {name}")
        return problems

    def next_staging_problems(self, tree):
        again = traced.run_fresh(self.program, tree)
        if again.returncode != 0:
            return [f"the next staging failed: {again.exit_text()} {again.stderr}"]
        label, problems = self.latest_problems({}, again.after)
        problems += [f"{name} left" for name in device.set_names(again.after, True)]
        if device.NEW_LATEST in again.after:
            problems.append(".tz_latest.new left")
        return ["after the next staging: " + problem for problem in problems]

    def after_kill(self, state, before, expected, crashed):
        label, problems = self.latest_problems(before, crashed)
        problems += self.set_problems(before, crashed)
        which = {"tz_latest old": before, "tz_latest new": expected}.get(label)
        if which is not None:
            key = (state, label)
            if key not in self.outcomes:
                self.outcomes[key] = self.kestrel_outcome(which)
            got = self.kestrel_outcome(crashed)
            if got != self.outcomes[key]:
                problems.append(
                    f"kestrel's start gives {got}, not {self.outcomes[key]}"
                )
        return label, problems + self.next_staging(crashed)

    def after_fault(self, state, before, expected, run):
        problems = device.ending_problems(run, traced.TIMEOUT)
        label, latest = self.latest_problems(before, run.after)
        problems += latest + self.set_problems(before, run.after)
        if run.returncode == 0:
            # A leftover that could not be removed waits for the next staging.
            label = "staged" if run.after == expected else "staged, leftover kept"
            if device.without_leftovers(run.after) != device.without_leftovers(
                expected
            ):
                problems.append("status 0 but not the staging's result")
        elif label == "tz_latest old":
            label = "refused, device as it was"
            if device.without_leftovers(run.after) != device.without_leftovers(before):
                problems.append("refused but the device changed")
            if device.set_names(run.after, True):
                label += " but for a scratch directory"
        else:
            label = "staged, failure reported"
        return label, problems + self.next_staging(run.after)
