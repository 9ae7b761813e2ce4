"""The unit-cost table: each variant's median activating-to-active time and
processor time, its ratio to the plain unit's with kestrel (the unit costs
nothing) and to the same unit's with the do-nothing program (kestrel costs
nothing), and its systemd-analyze security exposure."""

import json
import statistics

from . import unit_variants


def median(values):
    return statistics.median(values) if values else float("nan")


def rows(shipped, variants, times):
    """One row per variant; TIMES holds (wall ms, processor ms) per boot."""
    by_name = {(one.name, one.label): one for one in variants}
    plain = times[by_name[("plain", "kestrel")].id]
    found = []
    for one in variants:
        own = times[one.id]
        wall = [ms for ms, _ in own]
        nothing = by_name.get((one.name, "do-nothing"))
        found.append(
            {
                "unit": one.name,
                "program": one.label,
                "boots": len(own),
                "wall_ms": wall,
                "cpu_ms": [ms for _, ms in own],
                "median_ms": median(wall),
                "median_cpu_ms": median([ms for _, ms in own]),
                "to_plain_kestrel": median(wall) / median([m for m, _ in plain]),
                "to_do_nothing": (
                    median(wall) / median([m for m, _ in times[nothing.id]])
                    if nothing and one.label == "kestrel"
                    else None
                ),
                "exposure": unit_variants.exposure(shipped, one),
                "directives": one.service,
                "dropin": one.dropin,
            }
        )
    return found


def show(found):
    print(
        f"\n{'unit':28} {'program':10} {'boots':>5} {'median':>9} "
        f"{'range':>17} {'cpu':>7} {'/plain':>7} {'/nothing':>8}  exposure"
    )
    for row in found:
        versus = (
            f"{row['to_do_nothing']:8.2f}"
            if row["to_do_nothing"] is not None
            else f"{'':8}"
        )
        print(
            f"{row['unit']:28} {row['program']:10} {row['boots']:5} "
            f"{row['median_ms']:7.0f}ms "
            f"{min(row['wall_ms'], default=0):7.0f}-"
            f"{max(row['wall_ms'], default=0):7.0f}ms "
            f"{row['median_cpu_ms']:5.0f}ms "
            f"{row['to_plain_kestrel']:7.2f} {versus}  {row['exposure']}"
        )
    shipped = next(
        row for row in found if row["unit"] == "shipped" and row["program"] == "kestrel"
    )
    print(
        f"\nkestrel.service as shipped, with kestrel: "
        f"{shipped['to_plain_kestrel']:.2f} times the plain unit's time "
        f"with kestrel (target at most 2), "
        f"{shipped['to_do_nothing']:.2f} times its own time with the "
        f"do-nothing program; exposure {shipped['exposure']}"
    )


def write(found, wrong, path, note):
    with open(path, "w") as out:
        json.dump({"note": note, "variants": found, "failed": wrong}, out, indent=1)
