"""The commands that pages show, each with what is to be done with it."""

import re

RUN = "run"
MARKERS = {
    "output": None,
    "configuration": None,
    "needs a real host": "host",
    "programs": "programs",
}
MARKER = re.compile(r"^<!-- (.*) -->$")
MAN_MARKER = re.compile(r'^\.\\" (.*)$')
ELSEWHERE = re.compile(r"^run by (\S+)$")
OUTPUT_OF = re.compile(r"^output of (.+)$")


class PageError(Exception):
    pass


class Block:
    """Lines of one block, and what they are.

    RUN, "host", "programs" (of the build, run by tests of its own), the name of the test that runs
    them, or "output of COMMAND".
    """

    def __init__(self, page, line, how, lines):
        self.page, self.line, self.how, self.lines = page, line, how, lines


def how_of(page, number, marker):
    """What a marker says about the block behind it; None for one that holds no commands."""
    if marker is None:
        return RUN
    elsewhere = ELSEWHERE.match(marker)
    if elsewhere:
        return elsewhere.group(1)
    if OUTPUT_OF.match(marker):
        return marker
    if marker not in MARKERS:
        raise PageError(f"{page}:{number}: unknown marker \"{marker}\"")
    return MARKERS[marker]


def markdown_blocks(page, text):
    """Every block that is indented by four; a marker stands in a comment before it."""
    marker, lines, start = None, [], 0
    for number, line in enumerate(text.splitlines() + [""], 1):
        if line.startswith("    "):
            start = start or number
            lines.append(line[4:])
            continue
        if not line.strip() and lines:
            lines.append("")
            continue
        if not line.strip():
            continue
        if lines:
            yield start, how_of(page, start, marker), lines
            marker, lines, start = None, [], 0
        found = MARKER.match(line)
        marker = found.group(1) if found else None
    if lines:
        yield start, how_of(page, start, marker), lines


def manual_blocks(page, text):
    """What stands between .nf and .fi in the section EXAMPLES."""
    examples = False
    marker, lines, start = None, None, 0
    for number, line in enumerate(text.splitlines(), 1):
        if line.startswith(".SH"):
            examples = line == ".SH EXAMPLES"
        found = MAN_MARKER.match(line)
        if found:
            marker = found.group(1)
        elif examples and line == ".nf":
            lines, start = [], number + 1
        elif lines is not None and line == ".fi":
            yield start, how_of(page, start, marker), lines
            lines, marker = None, None
        elif lines is not None:
            lines.append(line.replace("\\-", "-").replace("\\(aq", "'"))


def blocks_of(path):
    text = path.read_text(encoding="utf-8")
    split = markdown_blocks if path.suffix == ".md" else manual_blocks
    return [Block(path.name, start, how, lines) for start, how, lines in split(path.name, text) if how]
