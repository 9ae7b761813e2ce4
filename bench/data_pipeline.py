#!/usr/bin/env python3
"""Measures kestrel-data on a whole real release against zic alone.

    bench/data_pipeline.py [--build DIR] [--release 2026a] [--rounds N]

In each round, on the same machine and in the same run: zic compiles the
release's data files (africa ... backward, factory) into a scratch directory;
kestrel-data builds the data set from tzdataRELEASE.tar.gz with ICU's
resources for the release (unpacking, tzdata.zi, zic, icupkg, verification);
and kestrel-data stages it on an empty device in a private user and mount
namespace (tmpfs over /var and /usr/share, nothing of this machine touched),
verifying it again there. Prints the median of each and the ratio of build
plus stage to zic; the target is at most 5. Speed is reported, never
enforced: the exit status is 0 unless a step fails. On a busy machine the
processor times are the steadier figure.
"""

import argparse
import os
import resource
import shutil
import statistics
import subprocess
import tempfile
import time

ROOT = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
RELEASES = os.path.join(ROOT, "tests", "data", "tz-releases")
DATA_FILES = [
    "africa",
    "antarctica",
    "asia",
    "australasia",
    "europe",
    "northamerica",
    "southamerica",
    "etcetera",
    "factory",
    "backward",
]
TARGET = 5.0

STAGE_ON_EMPTY_DEVICE = r"""
set -e
mount -t tmpfs device /var
mount -t tmpfs device /usr/share
mkdir -p /var/db/timezone /usr/share/zoneinfo.default /usr/share/icu
echo 2025b > /usr/share/zoneinfo.default/+VERSION
echo 44l > /usr/share/icu/icutzformat.txt
ln -s /usr/share/zoneinfo.default /var/db/timezone/zoneinfo
exec "$0" stage "$1" >/dev/null
"""


def timed(command, **options):
    """Wall time and processor time (user + system, of the command and every
    process it waited for) of one run."""
    before = resource.getrusage(resource.RUSAGE_CHILDREN)
    start = time.perf_counter()
    subprocess.run(command, check=True, **options)
    wall = time.perf_counter() - start
    after = resource.getrusage(resource.RUSAGE_CHILDREN)
    cpu = (after.ru_utime - before.ru_utime) + (after.ru_stime - before.ru_stime)
    return wall, cpu


def one_round(build, release, scratch):
    source = os.path.join(scratch, "source")
    os.makedirs(source)
    tarball = os.path.join(RELEASES, f"tzdata{release}.tar.gz")
    subprocess.run(["tar", "-xzf", tarball, "-C", source], check=True)
    zic = timed(
        ["zic", "-d", os.path.join(scratch, "zic-out")] + DATA_FILES, cwd=source
    )
    data = os.path.join(build, "kestrel-data")
    out = os.path.join(scratch, "set")
    build_time = timed(
        [
            data,
            "build",
            "--icu",
            os.path.join(RELEASES, "icu", release, "le"),
            tarball,
            out,
        ],
        stdout=subprocess.DEVNULL,
    )
    stage_time = timed(
        [
            "unshare",
            "--user",
            "--map-root-user",
            "--mount",
            "sh",
            "-c",
            STAGE_ON_EMPTY_DEVICE,
            data,
            out,
        ]
    )
    return zic, build_time, stage_time


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--build", default=os.path.join(ROOT, "build"))
    parser.add_argument("--release", default="2026a")
    parser.add_argument("--rounds", type=int, default=5)
    args = parser.parse_args()
    rounds = []
    for _ in range(args.rounds):
        scratch = tempfile.mkdtemp(prefix="kestrel-data-bench.")
        try:
            rounds.append(one_round(os.path.abspath(args.build), args.release, scratch))
        finally:
            shutil.rmtree(scratch)
    print(
        f"release {args.release}, median of {args.rounds} rounds,"
        " wall time and processor time"
    )
    for kind, index in (("wall", 0), ("processor", 1)):
        zic, build, stage = (
            statistics.median(r[i][index] for r in rounds) for i in range(3)
        )
        ratio = (build + stage) / zic
        print(
            f"  {kind}: zic alone {zic:.3f} s, kestrel-data build {build:.3f} s"
            f" + stage {stage:.3f} s (each with verification):"
            f" {ratio:.2f} x zic (target at most {TARGET:g}:"
            f" {'met' if ratio <= TARGET else 'not met'})"
        )


if __name__ == "__main__":
    main()
