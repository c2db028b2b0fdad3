"""Trees, of closed surfaces throughout: they need no sorting and no transparency."""

from __future__ import annotations

import numpy as np

from images import Array as Picture
from images import clouds, distance_grid, grain, plain, shade
from mesh import Array, Mesh, add_grid, add_tube, rotation, scaling, translation, unit
from models import Material, Model

MATERIALS = {
    "bark": Material(texture="bark.png", specular=0.0, ambient=0.55),
    "leaves": Material(texture="leaves.png", specular=0.0, ambient=0.55),
    "needles": Material(texture="needles.png", specular=0.0, ambient=0.55),
}


def leaves() -> Picture:
    size = (128, 128)
    spots = clouds(size, (24, 24), 301, 2, 0.7)
    picture = shade(plain(*size, (0.250, 0.390, 0.120)), np.clip(0.90 + 0.42 * spots, 0.3, 1.5))
    return shade(picture, 1 + 0.10 * grain(size, 305))


def needles() -> Picture:
    size = (128, 128)
    _, down = distance_grid(*size)
    spots = clouds(size, (8, 40), 311, 3, 0.7)
    picture = shade(plain(*size, (0.140, 0.270, 0.130)), np.clip(0.9 + 0.45 * spots, 0.3, 1.6))
    return shade(picture, 0.72 + 0.5 * down)


def bark() -> Picture:
    return shade(plain(64, 64, (0.28, 0.21, 0.14)), 1 + 0.25 * clouds((64, 64), (3, 20), 321, 3))


def _crown(radius: float, height: float, seed: int, rows: int, columns: int, rough: float) -> Mesh:
    """A lumpy ball round the origin, its normals those of the smooth ball bent towards its lumps."""
    random = np.random.RandomState(seed)
    polar = np.linspace(0, np.pi, rows + 1)
    turn = np.linspace(0, 2 * np.pi, columns + 1)
    swell = 1 + rough * random.uniform(-1, 1, (columns + 1, rows + 1))
    swell[-1] = swell[0]
    swell[:, 0], swell[:, -1] = swell[0, 0], swell[0, -1]
    ball = np.stack([np.cos(turn)[:, None] * np.sin(polar), np.sin(turn)[:, None] * np.sin(polar),
                     np.broadcast_to(-np.cos(polar), (columns + 1, rows + 1))], axis=-1)
    points = ball * swell[..., None] * [radius, radius, height]
    uvs = np.stack(np.broadcast_arrays(turn[:, None] / (2 * np.pi) * 3, polar[None, :] / np.pi * 2), axis=-1)
    mesh = Mesh()
    add_grid(mesh, "leaves", points, unit(ball * [1 / radius, 1 / radius, 1 / height]), uvs)
    return mesh


def _tier(radius: float, height: float, seed: int, columns: int) -> Mesh:
    """One skirt of a fir: a cone with a ragged hem and a shallow underside."""
    random = np.random.RandomState(seed)
    turn = np.linspace(0, 2 * np.pi, columns + 1)
    reach = radius * (1 + 0.16 * np.where(np.arange(columns + 1) % 2, 1, -1) + random.uniform(-0.05, 0.05, columns + 1))
    reach[-1] = reach[0]
    ring = np.stack([np.cos(turn), np.sin(turn), np.zeros(columns + 1)], axis=-1)
    hem = ring * reach[:, None] + [0, 0, 0.0]
    hem[:, 2] -= 0.08 * height * (reach / radius - 1) * 5
    neck = ring * 0.03 + [0, 0, height]
    inner = ring * 0.25 * radius + [0, 0, 0.16 * height]
    outward = unit(ring * height + [0, 0, radius * 0.9])
    u = turn / (2 * np.pi) * 3

    def uv(low: float, high: float) -> Array:
        return np.stack(np.broadcast_arrays(u[:, None], np.array([low, high])[None, :]), axis=-1)

    mesh = Mesh()
    add_grid(mesh, "needles", np.stack([hem, neck], axis=1), np.stack([outward, outward], axis=1), uv(0, 0.95))
    below = unit(ring * 0.3 + [0, 0, -1.0])
    add_grid(mesh, "needles", np.stack([inner, hem], axis=1), np.stack([below, below], axis=1), uv(0.0, 0.1))
    return mesh


def fir_mesh(height: float, seed: int, tiers: int = 5, columns: int = 12) -> Mesh:
    mesh = Mesh()
    add_tube(mesh, "bark", (0, 0, -0.4), (0, 0, height * 0.3), 0.17, 7, 0.13, capped=False)
    for index in range(tiers):
        share = index / tiers
        skirt = _tier(height * 0.24 * (1 - share) ** 0.85 + 0.25, height * (0.36 - 0.12 * share), seed + index, columns)
        mesh.extend(skirt, translation(0, 0, height * (0.12 + 0.74 * share ** 0.92)) @ rotation("z", 37 * index))
    return mesh


def broadleaf_mesh(height: float, seed: int, balls: int = 7, rows: int = 6, columns: int = 9) -> Mesh:
    random = np.random.RandomState(seed)
    mesh = Mesh()
    add_tube(mesh, "bark", (0, 0, -0.4), (0, 0, height * 0.55), 0.26, 8, 0.15, capped=False)
    for angle in (30, 150, 265):
        away = 0.16 * height
        add_tube(mesh, "bark", (0, 0, height * 0.30), (away * np.cos(np.radians(angle)), away * np.sin(
            np.radians(angle)), height * 0.52), 0.12, 6, 0.06, capped=False)
    mesh.extend(_crown(0.25 * height, 0.24 * height, seed, rows, columns, 0.14), translation(0, 0, height * 0.72))
    for index in range(balls - 1):
        angle = 2 * np.pi * index / (balls - 1) + random.uniform(-0.3, 0.3)
        away = height * random.uniform(0.17, 0.23)
        size = height * random.uniform(0.14, 0.19)
        ball = _crown(size, size * random.uniform(0.8, 0.95), seed + 10 + index, rows, columns, 0.16)
        mesh.extend(ball, translation(away * np.cos(angle), away * np.sin(angle),
                                      height * random.uniform(0.48, 0.68)) @ rotation("z", 50 * index))
    return mesh


def fir() -> Model:
    model = Model("Fir", dict(MATERIALS))
    model.geometries["Fir_tree"] = fir_mesh(11.0, 401)
    return model


def oak() -> Model:
    model = Model("Oak", dict(MATERIALS))
    model.geometries["Oak_tree"] = broadleaf_mesh(9.0, 431)
    return model


def copse() -> Model:
    """A score of small trees on one spot, for backgrounds: coarser, as they are seen from afar."""
    model = Model("Copse", dict(MATERIALS))
    mesh = model.geometry("Copse_trees")
    random = np.random.RandomState(461)
    placed: list[Array] = []
    while len(placed) < 20:
        at = random.uniform(-19, 19, 2)
        if np.hypot(*at) > 20 or any(np.hypot(*(at - other)) < 4.6 for other in placed):
            continue
        placed.append(at)
        size = random.uniform(0.75, 1.2)
        tree = (fir_mesh(10.5, 470 + len(placed), 3, 8) if len(placed) % 5 < 2
                else broadleaf_mesh(8.0, 500 + len(placed), 4, 4, 7))
        turn = rotation("z", random.uniform(0, 360))
        mesh.extend(tree, translation(at[0], at[1], 0) @ turn @ scaling(size, size, size))
    return model
