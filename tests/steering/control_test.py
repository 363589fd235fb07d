#!/usr/bin/env python3
"""`serve --control` and `tell`: commands from elsewhere, with their results."""
import json
import os
import socket
import stat
import tempfile
import unittest

from steering_support import run, scenario_file, serve, wait_until


class Control(unittest.TestCase):
    def setUp(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.directory = directory.name
        self.socket = os.path.join(self.directory, "control")

    def start(self, *arguments, scenario="healthy-array"):
        server = serve("--control", self.socket, "--interval", "1", *arguments, scenario=scenario)
        self.addCleanup(server.__exit__)
        return server

    def tell(self, *commands):
        told = run("tell", self.socket, *commands)
        return told.returncode, told.stdout, told.stderr

    def check(self, url):
        return run("ask", "--check", url).stdout.partition(" |")[0]

    def test_results_are_status_and_line(self):
        self.start()
        self.assertEqual(self.tell("fail drive C0 32_0"), (0, "done: fail drive C0 32_0\n", ""))
        self.assertEqual(self.tell("fail drive C0 99"),
                         (1, "", 'plexor-testbed: command: no drive "99"\n'))
        self.assertEqual(self.tell("dance")[::2], (
            1, 'plexor-testbed: command: unknown command "dance"; help lists the known ones\n'))
        self.assertEqual(self.tell("clear faults", "dance", "quit")[:2],
                         (1, "done: clear faults\n"), "the first refused one ends it")
        self.assertIn("fail drive|port|battery", self.tell("help")[1])
        self.assertIn("Controller C0 (RC-308)", self.tell("show")[1])
        self.assertEqual(stat.S_IMODE(os.stat(self.socket).st_mode) & 0o077, 0)

    def test_spare_is_rebuilt_to_optimal(self):
        server = self.start("--speed", "6")  # a minute of rebuilding takes ten seconds
        self.assertTrue(wait_until(lambda: self.check(server.url).startswith("PLEXOR OK")))
        self.tell("fail drive C0 32_1")
        for text in ("1 volume degraded: RAID5 data Logical Volume 0 on controller C0; "
                     "1 drive rebuilding: Drive 32_7", "1 drive failed: Drive 32_1 on controller C0"):
            self.assertTrue(wait_until(lambda t=text: self.check(server.url).endswith(t) or
                                       t in self.check(server.url)), text)
        self.assertTrue(wait_until(lambda: "degraded" not in self.check(server.url)))
        self.assertEqual(self.check(server.url),
                         "PLEXOR CRITICAL - 1 drive failed: Drive 32_1 on controller C0")
        self.tell("replace drive C0 32_1")
        self.assertTrue(wait_until(lambda: "1 drive rebuilding: Drive 32_1" in
                                   self.check(server.url)))
        self.assertTrue(wait_until(lambda: self.check(server.url).startswith("PLEXOR OK")))
        self.assertIn('] set drive C0 32_7 state="online"', server.await_line('32_7 state="online"'))

    def test_time_stands_goes_and_hurries(self):
        server = self.start()  # rebuilding takes a minute
        self.assertTrue(wait_until(lambda: self.check(server.url).startswith("PLEXOR OK")))
        self.assertEqual(self.tell("pause", "fail drive C0 32_1", "speed 100000")[0], 0)
        self.assertTrue(wait_until(lambda: "1 drive rebuilding" in self.check(server.url)))
        self.assertIn("1 drive rebuilding", self.check(server.url), "time stands")
        self.assertEqual(self.tell("play")[0], 0)
        self.assertIn('] set drive C0 32_7 state="online"', server.await_line("32_7 state="))
        for wrong, why in (("speed", "speed takes one number"), ("pause 5", "pause takes nothing"),
                           ("speed 0", "a number from 0.001 to 1000000 is needed behind speed"),
                           ("speed fast", "a number from 0.001 to 1000000 is needed behind speed")):
            self.assertEqual(self.tell(wrong)[::2], (1, f"plexor-testbed: command: {why}\n"))

    def test_saved_state_is_a_scenario(self):
        self.start("--speed", "0.001")
        file = os.path.join(self.directory, "saved.json")
        self.assertEqual(self.tell("fail drive C0 32_1", "save " + file)[0], 0)
        with open(file, encoding="utf-8") as stream:
            saved = json.load(stream)
        self.assertEqual([entry["command"] for entry in saved["timeline"]],
                         ['set drive C0 32_7 state="online"'])
        self.assertEqual(run("scenarios", file).stdout, file + ": fine\n")
        self.assertEqual(self.tell("reset")[0], 0)
        self.assertEqual(self.tell("save " + file)[0], 0)
        with open(file, encoding="utf-8") as stream:
            self.assertEqual([drive["state"] for drive in json.load(stream)["controllers"][0]["drives"]],
                             ["online"] * 7 + ["hot spare"])
        self.assertEqual(self.tell("save /nowhere/x.json")[::2], (
            1, "plexor-testbed: /nowhere/x.json: No such file or directory\n"))

    def test_a_broken_file_leaves_the_server_as_it_was(self):
        file = os.path.join(self.directory, "scenario.json")
        with open(scenario_file("healthy-array"), encoding="utf-8") as stream:
            text = stream.read()
        with open(file, "w", encoding="utf-8") as stream:
            stream.write(text)
        server = self.start(scenario=file)
        for broken, why in (('{"controllers": [], "shuffle": 1e999}', "the number is too large"),
                            ("[" * 200000, "nested deeper than 64 levels"),
                            ("", "the file is empty"), ("{}", '"controllers" is missing')):
            with open(file, "w", encoding="utf-8") as stream:
                stream.write(broken)
            self.assertIn(why, server.await_line("? "))
        self.assertTrue(wait_until(lambda: self.check(server.url).startswith("PLEXOR OK")))

    def test_strangers_and_silence_do_no_harm(self):
        server = self.start()
        silent = []
        for _ in range(40):
            connection = socket.socket(socket.AF_UNIX)
            connection.connect(self.socket)
            self.addCleanup(connection.close)
            silent.append(connection)
        silent[-1].sendall(b"x" * 100000)
        self.assertEqual(self.tell("clear faults")[0], 0)
        self.assertEqual(self.tell("quit"), (0, "done: quit\n", ""))
        self.assertEqual(server.end(), 0)
        self.assertFalse(os.path.exists(self.socket))
        self.assertEqual(self.tell("help")[0], 1)

    def test_a_socket_has_one_server(self):
        self.start()
        second = run("serve", "--scenario", "healthy-array", "--port", "0", "--control",
                     self.socket)
        self.assertEqual((second.returncode, second.stderr),
                         (1, f"plexor-testbed: {self.socket}: another server listens there\n"))

    def test_a_socket_that_was_left_behind_is_replaced(self):
        left = socket.socket(socket.AF_UNIX)
        left.bind(self.socket)
        left.close()
        self.start()
        self.assertEqual(self.tell("clear faults")[0], 0)


if __name__ == "__main__":
    unittest.main(verbosity=2)
