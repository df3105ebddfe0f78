"""Measures what one machine can ship: a program logs as fast as it can, rsyslog sends each line to a
collector on the same machine, as examples/fleet has it. Writes docs/benchmarks/shipping.md.

Run by ./dev engines ship, on a machine that does nothing else. KORVEX_BENCH is the directory of
bench-logging-korvex; KORVEX_LINES says how many lines are logged (200000)."""

import os
import platform
import resource
import subprocess
import time
import unittest

from harness import SOURCE, environment, eventually
from test_fleet import FLEET, Fleet

LINES = int(os.environ.get("KORVEX_LINES", "200000"))
PROGRAM = os.path.join(os.environ["KORVEX_BENCH"], "bench-logging-korvex")
PAGE = os.path.join(SOURCE, "docs/benchmarks/shipping.md")
TEXT = """# What one machine can ship

`./dev engines ship` writes this page. A program logs {lines:,} lines of
`%d{{ISO8601}} [%t] %-5p %c: %m%n` as fast as it can; rsyslog follows the file with `forward.conf` and
sends them through its queue on the disk to a second rsyslog on the same machine, with `collect.conf`.
Measured once, on {cores} cores of {cpu}, {system}.

| | Lines a second | CPU seconds for a million lines |
|---|---|---|
| the program, logging to its file | {logged:,.0f} | {logged_cpu:.2f} |
| rsyslog, from the file into the collector's | {shipped:,.0f} | {sent_cpu:.1f} |
| the collector | the same | {collected_cpu:.1f} |

While the collector is away, {bytes:,.0f} bytes of queue wait for a line of {size:.0f}.
"""


def processor_time(pid):
    """Seconds that the process has used."""
    with open("/proc/%d/stat" % pid) as file:
        fields = file.read().rsplit(")", 1)[1].split()
    return (int(fields[11]) + int(fields[12])) / os.sysconf("SC_CLK_TCK")


def processor():
    with open("/proc/cpuinfo") as file:
        names = [line.split(": ", 1)[1].strip() for line in file if line.startswith("model name")]
    return names[0] if names else platform.machine()


class Ship(Fleet):
    def test_what_one_machine_can_ship(self):
        log = self.file("log", "bench.log")
        os.makedirs(os.path.dirname(log))
        logged, logged_cpu = self.log(os.path.dirname(log))
        size = os.path.getsize(log)
        lines = self.count_lines(log)
        waiting = self.queue_of_some_lines()
        collector = self.start_collector()
        begin = time.monotonic()
        forwarder = self.start_forwarder("machine", log)
        eventually(lambda: self.count_lines(self.stream) >= lines, "all lines", 3600)
        shipped = lines / (time.monotonic() - begin)
        million = 1000000 / lines
        page = TEXT.format(
            lines=lines, cores=os.cpu_count(), cpu=processor(), system=platform.platform(),
            logged=logged, logged_cpu=logged_cpu * million, shipped=shipped,
            sent_cpu=processor_time(forwarder.pid) * million,
            collected_cpu=processor_time(collector.pid) * million, bytes=waiting,
            size=size / lines)
        with open(PAGE, "w") as file:
            file.write(page)
        print(page)

    def log(self, directory):
        """Lines a second, and CPU seconds."""
        before = resource.getrusage(resource.RUSAGE_CHILDREN)
        out = subprocess.run([PROGRAM, "dated", str(LINES)], cwd=directory, check=True,
                             capture_output=True, text=True).stdout
        after = resource.getrusage(resource.RUSAGE_CHILDREN)
        nanoseconds = float(dict(line.split("=") for line in out.split())["ns"])
        return 1e9 / nanoseconds, (after.ru_utime + after.ru_stime
                                   - before.ru_utime - before.ru_stime)

    def count_lines(self, path):
        if not os.path.exists(path):
            return 0
        return int(subprocess.run(["wc", "-l", path], check=True, capture_output=True,
                                  text=True).stdout.split()[0])

    def start_forwarder(self, name, log):
        work = self.file(name + "-work")
        os.makedirs(work)
        with open(os.path.join(FLEET, "forward.conf")) as file:
            text = file.read().replace("/opt/tallyd/var/log/tallyd.log", log)
        text = text.replace("/opt/tallyd", self.directory).replace("20514", str(self.port))
        return self.start_rsyslog(name, 'global(workDirectory="%s")\n%s' % (work, text))

    def queue_of_some_lines(self):
        """Bytes of queue a line, without a collector."""
        some = 1000
        subprocess.run("head -n %d log/bench.log > some.log" % some, shell=True, check=True,
                       cwd=self.directory)
        forwarder = self.start_forwarder("waiting", self.file("some.log"))

        def size():
            work = self.file("waiting-work")
            return sum(os.path.getsize(os.path.join(work, name)) for name in os.listdir(work)
                       if name.startswith("korvex_out.0"))
        last = -1
        while size() != last or last == 0:
            last = size()
            time.sleep(2)
        self.stop(forwarder)
        return last / some


if __name__ == "__main__":
    unittest.main()
