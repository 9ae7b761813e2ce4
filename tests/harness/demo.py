"""Builds the sample device, shows its links and files, runs kestrel on it
through the device sandbox, shows them again, and reads the local time the
way a program on the device would, through the device's links.

    python3 -m harness.demo KESTREL DEVICE_ROOT

Exits with kestrel's own status.
"""

import argparse
import os
import subprocess
import sys

from . import device, layout, sandbox
from . import tree as trees

ZONE_FILE_READ = f"""
zone=$(readlink -m {layout.LOCALTIME_LINK})
if [ -f "$zone" ]; then
  echo "zone file read: $zone"
else
  echo "zone file read: none, $zone is missing on the device (UTC is used)"
fi"""


def show_device(root, title):
    print(f"== {title}")
    tree = trees.read(os.path.join(root, "var"), "var/")
    shown = {p: e for p, e in tree.items() if not p.startswith(layout.STAGED)}
    for path, entry in sorted(shown.items()):
        if entry[0] == "link":
            print(f"{path} -> {entry[1]}")
    for path, entry in sorted(shown.items()):
        if entry[0] == "file":
            print(f'{path}: "{entry[2].decode().rstrip()}"')
    data_sets = [layout.rel(layout.SYSTEM_ZONEINFO)] + sorted(
        f"{layout.STAGED}{name}/zoneinfo"
        for name in os.listdir(os.path.join(root, layout.STAGED))
        if os.path.isdir(os.path.join(root, layout.STAGED, name, "zoneinfo"))
    )
    for data_set in data_sets:
        files = trees.read(os.path.join(root, data_set))
        release = files["+VERSION"][2].decode().strip()
        count = sum(1 for entry in files.values() if entry[0] == "file")
        print(f"{data_set}: release {release}, {count} zone files")
    with open(os.path.join(root, layout.rel(layout.ICU_FORMAT_FILE))) as schema:
        print(f'{layout.rel(layout.ICU_FORMAT_FILE)}: "{schema.read().strip()}"')
    print(flush=True)


def local_time(root, title):
    """What zdump, a real time-zone reader, makes of the device's local-time
    link, and the zone file it reaches through the device's links."""
    print(f"== {title}", flush=True)
    sandbox.reader(root, ["zdump", layout.LOCALTIME_LINK], check=True)
    sandbox.reader(root, ["sh", "-c", ZONE_FILE_READ], check=True)
    print(flush=True)


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("kestrel", metavar="KESTREL")
    parser.add_argument("root", metavar="DEVICE_ROOT")
    options = parser.parse_args()
    kestrel, root = os.path.abspath(options.kestrel), os.path.abspath(options.root)
    device.sample(root)
    show_device(root, "the sample device before kestrel runs")
    local_time(root, "local time a program on the device sees now")
    print("== kestrel runs; its warning lines:", flush=True)
    status = subprocess.run(
        [sandbox.SANDBOX, root, kestrel], stderr=subprocess.STDOUT
    ).returncode
    print(f"(exit status {status})\n")
    show_device(root, "the sample device after kestrel ran")
    local_time(root, "local time a program on the device sees after the run")
    return status


if __name__ == "__main__":
    sys.exit(main())
