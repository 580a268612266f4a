# SPDX-License-Identifier: BSL-1.0
"""Fails unless the pages of a folder can be read in the order of its README.md.

  order.py FOLDER

Each page is in the index once, under its title; each ends with a link to the next one.
"""
import re
import sys
from pathlib import Path

folder = Path(sys.argv[1])
index = re.findall(r"^\d+\. \[(.*?)\]\((.*?)\)", (folder / "README.md").read_text(encoding="utf-8"), re.M)
faults = [f"{page.name} is not in the index" for page in sorted(folder.glob("*.md"))
          if page.name != "README.md" and page.name not in [file for _, file in index]]
faults += [f"{file} is in the index twice" for _, file in set(index) if [f for _, f in index].count(file) > 1]
for (title, file), following in zip(index, index[1:] + [None]):
    lines = (folder / file).read_text(encoding="utf-8").rstrip("\n").split("\n")
    if lines[0] != f"# {title}":
        faults.append(f"{file} begins with \"{lines[0]}\", not with \"# {title}\"")
    wanted = f"Next: [{following[0]}]({following[1]})" if following else None
    if wanted and lines[-1] != wanted:
        faults.append(f"{file} ends with \"{lines[-1]}\", not with \"{wanted}\"")
print("\n".join(faults) or f"{len(index)} pages")
sys.exit(1 if faults or not index else 0)
