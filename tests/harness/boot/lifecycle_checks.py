"""What each boot of the lifecycle (lifecycle.py) must show: kestrel's run
and the clean-up agent's as in the device sandbox, the links, the record and
the staged sets, and what its steps did. Each check returns the list of what
is wrong."""

import os
import subprocess

from .. import device, layout
from .. import tree as trees
from . import check, image
from .lifecycle_steps import expect, readers, staging, text

R = layout.rel
STAGED = layout.STAGED_DIR
EDMONTON = ["MST-0700", "MDT-0600"]  # at the collector's 2025 instants
TOKYO = ["JST+0900", "JST+0900"]


def zone_names(zoneinfo):
    """Every zone and link name of ZONEINFO/tzdata.zi, whether its lines are
    in zic's short form ("Z", "L") or written out ("Zone", "Link")."""
    names = set()
    with open(os.path.join(zoneinfo, "tzdata.zi")) as source:
        for line in source:
            fields = line.split()
            if fields[:1] in (["Z"], ["Zone"]):
                names.add(fields[1])
            elif fields[:1] in (["L"], ["Link"]):
                names.add(fields[2])
    return sorted(names)


def offset(zone_file, instant):
    return subprocess.run(
        ["date", "-d", "@" + instant, "+%z"],
        env=dict(os.environ, TZ=zone_file),
        capture_output=True,
        text=True,
        check=True,
    ).stdout.strip()


def facts(prepared, built, release, instant):
    """What the checks compare with, read from the test system and the set
    built on this machine: the image's own tzdata release, the set's zone
    names, and America/Edmonton at the readers' INSTANT (after 2026-11-01)
    in either data."""
    with open(os.path.join(prepared, "usr/share/zoneinfo/tzdata.zi")) as zi:
        tzdata = zi.readline().split()[-1]
    system = device.release_of(os.path.join(prepared, R(layout.SYSTEM_ZONEINFO)))
    if system != tzdata:
        raise RuntimeError(f"system data set {system}, the image's tzdata {tzdata}")
    edmonton = image.USER_ZONE
    return {
        "system": system,
        "release": release,
        "zones": zone_names(os.path.join(built, "zoneinfo")),
        "edmonton": offset(os.path.join(built, "zoneinfo", edmonton), instant),
        "edmonton_image": offset(
            os.path.join(prepared, R(layout.SYSTEM_ZONEINFO), edmonton), instant
        ),
    }


def staged(version):
    return STAGED + version


def links(version, zone=image.USER_ZONE):
    """kestrel's links with the set VERSION adopted."""
    data = staged(version) if version else None
    found = {
        R(layout.ZONEINFO_LINK): data + "/zoneinfo" if data else layout.SYSTEM_ZONEINFO,
        R(layout.LOCALTIME_LINK): layout.zone_link_target(zone),
    }
    if data:
        found[R(layout.ICUTZ_LINK)] = data + "/icutz"
    return found


def clean_run(got, run, start, tree, results, facts):
    """The package's device, booted: kestrel has nothing to do, the user's
    zone is kept; then 2026c is staged."""
    expected = {
        "links": links(None),
        "files": {},
        "absent": [
            R(layout.NEEDS_CLEANUP),
            R(layout.VERSION_RECORD),
            R(layout.ICUTZ_LINK),
        ],
        "warnings": [],
        "agent": False,
        "date": EDMONTON,
    }
    return check.boot_matches(got, run, tree, expected) + staging(
        results, "staged", "0", staged(facts["release"] + ".1.1")
    )


def adopted(got, run, start, tree, results, facts):
    """2026c adopted and recorded; date reads its America/Edmonton; a service
    and a login read the same zones from ICU as from glibc; 2026c staged
    again, as its re-release .1.2."""
    first = facts["release"] + ".1.1"
    expected = {
        "links": links(first),
        "files": {R(layout.VERSION_RECORD): f"{facts['system']}.1.0_{first}".encode()},
        "absent": [R(layout.NEEDS_CLEANUP)],
        "warnings": [],
        "agent": False,
        "date": EDMONTON,
    }
    wrong = check.boot_matches(got, run, tree, expected)
    wrong += readers(results, "readers", image.USER_ZONE, facts["edmonton"], facts)
    return wrong + staging(results, "restaged", "0", staged(facts["release"] + ".1.2"))


def re_release_adopted(got, run, start, tree, results, facts):
    """The re-release adopted, the marker set and consumed by the agent,
    which removed the older set and nothing else; then the zone set with
    kestrel-data set-zone, and a staging cut short by a power-off."""
    first, second = facts["release"] + ".1.1", facts["release"] + ".1.2"
    expected = {
        "links": links(second),
        "files": {R(layout.VERSION_RECORD): f"{first}_{second}".encode()},
        "absent": [R(layout.NEEDS_CLEANUP), R(staged(first))],
        "warnings": [],
        "agent": True,
        "date": EDMONTON,
    }
    wrong = check.boot_matches(got, run, tree, expected)
    removed = sorted(set(start) - set(tree))
    older = R(staged(first))
    wrong += expect(
        "what the agent removed",
        [],
        [
            path
            for path in removed
            if path != older and not path.startswith(older + "/")
        ],
    )
    if older not in removed:
        wrong.append(f"the agent kept {older}")
    wrong += expect(
        "set-zone's status", "0", (text(results, "set_zone.status") or "").strip()
    )
    # Services of this boot keep the zone of the manager's start (the
    # environment generator); a login follows set-zone at once.
    wrong += readers(results, "zone_set", "Asia/Tokyo", "+0900", facts, ("login",))
    scratch = (text(results, "interrupted.scratch") or "").splitlines()
    if not any("/zoneinfo/" in line for line in scratch):
        wrong.append(
            f"the power-off came before the staging wrote anything: {scratch[:3]}"
        )
    return wrong


def after_power_off(got, run, start, tree, results, facts):
    """The boot after the power-off: kestrel on the previous data, the
    scratch directory left for the next staging to remove; every reader
    names the zone set-zone chose; the next staging succeeds and one of
    another ICU schema is refused, changing nothing."""
    second = facts["release"] + ".1.2"
    leftovers = {path for path in tree if "/.stage-" in path}
    expected = {
        "links": links(second, "Asia/Tokyo"),
        "files": {
            R(layout.VERSION_RECORD): f"{facts['release']}.1.1_{second}".encode()
        },
        "absent": [R(layout.NEEDS_CLEANUP)],
        # tz_latest still names the set adopted the boot before.
        "warnings": [
            f"New update not compatible or older version: {second} vs. {second}"
        ],
        "agent": False,
        "date": TOKYO,
    }
    kept = {path: entry for path, entry in tree.items() if path not in leftovers}
    wrong = check.boot_matches(got, run, kept, expected)
    if not leftovers:
        wrong.append("no scratch directory of the cut-short staging")
    wrong += readers(results, "zone_next_boot", "Asia/Tokyo", "+0900", facts)
    wrong += staging(results, "next_staging", "0", staged(facts["release"] + ".1.3"))
    wrong += unchanged(results, "incompatible")
    said = text(results, "incompatible.out") or ""
    wrong += expect(
        "the other schema's staging status",
        "1",
        (text(results, "incompatible.status") or "").strip(),
    )
    if '"44b"' not in said:
        wrong.append(f"the refusal does not name the schema: {said!r}")
    return wrong


def unchanged(results, name):
    """Step NAME left /var/db as it found it, entry by entry."""
    tars = [os.path.join(results, name + end) for end in (".before", "")]
    tars = [tar + ".var-db.tar" for tar in tars]
    if not all(map(os.path.exists, tars)):
        return [f"{name}: no /var/db before and after"]
    before, after = (trees.from_tar(tar, "var/db") for tar in tars)
    changed = [
        path for path in set(before) | set(after) if before.get(path) != after.get(path)
    ]
    return expect(f"{name}: what changed in /var/db", [], sorted(changed))


BOOTS = {
    function.__name__: function
    for function in (clean_run, adopted, re_release_adopted, after_power_off)
}
