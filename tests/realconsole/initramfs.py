"""Packs the files a guest boots from: a cpio archive in the kernel's own format, made without root."""

import os
import re
import stat
import subprocess
from pathlib import Path


class MissingPart(Exception):
    """Something the guest is made of is not on this machine; the text names what to install."""


class Initramfs:
    """Collects files by their path in the guest; folders on the way are made as needed."""

    def __init__(self) -> None:
        self._entries: dict[str, tuple[int, bytes]] = {}

    def add_file(self, guest_path: str, source: Path) -> None:
        """Puts a copy of `source`, executable, at the absolute `guest_path`."""
        path = os.path.normpath(guest_path).lstrip("/")
        self._add_folders(path)
        self._entries[path] = (stat.S_IFREG | 0o755, source.read_bytes())

    def add_program(self, program: Path) -> None:
        """Puts `program` and its shared libraries where they are on this machine, so that run paths hold."""
        self.add_file(str(program), program)
        for library in shared_libraries(program):
            self.add_file(library, Path(library))

    def add_folder(self, guest_path: str) -> None:
        path = guest_path.strip("/")
        self._add_folders(path)
        self._entries[path] = (stat.S_IFDIR | 0o755, b"")

    def write(self, archive: Path) -> None:
        with archive.open("wb") as output:
            for number, (path, (mode, content)) in enumerate(self._entries.items(), start=1):
                output.write(_record(number, path, mode, content))
            output.write(_record(0, "TRAILER!!!", 0, b""))

    def _add_folders(self, path: str) -> None:
        for parent in reversed(Path(path).parents[:-1]):
            self._entries.setdefault(str(parent), (stat.S_IFDIR | 0o755, b""))


def shared_libraries(program: Path) -> list[str]:
    """The absolute paths of everything the dynamic linker loads for `program`, the linker itself included."""
    # A static program makes ldd fail, with nothing to add.
    listing = subprocess.run(["ldd", program], capture_output=True, text=True, check=False).stdout
    missing = re.findall(r"(\S+) => not found", listing)
    if missing:
        raise MissingPart(f"{program} needs {', '.join(missing)}, which this machine does not have")
    return re.findall(r"(/\S+) \(0x", listing)


def _record(number: int, path: str, mode: int, content: bytes) -> bytes:
    """One archive member in the "newc" form: a header of hexadecimal fields, the name and the content,
    padded to a multiple of four bytes."""
    name = path.encode() + b"\0"
    owner = group = time = device = checksum = 0
    links = 1
    fields = [number, mode, owner, group, links, time, len(content)]
    fields += [device] * 4 + [len(name), checksum]
    header = b"070701" + b"".join(b"%08X" % field for field in fields)
    return _padded(header + name) + _padded(content)


def _padded(data: bytes) -> bytes:
    return data + bytes(-len(data) % 4)
