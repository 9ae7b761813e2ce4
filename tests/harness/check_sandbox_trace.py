"""Shows that kestrel.service's sandbox lets kestrel do its whole job.

    python3 -m harness.check_sandbox_trace [--dropin FILE]... UNIT KESTREL \
        SCENARIO...

Where systemd is not the init system, the unit cannot be started; instead
every scenario is run (harness.run_scenario, through the device sandbox)
with kestrel under strace, and its system calls are checked against the
unit's directives (with each --dropin FILE read after it, as systemd reads
the unit's drop-ins):

- every system call is allowed by its SystemCallFilter= lines, the groups
  resolved by `systemd-analyze syscall-filter` (without a filter, any);
- every path it creates, removes or opens for writing lies under one of its
  ReadWritePaths= (ProtectSystem=strict leaves everything else read-only;
  a unit without it lets kestrel write anywhere, and kestrel is held to
  /var/db, where everything it changes lies);
- it touches nothing that ProtectHome=, PrivateDevices=, ProtectKernel*= or
  ProcSubset=pid hide;
- it never maps memory writable and executable (MemoryDenyWriteExecute=) and
  opens no socket (RestrictAddressFamilies=none, PrivateNetwork=).
"""

import contextlib
import io
import os
import subprocess
import sys
import tempfile

from . import run_scenario, strace

HIDDEN = ("/home", "/root", "/run/user", "/sys", "/dev", "/boot", "/proc")
VISIBLE = (
    "/proc/self/",
    "/dev/null",
    "/dev/zero",
    "/dev/urandom",
    "/dev/random",
    "/dev/full",
)


def unit_directives(*files):
    """Each key's assignments in the unit and its drop-ins; an empty one
    resets the list, as systemd has it."""
    directives = {}
    for name in files:
        with open(name) as text:
            for line in text:
                line = line.strip()
                if line and not line.startswith(("#", ";", "[")):
                    key, _, value = line.partition("=")
                    directives[key] = directives.get(key, []) + [value] if value else []
    return directives


class everything:
    """The system calls of a unit without a filter."""

    def __contains__(self, name):
        return True


ANY = everything()


def syscall_groups():
    output = subprocess.run(
        ["systemd-analyze", "syscall-filter"],
        check=True,
        capture_output=True,
        text=True,
    ).stdout
    groups, current = {}, None
    for line in output.splitlines():
        if line.startswith("@"):
            current = groups.setdefault(line.strip(), [])
        elif current is not None and line.strip() and not line.strip().startswith("#"):
            current.append(line.strip())
    return groups


def expand(names, groups, seen=None):
    seen = set() if seen is None else seen
    result = set()
    for name in names:
        if name.startswith("@"):
            if name not in seen:
                seen.add(name)
                result |= expand(groups[name], groups, seen)
        else:
            result.add(name)
    return result


def allowed_syscalls(filters, groups):
    """The set the SystemCallFilter= lines leave, applied in order."""
    allowed = None
    for value in filters:
        deny = value.startswith("~")
        names = expand(value.lstrip("~").split(), groups)
        if allowed is None:
            if deny:
                raise SystemExit("a deny-list filter first is not handled")
            # systemd allows its @default set with any allow list.
            allowed = set(names) | expand(["@default"], groups)
        elif deny:
            allowed -= names
        else:
            allowed |= names
    return allowed or set()


def traced_scenario(scenario, kestrel):
    """Runs the scenario with kestrel, and only kestrel, under strace;
    returns whether it passed, what it printed, and kestrel's calls from its
    execve on (None without a trace)."""
    with tempfile.TemporaryDirectory(prefix="kestrel-trace.") as traces:
        trace_file = os.path.join(traces, "trace")
        wrapper = strace.wrapper(traces, ["-qq", "-o", trace_file])
        env = dict(os.environ, DEVICE_SANDBOX_WRAPPER=wrapper)
        printed = io.StringIO()
        with contextlib.redirect_stdout(printed):
            passed = run_scenario.run(scenario, kestrel, 30, env)
        trace = strace.read(trace_file)
    calls = [trace.start] + trace.calls if trace and trace.start else None
    return passed, printed.getvalue(), calls


def under(path, roots):
    return any(
        path == root or path.startswith(root.rstrip("/") + "/") for root in roots
    )


def problems(calls, allowed, writable):
    found = []
    for call in calls:
        line = call.describe()
        if call.name not in allowed:
            found.append(f"system call outside the filter: {line}")
        if call.name in ("socket", "socketpair"):
            found.append(f"socket: {line}")
        if call.name in ("mmap", "mprotect", "pkey_mprotect") and (
            "PROT_EXEC" in call.arguments
        ):
            found.append(f"executable mapping: {line}")
        for path in strace.written_names(call):
            if not path.startswith("/") or not under(path, writable):
                found.append(f"write outside {writable}: {line}")
        for path in call.names():
            if (
                path.startswith("/")
                and under(path, HIDDEN)
                and not path.startswith(VISIBLE)
                and path not in VISIBLE
            ):
                found.append(f"hidden path: {line}")
    return found


def main():
    arguments, dropins = sys.argv[1:], []
    while arguments[0] == "--dropin":
        dropins.append(arguments[1])
        arguments = arguments[2:]
    unit, kestrel = arguments[:2]
    scenarios = arguments[2:]
    directives = unit_directives(unit, *dropins)
    filters = directives.get("SystemCallFilter", [])
    allowed = allowed_syscalls(filters, syscall_groups()) if filters else ANY
    writable = (
        [
            p.lstrip("-+")
            for v in directives.get("ReadWritePaths", [])
            for p in v.split()
        ]
        if directives.get("ProtectSystem") == ["strict"]
        else ["/var/db"]
    )
    if not allowed or not writable:
        print("the unit leaves no system call or no path writable")
        return 1
    failed, used = False, set()
    for scenario in scenarios:
        passed, printed, calls = traced_scenario(scenario, os.path.abspath(kestrel))
        label = os.path.basename(scenario)
        if not passed or calls is None:
            print(f"{label}: the scenario failed under strace\n{printed}")
            failed = True
            continue
        used |= {call.name for call in calls}
        for problem in problems(calls, allowed, writable):
            print(f"{label}: {problem}")
            failed = True
    print(f"{len(scenarios)} scenarios; system calls used: " + " ".join(sorted(used)))
    return 1 if failed else 0


if __name__ == "__main__":
    sys.exit(main())
