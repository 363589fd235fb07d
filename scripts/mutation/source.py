"""One C++ source as the finders of mutants see it, and what a mutant is."""

import re
from dataclasses import dataclass

from cpp_text import SourceError, closing, without_strings


@dataclass(frozen=True)
class Mutant:
    """One change: `new` in place of text[start:end] of a file."""

    file: str  # relative to the source tree
    kind: str
    line: int
    start: int
    end: int
    new: str
    before: str  # the lines that change, on one line
    after: str

    def applied(self, text):
        return text[: self.start] + self.new + text[self.end :]

    def key(self):
        """What names the mutant when lines have moved."""
        return self.file, self.before, self.after

    def title(self):
        return f"{self.file}:{self.line}: {self.kind}\n  - {self.before}\n  + {self.after}"


def one_line(text):
    return " ".join(text.split())


_BODY = re.compile(r"(?:\)|\bconst|\bnoexcept)\s*\{")
_DIRECTIVE = re.compile(r"^[ \t]*#(?:[^\n]*\\\n)*[^\n]*", re.MULTILINE)


class Source:
    """A source with its literals and comments blanked out at their old places."""

    def __init__(self, file, text):
        self.file = file
        self.text = text
        self.blanked = _DIRECTIVE.sub(lambda m: re.sub(r"[^\n]", " ", m[0]), without_strings(text))
        self._bodies = self._find_bodies()

    def _find_bodies(self):
        bodies = []
        for match in _BODY.finditer(self.blanked):
            start = match.end() - 1
            if not bodies or start > bodies[-1][1]:
                bodies.append((start, closing(self.blanked, start)))
        return bodies

    def in_body(self, place):
        """Whether a function's body is there."""
        return any(start < place < end for start, end in self._bodies)

    def in_code(self, place):
        """Whether the place is worth a change: of a header only bodies and constants are."""
        if not self.file.endswith(".h") or self.in_body(place):
            return True
        start = self.text.rfind("\n", 0, place) + 1
        return re.match(r"(inline |static )*constexpr ", self.text[start:place].lstrip()) is not None

    def mutant(self, kind, start, end, new):
        first = self.text.rfind("\n", 0, start) + 1
        last = self.text.find("\n", end)
        after = self.text[first:start] + new + self.text[end:last]
        return Mutant(
            file=self.file,
            kind=kind,
            line=self.text.count("\n", 0, start) + 1,
            start=start,
            end=end,
            new=new,
            before=one_line(self.text[first:last]),
            after=one_line(after),
        )

    def closing(self, opening):
        """Place of the closing bracket; None when there is none, as in a macro's text."""
        try:
            return closing(self.blanked, opening)
        except SourceError:
            return None
