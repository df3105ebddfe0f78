"""rsyslog follows a log that is rotated, and gives each message as a line of JSON."""

import os
import re
import unittest

from harness import ROOT, LIBRARY, EngineTest, Following, environment, program

MODULES = os.path.join(ROOT, "usr/lib", LIBRARY, "rsyslog")


class RsyslogTest(Following, EngineTest):
    READY = "pid"
    KEPT = ("pid", "work")

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

    def start_engine(self):
        modules = ["-M", MODULES] if os.path.isdir(MODULES) else []
        return self.start([self.rsyslogd, "-n", "-f", self.config(), "-i", self.file("pid"),
                           *modules], env=environment())


if __name__ == "__main__":
    unittest.main()
