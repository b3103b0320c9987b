"""Debian's Chromium without a display, told what to do through its debugging pipe."""
import json
import os
import subprocess
import tempfile
import time
from pathlib import Path

PATIENCE = 60  # seconds; a slow machine may have much else to do

# The canvas as the user has it before him, or nothing while there is none.
DIGEST = """(async () => {
    const canvas = document.querySelector("#screen canvas");
    if (document.body.dataset.state !== "connected" || !canvas?.width) return "";
    const { data } = canvas.getContext("2d").getImageData(0, 0, canvas.width, canvas.height);
    const digest = new Uint8Array(await crypto.subtle.digest("SHA-256", data));
    return Array.from(digest, (byte) => byte.toString(16).padStart(2, "0")).join("");
})()"""


def eventually(what, condition):
    """What the condition gives, once it gives something."""
    end = time.monotonic() + PATIENCE
    while not (result := condition()):
        assert time.monotonic() < end, f"not within {PATIENCE} seconds: {what}"
        time.sleep(0.02)
    return result


class Browser:
    def __init__(self):
        self.folder = tempfile.TemporaryDirectory(ignore_cleanup_errors=True)
        self.downloads = Path(self.folder.name, "downloads")
        there, self.commands = os.pipe()
        self.answers, back = os.pipe()
        # It listens at 3 and answers at 4.
        self.process = subprocess.Popen(
            ["sh", "-c", f'exec "$@" 3<&{there} 4>&{back}', "sh", "chromium", "--headless", "--no-sandbox",
             "--disable-gpu", "--disable-dev-shm-usage", "--no-first-run", "--no-proxy-server",
             "--disable-background-networking", "--disable-component-update", "--window-size=1200,900",
             "--remote-debugging-pipe", f"--user-data-dir={self.folder.name}/profile"],
            pass_fds=(there, back), stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        os.close(there)
        os.close(back)
        self.received = b""
        self.count = 0
        self.tell("Browser.setDownloadBehavior", behavior="allow", downloadPath=str(self.downloads))

    def __enter__(self):
        return self

    def __exit__(self, *_):
        self.process.terminate()
        self.process.wait(PATIENCE)
        self.folder.cleanup()

    def tell(self, method, session="", **parameters):
        self.count += 1
        message = {"id": self.count, "method": method, "params": parameters}
        if session:
            message["sessionId"] = session
        os.write(self.commands, json.dumps(message).encode() + b"\0")
        while True:
            *answers, self.received = self.received.split(b"\0")
            for answer in map(json.loads, answers):
                if answer.get("id") == self.count:  # the rest are events, which nobody waits for
                    assert "error" not in answer, f"{method}: {answer['error']}"
                    return answer["result"]
            part = os.read(self.answers, 1 << 20)
            assert part, "the browser has ended"
            self.received += part


class Page:
    """A page with a screen on it. Points are the screen's pixels."""

    def __init__(self, browser, address):
        self.browser = browser
        self.target = browser.tell("Target.createTarget", url=address)["targetId"]
        self.session = browser.tell("Target.attachToTarget", targetId=self.target, flatten=True)["sessionId"]
        self.tell("Emulation.setFocusEmulationEnabled", enabled=True)
        eventually("a page", lambda: self.ask("document.body?.dataset.state"))

    def tell(self, method, **parameters):
        return self.browser.tell(method, self.session, **parameters)

    def close(self):
        self.browser.tell("Target.closeTarget", targetId=self.target)

    def ask(self, expression):
        answer = self.tell("Runtime.evaluate", expression=expression, awaitPromise=True, returnByValue=True)
        assert "exceptionDetails" not in answer, answer["exceptionDetails"]
        return answer["result"].get("value")

    def digest(self):
        return self.ask(DIGEST)

    def wait_for(self, state):
        eventually(f"the page is {state}", lambda: self.ask("document.body.dataset.state") == state)

    def place(self, selector):
        return self.ask(f"(({{ x, y, width, height }}) => [x, y, width, height])"
                        f"(document.querySelector({selector!r}).getBoundingClientRect())")

    def mouse(self, kind, x, y, **more):
        left, top, *_ = self.place("#screen canvas")
        self.tell("Input.dispatchMouseEvent", type=kind, x=left + x + 0.5, y=top + y + 0.5, **more)

    def move(self, x, y):
        self.mouse("mouseMoved", x, y)

    def wheel(self, x, y, notches):
        self.mouse("mouseWheel", x, y, deltaX=0, deltaY=100 * notches)

    def press(self, x, y):
        self.move(x, y)
        self.mouse("mousePressed", x, y, button="left", buttons=1, clickCount=1)

    def drag(self, x, y):
        self.mouse("mouseMoved", x, y, button="left", buttons=1)

    def release(self, x, y):
        self.mouse("mouseReleased", x, y, button="left", clickCount=1)

    def click_on(self, selector):
        """On a part of the page, as the user does."""
        left, top, width, height = self.place(selector)
        where = {"x": left + width / 2, "y": top + height / 2}
        for kind in ("mousePressed", "mouseReleased"):
            self.tell("Input.dispatchMouseEvent", type=kind, button="left", clickCount=1, **where)

    def type(self, *keys):
        """Keys by their places; those before a plus sign are held meanwhile."""
        for key in keys:
            codes = key.split("+")
            for kind, order in (("rawKeyDown", codes), ("keyUp", codes[::-1])):
                for code in order:  # the character is none that any layout has there
                    self.tell("Input.dispatchKeyEvent", type=kind, code=code, key="Dead")
