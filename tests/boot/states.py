"""The device states of the boot test. Each writes var/db of a device root
whose system partition (usr/share/zoneinfo.default, usr/share/icu) is already
in place, and names what the booted system must show afterwards."""

import os
import subprocess
import tempfile

SCHEMA = "72l"
TZ = "var/db/timezone"
# The date lines a program reports for the local zone at the collector's two
# instants, 2025-01-15 and 2025-07-15 at 12:00 UTC.
PARIS = ["CET+0100", "CEST+0200"]


def release_of(root):
    """The system partition's release: the version line of its tzdata.zi."""
    with open(os.path.join(root, "usr/share/zoneinfo.default/tzdata.zi")) as zi:
        return zi.readline().split()[-1]


def stage(root, version, word, zone_source=None):
    """A staged data set: the system's zone files under another release word,
    with ICU data of the system's schema; zone_source, if given, is zic
    source compiled over the copy, so that reading it shows which data set a
    program read."""
    directory = os.path.join(root, TZ, "tz", version)
    os.makedirs(os.path.join(directory, "icutz"))
    subprocess.run(["cp", "-a", os.path.join(root, "usr/share/zoneinfo.default"),
                    os.path.join(directory, "zoneinfo")], check=True)
    with open(os.path.join(directory, "zoneinfo/+VERSION"), "w") as out:
        out.write(word + "\n")
    with open(os.path.join(directory, f"icutz/icutz{SCHEMA}.dat"), "w") as out:
        out.write(f"ICU time-zone data, schema {SCHEMA}\n")
    if zone_source:
        with tempfile.NamedTemporaryFile("w", suffix=".zi") as source:
            source.write(zone_source)
            source.flush()
            subprocess.run(["zic", "-d", os.path.join(directory, "zoneinfo"),
                            source.name], check=True)
    return "/" + os.path.relpath(directory, root)


def link(root, path, target):
    os.symlink(target, os.path.join(root, path))


def update_adopted(root, release):
    update = stage(root, release + ".1.1", release,
                   "Zone Europe/Paris 1:30 - KTEST\n")
    link(root, TZ + "/zoneinfo", "/usr/share/zoneinfo.default")
    link(root, TZ + "/tz_latest", update)
    link(root, TZ + "/localtime", "/var/db/timezone/zoneinfo/Europe/Paris")
    return {"links": {TZ + "/zoneinfo": update + "/zoneinfo",
                      TZ + "/icutz": update + "/icutz"},
            "files": {TZ + "/TZVersionDiffRecord":
                      f"{release}.1.0_{release}.1.1".encode()},
            "absent": [TZ + "/needs_cleanup"],
            "warnings": [],
            "date": ["KTEST+0130", "KTEST+0130"]}


def older_data_reset(root, release):
    old = stage(root, "2000a.1.0", "2000a", "Zone Europe/Paris 0:30 - OLDT\n")
    link(root, TZ + "/zoneinfo", old + "/zoneinfo")
    link(root, TZ + "/icutz", old + "/icutz")
    link(root, TZ + "/localtime", "/var/db/timezone/zoneinfo/Europe/Paris")
    return {"links": {TZ + "/zoneinfo": "/usr/share/zoneinfo.default"},
            "files": {TZ + "/needs_cleanup": b""},
            "absent": [TZ + "/icutz", TZ + "/TZVersionDiffRecord"],
            "warnings": ["Symlink points at data incompatible with installed system"],
            "date": PARIS}


def localtime_old_style_corrected(root, release):
    link(root, TZ + "/zoneinfo", "/usr/share/zoneinfo.default")
    link(root, TZ + "/localtime", "/usr/share/zoneinfo/Asia/Tokyo")
    zone = "/var/db/timezone/zoneinfo/Asia/Tokyo"
    return {"links": {TZ + "/localtime": zone},
            "files": {}, "absent": [TZ + "/needs_cleanup"],
            "warnings": ["Correcting localtime link to " + zone],
            "date": ["JST+0900", "JST+0900"]}


def localtime_missing_default(root, release):
    link(root, TZ + "/zoneinfo", "/usr/share/zoneinfo.default")
    return {"links": {TZ + "/localtime":
                      "/var/db/timezone/zoneinfo/America/Los_Angeles"},
            "files": {}, "absent": [TZ + "/needs_cleanup"],
            "warnings": ["localtime link invalid; resetting to America/Los_Angeles"],
            "date": ["PST-0800", "PDT-0700"]}


def fifo_staged_version(root, release):
    """A staged update whose +VERSION is a FIFO that nobody writes: reading
    it would block for ever, so kestrel treats it as unreadable; the update's
    version is its directory name, so it is still adopted."""
    update = stage(root, release + ".1.1", release)
    version = os.path.join(root, update[1:], "zoneinfo/+VERSION")
    os.remove(version)
    os.mkfifo(version)
    link(root, TZ + "/zoneinfo", "/usr/share/zoneinfo.default")
    link(root, TZ + "/tz_latest", update)
    link(root, TZ + "/localtime", "/var/db/timezone/zoneinfo/Europe/Paris")
    return {"links": {TZ + "/zoneinfo": update + "/zoneinfo"},
            "files": {TZ + "/TZVersionDiffRecord":
                      f"{release}.1.0_{release}.1.1".encode()},
            "absent": [TZ + "/needs_cleanup"], "warnings": [], "date": PARIS}


STATES = {state.__name__: state for state in (
    update_adopted, older_data_reset, localtime_old_style_corrected,
    localtime_missing_default, fifo_staged_version)}


def lay_out(root, name):
    """Writes state NAME into the device root; returns its expectations."""
    os.makedirs(os.path.join(root, TZ, "tz"))
    return STATES[name](root, release_of(root))
