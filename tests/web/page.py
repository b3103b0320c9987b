"""What users do to a program in a browser, and what both show. Arguments: a case below, the build folder."""
import hashlib
import os
import re
import subprocess
import sys
import tempfile
import time
from pathlib import Path

from browser import Browser, Page, eventually

sys.path.append(str(Path(__file__).parents[1] / "realconsole"))
from picture import differing_pixels, read_png  # noqa: E402

BUILD = Path(sys.argv[2])
# The camera, on the same console, takes a picture for each line; the end of lines is the program's.
ATTENDED = 'shot=$1; shift; "$@" >events & while read -r _; do "$shot" shot.png && echo taken; done; kill $!'

# On the desktop: areas are told by their left, top, width and height.
NOTE = (148, 500, 500, 120)  # what is inside, below a pointer at the title
NOTE_TITLE, DRAGGED = (400, 463), (75, -41)
DRAGGED_TITLE = (475, 422)
PICTURE = (80, 90, 200, 250)
BESIDE_PICTURE = (400, 200)  # the same window
LARGEST_POINTERS = 4 * 32 * 32  # in pixels, of those that come and those that go


class Console:
    def __init__(self, program, *options, language="C", port=0):
        self.folder = tempfile.TemporaryDirectory()
        self.tool = subprocess.Popen(
            [BUILD / "console/tessella-console", "--mode", "1024x768x32", f"--web={port}", *options, "--",
             "sh", "-c", ATTENDED, "sh", BUILD / "care/tessella-shot", BUILD / "examples" / program],
            cwd=self.folder.name, env=dict(os.environ, LC_ALL=language), text=True,
            stdin=subprocess.PIPE, stdout=subprocess.PIPE, stderr=subprocess.PIPE)
        told = self.tool.stderr.readline()
        self.address, self.port = re.search(r"(http://localhost:(\d+)/)", told).groups()

    def __enter__(self):
        return self

    def __exit__(self, *_):
        self.tool.communicate(timeout=60)
        self.folder.cleanup()

    def picture(self):
        """What the framebuffer has."""
        print(file=self.tool.stdin, flush=True)
        assert self.tool.stdout.readline() == "taken\n"
        return read_png(Path(self.folder.name, "shot.png"))

    def shown_on(self, page, what, is_so):
        """A picture that stands still, in the framebuffer and on the page, and of which something is so."""
        def still():
            one = self.picture()
            time.sleep(0.1)
            return one if is_so(one) and one == self.picture() and digest(one) == page.digest() else None
        return eventually(what, still)

    def typed(self):
        """The characters that keys have given to the program, one text for each key that was pressed."""
        events = Path(self.folder.name, "events").read_text(encoding="utf-8")
        return ["".join(chr(int(code, 16)) for code in re.findall(r"U\+(\w+)", line))
                for line in events.splitlines() if line.startswith("down")]


def digest(picture):
    """Of the bytes that the page has: with a fourth in each pixel, which says that nothing shines through."""
    pixels = bytearray(b"\xff") * (4 * picture.width * picture.height)
    for channel in range(3):
        pixels[channel::4] = picture.pixels[channel::3]
    return hashlib.sha256(pixels).hexdigest()


def part(picture, place):
    left, top, width, height = place
    rows = range(picture.width * top + left, picture.width * (top + height), picture.width)
    return [picture.pixels[3 * row : 3 * (row + width)] for row in rows]


def colours(picture):
    return len({picture.pixels[i : i + 3] for i in range(0, len(picture.pixels), 3)})


def has_note(picture, note, by_x, by_y):
    """The note is so far from where it was at the beginning."""
    left, top, width, height = NOTE
    return part(picture, (left + by_x, top + by_y, width, height)) == note


def desktop(browser):
    with Console("desktop") as console:
        page = Page(browser, console.address)
        begin = console.shown_on(page, "the desktop", lambda now: colours(now) > 1000)
        note, picture = part(begin, NOTE), part(begin, PICTURE)

        page.press(*NOTE_TITLE)
        page.drag(NOTE_TITLE[0] + 30, NOTE_TITLE[1] - 10)
        page.release(*DRAGGED_TITLE)
        dragged = console.shown_on(page, "a window is dragged", lambda now: has_note(now, note, *DRAGGED))
        assert not has_note(dragged, note, 0, 0)

        page.wheel(*BESIDE_PICTURE, 1)
        console.shown_on(page, "the wheel brings another picture", lambda now: part(now, PICTURE) != picture)
        page.wheel(*BESIDE_PICTURE, -1)
        again = console.shown_on(page, "and this one", lambda now: part(now, PICTURE) == picture)

        page.click_on("#consoles :nth-child(2)")
        console.shown_on(page, "another console", lambda now: colours(now) == 1)
        page.click_on("#consoles :nth-child(1)")
        console.shown_on(page, "the program's console", lambda now: now == again)

        page.click_on("#screenshot")
        saved = eventually("a file", lambda: list(browser.downloads.glob("*.png")))
        assert read_png(saved[0]) == again

        # Somebody else drags, and goes.
        other = Page(browser, console.address)
        other.wait_for("connected")
        other.press(*DRAGGED_TITLE)
        other.drag(*NOTE_TITLE)
        console.shown_on(other, "it is dragged back", lambda now: has_note(now, note, 0, 0))
        other.close()

        def change(x, y):
            before = console.picture()
            page.move(x, y)
            after = console.shown_on(page, "the pointer elsewhere", lambda now: now != before)
            return len(differing_pixels(before, after))
        eventually("the pointer moves alone", lambda: change(60, 700) + change(60, 600) < LARGEST_POINTERS)


def keys(browser):
    """Of a German keyboard, whatever the browser makes of them."""
    with Console("keys", language="de") as console:
        page = Page(browser, console.address)
        page.wait_for("connected")
        console.shown_on(page, "the keyboard", lambda now: colours(now) > 100)
        page.type("KeyY", "Equal", "KeyE", "ShiftLeft+Equal", "KeyA", "Backquote", "KeyO", "Semicolon",
                  "AltRight+KeyQ", "BracketLeft", "IntlBackslash")
        # What waits for its letter is a null character.
        expected = ["z", "\0", "é", "", "\0", "à", "\0", "ô", "ö", "", "@", "ü", "<"]
        eventually("the characters", lambda: len(console.typed()) >= len(expected))
        assert console.typed() == expected, console.typed()
        # Those that a browser keeps for itself are in a menu, which leaves the keys with the program.
        page.click_on("summary")
        page.click_on("#keys button")
        page.type("KeyA")
        eventually("control, W and A", lambda: console.typed() == [*expected, "", "w", "a"])


def visits(browser):
    """The page asks for a password, and outlives programs."""
    with tempfile.NamedTemporaryFile("w") as secret:
        print("sesam", file=secret, flush=True)
        with Console("keys", "--password-file", secret.name) as console:
            page = Page(browser, console.address)
            for password in ("simsalabim", "sesam"):
                eventually("the question", lambda: page.ask('document.getElementById("asking").open'))
                page.tell("Input.insertText", text=password)
                page.tell("Input.dispatchKeyEvent", type="char", text="\r")
            page.wait_for("connected")
    page.wait_for("ended")
    with Console("desktop", port=console.port) as console:
        console.shown_on(page, "the next program", lambda now: colours(now) > 1000)


with Browser() as one:
    {"desktop": desktop, "keys": keys, "visits": visits}[sys.argv[1]](one)
