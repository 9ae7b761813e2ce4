"""Every device state that the harness runs kestrel on, one module a use:

- states.faults: the representative states of the fault matrix and the
  crash points, trees of the scenarios whose "before:" tree is that state;
- states.data_commands: the states on which the same two tools run
  kestrel-data stage and clean;
- states.boot: var/db laid out over a booted system's real system
  partition, with what the booted system must show;
- states.bench: the sample device shaped for measuring.

Devices are laid out with the builders of harness.device.
"""


def select(states, names):
    """The (name, value) pairs of states named, all of them when names is
    empty."""
    if not names:
        return list(states)
    known = dict(states)
    unknown = [name for name in names if name not in known]
    if unknown:
        raise SystemExit("unknown states: " + ", ".join(unknown))
    return [(name, known[name]) for name in names]
