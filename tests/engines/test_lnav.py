"""lnav counts what was logged and gives it back, by the exported format definition."""

import collections
import csv
import io
import os
import re
import subprocess
import unittest

from harness import EngineTest, environment, layouts, program


class LnavTest(EngineTest):
    def setUp(self):
        super().setUp()
        self.lnav = program("lnav")

    def install(self, layout):
        self.configure(layout)
        os.makedirs(self.file("config/formats/korvex"), exist_ok=True)
        with open(self.file("config/formats/korvex/korvex.json"), "w") as file:
            file.write(self.export("lnav"))

    def run_lnav(self, *arguments):
        return subprocess.run([self.lnav, "-I", self.file("config"), *arguments],
                              capture_output=True, env=environment(HOME=self.directory))

    def query(self, sql):
        logs = [self.file(name) for name in os.listdir(self.directory) if name.startswith("app.log")]
        self.assertGreater(len(logs), 1, "the log was not rotated")
        result = self.run_lnav("-n", "-c", ";" + sql, "-c", ":write-csv-to -", *logs)
        self.assertEqual(result.stderr, b"")
        return list(csv.reader(io.StringIO(result.stdout.decode())))[1:]

    def test_the_format_and_its_samples_are_accepted(self):
        for layout in layouts():
            with self.subTest(layout):
                self.install(layout)
                result = self.run_lnav("-C")
                self.assertEqual((result.returncode, result.stderr.decode()), (0, ""))

    def test_it_counts_each_level_and_channel_and_gives_messages_back(self):
        for layout in layouts():
            with self.subTest(layout):
                self.remove_logs()
                self.install(layout)
                logged = self.log()
                expected = self.shown(logged, layout)
                self.check_counts(expected)
                self.check_messages(expected, [one.utc for one in logged])

    def remove_logs(self):
        for name in os.listdir(self.directory):
            if name.startswith("app.log"):
                os.remove(self.file(name))

    def check_counts(self, expected):
        channel = "channel" if expected[0].channel else "''"
        found = self.query("SELECT level, %s, count(*) FROM korvex_log GROUP BY 1, 2" % channel)
        counts = collections.Counter((one.level, one.channel or "") for one in expected)
        self.assertEqual({(row[0], row[1]): int(row[2]) for row in found}, counts)

    # Lines of one millisecond are in order within a file; of two files lnav may mix them.
    def check_messages(self, expected, instants):
        fields = [field for field in ("channel", "thread", "uptime_ms", "uptime_s")
                  if getattr(expected[0], field) is not None]
        rows = self.query("SELECT %s, log_time, hex(log_body), log_path FROM korvex_log "
                          "ORDER BY log_line" % ", ".join(["level", *fields]))
        oldest_first = sorted(rows, key=lambda row: -backup_number(row[-1]))
        if re.search(r"[,.][0-9]{3}", expected[0].time) is None:  # the layout has no milliseconds
            instants = [one[:-3] + "000" for one in instants]
        self.assert_same(
            [(*(value(field, text) for field, text in zip(fields, row[1:])), row[0], row[-3],
              bytes.fromhex(row[-2])) for row in oldest_first],
            [(*(getattr(one, field) for field in fields), one.level, instant, one.message)
             for one, instant in zip(expected, instants)])


def value(field, text):
    return int(text) if field.startswith("uptime") else text


def backup_number(path):
    end = path.rsplit(".", 1)[1]
    return 0 if end == "log" else int(end)


if __name__ == "__main__":
    unittest.main()
