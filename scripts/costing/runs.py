"""The programs that measure, and what they have found: {name: value}, times in nanoseconds."""

import json
import os
import platform
import subprocess
from dataclasses import dataclass


class RunError(Exception):
    pass


@dataclass
class Form:
    """How much is measured."""
    drives: list
    walks: list           # drives of the inventories with a vendor that answers at once
    slow_walks: list      # and in 20 ms
    repetitions: dict     # of requests, up to that many drives
    refreshes: int        # repetitions of refreshes
    rounds: int           # of the crowd
    idle: int             # seconds


FULL = Form([24, 240, 1000, 4000], [24, 240, 1000], [24, 100], {240: 101, 1000: 41, 4000: 21}, 7, 15, 30)
QUICK = Form([24, 240], [24, 240], [24], {240: 31}, 5, 3, 10)

NANOSECONDS = {"ns": 1, "us": 1e3, "ms": 1e6, "s": 1e9}


def run(command, **more):
    try:
        subprocess.run([str(word) for word in command], check=True, **more)
    except subprocess.CalledProcessError as error:
        raise RunError(f"{command[0]} ended with status {error.returncode}") from error


def build(root, directory):
    """The benchmarks, which the tests' build leaves out; all else stays as it is configured."""
    preset = [] if (directory / "CMakeCache.txt").exists() else ["--preset", "release"]
    run(["cmake", *preset, "-S", root, "-B", directory, "-DPLEXOR_BUILD_BENCH=ON"],
        cwd=root, stdout=subprocess.DEVNULL)
    run(["cmake", "--build", directory, "--target", "cost-programs"], stdout=subprocess.DEVNULL)
    if not (directory / "bin/serving-cost").exists():
        raise RunError("google-benchmark is missing: scripts/install-deps costs")


def machine(directory):
    """What the numbers depend on; no names."""
    compiler = "unknown"
    for line in (directory / "CMakeCache.txt").read_text().splitlines():
        if line.startswith("CMAKE_CXX_COMPILER:"):
            words = [line.split("=", 1)[1], "-dumpfullversion"]
            version = subprocess.run(words, capture_output=True, text=True, check=True).stdout.strip()
            compiler = f"{os.path.basename(words[0])} {version}"
    return {"processors": os.cpu_count(), "compiler": compiler, "architecture": platform.machine(),
            "load": round(os.getloadavg()[2], 1)}


COMPARED = ("ratio", "provider", "bare")  # of one benchmark that asks both in turn; times in nanoseconds


def medians(prefix, file):
    """Of google-benchmark's repetitions: the processor's time of the measuring thread, or what a
    comparison tells instead."""
    content = json.loads(file.read_text())
    content["context"].pop("host_name", None)
    file.write_text(json.dumps(content, indent=1) + "\n")
    found = {}
    for each in content["benchmarks"]:
        if each.get("aggregate_name") != "median":
            continue
        name = prefix + each["run_name"]
        if "ratio" in each:
            found |= {f"{name}/{what}": each[what] for what in COMPARED}
        else:
            found[name] = each["cpu_time"] * NANOSECONDS[each["time_unit"]]
    return found


def google(program, prefix, drives, repetitions, seconds, directory, *more):
    file = directory / f"{program.name}-{drives}.json"
    run([program, "--drives", drives, *more, "--benchmark_enable_random_interleaving=true",
         f"--benchmark_repetitions={repetitions}", f"--benchmark_min_time={seconds}",
         "--benchmark_display_aggregates_only=true", f"--benchmark_out={file}",
         "--benchmark_out_format=json"], stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
    return medians(prefix, file)


def own(program, name, directory, *more):
    file = directory / f"{name}.json"
    run([program, *more, "--json", file], stdout=subprocess.DEVNULL)
    return {each["name"]: each["value"] for each in json.loads(file.read_text())["measurements"]}


def serving(form, programs, directory):
    found = {}
    for drives in form.drives:
        repetitions = next(number for limit, number in form.repetitions.items() if drives <= limit)
        for log, program, more in (("masked", "serving-cost", []),
                                   ("open", "serving-cost-open", ["--open"])):
            found |= google(programs / program, f"{log}/", drives, repetitions, 0.01, directory, *more)
    return found


def refresh(form, programs, directory):
    found = {}
    for drives in form.drives:
        found |= google(programs / "refresh-cost", "", drives, form.refreshes, 0.01, directory)
    return found


def counts(form, programs, directory):
    return own(programs / "counts", "counts", directory, "--drives", *form.drives)


def inventory(form, programs, directory):
    program = programs / "inventory-cost"
    return (own(program, "inventory", directory, "--drives", *form.walks) |
            own(program, "inventory-slow", directory, "--answer-time", 20,
                "--drives", *form.slow_walks))


def crowd(form, programs, directory):
    return own(programs / "crowd-latency", "crowd", directory, "--rounds", form.rounds)


def idle(form, programs, directory):
    return own(programs / "idle-wakeups", "idle", directory, "--seconds", form.idle)


def measure(group, form, programs, directory):
    print(f"measuring: {group}", flush=True)
    return {"serving": serving, "refresh": refresh, "counts": counts, "inventory": inventory,
            "crowd": crowd, "idle": idle}[group](form, programs, directory)
