"""A store's records go into etcd, Redis and PostgreSQL, and come back to the byte."""

import base64
import glob
import json
import os
import shutil
import subprocess
import sys
import unittest

from harness import (BUILD, SOURCE, EngineTest, environment, eventually, free_port, lines_of,
                     program)

RECORDS = os.path.join(BUILD, "tools/korvex-records/korvex-records")
SCRIPT = os.path.join(SOURCE, "examples/fleet/records.py")
BYTES = bytes(range(256)) * 3
VALUES = {"count/apple": b"2", "count/empty": b"", "count/bytes": BYTES, "count/lines": b"a\nb\\n\r\t\"x\"",
          "other/utf8": "Gr\u00f6\u00dfe".encode(), "count/-dash": b"-v", "count/a b'c": b"\\x41"}


class Recipe:
    """What is tested with each server."""

    def setUp(self):
        super().setUp()
        os.makedirs(self.file("home/etc"))
        os.makedirs(self.file("db"))
        self.write("home/etc/log-cmdline.cfg", "rootCategory=WARN\n")
        self.client = self.start_server()

    def environment(self, database="db"):
        return environment(KORVEX_HOME=self.file("home"), KORVEX_DB=self.file(database),
                           KORVEX_RECORDS=RECORDS, **self.client)

    def records(self, *arguments, stdin=b"", database="db"):
        result = subprocess.run([RECORDS, *arguments], input=stdin, capture_output=True,
                                env=self.environment(database))
        self.assertEqual(result.returncode, 0, result.stderr)
        return result.stdout

    def recipe(self, *arguments, database="db"):
        result = subprocess.run([sys.executable, SCRIPT, *arguments], capture_output=True,
                                env=self.environment(database))
        self.assertEqual(result.returncode, 0, result.stderr)
        return result.stdout.decode()

    def put(self, key, value):
        self.records("put", "--create", "-i", "-", key, stdin=value)

    def fill(self):
        for key, value in VALUES.items():
            self.put(key, value)
        self.records("put", b"count/\xff\x01", "odd key")

    def load(self, records):
        """Puts many records at once."""
        lines = [json.dumps({name: base64.b64encode(data).decode() for name, data in
                             (("key_base64", key), ("value_base64", value))})
                 for key, value in records.items()]
        self.records("load", "--json", stdin="\n".join(lines).encode() + b"\n")

    def test_all_records_come_back_to_the_byte(self):
        self.fill()
        self.assertEqual(self.recipe("push", self.name), "8 put, 0 deleted, 0 left alone\n")
        os.makedirs(self.file("db2/hashDb"))
        self.assertEqual(self.recipe("pull", self.name, database="db2"), "8 records\n")
        self.assertEqual(self.records("dump", database="db2"), self.records("dump"))
        self.assertEqual(self.records("get", "count/bytes", database="db2"), BYTES)

    def test_what_is_gone_is_deleted_and_the_rest_left_alone(self):
        self.fill()
        self.recipe("push", self.name)
        self.records("remove", "count/apple", "count/empty")
        self.put("count/lines", b"changed")
        self.assertEqual(self.recipe("push", self.name), "1 put, 2 deleted, 5 left alone\n")
        self.assertEqual(self.recipe("push", self.name), "0 put, 0 deleted, 6 left alone\n")
        before = self.records("dump")
        self.assertEqual(self.recipe("pull", self.name), "6 records\n")
        self.assertEqual(self.records("dump"), before)

    def test_a_prefix_leaves_other_records_alone(self):
        self.fill()
        self.assertEqual(self.recipe("push", self.name, "count/"), "7 put, 0 deleted, 0 left alone\n")
        self.records("remove", "count/apple")
        self.put("other/more", b"kept")
        self.assertEqual(self.recipe("pull", self.name, "count/"), "7 records\n")
        self.assertEqual(self.records("get", "count/apple"), b"2")
        self.assertEqual(self.records("get", "other/more"), b"kept")

    def test_many_and_large_changes_go_in_pieces(self):
        many = {b"many/%04d" % number: BYTES for number in range(350)}
        self.put("large", b"\0x" * 500000)
        self.load(many)
        self.assertEqual(self.recipe("push", self.name), "351 put, 0 deleted, 0 left alone\n")
        before = self.records("dump")
        self.recipe("pull", self.name)
        self.assertEqual(self.records("dump"), before)

    def test_a_save_is_pushed_while_watched(self):
        self.put("count/apple", b"1")
        watch = self.start([sys.executable, SCRIPT, "watch", self.name], env=self.environment())
        said = self.file(os.path.basename(sys.executable) + ".err")
        eventually(lambda: lines_of(said) == [b"1 put, 0 deleted, 0 left alone"], "the first push")
        self.put("count/pear", b"2")
        self.records("remove", "count/apple")
        eventually(lambda: sum(int(line.split()[2]) for line in lines_of(said)) == 1, "the deletion")
        self.stop(watch)
        self.assertEqual(self.recipe("push", self.name), "0 put, 0 deleted, 1 left alone\n")

    def test_a_store_without_a_file_or_with_half_of_one_deletes_nothing(self):
        self.put("count/apple", b"1")
        self.recipe("push", self.name)
        path = self.file("db/hashDb/data")
        with open(path, "r+b") as file:
            for size in (os.path.getsize(path) - 1, 0):
                file.truncate(size)
                self.assertNotEqual(self.refused("push", self.name), b"")
        os.remove(path)
        self.assertEqual(self.refused("push", self.name),
                         b"records.py: there is no record file, so nothing is changed\n")
        self.put("count/apple", b"1")
        self.assertEqual(self.recipe("push", self.name), "0 put, 0 deleted, 1 left alone\n")

    def refused(self, *arguments):
        result = subprocess.run([sys.executable, SCRIPT, *arguments], capture_output=True,
                                env=self.environment())
        self.assertEqual(result.returncode, 1, result.stdout)
        return result.stderr


class EtcdTest(Recipe, EngineTest):
    name = "etcd"

    def start_server(self):
        etcd, etcdctl = program("etcd"), program("etcdctl")
        clients, peers = ("http://127.0.0.1:%d" % free_port() for _ in range(2))
        self.start([etcd, "--data-dir", self.file("etcd"), "--listen-client-urls", clients,
                    "--advertise-client-urls", clients, "--listen-peer-urls", peers,
                    "--initial-advertise-peer-urls", peers, "--initial-cluster",
                    "default=" + peers], env=environment())
        client = {"ETCDCTL_ENDPOINTS": clients, "ETCDCTL_API": "3"}
        eventually(lambda: subprocess.run([etcdctl, "endpoint", "health"], capture_output=True,
                                          env=environment(**client)).returncode == 0, "etcd's start")
        return client


class RedisTest(Recipe, EngineTest):
    name = "redis"

    def start_server(self):
        server, client = program("redis-server"), program("redis-cli")
        socket = self.file("redis.sock")
        self.start([server, "--port", "0", "--unixsocket", socket, "--dir", self.directory,
                    "--save", ""], env=environment())
        eventually(lambda: os.path.exists(socket), "Redis's start")
        return {"REDIS_CLI": "%s -s %s" % (client, socket)}


class PostgresqlTest(Recipe, EngineTest):
    name = "postgresql"

    def start_server(self):
        found = sorted(glob.glob("/usr/lib/postgresql/*/bin")) + \
            sorted(glob.glob(os.path.join(os.environ["KORVEX_ENGINES"], "usr/lib/postgresql/*/bin")))
        if not found:
            raise unittest.SkipTest("there is no PostgreSQL")
        self.binaries = found[-1]
        data = self.file("pg")
        os.makedirs(data)
        as_user = {}
        if os.getuid() == 0:  # PostgreSQL refuses root
            os.chmod(self.directory, 0o755)
            shutil.chown(data, "nobody")
            as_user = {"user": "nobody"}
        subprocess.run([os.path.join(self.binaries, "initdb"), "-D", data + "/data", "-U", "korvex",
                        "-A", "trust", "-N", "-E", "UTF8", "--locale=C"], check=True,
                       capture_output=True, cwd="/", env=environment(), **as_user)
        self.start([os.path.join(self.binaries, "postgres"), "-D", data + "/data", "-k", data,
                    "-c", "listen_addresses=", "-c", "fsync=off"], cwd="/", env=environment(),
                   **as_user)
        client = {"PGHOST": data, "PGUSER": "korvex", "PGDATABASE": "postgres",
                  "PSQL": os.path.join(self.binaries, "psql")}
        eventually(lambda: subprocess.run([client["PSQL"], "-c", "SELECT 1"], capture_output=True,
                                          env=environment(**client)).returncode == 0,
                   "PostgreSQL's start")
        return client


if __name__ == "__main__":
    unittest.main()
