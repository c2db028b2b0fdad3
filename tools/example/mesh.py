"""Meshes as the generator builds them: triangles grouped by material.

Everything here is in scene axes, metres: x forward (or east), y left (or north), z up.
The model writers turn the result into the y-up axes that model files have.
"""

from __future__ import annotations

from collections.abc import Callable, Sequence
from dataclasses import dataclass, field

import numpy as np
from numpy.typing import NDArray

Array = NDArray[np.float64]


@dataclass
class Chunk:
    """Vertices with their normals, texture coordinates and the triangles over them."""

    positions: Array
    normals: Array
    uvs: Array
    triangles: NDArray[np.int64]


@dataclass
class Mesh:
    """A bag of chunks, keyed by the name of their material."""

    chunks: dict[str, list[Chunk]] = field(default_factory=dict)

    def add(self, material: str, positions: Array, normals: Array, uvs: Array,
            triangles: NDArray[np.int64]) -> None:
        if len(triangles):
            self.chunks.setdefault(material, []).append(Chunk(
                np.asarray(positions, float), np.asarray(normals, float),
                np.asarray(uvs, float), np.asarray(triangles, np.int64)))

    def extend(self, other: Mesh, matrix: Array | None = None) -> None:
        """Adds the triangles of `other`, placed by a 4x4 matrix for column vectors."""
        for material, chunks in other.chunks.items():
            for chunk in chunks:
                positions, normals, triangles = chunk.positions, chunk.normals, chunk.triangles
                if matrix is not None:
                    linear = matrix[:3, :3]
                    positions = positions @ linear.T + matrix[:3, 3]
                    normals = unit(normals @ np.linalg.inv(linear))
                    if np.linalg.det(linear) < 0:
                        triangles = triangles[:, ::-1]
                self.add(material, positions, normals, chunk.uvs, triangles)

    def merged(self) -> dict[str, Chunk]:
        """One chunk a material, without unused vertices and without collapsed triangles."""
        result = {}
        for material, chunks in self.chunks.items():
            starts = np.cumsum([0] + [len(c.positions) for c in chunks])
            triangles = np.concatenate([c.triangles + s for c, s in zip(chunks, starts)])
            positions = np.concatenate([c.positions for c in chunks])
            corners = positions[triangles]
            doubled = np.cross(corners[:, 1] - corners[:, 0], corners[:, 2] - corners[:, 0])
            triangles = triangles[np.linalg.norm(doubled, axis=1) > 1e-9]
            used, flat = np.unique(triangles, return_inverse=True)
            result[material] = Chunk(
                positions[used], np.concatenate([c.normals for c in chunks])[used],
                np.concatenate([c.uvs for c in chunks])[used], flat.reshape(-1, 3))
        return result

    def triangle_count(self) -> int:
        return sum(len(c.triangles) for chunks in self.chunks.values() for c in chunks)


def unit(vectors: Array) -> Array:
    length = np.linalg.norm(vectors, axis=-1, keepdims=True)
    return vectors / np.where(length > 1e-12, length, 1.0)


def translation(x: float, y: float, z: float) -> Array:
    matrix = np.eye(4)
    matrix[:3, 3] = x, y, z
    return matrix


def scaling(x: float, y: float, z: float) -> Array:
    return np.diag([x, y, z, 1.0])


def rotation(axis: str, degrees: float) -> Array:
    """Right-handed rotation about the named axis."""
    c, s = np.cos(np.radians(degrees)), np.sin(np.radians(degrees))
    i, j = {"x": (1, 2), "y": (2, 0), "z": (0, 1)}[axis]
    matrix = np.eye(4)
    matrix[i, i] = matrix[j, j] = c
    matrix[i, j], matrix[j, i] = -s, s
    return matrix


def grid_normals(points: Array) -> Array:
    """Smooth normals of a grid of points (rows, columns, 3): the cross product of d/row and d/column."""
    along_rows = np.gradient(points, axis=0)
    along_columns = np.gradient(points, axis=1)
    return unit(np.cross(along_rows, along_columns))


def add_grid(mesh: Mesh, material: str | Callable[[int, int], str | None], points: Array,
             normals: Array | None = None, uvs: Array | None = None, flip: bool = False) -> None:
    """Adds the quads of a grid (rows, columns, 3); a cell without a material stays open.

    Without flip the front face is where d/row x d/column points to; normals follow the flip
    only when they are made here.
    """
    rows, columns = points.shape[:2]
    if normals is None:
        normals = grid_normals(points) * (-1 if flip else 1)
    if uvs is None:
        v, u = np.meshgrid(np.linspace(0, 1, rows), np.linspace(0, 1, columns), indexing="ij")
        uvs = np.stack([u, v], axis=-1)
    cells: dict[str, list[tuple[int, int, int]]] = {}
    for i in range(rows - 1):
        for j in range(columns - 1):
            name = material if isinstance(material, str) else material(i, j)
            if name is None:
                continue
            a, b = i * columns + j, i * columns + j + 1
            c, d = a + columns, b + columns
            quad = [(a, c, d), (a, d, b)] if not flip else [(a, d, c), (a, b, d)]
            cells.setdefault(name, []).extend(quad)
    for name, triangles in cells.items():
        mesh.add(name, points.reshape(-1, 3), normals.reshape(-1, 3), uvs.reshape(-1, 2),
                 np.array(triangles))


def add_polygon(mesh: Mesh, material: str, corners: Sequence[Sequence[float]],
                uvs: Sequence[Sequence[float]] | None = None) -> None:
    """A flat convex polygon, counter-clockwise seen from its front."""
    points = np.array(corners, float)
    normal = unit(np.cross(points[1] - points[0], points[2] - points[0]))
    if uvs is None:
        uvs = [(0, 0), (1, 0), (1, 1), (0, 1)][:len(points)] if len(points) < 5 else [(0, 0)] * len(points)
    fan = np.array([(0, i, i + 1) for i in range(1, len(points) - 1)])
    mesh.add(material, points, np.tile(normal, (len(points), 1)), np.array(uvs, float), fan)


def add_box(mesh: Mesh, material: str, low: Sequence[float], high: Sequence[float],
            texel: float | None = None, sides: str = "xXyYzZ") -> None:
    """An upright box. `texel` metres make one texture repeat; without it each side shows the whole.

    `sides` names the faces to make: a small letter for the lower end of an axis, a capital for
    the upper one.
    """
    x0, y0, z0 = low
    x1, y1, z1 = high
    faces = {
        "x": [(x0, y1, z0), (x0, y0, z0), (x0, y0, z1), (x0, y1, z1)],
        "X": [(x1, y0, z0), (x1, y1, z0), (x1, y1, z1), (x1, y0, z1)],
        "y": [(x0, y0, z0), (x1, y0, z0), (x1, y0, z1), (x0, y0, z1)],
        "Y": [(x1, y1, z0), (x0, y1, z0), (x0, y1, z1), (x1, y1, z1)],
        "z": [(x0, y1, z0), (x1, y1, z0), (x1, y0, z0), (x0, y0, z0)],
        "Z": [(x0, y0, z1), (x1, y0, z1), (x1, y1, z1), (x0, y1, z1)],
    }
    for side in sides:
        corners = np.array(faces[side])
        uvs = None
        if texel:
            width = np.linalg.norm(corners[1] - corners[0]) / texel
            height = np.linalg.norm(corners[3] - corners[0]) / texel
            uvs = [(0, 0), (width, 0), (width, height), (0, height)]
        add_polygon(mesh, material, corners, uvs)


def add_revolution(mesh: Mesh, material: str, profile: Sequence[Sequence[float]], axis: str = "z",
                   segments: int = 16, crease: float = 40.0, repeat: float = 1.0) -> None:
    """Turns a profile of (radius, height) points about an axis; walked so that it lies outside on the right.

    Where the profile bends by more than `crease` degrees the surface gets a sharp edge.
    """
    points = np.array(profile, float)
    steps = unit(np.diff(points, axis=0))
    runs, start = [], 0
    for i in range(1, len(steps)):
        if np.degrees(np.arccos(np.clip(steps[i - 1] @ steps[i], -1, 1))) > crease:
            runs.append((start, i))
            start = i
    runs.append((start, len(steps)))
    angle = np.linspace(0, 2 * np.pi, segments + 1)
    length = np.concatenate([[0], np.cumsum(np.linalg.norm(np.diff(points, axis=0), axis=1))])
    for first, last in runs:
        part = points[first:last + 1]
        outward = np.zeros_like(part)
        for i in range(first, last + 1):
            near = steps[max(first, i - 1):min(last, i + 1)].sum(axis=0)
            outward[i - first] = near[1], -near[0]
        outward = unit(outward)
        ring = np.stack([np.cos(angle), np.sin(angle)], axis=-1)

        def spun(pairs: Array) -> Array:
            radial = pairs[None, :, :1] * ring[:, None, :]
            height = np.broadcast_to(pairs[None, :, 1:], radial.shape[:2] + (1,))
            order = {"z": [radial[..., :1], radial[..., 1:], height],
                     "y": [radial[..., 1:], height, radial[..., :1]],
                     "x": [height, radial[..., :1], radial[..., 1:]]}[axis]
            return np.concatenate(order, axis=-1)

        v = length[first:last + 1] / max(length[-1], 1e-9)
        uvs = np.stack(np.broadcast_arrays(angle[:, None] / (2 * np.pi) * repeat, v[None, :]), axis=-1)
        add_grid(mesh, material, spun(part), spun(outward), uvs)


def add_tube(mesh: Mesh, material: str, start: Sequence[float], end: Sequence[float],
             radius: float, segments: int = 8, end_radius: float | None = None,
             capped: bool = True) -> None:
    """A straight round bar between two points."""
    a, b = np.array(start, float), np.array(end, float)
    along = unit(b - a)
    side = unit(np.cross(along, [0.0, 0.0, 1.0] if abs(along[2]) < 0.9 else [1.0, 0.0, 0.0]))
    up = np.cross(side, along)
    matrix = np.eye(4)
    matrix[:3, :3] = np.stack([up, side, along], axis=1)
    if np.linalg.det(matrix[:3, :3]) < 0:
        matrix[:3, 0] *= -1
    matrix[:3, 3] = a
    last = radius if end_radius is None else end_radius
    length = float(np.linalg.norm(b - a))
    profile = [(radius, 0.0), (last, length)]
    if capped:
        profile = [(0.0, 0.0)] + profile + [(0.0, length)]
    bar = Mesh()
    add_revolution(bar, material, profile, "z", segments)
    mesh.extend(bar, matrix)
