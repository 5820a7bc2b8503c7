# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""A browser without a window, and what a page does in it: what it asks for, and what it complains of."""

import contextlib
import json
import sys
import tempfile

try:
    from selenium import webdriver
    from selenium.webdriver.chrome.service import Service
except ImportError:
    sys.exit(f"{sys.executable}: no module selenium: ./dev setup installs python3-selenium")

DRIVER = "/usr/bin/chromedriver"
OPTIONS = ("--headless=new", "--no-sandbox", "--disable-gpu", "--disable-background-networking", "--no-first-run",
           "--hide-scrollbars")
WIDE, NARROW = 1280, 400
LIGHT, DARK = "light", "dark"


class Browser:
    def __init__(self, profile):
        options = webdriver.ChromeOptions()
        for option in (*OPTIONS, f"--user-data-dir={profile}"):
            options.add_argument(option)
        options.set_capability("goog:loggingPrefs", {"browser": "ALL", "performance": "ALL"})
        self.driver = webdriver.Chrome(options=options, service=Service(DRIVER))
        self.look()

    def look(self, width=WIDE, scheme=LIGHT, height=900):
        self.driver.execute_cdp_cmd("Emulation.setDeviceMetricsOverride",
                                    {"width": width, "height": height, "deviceScaleFactor": 1, "mobile": False})
        self.driver.execute_cdp_cmd("Emulation.setEmulatedMedia",
                                    {"features": [{"name": "prefers-color-scheme", "value": scheme},
                                                  {"name": "prefers-reduced-motion", "value": "reduce"}]})

    def open(self, path):
        """A page from its file, as a double click opens it; what was said and asked before is forgotten."""
        self.driver.get("about:blank")
        self.complaints()
        self.requests()
        self.driver.get(path.as_uri())

    def run(self, script, *arguments):
        return self.driver.execute_script(script, *arguments)

    def complaints(self):
        """What stood on the console since the last time."""
        return [entry["message"] for entry in self.driver.get_log("browser")]

    def requests(self):
        """What the page asked for since the last time, but for what it holds itself."""
        messages = (json.loads(entry["message"])["message"] for entry in self.driver.get_log("performance"))
        asked = (message["params"]["request"]["url"] for message in messages
                 if message["method"] == "Network.requestWillBeSent")
        return [url for url in asked if not url.startswith("data:")]


@contextlib.contextmanager
def started():
    """A browser with a profile that nobody has used, gone when it is done with."""
    with tempfile.TemporaryDirectory(prefix="pmx-browser-") as profile:
        browser = Browser(profile)
        try:
            yield browser
        finally:
            browser.driver.quit()
