"""The landscape round the course: meadows that join its verge vertex by vertex, fields, a rim of hills."""

from __future__ import annotations

import numpy as np
from numpy.typing import NDArray

from course import EDGE, EDGE_HEIGHT, GRASS_REPEAT, Course
from curves import smoothstep
from delaunay import missing_edges, triangulate
from images import noise
from mesh import Array, unit
from models import Material, Model

RADIUS = 1500.0
_CALM = 62.0       # metres from the course within which the land stays level
_FIELD_STEP = 14.0   # along the outline of a field
# Fields: name of the material, middle x and y, half length and half width, turn in degrees.
FIELDS = [
    ("wheat", 40, -265, 120, 60, 4), ("soil", 330, -255, 90, 62, -14), ("rape", -250, -285, 110, 62, 10),
    ("soil", -10, 285, 110, 58, 12), ("wheat", 260, 235, 115, 70, -18), ("rape", 440, -30, 62, 110, 6),
    ("wheat", -430, 70, 70, 120, 10), ("crop", -300, 270, 100, 65, -24), ("crop", 480, 190, 70, 75, -12),
    ("crop", -470, -190, 85, 70, 20),
]


class Terrain:
    """Heights of the land; the course itself lies in the plane z = 0."""

    def __init__(self, course: Course) -> None:
        self._course = course
        self._swell = noise((192, 192), (16, 16), 5)
        self._rough = noise((192, 192), (48, 48), 6)

    def height(self, points: Array) -> Array:
        points = np.atleast_2d(points)
        away = self._course.distance(points)
        middle = np.hypot(points[:, 0], points[:, 1] * 1.15)

        def sample(table: Array, scale: float) -> Array:
            u = (points / scale + 1.5) * 64.0
            i, j = np.floor(u[:, 0]).astype(int), np.floor(u[:, 1]).astype(int)
            fx, fy = u[:, 0] - i, u[:, 1] - j
            n = len(table)
            row0, row1 = table[i % n, j % n], table[(i + 1) % n, j % n]
            col0, col1 = table[i % n, (j + 1) % n], table[(i + 1) % n, (j + 1) % n]
            return (row0 * (1 - fx) + row1 * fx) * (1 - fy) + (col0 * (1 - fx) + col1 * fx) * fy

        swell, rough = sample(self._swell, 1500.0), sample(self._rough, 1500.0)
        calm = smoothstep(_CALM, _CALM + 160, away)
        hills = smoothstep(520, 1250, middle)
        rise = calm * (2.5 + 3.0 * swell) + hills * (75 + 55 * swell + 14 * rough) + 1.2 * calm * rough
        return EDGE_HEIGHT * (1 - smoothstep(EDGE, EDGE + 14, away)) + rise


def _field_corners(field: tuple[str, float, float, float, float, float]) -> Array:
    _, x, y, a, b, turn = field
    c, s = np.cos(np.radians(turn)), np.sin(np.radians(turn))
    local = np.array([(-a, -b), (a, -b), (a, b), (-a, b)])
    return local @ np.array([[c, s], [-s, c]]) + (x, y)


def in_field(points: Array) -> Array:
    """Index of the field that each point lies in, -1 for none."""
    result = np.full(len(points), -1)
    for index, (_, x, y, a, b, turn) in enumerate(FIELDS):
        c, s = np.cos(np.radians(turn)), np.sin(np.radians(turn))
        local = (points - (x, y)) @ np.array([[c, -s], [s, c]])
        result[(np.abs(local[:, 0]) <= a) & (np.abs(local[:, 1]) <= b)] = index
    return result


def _landscape_points(course: Course) -> tuple[Array, list[tuple[int, int]]]:
    """The verge's rim and the outlines of the fields, with the edges to keep, and a graded filling."""
    fixed: list[Array] = []
    edges: list[tuple[int, int]] = []

    def outline(line: Array) -> None:
        first, count = sum(map(len, fixed)), len(line)
        fixed.append(line)
        edges.extend((first + i, first + (i + 1) % count) for i in range(count))

    outline(course.point(course.s, EDGE))
    outline(course.point(course.s, -EDGE))
    for field in FIELDS:
        corners = _field_corners(field)
        sides = []
        for i in range(4):
            a, b = corners[i], corners[(i + 1) % 4]
            steps = max(2, round(float(np.linalg.norm(b - a)) / _FIELD_STEP))
            sides.append(a + (b - a) * (np.arange(steps) / steps)[:, None])
        outline(np.concatenate(sides))
    taken = np.concatenate(fixed)
    random = np.random.RandomState(23)
    loose = []
    for inner, outer, spacing in ((0, 340, 22), (340, 700, 34), (700, RADIUS + 1, 62)):
        ticks = np.arange(-outer, outer + spacing, spacing)
        cells = np.stack(np.meshgrid(ticks, ticks, indexing="ij"), axis=-1).reshape(-1, 2)
        cells = cells + random.uniform(-0.28, 0.28, cells.shape) * spacing
        distance = np.hypot(cells[:, 0], cells[:, 1])
        cells = cells[(distance >= inner) & (distance < outer)]
        gap = np.min(np.linalg.norm(cells[:, None, :] - taken[None, :, :], axis=2), axis=1)
        loose.append(cells[(gap > 0.75 * _FIELD_STEP) & (course.distance(cells) > EDGE + 5)])
    angle = np.linspace(0, 2 * np.pi, 120, endpoint=False)
    rim = (RADIUS + 40) * np.stack([np.cos(angle), np.sin(angle)], axis=-1)
    return np.concatenate([taken, *loose, rim]), edges


def terrain_model(course: Course, terrain: Terrain) -> Model:
    model = Model("Ground", {
        name: Material(texture=f"{name}.png", specular=0.0, ambient=0.45)
        for name in ("grass", "wheat", "soil", "rape", "crop", "wood")})
    points, edges = _landscape_points(course)
    triangles = triangulate(points)
    lost = missing_edges(triangles, edges)
    if lost:
        raise RuntimeError(f"the landscape lost {len(lost)} edges of the course or its fields")
    heights = terrain.height(points)
    rim_count = 2 * len(course.s)
    heights[:rim_count] = EDGE_HEIGHT
    solid = np.concatenate([points, heights[:, None]], axis=1)
    middles = points[triangles].mean(axis=1)
    triangles = triangles[course.distance(middles) > EDGE - 0.3]
    middles = points[triangles].mean(axis=1)

    corners = solid[triangles]
    faces = np.cross(corners[:, 1] - corners[:, 0], corners[:, 2] - corners[:, 0])
    normals = np.zeros_like(solid)
    for k in range(3):
        np.add.at(normals, triangles[:, k], faces)
    normals = unit(normals)
    # Level with the verge, whose own normals are all but upright.
    normals[:rim_count] = (0, 0, 1)

    field = in_field(middles)
    high = heights[triangles].mean(axis=1)
    kinds = np.array(["grass"] * len(triangles), dtype=object)
    for index, (name, *_) in enumerate(FIELDS):
        kinds[field == index] = name
    kinds[(high > 26) & (field < 0)] = "wood"
    mesh = model.geometry("Ground_surface")
    for name in model.materials:
        chosen = triangles[kinds == name]
        mesh.add(name, solid, normals, _uvs(name, points, field, triangles), chosen)
    return model


def _uvs(name: str, points: Array, field: Array, triangles: NDArray[np.int64]) -> Array:
    """The grass lies on the plane like the verge's; a field's furrows run along its longer side."""
    repeat = {"grass": GRASS_REPEAT, "wood": 90.0}.get(name, 12.0)
    uvs = points / repeat
    for index, (kind, x, y, a, b, turn) in enumerate(FIELDS):
        if kind == name:
            own = np.unique(triangles[field == index])
            angle = np.radians(turn + (0 if a > b else 90))
            c, s = np.cos(angle), np.sin(angle)
            uvs[own] = ((points[own] - (x, y)) @ np.array([[c, -s], [s, c]])) / repeat
    return uvs
