"""Motion data files (".mdf"), as docs/motion-data-format.md lays them out."""

from __future__ import annotations

import json
from pathlib import Path

import numpy as np
from numpy.typing import NDArray

_MAGIC = b"\x89PMDF\r\n\x1a"
_HEADER = "<u4,<u4,<u4,<u4,<u8,<u4,<u4"


def frame_type(description: dict) -> np.dtype:
    return np.dtype([("time", "<f8"), ("pose", "<f4", (len(description["poses"]), 4, 4)),
                     ("value", "<f8", (len(description["instruments"]),))])


def write(path: Path, description: dict, frames: NDArray) -> None:
    text = json.dumps(description).encode()
    text += b" " * (-(40 + len(text)) % 8)
    counts = (1, len(description["poses"]), len(description["instruments"]), frames.dtype.itemsize,
              len(frames), len(text), 0)
    path.write_bytes(_MAGIC + np.array([counts], _HEADER).tobytes() + text + frames.tobytes())


def read(path: Path) -> tuple[dict, NDArray]:
    data = path.read_bytes()
    if data[:8] != _MAGIC:
        raise ValueError(f"{path} is no motion data file")
    length = int(np.frombuffer(data[8:40], _HEADER)[0][5])
    description = json.loads(data[40:40 + length])
    return description, np.frombuffer(data[40 + length:], frame_type(description))
