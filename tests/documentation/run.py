# SPDX-License-Identifier: BSL-1.0
"""Runs the programs and commands of one page, and compares what they print with the page.

  run.py PAGE --build FOLDER --source FOLDER --programs FOLDER --work FOLDER
         [--windows] [--emulator COMMAND] [--cmake NAME=VALUE]… [--update]

A block of CMake becomes a project with the files of the page, and is built. All commands of a page run
one after the other in one folder, the root, which is empty at first. The page names it /home/me, unless
it says otherwise. In an expected output, "…" stands for any text, or on a line of its own for any lines.
A comment "# ends with N" at the end of a command is its exit status.

Pages show what Linux prints. On Windows names of files are compared as if they were those of Linux.
--update writes the real output and status of commands into the page, where they differ.
"""
import argparse
import os
import re
import shutil
import subprocess
import sys
from pathlib import Path

from blocks import Block, PageError, fail, parse

TIMEOUT = 300  # seconds, for one command


class Runner:
    def __init__(self, options):
        self.options = options
        self.work = Path(options.work).resolve()
        shutil.rmtree(self.work, ignore_errors=True)
        self.root = self.work / "root"
        self.folder = self.root
        self.shown = "/home/me"
        self.instead = []  # (what a page says, what is used)
        self.changes = []  # (first line, number of lines, new lines), from 1
        tools = self.work / "bin"
        for folder in (self.root, tools):
            folder.mkdir(parents=True)
        program, command = Path(options.build) / "bin" / "mzcomponents", tools / "mzcomponents"
        if options.windows:
            command.write_text(f"#!/bin/sh\nexec {options.emulator} '{program}.exe' \"$@\"\n")
            command.chmod(0o755)
        else:
            command.symlink_to(program)
        self.environment = dict(os.environ, PATH=f"{tools}:{os.environ['PATH']}", LC_ALL="C.UTF-8",
                                CMAKE_PREFIX_PATH=str(self.work / "prefix"))
        self.environment.update(value.split("=", 1) for value in options.cmake)

    def step(self, item):
        if item.kind == "root":
            self.shown = item.value
        elif item.kind == "instead":
            said, _, used = item.value.partition(" of ")
            tree, _, rest = used.partition("/")
            self.instead.append((said, f"{getattr(self.options, tree)}/{rest}"))
        elif item.kind == "install":
            self.install()
        else:
            self.copy(item)

    def install(self):
        if not (self.work / "prefix").exists():
            self.call(["cmake", "--install", self.options.build, "--prefix", self.work / "prefix"])

    def cmake(self, block, files):
        """Makes a project of the block and of the files of the page, and builds it."""
        self.install()
        source = self.work / "cmake" / str(block.line)
        for name, text in files.items():
            (source / name).parent.mkdir(parents=True, exist_ok=True)
            (source / name).write_text(text, encoding="utf-8")
        (source / "CMakeLists.txt").write_text(
            f"cmake_minimum_required(VERSION 3.25)\nproject(block LANGUAGES CXX)\n{block.text}")
        for arguments in (["-S", source, "-B", source / "build"], ["--build", source / "build"]):
            done = subprocess.run(["cmake", *arguments], env=self.environment, text=True,
                                  stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
            if done.returncode:
                fail(block.page, block.line, f"cmake ended with {done.returncode}:\n{done.stdout}")

    def copy(self, item):
        origin, _, target = item.value.partition(" as ")
        target, _, changes = target.partition(" with ")
        tree, _, rest = self.native(origin).partition("/")
        base = {"build": self.options.build, "source": self.options.source}.get(tree)
        if base is None or not target:
            fail(item.page, item.line, "copy: (build|source)/FROM as TO [with OFFSET=BYTE]")
        origin, target = Path(base) / rest, self.root / self.native(target)
        if not origin.exists(): # a program on Windows
            origin = Path(f"{origin}.exe")
        target.parent.mkdir(parents=True, exist_ok=True)
        if origin.is_dir():
            shutil.copytree(origin, target, dirs_exist_ok=True)
        else:
            shutil.copy2(origin, target)
        if changes:
            offset, byte = changes.split("=")
            with target.open("r+b") as file:
                file.seek(int(offset))
                file.write(bytes([int(byte)]))

    def call(self, command):
        done = subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True)
        if done.returncode:
            raise PageError(f"{command} ended with {done.returncode}:\n{done.stdout}")

    def native(self, text):
        """Names as on Linux, made those of this platform."""
        return re.sub(r"\.so\b", ".dll", text) if self.options.windows else text

    def seen(self, text):
        """What was printed, as the page shows it."""
        text = text.replace("\r\n", "\n")
        if self.options.windows:
            root = str(self.root).replace("/", "\\")
            text = re.sub(r"(?:[Zz]:)?" + re.escape(root) + r"([^\s:\"']*)",
                          lambda name: str(self.root) + name[1].replace("\\", "/"), text, flags=re.I)
            text = re.sub(r"[Zz]:(?=" + re.escape(str(self.root)) + ")", "", text)
            text = re.sub(r"\.dll\b", ".so", text)
        text = text.replace(str(self.root), self.shown)
        return [line.rstrip() for line in text.strip("\n").split("\n")]

    def shell(self, command):
        """Runs one command; returns its status and its output."""
        for said, used in self.instead:
            command = command.replace(said, used)
        if self.options.windows:
            command = re.sub(r"(^|[;&|] *)([\w./-]+)", self.windows_program, self.native(command))
        place = self.work / "folder"
        script = f"{command}\nstatus=$?\npwd > '{place}'\nexit $status\n"
        done = subprocess.run(["bash", "-c", script], cwd=self.folder, env=self.environment,
                              stdin=subprocess.DEVNULL, stdout=subprocess.PIPE,
                              stderr=subprocess.STDOUT, timeout=TIMEOUT)
        self.folder = Path(place.read_text().strip())
        return done.returncode, done.stdout.decode("utf-8", "replace")

    def windows_program(self, match):
        if match[2] == "attrib":
            return f"{match[1]}{self.options.emulator} attrib.exe"
        if (self.folder / (match[2] + ".exe")).exists():
            return f"{match[1]}{self.options.emulator} {match[2]}.exe"
        return match[0]

    def compare(self, block, line, what, status, wanted, output, expected):
        actual = self.seen(output)
        expected = [row.rstrip() for row in expected]
        if status == wanted and matches(expected, actual):
            return
        if self.options.update and block.kind == "console":
            command = block.text.split("\n")[line - 1 - block.line]
            command = split_status(command)[0] + (f"   # ends with {status}" if status else "")
            self.changes.append((line - 1, len(expected) + 1,
                                 [command] + (actual if actual != [""] else [])))
            return
        if self.options.update and block.kind == "output":
            self.changes.append((line, len(expected), actual))
            return
        shown = "\n".join(expected)
        printed = "\n".join(actual)
        fail(block.page, line, f"{what} ended with {status} and printed\n{printed}\n"
             f"The page shows {wanted} and\n{shown}")

    def console(self, block):
        rows, index = block.text.split("\n")[:-1], 0
        if not rows or not rows[0].startswith("$ "):
            fail(block.page, block.line, "a console block begins with \"$ \"")
        while index < len(rows):
            command = rows[index][2:]
            index += 1
            while command.endswith("\\"):
                command += "\n" + rows[index]
                index += 1
            begin = index
            while index < len(rows) and not rows[index].startswith("$ "):
                index += 1
            command, wanted = split_status(command)
            status, output = self.shell(command)
            self.compare(block, block.line + begin, command, status, wanted, output,
                         rows[begin:index])

    def program(self, block, number):
        program = Path(self.options.programs) / f"{block.page.stem}-program{number}"
        command = [*self.options.emulator.split(), f"{program}{'.exe' if self.options.windows else ''}"]
        done = subprocess.run(command, cwd=self.folder, env=self.environment, timeout=TIMEOUT,
                              stdin=subprocess.DEVNULL, stdout=subprocess.PIPE,
                              stderr=subprocess.STDOUT)
        return done.returncode, done.stdout.decode("utf-8", "replace")

    def page(self, page):
        items, number, files = parse(page), 0, {}
        ran = (0, "")
        for item in items:
            if not isinstance(item, Block):
                self.step(item)
                continue
            if not item.applies(self.options.windows):
                continue
            number += 1
            if "file" in item.notes:
                files[item.notes["file"]] = item.text
                file = self.root / item.notes["file"]
                file.parent.mkdir(parents=True, exist_ok=True)
                file.write_text(item.text, encoding="utf-8")
            if item.kind == "console":
                self.console(item)
            elif item.kind == "cmake":
                self.cmake(item, files)
            elif item.kind == "shell":
                status, output = self.shell("set -e\n" + item.text)
                self.compare(item, item.line, item.text, status, 0, output, ["…"])
            elif item.kind == "program":
                ran = self.program(item, number)
            elif item.kind == "output":
                self.compare(item, item.line, "the program", ran[0], 0, ran[1],
                             item.text.split("\n")[:-1])
        if self.changes:
            rows = page.read_text(encoding="utf-8").split("\n")
            for line, count, new in reversed(self.changes):
                rows[line - 1:line - 1 + count] = new
            page.write_text("\n".join(rows), encoding="utf-8")


def split_status(command):
    found = re.match(r"(.*?)\s*# ends with (\d+)$", command, re.S)
    return (found[1], int(found[2])) if found else (command, 0)


def matches(expected, actual):
    if not expected:
        return actual == [""]
    pattern = ""
    for row in expected:
        if row.strip() == "…":
            pattern += r"(?:.*\n)*?"
        else:
            pattern += ".*".join(re.escape(part) for part in row.split("…")) + r"\n"
    return re.fullmatch(pattern, "\n".join(actual) + "\n") is not None


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("page", type=Path)
    for name in ("build", "source", "programs", "work"):
        parser.add_argument(f"--{name}", required=True)
    parser.add_argument("--emulator", default="")
    parser.add_argument("--cmake", action="append", default=[])
    parser.add_argument("--windows", action="store_true")
    parser.add_argument("--update", action="store_true")
    options = parser.parse_args()
    Runner(options).page(options.page)


try:
    main()
except PageError as error:
    sys.exit(str(error))
