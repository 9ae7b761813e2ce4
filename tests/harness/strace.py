"""kestrel's system calls, as strace 6.1 shows them, and what they do to
the device's files.

kestrel runs as the sandbox runs it, with strace wrapped around the
changed-root command through the sandbox's DEVICE_SANDBOX_WRAPPER hook, so
that only that one process is traced: chroot, then, after its execve of
/.kestrel, kestrel itself.

How strace counts "when=" for --inject: per system call and per traced
process, and the count survives execve. kestrel's N-th call of a system call
is therefore invocation N plus the number of chroot's own calls of it. Each
call keeps both numbers; an injection is checked afterwards in the injected
run's own trace (hit).

kestrel-data runs with strace as the sandbox's --reader command, so its
start is the execve of its own path, the first call traced. It is linked
dynamically: the loader's calls on this machine's shared libraries come
before its own and are not the device's files.
"""

import os
import re
import shlex

CALL = re.compile(r"^(\w+)\((.*)\)\s+= (\?|-?\d+|0x[0-9a-f]+)(.*)$")
STANDARD_STREAM = re.compile(r"^[012]<")
DESCRIPTOR = re.compile(r"\b\d+<(/[^>]*)>")
QUOTED = re.compile(r'"((?:[^"\\]|\\.)*)"')
SUBJECT = re.compile(r'"(?:[^"\\]|\\.)*"|\b\d+<[^>]*>')
KILLED = re.compile(r"^\+\+\+ killed by (SIG\w+)")
# kestrel-data's scratch directories, named by mkdtemp afresh in every run,
# read as one name so that the calls of two runs compare.
SCRATCH = re.compile(r"(/\.stage-)[A-Za-z0-9]{6}\b")
# The program the sandbox changes root to, which kestrel becomes.
KESTREL_START = "/.kestrel"
# What the dynamic loader reads and maps: its cache and the machine's
# libraries, as the subject of a call.
LIBRARIES = re.compile(r'^(?:"|\d+<)(?:/etc/ld\.so\.|/(?:usr/)?lib(?:64)?/)')

# The calls that change the file system whatever their arguments, each with
# the positions, among its quoted file names, of the names it changes (none
# for a call on a descriptor: the file was opened before).
CHANGING = {
    "unlink": [0],
    "unlinkat": [0],
    "rmdir": [0],
    "mkdir": [0],
    "mkdirat": [0],
    "mknod": [0],
    "mknodat": [0],
    "creat": [0],
    "symlink": [1],
    "symlinkat": [1],
    "link": [1],
    "linkat": [1],
    "rename": [0, 1],
    "renameat": [0, 1],
    "renameat2": [0, 1],
    "truncate": [0],
    "chmod": [0],
    "fchmodat": [0],
    "chown": [0],
    "lchown": [0],
    "fchownat": [0],
    "utime": [0],
    "utimes": [0],
    "futimesat": [0],
    "utimensat": [0],
    "setxattr": [0],
    "lsetxattr": [0],
    "removexattr": [0],
    "lremovexattr": [0],
    "ftruncate": [],
    "fallocate": [],
    "fchmod": [],
    "fchown": [],
    "fsetxattr": [],
    "fremovexattr": [],
    "write": [],
    "writev": [],
    "pwrite64": [],
    "pwritev": [],
    "pwritev2": [],
    "copy_file_range": [],
    "sendfile": [],
    # What was written reaches the disk: a kill on either side of it ends
    # the run with the same files, but the device's durable state differs.
    "fsync": [],
    "fdatasync": [],
    "syncfs": [],
    "sync_file_range": [],
}
# Open calls change the file system when they create or truncate.
OPENING = {"open", "openat", "openat2"}
CREATING = re.compile(r"\bO_(CREAT|TRUNC)\b")
# An open for writing changes nothing by itself, but a read-only mount
# refuses it all the same.
WRITING = re.compile(r"\bO_(WRONLY|RDWR|CREAT|TRUNC)\b")


class Call:
    """One system call of kestrel: its name, its arguments as strace shows
    them (device paths), its result, and which call of that name it is, both
    within kestrel (occurrence) and within the traced process (invocation,
    what --inject's when= counts)."""

    def __init__(self, name, arguments, result, rest, occurrence, invocation):
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

    def names(self):
        """The file names among its arguments, unescaped."""
        return [
            bytes(name, "latin-1").decode("unicode_escape")
            for name in QUOTED.findall(self.arguments)
        ]


class Trace:
    """The program's calls from its start (its execve, kept as start), and
    the signal strace saw kill it (None when none did)."""

    def __init__(self, start, calls, signal):
        self.start = start
        self.calls = calls
        self.signal = signal

    @property
    def killed(self):
        return self.signal == "SIGKILL"


def parse(lines, device=None, program=KESTREL_START):
    """The trace of the program started by the execve of the path program,
    its descriptors' paths (-y) given below the device root when device is
    the root's real path."""
    seen = {}
    calls = []
    start = None
    signal = None
    for line in lines:
        line = line.rstrip("\n")
        if device:
            line = line.replace(device + "/", "/").replace(device, "/")
        line = SCRATCH.sub(r"\1XXXXXX", line)
        killed = KILLED.match(line)
        if killed:
            signal = killed.group(1)
        match = CALL.match(line)
        if not match:
            continue
        name, arguments, result, rest = match.groups()
        seen[name] = seen.get(name, 0) + 1
        if name == "execve" and arguments.startswith(f'"{program}"'):
            start = Call(name, arguments, result, rest, 1, seen[name])
            if result != "0":
                start = None
            kestrel_start = dict(seen)
            continue
        if start:
            occurrence = seen[name] - kestrel_start.get(name, 0)
            calls.append(Call(name, arguments, result, rest, occurrence, seen[name]))
    return Trace(start, calls, signal)


def read(trace_file, device=None, program=KESTREL_START):
    """The parsed trace file, or None where strace wrote none."""
    if not os.path.exists(trace_file):
        return None
    with open(trace_file, encoding="latin-1") as lines:
        return parse(lines, device, program)


def touches_files(call):
    """A file-system call: one that names a file, or one that acts on a
    descriptor of a file; the standard streams are not the device's files.
    strace's own classes (%file, %desc) chose what the trace holds."""
    if STANDARD_STREAM.match(call.arguments) or LIBRARIES.match(subject(call)):
        return False
    return call.arguments.startswith(('"', "AT_FDCWD")) or bool(
        DESCRIPTOR.search(call.arguments)
    )


def changes_files(call):
    """Whether the call changes the device's file system when it runs."""
    if not touches_files(call):
        return False
    if call.name in OPENING:
        return bool(CREATING.search(call.arguments))
    return call.name in CHANGING


def written_names(call):
    """The file names that the call changes or opens for writing."""
    names = call.names()
    written = [names[i] for i in CHANGING.get(call.name, []) if i < len(names)]
    if call.name in OPENING and names and WRITING.search(call.arguments):
        written.append(names[0])
    return written


def wrapper(directory, options):
    """Writes into directory a command for the device sandbox's
    DEVICE_SANDBOX_WRAPPER that runs the changed-root kestrel under strace
    with options, and returns its path."""
    path = os.path.join(directory, "wrapper")
    command = ["strace"] + options
    with open(path, "w") as out:
        out.write(
            "#!/bin/sh\nexec "
            + " ".join(shlex.quote(word) for word in command)
            + ' -- "$@"\n'
        )
    os.chmod(path, 0o755)
    return path


def recording_options():
    """Every file-system call, for choosing where to inject."""
    return ["-e", "trace=%file,%desc"]


def injection_options(call, action):
    """strace options that do action (error=E, signal=KILL) to exactly that
    call, and trace enough to check it afterwards."""
    return [
        "-e",
        f"trace=execve,{call.name}",
        f"--inject={call.name}:{action}:when={call.invocation}",
    ]


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
                seen.injected() or seen.result == "?"
            )
    return False
