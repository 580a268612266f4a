#!/usr/bin/env python3
# SPDX-License-Identifier: BSL-1.0
"""Puts small faults into the libraries, one at a time, and reports those that no test notices.

    mutate.py FOLDER COUNT SEED

FOLDER contains a clone of the project in `source`, with the build `source/build/linux-release`. Each
outcome is appended to `FOLDER/outcomes.jsonl`, so that a run that was stopped goes on where it was,
and one of a later commit judges only what has changed and what was not noticed.
Ends with 1 if a fault was not noticed that is not in equivalent.txt.
"""
import collections
import concurrent.futures
import contextlib
import hashlib
import json
import os
import pathlib
import re
import signal
import subprocess
import sys
import tempfile
import time

from choice import chosen

FOLDERS = ("componentManager", "objectIO", "componentTools")
TARGETS = ("mzManagerObjects", "MZobjectIO", "mzToolsObjects")
# Tests that compile, draw or read the tree. They take most of the time, and judge no behaviour.
# Nor those that are disabled, at which ctest would stop.
LEFT_OUT = (r"/(Package|Documentation|Compatibility|KitRefusal|Refusal|Client|Tree|Exports|Run|"
            r"KitListWriter|KitImportPolicyList)\.")
BUILD_LIMIT = 600
TEST_LIMIT = 600
# These look for the memory that a test frees, which depends on the tests before it: they are run one
# by one only.
NOT_TOGETHER = "--gtest_filter=-NewMemory.*"
# Test programs that run all their tests in one process within this time are tried first, in seconds:
# they notice most faults.
QUICK_LIMIT = 15


class Judge:
    def __init__(self, folder: pathlib.Path) -> None:
        self.source = folder / "source"
        self.build = self.source / "build/linux-release"
        self.objects = self.digests()
        self.quick = self.quick_programs()
        self.passes = self.passes_of_ctest()

    def quick_programs(self) -> list[pathlib.Path]:
        """Returns the test programs that pass as one process, the fastest first."""
        times = {}
        for folder in ("internals", "bin"):
            for program in (self.build / folder).glob("*Tests"):
                begin = time.monotonic()
                tested = self.run(QUICK_LIMIT, str(program), "--gtest_brief=1", NOT_TOGETHER)
                if tested is not None and not tested.returncode:
                    times[program] = time.monotonic() - begin
        return sorted(times, key=times.__getitem__)

    def passes_of_ctest(self) -> list[str]:
        """Returns the numbers of the tests that ctest runs, in ctest's format: first those that only
        it runs, then those of the quick programs, which seldom fail if they passed as one process.
        ctest numbers what its filter leaves."""
        listed = self.run(TEST_LIMIT, "ctest", "--show-only=json-v1", "-E", LEFT_OUT)
        if listed is None or listed.returncode:
            sys.exit("ctest does not list its tests")
        passes: tuple[list[int], list[int]] = ([], [])
        for number, test in enumerate(json.loads(listed.stdout)["tests"], 1):
            passes[pathlib.Path(test["command"][0]) in self.quick].append(number)
        # The first, the last and the step of a range, then single ones.
        return [",".join(map(str, (some[0], some[0], 1, *some))) + "\n" for some in passes if some]

    def digests(self) -> dict[pathlib.Path, str]:
        """Returns digests of the libraries' objects without debug symbols, which name columns."""
        found = {}
        with tempfile.NamedTemporaryFile() as stripped:
            for target in TARGETS:
                for file in self.build.glob(f"components/*/CMakeFiles/{target}.dir/**/*.o"):
                    subprocess.run(["objcopy", "--strip-debug", file, stripped.name], check=True)
                    content = pathlib.Path(stripped.name).read_bytes()
                    found[file] = hashlib.sha256(content).hexdigest()
        return found

    def run(self, limit: int, *command: str) -> subprocess.CompletedProcess[str] | None:
        """Runs a command in a session of its own, of which no process outlives it: a fault may
        leave one in an endless loop. Returns null if it did not end in time."""
        with subprocess.Popen(command, cwd=self.build, text=True, stdin=subprocess.DEVNULL,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                              start_new_session=True) as process:
            try:
                output, _ = process.communicate(timeout=limit)
                return subprocess.CompletedProcess(command, process.returncode, output)
            except subprocess.TimeoutExpired:
                return None
            finally:
                with contextlib.suppress(ProcessLookupError):
                    os.killpg(process.pid, signal.SIGKILL)

    def outcome(self, file: pathlib.Path, faulty: str) -> tuple[str, str]:
        """Returns what became of a fault, and the test that noticed it."""
        original = file.read_text(encoding="utf-8")
        try:
            file.write_text(faulty, encoding="utf-8")
            built = self.run(BUILD_LIMIT, "ninja", *TARGETS)
            if built is None or built.returncode:
                return "invalid", ""
            if self.digests() == self.objects:
                return "same object", ""
            built = self.run(BUILD_LIMIT, "ninja")
            if built is None or built.returncode:
                # Programs list their tests when they are built; a fault may keep them from that.
                return "noticed", "the build"
            failed = self.failed_quickly() or self.failed_test()
            return ("noticed", failed) if failed else ("not noticed", "")
        finally:
            file.write_text(original, encoding="utf-8")

    def failed_quickly(self) -> str:
        """Runs the quick programs up to the first that fails, one on each processor, and returns
        the name of the failed test."""
        with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as threads:
            running = [threads.submit(self.failed_in, program) for program in self.quick]
            for ended in concurrent.futures.as_completed(running):
                if ended.result():
                    threads.shutdown(wait=False, cancel_futures=True)
                    return ended.result()
        return ""

    def failed_in(self, program: pathlib.Path) -> str:
        """Runs a test program up to the first test that fails, and returns its name."""
        tested = self.run(4 * QUICK_LIMIT, str(program), "--gtest_brief=1", "--gtest_fail_fast",
                          NOT_TOGETHER)
        if tested is None:
            return f"the limit of time of {program.name}"
        if not tested.returncode:
            return ""
        failed = re.search(r"\[  FAILED  \] (\S+?),? ", tested.stdout)
        return failed.group(1) if failed else program.name

    def failed_test(self) -> str:
        """Runs the tests up to the first that fails, and returns its name; empty if all pass."""
        return next(filter(None, map(self.failed_of, self.passes)), "")

    def failed_of(self, numbers: str) -> str:
        """Runs tests up to the first that fails, and returns its name; empty if all pass."""
        with tempfile.NamedTemporaryFile("w", encoding="ascii") as file:
            file.write(numbers)
            file.flush()
            tested = self.run(TEST_LIMIT, "ctest", "-j4", "--stop-on-failure", "--timeout", "60",
                              "-E", LEFT_OUT, "-I", file.name)
        if tested is None:
            return "the limit of time"
        failed = re.search(r"Test +#\d+: (\S+).*\*\*\*(?!Skipped)", tested.stdout)
        if not tested.returncode:
            return ""
        return failed.group(1) if failed else "ctest"


def sources_in(top: pathlib.Path) -> list[str]:
    """Returns the sources that get faults: those that are compiled on Linux."""
    return [str(file.relative_to(top)) for folder in FOLDERS
            for file in sorted((top / "components" / folder).rglob("*.cpp"))
            if "windows" not in file.parts]


def outcomes_in(log: pathlib.Path, commit: str, equivalent: set[tuple[str, str, str]]
                ) -> dict[tuple[str, str, str, int], dict[str, str]]:
    """Returns what is known of each fault. What no test of another commit noticed may be noticed
    now, unless it is equivalent."""
    known = {}
    for line in log.read_text(encoding="utf-8").splitlines() if log.exists() else ():
        entry = json.loads(line)
        listed = (entry["file"], entry["old"], entry["new"]) in equivalent
        if entry["verdict"] != "not noticed" or entry["commit"] == commit or listed:
            known[entry["file"], entry["old"], entry["new"], entry["nth"]] = entry
    return known


def known_equivalents(file: pathlib.Path) -> set[tuple[str, str, str]]:
    """Returns the faults that change nothing: file, line and faulty line; the reason follows."""
    lines = [line for line in file.read_text(encoding="utf-8").splitlines()
             if line and not line.startswith("#")]
    return {tuple(part.strip() for part in line.split(" | ")[:3]) for line in lines}  # type: ignore


def main() -> int:
    folder, count, seed = pathlib.Path(sys.argv[1]), int(sys.argv[2]), int(sys.argv[3])
    judge = Judge(folder)
    failed = judge.failed_test()
    if failed:
        sys.exit(f"without any fault, {failed} fails")
    log = folder / "outcomes.jsonl"
    commit = subprocess.run(["git", "rev-parse", "HEAD"], cwd=judge.source, check=True, text=True,
                            stdout=subprocess.PIPE).stdout.strip()
    equivalent = known_equivalents(pathlib.Path(__file__).with_name("equivalent.txt"))
    known = outcomes_in(log, commit, equivalent)
    tally: collections.Counter[str] = collections.Counter()
    survivors = []
    choices = chosen(sources_in(judge.source), judge.source, count, seed)
    for number, choice in enumerate(choices, 1):
        file = judge.source / choice.file
        source = file.read_text(encoding="utf-8")
        line = choice.fault.line(source)
        entry = known.get((choice.file, choice.old, choice.new, choice.nth))
        if entry is None:
            begin = time.monotonic()
            verdict, test = judge.outcome(file, choice.fault.put_into(source))
            entry = {"file": choice.file, "line": line, "old": choice.old, "new": choice.new,
                     "nth": choice.nth, "kind": choice.fault.kind, "verdict": verdict,
                     "test": test, "commit": commit, "seconds": round(time.monotonic() - begin)}
            with log.open("a", encoding="utf-8") as output:
                output.write(json.dumps(entry) + "\n")
        verdict = entry["verdict"]
        if verdict == "not noticed":
            if (choice.file, choice.old, choice.new) in equivalent:
                verdict = "equivalent"
            else:
                survivors.append(entry)
        tally[verdict] += 1
        print(f"{number}/{count} {verdict:12} {choice.file}:{line} {entry['test']}", flush=True)
    meaningful = tally["noticed"] + tally["not noticed"]
    print(", ".join(f"{number} {verdict}" for verdict, number in sorted(tally.items())))
    print(f"noticed: {tally['noticed']} of {meaningful} that change behaviour")
    for entry in survivors:
        print(f"\n{entry['file']}:{entry['line']}\n  {entry['old']}\n  {entry['new']}")
    return 1 if survivors else 0


if __name__ == "__main__":
    sys.exit(main())
