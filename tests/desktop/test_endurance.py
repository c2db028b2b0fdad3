"""What only long use shows: the desktop application keeps neither memory nor handles that it no longer needs.

Arguments: program, example folder, folder for pictures, then as unittest takes them.
"""

from __future__ import annotations

import math
import shutil
import sys
import tempfile
import time
import unittest
from pathlib import Path
from typing import NamedTuple

from application import Application, State, middle
from screen import Screen

program, example = (Path(argument) for argument in sys.argv[1:3])

wheel_up = 4  # the button that it is for the screen


class Held(NamedTuple):
    """What the program holds of the system."""

    handles: int
    contexts: int
    memory: int  # bytes


class EnduranceTest(unittest.TestCase):
    def setUp(self) -> None:
        self.screen = Screen()
        self.home = Path(tempfile.mkdtemp(prefix="panoramic-home-"))
        self.scene = self.home / "scene.xml"
        shutil.copy(example / "example.xml", self.scene)
        self.application = Application(program, self.screen, self.home, [str(self.scene), "--data",
                                                                         str(example / "run.mdf")])
        self.application.wait_for_pictures()

    def tearDown(self) -> None:
        if self.application.process.poll() is None:
            self.application.kill()
        self.screen.close()
        shutil.rmtree(self.home)

    def test_replay_of_an_hour_takes_no_more_memory_than_of_a_minute(self) -> None:
        # So slow at first that every place of the run is seen.
        self.play_at(4)
        self.application.wait(lambda s: s["time"] > 60, "a minute has been played", 60)
        memory = self.application.memory()
        self.screen.key("space")
        self.application.wait(lambda s: s["play_state"] == "stopped", "it stands")

        fastest, hour = 32, 3600
        self.play_at(fastest)
        began = time.monotonic()
        first = self.application.state()
        rounds, before = 0, first["time"]
        while (time.monotonic() - began) * fastest < hour:
            time.sleep(0.1)
            now = self.application.state()["time"]
            rounds += now < before
            before = now
        last = self.application.state()
        self.assertGreater(rounds, 10, "the data have begun again and again")
        self.assertGreater(last["drawn_frames"] - first["drawn_frames"], 200)
        growth = self.application.memory() / memory - 1
        print(f"{hour} s of data, {rounds} rounds, {last['drawn_frames'] - first['drawn_frames']} frames: "
              f"memory {memory >> 20} MB {growth:+.2%}")
        self.assertLess(growth, 0.02)

    def play_at(self, speed: float) -> None:
        """Round and round, from where it is."""
        self.screen.click(*middle(self.application.state()["speed_control"]), button=wheel_up,
                          times=round(math.log2(speed / self.application.state()["speed"])))
        self.application.wait(lambda s: s["speed"] == speed, "the speed is chosen")
        self.application.click_action("38750")  # loop
        self.application.wait(lambda s: s["play_state"] == "loop", "it plays round and round")

    def test_scenes_that_were_closed_leave_nothing_behind(self) -> None:
        rounds, warm = 200, 20
        for done in range(1, rounds + 1):
            self.close()
            if done == warm:
                before = self.held_once_settled()
            if done < rounds:
                self.open()
        after = self.held_once_settled()
        print(f"{rounds} scenes: {before} at first, {after} at last")
        self.assertEqual(after.contexts, before.contexts)
        self.assertLessEqual(after.handles, before.handles)
        self.assertLess(after.memory / before.memory, 1.02)
        self.assertEqual(self.application.state()["dialogs"], [])

    def close(self) -> None:
        """An empty scene takes the place of the open one."""
        self.screen.key("Control_L+n")
        self.application.wait(lambda s: s["views_created"] and not s["bodies"], "an empty scene")

    def held_once_settled(self) -> Held:
        """What is held once handles that are at work just then are back: the same for a second, or after 30 s as it is."""
        deadline = time.monotonic() + 30
        held, since = self.held(), time.monotonic()
        while time.monotonic() - since < 1 and time.monotonic() < deadline:
            time.sleep(0.1)
            now = self.held()
            if (now.handles, now.contexts) != (held.handles, held.contexts):
                since = time.monotonic()
            held = now
        return held

    def held(self) -> Held:
        contexts = self.application.state()["contexts"]
        return Held(self.application.handles(), contexts, self.application.memory())

    def open(self) -> None:
        """The scene again, by the list of recent files."""
        self.screen.click(*middle(self.application.state()["menu_bar"]["File"]))
        self.screen.click(*self.entry("recent"))
        self.screen.click(*self.entry("scene.xml"))
        self.application.wait(lambda s: s["views_created"] and s["bodies"], "the scene is back")

    def entry(self, part: str) -> tuple[float, float]:
        def found(state: State) -> list[State]:
            return [e for menu in state["menus"] for e in menu if part in e["text"].replace("&", "").lower()]

        return middle(found(self.application.wait(lambda s: bool(found(s)), f"an entry {part}"))[0]["rectangle"])


if __name__ == "__main__":
    unittest.main(argv=[sys.argv[0], *sys.argv[4:]], verbosity=2)
