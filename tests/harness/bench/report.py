"""The benchmark's report: figures per state, targets, and the comparison
with an earlier run's JSON file."""

import statistics

MIB = 1024 * 1024

# What kestrel should cost, on the common start above all. Wall time on a
# shared machine is noisy; the instruction count is repeatable.
TARGETS = (
    ("common start: wall time / do-nothing's", "common_start", "wall_ratio", 1.10),
    ("common start: instructions", "common_start", "instructions", 100000),
    ("stripped binary: bytes", None, "stripped_size", MIB),
    (
        "many ICU entries: instructions / common start's",
        "many_icu_entries",
        "instructions_vs_common",
        1.5,
    ),
    (
        "many ICU entries: wall time / common start's",
        "many_icu_entries",
        "wall_vs_common",
        1.5,
    ),
)


def summarize(result, common=None):
    """The headline figures of one state's measurements."""
    wall = result["wall_seconds"]
    summary = {
        "kestrel_wall_us": wall["kestrel"]["median"] * 1e6,
        "do_nothing_wall_us": wall["do_nothing"]["median"] * 1e6,
        # The median of the rounds' ratios, each from the two programs run
        # moments apart, not the ratio of the pooled medians.
        "wall_ratio": statistics.median(result["wall_round_ratios"]),
        # The fastest runs, less disturbed by the machine's other work.
        "wall_ratio_of_minima": (wall["kestrel"]["min"] / wall["do_nothing"]["min"]),
        "instructions": int(statistics.median(result["instructions"]["kestrel"])),
        "do_nothing_instructions": result["instructions"]["do_nothing"][0],
        "peak_rss_kib": int(statistics.median(result["peak_rss_kib"]["kestrel"])),
        "do_nothing_peak_rss_kib": int(
            statistics.median(result["peak_rss_kib"]["do_nothing"])
        ),
        "minor_faults": int(
            statistics.median(result.get("minor_faults", {}).get("kestrel", [0]))
        ),
        "do_nothing_minor_faults": int(
            statistics.median(result.get("minor_faults", {}).get("do_nothing", [0]))
        ),
        "system_calls": result["system_calls"]["kestrel"]["total"],
        "do_nothing_system_calls": result["system_calls"]["do_nothing"]["total"],
    }
    if common is not None:
        summary["instructions_vs_common"] = (
            summary["instructions"] / common["instructions"]
        )
        # Each state's time against its own interleaved do-nothing runs,
        # so that the machine's load while each state was measured cancels.
        summary["wall_vs_common"] = summary["wall_ratio"] / common["wall_ratio"]
    return summary


def targets(run):
    verdicts = []
    for label, state, figure_name, limit in TARGETS:
        if state is None:
            figure = run["binaries"]["kestrel"][figure_name]
        else:
            figure = run["states"][state]["summary"][figure_name]
        verdicts.append(
            {
                "target": label,
                "at_most": limit,
                "figure": figure,
                "met": figure <= limit,
            }
        )
    return verdicts


def number(value):
    if isinstance(value, float):
        return f"{value:.3f}" if value < 100 else f"{value:,.0f}"
    return f"{value:,}"


def print_run(run):
    binaries = run["binaries"]
    print(
        f"\nkestrel: {binaries['kestrel']['size']:,} bytes, "
        f"{binaries['kestrel']['stripped_size']:,} stripped; "
        f"do-nothing: {binaries['do_nothing']['stripped_size']:,} stripped"
    )
    header = (
        "state",
        "kestrel us",
        "nothing us",
        "ratio",
        "min ratio",
        "instructions",
        "nothing instr",
        "peak KiB",
        "faults",
        "syscalls",
        "nothing sysc",
    )
    line = "{:<20}{:>11}{:>11}{:>9}{:>10}{:>14}{:>14}{:>10}{:>8}{:>10}" "{:>13}"
    print("\n" + line.format(*header))
    for name, state in run["states"].items():
        s = state["summary"]
        print(
            line.format(
                name,
                f"{s['kestrel_wall_us']:,.0f}",
                f"{s['do_nothing_wall_us']:,.0f}",
                f"{s['wall_ratio']:.2f}",
                f"{s['wall_ratio_of_minima']:.2f}",
                f"{s['instructions']:,}",
                f"{s['do_nothing_instructions']:,}",
                f"{s['peak_rss_kib']:,}",
                f"{s['minor_faults']:,}",
                f"{s['system_calls']:,}",
                f"{s['do_nothing_system_calls']:,}",
            )
        )
    print(
        "\n(us: median wall time; ratio: median of the interleaved rounds'"
        " ratios; min ratio: fastest run / fastest run; faults: minor page"
        " faults)"
    )
    for name, state in run["states"].items():
        print(f"  {name}: {state['description']}")
    print("\nin-process (Google Benchmark, ns per call):")
    for name, figures in run["microbenchmarks"].items():
        print(f"  {name:<32}{figures['real_time_ns']:>12.1f}")
    print("\ntargets:")
    for verdict in run["targets"]:
        print(
            f"  {verdict['target']:<50} at most {number(verdict['at_most']):>10}"
            f"  figure {number(verdict['figure']):>12}  "
            f"{'met' if verdict['met'] else 'MISSED'}"
        )


COMPARED = (
    "kestrel_wall_us",
    "wall_ratio",
    "wall_ratio_of_minima",
    "instructions",
    "peak_rss_kib",
    "minor_faults",
    "system_calls",
)


def print_comparison(old, new):
    print(
        f"\ncompared with {old.get('commit', '?')[:12]} "
        f"({old.get('date', '?')}): old -> new (new / old)"
    )
    old_size = old["binaries"]["kestrel"]["stripped_size"]
    new_size = new["binaries"]["kestrel"]["stripped_size"]
    print(
        f"  stripped binary: {old_size:,} -> {new_size:,} "
        f"({new_size / old_size:.3f})"
    )
    for name, state in new["states"].items():
        if name not in old["states"]:
            continue
        before = old["states"][name]
        for figure in COMPARED:
            a, b = before["summary"][figure], state["summary"][figure]
            print(
                f"  {name:<20} {figure:<16} {number(a):>12} -> "
                f"{number(b):>12} ({b / a if a else float('nan'):.3f})"
            )
        if outcome_text(before["outcome"]) != outcome_text(state["outcome"]):
            print(
                f"  {name:<20} OUTCOME CHANGED: standard error or links "
                "differ from the earlier run"
            )
    for name, figures in new["microbenchmarks"].items():
        if name in old.get("microbenchmarks", {}):
            a = old["microbenchmarks"][name]["real_time_ns"]
            b = figures["real_time_ns"]
            print(
                f"  in-process {name:<26} {a:>12.1f} -> {b:>12.1f} ns " f"({b / a:.3f})"
            )


def outcome_text(outcome):
    # The errno text at the end of a warning line may be stale; the rest
    # of the line and the entries after the run are the behaviour.
    lines = [line.rsplit(": ", 1)[0] for line in outcome["stderr"]]
    return lines, outcome["after"], outcome["exit"]
