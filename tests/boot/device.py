"""What the project's device sandbox gives for the same state and binary,
and the description of a var/db tree shared by both sides of the
comparison."""

import hashlib
import os
import shutil
import signal
import stat
import subprocess
import tarfile

TOOLS = os.path.join(os.path.dirname(os.path.abspath(__file__)), "../../tools")
SANDBOX = os.path.join(TOOLS, "device-sandbox")
# The collector's instants: 2025-01-15 and 2025-07-15, 12:00 UTC.
INSTANTS = ["1736942400", "1752580800"]
SANDBOX_TIMEOUT = 60


def describe_file(data):
    if len(data) <= 64:
        return ("file", repr(data))
    return ("file", "sha256 " + hashlib.sha256(data).hexdigest())


def tree_of_directory(root):
    """var/db below the device ROOT, as path -> (kind, mode, detail)."""
    tree = {}
    for directory, names, files in os.walk(os.path.join(root, "var/db")):
        for name in names + files:
            full = os.path.join(directory, name)
            path = os.path.relpath(full, root)
            info = os.lstat(full)
            mode = stat.S_IMODE(info.st_mode)
            if stat.S_ISLNK(info.st_mode):
                tree[path] = ("link", os.readlink(full))
            elif stat.S_ISDIR(info.st_mode):
                tree[path] = ("dir", f"{mode:04o}")
            elif stat.S_ISREG(info.st_mode):
                with open(full, "rb") as data:
                    tree[path] = describe_file(data.read()) + (f"{mode:04o}",)
            else:
                tree[path] = ("other", f"{stat.S_IFMT(info.st_mode):o}")
    return tree


def tree_of_tar(archive):
    """The same description of the guest's var/db, from its tar archive."""
    tree = {}
    with tarfile.open(archive) as tar:
        for member in tar.getmembers():
            path = os.path.normpath(member.name)
            if path == "var/db":
                continue
            mode = f"{member.mode:04o}"
            if member.issym():
                tree[path] = ("link", member.linkname)
            elif member.isdir():
                tree[path] = ("dir", mode)
            elif member.isfile() or member.islnk():
                data = tar.extractfile(member).read()
                tree[path] = describe_file(data) + (mode,)
            elif member.isfifo():
                tree[path] = ("other", f"{stat.S_IFIFO:o}")
            else:
                tree[path] = ("other", member.type.decode())
    return tree


def bare_root(prepared, work):
    """A device root in WORK with only the system partition of the prepared
    test system (hard-linked), for the state to be laid out on."""
    root = os.path.join(work, "device")
    shutil.rmtree(root, ignore_errors=True)
    os.makedirs(os.path.join(root, "usr/share"))
    for entry in ("zoneinfo.default", "icu"):
        subprocess.run(["cp", "-al", os.path.join(prepared, "usr/share", entry),
                        os.path.join(root, "usr/share")], check=True)
    return root


def run_kestrel(root, kestrel):
    """Runs KESTREL on the device ROOT; returns its lines and exit status,
    or "timeout" (and no lines) if it hangs."""
    process = subprocess.Popen([SANDBOX, root, kestrel],
                               stdin=subprocess.DEVNULL,
                               stderr=subprocess.PIPE, start_new_session=True)
    try:
        _, stderr = process.communicate(timeout=SANDBOX_TIMEOUT)
    except subprocess.TimeoutExpired:
        os.killpg(process.pid, signal.SIGKILL)
        process.communicate()
        return [], "timeout"
    return stderr.decode("latin-1").splitlines(), process.returncode


def read_local_time(root):
    """date and zdump of this machine, reading the device's links."""
    def reader(*command):
        return subprocess.run([SANDBOX, "--reader", root] + list(command),
                              capture_output=True, text=True,
                              check=True).stdout.splitlines()
    dates = []
    for instant in INSTANTS:
        dates += reader("env", "TZ=:/var/db/timezone/localtime", "date",
                        "-d", "@" + instant, "+%Z%z")
    zdump = reader("zdump", "-v", "-c", "2025,2026", "/var/db/timezone/localtime")
    return dates, zdump
