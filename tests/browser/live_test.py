"""The page follows the array, and steers it."""
import os
import socket
import time

from selenium.webdriver.common.action_chains import ActionChains
from selenium.webdriver.common.keys import Keys

from browser_support import Page, serve
from steering_support import run


class Following(Page):
    def tell(self, *commands):
        told = run("tell", os.path.join(self.directory, "control"), *commands)
        self.assertEqual(told.returncode, 0, told.stderr)

    def start_with_control(self, *arguments):
        return self.start("--control", os.path.join(self.directory, "control"), *arguments)

    def look_of(self, key):
        slot = self.slots().get(key)
        return slot and slot["look"]

    def test_a_failed_drive_appears_without_a_reload(self):
        server = self.start_with_control()
        self.open(server.page, 8)
        self.wait(lambda: self.text("#verdict-word") == "OK", "all is well")
        self.js("window.isThisVeryPage = true")
        start = time.monotonic()
        self.tell("fail drive C0 32_1")
        self.wait(lambda: self.look_of("drive:C0_32_1") == "critical", "the drive has failed")
        self.assertLess(time.monotonic() - start, 20)
        self.assertTrue(self.js("return window.isThisVeryPage"))
        self.wait(lambda: "Drive 32_1 on controller C0: online → failed" in self.text("#changes"),
                  "the change in the list")
        self.wait(lambda: "online → failed" in self.text("#told") or "changes" in self.text("#told"),
                  "the change told to screen readers")
        self.wait(lambda: self.text("#verdict-word") == "CRITICAL", "the check")
        self.assertIn("> fail drive C0 32_1", self.text("#changes"))
        self.assert_no_errors()

    def test_a_rebuild_shows_its_progress(self):
        server = self.start_with_control()
        self.open(server.page, 8)
        self.tell("fail drive C0 32_1")
        bar = 'button.slot[data-key="drive:C0_32_7"] progress'
        self.wait(lambda: self.count(bar) == 1, "a bar")
        self.tell("speed 5")
        self.wait(lambda: self.js("return document.querySelector(arguments[0]).value", bar) >= 10,
                  "progress")
        self.assertIn("%", self.slots()["drive:C0_32_7"]["word"])
        self.tell("speed 1000")
        self.wait(lambda: self.look_of("drive:C0_32_7") == "ok", "the end of it")
        self.wait(lambda: self.count(bar) == 0, "the bar is gone")
        self.assert_no_errors()

    def test_a_server_that_is_gone_and_comes_back(self):
        server = self.start()
        self.open(server.page, 8)
        port = server.page.rstrip("/").rpartition(":")[2]
        server.process.terminate()
        server.end()
        self.wait(lambda: "lost the server" in self.text("#link"), "it says so")
        again = serve("--interval", "1", scenario="raid6-double-fault", port=port)
        self.addCleanup(again.__exit__)
        self.wait(lambda: self.js("return document.body.dataset.link") == "following", "it is back")
        self.wait(lambda: self.count("button.slot[data-look=critical]") == 2, "the other array")
        self.assertEqual(self.text("#link"), "")
        self.console_errors()  # of the time without a server

    def test_where_events_do_not_come_through_it_asks(self):
        server = self.start_with_control()
        self.driver.execute_cdp_cmd("Network.enable", {})
        self.driver.execute_cdp_cmd("Network.setBlockedURLs", {"urls": ["*/page/events"]})
        self.addCleanup(self.driver.execute_cdp_cmd, "Network.setBlockedURLs", {"urls": []})
        self.driver.get(server.page)
        self.wait(lambda: self.text("#link") == "asking every 2 s", "it asks")
        self.wait(lambda: self.count("button.slot[data-look=spare]") == 1, "the array")
        self.tell("fail drive C0 32_1")
        self.wait(lambda: self.look_of("drive:C0_32_1") == "critical", "the drive has failed")
        self.console_errors()  # of the stream that does not come through

    def test_fifty_pages_cost_what_one_costs(self):
        server = self.start("--log")
        host, _, port = server.page[len("http://"):].rstrip("/").rpartition(":")

        def follow():
            stream = socket.create_connection((host, int(port)))
            self.addCleanup(stream.close)
            stream.sendall(f"GET /page/events HTTP/1.1\r\nHost: {host}:{port}\r\n\r\n".encode())

        def lines_in(seconds):
            """Log lines about what the provider asks the vendor."""
            time.sleep(seconds)
            count = 0
            while not server.arrived.empty():
                count += "associators" in (server.next_line() or "").lower()
            return count

        follow()
        lines_in(5)  # until the inventory is complete
        one = lines_in(4)
        for _ in range(49):
            follow()
        lines_in(1)
        fifty = lines_in(4)
        self.assertGreater(one, 0)
        self.assertLess(fifty, 10 * one + 10, "not one for each of them, though the machine be busy")


class Steering(Page):
    def setUp(self):
        super().setUp()
        self.server = self.start()
        self.open(self.server.page, 8)
        self.wait(lambda: self.count("#time-commands button") == 6, "buttons")

    def level_of(self, key):
        return self.js("return document.querySelector(arguments[0])?.dataset.look ?? 'none'",
                       f'main [data-key="{key}"]')

    def test_drive_buttons_do_what_they_say(self):
        self.select("drive:C0_32_1")
        self.assertEqual(self.text("#detail h2"), "Drive 32_1 on controller C0")
        self.assertEqual(self.press("fail drive C0 32_1"), "done: fail drive C0 32_1")
        self.wait(lambda: self.level_of("drive:C0_32_1") == "critical", "it has failed")
        self.wait(lambda: self.level_of("drive:C0_32_7") == "rebuild", "the spare is rebuilt")
        self.press("speed 60")
        self.wait(lambda: self.level_of("drive:C0_32_7") == "ok", "the spare has been rebuilt")
        self.press("replace drive C0 32_1")
        self.wait(lambda: self.level_of("drive:C0_32_7") == "spare", "the spare is free again")
        self.press("remove drive C0 32_1")
        self.wait(lambda: self.count(".slot.vacant") == 1, "the slot is empty")
        self.find("button.slot.vacant").click()
        add = self.find("#detail [data-command^='add drive C0 id=32_1 ']")
        self.assertIn('slot="1"', add.text)
        add.click()
        self.wait(lambda: self.count(".slot.vacant") == 0, "the drive is back")
        self.assertIn("> fail drive C0 32_1", "\n".join(self.lines()))
        self.assert_no_errors()

    def lines(self):
        while not self.server.arrived.empty():
            self.server.next_line()
        return self.server.lines

    def test_batteries_time_and_faults(self):
        self.select("battery:C0_0")
        self.press("learn battery C0 0")
        self.wait(lambda: "learning" in self.text('[data-key="battery:C0_0"]'), "it learns")
        self.js("const s = document.querySelector('#detail select');"
                "s.value = [...s.options].findIndex((o) => o.text === 'dead');"
                "s.dispatchEvent(new Event('change'))")
        self.press('set battery C0 0 state="dead"')
        self.wait(lambda: self.level_of("battery:C0_0") == "critical", "it is dead")
        self.press("pause")
        self.wait(lambda: "stands still" in self.text("#time"), "time stands")
        self.press("play")
        self.press("speed 10")
        self.wait(lambda: "10 times as fast as the clock" in self.text("#time"), "time hurries")
        self.find("summary").click()
        self.press("latency 200 800")
        self.press("latency 0 0")
        self.press("clear faults")
        self.press("reset")
        self.wait(lambda: self.level_of("battery:C0_0") == "ok", "all is as it was")
        lines = self.lines()
        for command in ("learn battery C0 0", "pause", "play", "speed 10", "latency 200 800"):
            self.assertIn("> " + command, lines)
        self.assert_no_errors()

    def test_a_command_of_ones_own_and_refusals(self):
        field = self.find("#free-command")
        for command, result in (("predict drive C0 32_2", "done: predict drive C0 32_2"),
                                ("fail drive C0 99", 'refused: command: no drive "99"'),
                                ("quit", "refused: not for pages; plexor-testbed tell takes it"),
                                ("save /tmp/x", "refused: not for pages; plexor-testbed tell takes it")):
            field.clear()
            field.send_keys(command, Keys.ENTER)
            self.wait(lambda r=result: self.text("#result") == r, result)
        self.assertIsNone(self.server.process.poll())
        self.assert_no_errors()

    def test_volumes_and_drives_show_each_other(self):
        related = "return [...document.querySelectorAll('.related')].map((n) => n.dataset.key).sort()"
        ActionChains(self.driver).move_to_element(self.find('[data-key="volume:C0_1"]')).perform()
        self.assertEqual(self.js(related), ["drive:C0_32_5", "drive:C0_32_6"])
        self.js("document.querySelector('[data-key=\"volume:C0_0\"]').focus()")
        self.assertEqual(self.js(related), [f"drive:C0_32_{n}" for n in range(5)])
        self.js("document.querySelector('[data-key=\"drive:C0_32_6\"]').focus()")
        self.assertEqual(self.js(related), ["volume:C0_1"])
        self.js("document.activeElement.blur()")
        self.assertEqual(self.js(related), [])
        self.select("volume:C0_1")
        self.js("document.activeElement.blur()")
        self.assertIn("on drives 32_5, 32_6", self.text("#detail"))

    def test_the_keyboard_is_enough(self):
        self.js("document.querySelector('[data-key=\"drive:C0_32_0\"]').focus()")
        focused = "return document.activeElement.dataset.key"

        def press(*keys):
            ActionChains(self.driver).send_keys(*keys).perform()

        press(Keys.ARROW_RIGHT, Keys.ARROW_RIGHT)
        self.assertEqual(self.js(focused), "drive:C0_32_2")
        press(Keys.END)
        self.assertEqual(self.js(focused), "drive:C0_32_7")
        press(Keys.HOME, Keys.ENTER)
        self.assertIn("Drive 32_0", self.text("#detail h2"))
        press(Keys.ESCAPE)
        self.assertEqual(self.count("#detail:not([hidden])"), 0)
        press(Keys.TAB)
        self.assertEqual(self.js(focused), "volume:C0_0", "one stop for a rack")
