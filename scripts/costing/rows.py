"""The rows of the table of costs, each with its limit."""

import math
from dataclasses import dataclass

GROUPS = ["serving", "refresh", "counts", "inventory", "crowd", "idle"]

OPERATIONS = ["names", "instances", "get"]
ORDERS = ["unchanged", "reversed", "random", "all-new"]
MEMBERS = "members"       # a part of each refresh: the look-ups of the drives in their pool

SERVING_RATIO = 1.10      # to a provider that answers with constants, the log masked
SERVING_DRIVES = 1000     # up to that many drives
MASKED_LINE_NS = 20
# What four times as many drives may cost each: 1 is linear, 4 would be each drive looking at all. Memory
# further away takes its share, more in some runs than in others.
LINEAR = 2
# Calls, lines and allocations, masked: a fixed part and one for each drive.
COUNTS = {
    "names": {"calls": (8, 6), "lines": (5, 1), "allocations": (0, 1)},
    "instances": {"calls": (8, 16), "lines": (5, 6), "allocations": (0, 1)},
    "get": {"calls": (26, 0), "lines": (12, 0), "allocations": (3, 0)},
    "refresh-unchanged": {"calls": (19, 21), "lines": (25, 11), "allocations": (8, 0)},
    "refresh-reversed": {"calls": (19, 21), "lines": (25, 11), "allocations": (8, 0)},
    "refresh-random": {"calls": (19, 21), "lines": (25, 11), "allocations": (8, 0)},
    # The tenth: the index of the pool's drives, which is made anew now and then.
    "refresh-all-new": {"calls": (19, 56), "lines": (25, 32), "allocations": (8, 9.1)},
}
RECORD_BYTES = 460        # the controller's share at 24 drives in it
WALK_RATIO = 1.05         # to the prescribed waits, or to the vendor's answers
FIFO_LIMIT = 20
P99_RATIO = 1.1           # to a vendor that answers at once
WAKEUPS = 2.2             # two workers that look each second, and the odd one more


@dataclass
class Row:
    what: str
    drives: str
    value: object         # a number, or a tuple of them
    limit: object = None  # the same; None: there is none
    unit: str = ""
    digits: int = 2

    def is_ok(self):
        if self.limit is None:
            return True
        if isinstance(self.limit, tuple):
            return all(value <= limit for value, limit in zip(self.value, self.limit))
        return self.value <= self.limit

    def text(self, value):
        if value is None:
            return ""
        if isinstance(value, tuple):
            return f"{value[0]:g} + {value[1]:g} each"
        return f"{value:,.{self.digits}f} {self.unit}".rstrip()

    @property
    def measured(self):
        return self.text(self.value)

    def limit_text(self):
        return self.text(self.limit)


def sizes(found, pattern):
    """The numbers of drives for which there is a measurement of that name, N in it being the number."""
    before, after = pattern.split("N")
    numbers = {name[len(before):len(name) - len(after)] for name in found
               if name.startswith(before) and name.endswith(after)}
    return sorted(int(number) for number in numbers if number.isdigit())


def serving(found):
    for log in ("masked", "open"):
        for operation in OPERATIONS:
            for drives in sizes(found, f"{log}/{operation}/N/ratio"):
                ratio = found[f"{log}/{operation}/{drives}/ratio"]
                limited = log == "masked" and drives <= SERVING_DRIVES
                yield Row(f"{operation}, log {log}, to constants", f"{drives:,}", ratio,
                          SERVING_RATIO if limited else None)
    if "masked/masked-line" in found:
        yield Row("a masked log line", "", found["masked/masked-line"], MASKED_LINE_NS, "ns", 1)


def refresh(found):
    for order in ORDERS + [MEMBERS]:
        numbers = sizes(found, f"refresh/N/{order}")
        for drives in numbers:
            time = found[f"refresh/{drives}/{order}"] / 1e6
            yield Row(f"refresh, {order}", f"{drives:,}", time, unit="ms",
                      digits=max(0, 2 - math.floor(math.log10(time))))
        if len(numbers) < 2:
            continue
        less, more = numbers[-2:]
        each = [found[f"refresh/{drives}/{order}"] / drives for drives in (less, more)]
        # For another step than one by four as much as for the same way from 1 to quadratic.
        limit = LINEAR ** math.log(more / less, 4)
        yield Row(f"refresh, {order}, each drive's time to that at {less:,}", f"{more:,}",
                  each[1] / each[0], limit)


def counts(found):
    for name, limits in COUNTS.items():
        for what, limit in limits.items():
            numbers = sizes(found, f"{name}/N/{what}")
            if len(numbers) < 2:
                continue
            values = [found[f"{name}/{drives}/{what}"] for drives in numbers]
            # The steepest step between two sizes: what grows faster than the drives shows there.
            each = max((values[i + 1] - values[i]) / (numbers[i + 1] - numbers[i])
                       for i in range(len(values) - 1))
            yield Row(f"{name.replace('-', ', ', 1)}: {what}", f"{numbers[0]:,} to {numbers[-1]:,}",
                      (values[0] - each * numbers[0], each), limit)
    for drives in sizes(found, "record/N"):
        yield Row("bytes for each record", f"{drives:,}", found[f"record/{drives}"], RECORD_BYTES,
                  digits=0)
        yield Row("bytes more after 20 refreshes", f"{drives:,}", found[f"growth/{drives}"], 0, digits=0)


def inventory(found):
    for drives in sizes(found, "inventory/N/0ms/walk"):
        name = f"inventory/{drives}/0ms"
        room = found[f"{name}/waits-for-room"]
        waits = room + found[f"{name}/waits-for-end"]
        yield Row("inventory: waits for room", f"{drives:,}", room,
                  math.ceil(drives / FIFO_LIMIT) - 1, digits=0)
        yield Row("inventory, all but the waits", f"{drives:,}",
                  (found[f"{name}/walk"] - waits) * 1000, None, "ms", 0)
        yield Row("inventory, to the waits", f"{drives:,}", found[f"{name}/walk"] / waits, WALK_RATIO)
    for drives in sizes(found, "inventory/N/20ms/all-there"):
        name = f"inventory/{drives}/20ms"
        yield Row("inventory, answers take 20 ms, to the answers", f"{drives:,}",
                  found[f"{name}/all-there"] / (found[f"{name}/answers"] * 0.02), WALK_RATIO)


def crowd(found):
    for mood, limit in (("at-once", None), ("ten-seconds", P99_RATIO), ("never", P99_RATIO)):
        if f"crowd/{mood}/p99" not in found:
            continue
        words = {"at-once": "at once", "ten-seconds": "in 10 s", "never": "never"}[mood]
        yield Row(f"p99 of 64 clients, vendor answers {words}", "9", found[f"crowd/{mood}/p99"], None,
                  "ms")
        if limit is not None:
            yield Row(f"p99 of 64 clients, vendor answers {words}, to at once", "9",
                      found[f"crowd/{mood}/p99-ratio"], limit)


def idle(found):
    if "idle/wakeups" in found:
        yield Row("wake-ups of an idle provider in a second", "9", found["idle/wakeups"], WAKEUPS)


def rows_of(found):
    """What was measured of everything that has a row."""
    makers = {"serving": serving, "refresh": refresh, "counts": counts, "inventory": inventory,
              "crowd": crowd, "idle": idle}
    return [row for group in GROUPS for row in makers[group](found)]
