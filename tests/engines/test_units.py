"""systemd finds nothing wrong in the units of the examples."""

import glob
import os
import shutil
import subprocess
import unittest

from harness import SOURCE, EngineTest, environment, program

UNITS = sorted(glob.glob(os.path.join(SOURCE, "examples/daemon/system/*.service"))
               + glob.glob(os.path.join(SOURCE, "examples/fleet/system/tallyd*")))
PROGRAMS = ("opt/tallyd/bin/tallyd", "opt/tallyd/lib/records.py", "bin/kill")


class UnitsTest(EngineTest):
    def setUp(self):
        super().setUp()
        self.analyze = program("systemd-analyze")

    def test_the_units_are_accepted(self):
        self.assertEqual(len(UNITS), 4)
        shutil.copytree("/usr/lib/systemd/system", self.file("usr/lib/systemd/system"),
                        symlinks=True)
        os.makedirs(self.file("etc/systemd/system"))
        for unit in UNITS:
            shutil.copy(unit, self.file("etc/systemd/system"))
        for name in PROGRAMS:
            os.makedirs(os.path.dirname(self.file(name)), exist_ok=True)
            self.write(name, "#!/bin/sh\n")
            os.chmod(self.file(name), 0o755)
        result = subprocess.run([self.analyze, "verify", "--root=" + self.directory,
                                 *map(os.path.basename, UNITS)], capture_output=True, text=True,
                                env=environment())
        self.assertEqual((result.returncode, result.stdout + result.stderr), (0, ""))


if __name__ == "__main__":
    unittest.main()
