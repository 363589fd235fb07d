"""Lines and conditions of the sources, and whether the tests have reached them: what llvm-cov exports,
put together over all programs.

A condition is an operand of `&&`, `||`, `!` and `?:`, or what stands in an `if`, a loop or a `case`, as it is
written; it has two branches, "true" and "false". What the compiler adds for exceptions, destructors or
statics is no condition and is not counted.
"""

import json
import re
from dataclasses import dataclass

CONSTEXPR = re.compile(r"\bif constexpr \($")


@dataclass(frozen=True, order=True)
class Place:
    """A branch, or a line, of which something is known."""

    file: str
    number: int  # of the line
    line: str  # its text, without what is around it
    condition: str  # "": the line itself
    outcome: str  # "true", "false"; "run" of a line

    def key(self):
        """What it is called where line numbers would not last."""
        return self.file, self.line, self.condition, self.outcome

    def title(self):
        what = f"`{self.condition}` is never {self.outcome}" if self.condition else "never run"
        return f"{self.file}:{self.number}: {what}"


class Source:
    """The text of a file that places are in."""

    def __init__(self, text):
        self._lines = text.split("\n")

    def line(self, number):
        return self._lines[number - 1].strip()

    def text(self, first, first_column, last, last_column):
        """What stands from one column up to another one, on one line."""
        lines = self._lines[first - 1 : last]
        lines[-1] = lines[-1][: last_column - 1]
        lines[0] = lines[0][first_column - 1 :]
        return " ".join(" ".join(lines).split())

    def is_constant(self, number, column):
        """Whether the condition that begins there is decided by the compiler."""
        return CONSTEXPR.search(self._lines[number - 1][: column - 1]) is not None


class FileReach:
    """How often each line and each branch of one file was reached, in all programs together."""

    def __init__(self, name, source):
        self.name = name
        self._source = source
        self._lines = {}
        self._conditions = {}

    def add_line(self, number, count):
        self._lines[number] = self._lines.get(number, 0) + count

    def add_condition(self, region, true, false):
        """`region`: line and column where it begins and where it ends."""
        if self._source.is_constant(region[0], region[1]):
            return
        before = self._conditions.get(region, (0, 0))
        self._conditions[region] = (before[0] + true, before[1] + false)

    def lines(self):
        return len(self._lines)

    def unreached_lines(self):
        return [number for number, count in sorted(self._lines.items()) if count == 0]

    def blocks(self):
        """Unreached lines as (first, last), where no reached one lies between them."""
        found = []
        numbers = sorted(self._lines)
        for before, number in zip([None, *numbers], numbers):
            if self._lines[number] != 0:
                continue
            if found and before is not None and self._lines[before] == 0:
                found[-1] = (found[-1][0], number)
            else:
                found.append((number, number))
        return found

    def line_places(self):
        """One place for each block of unreached lines: its first line."""
        return [Place(self.name, first, self._source.line(first), "", "run")
                for first, _ in self.blocks()]

    def reached_lines(self):
        return [Place(self.name, number, self._source.line(number), "", "run")
                for number, count in sorted(self._lines.items()) if count != 0]

    def branches(self):
        """(place, count) of each branch."""
        for region, counts in sorted(self._conditions.items()):
            condition = self._source.text(*region)
            for outcome, count in zip(("true", "false"), counts):
                line = self._source.line(region[0])
                yield Place(self.name, region[0], line, condition, outcome), count


class Reach:
    """What is known of all files below some folders of a source tree."""

    def __init__(self, root):
        self._root = root
        self._files = {}

    def _file(self, path):
        try:
            name = path.resolve().relative_to(self._root.resolve()).as_posix()
        except ValueError:
            return None
        if name not in self._files:
            self._files[name] = FileReach(name, Source(path.read_text()))
        return self._files[name]

    def add_branches(self, export, make_path):
        """`export`: the JSON that llvm-cov writes."""
        for data in json.loads(export)["data"]:
            for each in data["files"]:
                file = self._file(make_path(each["filename"]))
                for branch in each["branches"] if file is not None else []:
                    file.add_condition(tuple(branch[:4]), branch[4], branch[5])

    def add_lines(self, export, make_path):
        """`export`: the same in lcov's format, which has the lines."""
        file = None
        for record in export.splitlines():
            if record.startswith("SF:"):
                file = self._file(make_path(record[3:]))
            elif record.startswith("DA:") and file is not None:
                number, count = record[3:].split(",")[:2]
                file.add_line(int(number), int(count))

    def files(self, folder):
        """Those below a folder, by name."""
        return [self._files[name] for name in sorted(self._files) if name.startswith(f"{folder}/")]
