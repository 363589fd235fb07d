"""Reading our own C++ sources as text, for the scripts that compare them with other files.

It relies on the repository's format: definitions at the margin, one token style. It is no C++
parser, and what it cannot read it refuses instead of guessing.
"""

import re


class SourceError(Exception):
    """A source that these scripts cannot read; the text says where and why."""


_TOKEN = re.compile(
    r"""
      (?P<comment>//[^\n]*|/\*.*?\*/)
    | (?P<string>"(?:\\.|[^"\\\n])*")
    | (?P<char>'(?:\\.|[^'\\\n])')
    """,
    re.VERBOSE | re.DOTALL,
)


def without_comments(text):
    """The text with comments blanked out, every character at its old place."""

    def blank(match):
        if match.lastgroup != "comment":
            return match.group()
        return re.sub(r"[^\n]", " ", match.group())

    return _TOKEN.sub(blank, text)


def without_strings(text):
    """The text, free of comments, with the insides of literals blanked out, at their old places."""

    def blank(match):
        token = match.group()
        if match.lastgroup == "comment":
            return re.sub(r"[^\n]", " ", token)
        return token[0] + "_" * (len(token) - 2) + token[-1]

    return _TOKEN.sub(blank, text)


def closing(blanked, opening):
    """Place of the bracket that closes the one at `opening`; of a text as without_strings gives."""
    pairs = {"(": ")", "{": "}", "[": "]"}
    stack = []
    for place in range(opening, len(blanked)):
        char = blanked[place]
        if char in pairs:
            stack.append(pairs[char])
        elif stack and char == stack[-1]:
            stack.pop()
            if not stack:
                return place
    raise SourceError(f"no closing bracket for the one at character {opening}")


def split_list(text, separator=","):
    """The parts of a list of arguments or initialisers, brackets and literals kept whole."""
    blanked = without_strings(text)
    parts, start, depth = [], 0, 0
    for place, char in enumerate(blanked):
        if char in "({[":
            depth += 1
        elif char in ")}]":
            depth -= 1
        elif char == separator and depth == 0:
            parts.append(text[start:place].strip())
            start = place + 1
    last = text[start:].strip()
    if last:
        parts.append(last)
    return parts


def joined_literals(text):
    """The text of adjacent string literals as the source spells it; None for anything else."""
    pieces = re.findall(r'"((?:\\.|[^"\\\n])*)"', text)
    rest = re.sub(r'"(?:\\.|[^"\\\n])*"', "", text)
    return "".join(pieces) if pieces and not rest.strip() else None


_DEFINITION = re.compile(
    r"^(?![#}/ \n])[^;{}()]*?(?P<name>(?:\w+::~?)*\b\w+)\((?P<parameters>[^;{}]*)\)\s*(?:const\s*)?\{",
    re.MULTILINE,
)


def functions(text):
    """The functions defined at the margin: (name with its class, parameters, body's start, body's
    end)."""
    blanked = without_strings(text)
    found = []
    for match in _DEFINITION.finditer(blanked):
        start = match.end() - 1
        found.append((match["name"], match["parameters"], start, closing(blanked, start)))
    return found
