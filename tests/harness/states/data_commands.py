"""The device states of the fault matrix and the crash points of
kestrel-data's two commands that change the device, each a tree in the
scenario format's notation: "stage" installs the small data set
(harness.small_set) on them, "clean" removes what no link designates."""

from .. import scenario

TZ = "var/db/timezone/tz/"
# The system partition at 2025b, on the system's ICU schema, and the device
# on it with its zone in Europe/Paris.
SYSTEM = [
    'file usr/share/zoneinfo.default/+VERSION "2025b\\n"',
    "file usr/share/zoneinfo.default/Europe/Paris",
    'file usr/share/icu/icutzformat.txt "44l\\n"',
    "link var/db/timezone/localtime -> /var/db/timezone/zoneinfo/Europe/Paris",
]
ON_SYSTEM = ["link var/db/timezone/zoneinfo -> /usr/share/zoneinfo.default"]


def staged(name):
    """A set as kestrel-data stages it, a few bytes a file."""
    return [
        f'file {TZ}{name}/zoneinfo/+VERSION "{name.split(".")[0]}\\n"',
        f'file {TZ}{name}/zoneinfo/Europe/Paris "TZif2 {name}"',
        f'file {TZ}{name}/icutz/icutz44l.dat "icu {name}"',
    ]


def designated(name):
    return [
        f"link var/db/timezone/zoneinfo -> /{TZ}{name}/zoneinfo",
        f"link var/db/timezone/icutz -> /{TZ}{name}/icutz",
    ]


def latest(name):
    return [f"link var/db/timezone/tz_latest -> /{TZ}{name}"]


def scratch(name):
    """What an interrupted staging leaves: part of a set."""
    return [
        f'file {TZ}{name}/zoneinfo/+VERSION "2026a\\n"',
        f'file {TZ}{name}/zoneinfo/Europe/Paris "TZif2 partial"',
    ]


def removing(name):
    """What an interrupted clean-up leaves: part of a renamed set."""
    return [
        f'file {TZ}.remove-{name}/zoneinfo/Europe/Paris "TZif2 {name}"',
        f"dir  {TZ}.remove-{name}/icutz",
    ]


STAGE = [
    # tz/ is made by the first staging.
    ("first-staging", SYSTEM + ON_SYSTEM),
    # An older update in use, tz_latest naming it: the staged set replaces
    # it as tz_latest's target.
    (
        "over-adopted-update",
        SYSTEM + staged("2025c.1.1") + designated("2025c.1.1") + latest("2025c.1.1"),
    ),
    # The release staged once already and not yet adopted: 2026a.1.2.
    (
        "second-of-release",
        SYSTEM + ON_SYSTEM + staged("2026a.1.1") + latest("2026a.1.1"),
    ),
    # An earlier staging killed: its scratch directory, its new tz_latest
    # link and the lock file are still there.
    (
        "leftover-scratch",
        SYSTEM
        + ON_SYSTEM
        + scratch(".stage-Ab3xYz")
        + ["link var/db/timezone/.tz_latest.new -> /" + TZ + ".stage-Ab3xYz"]
        + ["file var/db/timezone/.kestrel-data.lock mode 0600"],
    ),
]

MARKER = ["file var/db/timezone/needs_cleanup"]
CLEAN = [
    # The links and tz_latest on one set; an older set and the leftovers of
    # interrupted runs go.
    (
        "one-removable-set",
        SYSTEM
        + staged("2025c.1.1")
        + staged("2026a.1.1")
        + designated("2026a.1.1")
        + latest("2026a.1.1")
        + scratch(".stage-Ab3xYz")
        + removing("2024a.1.1")
        + MARKER,
    ),
    # tz_latest names a newer set than the one in use: both are kept.
    (
        "latest-not-adopted",
        SYSTEM
        + staged("2024a.1.1")
        + staged("2025b.1.1")
        + staged("2025c.1.1")
        + staged("2026a.1.1")
        + designated("2025c.1.1")
        + latest("2026a.1.1")
        + MARKER,
    ),
    # Back on the system partition with no tz_latest: every set goes.
    (
        "all-sets-abandoned",
        SYSTEM + ON_SYSTEM + staged("2025c.1.1") + staged("2026a.1.1") + MARKER,
    ),
]


def tree(lines):
    return scenario.tree_from((line, "harness.states.data_commands") for line in lines)


STATES = {"stage": STAGE, "clean": CLEAN}
