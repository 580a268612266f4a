# SPDX-License-Identifier: BSL-1.0
"""Writes the code blocks of pages to files, unchanged, and lists them for CMake.

  extract.py OUTPUT SOURCES TESTS linux|windows PAGE…

OUTPUT/blocks.cmake sets documentedSources (to compile), documentedPrograms (to build) and
documentedRuns (pages with something to run). SOURCES is the root of the source tree, for names in messages. TESTS is the folder in which
the names of tests are looked up. Files whose content is the same are not touched.
"""
import sys
from pathlib import Path

from blocks import Block, PageError, fail, parse


def write(file, text):
    file.parent.mkdir(parents=True, exist_ok=True)
    if not file.exists() or file.read_text(encoding="utf-8") != text:
        file.write_text(text, encoding="utf-8")


def tests_of(folder):
    """Everything in which a test may be named."""
    files = [f for f in sorted(folder.rglob("*")) if f.name == "CMakeLists.txt" or f.suffix == ".cpp"]
    return "\n".join(f.read_text(encoding="utf-8") for f in files)


def check_test(block, known):
    """Fails unless the test exists: as `Suite.Name` of ctest, or as TEST(Suite, Name)."""
    name = block.notes["tested"]
    suite, _, case = name.partition(".")
    if name not in known and f"({suite}, {case})" not in known and \
            f"test({case} " not in known:
        fail(block.page, block.line - 1, f"there is no test {name}")


def main():
    output, sources, tests = (Path(argument) for argument in sys.argv[1:4])
    windows = sys.argv[4] == "windows"
    known = tests_of(tests)
    result = {"Sources": [], "Programs": [], "Runs": []}
    for page in (Path(argument) for argument in sys.argv[5:]):
        folder = output / page.stem
        runs, number = False, 0
        for item in parse(page):
            if not isinstance(item, Block) or not item.applies(windows):
                continue
            number += 1
            runs |= item.kind in ("program", "console", "shell", "cmake")
            place = f"#line {item.line} \"{page.relative_to(sources)}\"\n"
            if item.kind == "tested":
                check_test(item, known)
            if "file" in item.notes:
                write(folder / item.notes["file"], item.text)
            if item.kind == "program":
                file = folder / f"program{number}.cpp"
                write(file, place + item.text)
                result["Programs"].append(file)
            elif item.kind == "compiled":
                file = folder / item.notes.get("file", f"block{number}.cpp")
                if file.suffix == ".h": # A source compiles the header.
                    file = folder / f"block{number}.cpp"
                    write(file, f"#include \"{item.notes['file']}\"\n")
                elif "file" not in item.notes:
                    write(file, place + item.text)
                result["Sources"].append(file)
        if runs:
            result["Runs"].append(page)
    write(output / "blocks.cmake", "".join(
        f"set(documented{name}\n{''.join(f'  {file.as_posix()}{chr(10)}' for file in files)})\n"
        for name, files in result.items()))


try:
    main()
except PageError as error:
    sys.exit(str(error))
