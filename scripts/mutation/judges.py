"""Who may notice a mutant: the provider's tests, clang's look at the locks, the sanitizers."""

import heapq
import json
import os
import re
import resource
import signal
import subprocess
import tempfile
import time
from dataclasses import dataclass
from pathlib import Path

from mutation.tree import SOURCES, TreeError

QUICK_SECONDS = 0.1  # tests that take longer come last, several at a time
OTHERS_SECONDS = 60  # what a program with a few quick tests gets
LEAST_SECONDS = 20  # what a group of tests gets, beside five times what it took before
SLOW_AT_ONCE = 4  # they wait more than they compute
MEMORY = 4 << 30  # in use: a mutant may allocate for ever, and checkers reserve addresses without end
OUTPUT = 64 << 20
# Also its own: it may stumble over a thread that ends, whatever is tested.
CHECKER_FAULT = "LeakSanitizer: SEGV"
HANGS = "hangs"

# Folders of tests/provider in which a source's own tests are, by the beginning of its name.
NEAR = {
    "CfgBuild": "drives volumes ports pools", "CfgClassLock": "refresh",
    "CfgController": "controllers records", "CfgDevices": "inventory", "CfgDisk": "drives",
    "CfgInventory": "inventory",
    "CfgItems": "workers inventory refresh", "CfgKinds": "records refresh", "CfgLookup": "records",
    "CfgMatch": "refresh", "CfgPool": "pools", "CfgPortBattery": "ports", "CfgProfile": "controllers",
    "CfgQuery": "controllers drives", "CfgReconcile": "refresh", "CfgRecords": "records",
    "CfgVolume": "volumes", "CfgWorkers": "workers", "IfcEntry": "entry unload",
    "IfcInFlight": "meeting", "IfcKeys": "keys", "IfcProperty": "render serve",
    "IfcRender": "render", "IfcServe": "serve", "IfcTurns": "meeting unload entry",
    "IfcUnload": "unload", "Util": "util", "Deadline": "meeting workers refresh", "Lock": "workers",
}


@dataclass
class Test:
    name: str
    folder: str
    seconds: float


@dataclass
class Outcome:
    """Of one run of the test program."""

    failed: bool
    why: str = ""
    test: str = ""  # the one that failed, when it is known


def near_folders(file):
    name = Path(file).stem.removeprefix("PlexorProvider")
    best = max((begin for begin in NEAR if name.startswith(begin)), key=len, default=None)
    return NEAR[best].split() if best else []


class Program:
    """The test program of a build."""

    def __init__(self, path):
        self.path = path

    @staticmethod
    def _limits():
        resource.setrlimit(resource.RLIMIT_CORE, (0, 0))
        resource.setrlimit(resource.RLIMIT_FSIZE, (OUTPUT, OUTPUT))

    def start(self, tests, output, *flags):
        """Starts those tests, or all; (process, file with the filter)."""
        flagfile = tempfile.NamedTemporaryFile("w", suffix=".flags")
        if tests is not None:
            flagfile.write(f"--gtest_filter={':'.join(test.name for test in tests)}\n")
            flagfile.flush()
        environment = {name: value for name, value in os.environ.items() if name != "PLEXOR_LONG"}
        process = subprocess.Popen(
            [str(self.path), f"--gtest_flagfile={flagfile.name}", "--gtest_brief=1", *flags],
            stdin=subprocess.DEVNULL, stdout=output, stderr=subprocess.STDOUT, env=environment,
            cwd=self.path.parent, start_new_session=True, preexec_fn=self._limits,
        )
        return process, flagfile

    def run(self, groups, limit):
        """Runs groups of tests at the same time, up to the first failure."""
        running = []
        try:
            for tests in groups:
                output = tempfile.TemporaryFile()
                running.append((*self.start(tests, output, "--gtest_fail_fast"), output))
            return self._await(running, time.monotonic() + limit)
        finally:
            for process, flagfile, output in running:
                end(process)
                flagfile.close()
                output.close()

    def _await(self, running, deadline):
        left = list(running)
        while left:
            for entry in left:
                if entry[0].poll() is None:
                    continue
                if entry[0].returncode != 0:
                    return self._failure(entry[0], entry[2])
                left.remove(entry)
                break
            else:
                if time.monotonic() > deadline:
                    return Outcome(True, HANGS)
                if any(memory_of(entry[0]) > MEMORY for entry in left):
                    return Outcome(True, "takes all memory")
                time.sleep(0.02)
        return Outcome(False)

    @staticmethod
    def _failure(process, output):
        output.seek(0)
        text = output.read().decode(errors="replace")
        found = re.search(r"(\w+Sanitizer: [\w -]+)", text)
        if found is not None:
            return Outcome(True, found[1].strip())
        found = re.search(r"^\[  FAILED  \] ([^\s,]+)", text, re.MULTILINE)
        if found is not None:
            return Outcome(True, f"test {found[1]}", found[1])
        if process.returncode < 0:
            return Outcome(True, f"ends by {signal.Signals(-process.returncode).name}")
        return Outcome(True, f"exit status {process.returncode}")


def memory_of(process):
    """What a process has in use; nothing when it has just ended."""
    try:
        pages = int(Path(f"/proc/{process.pid}/statm").read_text().split()[1])
    except (OSError, IndexError):
        return 0
    return pages * resource.getpagesize()


def end(process):
    if process.poll() is None:
        os.killpg(process.pid, signal.SIGKILL)
    process.wait()


class Tests:
    """The release build's tests as judge: the mutant's own ones first, those that wait last."""

    def __init__(self, program, others):
        self.program = Program(program)
        self.others = [Program(path) for path in others]
        self.tests = self._measure()
        self.times = {test.name: test for test in self.tests}

    def _measure(self):
        """Runs all tests without a mutant, for what each takes."""
        for _ in range(10):
            tests, failed, fault = self._run_all()
            if CHECKER_FAULT not in fault:
                break
        if fault:
            raise TreeError(f"the test program fails without a mutant:\n{fault[-4000:]}")
        for test in failed:
            # One that a busy machine made fail does not do so alone.
            if self.program.run([[test]], self._limit([[test]])).failed:
                raise TreeError(f"{test.name} fails without a mutant")
        return tests

    def _run_all(self):
        """All tests, those that failed, and what was printed when it was no test that failed."""
        with tempfile.TemporaryDirectory() as folder, tempfile.TemporaryFile() as output:
            report = Path(folder) / "report.json"
            process, flagfile = self.program.start(None, output, f"--gtest_output=json:{report}")
            status = process.wait()
            flagfile.close()
            tests, failed = self._read(report)
            if status == 0 or failed:
                return tests, failed, ""
            # It has not run to its end, or leaks.
            output.seek(0)
            return tests, failed, output.read().decode(errors="replace") or f"status {status}"

    @staticmethod
    def _read(report):
        """All tests, and those of them that failed."""
        tests, failed = [], []
        suites = json.loads(report.read_text())["testsuites"] if report.is_file() else []
        for suite in suites:
            for entry in suite["testsuite"]:
                test = Test(f"{entry['classname']}.{entry['name']}",
                            Path(entry["file"]).parent.name, float(entry["time"].rstrip("s")))
                tests.append(test)
                if entry.get("failures"):
                    failed.append(test)
        return tests, failed

    def _stages(self, file):
        folders = near_folders(file)
        quick = [test for test in self.tests if test.seconds < QUICK_SECONDS]
        slow = [test for test in self.tests if test.seconds >= QUICK_SECONDS]
        yield [[test for test in quick if test.folder in folders]]
        yield [[test for test in quick if test.folder not in folders]]
        yield _shared_out([test for test in slow if test.folder in folders])
        yield _shared_out([test for test in slow if test.folder not in folders])

    def judge(self, file):
        """Why a mutant of that file is noticed; None when it is not."""
        for groups in self._stages(file):
            groups = [group for group in groups if group]
            if not groups:
                continue
            outcome = self.program.run(groups, self._limit(groups))
            if outcome.failed and self._again(outcome, groups):
                return outcome.why
        for program in self.others:
            outcome = program.run([None], OTHERS_SECONDS)
            if outcome.failed:
                return outcome.why
        return None

    @staticmethod
    def _limit(groups):
        return LEAST_SECONDS + 5 * max(sum(test.seconds for test in group) for group in groups)

    def _again(self, outcome, groups):
        """Whether it fails again: what fails only once may be the machine's fault."""
        if outcome.test not in self.times:
            doubtful = outcome.why == HANGS or outcome.why.startswith(CHECKER_FAULT)
            return not doubtful or self.program.run(groups, self._limit(groups)).failed
        alone = [[self.times[outcome.test]]]
        if self.program.run(alone, self._limit(alone)).failed:
            return True
        return self.program.run(groups, self._limit(groups)).failed


def _shared_out(tests):
    """The tests in groups that take about the same time."""
    groups = [(0.0, number, []) for number in range(SLOW_AT_ONCE)]
    for test in sorted(tests, key=lambda test: -test.seconds):
        seconds, number, members = heapq.heappop(groups)
        heapq.heappush(groups, (seconds + test.seconds, number, members + [test]))
    return [members for _, _, members in groups]


def clang_refuses(tree, mutant):
    """Whether scripts/check-locks finds fault with the mutant in the copy."""
    files = [mutant.file] if mutant.file.endswith(".cpp") else [
        str(path.relative_to(tree.folder)) for path in sorted((tree.folder / SOURCES).glob("*.cpp"))
    ]
    command = [str(tree.folder / "scripts" / "check-locks"), str(tree.folder), *files]
    return subprocess.run(command, capture_output=True).returncode != 0


def sanitizer_refuses(tree, mutant, preset, limit=900):
    """What the tests under a sanitizer say of the mutant in the copy; None for nothing."""
    if not (tree.compiles(mutant, preset) and tree.links(preset)):
        raise TreeError(f"{mutant.title()}\ndoes not build as {preset}")
    outcome = Program(tree.program(preset)).run([None], limit)
    return f"{preset}: {outcome.why}" if outcome.failed else None
