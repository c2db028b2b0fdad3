"""The delivery van: one box behind a short bonnet, windows at the front, the owner's livery behind."""

from __future__ import annotations

import numpy as np

from bodywork import Cell, Shape, Shell, mirrored, sorted_stations
from curves import bump, curve, smoothstep
from mesh import Array, Mesh
from models import Material, Model
from vehicle_parts import (DETAILS, END_ANGLES, GLASS, SHADOW, add_handle, add_mirror, add_plate, add_shadow,
                           add_wipers, glass_by_place, in_line, lines, paint)
from vehicle_textures import WHITE, apply_atlas


def _inset(x: Array, end: Array, z: Array) -> Array:
    front, rear = np.clip(end, 0, 1) ** 1.5, np.clip(-end, 0, 1) ** 1.5
    side = 1 - np.maximum(front, rear)
    low = np.clip(0.48 - z, 0, None)
    flank = 0.05 * np.clip(z - 0.6, 0, None) + 0.6 * low ** 2
    flank = flank + 0.012 * bump(0.62, 0.10, z) * smoothstep(-2.2, -1.9, x) * (1 - smoothstep(1.0, 1.3, x))
    for axle in (1.55, -1.55):
        flank = flank - 0.016 * bump(0.385, 0.07, np.hypot(x - axle, z - 0.325))
    nose = 0.40 * np.clip(z - 0.50, 0, None) ** 1.2 + 0.9 * low ** 2 - 0.02 * bump(0.42, 0.08, z)
    back = 0.03 * np.clip(z - 0.6, 0, None) + 0.8 * low ** 2 - 0.04 * bump(0.44, 0.10, z)
    return side * flank + front * nose + rear * back


VAN = Shape(
    nose=2.40, tail=-2.52, front_corner=1.72, rear_corner=-2.30, front_power=2.9, rear_power=3.2,
    half_width=curve((-2.5, 0.945), (0.0, 0.955), (1.5, 0.945), (2.4, 0.90)),
    belt=curve((-2.6, 1.10), (1.0, 1.09), (1.6, 1.03), (2.0, 0.93), (2.4, 0.80)),
    crown=curve((-2.6, 0.02), (1.2, 0.05), (2.0, 0.07), (2.4, 0.05)),
    inset=_inset,
    fillet=curve((-2.6, 0.01), (0.9, 0.012), (1.4, 0.05), (2.4, 0.08)),
    roof=curve((-2.6, 1.90), (-2.45, 1.925), (-1.8, 1.95), (0.0, 1.96), (0.45, 1.925), (0.75, 1.82),
               (1.05, 1.63), (1.40, 1.38), (1.72, 1.13), (1.84, 1.03), (1.95, 0.95)),
    roof_crown=0.07, tumblehome=0.14, rail=0.11, axles=(1.55, -1.55), sill=0.21)


def van_body() -> Mesh:
    shell, half = Shell(VAN), Mesh()
    out = shell.outline
    doors = (1.10, 0.05, -1.13)
    ends = [out.at_front(a) for a in END_ANGLES] + [out.at_rear(a) for a in (0, 14, 28, 42, 56, 70, 80, 90)]
    walls = sorted_stations(ends, [out.at_x(x) for x in np.linspace(-2.1, 1.0, 9)], [out.at_x(2.0), 0.006],
                            shell.arch_stations(), lines(shell, *doors))
    levels = np.array([0, 0.05, 0.10, 0.20, 0.26, 0.34, 0.42, 0.50, 0.58, 0.64, 0.72, 0.80, 0.92, 1.0])
    lamp = out.at_x(1.90), 0.58, out.at_front(60), 0.92
    grille = out.at_front(60), 0.64, out.length, 0.92
    intake = out.at_front(43), 0.10, out.length, 0.34
    fog = out.at_front(26), 0.20, out.at_front(43), 0.34
    bumper = 0.34
    tail = out.at_rear(42), 0.50, out.at_rear(0), 0.92

    def wall(t: float, level: float) -> Cell:
        x = float(out.point(t)[0])
        for name, area in (("headlamp", lamp), ("grille", grille), ("intake", intake), ("foglamp", fog)):
            if area[0] <= t <= area[2] and area[1] <= level <= area[3]:
                return f"details:{name}", area
        if level < 0.05 or (x < -2.1 and level < bumper):
            return "details:plastic", None
        if -1.1 < x < 1.1 and 0.26 < level < bumper:
            return "details:plastic", None
        if in_line(shell, t, *doors):
            return "details:gap", None
        if tail[0] < t < tail[2] and tail[1] < level < tail[3]:
            return "details:taillamp", tail
        if t < 0.006 and level > bumper:
            return "details:gap", None
        return "paint", None

    shell.build_wall(half, walls, levels, wall)
    shell.build_fillet(half, walls, lambda t: "details:gap" if in_line(shell, t, *doors) else "paint")

    def bonnet(x: float, share: float) -> str | None:
        if x < 1.2:
            return None
        return "details:gap" if 0.05 < share < 0.062 and x < 2.2 else "paint"

    shell.build_deck(half, walls, np.array([0, 0.05, 0.062, 0.2, 0.45, 0.72, 1.0]), bonnet)
    shell.build_arches(half, "details:under", walls)
    shell.build_floor(half, "details:under", walls)

    front, rest = 0.95, 0.05
    sides = [out.at_x(x) for x in (*np.linspace(-2.2, 0.4, 11), *np.linspace(0.5, 1.95, 13), 0.52, 1.75, front, 1.25)]
    cabin = sorted_stations(sides, [out.at_rear(a) for a in (0, 14, 28, 42, 56, 70, 72, 82, 90)],
                            [0.006], lines(shell, rest, -1.13))
    heights = np.array([0, 0.06, 0.12, 0.3, 0.48, 0.66, 0.84, 0.90, 1.0, 1.33, 1.66, 2.0, 2.06, 2.35, 2.68, 3.0])
    panel = out.at_x(-1.94), 0.06, out.at_x(-0.12), 0.90
    cabin = sorted_stations(list(cabin), [panel[0], panel[2]])

    def shown(t: float, s: float) -> Cell:
        x = float(out.point(t)[0])
        if t < 0.006 and s < 1:
            return "details:gap", None
        if t < out.at_rear(42) and 0.12 < s < 0.84:
            return "glass:rear", None
        if in_line(shell, t, rest, -1.13) and s < 1:
            return "details:gap", None
        if s < 1:
            if rest < x < 1.25 and 0.06 < s < 0.90:
                return ("glass:side", None) if 0.12 < s < 0.84 and not 0.93 < x < front else ("details:plastic", None)
            if panel[0] < t < panel[2] and panel[1] < s < panel[3]:
                return "livery", (panel[2], panel[1], panel[0], panel[3])
            return "paint", None
        if x > 1.75:
            return "details:plastic", None
        if 0.52 < x and s > 2:
            return ("details:gap", None) if s < 2.06 else ("glass:screen", None)
        return "paint", None

    shell.build_cabin(half, cabin, heights, shown)
    add_handle(half, shell, 0.20, 0.96)
    add_handle(half, shell, -0.10, 0.96)
    add_mirror(half, (1.16, 0.98, 1.22), 0.13, "details:gap")
    body = mirrored(half)
    for chunk in body.chunks["livery"]:
        if chunk.positions[0, 1] < 0:
            chunk.uvs = [1, 0] - chunk.uvs * [1, -1]   # writing isn't mirrored
    add_plate(body, shell, 0.50, True)
    add_plate(body, shell, 0.70, False)
    add_wipers(body, shell, (1.70, 0.55))
    return body


def van() -> Model:
    model = Model("Van", {"paint": paint(*WHITE), "glass": GLASS, "details": DETAILS, "shadow": SHADOW,
                          "livery": Material(texture="livery.png", specular=0.75, shininess=55, ambient=0.45)})
    model.geometries["Van_body"] = apply_atlas(glass_by_place(van_body()))
    add_shadow(model, VAN.tail, VAN.nose, 0.85)
    return model
