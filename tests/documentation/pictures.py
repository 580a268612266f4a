# SPDX-License-Identifier: BSL-1.0
"""Fails unless each picture was drawn from the text beside it, and is shown by a page.

  pictures.py FOLDER PAGE…

FOLDER has the .dot files and the .svg files that were drawn from them. Versions of Graphviz draw
differently, so the words are compared, not the files.
"""
import html
import re
import sys
from collections import Counter
from pathlib import Path

folder = Path(sys.argv[1])
pages = "".join(Path(page).read_text(encoding="utf-8") for page in sys.argv[2:])


def words_of_text(text: str) -> Counter:
    """The words of all labels: of quoted ones, and of tables, whose tags are left out."""
    text = re.sub(r"^//.*$", "", text, flags=re.M)
    labels = [label.replace("\\n", " ") for label in re.findall(r'label = "(.*?)"', text)]
    labels += [html.unescape(re.sub(r"<[^>]*>", " ", table))
               for table in re.findall(r"label = <(.*?)>\]", text, re.S)]
    return Counter(" ".join(labels).split())


def words_of_picture(text: str) -> Counter:
    return Counter(html.unescape(" ".join(re.findall(r"<text[^>]*>(.*?)</text>", text, re.S))).split())


faults = []
texts = sorted(folder.glob("*.dot"))
for text in texts:
    picture = text.with_suffix(".svg")
    if not picture.exists():
        faults.append(f"{picture.name} is not drawn")
        continue
    wanted, drawn = (words(file.read_text(encoding="utf-8"))
                     for words, file in [(words_of_text, text), (words_of_picture, picture)])
    for word in sorted(((wanted - drawn) | (drawn - wanted)).keys()):
        faults.append(f"{picture.name} has \"{word}\" {drawn[word]} times, {text.name} {wanted[word]} times")
faults += [f"no page shows {text.stem}.svg" for text in texts if f"]({folder.name}/{text.stem}.svg)" not in pages]
faults += [f"{picture.name} has no text" for picture in folder.glob("*.svg") if not picture.with_suffix(".dot").exists()]
print("\n".join(faults) or f"{len(texts)} pictures")
sys.exit(1 if faults or not texts else 0)
