#!/usr/bin/env python3
"""Every row of the table of states in docs/operating.md can be reached by a command."""
import json
import os
import re
import tempfile
import unittest

from steering_support import SOURCE, run, serve, wait_until

SCENARIO = {
    "consequences": False,
    "controllers": [{
        "id": "C0", "pools": [{"id": "P", "primordial": True}, {"id": "G"}],
        "drives": [{"id": "d", "pool": "G"}, {"id": "u", "state": "unconfigured good"}],
        "volumes": [{"id": "v", "pool": "G"}], "ports": [{"id": "p"}], "batteries": [{"id": "b"}]}]}

# (class, word, OperationalStatus of the table) and the command that leads there. What the provider
# has once read of a port stays, so that new ones are added.
COMMANDS = {
    ("volume", "OPTIMAL", "2"): "restore volume C0 v",
    ("volume", "DEGRADED", "3"): "set volume C0 v state=degraded",
    ("volume", "OFFLINE", "6"): "fail volume C0 v",
    ("volume", "UNDEFINED", "any other"): "set volume C0 v state=undefined",
    ("drive", "ONLINE", "2, in an array"): "restore drive C0 d",
    ("drive", "HOT SPARE", "2, ExtentStatus 13"): 'set drive C0 u state="hot spare"',
    ("drive", "REBUILD", "2, in an array, ExtentStatus 11"): "rebuild drive C0 d",
    ("drive", "UNCONFIGURED GOOD", "2 outside of arrays, or 15"): "restore drive C0 u",
    ("drive", "UNCONFIGURED BAD", "6 outside of arrays, ExtentStatus not 3"):
        'set drive C0 u state="unconfigured bad"',
    ("drive", "FAILED", "6 otherwise"): "fail drive C0 d",
    ("drive", "OFFLINE", "12"): "set drive C0 d state=offline",
    ("drive", "UNDEFINED", "any other, 5 (predictive failure) among them"): "predict drive C0 d",
    ("port, battery", "-", "2 or 15"): "add port C0 id=q state=up",
    ("port, battery", "-", "6"): "add port C0 id=r state=failed",
    ("port", "-", "12"): "add port C0 id=s state=down",
    ("battery", "-", "12"): "set battery C0 b state=missing",
    ("port, battery", "-", "any other, 3 (degraded) among them"): "add port C0 id=t state=degraded",
}
CLASSES = {"volume": "StorageVolume", "drive": "StorageExtent", "port": "SASSATAPort",
           "battery": "Battery"}


def rows():
    """(class, word, OperationalStatus, HealthState) of the table."""
    with open(os.path.join(SOURCE, "docs/operating.md"), encoding="utf-8") as stream:
        table = stream.read().split("| class | word |")[1].split("\n\n")[0]
    cells = [[cell.strip() for cell in line.strip("|").split("|")]
             for line in table.splitlines()[2:]]
    return [tuple(row[:4]) for row in cells]


class States(unittest.TestCase):
    def test_every_row_can_be_reached(self):
        self.assertEqual({row[:3] for row in rows()}, set(COMMANDS))
        with tempfile.TemporaryDirectory() as directory:
            file = os.path.join(directory, "states.json")
            control = os.path.join(directory, "control")
            with open(file, "w", encoding="utf-8") as stream:
                json.dump(SCENARIO, stream)
            with serve("--interval", "1", "--control", control, scenario=file) as server:
                for kind, word, status, health in rows():
                    command = COMMANDS[kind, word, status]
                    with self.subTest(command=command):
                        self.assertEqual(run("tell", control, command).returncode, 0)
                        self.assertTrue(wait_until(lambda c=command, w=word, s=status, h=health:
                                                   self.shows(server.url, c, w, s, h)))

    @staticmethod
    def shows(url, command, word, status, health):
        _, kind, _, element = command.replace("id=", "").split(" ")[:4]
        answer = json.loads(run("ask", "--json", url).stdout)["Tovexa_Plexor" + CLASSES[kind]]
        number = re.match(r"\d+", status)
        for instance in answer:
            properties = instance["properties"]
            if not instance["path"].endswith(f'C0_{element}"'):
                continue
            if word != "-" and not properties["ElementName"].endswith(" - " + word):
                continue
            if number and properties["OperationalStatus"] != [int(number.group())]:
                continue
            if properties["HealthState"] == int(health):
                return True
        return False


if __name__ == "__main__":
    unittest.main(verbosity=2)
