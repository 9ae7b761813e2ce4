"""The update lifecycle on one disk image, booted again and again: the
system as the package laid it out, the tz release 2026c built and packed on
this machine by the package's kestrel-data and staged inside the running
system, adopted at the next boot, staged again and adopted with the older
set cleaned up by the agent, a staging cut short by a power-off, and an
archive of another ICU schema refused. Each boot is also compared with the
device sandbox's run of kestrel (and of the agent) on the /var/db that boot
started from. The steps of a boot are lines of a file on its results disk,
which the collector runs after taking the boot's own results
(tests/boot/guest/kestrel-boot-steps)."""

import os
import shutil
import subprocess
import time

from .. import SOURCE, layout
from .. import tree as trees
from . import check, image, lifecycle_checks, qemu, run_state

RELEASE = "2026c"
TARBALL = os.path.join(
    SOURCE, "tests", "data", "tz-releases", f"tzdata{RELEASE}.tar.gz"
)
ARCHIVE = "set.tar.gz"
OTHER_SCHEMA = "44b"
INCOMPATIBLE = "set-other-schema.tar.gz"
# The instant the readers read the local zone at: 2026-11-18, after 2026c's
# change of America/Edmonton on 2026-11-01.
INSTANT = "1795000000"

# Each boot's steps, run after its results are taken; the checks of a boot
# are lifecycle_checks.BOOTS[NAME].
BOOTS = [
    ("clean_run", ["stage staged " + ARCHIVE]),
    ("adopted", [f"readers readers {INSTANT} {RELEASE}", "stage restaged " + ARCHIVE]),
    (
        "re_release_adopted",
        [
            "set_zone set_zone Asia/Tokyo",
            "readers zone_set " + INSTANT,
            "interrupted_stage interrupted " + ARCHIVE,
        ],
    ),
    (
        "after_power_off",
        [
            "readers zone_next_boot " + INSTANT,
            "stage next_staging " + ARCHIVE,
            "stage incompatible " + INCOMPATIBLE,
        ],
    ),
]


def data_sets(programs, work):
    """INPUTS/set.tar.gz, 2026c with the ICU data kestrel-data converts from
    it, and the same set with its ICU data file named for another schema;
    returns the set's directory."""
    inputs = os.path.join(work, "sets")
    shutil.rmtree(inputs, ignore_errors=True)
    os.makedirs(inputs)
    env = dict(os.environ, KESTREL_ICU_PROBE=programs.probe)
    built = os.path.join(inputs, RELEASE)

    def data(*arguments):
        subprocess.run(
            [programs.data, *arguments], env=env, check=True, stdout=subprocess.DEVNULL
        )

    data("build", TARBALL, built)
    data("pack", built, os.path.join(inputs, ARCHIVE))
    other = os.path.join(inputs, "other-schema")
    shutil.copytree(built, other, symlinks=True)
    icutz = os.path.join(other, "icutz")
    os.rename(
        os.path.join(icutz, layout.icu_data_file()),
        os.path.join(icutz, layout.icu_data_file(OTHER_SCHEMA)),
    )
    data("pack", other, os.path.join(inputs, INCOMPATIBLE))
    return built


def boot_inputs(work, name, steps):
    """The files a boot's results disk starts with: its steps and the
    archives they stage."""
    inputs = os.path.join(work, name + ".inputs")
    shutil.rmtree(inputs, ignore_errors=True)
    os.makedirs(inputs)
    for archive in (ARCHIVE, INCOMPATIBLE):
        shutil.copy(os.path.join(work, "sets", archive), inputs)
    with open(os.path.join(inputs, "steps"), "w") as out:
        out.write("".join(step + "\n" for step in steps))
    return inputs


def sandbox_from(prepared, work, start, programs):
    """The device sandbox's boot of START, a var/db tar (or the prepared
    tree's var/db when None), and the var/db tree it started from."""
    root = run_state.bare_device(prepared, work)
    if start is None:
        os.makedirs(os.path.join(root, "var"))
        subprocess.run(
            ["cp", "-a", os.path.join(prepared, "var/db"), os.path.join(root, "var/")],
            check=True,
        )
    else:
        subprocess.run(["tar", "-C", root, "-xf", start], check=True)
    before = trees.read(os.path.join(root, "var/db"), "var/db/")
    run = run_state.sandbox_boot(root, programs)
    shutil.rmtree(root)
    return run, before


def run_lifecycle(prepared, deb, work, log, boots=len(BOOTS)):
    """Runs the first BOOTS boots of the lifecycle; returns the row of
    figures and the result."""
    work = os.path.join(work, "lifecycle")
    shutil.rmtree(work, ignore_errors=True)
    os.makedirs(work)
    started = time.monotonic()
    programs = run_state.packaged(deb, work)
    facts = lifecycle_checks.facts(
        prepared, data_sets(programs, work), RELEASE, INSTANT
    )
    root = os.path.join(work, "root")
    subprocess.run(["cp", "-al", prepared, root], check=True)
    disk = image.disk_image(root, work)
    shutil.rmtree(root)
    row = {"name": "lifecycle", "result": "FAILED", "boots": []}
    wrong, start = [], None  # None: the prepared tree's var/db
    log(
        f"lifecycle: system data {facts['system']}, sets built in "
        f"{time.monotonic() - started:.0f} s; {image.USER_ZONE} on "
        f"2026-11-18: {facts['edmonton_image']} in {facts['system']}, "
        f"{facts['edmonton']} in {RELEASE}"
    )
    for name, steps in BOOTS[:boots]:
        run, before = sandbox_from(prepared, work, start, programs)
        inputs = boot_inputs(work, name, steps)
        booted = qemu.boot_or_report(disk, prepared, work, name, wrong, inputs)
        if booted is None:
            break
        results, seconds = booted
        row["boots"].append(seconds)
        got = check.results(results)
        tree = trees.from_tar(os.path.join(results, "var-db.tar"), "var/db")
        more = lifecycle_checks.BOOTS[name](got, run, before, tree, results, facts)
        log(
            f"lifecycle: {name} took {seconds:.0f} s, kestrel "
            f"{got.duration_ms():.1f} ms, lines {got.warnings()}, "
            f"{len(more)} wrong"
        )
        wrong += [f"{name}: {text}" for text in more]
        # The next boot starts from /var/db as this boot's last step left it.
        last = steps[-1].split()[1]
        start = os.path.join(results, last + ".var-db.tar")
        if "interrupted_stage" in steps[-1]:
            start = os.path.join(results, last + ".before.var-db.tar")
    row["total"] = time.monotonic() - started
    if wrong:
        log("lifecycle: FAILED\n  " + "\n  ".join(wrong))
        for name, _ in BOOTS[:boots]:
            log(
                f"lifecycle: tail of {name}.serial.log:\n"
                + qemu.serial_tail(work, name)
            )
    else:
        row["result"] = "passed"
        os.remove(disk)
        log(f"lifecycle: passed in {row['total']:.0f} s")
    return row
