"""The test system: the cached base system with the kestrel package
installed by dpkg and a device laid out on it, and one disk image per device
state made from it without loop mounts (mkfs.ext4 -d)."""

import glob
import os
import shutil
import subprocess

from .. import SOURCE, layout
from ..states import boot as states

GUEST = os.path.join(SOURCE, "tests", "boot", "guest")
GUEST_PROGRAMS = ["kestrel-boot-collect", "kestrel-boot-steps", "kestrel-boot-readers"]
IMAGE_SIZE = "2G"
# The zone the test system's user chose before installing kestrel: one whose
# abbreviation alone does not name it, and whose rules 2026c changed.
USER_ZONE = "America/Edmonton"


def run(*command):
    subprocess.run(command, check=True)


def install_package(root, deb):
    # dpkg of the test system itself, changed root into it, so that users,
    # groups and maintainer scripts are the system's own; no systemd runs
    # there, so the unit is enabled but not started.
    inside = "/tmp/" + os.path.basename(deb)
    shutil.copy(deb, root + inside)
    run("chroot", root, "dpkg", "-i", inside)
    os.remove(root + inside)


def check_layout(root):
    """The package laid out the system partition from the image's own tzdata
    and pointed the system's local time at kestrel's link; the test lays out
    nothing of it itself."""
    version = os.path.join(root, layout.rel(layout.SYSTEM_ZONEINFO), "+VERSION")
    with open(os.path.join(root, layout.rel(layout.ICU_FORMAT_FILE))) as schema:
        found = schema.read().split()
    localtime = os.readlink(os.path.join(root, "etc/localtime"))
    if not os.path.isfile(version) or found != [layout.SCHEMA]:
        raise RuntimeError(
            f"the package made no system data set of schema {layout.SCHEMA}"
        )
    if localtime != layout.LOCALTIME_LINK:
        raise RuntimeError(f"/etc/localtime points at {localtime}")


def choose_zone(root):
    # The system's user chose a zone before installing kestrel, as tzdata's
    # own configuration does; the package must keep it.
    localtime = os.path.join(root, "etc/localtime")
    if os.path.lexists(localtime):
        os.remove(localtime)
    os.symlink("/usr/share/zoneinfo/" + USER_ZONE, localtime)
    with open(os.path.join(root, "etc/timezone"), "w") as timezone:
        timezone.write(USER_ZONE + "\n")


def install_collector(root):
    for program in GUEST_PROGRAMS:
        shutil.copy(os.path.join(GUEST, program), os.path.join(root, "usr/local/sbin/"))
    shutil.copy(
        os.path.join(GUEST, "kestrel-boot-collect.service"),
        os.path.join(root, "etc/systemd/system/"),
    )
    run("systemctl", "--root=" + root, "enable", "kestrel-boot-collect.service")


def prepare(base, root, deb):
    """The base tree, with kestrel installed and the device laid out, in
    ROOT (made anew; the base stays as it is)."""
    shutil.rmtree(root, ignore_errors=True)
    run("cp", "-a", base, root)
    choose_zone(root)
    install_package(root, deb)
    check_layout(root)
    install_collector(root)


def kernel_and_initrd(root):
    kernel = sorted(glob.glob(os.path.join(root, "boot/vmlinuz-*")))[-1]
    initrd = sorted(glob.glob(os.path.join(root, "boot/initrd.img-*")))[-1]
    return kernel, initrd


def state_image(prepared, work, name):
    """Disk image of the prepared tree with device state NAME; returns the
    image path and the state's expectations."""
    root = os.path.join(work, "root")
    shutil.rmtree(root, ignore_errors=True)
    # Hard links: the state tree shares every file of the prepared tree and
    # only gains a var/db of its own.
    run("cp", "-al", prepared, root)
    shutil.rmtree(os.path.join(root, "var/db"), ignore_errors=True)
    expected = states.lay_out(root, name)
    image = disk_image(root, work)
    shutil.rmtree(root)
    return image, expected


def disk_image(root, work):
    """WORK/root.img, the root file system made of the tree ROOT."""
    image = os.path.join(work, "root.img")
    if os.path.exists(image):
        os.remove(image)
    run("mkfs.ext4", "-q", "-F", "-L", "root", "-d", root, image, IMAGE_SIZE)
    return image
