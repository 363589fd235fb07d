"""Hostile names, strangers, and pages that one can only look at; how everybody can read it."""
import base64
import json
import os

from browser_support import NARROW, Page, WIDE, request

MARKUP = "<script>document.title='taken'</script>"
IMAGE = "\"><img src=x onerror=\"document.title='taken'\">"
CONTROLS = ("button", "link", "textbox", "combobox", "progressbar", "searchbox", "checkbox", "main")


class Names(Page):
    def test_hostile_names_are_text(self):
        server = self.start(scenario=self.scenario({"controllers": [{
            "id": "C0", "model": IMAGE, "pools": [{"id": "G"}], "enclosures": [{"number": 1}],
            "drives": [{"id": MARKUP, "pool": "G", "slot": 1, "enclosure": 1, "firmware": IMAGE},
                       {"id": "d2", "pool": "G", "slot": 2, "enclosure": 1}],
            "volumes": [{"id": "0", "name": IMAGE, "raid": "RAID1", "pool": "G"}],
            "ports": [{"id": "0", "name": MARKUP}]}]}))
        self.open(server.page, 2)
        self.wait(lambda: self.count(".volume") == 1, "the volume")
        self.assertIn(MARKUP, self.slots()["drive:C0_" + MARKUP]["label"])
        self.assertIn(IMAGE, self.text(".volume .title"))
        self.assertIn(IMAGE, self.text(".controller h2"))
        self.js("document.querySelector('.slot[data-key*=script]').click()")
        self.assertIn(MARKUP, self.text("#detail h2"))
        self.assertEqual(self.count("img, script:not([src='/page/page.js'])"), 0)
        self.assertNotIn("taken", self.driver.title)
        self.wait(lambda: self.count("#detail [data-command]") > 5, "buttons")
        command = [text for text in self.js("return [...document.querySelectorAll('#detail [data-command]')]"
                                            ".map((node) => node.dataset.command)") if "fail" in text]
        self.js("document.querySelector('#detail [data-command^=fail]').click()")
        self.wait(lambda: self.text("#result") == "done: " + command[0], "it can be steered")
        self.wait(lambda: self.slots()["drive:C0_" + MARKUP]["look"] == "critical", "it failed")
        self.assert_no_errors()


class Strangers(Page):
    def send(self, server, **changes):
        """A command as the page sends it, but for the changes."""
        host = server.page[len("http://"):].rstrip("/")
        token = json.loads(request(server.page, "GET", "/page/token",
                                   {"Host": host, **changes.get("known", {})})[2] or "{}").get("token")
        headers = {"Host": host, "Origin": "http://" + host, "Content-Type": "application/json",
                   "X-Plexor-Token": token or "", **changes.get("known", {}), **changes.get("headers", {})}
        headers = {name: value for name, value in headers.items() if value is not None}
        return request(server.page, "POST", "/page/command", headers,
                       json.dumps({"command": "fail drive C0 32_0"}))[0]

    def test_commands_of_other_sites_are_refused(self):
        server = self.start()
        for headers, status in (({}, 200), ({"Origin": "http://evil.example"}, 403),
                                ({"Origin": None}, 403), ({"Origin": "null"}, 403),
                                ({"X-Plexor-Token": "0" * 32}, 403), ({"X-Plexor-Token": None}, 403),
                                ({"Host": "evil.example"}, 421), ({"Host": "evil.example:80"}, 421),
                                ({"Sec-Fetch-Site": "cross-site"}, 403),
                                ({"Content-Type": "text/plain"}, 415)):
            self.assertEqual(self.send(server, headers=headers), status, headers)

    def test_documents_are_not_for_other_sites(self):
        server = self.start()
        for target in ("/", "/page.json", "/page/token", "/page/page.js"):
            self.assertEqual(request(server.page, "GET", target, {"Host": "evil.example"})[0], 421)
            self.assertEqual(request(server.page, "GET", target, {
                "Sec-Fetch-Site": "cross-site", "Sec-Fetch-Mode": "no-cors"})[0], 403, target)
            status, headers, _ = request(server.page, "GET", target)
            self.assertEqual(status, 200)
            self.assertIn("default-src 'none'; script-src 'self'", headers["Content-Security-Policy"])
            self.assertNotIn("unsafe", headers["Content-Security-Policy"])
            self.assertEqual(headers["X-Content-Type-Options"], "nosniff")
            self.assertIsNone(headers["Access-Control-Allow-Origin"])
        self.assertEqual(request(server.page, "GET", "/elsewhere")[0], 405)

    def test_with_a_user_nobody_else_sees_it(self):
        file = os.path.join(self.directory, "password")
        with open(file, "w", encoding="utf-8") as stream:
            stream.write("secret\n")
        server = self.start("--user", "anna", "--password-file", file)
        known = {"Authorization": "Basic " + base64.b64encode(b"anna:secret").decode()}
        for target in ("/", "/page.json", "/page/events", "/page/token"):
            self.assertEqual(request(server.page, "GET", target)[0], 401, target)
        self.assertEqual(request(server.page, "GET", "/", known)[0], 200)
        self.assertEqual(self.send(server), 401)
        self.assertEqual(self.send(server, known=known), 200)

    def test_a_page_to_look_at(self):
        server = self.start("--page", "look")
        self.assertEqual(self.send(server), 403)
        self.open(server.page, 8)
        self.assertEqual(self.count("#steer:not([hidden])"), 0)
        off = self.start("--page", "off")
        self.assertEqual(request(off.page, "GET", "/")[0], 405)

    def test_a_page_of_another_server(self):
        server = self.start(scenario="degraded-array")
        looking = self.start_looking(server.url, "--interval", "0.3")
        self.open(looking.page, 9)
        self.assertEqual(self.count(".rack"), 0)
        self.assertEqual(self.count(".row"), 1)
        self.wait(lambda: self.text("#verdict-word") == "CRITICAL", "the check")
        self.assertEqual(self.text("#source"), server.url[len("http://"):].split("/")[0])
        self.select("drive:C0_32_3")
        self.assertIn("failed", self.text("#detail .state"))
        self.assertEqual(self.count("[data-command], #steer:not([hidden])"), 0, "nothing to press")
        self.assertEqual(self.send(looking), 403)
        server.process.kill()
        self.wait(lambda: self.text("#verdict-word") == "UNKNOWN", "the server is gone")
        self.assertEqual(self.count("button.slot[data-key]"), 9, "what it said last stays")
        self.assert_no_errors()


class Readers(Page):
    def nameless_controls(self):
        self.driver.execute_cdp_cmd("Accessibility.enable", {})
        nodes = self.driver.execute_cdp_cmd("Accessibility.getFullAXTree", {})["nodes"]
        self.driver.execute_cdp_cmd("Accessibility.disable", {})
        shown = [node for node in nodes if not node["ignored"]]
        controls = [node for node in shown if node["role"]["value"] in CONTROLS]
        self.assertGreater(len(controls), 30)
        return [node for node in controls if not node.get("name", {}).get("value", "").strip()]

    def test_everything_has_a_name_and_fits(self):
        server = self.start(scenario="degraded-array")
        self.open(server.page, 9)
        self.wait(lambda: self.count("#time-commands button") == 6, "buttons")
        self.select("drive:C0_32_3")
        self.assertEqual(self.nameless_controls(), [])
        self.assertEqual(self.count("[aria-live], [role=status]"), 3)
        for size in (WIDE, NARROW, (2560, 1440)):
            self.resize(size)
            self.assertLessEqual(self.js("return document.documentElement.scrollWidth"), size[0])
        for scheme in ("dark", "light"):
            self.driver.execute_cdp_cmd("Emulation.setEmulatedMedia", {
                "features": [{"name": "prefers-color-scheme", "value": scheme}]})
            ground = self.js("return getComputedStyle(document.body).backgroundColor")
            self.assertEqual(ground, "rgb(15, 20, 25)" if scheme == "dark" else "rgb(238, 241, 244)")
        self.driver.execute_cdp_cmd("Emulation.setEmulatedMedia", {"media": "print"})
        self.addCleanup(self.driver.execute_cdp_cmd, "Emulation.setEmulatedMedia",
                        {"media": "", "features": []})
        self.assertEqual(self.js("return getComputedStyle(document.querySelector('#steer')).display"),
                         "none")
        self.assert_no_errors()
