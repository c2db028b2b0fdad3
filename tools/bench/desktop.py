"""The rows of the window, measured from outside in an X server of their own: what its user sees and waits for."""

from __future__ import annotations

import re
import shutil
import statistics
import subprocess
import sys
import tempfile
import time
from collections.abc import Iterator
from contextlib import contextmanager
from pathlib import Path

root = Path(__file__).resolve().parents[2]
sys.path.insert(0, str(root / "tests/desktop"))

import numpy as np  # noqa: E402
from application import Application, State, middle  # noqa: E402
from screen import Screen  # noqa: E402

programs = root / "build/release/bin"
example = root / "share/panoramic/example"

views = (964, 604)
"""Four panes of 480x300, and the bars between them."""
measured_seconds = 4.0
wheel_down = 5  # the button that it is for the screen
Pair = tuple[float, float]
"""What is measured, and what it is held against."""


class Window:
    """The application on the example, with settings of its own."""

    def __init__(self, screen: Screen, home: Path) -> None:
        self.screen = screen
        self.application = Application(programs / "panoramic-desktop", screen, home,
                                       [str(example / "example.xml"), "--data", str(example / "run.mdf")])

    def show_views(self) -> None:
        """Until the panes together are as large as `views`."""
        state = self.application.wait_for_pictures()
        for _ in range(3):
            window, area = state["window"], state["view_area"]
            self.screen.resize(window[2] + views[0] - area[2], window[3] + views[1] - area[3])
            time.sleep(0.5)
            state = self.application.state()
            if tuple(state["view_area"][2:]) == views:
                return
        raise RuntimeError(f"the views are {state['view_area'][2:]}, not {views}")

    def wait_until_drawn(self) -> None:
        def drawn(state: State) -> bool:
            return bool(state.get("views_created")) and bool(state["bodies"]) and all(
                pane["drawn"] and self.screen.picture(pane["rectangle"]).reshape(-1, 3).std(axis=0).max() > 5
                for pane in state["panes"])

        self.application.wait(drawn, "every pane shows its picture")

    def frames_per_second(self, seconds: float) -> float:
        first, began = self.application.state()["drawn_frames"], time.perf_counter()
        time.sleep(seconds)
        frames, passed = self.application.state()["drawn_frames"] - first, time.perf_counter() - began
        return frames / passed


@contextmanager
def window_on(screen: Screen, home: Path) -> Iterator[Window]:
    window = Window(screen, home)
    try:
        yield window
    finally:
        window.application.kill()


def window_frames(screen: Screen, home: Path) -> Pair:
    """Frames a second of a replay so slow that its picture all but stands, and of the bare window with that picture."""
    (home / "config/panoramic").mkdir(parents=True, exist_ok=True)
    (home / "config/panoramic/desktop.ini").write_text("[Desktop]\nPaced=0\n", encoding="utf-8")
    with window_on(screen, home) as window:
        window.show_views()
        application = window.application
        screen.click(*middle(application.state()["speed_control"]), button=wheel_down, times=10)
        application.wait(lambda s: s["speed"] < 0.04, "it is slow")
        application.click_action("38750")  # loop
        application.wait(lambda s: s["play_state"] == "loop", "it plays")
        time.sleep(2)
        ours = window.frames_per_second(measured_seconds)
        screen.save(root / "build/release/pictures/bench-window.png")
    bare = subprocess.run([programs / "panoramic_bare_window", *map(str, views), str(measured_seconds)],
                          env=window.application.environment, check=True, stdout=subprocess.PIPE, text=True)
    return ours, float(bare.stdout)


def first_frame(screen: Screen, home: Path) -> Pair:
    """Seconds from the start of the program until every pane shows its picture."""
    began = time.perf_counter()
    with window_on(screen, home) as window:
        window.wait_until_drawn()
        ours = time.perf_counter() - began
    began = time.perf_counter()
    subprocess.run([programs / "panoramic", "snapshot", "--scene", example / "example.xml", "--data",
                    example / "run.mdf", "--time", "0", "--size", "960x600", "-o", home / "picture.png"],
                   env=window.application.environment, check=True, stdout=subprocess.DEVNULL)
    return ours, time.perf_counter() - began


def key_press(screen: Screen, home: Path) -> Pair:
    """Seconds from the key that stops a replay until it has stopped, and of one frame of that replay."""
    with window_on(screen, home) as window:
        window.show_views()
        application = window.application
        waited = []
        frame = 0.0
        for _ in range(15):
            application.click_action("38750")  # loop
            application.wait(lambda s: s["play_state"] == "loop", "it plays")
            frame = frame or 1 / window.frames_per_second(measured_seconds)
            time.sleep(0.2 + 0.01 * len(waited))
            began = time.perf_counter()
            screen.key("space")
            while application.state()["play_state"] != "stopped":
                pass
            waited.append(time.perf_counter() - began)
    return statistics.median(waited), frame


def window_at_rest(screen: Screen, home: Path) -> Pair:
    """CPU seconds that the window takes while nothing runs or moves, and the seconds that pass."""
    with window_on(screen, home) as window:
        window.show_views()
        window.wait_until_drawn()
        time.sleep(2)
        application = window.application
        drawn, used, began = application.state()["drawn_frames"], application.cpu_seconds(), time.perf_counter()
        time.sleep(10)
        pair = application.cpu_seconds() - used, time.perf_counter() - began
        if application.state()["drawn_frames"] > drawn:
            raise RuntimeError("equal pictures are drawn")
        return pair


# row: (how it is measured, how often, what the subject is, what it is held against, the limit, whether it is a least)
ROWS = {
    "window_frames": (window_frames, 3, "frames a second, example in four panes 480x300",
                      "bare Qt window and viewer, same views", 0.95, True),
    "window_at_rest": (window_at_rest, 1, "CPU time of the stopped window", "time that passes", 0.03, False),
    "first_frame": (first_frame, 5, "start to first drawn frame of the example", "load and one picture by the command",
                    2.0, False),
    "key_press": (key_press, 3, "from the stop key to the play state, in replay", "one frame's time", 2.0, False),
}


def rows(row_filter: str) -> list:
    table = []
    for row, (measure, times, subject, baseline, limit, least) in ROWS.items():
        if not re.search(row_filter, row):
            continue
        home = Path(tempfile.mkdtemp(prefix="panoramic-bench-"))
        screen = Screen()
        try:
            measure(screen, home)  # the models are in the cache then, and the programs in memory
            pairs = np.array([measure(screen, home) for _ in range(times)])
        finally:
            screen.close()
            shutil.rmtree(home)
        table.append({"row": row, "subject": subject, "baseline": baseline, "measured": pairs.tolist(),
                      "value": float(np.median(pairs[:, 0]) / np.median(pairs[:, 1])), "limit": limit,
                      "least": least})
    return table
