"""Where the scene is looked at from: observers of every follow mode, and what the four panes show."""

from __future__ import annotations

from dataclasses import dataclass

import numpy as np

Triple = tuple[float, float, float]

FREE, FIXED, RIGID, HEADING, SMOOTH, LOOK_AT, POSITION, ALONG_X, ALONG_Y = range(9)


@dataclass(frozen=True)
class Observer:
    """`place`: the eye of a free observer, else the translation offset. `turn`: degrees about x (roll), y (pitch, up is
    positive) and z (heading from the scene's or the body's x axis, to the left).
    """

    name: str
    mode: int
    place: Triple
    turn: Triple = (0.0, 0.0, 0.0)
    body: str = ""


@dataclass(frozen=True)
class View:
    """A pane, 1 to 4, its observer, its view angle and where it starts to draw. The default of 15 mm would leave
    too few steps of depth for road and markings in the distance.
    """

    pane: int
    observer: str
    angle: float
    front: float


BACK = 4000.0   # behind the sky, which is 3 km away


def towards(eye: Triple, look: Triple) -> Triple:
    """The turn of an observer at `eye` that looks at `look`."""
    x, y, z = np.subtract(look, eye)
    return (0.0, round(float(np.degrees(np.arctan2(z, np.hypot(x, y)))), 1),
            round(float(np.degrees(np.arctan2(y, x))), 1))


def _looking(name: str, mode: int, eye: Triple, look: Triple, body: str = "") -> Observer:
    return Observer(name, mode, eye, towards(eye, look), body)


# The saloon starts on the main straight, which runs along x at y = -120, drives the eastern bend along y at x = 297,
# and passes the van beside the hump at (-50, 147) after 46 seconds.
OBSERVERS = [
    _looking("Free1", FREE, (-150.0, -170.0, 38.0), (-40.0, -110.0, 0.0)),
    _looking("Free2", FREE, (-260.0, -250.0, 90.0), (20.0, -30.0, 0.0)),
    _looking("Grandstand", FIXED, (-60.0, -107.0, 5.0), (-72.0, -122.0, 0.5)),
    # The models have no cabin inside, so a ride is outside: on the bonnet, and above the windscreen.
    Observer("Bonnet", RIGID, (1.0, 0.0, 1.15), (0.0, -2.0, 0.0), "Sedan"),
    Observer("Ride", HEADING, (-0.35, 0.0, 1.75), (0.0, -4.0, 0.0), "Sedan"),
    Observer("Chase", SMOOTH, (-8.0, 0.0, 2.5), (0.0, -9.0, 0.0), "Sedan"),
    # Turns to the saloon by itself, but keeps its height: the tilt is for the middle of the car when it passes by.
    Observer("Roadside", LOOK_AT, (-66.0, 141.0, 1.4), (0.0, -2.0, 0.0), "Sedan"),
    Observer("Above", POSITION, (0.0, 0.0, 45.0), (0.0, -90.0, 90.0), "Sedan"),
    Observer("Straight", ALONG_X, (0.0, -136.0, 1.5), (0.0, -3.0, 90.0), "Sedan"),
    Observer("East bend", ALONG_Y, (312.0, 0.0, 3.5), (0.0, -8.0, 180.0), "Sedan"),
]

VIEWS = [View(1, "Free1", 40.0, 1.0), View(2, "Ride", 40.0, 0.2), View(3, "Chase", 40.0, 0.5),
         View(4, "Roadside", 36.0, 0.5)]
