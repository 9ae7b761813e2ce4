"""The device's fixed places, as kestrel knows them (src/fs/paths.h; the
unit test harness.check_layout keeps the two the same), the system's ICU
schema and the default zone. Absolute paths are the device's own; the REL_
forms are the same places below a device root."""

# The directories of the links and of the staged data sets.
TIMEZONE_DIR = "/var/db/timezone/"
STAGED_DIR = "/var/db/timezone/tz/"

# The links every other program reads the data through.
ZONEINFO_LINK = "/var/db/timezone/zoneinfo"
ICUTZ_LINK = "/var/db/timezone/icutz"
LOCALTIME_LINK = "/var/db/timezone/localtime"
# The link to the directory of the latest staged update.
LATEST_LINK = "/var/db/timezone/tz_latest"
# The record of the last version change and the clean-up marker.
VERSION_RECORD = "/var/db/timezone/TZVersionDiffRecord"
NEEDS_CLEANUP = "/var/db/timezone/needs_cleanup"
# Entries of older layouts.
LEGACY_ICUTZ_LINK = "/var/db/icutz"
LEGACY_ICU = "/var/db/icu"
# The system partition's own data.
SYSTEM_ZONEINFO = "/usr/share/zoneinfo.default"
SYSTEM_ICU = "/usr/share/icu"

# The system's ICU schema, as its format file names it, and that file.
SCHEMA = "44l"
ICU_FORMAT_FILE = SYSTEM_ICU + "/icutzformat.txt"
# Where kestrel points the local-time link when nothing better is known.
DEFAULT_ZONE = "America/Los_Angeles"
# The zone of the sample device and of most device states.
SAMPLE_ZONE = "Europe/Paris"


def rel(path):
    """The place below a device root: "/var/db/icutz" -> "var/db/icutz"."""
    return path.lstrip("/")


def icu_data_file(schema=SCHEMA):
    """The name of a data set's ICU data file of that schema."""
    return f"icutz{schema}.dat"


def zone_link_target(zone):
    """What the local-time link of a zone points at."""
    return f"{ZONEINFO_LINK}/{zone}"


# What a run of kestrel may change, below the device root: the three links
# every program reads, and the records beside them.
DEVICE_LINKS = tuple(map(rel, (ZONEINFO_LINK, ICUTZ_LINK, LOCALTIME_LINK)))
DEVICE_RECORDS = tuple(map(rel, (VERSION_RECORD, NEEDS_CLEANUP, LEGACY_ICUTZ_LINK)))
STAGED = rel(STAGED_DIR)
