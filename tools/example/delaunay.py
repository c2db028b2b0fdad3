"""Delaunay triangulation of points in the plane, by insertion (Bowyer and Watson)."""

from __future__ import annotations

import numpy as np
from numpy.typing import NDArray

from mesh import Array


def triangulate(points: Array) -> NDArray[np.int64]:
    """Counter-clockwise triangles as rows of indices. A few thousand points take a few seconds."""
    count = len(points)
    span = float(np.ptp(points, axis=0).max()) * 50
    middle = points.mean(axis=0)
    all_points = np.concatenate([points, middle + span * np.array([(-1, -1), (1, -1), (0, 1)])])
    capacity = 2 * count + 64
    corners = np.zeros((capacity, 3), np.int64)
    circles = np.zeros((capacity, 3))    # centre and squared radius; radius -1 marks a free row
    circles[:, 2] = -1
    free = list(range(capacity - 1, -1, -1))

    def insert(triangle: tuple[int, int, int]) -> None:
        a, b, c = all_points[list(triangle)]
        d = 2 * ((b[0] - a[0]) * (c[1] - a[1]) - (b[1] - a[1]) * (c[0] - a[0]))
        b2, c2 = (b - a) @ (b - a), (c - a) @ (c - a)
        centre = np.array([(c[1] - a[1]) * b2 - (b[1] - a[1]) * c2, (b[0] - a[0]) * c2 - (c[0] - a[0]) * b2]) / d
        row = free.pop()
        corners[row] = triangle
        circles[row] = *(a + centre), centre @ centre

    insert((count, count + 1, count + 2))
    for index in range(count):
        x, y = all_points[index]
        used = capacity - len(free) + 64     # rows are handed out from the front
        part = circles[:used]
        hit = np.nonzero((part[:, 0] - x) ** 2 + (part[:, 1] - y) ** 2 < part[:, 2] * (1 + 1e-12))[0]
        edges: set[tuple[int, int]] = set()
        for row in hit:
            a, b, c = (int(k) for k in corners[row])
            for edge in ((a, b), (b, c), (c, a)):
                if edge[::-1] in edges:
                    edges.remove(edge[::-1])
                else:
                    edges.add(edge)
            circles[row, 2] = -1
        free.extend(sorted((int(row) for row in hit), reverse=True))
        for a, b in sorted(edges):
            insert((a, b, index))
    alive = corners[circles[:, 2] >= 0]
    return alive[(alive < count).all(axis=1)]


def missing_edges(triangles: NDArray[np.int64], wanted: list[tuple[int, int]]) -> list[tuple[int, int]]:
    """Those of the wanted edges that no triangle has."""
    have = {tuple(sorted((int(t[i]), int(t[(i + 1) % 3])))) for t in triangles for i in range(3)}
    return [edge for edge in wanted if tuple(sorted(edge)) not in have]
