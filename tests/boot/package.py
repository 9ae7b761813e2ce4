"""The kestrel package installed into the test system."""

import os
import subprocess

# Until the project's own Debian package lands, a package of the same
# contents is put together here from a built binary and the unit below.
UNIT = """\
[Unit]
Description=Reconcile the time-zone data links
DefaultDependencies=no
RequiresMountsFor=/var/db
After=local-fs.target
Before=sysinit.target shutdown.target
Conflicts=shutdown.target

[Service]
Type=oneshot
RemainAfterExit=yes
TimeoutStartSec=30s
ExecStart=/usr/sbin/kestrel
ProtectSystem=strict
ReadWritePaths=/var/db
PrivateNetwork=yes
CapabilityBoundingSet=
NoNewPrivileges=yes
SystemCallFilter=@system-service

[Install]
WantedBy=sysinit.target
"""

CONTROL = """\
Package: kestrel
Version: 0~boottest
Architecture: amd64
Maintainer: kestrel developers <kestrel@localhost>
Description: time-zone data link reconciler
"""

POSTINST = """\
#!/bin/sh
set -e
deb-systemd-helper enable kestrel.service
"""


def write(path, text, mode=0o644):
    os.makedirs(os.path.dirname(path), exist_ok=True)
    with open(path, "w") as out:
        out.write(text)
    os.chmod(path, mode)


def build(work, kestrel):
    """Builds the package from the binary KESTREL; returns its path."""
    tree = os.path.join(work, "package")
    subprocess.run(["rm", "-rf", tree], check=True)
    os.makedirs(os.path.join(tree, "usr/sbin"))
    subprocess.run(["install", "-m", "0755", kestrel,
                    os.path.join(tree, "usr/sbin/kestrel")], check=True)
    write(os.path.join(tree, "lib/systemd/system/kestrel.service"), UNIT)
    write(os.path.join(tree, "DEBIAN/control"), CONTROL)
    write(os.path.join(tree, "DEBIAN/postinst"), POSTINST, 0o755)
    deb = os.path.join(work, "kestrel.deb")
    subprocess.run(["dpkg-deb", "--root-owner-group", "-Zxz", "--build",
                    tree, deb], check=True, stdout=subprocess.DEVNULL)
    return deb
