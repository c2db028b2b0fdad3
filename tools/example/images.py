"""Pictures as arrays (rows from the top, columns, 3 or 4 channels of 0 to 1) and their PNG form."""

from __future__ import annotations

import struct
import zlib
from pathlib import Path

import numpy as np
from numpy.typing import NDArray

Array = NDArray[np.float64]

# 5 x 7 dots a letter, a row of five bits from the top; only what the textures spell.
_FONT = {
    "A": (14, 17, 17, 31, 17, 17, 17), "B": (30, 17, 17, 30, 17, 17, 30), "C": (14, 17, 16, 16, 16, 17, 14),
    "D": (30, 17, 17, 17, 17, 17, 30), "E": (31, 16, 16, 30, 16, 16, 31), "F": (31, 16, 16, 30, 16, 16, 16),
    "G": (14, 17, 16, 23, 17, 17, 15), "H": (17, 17, 17, 31, 17, 17, 17), "I": (14, 4, 4, 4, 4, 4, 14),
    "J": (7, 2, 2, 2, 2, 18, 12), "K": (17, 18, 20, 24, 20, 18, 17), "L": (16, 16, 16, 16, 16, 16, 31),
    "M": (17, 27, 21, 21, 17, 17, 17), "N": (17, 25, 21, 19, 17, 17, 17), "O": (14, 17, 17, 17, 17, 17, 14),
    "P": (30, 17, 17, 30, 16, 16, 16), "Q": (14, 17, 17, 17, 21, 18, 13), "R": (30, 17, 17, 30, 20, 18, 17),
    "S": (15, 16, 16, 14, 1, 1, 30), "T": (31, 4, 4, 4, 4, 4, 4), "U": (17, 17, 17, 17, 17, 17, 14),
    "V": (17, 17, 17, 17, 17, 10, 4), "W": (17, 17, 17, 21, 21, 27, 17), "X": (17, 17, 10, 4, 10, 17, 17),
    "Y": (17, 17, 10, 4, 4, 4, 4), "Z": (31, 1, 2, 4, 8, 16, 31), "0": (14, 17, 19, 21, 25, 17, 14),
    "1": (4, 12, 4, 4, 4, 4, 14), "2": (14, 17, 1, 6, 8, 16, 31), "3": (30, 1, 1, 14, 1, 1, 30),
    "4": (2, 6, 10, 18, 31, 2, 2), "5": (31, 16, 30, 1, 1, 17, 14), "6": (14, 16, 16, 30, 17, 17, 14),
    "7": (31, 1, 2, 4, 8, 8, 8), "8": (14, 17, 17, 14, 17, 17, 14), "9": (14, 17, 17, 15, 1, 1, 14),
    "-": (0, 0, 0, 14, 0, 0, 0), " ": (0, 0, 0, 0, 0, 0, 0),
}


def write_png(path: Path, picture: Array) -> None:
    pixels = (np.clip(picture, 0, 1) * 255 + 0.5).astype(np.uint8)
    height, width, channels = pixels.shape
    # The "sub" filter: textures are smooth along a row, so differences deflate better.
    left = np.zeros_like(pixels)
    left[:, 1:] = pixels[:, :-1]
    rows = np.concatenate([np.ones((height, 1), np.uint8), (pixels - left).reshape(height, -1)], axis=1)

    def chunk(kind: bytes, data: bytes) -> bytes:
        return struct.pack(">I", len(data)) + kind + data + struct.pack(">I", zlib.crc32(kind + data))

    header = struct.pack(">IIBBBBB", width, height, 8, 2 if channels == 3 else 6, 0, 0, 0)
    path.parent.mkdir(parents=True, exist_ok=True)
    path.write_bytes(b"\x89PNG\r\n\x1a\n" + chunk(b"IHDR", header)
                     + chunk(b"IDAT", zlib.compress(rows.tobytes(), 9)) + chunk(b"IEND", b""))


def read_png_pixels(data: bytes) -> tuple[tuple[int, int, int], NDArray[np.uint8]]:
    """Shape and pixels of a file that `write_png` made; for comparing two of them."""
    width, height, _, colour = struct.unpack(">IIBB", data[16:26])
    channels = 3 if colour == 2 else 4
    at, packed = 8, b""
    while at < len(data):
        length, = struct.unpack(">I", data[at:at + 4])
        if data[at + 4:at + 8] == b"IDAT":
            packed += data[at + 8:at + 8 + length]
        at += length + 12
    rows = np.frombuffer(zlib.decompress(packed), np.uint8).reshape(height, 1 + width * channels)
    steps = rows[:, 1:].reshape(height, width, channels)
    return (height, width, channels), np.cumsum(steps, axis=1, dtype=np.uint8)


def plain(height: int, width: int, colour: tuple[float, ...]) -> Array:
    return np.tile(np.array(colour, float), (height, width, 1))


def noise(size: tuple[int, int], cells: tuple[int, int], seed: int) -> Array:
    """Smooth noise of -1 to 1 that tiles: random values on a lattice, joined by cosine ramps."""
    lattice = np.random.RandomState(seed).uniform(-1, 1, cells)

    def ramp(count: int, steps: int) -> tuple[NDArray[np.int64], NDArray[np.int64], Array]:
        at = np.arange(count) * steps / count
        low = at.astype(int)
        part = at - low
        return low % steps, (low + 1) % steps, part * part * (3 - 2 * part)

    i0, i1, fi = ramp(size[0], cells[0])
    j0, j1, fj = ramp(size[1], cells[1])
    fi = fi[:, None]
    top = lattice[i0][:, j0] * (1 - fj) + lattice[i0][:, j1] * fj
    low = lattice[i1][:, j0] * (1 - fj) + lattice[i1][:, j1] * fj
    return top * (1 - fi) + low * fi


def clouds(size: tuple[int, int], cells: tuple[int, int], seed: int, octaves: int = 5,
           fade: float = 0.55) -> Array:
    """Noise summed over octaves, about -1 to 1."""
    total, weight, norm = np.zeros(size), 1.0, 0.0
    for octave in range(octaves):
        step = (min(cells[0] << octave, size[0]), min(cells[1] << octave, size[1]))
        total += weight * noise(size, step, seed + octave)
        norm += weight * weight
        weight *= fade
    return total / np.sqrt(norm) / 0.9


def grain(size: tuple[int, int], seed: int) -> Array:
    return np.random.RandomState(seed).normal(0, 1, size)


def blend(below: Array, above: tuple[float, ...] | Array, cover: Array | float) -> Array:
    """`above` over `below`, by a cover of 0 to 1 for each pixel."""
    share = np.asarray(cover, float)
    if share.ndim == 2:
        share = share[:, :, None]
    return below * (1 - share) + np.asarray(above, float) * share


def shade(picture: Array, factor: Array) -> Array:
    return picture * factor[:, :, None]


def fill(picture: Array, left: float, top: float, right: float, bottom: float,
         colour: tuple[float, ...]) -> None:
    """Paints a rectangle given in fractions of the picture, origin at the upper left."""
    height, width = picture.shape[:2]
    picture[round(top * height):round(bottom * height), round(left * width):round(right * width)] = colour


def write_text(picture: Array, text: str, left: int, top: int, dot: int, colour: tuple[float, ...]) -> None:
    """Letters of 5 x 7 dots; `dot` is the size of one in pixels."""
    for letter in text:
        for row, bits in enumerate(_FONT[letter]):
            for column in range(5):
                if bits >> (4 - column) & 1:
                    y, x = top + row * dot, left + column * dot
                    picture[y:y + dot, x:x + dot] = colour
        left += 6 * dot


def text_width(text: str, dot: int) -> int:
    return (6 * len(text) - 1) * dot


def few_tones(picture: Array) -> Array:
    """Rounds to 52 tones a channel: invisible where there is grain, and the file gets a good third smaller."""
    return np.round(picture * 51) / 51


def distance_grid(height: int, width: int) -> tuple[Array, Array]:
    """For each pixel its fractions (across, down) of the picture, at pixel centres."""
    down, across = np.meshgrid((np.arange(height) + 0.5) / height, (np.arange(width) + 0.5) / width,
                               indexing="ij")
    return across, down
