# SPDX-License-Identifier: BSL-1.0
"""Fails unless a page has a heading of level 3 for each name that sources define.

  headings.py PAGE PATTERN SOURCE…

PATTERN is a regular expression whose first group is a name, or the beginning of one. A heading is the
name, in back quotes or not; what follows it in parentheses does not count. A heading of no name is an
error, too.
"""
import re
import sys
from pathlib import Path

page, pattern, *sources = sys.argv[1:]
names = {name.replace('\\"', '"').strip() for source in sources
         for name in re.findall(pattern, Path(source).read_text(encoding="utf-8"))}
text = Path(page).read_text(encoding="utf-8")
headings = re.findall(r"^### `?(.*?)`?(?: \([^)]*\))?$", text, re.M)
faults = [f"no heading: {name}" for name in sorted(names)
          if not any(heading.startswith(name) for heading in headings)]
faults += [f"heading of nothing: {heading}" for heading in headings
           if not any(heading.startswith(name) for name in names)]
if not names:
    faults.append(f"no names in {sources}")
print("\n".join(faults) or f"{len(names)} names")
sys.exit(1 if faults else 0)
