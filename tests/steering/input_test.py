#!/usr/bin/env python3
"""Commands on standard input: what is refused and what that means, waiting, the timeline."""
import json
import os
import tempfile
import unittest

from steering_support import Session, run, scenario_file, serve

SHOWN = ("--scenario", scenario_file("battery-learning"))


class Input(unittest.TestCase):
    def watch(self, commands, *arguments):
        return run("watch", *SHOWN, "--speed", "0.001", *arguments, input=commands)

    def test_strict_ends_with_the_first_refused_command(self):
        watched = self.watch("dance\nfail battery C0 0\n", "--strict")
        self.assertEqual(watched.returncode, 1)
        self.assertIn('\n? command: unknown command "dance"', watched.stdout)
        self.assertNotIn("> fail battery", watched.stdout)
        with serve("--strict") as server:
            server.say("set drive C0 32_0 sloth=1")
            self.assertIn("controllers[C0].drives[32_0]: unknown member", server.await_line("? "))
            self.assertEqual(server.end(), 1)

    def test_without_strict_it_goes_on(self):
        watched = self.watch("wait abc\nwait\nwait -1\nfail battery C0 0\n")
        self.assertEqual(watched.returncode, 0)
        self.assertEqual(watched.stdout.count("? command: a number of seconds from 0 to"), 2)
        self.assertIn("? command: wait takes a number of seconds\n", watched.stdout)
        self.assertIn("> fail battery C0 0", watched.stdout)

    def test_waiting_keeps_later_commands_back(self):
        with serve() as server:
            server.say("wait 2")
            server.say("clear faults")
            server.say("quit")
            self.assertEqual(server.next_line(), "> clear faults")
            self.assertEqual(server.end(), 0)

    def test_values_are_json(self):
        with serve() as server:
            server.say('set drive C0 32_0 properties={"Name": {"type": "string", "value": "a b"}} '
                       'name="c d" pools=["DG0"] pool=["DG1"]')
            self.assertTrue(server.next_line().startswith("> set drive"))
            server.say("quit")
            self.assertIsNone(server.next_line(), "not refused")

    def test_timeline(self):
        with tempfile.TemporaryDirectory() as directory:
            file = os.path.join(directory, "timed.json")
            with open(scenario_file("battery-learning"), encoding="utf-8") as stream:
                scenario = json.load(stream)
            scenario["timeline"].append({"at": 11, "command": "fail drive C0 nothing"})
            with open(file, "w", encoding="utf-8") as stream:
                json.dump(scenario, stream)
            with Session("watch", "--scenario", file, "--speed", "20") as watch:
                self.assertEqual(watch.await_line("[10 s]"), "[10 s] learn battery C0 0")
                self.assertEqual(watch.await_line("[11 s]"), "[11 s] fail drive C0 nothing")
                self.assertEqual(watch.await_line("? "), '? command: no drive "nothing"')
                for state in ("charging and low", "charging", "optimal"):
                    self.assertIn(f'set battery C0 0 state="{state}"', watch.await_line("s] set"))
        self.assertEqual(run("watch", "--scenario", scenario_file("battery-learning"), "--speed",
                             "0").returncode, 2)


if __name__ == "__main__":
    unittest.main(verbosity=2)
