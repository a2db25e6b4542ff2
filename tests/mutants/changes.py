"""The single small changes that scripts/mutate makes, found line by line in the code of a room."""

import pathlib
import re
from typing import NamedTuple

PROLOGUE = '#include "tests/mutants/switch.h"\n#line 1\n'  # of each changed file
COMMENT = "\1"  # what stands for the characters of a comment, and of a text
TEXT = "\0"

# clang-format sets blanks around operators of two sides, and none around the brackets of templates.
SWAPS = [
    (r" < ", " <= "), (r" <= ", " < "), (r" > ", " >= "), (r" >= ", " > "),
    (r" == ", " != "), (r" != ", " == "), (r" && ", " || "), (r" \|\| ", " && "),
    (r" \+ ", " - "), (r" - ", " + "), (r" \* ", " / "), (r" / ", " * "), (r" % ", " / "),
    (r" \+= ", " -= "), (r" -= ", " += "), (r" & ", " | "), (r" \| ", " & "), (r" << (?=\d)", " >> "),
    (r" >> (?=\d)", " << "), (r"\btrue\b", "false"), (r"\bfalse\b", "true"), (r"(?<=[(& ])!(?=[\w(])", ""),
    (r"\+\+", "--"), (r"\bbreak;", ";"), (r"\bcontinue;", ";"), (r"\bstd::min\b", "std::max"), (r"\bstd::max\b", "std::min"),
]
NUMBER = re.compile(r"(?<![\w.\"'])(\d+)(?![\w.'])")
STATEMENT = re.compile(r"^\s+(?!return\b|using\b|case\b|throw\b|break\b|continue\b|default\b|goto\b)"
                       r"(?:\+\+|--)?[a-zA-Z_][\w.:>\[\]-]*(?:\(.*\)| [+-]?= .*|\+\+|--)?;$")
RESERVE = re.compile(r"^[a-zA-Z_][\w.]*\.reserve\(.*\);$")
HEAD = {"break;": re.compile(r"\bswitch$"), "continue;": re.compile(r"\b(?:for|while)$")}
DECLARATION = re.compile(r"^\s*(?:static_assert|constexpr|#|using|namespace|template|extern|friend|typedef)\b")


class Change(NamedTuple):
    file: pathlib.Path  # from the root
    number: int  # of the line, from 0
    old: str  # the line
    new: str
    begin: int  # in the line: what is replaced
    end: int
    text: str  # by what


def masked(line):
    """The line with what stands in texts and comments replaced, so that no change is made there."""
    line = re.sub(r'"(?:\\.|[^"\\])*"|\'(?:\\.|[^\'\\])\'', lambda text: TEXT * len(text.group()), line)
    comment = line.find("//")
    return line if comment < 0 else line[:comment] + COMMENT * (len(line) - comment)


def raw_lines(lines):
    """The numbers of lines inside raw texts of several lines."""
    inside, numbers = None, set()
    for number, line in enumerate(lines):
        if inside is not None:
            numbers.add(number)
            if inside in line:
                inside = None
            continue
        start = re.search(r'R"(\w*)\(', line)
        if start and ")" + start.group(1) + '"' not in line[start.end():]:
            numbers.add(number)
            inside = ")" + start.group(1) + '"'
    return numbers


def mask(lines):
    """All lines of a file, masked."""
    raw = raw_lines(lines)
    return [TEXT * len(line) if number in raw else masked(line) for number, line in enumerate(lines)]


def head_of_block(code):
    """What stands before the round brackets that lead to the last block that stays open; nothing where it has none."""
    blocks = 0
    for at in range(len(code) - 1, -1, -1):
        blocks += {"}": 1, "{": -1}.get(code[at], 0)
        if blocks < 0:
            break
    head = code[:at].rstrip() if blocks < 0 else ""
    brackets = 0
    for at in range(len(head) - 1, -1, -1):
        brackets += {")": 1, "(": -1}.get(head[at], 0)
        if brackets == 0:
            return head[:at].rstrip()
    return ""


def ends_its_block(codes, number):
    """Whether a line is a `break;` or a `continue;` alone, right before the closing brace of its own switch or loop,
    where the way goes on all the same."""
    word = codes[number].strip(COMMENT + " ")
    if word not in HEAD:
        return False
    above = [code for code in (code.strip(COMMENT + " ") for code in codes[:number]) if code]
    below = [code for code in (code.strip(COMMENT + " ") for code in codes[number + 1:]) if code]
    if not above or above[-1][-1] not in ";:{}" or not below or below[0][0] != "}":
        return False  # such as a break of a loop without braces
    return bool(HEAD[word].search(head_of_block("\n".join(codes[:number]))))


def changes_of(line, code):
    """All single changes of a line, as begin, end and new text."""
    if not code.strip(TEXT + COMMENT + " ") or DECLARATION.match(code):
        return
    for pattern, new in SWAPS:
        for match in re.finditer(pattern, code):
            if TEXT in (code[match.start() - 1:match.start()], code[match.end():match.end() + 1]) and new in (" - ", " -= "):
                continue  # texts can only be joined
            yield match.start(), match.end(), new
    for match in NUMBER.finditer(code):
        yield match.start(), match.end(), str(int(match.group()) + 1)
    statement = code.rstrip(TEXT + COMMENT + " ")
    if STATEMENT.match(statement) and not RESERVE.match(statement.strip()):  # without it all but the time is the same
        yield len(line) - len(line.lstrip()), len(statement), ";"


def changes_in(root, room):
    """All changes of the files below a room."""
    found = []
    for path in sorted((root / room).rglob("*")):
        if path.suffix not in (".cpp", ".h"):
            continue
        lines = path.read_text().splitlines()
        codes = mask(lines)
        for number, (line, code) in enumerate(zip(lines, codes)):
            if ends_its_block(codes, number):
                continue
            for begin, end, text in changes_of(line, code):
                found.append(Change(path.relative_to(root), number, line, line[:begin] + text + line[end:], begin, end,
                                    text))
    return found


def one_by_one(text, change):
    """The text of the file with the change made."""
    lines = text.splitlines()
    lines[change.number] = change.new
    return PROLOGUE + "\n".join(lines) + "\n"
