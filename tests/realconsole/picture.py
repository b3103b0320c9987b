"""Pictures of three bytes a pixel: read from the formats screens come in, written as PNG, compared."""

import struct
import zlib
from dataclasses import dataclass
from pathlib import Path


@dataclass(frozen=True)
class Picture:
    """Rows from top to bottom without padding, each pixel red, green, blue."""

    width: int
    height: int
    pixels: bytes

    def at(self, index: int) -> str:
        return self.pixels[3 * index : 3 * index + 3].hex().upper()


def read_ppm(path: Path) -> Picture:
    magic, size, deepest, pixels = path.read_bytes().split(b"\n", 3)
    width, height = map(int, size.split())
    if magic != b"P6" or deepest != b"255" or len(pixels) != 3 * width * height:
        raise ValueError(f"{path} is not a whole 8-bit PPM picture")
    return Picture(width, height, pixels)


def read_png(path: Path) -> Picture:
    """Reads 8-bit RGB or RGBA without interlace, which is what screenshots are; alpha is dropped."""
    data = path.read_bytes()
    if data[:8] != b"\x89PNG\r\n\x1a\n":
        raise ValueError(f"{path} is not a PNG file")
    packed = b""
    offset = 8
    while offset < len(data):
        length, kind = struct.unpack_from(">I4s", data, offset)
        content = data[offset + 8 : offset + 8 + length]
        if kind == b"IHDR":
            width, height, bits, colour_type, _, _, interlace = struct.unpack(">IIBBBBB", content)
            if bits != 8 or colour_type not in (2, 6) or interlace:
                raise ValueError(f"{path} is not an 8-bit RGB or RGBA picture without interlace")
        elif kind == b"IDAT":
            packed += content
        offset += 12 + length
    step = 3 if colour_type == 2 else 4
    rows = _unfilter(zlib.decompress(packed), step * width, height, step)
    if step == 4:
        rows = b"".join(rows[i : i + 3] for i in range(0, len(rows), 4))
    return Picture(width, height, rows)


def write_png(path: Path, picture: Picture) -> None:
    stride = 3 * picture.width
    rows = b"".join(b"\0" + picture.pixels[stride * y : stride * (y + 1)] for y in range(picture.height))
    header = struct.pack(">IIBBBBB", picture.width, picture.height, 8, 2, 0, 0, 0)
    chunks = ((b"IHDR", header), (b"IDAT", zlib.compress(rows, 6)), (b"IEND", b""))
    with path.open("wb") as output:
        output.write(b"\x89PNG\r\n\x1a\n")
        for kind, content in chunks:
            check = zlib.crc32(kind + content)
            output.write(struct.pack(">I", len(content)) + kind + content + struct.pack(">I", check))


def differing_pixels(one: Picture, other: Picture) -> list[int]:
    """The indices (row by row) of the pixels that differ in two pictures of one size."""
    if one.pixels == other.pixels:
        return []
    offsets = range(0, len(one.pixels), 3)
    return [i // 3 for i in offsets if one.pixels[i : i + 3] != other.pixels[i : i + 3]]


def difference(picture: Picture, marked: list[int]) -> Picture:
    """The picture, dimmed, with the marked pixels in red."""
    pixels = bytearray(value >> 2 for value in picture.pixels)
    for index in marked:
        pixels[3 * index : 3 * index + 3] = b"\xff\0\0"
    return Picture(picture.width, picture.height, bytes(pixels))


def _unfilter(data: bytes, stride: int, height: int, step: int) -> bytes:
    """Undoes the row filters of PNG: each row is a filter number and the differences from a prediction."""
    above = bytearray(step + stride)  # a pixel of zeros stands before each row
    rows = []
    for y in range(height):
        start = (stride + 1) * y
        kind = data[start]
        row = bytearray(step) + data[start + 1 : start + 1 + stride]
        if len(row) != step + stride or kind > 4:
            raise ValueError("damaged PNG rows")
        if kind:
            for i in range(step, step + stride):
                row[i] = (row[i] + _prediction(kind, row[i - step], above[i], above[i - step])) & 0xFF
        rows.append(bytes(row[step:]))
        above = row
    return b"".join(rows)


def _prediction(kind: int, left: int, up: int, up_left: int) -> int:
    if kind == 1:
        return left
    if kind == 2:
        return up
    if kind == 3:
        return (left + up) >> 1
    nearest = min(abs(up - up_left), abs(left - up_left), abs(left + up - 2 * up_left))
    if nearest == abs(up - up_left):
        return left
    return up if nearest == abs(left - up_left) else up_left
