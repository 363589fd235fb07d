#!/usr/bin/env python3
"""wbemcli against `plexor-testbed serve` from an install tree: what the client prints must be what
`plexor-testbed show` answers for the same scenario, and what was worked out by hand."""
import json
import os
import re
import shutil
import signal
import subprocess
import tempfile
import time
import unittest

import wbemcli_support as support
from wbemcli_support import CLASSES, NAMESPACE, PREFIX, Client

running = {}


def setUpModule():
    support.require_client()
    running.update(support.start_all())


def tearDownModule():
    for server, _ in running.values():
        server.process.terminate()
    for server, _ in running.values():
        server.end()


class EveryScenario(unittest.TestCase):
    """Each method goes through all scenarios and all of the provider's classes."""
    maxDiff = None

    def over_scenarios(self, check):
        for name, (server, answer) in running.items():
            with self.subTest(scenario=name):
                self.assertIsNotNone(answer, "show has failed")
                self.await_inventory(server, answer)
                check(name, server, answer)

    def over_classes(self, check):
        def check_classes(name, server, answer):
            for short in CLASSES:
                with self.subTest(short=short):
                    check(name, server, PREFIX + short, answer[PREFIX + short])
        self.over_scenarios(check_classes)

    def await_inventory(self, server, answer):
        """The server answers from its start; what the walk has not reached yet comes later."""
        def complete():
            return all(len(Client("ein", server.url(PREFIX + short)).lines()) ==
                       len(answer[PREFIX + short]) for short in CLASSES)
        self.assertTrue(support.wait_until(complete), "the inventory is not complete")

    @staticmethod
    def settled(name, instances):
        """Those whose values do not depend on the order of the vendor's answers."""
        patterns = [pattern.split("\\|")[1] for pattern in support.read_expected(name)[1]]
        return [instance for instance in instances if not any(
            re.fullmatch(pattern, instance["properties"]["ElementName"] or "")
            for pattern in patterns)]

    def test_names(self):
        def check(_, server, class_name, instances):
            expected = [support.path_text(server.host, class_name, instance["keys"])
                        for instance in instances]
            lines = Client("ein", server.url(class_name)).lines()
            self.assertEqual(sorted(lines), sorted(expected))
        self.over_classes(check)

    def test_instances_with_all_properties(self):
        def check(name, server, class_name, instances):
            expected = [support.block_of(server.host, class_name, instance)
                        for instance in self.settled(name, instances)]
            blocks = Client("-nl", "ei", server.url(class_name)).blocks()
            self.assertEqual(len(blocks), len(instances))
            self.assertEqual([block for block in expected if block not in blocks], [])
        self.over_classes(check)

    def test_instances_on_a_line(self):
        def check(name, server, class_name, instances):
            expected = [support.line_of(server.host, class_name, instance)
                        for instance in self.settled(name, instances)]
            output = Client("ei", server.url(class_name)).output
            self.assertEqual([line for line in expected if line not in output], [])
        self.over_classes(check)

    def test_instances_with_a_property_list(self):
        chosen = ["ElementName", "HealthState"]
        def check(name, server, class_name, instances):
            expected = [support.block_of(server.host, class_name, instance, chosen)
                        for instance in self.settled(name, instances)]
            blocks = Client("-nl", "ei", server.url(class_name), ",".join(chosen)).blocks()
            self.assertEqual(len(blocks), len(instances))
            self.assertEqual([block for block in expected if block not in blocks], [])
        self.over_classes(check)

    def test_single_instances(self):
        def check_one(server, class_name, instance, controllers):
            path = support.path_text(server.host, class_name, instance["keys"])
            answer = Client("-nl", "gi", "http://" + path)
            if support.is_addressable(instance, controllers):
                self.assertEqual(answer.blocks(),
                                 [support.block_of(server.host, class_name, instance)],
                                 answer.errors)
            else:
                self.assertIn("Cim: (6)", answer.errors)

        def check(name, server, class_name, instances):
            controllers = running[name][1][PREFIX + "Controller"]
            instances = self.settled(name, instances)
            for instance in instances[::1 + len(instances) // 12]:
                check_one(server, class_name, instance, controllers)
        self.over_classes(check)

    def test_answers_worked_out_by_hand(self):
        def check(name, server, _):
            lines = []
            for short in CLASSES:
                blocks = Client("-nl", "ei", server.url(PREFIX + short)).blocks()
                lines += [support.summary_line(short, block) for block in blocks]
            expected, patterns = support.read_expected(name)
            self.assertTrue(expected)
            for pattern in patterns:
                match = next((line for line in lines if re.fullmatch(pattern, line)), None)
                self.assertIsNotNone(match, "nothing matches " + pattern)
                lines.remove(match)
            self.assertEqual(sorted(lines), sorted(expected))
        self.over_scenarios(check)

    def test_superclass(self):
        def check(_, server, answer):
            expected = [support.path_text(server.host, PREFIX + short, instance["keys"])
                        for short in ("StorageVolume", "StorageExtent")
                        for instance in answer[PREFIX + short]]
            lines = Client("ein", server.url("CIM_StorageExtent")).lines()
            self.assertEqual(sorted(lines), sorted(expected))
        self.over_scenarios(check)


class HealthyArray(unittest.TestCase):
    """One controller C0 with eight drives, two volumes, eight ports, a battery and a fan."""

    def setUp(self):
        self.server, _ = running["healthy-array"]
        port_controllers = Client("ein", self.vendor("CIM_PortController")).lines()
        self.assertEqual(len(port_controllers), 1)
        self.card = "http://" + port_controllers[0]

    def vendor(self, name):
        return self.server.url(name, "root/sample")

    def assert_failure(self, number, *arguments):
        answer = Client(*arguments)
        self.assertEqual(answer.output, "")
        self.assertIn(f"Cim: ({number})", answer.errors)

    def system(self):
        names = Client("ain", self.card, "-arc", "CIM_ComputerSystem").lines()
        self.assertEqual(len(names), 1)
        self.assertIn("root/sample:Sample_ControllerSystem.", names[0])
        return "http://" + names[0]

    def test_walk_from_profile_to_volumes(self):
        profiles = Client("ein", self.server.url("CIM_RegisteredProfile", "root/interop")).lines()
        reached = [name for profile in profiles for name in
                   Client("ain", "http://" + profile, "-ac", "CIM_ElementConformsToProfile",
                          "-arc", "CIM_PortController").lines()]
        self.assertEqual(["http://" + name for name in reached], [self.card])
        volumes = Client("-nl", "ai", self.system(), "-ac", "CIM_SystemDevice", "-arc",
                         "CIM_StorageVolume").blocks()
        self.assertEqual(sorted(support.property_of(block, "ElementName") for block in volumes),
                         ["boot", "data"])

    def test_counts_of_what_belongs_to_the_controller(self):
        for class_name, count in (("CIM_DiskDrive", 8), ("CIM_StorageVolume", 2),
                                  ("CIM_SASSATAPort", 8), ("CIM_Battery", 1), ("CIM_Fan", 1)):
            names = Client("ain", self.system(), "-arc", class_name).lines()
            self.assertEqual(len(names), count, class_name)

    def test_references_are_as_many_as_associators(self):
        for source in (self.card, self.system()):
            count = len(Client("ain", source).lines())
            self.assertGreater(count, 1)
            self.assertEqual(len(Client("rin", source).lines()), count)
            self.assertEqual(len(Client("-nl", "ri", source).blocks()), count)
            self.assertEqual(len(Client("-nl", "ai", source).blocks()), count)

    def test_references_name_both_ends(self):
        blocks = Client("-nl", "ri", self.card, "-arc", "CIM_LogicalIdentity").blocks()
        self.assertEqual(len(blocks), 1)
        self.assertIn("Sample_ControllerSystem", support.property_of(blocks[0], "SystemElement"))
        self.assertIn("Sample_PortController", support.property_of(blocks[0], "SameElement"))

    def test_provider_has_no_associations(self):
        name = "http://" + Client("ein", self.server.url(PREFIX + "Battery")).lines()[0]
        for operation in ("ai", "ain", "ri", "rin"):
            answer = Client(operation, name)
            self.assertEqual((answer.output.strip(), answer.errors), ("", ""))

    def test_classes(self):
        names = Client("ecn", self.server.url("")[:-1]).lines()
        for short in CLASSES:
            path = f"{self.server.host}/{NAMESPACE}:{PREFIX}{short}"
            self.assertIn(path, names)
            text = Client("gc", self.server.url(PREFIX + short)).output
            self.assertTrue(text.startswith(path + " "), text)
            self.assertIn("ElementName=", text)
        self.assertIn("BatteryStatus=", text)
        below = Client("ecn", self.server.url("CIM_StorageExtent")).lines()
        self.assertIn(f"{self.server.host}/{NAMESPACE}:{PREFIX}StorageVolume", below)

    def test_failures(self):
        battery = self.server.url(PREFIX + "Battery")
        self.assert_failure(5, "ein", self.server.url("CIM_Nothing"))
        self.assert_failure(5, "ei", self.server.url("CIM_Nothing"))
        self.assert_failure(3, "ei", self.server.url(PREFIX + "Battery", "root/nothing"))
        self.assert_failure(6, "gc", self.server.url("CIM_Nothing"))
        keys = 'SystemCreationClassName="a",SystemName="b",CreationClassName="c"'
        self.assert_failure(6, "gi", f'{battery}.{keys},DeviceID="tvxControllerBatteryC0_9"')
        self.assert_failure(6, "gi", self.vendor('Sample_Battery.DeviceID="nothing"'))
        self.assert_failure(7, "di", f'{battery}.{keys},DeviceID="x"')
        self.assert_failure(7, "cm", battery, "Reset")


class LiveServer(unittest.TestCase):
    """The server's life: commands, a user, and its end."""

    def start(self, *arguments, scenario=support.scenario_file("healthy-array")):
        server = support.Server(scenario, *arguments)
        self.addCleanup(server.end, lambda ended: ended.process.kill())
        return server

    def directory(self):
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        return directory.name

    def rewrite(self, file, old, new):
        with open(file, encoding="utf-8") as stream:
            text = stream.read()
        self.assertIn(old, text)
        with open(file, "w", encoding="utf-8") as stream:
            stream.write(text.replace(old, new))

    def test_commands_change_what_clients_see(self):
        server = self.start("--interval", "1")
        drives = server.url(PREFIX + "StorageExtent")
        self.assertTrue(support.wait_until(lambda: len(Client("ein", drives).lines()) == 8))
        server.say("fail drive C0 32_0")
        failed = "Drive 32_0 on controller C0 Fw: GS0F - FAILED"
        self.assertTrue(support.wait_until(lambda: failed in Client("ei", drives).output, 60))
        server.say("nonsense")
        self.assertEqual(server.process.stdout.readline(), "> fail drive C0 32_0\n")
        self.assertEqual(server.process.stdout.readline(), "> nonsense\n")
        self.assertTrue(server.process.stdout.readline().startswith("? "))
        self.assertEqual(server.end(lambda ended: ended.say("quit")), 0)

    def test_end_of_input_is_not_the_end(self):
        file = os.path.join(self.directory(), "scenario.json")
        shutil.copy(support.scenario_file("healthy-array"), file)
        server = self.start("--interval", "1", scenario=file)
        server.close_input()
        volumes = server.url(PREFIX + "StorageVolume")
        self.assertTrue(support.wait_until(lambda: len(Client("ein", volumes).lines()) == 2, 60))
        self.rewrite(file, '"name": "boot", "raid": "RAID1", "pool": "DG1", "state": "optimal"',
                     '"name": "boot", "raid": "RAID1", "pool": "DG1", "state": "degraded"')
        self.assertTrue(support.wait_until(
            lambda: " - DEGRADED" in Client("ei", volumes).output, 60))
        self.assertEqual(server.end(lambda s: s.process.send_signal(signal.SIGINT)), 0)

    def test_user(self):
        file = os.path.join(self.directory(), "password")
        with open(file, "w", encoding="ascii") as stream:
            stream.write("open-sesame\n")
        server = self.start("--user", "admin", "--password-file", file)
        url = server.url(PREFIX + "Controller")
        self.assertIn("Username/password required", Client("ein", url).errors)
        self.assertIn("Invalid username/password",
                      Client("ein", url.replace("//", "//admin:wrong@")).errors)
        self.assertEqual(len(Client("ein", url.replace("//", "//admin:open-sesame@")).lines()), 1)

    def test_https_with_a_throw_away_certificate(self):
        server = self.start("--tls-self-signed")
        url = server.url(PREFIX + "Controller").replace("http:", "https:")
        answer = Client("-noverify", "ein", url)
        self.assertEqual(len(answer.lines()), 1, answer.errors)
        self.assertEqual(Client("ein", url.replace("https:", "http:")).output, "")

    def test_server_fails_on_command(self):
        server = self.start()
        controllers = server.url(PREFIX + "Controller")
        server.say('server status=2 message="the array sleeps" times=1')
        server.say("server http=20")
        for expected in ("> server status=2", "> server http=20", "? http: a number from 400"):
            self.assertTrue(server.process.stdout.readline().startswith(expected), expected)
        self.assertIn("the array sleeps", Client("ein", controllers).errors)
        self.assertEqual(len(Client("ein", controllers).lines()), 1)
        server.say("server connection=refuse")
        self.assertTrue(support.wait_until(
            lambda: "connect" in Client("ein", controllers).errors, 20))
        server.say("clear server")
        self.assertTrue(support.wait_until(lambda: Client("ein", controllers).lines(), 20))

    def hang(self, server):
        """Lets the provider's questions wait for ten minutes."""
        server.say("latency 600000 600000")
        server.say("fault call=associators delayMs=600000")

    def test_waiting_faults_do_not_keep_it_from_ending(self):
        for end in (lambda ended: ended.process.terminate(), lambda ended: ended.say("quit")):
            server = self.start("--interval", "1")
            volumes = server.url(PREFIX + "StorageVolume")
            self.assertTrue(support.wait_until(lambda: len(Client("ein", volumes).lines()) == 2))
            self.hang(server)
            time.sleep(3)  # a refresh is under way, and waits
            begin = time.monotonic()
            self.assertEqual(server.end(end), 0)
            self.assertLess(time.monotonic() - begin, 20)

    def test_faults_at_the_start_do_not_keep_it_from_ending(self):
        file = os.path.join(self.directory(), "scenario.json")
        with open(support.scenario_file("healthy-array"), encoding="utf-8") as stream:
            scenario = json.load(stream)
        scenario["faults"] = [{"call": call, "delayMs": 600000} for call in
                              ("enumerateInstances", "enumerateInstanceNames", "associators")]
        with open(file, "w", encoding="utf-8") as stream:
            json.dump(scenario, stream)
        process = subprocess.Popen([support.TOOL, "serve", "--scenario", file, "--port", "0"],
                                   stdin=subprocess.PIPE, stdout=subprocess.DEVNULL,
                                   env=support.environment())
        self.addCleanup(process.kill)
        self.addCleanup(process.stdin.close)
        time.sleep(2)  # the provider's start waits by now
        process.terminate()
        self.assertEqual(process.wait(timeout=30), 0)

    def test_mistakes_end_with_a_line(self):
        taken = self.start().host.rpartition(":")[2]
        file = support.scenario_file("healthy-array")
        for why, arguments, port in (("Address already in use", [], taken),
                                     ("cannot listen on nowhere", ["--listen", "nowhere"], "0"),
                                     ("--user has no name",
                                      ["--user", "", "--password-file", file], "0"),
                                     ("everybody who reaches 0.0.0.0 could ask",
                                      ["--listen", "0.0.0.0"], "0"),
                                     ("no password in /nonexistent",
                                      ["--user", "a", "--password-file", "/nonexistent"], "0")):
            with self.assertRaisesRegex(RuntimeError, "plexor-testbed: .*" + why):
                support.Server(file, *arguments, port=port)


if __name__ == "__main__":
    unittest.main(verbosity=2)
