# SPDX-License-Identifier: BSL-1.0
"""Small faults that can be put into a C++ source, one at a time.

Comments, texts, characters and directives of the preprocessor are passed over. The source is not
parsed: what does not compile is left out by the caller.
"""
import dataclasses
import re
from collections.abc import Iterator

COVERED = re.compile(
    r"""//[^\n]*|/\*.*?\*/|R"(\w*)\(.*?\)\1"|"(?:\\.|[^"\\\n])*"|'(?:\\.|[^'\\\n])+'|"""
    r"""^[ \t]*\#(?:\\\n|[^\n])*""", re.S | re.M)
DIGITS_WITH_QUOTES = re.compile(r"(?<=[0-9A-Fa-f])'(?=[0-9A-Fa-f])")
COMPARISON = re.compile(r"(?<= )(<=|>=|==|!=|<|>)(?= )")
TURNED = {"<=": "<", "<": "<=", ">=": ">", ">": ">=", "==": "!=", "!=": "=="}
NUMBER = re.compile(r"(?<![\w.'])(\d+)(?![\w.'])")
CONDITION = re.compile(r"\b(?:if|while) (?=\()")
STATEMENT = re.compile(r"^ +((?:\+\+|--|\*)?[A-Za-z_][\w:.\[\]>-]*(?:\(| (?:[-+*/%&|^]|<<|>>)?= |\+\+|--)[^\n]*;)$|"
                       r"^ +((?:\+\+|--)[A-Za-z_][\w:.\[\]>-]*;)$", re.M)
NO_STATEMENT = re.compile(r"(?:return|throw|delete|using|case|default|goto|static_assert|co_return)\b")
RETURN = re.compile(r"\breturn ([^;{}]+);")


@dataclasses.dataclass(frozen=True)
class Fault:
    """A part of a source, and what takes its place."""
    kind: str
    begin: int
    end: int
    text: str

    def put_into(self, source: str) -> str:
        return source[:self.begin] + self.text + source[self.end:]

    def line(self, source: str) -> int:
        return source.count("\n", 0, self.begin) + 1


def code_of(source: str) -> str:
    """Returns the source with blanks in place of what is not code; positions stay."""
    source = DIGITS_WITH_QUOTES.sub("_", source)
    return COVERED.sub(lambda part: re.sub(r"[^\n]", " ", part.group(0)), source)


def closing(code: str, opening: int) -> int:
    """Returns the position of the parenthesis that closes the one at `opening`; -1 for none."""
    depth = 0
    for position in range(opening, len(code)):
        depth += {"(": 1, ")": -1}.get(code[position], 0)
        if depth == 0:
            return position
    return -1


def comparisons(code: str) -> Iterator[Fault]:
    for match in COMPARISON.finditer(code):
        if "template" not in code[code.rfind("\n", 0, match.start()):match.start()]:
            yield Fault("comparison", match.start(), match.end(), TURNED[match.group()])


def constants(code: str) -> Iterator[Fault]:
    for match in NUMBER.finditer(code):
        number = int(match.group())
        for other in (number + 1, number - 1):
            if other >= 0:
                yield Fault("constant", match.start(), match.end(), str(other))


def conditions(code: str) -> Iterator[Fault]:
    for match in CONDITION.finditer(code):
        end = closing(code, match.end())
        inner = code[match.end() + 1:end]
        if end > 0 and ";" not in inner and not re.search(r"[^=!<>]=[^=]", inner):
            yield Fault("condition", match.end(), match.end() + 1, "(!(")
            # The other parenthesis follows from the first: see `whole`.


def statements(code: str) -> Iterator[Fault]:
    for match in STATEMENT.finditer(code):
        group = 1 if match.group(1) else 2
        before = code[:match.start(group)].rstrip()
        if before.endswith((";", "{", "}", ")", ":", "else")) and \
                not NO_STATEMENT.match(match.group(group)) and \
                match.group(group).count("(") == match.group(group).count(")"):
            yield Fault("statement", match.start(group), match.end(group), ";")


def returns(code: str) -> Iterator[Fault]:
    for match in RETURN.finditer(code):
        value = match.group(1).strip()
        other = {"true": "false", "false": "true", "nullptr": None, "0": None}.get(value, "{}")
        if other:
            yield Fault("return", match.start(1), match.end(1), other)


def whole(fault: Fault, source: str, code: str) -> Fault:
    """Completes a condition with its second parenthesis."""
    if fault.kind != "condition":
        return fault
    end = closing(code, fault.begin)
    return Fault(fault.kind, fault.begin, end + 1, "(!" + source[fault.begin:end + 1] + ")")


def faults_of(source: str) -> list[Fault]:
    """Returns every fault that can be put into the source, in the order of their places."""
    code = code_of(source)
    found = [fault for kind in (comparisons, constants, conditions, statements, returns)
             for fault in kind(code)]
    return sorted((whole(fault, source, code) for fault in found),
                  key=lambda fault: (fault.begin, fault.end, fault.text))
