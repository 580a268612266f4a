#!/usr/bin/env python3
# SPDX-License-Identifier: BSL-1.0
"""Reports which lines and branches of the libraries the tests reached.

    report.py SOURCE BUILD OUTPUT [--write]

BUILD contains the counters, and OUTPUT gets the pages that show each line. Ends with 1 if a library
is below its figures in thresholds.txt, or if unreached.txt does not name exactly the lines that were
not reached. `--write` adds the missing lines to unreached.txt, without reasons.
"""
import collections
import json
import pathlib
import subprocess
import sys

from counters import read_counters

# The core is a library like the others. Its branches must all be reached or listed.
CORE = "componentManager"
TOTAL = "components"


def measure(source: pathlib.Path, build: pathlib.Path, output: pathlib.Path) -> list[dict]:
    """Returns the files that were counted. gcovr writes the pages."""
    output.mkdir(parents=True, exist_ok=True)
    counted = output / "coverage.json"
    counters = read_counters(source, build)
    counted.write_text(json.dumps(counters))
    subprocess.run(
        ["gcovr", "--root", source, "--add-tracefile", counted, "--html-details",
         output / "index.html", "--html-title", "Coverage of the libraries"],
        check=True, cwd=source, stderr=(output / "gcovr.log").open("w"))
    return counters["files"]


class Figures:
    """Counts of one library."""

    def __init__(self) -> None:
        self.lines = self.reached = self.branches = self.taken = 0

    def add(self, line: dict) -> None:
        self.lines += 1
        self.reached += line["count"] > 0
        self.branches += len(line["branches"])
        self.taken += sum(branch["count"] > 0 for branch in line["branches"])

    def percents(self) -> tuple[float, float]:
        return (100 * self.reached / max(self.lines, 1), 100 * self.taken / max(self.branches, 1))


def code_lines(file: dict) -> list[dict]:
    return [line for line in file["lines"] if not line.get("gcovr/noncode")]


def figures(files: list[dict]) -> dict[str, Figures]:
    counts: dict[str, Figures] = collections.defaultdict(Figures)
    for file in files:
        library = file["file"].split("/")[1]
        for line in code_lines(file):
            counts[library].add(line)
            counts[TOTAL].add(line)
    return counts


def compare(counts: dict[str, Figures], file: pathlib.Path) -> list[str]:
    """Prints the figures. Returns those that are below the thresholds."""
    faults = []
    thresholds = {}
    for entry in file.read_text().splitlines():
        if entry and not entry.startswith("#"):
            library, *numbers = entry.split()
            thresholds[library] = tuple(float(number) for number in numbers)
    for library in sorted(counts, key=lambda name: (name == TOTAL, name)):
        lines, branches = counts[library].percents()
        print(f"    {library:17} lines {lines:6.2f} % of {counts[library].lines:5}"
              f"   branches {branches:6.2f} % of {counts[library].branches:5}")
        if library not in thresholds:
            faults.append(f"{library} has no thresholds in {file.name}")
        for what, percent, least in zip(("lines", "branches"), (lines, branches),
                                        thresholds.get(library, ())):
            if percent < least:
                faults.append(f"{library}: {percent:.2f} % of its {what}, less than {least} %")
    return faults + [f"{library} in {file.name} was not measured"
                     for library in thresholds if library not in counts]


def unreached(files: list[dict], source: pathlib.Path) -> collections.Counter:
    """Returns the file, the kind and the text of each line that was not reached, or in the core one
    of whose branches was not taken, and how often such a text is in the file."""
    found = collections.Counter()
    for file in files:
        texts = (source / file["file"]).read_text().splitlines()
        for line in code_lines(file):
            text = texts[line["line_number"] - 1].strip()
            if not line["count"]:
                found[file["file"], "line", text] += 1
            elif file["file"].split("/")[1] == CORE:
                missed = sum(not branch["count"] for branch in line["branches"])
                if missed:
                    found[file["file"], "branch", text] += missed
    return found


def listed(file: pathlib.Path) -> tuple[collections.Counter, list[str]]:
    """Returns the entries of unreached.txt, and those without a reason."""
    entries = collections.Counter()
    faults = []
    for entry in file.read_text().splitlines():
        if not entry or entry.startswith("#"):
            continue
        name, kind, count, rest = entry.split(" | ", 3)
        text, _, reason = rest.rpartition(" | ")
        entries[name, kind, text] += int(count)
        if not reason.strip() or reason == "?":
            faults.append(f"no reason: {name}: {text}")
    return entries, faults


def check_list(found: collections.Counter, file: pathlib.Path, write: bool) -> list[str]:
    entries, faults = listed(file)
    new = found - entries
    if write:
        with file.open("a") as target:
            for (name, kind, text), count in sorted(new.items()):
                target.write(f"{name} | {kind} | {count} | {text} | ?\n")
    for (name, kind, text), count in sorted(new.items()):
        faults.append(f"{name}: not reached and not listed ({kind}, {count}): {text}")
    for name, kind, text in sorted(entries - found):
        # What only some runs reach may be listed.
        print(f"    reached now, though listed: {name} ({kind}): {text}")
    return faults


def main() -> int:
    source, build, output = (pathlib.Path(argument).resolve() for argument in sys.argv[1:4])
    here = pathlib.Path(__file__).parent
    files = measure(source, build, output)
    faults = compare(figures(files), here / "thresholds.txt")
    faults += check_list(unreached(files, source), here / "unreached.txt", "--write" in sys.argv)
    print(f"    each line: {output / 'index.html'}")
    for fault in faults:
        print("failed:", fault, file=sys.stderr)
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
