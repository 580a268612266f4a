# SPDX-License-Identifier: BSL-1.0
"""Which faults are put into the sources of a folder, in an order of the seed's.

The order depends on each fault alone: a change of the sources adds and removes faults, and leaves the
others where they are.
"""
import collections
import dataclasses
import hashlib
import pathlib

import faults


@dataclasses.dataclass(frozen=True)
class Choice:
    """A fault in a source, by its lines: the how manieth of those with the same lines it is."""
    file: str
    old: str
    new: str
    nth: int
    fault: faults.Fault = dataclasses.field(compare=False)

    def rank(self, seed: int) -> bytes:
        text = "\n".join((str(seed), self.file, self.old, self.new, str(self.nth)))
        return hashlib.sha256(text.encode()).digest()


def choices_in(file: str, source: str) -> list[Choice]:
    """Returns the faults of a source, in the order of their places."""
    before = source.splitlines()
    count: collections.Counter[tuple[str, str]] = collections.Counter()
    found = []
    for fault in faults.faults_of(source):
        line = fault.line(source) - 1
        lines = before[line].strip(), fault.put_into(source).splitlines()[line].strip()
        found.append(Choice(file, *lines, count[lines], fault))
        count[lines] += 1
    return found


def chosen(files: list[str], top: pathlib.Path, count: int, seed: int) -> list[Choice]:
    """Returns the first faults of a seed, of each kind as many as of the others."""
    kinds = collections.defaultdict(list)
    for file in files:
        for choice in choices_in(file, (top / file).read_text(encoding="utf-8")):
            kinds[choice.fault.kind].append(choice)
    for some in kinds.values():
        some.sort(key=lambda choice: choice.rank(seed))
    order = sorted(kinds)
    turns = (kinds[kind][turn] for turn in range(max(map(len, kinds.values()), default=0))
             for kind in order if turn < len(kinds[kind]))
    return [choice for choice, _ in zip(turns, range(count))]
