# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""A light reading of C and C++ text: enough to find comments and functions, not a parser."""

import re
from dataclasses import dataclass

_TOKENS = re.compile(
    r'(?P<comment>//[^\n]*|/\*.*?\*/)'
    r'|(?P<raw>R"(?P<tag>[^()\s\\]{0,16})\(.*?\)(?P=tag)")'
    r'|(?P<text>"(?:\\.|[^"\\\n])*"|(?<![0-9A-Za-z_])\'(?:\\.|[^\'\\\n])+\')', re.S)


@dataclass(frozen=True)
class Comment:
    start: int  # offsets in the text
    end: int
    line: int   # of its first character, counted from 1
    text: str


@dataclass(frozen=True)
class Function:
    name: str
    line: int        # of its opening brace
    length: int      # lines between the braces, lines of raw texts apart
    body: str        # what stands between the braces, comments and literals blanked


def _blanked(text):
    return re.sub(r"[^\n]", " ", text)


class Source:
    """One file's text, with comments, literals and preprocessor lines set apart."""

    def __init__(self, text):
        self.text = text
        self.comments = []
        raw_lines = set()

        def replace(match):
            line = text.count("\n", 0, match.start()) + 1
            if match.lastgroup == "comment":
                self.comments.append(Comment(match.start(), match.end(), line, match.group()))
                return _blanked(match.group())
            if match.group("raw"):
                raw_lines.update(range(line + 1, line + match.group().count("\n") + 1))
            return '"' + _blanked(match.group()[1:-1]) + '"'

        self.raw_lines = raw_lines
        self.code = _TOKENS.sub(replace, text)
        # what the compiler proper sees: no preprocessor lines, their continuations included
        self.plain = re.sub(r"^[ \t]*#(?:[^\n]*\\\n)*[^\n]*", lambda match: _blanked(match.group()), self.code,
                            flags=re.M)

    def line_of(self, offset):
        return self.text.count("\n", 0, offset) + 1

    def functions(self):
        """Every function with a body, at namespace level or in a class; a test case counts as one."""
        stack = []  # (kind, name, offset of the opening brace)
        head_start = 0
        for match in re.finditer(r"[{};]", self.plain):
            sign, offset = match.group(), match.start()
            head = self.plain[head_start:offset]
            head_start = match.end()
            if sign == "{":
                inside_code = any(kind in ("function", "block") for kind, _, _ in stack)
                stack.append((*_classify(head, inside_code), offset))
            elif sign == "}" and stack:
                kind, name, start = stack.pop()
                if kind == "function":
                    first, last = self.line_of(start), self.line_of(offset)
                    inner = set(range(first + 1, last)) - self.raw_lines
                    yield Function(name, first, len(inner), self.code[start + 1:offset])


def _classify(head, inside_code):
    """(kind, name) of the block that follows the given text."""
    head = re.sub(r'\bextern\s*"[^"]*"', "extern_language", head)
    head = re.sub(r"\bBOARD_CALL_END\s*\(\w+\)", " ", head)  # the end of the function before
    head = re.sub(r"\[\[.*?\]\]|\b(alignas|noexcept|requires|DRV_ENUM)\s*\([^()]*\)", " ", head)
    if re.search(r"\b(namespace|extern_language)\b[^()]*$", head):
        return "namespace", ""
    if inside_code or head.rstrip().endswith(("=", ",", "(")):
        return "block", ""
    if re.search(r"\b(class|struct|union|enum)\b[^()=]*$", head):
        return "class", ""
    test = re.search(r"\bTEST(?:_F|_P)?\s*\(\s*(\w+)\s*,\s*(\w+)\s*\)", head)
    if test:
        return "function", f"{test.group(1)}.{test.group(2)}"
    name = re.search(r"([\w:~]+|operator\s*\S+)\s*\(", head)
    if name and ")" in head and "=" not in head.split("(")[0].replace("operator==", ""):
        return "function", name.group(1)
    return "block", ""
