"""What the demo shows of the sample device: its links, records and data
sets, and the local time a program on the device reads through the links."""

import os
import subprocess

from . import layout, sandbox
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


def run_kestrel(root, kestrel):
    """kestrel's start on the device, its warning lines shown; its status."""
    print("== kestrel runs; its warning lines:", flush=True)
    status = subprocess.run(
        [sandbox.SANDBOX, root, kestrel], stderr=subprocess.STDOUT
    ).returncode
    print(f"(exit status {status})\n")
    return status
