"""Builders of device trees from real time-zone data: the system partition,
staged data sets and the links, below a device root."""

import os
import shutil
import subprocess
import tempfile

from . import layout

MACHINE_ZONEINFO = "/usr/share/zoneinfo"


def release_of(zoneinfo):
    """The release of compiled zone data: the version line of its
    tzdata.zi."""
    with open(os.path.join(zoneinfo, "tzdata.zi")) as zi:
        return zi.readline().split()[-1]


def write(root, path, text):
    with open(os.path.join(root, layout.rel(path)), "w") as out:
        out.write(text)


def link(root, path, target):
    """The link at the device's path, made anew."""
    full = os.path.join(root, layout.rel(path))
    if os.path.lexists(full):
        os.unlink(full)
    os.symlink(target, full)


def system_partition(root, source=MACHINE_ZONEINFO):
    """The system partition: the zone files of source with +VERSION naming
    their release, and the system's ICU schema. Returns the release."""
    release = release_of(source)
    zoneinfo = os.path.join(root, layout.rel(layout.SYSTEM_ZONEINFO))
    os.makedirs(os.path.dirname(zoneinfo), exist_ok=True)
    subprocess.run(["cp", "-a", source, zoneinfo], check=True)
    write(root, layout.SYSTEM_ZONEINFO + "/+VERSION", release + "\n")
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
    if not os.path.isfile(os.path.join(MACHINE_ZONEINFO, "tzdata.zi")):
        raise SystemExit(
            f"make-device: no {MACHINE_ZONEINFO}/tzdata.zi (is tzdata installed?)"
        )
    if not os.path.isfile(os.path.join(MACHINE_ZONEINFO, zone)):
        raise SystemExit(f"make-device: no zone {zone} in {MACHINE_ZONEINFO}")
    shutil.rmtree(root, ignore_errors=True)
    os.makedirs(os.path.join(root, layout.rel(layout.STAGED_DIR)))
    release = system_partition(root)
    update = stage(root, f"{release}.1.1", release, source=MACHINE_ZONEINFO)
    link(root, layout.ZONEINFO_LINK, layout.SYSTEM_ZONEINFO)
    link(root, layout.LATEST_LINK, update)
    link(root, layout.LOCALTIME_LINK, f"{MACHINE_ZONEINFO}/{zone}")
    link(root, layout.LEGACY_ICUTZ_LINK, layout.SYSTEM_ICU)
    return release
