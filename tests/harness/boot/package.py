"""The kestrel package that the test system gets: the project's own .deb,
built by tools/build-package, or one built before (the package test's)."""

import glob
import os
import subprocess

from .. import SOURCE


def find(directory):
    """The kestrel .deb in directory (not its debug-symbol package)."""
    debs = glob.glob(os.path.join(directory, "kestrel_*.deb"))
    if len(debs) != 1:
        raise SystemExit(
            f"boot-test: expected one kestrel_*.deb in "
            f"{directory}, found {len(debs)}"
        )
    return debs[0]


def build(work):
    """Builds the package from the tracked tree; returns its path. Its tests
    are left out here: the package test builds the same tree with them."""
    out = os.path.join(work, "package")
    subprocess.run(["rm", "-rf", out], check=True)
    env = dict(os.environ, DEB_BUILD_OPTIONS="nocheck")
    subprocess.run(
        [os.path.join(SOURCE, "tools/build-package"), out],
        check=True,
        env=env,
        stdout=subprocess.DEVNULL,
    )
    return find(out)
