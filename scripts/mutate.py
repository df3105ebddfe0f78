#!/usr/bin/env python3
"""Breaks src/ in N places, one at a time, and tells which breakages no test notices.

Usage: mutate.py ROOT N

The places are drawn with a fixed seed from all that the rules below find, so that a run can be
repeated. Each is broken in a copy of the tree, which is built without optimisation and tested. The
survivors are held against tests/mutants-explained.txt, whose blocks look like this:

    src/util/Pathname/Pathname.cc
        if (a < b) => if (a <= b)
        why: The two are never equal here.

Fails when a survivor has no explanation, and when an explained one is killed or gone.
"""
import os
import queue
import random
import re
import shutil
import signal
import subprocess
import sys
import threading

SWAPS = {
    "==": "!=", "!=": "==", "<": "<=", "<=": "<", ">": ">=", ">=": ">", "&&": "||", "||": "&&",
    "+": "-", "-": "+", "*": "+", "/": "*", "%": "/", "+=": "-=", "-=": "+=", "|": "&", "&": "|",
    "++": "--", "--": "++", "true": "false", "false": "true", "break": "continue",
    "continue": "break",
}
# An operator stands between blanks (so templates, pointers and references are left alone).
OPERATOR = re.compile(r"(?<= )(==|!=|<=|>=|<|>|&&|\|\||\+=|-=|[-+*/%|&])(?= )|\+\+|--|"
                      r"\b(?:true|false|break|continue)\b")
NUMBER = re.compile(r"(?<![\w.'\\])\d+(?![\w.'])")
CONDITION = re.compile(r"^(\s*(?:\} else )?(?:if|while) )\((?!const )(.*)\)( \{| [^ ].*;)$")
STATEMENT = re.compile(r"^\s+(?!return\b|const |using |static |case |auto |throw |else|#|//|\}|:|,)"
                       r"[\w:.>\[\]*&-]+(?:\(.*\)| [-+|&]?= .*|\+\+);$")
TEXT = re.compile(r'"(?:[^"\\]|\\.)*"|\'(?:[^\'\\]|\\.)+\'|//.*')

LEFT_OUT = "Tallyd*"  # starts daemons, which outlive a test that is ended from outside
SLOW = "*Crash*:*Stress*:*Sweep*:*Safety*:*ATransferBeyondIntMax*"


def blanked(line):
    """The line with the contents of texts and comments masked, at the same columns."""
    return TEXT.sub(lambda m: "\1" * len(m.group()), line)


def mutations_of(line):
    code = blanked(line)
    if not code.strip() or code.lstrip().startswith(("#", "static_assert", "template", "using")):
        return
    for match in OPERATOR.finditer(code):
        yield line[:match.start()] + SWAPS[match.group()] + line[match.end():]
    for match in NUMBER.finditer(code):
        yield line[:match.start()] + str(int(match.group()) + 1) + line[match.end():]
    match = CONDITION.match(code)
    if match and match.group(2).count("(") == match.group(2).count(")") and ";" not in match.group(2):
        yield "%s(!(%s))%s" % (line[:match.end(1)], line[match.start(2):match.end(2)],
                               line[match.end(2) + 1:])
    if STATEMENT.match(code):
        yield re.match(r"\s*", line).group() + ";"


def sites(root):
    files = subprocess.run(["git", "ls-files", "src/*.cc"], cwd=root, check=True,
                           capture_output=True, text=True).stdout.split()
    for file in sorted(files):
        with open(os.path.join(root, file), encoding="utf-8") as source:
            for number, line in enumerate(source.read().split("\n")):
                for mutant in mutations_of(line):
                    yield file, number, line, mutant


def describe(site):
    return site[0], "%s => %s" % (site[2].strip(), site[3].strip())


class Worker:
    """A copy of the tree with its own build."""

    def __init__(self, root, folder):
        self.tree = folder
        shutil.rmtree(folder, ignore_errors=True)
        os.makedirs(folder)
        files = subprocess.run(["git", "ls-files", "-z"], cwd=root, check=True, capture_output=True)
        pack = subprocess.run(["tar", "-c", "--null", "-T", "-"], cwd=root, check=True,
                              input=files.stdout, capture_output=True)
        subprocess.run(["tar", "-x"], cwd=folder, input=pack.stdout, check=True)
        self.command(["cmake", "-G", "Ninja", "-S", ".", "-B", "build", "-DCMAKE_BUILD_TYPE=None",
                      "-DCMAKE_CXX_FLAGS=-O0"], 600)
        if self.build(3600) != 0 or self.test("*") != 0:
            sys.exit("mutate: the unbroken tree does not pass")

    def command(self, arguments, seconds):
        """The exit status; a number of its own when time is up, as it is in an endless loop."""
        process = subprocess.Popen(arguments, cwd=self.tree, start_new_session=True,
                                   stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL,
                                   stdin=subprocess.DEVNULL)
        try:
            return process.wait(seconds)
        except subprocess.TimeoutExpired:
            return 1000
        finally:
            try:
                os.killpg(process.pid, signal.SIGKILL)
            except ProcessLookupError:
                pass
            process.wait()

    def build(self, seconds=300):
        return self.command(["ninja", "-C", "build", "-j1", "korvex-tests", "korvex-records"],
                            seconds)

    def test(self, which):
        # A broken loop may ask for all there is.
        limited = 'ulimit -v 16000000; exec build/tests/korvex-tests --gtest_fail_fast "$0"'
        return self.command(["bash", "-c", limited, "--gtest_filter=" + which],
                            60 if which.startswith("-") else 240)

    def verdict(self, site):
        file, number, line, mutant = site
        path = os.path.join(self.tree, file)
        with open(path, encoding="utf-8") as source:
            original = source.read()
        lines = original.split("\n")
        assert lines[number] == line
        lines[number] = mutant
        try:
            with open(path, "w", encoding="utf-8") as source:
                source.write("\n".join(lines))
            if self.build() != 0:
                return "refused"
            if self.test("-" + SLOW + ":" + LEFT_OUT) != 0 or self.test(SLOW) != 0:
                return "killed"
            return "survived"
        finally:
            with open(path, "w", encoding="utf-8") as source:
                source.write(original)


def judge_all(root, chosen, wanted, workers):
    """Judges sites in their order until `wanted` of them could be built."""
    results, places = {}, queue.SimpleQueue()
    for index in range(len(chosen)):
        places.put(index)
    guard = threading.Lock()

    def built():
        return sum(1 for v in results.values() if v != "refused")

    def work(number):
        worker = Worker(root, os.path.join(root, "build", "mutate", str(number)))
        while not places.empty():
            with guard:
                if built() >= wanted:
                    return
            index = places.get()
            verdict = worker.verdict(chosen[index])
            with guard:
                results[index] = verdict
                if verdict == "survived":
                    print("survived: %s:%u: %s" % (chosen[index][0], chosen[index][1] + 1,
                                                   describe(chosen[index])[1]), flush=True)

    threads = [threading.Thread(target=work, args=(n,)) for n in range(workers)]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    return results


def read_explanations(path):
    entries, file, pending = {}, None, []
    with open(path, encoding="utf-8") as stream:
        for raw in stream:
            line = raw.strip()
            if not line or line.startswith("#"):
                continue
            if not raw[0].isspace():
                file = line
            elif line.startswith("why: "):
                entries.update({key: line[5:] for key in pending})
                pending = []
            else:
                pending.append((file, line))
    if pending:
        sys.exit("%s: no reason for %s" % (path, pending[0]))
    return entries


def main():
    root, wanted = os.path.realpath(sys.argv[1]), int(sys.argv[2])
    explained = read_explanations(os.path.join(root, "tests", "mutants-explained.txt"))
    found = list(sites(root))
    chosen = list(found)
    random.Random(1).shuffle(chosen)
    results = judge_all(root, chosen, wanted, os.cpu_count() or 1)

    survivors = {describe(chosen[i]) for i, v in results.items() if v == "survived"}
    killed = sum(1 for v in results.values() if v == "killed")
    count = sum(1 for v in results.values() if v == "survived")
    left = survivors - set(explained)
    judged = {describe(chosen[i]) for i, v in results.items() if v == "killed"}
    stale = (set(explained) & judged) - survivors | set(explained) - {describe(s) for s in found}
    print("mutants: %u of %u places tried: %u killed, %u survived, %u of them explained"
          % (killed + count, len(found), killed, count, count - sum(
              1 for i, v in results.items() if v == "survived" and describe(chosen[i]) in left)))
    for file, text in sorted(stale):
        print("explained, but killed or gone: %s: %s" % (file, text))
    sys.exit(1 if left or stale else 0)


main()
