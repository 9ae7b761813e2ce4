"""kestrel, or a kestrel-data command, run under strace in the device
sandbox, on a device built fresh from a tree, for the fault matrix and the
crash points."""

import argparse
import os
import shutil
import tempfile

from . import sandbox, states, strace
from . import tree as trees
from .states import data_commands as data_states
from .states import faults as fault_states

TIMEOUT = 20  # seconds; a run takes a few hundredths


class Kestrel:
    """The boot binary, changed root into the device; strace wraps the
    changed-root command through the sandbox's hook."""

    start = strace.KESTREL_START

    def __init__(self, binary):
        self.binary = os.path.abspath(binary)

    def command(self, device, tracer, env, scratch):
        if tracer is not None:
            env["DEVICE_SANDBOX_WRAPPER"] = strace.wrapper(scratch, tracer)
        return [sandbox.SANDBOX, device, self.binary]


class DataCommand:
    """A kestrel-data command on the device's fixed paths, as the device's
    own programs run (the sandbox's --reader); strace runs it directly."""

    def __init__(self, binary, arguments):
        self.start = os.path.abspath(binary)
        self.arguments = list(arguments)

    def command(self, device, tracer, env, scratch):
        traced = [] if tracer is None else ["strace"] + tracer + ["--"]
        return (
            [sandbox.SANDBOX, "--reader", device]
            + traced
            + [self.start]
            + self.arguments
        )


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


def run(program, device, strace_options=None):
    """Runs the program on the device directory, under strace when
    strace_options is a list, and reads the device back."""
    scratch = tempfile.mkdtemp(prefix="kestrel-traced.")
    try:
        env = dict(os.environ, LC_ALL="C")
        env.pop("DEVICE_SANDBOX_WRAPPER", None)
        trace_file = os.path.join(scratch, "trace")
        tracer = None
        if strace_options is not None:
            tracer = ["-qq", "-y", "-o", trace_file] + strace_options
        command = program.command(device, tracer, env, scratch)
        ran = sandbox.run(command, TIMEOUT, env)
        trace = None
        if strace_options is not None:
            trace = strace.read(trace_file, device, program.start)
        return Run(ran, trees.read(device), trace)
    finally:
        shutil.rmtree(scratch, ignore_errors=True)


def run_fresh(program, tree, strace_options=None):
    """One run on a fresh device built from tree."""
    scratch = tempfile.mkdtemp(prefix="kestrel-device.")
    try:
        return run(program, build_device(scratch, tree), strace_options)
    finally:
        shutil.rmtree(scratch, ignore_errors=True)


def record(state, tree, program):
    """The run on the state's tree without faults, every file-system call
    of it recorded."""
    recorded = run_fresh(program, tree, strace.recording_options())
    if recorded.returncode != 0 or recorded.trace is None or not recorded.trace.calls:
        raise SystemExit(
            f"{state}: the run without faults failed ({recorded.exit_text()})"
        )
    return recorded


def outcome(tree, paths):
    """The entries of paths in a few words each."""
    return {
        path: trees.show_entry(entry) for path, entry in trees.pick(tree, paths).items()
    }


def command_line(description, *extra):
    """The options of a fault tool: the binaries, the jobs, the states, and
    extra, its own (flag, keyword arguments of add_argument) pairs. Returns
    the options, the boot binary and the chosen (name, tree) states: those
    of kestrel, or those of the kestrel-data command --command."""
    parser = argparse.ArgumentParser(description=description.splitlines()[0])
    parser.add_argument("--kestrel", required=True)
    parser.add_argument("--data", help="kestrel-data, to run --command instead")
    parser.add_argument("--command", choices=("stage", "clean"), default="stage")
    parser.add_argument("--jobs", type=int, default=2)
    parser.add_argument("--state", action="append", default=[])
    for flag, keywords in extra:
        parser.add_argument(flag, **keywords)
    options = parser.parse_args()
    if options.data:
        every = data_states.STATES[options.command]
        chosen = [
            (name, data_states.tree(lines))
            for name, lines in states.select(every, options.state)
        ]
    else:
        chosen = [
            (name, fault_states.tree(stem))
            for name, stem in states.select(fault_states.STATES, options.state)
        ]
    return options, Kestrel(options.kestrel), chosen
