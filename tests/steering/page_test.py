#!/usr/bin/env python3
"""What `serve` answers to browsers: the page's files, its document and events, and commands from it."""
import http.client
import json
import unittest
import urllib.parse

from steering_support import serve, wait_until

POLICY = ("default-src 'none'; script-src 'self'; style-src 'self'; img-src 'self'; "
          "connect-src 'self'; base-uri 'none'; form-action 'none'; frame-ancestors 'none'; "
          "require-trusted-types-for 'script'; trusted-types 'none'")


class Page(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.server = serve("--interval", "1")
        cls.address = urllib.parse.urlsplit(cls.server.url).netloc

    @classmethod
    def tearDownClass(cls):
        cls.server.__exit__()

    def request(self, method, target, body=None, **headers):
        """Status, headers and text of the answer; the headers' names with _ for -."""
        connection = http.client.HTTPConnection(self.address, timeout=60)
        self.addCleanup(connection.close)
        connection.request(method, target, body,
                           {name.replace("_", "-"): value for name, value in headers.items()})
        answer = connection.getresponse()
        if answer.getheader("Content-Type") == "text/event-stream":
            return answer.status, answer, answer.readline().decode()
        return answer.status, answer, answer.read().decode()

    def command(self, body, **headers):
        token = json.loads(self.request("GET", "/page/token")[2])["token"]
        headers = {"Content_Type": "application/json", "X_Plexor_Token": token,
                   "Origin": f"http://{self.address}", **headers}
        status, _, text = self.request("POST", "/page/command", body, **headers)
        return status, json.loads(text) if status == 200 else text

    def test_files_come_with_what_a_browser_may_do_with_them(self):
        status, answer, text = self.request("GET", "/")
        self.assertEqual(status, 200)
        self.assertEqual(answer.getheader("Content-Security-Policy"), POLICY)
        self.assertEqual(answer.getheader("X-Content-Type-Options"), "nosniff")
        self.assertEqual(answer.getheader("Cache-Control"), "no-store")
        self.assertTrue(text.startswith("<!doctype html>"), text[:40])
        self.assertEqual(self.request("GET", "/page.exe")[0], 405, "no file of the page's")

    def document(self, query=""):
        status, _, text = self.request("GET", "/page.json" + query)
        self.assertEqual(status, 200)
        return json.loads(text)

    def test_the_document_is_the_array_and_its_head_alone_when_nothing_has_changed(self):
        self.assertTrue(wait_until(lambda: "Tovexa_PlexorBattery" in self.document()))
        document = self.document()
        self.assertEqual([each["properties"]["ElementName"] for each in document["Tovexa_PlexorBattery"]],
                         ["Battery 0 on Controller C0"])
        self.assertEqual(len(document["Tovexa_PlexorStorageExtent"]), 8)
        self.assertTrue(wait_until(
            lambda: self.document(f"?since={self.document()['serial']}").keys() ==
            {"serial", "age"}))
        for unknown in ("?since=soon", "?since=1", "?since=", "?until=1"):
            self.assertEqual(self.document(unknown).keys(), document.keys(), unknown)

    def test_events_begin_at_once(self):
        status, answer, line = self.request("GET", "/page/events")
        self.assertEqual((status, answer.getheader("Content-Type")), (200, "text/event-stream"))
        self.assertTrue(line.startswith(("event: ", "id: ", "data: ", ": ")), line)

    def test_a_command_of_the_page_is_carried_out(self):
        self.assertEqual(self.command('{"command": "fail battery C0 0"}'),
                         (200, {"refused": False, "text": ""}))
        self.assertTrue(wait_until(lambda: "Battery 0 on Controller C0" in
                                   self.document()["check"]["text"]))
        self.assertEqual(self.command('{"command": "fail drive C0 99"}'),
                         (200, {"refused": True, "text": 'command: no drive "99"'}))
        self.assertEqual(self.command('{"command": "quit"}'), (
            200, {"refused": True, "text": "not for pages; plexor-testbed tell takes it"}))

    def test_no_other_command_is(self):
        good = '{"command": "fail drive C0 32_0"}'
        self.assertEqual(self.command(good, X_Plexor_Token="guessed")[0], 403)
        self.assertEqual(self.command(good, Origin="http://elsewhere.example")[0], 403)
        self.assertEqual(self.command(good, Content_Type="text/plain")[0], 415)
        for bad in ("fail drive C0 32_0", "{}", '{"command": 7}', '["fail"]',
                    '{"command": "help\\nfail drive C0 32_0"}'):
            self.assertEqual(self.command(bad)[0], 400, bad)

    def test_another_name_than_the_hosts_gets_nothing(self):
        for target in ("/", "/page.json", "/page/token"):
            self.assertEqual(self.request("GET", target, Host="elsewhere.example")[0], 421, target)


if __name__ == "__main__":
    unittest.main()
