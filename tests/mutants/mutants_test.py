"""scripts/mutants on a tree of one small source whose tests leave out one thing.

    mutants_test.py SOURCE_TREE
"""

import json
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

sys.dont_write_bytecode = True
ROOT = Path(sys.argv.pop(1))

THING = """\
bool IsBelow(int a, int b) {
    return a < b;
}
int Coded(int code) {
    switch (code) {
        case 0:
        case 1:
            return 7;
        default:
            return code;
    }
}
#if 0
int Never() { return 3; }
#endif
int Forgotten() { return 5; }
"""
TREE = {
    ".gitignore": "/build/\n",
    "cim/plexor/PlexorProviderThing.cpp": THING,
    # Coded(1) makes the constant in `case 1` known; nothing looks at what is equal, nor at
    # Forgotten.
    "thing_test.cpp": """\
#include <gtest/gtest.h>
bool IsBelow(int a, int b);
int Coded(int code);
TEST(Thing, IsBelow) {
    EXPECT_TRUE(IsBelow(1, 2));
    EXPECT_FALSE(IsBelow(2, 1));
}
TEST(Thing, Coded) { EXPECT_EQ(Coded(1), 7); }
""",
    "other_test.cpp": "int main() { return 0; }\n",
    "CMakePresets.json": json.dumps({
        "version": 5,
        "configurePresets": [{
            "name": "release", "generator": "Ninja", "binaryDir": "${sourceDir}/build/release",
        }],
    }),
    "cim/plexor/CMakeLists.txt": "add_library(plexor_objects OBJECT PlexorProviderThing.cpp)\n",
    "CMakeLists.txt": """\
cmake_minimum_required(VERSION 3.25)
project(Thing LANGUAGES CXX)
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/bin)
find_package(GTest REQUIRED)
add_subdirectory(cim/plexor)
add_executable(provider-tests thing_test.cpp)
target_link_libraries(provider-tests PRIVATE plexor_objects GTest::gtest_main)
add_executable(interposed-tests other_test.cpp)
""",
    "tests/mutants/equivalent.json": json.dumps([{
        "reason": "nobody asks for it",
        "mutants": [{
            "file": "cim/plexor/PlexorProviderThing.cpp",
            "before": "int Forgotten() { return 5; }",
            "after": "int Forgotten() { return 6; }",
        }],
    }]),
}


class Run(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.folder = tempfile.TemporaryDirectory()
        cls.root = Path(cls.folder.name)
        for name, text in TREE.items():
            path = cls.root / name
            path.parent.mkdir(parents=True, exist_ok=True)
            path.write_text(text)
        subprocess.run(["git", "init", "-q"], cwd=cls.root, check=True)

    @classmethod
    def tearDownClass(cls):
        cls.folder.cleanup()

    def run_mutants(self, *options):
        return subprocess.run([str(ROOT / "scripts" / "mutants"), "--root", str(self.root), *options],
                              capture_output=True, text=True)

    def test_finds_what_the_tests_leave_out_and_leaves_the_checkout_alone(self):
        report = self.root / "build" / "report.json"
        report.parent.mkdir(exist_ok=True)
        done = self.run_mutants("--kind", "bound", "--kind", "constant", "--report", str(report))
        self.assertEqual(done.returncode, 1, done.stderr)
        lines = done.stdout.splitlines()
        start = lines.index("survived: cim/plexor/PlexorProviderThing.cpp:2: bound")
        self.assertEqual(lines[start + 1 : start + 3],
                         ["  - return a < b;", "  + return a <= b;"])
        self.assertEqual(lines[-2:], [
            "not counted: 1 known to be equivalent, 1 compiled to the same code, 1 not compiled",
            "3 mutants, 2 killed, 1 survived (66.7 %)",
        ])
        self.assertIn("  = nobody asks for it", lines)
        states = [(each["line"], each["state"], each["by"])
                  for each in json.loads(report.read_text())["mutants"]]
        self.assertIn((7, "killed", ["test Thing.Coded"]), states)
        self.assertEqual({name: (self.root / name).read_text() for name in TREE}, TREE)
        left = self.run_mutants("--list", "--again", str(report)).stdout.splitlines()
        self.assertEqual(left, [lines[start].removeprefix("survived: "), *lines[start + 1 : start + 3], "1 mutants"])
        copy = self.root / "build" / "mutants" / "tree" / "cim" / "plexor"
        self.assertEqual((copy / "PlexorProviderThing.cpp").read_text(), THING)

    def test_a_sample_hangs_on_the_seed(self):
        first = self.run_mutants("--list", "--sample", "3", "--seed", "5")
        self.assertEqual(first.stdout.splitlines()[-1], "3 mutants")
        again = self.run_mutants("--list", "--sample", "3", "--seed", "5")
        self.assertEqual(first.stdout, again.stdout)
        other = self.run_mutants("--list", "--sample", "3", "--seed", "6")
        self.assertNotEqual(first.stdout, other.stdout)

    def test_the_slices_are_the_whole(self):
        whole = self.run_mutants("--list").stdout.splitlines()[:-1]
        slices = []
        for number in "12":
            lines = self.run_mutants("--list", "--slice", f"{number}/2").stdout.splitlines()
            self.assertGreater(len(lines), 1)
            slices += lines[:-1]
        self.assertEqual(sorted(slices), sorted(whole))
        for wrong in ("0/2", "3/2", "1", "a/b"):
            self.assertEqual(self.run_mutants("--list", "--slice", wrong).returncode, 2, wrong)

    def test_an_entry_that_names_no_mutant_is_refused(self):
        path = self.root / "tests" / "mutants" / "equivalent.json"
        path.write_text(TREE["tests/mutants/equivalent.json"].replace("return 6", "return 9"))
        done = self.run_mutants("--list")
        path.write_text(TREE["tests/mutants/equivalent.json"])
        self.assertEqual(done.returncode, 2)
        self.assertIn("equivalent.json names no mutant", done.stderr)


if __name__ == "__main__":
    unittest.main()
