"""The base system of the boot test: a bootable Debian 12 tree made by
mmdebstrap from the machine's own apt sources, kept in a cache directory
keyed by everything that goes into it (this file and the package list), so
that it is built once and reused until either changes."""

import hashlib
import os
import shutil
import subprocess
import time

SUITE = "bookworm"
# systemd boots it; tzdata is the data the system partition is made of;
# cron and systemd-timesyncd are ordinary services that read the local time
# and must start after kestrel has finished; libicu72 and libssl3 are what
# the package's kestrel-data and its ICU probe link.
PACKAGES = [
    "systemd",
    "systemd-sysv",
    "linux-image-amd64",
    "udev",
    "tzdata",
    "cron",
    "systemd-timesyncd",
    "libicu72",
    "libssl3",
]


def cache_key():
    digest = hashlib.sha256()
    with open(__file__, "rb") as source:
        digest.update(source.read())
    digest.update(" ".join([SUITE] + PACKAGES).encode())
    return digest.hexdigest()[:16]


def base_tree(cache_dir, log):
    """Returns the cached base tree, building it first if it is missing."""
    root = os.path.join(cache_dir, "base-" + cache_key())
    if os.path.isdir(root):
        log(f"base system: cached in {root}")
        return root
    scratch = root + ".partial"
    shutil.rmtree(scratch, ignore_errors=True)
    os.makedirs(cache_dir, exist_ok=True)
    log(f"base system: mmdebstrap {SUITE} into {root}")
    started = time.monotonic()
    with open(root + ".log", "w") as out:
        subprocess.run(
            [
                "mmdebstrap",
                "--variant=apt",
                "--include=" + ",".join(PACKAGES),
                SUITE,
                scratch,
            ],
            stdout=out,
            stderr=subprocess.STDOUT,
            check=True,
        )
    os.rename(scratch, root)
    log(f"base system: built in {time.monotonic() - started:.0f} s")
    return root
