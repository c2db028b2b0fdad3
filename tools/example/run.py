"""The recorded run: the saloon catches up with the van and passes it on the far side of the course.

A pose is that of the body's frame in the scene: x forward, y left, z up. The chassis frame lies on the
ground under the centre between the axles, a wheel's in its hub. Wheels roll about their y axis.
"""

from __future__ import annotations

from dataclasses import dataclass
from pathlib import Path

import numpy as np

import mdf
from course import Course
from curves import smoothstep
from mesh import Array
from wheel import RADIUS

RATE = 100.0
DURATION = 68.0
_GRAVITY = 9.81
CORNERS = ("FL", "FR", "RL", "RR")
CHANNELS = [vehicle + corner for vehicle in ("Sedan", "Van") for corner in ("", *("." + c for c in CORNERS))]


@dataclass(frozen=True)
class Driver:
    """A vehicle and how it is driven; accelerations in m/s^2, speeds in m/s."""

    name: str
    wheelbase: float
    track: float
    start: float            # place of its centre behind or ahead of the start line
    wait: float             # seconds before it moves off
    top_speed: float
    lateral: float
    pull: float
    brake: float
    hump_speed: float
    offset: float
    passing: tuple[float, float] | None = None   # places at which it pulls out and in again
    roll: float = 0.0       # radians for each m/s^2
    pitch: float = 0.0


SEDAN = Driver("Sedan", 2.75, 1.57, start=-4.0, wait=1.0, top_speed=31.0, lateral=5.6, pull=3.6, brake=5.5,
               hump_speed=9.5, offset=-1.95, passing=(925.0, 1035.0), roll=0.0085, pitch=0.0060)
VAN = Driver("Van", 3.10, 1.62, start=262.0, wait=0.0, top_speed=16.5, lateral=2.9, pull=1.6, brake=2.6, hump_speed=6.5,
             offset=-2.05, roll=0.0130, pitch=0.0075)


@dataclass(frozen=True)
class Motion:
    """What one vehicle did, a row for each frame."""

    poses: Array            # frames, chassis and four wheels, 4, 4
    speed: Array
    acceleration: Array     # along
    lateral: Array          # to the left
    steer: Array            # of the front wheels, radians to the left
    euler: Array            # roll, pitch, yaw of the chassis in radians


def _smooth(values: Array, seconds: float) -> Array:
    """A running mean with soft ends; the value beyond either end continues at its slope."""
    half = int(seconds * RATE / 2)
    window = np.hanning(2 * half + 3)[1:-1]
    before = values[0] + (values[1] - values[0]) * np.arange(-half, 0)
    after = values[-1] + (values[-1] - values[-2]) * np.arange(1, half + 1)
    return np.convolve(np.concatenate([before, values, after]), window / window.sum(), "valid")


def places(course: Course, driver: Driver, time: Array) -> Array:
    """Arc length of the vehicle's centre at each time: as fast as bends, humps, pull and brakes let it."""
    step = 0.25
    s = np.arange(0, 2100, step) + course.start_line + driver.start
    # A driver looks at the bend as a whole; the sampled curvature is spread over a car's length.
    bend = np.max([np.abs(course.curvature_at(s + shift)) for shift in (-4, 0, 4)], axis=0)
    limit = np.minimum(driver.top_speed, np.sqrt(driver.lateral / np.maximum(bend, 1e-4)))
    for patch in course.patches:
        if patch.height:
            lap = course.length
            away = np.abs(np.mod(s - (patch.start + patch.end) / 2 + lap / 2, lap) - lap / 2)
            limit = np.where(away < driver.wheelbase / 2 + 2.5, np.minimum(limit, driver.hump_speed), limit)
    limit = limit.copy()
    for i in range(len(s) - 2, -1, -1):
        limit[i] = min(limit[i], np.sqrt(limit[i + 1] ** 2 + 2 * driver.brake * step))
    speed = limit.copy()
    speed[0] = 0.0 if driver.wait else limit[0]
    for i in range(1, len(s)):
        pull = driver.pull * (1 - 0.75 * speed[i - 1] / driver.top_speed)
        speed[i] = min(limit[i], np.sqrt(speed[i - 1] ** 2 + 2 * pull * step))
    arrival = driver.wait + np.concatenate([[0], np.cumsum(2 * step / (speed[1:] + speed[:-1]))])
    return np.interp(time, arrival, s)


def _offset(course: Course, driver: Driver, s: Array) -> Array:
    """Lateral place: the own lane, a little towards the inside of bends, the other lane while passing."""
    spread = np.arange(-24, 25, 4.0)
    bend = np.mean([course.curvature_at(s + shift) for shift in spread], axis=0)
    line = driver.offset + np.clip(bend * 22, -0.55, 0.55)
    if driver.passing:
        out, back = driver.passing
        line = line + 3.85 * (smoothstep(out, out + 42, s) - smoothstep(back, back + 46, s))
    return line


def _filtered(target: Array, hertz: float, damping: float) -> Array:
    """A sprung mass that follows the target."""
    result, rate = np.empty_like(target), 0.0
    value, omega, step = target[0], 2 * np.pi * hertz, 1 / RATE
    for i, goal in enumerate(target):
        rate += (omega * omega * (goal - value) - 2 * damping * omega * rate) * step
        value += rate * step
        result[i] = value
    return result


def _turn(axis: int, angle: Array) -> Array:
    c, s = np.cos(angle), np.sin(angle)
    matrix = np.zeros(angle.shape + (4, 4))
    matrix[..., range(4), range(4)] = 1
    i, j = [(1, 2), (2, 0), (0, 1)][axis]
    matrix[..., i, i] = matrix[..., j, j] = c
    matrix[..., i, j], matrix[..., j, i] = -s, s
    return matrix


def drive(course: Course, driver: Driver) -> Motion:
    time = np.arange(round(DURATION * RATE)) / RATE
    s = _smooth(places(course, driver, time), 0.7)

    def on_line(place: Array) -> Array:
        return course.point(place, _offset(course, driver, place))

    front, rear = on_line(s + driver.wheelbase / 2), on_line(s - driver.wheelbase / 2)
    centre = (front + rear) / 2
    ahead = front - rear
    yaw = np.unwrap(np.arctan2(ahead[:, 1], ahead[:, 0]))
    course_ahead = on_line(s + driver.wheelbase / 2 + 0.5) - on_line(s + driver.wheelbase / 2 - 0.5)
    steer = np.unwrap(np.arctan2(course_ahead[:, 1], course_ahead[:, 0])) - yaw
    steer = _smooth(np.mod(steer + np.pi, 2 * np.pi) - np.pi, 0.15)

    velocity = np.gradient(centre, 1 / RATE, axis=0)
    speed = np.hypot(velocity[:, 0], velocity[:, 1])
    acceleration = _smooth(np.gradient(speed, 1 / RATE), 0.2)
    lateral = _smooth(speed * np.gradient(yaw, 1 / RATE), 0.2)

    # The road under each wheel, then the body on its springs.
    reach, side = driver.wheelbase / 2, driver.track / 2
    hubs = np.array([(reach, side), (reach, -side), (-reach, side), (-reach, -side)])
    offset = _offset(course, driver, s)
    ground = np.stack([course.height(s + x, offset + y) for x, y in hubs], axis=-1)
    heave = _filtered(ground.mean(axis=1), 1.7, 0.40)
    slope = (ground[:, 2] + ground[:, 3] - ground[:, 0] - ground[:, 1]) / 2 / driver.wheelbase
    pitch = _filtered(slope - driver.pitch * acceleration, 1.5, 0.35)
    bank = (ground[:, 0] + ground[:, 2] - ground[:, 1] - ground[:, 3]) / 2 / driver.track
    roll = _filtered(bank + driver.roll * lateral, 1.4, 0.40)

    poses = np.zeros((len(time), 5, 4, 4))
    # Roll and pitch turn about an axis a little above the ground, so the wheels stay in their arches.
    chassis = _turn(2, yaw) @ _turn(1, pitch) @ _turn(0, roll)
    chassis[:, :2, 3], chassis[:, 2, 3] = centre, heave
    poses[:, 0] = chassis
    level = _turn(2, yaw)
    for index, (x, y) in enumerate(hubs):
        place = centre + level[:, :2, 0] * x + level[:, :2, 1] * y
        rolled = np.concatenate([[0], np.cumsum(np.linalg.norm(np.diff(place, axis=0), axis=1))]) / RADIUS
        turned = yaw + (steer if x > 0 else 0)
        wheel = _turn(2, turned) @ _turn(0, np.full_like(yaw, -0.012 * np.sign(y))) @ _turn(1, rolled)
        wheel[:, :2, 3], wheel[:, 2, 3] = place, RADIUS + ground[:, index]
        poses[:, 1 + index] = wheel
    return Motion(poses, speed, acceleration, lateral, steer, np.stack([roll, pitch, yaw], axis=-1))


_RATIOS = (3.6, 2.12, 1.45, 1.08, 0.85, 0.68)
_FINAL = 3.9


def _gears(motion: Motion) -> tuple[Array, Array]:
    """Gear and engine speed in 1/min: up at 4300, down at 1600, idling at 820."""
    gear, gears = 1, np.empty(len(motion.speed))
    turns = motion.speed / (2 * np.pi * RADIUS) * 60 * _FINAL
    held = 0
    for i, shaft in enumerate(turns):
        held += 1
        if held > 60 and gear < 6 and shaft * _RATIOS[gear - 1] > (4300 if motion.acceleration[i] > 1.2 else 2900):
            gear, held = gear + 1, 0
        elif held > 40 and gear > 1 and shaft * _RATIOS[gear - 1] < 1600:
            gear, held = gear - 1, 0
        gears[i] = gear
    engine = turns * np.array(_RATIOS)[gears.astype(int) - 1]
    return gears, _smooth(np.maximum(engine, 820.0), 0.25)


def write_run(course: Course, path: Path) -> None:
    sedan, van = drive(course, SEDAN), drive(course, VAN)
    gears, engine = _gears(sedan)
    description = {
        "poses": CHANNELS,
        "instruments": [{"name": "Speed", "unit": "km/h"}, {"name": "EngineSpeed", "unit": "1/min"},
                        {"name": "SteeringAngle", "unit": "deg"}, {"name": "LateralAcceleration", "unit": "m/s^2"},
                        {"name": "Gear", "unit": "-"}, {"name": "Brake", "unit": "%"}],
        "trackSafety": 0, "timeStamps": True}
    frames = np.zeros(len(sedan.speed), mdf.frame_type(description))
    frames["time"] = np.arange(len(frames)) / RATE
    frames["pose"] = np.concatenate([sedan.poses, van.poses], axis=1)
    frames["value"] = np.stack([sedan.speed * 3.6, engine, np.degrees(sedan.steer) * 15.5, sedan.lateral, gears,
                                np.clip(-sedan.acceleration - 0.4, 0, None) / _GRAVITY * 100], axis=-1)
    mdf.write(path, description, frames)


def write_csv(course: Course, path: Path) -> None:
    """Five seconds of the saloon moving off, at 50 Hz, in the columns that the import of tables reads."""
    motion = drive(course, SEDAN)
    rows = ["time,Sedan.x,Sedan.y,Sedan.z,Sedan.roll,Sedan.pitch,Sedan.yaw,Speed [km/h]"]
    for index, frame in enumerate(range(round(SEDAN.wait * RATE), round((SEDAN.wait + 5) * RATE), 2)):
        place, angles = motion.poses[frame, 0, :3, 3], np.degrees(motion.euler[frame])
        cells = (index * 0.02, *place, *angles, motion.speed[frame] * 3.6)
        rows.append(",".join(f"{value + 0.0:.4f}".rstrip("0").rstrip(".") for value in cells))
    path.write_text("\n".join(rows) + "\n", encoding="utf-8")
