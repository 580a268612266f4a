# SPDX-License-Identifier: BSL-1.0
"""Follows every relative link and anchor of Markdown pages.

  links.py ROOT PAGE…

Prints each link that leads nowhere, and each page that has two headings with one anchor; ends with 1
if there is one. Anchors are made of headings as GitHub makes them. Links into the network are not
followed.
"""
import re
import sys
import unicodedata
from pathlib import Path

LINK = re.compile(r"\[(?:[^\]\[]|\[[^\]]*\])*\]\(([^)\s]+)\)")
HEADING = re.compile(r"^#{1,6}\s+(.*?)\s*#*$")


def without_code(text):
    """The text without code: what is left keeps its lines."""
    rows, fence = [], None
    for row in text.split("\n"):
        mark = re.match(r"^\s*(```+|~~~+)", row)
        if mark and fence is None:
            fence = mark[1]
            rows.append("")
        elif fence is not None:
            if row.strip() == fence:
                fence = None
            rows.append("")
        else:
            rows.append(row)
    return "\n".join(rows)


def anchor_of(heading):
    heading = re.sub(r"\[([^\]]*)\]\([^)]*\)", r"\1", heading).replace("`", "")
    kept = (c for c in heading.lower()
            if c in " -_" or unicodedata.category(c)[0] in "LN")
    return "".join(kept).replace(" ", "-")


def anchors_of(page):
    headings = (HEADING.match(row) for row in without_code(page.read_text(encoding="utf-8")).split("\n"))
    return [anchor_of(heading[1]) for heading in headings if heading]


def main():
    root = Path(sys.argv[1]).resolve()
    faults, count, known = [], 0, {}

    def anchors(page):
        if page not in known:
            known[page] = anchors_of(page)
        return known[page]

    for page in (Path(argument).resolve() for argument in sys.argv[2:]):
        own = anchors(page)
        name = page.relative_to(root)
        faults += [f"{name}: two headings have the anchor #{a}" for a in sorted(set(own))
                   if own.count(a) > 1]
        text = without_code(page.read_text(encoding="utf-8"))
        text = re.sub(r"`[^`\n]*`", lambda code: " " * len(code[0]) if "](" in code[0] else code[0], text)
        for link in LINK.finditer(text):
            target = link[1]
            if re.match(r"[a-z]+:", target):
                continue
            count += 1
            line = text.count("\n", 0, link.start()) + 1
            file, _, anchor = target.partition("#")
            leads = (page.parent / file).resolve() if file else page
            if not leads.exists():
                faults.append(f"{name}:{line}: {target}: there is no such file")
            elif anchor and (leads.suffix != ".md" or anchor not in anchors(leads)):
                faults.append(f"{name}:{line}: {target}: there is no such heading")
    if count == 0:
        faults.append("there is no link at all")
    print("\n".join(faults) or f"{count} links")
    sys.exit(1 if faults else 0)


main()
