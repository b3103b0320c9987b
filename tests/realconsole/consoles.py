"""Sits at a machine with a shell on two of its consoles: goes to the other one and back while a program draws, and
sees to it that the shell takes what is typed after each way in which a program can crash."""

import argparse
import sys
import threading
import time
from pathlib import Path

import machine
import picture

KEYS = {name: code for row, first in (("1234567890", 2), ("qwertyuiop", 16), ("asdfghjkl", 30), ("zxcvbnm,./", 44))
        for code, name in enumerate(row, first)} | {" ": 57, "\n": 28}
CTRL, SHIFT, ALT, F1, F2 = 29, 42, 56, 59, 60
KEY_SECONDS = 0.02
MOVE_SECONDS = 0.005

SHELL = "setsid sh -c 'exec env PS1= sh -i < /dev/tty{0} > /dev/tty{0} 2>&1' &"
AWAIT = "for i in $(seq 400); do {condition} && exit 0; usleep 50000; done; exit 1"
IS_SHOWN = "grep -qx tty{0} /sys/class/tty/tty0/active"
HAS_ENDED = "! pidof {0}"
HAS_CONSOLE = "{state} | grep -q 'screen 1 switch 1'"
TAKES_MOUSE = "ls -l /proc/$(pidof {0})/fd | grep -q mice"


class Wrong(Exception):
    """A console is not as it should be."""


class User:
    def __init__(self, options: argparse.Namespace, real: machine.Machine) -> None:
        self._options = options
        self._real = real

    def press(self, *codes: int) -> None:
        for code in [*codes, *(code | 0x80 for code in reversed(codes))]:
            self._real.key(code)
            time.sleep(KEY_SECONDS)

    def type(self, text: str) -> None:
        for character in text:
            self.press(*((SHIFT, KEYS["."]) if character == ">" else (KEYS[character],)))

    def wait_for(self, condition: str) -> None:
        status, words = self._real.run(AWAIT.format(condition=condition), 60)
        if status != 0:
            raise Wrong(f"never: {condition} {words}")

    def go_to(self, console: int, *keys: int) -> None:
        self.press(*keys)
        self.wait_for(IS_SHOWN.format(console))

    def check_shell(self, word: str) -> None:
        """The shell of the console that is shown takes what is typed."""
        self.type(f"echo {word} > /tmp/{word}\n")
        self.wait_for(f"grep -qsx {word} /tmp/{word}")

    def start(self, command: str) -> None:
        self.type(command + "\n")
        self.wait_for(HAS_CONSOLE.format(state=self._options.state))
        self.wait_for(TAKES_MOUSE.format(command.split()[0]))

    def settled(self) -> picture.Picture:
        shown, since = self._real.screenshot(), time.monotonic()
        while time.monotonic() - since < 2:
            now = self._real.screenshot()
            if now != shown:
                shown, since = now, time.monotonic()
        return shown

    def leave_and_return(self) -> None:
        self.start("gallery")
        before = self.settled()
        for word in ("once", "twice"):
            self.go_to(2, CTRL, ALT, F2)
            self.check_shell(word)
            if self._real.screenshot() == before:
                raise Wrong("the other console looks like the program's")
            self.go_to(1, ALT, F1)
            if self.settled() != before:
                picture.write_png(self._options.keep / "returned.png", self._real.screenshot())
                picture.write_png(self._options.keep / "left.png", before)
                raise Wrong(f"the picture is another one: see {self._options.keep}")
        self._real.monitor("mouse_button 2")
        self.wait_for(HAS_ENDED.format("gallery"))
        self.check_shell("ended")

    def crash(self, how: str) -> None:
        state = self._real.run(self._options.state)[1]
        self.start(f"faulty {how}")
        if how.startswith("away"):
            self.go_to(2, CTRL, ALT, F2)
        if how in ("key", "paint"):
            self.press(KEYS["a"])
        moving = threading.Event()
        mouse = threading.Thread(target=self._move, args=(moving,))
        if how in ("mouse", "awayandmoved"):
            # Until the program has gone; the commands that look for this go another way.
            mouse.start()
        if how.startswith("away"):
            time.sleep(0.3)
            self._real.run("kill -SEGV $(pidof faulty)")
        self.wait_for(HAS_ENDED.format("faulty"))
        if mouse.ident:
            moving.set()
            mouse.join()
        if how.startswith("away"):
            self.check_shell(f"beside{how}")
            self.go_to(1, ALT, F1)
        self.check_shell(how)
        picture.write_png(self._options.keep / f"{how}.png", self._real.screenshot())
        if self._real.run(self._options.state)[1] != state:
            raise Wrong(f"after a crash ({how}) the console is {self._real.run(self._options.state)[1]}, was {state}")

    def _move(self, over: threading.Event) -> None:
        while not over.is_set():
            for step in ("3 1", "-3 -1"):
                self._real.monitor(f"mouse_move {step}")
                time.sleep(MOVE_SECONDS)


def main() -> int:
    parser = argparse.ArgumentParser(description=__doc__)
    for name, purpose in (("gallery", "draws the same whenever it is asked"), ("faulty", "crashes"),
                          ("state", "tells how a console is set up"), ("kernel", "what scripts/fetch-kernel left"),
                          ("keep", "the folder for pictures and logs")):
        parser.add_argument(f"--{name}", type=Path, required=True, help=purpose)
    options = parser.parse_args()
    try:
        with machine.boot(16, [options.gallery, options.faulty, options.state], options.kernel, options.keep) as real:
            real.run(f"{machine.PLUG_MOUSE}; ln -s {options.gallery} {options.faulty} /bin")
            for console in (1, 2):
                real.run(SHELL.format(console))
            user = User(options, real)
            user.check_shell("ready")
            user.leave_and_return()
            for how in ("key", "paint", "mouse", "away", "awayandmoved"):
                user.crash(how)
    except (Wrong, machine.MachineError, machine.MissingPart, OSError) as error:
        print(f"realconsole.consoles: {error}", file=sys.stderr)
        return 1
    return 0


if __name__ == "__main__":
    sys.exit(main())
