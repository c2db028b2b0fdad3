"""Pictures for the vehicles: one atlas of details, the glass, the tyre and the van's livery."""

from __future__ import annotations

import numpy as np

from images import (Array, blend, clouds, distance_grid, fill, grain, plain, shade, text_width, write_text)
from mesh import Mesh

# Regions of the atlas: left, bottom, right, top in texture coordinates.
REGIONS = {
    "headlamp": (0.0, 0.75, 0.5, 1.0), "taillamp": (0.5, 0.75, 1.0, 1.0),
    "grille": (0.0, 0.5, 0.5, 0.75), "intake": (0.5, 0.5, 1.0, 0.75),
    "plate": (0.0, 0.375, 0.5, 0.5), "foglamp": (0.5, 0.375, 0.625, 0.5),
}
_SWATCHES = {"plastic": (0.035, 0.036, 0.04), "chrome": (0.62, 0.64, 0.67), "gap": (0.012, 0.012, 0.014),
             "rubber": (0.05, 0.05, 0.052), "red": (0.45, 0.02, 0.02), "amber": (0.75, 0.32, 0.03),
             "under": (0.03, 0.03, 0.03), "mirror": (0.42, 0.50, 0.58)}


def apply_atlas(mesh: Mesh) -> Mesh:
    """Moves the texture coordinates of "details:region" into the region; a swatch becomes one point."""
    result = Mesh()
    for material, chunks in mesh.chunks.items():
        name, _, region = material.partition(":")
        for chunk in chunks:
            uvs = chunk.uvs
            if region in _SWATCHES:
                index = list(_SWATCHES).index(region)
                uvs = np.tile([(index + 0.5) / 8, 0.0625], (len(uvs), 1))
            elif region:
                left, bottom, right, top = REGIONS[region]
                # Half a pixel of margin keeps the neighbours out of the filtered edge.
                uvs = np.clip(uvs, 0.01, 0.99) * [right - left, top - bottom] + [left, bottom]
            result.add(name, chunk.positions, chunk.normals, uvs, chunk.triangles)
    return result


def _disc(picture: Array, x: float, y: float, radius: float, colour: tuple[float, ...], soft: float = 0.03) -> Array:
    """A round spot; x across and radius in units of the picture's height, y down."""
    height, width = picture.shape[:2]
    across, down = distance_grid(height, width)
    away = np.hypot(across * width / height - x, down - y)
    return blend(picture, colour, np.clip((radius - away) / soft + 0.5, 0, 1))


def _headlamp() -> Array:
    lamp = plain(128, 256, (0.10, 0.11, 0.12))
    across, down = distance_grid(128, 256)
    lamp = blend(lamp, (0.30, 0.32, 0.34), 0.6 * np.clip(1 - np.abs(down - 0.45) * 2.4, 0, 1))
    for x in (0.62, 1.36):
        for radius, colour in ((0.33, (0.75, 0.77, 0.8)), (0.29, (0.16, 0.17, 0.19)),
                               (0.24, (0.88, 0.92, 0.97)), (0.15, (1.0, 1.0, 1.0)), (0.08, (0.78, 0.86, 0.95))):
            lamp = _disc(lamp, x, 0.47, radius, colour)
    lamp = blend(lamp, (0.98, 0.99, 1.0), ((down > 0.86) & (down < 0.95) & (across > 0.1)).astype(float))
    amber = (across > 0.06) & (across < 0.10) & (down > 0.5) & (down < 0.8)
    lamp = blend(lamp, (0.85, 0.40, 0.06), amber.astype(float))
    edge = np.minimum(np.minimum(across * 2, (1 - across) * 2), np.minimum(down, 1 - down))
    return blend(lamp, (0.02, 0.02, 0.025), np.clip(1 - edge / 0.05, 0, 1))


def _taillamp() -> Array:
    lamp = plain(128, 256, (0.46, 0.015, 0.02))
    across, down = distance_grid(128, 256)
    ribs = 0.75 + 0.25 * np.cos(across * 2 * np.pi * 16) * np.cos(down * 2 * np.pi * 6)
    lamp = shade(lamp, ribs)
    lamp = blend(lamp, (0.95, 0.10, 0.08), ((down > 0.12) & (down < 0.34) & (across < 0.93)).astype(float))
    lamp = blend(lamp, (0.92, 0.90, 0.88), ((down > 0.62) & (across > 0.62) & (across < 0.9)).astype(float) * 0.9)
    lamp = blend(lamp, (0.9, 0.42, 0.05), ((down > 0.62) & (across > 0.32) & (across < 0.6)).astype(float) * 0.9)
    edge = np.minimum(np.minimum(across * 2, (1 - across) * 2), np.minimum(down, 1 - down))
    return blend(lamp, (0.03, 0.01, 0.01), np.clip(1 - edge / 0.05, 0, 1))


def details() -> Array:
    """512 x 512: lamps, grille, intake, number plate and plain swatches."""
    atlas = plain(512, 512, (0.03, 0.03, 0.03))
    atlas[0:128, 0:256] = _headlamp()
    atlas[0:128, 256:512] = _taillamp()

    across, down = distance_grid(128, 256)
    grille = plain(128, 256, (0.012, 0.012, 0.014))
    bars = np.clip(np.cos(down * 2 * np.pi * 6) * 3 - 0.6, 0, 1)
    grille = blend(grille, (0.30, 0.31, 0.33), bars)
    frame = np.minimum(across * 2, np.minimum(down, 1 - down))
    atlas[128:256, 0:256] = blend(grille, (0.70, 0.72, 0.74), np.clip((0.075 - frame) / 0.02, 0, 1))

    intake = plain(128, 256, (0.014, 0.014, 0.016))
    comb = ((np.floor(across * 40) + np.floor(down * 14)) % 2)
    atlas[128:256, 256:512] = blend(intake, (0.075, 0.075, 0.08), comb)

    plate = plain(64, 256, (0.93, 0.93, 0.90))
    fill(plate, 0.0, 0.0, 0.09, 1.0, (0.05, 0.14, 0.55))
    write_text(plate, "VD 4711", (256 - text_width("VD 4711", 5)) // 2 + 10, 14, 5, (0.03, 0.03, 0.04))
    edge = np.ones((64, 256))
    edge[3:-3, 3:-3] = 0
    atlas[256:320, 0:256] = blend(plate, (0.06, 0.06, 0.06), edge)

    lamp = plain(64, 64, (0.04, 0.04, 0.045))
    for radius, colour in ((0.42, (0.6, 0.62, 0.65)), (0.35, (0.85, 0.88, 0.92)), (0.18, (1.0, 1.0, 1.0))):
        lamp = _disc(lamp, 0.5, 0.5, radius, colour)
    atlas[256:320, 256:320] = lamp

    for index, colour in enumerate(_SWATCHES.values()):
        atlas[448:512, index * 64:index * 64 + 64] = colour
    return atlas


def glass() -> Array:
    """Dark glazing that seems to mirror a sky: bright above, a soft horizon, dark below."""
    across, down = distance_grid(128, 256)
    sky = clouds((128, 256), (3, 4), 71, 4)
    picture = plain(128, 256, (0.035, 0.045, 0.055))
    picture = blend(picture, (0.36, 0.44, 0.52), np.clip(0.62 - 1.15 * down + 0.10 * sky, 0, 1))
    streak = np.clip(1 - np.abs((across - 0.35 * (1 - down)) * 5 - 1.4), 0, 1) * (1 - down)
    picture = blend(picture, (0.62, 0.70, 0.78), 0.35 * streak)
    return picture


def tyre() -> Array:
    """512 x 256: across the repeat along the tyre, down from one bead over the tread to the other."""
    across, down = distance_grid(256, 512)
    picture = plain(256, 512, (0.060, 0.060, 0.064))
    picture = shade(picture, 1 + 0.10 * grain((256, 512), 81))
    side = np.abs(down - 0.5) * 2      # 0 in the middle of the tread, 1 at the beads
    tread = side < 0.40
    slant = np.where(down > 0.5, across * 8 + side * 1.8, across * 8 - side * 1.8 + 0.5)
    grooves = (np.abs(slant - np.floor(slant) - 0.5) < 0.10) & (side > 0.09) & (side < 0.44)
    rings = (np.abs(side - 0.09) < 0.025) | (np.abs(side - 0.25) < 0.02) & tread
    picture = blend(picture, (0.012, 0.012, 0.013), (grooves | rings).astype(float))
    picture = blend(picture, (0.10, 0.10, 0.105), 0.8 * ((side > 0.52) & (side < 0.535)).astype(float))
    picture = blend(picture, (0.10, 0.10, 0.105), 0.8 * ((side > 0.92) & (side < 0.94)).astype(float))
    for top, flip in ((204, False), (30, True)):
        strip = plain(22, 512, (0.0, 0.0, 0.0))
        write_text(strip, "PANORAMA 205-55 R16", 60, 4, 2, (1.0, 1.0, 1.0))
        ink = strip[:, :, 0][::-1, ::-1] if flip else strip[:, :, 0]
        picture[top:top + 22] = blend(picture[top:top + 22], (0.22, 0.22, 0.23), ink)
    return picture


WHITE = (0.60, 0.605, 0.61)   # the van's lacquer


def livery() -> Array:
    """The panel on the van's side: 512 x 256, the owner's name over a swoosh."""
    across, down = distance_grid(256, 512)
    picture = blend(plain(256, 512, (0.03, 0.17, 0.42)), (0.08, 0.33, 0.66), 0.9 * down)
    wave = 0.70 - 0.16 * np.sin(across * np.pi * 0.9)
    picture = blend(picture, (0.88, 0.89, 0.90), np.clip((down - wave) * 60, 0, 1))
    picture = blend(picture, (0.98, 0.58, 0.05), np.clip((0.026 - np.abs(down - wave + 0.05)) * 90, 0, 1))
    write_text(picture, "ROAD", 60, 36, 9, (0.93, 0.95, 0.97))
    write_text(picture, "LAB", 300, 36, 9, (1.0, 0.68, 0.15))
    write_text(picture, "VEHICLE TESTING", 62, 218, 3, (0.04, 0.20, 0.46))
    return picture


def rim() -> Array:
    """Brushed alloy."""
    return shade(plain(64, 64, (0.60, 0.61, 0.63)), 1 + 0.03 * np.repeat(grain((64, 1), 91), 64, axis=1))


def dark() -> Array:
    return plain(16, 16, (0.05, 0.05, 0.055))


def disc() -> Array:
    """A brake disc, with its holes; the revolution runs across."""
    across, down = distance_grid(64, 256)
    picture = shade(plain(64, 256, (0.34, 0.33, 0.32)), 1 + 0.08 * np.repeat(grain((64, 1), 92), 256, axis=1))
    hole = np.hypot((across * 24) % 1 - 0.5, (down * 4 + np.floor(across * 24) * 0.33) % 1 - 0.5) < 0.22
    return blend(picture, (0.05, 0.05, 0.05), hole.astype(float))


def shadow() -> Array:
    """What the vehicle keeps from the sky: 64 x 128, black, opaque in the middle, gone at the edge."""
    across, down = distance_grid(64, 128)
    edge = np.minimum(np.minimum(across * 2.4, (1 - across) * 2.4), np.minimum(down, 1 - down))
    u = np.clip(edge / 0.28, 0, 1)
    return np.concatenate([np.zeros((64, 128, 3)), (0.85 * u * u * (3 - 2 * u))[:, :, None]], axis=2)
