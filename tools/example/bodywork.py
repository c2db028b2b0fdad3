"""The shell of a vehicle, from a few curves: side walls that run round bumper and tail, deck, cabin.

The frame is the simulated one: x forward, y left, z up, origin on the ground under the centre
between the axles. Only the left half is built; `build_shell` mirrors it.
"""

from __future__ import annotations

from collections.abc import Callable
from dataclasses import dataclass

import numpy as np

from curves import Function
from mesh import Array, Mesh, add_grid, add_polygon, scaling, unit

Cell = tuple[str, tuple[float, float, float, float] | None]
"""A material and, for a picture that spans several cells, its extent (station, level, station, level)."""


@dataclass(frozen=True)
class Shape:
    """What makes one vehicle differ from another. Heights above ground and stations are in metres."""

    nose: float                  # x of the foremost point
    tail: float                  # x of the rearmost point
    front_corner: float          # x where the plan starts to round towards the nose
    rear_corner: float
    front_power: float           # exponent of the superellipse in plan: 2 round, 8 square
    rear_power: float
    half_width: Function         # of x, without the rounded ends
    belt: Function               # of x: height of the upper edge of the wall
    crown: Function              # of x: how far the deck's middle stands above its edge
    inset: Callable[[Array, Array, Array], Array]   # (x, end -1..1, z): inward from the plan
    fillet: Function             # of x: radius between wall and deck
    roof: Function               # of x: height of the cabin along the centre line
    roof_crown: float
    tumblehome: float            # how far the cabin's side leans inwards for a metre of height
    rail: float                  # radius between the cabin's side and its roof
    axles: tuple[float, float]
    sill: float = 0.19
    wheel_radius: float = 0.325
    arch_radius: float = 0.385


class Outline:
    """The left half of the plan view, from the middle of the tail round to the middle of the nose.

    A place on it is its arc length t; `at_x` gives t of a station on the side, `at_front` and
    `at_rear` of an angle of the rounded ends, 0 at the side to 90 at the middle.
    """

    def __init__(self, shape: Shape) -> None:
        angle = np.linspace(0, np.pi / 2, 600)

        def end(corner: float, tip: float, power: float) -> Array:
            x = corner + (tip - corner) * np.sin(angle) ** (2 / power)
            return np.stack([x, shape.half_width(x) * np.cos(angle) ** (2 / power)], axis=-1)

        rear = end(shape.rear_corner, shape.tail, shape.rear_power)[::-1]
        front = end(shape.front_corner, shape.nose, shape.front_power)
        x = np.linspace(shape.rear_corner, shape.front_corner, 800)[1:-1]
        side = np.stack([x, shape.half_width(x)], axis=-1)
        self._points = np.concatenate([rear, side, front])
        step = np.linalg.norm(np.diff(self._points, axis=0), axis=1)
        self._t = np.concatenate([[0], np.cumsum(step)])
        self._angle = np.degrees(angle)
        self._rear = self._t[:600][::-1]
        self._front = self._t[-600:]
        self._shape = shape
        self.length = float(self._t[-1])

    def at_x(self, x: float) -> float:
        return float(np.interp(x, self._points[:, 0], self._t))

    def at_front(self, angle: float) -> float:
        return float(np.interp(angle, self._angle, self._front))

    def at_rear(self, angle: float) -> float:
        return float(np.interp(angle, self._angle, self._rear))

    def point(self, t: Array | float) -> Array:
        return np.stack([np.interp(t, self._t, self._points[:, k]) for k in (0, 1)], axis=-1)

    def outward(self, t: Array | float) -> Array:
        """Horizontal unit normal; straight ahead and straight back in the middle of the ends."""
        t = np.asarray(t, float)
        ahead, behind = self.point(np.minimum(t + 0.02, self.length)), self.point(np.maximum(t - 0.02, 0))
        along = ahead - behind
        normal = unit(np.stack([-along[..., 1], along[..., 0]], axis=-1))
        normal[t >= self.length - 1e-6] = (1, 0)
        normal[t <= 1e-6] = (-1, 0)
        return normal


class Shell:
    """Surfaces of one shape as functions, and the meshes over them."""

    def __init__(self, shape: Shape) -> None:
        self.shape = shape
        self.outline = Outline(shape)

    def wall(self, t: Array | float, z: Array | float) -> Array:
        """Point of the wall at arc length t and height z."""
        plan, normal = self.outline.point(t), self.outline.outward(t)
        z = np.broadcast_to(np.asarray(z, float), plan.shape[:-1])
        inset = self.shape.inset(plan[..., 0], normal[..., 0], z)
        xy = plan - normal * inset[..., None]
        # Nothing may cross the middle plane where the ends lean in.
        return np.stack([xy[..., 0], np.maximum(xy[..., 1], 0.0), z], axis=-1)

    def wall_normal(self, t: Array | float, z: Array | float) -> Array:
        e = 0.004
        t = np.asarray(t, float)
        z = np.broadcast_to(np.asarray(z, float), t.shape)
        lean = (self.shape.inset(self.outline.point(t)[..., 0], self.outline.outward(t)[..., 0], z + e)
                - self.shape.inset(self.outline.point(t)[..., 0], self.outline.outward(t)[..., 0], z - e)) / (2 * e)
        t0, t1 = np.clip(t - 3 * e, 0, None), np.clip(t + 3 * e, None, self.outline.length)
        along = self.wall(t1, z) - self.wall(t0, z)
        flat = unit(np.stack([-along[..., 1], along[..., 0]], axis=-1))
        middle = (t <= 1e-6) | (t >= self.outline.length - 1e-6)
        flat[middle] = self.outline.outward(t)[middle]
        return unit(np.concatenate([flat, lean[..., None]], axis=-1))

    def wall_top(self, t: Array | float) -> Array:
        """Height at which the fillet towards the deck begins."""
        x = self.outline.point(t)[..., 0]
        return self.shape.belt(x) - self.shape.fillet(x)

    def bottom(self, t: Array) -> Array:
        """Height of the wall's lower edge: the sill, or the wheel arch above it."""
        x = self.outline.point(t)[..., 0]
        low = np.full_like(x, self.shape.sill)
        for axle in self.shape.axles:
            away = np.abs(x - axle)
            inside = away <= self.shape.arch_radius + 1e-4
            rise = np.sqrt(np.clip(self.shape.arch_radius ** 2 - away ** 2, 0, None))
            low = np.where(inside, np.maximum(low, self.shape.wheel_radius + rise), low)
        return low

    def arch_stations(self) -> list[float]:
        """Stations at which the arches are cut, with a second one just outside each vertical end."""
        angles = np.radians(np.arange(0, 181, 15))
        result = []
        for axle in self.shape.axles:
            result += [self.outline.at_x(axle + self.shape.arch_radius * c) for c in np.cos(angles)]
            result += [self.outline.at_x(axle + side * (self.shape.arch_radius + 0.002)) for side in (-1, 1)]
        return result

    def build_wall(self, mesh: Mesh, stations: Array, levels: Array,
                   material: Callable[[float, float], Cell]) -> None:
        """`levels` are fractions of the wall's height; `material` is asked for the middle of each cell."""
        t = stations[:, None]
        low, top = self.bottom(t), self.wall_top(t)
        z = low + levels[None, :] * (top - low)
        grid = np.broadcast_to(t, z.shape)
        points, normals = self.wall(grid, z), self.wall_normal(grid, z)
        self._add_cells(mesh, stations, levels, points, normals, material)

    def build_fillet(self, mesh: Mesh, stations: Array, material: Callable[[float], str],
                     steps: int = 3) -> None:
        t = np.broadcast_to(stations[:, None], (len(stations), steps + 1))
        angle = np.radians(np.linspace(0, 90, steps + 1))[None, :]
        radius = self.shape.fillet(self.outline.point(t)[..., 0])
        top = self.wall_top(t)
        points, side = self.wall(t, top), self.wall_normal(t, top)
        flat = unit(side[..., :2])
        points = points.copy()
        points[..., :2] -= flat * (radius * (1 - np.cos(angle)))[..., None]
        points[..., 1] = np.maximum(points[..., 1], 0)
        points[..., 2] += radius * np.sin(angle)
        up = np.array([0.0, 0.0, 1.0])
        normals = unit(side * np.cos(angle)[..., None] + up * np.sin(angle)[..., None])
        middle = (stations[1:] + stations[:-1]) / 2
        add_grid(mesh, lambda i, j: material(middle[i]), points, normals, flip=True)
        self._deck_edge = points[:, -1]

    def build_deck(self, mesh: Mesh, stations: Array, shares: Array,
                   material: Callable[[float, float], str | None]) -> None:
        """The bonnet and boot: from the fillet's inner edge to the middle, at these shares of the way."""
        edge = self._deck_edge
        y = edge[:, 1:2] * (1 - shares[None, :])
        x = np.broadcast_to(edge[:, :1], y.shape)
        rim = np.broadcast_to(edge[:, 2:], y.shape)
        width = float(np.max(edge[:, 1]))
        crown = self.shape.crown(x)
        points = np.stack([x, y, rim + crown * (edge[:, 1:2] ** 2 - y ** 2) / width ** 2], axis=-1)
        e = 0.03
        slope = (self.shape.belt(x + e) - self.shape.belt(x - e)) / (2 * e)
        normals = unit(np.stack([-slope, 2 * crown * y / width ** 2, np.ones_like(x)], axis=-1))
        middle = (edge[1:, 0] + edge[:-1, 0]) / 2
        share = (shares[1:] + shares[:-1]) / 2
        add_grid(mesh, lambda i, j: material(middle[i], share[j]), points, normals, flip=True)

    def cabin(self, t: Array, s: Array) -> Array:
        """Point of the cabin; s runs 0 to 1 up its side, to 2 round the rail, to 3 to the roof's middle."""
        shape = self.shape
        base = self.wall(t, self.wall_top(t))
        base_z = shape.belt(base[..., 0]) - 0.02
        normal = self.outline.outward(t)
        foot = base[..., :2] - normal * (0.65 * shape.fillet(base[..., 0]))[..., None]
        x = foot[..., 0]
        foot_y = np.maximum(foot[..., 1], 0)
        roof = np.maximum(shape.roof(x), base_z + 0.002)
        crown = np.minimum(shape.roof_crown, 0.5 * (roof - base_z))
        edge_z = roof - crown
        edge_y = np.maximum(foot_y - shape.tumblehome * (edge_z - base_z), 0)
        # An upright tail has a level upper edge: towards its middle the roof loses its crown.
        crown = crown * np.clip(foot_y / 0.6, 0, 1) ** 2
        rail = np.minimum(np.minimum(shape.rail, 0.45 * (edge_z - base_z)), 0.5 * edge_y + 1e-4)
        # Side, rail and roof as one curve: straight, a quadratic arc about the corner, a parabola.
        lean = unit(np.stack([foot_y - edge_y, base_z - edge_z], axis=-1))
        side_y, side_z = edge_y + lean[..., 0] * rail, edge_z + lean[..., 1] * rail
        top_y = np.maximum(edge_y - rail, 0)
        ratio = np.where(edge_y > 1e-6, top_y / np.maximum(edge_y, 1e-6), 0)
        top_z = edge_z + crown * (1 - ratio ** 2)
        u, v, w = np.clip(s, 0, 1), np.clip(s - 1, 0, 1), np.clip(s - 2, 0, 1)
        y = np.where(s <= 1, foot_y + u * (side_y - foot_y),
                     (1 - v) ** 2 * side_y + 2 * v * (1 - v) * edge_y + v * v * top_y)
        z = np.where(s <= 1, base_z + u * (side_z - base_z),
                     (1 - v) ** 2 * side_z + 2 * v * (1 - v) * (edge_z + 0.3 * crown * rail) + v * v * top_z)
        roof_y = top_y * (1 - w)
        ratio = np.where(edge_y > 1e-6, roof_y / np.maximum(edge_y, 1e-6), 0)
        y = np.where(s > 2, roof_y, y)
        z = np.where(s > 2, edge_z + crown * (1 - ratio ** 2), z)
        return np.stack([x, y, z], axis=-1)

    def build_cabin(self, mesh: Mesh, stations: Array, levels: Array,
                    material: Callable[[float, float], Cell]) -> None:
        t, s = np.meshgrid(stations, levels, indexing="ij")
        points = self.cabin(t, s)
        e = 0.012
        along = self.cabin(np.clip(t + e, 0, self.outline.length), s) - self.cabin(np.clip(t - e, 0, None), s)
        # One-sided at the middle and between side, rail and roof, so that flat stays flat.
        up = self.cabin(t, np.clip(s + e, 0, 3)) - self.cabin(t, np.clip(s - e, 0, 3))
        normals = unit(np.cross(up, along))
        weak = np.linalg.norm(np.cross(up, along), axis=-1) < 1e-9
        normals[weak] = (0, 0, 1)
        normals[..., 1] = np.where(points[..., 1] < 1e-6, 0, normals[..., 1])
        self._add_cells(mesh, stations, levels, points, unit(normals), material)

    @staticmethod
    def _add_cells(mesh: Mesh, stations: Array, levels: Array, points: Array, normals: Array,
                   material: Callable[[float, float], Cell]) -> None:
        """Cells that show part of a picture get texture coordinates from the extent of the picture."""
        by_extent: dict[tuple[float, float, float, float] | None, list[tuple[int, int, str]]] = {}
        for i in range(len(stations) - 1):
            for j in range(len(levels) - 1):
                name, extent = material((stations[i] + stations[i + 1]) / 2, (levels[j] + levels[j + 1]) / 2)
                if name:
                    by_extent.setdefault(extent, []).append((i, j, name))
        for extent, cells in by_extent.items():
            names = {(i, j): name for i, j, name in cells}
            t0, l0, t1, l1 = extent or (stations[0], levels[0], stations[-1], levels[-1])
            u = np.broadcast_to(((stations - t0) / (t1 - t0))[:, None], points.shape[:2])
            v = np.broadcast_to(((levels - l0) / (l1 - l0))[None, :], points.shape[:2])
            add_grid(mesh, lambda i, j, n=names: n.get((i, j)), points, normals,
                     np.stack([u, v], axis=-1), flip=True)

    def build_arches(self, mesh: Mesh, material: str, stations: Array, depth: float = 0.42) -> None:
        """Lip, lining and inner wall of the two wheel houses, on the stations that the wall has there."""
        shape = self.shape
        for axle in shape.axles:
            x = self.outline.point(stations)[:, 0]
            t = stations[np.abs(x - axle) <= shape.arch_radius + 1e-4][::-1]
            rim = self.wall(t, self.bottom(t))
            low = np.array([[1, 1, 0]])
            rim = np.concatenate([rim[:1] * low + [0, 0, shape.sill], rim, rim[-1:] * low + [0, 0, shape.sill]])
            rows = [rim, rim - [0, 0.025, 0], rim - [0, depth, 0]]
            inward = np.array([axle, 0, shape.wheel_radius]) - rim
            inward[:, 1] = 0
            normals = np.stack([unit(inward)] * 3)
            add_grid(mesh, material, np.stack(rows), normals)
            add_polygon(mesh, material, rows[2])
            add_polygon(mesh, material, rows[2][::-1])

    def build_floor(self, mesh: Mesh, material: str, stations: Array) -> None:
        """A flat underside, narrow between the wheels."""
        left = self.wall(stations, np.full_like(stations, self.shape.sill))
        near = np.zeros(len(left), bool)
        for axle in self.shape.axles:
            near |= np.abs(left[:, 0] - axle) < self.shape.arch_radius + 1e-3
        left[near, 1] = np.minimum(left[near, 1], 0.5)
        middle = left * [1, 0, 1]
        normals = np.tile([0.0, 0.0, -1.0], (len(left), 2, 1))
        add_grid(mesh, material, np.stack([left, middle], axis=1), normals)


def mirrored(half: Mesh) -> Mesh:
    """The half and its mirror image in the plane y = 0."""
    whole = Mesh()
    whole.extend(half)
    whole.extend(half, scaling(1, -1, 1))
    return whole


def sorted_stations(*groups: list[float]) -> Array:
    """All stations in ascending order, without near duplicates."""
    values = sorted(value for group in groups for value in group)
    kept = values[:1]
    for value in values[1:]:
        if value - kept[-1] > 5e-4:
            kept.append(value)
    return np.array(kept)
