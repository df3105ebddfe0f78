"""Three daemons, each with an rsyslog that forwards its logs, and a collector, as examples/fleet has
them: every line arrives, in order, while the logs are rotated and processes are killed."""

import json
import os
import re
import shutil
import signal
import socket
import time
import unittest

from harness import (BUILD, LIBRARY, ROOT, SOURCE, EngineTest, environment, eventually, free_port,
                     lines_of, program)

MODULES = os.path.join(ROOT, "usr/lib", LIBRARY, "rsyslog")
TALLYD = os.path.join(BUILD, "examples/daemon/tallyd")
FLEET = os.path.join(SOURCE, "examples/fleet")
NAMES = 2500  # counted by each daemon
# What rsyslog was about to send when it was ended comes behind what waited.
BATCH = 128


class Daemon:
    """A copy of the example daemon, and the rsyslog of its machine."""

    def __init__(self, test, number):
        self.test = test
        self.name = "machine%d" % number
        self.port = free_port()
        self.home = test.file(self.name, "home")
        self.work = test.file(self.name, "work")
        shutil.copytree(os.path.join(SOURCE, "examples/daemon/home"), self.home)
        for directory in (self.work, test.file(self.name, "db"), os.path.join(self.home, "var/log")):
            os.makedirs(directory)
        self.every_name_is_logged()

    def every_name_is_logged(self):
        path = os.path.join(self.home, "etc/myinstall/log.cfg")
        with open(path) as file:
            text = file.read()
        text = text.replace("category.receiver=INFO", "category.receiver=DEBUG")
        text = text.replace("maxFileSize=1048576", "maxFileSize=60000")
        text = text.replace("maxBackupIndex=3", "maxBackupIndex=99")
        with open(path, "w") as file:
            file.write(text)

    def start(self):
        self.process = self.test.start(
            [TALLYD, "--nodaemon", "-p", str(self.port)],
            env=environment(KORVEX_HOME=self.home, KORVEX_DB=self.test.file(self.name, "db")))
        pid = self.test.file(self.name, "db/tallyd.pid")
        wanted = [str(self.process.pid).encode()]
        eventually(lambda: lines_of(pid) == wanted, "the daemon's start")

    def start_forwarder(self):
        with open(os.path.join(FLEET, "forward.conf")) as file:
            text = file.read().replace("/opt/tallyd", self.home)
        text = text.replace("20514", str(self.test.port)).replace("$hostname", '"%s"' % self.name)
        text = 'global(workDirectory="%s")\n%s' % (self.work, text)
        self.forwarder = self.test.start_rsyslog(self.name, text)

    def count(self, name):
        with socket.socket(socket.AF_INET, socket.SOCK_DGRAM) as one:
            one.sendto(name.encode(), ("127.0.0.1", self.port))

    def logged(self, appender, leaf):
        """The lines of a log and its backups, oldest first."""
        log = os.path.join(self.home, "var/log", leaf)
        backups = sorted((int(name.rsplit(".", 1)[1]) for name in os.listdir(os.path.dirname(log))
                          if re.fullmatch(re.escape(leaf) + r"\.[0-9]+", name)), reverse=True)
        return [(appender, line) for path in ["%s.%d" % (log, n) for n in backups] + [log]
                for line in lines_of(path)]


class FleetTest(EngineTest):
    def setUp(self):
        super().setUp()
        self.rsyslogd = program("rsyslogd")
        self.port = free_port()
        self.stream = self.file("stream.json")
        self.daemons = [Daemon(self, number) for number in (1, 2, 3)]

    def start_rsyslog(self, name, text):
        modules = ["-M", MODULES] if os.path.isdir(MODULES) else []
        pid = self.file(name + ".pid")
        process = self.start([self.rsyslogd, "-n", "-f", self.write(name + ".conf", text),
                              "-i", pid, *modules], env=environment())
        eventually(lambda: lines_of(pid) == [str(process.pid).encode()], "rsyslogd's start")
        return process

    def start_collector(self):
        with open(os.path.join(FLEET, "collect.conf")) as file:
            text = file.read().replace("20514", str(self.port))
        text, replaced = re.subn(r'"/var/log/fleet/[^"]*"', '"%s"' % self.stream, text)
        self.assertEqual(replaced, 1)
        os.makedirs(self.file("collector"), exist_ok=True)
        return self.start_rsyslog("collect", 'global(workDirectory="%s" maxMessageSize="256k")\n'
                                  % self.file("collector") + text)

    def received(self, daemon):
        """(appender, offset, line) of each line of the daemon, in the stream's order."""
        found = []
        for line in lines_of(self.stream):
            one = json.loads(line)
            if one["host"] == daemon.name:
                self.assertIn("time", one, line)
                text = "%s %s%-5s %s%s" % (
                    one["time"], "[%s] " % one["thread"] if "thread" in one else "", one["level"],
                    one["channel"] + ": " if "channel" in one else "", one["message"])
                found.append((one["appender"], one["offset"], text.encode()))
        return found

    def once(self, received):
        """Without what came once more: a line of the same place and time."""
        return list(dict.fromkeys(received))

    def load(self, first, last):
        """Each daemon counts these names, 400 a second."""
        for number in range(first, last):
            for daemon in self.daemons:
                daemon.count("name%06d" % number)
            time.sleep(1 / 400)

    def check(self, displaced=0):
        """Every line once and in order, but for so many that come later."""
        for daemon in self.daemons:
            logs = {"MAIN": daemon.logged("MAIN", "tallyd.log"),
                    "RECEIVER": daemon.logged("RECEIVER", "receiver.log")}
            wanted = len(logs["MAIN"]) + len(logs["RECEIVER"])
            eventually(lambda: len(self.once(self.received(daemon))) >= wanted,
                       "all %d lines of %s" % (wanted, daemon.name), 60)
            found = self.once(self.received(daemon))
            for appender, lines in logs.items():
                came = [(one[0], one[2]) for one in found if one[0] == appender]
                self.assert_same(sorted(came), sorted(lines))
                place = {line: number for number, line in enumerate(lines)}
                late = 0
                last = -1
                for line in came:
                    late += place[line] < last
                    last = max(last, place[line])
                self.assertLessEqual(late, displaced, "lines out of order")

    def test_every_line_arrives_once_and_in_order(self):
        collector = self.start_collector()
        for daemon in self.daemons:
            daemon.start_forwarder()
            daemon.start()
        self.load(0, NAMES // 4)
        self.stop(collector, signal.SIGKILL)
        self.load(NAMES // 4, NAMES // 2)
        collector = self.start_collector()
        self.stop(self.daemons[1].process, signal.SIGKILL)
        self.daemons[1].start()
        self.load(NAMES // 2, NAMES)
        for daemon in self.daemons:
            self.assertGreater(len(daemon.logged("RECEIVER", "receiver.log")), NAMES // 2)
            self.assertTrue(os.path.exists(os.path.join(daemon.home, "var/log/receiver.log.2")))
        self.check()
        repeated = sum(len(self.received(daemon)) - len(self.once(self.received(daemon)))
                       for daemon in self.daemons)
        print("lines that came twice: %d" % repeated)

    def test_what_is_logged_while_the_link_is_down_arrives_later(self):
        for daemon in self.daemons:
            daemon.start_forwarder()
            daemon.start()
        self.load(0, NAMES // 4)
        for daemon in self.daemons:  # the machine is switched off and on
            self.stop(daemon.forwarder)
            daemon.start_forwarder()
        self.start_collector()
        self.check(displaced=BATCH)


if __name__ == "__main__":
    unittest.main()
