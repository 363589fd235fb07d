#!/usr/bin/python3
"""How fast the page draws a large array, and a change to it, in Chromium.

    tests/browser/speed.py [DRIVES]       1,000 unless said otherwise; waits for the inventory first

Exits with 1 when drawing takes more than a second, or a change more than 100 ms.
"""
import json
import os
import statistics
import sys
import tempfile
import time

BUILD = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "..", "build", "release")
os.environ.setdefault("PLEXOR_TESTBED", os.path.join(BUILD, "bin", "plexor-testbed"))
os.environ.setdefault("PROJECT_SOURCE_DIR", os.path.join(BUILD, "..", ".."))
# pylint: disable=wrong-import-position
from browser_support import chromium
from steering_support import run, serve

# Milliseconds from the arrival of the last document or change until it was on the screen.
MEASURE = "return performance.getEntriesByName('plexor:' + arguments[0])[0]?.duration"


def array(drives):
    shelves = drives // 50
    return {"controllers": [{
        "id": "C0", "model": "large", "pools": [{"id": f"P{n}"} for n in range(shelves)],
        "enclosures": [{"number": n} for n in range(shelves)],
        "drives": [{"id": f"{n // 50}_{n % 50}", "slot": n % 50, "enclosure": n // 50,
                    "pool": f"P{n // 50}", "capacityGB": 4000} for n in range(drives)],
        "volumes": [{"id": str(n), "raid": "RAID60", "pool": f"P{n}", "capacityGB": 180000}
                    for n in range(shelves)],
        "batteries": [{"id": "0"}]}]}


def wait_until(condition, seconds):
    end = time.monotonic() + seconds
    while not condition():
        if time.monotonic() > end:
            sys.exit("too late")
        time.sleep(0.2)


def main():
    drives = int(sys.argv[1]) if len(sys.argv) > 1 else 1000
    directory = tempfile.mkdtemp()
    file = os.path.join(directory, "large.json")
    with open(file, "w", encoding="utf-8") as stream:
        json.dump(array(drives), stream)
    control = os.path.join(directory, "control")
    with serve("--interval", "1", "--control", control, scenario=file) as server:
        driver = chromium()
        page = server.url.replace("/cimom", "/")
        driver.get(page)
        shown = "return document.querySelectorAll('button.slot:not([data-look=absent])').length"
        wait_until(lambda: driver.execute_script(shown) == drives, 600)
        times = []
        for _ in range(5):
            driver.get(page)
            wait_until(lambda: driver.execute_script(shown) == drives, 60)
            wait_until(lambda: driver.execute_script(MEASURE, "document"), 60)
            times.append(driver.execute_script(MEASURE, "document"))
        failed = "return document.querySelectorAll('button.slot[data-look=critical]').length"
        changes = []
        for n in range(10):
            driver.execute_script("performance.clearMeasures()")
            run("tell", control, f"fail drive C0 {n}_1")
            wait_until(lambda expected=n + 1: driver.execute_script(failed) == expected, 60)
            wait_until(lambda: driver.execute_script(MEASURE, "change"), 60)
            changes.append(driver.execute_script(MEASURE, "change"))
    print(f"{drives} drives: drawn in {statistics.median(times):.0f} ms (longest of {len(times)}: "
          f"{max(times):.0f} ms); a failed drive in {statistics.median(changes):.1f} ms (longest of "
          f"{len(changes)}: {max(changes):.1f} ms)")
    sys.exit(0 if max(times) < 1000 and max(changes) < 100 else 1)


if __name__ == "__main__":
    main()
