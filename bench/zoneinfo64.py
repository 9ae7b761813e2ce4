#!/usr/bin/env python3
"""Measures the tz-to-ICU converter on whole releases against zic.

    bench/zoneinfo64.py [BUILD_DIR] [--runs N]

For each release in tests/data/tz-releases, in one run of hyperfine each:
zic compiling the release's data files; the converter making zoneinfo64
text from the release (its rearguard form through the release's
ziguard.awk included) and genrb compiling it; and the same followed by the
check that ICU reading the result agrees with glibc reading zic's output
for every zone, 1900-2100. BUILD_DIR (default build/, the default preset)
must hold kestrel-zoneinfo64 and the test programs. Prints the mean wall
times and the ratio to zic; the target, reported and never enforced, is
converting and compiling in at most 3 times zic's time.
"""

import argparse
import json
import os
import subprocess
import tarfile
import tempfile

ROOT = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
DATA = os.path.join(ROOT, "tests", "data", "tz-releases")
FILES = (
    "africa antarctica asia australasia europe northamerica southamerica "
    "etcetera factory backward"
)
TARGET = 3.0


def measure(release, build, runs, scratch):
    source = os.path.join(scratch, release)
    with tarfile.open(os.path.join(DATA, f"tzdata{release}.tar.gz")) as archive:
        archive.extractall(source)
    zoneinfo = os.path.join(scratch, release + "-zoneinfo")
    res = os.path.join(scratch, release + "-res")
    os.makedirs(res)
    converter = os.path.join(build, "src", "kestrel-zoneinfo64")
    checker = os.path.join(
        build, "tests", "unit", "zoneinfo64", "zoneinfo64_glibc_agreement"
    )
    text = os.path.join(scratch, release + ".txt")
    subprocess.run(
        f"cd {source} && cat {FILES} > {zoneinfo}.zi", shell=True, check=True
    )
    icu = os.path.join(DATA, "icu", "2026a", "le")
    for other in ("metaZones", "timezoneTypes", "windowsZones"):
        subprocess.run(["cp", os.path.join(icu, other + ".res"), res], check=True)
    convert = f"{converter} {source} {text} && genrb -q -d {res} {text}"
    verify = f"cp {zoneinfo}.zi {zoneinfo}/tzdata.zi && {checker} {res} {zoneinfo}"
    commands = {
        "zic": f"cd {source} && zic -d {zoneinfo} {FILES}",
        "convert+genrb": convert,
        "convert+genrb+verify": f"{convert} && {verify} >/dev/null",
    }
    subprocess.run(commands["zic"], shell=True, check=True)
    export = os.path.join(scratch, release + ".json")
    subprocess.run(
        [
            "hyperfine",
            "--style",
            "none",
            "--warmup",
            "2",
            "--runs",
            str(runs),
            "--export-json",
            export,
        ]
        + list(commands.values()),
        check=True,
    )
    with open(export) as results:
        means = [result["mean"] for result in json.load(results)["results"]]
    return dict(zip(commands, means))


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("build", nargs="?", default=os.path.join(ROOT, "build"))
    parser.add_argument("--runs", type=int, default=10)
    options = parser.parse_args()
    releases = sorted(
        name[len("tzdata") : -len(".tar.gz")]
        for name in os.listdir(DATA)
        if name.startswith("tzdata") and name.endswith(".tar.gz")
    )
    with tempfile.TemporaryDirectory() as scratch:
        for release in releases:
            means = measure(release, options.build, options.runs, scratch)
            ratio = means["convert+genrb"] / means["zic"]
            print(
                f"{release}: zic {means['zic'] * 1000:.0f} ms, convert+genrb "
                f"{means['convert+genrb'] * 1000:.0f} ms ({ratio:.2f} x zic, target "
                f"<= {TARGET:.0f} x), with verification "
                f"{means['convert+genrb+verify'] * 1000:.0f} ms "
                f"({means['convert+genrb+verify'] / means['zic']:.2f} x zic)"
            )


if __name__ == "__main__":
    main()
