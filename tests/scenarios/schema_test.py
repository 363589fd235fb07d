#!/usr/bin/env python3
"""The JSON schema of scenarios against the tool that reads them: both take what is shipped, both
refuse what is wrong, and both know the same members."""
import copy
import json
import os
import pathlib
import subprocess
import tempfile
import unittest

import jsonschema

TOOL = os.environ["PLEXOR_TESTBED"]
SOURCE = pathlib.Path(os.environ["PROJECT_SOURCE_DIR"])
SCHEMA = json.loads((SOURCE / "docs/scenario.schema.json").read_text())
VALIDATOR = jsonschema.Draft7Validator(SCHEMA)

BASE = {
    "host": {"name": "h"}, "vendor": {}, "manager": {}, "consequences": {},
    "profiles": [{"name": "p"}], "faults": [{"call": "associators"}],
    "timeline": [{"at": 1, "command": "clear faults"}],
    "controllers": [{
        "id": "C0", "software": [{"id": "f"}], "enclosures": [{"number": 1}],
        "pools": [{"id": "P", "primordial": True}, {"id": "G"}],
        "drives": [{"id": "d", "pool": "G", "properties": {"Name": {"type": "string", "value": ""}}}],
        "volumes": [{"id": "v", "pool": "G"}], "ports": [{"id": "p"}],
        "batteries": [{"id": "b"}], "others": [{"id": "o"}]}]}

# Where the base has an object of each definition.
C = ["controllers", 0]
PLACES = {"scenario": [], "host": ["host"], "vendor": ["vendor"], "manager": ["manager"],
          "consequences": ["consequences"], "profile": ["profiles", 0], "fault": ["faults", 0],
          "timed": ["timeline", 0], "controller": C, "software": C + ["software", 0],
          "enclosure": C + ["enclosures", 0], "pool": C + ["pools", 1], "drive": C + ["drives", 0],
          "volume": C + ["volumes", 0], "port": C + ["ports", 0], "battery": C + ["batteries", 0],
          "other": C + ["others", 0], "value": C + ["drives", 0, "properties", "Name"],
          "tweaks": C + ["drives", 0, "extent"]}

# (object, member, value that is wrong there); None takes the member away.
WRONG = [
    ("scenario", "hots", {}), ("scenario", "controllers", None), ("scenario", "controllers", {}),
    ("scenario", "latencyMs", [1]), ("scenario", "latencyMs", [1, 2, 3]),
    ("scenario", "latencyMs", 5), ("scenario", "shuffle", -1), ("scenario", "shuffle", 4294967296),
    ("scenario", "consequences", "no"), ("scenario", "timeline", {}),
    ("host", "nmae", "x"), ("host", "absent", "yes"), ("vendor", "prefix", "A"),
    ("manager", "serial", True), ("manager", "allProperties", 1),
    ("consequences", "rebuildSeconds", -5), ("consequences", "rebuild", 5),
    ("timed", "at", "soon"), ("timed", "at", -1), ("timed", "at", None), ("timed", "command", None),
    ("profile", "name", None), ("profile", "organization", 65536),
    ("fault", "call", None), ("fault", "call", "associate"), ("fault", "delay", 5),
    ("fault", "delayMs", -1), ("fault", "times", "twice"), ("fault", "rc", "failed"),
    ("controller", "id", None), ("controller", "fans", []), ("controller", "status", "well"),
    ("controller", "health", 65536), ("controller", "software", {"toast": "1"}),
    ("controller", "operationalStatus", 1.5), ("controller", "drives", "many"),
    ("software", "classifications", "firmware"), ("software", "versoin", "1"),
    ("pool", "totalGb", 5), ("pool", "totalGB", -5), ("pool", "members", [True]),
    ("enclosure", "number", None), ("enclosure", "status", "lots"),
    ("drive", "sloth", 1), ("drive", "slot", 65536), ("drive", "slot", "1a"), ("drive", "slot", -1),
    ("drive", "slot", [1]), ("drive", "state", "foo"), ("drive", "state", 2),
    ("drive", "interface", "IDE"), ("drive", "capacityGB", "1.8 TB"), ("drive", "count", "many"),
    ("drive", "before", "happy"), ("drive", "extent", {"status": 1}), ("drive", "omit", {}),
    ("drive", "properties", []), ("volume", "raid", "RAID7"), ("volume", "state", "failed"),
    ("volume", "deltaReservation", 256), ("volume", "primordial", "no"),
    ("port", "type", "USB"), ("port", "usage", "all"), ("port", "state", "online"),
    ("battery", "state", "tired"), ("battery", "batteryStatus", "empty"), ("battery", "id", True),
    ("other", "id", None), ("value", "type", "uint17"), ("value", "type", None),
    ("value", "value", None), ("tweaks", "Properties", {}), ("tweaks", "keys", 5),
]


def with_change(place, member, value):
    document = copy.deepcopy(BASE)
    target = document
    for step in place:
        if isinstance(target, dict) and step not in target:
            target[step] = {}
        target = target[step]
    if value is None:
        del target[member]
    else:
        target[member] = value
    return document


def tool_says(documents):
    """The tool's line for each document, without the file's name."""
    with tempfile.TemporaryDirectory() as directory:
        files = [os.path.join(directory, f"{i}.json") for i in range(len(documents))]
        for file, document in zip(files, documents):
            pathlib.Path(file).write_text(json.dumps(document))
        run = subprocess.run([TOOL, "scenarios", *files], capture_output=True, text=True,
                             check=False)
        lines = run.stdout.splitlines()
        assert len(lines) == len(files) and not run.stderr, run.stdout + run.stderr
        return [line[len(file) + 2:] for file, line in zip(files, lines)]


def schema_says(document):
    return [error.message for error in VALIDATOR.iter_errors(document)]


class Schema(unittest.TestCase):
    def test_is_a_schema(self):
        jsonschema.Draft7Validator.check_schema(SCHEMA)

    def test_shipped_scenarios_and_the_base_are_fine(self):
        shipped = sorted((SOURCE / "scenarios").glob("*.json"))
        self.assertGreaterEqual(len(shipped), 12)
        documents = [BASE] + [json.loads(file.read_text()) for file in shipped]
        for document, said in zip(documents, tool_says(documents)):
            self.assertEqual(said, "fine")
            self.assertEqual(schema_says(document), [], document.get("description"))

    def test_examples_of_the_manual_are_fine(self):
        text = (SOURCE / "docs/scenarios.md").read_text()
        examples = [json.loads(part.split("```")[0]) for part in text.split("```json\n")[1:]]
        self.assertEqual(len(examples), 3)
        self.assertEqual(tool_says(examples), ["fine"] * 3)
        self.assertEqual([schema_says(example) for example in examples], [[]] * 3)

    def test_wrong_ones_are_refused_by_both(self):
        self.assertGreaterEqual(len(WRONG), 50)
        documents = [with_change(PLACES[name], member, value) for name, member, value in WRONG]
        for case, document, said in zip(WRONG, documents, tool_says(documents)):
            with self.subTest(case=case):
                self.assertNotEqual(said, "fine")
                self.assertRegex(said, r"\(line \d+\)$")
                self.assertNotEqual(schema_says(document), [])

    def test_both_know_the_same_members(self):
        cases = []
        for name, place in PLACES.items():
            definition = SCHEMA if name == "scenario" else SCHEMA["definitions"][name]
            cases += [(name, member, place) for member in definition["properties"]
                      if member not in ("$schema", "count", "first")]
        self.assertGreater(len(cases), 150)
        # What no member can be.
        documents = [with_change(place, member, [[[]]]) for _, member, place in cases]
        for (name, member, _), document, said in zip(cases, documents, tool_says(documents)):
            with self.subTest(object=name, member=member):
                if (name, member) == ("value", "value"):
                    continue  # of any type
                self.assertNotEqual(said, "fine")
                self.assertNotIn("unknown member", said)
                self.assertNotEqual(schema_says(document), [])

    def test_a_typo_has_a_line_and_a_reason(self):
        text = (SOURCE / "scenarios/healthy-array.json").read_text()
        typo = json.loads(text.replace('"enclosure": 32, "state": "hot spare"',
                                       '"enclosrue": 32, "state": "hot spare"'))
        self.assertIn("Additional properties are not allowed ('enclosrue' was unexpected)",
                      schema_says(typo))
        self.assertRegex(tool_says([typo])[0],
                         r'^controllers\[0\].drives\[2\]: unknown member "enclosrue" \(line 1\)$')


if __name__ == "__main__":
    unittest.main(verbosity=2)
