"""kestrel run under strace in the device sandbox, on a device built fresh
from a tree, for the fault matrix and the crash points."""

import argparse
import os
import shutil
import tempfile

from . import sandbox, states, strace
from . import tree as trees
from .states import faults as fault_states

TIMEOUT = 20  # seconds; a run takes a few hundredths


class Run:
    """One run: the sandbox's run, its standard error lines, the device
    afterwards and the trace (None when not traced or strace wrote none)."""

    def __init__(self, ran, after, trace):
        self.returncode = ran.returncode
        self.timed_out = ran.timed_out
        self.stderr = ran.lines()
        self.after = after
        self.trace = trace
        self.exit_text = ran.exit_text


def build_device(scratch, tree):
    device = os.path.join(scratch, "device")
    os.mkdir(device)
    os.umask(0o022)
    trees.build(device, tree)
    return device


def run_kestrel(kestrel, device, strace_options=None):
    """Runs kestrel on the device directory, under strace when
    strace_options is a list, and reads the device back."""
    scratch = tempfile.mkdtemp(prefix="kestrel-traced.")
    try:
        env = dict(os.environ, LC_ALL="C")
        env.pop("DEVICE_SANDBOX_WRAPPER", None)
        trace_file = os.path.join(scratch, "trace")
        if strace_options is not None:
            env["DEVICE_SANDBOX_WRAPPER"] = strace.wrapper(
                scratch, ["-qq", "-y", "-o", trace_file] + strace_options
            )
        ran = sandbox.run_kestrel(device, kestrel, timeout=TIMEOUT, env=env)
        trace = None
        if strace_options is not None:
            trace = strace.read(trace_file, device)
        return Run(ran, trees.read(device), trace)
    finally:
        shutil.rmtree(scratch, ignore_errors=True)


def run_fresh(kestrel, tree, strace_options=None):
    """One run on a fresh device built from tree."""
    scratch = tempfile.mkdtemp(prefix="kestrel-device.")
    try:
        return run_kestrel(kestrel, build_device(scratch, tree), strace_options)
    finally:
        shutil.rmtree(scratch, ignore_errors=True)


def record(state, stem, kestrel):
    """The state's tree (the before: tree of the scenario stem), and the run
    on it without faults, every file-system call of it recorded."""
    tree = fault_states.tree(stem)
    run = run_fresh(kestrel, tree, strace.recording_options())
    if run.returncode != 0 or run.trace is None or not run.trace.calls:
        raise SystemExit(f"{state}: the run without faults failed ({run.exit_text()})")
    return tree, run


def outcome(tree, paths):
    """The entries of paths in a few words each."""
    return {
        path: trees.show_entry(entry) for path, entry in trees.pick(tree, paths).items()
    }


def command_line(description, *extra):
    """The options of a fault tool: the binary, the jobs, the states, and
    extra, its own (flag, keyword arguments of add_argument) pairs. Returns
    the options, the binary's absolute path and the chosen states."""
    parser = argparse.ArgumentParser(description=description.splitlines()[0])
    parser.add_argument("--kestrel", required=True)
    parser.add_argument("--jobs", type=int, default=2)
    parser.add_argument("--state", action="append", default=[])
    for flag, keywords in extra:
        parser.add_argument(flag, **keywords)
    options = parser.parse_args()
    chosen = states.select(fault_states.STATES, options.state)
    return options, os.path.abspath(options.kestrel), chosen
