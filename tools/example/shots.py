"""When to take pictures of the run: "example.shots" with a place to look from for each, "panes.shots" of the scene file's
four panes.
"""

from __future__ import annotations

from dataclasses import dataclass
from pathlib import Path

import numpy as np

from course import Course
from run import DURATION, RATE, SEDAN, places


@dataclass(frozen=True)
class Shot:
    """A picture at a time. Eye and look: metres along the road from where the saloon is then, left of its
    centre line, above it. A replay may be some frames late, so there is room ahead of the saloon.
    """

    time: float
    name: str
    eye: tuple[float, float, float]
    look: tuple[float, float, float]


SHOTS = [
    Shot(0.6, "1-start", (6.4, 1.5, 1.5), (0.4, -1.9, 0.75)),
    Shot(6.0, "2-off-the-line", (-7.0, -3.4, 1.9), (6.0, -1.6, 0.9)),
    Shot(20.6, "3-first-bend", (17.0, 3.6, 1.3), (2.5, -1.8, 0.6)),
    Shot(27.4, "4-hump", (12.5, 3.2, 1.7), (4.0, -1.6, 0.5)),
    Shot(36.2, "5-behind-the-van", (-9.0, 0.5, 5.2), (14.0, -1.2, 0.0)),
    Shot(46.6, "6-passing", (17.5, 6.4, 1.7), (5.0, 0.8, 0.7)),
    Shot(58.2, "7-chicane", (16.0, -6.5, 1.6), (4.0, -1.0, 0.6)),
    Shot(64.0, "8-course", (-70.0, -150.0, 95.0), (90.0, 110.0, -20.0)),
]

PANES = [(4.5, "1-start"), (20.6, "2-first-bend"), (28.0, "3-hump"), (42.5, "4-behind-the-van"), (44.6, "5-braking"),
         (46.0, "6-passing"), (47.9, "7-past-the-roadside"), (58.2, "8-chicane")]


def write_pane_shots(path: Path) -> None:
    lines = ["# time  name of the picture", *(f"{time:g} {name}" for time, name in PANES)]
    path.write_text("\n".join(lines) + "\n", encoding="utf-8")


def write_shots(course: Course, path: Path) -> None:
    time = np.arange(round(DURATION * RATE)) / RATE
    along = places(course, SEDAN, time)
    lines = ["# time  eye x,y,z  look x,y,z  name of the picture"]

    def scene(s: float, place: tuple[float, float, float]) -> str:
        x, y = course.point(s + place[0], place[1])
        return ",".join(f"{value:.2f}" for value in (x, y, place[2]))

    for shot in SHOTS:
        s = float(np.interp(shot.time, time, along))
        lines.append(f"{shot.time:g} {scene(s, shot.eye)} {scene(s, shot.look)} {shot.name}")
    path.write_text("\n".join(lines) + "\n", encoding="utf-8")
