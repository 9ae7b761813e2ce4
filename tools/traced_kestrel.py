"""Runs the real kestrel under strace in the device sandbox, for
tools/fault-matrix and tools/crash-points.

The device states are scenario files (their "before:" trees), read with
tools/run-scenario's own parser. kestrel runs as the sandbox runs it, with
strace wrapped around the changed-root command through the sandbox's
DEVICE_SANDBOX_WRAPPER hook, so that only that one process is traced.

How strace 6.1 counts "when=" for --inject: per system call and per traced
process (a forked child starts again from one), and the count survives
execve. The traced process runs chroot first and then execs /.kestrel, so
kestrel's N-th call of a system call is invocation N plus the number of
chroot's own calls of it. The offset is taken from a recording run and every
injection is checked afterwards in the injected run's own trace.
"""

import importlib.machinery
import importlib.util
import os
import re
import shlex
import shutil
import subprocess
import tempfile
import threading

TOOLS = os.path.dirname(os.path.abspath(__file__))
SANDBOX = os.path.join(TOOLS, "device-sandbox")
SCENARIOS = os.path.join(os.path.dirname(TOOLS), "tests", "scenarios")
TIMEOUT = 20  # seconds; a run takes a few hundredths


def _load_run_scenario():
    loader = importlib.machinery.SourceFileLoader(
        "run_scenario", os.path.join(TOOLS, "run-scenario"))
    module = importlib.util.module_from_spec(
        importlib.util.spec_from_loader("run_scenario", loader))
    loader.exec_module(module)
    return module


scenario = _load_run_scenario()

# The scenario runner builds and reads trees by changing the working
# directory, which all threads share: one tree at a time.
_tree_lock = threading.Lock()


def read_tree(device):
    with _tree_lock:
        return scenario.read_tree(device)

# Representative device states: name, and the scenario whose "before:" tree
# is that state.
STATES = [
    ("healthy-system-only", "healthy_device_run_is_quiet_and_exits_0"),
    ("current-is-latest", "tz_latest_naming_current_data_warns_on_every_start"),
    ("first-adoption", "first_update_replaces_system_partition_data"),
    ("staged-to-newer-adoption", "newer_update_replaces_staged_data_set"),
    ("incompatible-icu-schema", "incompatible_designated_data_is_reset_to_system"),
    ("update-with-other-icu-schema", "update_with_other_icu_schema_is_refused"),
    ("legacy-migration", "legacy_icutz_link_is_moved_to_present_place"),
    ("old-style-localtime", "localtime_old_style_link_is_corrected"),
    ("missing-localtime", "localtime_missing_is_reset_to_los_angeles"),
    ("tz-latest-regular-file", "tz_latest_regular_file_resets_to_system"),
    ("tz-latest-outside-staged", "tz_latest_outside_staged_directory_resets_to_system"),
]

DEVICE_LINKS = ("var/db/timezone/zoneinfo", "var/db/timezone/icutz",
                "var/db/timezone/localtime")
DEVICE_RECORDS = ("var/db/timezone/TZVersionDiffRecord",
                  "var/db/timezone/needs_cleanup", "var/db/icutz")


def select_states(names):
    if not names:
        return STATES
    known = dict(STATES)
    unknown = [name for name in names if name not in known]
    if unknown:
        raise SystemExit("unknown states: " + ", ".join(unknown))
    return [(name, known[name]) for name in names]


def state_tree(stem):
    sections = scenario.parse_scenario(os.path.join(SCENARIOS,
                                                    stem + ".scenario"))
    return scenario.tree_from(sections["before"])


class Run:
    """One run of kestrel on a fresh device built from a tree."""

    def __init__(self, returncode, stderr, after, trace, timed_out):
        self.returncode = returncode
        self.stderr = stderr
        self.after = after
        self.trace = trace
        self.timed_out = timed_out

    def exit_text(self):
        if self.timed_out:
            return "hang"
        return scenario.describe_exit(self.returncode)


def build_device(scratch, tree):
    device = os.path.join(scratch, "device")
    os.mkdir(device)
    os.umask(0o022)
    with _tree_lock:
        scenario.build(device, tree)
    return device


def strace_wrapper(directory, strace_options):
    """Writes into directory a command for the device sandbox's
    DEVICE_SANDBOX_WRAPPER that runs the changed-root kestrel under strace
    with strace_options, and returns its path."""
    wrapper = os.path.join(directory, "wrapper")
    command = ["strace"] + strace_options
    with open(wrapper, "w") as out:
        out.write("#!/bin/sh\nexec " + " ".join(
            shlex.quote(word) for word in command) + ' -- "$@"\n')
    os.chmod(wrapper, 0o755)
    return wrapper


def run_kestrel(kestrel, device, strace_options=None):
    """Runs kestrel on the device directory, under strace when
    strace_options is a list, and reads the device back."""
    scratch = tempfile.mkdtemp(prefix="kestrel-traced.")
    try:
        env = dict(os.environ, LC_ALL="C")
        env.pop("DEVICE_SANDBOX_WRAPPER", None)
        trace_file = os.path.join(scratch, "trace")
        if strace_options is not None:
            env["DEVICE_SANDBOX_WRAPPER"] = strace_wrapper(
                scratch, ["-qq", "-y", "-o", trace_file] + strace_options)
        process = subprocess.Popen([SANDBOX, device, kestrel],
                                   stdin=subprocess.DEVNULL,
                                   stdout=subprocess.DEVNULL,
                                   stderr=subprocess.PIPE, env=env,
                                   start_new_session=True,
                                   # Another thread may be inside a tree
                                   # that is about to be removed.
                                   cwd="/")
        timed_out = False
        try:
            _, err = process.communicate(timeout=TIMEOUT)
        except subprocess.TimeoutExpired:
            timed_out = True
            os.killpg(process.pid, 9)
            _, err = process.communicate()
        trace = None
        if strace_options is not None and os.path.exists(trace_file):
            with open(trace_file, encoding="latin-1") as lines:
                trace = parse_trace(lines, device)
        after = read_tree(device)
        return Run(process.returncode, err.decode("latin-1").splitlines(),
                   after, trace, timed_out)
    finally:
        shutil.rmtree(scratch, ignore_errors=True)


def run_fresh(kestrel, tree, strace_options=None):
    """One run on a fresh device built from tree."""
    scratch = tempfile.mkdtemp(prefix="kestrel-device.")
    try:
        return run_kestrel(kestrel, build_device(scratch, tree),
                           strace_options)
    finally:
        shutil.rmtree(scratch, ignore_errors=True)


CALL = re.compile(r"^(\w+)\((.*)\)\s+= (\?|-?\d+|0x[0-9a-f]+)(.*)$")
STANDARD_STREAM = re.compile(r"^[012]<")
DESCRIPTOR = re.compile(r"\b\d+<(/[^>]*)>")


class Call:
    """One system call of kestrel: its name, its arguments as strace shows
    them (device paths), its result, and which call of that name it is, both
    within kestrel (occurrence) and within the traced process (invocation,
    what --inject's when= counts)."""

    def __init__(self, name, arguments, result, rest, occurrence,
                 invocation):
        self.name = name
        self.arguments = arguments
        self.result = result
        self.rest = rest
        self.occurrence = occurrence
        self.invocation = invocation

    def failed(self):
        return self.result == "-1"

    def injected(self):
        return "(INJECTED)" in self.rest

    def describe(self):
        return f"{self.name}({self.arguments}) = {self.result}{self.rest}"


class Trace:
    def __init__(self, calls, killed):
        self.calls = calls
        self.killed = killed


def parse_trace(lines, device):
    """The calls that kestrel made, after chroot's execve of /.kestrel."""
    seen = {}
    calls = []
    started = False
    killed = False
    for line in lines:
        line = line.rstrip("\n").replace(device + "/", "/").replace(
            device, "/")
        if line.startswith("+++ killed by SIGKILL"):
            killed = True
        match = CALL.match(line)
        if not match:
            continue
        name, arguments, result, rest = match.groups()
        seen[name] = seen.get(name, 0) + 1
        if name == "execve" and arguments.startswith('"/.kestrel"'):
            started = result == "0"
            kestrel_start = dict(seen)
            continue
        if started:
            occurrence = seen[name] - kestrel_start.get(name, 0)
            calls.append(Call(name, arguments, result, rest, occurrence,
                              seen[name]))
    return Trace(calls, killed)


def touches_files(call):
    """A file-system call: one that names a file, or one that acts on a
    descriptor of a file; the standard streams are not the device's files.
    strace's own classes (%file, %desc) chose what the trace holds."""
    if STANDARD_STREAM.match(call.arguments):
        return False
    return call.arguments.startswith(('"', "AT_FDCWD")) or bool(
        DESCRIPTOR.search(call.arguments))


def recording_options():
    return ["-e", "trace=%file,%desc"]


def injection_options(call, action):
    """strace options that do action (error=E, signal=KILL) to exactly that
    call, and trace enough to check it afterwards."""
    return ["-e", f"trace=execve,{call.name}",
            f"--inject={call.name}:{action}:when={call.invocation}"]


SUBJECT = re.compile(r'"(?:[^"\\]|\\.)*"|\b\d+<[^>]*>')


def subject(call):
    """What a call acts on: its first file name or described descriptor."""
    found = SUBJECT.search(call.arguments)
    return found.group(0) if found else ""


def hit(trace, call):
    """Whether the injection landed on kestrel's call of that occurrence."""
    if trace is None:
        return False
    for seen in trace.calls:
        if seen.name == call.name and seen.occurrence == call.occurrence:
            return subject(seen) == subject(call) and (
                seen.injected() or seen.result == "?")
    return False


def staged_changes(before, after):
    staged = scenario.STAGED
    paths = {path for path in list(before) + list(after)
             if path.startswith(staged) or path == staged.rstrip("/")}
    return sorted(path for path in paths if before.get(path) != after.get(path))


def pick(tree, paths):
    return {path: tree.get(path) for path in paths}


def show(entry):
    if entry is None:
        return "absent"
    if entry[0] == "link":
        return "-> " + entry[1]
    if entry[0] == "file":
        return "file " + scenario.quote(entry[2])
    return entry[0]
