"""Measures kestrel and the do-nothing program on one device state.

    tools/device-sandbox --reader DEVICE python3 -m harness.bench.measure CONFIG.json

Runs inside the device sandbox's reader namespace, where the device's var/db
and usr/share are mounted over /var/db and /usr/share, so that kestrel, built
on this machine, reads and changes the device on its fixed paths. The state
is restored before every kestrel run, outside the measured part. Writes its
figures as JSON to the configuration's "output".
"""

import json
import os
import re
import statistics
import subprocess
import sys
import tempfile
import time

from ..states import bench as devices


def restore(config):
    subprocess.run([config["restore"]], check=True)


def outcome(config):
    """One run's standard error, exit and changed entries, for the check
    that the state is what it claims and for comparing runs."""
    restore(config)
    before = devices.snapshot(config["var_db"])
    start = time.perf_counter()
    run = subprocess.run(
        [config["kestrel"]],
        stdin=subprocess.DEVNULL,
        stderr=subprocess.PIPE,
        check=False,
    )
    seconds = time.perf_counter() - start
    after = devices.snapshot(config["var_db"])
    restore(config)
    return {
        "before": before,
        "after": after,
        "exit": run.returncode,
        "stderr": run.stderr.decode("latin-1").splitlines(),
        "rough_seconds": seconds,
    }


def rounds_and_runs(config, rough_seconds):
    """The configured rounds and runs, fewer where one run is slow, so that
    a state costs a bounded time: at least three rounds of two runs."""
    wanted = config["rounds"] * config["runs"]
    affordable = int(config["seconds_per_state"] / max(rough_seconds, 1e-4))
    if affordable >= wanted:
        return config["rounds"], config["runs"]
    rounds = min(config["rounds"], max(3, affordable // 2))
    return rounds, max(2, affordable // rounds)


def wall_times(config, scratch, rounds, runs, warmup):
    """Rounds of hyperfine, the two programs in alternating order, each run
    after a restore. Every round gives a ratio of the two programs' medians,
    measured moments apart, so that slow phases of the shared machine fall
    on both alike; the times are also pooled over the rounds."""
    times = {"kestrel": [], "do_nothing": []}
    round_ratios = []
    for round_number in range(rounds):
        names = ["kestrel", "do_nothing"]
        if round_number % 2:
            names.reverse()
        export = os.path.join(scratch, f"round{round_number}.json")
        command = [
            "hyperfine",
            "-N",
            "--style",
            "none",
            "--warmup",
            str(warmup),
            "--runs",
            str(runs),
            "--export-json",
            export,
            "--prepare",
            config["restore"],
        ]
        # Its advice about outliers would only repeat that the machine is
        # shared; its errors are shown.
        done = subprocess.run(
            command + [config[name] for name in names],
            stdout=subprocess.DEVNULL,
            stderr=subprocess.PIPE,
            check=False,
        )
        if done.returncode != 0:
            sys.exit(done.stderr.decode("latin-1"))
        with open(export) as data:
            results = json.load(data)["results"]
        medians = {}
        for name, result in zip(names, results):
            times[name].extend(result["times"])
            medians[name] = statistics.median(result["times"])
        round_ratios.append(medians["kestrel"] / medians["do_nothing"])
    return times, round_ratios


def instructions(binary, config, repeats):
    """Instructions executed in user space, counted by callgrind."""
    counts = []
    for _ in range(repeats):
        restore(config)
        run = subprocess.run(
            ["valgrind", "--tool=callgrind", "--callgrind-out-file=/dev/null", binary],
            stdin=subprocess.DEVNULL,
            stderr=subprocess.PIPE,
            check=True,
        )
        found = re.search(r"Collected : (\d+)", run.stderr.decode("latin-1"))
        counts.append(int(found.group(1)))
    return counts


def run_quietly(command):
    """A measuring command, its output in its own report file."""
    subprocess.run(
        command, stdin=subprocess.DEVNULL, stderr=subprocess.DEVNULL, check=True
    )


def memory(binary, config, repeats, scratch):
    """Maximum resident set size in KiB and minor page faults, from GNU
    time's %M and %R."""
    report = os.path.join(scratch, "time")
    figures = {"peak_rss_kib": [], "minor_faults": []}
    for _ in range(repeats):
        restore(config)
        run_quietly(["/usr/bin/time", "-f", "%M %R", "-o", report, binary])
        with open(report) as data:
            peak, faults = data.read().split()[-2:]
        figures["peak_rss_kib"].append(int(peak))
        figures["minor_faults"].append(int(faults))
    return figures


def system_calls(binary, config, scratch):
    """strace -c's table of the program's own calls, from its execve on."""
    report = os.path.join(scratch, "strace")
    restore(config)
    run_quietly(["strace", "-f", "-c", "-o", report, binary])
    by_name, total, errors = {}, 0, 0
    with open(report) as data:
        for line in data:
            fields = line.split()
            if len(fields) < 5 or not fields[0][0].isdigit():
                continue
            calls = int(fields[3])
            failed = int(fields[4]) if len(fields) == 6 else 0
            if fields[-1] == "total":
                total, errors = calls, failed
            else:
                by_name[fields[-1]] = {"calls": calls, "errors": failed}
    return {"total": total, "errors": errors, "by_name": by_name}


def main():
    # The measured programs get the environment the benchmark was started
    # with: every variable costs kestrel's start instructions.
    for name in ("PYTHONPATH", "PYTHONDONTWRITEBYTECODE"):
        os.environ.pop(name, None)
    with open(sys.argv[1]) as data:
        config = json.load(data)
    with tempfile.TemporaryDirectory(prefix="kestrel-measure.") as scratch:
        result = {"outcome": outcome(config)}
        rough = result["outcome"]["rough_seconds"]
        rounds, runs = rounds_and_runs(config, rough)
        times, round_ratios = wall_times(
            config, scratch, rounds, runs, 2 if rough < 0.02 else 1
        )
        result["wall_seconds"] = {
            name: {
                "median": statistics.median(values),
                "runs": len(values),
                "min": min(values),
                "max": max(values),
            }
            for name, values in times.items()
        }
        result["wall_round_ratios"] = round_ratios
        result["wall_plan"] = {"rounds": rounds, "runs_per_round": runs}
        result["instructions"] = {
            "kestrel": instructions(config["kestrel"], config, 3),
            "do_nothing": instructions(config["do_nothing"], config, 1),
        }
        memories = {
            name: memory(config[name], config, 3, scratch)
            for name in ("kestrel", "do_nothing")
        }
        for figure in ("peak_rss_kib", "minor_faults"):
            result[figure] = {name: memories[name][figure] for name in memories}
        result["system_calls"] = {
            name: system_calls(config[name], config, scratch)
            for name in ("kestrel", "do_nothing")
        }
        restore(config)
    with open(config["output"], "w") as out:
        json.dump(result, out, indent=1)


if __name__ == "__main__":
    main()
