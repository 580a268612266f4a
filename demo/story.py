#!/usr/bin/env python3
# SPDX-License-Identifier: BSL-1.0
"""The demonstration: story.py BUILD PLATFORM… -- FILE…

Runs the programs of BUILD/linux-release and BUILD/windows-release (under Wine), tells what they did,
and leaves a page in BUILD/demo. All output of the programs goes to BUILD/log/demo.log. What fails is
said at once; the rest of the story is told nevertheless.
"""
import json
import re
import shutil
import subprocess
import sys
from pathlib import Path

from page import Page

SOURCE = Path(__file__).resolve().parent.parent
SHOWN = 15  # rows of the table

MESH = re.compile(r"(.*): (.+), (\d+) vertices, (\d+) faces, box \((.*)\) to \((.*)\)$")
SAVED = re.compile(r"  saved: (\d+) bytes in binary, (\d+) as text; both were read back and are equal$")
LOADED = re.compile(r"(After [\w ]+): (\d+) component librar(?:y is|ies are) loaded$")


class Failed(Exception):
    """A part of the story that did not happen. The text is for the user."""


class Log:
    """Everything that the programs print."""

    def __init__(self, file: Path) -> None:
        self.file = file
        file.parent.mkdir(parents=True, exist_ok=True)
        file.write_text("", encoding="utf-8")

    def add(self, command: list[str], result: subprocess.CompletedProcess) -> None:
        with self.file.open("a", encoding="utf-8") as log:
            log.write(f"$ {' '.join(command)}\n{result.stdout}{result.stderr}"
                      f"[exit status {result.returncode}]\n\n")


class Platform:
    """One system, with its programs and its folder of results."""

    def __init__(self, name: str, build: Path, log: Log) -> None:
        windows = name == "Windows"
        self.name = name
        self.log = log
        self.tree = build / f"{name.lower()}-release"
        self.starter = [str(SOURCE / "cmake/wine-run")] if windows else []
        self.extension = ".exe" if windows else ""
        self.library = ".dll" if windows else ".so"
        self.folder = build / "demo" / name
        self.folder.mkdir(parents=True)

    def run(self, program: str, *arguments: object) -> subprocess.CompletedProcess:
        command = self.starter + [str(self.tree / "bin" / (program + self.extension))]
        command += [str(argument) for argument in arguments]
        result = subprocess.run(command, capture_output=True, cwd=SOURCE, stdin=subprocess.DEVNULL,
                                encoding="utf-8", errors="replace", check=False)
        self.log.add(command, result)
        return result

    def components(self) -> Path:
        return self.tree / "components" / "mesh"


def say(text: str = "") -> None:
    print(text, flush=True)


def counted(count: int, one: str, several: str) -> str:
    return f"{count} {one if count == 1 else several}"


def loaded(output: str) -> dict[str, int]:
    """Returns how many libraries were loaded, by the moment."""
    return {match[1]: int(match[2]) for match in map(LOADED.match, output.splitlines()) if match}


def builders(output: str) -> list[str]:
    """Returns the builders that a host listed, without the labels that only a loaded library has."""
    listed = re.search(r"^Builders:\n((?:  .*\n)*)", output, re.M)
    return [line.split(", from ")[0].strip() for line in listed[1].splitlines()] if listed else []


class Import:
    """One imported file, as a host described it."""

    def __init__(self, match: re.Match, saved: re.Match | None) -> None:
        self.name = Path(match[1]).name
        self.line = match[0]
        self.builder, self.vertices, self.faces = match[2], match[3], match[4]
        low, high = ([float(number) for number in text.split(", ")] for text in (match[5], match[6]))
        self.box = " × ".join(f"{h - l:.4g}" for l, h in zip(low, high))
        self.saved = f"{int(saved[1]) + int(saved[2]):,} bytes" if saved else "no"

    def cells(self) -> list[str]:
        return [self.name, self.builder, self.vertices, self.faces, self.box, self.saved]


def imports_of(output: str) -> list[Import]:
    lines = output.splitlines()
    found = []
    for line, following in zip(lines, lines[1:] + [""]):
        if match := MESH.match(line):
            found.append(Import(match, SAVED.match(following)))
    return found


class Story:
    def __init__(self, build: Path, platforms: list[str], files: list[str]) -> None:
        self.log = Log(build / "log" / "demo.log")
        self.folder = build / "demo"
        shutil.rmtree(self.folder, ignore_errors=True)
        self.platforms = [Platform(name, build, self.log) for name in platforms]
        self.files = files
        self.outputs: dict[str, str] = {}
        self.imports: list[Import] = []
        self.page = Page()
        self.failures: list[str] = []

    def tell(self) -> bool:
        for chapter in (self.first_start, self.second_start, self.exchange, self.crash, self.drawing):
            try:
                chapter()
            except Failed as failure:
                self.failures.append(str(failure))
                say(f"failed: {failure}")
        say(f"The page: {self.relative(self.folder / 'index.html')};"
            f" all that was printed: {self.relative(self.log.file)}")
        if self.failures:
            say(f"Demo failed: {self.failures[0]}")
        else:
            names = " and ".join(platform.name for platform in self.platforms)
            say(f"Demo passed: {counted(len(self.imports), 'file was', 'files were')} imported, saved"
                f" and read back on {names}")
        return not self.failures

    @staticmethod
    def relative(path: Path) -> Path:
        return path.relative_to(SOURCE) if path.is_relative_to(SOURCE) else path

    def first_start(self) -> None:
        """The host loads all components and imports each file through the one that can read it."""
        failed = []
        for platform in self.platforms:
            result = platform.run("meshHost", "--list", platform.folder / "recorded.list", "--save",
                                  platform.folder / "saved", "--draw", platform.folder / "drawn",
                                  *self.files)
            self.outputs[platform.name] = result.stdout
            if result.returncode != 0:
                said = result.stderr.strip().splitlines() or [f"exit status {result.returncode}"]
                failed.append(f"{platform.name}: {'; '.join(said[:3])}")
        first = self.outputs[self.platforms[0].name]
        count = loaded(first).get("After a start without a recorded list", 0)
        self.imports = imports_of(first)
        say(f"A host starts, loads {counted(count, 'component library', 'component libraries')} with"
            f" {counted(len(builders(first)), 'builder', 'builders')}, and imports"
            f" {counted(len(self.imports), 'file', 'files')} through them:")
        self.table()
        if failed:
            raise Failed("; ".join(failed))
        for platform in self.platforms[1:]:
            if self.outputs[platform.name] != first:
                raise Failed(f"{platform.name} printed something else than {self.platforms[0].name}")

    def table(self) -> None:
        others = {p.name: {i.line: i for i in imports_of(self.outputs[p.name])} for p in self.platforms}

        def agreement(platform: Platform, item: Import) -> str:
            same = others[platform.name].get(item.line)
            return "yes" if same and same.cells() == item.cells() and same.saved != "no" else "NO"

        names = [platform.name for platform in self.platforms]
        head = ["file", "builder", "vertices", "faces", "box", "saved, read back", *names]
        rows = [item.cells() + [agreement(p, item) for p in self.platforms] for item in self.imports]
        self.page.table("Imported files", head, rows)
        widths = [max(len(row[column]) for row in [head, *rows]) for column in range(len(head))]
        for row in [head, *rows[:SHOWN]]:
            say("  " + "  ".join(cell.ljust(width) for cell, width in zip(row, widths)).rstrip())
        if len(rows) > SHOWN:
            say(f"  … and {len(rows) - SHOWN} more, on the page")
        scene = re.search(r"^All together: (.*)$", self.outputs[names[0]], re.M)
        if scene:
            say(f"  all together: {scene[1]}, saved and read back with what it shares")

    def second_start(self) -> None:
        """The host starts with what the first start recorded, and loads nothing."""
        for platform in self.platforms:
            output = platform.run("meshHost", "--list", platform.folder / "recorded.list").stdout
            counts = loaded(output)
            if builders(output) != builders(self.outputs[platform.name]) or not builders(output):
                raise Failed(f"the second start on {platform.name} lists other builders")
            if counts.get("After a start with the recorded list") != 0 or \
                    counts.get("After the first object was made") != 1:
                raise Failed(f"the second start on {platform.name} loaded what it need not")
        say("The second start, with the list that the first one wrote: the same builders, no library"
            " loaded; the first object loads one.")

    def exchange(self) -> None:
        """Each platform reads what the other one saved; the files are the same byte for byte."""
        if len(self.platforms) < 2:
            return
        first, second = self.platforms
        for reader, writer in ((first, second), (second, first)):
            result = reader.run("meshHost", "--load", writer.folder / "saved")
            if result.returncode != 0:
                raise Failed(f"{reader.name} cannot read what {writer.name} saved")
        for kind in ("saved", "drawn"):
            names = sorted(file.name for file in (first.folder / kind).iterdir())
            if names != sorted(file.name for file in (second.folder / kind).iterdir()):
                raise Failed(f"{first.name} and {second.name} wrote other files")
            for name in names:
                if (first.folder / kind / name).read_bytes() != (second.folder / kind / name).read_bytes():
                    raise Failed(f"{name} is not the same on {first.name} and {second.name}")
        count = len(list((first.folder / "saved").iterdir()))
        say(f"Each platform reads what the other one saved; all {count} files are the same, byte for byte.")

    def crash(self) -> None:
        """A component that crashes while it is loaded: the scan finds it, the host goes without it."""
        said = []
        for platform in self.platforms:
            folder = platform.folder / "with a crash"
            shutil.copytree(platform.components(), folder)
            shutil.copy(platform.tree / "components" / "demo" / f"crashing{platform.library}", folder)
            scan_list = platform.folder / "scan.list"
            scan = platform.run("mzcomponents", "scan", "--json", "--path", folder, "--cache", scan_list)
            try:
                files = json.loads(scan.stdout)["files"]
            except (ValueError, KeyError) as failure:
                raise Failed(f"the scan on {platform.name} gave no result: {failure}") from None
            bad = [file for file in files if file["verdict"] != "works"]
            if [re.split(r"[\\/]", file["file"])[-1] for file in bad] != [f"crashing{platform.library}"]:
                raise Failed(f"the scan on {platform.name} does not single out the crash")
            host = platform.run("meshHost", "--components", folder, "--list", scan_list)
            if host.returncode != 0 or builders(host.stdout) != builders(self.outputs[platform.name]):
                raise Failed(f"the host on {platform.name} does not start without the crash")
            said.append(f"  {platform.name}: {bad[0]['sentence']}")
        say("A component that crashes while it loads is added. The scan, which loads each library in a"
            " process of its own:")
        for line in said:
            say(line)
        say("With the list of the scan, the host starts without it and lists the same builders.")

    def drawing(self) -> None:
        """The page."""
        platform = self.platforms[0]
        folder = platform.folder
        graph, first, listed = (folder / f"{name}.svg" for name in ("graph", "first", "listed"))
        for what, arguments in (
                ("the graph", ["graph", "--path", platform.components(), "--svg", graph]),
                ("the profile", ["profile", "--path", platform.components(), "--svg", first]),
                ("the profile with the list",
                 ["profile", "--path", platform.components(), "--cache", folder / "recorded.list",
                  "--svg", listed])):
            if platform.run("mzcomponents", *arguments).returncode != 0:
                raise Failed(f"{what} could not be drawn")
        drawn = sorted((folder / "drawn").glob("*.svg"), key=lambda file: int(file.name.split("-")[0]))
        self.page.pictures("The meshes, as they were imported",
                           [(file.stem.split("-", 1)[1], file) for file in drawn])
        self.page.picture("Libraries, their builders, and who uses them", graph, paper=True)
        self.page.picture("Where the time of the first start goes", first)
        self.page.picture("Where the time of a start with the list goes", listed)
        self.page.write(self.folder / "index.html")


def main() -> int:
    build = Path(sys.argv[1]).resolve()
    split = sys.argv.index("--")
    return 0 if Story(build, sys.argv[2:split], sys.argv[split + 1:]).tell() else 1


sys.exit(main())
