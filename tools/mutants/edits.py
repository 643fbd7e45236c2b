"""What is changed in C++ to see whether a test notices, and how every change stands in the source at once,
each behind a switch of its own."""

import bisect
import re
from typing import Iterator, NamedTuple

# clang-format parts binary operators from their operands, and pointers and template arguments from nothing.
_PRECEDENCE = {
    **dict.fromkeys(["*", "/", "%"], 10),
    **dict.fromkeys(["+", "-"], 9),
    **dict.fromkeys(["<<", ">>"], 8),
    **dict.fromkeys(["<", "<=", ">", ">=", "<=>"], 7),
    **dict.fromkeys(["==", "!="], 6),
    "&": 5,
    "^": 4,
    "|": 3,
    "&&": 2,
    "||": 1,
    **dict.fromkeys(["=", "+=", "-=", "*=", "/=", "%=", "|=", "&=", "^=", "<<=", ">>="], 0),
}
_SWAPS = {
    "comparison": {"<": "<=", "<=": "<", ">": ">=", ">=": ">"},
    "equality": {"==": "!=", "!=": "=="},
    "arithmetic": {"+": "-", "-": "+", "*": "/", "/": "*", "%": "*"},
    "assignment": {"+=": "-=", "-=": "+=", "*=": "/=", "|=": "="},
    "logic": {"&&": "||", "||": "&&"},
    "bits": {"&": "|", "|": "&", "<<": ">>", ">>": "<<", "^": "|"},
}
_TRIVIAL_RESULTS = {"false", "true", "nullptr", "0", "std::nullopt", "{}"}
# What may be left out without a difference to any result.
_SPEED_ALONE = re.compile(r"\b(reserve|prefetch\w*|shrink_to_fit)\(")
_TOKEN = re.compile(
    r"""(?P<comment>//[^\n]*|/\*.*?\*/|^[ ]*\#(?:[^\n]*\\\n)*[^\n]*)
    |(?P<text>"(?:\\.|[^"\\\n])*"|(?<![0-9a-fA-F])'(?:\\.|[^'\\\n])+')
    |(?P<number>\.?\d(?:[eEpP][+-]|[\w.'])*)
    |(?P<word>[A-Za-z_]\w*)
    |(?P<sign>::|->|\+\+|--|<<=|>>=|<=>|<=|>=|==|!=|&&|\|\||[-+*/%&|^]=|<<|>>|\.\.\.|\S)""",
    re.S | re.M | re.X,
)
_OPEN, _CLOSE = "([{<", ")]}>"
_ENDS = {"?", ":", ",", ";"}
_STATEMENT_WORDS = {"return", "throw", "else", "case", "do", "co_return"}


class Token(NamedTuple):
    kind: str
    text: str
    start: int
    end: int


class Edit(NamedTuple):
    kind: str
    start: int  # of the expression or statement that is chosen between
    end: int
    at: int  # what is replaced in it
    until: int
    by: str
    statement: bool

    def of(self, text: str) -> str:
        """The expression as changed, on one line."""
        changed = text[self.start : self.at] + self.by + text[self.until : self.end]
        return re.sub(r"//[^\n]*\n|\n", " ", changed)

    def line(self, text: str) -> int:
        return text.count("\n", 0, self.at) + 1

    def shown(self, text: str) -> tuple[str, str]:
        """The line or lines that are changed, before and after."""
        first, last = text.rfind("\n", 0, self.at) + 1, text.find("\n", self.until)
        before, after = text[first:last], text[first : self.at] + self.by + text[self.until : last]
        return " ".join(before.split()), " ".join(after.split())


class _Source:
    def __init__(self, text: str) -> None:
        self.text = text
        self.tokens = [
            Token(match.lastgroup, match[0], match.start(), match.end())
            for match in _TOKEN.finditer(text)
            if match.lastgroup != "comment"
        ]
        self.match = self._brackets()

    def _brackets(self) -> dict[int, int]:
        match, stack = {}, []
        for i, token in enumerate(self.tokens):
            text = token.text
            if text in "([{" or (text == "<" and not self.text[token.end].isspace()):
                stack.append((text, i))
            elif text in (">", ">>") and not self.binary(i):
                for _ in text:
                    if stack and stack[-1][0] == "<":
                        match[i] = stack.pop()[1]
                        match[match[i]] = i
            elif text in ")]}":
                while stack and stack[-1][0] == "<":
                    stack.pop()
                if stack:
                    match[i] = stack.pop()[1]
                    match[match[i]] = i
        return match

    def binary(self, i: int) -> bool:
        token = self.tokens[i]
        return (
            token.text in _PRECEDENCE
            and self.text[token.start - 1].isspace()
            and self.text[token.end].isspace()
        )

    def ends(self, i: int, precedence: float) -> bool:
        """Whether an operand of this precedence does not reach over token `i`."""
        text = self.tokens[i].text
        if text in _ENDS or text in _STATEMENT_WORDS:
            return True
        return self.binary(i) and _PRECEDENCE[text] < precedence

    def left(self, i: int, precedence: int) -> int:
        """The first token of the operand before operator `i`."""
        j = i
        while j > 0:
            before = j - 1
            token = self.tokens[before]
            if self.ends(before, precedence):
                break
            follows = self.tokens[j].kind in ("word", "number", "text") and j != i
            if follows and (token.kind in ("word", "number") and token.text != "sizeof" or token.text in (")", "}", "]", ">")):
                break  # two operands side by side: the end of a condition, a type and its name
            if before in self.match:
                if self.match[before] > before:
                    break  # an opening bracket
                before = self.match[before]
            elif token.text in ("(", "[", "{", "}"):
                break
            j = before
        return j

    def right(self, i: int, precedence: int) -> int:
        """The last token of the operand after operator `i`."""
        j = i
        while j + 1 < len(self.tokens):
            after = j + 1
            choice = precedence == 0 and self.tokens[after].text in ("?", ":")  # all of it is assigned
            if self.ends(after, precedence + 0.5) and not choice:
                break
            if after in self.match:
                if self.match[after] < after:
                    break
                after = self.match[after]
            elif self.tokens[after].text in (")", "]", "}"):
                break
            j = after
        return j

    def operand_after(self, i: int) -> int:
        """The last token of what a prefix such as `!` applies to."""
        j = i + 1
        while self.tokens[j].text in ("!", "*", "-", "++", "--"):
            j += 1
        j = self.match.get(j, j)
        while j + 1 < len(self.tokens):
            text = self.tokens[j + 1].text
            if text in ("::", ".", "->"):
                j += 2
            elif text in ("(", "[", "<") and j + 1 in self.match and not self.binary(j + 1):
                j = self.match[j + 1]
            else:
                break
        return j

    def edit(self, kind: str, first: int, last: int, i: int, until: int, by: str, statement=False) -> Edit:
        tokens = self.tokens
        return Edit(kind, tokens[first].start, tokens[last].end, tokens[i].start, tokens[until].end, by, statement)

    def begins_statement(self, i: int) -> bool:
        return i > 0 and self.tokens[i - 1].text in (";", "{", "}", ")", "else")

    def end_of_statement(self, i: int) -> int | None:
        """The semicolon of the statement that begins at token `i`; none where a block comes first."""
        while i < len(self.tokens) and self.tokens[i].text != ";":
            if self.tokens[i].text in (")", "]", "}"):
                return None
            if self.tokens[i].text in ("(", "[", "{"):
                i = self.match.get(i, len(self.tokens))
            i += 1
        return i if i < len(self.tokens) else None

    def operators(self, i: int) -> Iterator[Edit]:
        text = self.tokens[i].text
        for kind, table in _SWAPS.items():
            if text in table:
                precedence = _PRECEDENCE[text]
                first, last = self.left(i, precedence), self.right(i, precedence)
                if first < i < last:
                    if text == "+" and any(token.kind == "text" for token in self.tokens[first : last + 1]):
                        continue  # texts one after the other
                    yield self.edit(kind, first, last, i, i, table[text])

    def numbers(self, i: int) -> Iterator[Edit]:
        text = self.tokens[i].text
        by = None
        if match := re.fullmatch(r"(\d+)([uU]?[lL]*)", text):
            by = f"{int(match[1]) + 1}{match[2]}"
        elif re.fullmatch(r"0[xX][\da-fA-F]+[uU]?[lL]*", text):
            by = f"({text} ^ 1)"
        elif re.fullmatch(r"\d+\.\d*(e-?\d+)?f?|\d+e-?\d+f?", text):
            by = f"({text} + {text} + 1)"
        pure = self.tokens[i - 1].text == "=" and self.tokens[i - 2].text in (")", "const", "noexcept")
        if by and not pure:
            yield self.edit("constant", i, i, i, i, by)

    def words(self, i: int) -> Iterator[Edit]:
        tokens, text = self.tokens, self.tokens[i].text
        if text in ("true", "false"):
            yield self.edit("truth", i, i, i, i, "false" if text == "true" else "true")
        if text in ("min", "max") and tokens[i - 1].text == "::" and tokens[i - 2].text == "std":
            last = self.operand_after(i - 1)
            if tokens[last].text == ")":
                yield self.edit("extreme", i - 2, last, i, i, "max" if text == "min" else "min")
        if text == "if" and tokens[i + 1].text == "(":
            first, last = i + 2, self.match[i + 1] - 1
            if not any(self.binary(j) or tokens[j].text in (";", "!") for j in range(first, last + 1)):
                whole = self.text[tokens[first].start : tokens[last].end]
                yield self.edit("negation", first, last, first, last, f"!({whole})")
        if text in ("break", "continue") and tokens[i + 1].text == ";":
            yield self.edit("jump", i, i + 1, i, i, "", True)
        if text == "return":
            last = self.end_of_statement(i)
            if last and last > i + 1:
                result = self.text[tokens[i + 1].start : tokens[last - 1].end]
                if result not in _TRIVIAL_RESULTS:
                    yield self.edit("return", i, last, i + 1, last - 1, "{}", True)

    def statements(self, i: int) -> Iterator[Edit]:
        """A call for its effect, and what is stored: no declaration, whose name follows a type."""
        first, last = self.tokens[i], self.end_of_statement(i)
        if last is None or first.text in _STATEMENT_WORDS | {"auto", "using", "if", "for", "while", "static_assert"}:
            return
        end = self.operand_after(i - 1)
        whole = self.text[first.start : self.tokens[last].end]
        if _SPEED_ALONE.search(whole) or first.text.startswith(("HWY_", "assert")):
            return
        one_word = self.tokens[i + 1].text == "(" and first.text[0].isupper()  # a constructor's declaration
        if end == last - 1 and self.tokens[end].text == ")" and not one_word:
            yield self.edit("call", i, last, i, last - 1, "", True)
        elif self.tokens[end + 1].text == "=" and self.tokens[end + 2].text not in ("delete", "default"):
            yield self.edit("store", i, last, i, last - 1, "", True)

    def edits(self) -> Iterator[Edit]:
        for i, token in enumerate(self.tokens):
            if i < 2 or i + 2 >= len(self.tokens):
                continue
            if self.binary(i):
                yield from self.operators(i)
            elif token.text in ("++", "--") and self.tokens[i + 1].kind == "word":
                last = self.operand_after(i)
                yield self.edit("step", i, last, i, i, "--" if token.text == "++" else "++")
            elif token.text == "!":
                yield self.edit("negation", i, self.operand_after(i), i, i, "!!")
            elif token.kind == "number":
                yield from self.numbers(i)
            elif token.kind == "word":
                yield from self.words(i)
                if self.begins_statement(i):
                    yield from self.statements(i)


def edits(text: str) -> list[Edit]:
    """All edits, from the outermost to the innermost where one holds another."""
    return sorted(_Source(text).edits(), key=lambda edit: (edit.start, -edit.end, edit.at))


def switched(text: str, numbered: list[tuple[int, Edit]]) -> str:
    """The source with each of the edits, which are as `edits` gives them, behind `quenbyMutant(number)`. Lines
    stay where they are."""

    def part(start: int, end: int, inside: list[tuple[int, Edit]]) -> str:
        out, at = [], start
        while inside:
            number, edit = inside[0]
            same = [(n, e) for n, e in inside if (e.start, e.end) == (edit.start, edit.end)]
            within = [(n, e) for n, e in inside if edit.start <= e.start and e.end <= edit.end]
            inside = [(n, e) for n, e in inside if e.start >= edit.end]  # what overlaps by half is left out
            out.append(text[at : edit.start])
            chosen = part(edit.start, edit.end, [pair for pair in within if pair not in same])
            for n, e in reversed(same):
                if e.statement:
                    chosen = f"{{ if (quenbyMutant({n})) {{ {e.of(text)} }} else {{ {chosen} }} }}"
                else:
                    chosen = f"(quenbyMutant({n}) ? ({e.of(text)}) : ({chosen}))"
            out.append(chosen)
            at = edit.end
        return "".join(out) + text[at:end]

    return part(0, len(text), numbered)
