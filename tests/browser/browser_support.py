"""One browser for all tests of the page, and what they ask of it."""
import atexit
import http.client
import json
import os
import shutil
import sys
import tempfile
import time
import unittest
from urllib.parse import urlsplit

sys.path.insert(0, os.path.join(os.path.dirname(__file__), "..", "steering"))
# pylint: disable=wrong-import-position
from selenium import webdriver
from selenium.webdriver.chrome.service import Service
from selenium.webdriver.common.by import By
from steering_support import DEADLINE, Session, run, serve

WIDE, NARROW = (1280, 900), (360, 740)
ARGUMENTS = ["--headless=new", "--no-sandbox", "--disable-gpu", "--disable-quic", "--no-first-run",
             "--disable-background-networking", "--disable-component-update", "--disable-sync",
             "--disable-extensions", "--disable-dev-shm-usage", "--hide-scrollbars",
             "--force-color-profile=srgb", "--lang=en-GB"]
# Slots with what a reader of the page sees of them, by key.
SLOTS = """
    const slots = {};
    for (const node of document.querySelectorAll('button.slot[data-key]'))
        slots[node.dataset.key] = {look: node.dataset.look, level: node.dataset.level ?? '',
            label: node.getAttribute('aria-label'), sign: node.querySelector('.sign').textContent,
            word: node.querySelector('.word').textContent, place: node.dataset.place};
    return slots;"""


def chromium(width_and_height=WIDE):
    """A browser with an empty profile. Whoever starts it quits it."""
    profile = tempfile.mkdtemp(prefix="plexor-browser-")
    options = webdriver.ChromeOptions()
    options.binary_location = shutil.which("chromium")
    for argument in [*ARGUMENTS, f"--user-data-dir={profile}",
                     "--window-size={},{}".format(*width_and_height)]:
        options.add_argument(argument)
    options.set_capability("goog:loggingPrefs", {"browser": "ALL"})
    driver = webdriver.Chrome(service=Service(shutil.which("chromedriver")), options=options)
    driver.set_script_timeout(DEADLINE)
    atexit.register(shutil.rmtree, profile, True)
    atexit.register(driver.quit)
    return driver


class Page(unittest.TestCase):
    """Tests with a browser, which is started for the first of them."""
    driver = None

    def setUp(self):
        if Page.driver is None:
            Page.driver = chromium()
        self.driver = Page.driver
        self.resize(WIDE)
        self.console_errors()  # of the test before
        directory = tempfile.TemporaryDirectory()
        self.addCleanup(directory.cleanup)
        self.directory = directory.name

    def tearDown(self):
        self.driver.get("about:blank")  # before its server ends

    # -- servers ---------------------------------------------------------------------------------

    def start(self, *arguments, scenario="healthy-array"):
        server = serve("--interval", "1", *arguments, scenario=scenario)
        self.addCleanup(server.__exit__)
        server.page = server.url.replace("/cimom", "/")
        return server

    def start_looking(self, url, *arguments):
        """`page` for a server."""
        session = Session("page", url, "--listen-port", "0", *arguments)
        self.addCleanup(session.__exit__)
        session.page = session.await_line("page at ").split(" ")[2]
        return session

    def scenario(self, text):
        file = os.path.join(self.directory, "array.json")
        with open(file, "w", encoding="utf-8") as stream:
            json.dump(text, stream)
        return file

    # -- the browser -----------------------------------------------------------------------------

    def open(self, url, drives=None):
        """Opens a page, and waits until it shows so many drives."""
        self.driver.get(url)
        self.wait(lambda: self.js("return document.body.dataset.link") == "following",
                  "the page follows")
        if drives is not None:
            self.wait(lambda: self.count("button.slot[data-look]:not([data-look=absent])") == drives,
                      f"{drives} drives")

    def resize(self, size):
        self.driver.execute_cdp_cmd("Emulation.setDeviceMetricsOverride", {
            "width": size[0], "height": size[1], "deviceScaleFactor": 1, "mobile": False})

    def js(self, script, *arguments):
        return self.driver.execute_script(script, *arguments)

    def wait(self, condition, what):
        end = time.monotonic() + DEADLINE
        while not condition():
            if time.monotonic() > end:
                self.fail(f"not within {DEADLINE} s: {what}; the page: " + self.text("body")[:2000])
            time.sleep(0.05)

    def count(self, selector):
        return self.js("return document.querySelectorAll(arguments[0]).length", selector)

    def text(self, selector):
        return self.js("return document.querySelector(arguments[0])?.innerText ?? ''", selector)

    def slots(self):
        return self.js(SLOTS)

    def find(self, selector):
        return self.driver.find_element(By.CSS_SELECTOR, selector)

    def select(self, key):
        node = self.find(f'main [data-key="{key}"]')
        self.js("arguments[0].scrollIntoView({block: 'center'})", node)
        if node.get_attribute("aria-pressed") != "true":
            node.click()

    def press(self, command):
        """Presses the button that sends the command, and waits for the answer."""
        node = self.find(f"[data-command='{command}']")
        self.js("arguments[0].scrollIntoView({block: 'center'})", node)
        self.assertIn(command, node.text, "a button shows what it sends")
        node.click()
        self.wait(lambda: self.text("#result").startswith(("done", "refused", "not")), "a result")
        return self.text("#result")

    def console_errors(self):
        return [entry["message"] for entry in self.driver.get_log("browser")
                if entry["level"] in ("SEVERE", "WARNING")]

    def assert_no_errors(self):
        self.assertEqual(self.console_errors(), [])


def request(url, method, target, headers=None, body=None):
    """A request as no browser would send it: status, headers, body."""
    parts = urlsplit(url)
    connection = http.client.HTTPConnection(parts.hostname, parts.port, timeout=DEADLINE)
    try:
        connection.request(method, target, body, headers or {})
        response = connection.getresponse()
        return response.status, response.headers, response.read().decode()
    finally:
        connection.close()


def asked(url):
    """The document of `ask --json`."""
    return json.loads(run("ask", "--json", url).stdout)
