"""The unit-cost part of a boot-test run: the measurement, its table on
standard output and in DIR/unit-cost/unit-cost.json. Only a variant that
fails to run fails the test; the figures themselves are reported, never
judged."""

import datetime
import os

from . import cost_table, unit_cost
from .run_state import packaged


def run(prepared, deb, work, options, log):
    groups = options.unit_cost
    boots = options.cost_boots or (5 if groups else 3)
    log(f"unit cost: {boots} boots of the common start")
    kestrel = packaged(deb, work).kestrel
    shipped, variants, times, wrong = unit_cost.measure(
        prepared, work, kestrel, boots, groups, log
    )
    found = cost_table.rows(shipped, variants, times)
    cost_table.show(found)
    note = (
        f"{datetime.datetime.now(datetime.timezone.utc):%Y-%m-%d %H:%M} "
        f"UTC, {os.path.basename(deb)}, {boots} boots, QEMU TCG"
    )
    cost_table.write(
        found, wrong, os.path.join(work, "unit-cost", "unit-cost.json"), note
    )
    for text in wrong:
        log(f"unit cost: FAILED: {text}")
    return not wrong
