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


def hold_clean_up_agent(root):
    # Each state's /var/db after a boot is compared with kestrel's run in the
    # device sandbox alone, so the clean-up agent, which would act on the
    # marker kestrel leaves, is masked here.
    run("systemctl", "--root=" + root, "mask", "kestrel-clean.path")


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
    check_layout(root)
    hold_clean_up_agent(root)
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
