# SPDX-License-Identifier: BSL-1.0
"""Fails unless each picture was drawn from the text beside it, or from the page that shows it.

  pictures.py FOLDER PAGE…

FOLDER has the .dot files and the .svg files that were drawn from them. Versions of Graphviz draw
differently, so the words are compared, not the files. A picture without such a file is a plot of the
figures of one page: each of its texts is on that page.
"""
import html
import re
import sys
from collections import Counter
from pathlib import Path

folder = Path(sys.argv[1])
contents = [Path(page).read_text(encoding="utf-8") for page in sys.argv[2:]]
pages = "".join(contents)


def words_of_text(text: str) -> Counter:
    """The words of all labels: of quoted ones, and of tables, whose tags are left out."""
    text = re.sub(r"^//.*$", "", text, flags=re.M)
    labels = [label.replace("\\n", " ") for label in re.findall(r'label = "(.*?)"', text)]
    labels += [html.unescape(re.sub(r"<[^>]*>", " ", table))
               for table in re.findall(r"label = <(.*?)>\]", text, re.S)]
    return Counter(" ".join(labels).split())


def words_of_picture(text: str) -> Counter:
    return Counter(html.unescape(" ".join(re.findall(r"<text[^>]*>(.*?)</text>", text, re.S))).split())


def faults_of_plot(picture: Path) -> list:
    """Compares the texts of a plot with the page that shows it. The words of a text may be in several
    cells of a table, and the numbers of its scale are on no page."""
    showing = [page for page in contents if f"]({folder.name}/{picture.name})" in page]
    if len(showing) != 1:
        return [f"{picture.name} has no text, and {len(showing)} pages show it"]
    words = set(re.findall(r"[^\s|*]+", showing[0]))
    return [f"{picture.name} has \"{word}\", its page has not"
            for text in re.findall(r'<text class="(?!tick)[^>]*>(.*?)</text>',
                                   picture.read_text(encoding="utf-8"), re.S)
            for word in html.unescape(text).split()
            if not words & {word, word + ":", word + ",", word + ".", "*" + word}]


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
for picture in folder.glob("*.svg"):
    if not picture.with_suffix(".dot").exists():
        faults += faults_of_plot(picture)
print("\n".join(faults) or f"{len(texts)} pictures")
sys.exit(1 if faults or not texts else 0)
