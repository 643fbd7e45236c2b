"""What is changed in a line of C++ to see whether a test notices: a table of text edits."""

import re
from typing import Iterator, NamedTuple

# clang-format puts spaces around binary operators, and none into template arguments and pointers.
_SWAPS = [
    ("comparison", {" < ": [" <= "], " <= ": [" < "], " > ": [" >= "], " >= ": [" > "]}),
    ("equality", {" == ": [" != "], " != ": [" == "]}),
    ("arithmetic", {" + ": [" - "], " - ": [" + "], " * ": [" / "], " / ": [" * "], " % ": [" * "]}),
    ("assignment", {" += ": [" -= "], " -= ": [" += "], " *= ": [" /= "], " |= ": [" = "]}),
    ("logic", {" && ": [" || "], " || ": [" && "]}),
    ("bits", {" & ": [" | "], " | ": [" & "], " << ": [" >> "], " >> ": [" << "], " ^ ": [" | "]}),
    ("extreme", {"std::min(": ["std::max("], "std::max(": ["std::min("]}),
]
_PATTERNS = [
    ("step", re.compile(r"(?<![\w+])\+\+(?=\w)"), lambda m: ["--"]),
    ("step", re.compile(r"(?<![\w-])--(?=\w)"), lambda m: ["++"]),
    ("negation", re.compile(r"(?<=[( ])!(?=[\w(])"), lambda m: [""]),
    ("negation", re.compile(r"\bif \((?=\w[\w.]*(\(\))?\) )"), lambda m: ["if (!"]),
    ("truth", re.compile(r"\btrue\b"), lambda m: ["false"]),
    ("truth", re.compile(r"\bfalse\b"), lambda m: ["true"]),
    ("constant", re.compile(r"(?<![\w.'])\d+(?![\w.'])"), lambda m: [str(int(m[0]) + 1)]),
    ("constant", re.compile(r"(?<![\w.'])\d+\.\d*f?(?![\w.'])"), lambda m: [f"({m[0]} + {m[0]} + 1)"]),
    ("return", re.compile(r"(?<=\breturn )(?!(?:false|nullptr|0|std::nullopt|\{\});)[^;]+(?=;$)"), lambda m: ["{}"]),
    ("jump", re.compile(r"\bbreak(?=;)"), lambda m: [""]),
    ("jump", re.compile(r"\bcontinue(?=;)"), lambda m: [""]),
    # A call for its effect, alone on its line: no declaration, whose name follows a type.
    ("call", re.compile(r"^\s*(?!return\b|throw\b|using\b)[\w:>.\[\]-]+\(.*\);$"), lambda m: [";"]),
    ("store", re.compile(r"^\s*[\w.\[\]>-]+ = .*;$"), lambda m: [";"]),
]
_LEFT_ALONE = re.compile(r"^\s*(#|static_assert|namespace|using |template|extern|friend|enum |assert\()")


class Edit(NamedTuple):
    line: int  # from 0
    kind: str
    before: str  # the whole line
    after: str


def _code(text: str) -> list[str]:
    """The lines with comments and the insides of texts blank, each as long as it was."""

    def blank(match: re.Match) -> str:
        return re.sub(r"[^\n]", "\x01", match[0])

    pattern = r'//[^\n]*|/\*.*?\*/|"(?:\\.|[^"\\\n])*"|\'(?:\\.|[^\'\\\n])\''
    return re.sub(pattern, blank, text, flags=re.S).split("\n")


def edits(text: str) -> Iterator[Edit]:
    lines = text.split("\n")
    for number, code in enumerate(_code(text)):
        if _LEFT_ALONE.match(code):
            continue
        line = lines[number]
        found = []
        for kind, table in _SWAPS:
            for operator, others in table.items():
                for match in re.finditer(re.escape(operator), code):
                    found += [(match.start(), match.end(), kind, other) for other in others]
        for kind, pattern, others_of in _PATTERNS:
            for match in pattern.finditer(code.rstrip("\x01 ")):
                found += [(match.start(), match.end(), kind, other) for other in others_of(match)]
        for start, end, kind, other in sorted(found):
            yield Edit(number, kind, line, line[:start] + other + line[end:])
