#!/usr/bin/env python3
"""`scenarios` and `calls`: what there is, whether a file of one's own is right, what the vendor is asked."""
import os
import tempfile
import unittest

from steering_support import SOURCE, run, scenario_file


class Listing(unittest.TestCase):
    def test_every_scenario_has_a_line(self):
        listed = run("scenarios")
        self.assertEqual((listed.returncode, listed.stderr), (0, ""))
        lines = listed.stdout.splitlines()
        self.assertEqual([line.split()[0] + ".json" for line in lines],
                         sorted(name for name in os.listdir(os.path.join(SOURCE, "scenarios"))
                                if name.endswith(".json")))
        self.assertIn("degraded-array      One drive has failed, the spare is being rebuilt into its "
                      "place, a volume is degraded and the battery is weak.", lines)

    def test_files_are_checked_one_by_one(self):
        with tempfile.NamedTemporaryFile("w", suffix=".json") as wrong:
            wrong.write('{"controllers": 7}')
            wrong.flush()
            checked = run("scenarios", wrong.name, "healthy-array")
        self.assertEqual(checked.returncode, 1)
        first, second = checked.stdout.splitlines()
        self.assertIn("controllers", first)
        self.assertEqual(os.path.basename(second), "healthy-array.json: fine")
        self.assertEqual(run("scenarios", "healthy-array").returncode, 0)

    def test_calls_are_counted_by_what_they_are_made_on(self):
        counted = run("calls", "--scenario", scenario_file("healthy-array"))
        self.assertEqual(counted.returncode, 0, counted.stderr)
        lines = counted.stdout.splitlines()
        drives = lines.index("made on CIM_DiskDrive")
        self.assertEqual(lines[drives + 1 : drives + 4], [
            "       8  associatorNames CIM_Realizes -> CIM_PhysicalPackage",
            "       8  associators CIM_ElementSoftwareIdentity -> CIM_SoftwareIdentity",
            "       8  associators CIM_MediaPresent",
        ])
        counts = [int(line.split()[0]) for line in lines if line.startswith(" ")]
        self.assertEqual(lines[-1].split()[1:], ["in", "all"])
        self.assertEqual(counts[-1], sum(counts[:-1]))


if __name__ == "__main__":
    unittest.main()
