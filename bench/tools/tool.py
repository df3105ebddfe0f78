#!/usr/bin/env python3
"""One command-line tool at one row, on the same records as the others: @NAME@.

Prints the nanoseconds and the peak memory (at least this script's own, some 14 MiB) of the program
that does the row; what it needs is made
before. Usage: ROW CALLS, the row being tool-VERB-RECORDS.
"""
import os
import pathlib
import subprocess
import sys
import time

NAME = "@NAME@"
KORVEX = "@KORVEX@"
UNSUPPORTED = 3


def key(i):
    """The i-th key; keys ascend."""
    return f"key/{i:08d}"


def value(i):
    """Some fifty bytes."""
    return f"value of the record {i:08d}, as long as such values are"


def write_lines(path, head, line, tail, count):
    """A file with a line for each record, unless it is there."""
    if path.exists():
        return
    with path.open("w", encoding="ascii") as out:
        out.write(head)
        out.writelines(line(i) for i in range(count))
        out.write(tail)


def dump_of(path, count, more=""):
    """A dump as db_dump writes it."""
    write_lines(path, f"VERSION=3\nformat=print\ntype=btree\n{more}HEADER=END\n",
                lambda i: f" {key(i)}\n {value(i)}\n", "DATA=END\n", count)
    return path


def script_of(path, count):
    """What gdbmtool reads."""
    write_lines(path, "", lambda i: f'store "{key(i)}" "{value(i)}"\n', "", count)
    return path


def table_of(path, count):
    """What sqlite3 imports."""
    write_lines(path, "", lambda i: f"{key(i)}\t{value(i)}\n", "", count)
    return path


def floor(verb, records, count):
    """Copies, or reads, as many bytes."""
    dump = dump_of(pathlib.Path(f"dump-{count}"), count)
    if verb == "load":
        return ["dd", f"if={dump}", f"of={records}", "bs=64K", "conv=fsync", "status=none"], None
    return ["cat", records], None


def korvex(verb, records, count):
    """korvex-records."""
    dump = dump_of(pathlib.Path(f"dump-{count}"), count)
    words = {"load": ["load", dump], "dump": ["dump"], "get": ["get", key(count // 2)], "list": ["list"]}
    return [KORVEX, "-f", records, *words[verb]], None


def berkeley_db(verb, records, count):
    """db_load and db_dump."""
    dump = dump_of(pathlib.Path(f"dump-{count}"), count)
    words = {"load": ["db_load", "-f", dump, records], "dump": ["db_dump", records]}
    return words.get(verb), None


def lmdb(verb, records, count):
    """mdb_load and mdb_dump."""
    dump = dump_of(pathlib.Path(f"dump-{count}"), count, "mapsize=1073741824\n")
    words = {"load": ["mdb_load", "-n", "-f", dump, records], "dump": ["mdb_dump", "-n", records]}
    return words.get(verb), None


def gdbm(verb, records, count):
    """gdbmtool."""
    if verb == "load":
        return ["gdbmtool", records], script_of(pathlib.Path(f"script-{count}"), count)
    words = {"dump": ["gdbm_dump", records, "/dev/stdout"],
             "get": ["gdbmtool", "-r", records, "fetch", key(count // 2)],
             "list": ["gdbmtool", "-r", records, "list"]}
    return words[verb], None


def sqlite(verb, records, count):
    """sqlite3."""
    if verb == "load":
        table = table_of(pathlib.Path(f"table-{count}"), count)
        return ["sqlite3", "-cmd", "create table r(k text primary key, v) without rowid",
                "-cmd", ".mode tabs", records, f".import {table} r"], None
    words = {"dump": ".dump", "list": "select k from r",
             "get": f"select v from r where k = '{key(count // 2)}'"}
    return ["sqlite3", records, words[verb]], None


def run(command, stdin):
    """The status, the nanoseconds and the peak MiB of a command that prints to nobody."""
    with open(stdin or os.devnull, "rb") as source, open(os.devnull, "wb") as nobody:
        begin = time.monotonic_ns()
        with subprocess.Popen(command, stdin=source, stdout=nobody) as process:
            _, status, usage = os.wait4(process.pid, 0)
            process.returncode = os.waitstatus_to_exitcode(status)
        return process.returncode, time.monotonic_ns() - begin, usage.ru_maxrss / 1024


def main():
    """Makes what the row needs, and measures it."""
    _, verb, count = sys.argv[1].split("-")
    contestant = {"floor": floor, "korvex": korvex, "db": berkeley_db, "mdb": lmdb, "gdbm": gdbm,
                  "sqlite": sqlite}[NAME]
    records = pathlib.Path(f"records-{count}")
    command, stdin = contestant(verb, records, int(count))
    if command is None:
        return UNSUPPORTED
    home = pathlib.Path("home")
    (home / "etc").mkdir(parents=True, exist_ok=True)
    (home / "etc/log-cmdline.cfg").write_text("rootCategory=WARN\n", encoding="ascii")
    os.environ.update(KORVEX_HOME=str(home.resolve()), KORVEX_DB=str(home.resolve()))
    if verb == "load":
        records.unlink(missing_ok=True)
        pathlib.Path(f"{records}-lock").unlink(missing_ok=True)
    elif not records.exists():
        load, source = contestant("load", records, int(count))
        if run(load, source)[0] != 0:
            return 1
    status, nanoseconds, mib = run(command, stdin)
    print(f"ns={nanoseconds}\nmib={mib:.1f}")
    return status


if __name__ == "__main__":
    sys.exit(main())
