"""As much of a WebDriver client as these tests use: chromedriver on loopback, headless Chromium behind it."""

import base64
import json
import os
import shutil
import socket
import subprocess
import tempfile
import time
import urllib.error
import urllib.request

ELEMENT = "element-6066-11e4-a52e-4f735466cecf"
TAB, ENTER, ESCAPE = "\ue004", "\ue007", "\ue00c"


def missing_programs():
    return [name for name in ("chromium", "chromedriver") if not shutil.which(name)]


class Browser:
    def __init__(self, width=1280, height=900):
        self._profile = tempfile.mkdtemp(prefix="zrsql_browser_")
        self._driver = None
        self._session = None
        try:
            self._start(width, height)
        except BaseException:
            self.close()
            raise

    def _start(self, width, height):
        with socket.socket() as free:
            free.bind(("127.0.0.1", 0))
            self._port = free.getsockname()[1]
        self._driver = subprocess.Popen(
            [shutil.which("chromedriver"), f"--port={self._port}", "--log-level=SEVERE"],
            stdout=subprocess.DEVNULL,
            stderr=subprocess.DEVNULL,
            env={**os.environ, "HOME": self._profile},
        )
        deadline = time.monotonic() + 60
        while True:
            try:
                if self._call("GET", "/status")["ready"]:
                    break
            except OSError:
                pass
            if time.monotonic() > deadline or self._driver.poll() is not None:
                raise RuntimeError("chromedriver did not start")
            time.sleep(0.1)
        options = {
            "binary": shutil.which("chromium"),
            "args": [
                "--headless",
                "--no-sandbox",
                "--disable-gpu",
                "--disable-quic",
                "--disable-dev-shm-usage",
                "--no-first-run",
                "--disable-background-networking",
                "--disable-component-update",
                "--disable-sync",
                "--host-resolver-rules=MAP * ~NOTFOUND",
                f"--window-size={width},{height}",
                f"--user-data-dir={self._profile}/profile",
            ],
        }
        capabilities = {"goog:chromeOptions": options, "goog:loggingPrefs": {"browser": "ALL"}}
        answer = self._call("POST", "/session", {"capabilities": {"alwaysMatch": capabilities}})
        self._session = "/session/" + answer["sessionId"]

    def close(self):
        if self._session:
            try:
                self._call("DELETE", self._session)
            except (OSError, RuntimeError):
                pass
        if self._driver:
            self._driver.terminate()
            self._driver.wait(30)
        shutil.rmtree(self._profile, ignore_errors=True)

    def _call(self, method, path, body=None):
        data = None if body is None else json.dumps(body).encode()
        request = urllib.request.Request(
            f"http://127.0.0.1:{self._port}{path}", data, {"Content-Type": "application/json"}, method=method
        )
        opener = urllib.request.build_opener(urllib.request.ProxyHandler({}))
        try:
            with opener.open(request, timeout=180) as answer:
                return json.load(answer)["value"]
        except urllib.error.HTTPError as error:
            raise RuntimeError(json.load(error)["value"]["message"]) from None

    def open(self, path):
        self._call("POST", self._session + "/url", {"url": "file://" + os.path.abspath(path)})

    def run(self, script, *arguments):
        body = {"script": script, "args": list(arguments)}
        return self._call("POST", self._session + "/execute/sync", body)

    def wait_until(self, condition, seconds=20):
        deadline = time.monotonic() + seconds
        while not self.run("return " + condition):
            if time.monotonic() > deadline:
                raise AssertionError("did not come about: " + condition)
            time.sleep(0.02)

    def click(self, selector):
        body = {"using": "css selector", "value": selector}
        element = self._call("POST", self._session + "/element", body)[ELEMENT]
        self._call("POST", f"{self._session}/element/{element}/click", {})

    def press(self, keys):
        """Presses keys, one after the other, wherever the focus is."""
        actions = []
        for key in keys:
            actions += [{"type": "keyDown", "value": key}, {"type": "keyUp", "value": key}]
        keyboard = {"type": "key", "id": "keyboard", "actions": actions}
        self._call("POST", self._session + "/actions", {"actions": [keyboard]})

    def complaints(self):
        """What the page has told on the console since the last call."""
        return self._call("POST", self._session + "/se/log", {"type": "browser"})

    def prefer(self, scheme):
        features = [{"name": "prefers-color-scheme", "value": scheme}]
        self._tool("Emulation.setEmulatedMedia", {"features": features})

    def resize(self, width, height):
        metrics = {"width": width, "height": height, "deviceScaleFactor": 1, "mobile": False}
        self._tool("Emulation.setDeviceMetricsOverride", metrics)

    def _tool(self, command, parameters):
        body = {"cmd": command, "params": parameters}
        return self._call("POST", self._session + "/goog/cdp/execute", body)

    def screenshot(self, path):
        with open(path, "wb") as file:
            file.write(base64.b64decode(self._call("GET", self._session + "/screenshot")))
