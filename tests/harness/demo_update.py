"""The update lifecycle on the sample device, after kestrel's first run:
tz 2026a built with ICU's own 2026a resources, staged and adopted, and read
through the device's links; tz 2026c with ICU's 2026a resources refused by
the verification gate; tz 2026c built with the project's converter, staged
and adopted; then the clean-up agent keeps only the set in use.
kestrel-data runs on the device's fixed paths inside the device sandbox
(--reader), like every program that reads the links."""

import os
import subprocess
import tempfile

from . import SOURCE, layout, sandbox
from .demo_view import run_kestrel, show_device

RELEASES = os.path.join(SOURCE, "tests", "data", "tz-releases")
# 2025-07-15 00:00 UTC: Mexico City is at -06 since tz 2022f, at -05 in the
# 2022e data the system's ICU carries.
ZONE, INSTANT = "America/Mexico_City", "1752537600"


def step(title, command, expect_success=True):
    """Shows and runs one command; whether it ended as it should."""
    print(f"== {title}\n$ {' '.join(command)}", flush=True)
    status = subprocess.run(command, stderr=subprocess.STDOUT).returncode
    print(f"(exit status {status})\n", flush=True)
    return (status == 0) == expect_success


class Lifecycle:
    def __init__(self, root, binaries, scratch):
        self.root = root
        self.data = os.path.join(binaries, "kestrel-data")
        self.probe = os.path.join(binaries, "kestrel-icu-probe")
        self.kestrel = os.path.join(binaries, "kestrel")
        self.scratch = scratch

    def on_device(self, *command, **env):
        settings = [f"{name}={value}" for name, value in env.items()]
        prefix = ["env"] + settings if settings else []
        return [sandbox.SANDBOX, "--reader", self.root] + prefix + list(command)

    def set_dir(self, release):
        return os.path.join(self.scratch, f"set-{release}")

    def build(self, release, icu, expect_success=True):
        icu_options = ["--icu", os.path.join(RELEASES, "icu", icu, "le")] if icu else []
        how = f"ICU's {icu} resources" if icu else "the project's converter"
        command = [self.data, "build"] + icu_options
        command += [os.path.join(RELEASES, f"tzdata{release}.tar.gz")]
        command += [self.set_dir(release)]
        return step(f"build tz {release} with {how}", command, expect_success)

    def build_stage_and_start(self, release, icu):
        stage = self.on_device(self.data, "stage", self.set_dir(release))
        return (
            self.build(release, icu)
            and step(f"stage tz {release} on the device", stage)
            and run_kestrel(self.root, self.kestrel) == 0
            and step("kestrel-data status", self.on_device(self.data, "status"))
        )

    def readers(self, title):
        """zdump, date and the ICU probe through the device's links."""
        zoneinfo = {"TZDIR": layout.ZONEINFO_LINK}
        date = ["date", "-d", f"@{INSTANT}", "+%F %T %z"]
        icu = {"ICU_TIMEZONE_FILES_DIR": layout.ICUTZ_LINK}
        return (
            step(f"{title}: zdump", self.on_device("zdump", ZONE, **zoneinfo))
            and step(
                f"{title}: date at {INSTANT}",
                self.on_device(*date, TZ=ZONE, **zoneinfo),
            )
            and step(
                f"{title}: ICU at {INSTANT}",
                self.on_device(self.probe, "at", ZONE, INSTANT, **icu),
            )
        )


def lifecycle(root, binaries):
    """Every step in turn; 0 when each did what it should, 1 from the first
    that did not."""
    with tempfile.TemporaryDirectory(prefix="kestrel-demo-sets.") as scratch:
        life = Lifecycle(root, binaries, scratch)
        steps = (
            lambda: life.readers("before any update, the system's ICU"),
            lambda: life.build_stage_and_start("2026a", "2026a"),
            lambda: life.readers("after adopting 2026a"),
            lambda: life.build("2026c", "2026a", expect_success=False),
            lambda: life.build_stage_and_start("2026c", None),
            lambda: life.readers("after adopting 2026c"),
            lambda: step("clean up", life.on_device(life.data, "clean")),
            lambda: step("kestrel-data status", life.on_device(life.data, "status")),
        )
        passed = all(each() for each in steps)
    if not passed:
        print("== the demo stopped at a step that did not do what it should")
        return 1
    show_device(root, "the sample device after the updates")
    print("== every step did what it should")
    return 0
