"""What each boot of the lifecycle (lifecycle.py) must show: kestrel's run
and the clean-up agent's as in the device sandbox, the links, the record and
the staged sets, and what its steps did. Each check returns the list of what
is wrong."""

import os
import subprocess

from .. import device, layout
from .. import tree as trees
from . import check, image

R = layout.rel
STAGED = layout.STAGED_DIR
EDMONTON = ["MST-0700", "MDT-0600"]  # at the collector's 2025 instants
TOKYO = ["JST+0900", "JST+0900"]
SERVICE_AND_LOGIN = ("service", "login")


def zone_names(zoneinfo):
    """Every zone and link name of ZONEINFO/tzdata.zi."""
    names = set()
    with open(os.path.join(zoneinfo, "tzdata.zi")) as source:
        for line in source:
            fields = line.split()
            if fields[:1] == ["Z"]:
                names.add(fields[1])
            elif fields[:1] == ["L"]:
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


def text(results, name):
    path = os.path.join(results, name)
    if not os.path.exists(path):
        return None
    with open(path, errors="replace") as read:
        return read.read()


def expect(what, want, got):
    return [] if want == got else [f"{what}: {got!r}, expected {want!r}"]


def staged(version):
    return STAGED + version


def link_targets(tree):
    return {
        path: entry[1]
        for path, entry in tree.items()
        if entry[0] == "link" and "/tz/" not in path
    }


def staged_sets(tree):
    prefix = R(STAGED)
    return sorted(
        path[len(prefix) :]
        for path in tree
        if path.startswith(prefix) and "/" not in path[len(prefix) :]
    )


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


def boot_matches(got, run, tree, expected):
    """kestrel and the agent as in the device sandbox and as EXPECTED."""
    return (
        check.unit_ran_once(got)
        + check.warnings_match(got, run["lines"], expected["warnings"])
        + check.finished_first(got)
        + check.clean_up_agent(got, run["clean"], expected["agent"])
        + check.tree_matches(tree, run["tree"], expected)
        + check.local_time_matches(got, run["dates"], run["zdump"], expected)
    )


def staging(results, name, status, latest):
    """Step NAME of kestrel-data stage ended with STATUS and left tz_latest
    at LATEST and no scratch directory."""
    tar = os.path.join(results, name + ".var-db.tar")
    if not os.path.exists(tar):
        return [f"{name}: the step left no results ({text(results, 'steps.log')})"]
    after = trees.from_tar(tar, "var/db")
    said = text(results, name + ".out")
    wrong = expect(
        f"{name}: kestrel-data stage's status ({said})",
        status,
        (text(results, name + ".status") or "").strip(),
    )
    wrong += expect(
        f"{name}: tz_latest", ("link", latest), after.get(R(layout.LATEST_LINK))
    )
    leftovers = [s for s in staged_sets(after) if s.startswith(".stage-")]
    return wrong + expect(f"{name}: scratch directories", [], leftovers)


def readers(results, name, zone, want_offset, facts, contexts=SERVICE_AND_LOGIN):
    """What a service and a login read (kestrel-boot-readers): the zone
    variables; ZONE as the local zone of ICU, with glibc's date and ICU both
    at WANT_OFFSET at the readers' instant; and, where the step ran it, the
    ICU probe's check: ICU's data the adopted release, every zone and link
    name of it the same in ICU as in glibc."""
    wrong = []
    for context in contexts:
        said = (text(results, f"{name}.{context}") or "").splitlines() + [""] * 3
        where = f"{name}: {context}"
        wrong += expect(
            f"{where}: variables",
            f"variables: TZ={zone} TZDIR={layout.ZONEINFO_LINK} "
            f"ICU_TIMEZONE_FILES_DIR={layout.ICUTZ_LINK}",
            said[0],
        )
        local = said[1].split() + [""] * 5
        wrong += expect(f"{where}: ICU's local zone", zone, local[3])
        wrong += expect(f"{where}: date's offset", want_offset, local[1][-5:])
        icu = said[2].split() + [""] * 3
        wrong += expect(f"{where}: ICU's offset", want_offset, icu[2].replace(":", ""))
        if len(said) > 6:
            wrong += expect(f"{where}: ICU's data", facts["release"], local[4])
            wrong += probe_check(where, said[3:], facts)
    if "service" in contexts:
        wrong += timedated(results, name)
    return wrong


def timedated(results, name):
    """timedated names no zone (/etc/localtime leads to kestrel's link, not
    into /usr/share/zoneinfo); timedatectl, run by the collector's service,
    shows the time in the zone date of a service names."""
    shown = dict(
        line.partition("=")[::2]
        for line in (text(results, f"{name}.timedatectl") or "").splitlines()
    )
    service = (text(results, f"{name}.service") or "").splitlines() + [""] * 2
    abbreviation = (service[1].split() + [""] * 2)[1][:-5]
    return expect(
        f"{name}: timedatectl's zone and time",
        ("", abbreviation),
        (shown.get("Timezone", ""), shown.get("TimeUSec", "").rpartition(" ")[2]),
    )


def probe_check(where, lines, facts):
    """kestrel-icu-probe check found ICU's data of the release and no zone
    name of it reading otherwise than in glibc."""
    release = facts["release"]
    wanted = [
        f"ICU tz version: {release} (release {release})",
        f"zones: {len(facts['zones'])}",
        "disagreements: 0",
        "check status: 0",
    ]
    missing = [line for line in wanted if line not in lines]
    return (
        [f"{where}: the ICU probe's check lacks {missing}: {lines}"] if missing else []
    )


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
    return boot_matches(got, run, tree, expected) + staging(
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
    wrong = boot_matches(got, run, tree, expected)
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
    wrong = boot_matches(got, run, tree, expected)
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
        "warnings": [],
        "agent": False,
        "date": TOKYO,
    }
    kept = {path: entry for path, entry in tree.items() if path not in leftovers}
    wrong = boot_matches(got, run, kept, expected)
    if not leftovers:
        wrong.append("no scratch directory of the cut-short staging")
    wrong += readers(results, "zone_next_boot", "Asia/Tokyo", "+0900", facts)
    wrong += staging(results, "next_staging", "0", staged(facts["release"] + ".1.3"))
    before = os.path.join(results, "incompatible.before.var-db.tar")
    after = os.path.join(results, "incompatible.var-db.tar")
    if os.path.exists(before) and os.path.exists(after):
        wrong += expect(
            "/var/db after the refused staging",
            trees.from_tar(before, "var/db"),
            trees.from_tar(after, "var/db"),
        )[:1]
    said = text(results, "incompatible.out") or ""
    wrong += expect(
        "the other schema's staging status",
        "1",
        (text(results, "incompatible.status") or "").strip(),
    )
    if '"44b"' not in said:
        wrong.append(f"the refusal does not name the schema: {said!r}")
    return wrong


BOOTS = {
    function.__name__: function
    for function in (clean_run, adopted, re_release_adopted, after_power_off)
}
