"""A headless Chromium through its driver, for tests of pages. Needs Python's own library alone."""

import base64
import json
import shutil
import subprocess
import sys
import time
import urllib.error
import urllib.request

SKIPPED = 77
ELEMENT = "element-6066-11e4-a52e-4f735466cecf"
TAB, SPACE, ENTER = "\ue004", " ", "\ue007"
CONTROL, SHIFT, LEFT, RIGHT, HOME = "\ue009", "\ue008", "\ue012", "\ue014", "\ue011"


def skip_unless_installed():
    """Ends the test in words where there is no browser."""
    for program in ("chromium", "chromedriver"):
        if shutil.which(program) is None:
            print(f"skipped: {program} is not installed")
            sys.exit(SKIPPED)


class Browser:
    """A browser with one window; gone at the end of its `with`."""

    def __init__(self, downloads, width=1000, height=900, arguments=()):
        self.driver = subprocess.Popen(
            ["chromedriver", "--port=0"], stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True
        )
        port = None
        for line in self.driver.stdout:
            if "started successfully on port" in line:
                port = int(line.rstrip(". \n").rsplit(" ", 1)[1])
                break
        if port is None:
            raise RuntimeError("chromedriver does not start")
        self.url = f"http://127.0.0.1:{port}/session"
        arguments = ["--headless=new", "--no-sandbox", "--disable-gpu", "--disable-dev-shm-usage",
                     f"--window-size={width},{height}", *arguments]
        options = {
            "args": arguments,
            "prefs": {"download.default_directory": str(downloads)},
        }
        wanted = {"goog:chromeOptions": options, "goog:loggingPrefs": {"browser": "ALL"}}
        try:
            session = self._post("", {"capabilities": {"alwaysMatch": wanted}})
        except BaseException:
            self.driver.kill()
            raise
        self.url += "/" + session["sessionId"]

    def __enter__(self):
        return self

    def __exit__(self, *error):
        try:
            self._send("DELETE", "")
        finally:
            self.driver.terminate()
            self.driver.wait()

    def _send(self, method, path, body=None):
        data = None if body is None else json.dumps(body).encode()
        request = urllib.request.Request(
            self.url + path, data, {"Content-Type": "application/json"}, method=method
        )
        try:
            with urllib.request.urlopen(request, timeout=60) as answer:
                return json.load(answer)["value"]
        except urllib.error.HTTPError as error:
            raise RuntimeError(json.load(error)["value"]["message"]) from None

    def _post(self, path, body):
        return self._send("POST", path, body)

    def open(self, path):
        """Shows a file."""
        self._post("/url", {"url": path.as_uri()})

    def visit(self, url):
        """Shows a page."""
        self._post("/url", {"url": url})

    def emulate(self, width, height, dark=False):
        """Makes the page as large as this, which may be less than a window can be."""
        self.command("Emulation.setDeviceMetricsOverride",
                      {"width": width, "height": height, "deviceScaleFactor": 1, "mobile": False})
        scheme = {"name": "prefers-color-scheme", "value": "dark" if dark else "light"}
        still = {"name": "prefers-reduced-motion", "value": "reduce"}  # colours are there at once
        self.command("Emulation.setEmulatedMedia", {"features": [scheme, still]})

    def command(self, name, parameters):
        """What the browser answers to a command of its own."""
        return self._post("/goog/cdp/execute", {"cmd": name, "params": parameters})

    def choose(self, selector, *paths):
        """Gives files to an input of files."""
        text = "\n".join(map(str, paths))
        self._post(f"/element/{self.find(selector)}/value", {"text": text})

    def run(self, script, *arguments):
        """What a script returns."""
        return self._post("/execute/sync", {"script": script, "args": list(arguments)})

    def run_async(self, script, *arguments):
        """What a script hands to its last argument, a function."""
        return self._post("/execute/async", {"script": script, "args": list(arguments)})

    def find(self, selector):
        return self._post("/element", {"using": "css selector", "value": selector})[ELEMENT]

    def click(self, selector):
        self._post(f"/element/{self.find(selector)}/click", {})

    def press(self, *keys):
        """Presses keys one after the other, wherever the focus is."""
        actions = [{"type": kind, "value": key} for key in keys for kind in ("keyDown", "keyUp")]
        self._post("/actions", {"actions": [{"type": "key", "id": "keyboard", "actions": actions}]})

    def drag(self, selector, *places, pointer="mouse"):
        """Presses at the first place over an element and moves through the others; places are
        fractions of its width and height."""
        box = self.run(
            "const e = document.querySelector(arguments[0]); e.scrollIntoView({block: 'nearest'});"
            "const b = e.getBoundingClientRect(); return [b.left, b.top, b.width, b.height]", selector
        )
        steps = [{"type": "pointerMove", "duration": 0, "x": round(box[0] + x * box[2]),
                  "y": round(box[1] + y * box[3])} for x, y in places]
        steps[1:1] = [{"type": "pointerDown", "button": 0}]
        steps += [{"type": "pointerUp", "button": 0}]
        finger = {"type": "pointer", "id": pointer, "actions": steps}
        finger["parameters"] = {"pointerType": pointer}
        self._post("/actions", {"actions": [finger]})

    def chord(self, *keys):
        """Presses keys together."""
        actions = [{"type": "keyDown", "value": key} for key in keys]
        actions += [{"type": "keyUp", "value": key} for key in reversed(keys)]
        self._post("/actions", {"actions": [{"type": "key", "id": "keyboard", "actions": actions}]})

    def wait_until(self, script, *arguments, seconds=30):
        """Waits until a script returns something true, and returns that."""
        end = time.monotonic() + seconds
        while True:
            value = self.run(script, *arguments)
            if value:
                return value
            if time.monotonic() > end:
                raise RuntimeError(f"it does not come: {script}")
            time.sleep(0.02)

    def complaints(self):
        """What the console has been told since it was last asked: errors of scripts, what was refused."""
        return [entry["message"] for entry in self._post("/se/log", {"type": "browser"})]

    def screenshot(self, path):
        path.write_bytes(base64.b64decode(self._send("GET", "/screenshot")))


def wait_for(path, seconds=20):
    """Waits until a download is there."""
    end = time.monotonic() + seconds
    while not path.exists():
        if time.monotonic() > end:
            raise RuntimeError(f"{path} does not come")
        time.sleep(0.02)
