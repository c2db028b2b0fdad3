"""The saloon."""

from __future__ import annotations

import numpy as np

from bodywork import Cell, Shape, Shell, mirrored, sorted_stations
from curves import bump, curve, smoothstep
from mesh import Array, Mesh, add_revolution, add_tube, scaling, translation
from models import Model
from vehicle_parts import (DETAILS, END_ANGLES, GLASS, SHADOW, add_handle, add_mirror, add_plate, add_shadow,
                           add_wipers, glass_by_place, in_line, lines, paint)
from vehicle_textures import apply_atlas

def _sedan_inset(x: Array, end: Array, z: Array) -> Array:
    front, rear = np.clip(end, 0, 1) ** 1.5, np.clip(-end, 0, 1) ** 1.5
    side = 1 - np.maximum(front, rear)
    up, low = np.clip(z - 0.50, 0, None), np.clip(0.46 - z, 0, None)
    flank = 0.30 * up ** 1.8 + 0.85 * low ** 2
    # A hollow along the doors below a shoulder line, and flared arches.
    doors = smoothstep(-1.25, -0.9, x) * (1 - smoothstep(0.9, 1.2, x))
    flank = flank + 0.016 * doors * bump(0.46, 0.13, z) + 0.010 * smoothstep(0.735, 0.765, z)
    for axle in (1.37, -1.38):
        away = np.hypot(x - axle, z - 0.325)
        flank = flank - 0.016 * bump(0.385, 0.075, away)
    nose = 0.55 * np.clip(z - 0.44, 0, None) ** 1.25 + 1.2 * low ** 2 - 0.018 * bump(0.40, 0.06, z)
    boot = 0.16 * np.clip(z - 0.62, 0, None) + 0.9 * low ** 2 - 0.03 * bump(0.5, 0.09, z)
    boot = boot - 0.05 * smoothstep(0.86, 0.95, z)
    return side * flank + front * nose + rear * boot


SEDAN = Shape(
    nose=2.27, tail=-2.36, front_corner=1.50, rear_corner=-1.60, front_power=2.7, rear_power=3.2,
    half_width=curve((-2.4, 0.875), (-1.4, 0.900), (0.0, 0.908), (1.4, 0.898), (2.3, 0.87)),
    belt=curve((-2.40, 0.985), (-1.7, 0.985), (-0.8, 0.955), (0.2, 0.925), (0.9, 0.905), (1.5, 0.845),
               (2.0, 0.755), (2.3, 0.665)),
    crown=curve((-2.4, 0.03), (-1.0, 0.03), (0.8, 0.075), (1.8, 0.075), (2.3, 0.05)),
    inset=_sedan_inset,
    fillet=curve((-2.4, 0.045), (-1.6, 0.05), (0.5, 0.05), (1.6, 0.07), (2.3, 0.075)),
    roof=curve((-2.15, 0.98), (-1.98, 1.045), (-1.72, 1.135), (-1.40, 1.275), (-1.05, 1.385), (-0.7, 1.438),
               (-0.3, 1.452), (0.0, 1.42), (0.3, 1.325), (0.62, 1.17), (0.92, 1.025), (1.08, 0.955), (1.2, 0.9)),
    roof_crown=0.075, tumblehome=0.50, rail=0.085, axles=(1.37, -1.38))


def sedan_body() -> Mesh:
    shell, half = Shell(SEDAN), Mesh()
    out = shell.outline
    doors = (0.93, -0.20, -1.02)
    ends = [out.at_front(a) for a in END_ANGLES] + [out.at_rear(a) for a in END_ANGLES]
    sides = [out.at_x(x) for x in np.linspace(-0.9, 0.9, 8)] + [out.at_x(x) for x in (1.83, -1.84)]
    walls = sorted_stations(ends, sides, shell.arch_stations(), lines(shell, *doors, 1.80, -1.80))
    levels = np.array([0, 0.05, 0.065, 0.14, 0.22, 0.38, 0.46, 0.54, 0.62, 0.72, 0.82, 0.93, 0.95, 1.0])

    lamp = out.at_x(1.72), 0.62, out.at_front(60), 0.95
    grille = out.at_front(66), 0.54, out.length, 0.93
    intake = out.at_front(34), 0.14, out.length, 0.38
    fog = out.at_front(18), 0.22, out.at_front(34), 0.38
    tail = out.at_rear(60), 0.62, out.at_x(-1.84), 0.93

    def wall(t: float, level: float) -> Cell:
        for name, area in (("headlamp", lamp), ("grille", grille), ("intake", intake), ("foglamp", fog),
                           ("taillamp", tail)):
            if area[0] <= t <= area[2] and area[1] <= level <= area[3]:
                if name == "taillamp":
                    return "details:taillamp", (area[2], area[1], area[0], area[3])
                return f"details:{name}", area
        x = float(out.point(t)[0])
        if level < 0.05 or (x < -1.9 and level < 0.14):
            return "details:plastic", None
        if 0.05 < level < 0.065 and doors[2] < x < doors[0]:
            return "details:gap", None
        if in_line(shell, t, *doors):
            return "details:gap", None
        if in_line(shell, t, 1.80, -1.80) and level < 0.62:
            return "details:gap", None
        if x < -1.84 and 0.93 < level < 0.95 and t < out.at_rear(30):
            return "details:gap", None
        return "paint", None

    shell.build_wall(half, walls, levels, wall)
    shell.build_fillet(half, walls, lambda t: "details:gap" if in_line(shell, t, *doors) else "paint")

    def deck(x: float, share: float) -> str | None:
        if -1.55 < x < 0.60:
            return None
        seam = 0.05 < share < 0.062
        return "details:gap" if seam and (0.8 < x < 2.12 or -2.3 < x < -1.6) else "paint"

    shell.build_deck(half, walls, np.array([0, 0.05, 0.062, 0.18, 0.42, 0.70, 1.0]), deck)
    shell.build_arches(half, "details:under", walls)
    shell.build_floor(half, "details:under", walls)

    # The cabin: screens on the roof's share of the section, windows on its side.
    pillars = (0.52, -0.20, -0.30, -1.00)
    cabin = sorted_stations([out.at_x(x) for x in np.linspace(-2.1, 1.12, 22)], [out.at_x(x) for x in pillars],
                            [out.at_x(x) for x in (0.10, 0.98, -1.20, -1.90, 0.62, -1.25)])
    screen = out.at_x(0.10), 1.0, out.at_x(0.98), 3.0
    rear = out.at_x(-1.90), 1.0, out.at_x(-1.20), 3.0
    window = out.at_x(-1.25), 0.0, out.at_x(0.62), 1.0
    heights = np.array([0, 0.07, 0.10, 0.5, 0.90, 1.0, 1.33, 1.66, 2.0, 2.06, 2.35, 2.68, 3.0])

    def shown(t: float, s: float) -> Cell:
        x = float(out.point(t)[0])
        if s < 1:
            if s < 0.10 and -1.25 < x < 0.75:
                return ("details:chrome" if s < 0.07 else "details:gap"), None
            if s > 0.90:
                return ("details:plastic", None) if -1.25 < x < 0.62 else ("paint", None)
            if -0.30 < x < -0.20 or 0.52 < x < 0.62:
                return "details:plastic", None
            if -1.25 < x < 0.62:
                return "glass:side", window
            return "paint", None
        if 0.10 < x < 0.98 and s > 2:
            return ("details:gap", None) if s < 2.06 else ("glass:screen", screen)
        if -1.90 < x < -1.20 and s > 2:
            return ("details:gap", None) if s < 2.06 else ("glass:rear", rear)
        if x >= 0.98:
            return "details:plastic", None
        return "paint", None

    shell.build_cabin(half, cabin, heights, shown)
    add_handle(half, shell, -0.08, 0.80)
    add_handle(half, shell, -0.90, 0.82)
    add_mirror(half, (0.56, 0.865, 1.0))
    body = mirrored(half)
    add_plate(body, shell, 0.44, True)
    add_plate(body, shell, 0.66, False)
    add_wipers(body, shell, (0.93, 0.55))
    for y in (-0.52, 0.52):
        add_tube(body, "details:chrome", (-2.2, y, 0.235), (-2.30, y, 0.235), 0.035, 10)
    # A shark fin for the aerial.
    fin = Mesh()
    add_revolution(fin, "paint", [(1.0, 0.0), (0.85, 0.5), (0.5, 0.85), (0.0, 1.0)], segments=12)
    body.extend(fin, translation(-0.98, 0, 1.39) @ scaling(0.09, 0.022, 0.07))
    return body


def sedan() -> Model:
    model = Model("Sedan", {"paint": paint(0.52, 0.02, 0.035), "glass": GLASS, "details": DETAILS, "shadow": SHADOW})
    model.geometries["Sedan_body"] = apply_atlas(glass_by_place(sedan_body()))
    add_shadow(model, SEDAN.tail, SEDAN.nose, 0.85)
    return model
