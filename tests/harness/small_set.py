"""A small but real data set for the fault runs of kestrel-data stage: the tz
2026a release cut down to a handful of zones and built by kestrel-data build
with ICU's own 2026a resources. It passes every check of staging (verified
by the ICU probe, newer than the devices' 2025b), and staging it makes each
call of a real staging a few times instead of the thousands of a whole
release, so that every one of them can be killed and failed."""

import os
import subprocess
import tarfile

from . import SOURCE, device

RELEASES = os.path.join(SOURCE, "tests", "data", "tz-releases")
RELEASE = "2026a"
ZONES = ("Europe/Paris", "America/Los_Angeles", "Asia/Tokyo", "Etc/UTC")


def cut(text, zones):
    """Source lines of the zones, with every rule and the links to them (zic
    makes those hard links, which staging must keep); no comments."""
    kept = []
    keeping = False
    for line in text.splitlines():
        fields = line.split("#", 1)[0].split()
        if not fields:
            continue
        if line[:1].isspace():
            if keeping:
                kept.append(line)
            continue
        keeping = fields[:1] == ["Zone"] and fields[1] in zones
        linked = fields[:1] == ["Link"] and fields[1] in zones
        if keeping or linked or fields[:1] == ["Rule"]:
            kept.append(line)
    return "\n".join(kept) + "\n"


def reduced_release(directory, zones=ZONES):
    """The release unpacked in directory, its zone sources cut to zones."""
    with tarfile.open(os.path.join(RELEASES, f"tzdata{RELEASE}.tar.gz")) as release:
        release.extractall(directory)
    for name in device.RELEASE_SOURCES:
        path = os.path.join(directory, name)
        with open(path, encoding="utf-8") as source:
            text = source.read()
        with open(path, "w", encoding="utf-8") as source:
            source.write(cut(text, zones))


def build(data, scratch):
    """The set, built by the kestrel-data binary data below scratch; its
    directory."""
    release = os.path.join(scratch, "release")
    set_dir = os.path.join(scratch, f"set-{RELEASE}")
    reduced_release(release)
    icu = os.path.join(RELEASES, "icu", RELEASE, "le")
    subprocess.run(
        [data, "build", "--icu", icu, release, set_dir],
        check=True,
        stdout=subprocess.DEVNULL,
    )
    return set_dir
