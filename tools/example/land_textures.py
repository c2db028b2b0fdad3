"""Pictures of the ground: asphalt, what is painted on it, gravel, grass, fields, woods, the sky."""

from __future__ import annotations

import numpy as np

from images import (Array, blend, clouds, distance_grid, few_tones, fill, grain, noise, plain, shade, write_text)


def _soft_grain(size: tuple[int, int], seed: int) -> Array:
    """Grain that repeats without a seam, softened by its neighbours."""
    dots = grain(size, seed)
    return (dots + np.roll(dots, 1, 0) + np.roll(dots, 1, 1) + np.roll(dots, (1, 1), (0, 1))) / 2


def asphalt() -> Array:
    """512 x 1024 for 8 x 16 m: two lanes, edge lines, a broken centre line. Travel runs upwards."""
    size = (1024, 512)
    across, down = distance_grid(*size)
    metres = across * 8
    tone = 0.315 + 0.016 * clouds(size, (8, 4), 101, 4) + 0.022 * _soft_grain(size, 105)
    for track in (1.25, 2.75, 5.25, 6.75):
        tone -= 0.016 * np.exp(-((metres - track) / 0.28) ** 2)
    for middle in (2.0, 6.0):
        tone += 0.008 * np.exp(-((metres - middle) / 0.3) ** 2)
    picture = tone[:, :, None] * np.array([0.99, 1.0, 1.03])
    worn = 0.86 + 0.10 * clouds(size, (32, 16), 109, 3)
    lines = ((np.abs(metres - 0.32) < 0.075) | (np.abs(metres - 7.68) < 0.075)
             | ((np.abs(metres - 4) < 0.07) & (np.mod(down * 2, 1) < 0.5)))
    return few_tones(blend(picture, (0.80, 0.80, 0.77), np.clip(worn, 0, 1) * lines))


_LEAST_ALPHA = 0.05


def markings() -> Array:
    """1024 x 1024 with alpha: chequers, zebra, arrow, the word SLOW, a repair, a hump, a manhole cover."""
    size = 1024
    picture = np.zeros((size, size, 4))
    wear = np.clip(0.92 + 0.16 * clouds((size, size), (48, 48), 121, 3), 0, 1)
    white, ink = np.array([0.82, 0.82, 0.80]), np.array([0.05, 0.05, 0.055])

    def part(left: float, bottom: float, right: float, top: float) -> tuple[slice, slice]:
        return (slice(round((1 - top) * size), round((1 - bottom) * size)),
                slice(round(left * size), round(right * size)))

    # The start line, 7.5 m by 1.6 m.
    where = part(0.0, 0.75, 0.5, 1.0)
    across, down = distance_grid(256, 512)
    chequer = ((np.floor(across * 18) + np.floor(down * 4)) % 2).astype(bool)
    picture[where] = np.concatenate([np.where(chequer[:, :, None], white, ink), wear[where][:, :, None]], axis=2)
    # A zebra crossing, 7.5 m by 3.5 m.
    where = part(0.5, 0.75, 1.0, 1.0)
    picture[where] = (*white, 0)
    picture[where][:, :, 3] = (np.mod(across * 7.5 + 0.25, 1.0) < 0.5) * wear[where]
    # An arrow straight ahead, 2 m by 5 m.
    where = part(0.0, 0.25, 0.25, 0.75)
    across, down = distance_grid(512, 256)
    middle = np.abs(across - 0.5)
    head = (down > 0.06) & (down < 0.42) & (middle < (down - 0.06) * 0.75)
    arrow = head | (down >= 0.42) & (down < 0.97) & (middle < 0.065)
    picture[where] = (*white, 0)
    picture[where][:, :, 3] = arrow * wear[where]
    # A word, stretched along the road as such words are, 2.4 m by 6 m.
    where = part(0.25, 0.25, 0.5, 0.75)
    word = plain(64, 128, (0.0,))
    write_text(word, "SLOW", 6, 8, 5, (1.0,))
    stretched = np.kron(word[:, :, 0], np.ones((8, 2)))
    picture[where] = (*white, 0)
    picture[where][:, :, 3] = stretched * wear[where]
    # A repair: darker asphalt with a frayed, tarred edge.
    where = part(0.5, 0.25, 1.0, 0.75)
    across, down = distance_grid(512, 512)
    edge = np.minimum(np.minimum(across, 1 - across), np.minimum(down, 1 - down))
    edge = edge + 0.012 * clouds((512, 512), (16, 16), 131, 3)
    tone = 0.225 + 0.02 * _soft_grain((512, 512), 135) - 0.10 * np.exp(-((edge - 0.035) / 0.014) ** 2)
    picture[where] = np.concatenate([np.repeat(tone[:, :, None], 3, axis=2),
                                     np.clip((edge - 0.018) * 120, 0, 0.96)[:, :, None]], axis=2)
    # A hump of rubber blocks, yellow and black.
    where = part(0.0, 0.0, 0.5, 0.25)
    across, down = distance_grid(256, 512)
    block = np.mod(np.floor(across * 12), 2) > 0
    tone = 0.9 + 0.12 * clouds((256, 512), (16, 32), 141, 4)
    joint = np.minimum(np.mod(across * 12, 1), 1 - np.mod(across * 12, 1)) < 0.03
    colour = np.where(block[:, :, None], (0.80, 0.58, 0.03), (0.07, 0.07, 0.075)) * tone[:, :, None]
    colour[joint] = 0.02
    picture[where] = np.concatenate([colour, np.ones((256, 512, 1))], axis=2)
    # A manhole cover.
    where = part(0.5, 0.0, 0.625, 0.125)
    across, down = distance_grid(128, 128)
    radius = np.hypot(across - 0.5, down - 0.5)
    ribs = 0.16 + 0.06 * ((np.floor(across * 12) + np.floor(down * 12)) % 2)
    ribs = np.where((radius > 0.40) & (radius < 0.43), 0.06, ribs)
    picture[where] = np.concatenate([np.repeat(ribs[:, :, None], 3, axis=2),
                                     np.clip((0.47 - radius) * 60, 0, 1)[:, :, None]], axis=2)
    # Nothing is quite clear: pixels that an alpha test drops would leave no depth, and what lies behind
    # the road would show through it.
    clear = picture[:, :, 3] < _LEAST_ALPHA
    picture[clear] = (0.31, 0.31, 0.32, _LEAST_ALPHA)
    # And nothing quite opaque: the road's shader grains opaque surfaces only.
    picture[:, :, 3] = np.minimum(picture[:, :, 3], 0.96)
    return picture


def gravel() -> Array:
    size = (256, 256)
    tone = 0.36 + 0.06 * _soft_grain(size, 151) + 0.03 * clouds(size, (8, 8), 152, 4)
    return np.clip(tone, 0.1, 0.6)[:, :, None] * np.array([1.0, 0.95, 0.86])


def kerb() -> Array:
    picture = plain(128, 64, (0.74, 0.74, 0.72))
    fill(picture, 0, 0, 1, 0.5, (0.62, 0.05, 0.04))
    return shade(picture, 0.95 + 0.06 * clouds((128, 64), (8, 4), 161, 3))


def grass() -> Array:
    """1024 x 1024 for 40 m, without anything large that would show the repeat from above."""
    size = (1024, 1024)
    blades = _soft_grain(size, 171)
    patch = clouds(size, (14, 14), 172, 5, 0.66)
    dry = np.clip(clouds(size, (11, 11), 181, 4) * 0.5, 0, 1)
    picture = plain(*size, (0.255, 0.370, 0.120))
    picture = blend(picture, (0.340, 0.435, 0.165), np.clip(0.5 + 0.4 * patch, 0, 1))
    picture = blend(picture, (0.450, 0.440, 0.230), 0.5 * dry)
    return few_tones(shade(picture, 1 + 0.11 * blades))


def _rows(colour_a: tuple[float, float, float], colour_b: tuple[float, float, float], rows: int, seed: int,
          rough: float) -> Array:
    size = (256, 256)
    _, down = distance_grid(*size)
    wave = 0.5 + 0.5 * np.sin(2 * np.pi * (down * rows + 0.10 * noise(size, (8, 8), seed)))
    picture = blend(plain(*size, colour_a), colour_b, wave)
    return shade(picture, 1 + rough * _soft_grain(size, seed + 1) + 0.06 * clouds(size, (4, 4), seed + 2, 4))


def wheat() -> Array:
    return _rows((0.62, 0.51, 0.24), (0.70, 0.59, 0.29), 12, 191, 0.09)


def soil() -> Array:
    return _rows((0.26, 0.19, 0.13), (0.40, 0.30, 0.21), 8, 201, 0.10)


def rape() -> Array:
    return _rows((0.62, 0.60, 0.10), (0.80, 0.74, 0.10), 10, 211, 0.12)


def crop() -> Array:
    return _rows((0.17, 0.30, 0.09), (0.28, 0.43, 0.12), 14, 221, 0.10)


def wood() -> Array:
    """Tree tops seen from far away."""
    size = (512, 512)
    crowns = clouds(size, (40, 40), 231, 3, 0.6)
    tone = np.clip(0.85 + 0.26 * crowns + 0.12 * clouds(size, (5, 5), 235, 4), 0.25, 1.4)
    return shade(plain(*size, (0.235, 0.325, 0.215)), tone)


def sky() -> Array:
    """1024 x 512: the lower edge a little under the horizon, the upper one overhead."""
    size = (512, 1024)
    _, down = distance_grid(*size)
    height = 1 - down
    picture = plain(*size, (0.785, 0.885, 0.975))
    picture = blend(picture, (0.30, 0.53, 0.86), np.clip((height - 0.06) * 1.9, 0, 1) ** 0.75)
    # Towards the zenith a row of the picture covers less sky, so the clouds there are broader.
    field = clouds(size, (7, 9), 241, 7, 0.58)
    detail = clouds(size, (20, 30), 251, 5, 0.6)
    cover = np.clip((field + 0.25 * detail - 0.30) * 1.9, 0, 1) * np.clip((height - 0.09) * 7, 0, 1)
    cover *= np.clip((0.93 - height) * 5, 0, 1)
    lit = np.clip(0.93 + 0.10 * np.roll(field, 6, axis=0) - 0.10 * field, 0.78, 1)
    white = lit[:, :, None] * np.array([1.0, 1.0, 1.01])
    return blend(picture, np.clip(white, 0, 1), 0.88 * cover ** 1.2)
