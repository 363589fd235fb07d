"""What is asked of the folders, and the report on it."""

from dataclasses import dataclass



@dataclass(frozen=True)
class Demand:
    folder: str
    least: float  # percentage of the lines
    branches: bool  # all lines and branches, but for what is excused


DEMANDS = (Demand("cim/plexor", 100, True), Demand("testbed", 95, False))


def per_cent(part, whole):
    """Rounded down: what is short of all is never shown as all."""
    return f"{int(1000 * part / whole) / 10 if whole else 100:.1f} %"


def ranges(blocks):
    return " ".join(f"{first}" if first == last else f"{first}-{last}" for first, last in blocks)


class Verdict:
    """On one folder: `findings`, which must not be; `notes`, for whoever wants to know; a summary."""

    def __init__(self, demand, files, excuses):
        self.findings = []
        self.notes = []
        lines = sum(file.lines() for file in files)
        missed = sum(len(file.unreached_lines()) for file in files)
        self.summary = (f"{demand.folder}: {per_cent(lines - missed, lines)} of {lines} lines"
                        f", {missed} not reached")
        if not lines:
            self.findings.append(f"{demand.folder}: nothing was measured")
        if demand.branches:
            self._judge_places(files, excuses)
        else:
            self._judge_lines(demand, files, lines, missed)

    def _judge_places(self, files, excuses):
        branches = [each for file in files for each in file.branches()]
        missed = [place for place, count in branches if count == 0]
        reached = [place for place, count in branches if count != 0]
        reached += [place for file in files for place in file.reached_lines()]
        unreached = missed + [place for file in files for place in file.line_places()]
        excused, others = excuses.sort(unreached)
        self.summary += (f"; {per_cent(len(branches) - len(missed), len(branches))} of "
                         f"{len(branches)} branches, {len(missed)} not reached; "
                         f"{len(others)} without an excuse")
        for place in sorted(others):
            self.findings.append(f"{place.title()}\n    {place.line}")
        for (file, line, condition, outcome), why in excuses.stale(unreached, reached):
            what = f"`{condition}` {outcome}" if condition else outcome
            self.findings.append(f"{file}: excused, but {why}: {what}\n    {line}")

    def _judge_lines(self, demand, files, lines, missed):
        for file in files:
            if file.blocks():
                self.notes.append(f"{file.name}: {ranges(file.blocks())}")
        if 100 * (lines - missed) < demand.least * lines:
            self.findings.append(f"{demand.folder}: less than {demand.least} % of the lines")
        self.summary += f"; at least {demand.least} % asked"


def judge(reach, excuses):
    """A verdict on each folder that something is asked of."""
    return [Verdict(demand, reach.files(demand.folder), excuses) for demand in DEMANDS]
