"""Boots a disk image in QEMU (TCG: nested KVM stalls on this machine kind)
with a results disk beside it, which may also bring the boot the steps to
run and their files, and reads the results back with debugfs once the
system has powered itself off."""

import os
import shutil
import subprocess
import time

from . import image

BOOT_TIMEOUT = 600
# Room for the lifecycle's archives and its several copies of /var/db.
RESULTS_SIZE = "512M"


class boot_failed(Exception):
    pass


def boot(root_image, prepared, work, name, inputs=None):
    """Boots ROOT_IMAGE; returns (results directory, seconds). The results
    disk starts with the files of the directory INPUTS, if given. The serial
    log stays in WORK as NAME.serial.log."""
    results_image = os.path.join(work, name + ".results.img")
    contents = ["-d", inputs] if inputs else []
    subprocess.run(
        ["mkfs.ext4", "-q", "-F", "-L", "results"]
        + contents
        + [results_image, RESULTS_SIZE],
        check=True,
    )
    serial = os.path.join(work, name + ".serial.log")
    kernel, initrd = image.kernel_and_initrd(prepared)
    command = [
        "qemu-system-x86_64",
        "-accel",
        "tcg",
        "-m",
        "1024",
        "-display",
        "none",
        "-nic",
        "none",
        "-no-reboot",
        "-serial",
        "file:" + serial,
        "-kernel",
        kernel,
        "-initrd",
        initrd,
        "-append",
        "root=/dev/vda rw console=ttyS0 panic=-1",
        "-drive",
        f"file={root_image},format=raw,if=virtio",
        "-drive",
        f"file={results_image},format=raw,if=virtio",
    ]
    started = time.monotonic()
    try:
        subprocess.run(
            command, stdin=subprocess.DEVNULL, check=True, timeout=BOOT_TIMEOUT
        )
    except subprocess.TimeoutExpired:
        raise boot_failed(f"no power-off within {BOOT_TIMEOUT} s")
    seconds = time.monotonic() - started
    results = os.path.join(work, name + ".results")
    shutil.rmtree(results, ignore_errors=True)
    os.makedirs(results)
    subprocess.run(
        ["debugfs", "-R", f"rdump / {results}", results_image],
        check=True,
        capture_output=True,
    )
    os.remove(results_image)
    if not os.path.exists(os.path.join(results, "complete")):
        raise boot_failed("the collector left no complete set of results")
    return results, seconds


def boot_or_report(root_image, prepared, work, name, wrong, inputs=None):
    """boot(), or None with the reason the boot failed added to WRONG."""
    try:
        return boot(root_image, prepared, work, name, inputs)
    except boot_failed as failure:
        wrong.append(f"{name}: {failure}")
        return None


def serial_tail(work, name, lines=40):
    path = os.path.join(work, name + ".serial.log")
    if not os.path.exists(path):
        return "(no serial log)"
    with open(path, errors="replace") as log:
        return "".join(log.readlines()[-lines:])
