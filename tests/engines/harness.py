"""What the tests with real log engines share."""

import collections
import json
import os
import re
import shutil
import signal
import socket
import subprocess
import tempfile
import time
import unittest

BUILD = os.environ["KORVEX_BUILD"]  # a build directory with the tools and engine-writer
ROOT = os.environ["KORVEX_ENGINES"]  # where the engines are unpacked; those installed will do, too
SOURCE = os.path.dirname(os.path.dirname(os.path.dirname(os.path.abspath(__file__))))
COUNT = int(os.environ.get("KORVEX_MESSAGES", "100000"))
LOGCHECK = os.path.join(BUILD, "tools/korvex-logcheck/korvex-logcheck")
WRITER = os.path.join(BUILD, "tests/engine-writer")

LIBRARY = subprocess.run(["gcc", "-print-multiarch"], capture_output=True, text=True).stdout.strip()
LIBRARIES = [os.path.join(ROOT, "usr/lib", LIBRARY), os.path.join(ROOT, "lib", LIBRARY),
             os.path.join(ROOT, "usr/lib/syslog-ng")]
PATH = os.pathsep.join([os.path.join(ROOT, "usr/sbin"), os.path.join(ROOT, "usr/bin"),
                        "/usr/sbin", os.environ["PATH"]])

Entry = collections.namedtuple("Entry", "level channel thread time uptime_ms uptime_s cpu_ticks "
                               "utc message")
CONVERSIONS = {"channel": "c", "thread": "t", "uptime_ms": "r", "uptime_s": "R", "cpu_ticks": "u"}


def program(name):
    """The program's path; the test is skipped where there is none."""
    path = shutil.which(name, path=PATH)
    if path is None:
        raise unittest.SkipTest("there is no %s" % name)
    return path


def environment(**more):
    """For what is unpacked below ROOT."""
    return dict(os.environ, PATH=PATH, LD_LIBRARY_PATH=os.pathsep.join(LIBRARIES), TZ="UTC",
                LC_ALL="C.UTF-8", **more)


def layouts():
    with open(os.path.join(SOURCE, "tests/engines/layouts.txt")) as file:
        return file.read().splitlines()


def shows(layout, letter):
    """Whether the layout has that conversion, outside of its dates."""
    return re.search("%[-.0-9]*" + letter, re.sub(r"\{[^}]*\}", "", layout)) is not None


def entry_of(one):
    """What an engine gave as an object of JSON. Of processor time only a number is expected."""
    def number(field):
        return int(one[field]) if field in one else None
    return Entry(one["level"], one.get("channel"), one.get("thread"), one["time"],
                 number("uptime_ms"), number("uptime_s"),
                 None if number("cpu_ticks") is None else True, None, one["message"].encode())


def eventually(condition, what, seconds=120):
    end = time.monotonic() + seconds
    while not condition():
        if time.monotonic() > end:
            raise AssertionError("never came true: " + what)
        time.sleep(0.1)


def free_port():
    with socket.socket() as one:
        one.bind(("127.0.0.1", 0))
        return one.getsockname()[1]


def lines_of(path):
    if not os.path.exists(path):
        return []
    with open(path, "rb") as file:
        return file.read().splitlines()


class EngineTest(unittest.TestCase):
    """A directory of the test's own, and processes that end with it."""

    def setUp(self):
        self.directory = tempfile.mkdtemp(prefix="korvex-engines-")
        self.addCleanup(shutil.rmtree, self.directory)
        self.processes = []
        self.addCleanup(self.end_all)

    def file(self, *names):
        return os.path.join(self.directory, *names)

    def write(self, name, text):
        with open(self.file(name), "w") as file:
            file.write(text)
        return self.file(name)

    def start(self, command, **options):
        with open(self.file(os.path.basename(command[0]) + ".err"), "ab") as errors:
            process = subprocess.Popen(command, stdout=errors, stderr=errors,
                                       stdin=subprocess.DEVNULL, **options)
        self.processes.append(process)
        return process

    def stop(self, process, how=signal.SIGTERM):
        process.send_signal(how)
        process.wait(60)
        self.processes.remove(process)

    def end_all(self):
        for process in list(self.processes):
            self.stop(process, signal.SIGKILL)

    def configure(self, layout, size=COUNT * 40, backups=20):
        """A configuration with the appender LOG; its path."""
        return self.write("log.cfg", "rootCategory=DEBUG,LOG\n"
                          "appender.LOG.fileName=%s\n"
                          "appender.LOG.maxFileSize=%d\n"
                          "appender.LOG.maxBackupIndex=%d\n"
                          "appender.LOG.layout.ConversionPattern=%s\n"
                          % (self.file("app.log"), size, backups, layout))

    def export(self, engine, source="log.cfg", options=()):
        return subprocess.run([LOGCHECK, "--export", engine, self.file(source), *options],
                              check=True, capture_output=True, text=True).stdout

    def log(self, count=COUNT, pause=0):
        """Logs that many messages of all shapes, with pauses; what an engine must find."""
        out = subprocess.run([WRITER, self.file("log.cfg"), str(count), str(pause)], check=True,
                             capture_output=True, env=environment()).stdout
        entries = []
        for line in out.decode().splitlines():
            level, channel, thread, when, uptime_ms, uptime_s, utc, message = line.split("\t")
            entries.append(Entry(level, channel, thread, when, int(uptime_ms), int(uptime_s), True,
                                 utc, bytes.fromhex(message)))
        self.assertGreater(len(entries), count)
        return entries

    def shown(self, entries, layout):
        """The entries as far as the layout shows them."""
        hidden = {field: None for field, letter in CONVERSIONS.items() if not shows(layout, letter)}
        hidden["utc"] = None
        cut = {field: slice(2 if ".2" + letter in layout else None)
               for field, letter in (("level", "p"), ("channel", "c"))}
        return [one._replace(**{"level": one.level[cut["level"]],
                                "channel": one.channel[cut["channel"]], **hidden})
                for one in entries]

    def assert_same(self, found, expected):
        """Compares lists too long for assertEqual's report."""
        for number, (one, other) in enumerate(zip(found, expected)):
            self.assertEqual(one, other, "entry %d" % number)
        self.assertEqual(len(found), len(expected))


class Following:
    """What is tested of an engine that follows a log and writes each message as JSON: out.json.

    A test class sets READY, a file that is there once the engine runs, and KEPT, the beginnings of
    the names under which the engine keeps how far it has read. start_engine() starts it."""

    def given(self, entry):
        """The entry as the engine gives it."""
        return entry

    def check(self, layout, count, size=COUNT * 40, pause=0):
        self.forget_all()
        self.configure(layout, size)
        self.write("app.log", "")
        engine = self.start_engine()
        eventually(lambda: os.path.exists(self.file(self.READY)), "the engine's start")
        expected = [self.given(one) for one in self.shown(self.log(count, pause), layout)]
        lost = self.last_of_backups()
        expected = [one for number, one in enumerate(expected) if number not in lost]
        eventually(lambda: len(lines_of(self.file("out.json"))) >= len(expected),
                   "all lines in the JSON", 60)
        self.stop(engine)
        self.assert_same([entry_of(json.loads(line.decode()))
                          for line in lines_of(self.file("out.json"))], expected)
        return lost

    def forget_all(self):
        for name in os.listdir(self.directory):
            if not name.startswith(("app.log", "out.json", *self.KEPT)):
                continue
            if os.path.isdir(self.file(name)):
                shutil.rmtree(self.file(name))
            else:
                os.remove(self.file(name))

    def last_of_backups(self):
        """The numbers of the messages that are the last of a file that was rotated away."""
        quoted = re.search(r'startmsg.regex="(.*)"', self.export("rsyslog")).group(1)
        begin = re.compile(re.sub(r"\\(.)", r"\1", quoted).replace("[:space:]", r"\s").encode())
        backups = [name for name in os.listdir(self.directory) if name.startswith("app.log.")]
        numbers = []
        count = 0
        for name in sorted(backups, key=lambda one: -int(one.rsplit(".", 1)[1])):
            with open(self.file(name), "rb") as file:
                count += sum(1 for line in file.read().split(b"\n") if begin.match(line))
            numbers.append(count - 1)
        return numbers

    def test_every_message_comes_as_json_in_order(self):
        for layout in layouts():
            with self.subTest(layout):
                self.assertEqual(self.check(layout, COUNT // 10), [])

    def test_of_a_log_that_is_rotated_it_loses_the_last_message_of_each_file(self):
        for layout in layouts():
            with self.subTest(layout):
                self.assertGreater(len(self.check(layout, 6000, size=500000, pause=3000)), 1)
