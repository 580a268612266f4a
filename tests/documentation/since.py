# SPDX-License-Identifier: BSL-1.0
"""Fails unless a page's table of what is new names the same headers that say so.

  since.py PAGE VERSION COMPONENTS

A header says so by "Since VERSION" or "\\since VERSION" in a comment. The names that the table gives
must be in the headers of their row.
"""
import re
import sys
from pathlib import Path

page, version, components = Path(sys.argv[1]), sys.argv[2], Path(sys.argv[3])
section = page.read_text(encoding="utf-8").split(f"### Since {version}\n")[1].split("\n#")[0]
texts = {str(header.relative_to(components)): header.read_text(encoding="utf-8")
         for header in components.glob("*/*.h")}
mark = re.compile(rf"\b[sS]ince {re.escape(version)}\b")
marked = {header for header, text in texts.items() if mark.search(text)}

named = set()
faults = []
for files, names in re.findall(r"^\| (`.*?) \| (.*) \|$", section, re.M):
    folder = ""
    row = []
    for file in re.findall(r"`(.*?)`", files):
        folder = file.rpartition("/")[0] or folder  # a file without one is in that of the file before
        row.append(f"{folder}/{file.rpartition('/')[2]}")
    named.update(row)
    content = "".join(texts.get(header, "") for header in row)
    faults += [f"{name} is not in {' or '.join(row)}" for name in re.findall(r"`(?:\w+::)*(\w+)`", names)
               if not re.search(rf"\b{name}\b", content)]

faults += [f"{header} does not say that it is new" for header in named - marked]
faults += [f"{page.name} does not name {header}" for header in marked - named]
print("\n".join(sorted(faults)) or f"{len(marked)} headers")
sys.exit(1 if faults or not marked else 0)
