#!/usr/bin/env python3
"""The runbook has an entry for everything that the check can say and for each error of the log.

    runbook_test.py SOURCE

States, words of codes and reasons come from the sources, error lines from scripts/messages.
"""

import pathlib
import re
import subprocess
import sys

SOURCE = pathlib.Path(sys.argv[1])
RUNBOOK = (SOURCE / "docs/runbook.md").read_text(encoding="utf-8")
FLAT = re.sub(r"\s+", " ", RUNBOOK)


def literal(text):
    return text.replace('\\"', '"').replace("\\n", "").strip()


def table(file, name):
    text = (SOURCE / file).read_text(encoding="utf-8")
    return re.search(rf"\b{name}\[\] = \{{(.*?)\n\}};", text, re.S).group(1)


def state_words():
    """Words and findings of the table of states; the words of an OperationalStatus and of charges."""
    states = table("testbed/cli/check_rules.cpp", "kStateRules")
    for word, finding in re.findall(r'\{k\w+, "([^"]*)", .*?, "([^"]*)"\}', states):
        yield word
        yield finding
    words = "testbed/broker/cim_words.cpp", "testbed/vendor/cim_words.cpp", "testbed/schema/cim_words.cpp"
    [file] = [name for name in words if (SOURCE / name).exists()]
    for name in ("kOperationalStatus", "kHealthState"):
        yield from re.findall(r'"([^"]+)"', table(file, name))
    charges = dict(re.findall(r'\{(\d+), "([^"]+)"\}', table(file, "kBatteryStatus")))
    rules = table("testbed/cli/check_rules.cpp", "kChargeRules")
    for code in re.findall(r"\{(\d+), k", rules):
        yield f"battery {charges[code]}"


def reasons():
    """What the check says of answers that it does not take, as far as it is spelled out."""
    for file in ("testbed/wbem/http_post.cpp", "testbed/wbem/wbem_client.cpp",
                 "testbed/cli/ask_server.cpp"):
        text = (SOURCE / file).read_text(encoding="utf-8")
        text = re.sub(r'"\s*\n\s*"', "", text)
        for found in re.finditer(r'(?:WbemError|withoutSecrets|\bfail)\([^"();]*"((?:[^"\\]|\\.)+)"', text):
            reason = literal(found.group(1)).strip(": ")
            yield {"the answer has": "the answer has more than", "": ""}.get(reason, reason)
    text = (SOURCE / "testbed/wbem/http_post.cpp").read_text(encoding="utf-8")
    yield re.search(r'kLate = "([^"]+)"', text).group(1)


def endings():
    """Texts of the line that are put together; each from the place that makes it."""
    places = {
        "testbed/cli/check_summary.cpp": ["only ", " instead of ", "but no devices", "nothing to judge",
                                          "answered with status ", "inventory still arriving",
                                          " ignored"],
        "testbed/cli/inventory_gaps.cpp": [" has no devices", "which is not there",
                                           "are there", " have ", " has "],
        "testbed/cli/ask_server.cpp": ["no time left to ask again after "],
        "testbed/cli/command_ask.cpp": ["no answer within "],
        "testbed/cli/check_command.cpp": ["wrong usage"],
    }
    for file, texts in places.items():
        source = (SOURCE / file).read_text(encoding="utf-8")
        for text in texts:
            if text not in source:
                raise SystemExit(f"FAIL: {file} no longer says \"{text}\"")
            yield text


def log_errors():
    listing = subprocess.run(
        [sys.executable, SOURCE / "scripts/messages", "--list"], capture_output=True, text=True, check=True
    )
    for line in listing.stdout.splitlines():
        priority, text = line.split("\t")[:2]
        if priority == "LOG_ERR":
            yield literal(text)


def has_error(message):
    """Whether some pattern of the runbook, with its … for names, is this message."""
    patterns = [text for text in re.findall(r"`([^`]+)`", RUNBOOK) if len(re.findall("[a-z]", text)) > 4]
    plain = re.sub(r"%l?[a-z]", "X", message).replace(" ", "")
    for text in patterns:
        pattern = ".*".join(re.escape(part.replace(" ", "")) for part in text.split("…"))
        if re.search(f"^{pattern}", plain.replace("X:", "X")) or re.search(f"^{pattern}", plain):
            return True
    return False


def missing():
    for word in [*state_words(), *reasons(), *endings()]:
        if word and word.strip() not in FLAT:
            yield f"no entry for \"{word}\""
    for message in log_errors():
        # The option's name is a parameter of the line.
        if message == "%s: %s not found":
            continue
        if not has_error(message):
            yield f"no entry for the log's \"{message}\""


def main():
    wrong = list(missing())
    for line in wrong:
        print(f"FAIL: docs/runbook.md: {line}")
    return 1 if wrong else 0


if __name__ == "__main__":
    sys.exit(main())
