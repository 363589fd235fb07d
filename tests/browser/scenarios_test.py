"""Every scenario that comes with the tool, as the page shows it."""
import collections
import json
import re

from browser_support import Page, asked, request, run

DRIVES, VOLUMES = "Tovexa_PlexorStorageExtent", "Tovexa_PlexorStorageVolume"
BATTERIES, PORTS = "Tovexa_PlexorBattery", "Tovexa_PlexorSASSATAPort"

# Looks of the drives; drives in each rack; volumes; batteries and ports.
SCENARIOS = {
    "battery-learning": ({"ok": 2}, [2], 1, 3),
    "degraded-array": ({"ok": 6, "rebuild": 1, "critical": 1, "warning": 1}, [9], 2, 9),
    "enclosure-lost": ({"ok": 2, "critical": 5}, [2, 5], 2, 3),
    "foreign-drives": ({"ok": 2, "warning": 3}, [5], 1, 3),
    "four-enclosures": ({"ok": 232, "spare": 8}, [60, 60, 60, 60], 4, 9),
    "healthy-array": ({"ok": 7, "spare": 1}, [8], 2, 9),
    "hostile-vendor": ({"ok": 15, "warning": 2}, [7, 1, 0, 0, 0, 1, 1, 1, 1, 1], 8, 7),
    "many-drives": ({"ok": 238, "spare": 2}, [24] * 10, 10, 9),
    "no-pools": ({}, [4], 0, 5),  # the provider does not show what is in no pool
    "predictive-failure": ({"ok": 3, "spare": 1, "warning": 1}, [5], 1, 5),
    "raid6-double-fault": ({"ok": 6, "critical": 2}, [8], 1, 3),
    "spare-rebuild": ({"ok": 4, "spare": 1}, [5], 1, 3),
    "two-controllers": ({"ok": 13, "spare": 1, "free": 1}, [2, 6, 7], 4, 18),
}


class Scenarios(Page):
    maxDiff = None

    def check_against_answers(self, url, slots):
        """State words and levels are those of the tool."""
        answer = asked(url)
        for drive in answer[DRIVES]:
            key = "drive:" + drive["keys"]["DeviceID"].removeprefix("tvxStorageExt")
            self.assertEqual(slots[key]["level"], drive["verdict"]["level"], key)
            self.assertIn(drive["verdict"]["word"].lower(), slots[key]["label"], key)
            self.assertTrue(slots[key]["sign"], "colour is not the only sign")
        shown = self.js("return [...document.querySelectorAll('.volume')].map("
                        "(node) => [node.dataset.level, node.querySelector('.word').innerText])")
        self.assertEqual(sorted(map(tuple, shown)),
                         sorted((each["verdict"]["level"], each["verdict"]["word"].lower())
                                for each in answer[VOLUMES]))
        parts = self.js("return [...document.querySelectorAll('.part')].map("
                        "(node) => node.dataset.level)")
        self.assertEqual(sorted(parts), sorted(each["verdict"]["level"]
                                               for each in answer[BATTERIES] + answer[PORTS]))

    def check_line(self, url):
        line = run("ask", "--check", "--no-refresh", url).stdout.partition(" | ")[0]
        level, text = re.fullmatch(r"PLEXOR (\w+) - (.*)\n?", line).groups()
        self.wait(lambda: self.text("#verdict-text") == text.strip(), line)
        self.assertEqual(self.text("#verdict-word"), level)
        self.assertEqual(self.js("return document.querySelector('#verdict').dataset.level"),
                         level.lower())

    def show(self, name):
        looks, racks, volumes, parts = SCENARIOS[name]
        server = self.start("--speed", "0.001", scenario=name)  # what the file says, and no more
        self.open(server.page, sum(looks.values()))
        self.wait(lambda: self.count(".volume") == volumes and self.count(".part") == parts, name)
        slots = {key: slot for key, slot in self.slots().items() if slot["look"] != "absent"}
        self.assertEqual(collections.Counter(slot["look"] for slot in slots.values()), looks)
        self.assertEqual(self.js("return [...document.querySelectorAll('.rack')].map((node) =>"
                                 "node.querySelectorAll('[data-key]').length)"), racks)
        self.check_against_answers(server.url, slots)
        self.check_line(server.url)
        self.assert_no_errors()
        return server

    def test_page_document_is_the_documented_one(self):
        server = self.start(scenario="degraded-array")
        self.open(server.page, 9)
        document = json.loads(request(server.page, "GET", "/page.json")[2])
        for name, value in asked(server.url).items():
            if isinstance(value, list):
                value = [{k: v for k, v in each.items() if k != "view"} for each in value]
                document[name] = [{k: v for k, v in each.items() if k != "view"}
                                  for each in document[name]]
            self.assertEqual(document[name], value, name)
        self.assertEqual(list(document["check"]), ["status", "level", "text", "performance"])


def add_test(name):
    setattr(Scenarios, "test_" + name.replace("-", "_"), lambda self: self.show(name))


for scenario in SCENARIOS:
    add_test(scenario)
