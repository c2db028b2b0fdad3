"""Houses, a hall, an office block, a grandstand, and the water tower."""

from __future__ import annotations

import numpy as np

from images import Array as Picture
from images import blend, clouds, distance_grid, fill, grain, plain, shade, text_width, write_text
from mesh import add_box, add_polygon, add_revolution, add_tube
from models import Material, Model

_MATT = {"specular": 0.02, "shininess": 8.0, "ambient": 0.8}
_SHEET = Material(texture="sheet.png", specular=0.2, shininess=20.0, ambient=0.8)


def _window(picture: Picture, left: float, top: float, right: float, bottom: float,
            frame: tuple[float, float, float], seed: int) -> None:
    """A window that mirrors a bit of sky, with frame and cross bar; fractions from the upper left."""
    height, width = picture.shape[:2]
    dx, dy = 3 / width, 3 / height
    fill(picture, left - dx, top - dy, right + dx, bottom + dy, frame)
    rows, columns = round(bottom * height) - round(top * height), round(right * width) - round(left * width)
    across, down = distance_grid(rows, columns)
    pane = blend(plain(rows, columns, (0.07, 0.09, 0.11)), (0.34, 0.42, 0.50),
                 np.clip(0.75 - down + 0.3 * across + 0.15 * np.sin(seed), 0, 1) * 0.75)
    picture[round(top * height):round(top * height) + rows, round(left * width):round(left * width) + columns] = pane
    middle = (left + right) / 2
    fill(picture, middle - dx / 3, top, middle + dx / 3, bottom, frame)


def house_wall() -> Picture:
    """One side of a two-storey house, 512 x 256 for 10 x 5.4 m."""
    size = (256, 512)
    picture = shade(plain(*size, (0.80, 0.73, 0.60)), 1 + 0.025 * grain(size, 601) + 0.03 * clouds(size, (3, 5), 602))
    fill(picture, 0, 0.92, 1, 1, (0.30, 0.29, 0.28))
    frame = (0.72, 0.71, 0.68)
    for index, left in enumerate((0.09, 0.33, 0.57, 0.80)):
        _window(picture, left, 0.12, left + 0.11, 0.36, frame, index)
        if index != 2:
            _window(picture, left, 0.56, left + 0.11, 0.82, frame, index + 5)
        for side in (left - 0.045, left + 0.12):
            if index != 2:
                fill(picture, side, 0.55, side + 0.032, 0.83, (0.20, 0.32, 0.24))
            fill(picture, side, 0.11, side + 0.032, 0.37, (0.20, 0.32, 0.24))
    fill(picture, 0.575, 0.54, 0.675, 0.95, frame)
    fill(picture, 0.585, 0.56, 0.665, 0.95, (0.24, 0.13, 0.07))
    fill(picture, 0.600, 0.60, 0.650, 0.68, (0.30, 0.36, 0.40))
    return picture


def plaster() -> Picture:
    size = (128, 128)
    return shade(plain(*size, (0.80, 0.73, 0.60)), 1 + 0.025 * grain(size, 611) + 0.03 * clouds(size, (3, 3), 612))


def tiles() -> Picture:
    size = (256, 256)
    across, down = distance_grid(*size)
    row = np.floor(down * 12)
    lit = 0.72 + 0.36 * np.mod(down * 12, 1)
    lit *= np.where(np.mod(across * 14 + 0.5 * (row % 2), 1) < 0.10, 0.72, 1.0)
    return shade(plain(*size, (0.56, 0.23, 0.15)), lit * (1 + 0.10 * clouds(size, (14, 12), 621, 3)))


def cladding() -> Picture:
    """Corrugated sheet with a band of windows, 512 x 256 for 12 x 6 m."""
    across, down = distance_grid(256, 512)
    lit = 0.90 + 0.12 * np.sin(across * 2 * np.pi * 48)
    picture = shade(plain(256, 512, (0.58, 0.63, 0.67)), lit * (1 + 0.03 * clouds((256, 512), (4, 2), 631)))
    fill(picture, 0, 0.90, 1, 1, (0.28, 0.28, 0.28))
    fill(picture, 0, 0, 1, 0.05, (0.12, 0.25, 0.42))
    for index in range(8):
        _window(picture, 0.02 + index * 0.122, 0.16, 0.02 + index * 0.122 + 0.10, 0.32, (0.25, 0.26, 0.27), index)
    return picture


def gate_wall() -> Picture:
    """The gable end of the hall, with a roller gate and a name, 512 x 256 for 16 x 6 m."""
    across, _ = distance_grid(256, 512)
    picture = shade(plain(256, 512, (0.58, 0.63, 0.67)), 0.90 + 0.12 * np.sin(across * 2 * np.pi * 64))
    fill(picture, 0, 0.90, 1, 1, (0.28, 0.28, 0.28))
    fill(picture, 0, 0, 1, 0.05, (0.12, 0.25, 0.42))
    fill(picture, 0.10, 0.36, 0.40, 1.0, (0.62, 0.63, 0.62))
    for line in np.arange(0.40, 1.0, 0.05):
        fill(picture, 0.11, line, 0.39, line + 0.012, (0.45, 0.46, 0.46))
    fill(picture, 0.50, 0.52, 0.58, 1.0, (0.13, 0.25, 0.40))
    _window(picture, 0.66, 0.52, 0.90, 0.74, (0.25, 0.26, 0.27), 3)
    write_text(picture, "TEST CENTRE", (512 - text_width("TEST CENTRE", 5)) // 2, 34, 5, (0.90, 0.91, 0.92))
    return picture


def sheet() -> Picture:
    across, _ = distance_grid(128, 128)
    return shade(plain(128, 128, (0.50, 0.53, 0.55)), 0.92 + 0.12 * np.sin(across * 2 * np.pi * 12))


def facade() -> Picture:
    """One bay and one storey of the office block, four by four: 256 x 256 for 12 x 13 m."""
    picture = plain(256, 256, (0.72, 0.72, 0.71))
    for row in range(4):
        for column in range(4):
            seed = row * 7 + column * 3
            _window(picture, column / 4 + 0.025, row / 4 + 0.06, column / 4 + 0.225, row / 4 + 0.20,
                    (0.20, 0.21, 0.22), seed)
            if seed % 5 == 1:
                fill(picture, column / 4 + 0.03, row / 4 + 0.06, column / 4 + 0.12, row / 4 + 0.11, (0.66, 0.64, 0.58))
    for row in range(4):
        fill(picture, 0, row / 4, 1, row / 4 + 0.02, (0.36, 0.40, 0.44))
    return shade(picture, 1 + 0.015 * grain((256, 256), 641))


def concrete() -> Picture:
    size = (128, 128)
    return shade(plain(*size, (0.60, 0.595, 0.58)), 1 + 0.03 * grain(size, 651) + 0.06 * clouds(size, (4, 4), 652))


def seats() -> Picture:
    """Rows of coloured seats with people on some of them."""
    picture = plain(256, 512, (0.10, 0.20, 0.40))
    random = np.random.RandomState(661)
    for row in range(8):
        fill(picture, 0, row / 8, 1, row / 8 + 0.030, (0.42, 0.42, 0.41))
        for column in range(64):
            if random.uniform() < 0.62:
                coat = random.uniform(0.1, 0.75, 3)
                left, top = column / 64 + 0.003, row / 8 + 0.05
                fill(picture, left, top + 0.02, left + 0.0105, top + 0.065, tuple(coat))
                fill(picture, left + 0.003, top, left + 0.008, top + 0.022, (0.62, 0.46, 0.36))
    return picture


def house() -> Model:
    """A family house, 10 x 8 m, ridge along x."""
    model = Model("House", {"wall": Material(texture="house_wall.png", **_MATT),
                            "plaster": Material(texture="plaster.png", **_MATT),
                            "tiles": Material(texture="tiles.png", **_MATT)})
    mesh = model.geometry("House_building")
    x, y, eaves, ridge = 5.0, 4.0, 5.4, 8.6
    add_box(mesh, "wall", (-x, -y, 0), (x, y, eaves), sides="yY")
    add_box(mesh, "plaster", (-x, -y, -1.5), (x, y, 0), texel=2.5, sides="xXyY")
    add_box(mesh, "wall", (-x, -y, 0), (x, y, eaves), sides="xX")
    for side in (-1, 1):
        add_polygon(mesh, "plaster", [(side * x, -side * y, eaves), (side * x, side * y, eaves), (side * x, 0, ridge)],
                    [(0, 0), (3, 0), (1.5, 1.2)])
        over, slope = 0.55, (ridge - eaves) / y
        low, out = eaves - over * slope, y + over
        corners = [(-side * (x + 0.4), -side * out, low), (side * (x + 0.4), -side * out, low),
                   (side * (x + 0.4), 0, ridge), (-side * (x + 0.4), 0, ridge)]
        add_polygon(mesh, "tiles", corners, [(0, 0), (3.6, 0), (3.6, 2), (0, 2)])
        add_polygon(mesh, "plaster", [(px, py, pz - 0.16) for px, py, pz in corners[::-1]])
        # Barge boards close the gap between the two skins.
        for a, b in ((0, 1), (1, 2), (3, 0)):
            p, q = corners[a], corners[b]
            add_polygon(mesh, "tiles", [(p[0], p[1], p[2] - 0.16), (q[0], q[1], q[2] - 0.16), q, p],
                        [(0, 0), (1, 0), (1, 0.05), (0, 0.05)])
    add_box(mesh, "tiles", (2.0, 0.6, 6.5), (2.7, 1.3, 9.4), texel=1.5)
    add_box(mesh, "plaster", (-1.2, -y - 1.3, -0.4), (2.2, -y, 0.12), texel=2.5)
    return model


def hall() -> Model:
    """A workshop hall, 36 x 16 m, with a low gable roof and skylights."""
    model = Model("Hall", {"cladding": Material(texture="cladding.png", **_MATT),
                           "gate": Material(texture="gate_wall.png", **_MATT),
                           "sheet": _SHEET, "concrete": Material(texture="concrete.png", **_MATT)})
    mesh = model.geometry("Hall_building")
    x, y, eaves, ridge = 18.0, 8.0, 6.0, 7.8
    for side in (-1, 1):
        add_polygon(mesh, "cladding", [(-side * x, -side * y, 0), (side * x, -side * y, 0),
                                       (side * x, -side * y, eaves), (-side * x, -side * y, eaves)],
                    [(0, 0), (3, 0), (3, 1), (0, 1)])
        add_polygon(mesh, "gate", [(side * x, -side * y, 0), (side * x, side * y, 0), (side * x, side * y, eaves),
                                   (side * x, -side * y, eaves)])
        add_polygon(mesh, "sheet", [(side * x, -side * y, eaves), (side * x, side * y, eaves), (side * x, 0, ridge)],
                    [(0, 0), (4, 0), (2, 0.5)])
        add_polygon(mesh, "sheet", [(-side * (x + 0.3), -side * (y + 0.4), eaves - 0.09),
                                    (side * (x + 0.3), -side * (y + 0.4), eaves - 0.09),
                                    (side * (x + 0.3), 0, ridge), (-side * (x + 0.3), 0, ridge)],
                    [(0, 0), (12, 0), (12, 2), (0, 2)])
    add_box(mesh, "concrete", (-x - 0.1, -y - 0.1, -1.5), (x + 0.1, y + 0.1, 0.02), texel=4, sides="xXyY")
    for middle in (-12.0, -4.0, 4.0, 12.0):
        add_box(mesh, "cladding", (middle - 2.2, -1.2, ridge - 0.4), (middle + 2.2, 1.2, ridge + 0.7), texel=8,
                sides="xXyYZ")
    for at in (-14.0, -9.0, 8.0):
        add_tube(mesh, "sheet", (at, 4.0, 6.6), (at, 4.0, 8.6), 0.35, 10)
    return model


def office() -> Model:
    """An office block of five storeys, 24 x 12 m, with a glazed porch and plant on its roof."""
    model = Model("Office", {"facade": Material(texture="facade.png", specular=0.12, shininess=30.0, ambient=0.8),
                             "concrete": Material(texture="concrete.png", **_MATT)})
    mesh = model.geometry("Office_building")
    x, y, h = 12.0, 6.0, 16.25
    add_box(mesh, "facade", (-x, -y, 0), (x, y, h), texel=12.0, sides="xXyY")
    add_box(mesh, "concrete", (-x - 0.15, -y - 0.15, h), (x + 0.15, y + 0.15, h + 0.7), texel=4)
    add_box(mesh, "concrete", (-x - 0.15, -y - 0.15, -1.5), (x + 0.15, y + 0.15, 0.35), texel=4, sides="xXyYZ")
    for left in (-12.2, -4.1, 3.9, 11.8):
        add_box(mesh, "concrete", (left, -y - 0.35, 0), (left + 0.4, -y, h), texel=4)
        add_box(mesh, "concrete", (left, y, 0), (left + 0.4, y + 0.35, h), texel=4)
    add_box(mesh, "facade", (-3, -y - 3.2, 0.1), (3, -y, 3.2), texel=12.0, sides="xXy")
    add_box(mesh, "concrete", (-3.4, -y - 3.8, 3.2), (3.4, -y, 3.55), texel=4)
    add_box(mesh, "concrete", (-6, -2.5, h + 0.7), (-1, 2.5, h + 3.0), texel=4)
    add_box(mesh, "facade", (2, -2, h + 0.7), (7, 2, h + 2.2), texel=14.0)
    add_tube(mesh, "concrete", (9, 0, h), (9, 0, h + 6), 0.07, 6, 0.03)
    return model


def grandstand() -> Model:
    """A covered stand, 30 m long, that looks towards -y."""
    model = Model("Grandstand", {"seats": Material(texture="seats.png", **_MATT),
                                 "concrete": Material(texture="concrete.png", **_MATT),
                                 "sheet": _SHEET})
    mesh = model.geometry("Grandstand_building")
    x, depth, low, high = 15.0, 9.0, 1.2, 5.6
    add_polygon(mesh, "seats", [(-x, 0, low), (x, 0, low), (x, depth, high), (-x, depth, high)])
    add_box(mesh, "concrete", (-x, -0.15, -0.6), (x, 0, low + 0.5), texel=4)
    add_box(mesh, "concrete", (-x, depth, -0.6), (x, depth + 0.3, 8.6), texel=4)
    for side in (-1, 1):
        for way, at in ((side, x + 0.2), (-side, x)):
            corners = [(side * at, 0, -0.6), (side * at, depth, -0.6), (side * at, depth, high), (side * at, 0, low)]
            add_polygon(mesh, "concrete", corners[::way], [(0, 0), (2, 0), (2, 1.4), (0, 0.4)][::way])
    roof = [(-x - 0.5, -2.0, 9.4), (x + 0.5, -2.0, 9.4), (x + 0.5, depth + 0.6, 8.5), (-x - 0.5, depth + 0.6, 8.5)]
    add_polygon(mesh, "sheet", roof, [(0, 0), (10, 0), (10, 4), (0, 4)])
    add_polygon(mesh, "sheet", [(a, b, c - 0.25) for a, b, c in roof[::-1]], [(0, 0), (10, 0), (10, 4), (0, 4)])
    for a, b in ((0, 1), (1, 2), (2, 3), (3, 0)):
        p, q = roof[a], roof[b]
        add_polygon(mesh, "sheet", [(p[0], p[1], p[2] - 0.25), (q[0], q[1], q[2] - 0.25), q, p],
                    [(0, 0), (1, 0), (1, 0.1), (0, 0.1)])
    for at in (-14.5, -7.2, 0.0, 7.2, 14.5):
        add_tube(mesh, "concrete", (at, depth - 0.4, high - 0.4), (at, depth - 0.4, 8.5), 0.14, 8)
        add_tube(mesh, "concrete", (at, depth - 0.4, 6.2), (at, 0.5, 9.0), 0.09, 6)
    return model


def water_tower() -> Model:
    """A water tower, 24 m high, written as VRML: no textures, three materials."""
    model = Model("WaterTower", {
        "steel": Material(diffuse=(0.55, 0.60, 0.64), specular=0.4, shininess=40.0, ambient=0.5),
        "band": Material(diffuse=(0.62, 0.10, 0.08), specular=0.3, shininess=30.0, ambient=0.5),
        "frame": Material(diffuse=(0.30, 0.32, 0.34), specular=0.2, shininess=20.0, ambient=0.5)})
    mesh = model.geometry("Tower")
    add_revolution(mesh, "steel", [(0.0, 16.2), (2.0, 16.5), (3.4, 17.3), (4.0, 18.6), (4.0, 19.2)], segments=28)
    add_revolution(mesh, "band", [(4.02, 19.2), (4.02, 20.2)], segments=28)
    add_revolution(mesh, "steel", [(4.0, 20.2), (4.0, 21.6), (3.9, 21.9), (0.3, 23.6), (0.3, 24.0), (0.0, 24.0)],
                   segments=28)
    add_revolution(mesh, "frame", [(4.75, 18.55), (4.75, 18.65), (4.0, 18.65)], segments=28)
    add_tube(mesh, "frame", (0, 0, -1), (0, 0, 16.4), 0.55, 14, capped=False)
    legs = [(np.cos(a), np.sin(a)) for a in np.radians((45, 135, 225, 315))]
    for index, (c, s) in enumerate(legs):
        add_tube(mesh, "frame", (5.2 * c, 5.2 * s, -1), (3.3 * c, 3.3 * s, 18.0), 0.22, 8, capped=False)
        c2, s2 = legs[(index + 1) % 4]
        for low, high in ((0.0, 6.0), (6.0, 12.0), (12.0, 17.4)):
            def at(cos: float, sin: float, z: float) -> tuple[float, float, float]:
                away = 5.1 - 1.8 * z / 18
                return away * cos, away * sin, z
            add_tube(mesh, "frame", at(c, s, low), at(c2, s2, high), 0.06, 5, capped=False)
            add_tube(mesh, "frame", at(c2, s2, low), at(c, s, high), 0.06, 5, capped=False)
            add_tube(mesh, "frame", at(c, s, high), at(c2, s2, high), 0.09, 5, capped=False)
    for turn in np.arange(0, 360, 20):
        c, s = np.cos(np.radians(turn)), np.sin(np.radians(turn))
        add_tube(mesh, "frame", (4.7 * c, 4.7 * s, 18.6), (4.7 * c, 4.7 * s, 19.7), 0.03, 4, capped=False)
    add_revolution(mesh, "frame", [(4.72, 19.66), (4.76, 19.70), (4.72, 19.74), (4.68, 19.70), (4.72, 19.66)],
                   segments=36, crease=100)
    return model
