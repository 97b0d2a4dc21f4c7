# SPDX-License-Identifier: MIT
"""Finds the places of a C++ source that can be mutated, and the new text of each.

Reads tokens, not grammar: it relies on clang-format's layout, which has a blank on both sides of every
binary operator. The compiler refuses mutations that make no sense.
"""

import re
from dataclasses import dataclass

TOKEN = re.compile(
    r"""
    (?P<blank>\s+ | //[^\n]* | /\*.*?\*/ | \#[^\n]*(?<!\\)$)
  | (?P<text>(?:u8|[uUL])?"(?:\\.|[^"\\\n])*")
  | (?P<char>(?:u8|[uUL])?'(?:\\.|[^'\\\n])+')
  | (?P<number>(?:0[xX][0-9a-fA-F']+|\d[\d']*(?:\.\d+)?)[uUlLfF]*)
  | (?P<name>[A-Za-z_]\w*)
  | (?P<operator><<=|>>=|\.\.\.|->\*|::|->|\+\+|--|<<|>>|<=|>=|==|!=|&&|\|\||[-+*/%&|^]=|.)
    """,
    re.VERBOSE | re.MULTILINE | re.DOTALL,
)

SWAPS = {
    "==": "!=", "!=": "==", "<": "<=", "<=": "<", ">": ">=", ">=": ">", "&&": "||", "||": "&&",
    "+": "-", "-": "+", "*": "/", "/": "*", "|": "&", "&": "|", "|=": "&=", "+=": "-=", "-=": "+=",
}  # fmt: skip
NOT_STATEMENTS = {
    "break", "case", "catch", "class", "const", "constexpr", "continue", "default", "do", "else",
    "enum", "explicit", "extern", "for", "friend", "if", "inline", "namespace", "operator",
    "private", "protected", "public", "return", "static", "static_assert", "struct", "switch",
    "template", "try", "typedef", "typename", "union", "using", "virtual", "while",
}  # fmt: skip
CONSTANT = re.compile(r"(?:GIT|O|F|S|SIG|STD|E|PATH)_?[A-Z0-9]*_[A-Z0-9_]+$|GIT_[A-Z0-9_]+$")
NOT_CONSTANT = re.compile(r".*_(?:INIT|VERSION)$")


@dataclass(frozen=True)
class Token:
    kind: str
    text: str
    begin: int
    end: int


@dataclass(frozen=True)
class Mutation:
    """One change of one file: the text from begin to end becomes `after`."""

    file: str
    kind: str
    begin: int
    end: int
    after: str
    line: int
    in_function: bool

    def apply(self, source):
        return source[: self.begin] + self.after + source[self.end :]

    def lines(self, source):
        """The old and the new text of the changed lines, without their layout."""
        begin = source.rfind("\n", 0, self.begin) + 1
        end = source.find("\n", self.end)
        before = source[begin:end]
        after = source[begin : self.begin] + self.after + source[self.end : end]
        return " ".join(before.split()), " ".join(after.split())


def tokenize(source):
    tokens = []
    for match in TOKEN.finditer(source):
        if match.lastgroup != "blank":
            tokens.append(Token(match.lastgroup, match.group(), match.start(), match.end()))
    return tokens


class Finder:
    def __init__(self, file, source):
        self.file = file
        self.source = source
        self.tokens = tokenize(source)
        self.partner, self.enclosing = self._match_brackets()
        self.function_at = self._find_functions()
        self.found = []

    def find(self):
        for index, token in enumerate(self.tokens):
            if self._is_left_alone(index):
                continue
            if token.text in ("if", "while") and token.kind == "name":
                self._negate_condition(index)
            elif token.kind == "operator":
                self._swap_operator(index)
            elif token.kind in ("number", "char", "text"):
                self._change_literal(index)
            elif token.kind == "name":
                self._change_name(index)
            if self.function_at[index] and self._begins_statement(index):
                self._drop_statement(index)
        return self.found

    def _match_brackets(self):
        """Returns the partner of each bracket, and the enclosing bracket of each token."""
        partner, enclosing, open_ones = {}, [], []
        for index, token in enumerate(self.tokens):
            enclosing.append(open_ones[-1] if open_ones else None)
            if token.kind != "operator":
                continue
            if token.text in "([{":
                open_ones.append(index)
            elif token.text in ")]}":
                begin = open_ones.pop()
                partner[begin], partner[index] = index, begin
        return partner, enclosing

    def _find_functions(self):
        """Returns for each token whether it is in the body of a function."""
        inside, kinds = [], []
        for index, token in enumerate(self.tokens):
            if token.kind == "operator" and token.text == "{":
                kinds.append(any(kinds) or self._opens_function(index))
            inside.append(any(kinds))
            if token.kind == "operator" and token.text == "}":
                kinds.pop()
        return inside

    def _opens_function(self, index):
        head = []
        for token in reversed(self.tokens[:index]):
            if token.text in (";", "{", "}"):
                break
            head.append(token.text)
        return ")" in head and not {"namespace", "class", "struct", "enum"} & set(head[-1:])

    def _text(self, index):
        return self.tokens[index].text if 0 <= index < len(self.tokens) else ""

    def _is_left_alone(self, index):
        """Returns true for what the compiler checks or no run can see: assertions, names, template lists."""
        begin = index
        while begin > 0 and self._text(begin - 1) not in (";", "{", "}"):
            begin -= 1
        return self._text(begin) in ("static_assert", "using", "namespace", "template", "friend")

    def _add(self, kind, first, last, after):
        begin, end = self.tokens[first].begin, self.tokens[last].end
        line = self.source.count("\n", 0, begin) + 1
        self.found.append(
            Mutation(self.file, kind, begin, end, after, line, self.function_at[first])
        )

    def _negate_condition(self, index):
        begin = index + 1
        if self._text(begin) == "constexpr":
            return
        end = self.partner[begin]
        inside = range(begin + 1, end)
        last_semicolon = max((i for i in inside if self._text(i) == ";"), default=begin)
        texts = [self._text(i) for i in range(last_semicolon + 1, end)]
        # A change of the operator in it has the same effect.
        if not {"&&", "||"} & set(texts) and (texts[0] == "!" or {"==", "!="} & set(texts)):
            return
        condition = self.source[self.tokens[last_semicolon].end : self.tokens[end].begin].strip()
        self._add("condition negated", last_semicolon + 1, end - 1, f"!({condition})")

    def _swap_operator(self, index):
        token = self.tokens[index]
        around = self.source[token.begin - 1], self.source[token.end : token.end + 1]
        is_binary = around[0].isspace() and around[1].isspace()
        if token.text == "!" and self._text(index + 1) != "=":
            self._add("negation dropped", index, index, "")
        elif token.text in SWAPS and is_binary:
            self._add("operator changed", index, index, SWAPS[token.text])

    def _change_literal(self, index):
        token = self.tokens[index]
        if token.kind == "number":
            if "." in token.text or self._is_pure_specifier(index):
                return
            digits = re.match(r"(0[xX][0-9a-fA-F']+|[\d']+)(.*)", token.text)
            value = int(digits[1].replace("'", ""), 0 if "x" in digits[1].lower() else 10)
            self._add("literal changed", index, index, f"{value + 1}{digits[2]}")
        elif token.kind == "char":
            self._add("literal changed", index, index, "'~'" if token.text[0] == "'" else "u'~'")
        elif self._text(index - 1) != "extern":
            quote = token.text.index('"')
            inside = token.text[quote + 1 : -1]
            after = token.text[:quote] + ('""' if inside else '"~"')
            self._add("literal changed", index, index, after)

    def _is_pure_specifier(self, index):
        return self._text(index - 1) == "=" and self._text(index - 2) in (")", "const", "noexcept")

    def _change_name(self, index):
        text = self._text(index)
        if text in ("true", "false"):
            after = "false" if text == "true" else "true"
            if self._text(index - 1) != "noexcept":
                self._add("literal changed", index, index, after)
        elif CONSTANT.match(text) and not NOT_CONSTANT.match(text):
            after = f"static_cast<decltype({text})>({text} + 1)"
            self._add("constant changed", index, index, after)

    def _begins_statement(self, index):
        enclosing = self.enclosing[index]
        if enclosing is None or self._text(enclosing) != "{":
            return False
        if self._text(index - 1) not in (";", "{", "}") and not self._follows_condition(index):
            return False
        beginnings = ("::", "*", "++", "--", "(")
        return self.tokens[index].kind == "name" or self._text(index) in beginnings

    def _follows_condition(self, index):
        if self._text(index - 1) == "else":
            return True
        if self._text(index - 1) != ")":
            return False
        return self._text(self.partner[index - 1] - 1) in ("if", "for", "while")

    def _statement_end(self, index):
        while index < len(self.tokens) and self._text(index) != ";":
            if self._text(index) in ("(", "[", "{"):
                index = self.partner[index]
            elif self._text(index) in (")", "]", "}"):
                return None
            index += 1
        return index if index < len(self.tokens) else None

    def _drop_statement(self, index):
        end = self._statement_end(index)
        if end is None or end == index or self._text(end) != ";":
            return
        first = self._text(index)
        if first in ("break", "continue"):
            self._add("statement dropped", index, end, ";")
        elif first == "return":
            if self._is_guarded(index, end):
                self._add("statement dropped", index, end, ";")
        elif first == "throw" or first not in NOT_STATEMENTS and self._is_expression(index, end):
            self._add("statement dropped", index, end, ";")

    def _is_guarded(self, index, end):
        """Returns true if the function can continue without this statement: a condition decides about it."""
        if self._follows_condition(index):
            return self._text(end + 1) != "}"
        if self._text(end + 1) != "}":
            return True
        opened = self.partner[end + 1]
        return self._follows_condition(opened) and self._text(end + 2) not in ("}", "else")

    def _is_expression(self, index, end):
        """Returns true for a call, an assignment or an output, false for the declaration of a name."""
        position = index
        while position < end:
            text = self._text(position)
            if text in ("=", "+=", "-=", "|=", "&=", "<<", "++", "--"):
                return True
            if text == "(":
                # A call has a name directly before the bracket, and no name before that.
                before = self.tokens[position - 2] if position - 2 >= index else None
                if before is not None and before.kind == "name" or before and before.text in "&>":
                    return False
                position = self.partner[position] + 1
                if position >= end or self._text(position) in (".", "->", "=", "(", "["):
                    return True
                continue
            if text == "<" and self.source[self.tokens[position].begin - 1] != " ":
                return self._text(end - 1) == ")" and self._text(index) in ("std", "static_cast")
            if self.tokens[position].kind == "name" and self._declares(position + 1):
                return False
            position += 1
        return False

    def _declares(self, index):
        """Returns true if a name follows, or a star or ampersand of a name."""
        token = self.tokens[index]
        if token.text in ("*", "&", "&&"):
            return not self.source[token.end].isspace()
        return token.kind == "name"


def find_mutations(file, source):
    """Returns all mutations of a source, in its order, each once."""
    unique = {}
    for mutation in Finder(file, source).find():
        unique.setdefault((mutation.begin, mutation.end, mutation.after), mutation)
    return sorted(unique.values(), key=lambda mutation: (mutation.begin, mutation.end))
