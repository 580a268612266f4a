#!/usr/bin/env python3
# SPDX-License-Identifier: BSL-1.0
"""Follows every inner link of a site: checkLinks.py FOLDER. Fails if one leads nowhere."""
import pathlib
import sys
from html.parser import HTMLParser
from urllib.parse import unquote, urlsplit


class Page(HTMLParser):
    """The anchors of a page, and what it links or loads."""

    def __init__(self, file: pathlib.Path) -> None:
        super().__init__()
        self.anchors: set[str] = set()
        self.links: list[str] = []
        self.feed(file.read_text(encoding="utf-8"))

    def handle_starttag(self, tag: str, attributes: list[tuple[str, str | None]]) -> None:
        for name, value in attributes:
            if name == "id" or (tag == "a" and name == "name"):
                self.anchors.add(value or "")
            elif name in ("href", "src", "data") and value:
                self.links.append(value)


def main() -> int:
    root = pathlib.Path(sys.argv[1]).resolve()
    pages = {file: Page(file) for file in root.rglob("*.html")}
    followed = dead = 0
    for file, page in sorted(pages.items()):
        for link in page.links:
            parts = urlsplit(link)
            if parts.scheme or parts.netloc:
                continue
            followed += 1
            target = (file.parent / unquote(parts.path)).resolve() if parts.path else file
            anchor = unquote(parts.fragment)
            if not target.is_file() or (
                    anchor and target in pages and anchor not in pages[target].anchors):
                print(f"{file.name}: {link} leads nowhere", file=sys.stderr)
                dead += 1
    if not followed:
        print(f"there is no link in {root}", file=sys.stderr)
        return 1
    print(f"{followed} links on {len(pages)} pages, {dead} of them dead")
    return 1 if dead else 0


sys.exit(main())
