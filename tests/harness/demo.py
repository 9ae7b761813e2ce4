"""Builds the sample device, shows its links and files, runs kestrel on it
through the device sandbox, shows them again, and reads the local time the
way a program on the device would, through the device's links. Then the
update lifecycle on the same device (harness.demo_update): real releases
built, verified, refused or staged with kestrel-data, adopted by kestrel and
read through the links by zdump, date and an ICU program.

    python3 -m harness.demo KESTREL DEVICE_ROOT

kestrel-data and kestrel-icu-probe are taken from KESTREL's directory.
Exits with the first failing status, 0 when every step did what it should.
"""

import argparse
import os
import sys

from . import demo_update, device
from .demo_view import local_time, run_kestrel, show_device


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("kestrel", metavar="KESTREL")
    parser.add_argument("root", metavar="DEVICE_ROOT")
    options = parser.parse_args()
    kestrel, root = os.path.abspath(options.kestrel), os.path.abspath(options.root)
    device.sample(root)
    show_device(root, "the sample device before kestrel runs")
    local_time(root, "local time a program on the device sees now")
    status = run_kestrel(root, kestrel)
    show_device(root, "the sample device after kestrel ran")
    local_time(root, "local time a program on the device sees after the run")
    return status or demo_update.lifecycle(root, os.path.dirname(kestrel))


if __name__ == "__main__":
    sys.exit(main())
