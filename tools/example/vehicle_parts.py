"""Parts that vehicles share: shut lines, handles, mirrors, number plates, wipers, materials."""

from __future__ import annotations

import numpy as np

from bodywork import Shell
from mesh import Mesh, add_box, add_polygon, add_revolution, add_tube, rotation, scaling, translation
from models import Material, Model

GLASS = Material(texture="glass.png", specular=0.9, shininess=90, ambient=0.6)
DETAILS = Material(texture="details.png", specular=0.35, shininess=40, ambient=0.6)
_GAP = 0.007   # width of a shut line
SHADOW = Material(texture="shadow.png", specular=0.0, see_through=True)
END_ANGLES = [0, 8, 18, 26, 34, 43, 52, 60, 66, 78, 90]


def paint(red: float, green: float, blue: float) -> Material:
    """Lacquer; without a texture, so that a dye can colour it."""
    return Material(diffuse=(red, green, blue), specular=0.75, shininess=55, ambient=0.6)


def lines(shell: Shell, *places: float) -> list[float]:
    """Both edges of a shut line at each x."""
    return [shell.outline.at_x(x) + half for x in places for half in (-_GAP / 2, _GAP / 2)]


def in_line(shell: Shell, t: float, *places: float) -> bool:
    return any(abs(t - shell.outline.at_x(x)) < _GAP / 2 for x in places)


def add_handle(half: Mesh, shell: Shell, x: float, z: float) -> None:
    t = shell.outline.at_x(x)
    at = shell.wall(np.array([t]), np.array([z]))[0]
    lug = Mesh()
    add_revolution(lug, "paint", [(0.0, -1.0), (0.7, -0.8), (1.0, -0.3), (1.0, 0.3), (0.7, 0.8), (0.0, 1.0)],
                   "x", 10, crease=80)
    half.extend(lug, translation(*(at + [0, 0.012, 0])) @ scaling(0.11, 0.022, 0.018))
    pocket = Mesh()
    add_revolution(pocket, "details:gap", [(0.0, -1.0), (0.8, -0.6), (1.0, 0.0), (0.8, 0.6), (0.0, 1.0)], "x", 10)
    half.extend(pocket, translation(*(at + [0, 0, -0.012])) @ scaling(0.085, 0.006, 0.026))


def add_mirror(half: Mesh, at: tuple[float, float, float], height: float = 0.075,
               material: str = "paint") -> None:
    x, y, z = at
    shell = Mesh()
    add_revolution(shell, material, [(0.88, 0.0), (1.0, 0.25), (0.93, 0.6), (0.7, 0.88), (0.0, 1.0)], "x", 16,
                   crease=80)
    add_revolution(shell, "details:mirror", [(0.0, 0.02), (0.80, 0.02)], "x", 16)
    add_revolution(shell, "details:plastic", [(0.80, 0.02), (0.88, 0.0)], "x", 16)
    # The glass looks back, so its front is turned.
    glassy = shell.chunks["details:mirror"]
    for chunk in glassy:
        chunk.normals[:] = (-1, 0, 0)
        chunk.triangles[:] = chunk.triangles[:, ::-1]
    for chunk in shell.chunks["details:plastic"]:
        chunk.normals[:] = (-1, 0, 0)
        chunk.triangles[:] = chunk.triangles[:, ::-1]
    half.extend(shell, translation(x, y + 0.095, z) @ rotation("z", -8) @ scaling(0.11, 0.115, height))
    add_box(half, "details:plastic", (x + 0.01, y - 0.13, z - height * 0.9), (x + 0.07, y + 0.06, z - height * 0.45))


def add_plate(body: Mesh, shell: Shell, z: float, front: bool) -> None:
    """A number plate that stands a little before the bumper."""
    t = shell.outline.length if front else 0.0
    x = float(shell.wall(np.array([t]), np.array([z]))[0, 0])
    tilt = float(shell.wall(np.array([t]), np.array([z + 0.05]))[0, 0]) - float(
        shell.wall(np.array([t]), np.array([z - 0.05]))[0, 0])
    way, w, h = (1, 0.26, 0.055) if front else (-1, 0.26, 0.055)
    plate = Mesh()
    add_box(plate, "details:plastic", (-0.06, -w - 0.01, -h - 0.01), (0.012, w + 0.01, h + 0.01), sides="XyYzZ")
    add_polygon(plate, "details:plate", [(0.016, -w, -h), (0.016, w, -h), (0.016, w, h), (0.016, -w, h)])
    turn = np.degrees(np.arctan2(tilt * way, 0.1))
    body.extend(plate, translation(x, 0, z) @ rotation("z", 0 if front else 180) @ rotation("y", turn))


def add_wipers(body: Mesh, shell: Shell, along: tuple[float, float]) -> None:
    """Two blades that lie on the foot of the screen."""
    x0, x1 = along
    for y0, y1 in ((0.42, -0.12), (-0.10, -0.62)):
        ends = []
        for x, y in ((x0, y0), (x0 - 0.06, y1)):
            s = np.linspace(2, 3, 80)
            points = shell.cabin(np.full(80, shell.outline.at_x(x)), s)
            ends.append(points[np.argmin(np.abs(points[:, 1] - abs(y)))] * [1, np.sign(y), 1] + [0.006, 0, 0.012])
        add_tube(body, "details:gap", ends[0], ends[1], 0.009, 5)


def glass_by_place(mesh: Mesh) -> Mesh:
    """Glass gets its picture by height, so that the seeming horizon runs level round the vehicle."""
    result = Mesh()
    for material, chunks in mesh.chunks.items():
        name = material.partition(":")[0]
        for chunk in chunks:
            uvs = chunk.uvs
            if name == "glass":
                p = chunk.positions
                low, high = p[:, 2].min(), p[:, 2].max()
                uvs = np.stack([0.35 * p[:, 0] + 0.5 * np.abs(p[:, 1]), 0.04 + 0.92 * (p[:, 2] - low) / (high - low)],
                               axis=-1)
            result.add(name if name == "glass" else material, chunk.positions, chunk.normals, uvs, chunk.triangles)
    return result


def add_shadow(model: Model, tail: float, nose: float, half_width: float) -> None:
    """A soft shadow below the body. It hovers, so that a body that dives doesn't push it into the road."""
    height, reach = 0.085, 0.34
    add_polygon(model.geometry(f"{model.name}_shadow"), "shadow",
                [(tail - reach, -half_width - reach, height), (nose + reach, -half_width - reach, height),
                 (nose + reach, half_width + reach, height), (tail - reach, half_width + reach, height)])
