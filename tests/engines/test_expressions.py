"""The expressions that Fluent Bit, Vector, Loki and Logstash get, tried with expressions of their kinds:
RE2 and Oniguruma, as npm has them. Their configurations are read as YAML."""

import json
import os
import subprocess
import unittest

from harness import COUNT, SOURCE, EngineTest, entry_of, environment, layouts, program

MODULES = os.path.join(os.path.dirname(os.environ["KORVEX_ENGINES"]), "npm")
SCRIPT = os.path.join(SOURCE, "tests/engines/expressions.cjs")


class ExpressionsTest(EngineTest):
    def setUp(self):
        super().setUp()
        self.node = program("node")
        if not os.path.isdir(os.path.join(MODULES, "node_modules")):
            raise unittest.SkipTest("npm's packages are not there")

    def check(self, engine):
        for layout in layouts():
            with self.subTest(layout):
                self.configure(layout, size=0)
                if os.path.exists(self.file("app.log")):
                    os.remove(self.file("app.log"))
                expected = self.shown(self.log(COUNT // 50), layout)
                config = self.write("exported", self.export(engine))
                out = subprocess.run([self.node, SCRIPT, MODULES, engine, config,
                                      self.file("app.log")], capture_output=True,
                                     env=environment())
                self.assertEqual((out.returncode, out.stderr.decode()[-500:]), (0, ""))
                found = [json.loads(line) for line in out.stdout.split(b"\n")[:-1]]
                self.assert_same([entry_of(one) for one in found], expected)

    def test_fluent_bit(self):
        self.check("fluent-bit")

    def test_vector(self):
        self.check("vector")

    def test_loki(self):
        self.check("loki")

    def test_logstash(self):
        self.check("logstash")


if __name__ == "__main__":
    unittest.main()
