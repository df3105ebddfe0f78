#!/usr/bin/env python3
"""Copies a store's records into etcd, Redis or PostgreSQL, and back, with their own clients.

    records.py push|pull|watch etcd|redis|postgresql [PREFIX]

push makes the server hold what the store holds below PREFIX: changed records are put, records that
are gone are deleted, others are left alone. watch pushes now and each time the store was saved, until
it is ended. pull makes the store hold what the server holds there; no program that keeps the store in
its memory may run then, for it would write it all back.

Keys and values may be of any bytes. The store is that of KORVEX_DB; etcdctl, redis-cli and psql find
their servers as they always do (ETCDCTL_ENDPOINTS, REDISCLI_AUTH and -p, PGHOST ...), and REDIS_CLI
and the like in the environment may name them with more arguments.
"""

import base64
import json
import os
import re
import shlex
import subprocess
import sys
import time


def run(command, stdin=b""):
    return subprocess.run(command, input=stdin, stdout=subprocess.PIPE, check=True).stdout


def tool(variable, default):
    return shlex.split(os.environ.get(variable, default))


class Failure(Exception):
    pass


class Store:
    tool = tool("KORVEX_RECORDS", "korvex-records")

    def stamp(self):
        """Changes with each save."""
        try:
            found = os.stat(os.path.join(os.environ["KORVEX_DB"], "hashDb/data"))
        except FileNotFoundError:
            return None
        return found.st_ino, found.st_size, found.st_mtime_ns

    def saved(self, prefix):
        """What was saved last. A save may rewrite the file in place, and half of a file would delete
        the rest: so nobody must have written to it for a second, and an empty file is none."""
        while True:
            before = self.stamp()
            if before is None or before[1] == 0:
                raise Failure("there is no record file, so nothing is changed")
            if time.time_ns() - before[2] < 1000000000:
                time.sleep(0.1)
                continue
            records = self.read(prefix)
            if self.stamp() == before:
                return records

    def read(self, prefix):
        def part(record, name):
            if name in record:
                return record[name].encode()
            return base64.b64decode(record[name + "_base64"])
        lines = run([*self.tool, "dump", "--json", "--", prefix]).splitlines()
        return {part(one, "key"): part(one, "value") for one in map(json.loads, lines)}

    def replace(self, records):
        """The whole store: what is below other prefixes is among the records."""
        def encoded(data):
            return base64.b64encode(data).decode()
        lines = [json.dumps({"key_base64": encoded(key), "value_base64": encoded(value)})
                 for key, value in sorted(records.items())]
        run([*self.tool, "load", "--json", "--replace", "--create"],
            "".join(line + "\n" for line in lines).encode())


class Etcd:
    """A key for each record. A value may have 1.5 MB, all of them 2 GB, as etcd is set up. What has
    changed is put in transactions of at most 100 changes and some 500 KB, below etcd's limits."""
    tool = tool("ETCDCTL", "etcdctl")
    root = b"korvex/"

    def read(self, prefix):
        found = json.loads(run([*self.tool, "get", "--prefix", "-w", "json", self.root + prefix]))
        return {base64.b64decode(one["key"])[len(self.root):]: base64.b64decode(one.get("value", ""))
                for one in found.get("kvs", [])}

    @staticmethod
    def quoted(data):
        return '"' + "".join("\\x%02x" % byte for byte in data) + '"'

    def change(self, put, gone):
        changes = ["put -- %s %s" % (self.quoted(self.root + key), self.quoted(value))
                   for key, value in put.items()]
        changes += ["del -- " + self.quoted(self.root + key) for key in gone]
        some = []
        for change in changes:
            if some and (len(some) == 100 or sum(map(len, some)) + len(change) > 4 * 500000):
                self.commit(some)
                some = []
            some.append(change)
        if some:
            self.commit(some)

    def commit(self, changes):
        """Under no condition, and nothing else otherwise."""
        out = run([*self.tool, "txn"], ("\n" + "\n".join(changes) + "\n\n\n").encode())
        if not out.startswith(b"SUCCESS"):
            raise Failure("etcd refused a transaction: " + out.decode(errors="replace"))


class Redis:
    """One hash, changed as one transaction."""
    tool = tool("REDIS_CLI", "redis-cli")
    name = b"korvex"
    escapes = {b"n": b"\n", b"r": b"\r", b"t": b"\t", b"a": b"\a", b"b": b"\b"}

    def plain(self, quoted):
        def one(match):
            code = match.group(1)
            if code[:1] == b"x":
                return bytes.fromhex(code[1:].decode())
            return self.escapes.get(code, code)
        return re.sub(rb"\\(x[0-9a-f]{2}|.)", one, quoted)

    def read(self, prefix):
        out = run([*self.tool, "--no-raw", "HGETALL", self.name])
        found = [self.plain(one) for one in re.findall(rb'^ *[0-9]+\) "(.*)"$', out, re.M)]
        records = dict(zip(found[::2], found[1::2]))
        return {key: value for key, value in records.items() if key.startswith(prefix)}

    def change(self, put, gone):
        def command(*words):
            return b"*%d\r\n" % len(words) + b"".join(b"$%d\r\n%s\r\n" % (len(word), word)
                                                      for word in words)
        changes = [command(b"HSET", self.name, key, value) for key, value in put.items()]
        changes += [command(b"HDEL", self.name, key) for key in gone]
        if changes:
            run([*self.tool, "--pipe"],
                command(b"MULTI") + b"".join(changes) + command(b"EXEC"))


class Postgresql:
    """A table, changed as one transaction."""
    tool = tool("PSQL", "psql")
    table = ("CREATE TABLE IF NOT EXISTS korvex_records "
             "(key bytea PRIMARY KEY, value bytea NOT NULL);\n")

    def sql(self, text):
        return run([*self.tool, "-X", "-q", "-v", "ON_ERROR_STOP=1"],
                   ("SET client_min_messages = warning;\n" + self.table + text).encode())

    def read(self, prefix):
        out = self.sql("COPY korvex_records TO STDOUT;\n")
        rows = [line.split(b"\t") for line in out.splitlines()]
        records = {bytes.fromhex(key[3:].decode()): bytes.fromhex(value[3:].decode())
                   for key, value in rows}
        return {key: value for key, value in records.items() if key.startswith(prefix)}

    def change(self, put, gone):
        def column(data):
            return "\\\\x" + data.hex()
        rows = "".join(column(key) + "\t" + column(value) + "\n" for key, value in put.items())
        old = "".join(column(key) + "\n" for key in gone)
        self.sql("BEGIN;\n"
                 "CREATE TEMP TABLE put (LIKE korvex_records) ON COMMIT DROP;\n"
                 "CREATE TEMP TABLE gone (key bytea) ON COMMIT DROP;\n"
                 "COPY put FROM STDIN;\n" + rows + "\\.\n"
                 "COPY gone FROM STDIN;\n" + old + "\\.\n"
                 "INSERT INTO korvex_records SELECT * FROM put "
                 "ON CONFLICT (key) DO UPDATE SET value = excluded.value;\n"
                 "DELETE FROM korvex_records USING gone WHERE korvex_records.key = gone.key;\n"
                 "COMMIT;\n")


SERVERS = {"etcd": Etcd, "redis": Redis, "postgresql": Postgresql}


def push(store, server, prefix):
    wanted = store.saved(prefix)
    there = server.read(prefix)
    put = {key: value for key, value in wanted.items() if there.get(key) != value}
    gone = [key for key in there if key not in wanted]
    server.change(put, gone)
    print("%d put, %d deleted, %d left alone" % (len(put), len(gone), len(wanted) - len(put)),
          flush=True)


def watch(store, server, prefix):
    pushed = None
    while True:
        stamp = store.stamp()
        if stamp != pushed:
            try:
                push(store, server, prefix)
                pushed = stamp
            except (Failure, subprocess.CalledProcessError) as error:
                print(error, file=sys.stderr, flush=True)  # and is tried again
        time.sleep(1)


def pull(store, server, prefix):
    others = store.read(b"") if prefix else {}
    records = {key: value for key, value in others.items() if not key.startswith(prefix)}
    found = server.read(prefix)
    records.update(found)
    store.replace(records)
    print("%d records" % len(found))


WORDS = {"push": push, "pull": pull, "watch": watch}


def main():
    if len(sys.argv) not in (3, 4) or sys.argv[1] not in WORDS or sys.argv[2] not in SERVERS:
        sys.exit(__doc__)
    prefix = os.fsencode(sys.argv[3]) if len(sys.argv) == 4 else b""
    try:
        WORDS[sys.argv[1]](Store(), SERVERS[sys.argv[2]](), prefix)
    except (Failure, subprocess.CalledProcessError) as error:
        sys.exit("records.py: %s" % error)


if __name__ == "__main__":
    main()
