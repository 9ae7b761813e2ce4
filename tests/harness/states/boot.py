"""The device states of the boot test. Each writes var/db of a device root
whose system partition (usr/share/zoneinfo.default, usr/share/icu) is already
in place, and names what the booted system must show afterwards, the
clean-up agent's work included ("agent": whether kestrel leaves the marker
that starts it)."""

import os

from .. import device, layout
from ..layout import LATEST_LINK, LOCALTIME_LINK, ZONEINFO_LINK

# The date lines a program reports for the local zone at the collector's two
# instants, 2025-01-15 and 2025-07-15 at 12:00 UTC.
PARIS = ["CET+0100", "CEST+0200"]
R = layout.rel


def update_adopted(root, release):
    update = device.stage(
        root, release + ".1.1", release, zone_source="Zone Europe/Paris 1:30 - KTEST\n"
    )
    device.link(root, ZONEINFO_LINK, layout.SYSTEM_ZONEINFO)
    device.link(root, LATEST_LINK, update)
    device.link(root, LOCALTIME_LINK, layout.zone_link_target("Europe/Paris"))
    return {
        "links": {
            R(ZONEINFO_LINK): update + "/zoneinfo",
            R(layout.ICUTZ_LINK): update + "/icutz",
        },
        "files": {R(layout.VERSION_RECORD): f"{release}.1.0_{release}.1.1".encode()},
        "absent": [R(layout.NEEDS_CLEANUP)],
        "warnings": [],
        "agent": False,
        "date": ["KTEST+0130", "KTEST+0130"],
    }


def older_data_reset(root, release):
    old = device.stage(
        root, "2000a.1.0", "2000a", zone_source="Zone Europe/Paris 0:30 - OLDT\n"
    )
    device.link(root, ZONEINFO_LINK, old + "/zoneinfo")
    device.link(root, layout.ICUTZ_LINK, old + "/icutz")
    device.link(root, LOCALTIME_LINK, layout.zone_link_target("Europe/Paris"))
    # The agent removes the abandoned set and consumes the marker.
    return {
        "links": {R(ZONEINFO_LINK): layout.SYSTEM_ZONEINFO},
        "files": {},
        "absent": [
            R(layout.ICUTZ_LINK),
            R(layout.VERSION_RECORD),
            R(layout.NEEDS_CLEANUP),
            R(old),
        ],
        "warnings": ["Symlink points at data incompatible with installed system"],
        "agent": True,
        "date": PARIS,
    }


def localtime_old_style_corrected(root, release):
    device.link(root, ZONEINFO_LINK, layout.SYSTEM_ZONEINFO)
    device.link(root, LOCALTIME_LINK, "/usr/share/zoneinfo/Asia/Tokyo")
    zone = layout.zone_link_target("Asia/Tokyo")
    return {
        "links": {R(LOCALTIME_LINK): zone},
        "files": {},
        "absent": [R(layout.NEEDS_CLEANUP)],
        "warnings": ["Correcting localtime link to " + zone],
        "agent": False,
        "date": ["JST+0900", "JST+0900"],
    }


def localtime_missing_default(root, release):
    device.link(root, ZONEINFO_LINK, layout.SYSTEM_ZONEINFO)
    return {
        "links": {R(LOCALTIME_LINK): layout.zone_link_target(layout.DEFAULT_ZONE)},
        "files": {},
        "absent": [R(layout.NEEDS_CLEANUP)],
        "warnings": [f"localtime link invalid; resetting to {layout.DEFAULT_ZONE}"],
        "agent": False,
        "date": ["PST-0800", "PDT-0700"],
    }


def fifo_staged_version(root, release):
    """A staged update whose +VERSION is a FIFO that nobody writes: reading
    it would block for ever, so kestrel treats it as unreadable; the update's
    version is its directory name, so it is still adopted."""
    update = device.stage(root, release + ".1.1", release)
    version = os.path.join(root, R(update), "zoneinfo/+VERSION")
    os.remove(version)
    os.mkfifo(version)
    device.link(root, ZONEINFO_LINK, layout.SYSTEM_ZONEINFO)
    device.link(root, LATEST_LINK, update)
    device.link(root, LOCALTIME_LINK, layout.zone_link_target("Europe/Paris"))
    return {
        "links": {R(ZONEINFO_LINK): update + "/zoneinfo"},
        "files": {R(layout.VERSION_RECORD): f"{release}.1.0_{release}.1.1".encode()},
        "absent": [R(layout.NEEDS_CLEANUP)],
        "warnings": [],
        "agent": False,
        "date": PARIS,
    }


STATES = {
    state.__name__: state
    for state in (
        update_adopted,
        older_data_reset,
        localtime_old_style_corrected,
        localtime_missing_default,
        fifo_staged_version,
    )
}


def lay_out(root, name):
    """Writes state NAME into the device root; returns its expectations."""
    os.makedirs(os.path.join(root, R(layout.STAGED_DIR)))
    zoneinfo = os.path.join(root, R(layout.SYSTEM_ZONEINFO))
    return STATES[name](root, device.release_of(zoneinfo))
