# SPDX-License-Identifier: BSL-1.0
"""The demonstration's page: one HTML file that needs no other."""
import base64
import html
import re
from pathlib import Path

HEAD = """<!DOCTYPE html>
<html lang="en">
<meta charset="utf-8">
<meta name="viewport" content="width=device-width, initial-scale=1">
<title>libMZcomponentManager: the demonstration</title>
<style>
:root { color-scheme: light dark; --line: #8884; }
body { font: 16px/1.5 system-ui, sans-serif; margin: 0 auto; max-width: 70rem; padding: 1rem; }
h2 { border-top: 1px solid var(--line); padding-top: 1rem; }
.wide { overflow-x: auto; }
table { border-collapse: collapse; white-space: nowrap; }
th, td { padding: .2rem .8rem .2rem 0; text-align: left; }
td:nth-child(3), td:nth-child(4) { font-variant-numeric: tabular-nums; }
.meshes { display: grid; gap: 1rem; grid-template-columns: repeat(auto-fill, minmax(9rem, 1fr)); }
figure { margin: 0; text-align: center; }
figcaption { font-size: .8rem; overflow-wrap: anywhere; }
.wide img { min-width: 36rem; max-width: 100%; }
.paper { background: white; border-radius: .5rem; padding: .5rem; }
svg { height: auto; max-width: 100%; }
h1 { font-size: clamp(1.2rem, 5vw, 2rem); overflow-wrap: anywhere; }
</style>
<h1>libMZcomponentManager: the demonstration</h1>
"""


def inline(file: Path) -> str:
    """Returns the drawing without what stands before its first element."""
    text = file.read_text(encoding="utf-8")
    return text[re.search(r"<svg\b", text).start():]


class Page:
    def __init__(self) -> None:
        self.parts = [HEAD]

    def add(self, title: str, content: str) -> None:
        self.parts.append(f"<h2>{html.escape(title)}</h2>\n{content}\n")

    def table(self, title: str, head: list[str], rows: list[list[str]]) -> None:
        def line(cells: list[str], tag: str) -> str:
            return "<tr>" + "".join(f"<{tag}>{html.escape(cell)}</{tag}>" for cell in cells) + "</tr>\n"

        body = line(head, "th") + "".join(line(row, "td") for row in rows)
        self.add(title, f'<div class="wide"><table>\n{body}</table></div>')

    def pictures(self, title: str, pictures: list[tuple[str, Path]]) -> None:
        figures = "".join(f"<figure>{inline(file)}<figcaption>{html.escape(name)}</figcaption></figure>\n"
                          for name, file in pictures)
        self.add(title, f'<div class="meshes">\n{figures}</div>')

    def picture(self, title: str, file: Path, paper: bool = False) -> None:
        """Adds a drawing, whose styles are its own; on white `paper`, if it knows no dark pages."""
        data = base64.b64encode(file.read_bytes()).decode("ascii")
        self.add(title, f'<div class="{"wide paper" if paper else "wide"}">'
                        f'<img alt="{html.escape(title)}" src="data:image/svg+xml;base64,{data}"></div>')

    def write(self, file: Path) -> None:
        file.write_text("".join(self.parts), encoding="utf-8")
