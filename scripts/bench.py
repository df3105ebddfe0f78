#!/usr/bin/env python3
"""Measures Korvex beside its floors and its peers, interleaved; see docs/benchmarks/README.md.

Build with the preset 'bench' first, or let ./dev bench do both.
"""
import argparse
import json
import os
import pathlib
import shutil
import statistics
import subprocess
import sys

ROOT = pathlib.Path(__file__).resolve().parent.parent
BIN = ROOT / "build/bench/bin"
WORK = ROOT / "build/bench/work"
OUT = ROOT / "docs/benchmarks"
UNSUPPORTED = 3

# Row: table, argument N of the contestant (calls, or child processes), what it measures.
ROWS = {
    "filtered": ("logging", 20_000_000, "filtered-out debug call, two arguments"),
    "message": ("logging", 200_000, "`%m%n` to a file"),
    "dated": ("logging", 200_000, "`%d{ISO8601} [%t] %-5p %c: %m%n` to a file"),
    "null": ("logging", 400_000, "the same to /dev/null"),
    "rotation": ("logging", 200_000, "the same, rotation at 1 MiB, 5 backups"),
    "threads-2": ("logging", 200_000, "the same, 2 threads, one file"),
    "threads-4": ("logging", 200_000, "the same, 4 threads, one file"),
    "start": ("logging", 100, "main to first message, 20 categories, 5 appenders"),
}
for n, loads, saves in ((100, 200, 100), (10_000, 10, 10), (1_000_000, 1, 1)):
    ROWS[f"load-{n}"] = ("store", loads, f"load {n:,} records, per record")
    ROWS[f"save-{n}"] = ("store", saves, f"save {n:,} records, per record")
    ROWS[f"get-{n}"] = ("store", 500_000, f"get a random key among {n:,}, copied")
for n in (100, 10_000, 1_000_000):
    ROWS[f"enumerate-{n}"] = ("store", 100_000, f"enumerate a prefix with 10 matches in {n:,}")
for n, puts in ((100, 2000), (10_000, 40)):
    ROWS[f"put-{n}"] = ("store", puts, f"put and save one record among {n:,}")
ROWS["memory-1000000"] = ("store", 1, "peak memory, 1,000,000 records loaded")

UNITS = {"ns": "ns", "p99": "ns", "mib": "MiB"}


def contestants(table):
    """Names of the built contestants, the floor and Korvex first."""
    names = [p.name.split("-", 2)[2] for p in BIN.glob(f"bench-{table}-*")]
    return sorted(names, key=lambda n: (n != "floor", n != "korvex", n))


def start_configuration():
    """A properties file that Korvex and log4cpp read alike."""
    lines = ["log4cpp.rootCategory=INFO, A0"]
    for i in range(20):
        lines.append(f"log4cpp.category.part{i}={('DEBUG', 'INFO', 'WARN')[i % 3]}, A{i % 5}")
    for i in range(5):
        lines += [
            f"log4cpp.appender.A{i}=FileAppender",
            f"log4cpp.appender.A{i}.fileName=start-{i}.log",
            f"log4cpp.appender.A{i}.layout=PatternLayout",
            f"log4cpp.appender.A{i}.layout.ConversionPattern=%d [%t] %p %c: %m%n",
        ]
    return "\n".join(lines) + "\n"


def run(table, name, row, calls):
    """One run: its figures by name, or None where the contestant cannot do the row."""
    where = WORK / f"{table}-{name}"
    if table == "logging":
        shutil.rmtree(where, ignore_errors=True)
    where.mkdir(parents=True, exist_ok=True)
    if row == "start":
        (where / "start.cfg").write_text(start_configuration())
    done = subprocess.run([BIN / f"bench-{table}-{name}", row, str(calls)], cwd=where,
                          stdout=subprocess.PIPE, text=True, check=False)
    if done.returncode == UNSUPPORTED:
        return None
    if done.returncode != 0:
        sys.exit(f"bench: {name} failed in {row} with status {done.returncode}")
    return {k: float(v) for k, v in (line.split("=") for line in done.stdout.split())}


def measure(row, repeat):
    """Median and minimum of every figure of every contestant, run in turns."""
    table, calls, _ = ROWS[row]
    figures = {}
    able = contestants(table)
    for turn in range(repeat):
        for name in list(able):
            got = run(table, name, row, calls)
            if got is None:
                able.remove(name)
                continue
            for metric, value in got.items():
                figures.setdefault(metric, {}).setdefault(name, []).append(value)
        print(f"\r{row} {turn + 1}/{repeat} ", end="", file=sys.stderr, flush=True)
    print("\r", end="", file=sys.stderr)
    return {metric: summary(by_name) for metric, by_name in figures.items()}


def summary(by_name):
    """Medians and minima, and their ratios to the floor's."""
    result = {}
    for name, values in by_name.items():
        result[name] = {"median": statistics.median(values), "min": min(values)}
    floor = result["floor"]
    for figures in result.values():
        figures["to_floor"] = round(figures["median"] / floor["median"], 3)
        figures["min_to_floor"] = round(figures["min"] / floor["min"], 3)
    return result


def show(row, metric, result):
    """One line on the terminal: medians, ratios of medians (of minima)."""
    texts = []
    for name, f in result.items():
        texts.append(f"{name} {f['median']:.4g} {f['to_floor']:.2f} ({f['min_to_floor']:.2f})")
    print(f"{row:16} {metric:4} " + "  ".join(texts), flush=True)


def main():
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("--rows", default="", help="only these, by comma; a prefix stands for all")
    parser.add_argument("--repeat", type=int, default=7)
    options = parser.parse_args()
    wanted = [r for r in ROWS if not options.rows or r.startswith(tuple(options.rows.split(",")))]
    results = {}
    for row in wanted:
        results[row] = measure(row, options.repeat)
        for metric, result in results[row].items():
            show(row, metric, result)


if __name__ == "__main__":
    main()
