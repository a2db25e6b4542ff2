"""Many changes in one build: each changed place asks mutants::isOn(NUMBER) whether its change is the one to try.

    a + b > c      becomes      (::mutants::isOn(7) ? (a - b > c) : (a + b > c))

The expression around a place is found by brackets and by what ends expressions, with the habits of clang-format: blanks
around operators, none around the brackets of templates. Where that fails the compiler says so, and the change is built
alone."""

import re

from changes import COMMENT, PROLOGUE, mask

TOKEN = re.compile(r"(?P<open>[(\[{])|(?P<close>[)\]}])"
                   r"|(?P<stop>[;,]|(?<!:):(?!:)|(?<=\s)\?(?=\s)|(?<=\s)(?:<<|>>|[-+*/%&|^])?=(?=\s)"
                   r"|\b(?:return|throw|else|do|case|co_return|co_yield)\b)"
                   r"|(?P<operator>->|(?<=\s)(?:<=>|<<|>>|[<>]=?|[!=]=)(?=\s))"
                   r"|(?P<less>(?<=\w)<)|(?P<greater>>)")
HEAD = re.compile(r"\b(?:if|for|while|switch|catch|constexpr)\s*$")
NEVER_ASKED = re.compile(r"\b(?:constexpr|consteval|enum)\b")


class Code:
    """A file's text with its brackets paired."""

    def __init__(self, text):
        self.text = text
        lines = text.splitlines()
        self.code = "\n".join(mask(lines)) + "\n"
        self.starts = [0]
        for line in lines:
            self.starts.append(self.starts[-1] + len(line) + 1)
        self.tokens = [(match.start(), match.end(), match.lastgroup) for match in TOKEN.finditer(self.code)]
        self.partner = {}
        self._pair()

    def _pair(self):
        stack = []
        for index, (_, _, kind) in enumerate(self.tokens):
            if kind in ("open", "less"):
                stack.append(index)
            elif kind == "greater" and stack and self.tokens[stack[-1]][2] == "less":
                self._join(stack.pop(), index)
            elif kind == "close":
                while stack and self.tokens[stack[-1]][2] == "less":
                    stack.pop()
                if stack:
                    self._join(stack.pop(), index)

    def _join(self, first, second):
        self.partner[first] = second
        self.partner[second] = first

    def left(self, place):
        """Where the expression around a place begins."""
        index = max((i for i, token in enumerate(self.tokens) if token[1] <= place), default=-1)
        while index >= 0:
            begin, end, kind = self.tokens[index]
            if kind == "stop" or kind == "open" or (kind == "close" and index not in self.partner):
                return end
            if kind in ("close", "greater") and index in self.partner:
                first = self.partner[index]
                ends_block = self.code[begin] == "}" and self.code[end:end + 1] == "\n"
                if ends_block or (self.code[begin] == ")" and HEAD.search(self.code[:self.tokens[first][0]])):
                    return end
                index = first
            elif kind == "less" and index in self.partner:
                return end
            index -= 1
        return 0

    def right(self, place, assigned=False):
        """Where it ends; what is assigned ends with its statement."""
        index = next((i for i, token in enumerate(self.tokens) if token[0] >= place), len(self.tokens))
        while index < len(self.tokens):
            begin, _, kind = self.tokens[index]
            within = assigned and self.code[begin] not in ";,"
            if kind == "close" or (kind == "stop" and not within) or (kind == "greater" and index in self.partner):
                return begin
            index = self.partner.get(index, index) + 1
        return len(self.code)

    def extent(self, change):
        """What is to be written twice, with nothing blank at its ends."""
        begin = self.starts[change.number] + change.begin
        end = self.starts[change.number] + change.end
        if not re.fullmatch(r"\d+|true|false|;", change.text):
            begin, end = self.left(begin), self.right(end, change.text in (" += ", " -= "))
        while self.code[begin] in " \n" + COMMENT:
            begin += 1
        while self.code[end - 1] in " \n" + COMMENT:
            end -= 1
        return begin, end

    def piece(self, begin, end):
        """The text without comments, on one line."""
        return "".join(" " if mark in COMMENT + "\n" else letter
                       for letter, mark in zip(self.text[begin:end], self.code[begin:end]))

    def switch(self, change, number):
        """What stands in place of an extent; it has the same number of lines."""
        begin, end = self.extent(change)
        at = self.starts[change.number]
        old = self.piece(begin, end)
        new = self.piece(begin, at + change.begin) + change.text + self.piece(at + change.end, end)
        if change.text == ";":
            text = f"{{ if (!::mutants::isOn({number})) {{ {old} }} }}"
        elif not change.text:
            # Without its "!" an optional would make an optional of the other side, too.
            text = f"(::mutants::isOn({number}) ? static_cast<bool>({new}) : ({old}))"
        else:
            text = f"(::mutants::isOn({number}) ? ({new}) : ({old}))"
        return begin, end, text + "\n" * self.code.count("\n", begin, end)

    def line_of(self, place):
        return self.code.count("\n", 0, place)

    def is_compiled_in(self, change):
        """Whether the compiler itself may compute what stands there, so that no switch is ever asked."""
        line = change.old[:change.end + 1]
        if re.search(r"\bcase\b|[<\[]\d+.?$", line):
            return True
        lines = self.text.splitlines()
        first = change.number
        while first > 0 and not re.match(r"[^\s{})]", lines[first]):
            first -= 1
        is_table = "(" not in lines[first] and "=" in lines[first]
        return is_table or bool(NEVER_ASKED.search("\n".join(lines[first:change.number + 1])))


def with_switches(text, changes):
    """The file's text with a switch for each of its (number, change), the lines that each fills, and the numbers of
    those that others leave no room for."""
    code = Code(text)
    placed, crowded, lines, taken = [], [], {}, []
    for number, change in changes:
        begin, end, new = code.switch(change, number)
        if any(begin < other_end and other_begin < end for other_begin, other_end in taken):
            crowded.append(number)
            continue
        taken.append((begin, end))
        placed.append((begin, end, new))
        lines[number] = range(code.line_of(begin), code.line_of(end) + 1)
    for begin, end, new in sorted(placed, reverse=True):
        text = text[:begin] + new + text[end:]
    return PROLOGUE + text, lines, crowded
