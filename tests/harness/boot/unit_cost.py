"""What kestrel.service costs a boot: the common start booted several times
with every measured unit variant (unit_variants.py) installed
and enabled, kestrel.service itself disabled. In a boot the variants run one
after the other (each is ordered after the one before it, all in kestrel's
own place before sysinit.target), so no two are set up at the same time;
each one's time is its own InactiveExit -> ActiveEnter. The order turns by
a step every boot, so that no variant always runs first or last, and a
plain unit starting kestrel and the do-nothing program runs ahead of them
all, so that none pays for reading the programs from disk."""

import glob
import os
import shutil
import subprocess

from .. import SOURCE, device, layout, sandbox
from . import check, image, qemu, run_state, unit_variants

KESTREL = "/usr/sbin/kestrel"
NOTHING = "/usr/local/sbin/kestrel-do-nothing"
UNITS = "etc/systemd/system"
WARMUP = "kestrel-cost-warmup.service"


def common_start(root, release):
    """The current data is the latest staged update: kestrel changes
    nothing and warns that the update is not newer, on every start."""
    os.makedirs(os.path.join(root, layout.rel(layout.STAGED_DIR)))
    update = device.stage(root, release + ".1.1", release)
    for path, target in (
        (layout.ZONEINFO_LINK, update + "/zoneinfo"),
        (layout.ICUTZ_LINK, update + "/icutz"),
        (layout.LATEST_LINK, update),
        (layout.LOCALTIME_LINK, layout.zone_link_target("Europe/Paris")),
    ):
        device.link(root, path, target)
    device.write(root, layout.VERSION_RECORD, f"{release}.1.0_{release}.1.1")


def system_release(root):
    zoneinfo = os.path.join(root, layout.rel(layout.SYSTEM_ZONEINFO))
    return device.release_of(zoneinfo)


def do_nothing(work):
    """The static do-nothing program, built as kestrel is linked."""
    program = os.path.join(work, "do-nothing")
    subprocess.run(
        [
            "g++",
            "-O2",
            "-static-pie",
            "-o",
            program,
            os.path.join(SOURCE, "bench/do_nothing.cc"),
        ],
        check=True,
    )
    subprocess.run(["strip", program], check=True)
    return program


def write(path, text):
    os.makedirs(os.path.dirname(path), exist_ok=True)
    with open(path, "w") as out:
        out.write(text)


def install_variants(root, shipped, order):
    wants = os.path.join(root, UNITS, "sysinit.target.wants")
    os.remove(os.path.join(wants, "kestrel.service"))
    warmup = unit_variants.unit_text(shipped, {}, KESTREL, None)
    write(
        os.path.join(root, UNITS, WARMUP),
        warmup.replace(
            f"ExecStart={KESTREL}", f"ExecStart={KESTREL}\nExecStart={NOTHING}"
        ),
    )
    after = WARMUP
    for one in [None] + order:
        unit = WARMUP if one is None else one.id
        if one is not None:
            write(
                os.path.join(root, UNITS, unit),
                unit_variants.unit_text(shipped, one.service, one.path, after),
            )
            if one.dropin:
                write(os.path.join(root, UNITS, unit + ".d/variant.conf"), one.dropin)
            after = unit
        os.symlink("../" + unit, os.path.join(wants, unit))


def cost_image(prepared, work, shipped, order, program):
    """Disk image of the common start with ORDER's units in place."""
    root = os.path.join(work, "root")
    shutil.rmtree(root, ignore_errors=True)
    subprocess.run(["cp", "-al", prepared, root], check=True)
    shutil.rmtree(os.path.join(root, "var/db"), ignore_errors=True)
    common_start(root, system_release(root))
    shutil.copy(program, root + NOTHING)
    install_variants(root, shipped, order)
    disk = image.disk_image(root, work)
    shutil.rmtree(root)
    return disk


def expected_lines(prepared, work, kestrel):
    """kestrel's lines on the common start, from the device sandbox."""
    root = run_state.bare_device(prepared, work)
    common_start(root, system_release(root))
    ran = sandbox.run_kestrel(root, kestrel, timeout=run_state.SANDBOX_TIMEOUT)
    shutil.rmtree(root)
    if ran.timed_out or ran.returncode != 0:
        raise SystemExit(
            f"boot-test: kestrel ended with {ran.returncode} on the "
            f"common start in the device sandbox: {ran.lines()}"
        )
    return ran.lines()


def installed(prepared, *patterns):
    """The files of the prepared tree that the first matching pattern
    names."""
    for pattern in patterns:
        found = sorted(glob.glob(os.path.join(prepared, pattern)))
        if found:
            return found
    return []


def read(path):
    with open(path) as text:
        return text.read()


def check_boot(got, order, lines, name):
    """Each variant's activating-to-active time and processor time, in ms;
    what went wrong, if anything."""
    times, wrong = {}, []
    for one in order:
        unit = got.units.get(one.id, {})
        start = int(unit.get("InactiveExitTimestampMonotonic") or 0)
        end = int(unit.get("ActiveEnterTimestampMonotonic") or 0)
        if not start or not end:
            wrong.append(f"{name}: {one.id} never became active")
            continue
        times[one.id] = (
            (end - start) / 1000,
            int(unit.get("CPUUsageNSec", "").isdigit() and unit["CPUUsageNSec"]) / 1e6,
        )
        said = [
            entry["MESSAGE"]
            for entry in got.journal
            if entry.get("_SYSTEMD_UNIT") == one.id
        ]
        want = lines if one.path == KESTREL else []
        if said != want:
            wrong.append(f"{name}: {one.id} wrote {said}, expected {want}")
    return times, wrong


def measure(prepared, work, kestrel, boots, groups, log):
    """Boots the common start BOOTS times; returns the variants, each one's
    times in ms by unit name, and what went wrong."""
    work = os.path.join(work, "unit-cost")
    shutil.rmtree(work, ignore_errors=True)
    os.makedirs(work)
    shipped = read(
        installed(
            prepared,
            "lib/systemd/system/kestrel.service",
            "usr/lib/systemd/system/kestrel.service",
        )[0]
    )
    dropins = {
        os.path.basename(path)[:-5]: read(path)
        for path in installed(prepared, "usr/share/doc/kestrel/examples/*.conf")
    }
    variants = unit_variants.variants(
        shipped, dropins, [("kestrel", KESTREL), ("do-nothing", NOTHING)], groups
    )
    program = do_nothing(work)
    lines = expected_lines(prepared, work, kestrel)
    times, wrong = {one.id: [] for one in variants}, []
    for number in range(boots):
        turn = number * len(variants) // boots
        order = variants[turn:] + variants[:turn]
        disk = cost_image(prepared, work, shipped, order, program)
        name = f"cost{number + 1}"
        booted = qemu.boot_or_report(disk, prepared, work, name, wrong)
        if booted is None:
            continue
        results, seconds = booted
        got, more = check_boot(check.results(results), order, lines, name)
        wrong += more
        for unit, ms in got.items():
            times[unit].append(ms)
        log(f"unit cost: {name} took {seconds:.0f} s")
    return shipped, variants, times, wrong
