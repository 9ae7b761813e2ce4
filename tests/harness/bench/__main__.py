"""Measures kestrel as a whole process on representative device states,
against a do-nothing program built and linked the same way.

    tools/benchmark [--compare OLD.json] [--out NEW.json] [--rounds N]
                    [--runs N] [--keep-devices]

Builds the bench preset (Release, in build-bench/), strips copies of kestrel
and of the do-nothing program, builds each device state fresh under
build-bench/devices/, and measures each state inside the device sandbox's
reader namespace (nothing on this machine is touched): the median wall time
of interleaved hyperfine rounds, instructions (valgrind callgrind), peak
memory (GNU time), system calls (strace -c); then the in-process benchmarks
(Google Benchmark). Prints the figures and the targets, writes them to
NEW.json (default build-bench/benchmark-<date>.json) and compares them with
OLD.json when given. Speed targets are reported, never enforced: the exit
status is 0 unless the benchmark itself fails.
"""

import argparse
import datetime
import json
import os
import platform
import shutil
import subprocess
import sys

from .. import SOURCE as ROOT
from .. import sandbox
from ..states import bench as devices
from . import report

BUILD = os.path.join(ROOT, "build-bench")


def run(command, **options):
    return subprocess.run(command, cwd=ROOT, check=True, **options)


def build():
    run([os.path.join(ROOT, "tools", "install-deps"), "demo", "bench"])
    run(["cmake", "--preset", "bench"], stdout=subprocess.DEVNULL)
    run(["cmake", "--build", "--preset", "bench"], stdout=subprocess.DEVNULL)
    binaries = {}
    for name in ("kestrel", "do_nothing"):
        built = os.path.join(BUILD, name)
        stripped = built + ".stripped"
        run(["strip", "-o", stripped, built])
        binaries[name] = {
            "path": stripped,
            "size": os.path.getsize(built),
            "stripped_size": os.path.getsize(stripped),
        }
    return binaries


def measure(state, binaries, options):
    config = {
        "kestrel": binaries["kestrel"]["path"],
        "do_nothing": binaries["do_nothing"]["path"],
        "restore": state.restore,
        "var_db": state.var_db,
        "rounds": options.rounds,
        "runs": options.runs,
        "seconds_per_state": 15,
        "output": os.path.join(state.directory, "result.json"),
    }
    config_file = os.path.join(state.directory, "config.json")
    with open(config_file, "w") as out:
        json.dump(config, out)
    env = dict(
        os.environ, PYTHONPATH=os.path.join(ROOT, "tests"), PYTHONDONTWRITEBYTECODE="1"
    )
    sandbox.reader(
        state.device,
        [sys.executable, "-m", "harness.bench.measure", config_file],
        cwd=ROOT,
        check=True,
        env=env,
    )
    with open(config["output"]) as data:
        result = json.load(data)
    outcome = result["outcome"]
    if not state.outcome_matches(
        outcome["before"], outcome["after"], outcome["stderr"]
    ):
        sys.exit(
            f"benchmark: the {state.name} state did not behave as it "
            f"should: {json.dumps(outcome, indent=1)}"
        )
    return result


def microbenchmarks():
    done = run(
        [
            os.path.join(BUILD, "kestrel_microbench"),
            "--benchmark_format=json",
            "--benchmark_min_time=0.2",
        ],
        stdout=subprocess.PIPE,
        stderr=subprocess.DEVNULL,
    )
    figures = {}
    for entry in json.loads(done.stdout)["benchmarks"]:
        scale = {"ns": 1, "us": 1e3, "ms": 1e6, "s": 1e9}[entry["time_unit"]]
        figures[entry["name"]] = {
            "real_time_ns": entry["real_time"] * scale,
            "cpu_time_ns": entry["cpu_time"] * scale,
            "iterations": entry["iterations"],
        }
    return figures


def describe_run():
    commit = run(
        ["git", "rev-parse", "HEAD"], stdout=subprocess.PIPE, text=True
    ).stdout.strip()
    dirty = (
        run(
            ["git", "status", "--porcelain", "--untracked-files=no"],
            stdout=subprocess.PIPE,
            text=True,
        ).stdout.strip()
        != ""
    )
    with open("/proc/loadavg") as load:
        load_average = load.read().split()[:3]
    return {
        "date": datetime.datetime.now().isoformat(timespec="seconds"),
        "commit": commit,
        "dirty": dirty,
        "kernel": platform.release(),
        "cpus": os.cpu_count(),
        "load_average_at_start": load_average,
    }


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--compare", metavar="OLD.json")
    parser.add_argument("--out", metavar="NEW.json")
    parser.add_argument(
        "--rounds", type=int, default=20, help="hyperfine rounds per state (default 20)"
    )
    parser.add_argument(
        "--runs",
        type=int,
        default=15,
        help="runs of each program per round (default 15)",
    )
    parser.add_argument("--keep-devices", action="store_true")
    options = parser.parse_args()

    result = describe_run()
    result["binaries"] = build()
    scratch = os.path.join(BUILD, "devices")
    print("building the device states in", scratch, flush=True)
    states = devices.build_states(scratch)
    result["states"] = {}
    for state in states:
        print("measuring", state.name, flush=True)
        measured = measure(state, result["binaries"], options)
        measured["description"] = state.description
        common = result["states"].get("common_start", {}).get("summary")
        measured["summary"] = report.summarize(measured, common)
        result["states"][state.name] = measured
    result["microbenchmarks"] = microbenchmarks()
    result["targets"] = report.targets(result)
    if not options.keep_devices:
        shutil.rmtree(scratch)

    out = options.out or os.path.join(
        BUILD, f"benchmark-{result['date'].replace(':', '')}.json"
    )
    with open(out, "w") as data:
        json.dump(result, data, indent=1)
    report.print_run(result)
    print(f"\nfigures written to {out}")
    if options.compare:
        with open(options.compare) as data:
            report.print_comparison(json.load(data), result)


if __name__ == "__main__":
    main()
