"""A browser without a window for tests of pages: chromium-headless-shell, driven through a pair of pipes with the protocol of its
developer tools. Needs nothing but the standard library.
"""

import base64
import json
import os
import pathlib
import shutil
import subprocess
import tempfile

LIMIT = 120  # seconds; only ends a test that would wait for ever
PROGRAM = shutil.which("chromium-headless-shell")


class Browser:
    """One browser with one page. Keeps what the page says on the console, and what it asks a network for."""

    def __init__(self):
        assert PROGRAM, "chromium-headless-shell is not installed"
        self.folder = tempfile.mkdtemp(prefix="lapdread-browser.")
        to_browser, self.writing = os.pipe()
        self.reading, from_browser = os.pipe()
        # The browser reads commands from descriptor 3 and writes to 4. A shell puts them there, since it can.
        command = [PROGRAM, "--headless", "--no-sandbox", "--disable-gpu", "--disable-dev-shm-usage", "--no-first-run",
                   f"--user-data-dir={self.folder}", "--remote-debugging-pipe", "about:blank"]
        self.process = subprocess.Popen(
            ["sh", "-c", f'exec 3<&{to_browser} 4>&{from_browser}; exec "$@"', "sh", *command],
            stdin=subprocess.DEVNULL, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL,
            pass_fds=(to_browser, from_browser), env={**os.environ, "HOME": self.folder})
        os.close(to_browser)
        os.close(from_browser)
        self.received = b""
        self.last = 0
        self.events = []
        target = self.tell("Target.createTarget", url="about:blank")["targetId"]
        self.session = self.tell("Target.attachToTarget", targetId=target, flatten=True)["sessionId"]
        for domain in ("Page", "Runtime", "Log", "Network"):
            self.tell(f"{domain}.enable")

    def close(self):
        os.close(self.writing)  # the end of its commands ends the browser
        try:
            self.process.wait(timeout=LIMIT)
        except subprocess.TimeoutExpired:
            self.process.kill()
            self.process.wait()
        os.close(self.reading)
        shutil.rmtree(self.folder, ignore_errors=True)

    def tell(self, method, **parameters):
        """Sends a command and returns its result; what the browser reports meanwhile is kept."""
        self.last += 1
        message = {"id": self.last, "method": method, "params": parameters}
        if hasattr(self, "session"):
            message["sessionId"] = self.session
        os.write(self.writing, json.dumps(message).encode() + b"\0")
        while True:
            answer = self.receive()
            if answer.get("id") == self.last:
                if "error" in answer:
                    raise AssertionError(f"{method}: {answer['error']}")
                return answer["result"]
            self.events.append(answer)

    def receive(self):
        while b"\0" not in self.received:
            piece = os.read(self.reading, 1 << 20)
            if not piece:
                raise AssertionError("the browser has gone")
            self.received += piece
        message, _, self.received = self.received.partition(b"\0")
        return json.loads(message)

    def wait_for(self, event):
        while not any(each.get("method") == event for each in self.events):
            self.events.append(self.receive())

    def open(self, path, scripts=True, dark=False, fragment=""):
        """Loads a file anew, and waits until all of it is there."""
        self.tell("Emulation.setScriptExecutionDisabled", value=not scripts)
        self.tell("Emulation.setEmulatedMedia",
                  features=[{"name": "prefers-color-scheme", "value": "dark" if dark else "light"}])
        self.load("about:blank")
        self.load(pathlib.Path(path).resolve().as_uri() + fragment)

    def load(self, address):
        self.events = []
        self.tell("Page.navigate", url=address)
        self.wait_for("Page.loadEventFired")

    def value(self, expression):
        """What a JavaScript expression is in the page, as a value of Python."""
        result = self.tell("Runtime.evaluate", expression=f"JSON.stringify({expression})", awaitPromise=True)
        if "exceptionDetails" in result:
            raise AssertionError(f"{expression}: {result['exceptionDetails']}")
        value = result["result"].get("value")
        return None if value is None else json.loads(value)

    def complaints(self):
        """All that was written to the console, or thrown, since the page was opened."""
        self.value("1")  # whatever was said before has come now
        kinds = ("Runtime.consoleAPICalled", "Runtime.exceptionThrown", "Log.entryAdded")
        return [event["params"] for event in self.events if event.get("method") in kinds]

    def requests(self):
        """The addresses of everything that was asked for since the page was opened."""
        self.value("1")
        return [event["params"]["request"]["url"] for event in self.events
                if event.get("method") == "Network.requestWillBeSent"]

    def picture(self, path, width=1200, height=900, whole=True):
        """Saves the page as PNG, all of it or what the window shows."""
        self.tell("Emulation.setDeviceMetricsOverride", width=width, height=height, deviceScaleFactor=1, mobile=False)
        made = self.tell("Page.captureScreenshot", format="png", captureBeyondViewport=whole)
        pathlib.Path(path).write_bytes(base64.b64decode(made["data"]))

    def printed(self):
        """The page on paper, as PDF."""
        return base64.b64decode(self.tell("Page.printToPDF", printBackground=False)["data"])
