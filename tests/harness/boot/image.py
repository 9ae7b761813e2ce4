"""The test system: the cached base system with the kestrel package
installed by dpkg and a device laid out on it, and one disk image per device
state made from it without loop mounts (mkfs.ext4 -d)."""

import glob
import os
import shutil
import subprocess

from .. import SOURCE, device, layout
from ..states import boot as states

GUEST = os.path.join(SOURCE, "tests", "boot", "guest")
IMAGE_SIZE = "2G"


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


def lay_out_system_partition(root):
    """The system partition made from the image's own tzdata, and the
    system's local time read through kestrel's links."""
    device.system_partition(root, os.path.join(root, "usr/share/zoneinfo"))
    localtime = os.path.join(root, "etc/localtime")
    if os.path.lexists(localtime):
        os.remove(localtime)
    os.symlink(layout.LOCALTIME_LINK, localtime)


def install_collector(root):
    shutil.copy(
        os.path.join(GUEST, "kestrel-boot-collect"),
        os.path.join(root, "usr/local/sbin/"),
    )
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
    install_package(root, deb)
    lay_out_system_partition(root)
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
    image = os.path.join(work, "root.img")
    if os.path.exists(image):
        os.remove(image)
    run("mkfs.ext4", "-q", "-F", "-L", "root", "-d", root, image, IMAGE_SIZE)
    shutil.rmtree(root)
    return image, expected
