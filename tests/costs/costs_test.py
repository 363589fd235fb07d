#!/usr/bin/env python3
"""scripts/costs: which measurements it lets pass, and that docs/performance.md shows what was measured.

  costs_test.py SOURCE_TREE
"""
import contextlib
import importlib.machinery
import io
import json
import pathlib
import subprocess
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True
SOURCE = pathlib.Path(sys.argv.pop(1)) if len(sys.argv) > 1 else pathlib.Path(__file__).parents[2]
sys.path.insert(0, str(SOURCE / "scripts"))
costs = importlib.machinery.SourceFileLoader("costs", str(SOURCE / "scripts/costs")).load_module()

SERVING = {"masked/names/24/bare": 100.0, "masked/names/24/provider": 111.0,
           "masked/names/24/ratio": 1.10}  # the middle one of the ratios, not that of the middle times
COUNTS = {"get/24/calls": 26, "get/240/calls": 26, "get/1000/calls": 26}


# Benchmarks that a build may leave out, and something else that it was told.
PROJECT = """\
cmake_minimum_required(VERSION 3.25)
project(Thing NONE)
option(PLEXOR_BUILD_BENCH "Build the benchmarks" ON)
if(PLEXOR_BUILD_BENCH)
    file(WRITE ${CMAKE_BINARY_DIR}/told "${TOLD}")
    add_custom_target(cost-programs
        COMMAND ${CMAKE_COMMAND} -E make_directory bin
        COMMAND ${CMAKE_COMMAND} -E touch bin/serving-cost)
endif()
"""
PRESETS = {"version": 5, "configurePresets": [
    {"name": "release", "generator": "Ninja", "cacheVariables": {"TOLD": "by the preset"}},
]}


def judged(measurements, *options):
    """Exit status and lines of the table for these measurements."""
    with tempfile.NamedTemporaryFile("w", suffix=".json") as file:
        json.dump({"measurements": measurements}, file)
        file.flush()
        out = io.StringIO()
        with contextlib.redirect_stdout(out):
            status = costs.main(["--judge", file.name, *options])
    return status, out.getvalue().splitlines()


class Verdicts(unittest.TestCase):
    def test_a_ratio_at_its_limit_passes(self):
        status, lines = judged(SERVING)
        self.assertEqual(0, status)
        self.assertEqual("names, log masked, to constants  24      1.10      1.10   ok", lines[1])
        self.assertEqual("1 rows, 1 with a limit, 0 over it", lines[-1])

    def test_a_ratio_over_its_limit_fails_and_is_marked(self):
        status, lines = judged(SERVING | {"masked/names/24/ratio": 1.12})
        self.assertEqual(1, status)
        self.assertEqual("names, log masked, to constants  24      1.12      1.10   OVER", lines[1])
        self.assertEqual("1 rows, 1 with a limit, 1 over it", lines[-1])

    def test_an_open_log_and_4000_drives_have_no_limit(self):
        for name in ("open/names/24", "masked/names/4000"):
            status, lines = judged({f"{name}/ratio": 5.0})
            self.assertEqual(0, status)
            self.assertEqual("1 rows, 0 with a limit, 0 over it", lines[-1])

    def test_one_call_more_for_a_request_is_over_the_limit(self):
        self.assertEqual(0, judged(COUNTS)[0])
        self.assertEqual(1, judged({name: 27 for name in COUNTS})[0])

    def test_a_count_that_grows_faster_than_the_drives_is_over_the_limit(self):
        self.assertEqual(1, judged(COUNTS | {"get/1000/calls": 27})[0])

    def test_time_for_each_drive_that_grows_with_the_drives_is_over_the_limit(self):
        linear = {"refresh/1000/random": 100e6, "refresh/4000/random": 400e6}
        self.assertEqual(0, judged(linear)[0])
        self.assertEqual(0, judged(linear | {"refresh/4000/random": 780e6})[0], "caches")
        self.assertEqual(1, judged(linear | {"refresh/4000/random": 1380e6})[0])

    def test_a_file_that_is_missing_is_a_failure_of_another_kind(self):
        with contextlib.redirect_stderr(io.StringIO()):
            self.assertEqual(2, costs.main(["--judge", "/nonexistent/costs.json"]))


class Page(unittest.TestCase):
    def test_the_page_has_the_table_of_the_measurements_beside_it(self):
        page = (SOURCE / "docs/performance.md").read_text()
        out = io.StringIO()
        with contextlib.redirect_stdout(out):
            costs.main(["--judge", str(SOURCE / "docs/performance.json"), "--markdown"])
        self.assertIn(out.getvalue(), page)


class Build(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.root = pathlib.Path(folder.name)
        self.build = self.root / "build"
        (self.root / "CMakeLists.txt").write_text(PROJECT)
        (self.root / "CMakePresets.json").write_text(json.dumps(PRESETS))

    def told(self):
        """What a build was told that has the benchmarks now."""
        with contextlib.redirect_stdout(io.StringIO()):
            costs.build(self.root, self.build)
        self.assertTrue((self.build / "bin/serving-cost").exists())
        return (self.build / "told").read_text()

    def test_a_new_build_is_the_preset_s(self):
        self.assertEqual(self.told(), "by the preset")

    def test_a_build_that_left_the_benchmarks_out_gets_them(self):
        subprocess.run(["cmake", "-G", "Ninja", "-S", self.root, "-B", self.build,
                        "-DPLEXOR_BUILD_BENCH=OFF", "-DTOLD=by its owner"],
                       check=True, stdout=subprocess.DEVNULL)
        self.assertEqual(self.told(), "by its owner")


if __name__ == "__main__":
    unittest.main()
