"""What is measured, and where: the rows of the benchmarks' table."""
import os
import pathlib

ROOT = pathlib.Path(__file__).resolve().parent.parent
BIN = pathlib.Path(os.environ.get("KORVEX_BUILD_DIR", ROOT / "build")) / "bench/bin"
OUT = ROOT / "docs/benchmarks"


class Row:
    """A row: its table, the argument N (calls, or child processes), a title, and what it is to
    reach: at most so many floors, at most so much of the best peer (None: nothing promised)."""

    def __init__(self, table, calls, title, floors=None, peers=None):
        self.table, self.calls, self.title = table, calls, title
        self.aims = (floors, peers)


ROWS = {
    "filtered": Row("logging", 20_000_000, "filtered-out debug call, two arguments", 1.15),
    "message": Row("logging", 200_000, "`%m%n` to a file", 1.10, 0.85),
    "dated": Row("logging", 200_000, "`%d{ISO8601} [%t] %-5p %c: %m%n` to a file", 0.85, 0.90),
    "null": Row("logging", 400_000, "the same to /dev/null", 0.85),
    "rotation": Row("logging", 200_000, "the same, rotation at 1 MiB, 5 backups", 0.80),
    "threads-1": Row("logging", 200_000, "the same, 1 thread of its own"),
    "threads-2": Row("logging", 200_000, "the same, 2 threads, one file", 0.75),
    "threads-4": Row("logging", 200_000, "the same, 4 threads, one file", 0.75),
    "threads-8": Row("logging", 200_000, "the same, 8 threads, one file"),
    "threads-16": Row("logging", 200_000, "the same, 16 threads, one file"),
    "start": Row("logging", 100, "main to first message, 20 categories, 5 appenders", 1.2),
}
SIZES = (100, 10_000, 1_000_000)
for n, children, load, save in zip(SIZES, (200, 10, 1), (1.2, 0.85, 0.75), (1.1, 0.8, 0.5)):
    ROWS[f"load-{n}"] = Row("store", children, f"load {n:,} records, each", load)
    ROWS[f"save-{n}"] = Row("store", children, f"save {n:,} records, each", save)
for n in SIZES:
    ROWS[f"get-{n}"] = Row("store", 500_000, f"get a random key among {n:,}, copied", 1.05)
for n in SIZES:
    ROWS[f"enumerate-{n}"] = Row("store", 50_000, f"enumerate a prefix with 10 matches in {n:,}",
                                 1.1 if n == 1_000_000 else None)
for n, puts in ((100, 1000), (10_000, 30)):
    ROWS[f"put-{n}"] = Row("store", puts, f"put and save one record among {n:,}, in /dev/shm", 1.05)
ROWS["memory-1000000"] = Row("store", 1, "peak memory, 1,000,000 records loaded", 0.75)
for n in (100_000, 1_000_000):
    for verb, title in (("load", "load a dump of"), ("dump", "dump"), ("get", "get one of"),
                        ("list", "list the keys of")):
        ROWS[f"tool-{verb}-{n}"] = Row("tools", 1, f"`korvex-records`: {title} {n:,} records")

# Counted under callgrind: the number of calls, what to run, and what one call is.
COUNTED = {
    "filtered": (1000, "filtered", "filtered-out debug call"),
    "message": (1000, "message", "`%m%n` to a file"),
    "dated": (1000, "dated", "`%d{ISO8601} [%t] %-5p %c: %m%n` to a file"),
    "get-10000": (1000, "get-10000", "get a random key among 10,000"),
    "enumerate-10000": (300, "enumerate-10000", "enumerate 10 matches in 10,000"),
    "put-100": (50, "put-100", "put and save one record among 100"),
    "memory-1000000": (10_000, "memory-10000", "load one of 10,000 records"),
}

LINEAR = {
    "separators": "path of n separators, doubled ones removed",
    "dotdots": "path of n `..` elements, removed",
    "quotes": "path of n quotes, quoted for the shell",
    "logline": "log line of n bytes, to /dev/null",
    "confline": "configuration line of n bytes",
    "records": "record file of n records, loaded",
}


def contestants(table):
    """Names of the built contestants, the floor and Korvex first."""
    names = [p.name.split("-", 2)[2] for p in BIN.glob(f"bench-{table}-*")]
    return sorted(names, key=lambda name: (name != "floor", name != "korvex", name))


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
