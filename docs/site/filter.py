#!/usr/bin/env python3
# SPDX-License-Identifier: BSL-1.0
"""Prepares a file for doxygen, line for line, so that the lines of its warnings are right.

Headers and guides are written to be read as they are. Doxygen 1.9 takes the first comment of a
header for that of what follows it, knows neither the anchors that others give to headings nor links
to them, and drops a percent sign at the beginning of a word.
"""
import os
import re
import sys

HEADING = re.compile(r"^(#{1,6}) +(.*?) *$")
LINK = re.compile(r"(?<!\!)\[((?:[^\[\]]|\[[^\]]*\])*)\]\(([^()\s]+)\)")
LINK_AND_WORD = re.compile(LINK.pattern + r"\S* ?")


CODE = re.compile(r"`[^`\n]+`")


def with_percent_signs(text: str) -> str:
    """Doubles what doxygen drops, also in code: the percent sign of `%s`."""
    return CODE.sub(lambda code: re.sub(r"(?<=[`\s])%(?=[A-Za-z_])", "%%", code.group(0)), text)


def header(text: str) -> str:
    """Marks the first comment as that of the file, and shares comments among declarations."""
    text = re.sub(r"\A// SPDX[^\n]*\n///", "/// \\\\file\n///", text, count=1)
    lines = text.split("\n")
    index = 0
    while index < len(lines):
        index = share(lines, index) if is_comment(lines[index]) else index + 1
    return with_percent_signs("\n".join(lines))


def is_comment(line: str) -> bool:
    return line.strip().startswith("///")


def indent(line: str) -> int:
    return len(line) - len(line.lstrip())


def share(lines: list[str], comment: int) -> int:
    """Marks the declarations below a comment, up to a blank line, as those that it is about.

    Returns the index of the line after them.
    """
    first = comment
    while first < len(lines) and is_comment(lines[first]):
        first += 1
    end = first
    while end < len(lines) and lines[end].strip() and not is_comment(lines[end]) \
            and indent(lines[end]) >= indent(lines[comment]):
        end += 1
    run = lines[first:end]
    count = sum(line.rstrip().endswith((";", "}")) for line in run)
    names = set(re.findall(r"^ *[^(]*?(\w+|operator\W+)\(", "\n".join(run), re.M))
    detailed = any(re.search(r"\\(param|return)", line) for line in lines[comment:first])
    if comment > 0 and count > 1 and (len(names) == 1 or not detailed) and not any(
            line.count("{") != line.count("}") or "//" in line for line in run):
        lines[comment - 1] += " /**@{*/"
        lines[end - 1] += " /**@}*/"
    return end


def page_of(path: str) -> str:
    """Returns the name of a guide's page: its path, in letters."""
    return "page_" + re.sub(r"\W", "_", path.removesuffix(".md").removeprefix("docs/"))


def slug(heading: str) -> str:
    """Returns the anchor that a heading has where Markdown is shown, as on code hosts."""
    plain = re.sub(r"\[([^\]]*)\]\([^)]*\)", r"\1", heading).lower()
    return re.sub(r"[^\w\- ]", "", plain).strip().replace(" ", "-")


def anchor_of(path: str, name: str) -> str:
    return page_of(path) + "_" + re.sub(r"\W", "_", name)


def on_site(path: str) -> bool:
    return path in ("README.md", "SECURITY.md") or path.startswith(("docs/", "examples/"))


class Guide:
    """A guide, whose pages and headings get names that doxygen can link."""

    def __init__(self, path: str) -> None:
        self.path = path
        self.seen: dict[str, int] = {}

    def heading(self, match: re.Match) -> str:
        marks, text = match.groups()
        if len(marks) == 1:
            return f"# {text} {{#{'mainpage' if self.path == 'docs/README.md' else page_of(self.path)}}}"
        name = slug(text)
        count = self.seen.get(name, 0)
        self.seen[name] = count + 1
        if count:
            name += f"-{count}"
        return f"{marks} {self.links(text)} {{#{anchor_of(self.path, name)}}}"

    def link(self, match: re.Match) -> str:
        text, target = match.groups()
        if re.match(r"[a-z]+:", target):
            return match.group(0)
        file, _, anchor = target.partition("#")
        path = os.path.normpath(os.path.join(os.path.dirname(self.path), file)) if file else self.path
        if not path.endswith(".md") or not os.path.isfile(path):
            return text  # A source: not on the site.
        if not on_site(path):
            return text
        if anchor:
            return f"[{text}](@ref {anchor_of(path, anchor)})"
        return f"[{text}](@ref {'index' if path == 'docs/README.md' else page_of(path)})"

    def links(self, text: str) -> str:
        return LINK.sub(self.link, text)

    def on_one_line(self, match: re.Match) -> str:
        """Moves the line breaks of a link behind it: on a page with a table, doxygen would show its
        commands for headings as text."""
        words = match.group(0)
        if "\n" not in words:
            return words
        return re.sub(r"\n *", " ", words.rstrip(" ")) + "\n" * words.count("\n")

    def filtered(self, text: str) -> str:
        # Every second part is a block of code.
        parts = re.split(r"(?ms)(^ *```.*?^ *```$)", text)
        parts[::2] = [self.prose(LINK_AND_WORD.sub(self.on_one_line, part)) for part in parts[::2]]
        return "".join(parts)

    def prose(self, text: str) -> str:
        lines = []
        for line in text.split("\n"):
            match = HEADING.match(line)
            lines.append(with_percent_signs(self.heading(match) if match else self.links(line)))
        return "\n".join(lines)


def main() -> None:
    path = os.path.relpath(sys.argv[1])
    with open(path, encoding="utf-8") as file:
        text = file.read()
    sys.stdout.write(header(text) if path.endswith(".h") else Guide(path).filtered(text))


if __name__ == "__main__":
    main()
