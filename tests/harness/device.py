"""Builders of device trees from real time-zone data: the system partition,
staged data sets and the links, below a device root."""

import os
import shutil
import subprocess
import tarfile
import tempfile

from . import SOURCE, layout

# The sample device's system partition is this release, compiled here, so
# that the device and everything the demo stages on it are the same on every
# machine, whatever tzdata the machine itself has.
SAMPLE_RELEASE = os.path.join(
    SOURCE, "tests", "data", "tz-releases", "tzdata2025b.tar.gz"
)
RELEASE_SOURCES = (
    "africa antarctica asia australasia europe northamerica southamerica "
    "etcetera factory backward"
).split()
ZONE_TABLES = ("iso3166.tab", "zone.tab", "zone1970.tab")
# The old-style local-time link of the sample device points here, where the
# device has nothing.
MACHINE_ZONEINFO = "/usr/share/zoneinfo"


def release_of(zoneinfo):
    """The release of compiled zone data: the version line of its
    tzdata.zi."""
    with open(os.path.join(zoneinfo, "tzdata.zi")) as zi:
        return zi.readline().split()[-1]


def compile_release(tarball, zoneinfo):
    """zic's tree of a tz release tarball in zoneinfo, with the release's
    zone tables and +VERSION. Returns the release."""
    with tempfile.TemporaryDirectory() as source:
        with tarfile.open(tarball) as release:
            release.extractall(source)
        with open(os.path.join(source, "version")) as version:
            word = version.read().strip()
        os.makedirs(zoneinfo)
        subprocess.run(
            ["zic", "-d", zoneinfo, *RELEASE_SOURCES], cwd=source, check=True
        )
        for table in ZONE_TABLES:
            shutil.copy(os.path.join(source, table), zoneinfo)
    with open(os.path.join(zoneinfo, "+VERSION"), "w") as version:
        version.write(word + "\n")
    return word


def write(root, path, text):
    with open(os.path.join(root, layout.rel(path)), "w") as out:
        out.write(text)


def link(root, path, target):
    """The link at the device's path, made anew."""
    full = os.path.join(root, layout.rel(path))
    if os.path.lexists(full):
        os.unlink(full)
    os.symlink(target, full)


def system_partition(root, tarball=SAMPLE_RELEASE):
    """The system partition: the release compiled, and the system's ICU
    schema. Returns the release."""
    zoneinfo = os.path.join(root, layout.rel(layout.SYSTEM_ZONEINFO))
    os.makedirs(os.path.dirname(zoneinfo), exist_ok=True)
    release = compile_release(tarball, zoneinfo)
    os.makedirs(os.path.join(root, layout.rel(layout.SYSTEM_ICU)), exist_ok=True)
    write(root, layout.ICU_FORMAT_FILE, layout.SCHEMA + "\n")
    return release


def stage(root, version, word, source=None, zone_source=None):
    """A staged data set VERSION: the zone files of source (the system
    partition's by default) under the release word, with ICU data of the
    system's schema; zone_source, if given, is zic source compiled over the
    copy. Returns the data set's directory on the device."""
    directory = layout.STAGED_DIR + version
    full = os.path.join(root, layout.rel(directory))
    os.makedirs(os.path.join(full, "icutz"))
    source = source or os.path.join(root, layout.rel(layout.SYSTEM_ZONEINFO))
    subprocess.run(["cp", "-a", source, os.path.join(full, "zoneinfo")], check=True)
    write(root, directory + "/zoneinfo/+VERSION", word + "\n")
    write(
        root,
        f"{directory}/icutz/{layout.icu_data_file()}",
        f"ICU time-zone data, schema {layout.SCHEMA}\n",
    )
    if zone_source:
        with tempfile.NamedTemporaryFile("w", suffix=".zi") as zic_source:
            zic_source.write(zone_source)
            zic_source.flush()
            subprocess.run(
                ["zic", "-d", os.path.join(full, "zoneinfo"), zic_source.name],
                check=True,
            )
    return directory


def sample(root, zone=layout.SAMPLE_ZONE):
    """The sample device (sample/make-device), made anew in root."""
    shutil.rmtree(root, ignore_errors=True)
    os.makedirs(os.path.join(root, layout.rel(layout.STAGED_DIR)))
    release = system_partition(root)
    zoneinfo = os.path.join(root, layout.rel(layout.SYSTEM_ZONEINFO))
    if not os.path.isfile(os.path.join(zoneinfo, zone)):
        raise SystemExit(f"make-device: no zone {zone} in release {release}")
    update = stage(root, f"{release}.1.1", release)
    link(root, layout.ZONEINFO_LINK, layout.SYSTEM_ZONEINFO)
    link(root, layout.LATEST_LINK, update)
    link(root, layout.LOCALTIME_LINK, f"{MACHINE_ZONEINFO}/{zone}")
    link(root, layout.LEGACY_ICUTZ_LINK, layout.SYSTEM_ICU)
    return release
