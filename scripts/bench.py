#!/usr/bin/env python3
"""Measures Korvex beside its floors and its peers, interleaved; ./dev bench builds and runs it.

Writes docs/benchmarks. With --rows only prints the rows named; with --check compares with what
docs/benchmarks/results.json says, writes nothing, and fails when a ratio grew by more than a third.
"""
import argparse
import json
import math
import os
import pathlib
import platform
import re
import shutil
import statistics
import subprocess
import sys

import bench_plots
import bench_quiet
import bench_report
from bench_rows import BIN, COUNTED, LINEAR, OUT, ROOT, ROWS, contestants, start_configuration

UNSUPPORTED = 3  # exit status of a contestant that cannot do a row
GROWN = 4 / 3
SHM = pathlib.Path("/dev/shm")
PARTIAL = BIN.parent / "rows.json"  # what a run of all rows has measured so far
work = BIN.parent / "work"


def say(text):
    """Progress, where somebody looks."""
    if sys.stderr.isatty():
        print(f"\r{text:60}", end="", file=sys.stderr, flush=True)


def run(table, name, row, calls, tool=()):
    """One run of a contestant: its output, or None where it cannot do the row."""
    # ext4 waits for the disk when a file was rewritten in place, floors' and Korvex's alike, and
    # that hides all else: such rows are measured in memory.
    in_memory = row.startswith("put-") and SHM.is_dir()
    where = (SHM / f"korvex-bench-{os.getpid()}" if in_memory else work) / f"{table}-{name}"
    if table == "logging":
        shutil.rmtree(where, ignore_errors=True)
    where.mkdir(parents=True, exist_ok=True)
    if row == "start":
        (where / "start.cfg").write_text(start_configuration())
    done = subprocess.run([*tool, BIN / f"bench-{table}-{name}", row, str(calls)], cwd=where,
                          capture_output=True, text=True, check=False)
    if in_memory:
        shutil.rmtree(where.parent)
    if done.returncode == UNSUPPORTED:
        return None
    if done.returncode != 0:
        sys.exit(f"bench: {name} failed in {row}, status {done.returncode}: {done.stderr}")
    return done


def figures_of(output):
    """The figures that a contestant printed, by name."""
    return {k: float(v) for k, v in (line.split("=") for line in output.stdout.split())}


def measure(row, repeat):
    """Medians, minima and ratios of every figure of every contestant, run in turns."""
    values = {}
    able = contestants(ROWS[row].table)
    for turn in range(repeat):
        for name in list(able):
            say(f"{row} {turn + 1}/{repeat} {name}")
            output = bench_quiet.alone(lambda name=name: run(ROWS[row].table, name, row,
                                                             ROWS[row].calls))
            if output is None:
                able.remove(name)
                continue
            for metric, value in figures_of(output).items():
                values.setdefault(metric, {}).setdefault(name, []).append(value)
    say("")
    return {metric: summary(by_name) for metric, by_name in values.items()}


def summary(by_name):
    """Medians and minima with their ratios to the floor's, and Korvex's to the best peer's."""
    result = {name: {"median": statistics.median(v)} for name, v in by_name.items()}
    for name, figures in result.items():
        figures["to_floor"] = round(figures["median"] / result["floor"]["median"], 3)
        figures["min_to_floor"] = round(min(by_name[name]) / min(by_name["floor"]), 3)
    best = best_peer(result)
    if best:
        korvex = result["korvex"]
        korvex["to_peer"] = round(korvex["median"] / result[best]["median"], 3)
    return result


def best_peer(result):
    """The peer with the least median, if there is any."""
    peers = [name for name in result if name not in ("floor", "korvex")]
    return min(peers, key=lambda name: result[name]["median"], default=None)


def show(row, metric, result):
    """One line on the terminal: medians, their ratios to the floor, those of the minima."""
    texts = [f"{name} {f['median']:.4g} {f['to_floor']:.2f} ({f['min_to_floor']:.2f})"
             for name, f in result.items()]
    print(f"{row:17} {metric:4} " + "  ".join(texts), flush=True)


def instructions(row):
    """Instructions of one call, by contestant, as callgrind counts them."""
    calls, program_row, _ = COUNTED[row]
    tool = ("valgrind", "--tool=callgrind", "--collect-atstart=no",
            "--callgrind-out-file=/dev/null")
    table = ROWS[row].table
    counts = {}
    for name in contestants(table):
        say(f"counting {row} {name}")
        if run(table, name, program_row, 1) is None:  # makes its store
            continue
        output = run(table, name, program_row, calls, tool)
        # A child that made the store has told its own count before.
        counts[name] = round(int(re.findall(r"Collected : (\d+)", output.stderr)[-1]) / calls, 1)
    say("")
    return counts


def linear(what):
    """Nanoseconds by n, and the slope of their logarithms: 1 is linear."""
    say(f"slope of {what}")
    times = figures_of(run("linear", "korvex", what, 0))
    points = [(math.log(float(n)), math.log(ns)) for n, ns in times.items()]
    slope = statistics.linear_regression(*zip(*points)).slope
    return {"times": times, "slope": round(slope, 3)}


def functions():
    """CPU nanoseconds of single functions, by Google Benchmark."""
    say("single functions")
    program = BIN / "bench-functions"
    if not program.exists():
        return {}
    arguments = ["--benchmark_format=json", "--benchmark_repetitions=7",
                 "--benchmark_min_time=0.05", "--benchmark_report_aggregates_only=true"]
    output = subprocess.run([program, *arguments], capture_output=True, text=True, check=True)
    return {one["run_name"]: round(one["cpu_time"], 1)
            for one in json.loads(output.stdout)["benchmarks"]
            if one["aggregate_name"] == "median"}


def machine(repeat):
    """What the figures were measured on."""
    model = re.search(r"model name\s*: (.*)", pathlib.Path("/proc/cpuinfo").read_text())
    return {"cpu": model[1] if model else platform.machine(), "cores": os.cpu_count(),
            "kernel": platform.release(), "repetitions": repeat,
            "zone": os.environ.get("TZ", "unset")}


def grown(row, metric, result, known):
    """What grew by more than a third beyond the checked-in ratios, as texts."""
    before = known["rows"].get(row, {}).get(metric, {}).get("korvex", {})
    now = result["korvex"]
    return [f"{row} {metric} {ratio}: {now[ratio]} after {before[ratio]}"
            for ratio in ("to_floor", "to_peer")
            if ratio in before and ratio in now and now[ratio] > GROWN * before[ratio]]


def check_row(row, repeat, known):
    """The complaints about a row; one that grew is measured once more, since machines are noisy."""
    for _ in range(2):
        complaints = []
        for metric, result in measure(row, repeat).items():
            show(row, metric, result)
            complaints += grown(row, metric, result, known)
        if not complaints:
            break
    return complaints


def prove(rows, known):
    """Stops unless each row that is checked would be noticed if it grew by more than a third."""
    for row in rows:
        for metric, result in known["rows"].get(row, {"ns": None}).items():
            if result is None:
                sys.exit(f"bench: results.json has no {row}; measure all rows again")
            korvex = result["korvex"]
            for factor, complains in ((1.32, False), (1.35, True)):
                slower = dict(korvex, **{ratio: korvex[ratio] * factor
                                         for ratio in ("to_floor", "to_peer") if ratio in korvex})
                if bool(grown(row, metric, {"korvex": slower}, known)) != complains:
                    sys.exit(f"bench: {row} {metric}, {factor} times as slow, is judged wrongly")


def check(rows, repeat):
    """Exit status: 1 when a ratio grew."""
    known = json.loads((OUT / "results.json").read_text())
    prove(rows, known)
    complaints = [text for row in rows for text in check_row(row, repeat, known)]
    for row in (row for row in COUNTED if row in rows and shutil.which("valgrind")):
        before, now = known["instructions"].get(row, {}), instructions(row)
        if before and now["korvex"] / now["floor"] > GROWN * before["korvex"] / before["floor"]:
            complaints.append(f"{row} instructions: {now} after {before}")
    for text in complaints:
        print(f"bench: grown by more than a third: {text}")
    return 1 if complaints else 0


def write(results):
    """Everything below docs/benchmarks."""
    OUT.mkdir(parents=True, exist_ok=True)
    (OUT / "results.json").write_text(json.dumps(results, indent=1) + "\n")
    for name, text in {**bench_report.pages(results), **bench_plots.plots(results)}.items():
        (OUT / name).write_text(text)


def main():
    global work
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("--check", action="store_true", help="compare with the checked-in ratios")
    parser.add_argument("--rows", default="", help="only these, by comma; a prefix names several")
    parser.add_argument("--repeat", type=int, default=7)
    parser.add_argument("--count", action="store_true", help="with --rows: count instructions too")
    parser.add_argument("--dir", type=pathlib.Path, default=work, help="where the files are written")
    parser.add_argument("--redraw", action="store_true", help="only the page and the plots")
    parser.add_argument("--resume", action="store_true", help="keep the rows of a run that stopped")
    parser.add_argument("--busy", action="store_true", help="measure whoever else is at work")
    options = parser.parse_args()
    bench_quiet.enforced = not options.busy
    work = options.dir.resolve()
    if options.redraw:
        return write(json.loads((OUT / "results.json").read_text()))
    wanted = tuple(options.rows.split(","))
    rows = [row for row in ROWS if row.startswith(wanted)]
    if options.check:
        return check(rows, options.repeat)
    results = {"machine": machine(options.repeat), "rows": {}}
    if options.resume:
        results["rows"] = json.loads(PARTIAL.read_text())
    for row in rows:
        if row not in results["rows"]:
            results["rows"][row] = measure(row, options.repeat)
            for metric, result in results["rows"][row].items():
                show(row, metric, result)
            if not options.rows:
                PARTIAL.write_text(json.dumps(results["rows"]))
    if options.count or not options.rows:
        counted = [row for row in COUNTED if row.startswith(wanted) and shutil.which("valgrind")]
        results["instructions"] = {row: instructions(row) for row in counted}
        for row, counts in results["instructions"].items():
            print(f"{row:17} instructions {counts}")
    if not options.rows:
        results["linear"] = {what: linear(what) for what in LINEAR}
        results["functions"] = functions()
        write(results)
    return 0


if __name__ == "__main__":
    sys.exit(main())
