"""The base system of the boot test: a bootable Debian 12 tree made by
mmdebstrap from the Debian 12 archive of the machine's own apt sources, kept
in a cache directory keyed by everything that goes into it (this file, the
package list and the archive), so that it is built once and reused until any
of them changes.

It is a stock point release: bookworm's main suite alone, without the
security archive, whose tzdata (2026f by now) is newer than the tz release
the lifecycle stages (2026c); on such a system kestrel-data rightly refuses
to stage older data than the system partition's."""

import hashlib
import os
import shutil
import subprocess
import time

SUITE = "bookworm"
# systemd boots it; tzdata is the data the system partition is made of;
# cron and systemd-timesyncd are ordinary services that read the local time
# and must start after kestrel has finished; libicu72 and libssl3 are what
# the package's kestrel-data and its ICU probe link; icu-devtools' icuinfo
# names the zone an ICU program takes as the local one, and dbus carries
# timedatectl's questions to systemd-timedated.
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
    "icu-devtools",
    "dbus",
]


def archive():
    """The one-line source of SUITE's main component among this machine's
    apt sources."""
    targets = subprocess.run(
        [
            "apt-get",
            "indextargets",
            "--format",
            "$(REPO_URI) $(RELEASE) $(COMPONENT) $(TARGET_OF)",
        ],
        capture_output=True,
        text=True,
        check=True,
    ).stdout.split("\n")
    for target in targets:
        fields = target.split()
        if fields[1:] == [SUITE, "main", "deb"]:
            return f"deb {fields[0]} {SUITE} main"
    raise SystemExit(f"boot-test: no {SUITE} main in this machine's apt sources")


def cache_key(source):
    digest = hashlib.sha256()
    with open(__file__, "rb") as text:
        digest.update(text.read())
    digest.update(" ".join([source] + PACKAGES).encode())
    return digest.hexdigest()[:16]


def base_tree(cache_dir, log):
    """Returns the cached base tree, building it first if it is missing."""
    source = archive()
    root = os.path.join(cache_dir, "base-" + cache_key(source))
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
                source,
            ],
            stdout=out,
            stderr=subprocess.STDOUT,
            check=True,
        )
    os.rename(scratch, root)
    log(f"base system: built in {time.monotonic() - started:.0f} s")
    return root
