# SPDX-License-Identifier: BSL-1.0
"""Fails unless a page has a heading for each name that a source defines.

  headings.py PAGE SOURCE PATTERN

PATTERN is a regular expression whose first group is a name. A heading is the name itself, in back
quotes or not; what follows it in parentheses does not count. A heading below level 2 for a name that the
source lacks is an error, too.
"""
import re
import sys
from pathlib import Path

page, source, pattern = sys.argv[1:]
names = set(re.findall(pattern, Path(source).read_text(encoding="utf-8")))
found = re.findall(r"^### `?(.*?)`?(?: \(.*\))?$", Path(page).read_text(encoding="utf-8"), re.M)
faults = [f"no heading: {name}" for name in sorted(names - set(found))]
faults += [f"heading of nothing: {name}" for name in sorted(set(found) - names)]
if not names:
    faults.append(f"{source} has no names")
print("\n".join(faults) or f"{len(names)} headings")
sys.exit(1 if faults else 0)
