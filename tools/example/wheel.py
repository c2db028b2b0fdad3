"""The road wheel: tyre, five twin spokes, brake disc. One model serves all corners of both vehicles.

It is built about the origin with its axle along y (model z), and looks the same from both sides,
so that a channel's frame can stay the plain one (x forward, y left, z up) on the left and the right.
"""

from __future__ import annotations

import numpy as np

from mesh import Array, Mesh, add_grid, add_revolution, rotation, scaling, unit
from models import Material, Model

RADIUS = 0.325
_WIDTH = 0.215
_RIM = 0.222


def _tyre() -> Mesh:
    """Revolved by hand: its texture runs from bead to bead, with the tread in the middle."""
    w = _WIDTH / 2
    half = [(_RIM - 0.004, 0.80), (_RIM + 0.012, 0.90), (0.255, 1.0), (0.285, 0.99), (0.306, 0.92),
            (0.318, 0.80), (RADIUS, 0.60), (RADIUS, 0.0)]
    profile = np.array([(r, -w * y) for r, y in half] + [(r, w * y) for r, y in half[-2::-1]])
    length = np.concatenate([[0], np.cumsum(np.linalg.norm(np.diff(profile, axis=0), axis=1))])
    segments = 36
    angle = np.linspace(0, 2 * np.pi, segments + 1)
    along = np.gradient(profile, axis=0)
    outward = unit(np.stack([along[:, 1], -along[:, 0]], axis=-1))

    def spun(pairs: Array) -> Array:
        return np.stack([np.cos(angle)[:, None] * pairs[None, :, 0],
                         np.broadcast_to(pairs[None, :, 1], (segments + 1, len(pairs))),
                         np.sin(angle)[:, None] * pairs[None, :, 0]], axis=-1)

    v = 1 - length / length[-1]
    uvs = np.stack(np.broadcast_arrays(angle[:, None] / (2 * np.pi) * 3, v[None, :]), axis=-1)
    mesh = Mesh()
    add_grid(mesh, "tyre", spun(profile), spun(outward), uvs, flip=True)
    return mesh


def _side() -> Mesh:
    """Half of the rim, the one that faces +y: flange, barrel, spokes and hub."""
    mesh = Mesh()
    flange = [(0.190, 0.020), (0.198, 0.060), (0.205, 0.082), (0.214, 0.088), (_RIM, 0.090), (_RIM + 0.003, 0.084)]
    add_revolution(mesh, "rim", flange[::-1], "y", 30, crease=50)
    add_revolution(mesh, "dark", [(0.192, 0.022), (0.192, 0.004), (0.150, 0.004)], "y", 24)
    hub = [(0.066, 0.030), (0.062, 0.062), (0.052, 0.072), (0.030, 0.076), (0.030, 0.070), (0.0, 0.070)]
    add_revolution(mesh, "rim", hub, "y", 20, crease=35)
    for index in range(5):
        for lean in (-10.5, 10.5):
            mesh.extend(_spoke(), rotation("y", 72 * index + lean))
        bolt = Mesh()
        add_revolution(bolt, "dark", [(0.0075, 0.066), (0.0075, 0.0725), (0.0, 0.0725)], "y", 6)
        mesh.extend(bolt, rotation("y", 72 * index + 36) @ np.array(
            [[1, 0, 0, 0.045], [0, 1, 0, 0], [0, 0, 1, 0], [0, 0, 0, 1.0]]))
    return mesh


def _spoke() -> Mesh:
    """A bar from the hub to the flange, highest along its middle, dished towards the hub."""
    radii = np.array([0.045, 0.085, 0.13, 0.170, 0.202])
    widths = np.array([0.019, 0.0155, 0.0135, 0.0145, 0.019])
    heights = np.array([0.060, 0.062, 0.070, 0.078, 0.080])
    across = np.array([-1.0, -0.62, 0.62, 1.0])
    drop = np.array([0.030, 0.0, 0.0, 0.030])
    points = np.stack([np.broadcast_to(radii[:, None], (5, 4)), heights[:, None] - drop[None, :],
                       widths[:, None] * across[None, :]], axis=-1)
    mesh = Mesh()
    for first in range(3):
        strip = points[:, first:first + 2]
        normals = unit(np.cross(strip[:, 1] - strip[:, 0], [1.0, 0.1, 0.0]))
        add_grid(mesh, "rim", strip, np.stack([normals, normals], axis=1), flip=True)
    return mesh


def wheel() -> Model:
    model = Model("Wheel", {
        "tyre": Material(texture="tyre.png", specular=0.10, shininess=12, ambient=0.6),
        "rim": Material(texture="rim.png", specular=0.8, shininess=45, ambient=0.5),
        "dark": Material(texture="dark.png", specular=0.2, shininess=20),
    })
    mesh = model.geometry("Wheel_body")
    mesh.extend(_tyre())
    side = _side()
    add_revolution(side, "disc", [(0.150, 0.0), (0.150, 0.014), (0.075, 0.014)], "y", 24)
    model.materials["disc"] = Material(texture="disc.png", specular=0.5, shininess=30)
    mesh.extend(side)
    mesh.extend(side, scaling(1, -1, 1))
    return model
