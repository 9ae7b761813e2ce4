"""The units whose cost the boot test measures: the package's kestrel.service
as shipped, with each of its drop-ins, the same unit without any sandboxing
(the plain unit: same ordering, same run), and the plain unit with one group
of the full sandbox's directives at a time. Each is a whole unit file (and a
drop-in where one is measured), named kestrel-cost-NAME.service, and its
exposure is systemd-analyze security's, judged offline on this machine."""

import os
import re
import subprocess
import tempfile

# What every variant keeps of the [Service] section: how kestrel is run, not
# what it is kept from.
RUN = ("Type", "RemainAfterExit", "ExecStart", "TimeoutStartSec", "UMask")
# The full sandbox's directives, by what systemd must set up for them.
GROUPS = {
    "user namespace": ["PrivateUsers"],
    "mount namespace": [
        "ProtectSystem",
        "ReadWritePaths",
        "ProtectHome",
        "PrivateTmp",
        "PrivateMounts",
    ],
    "private /dev": ["PrivateDevices", "DevicePolicy"],
    "network": ["PrivateNetwork", "IPAddressDeny"],
    "IPC": ["PrivateIPC", "RemoveIPC", "KeyringMode"],
    "kernel and proc": [
        "ProtectHostname",
        "ProtectClock",
        "ProtectKernelTunables",
        "ProtectKernelModules",
        "ProtectKernelLogs",
        "ProtectControlGroups",
        "ProtectProc",
        "ProcSubset",
    ],
    "system-call filter": [
        "CapabilityBoundingSet",
        "AmbientCapabilities",
        "NoNewPrivileges",
        "SystemCallArchitectures",
        "SystemCallErrorNumber",
        "SystemCallFilter",
        "LockPersonality",
        "MemoryDenyWriteExecute",
        "RestrictRealtime",
        "RestrictNamespaces",
        "RestrictSUIDSGID",
        "RestrictAddressFamilies",
    ],
}


# Points between the plain unit and the full sandbox, each adding to the one
# before it what costs least for what it takes from the exposure: only what
# needs no namespace, then a network namespace, then the user namespace and
# what needs no mount namespace, then a mount namespace for the kernel's
# files, then a fresh /proc; and, beside them, the mount namespace for a
# read-only system alone, which systemd's rating hardly counts.
FILTER = GROUPS["system-call filter"]
FRONTIER = {}
FRONTIER["caps and system calls"] = FILTER[:6]
FRONTIER["filter + network"] = FILTER + GROUPS["network"]
FRONTIER["no mount namespace"] = FRONTIER["filter + network"] + [
    "PrivateUsers",
    "ProtectHostname",
    "ProtectClock",
    "DevicePolicy",
]
FRONTIER["+ read-only system"] = FRONTIER["no mount namespace"] + [
    "ProtectSystem",
    "ReadWritePaths",
]
FRONTIER["+ kernel read-only"] = FRONTIER["no mount namespace"] + [
    "ProtectKernelTunables",
    "ProtectKernelModules",
    "ProtectKernelLogs",
    "ProtectControlGroups",
]
FRONTIER["+ private /proc"] = FRONTIER["+ kernel read-only"] + [
    "ProtectProc",
    "ProcSubset",
]

# The drop-in that gives the shipped unit the full sandbox.
FULL = "hardened"


class variant:
    """One measured unit: NAME's sandbox directives SERVICE, the drop-in
    text DROPIN (or None) and the program (LABEL, PATH) it starts."""

    def __init__(self, name, service, dropin, program):
        self.name, self.service, self.dropin = name, service, dropin
        self.label, self.path = program
        slug = re.sub(r"[^a-z0-9]+", "-", f"{name} {self.label}".lower())
        self.id = f"kestrel-cost-{slug.strip('-')}.service"


def sections(text):
    """[(section, [(key, value)])] of a unit file, comments left out."""
    found = []
    for line in text.splitlines():
        line = line.strip()
        if line.startswith("["):
            found.append((line, []))
        elif line and not line.startswith(("#", ";")) and found:
            key, _, value = line.partition("=")
            found[-1][1].append((key, value))
    return found


def sandbox(*texts):
    """The sandbox directives of texts, a unit and its drop-ins: every
    assignment of each key in order, so that systemd reads them as it reads
    the unit and its drop-ins (an empty one resets a list, or empties it)."""
    merged = {}
    for text in texts:
        for section, entries in sections(text):
            for key, value in entries:
                if section == "[Service]" and key not in RUN:
                    merged.setdefault(key, []).append(value)
    return merged


def unit_text(shipped, service, program, after):
    """The shipped unit with SERVICE as its sandbox, running PROGRAM, ordered
    after the unit AFTER as well as the shipped unit's own order."""
    lines = []
    for section, entries in sections(shipped):
        lines.append(section)
        if section == "[Service]":
            entries = [
                (k, program if k == "ExecStart" else v) for k, v in entries if k in RUN
            ]
            entries += [(k, v) for k, values in service.items() for v in values]
        lines += [f"{key}={value}" for key, value in entries]
        if section == "[Unit]" and after:
            lines.append(f"After={after}")
    return "\n".join(lines) + "\n"


def variants(shipped, dropins, programs, groups=True):
    """The measured variants: shipped and plain with each of PROGRAMS
    (label, path), then, with GROUPS, the shipped unit with each drop-in and
    each group alone on the plain unit, with the first program."""
    full = sandbox(shipped, dropins.get(FULL, ""))
    unknown = set(full) - {k for keys in GROUPS.values() for k in keys}
    if unknown:
        raise SystemExit(f"boot-test: directives in no group: {unknown}")
    found = []
    for program in programs:
        found.append(variant("shipped", sandbox(shipped), None, program))
        found.append(variant("plain", {}, None, program))
    for name, text in dropins.items() if groups else ():
        found.append(variant("drop-in " + name, sandbox(shipped), text, programs[0]))
    for name, keys in list(GROUPS.items()) + list(FRONTIER.items()) if groups else ():
        found.append(
            variant(name, {k: full[k] for k in keys if k in full}, None, programs[0])
        )
    return found


def exposure(shipped, one):
    """systemd-analyze security's overall exposure of the variant, offline."""
    with tempfile.TemporaryDirectory(prefix="kestrel-exposure.") as root:
        units = os.path.join(root, "etc/systemd/system")
        os.makedirs(units + "/kestrel.service.d")
        with open(units + "/kestrel.service", "w") as out:
            out.write(unit_text(shipped, one.service, one.path, None))
        if one.dropin:
            with open(units + "/kestrel.service.d/variant.conf", "w") as out:
                out.write(one.dropin)
        report = subprocess.run(
            [
                "systemd-analyze",
                "security",
                "--offline=true",
                "--root=" + root,
                "kestrel.service",
            ],
            capture_output=True,
            text=True,
        ).stdout
    level = re.search(r"Overall exposure level for \S+: (\S+) (\S+)", report)
    return f"{level.group(1)} {level.group(2)}" if level else "?"
