# SPDX-License-Identifier: BSL-1.0
"""Parses the code blocks of a Markdown page and gives each of them a kind.

The language of a fence and the comments before it decide the kind. A comment stands on a line of its
own, `<!-- WORD -->` or `<!-- WORD: VALUE -->`, and does not show on the page:

  file: NAME     the block is the content of this file; a .cpp file is compiled, too
  Linux, Windows the block is for one platform only
  tested: NAME   the ctest test NAME checks the block
  not run: WHY   the block cannot be run by a test
  diagram        a picture made of text (language "text")

These comments need no block. They are steps of the page, in its order:

  copy: FROM as TO   copies a file or folder of the `build` or the `source` tree; "with OFFSET=BYTE"
                     changes one byte of the copy
  install            installs the build, for blocks that use CMake
  root: FOLDER       how the page names the folder in which its commands run
  instead: A of B    commands use B, of the `build` or the `source` tree, where the page says A

A block without a kind is an error: nothing on a page escapes the tests.
"""
import re
from dataclasses import dataclass, field
from pathlib import Path


class PageError(Exception):
    """A mistake on a page. The text begins with the name of the page and the line."""


@dataclass
class Block:
    page: Path
    line: int  # of the first line of the content, from 1
    language: str
    text: str
    indent: int
    notes: dict = field(default_factory=dict)
    kind: str = ""

    def applies(self, windows):
        return ("Linux" not in self.notes or not windows) and ("Windows" not in self.notes or windows)


@dataclass
class Step:
    """A comment that needs no block."""
    page: Path
    line: int
    kind: str
    value: str


BLOCK_NOTES = {"file", "Linux", "Windows", "tested", "not run", "diagram"}
STEPS = {"copy", "install", "root", "instead"}
COMMENT = re.compile(r"^\s*<!-- ([A-Za-z][a-z]*(?: run)?)(?:: (.*?))? -->$")
FENCE = re.compile(r"^(\s*)(```+|~~~+)(.*)$")


def fail(page, line, text):
    raise PageError(f"{page}:{line}: {text}")


def parse(page):
    """Returns the blocks and steps of the page, in its order; each block has its kind."""
    items, notes = [], {}
    lines = page.read_text(encoding="utf-8").split("\n")
    number, in_list, blank = 0, False, True
    while number < len(lines):
        line = lines[number]
        number += 1
        comment, fence = COMMENT.match(line), FENCE.match(line)
        if comment:
            word, value = comment[1], comment[2] or ""
            if word in STEPS:
                items.append(Step(page, number, word, value))
            elif word in BLOCK_NOTES:
                notes[word] = value
            else:
                fail(page, number, f"unknown comment \"{word}\"")
        elif fence:
            begin = number
            while number < len(lines) and lines[number].strip() != fence[2]:
                number += 1
            if number == len(lines):
                fail(page, begin, "the block has no end")
            indent = len(fence[1])
            text = "".join(row[indent:] + "\n" for row in lines[begin:number])
            number += 1
            items.append(Block(page, begin + 1, fence[3], text, indent, notes))
            notes = {}
        else:
            if line.strip() and notes:
                fail(page, number, f"a comment {sorted(notes)} without a block")
            if line.startswith("    ") and blank and not in_list:
                fail(page, number, "an indented block: use a fence with a language")
            if line.strip() and not line.startswith(" "):
                in_list = bool(re.match(r"^([-*+]|\d+\.)\s", line))
        blank = not line.strip()
    give_kinds(items)
    return items


def give_kinds(items):
    previous = None
    for item in items:
        if isinstance(item, Step):
            continue
        item.kind = kind_of(item, previous)
        if not item.kind:
            fail(item.page, item.line - 1, f"the block \"{item.language}\" has no known kind")
        if item.kind == "output":
            previous.kind = "program"
        previous = item


def kind_of(block, previous):
    notes = block.notes
    if "tested" in notes:
        return "tested"
    if "not run" in notes:
        if not notes["not run"] or block.language == "cpp":
            fail(block.page, block.line - 1, "\"not run\" needs a reason, and is not for cpp")
        return "skipped"
    if block.language == "cpp":
        return "compiled"
    if "file" in notes:
        return "file" if block.language in ("cmake", "text", "ini", "json") else ""
    if block.language == "text":
        if "diagram" in notes:
            return "diagram"
        if previous and previous.kind == "compiled" and re.search(r"^int main\(", previous.text, re.M):
            return "output"
        return ""
    return {"cmake": "cmake", "console": "console", "sh": "shell"}.get(block.language, "")
