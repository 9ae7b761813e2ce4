"""Runs programs in the project's device sandbox (tools/device-sandbox): a
kestrel binary changed root into a device tree, or a program of this
machine reading the device's var/db and usr/share (--reader)."""

import os
import signal
import subprocess

from . import SOURCE

SANDBOX = os.path.join(SOURCE, "tools", "device-sandbox")


class Run:
    """One finished run: its standard error as bytes, and its return code
    (negative for a signal), or None when it was killed after the
    timeout."""

    def __init__(self, stderr, returncode):
        self.stderr = stderr
        self.returncode = returncode

    @property
    def timed_out(self):
        return self.returncode is None

    def lines(self):
        return self.stderr.decode("latin-1").splitlines()

    def exit_text(self):
        return describe_exit(self.returncode)


def describe_exit(returncode):
    """ "status N", "abort", "signal N", or "hang" for None."""
    if returncode is None:
        return "hang"
    if returncode == -signal.SIGABRT:
        return "abort"
    if returncode < 0:
        return f"signal {-returncode}"
    return f"status {returncode}"


def run(command, timeout, env=None, stdout=subprocess.DEVNULL):
    """Runs command in a session of its own and waits at most timeout
    seconds; a hang is ended by killing the whole process group, where the
    sandbox's kestrel runs too."""
    child = subprocess.Popen(
        command,
        stdin=subprocess.DEVNULL,
        stdout=stdout,
        stderr=subprocess.PIPE,
        env=env,
        start_new_session=True,
        # Another thread may be inside a tree that is about to be removed.
        cwd="/",
    )
    try:
        _, stderr = child.communicate(timeout=timeout)
        return Run(stderr, child.returncode)
    except subprocess.TimeoutExpired:
        os.killpg(child.pid, signal.SIGKILL)
        return Run(child.communicate()[1], None)


def run_kestrel(root, kestrel, arguments=(), timeout=30, env=None, prefix=()):
    """kestrel on the device root; prefix is a command to run the sandbox
    under (GNU time)."""
    command = list(prefix) + [SANDBOX, root, kestrel] + list(arguments)
    return run(command, timeout, env)


def reader(root, command, **options):
    """A program of this machine that reads the device's data on the fixed
    paths; its completed process."""
    return subprocess.run([SANDBOX, "--reader", root] + list(command), **options)
