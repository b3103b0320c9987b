"""Plays the virtual console's scripts on a machine: the same user sits at the real console."""

import re
import subprocess
import time
from pathlib import Path

import machine
import picture

BUTTONS = {"left": 1, "right": 2, "middle": 4}  # as the emulator's monitor has them

# The virtual console sees what a program has read. Here it is given time for that, or the kernel would put
# two movements into one packet. Keys only have to leave the controller, which holds few of them.
MOUSE_SECONDS = 0.05
KEY_SECONDS = 0.01
SWITCH_SECONDS = 0.05
OPENED_SECONDS = 0.5

# In the background: the machine stays free for further commands.
START = (
    "rm -f /tmp/status; (sh -c 'echo $$ > /tmp/pid; exec env LC_ALL={language} {program} > /tmp/output 2>&1';"
    " echo $? > /tmp/status) < /dev/null 2> /dev/null &"
)
AWAIT = "until {condition}; do [ ! -e /tmp/status ] || exit 1; usleep 50000; done"
HAS_OPEN = "ls -l /proc/$(cat /tmp/pid)/fd | grep -q {device}$"
HAS_SCREEN = "grep -q /dev/fb /proc/$(cat /tmp/pid)/maps"
IS_SHOWN = "grep -qx tty{number} /sys/class/tty/tty0/active"
HAS_ENDED = "[ -e /tmp/status ]"
TERMINATED = 128 + 15

# How a program that reads raw keys and draws has set up the console, and what of that outlives its death: the
# kernel resets a terminal that nobody has open.
TAKEN = re.compile(r"keys 2 screen 1 switch 1 input \w+ output \w+ local \w*0 ")
LEFT = re.compile(r"keys 2 screen 1 switch 1 ")


class ScriptError(Exception):
    """The script could not be played to its end, or the program failed."""


def read_steps(console: Path, script: Path) -> list[str]:
    """What the script comes down to, as the virtual console reads it."""
    command = [console, "--script", script, "--print-steps"]
    return subprocess.run(command, capture_output=True, text=True, check=True).stdout.splitlines()


class Player:
    """Sits at a machine. Screenshots go to the folder, under the names that the script gives them."""

    def __init__(self, real: machine.Machine, folder: Path, state: Path) -> None:
        self._real = real
        self._state = state
        self._folder = folder
        self._buttons = 0
        self._opened: set[str] = set()

    def play(self, steps: list[str], program: object, language: str) -> list[str]:
        """Starts the program and returns what it wrote, on both streams, when it has ended. It has the
        console meanwhile; if it ends by itself, the console is as it was, else nobody has given it back."""
        self._real.run(machine.PLUG_MOUSE)
        before = self._console_state()
        self._real.run(START.format(program=program, language=language))
        for step in steps:
            command, *words = step.split()
            getattr(self, f"_{command}")(*words)
            if command == "screenshot":
                self._check_console(TAKEN)
        self._await(HAS_ENDED)
        status = int(self._real.run("cat /tmp/status")[1][0])
        output = self._real.run("awk 1 /tmp/output")[1]  # which ends the last line, too
        if status != (TERMINATED if steps[-1] == "quit" else 0):
            raise ScriptError(f"{program} ended with status {status}: {output}")
        self._check_console(LEFT if steps[-1] == "quit" else re.compile(re.escape(before)))
        return output

    def _console_state(self) -> str:
        return self._real.run(self._state)[1][0]

    def _check_console(self, expected: re.Pattern) -> None:
        if not expected.match(self._console_state()):
            raise ScriptError(f"the console is {self._console_state()}, but should be {expected.pattern}")

    def _await(self, condition: str) -> None:
        if self._real.run(AWAIT.format(condition=condition))[0] != 0:
            raise ScriptError(f"the program ended before {condition}: {self._real.run('cat /tmp/output')[1]}")

    def _await_open(self, device: str) -> None:
        if device not in self._opened:
            self._await(HAS_OPEN.format(device=device))
            self._opened.add(device)
            time.sleep(OPENED_SECONDS)

    def _mouse(self, command: str) -> None:
        self._await_open("mice")
        self._real.monitor(command)
        time.sleep(MOUSE_SECONDS)

    def _move(self, dx: str, dy: str) -> None:
        self._mouse(f"mouse_move {dx} {dy}")

    def _wheel(self, direction: str) -> None:
        self._mouse(f"mouse_move 0 0 {1 if direction == 'up' else -1}")

    def _press(self, button: str) -> None:
        self._buttons ^= BUTTONS[button]
        self._mouse(f"mouse_button {self._buttons}")

    _release = _press

    def _keys(self, code: str) -> None:
        self._await_open("tty0")
        self._real.key(int(code, 16))
        time.sleep(KEY_SECONDS)

    def _wait(self, milliseconds: str) -> None:
        time.sleep(int(milliseconds) / 1000)

    def _settle(self, quiet: str, limit: str) -> None:
        self._await(HAS_SCREEN)
        begin = since = time.monotonic()
        shown = self._real.screenshot()
        while time.monotonic() - since < int(quiet) / 1000:
            if time.monotonic() - begin > int(limit) / 1000:
                raise ScriptError("the screen does not stand still")
            now = self._real.screenshot()
            if now != shown:
                shown, since = now, time.monotonic()

    def _screenshot(self, name: str) -> None:
        self._await(HAS_SCREEN)
        picture.write_png(self._folder / name, self._real.screenshot())

    def _switch(self, number: str) -> None:
        self._real.run(f"chvt {number}")
        self._await(IS_SHOWN.format(number=number))
        time.sleep(SWITCH_SECONDS)

    def _quit(self) -> None:
        self._real.run("kill $(cat /tmp/pid)")
