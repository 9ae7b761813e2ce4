"""kestrel's test harness: the device layout, device trees, the device
sandbox, strace traces, the message catalogue and the device states, and the
runners and checks built on them (see README.md)."""

import os

# The source tree the harness belongs to.
SOURCE = os.path.dirname(os.path.dirname(os.path.dirname(os.path.abspath(__file__))))
