"""Sits at a machine with shells on two of its consoles: goes to the other one and back while a program draws, and
sees to it that the shell takes what is typed after each way in which a program can crash, or die under a guardian. And
asks the doctor.

    consoles.py GALLERY FAULTY GUARDIAN DOCTOR STATE KERNEL KEEP    programs, folders of the kernel and for pictures, logs
"""

import sys
import time
from pathlib import Path

import machine
import picture

ROWS = {2: "1234567890-", 16: "qwertyuiop", 28: "\n", 30: "asdfghjkl;", 44: "zxcvbnm,./", 57: " "}
KEYS = {character: code for first, row in ROWS.items() for code, character in enumerate(row, first)}
CTRL, SHIFT, ALT, F1, F2 = 29, 42, 56, 59, 60
KEY_SECONDS = 0.02
STILL_SECONDS = 2

SHELL = "setsid sh -c 'exec env PS1= sh -i < /dev/tty{0} > /dev/tty{0} 2>&1' &"
AWAIT = "for i in $(seq 400); do {condition} && exit 0; usleep 50000; done; exit 1"
HAS_TAKEN = "{state} | grep -q 'screen 1 switch 1' && ls -l /proc/$(pidof {program})/fd | grep -q mice"


class Wrong(Exception):
    """A console is not as it should be."""


class User:
    def __init__(self, real: machine.Machine, state: Path) -> None:
        self._real = real
        self._state = state

    def press(self, *codes: int) -> None:
        for code in [*codes, *(code | 0x80 for code in reversed(codes))]:
            self._real.key(code)
            time.sleep(KEY_SECONDS)

    def type(self, text: str) -> None:
        for character in text:
            self.press(*((SHIFT, KEYS["."]) if character == ">" else (KEYS[character],)))

    def wait_for(self, condition: str) -> None:
        if self._real.run(AWAIT.format(condition=condition), 60)[0] != 0:
            raise Wrong(f"never: {condition}")

    def go_to(self, console: int, *keys: int) -> None:
        self.press(*keys)
        self.wait_for(f"grep -qx tty{console} /sys/class/tty/tty0/active")

    def check_shell(self, word: str) -> None:
        self.type(f"echo {word} > /tmp/{word}\n")
        self.wait_for(f"grep -qsx {word} /tmp/{word}")

    def start(self, program: str, how: str = "", guarded: bool = False) -> None:
        print(f"starting {program} {how}", flush=True)
        self.type(f"{'tessella-run ' * guarded}{program} {how}\n")
        self.wait_for(HAS_TAKEN.format(state=self._state, program=program))

    def settled(self) -> picture.Picture:
        shown, since = self._real.screenshot(), time.monotonic()
        while time.monotonic() - since < STILL_SECONDS:
            now = self._real.screenshot()
            if now != shown:
                shown, since = now, time.monotonic()
        return shown

    def ask_doctor(self) -> None:
        for before, status, words in (("", 0, "/dev/input/mice answers"), ("echo > /dev/mice; ", 2, "doesn't answer")):
            told = self._real.run(f"{before}tessella-doctor; s=$?; rm -f /dev/mice; exit $s")
            if told[0] != status or not any(words in line for line in told[1]):
                raise Wrong(f"the doctor says {told}")

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
                raise Wrong("the picture is another one after the return")
        self._real.monitor("mouse_button 2")
        self.wait_for("! pidof gallery")
        self.check_shell("ended")

    def crash(self, how: str) -> None:
        before = self._real.run(self._state)
        self.start("faulty", how)
        is_away = how in ("away", "frozen")
        if is_away:
            self.go_to(2, CTRL, ALT, F2)
        elif how != "mouse":
            self.press(KEYS["a"])
        for i in range(0 if how == "away" else 100):
            self._real.monitor(f"mouse_move {i % 3 - 1} 1")
        if is_away:
            self._real.run("kill -SEGV $(pidof faulty)")
        self.wait_for("! pidof faulty")
        if is_away:
            self.go_to(1, ALT, F1)
        self.check_shell(how)
        if self._real.run(self._state) != before:
            raise Wrong(f"the console has not been given back after a crash: {how}")

    def die(self, signal: str, away: bool) -> None:
        """Under the guardian, which has the last word: the program's end, and the console that was shown."""
        before = self._real.run(self._state)
        self.start("gallery", guarded=True)
        if away:
            self.go_to(2, CTRL, ALT, F2)
        self._real.run(f"kill -{signal} $(pidof gallery)")
        self.wait_for("! pidof tessella-run")
        self.wait_for("grep -qx tty1 /sys/class/tty/tty0/active")
        self.check_shell(f"{signal}{away}".lower())
        if self._real.run(self._state) != before:
            raise Wrong(f"the guardian has not given the console back after {signal}")

    def restore(self) -> None:
        before = self._real.run(self._state)
        self.start("gallery")
        self._real.run("kill -KILL $(pidof gallery)")
        self.wait_for("! pidof gallery")
        if self._real.run(self._state) == before:
            raise Wrong("nothing is left behind that could be mended")
        self._real.run("tessella-run --restore --tty /dev/tty1")
        self.check_shell("restored")
        # The shell has taken the terminal's settings for its own meanwhile, and goes back to them.
        self.type("tessella-run --restore; echo mended > /tmp/mended\n")
        self.wait_for("grep -qsx mended /tmp/mended")
        self.check_shell("again")
        if self._real.run(self._state) != before:
            raise Wrong("the console is not as at the start")


def main() -> int:
    gallery, faulty, guardian, doctor, state, kernel, keep = map(Path, sys.argv[1:])
    try:
        with machine.boot(16, [gallery, faulty, guardian, doctor, state], kernel, keep) as real:
            real.run(f"{machine.PLUG_MOUSE}; ln -s {gallery} {faulty} {guardian} {doctor} /bin")
            for console in (1, 2):
                real.run(SHELL.format(console))
            user = User(real, state)
            user.check_shell("ready")
            user.ask_doctor()
            user.leave_and_return()
            for how in ("key", "paint", "mouse", "away", "frozen"):
                user.crash(how)
            for signal in ("KILL", "SEGV", "ABRT", "TERM"):
                user.die(signal, away=False)
            user.die("KILL", away=True)
            user.restore()
            picture.write_png(keep / "reported.png", real.screenshot())
    except (Wrong, machine.MachineError, machine.MissingPart, OSError) as error:
        print(f"realconsole.consoles: {error}", file=sys.stderr)
        return 1
    except KeyboardInterrupt:
        return 130
    return 0


if __name__ == "__main__":
    sys.exit(main())
