"""Boot test: the kestrel package installed in a real Debian 12 system,
booted in QEMU once per device state (and a second time to show that a
second start changes nothing), each boot checked against the device
sandbox's run of the same state with the same binary; then the update
lifecycle (lifecycle.py) on one image booted four times.

    tools/boot-test [--build-dir DIR] [--package-dir DIR] [STATE...]
                    [--dropin NAME] [--cost-boots N] [--unit-cost]
                    [--lifecycle-boots N]
    python3 -m harness.boot [the same]

Runs as root (mmdebstrap, dpkg --root, mkfs.ext4 -d). Needs the packages of
`tools/install-deps boot`. The package is the kestrel .deb in --package-dir,
or one built from the tracked tree with tools/build-package. The base system
is cached in DIR/cache; each
boot's serial log stays in DIR/states/STATE. Exits 1 if any check fails.

STATE "lifecycle" is the lifecycle; with no STATE, every state and the
lifecycle run. --lifecycle-boots N runs only its first N boots (CI: 2).
--dropin NAME boots the states with the package's example drop-in NAME
(/usr/share/doc/kestrel/examples/NAME.conf) installed for kestrel.service.
After the states it boots the common start --cost-boots times (default 3)
with the shipped unit and the plain unit (same ordering, no sandboxing),
each starting kestrel and a static do-nothing program, and prints what the
unit costs against both (unit_cost.py). --unit-cost boots no state and
measures every variant: also each drop-in the package ships, each group of
the full sandbox's directives on its own and the points between them
(default 5 boots).
"""

import argparse
import os
import shutil
import sys
import time

from ..states import boot as states
from . import base, image, package, unit_cost_main
from .lifecycle import BOOTS as LIFECYCLE_BOOTS
from .lifecycle import run_lifecycle
from .run_state import run_state

LIFECYCLE = "lifecycle"

TOOLS = [
    "mmdebstrap",
    "qemu-system-x86_64",
    "mkfs.ext4",
    "debugfs",
    "dpkg-deb",
    "zic",
    "unshare",
]


def log(text):
    print(f"boot-test: {text}", flush=True)


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--build-dir", default="build/boot")
    parser.add_argument("--package-dir")
    parser.add_argument("--dropin")
    parser.add_argument("--cost-boots", type=int)
    parser.add_argument("--unit-cost", action="store_true")
    parser.add_argument("--lifecycle-boots", type=int, default=len(LIFECYCLE_BOOTS))
    parser.add_argument("states", nargs="*")
    options = parser.parse_args()
    if not options.states and not options.unit_cost:
        options.states = list(states.STATES) + [LIFECYCLE]
    unknown = [
        name for name in options.states if name not in list(states.STATES) + [LIFECYCLE]
    ]
    if unknown or os.geteuid() != 0:
        parser.error(
            f"unknown states {unknown}"
            if unknown
            else "must run as root (mmdebstrap, dpkg --root, mkfs.ext4 -d)"
        )
    missing = [
        tool
        for tool in TOOLS
        if not any(
            os.access(os.path.join(d, tool), os.X_OK)
            for d in os.environ["PATH"].split(":") + ["/usr/sbin", "/sbin"]
        )
    ]
    if missing:
        parser.error(f"missing {missing}: run tools/install-deps boot")
    os.umask(0o022)

    work = os.path.abspath(options.build_dir)
    started = time.monotonic()
    base_root = base.base_tree(os.path.join(work, "cache"), log)
    deb = (
        package.find(options.package_dir)
        if options.package_dir
        else package.build(work)
    )
    prepared = os.path.join(work, "prepared")
    image.prepare(base_root, prepared, deb)
    if options.dropin:
        dropins = os.path.join(prepared, "etc/systemd/system/kestrel.service.d")
        os.makedirs(dropins)
        examples = os.path.join(prepared, "usr/share/doc/kestrel/examples")
        shutil.copy(os.path.join(examples, options.dropin + ".conf"), dropins)
    log(f"test system ready in {time.monotonic() - started:.0f} s")

    rows = [
        run_state(name, prepared, deb, work, log)
        for name in options.states
        if name != LIFECYCLE
    ]
    if rows:
        print(
            f"\n{'state':32} {'result':6} {'image':>6} {'boot 1':>7} "
            f"{'boot 2':>7} {'kestrel 1':>10} {'kestrel 2':>10}"
        )
    for row in rows:
        print(
            f"{row['name']:32} {row['result']:6} {row['image']:5.0f}s "
            f"{row['boot1']:6.0f}s {row['boot2']:6.0f}s "
            f"{row['kestrel1']:8.1f}ms {row['kestrel2']:8.1f}ms"
        )
    if LIFECYCLE in options.states:
        cycle = run_lifecycle(prepared, deb, work, log, options.lifecycle_boots)
        boots = " ".join(f"{seconds:.0f}s" for seconds in cycle["boots"])
        total = cycle["total"]
        print(f"\nlifecycle {cycle['result']}: boots {boots}, {total:.0f} s in all")
        rows.append(cycle)
    # The unit's cost is measured after the states, not after the lifecycle
    # alone.
    measure = options.unit_cost or set(options.states) - {LIFECYCLE}
    costs_ran = not measure or unit_cost_main.run(prepared, deb, work, options, log)
    log(f"all done in {time.monotonic() - started:.0f} s")
    passed = all(row["result"] == "passed" for row in rows)
    return 0 if costs_ran and passed else 1


if __name__ == "__main__":
    sys.exit(main())
