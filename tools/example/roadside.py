"""What stands along the road: start gantry, lamp posts, guard rails, cones, signs; and the sky above."""

from __future__ import annotations

import numpy as np

from course import Course
from images import Array as Picture
from images import blend, clouds, distance_grid, fill, plain, shade, text_width, write_text
from mesh import add_box, add_grid, add_polygon, add_revolution, add_tube, unit
from models import Material, Model

_METAL = Material(texture="metal.png", specular=0.35, shininess=30, ambient=0.7)
_FACES = Material(texture="sign_faces.png", specular=0.05, ambient=0.7)


def metal() -> Picture:
    return shade(plain(64, 64, (0.62, 0.64, 0.66)), 1 + 0.05 * clouds((64, 64), (4, 4), 701, 3))


def banner() -> Picture:
    """The board of the gantry, 1024 x 128."""
    picture = plain(128, 1024, (0.05, 0.16, 0.36))
    across, down = distance_grid(128, 1024)
    chequer = (np.floor(across * 64) + np.floor(down * 8)) % 2
    ends = (across < 0.125) | (across > 0.875)
    picture = blend(picture, np.where(chequer[:, :, None] > 0, 0.85, 0.05), ends.astype(float))
    text = "PANORAMIC"
    write_text(picture, text, (1024 - text_width(text, 12)) // 2, 22, 12, (0.92, 0.93, 0.95))
    fill(picture, 0.125, 0.93, 0.875, 1.0, (0.90, 0.50, 0.05))
    return picture


def cone_stripes() -> Picture:
    picture = plain(64, 16, (0.85, 0.22, 0.03))
    fill(picture, 0, 0.25, 1, 0.42, (0.85, 0.85, 0.84))
    fill(picture, 0, 0.58, 1, 0.75, (0.85, 0.85, 0.84))
    return picture


def sign_faces() -> Picture:
    """256 x 128: a speed limit on the left, a chevron board for bends on the right."""
    picture = plain(128, 256, (0.80, 0.80, 0.78))
    across, down = distance_grid(128, 128)
    radius = np.hypot(across - 0.5, down - 0.5)
    disc = blend(plain(128, 128, (0.55, 0.56, 0.57)), (0.80, 0.80, 0.78), (radius < 0.5).astype(float))
    disc = blend(disc, (0.72, 0.03, 0.03), ((radius > 0.36) & (radius < 0.49)).astype(float))
    write_text(disc, "60", 64 - text_width("60", 6) // 2, 43, 6, (0.03, 0.03, 0.03))
    picture[:, :128] = disc
    stripe = np.mod(across * 2 + np.abs(down - 0.5) * 1.6, 1) < 0.5
    picture[:, 128:] = blend(plain(128, 128, (0.82, 0.82, 0.80)), (0.72, 0.03, 0.03), stripe.astype(float))
    return picture


def gantry() -> Model:
    """An arch over the road, which runs along x below it."""
    model = Model("Gantry", {"metal": _METAL, "banner": Material(texture="banner.png", specular=0.1, ambient=0.6)})
    mesh = model.geometry("Gantry_arch")
    reach, low, high = 6.2, 5.4, 6.9
    for y in (-reach, reach):
        for x in (-0.45, 0.45):
            add_tube(mesh, "metal", (x, y, -0.5), (x, y, high), 0.08, 8)
        for z in np.arange(0.2, high - 0.5, 1.0):
            add_tube(mesh, "metal", (-0.45, y, z), (0.45, y, z + 0.9), 0.035, 5)
        add_box(mesh, "metal", (-0.8, y - 0.45, -0.4), (0.8, y + 0.45, 0.12), texel=1.0)
    for x in (-0.45, 0.45):
        for z in (low, high):
            add_tube(mesh, "metal", (x, -reach, z), (x, reach, z), 0.07, 8)
    add_box(mesh, "metal", (-0.40, -reach, low), (0.40, reach, high), texel=1.5, sides="zZ")
    for way in (-1, 1):
        x = way * 0.54
        face = [(x, -way * reach * 0.97, low - 0.05), (x, way * reach * 0.97, low - 0.05),
                (x, way * reach * 0.97, high + 0.1),
                (x, -way * reach * 0.97, high + 0.1)]
        add_polygon(mesh, "banner", face)
    return model


def lamp() -> Model:
    """A street lamp, 8 m high, that reaches out towards +x."""
    model = Model("Lamp", {"metal": _METAL, "glow": Material(diffuse=(0.85, 0.85, 0.78), emission=0.3)})
    mesh = model.geometry("Lamp_post")
    add_revolution(mesh, "metal", [(0.16, -0.3), (0.16, 0.5), (0.09, 0.6), (0.06, 7.2)], segments=10, crease=30)
    bend = [(0.0, 7.2), (0.25, 7.65), (0.7, 7.92), (1.3, 8.02)]
    for (x0, z0), (x1, z1) in zip(bend, bend[1:]):
        add_tube(mesh, "metal", (x0, 0, z0), (x1, 0, z1), 0.055, 7, capped=False)
    add_box(mesh, "metal", (1.2, -0.14, 7.98), (2.0, 0.14, 8.10), texel=1.0)
    add_polygon(mesh, "glow", [(1.25, 0.11, 7.97), (1.95, 0.11, 7.97), (1.95, -0.11, 7.97), (1.25, -0.11, 7.97)])
    return model


def cone() -> Model:
    model = Model("Cone", {"stripes": Material(texture="cone_stripes.png", specular=0.1, shininess=20)})
    mesh = model.geometry("Cone_body")
    add_revolution(mesh, "stripes", [(0.14, 0.03), (0.03, 0.50), (0.0, 0.50)], segments=14)
    add_box(mesh, "stripes", (-0.19, -0.19, 0.0), (0.19, 0.19, 0.035), texel=4.0, sides="xXyYZ")
    return model


def speed_sign() -> Model:
    model = Model("SpeedSign", {"metal": _METAL, "faces": _FACES})
    mesh = model.geometry("SpeedSign_board")
    add_tube(mesh, "metal", (-0.08, 0, -0.4), (-0.08, 0, 2.75), 0.035, 8)
    turn = np.radians(np.linspace(0, 360, 25)[:-1])
    rim = np.stack([np.full(24, 0.012), 0.35 * np.cos(turn), 2.5 + 0.35 * np.sin(turn)], axis=-1)
    add_polygon(mesh, "faces", rim, np.stack([0.25 + 0.244 * np.cos(turn), 0.5 + 0.488 * np.sin(turn)], axis=-1))
    add_polygon(mesh, "metal", (rim - [0.045, 0, 0])[::-1])
    return model


def chevron() -> Model:
    """A board on a post that faces +x and points to its own right, where a bend to the left goes."""
    model = Model("Chevron", {"metal": _METAL, "faces": _FACES})
    mesh = model.geometry("Chevron_board")
    add_tube(mesh, "metal", (-0.08, 0, -0.4), (-0.08, 0, 1.3), 0.035, 8)
    board = np.array([(0.012, -0.45, 0.7), (0.012, 0.45, 0.7), (0.012, 0.45, 1.3), (0.012, -0.45, 1.3)])
    add_polygon(mesh, "faces", board, [(0.505, 0), (0.995, 0), (0.995, 1), (0.505, 1)])
    add_polygon(mesh, "metal", (board - [0.045, 0, 0])[::-1])
    return model


_RAIL = np.array([(0.0, 0.43), (0.06, 0.49), (0.0, 0.59), (0.06, 0.69), (0.0, 0.75)])   # reach, height


def guard_rails(course: Course) -> Model:
    """The rails along the outside of the faster bends, with their posts, as one model in place."""
    model = Model("GuardRails", {"metal": _METAL})
    mesh = model.geometry("GuardRails_steel")
    for first, last, side in RAILS:
        s = np.arange(first, last, 4.0)
        # Both ends swing outward and down into the verge.
        ends = np.clip(np.minimum(s - s[0], s[-1] - s) / 9.0, 0, 1)
        offset = side * (6.3 + 0.9 * (1 - ends))
        drop = 0.7 * (1 - ends) ** 2 + 0.08
        reach, z = _RAIL[:, 0], _RAIL[:, 1]
        plan = course.point(s[:, None], offset[:, None] - side * (0.08 + reach[None, :]))
        points = np.concatenate([plan, (z[None, :] - drop[:, None])[..., None]], axis=-1)
        uvs = np.stack(np.broadcast_arrays(s[:, None] / 2.0, np.linspace(0, 1, len(z))[None, :]), axis=-1)
        back = points.copy()
        back[..., :2] += plan[:, :1] - plan[:, 1:2]
        add_grid(mesh, "metal", points, None, uvs, flip=side < 0)
        add_grid(mesh, "metal", back, None, uvs, flip=side > 0)
        for at, off, sink in zip(s, offset, drop):
            foot = np.append(course.point(at, off), -0.5)
            add_tube(mesh, "metal", foot, [foot[0], foot[1], 0.70 - sink], 0.05, 4, capped=False)
    return model


# From s to s, and the side: 1 left, -1 right, always the outside of a bend.
RAILS = [(392.0, 640.0, -1), (770.0, 905.0, -1), (1000.0, 1075.0, -1), (1255.0, 1425.0, -1)]


def sky_dome() -> Model:
    """A dome of 3 km radius that shines by itself; its lower rim hides behind the hills."""
    model = Model("Sky", {"sky": Material(texture="sky.png", specular=0.0, emission=1.0, ambient=0.0)})
    turn = np.linspace(0, 2 * np.pi, 49)
    height = np.radians(np.concatenate([[-6.0, 0.0], np.linspace(4, 90, 13)]))
    ball = np.stack([np.cos(turn)[:, None] * np.cos(height), np.sin(turn)[:, None] * np.cos(height),
                     np.broadcast_to(np.sin(height), (49, 15))], axis=-1)
    v = np.clip((np.degrees(height) + 2) / 93, 0.004, 0.985)
    uvs = np.stack(np.broadcast_arrays(-turn[:, None] / (2 * np.pi) * 3, v[None, :]), axis=-1)
    add_grid(model.geometry("Sky_dome"), "sky", ball * 3000.0, unit(-ball), uvs, flip=True)
    return model
