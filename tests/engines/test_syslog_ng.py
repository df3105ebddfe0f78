"""syslog-ng follows a log that is rotated, and gives each message as a line of JSON."""

import glob
import os
import re
import unittest

from harness import ROOT, EngineTest, Following, environment, program

MODULES = glob.glob(os.path.join(ROOT, "usr/lib/syslog-ng/[0-9]*"))


class SyslogNgTest(Following, EngineTest):
    READY = "ctl"
    KEPT = ("persist", "pid", "ctl")

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

    def start_engine(self):
        modules = ["--module-path", MODULES[0]] if MODULES else []
        return self.start([self.syslog_ng, "-F", "--no-caps", "-f", self.config(),
                           "--persist-file", self.file("persist"),
                           "--pidfile", self.file("pid"), "--control", self.file("ctl"),
                           *modules], env=environment())

    def given(self, entry):
        """It takes newlines and carriage returns off a message's end."""
        return entry._replace(message=entry.message.rstrip(b"\r\n"))


if __name__ == "__main__":
    unittest.main()
