"""Device trees: a tree is a dict from a path below the device root to its
entry, one of

    ("dir", MODE)  ("file", MODE, CONTENT)  ("link", TARGET)
    ("fifo", MODE)  ("socket", MODE)  ("other", FILE_TYPE)

built on disk, read back from disk or from a tar archive, shown in the
scenario format's own notation and compared."""

import difflib
import os
import re
import socket
import stat
import subprocess
import sys
import tarfile
import threading

DEFAULT_MODES = {"dir": 0o755, "file": 0o644, "fifo": 0o644, "socket": 0o644}

# A directory tree thousands of levels deep is walked with one Python frame
# per level.
sys.setrecursionlimit(20000)

# Trees are built and read by changing the working directory, which all
# threads share: one tree at a time.
_cwd_lock = threading.Lock()


class Cursor:
    """Moves the working directory through a tree one directory at a time, so
    that no path handed to the system grows with the tree's depth."""

    def __init__(self, root):
        os.chdir(root)
        self.here = ""

    def enter(self, directory):
        here = self.here
        while here and directory != here and not directory.startswith(here + "/"):
            os.chdir("..")
            here = os.path.dirname(here)
        rest = directory[len(here) :].lstrip("/")
        for part in rest.split("/") if rest else []:
            os.chdir(part)
        self.here = directory


def _make(name, entry):
    kind = entry[0]
    if kind == "dir":
        os.mkdir(name)
    elif kind == "link":
        os.symlink(entry[1], name)
    elif kind == "fifo":
        os.mkfifo(name)
    elif kind == "socket":
        with socket.socket(socket.AF_UNIX) as listener:
            listener.bind(name)
    else:
        with open(name, "wb") as out:
            out.write(entry[2])
    # The umask of 022 already gives a file its usual 0644.
    if kind in ("fifo", "socket") or (kind == "file" and entry[1] != 0o644):
        os.chmod(name, entry[1])


def _build_from(root, tree):
    cursor = Cursor(root)
    for path in sorted(tree):
        cursor.enter(os.path.dirname(path))
        _make(os.path.basename(path), tree[path])
    # Directory modes last and deepest first, so that a read-only
    # directory still gets its children.
    for path in sorted(tree, reverse=True):
        if tree[path][0] == "dir":
            cursor.enter(os.path.dirname(path))
            os.chmod(os.path.basename(path), tree[path][1])


def _walk(prefix, tree):
    kinds = {stat.S_IFIFO: "fifo", stat.S_IFSOCK: "socket"}
    for name in sorted(os.listdir(".")):
        path = prefix + name
        info = os.lstat(name)
        mode = stat.S_IMODE(info.st_mode)
        kind = stat.S_IFMT(info.st_mode)
        if stat.S_ISLNK(info.st_mode):
            tree[path] = ("link", os.readlink(name))
        elif stat.S_ISDIR(info.st_mode):
            tree[path] = ("dir", mode)
            os.chmod(name, mode | 0o700)
            os.chdir(name)
            _walk(path + "/", tree)
            os.chdir("..")
        elif stat.S_ISREG(info.st_mode):
            with open(name, "rb") as data:
                tree[path] = ("file", mode, data.read())
        elif kind in kinds:
            tree[path] = (kinds[kind], mode)
        else:
            tree[path] = ("other", kind)


def _in_directory(function):
    def locked(root, *arguments):
        with _cwd_lock:
            home = os.getcwd()
            try:
                return function(root, *arguments)
            finally:
                os.chdir(home)

    return locked


@_in_directory
def build(root, tree):
    """Makes every entry of tree below the existing directory root."""
    _build_from(root, tree)


@_in_directory
def read(root, prefix=""):
    """The tree below root, each path prefixed with prefix. Directories
    without search or read permission are opened up to be read."""
    os.chdir(root)
    tree = {}
    _walk(prefix, tree)
    return tree


def from_tar(archive, top):
    """The tree of the archive's members below top (itself left out)."""
    tree = {}
    with tarfile.open(archive) as tar:
        for member in tar.getmembers():
            path = os.path.normpath(member.name)
            if path == top:
                continue
            if member.issym():
                tree[path] = ("link", member.linkname)
            elif member.isdir():
                tree[path] = ("dir", member.mode)
            elif member.isfile() or member.islnk():
                tree[path] = ("file", member.mode, tar.extractfile(member).read())
            elif member.isfifo():
                tree[path] = ("fifo", member.mode)
            else:
                tree[path] = ("other", member.type.decode())
    return tree


def remove(directory):
    """Removes a tree of any depth: rm walks it where a recursive walk here
    would hold one descriptor per level."""
    subprocess.run(["rm", "-rf", "--", directory], check=False)


def pick(tree, paths):
    """The entries of paths, None for those that are absent."""
    return {path: tree.get(path) for path in paths}


def changed(before, after, below):
    """The paths below the directory below (or it itself) whose entry
    differs between the trees."""
    paths = {
        path
        for path in list(before) + list(after)
        if path.startswith(below) or path == below.rstrip("/")
    }
    return sorted(path for path in paths if before.get(path) != after.get(path))


# ---- Showing trees ---------------------------------------------------------

RUN = re.compile(rb"(.)\1{15,}", re.S)
NAMED_ESCAPES = {
    "\n": "\\n",
    "\t": "\\t",
    "\r": "\\r",
    "\v": "\\v",
    "\f": "\\f",
    '"': '\\"',
    "\\": "\\\\",
}
LONG = 160


def quote(data):
    """Bytes as one C-style quoted string."""
    out = []
    for byte in data:
        char = chr(byte)
        if char in NAMED_ESCAPES:
            out.append(NAMED_ESCAPES[char])
        elif 32 <= byte < 127:
            out.append(char)
        else:
            out.append(f"\\x{byte:02x}")
    return '"' + "".join(out) + '"'


def _quote_cut(data):
    """A stretch without long runs, cut in the middle when it is long."""
    if len(data) <= LONG:
        return quote(data)
    keep = LONG // 2
    return (
        f"{quote(data[:keep])} + <{len(data) - 2 * keep} bytes> + "
        f"{quote(data[-keep:])}"
    )


def show(data):
    """Bytes in the scenario format's notation, runs of one byte as
    '"c" * N'."""
    parts, done = [], 0
    for run in RUN.finditer(data):
        if run.start() > done:
            parts.append(_quote_cut(data[done : run.start()]))
        parts.append(f"{quote(run.group(1))} * {run.end() - run.start()}")
        done = run.end()
    if done < len(data) or not parts:
        parts.append(_quote_cut(data[done:]))
    return " + ".join(parts)


def show_path(path):
    data = os.fsencode(path)
    plain = re.fullmatch(rb"[!#-~]+", data) and not data.startswith(b'"')
    return path if plain else show(data)


def describe(path, entry):
    """One entry as a line of the scenario format."""
    path = show_path(path)
    if entry[0] == "link":
        return f"link {path} -> {show_path(entry[1])}"
    if entry[0] == "file":
        return f"file {path} mode {entry[1]:04o} {show(entry[2])}"
    if entry[0] == "other":
        return f"?    {path} (file type {entry[1]:o})"
    return f"{entry[0]:4} {path} mode {entry[1]:04o}"


def listing(tree):
    return [describe(path, tree[path]) for path in sorted(tree)]


def show_entry(entry):
    """An entry in a few words: absent, a link's target, a file's content."""
    if entry is None:
        return "absent"
    if entry[0] == "link":
        return "-> " + entry[1]
    if entry[0] == "file":
        return "file " + quote(entry[2])
    return entry[0]


def shorten(line):
    return show(line.encode("latin-1")) if len(line) > LONG else line


def print_diff(title, expected, actual):
    """A unified diff of two lists of lines, long lines shortened."""
    print(f"--- {title}: expected / +++ actual")
    for line in difflib.unified_diff(
        expected, actual, "expected", "actual", lineterm="", n=100
    ):
        if not line.startswith(("---", "+++")):
            print(line[0] + shorten(line[1:]) if line[:1] in "+- " else line)
