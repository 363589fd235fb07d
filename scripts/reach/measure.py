"""Builds with counters (preset `coverage`), runs the tests, reads what they have counted."""

import os
import subprocess
import time
from pathlib import Path

from reach.judge import DEMANDS
from reach.places import Reach

# What they count is written at their end, as is that of the tool and of libraries that they use.
PROGRAMS = ("provider-tests", "interposed-tests", "faults-test", "testbed-tests", "vendor-tests",
            "schema-tests", "wbem-tests", "page-tests", "ask-tests", "scenario-tests")
# Tests that are scripts, or need arguments, by their names for ctest; and what they need.
OTHER_TESTS = r"^(steering\..*|scenario-schema|load\.c_program.*)$"
OTHER_TARGETS = ("plexor-testbed", "PlexorProvider", "PlexorProviderStandard", "plexor-desk", "c-program")
# Where the product's code is; each of them may have some of it that the others have not.
OBJECTS = (*(f"bin/{name}" for name in (*PROGRAMS, "plexor-testbed")), "lib/libPlexorProvider.so",
           "lib/standard/libPlexorProvider.so", "lib/libplexor-desk.so")
LIMIT = 1200  # seconds for one program


class MeasureError(Exception):
    """Nothing was measured; the text says why."""


def run(command, **options):
    command = [str(part) for part in command]
    try:
        done = subprocess.run(command, text=True, capture_output=True, **options)
    except (OSError, subprocess.TimeoutExpired) as error:
        raise MeasureError(str(error)) from error
    if done.returncode != 0:
        raise MeasureError(f"{' '.join(command)}: status {done.returncode}\n"
                           f"{done.stdout[-8000:]}{done.stderr[-4000:]}")
    return done.stdout


class Build:
    """The build tree with counters of a checkout."""

    def __init__(self, root, tell):
        self._root = root
        self._tell = tell
        self._tree = root / "build" / "coverage"
        self._profiles = self._tree / "profiles"
        self._merged = self._tree / "merged.profdata"

    def _environment(self, folder):
        # A file for each program and library, into which all their runs are added up.
        return {**os.environ, "LLVM_PROFILE_FILE": str(folder / "%m.profraw")}

    def make(self):
        run([self._root / "scripts" / "install-deps", "build", "test", "coverage"])
        # CMake runs some test programs while it builds, to ask for the names of their tests.
        environment = self._environment(self._tree / "asked")
        run(["cmake", "--preset", "coverage"], cwd=self._root, env=environment)
        run(["cmake", "--build", "--preset", "coverage", "--target", *PROGRAMS, *OTHER_TARGETS],
            cwd=self._root, env=environment)

    def run_tests(self):
        self._profiles.mkdir(exist_ok=True)
        for old in self._profiles.iterdir():
            old.unlink()
        commands = [[self._tree / "bin" / name, "--gtest_brief=1"] for name in PROGRAMS]
        commands.append(["ctest", "--preset", "coverage", "-R", OTHER_TESTS])
        for command in commands:
            begun = time.monotonic()
            run(command, cwd=self._root, env=self._environment(self._profiles), timeout=LIMIT)
            self._tell(f"{Path(command[0]).name}: {time.monotonic() - begun:.0f} s")
        run(["llvm-profdata", "merge", "-sparse", "-o", self._merged, *self._profiles.iterdir()])

    def reach(self):
        """What the last run of the tests has reached."""
        if not self._merged.is_file():
            raise MeasureError("the tests have not been run yet")
        reach = Reach(self._root)
        for name in OBJECTS:
            export = ["llvm-cov", "export", "-instr-profile", self._merged, "-skip-functions",
                      "-skip-expansions", self._tree / name,
                      *(self._root / demand.folder for demand in DEMANDS)]
            reach.add_branches(run(export), self._path)
            reach.add_lines(run([*export, "-format=lcov"]), self._path)
        return reach

    def _path(self, name):
        """Of a file as the compiler was told of it."""
        return self._tree / name
