"""A virtual PC that boots Debian's kernel into a real framebuffer console.

    with boot(16, [program], kernel_folder, work_folder) as machine:
        machine.start(program)
        machine.wait_line("ready")
        picture = machine.screenshot()

The processor is always emulated: a /dev/kvm that opens may still be unable to run a guest, and the emulation
boots in seconds and behaves the same on every machine.
"""

import json
import shutil
import socket
import subprocess
import time
from pathlib import Path

import picture
from initramfs import Initramfs, MissingPart

# The boot loader's number of the 1024x768 mode with so many bits a pixel; 640x480 with 4 planes.
VGA_MODES = {4: 0x112, 8: 0x305, 15: 0x316, 16: 0x317, 24: 0x318, 32: 0x344}

# In the guest, by their paths in what scripts/fetch-kernel left.
MODULES = {"/mouse.ko": "modules/kernel/drivers/input/mouse/psmouse.ko"}
PLANAR_MODULES = {
    "/vgastate.ko": "modules/kernel/drivers/video/vgastate.ko",
    "/vga16fb.ko": "modules/kernel/drivers/video/fbdev/vga16fb.ko",
    "/vga_screen.ko": "vga_screen.ko",
}

# Linux has the PC's numbers for the keys up to F12, and its own for those that the PC numbers from 0x80 up:
# KP_ENTER to right ALT, HOME to DELETE, PAUSE, and the last three of META and COMPOSE.
LAST_PLAIN_KEY = 88
FURTHER_KEYS = dict(enumerate((0x9C, 0x9D, 0xB5, 0xB7, 0xB8), 96))
FURTHER_KEYS |= dict(enumerate((0xC7, 0xC8, 0xC9, 0xCB, 0xCD, 0xCF, 0xD0, 0xD1, 0xD2, 0xD3), 102))
FURTHER_KEYS |= {119: 0xC6, 125: 0xDB, 126: 0xDC, 127: 0xDD}

BOOT_SECONDS = 60
# A command for the guest, which has no mouse before.
PLUG_MOUSE = "insmod /mouse.ko; until grep -q Mouse /proc/bus/input/devices; do usleep 50000; done"
ANSWER_SECONDS = 20


class MachineError(Exception):
    """The guest did not do what was waited for; the text tells what it said and where its log is."""


def boot(bits: int, programs: list[Path], kernel_folder: Path, work_folder: Path) -> "Machine":
    """Starts a machine with a framebuffer of `bits` bits a pixel and waits until it takes commands.

    `programs` are put, with their libraries, at the paths they have here. `work_folder` (made if needed)
    takes the boot archive and console.log, the kernel's messages. Raises MissingPart or MachineError."""
    emulator = _tool("qemu-system-x86_64", "qemu-system-x86")
    kernel = kernel_folder / "vmlinuz"
    if not kernel.exists():
        raise MissingPart(f"{kernel} is missing: run scripts/fetch-kernel (Debian package linux-image-amd64)")
    work_folder.mkdir(parents=True, exist_ok=True)
    archive = work_folder / "initramfs.cpio"
    modules = MODULES | (PLANAR_MODULES if bits == 4 else {})
    _make_initramfs(programs, {path: kernel_folder / modules[path] for path in modules}).write(archive)

    machine = Machine(work_folder)
    try:
        machine.power_on(emulator, kernel, archive, VGA_MODES[bits])
        machine.wait_line("booted", BOOT_SECONDS)
        for module in PLANAR_MODULES if bits == 4 else ():
            if machine.run(f"insmod {module}")[0] != 0:
                raise MachineError(f"the guest does not take {module}")
    except BaseException:
        machine.stop()
        raise
    return machine


class Machine:
    """A running guest: a command line on a serial port, and the monitor. Made by boot(); stop() ends it, and
    so does leaving a `with` block. Nothing survives the process that made it."""

    def __init__(self, work_folder: Path) -> None:
        self.log = work_folder / "console.log"
        self._screendump = work_folder / "screendump.ppm"
        self._emulator: subprocess.Popen | None = None
        self._serial, self._serial_end = socket.socketpair()
        self._monitor, self._monitor_end = socket.socketpair()
        self._monitor.settimeout(ANSWER_SECONDS)
        self._monitor_stream = self._monitor.makefile("rb")
        self._received = b""

    def power_on(self, emulator: str, kernel: Path, archive: Path, vga_mode: int) -> None:
        # quiet and a hidden text cursor: nothing but the program draws on the framebuffer.
        command_line = f"console=ttyS0 quiet vt.global_cursor_default=0 vga={vga_mode:#x} panic=-1"
        serial, monitor = self._serial_end.fileno(), self._monitor_end.fileno()
        self._emulator = subprocess.Popen(
            # The kernel ends the emulator should this process be killed.
            ["setpriv", "--pdeathsig", "KILL", emulator]
            + ["-nodefaults", "-no-user-config", "-no-reboot", "-accel", "tcg", "-m", "256"]
            + ["-vga", "std", "-display", "none"]
            + ["-kernel", str(kernel), "-initrd", str(archive), "-append", command_line]
            + ["-serial", f"file:{self.log}"]
            + ["-chardev", f"socket,id=serial,fd={serial}", "-serial", "chardev:serial"]
            + ["-chardev", f"socket,id=monitor,fd={monitor}", "-mon", "chardev=monitor,mode=control"],
            stdin=subprocess.DEVNULL,
            stdout=subprocess.DEVNULL,
            stderr=subprocess.PIPE,
            pass_fds=(serial, monitor),
        )
        self._serial_end.close()
        self._monitor_end.close()
        self._monitor_reply()  # the greeting
        self._qmp("qmp_capabilities")

    def start(self, command: object) -> None:
        """Runs a shell command in the guest. It reads what send_line() sends; finish() waits for its end."""
        self.send_line(command)

    def send_line(self, text: object = "") -> None:
        self._serial.sendall(f"{text}\n".encode())

    def wait_line(self, expected: str, seconds: float = ANSWER_SECONDS) -> list[str]:
        """Waits for a line that is `expected` and returns the lines that came before it."""
        return self._lines_until(lambda line: line == expected, f'line "{expected}"', seconds)[:-1]

    def finish(self, seconds: float = ANSWER_SECONDS) -> tuple[int, list[str]]:
        """Waits for the running command's end: its exit status and what it wrote since the last wait."""
        lines = self._lines_until(lambda line: line.startswith("status "), "end of the command", seconds)
        return int(lines[-1].split()[1]), lines[:-1]

    def run(self, command: object, seconds: float = ANSWER_SECONDS) -> tuple[int, list[str]]:
        self.start(command)
        return self.finish(seconds)

    def monitor(self, command: str) -> str:
        """Gives the emulator's monitor a line like "sendkey a" or "mouse_move 10 5"; returns its answer."""
        return self._qmp("human-monitor-command", {"command-line": command})

    def key(self, byte: int) -> None:
        """Presses the key with this code of Linux, or lets it go if bit 7 is set."""
        code = byte & 0x7F
        key = {"type": "number", "data": code if code <= LAST_PLAIN_KEY else FURTHER_KEYS[code]}
        event = {"type": "key", "data": {"down": byte <= 0x7F, "key": key}}
        self._qmp("input-send-event", {"events": [event]})

    def screenshot(self) -> picture.Picture:
        self._qmp("screendump", {"filename": str(self._screendump)})
        return picture.read_ppm(self._screendump)

    def stop(self) -> None:
        if self._emulator is not None:
            self._emulator.kill()
            self._emulator.communicate()
            self._emulator = None
        for end in (self._serial, self._serial_end, self._monitor_stream, self._monitor, self._monitor_end):
            end.close()

    def __enter__(self) -> "Machine":
        return self

    def __exit__(self, *_: object) -> None:
        self.stop()

    def _lines_until(self, is_last, purpose: str, seconds: float) -> list[str]:
        deadline = time.monotonic() + seconds
        lines: list[str] = []
        while not (lines and is_last(lines[-1])):
            line, newline, rest = self._received.partition(b"\n")
            if newline:
                self._received = rest
                lines.append(line.decode(errors="replace"))
            elif not self._receive(deadline):
                said = "\n".join([*lines, line.decode(errors="replace")]).rstrip()
                raise MachineError(f"no {purpose} in {seconds} s; the guest said:\n{said}\n{self._state()}")
        return lines

    def _receive(self, deadline: float) -> bool:
        """Adds what comes next on the serial port; False at the deadline or if the machine has ended."""
        self._serial.settimeout(max(deadline - time.monotonic(), 0.001))
        try:
            data = self._serial.recv(4096)
        except (TimeoutError, ConnectionError):
            return False
        self._received += data
        return bool(data)

    def _qmp(self, command: str, arguments: dict | None = None):
        request = {"execute": command, "arguments": arguments or {}}
        try:
            self._monitor.sendall(json.dumps(request).encode())
        except ConnectionError:
            raise MachineError(f"the monitor took no {command}; {self._state()}") from None
        reply = self._monitor_reply()
        while "event" in reply:
            reply = self._monitor_reply()
        if "error" in reply:
            raise MachineError(f"monitor: {command}: {reply['error']['desc']}")
        return reply["return"]

    def _monitor_reply(self) -> dict:
        try:
            line = self._monitor_stream.readline()
        except (TimeoutError, ConnectionError):
            line = b""
        if not line:
            raise MachineError(f"the monitor does not answer; {self._state()}")
        return json.loads(line)

    def _state(self) -> str:
        try:
            self._emulator.wait(1)  # its ends of the sockets close a moment before it ends
        except subprocess.TimeoutExpired:
            return f"the kernel's messages are in {self.log}"
        reason = self._emulator.stderr.read().decode(errors="replace").strip()
        return f"the emulator ended with status {self._emulator.returncode}: {reason}"


def _make_initramfs(programs: list[Path], modules: dict[str, Path]) -> Initramfs:
    busybox = Path(_tool("busybox", "busybox-static"))
    guest = Initramfs()
    for folder in ("bin", "dev", "proc", "sys", "tmp"):
        guest.add_folder(folder)
    guest.add_program(busybox)
    guest.add_file("/bin/busybox", busybox)
    guest.add_file("/init", Path(__file__).with_name("init"))
    for path, module in modules.items():
        guest.add_file(path, module)
    for program in programs:
        guest.add_program(program)
    return guest


def _tool(name: str, package: str) -> str:
    path = shutil.which(name)
    if path is None:
        raise MissingPart(f"{name} is missing: install the Debian package {package}")
    return path
