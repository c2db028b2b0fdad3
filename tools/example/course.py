"""The closed road course: its line, its road model with markings and humps, its heights.

Places on the course are (s, offset): metres along the centre line from the start, and metres to
the left of it. The line is driven counter-clockwise, with traffic on the right.
"""

from __future__ import annotations

from dataclasses import dataclass

import numpy as np

from curves import closed_spline, smoothstep
from mesh import Array, Mesh, add_grid, unit
from models import Material, Model

HALF_WIDTH = 4.0
EDGE = 10.0          # where the verge ends and the landscape begins, to either side
EDGE_HEIGHT = -0.25  # of the verge's outer rim, for drainage
_SHOULDER = 4.7
_SPACING = 2.5
_POINTS = [(-190, -120), (-60, -120), (80, -120), (190, -117), (268, -88), (296, -20), (262, 42), (188, 58),
           (118, 42), (52, 58), (8, 112), (-62, 152), (-142, 142), (-186, 84), (-206, 22), (-262, -12),
           (-292, -62), (-258, -108)]


@dataclass(frozen=True)
class Patch:
    """Something on the road: where it lies, which picture of the bump texture it shows, how high it is."""

    start: float
    end: float
    right: float     # offsets; left is greater
    left: float
    picture: tuple[float, float, float, float]   # left, bottom, right, top in texture coordinates
    height: float = 0.0


_CHECKER, _ZEBRA = (0.0, 0.75, 0.5, 1.0), (0.5, 0.75, 1.0, 1.0)
_ARROW, _SLOW = (0.0, 0.25, 0.25, 0.75), (0.25, 0.25, 0.5, 0.75)
_REPAIR, _HUMP = (0.5, 0.25, 1.0, 0.75), (0.0, 0.0, 0.5, 0.25)
_COVER = (0.5, 0.0, 0.625, 0.125)


class Course:
    """The centre line, sampled at even steps, with its tangent and curvature."""

    def __init__(self) -> None:
        line = closed_spline(_POINTS, _SPACING)
        step = np.linalg.norm(np.roll(line, -1, axis=0) - line, axis=1)
        self.length = float(step.sum())
        self.s = np.arange(len(line)) * self.length / len(line)
        self.line = line
        self.tangent = unit(np.roll(line, -1, axis=0) - np.roll(line, 1, axis=0))
        heading = np.unwrap(np.arctan2(self.tangent[:, 1], self.tangent[:, 0]))
        after = np.append(heading[1:], heading[0] + 2 * np.pi)
        before = np.append(heading[-1] - 2 * np.pi, heading[:-1])
        self.curvature = (after - before) / (2 * self.length / len(line))
        self._heading = heading
        self.patches = self._patches()

    def _at(self, values: Array, s: Array | float) -> Array:
        return np.interp(np.mod(s, self.length), np.append(self.s, self.length), np.append(values, values[0]))

    def curvature_at(self, s: Array | float) -> Array:
        """1/m, positive where the course turns left."""
        return self._at(self.curvature, s)

    def heading_at(self, s: Array | float) -> Array:
        """Radians from the x axis, growing by a full turn with every lap."""
        laps = np.floor_divide(s, self.length)
        turns = np.append(self._heading, self._heading[0] + 2 * np.pi)
        return np.interp(np.mod(s, self.length), np.append(self.s, self.length), turns) + laps * 2 * np.pi

    def point(self, s: Array | float, offset: Array | float) -> Array:
        """Scene x and y."""
        heading = self.heading_at(s)
        xy = np.stack([self._at(self.line[:, 0], s), self._at(self.line[:, 1], s)], axis=-1)
        left = np.stack([-np.sin(heading), np.cos(heading)], axis=-1)
        return xy + left * np.asarray(offset, float)[..., None]

    def distance(self, points: Array) -> Array:
        """From each (x, y) to the centre line, near enough for placing things."""
        points = np.atleast_2d(points)
        return np.min(np.linalg.norm(points[:, None, :] - self.line[None, :, :], axis=2), axis=1)

    def height(self, s: Array, offset: Array) -> Array:
        """Of the road surface above the plane: the humps."""
        result = np.zeros(np.broadcast(s, offset).shape)
        for patch in self.patches:
            if patch.height:
                along = np.mod(s - patch.start, self.length) / (patch.end - patch.start)
                across = (offset - patch.right) / (patch.left - patch.right)
                inside = (along < 1) & (across > 0) & (across < 1)
                result = np.where(inside, _hump(along, across) * patch.height, result)
        return result

    def _patches(self) -> list[Patch]:
        lane, start = 2.0, self.start_line
        patches = [Patch(start, start + 1.6, -3.75, 3.75, _CHECKER)]
        for at in (start + 130, start + 620, start + 1010):
            patches.append(Patch(at, at + 5, -lane - 1.0, -lane + 1.0, _ARROW))
        zebra = start + 205
        patches.append(Patch(zebra, zebra + 3.5, -3.75, 3.75, _ZEBRA))
        patches.append(Patch(zebra - 32, zebra - 26, -lane - 1.2, -lane + 1.2, _SLOW))
        for at in (start + 520, start + 850):
            patches.append(Patch(at, at + 2.4, -3.7, 3.7, _HUMP, 0.07))
            patches.append(Patch(at - 34, at - 28, -lane - 1.2, -lane + 1.2, _SLOW))
        random = np.random.RandomState(17)
        for at in np.linspace(start + 60, start + self.length - 90, 15):
            at += random.uniform(-12, 12)
            right = random.choice([-3.4, -2.6, 0.5, 1.0])
            length, width = random.uniform(3, 7), random.uniform(1.4, 2.2)
            if all(at > p.end + 1 or at + length < p.start - 1 for p in patches):
                patches.append(Patch(at, at + length, right, right + width, _REPAIR))
        for at in np.linspace(start + 25, start + self.length - 60, 11):
            if all(at > p.end + 1 or at + 0.8 < p.start - 1 for p in patches):
                patches.append(Patch(at, at + 0.75, 1.0, 1.75, _COVER))
        return patches

    @property
    def start_line(self) -> float:
        """s of the start line: a third of the way down the main straight."""
        return 110.0


def _hump(along: Array, across: Array) -> Array:
    """0 to 1: a round back that runs out at both ends, so that it closes with the road."""
    ends = smoothstep(0, 0.08, across) * smoothstep(0, 0.08, 1 - np.asarray(across, float))
    return np.sin(np.pi * np.clip(along, 0, 1)) ** 1.5 * ends


def _ribbon(mesh: Mesh, course: Course, material: str, offsets: list[float], heights: list[float],
            uv_of: tuple[float, float] | None, length: float, stations: Array | None = None) -> None:
    """A strip along the course, closed if no stations are given, with the offsets from right to left.

    `uv_of` maps the first and last offset to texture coordinates across; without it the texture lies
    on the ground plane, `length` metres a repeat, as the landscape's does.
    """
    if stations is None:
        stations = np.append(course.s, course.length)
    plan = np.stack([course.point(stations, o) for o in offsets], axis=1)
    z = np.broadcast_to(np.array(heights)[None, :, None], plan.shape[:2] + (1,))
    points = np.concatenate([plan, z], axis=-1)
    if uv_of is None:
        uvs = plan / length
    else:
        share = (np.array(offsets) - offsets[0]) / (offsets[-1] - offsets[0])
        u = uv_of[0] + (uv_of[1] - uv_of[0]) * share
        # A whole number of repeats, so that the closed strip has no seam.
        v = stations * round(course.length / length) / course.length
        uvs = np.stack(np.broadcast_arrays(u[None, :], v[:, None]), axis=-1)
    add_grid(mesh, material, points, None, uvs)


ROAD_REPEAT = 16.0
GRASS_REPEAT = 40.0
_FLAT = (0.0, 0.0, 1.0)


def course_model(course: Course) -> Model:
    surface = {"specular": 0.06, "shininess": 10.0, "ambient": 0.45}
    model = Model("Course", {
        "asphalt": Material(texture="asphalt.png", **surface),
        # The base of the bumps gets its own depth state. A material of its own, different in a number
        # that nobody sees, keeps the reader from sharing one state between it and the road.
        "asphalt_base": Material(texture="asphalt.png", **{**surface, "shininess": 11.0}),
        "markings": Material(texture="markings.png", **surface),
        "gravel": Material(texture="gravel.png", **surface),
        "verge": Material(texture="grass.png", specular=0.0, ambient=0.45),
        "kerb": Material(texture="kerb.png", **surface),
    })
    base = model.geometry("Course_bumpbase_geometry")
    bumps = model.geometry("Course_bump_geometry")
    for patch in course.patches:
        _add_patch(course, patch, base, bumps)
    road = model.geometry("Course_road_geometry")
    _ribbon(road, course, "asphalt", [-HALF_WIDTH, -2, 0, 2, HALF_WIDTH], [0] * 5, (0, 1), ROAD_REPEAT)
    sides = model.geometry("Course_shoulder")
    _ribbon(sides, course, "gravel", [-_SHOULDER, -HALF_WIDTH], [-0.03, 0], (0, 0.25), 3.0)
    _ribbon(sides, course, "gravel", [HALF_WIDTH, _SHOULDER], [0, -0.03], (0, 0.25), 3.0)
    _ribbon(sides, course, "verge", [-EDGE, -7, -_SHOULDER], [EDGE_HEIGHT, -0.12, -0.03], None, GRASS_REPEAT)
    _ribbon(sides, course, "verge", [_SHOULDER, 7, EDGE], [-0.03, -0.12, EDGE_HEIGHT], None, GRASS_REPEAT)
    _add_kerbs(course, model.geometry("Course_kerb"))
    return model


def _add_patch(course: Course, patch: Patch, base: Mesh, bumps: Mesh) -> None:
    """The piece of road below the patch, and the patch itself over exactly the same outline."""
    rows = max(2, int(np.ceil((patch.end - patch.start) / (0.2 if patch.height else 1.5))) + 1)
    columns = 15 if patch.height else 3
    s = np.linspace(patch.start, patch.end, rows)
    offsets = np.linspace(patch.right, patch.left, columns)
    grid_s, grid_o = np.meshgrid(s, offsets, indexing="ij")
    plan = course.point(grid_s, grid_o)
    flat = np.concatenate([plan, np.zeros(plan.shape[:2] + (1,))], axis=-1)
    repeats = round(course.length / ROAD_REPEAT) / course.length
    road_uv = np.stack([(grid_o + HALF_WIDTH) / (2 * HALF_WIDTH), grid_s * repeats], axis=-1)
    add_grid(base, "asphalt_base", flat, np.broadcast_to(_FLAT, flat.shape), road_uv)

    along = (grid_s - patch.start) / (patch.end - patch.start)
    across = (grid_o - patch.right) / (patch.left - patch.right)
    raised = flat.copy()
    if patch.height:
        raised[..., 2] = _hump(along, across) * patch.height
    left, bottom, right, top = patch.picture
    margin = 0.004
    u = right - margin - (right - left - 2 * margin) * across   # offsets grow to the left
    v = bottom + margin + (top - bottom - 2 * margin) * along
    add_grid(bumps, "markings", raised, None, np.stack([u, v], axis=-1))


def _add_kerbs(course: Course, mesh: Mesh) -> None:
    """Red and white kerbs on the inside of the bends, and on the outside where one begins to straighten."""
    for side in (1, -1):
        bend = course.curvature * side > 1 / 85
        for first, last in _runs(bend):
            s = course.s[first] + np.arange((last - first) % len(bend) + 1) * _SPACING * course.length / (
                len(bend) * _SPACING)
            offsets = np.array([3.78, 3.95, 4.35, 4.62]) * side
            heights = np.array([0.004, 0.055, 0.075, -0.03])
            if side < 0:
                offsets, heights = offsets[::-1], heights[::-1]
            # The ends sink into the road.
            fade = smoothstep(0, 2.6, s - s[0]) * smoothstep(0, 2.6, s[-1] - s)
            plan = np.stack([course.point(s, o) for o in offsets], axis=1)
            z = heights[None, :] * fade[:, None] - 0.08 * (1 - fade[:, None])
            points = np.concatenate([plan, z[..., None]], axis=-1)
            uvs = np.stack(np.broadcast_arrays(np.linspace(0, 1, 4)[None, :], (s / 2.0)[:, None]), axis=-1)
            add_grid(mesh, "kerb", points, None, uvs)


def _runs(flags: Array) -> list[tuple[int, int]]:
    """First and last index of each run of true values in a closed sequence, runs of eight or more."""
    count = len(flags)
    starts = [i for i in range(count) if flags[i] and not flags[i - 1]]
    result = []
    for start in starts:
        end = start
        while flags[(end + 1) % count]:
            end += 1
        if end - start >= 8:
            result.append((start, end))
    return result
