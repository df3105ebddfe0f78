"""rsyslog follows a log that is rotated, and gives each message as a line of JSON."""

import json
import os
import re
import unittest

from harness import (COUNT, ROOT, LIBRARY, EngineTest, entry_of, environment, eventually, layouts,
                     lines_of, program)

MODULES = os.path.join(ROOT, "usr/lib", LIBRARY, "rsyslog")


class RsyslogTest(EngineTest):
    def setUp(self):
        super().setUp()
        self.rsyslogd = program("rsyslogd")

    def config(self):
        """The exported configuration, whose JSON goes into a file."""
        text, replaced = re.subn(r'action\(type="omfwd".*?\)\n',
                                 'action(type="omfile" file="%s" template="korvex_json")\n'
                                 % self.file("out.json"), self.export("rsyslog"), flags=re.S)
        self.assertEqual(replaced, 1)
        os.makedirs(self.file("work"), exist_ok=True)
        return self.write("rsyslog.conf", 'global(workDirectory="%s")\n' % self.file("work") + text)

    def start_rsyslog(self):
        modules = ["-M", MODULES] if os.path.isdir(MODULES) else []
        return self.start([self.rsyslogd, "-n", "-f", self.config(), "-i", self.file("pid"),
                           *modules], env=environment())

    def entries(self):
        return [entry_of(json.loads(line.decode())) for line in lines_of(self.file("out.json"))]

    def clear(self):
        for name in os.listdir(self.directory):
            if name.startswith(("app.log", "out.json")):
                os.remove(self.file(name))

    def check(self, layout, count=COUNT // 10, size=0, pause=0):
        self.clear()
        self.configure(layout, size)
        rsyslog = self.start_rsyslog()
        eventually(lambda: os.path.exists(self.file("pid")), "rsyslogd's start")
        expected = self.shown(self.log(count, pause), layout)
        if size:
            lost = self.last_of_backups()
            self.assertGreater(len(lost), 1)
            expected = [one for number, one in enumerate(expected) if number not in lost]
        eventually(lambda: len(lines_of(self.file("out.json"))) >= len(expected),
                   "all lines in the JSON", 60)
        self.stop(rsyslog)
        self.assert_same(self.entries(), expected)

    def test_every_message_comes_as_json_in_order(self):
        for layout in layouts():
            with self.subTest(layout):
                self.check(layout)

    def test_of_a_log_that_is_rotated_it_loses_the_last_message_of_each_file(self):
        self.check(layouts()[0], count=10000, size=700000, pause=3000)


if __name__ == "__main__":
    unittest.main()
