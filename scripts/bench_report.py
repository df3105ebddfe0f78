"""The page docs/benchmarks/README.md, from the results."""
from bench_rows import COUNTED, LINEAR, ROWS

UNITS = {"ns": "ns", "p99": "ns", "mib": "MiB"}

INTRODUCTION = """# Benchmarks

`./dev bench` measures Korvex beside its floors and its peers and writes this page, `results.json` and
the plots. `./dev bench --check` measures again and fails when a ratio of Korvex to its floor or to the
best peer, or of its instructions to the floor's, grew by more than a third.

Everything is built with `-O2 -DNDEBUG`. The contestants run in turns, {repetitions} times, each time as a new
process; figures are medians, and ratios are those of medians, with those of minima in parentheses.
Measured on {cores} cores of {cpu}, Linux {kernel}, `TZ` {zone}.

A **floor** is what anyone must do: for a message, `gettimeofday`, formatting with `snprintf`, for a date
`localtime_r` and `strftime`, then one `write` under one mutex to a file opened for appending; for a
filtered call, an out-of-line printf-like function that tests the level; for the store, `std::map`, one
read and one write of the whole file; for the start, splitting the same lines into a map and opening the
files. **Peers** are those of Debian that were installed. Every logging peer is set up to have each line
in the kernel when the call returns, as Korvex has; glog has a form of line of its own. Stores that work
in their files load into a `std::map` and save from one, in one transaction; saving waits for no disk
(SQLite once with `synchronous=OFF`, once with a write-ahead log). For the record tool the floor copies
or reads as many bytes, and the peers are the tools of other stores on the same records: `db_load` and
`db_dump`, `mdb_load` and `mdb_dump`, `gdbmtool`, `sqlite3`.
"""

REMARKS = """
## What stands in the way

- **Load 100 records.** A new process has as many page faults here as the floor has, and no more system
  calls but one. Of the third that it takes longer, a fourth is the store's lock: it is taken for each
  record, as others may put while a file is read. The rest is four reads from the stream for each record,
  where the floor counts in its buffer. Tried, for 3 % at the most: reading the lengths byte by byte,
  unlocked reads, a buffer of 16 KiB, `malloc` for `calloc`, other ways of inserting.
- **4 threads on two cores.** Threads that sleep cost the slowest calls, threads that look while others
  work cost throughput. Without looking it is 0.85 of the floor, with a 99th percentile like the floor's;
  looking for up to 150 turns makes it 0.9 to 1.0, with less than half of that percentile; pthread's own
  adaptive lock made it 1.03, with four times of it. The rest is the file's own lock in the kernel.
- **The text of a date** is made anew for each line, though it changes once a second: keeping it would
  have to see every change of the time zone, and `tzset` leaves no sign of some.
- **Single records** cost a rewrite of the file, because that is the format; a store with a log does less.
  Setting the umask each time, as each save does, is the last hundredth.
"""


def number(value):
    """Three digits or so."""
    if value >= 100:
        return f"{value:,.0f}"
    return f"{value:.3g}"


def ratio(value, aim=None):
    """A ratio, and what it is to be at most."""
    return f"{value:.2f}" + (f" (at most {aim:.2f})" if aim else "")


def line(row, metric, result):
    """One line of the table of rows."""
    floors, peers = ROWS[row].aims
    title = ROWS[row].title
    if metric == "p99":
        title, floors, peers = title + ": 99th percentile of a call", None, 1.0
    floor, korvex = result["floor"], result["korvex"]
    others = [name for name in result if name not in ("floor", "korvex")]
    best = min(others, key=lambda name: result[name]["median"], default=None)
    cells = [title, f"{number(floor['median'])} {UNITS[metric]}",
             f"{number(korvex['median'])} {UNITS[metric]}",
             f"**{korvex['to_floor']:.2f}** ({korvex['min_to_floor']:.2f})",
             f"{floors:.2f}" if floors else "",
             f"{best} {result[best]['to_floor']:.2f}" if best else "",
             ratio(korvex["to_peer"], peers) if best else ""]
    return "| " + " | ".join(cells) + " |"


def others_line(row, metric, result, names):
    """One line of the table of everybody, in floors."""
    named_by_it = metric == "ns" or row.startswith("memory")
    title = row + ("" if named_by_it else f" {metric}")
    cells = [f"{result[name]['to_floor']:.2f}" if name in result else "" for name in names]
    return f"| {title} | " + " | ".join(cells) + " |"


def everybody(results, table):
    """The ratios of all contestants of a table."""
    rows = {row: r for row, r in results["rows"].items() if ROWS[row].table == table}
    if not rows:
        return []
    names = list(dict.fromkeys(n for r in rows.values() for by in r.values() for n in by))[1:]
    lines = ["", f"| in floors | {' | '.join(names)} |", "|---" * (len(names) + 1) + "|"]
    for row, metrics in rows.items():
        lines += [others_line(row, metric, result, names) for metric, result in metrics.items()]
    return lines


def page(results):
    """The whole page."""
    out = [INTRODUCTION.format(**results["machine"]),
           "| Work | Floor | Korvex | In floors (minima) | At most | Best peer, in floors | Of that peer |",
           "|---|---|---|---|---|---|---|"]
    for row, metrics in results["rows"].items():
        out += [line(row, metric, result) for metric, result in metrics.items()]
    out += [REMARKS, "![Cost per message by layout](layouts.svg)",
            "![Throughput and 99th percentile by threads](threads.svg)",
            "![Store cost by number of records](store.svg)",
            "", "## Everybody"]
    for table in ("logging", "store", "tools"):
        out += everybody(results, table)
    out += instruction_table(results) + slope_table(results) + function_table(results)
    return "\n".join(out) + "\n"


def instruction_table(results):
    """Instructions of one call."""
    out = ["", "## Instructions", "",
           "Of one call, by `valgrind --tool=callgrind`; they repeat where times do not. What the",
           "kernel does is not in them.", ""]
    counts = results.get("instructions", {})
    names = list(dict.fromkeys(name for by in counts.values() for name in by))
    out += [f"| Call | {' | '.join(names)} |", "|---" * (len(names) + 1) + "|"]
    for row, by in counts.items():
        cells = [number(by[name]) if name in by else "" for name in names]
        out.append(f"| {COUNTED[row][2]} | {' | '.join(cells)} |")
    return out


def slope_table(results):
    """What is linear."""
    out = ["", "## Linear", "",
           "The slope is that of the logarithms over three decades: 1 is linear.", "",
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
