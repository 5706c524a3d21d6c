"""Chromium without a window, told what to do over a pipe in the DevTools protocol."""

import fcntl
import json
import os
import select
import shutil
import subprocess
import tempfile
import time

PATIENCE = 120  # seconds; starting takes two where nothing else runs


class Browser:
    """One tab. `messages` are what the page said on its console, exceptions included; `requests` what it loaded."""

    def __init__(self):
        program = shutil.which("chromium")
        if program is None:
            raise RuntimeError("chromium is not installed: scripts/setup --tests installs it")
        self.folder = tempfile.TemporaryDirectory(prefix="morvik-browser-", ignore_cleanup_errors=True)
        self.log = open(os.path.join(self.folder.name, "log"), "w+", encoding="utf-8", errors="replace")
        commands, self.output = self._pipe()
        self.input, answers = self._pipe()

        def connect():  # the browser expects its pipe at these two
            os.dup2(commands, 3)
            os.dup2(answers, 4)

        self.process = subprocess.Popen(
            [program, "--headless", "--no-sandbox", "--disable-gpu", "--disable-dev-shm-usage", "--hide-scrollbars",
             "--no-first-run", "--disable-extensions", "--disable-background-networking",
             "--remote-debugging-pipe", f"--user-data-dir={self.folder.name}/profile", "about:blank"],
            preexec_fn=connect, pass_fds=(3, 4), stdin=subprocess.DEVNULL, stdout=self.log, stderr=self.log,
            env={**os.environ, "HOME": self.folder.name}, start_new_session=True)
        os.close(commands)
        os.close(answers)
        self.received = b""
        self.last = 0
        self.session = None
        self.events = []
        self.messages = []
        self.requests = []
        try:
            self._attach()
        except BaseException:
            self.close()
            raise

    @staticmethod
    def _pipe():
        """Ends that are not in the way of 3 and 4."""
        ends = os.pipe()
        moved = tuple(fcntl.fcntl(end, fcntl.F_DUPFD_CLOEXEC, 10) for end in ends)
        for end in ends:
            os.close(end)
        return moved

    def _attach(self):
        pages = [target for target in self.call("Target.getTargets")["targetInfos"] if target["type"] == "page"]
        page = pages[0]["targetId"] if pages else self.call("Target.createTarget", url="about:blank")["targetId"]
        self.session = self.call("Target.attachToTarget", targetId=page, flatten=True)["sessionId"]
        for domain in ("Page", "Runtime", "Log", "Network"):
            self.call(domain + ".enable")

    def _fail(self, what):
        self.log.seek(0)
        raise RuntimeError(f"{what}; Chromium said:\n{self.log.read()[-4000:]}")

    def _next(self, deadline):
        while b"\0" not in self.received:
            ready, _, _ = select.select([self.input], [], [], max(0, deadline - time.monotonic()))
            if not ready:
                self._fail("Chromium does not answer")
            part = os.read(self.input, 1 << 16)
            if not part:
                self._fail("Chromium has ended")
            self.received += part
        text, _, self.received = self.received.partition(b"\0")
        message = json.loads(text)
        self._note(message)
        return message

    def _note(self, message):
        method, values = message.get("method"), message.get("params", {})
        if method == "Runtime.consoleAPICalled":
            self.messages.append(" ".join(str(value.get("value", value)) for value in values["args"]))
        elif method == "Runtime.exceptionThrown":
            details = values["exceptionDetails"]
            self.messages.append(details.get("exception", {}).get("description") or details["text"])
        elif method == "Log.entryAdded":
            self.messages.append(values["entry"]["text"])
        elif method == "Network.requestWillBeSent":
            self.requests.append(values["request"]["url"])
        elif method is not None:
            self.events.append(method)

    def call(self, method, **values):
        """What the browser answers to a command."""
        self.last += 1
        command = {"id": self.last, "method": method, "params": values}
        if self.session is not None:
            command["sessionId"] = self.session
        os.write(self.output, json.dumps(command).encode() + b"\0")
        deadline = time.monotonic() + PATIENCE
        while True:
            message = self._next(deadline)
            if message.get("id") == self.last:
                if "error" in message:
                    raise RuntimeError(f"{method}: {message['error']['message']}")
                return message["result"]

    def load(self, url):
        """Opens a page and waits until it is all there."""
        self.events.clear()
        self.messages.clear()
        self.requests.clear()
        self.call("Page.navigate", url=url)
        deadline = time.monotonic() + PATIENCE
        while "Page.loadEventFired" not in self.events:
            self._next(deadline)

    def evaluate(self, expression):
        """The value of an expression of JavaScript."""
        answer = self.call("Runtime.evaluate", expression=expression, returnByValue=True, awaitPromise=True)
        if "exceptionDetails" in answer:
            raise RuntimeError(f"{expression}: {answer['exceptionDetails']}")
        return answer["result"].get("value")

    def resize(self, width, height, scale=1):
        self.call("Emulation.setDeviceMetricsOverride", width=width, height=height, deviceScaleFactor=scale, mobile=False)

    def media(self, kind="", scheme="light"):
        self.call("Emulation.setEmulatedMedia", media=kind, features=[{"name": "prefers-color-scheme", "value": scheme}])

    def move(self, x, y):
        self.call("Input.dispatchMouseEvent", type="mouseMoved", x=x, y=y)

    def click(self, x, y):
        self.move(x, y)
        for kind in ("mousePressed", "mouseReleased"):
            self.call("Input.dispatchMouseEvent", type=kind, x=x, y=y, button="left", clickCount=1)

    def press(self, key):
        for kind in ("keyDown", "keyUp"):
            self.call("Input.dispatchKeyEvent", type=kind, key=key, code=key)

    def close(self):
        try:
            self.session = None
            self.call("Browser.close")
        except (OSError, RuntimeError):
            pass  # it has gone already
        try:
            self.process.wait(timeout=10)
        except subprocess.TimeoutExpired:
            self.process.kill()
            self.process.wait()
        os.close(self.output)
        os.close(self.input)
        self.log.close()
        self.folder.cleanup()
