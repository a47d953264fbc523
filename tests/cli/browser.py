"""A headless browser for tests: the WebDriver calls that they need, over plain HTTP to chromedriver."""

import base64
import json
import pathlib
import subprocess
import tempfile
import time
import urllib.error
import urllib.request

ELEMENT = "element-6066-11e4-a52e-4f735466cecf"  # the key of element references in the protocol

ARGUMENTS = ["--headless", "--no-sandbox", "--disable-gpu", "--disable-quic", "--no-first-run", "--disable-dev-shm-usage",
             "--disable-background-networking", "--disable-component-update", "--disable-sync", "--hide-scrollbars"]


class Browser:
    """Chromium with a fresh profile, offline. Use as a context."""

    def __init__(self, width=1280, height=860, arguments=()):
        self.profile = tempfile.TemporaryDirectory(ignore_cleanup_errors=True)
        self.driver = subprocess.Popen(["chromedriver", "--port=0"], stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True)
        try:
            for line in self.driver.stdout:
                if "started successfully on port" in line:
                    port = int(line.rstrip(". \n").rsplit(" ", 1)[1])
                    break
            else:
                raise RuntimeError("chromedriver did not start")
            self.base = f"http://127.0.0.1:{port}"
            arguments = [*ARGUMENTS, f"--user-data-dir={self.profile.name}", f"--window-size={width},{height}", *arguments]
            session = self.call("POST", "/session", {"capabilities": {"alwaysMatch": {
                "browserName": "chrome", "goog:chromeOptions": {"args": arguments},
                "goog:loggingPrefs": {"browser": "ALL"}}}})
            self.base += f"/session/{session['sessionId']}"
        except BaseException:
            self.driver.kill()
            self.driver.wait()
            raise

    def __enter__(self):
        return self

    def __exit__(self, *_):
        try:
            self.call("DELETE", "")
        finally:
            self.driver.terminate()
            self.driver.wait()
            self.driver.stdout.close()
            self.profile.cleanup()

    def call(self, method, path, body=None):
        data = None if method != "POST" else json.dumps(body or {}).encode()
        request = urllib.request.Request(self.base + path, data, {"Content-Type": "application/json"}, method=method)
        opener = urllib.request.build_opener(urllib.request.ProxyHandler({}))
        try:
            with opener.open(request, timeout=60) as response:
                return json.load(response)["value"]
        except urllib.error.HTTPError as error:
            raise RuntimeError(json.load(error)["value"]["message"]) from None

    def open(self, url):
        self.call("POST", "/url", {"url": url})

    def run(self, script, *arguments):
        return self.call("POST", "/execute/sync", {"script": script, "args": list(arguments)})

    def element(self, selector):
        return self.call("POST", "/element", {"using": "css selector", "value": selector})[ELEMENT]

    def click(self, selector):
        self.call("POST", f"/element/{self.element(selector)}/click")

    def type(self, selector, text):
        """Text, or a key of the protocol such as "\\ue015" (arrow down)."""
        self.call("POST", f"/element/{self.element(selector)}/value", {"text": text})

    def text(self, selector):
        return self.run("return document.querySelector(arguments[0]).innerText", selector)

    def texts(self, selector):
        return self.run("return [...document.querySelectorAll(arguments[0])].map((each) => each.innerText)", selector)

    def wait(self, script, *arguments, seconds=20):
        """Until a script gives something true, which is returned."""
        end = time.monotonic() + seconds
        while True:
            value = self.run(script, *arguments)
            if value:
                return value
            if time.monotonic() > end:
                raise AssertionError(f"never true: {script} {arguments}")
            time.sleep(0.02)

    def resize(self, width, height):
        self.call("POST", "/goog/cdp/execute", {"cmd": "Emulation.setDeviceMetricsOverride", "params": {
            "width": width, "height": height, "deviceScaleFactor": 1, "mobile": False}})

    def dark(self, is_dark):
        self.call("POST", "/goog/cdp/execute", {"cmd": "Emulation.setEmulatedMedia", "params": {
            "features": [{"name": "prefers-color-scheme", "value": "dark" if is_dark else "light"}]}})

    def complaints(self):
        """What the console has got since the last call."""
        return self.call("POST", "/se/log", {"type": "browser"})

    def picture(self, path):
        pathlib.Path(path).write_bytes(base64.b64decode(self.call("GET", "/screenshot")))
