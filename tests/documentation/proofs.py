# SPDX-License-Identifier: BSL-1.0
"""Fails unless each test that pages name as a proof exists.

  proofs.py SOURCES PAGE…

Proofs are in the last column of each table whose last heading is "proof" or "test": names of tests in
back quotes, as ctest shows them without the build before the slash, or commands, `./run NAME`. Each row
needs one. `Suite.*` stands for all tests of a suite. SOURCES is the root of the source tree: names are
read from the sources of the tests and from the CMakeLists that add tests, because no build contains the
tests of all platforms.
"""
import re
import sys
from pathlib import Path

FOLDERS = ("tests", "fuzz")
MACRO = re.compile(r"^\s*(?:TYPED_)?TEST(?:_[FP])?\(\s*(\w+)\s*,\s*(\w+)\s*\)", re.M)
ADDED = re.compile(r"\badd_test\(NAME \$\{\w+\}/(\w+)\.([\w${}]+)")
FUNCTION = re.compile(r"^function\((\w+) (.*?)\)$(.*?)^endfunction\(\)$", re.M | re.S)
LOOP = re.compile(r"^\s*foreach\((\w+) (?:IN ITEMS )?(?!IN\b)([\w\s]+)\)$(.*?)^\s*endforeach\(\)$", re.M | re.S)
VARIABLE = re.compile(r"\$\{(\w+)\}")


def unrolled(text):
    """The text of a CMakeLists with the loops over plain words written out."""
    return LOOP.sub(lambda loop: "\n".join(loop[3].replace(f"${{{loop[1]}}}", item)
                                           for item in loop[2].split()), text)


def added(text):
    """Yields the names of the tests that a CMakeLists adds, in which variables may remain."""
    text = unrolled(re.sub(r"^\s*#.*$", "", text, flags=re.M))
    yield from (f"{suite}.{name}" for suite, name in ADDED.findall(text))
    for function, parameters, body in FUNCTION.findall(text):
        pattern = re.search(r"\badd_test\(NAME \$\{MZ_BUILD_NAME\}/([\w.${}]+)", body)
        for call in re.findall(rf"\b{function}\(([^()]+)", text) if pattern else ():
            values = dict(zip(parameters.split(), call.split()))
            yield VARIABLE.sub(lambda name: values.get(name[1], name[0]), pattern[1])


def tests_of(root):
    """The names of all tests, and those of their suites with an asterisk."""
    names = set()
    for file in (file for folder in FOLDERS for file in (root / folder).rglob("*")):
        if file.suffix == ".cpp":
            names |= {f"{suite}.{name}" for suite, name in MACRO.findall(file.read_text(encoding="utf-8"))
                      if not name.startswith("DISABLED_")}
        elif file.name == "CMakeLists.txt":
            names.update(added(file.read_text(encoding="utf-8")))
    return names | {name.partition(".")[0] + ".*" for name in names}


def commands_of(root):
    return {f"./run {name}" for name in re.findall(r"^([\w-]+)\) ", (root / "run").read_text(encoding="utf-8"),
                                                    re.M)}


def proofs_of(page):
    """Yields the line of each row of a table of proofs, and what is named there."""
    rows = page.read_text(encoding="utf-8").split("\n")
    wanted = False
    for line, row in enumerate(rows, 1):
        if not row.startswith("|"):
            wanted = False
            continue
        last = row.strip().strip("|").split("|")[-1].strip()
        if line > 1 and rows[line - 2].startswith("|"):
            if wanted and not re.fullmatch(r":?-+:?", last):
                yield line, re.findall(r"`([^`]+)`", last)
        else:
            wanted = last in ("proof", "test")


def main():
    root = Path(sys.argv[1])
    known = tests_of(root) | commands_of(root)
    faults, count = [], 0
    for page in (Path(argument) for argument in sys.argv[2:]):
        rows = list(proofs_of(page))
        if not rows:
            faults.append(f"{page.name}: there is no table of proofs")
        for line, names in rows:
            count += len(names)
            if not names:
                faults.append(f"{page.name}:{line}: there is no proof")
            faults += [f"{page.name}:{line}: there is no test {name}" for name in names if name not in known]
    print("\n".join(faults) or f"{count} proofs")
    sys.exit(1 if faults else 0)


main()
