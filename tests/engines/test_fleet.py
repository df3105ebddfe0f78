"""Three daemons, each with an rsyslog that forwards its logs, and a collector, as examples/fleet has
them: every line arrives, in order, while the logs are rotated and processes are killed."""

import json
import os
import re
import shutil
import signal
import socket
import subprocess
import threading
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
# What RELP may have on its way: it comes once more when the collector is killed.
WINDOW = 512
# So many changes of the queue rsyslog may forget when it is killed.
CHECKPOINT = 100


def late(came, logged):
    """Compares two lists of lines that differ from each other: each line of one must be in the other
    once. How many of those that came are behind one that was logged later."""
    if sorted(came) != sorted(logged):
        lost = sorted(set(logged) - set(came))
        extra = sorted(set(came) - set(logged))
        raise AssertionError("%d lines came for %d; lost: %s; not logged: %s"
                             % (len(came), len(logged), lost[:3], extra[:3]))
    place = {line: number for number, line in enumerate(logged)}
    count = 0
    last = -1
    for line in came:
        count += place[line] < last
        last = max(last, place[line])
    return count


class LateTest(unittest.TestCase):
    """The comparison notices what it is for."""

    LINES = [b"a", b"b", b"c", b"d"]

    def test_lines_in_order_are_not_late(self):
        self.assertEqual(late(self.LINES, self.LINES), 0)

    def test_a_line_behind_a_later_one_is_late(self):
        self.assertEqual(late([b"a", b"c", b"d", b"b"], self.LINES), 1)

    def test_a_lost_a_repeated_and_a_strange_line_are_noticed(self):
        for came in ([b"a", b"b", b"d"], [b"a", b"b", b"b", b"c", b"d"], [b"a", b"b", b"c", b"x"]):
            with self.assertRaises(AssertionError):
                late(came, self.LINES)


class Daemon:
    """A copy of the example daemon, and the rsyslog of its machine."""

    def __init__(self, test, number):
        self.test = test
        self.queue_size = "5000000"
        self.name = "machine%d" % number
        self.port = free_port()
        self.home = test.file(self.name, "home")
        self.work = test.file(self.name, "work")
        shutil.copytree(os.path.join(SOURCE, "examples/daemon/home"), self.home)
        for directory in (self.work, test.file(self.name, "db"), os.path.join(self.home, "var/log")):
            os.makedirs(directory)
        self.log_every_name(60000)

    def log_every_name(self, file_size):
        path = os.path.join(self.home, "etc/myinstall/log.cfg")
        with open(path) as file:
            text = file.read()
        text = text.replace("category.receiver=INFO", "category.receiver=DEBUG")
        text = re.sub("maxFileSize=[0-9]+", "maxFileSize=%d" % file_size, text)
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
        text = text.replace('queue.size="5000000"', 'queue.size="%s"' % self.queue_size)
        text = 'global(workDirectory="%s")\n%s' % (self.work, text)
        self.forwarder = self.test.start_rsyslog(self.name, text)

    def waiting(self):
        """How many bytes wait on the disk."""
        return sum(os.path.getsize(os.path.join(self.work, name)) for name in os.listdir(self.work)
                   if name.startswith("korvex_out."))

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


class Fleet(EngineTest):
    """rsyslog as examples/fleet has it."""

    def setUp(self):
        super().setUp()
        self.rsyslogd = program("rsyslogd")
        self.port = free_port()
        self.stream = self.file("stream.json")

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


class FleetTest(Fleet):
    def setUp(self):
        super().setUp()
        self.daemons = [Daemon(self, number) for number in (1, 2, 3)]

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

    def start_all(self):
        for daemon in self.daemons:
            daemon.start_forwarder()
            daemon.start()

    def check(self, displaced=0, repeated=0):
        """Every line once and in order, but for so many that come later, or once more."""
        for daemon in self.daemons:
            self.stop(daemon.process)
            logs = {"MAIN": daemon.logged("MAIN", "tallyd.log"),
                    "RECEIVER": daemon.logged("RECEIVER", "receiver.log")}
            wanted = len(logs["MAIN"]) + len(logs["RECEIVER"])
            eventually(lambda: len(self.once(self.received(daemon))) >= wanted,
                       "all %d lines of %s" % (wanted, daemon.name), 120)
            found = self.received(daemon)
            for appender, lines in logs.items():
                came = [(one[0], one[2]) for one in self.once(found) if one[0] == appender]
                self.assertLessEqual(late(came, lines), displaced, "lines out of order")
            self.assertLessEqual(len(found) - len(self.once(found)), repeated, "lines come again")

    def test_every_line_arrives_once_and_in_order(self):
        collector = self.start_collector()
        self.start_all()
        load = threading.Thread(target=self.load, args=(0, NAMES))
        load.start()
        time.sleep(1.5)
        self.stop(collector, signal.SIGKILL)
        time.sleep(1.5)
        collector = self.start_collector()
        time.sleep(0.5)
        self.stop(self.daemons[1].process, signal.SIGKILL)
        self.daemons[1].start()
        self.assertTrue(load.is_alive(), "all of that was under load")
        load.join()
        for daemon in self.daemons:
            self.assertGreater(len(daemon.logged("RECEIVER", "receiver.log")), NAMES // 2)
            self.assertTrue(os.path.exists(os.path.join(daemon.home, "var/log/receiver.log.2")))
        self.check(repeated=WINDOW)
        each_once = subprocess.run(["awk", "!seen[$0]++", self.stream], check=True,
                                   capture_output=True).stdout.splitlines()
        self.assertEqual(len(each_once),
                         sum(len(self.once(self.received(daemon))) for daemon in self.daemons))

    def test_what_is_logged_while_the_link_is_down_waits_on_the_disk(self):
        self.start_all()
        self.load(0, NAMES // 4)
        for daemon in self.daemons:  # the machine is switched off and on
            self.stop(daemon.forwarder)
            lines = len(daemon.logged("RECEIVER", "receiver.log"))
            print("%s: %d lines take %d bytes of queue" % (daemon.name, lines, daemon.waiting()))
            self.assertGreater(daemon.waiting(), 500 * lines)
            self.assertLess(daemon.waiting(), 2000 * lines)
            daemon.start_forwarder()
        self.start_collector()
        self.check(displaced=BATCH, repeated=WINDOW)

    def test_a_queue_that_was_full_is_sent_and_little_was_thrown_away(self):
        for daemon in self.daemons:
            daemon.queue_size = "500"
            daemon.log_every_name(10000000)
        self.start_all()
        self.load(0, NAMES)
        for daemon in self.daemons:
            self.assertLess(daemon.waiting(), 600 * 2000)
        self.start_collector()
        for daemon in self.daemons:
            self.check_the_end_arrives(daemon)
            came = [one[2] for one in self.once(self.received(daemon)) if b"counted name" in one[2]]
            logged = [line for _, line in daemon.logged("RECEIVER", "receiver.log")
                      if b"counted name" in line]
            self.assertEqual(came[:300], logged[:300])
            print("%s: %d of %d lines thrown away" % (daemon.name, len(logged) - len(came),
                                                      len(logged)))
            self.assertLess(len(logged) - len(came), 60)  # one in two seconds
            arrived = set(came)
            self.assertLessEqual(late(came, [line for line in logged if line in arrived]), BATCH)

    def test_a_forwarder_that_is_killed_goes_on_close_to_where_it_was(self):
        daemon = self.daemons[0]
        daemon.log_every_name(10000000)
        self.start_collector()
        daemon.start_forwarder()
        daemon.start()
        for kill in range(3):
            for number in range(kill * 1000, (kill + 1) * 1000):
                daemon.count("name%06d" % number)
                time.sleep(1 / 2000)
            self.stop(daemon.forwarder, signal.SIGKILL)
            daemon.start_forwarder()
        self.check_the_end_arrives(daemon)
        came = [one[2].split()[-1] for one in self.received(daemon) if b"counted name" in one[2]]
        logged = [line.split()[-1] for _, line in daemon.logged("RECEIVER", "receiver.log")
                  if b"counted name" in line]
        self.assertGreater(len(logged), 2000)
        self.assertEqual(set(came) - set(logged), set())
        print("%d of %d lines lost, %d came again" % (len(set(logged) - set(came)), len(logged),
                                                      len(came) - len(set(came))))
        self.assertLessEqual(len(set(logged) - set(came)), 3 * CHECKPOINT)

    def check_the_end_arrives(self, daemon):
        def arrived():
            daemon.count("last")
            return any(b"counted last" in one[2] for one in self.received(daemon))
        eventually(arrived, "a line after the queue was full")
        self.stop(daemon.process)


if __name__ == "__main__":
    unittest.main()
