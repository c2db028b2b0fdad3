"""Comparing what the generator makes with what is committed, as exactly as other machines can reproduce it."""

from __future__ import annotations

import re
from pathlib import Path

import numpy as np

import mdf
from images import read_png_pixels

_NUMBER = re.compile(r"-?\d+(?:\.\d+)?(?:e-?\d+)?")


def compare_folders(made: Path, kept: Path) -> list[str]:
    """One line for each file that is missing, left over or different."""
    def files(folder: Path) -> dict[str, Path]:
        return {path.relative_to(folder).as_posix(): path for path in sorted(folder.rglob("*")) if path.is_file()}

    new, old = files(made), files(kept)
    differences = [f"{name}: not committed" for name in new if name not in old]
    differences += [f"{name}: committed, but not made" for name in old if name not in new]
    for name in new:
        if name in old:
            reason = _difference(new[name], old[name])
            if reason:
                differences.append(f"{name}: {reason}")
    return differences


def _difference(made: Path, kept: Path) -> str:
    a, b = made.read_bytes(), kept.read_bytes()
    if a == b:
        return ""
    if made.suffix == ".png":
        (shape_a, pixels_a), (shape_b, pixels_b) = read_png_pixels(a), read_png_pixels(b)
        if shape_a != shape_b:
            return f"{shape_b} pixels, made with {shape_a}"
        apart = np.abs(pixels_a.astype(int) - pixels_b.astype(int))
        return "" if apart.mean() < 0.05 else f"pixels differ by {apart.mean():.2f} of 255 on average"
    if made.suffix == ".mdf":
        (text_a, frames_a), (text_b, frames_b) = mdf.read(made), mdf.read(kept)
        if text_a != text_b or len(frames_a) != len(frames_b):
            return "another description or number of frames"
        apart = max(float(np.max(np.abs(frames_a[part] - frames_b[part]))) for part in ("time", "pose"))
        return "" if apart < 1e-3 else f"poses differ by up to {apart:.3g}"
    return _text_difference(a.decode(), b.decode())


def _text_difference(made: str, kept: str) -> str:
    """Texts are the same if they are but for their numbers, and those are close."""
    if _NUMBER.sub("#", made) != _NUMBER.sub("#", kept):
        return "another text"
    a, b = (np.array(_NUMBER.findall(text), float) for text in (made, kept))
    apart = float(np.max(np.abs(a - b), initial=0))
    return "" if apart < 2e-3 else f"numbers differ by up to {apart:.3g}"


def shader_difference(assets: Path) -> list[str]:
    """The shader of the bump base must be that of the road, which GLSL 1.20 can only have by copying."""
    def body(name: str) -> str:
        return (assets / name).read_text(encoding="utf-8").partition("#version")[2]

    pairs = (("PixShader.frag", "BumpBaseShader.frag"), ("VtxShader.vert", "BumpBaseShader.vert"))
    return [f"{second}: differs from {first} below its first comment" for first, second in pairs
            if body(first) != body(second)]
