#!/usr/bin/env python3
"""Prints what the exports of llvm-cov say of src/ and include/, and holds it against the exemptions.

Usage: coverage-report.py ROOT EXEMPTIONS EXPORT.json...

Fails when a line or a branch is not covered and not exempt, and when an exempt one is
covered after all. The exemptions are blocks like this one:

    src/util/Pathname/FileSystem.cc
        never true: off != length
        lines from: errno = EFBIG;
        why: off_t has 64 bits here.

"never true" and "never false" name one branch by its condition (inside a macro: by the whole source
line), "lines from" an unbroken run of lines that never run by its first one, "no effect" a condition
that MC/DC never sees decide. Texts, not line numbers, so that edits elsewhere do no harm.
"""
import json
import os
import sys

KINDS = ("never true", "never false", "lines from", "no effect")


class File:
    """One source file: counts by line, by branch outcome and by condition, added over programs."""

    def __init__(self, path, name):
        self.name = name
        with open(path, encoding="utf-8") as source:
            self.text = source.read().split("\n")
        self.lines, self.branches, self.conditions = {}, {}, {}

    def code(self, l1, c1, l2, c2):
        """The source text of a region, on one line."""
        if l1 == l2:
            return self.text[l1 - 1][c1 - 1:c2 - 1].strip()
        parts = [self.text[l1 - 1][c1 - 1:], *self.text[l1:l2 - 1], self.text[l2 - 1][:c2 - 1]]
        return " ".join(part.strip() for part in parts)

    def line(self, number):
        return self.text[number - 1].strip()

    def add_lines(self, segments):
        """What llvm-cov does too: a line's count is the largest of the regions that touch it."""
        wrapped, at = None, 0
        for number in range(segments[0][0], segments[-1][0] + 1 if segments else 0):
            here = []
            while at < len(segments) and segments[at][0] == number:
                here.append(segments[at])
                at += 1
            # A segment: line, column, count, has a count, begins a region, is a gap.
            starts = [s for s in here if s[3] and s[4] and not s[5]]
            skipped = here and not here[0][3] and here[0][4]
            covers = wrapped is not None and wrapped[3]
            if starts or (covers and not skipped):
                count = max([s[2] for s in starts] + [wrapped[2] if covers else 0])
                self.lines[number] = self.lines.get(number, 0) + count
            wrapped = here[-1] if here else wrapped

    def add_branch(self, key, line, text, taken, not_taken):
        for outcome, count in (("never true", taken), ("never false", not_taken)):
            old = self.branches.get((key, outcome), (line, text, 0))[2]
            self.branches[key, outcome] = (line, text, old + count)

    def add(self, entry):
        if entry["segments"]:
            self.add_lines(entry["segments"])
        for l1, c1, l2, c2, taken, not_taken, *_ in entry["branches"]:
            self.add_branch((l1, c1, l2, c2), l1, self.code(l1, c1, l2, c2), taken, not_taken)
        for expansion in entry["expansions"]:
            line, column = expansion["source_region"][:2]
            for branch in expansion["branches"]:
                key = (line, column, *branch[:4])
                self.add_branch(key, line, self.line(line), *branch[4:6])
        for record in entry.get("mcdc_records", []):
            l1, c1, l2, c2 = record[:4]
            for number, shown in enumerate(record[-1]):
                key = (l1, c1, l2, c2, number)
                self.conditions[key] = self.conditions.get(key, False) or shown

    def gaps(self):
        """(line, kind, text) for all that is missing, in the order of the file."""
        missing = []
        numbers = sorted(n for n, count in self.lines.items() if count == 0)
        for n in numbers:
            if n - 1 not in numbers:
                missing.append((n, "lines from", self.line(n)))
        for (_, outcome), (line, text, count) in self.branches.items():
            if count == 0:
                missing.append((line, outcome, text))
        for (l1, c1, l2, c2, number), shown in self.conditions.items():
            if not shown:
                text = "condition %d of %s" % (number + 1, self.code(l1, c1, l2, c2))
                missing.append((l1, "no effect", text))
        return sorted(missing)


def read_exports(root, exports):
    files = {}
    root = os.path.realpath(root)
    prefixes = tuple(os.path.join(root, folder, "") for folder in ("src", "include"))
    for export in exports:
        with open(export, encoding="utf-8") as stream:
            entries = json.load(stream)["data"][0]["files"]
        for entry in entries:
            path = os.path.realpath(entry["filename"])
            if path.startswith(prefixes):
                name = os.path.relpath(path, root)
                files.setdefault(name, File(path, name)).add(entry)
    return [files[name] for name in sorted(files)]


def read_exemptions(path):
    """A list of [file, kind, text, reason], one for each gap that is let pass."""
    entries, file, without_reason = [], None, []
    with open(path, encoding="utf-8") as stream:
        for number, raw in enumerate(stream, 1):
            line = raw.strip()
            if not line or line.startswith("#"):
                continue
            kind, _, text = line.partition(": ")
            if not raw[0].isspace():
                file = line
            elif kind == "why":
                for entry in without_reason:
                    entry[3] = text
                without_reason = []
            elif kind in KINDS:
                entries.append([file, kind, text, None])
                without_reason.append(entries[-1])
            else:
                sys.exit("%s:%u: what is this?" % (path, number))
    if without_reason:
        sys.exit("%s: exempt without a reason: %s" % (path, without_reason[0][:3]))
    return entries


def share(total, missing):
    return "%.1f %% of %u" % (100.0 * (total - missing) / total, total) if total else "none"


def report(files, exemptions, measures_conditions):
    totals = {"lines": [0, 0], "branches": [0, 0], "MC/DC": [0, 0]}
    failures, exempt_lines = 0, {"lines": 0, "branches": 0, "MC/DC": 0}
    left = list(exemptions)
    for file in files:
        missing = {
            "lines": sum(1 for count in file.lines.values() if count == 0),
            "branches": sum(1 for _, _, count in file.branches.values() if count == 0),
            "MC/DC": sum(1 for shown in file.conditions.values() if not shown),
        }
        sizes = {"lines": len(file.lines), "branches": len(file.branches),
                 "MC/DC": len(file.conditions)}
        for what in totals:
            totals[what][0] += sizes[what]
            totals[what][1] += missing[what]
        gaps = file.gaps()
        if gaps:
            print("%s: %s" % (file.name, ", ".join(
                "%s %s" % (what, share(sizes[what], missing[what])) for what in totals)))
        for line, kind, text in gaps:
            match = next((e for e in left if e[:3] == [file.name, kind, text]), None)
            if match:
                left.remove(match)
                print("  %4u  (exempt) %s: %s" % (line, kind, text))
            else:
                failures += 1
                print("  %4u  %s: %s" % (line, kind, text))
                continue
            what = {"lines from": "lines", "no effect": "MC/DC"}.get(kind, "branches")
            run = 1
            while what == "lines" and file.lines.get(line + run) == 0:
                run += 1
            exempt_lines[what] += run
    print()
    for what, (total, missing) in totals.items():
        if total:
            print("%-9s %s; of the reachable %s (%u exempt)" % (
                what, share(total, missing),
                share(total - exempt_lines[what], missing - exempt_lines[what]),
                exempt_lines[what]))
    for file, kind, text, _ in left:
        if kind == "no effect" and not measures_conditions:
            continue
        failures += 1
        print("exempt, but covered or gone: %s: %s: %s" % (file, kind, text))
    return failures


def main():
    root, exemptions, *exports = sys.argv[1:]
    files = read_exports(root, exports)
    measures_conditions = any(file.conditions for file in files)
    failures = report(files, read_exemptions(exemptions), measures_conditions)
    if failures:
        sys.exit("coverage: %u gaps or stale exemptions" % failures)


main()
