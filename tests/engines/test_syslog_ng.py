"""syslog-ng follows a log that is rotated, and gives each message as a line of JSON."""

import glob
import json
import os
import re
import unittest

from harness import (COUNT, ROOT, EngineTest, entry_of, environment, eventually, layouts, lines_of,
                     program)

MODULES = glob.glob(os.path.join(ROOT, "usr/lib/syslog-ng/[0-9]*"))


class SyslogNgTest(EngineTest):
    def setUp(self):
        super().setUp()
        self.syslog_ng = program("syslog-ng")

    def config(self):
        """The exported configuration, whose JSON goes into a file, read from its beginning."""
        text, replaced = re.subn(r"    network\(.*?\);\n",
                                 '    file("%s" template("$MESSAGE\\\\n"));\n' % self.file("out.json"),
                                 self.export("syslog-ng"), flags=re.S)
        self.assertEqual(replaced, 1)
        return self.write("syslog-ng.conf", text)

    def start_syslog_ng(self):
        modules = ["--module-path", MODULES[0]] if MODULES else []
        return self.start([self.syslog_ng, "-F", "--no-caps", "-f", self.config(),
                           "--persist-file", self.file("persist"),
                           "--pidfile", self.file("pid"), "--control", self.file("ctl"),
                           *modules], env=environment())

    def entries(self):
        return [entry_of(json.loads(line.decode())) for line in lines_of(self.file("out.json"))]

    def clear(self):
        for name in os.listdir(self.directory):
            if name.startswith(("app.log", "out.json", "persist", "ctl")):
                os.remove(self.file(name))

    def check(self, layout, count=COUNT // 10, size=0, pause=0):
        self.clear()
        self.configure(layout, size)
        self.write("app.log", "")
        syslog_ng = self.start_syslog_ng()
        eventually(lambda: os.path.exists(self.file("ctl")), "syslog-ng's start")
        # It takes newlines and carriage returns off a message's end.
        expected = [one._replace(message=one.message.rstrip(b"\r\n"))
                    for one in self.shown(self.log(count, pause), layout)]
        if size:
            lost = self.last_of_backups()
            self.assertGreater(len(lost), 1)
            expected = [one for number, one in enumerate(expected) if number not in lost]
        eventually(lambda: len(lines_of(self.file("out.json"))) >= len(expected),
                   "all lines in the JSON", 60)
        self.stop(syslog_ng)
        self.assert_same(self.entries(), expected)

    def test_every_message_comes_as_json_in_order(self):
        for layout in layouts():
            with self.subTest(layout):
                self.check(layout)

    def test_of_a_log_that_is_rotated_it_loses_the_last_message_of_each_file(self):
        self.check(layouts()[0], count=10000, size=700000, pause=3000)


if __name__ == "__main__":
    unittest.main()
