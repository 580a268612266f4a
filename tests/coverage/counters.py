# SPDX-License-Identifier: BSL-1.0
"""Reads what a build has counted.

gcovr of Debian 12 reads the text of gcov. There, a branch in a function that some program contains
and never calls is not marked as one that only an exception takes, so it would count as missed in each
line with a call. The JSON of gcov marks it. The result has gcovr's format, from which gcovr makes its
pages.
"""
import collections
import concurrent.futures
import json
import os
import pathlib
import subprocess
from typing import Iterator

FORMAT = "0.3"


def counted(file: pathlib.Path) -> list[dict]:
    """Returns the source files of one object."""
    output = subprocess.run(["gcov", "--branch-probabilities", "--branch-counts", "--json-format",
                             "--stdout", file], check=True, text=True, cwd=file.parent,
                            stdout=subprocess.PIPE, stderr=subprocess.DEVNULL).stdout
    return [source for text in output.splitlines() for source in json.loads(text)["files"]]


def all_counted(build: pathlib.Path) -> Iterator[dict]:
    with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as threads:
        for files in threads.map(counted, sorted(build.rglob("*.gcda"))):
            yield from files


def is_code(text: str) -> bool:
    """Returns whether a line has more than braces. What they have of branches is the compiler's."""
    return text.split("//")[0].strip().replace(" ", "") not in ("", "{", "}", "{}")


class Merged:
    """The counts of one source file in all objects. The instances of a template are counted as one,
    but apart from those that have more or fewer branches in a line."""

    def __init__(self) -> None:
        self.counts: collections.Counter[int] = collections.Counter()
        self.branches: dict[tuple[int, int], list[dict]] = {}

    def add(self, line: dict) -> None:
        # A process that ends inside a function can make counts of single calls negative.
        number, branches = line["line_number"], line["branches"]
        self.counts[number] += max(line["count"], 0)
        known = self.branches.setdefault((number, len(branches)), [
            {"count": 0, "fallthrough": branch["fallthrough"], "throw": branch["throw"]}
            for branch in branches])
        for sum_, branch in zip(known, branches):
            sum_["count"] += max(branch["count"], 0)

    def lines(self, texts: list[str]) -> list[dict]:
        """Returns the lines in gcovr's format, without branches that only exceptions take."""
        kept = collections.defaultdict(list)
        for (number, _), branches in sorted(self.branches.items()):
            if is_code(texts[number - 1]):
                kept[number] += [branch for branch in branches if not branch["throw"]]
        return [{"line_number": number, "count": count, "branches": kept[number],
                 "gcovr/excluded": False,
                 "gcovr/noncode": not count and not is_code(texts[number - 1])}
                for number, count in sorted(self.counts.items())]


def read_counters(source: pathlib.Path, build: pathlib.Path) -> dict:
    """Returns the counts of the files in `components`, in gcovr's format."""
    files: dict[pathlib.Path, Merged] = collections.defaultdict(Merged)
    for file in all_counted(build):
        path = pathlib.Path(os.path.normpath(build / file["file"]))
        if path.is_relative_to(source / "components"):
            for line in file["lines"]:
                files[path].add(line)
    return {"gcovr/format_version": FORMAT, "files": [
        {"file": str(path.relative_to(source)), "functions": [],
         "lines": merged.lines(path.read_text(encoding="utf-8").splitlines())}
        for path, merged in sorted(files.items())]}
