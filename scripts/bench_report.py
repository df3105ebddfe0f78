"""The pages below docs/benchmarks, from the results."""
from bench_rows import COUNTED, LINEAR, ROWS

UNITS = {"ns": "ns", "p99": "ns", "p999": "ns", "mib": "MiB", "s": "s"}
CALLS = {"p99": ": 99th percentile of a call", "p999": ": 99.9th percentile of a call"}

# What a user would ask first: a row, one of its figures, and the question.
QUESTIONS = (
    ("filtered", "ns", "a debug message that the level filters out"),
    ("message", "ns", "a message, without a date"),
    ("dated", "ns", "a message with date, thread, level and channel"),
    ("threads-4", "ns", "the same by four threads to one file, each message"),
    ("threads-4", "p999", "the slowest of a thousand of those calls"),
    ("start", "ns", "reading a configuration of 25 entries, and the first message"),
    ("load-10000", "ns", "loading 10,000 records, each"),
    ("save-10000", "ns", "saving 10,000 records, each"),
    ("get-10000", "ns", "getting one of 10,000 records"),
    ("put-100", "ns", "storing one record among 100 and saving the file"),
)

SUMMARY = """# Benchmarks

What things cost, on {cores} cores of {cpu}, Linux {kernel}. The *floor* is a minimal program that gets
the same result. Less is faster; the fastest library of each line is bold.

| What | Floor | Korvex | Fastest other library |
|---|---|---|---|
"""

REMARKS = """
## Where Korvex is slower, and why

- **Single records.** Each save rewrites the whole file, because that is the format. A store that appends
  to a log, or changes pages in place, writes less. If you save single records often, see
  [Outgrowing one machine](../outgrowing.md).
- **The text of a date** is made anew for each line, although it changes once a second. A kept text would
  have to notice each change of the time zone, and `tzset` leaves no sign of some. spdlog keeps it, and so
  is up to a tenth faster where one thread logs dates.
- **A filtered message** costs what it costs with glog, to a tenth of a nanosecond, with fewer instructions.
- **Listing a few records among very many** is faster with LMDB, which keeps neighbours in one page. Korvex
  looks up each key where it lies in the file's bytes.
- **`korvex-records`** reads the file from its beginning, so `get` of one record among a million is slower
  than with gdbm and SQLite, which have an index on the disk. `load` holds all records in memory.

The [results](results.md) have every row, every library, instructions, and how the cost grows with the
size. [How it is measured](method.md) says what is compared with what. `./dev bench` measures again.

![Cost per message by layout](layouts.svg)
![Throughput and percentiles by threads](threads.svg)
![Store cost by number of records](store.svg)
"""

METHOD = """# How it is measured

`./dev bench` measures Korvex, a floor and other libraries, and writes [the summary](README.md),
[the results](results.md), `results.json` and the plots. `./dev bench --check` measures again. It fails
if a ratio of Korvex to the floor or to the fastest other library, or of its instructions to those of the
floor, grew by more than a third.

Everything is built with `-O2 -DNDEBUG`. The programs run in turns, {repetitions} times, each time as a new
process. A run of all of them counts only if nobody else used the processors meanwhile. Figures are
medians. Ratios are those of medians, and in parentheses those of minima. `TZ` was {zone}.

## The floor

The floor is what every implementation must do.

- For a message: `gettimeofday`, formatting with `snprintf`, for a date `localtime_r` and `strftime`, then
  one `write` under one mutex to a file opened for appending.
- For a message that is filtered out: a call of a printf-like function that tests the level.
- For the store: a `std::map`, and one read or one write of the whole file.
- For the start: splitting the same lines into a map, and opening the files.
- For the record tool: copying or reading as many bytes.

## The other libraries

They are those of Debian that were installed. Each logging library is set up so that a line is in the
kernel when the call returns, as with Korvex. glog has its own form of line. Stores that work in their
files load into a `std::map` and save from one, in one transaction. No save waits for the disk (SQLite
runs once with `synchronous=OFF` and once with a write-ahead log). The record tool is compared with the
tools of other stores on the same records: `db_load` and `db_dump`, `mdb_load` and `mdb_dump`,
`gdbmtool`, `sqlite3`.
"""


def number(value):
    """Three digits or so."""
    if value >= 100:
        return f"{value:,.0f}"
    return f"{value:.3g}"


def others(result):
    """The names of the other libraries."""
    return [name for name in result if name not in ("floor", "korvex")]


def fastest(result):
    """The other library with the least median; None where there is none."""
    return min(others(result), key=lambda name: result[name]["median"], default=None)


def question_line(row, metric, question, results):
    """One line of the summary; "" where it was not measured."""
    result = results["rows"].get(row, {}).get(metric)
    if result is None:
        return ""
    best = fastest(result)
    korvex = number(result["korvex"]["median"])
    other = f"{best} {number(result[best]['median'])}" if best else ""
    if best and result[best]["median"] < result["korvex"]["median"]:
        other = f"**{other}**"
    else:
        korvex = f"**{korvex}**"
    unit = UNITS[metric]
    return f"| {question} | {number(result['floor']['median'])} {unit} | {korvex} {unit} | {other} |\n"


def summary(results):
    """README.md"""
    lines = (question_line(*question, results) for question in QUESTIONS)
    return SUMMARY.format(**results["machine"]) + "".join(lines) + REMARKS


def row_line(row, metric, result):
    """One line of the table of rows."""
    most, _ = ROWS[row].aims
    title = ROWS[row].title + CALLS.get(metric, "")
    floor, korvex = result["floor"], result["korvex"]
    best = fastest(result)
    cells = [title, f"{number(floor['median'])} {UNITS[metric]}",
             f"{number(korvex['median'])} {UNITS[metric]}",
             f"**{korvex['to_floor']:.2f}** ({korvex['min_to_floor']:.2f})",
             f"{most:.2f}" if most and metric not in CALLS else "",
             f"{best} {result[best]['to_floor']:.2f}" if best else "",
             f"{korvex['to_peer']:.2f}" if best else ""]
    return "| " + " | ".join(cells) + " |"


def library_line(row, metric, result, names):
    """One line of the table of all libraries."""
    title = row if metric not in CALLS else f"{row} {metric}"
    cells = [f"{result[name]['to_floor']:.2f}" if name in result else "" for name in names]
    return f"| {title} | " + " | ".join(cells) + " |"


def library_table(results, table):
    """The ratios of all libraries to the floor."""
    rows = {row: r for row, r in results["rows"].items() if ROWS[row].table == table}
    if not rows:
        return []
    names = list(dict.fromkeys(n for r in rows.values() for by in r.values() for n in by))[1:]
    lines = ["", f"| Time of the floor = 1 | {' | '.join(names)} |", "|---" * (len(names) + 1) + "|"]
    for row, metrics in rows.items():
        lines += [library_line(row, metric, result, names) for metric, result in metrics.items()]
    return lines


def instruction_table(results):
    """Instructions of one call."""
    out = ["", "## Instructions", "",
           "Instructions of one call, without those in the kernel, counted by",
           "`valgrind --tool=callgrind`. They repeat exactly; times do not.", ""]
    counts = results.get("instructions", {})
    names = list(dict.fromkeys(name for by in counts.values() for name in by))
    out += [f"| Call | {' | '.join(names)} |", "|---" * (len(names) + 1) + "|"]
    for row, by in counts.items():
        cells = [number(by[name]) if name in by else "" for name in names]
        out.append(f"| {COUNTED[row][2]} | {' | '.join(cells)} |")
    return out


def slope_table(results):
    """What is linear."""
    out = ["", "## How the cost grows", "",
           "The slope is that of the logarithms over three decades. 1 is linear.", "",
           "| Work, in µs | n = 1,000 | 10,000 | 100,000 | 1,000,000 | Slope |", "|---" * 6 + "|"]
    for what, got in results.get("linear", {}).items():
        cells = [number(ns / 1000) for ns in got["times"].values()]
        out.append(f"| {LINEAR[what]} | {' | '.join(cells)} | {got['slope']:.2f} |")
    return out


def function_table(results):
    """Google Benchmark's figures."""
    out = ["", "## Single functions", "", "By Google Benchmark (`bench/functions.cc`), median.", "",
           "| Function | ns |", "|---|---|"]
    return out + [f"| {name} | {ns} |" for name, ns in results.get("functions", {}).items()]


def details(results):
    """results.md"""
    out = ["# All benchmark results", "",
           "[How it is measured](method.md) explains the floor and the other libraries. Ratios of minima",
           "are in parentheses. *At most* is what Korvex promises itself.", "",
           "| Work | Floor | Korvex | Korvex / floor (minima) | At most | Fastest other library / floor "
           "| Korvex / that library |", "|---|---|---|---|---|---|---|"]
    for row, metrics in results["rows"].items():
        out += [row_line(row, metric, result) for metric, result in metrics.items()]
    out += ["", "## All libraries"]
    for table in ("logging", "store", "tools"):
        out += library_table(results, table)
    out += instruction_table(results) + slope_table(results) + function_table(results)
    return "\n".join(out) + "\n"


def pages(results):
    """Every page by its file's name."""
    return {"README.md": summary(results), "method.md": METHOD.format(**results["machine"]),
            "results.md": details(results)}
