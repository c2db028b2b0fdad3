"""Smooth functions through given points, and polylines measured by their length."""

from __future__ import annotations

from collections.abc import Callable, Sequence

import numpy as np

from mesh import Array

Function = Callable[[Array | float], Array]


def curve(*points: tuple[float, float]) -> Function:
    """A smooth function through points of ascending x; level beyond both ends, no overshoot."""
    x, y = np.array(sorted(points), float).T
    step, slope = np.diff(x), np.diff(y) / np.diff(x)
    tangent = np.zeros_like(x)
    tangent[0], tangent[-1] = slope[0], slope[-1]
    for i in range(1, len(x) - 1):
        if slope[i - 1] * slope[i] > 0:
            a, b = 2 * step[i] + step[i - 1], step[i] + 2 * step[i - 1]
            tangent[i] = (a + b) / (a / slope[i - 1] + b / slope[i])

    def value(at: Array | float) -> Array:
        t = np.clip(np.asarray(at, float), x[0], x[-1])
        i = np.clip(np.searchsorted(x, t, side="right") - 1, 0, len(step) - 1)
        u, h = (t - x[i]) / step[i], step[i]
        return (y[i] * (1 + 2 * u) * (1 - u) ** 2 + tangent[i] * h * u * (1 - u) ** 2
                + y[i + 1] * u * u * (3 - 2 * u) + tangent[i + 1] * h * u * u * (u - 1))

    return value


def smoothstep(low: float, high: float, at: Array | float) -> Array:
    u = np.clip((np.asarray(at, float) - low) / (high - low), 0, 1)
    return u * u * (3 - 2 * u)


def bump(centre: float, width: float, at: Array | float) -> Array:
    return np.exp(-((np.asarray(at, float) - centre) / width) ** 2)


def closed_spline(points: Sequence[Sequence[float]], spacing: float) -> Array:
    """A closed curve with continuous curvature through the points, resampled to even steps near `spacing`."""
    knots = np.array(points, float)
    count = len(knots)
    chord = np.linalg.norm(np.roll(knots, -1, axis=0) - knots, axis=1)
    # Periodic cubic spline over the chord length: one linear system for the second derivatives.
    before = np.roll(chord, 1)
    matrix = np.zeros((count, count))
    for i in range(count):
        matrix[i, i] = 2 * (before[i] + chord[i])
        matrix[i, i - 1] += before[i]
        matrix[i, (i + 1) % count] += chord[i]
    rise = (np.roll(knots, -1, axis=0) - knots) / chord[:, None]
    second = np.linalg.solve(matrix, 6 * (rise - np.roll(rise, 1, axis=0)))
    dense = []
    for i in range(count):
        j, h = (i + 1) % count, chord[i]
        u = np.linspace(0, h, 200, endpoint=False)[:, None]
        dense.append(second[i] * (h - u) ** 3 / (6 * h) + second[j] * u ** 3 / (6 * h)
                     + (knots[i] / h - second[i] * h / 6) * (h - u)
                     + (knots[j] / h - second[j] * h / 6) * u)
    line = np.concatenate(dense)
    length = np.concatenate([[0], np.cumsum(np.linalg.norm(np.roll(line, -1, axis=0) - line, axis=1))])
    steps = round(length[-1] / spacing)
    at = np.arange(steps) * length[-1] / steps
    closed = np.concatenate([line, line[:1]])
    return np.stack([np.interp(at, length, closed[:, k]) for k in range(closed.shape[1])], axis=-1)
