"""The scene: which models there are, where they lie in the libraries, and where they stand."""

from __future__ import annotations

from collections.abc import Callable
from dataclasses import dataclass

import numpy as np

import buildings
import land_textures as land
import plants
import roadside
import vehicle_textures as vehicle
from course import EDGE, Course, course_model
from images import Array as Picture
from mesh import Array
from models import Model
from sedan import sedan
from terrain import Terrain, in_field, terrain_model
from van import van
from wheel import wheel

PRODUCT, CUSTOMER = "Vantor Objects/advanced", "Customer_Objects"


@dataclass(frozen=True)
class Entry:
    """A model of a library: made by `make`, in the folder of its group, as .dae or .wrl."""

    library: str
    group: str
    name: str
    make: Callable[[], Model]
    extension: str = "dae"

    @property
    def folder(self) -> str:
        return f"{self.library}/{self.group}/${self.name}"

    @property
    def path(self) -> str:
        return f"{self.folder}/{self.name}.{self.extension}"


@dataclass(frozen=True)
class Placed:
    """A static body: scene coordinates of its origin, and a turn about the upright in degrees."""

    name: str
    x: float = 0.0
    y: float = 0.0
    z: float = 0.0
    turn: float = 0.0


PICTURES: dict[str, Callable[[], Picture]] = {
    **{name: getattr(vehicle, name) for name in ("details", "glass", "tyre", "rim", "dark", "disc", "livery",
                                                 "shadow")},
    **{name: getattr(land, name) for name in ("asphalt", "markings", "gravel", "kerb", "grass", "wheat", "soil", "rape",
                                              "crop", "wood", "sky")},
    **{name: getattr(plants, name) for name in ("leaves", "needles", "bark")},
    **{name: getattr(buildings, name) for name in ("house_wall", "plaster", "tiles", "cladding", "gate_wall", "sheet",
                                                   "facade", "concrete", "seats")},
    **{name: getattr(roadside, name) for name in ("metal", "banner", "cone_stripes", "sign_faces")},
}


def library(course: Course, terrain: Terrain) -> list[Entry]:
    return [
        Entry(PRODUCT, "Vehicles", "Sedan", sedan), Entry(PRODUCT, "Vehicles", "Wheel", wheel),
        Entry(CUSTOMER, "Fleet", "Van", van),
        Entry(PRODUCT, "Roads", "Course", lambda: course_model(course)),
        Entry(PRODUCT, "Roads", "GuardRails", lambda: roadside.guard_rails(course)),
        Entry(PRODUCT, "Landscape", "Ground", lambda: terrain_model(course, terrain)),
        Entry(PRODUCT, "Landscape", "Sky", roadside.sky_dome),
        Entry(PRODUCT, "Landscape", "Fir", plants.fir), Entry(PRODUCT, "Landscape", "Oak", plants.oak),
        Entry(PRODUCT, "Landscape", "Copse", plants.copse),
        Entry(PRODUCT, "Buildings", "House", buildings.house), Entry(PRODUCT, "Buildings", "Hall", buildings.hall),
        Entry(PRODUCT, "Buildings", "Office", buildings.office),
        Entry(PRODUCT, "Buildings", "Grandstand", buildings.grandstand),
        Entry(PRODUCT, "Buildings", "WaterTower", buildings.water_tower, "wrl"),
        Entry(PRODUCT, "Roadside", "Gantry", roadside.gantry), Entry(PRODUCT, "Roadside", "Lamp", roadside.lamp),
        Entry(PRODUCT, "Roadside", "Cone", roadside.cone), Entry(PRODUCT, "Roadside", "SpeedSign", roadside.speed_sign),
        Entry(PRODUCT, "Roadside", "Chevron", roadside.chevron),
    ]


def _by_road(course: Course, name: str, s: float, offset: float, turn: float = 0.0) -> Placed:
    """Something beside the road, turned with it: at 0 its x axis points along the road."""
    x, y = course.point(s, offset)
    away = abs(offset)
    z = -0.03 if away < 5 else -0.10 if away < 7.5 else -0.2
    return Placed(name, float(x), float(y), z if away > 4 else 0.0,
                  float(np.degrees(course.heading_at(s))) % 360 + turn)


def placements(course: Course, terrain: Terrain) -> list[Placed]:
    """All static bodies, in the order in which they are loaded."""
    start = course.start_line
    result = [Placed("Sky"), Placed("Ground"), Placed("Course"), Placed("GuardRails")]
    result.append(_by_road(course, "Gantry", start + 0.8, 0.0))
    for s in np.arange(start - 72, start + 150, 37):
        if abs(s - start) > 8:
            result.append(_by_road(course, "Lamp", float(s), 7.2, -90))
            result.append(_by_road(course, "Lamp", float(s), -7.2, 90))
    for s, offset in ((start + 165, -5.6), (start + 480, -5.6), (start + 810, -5.6)):
        result.append(_by_road(course, "SpeedSign", s, offset, 180))
    # Warning boards on the outside of bends to the left, facing the traffic that comes.
    for first in (400.0, 560.0, 1290.0):
        for k in range(4):
            result.append(_by_road(course, "Chevron", first + 14 * k, -7.4, 180 + 35))
    for k in range(9):
        result.append(_by_road(course, "Cone", start + 40 + 3.0 * k, -4.35 - 0.12 * k, 13.0 * k))

    # The test centre beside the main straight, and a hamlet inside the course.
    north, south = 30.0, -30.0
    result += [_by_road(course, "Grandstand", start + 5, 17.0), _by_road(course, "Office", start - 62, south - 2, 180),
               _by_road(course, "Hall", start + 12, south - 4, 0), _by_road(course, "Hall", start + 62, south - 4, 180),
               _by_road(course, "Hall", start - 60, north + 4, 0)]
    for x, y, turn in ((150, -30, 15), (176, -14, -65), (128, -8, 100), (160, 12, 20), (204, -36, 80),
                       (-95, 60, 30), (-120, 40, -40), (-72, 84, 75), (-132, 88, 10)):
        result.append(Placed("House", x, y, 0.0, turn))
    result += [Placed("WaterTower", 60, -12, 0.0, 20)]
    result += _trees(course, terrain, result)
    return [_on_ground(terrain, p) if p.name in _LEVELLED else p for p in result]


_LEVELLED = {"House", "Hall", "Office", "Grandstand", "WaterTower", "Fir", "Oak", "Copse"}
_ROOM = {"House": 11.0, "Hall": 24.0, "Office": 18.0, "Grandstand": 20.0, "WaterTower": 9.0}


def _on_ground(terrain: Terrain, placed: Placed) -> Placed:
    z = float(terrain.height(np.array([(placed.x, placed.y)]))[0])
    return Placed(placed.name, placed.x, placed.y, z, placed.turn)


def _trees(course: Course, terrain: Terrain, standing: list[Placed]) -> list[Placed]:
    """Single trees near the road, copses farther off; none on the road, in a field or in a house."""
    random = np.random.RandomState(811)
    built = np.array([(p.x, p.y, _ROOM[p.name]) for p in standing if p.name in _ROOM])
    taken: list[tuple[float, float, float]] = []
    result: list[Placed] = []

    def free(at: Array, room: float) -> bool:
        if course.distance(at)[0] < EDGE + room or in_field(at[None, :])[0] >= 0:
            return False
        if (np.hypot(built[:, 0] - at[0], built[:, 1] - at[1]) < built[:, 2] + room).any():
            return False
        return all(np.hypot(x - at[0], y - at[1]) > other + room for x, y, other in taken)

    def plant(name: str, at: Array, room: float) -> None:
        taken.append((at[0], at[1], room))
        result.append(Placed(name, round(float(at[0]), 2), round(float(at[1]), 2), 0.0,
                             round(random.uniform(0, 360), 1)))

    wanted = 70
    while wanted:
        s, side = random.uniform(0, course.length), random.choice([-1, 1])
        at = course.point(s, side * random.uniform(15, 48))
        if free(at, 3.2):
            plant("Oak" if random.uniform() < 0.55 else "Fir", at, 3.2)
            wanted -= 1
    wanted = 34
    while wanted:
        angle, away = random.uniform(0, 2 * np.pi), random.uniform(150, 640)
        at = away * np.array([np.cos(angle), np.sin(angle) * 0.9])
        if free(at, 21.0):
            plant("Copse", at, 19.0)
            wanted -= 1
    return result


def static_argument(entry: Entry, placed: Placed) -> str:
    if not any((placed.x, placed.y, placed.z, placed.turn)):
        return entry.path
    place = ",".join(f"{v:.2f}".rstrip("0").rstrip(".") for v in (placed.x, placed.y, placed.z))
    turn = f"{placed.turn % 360:.1f}".rstrip("0").rstrip(".")
    return f"{entry.path}@{place}" + (f",0,0,{turn}" if turn != "0" else "")


def road_description() -> str:
    """What the road model says about itself: its textures, all three of which lie in the model's one unit."""
    lines = ['<?xml version="1.0" encoding="utf-8"?>',
             '<vtattr:Object xmlns:vtattr="urn:panoramic:attributes" type="6">']
    for name, kind, value in (("object_type", "int", "6"), ("name", "string", "Course"),
                              ("basetexture", "string", "uniform,sampler2D,0"),
                              ("decalMap", "string", "uniform,sampler2D,0"),
                              ("batterTexture", "string", "uniform,sampler2D,0")):
        lines += [f'  <vtattr:Attribute name="{name}" type="{kind}">', f"    <vtattr:value>{value}</vtattr:value>",
                  "  </vtattr:Attribute>"]
    return "\n".join([*lines, "</vtattr:Object>", ""])
