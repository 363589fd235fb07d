"""What scripts/coverage finds in the exports of llvm-cov, and what it makes of the list of excuses.

    coverage_test.py SOURCE_TREE
"""

import json
import sys
import tempfile
import unittest
from pathlib import Path

sys.dont_write_bytecode = True
ROOT = Path(sys.argv.pop(1))
sys.path.insert(0, str(ROOT / "scripts"))
from reach.excuses import Excuses
from reach.judge import Demand, Verdict, per_cent
from reach.places import Reach

THING = """\
int F(int a, int b) {
    if (a != 0 && b != 0) return 1;
    if constexpr (kNever) {
    }
    if (a < 0) {
        b++;
        return 2;
    }
    return a == 7 ||
                   b == 7
               ? 3
               : 4;
}
"""
NAME = "cim/plexor/Thing.cpp"
# Line and column where the condition begins and ends.
A, B = [2, 9, 2, 15], [2, 19, 2, 25]
CONSTANT, BELOW, BOTH = [3, 19, 3, 25], [5, 9, 5, 14], [9, 12, 10, 26]
REST = [[*BELOW, 0, 5], [*BOTH, 2, 3]]
LINES = {1: 5, 2: 5, 5: 5, 6: 0, 7: 0, 8: 0, 9: 5, 10: 5}

NEVER_BELOW = {"file": NAME, "line": "if (a < 0) {", "condition": "a < 0", "never": "true"}
NOT_RUN = {"file": NAME, "line": "b++;", "never": "run"}
ALL = Demand("cim/plexor", 100, True)


class Coverage(unittest.TestCase):
    def setUp(self):
        self.folder = tempfile.TemporaryDirectory()
        self.root = Path(self.folder.name)
        self.reach = Reach(self.root)
        self.write(NAME, THING)

    def tearDown(self):
        self.folder.cleanup()

    def write(self, name, text):
        path = self.root / name
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_text(text)

    def measured(self, branches, lines=None, name=NAME):
        """One program's exports."""
        file = {"filename": str(self.root / name), "branches": [[*each, 0, 0, 4] for each in branches]}
        self.reach.add_branches(json.dumps({"data": [{"files": [file]}]}), Path)
        records = [f"DA:{line},{count}" for line, count in (lines or {}).items()]
        self.reach.add_lines("\n".join([f"SF:{self.root / name}", "FN:1,F", *records]), Path)

    def verdict(self, *places, demand=ALL):
        excuses = Excuses([{"reason": "because", "places": list(places)}])
        return Verdict(demand, self.reach.files(demand.folder), excuses)

    def test_names_what_no_program_reaches(self):
        self.measured([[*A, 5, 0], [*B, 2, 3], [*CONSTANT, 0, 0], *REST], LINES)
        verdict = self.verdict()
        self.assertEqual(verdict.findings, [
            f"{NAME}:2: `a != 0` is never false\n    if (a != 0 && b != 0) return 1;",
            f"{NAME}:5: `a < 0` is never true\n    if (a < 0) {{",
            f"{NAME}:6: never run\n    b++;",
        ])
        self.assertEqual(verdict.summary, "cim/plexor: 62.5 % of 8 lines, 3 not reached; 75.0 % of "
                                          "8 branches, 2 not reached; 3 without an excuse")

    def test_adds_programs_up(self):
        self.measured([[*A, 5, 0], [*B, 5, 0]], LINES)
        self.measured([[*A, 0, 1], [*B, 0, 1]], {**LINES, 6: 1, 7: 1, 8: 1})
        self.measured([[*A, 0, 0]], {6: 0, 7: 0, 8: 0})
        self.assertEqual(self.verdict().findings, [])

    def test_a_condition_over_several_lines_is_one_text(self):
        self.measured([[*BOTH, 0, 1]], {9: 1})
        self.assertEqual(self.verdict().findings, [
            f"{NAME}:9: `a == 7 || b == 7` is never true\n    return a == 7 ||"])

    def test_excuses_hold_wherever_the_line_stands(self):
        self.measured([[*A, 1, 1], [*B, 1, 1], *REST], LINES)
        self.assertEqual(self.verdict(NEVER_BELOW, NOT_RUN).findings, [])
        self.write(NAME, "\n\n" + THING)
        self.reach = Reach(self.root)
        self.measured([[7, 9, 7, 14, 0, 5]], {line + 2: count for line, count in LINES.items()})
        self.assertEqual(self.verdict(NEVER_BELOW, NOT_RUN).findings, [])

    def test_an_excuse_is_for_one_side_of_one_place(self):
        self.measured([[*BELOW, 0, 0]], {5: 1})
        self.assertEqual(self.verdict(NEVER_BELOW).findings,
                         [f"{NAME}:5: `a < 0` is never false\n    if (a < 0) {{"])
        self.write(NAME, THING + THING)
        self.reach = Reach(self.root)
        self.measured([[*BELOW, 0, 1], [18, 9, 18, 14, 0, 1]], {5: 1})
        self.assertEqual(self.verdict(NEVER_BELOW).findings,
                         [f"{NAME}:18: `a < 0` is never true\n    if (a < 0) {{"])
        self.assertEqual(self.verdict(NEVER_BELOW, NEVER_BELOW).findings, [])

    def test_an_excuse_for_what_is_reached_is_stale(self):
        self.measured([[*BELOW, 1, 5]], {6: 1})
        self.assertEqual(self.verdict(NEVER_BELOW, NOT_RUN).findings, [
            f"{NAME}: excused, but is reached: run\n    b++;",
            f"{NAME}: excused, but is reached: `a < 0` true\n    if (a < 0) {{",
        ])

    def test_an_excuse_for_what_is_gone_is_stale(self):
        self.measured([[*BELOW, 1, 5]], {6: 1})
        gone = {**NEVER_BELOW, "condition": "a < 1"}
        self.assertEqual(self.verdict(gone).findings, [
            f"{NAME}: excused, but is no longer there: `a < 1` true\n    if (a < 0) {{"])
        self.assertEqual(self.verdict({**NOT_RUN, "line": "c++;"}).findings, [
            f"{NAME}: excused, but is no longer there: run\n    c++;"])

    def test_elsewhere_a_part_of_the_lines_is_enough(self):
        name = "testbed/cli/thing.cpp"
        self.write(name, THING)
        self.measured([[*BELOW, 0, 0]], LINES, name)
        enough = self.verdict(demand=Demand("testbed", 62, False))
        self.assertEqual(enough.findings, [])
        self.assertEqual(enough.notes, [f"{name}: 6-8"])
        self.assertEqual(enough.summary,
                         "testbed: 62.5 % of 8 lines, 3 not reached; at least 62 % asked")
        self.assertEqual(self.verdict(demand=Demand("testbed", 63, False)).findings,
                         ["testbed: less than 63 % of the lines"])

    def test_nothing_measured_is_a_finding(self):
        self.assertEqual(self.verdict().findings, ["cim/plexor: nothing was measured"])

    def test_short_of_all_is_never_called_all(self):
        self.assertEqual(per_cent(9999, 10000), "99.9 %")
        self.assertEqual(per_cent(10000, 10000), "100.0 %")

    def test_every_excuse_of_ours_has_a_reason_and_names_a_line(self):
        for group in json.loads((ROOT / "tests" / "coverage" / "unreached.json").read_text()):
            self.assertGreater(len(group["reason"]), 20)
            for place in group["places"]:
                lines = [line.strip() for line in (ROOT / place["file"]).read_text().split("\n")]
                self.assertIn(place["line"], lines)
                self.assertIn(place["never"], ("true", "false", "run"))


if __name__ == "__main__":
    unittest.main()
