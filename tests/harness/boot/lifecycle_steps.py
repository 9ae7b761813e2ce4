"""What the steps of a lifecycle boot (tests/boot/guest/kestrel-boot-steps)
wrote on its results disk, checked: a staging's outcome, and what a
service's and a login's programs read. Each check returns the list of what
is wrong."""

import os

from .. import layout
from .. import tree as trees

SERVICE_AND_LOGIN = ("service", "login")


def text(results, name):
    path = os.path.join(results, name)
    if not os.path.exists(path):
        return None
    with open(path, errors="replace") as read:
        return read.read()


def expect(what, want, got):
    return [] if want == got else [f"{what}: {got!r}, expected {want!r}"]


def staged_sets(tree):
    """The names under tz/ in TREE."""
    prefix = layout.rel(layout.STAGED_DIR)
    return sorted(
        path[len(prefix) :]
        for path in tree
        if path.startswith(prefix) and "/" not in path[len(prefix) :]
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
        f"{name}: tz_latest",
        ("link", latest),
        after.get(layout.rel(layout.LATEST_LINK)),
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
