"""The desktop application as its user meets it: a window on a screen, driven by mouse and keyboard from outside.

What is seen is asserted on by pixels, what isn't by the hook, which only reads. Arguments: program, example folder,
folder for pictures.
"""

from __future__ import annotations

import shutil
import sys
import tempfile
import time
import unittest
from pathlib import Path

import numpy as np

from application import Application, State, middle
from screen import Rectangle, Screen

program, example, pictures = (Path(argument) for argument in sys.argv[1:4])


def differing(before: np.ndarray, after: np.ndarray) -> float:
    """Share of the pixels that changed visibly."""
    return float((np.abs(before.astype(int) - after.astype(int)).max(axis=2) > 12).mean())


def spread(picture: np.ndarray) -> float:
    """0 where everything has one colour."""
    return float(picture.reshape(-1, 3).std(axis=0).max())


def distance(a: list[float], b: list[float]) -> float:
    return float(np.linalg.norm(np.subtract(a, b)))


def inner(rectangle: Rectangle, margin: int = 4) -> Rectangle:
    x, y, width, height = rectangle
    return [x + margin, y + margin, width - 2 * margin, height - 2 * margin]


class WindowTest(unittest.TestCase):
    screen: Screen

    @classmethod
    def setUpClass(cls) -> None:
        cls.screen = Screen()

    @classmethod
    def tearDownClass(cls) -> None:
        cls.screen.close()

    def setUp(self) -> None:
        self.home = Path(tempfile.mkdtemp(prefix="panoramic-home-"))
        self.scene = self.home / "scene.xml"
        shutil.copy(example / "example.xml", self.scene)
        self.application: Application | None = None

    def tearDown(self) -> None:
        if self.application and self.application.process.poll() is None:
            self.application.kill()
        shutil.rmtree(self.home)

    def start(self, *arguments: str) -> State:
        self.application = Application(program, self.screen, self.home, list(arguments))
        return self.application.wait_for_pictures()

    def start_example(self, *arguments: str) -> State:
        return self.start(str(self.scene), "--data", str(example / "run.mdf"), *arguments)

    def pane_picture(self, number: int) -> np.ndarray:
        return self.screen.picture(inner(self.application.pane(number)["rectangle"]))

    def dialog(self, part: str) -> State:
        state = self.application.wait(lambda s: any(part in d["text"] + d["title"] for d in s["dialogs"]),
                                      f"a box about {part}")
        return next(d for d in state["dialogs"] if part in d["text"] + d["title"])

    def answer(self, box: State, button: str) -> None:
        self.screen.click(*middle(box["buttons"][button]))
        self.application.wait(lambda s: not s["dialogs"] and s["has_keyboard"], "the box has gone")

    # Opening

    def test_the_example_opens_in_four_panes_that_show_it(self) -> None:
        state = self.start_example()
        self.assertEqual([pane["observer"] for pane in state["panes"]], ["Free1", "Ride", "Chase", "Roadside"])
        self.assertFalse(state["modified"])
        area = state["view_area"]
        covered = 0
        for pane in state["panes"]:
            self.assertTrue(pane["in_viewer"])
            self.assertGreater(spread(self.screen.picture(inner(pane["rectangle"]))), 20, pane["name"])
            covered += pane["rectangle"][2] * pane["rectangle"][3]
        self.assertGreater(covered / (area[2] * area[3]), 0.97)
        self.screen.save(pictures / "desktop-open.png")

    def test_a_scene_that_cannot_be_read_leaves_the_open_one(self) -> None:
        self.start_example()
        broken = self.home / "broken.xml"
        broken.write_text("<?xml version=\"1.0\"?>\n<vtattr:Scene")
        self.screen.key("Control_L+o")
        self.application.wait(lambda s: s["dialogs"] and s["dialogs"][0]["has_keyboard"], "the file dialog is open")
        self.type(str(broken))
        self.application.wait(lambda s: str(broken) in s["dialogs"][0]["fields"], "the name is typed")
        self.screen.key("Return")
        box = self.dialog("broken.xml")
        self.assertEqual(box["icon"], 3, box)
        self.screen.save(pictures / "desktop-error.png")
        self.answer(box, "OK")
        self.assertEqual(self.application.state()["document"], str(self.scene))
        self.assertIn("Sedan", self.application.state()["bodies"])

    def type(self, text: str) -> None:
        names = {"/": "slash", ".": "period", "-": "minus", "_": "underscore"}
        for letter in text:
            name = names.get(letter, letter)
            shifted = letter.isupper() or letter == "_"
            self.screen.key(f"Shift_L+{name}" if shifted else name)

    # Playing

    def test_play_pause_and_steps_move_the_car_and_grey_the_buttons(self) -> None:
        state = self.start_example()
        self.assertTrue(state["actions"]["38751"]["enabled"], "play")
        self.assertFalse(state["actions"]["38747"]["enabled"], "nothing to stop")
        stop = state["actions"]["38747"]["tool_bar"]
        greyed = self.screen.picture(stop)
        before = self.pane_picture(3)

        self.screen.key("space")
        began = self.application.wait(lambda s: s["play_state"] == "once", "the replay runs")
        state = self.application.wait(
            lambda s: distance(s["bodies"]["Sedan"], began["bodies"]["Sedan"]) > 1, "the car moves")
        self.assertTrue(state["actions"]["38747"]["enabled"])
        self.assertFalse(state["actions"]["38748"]["enabled"], "no step while it runs")
        self.assertGreater(differing(greyed, self.screen.picture(stop)), 0.02, "the button looks live")
        self.screen.save(pictures / "desktop-play.png")

        self.screen.key("space")
        state = self.application.wait(lambda s: s["play_state"] == "stopped", "space stops it")
        time.sleep(0.5)
        self.assertEqual(self.application.state()["frame"], state["frame"])
        self.screen.move(5, 5)
        time.sleep(0.3)
        self.assertLess(differing(greyed, self.screen.picture(stop)), 0.01, "greyed as before")
        self.assertGreater(differing(before, self.pane_picture(3)), 0.05, "another stretch of road")

        frame = self.application.state()["frame"]
        self.screen.key("Right")
        self.application.wait(lambda s: s["frame"] == frame + 1, "one frame on")
        self.screen.key("Left")
        self.application.wait(lambda s: s["frame"] == frame, "and back")
        self.screen.key("End")
        state = self.application.wait(lambda s: s["frame"] == s["frames"], "the last frame")
        self.application.wait(lambda s: not s["actions"]["38748"]["enabled"], "none behind it")
        self.screen.key("Home")
        self.application.wait(lambda s: s["frame"] == 1 and not s["actions"]["38746"]["enabled"], "the first frame")

    def test_the_keyboard_goes_round_panes_and_docks_also_of_the_next_scene(self) -> None:
        self.start_example()
        for pane in (1, 2, 3, 4, 4, 4, 1):  # the two docks lie between the last pane and the first
            self.screen.key("F6")
            self.application.wait(lambda s, p=pane: s["panes"][p - 1]["active"], f"pane {pane} is the active one")
        self.screen.key("Control_L+n")
        self.application.wait(lambda s: s["views_created"] and not s["bodies"], "a new scene")
        for pane in (1, 2):
            self.screen.key("F6")
            self.application.wait(lambda s, p=pane: s["panes"][p - 1]["active"], f"pane {pane} of the new scene")

    def test_a_replay_has_to_be_stopped_before_the_program_ends(self) -> None:
        self.start_example("--play")
        self.application.wait(lambda s: s["play_state"] != "stopped", "it plays")
        self.screen.key("Control_L+q")
        box = self.dialog("running")
        self.assertEqual(box["icon"], 1, "information")
        self.answer(box, "OK")
        self.screen.key("space")
        self.application.wait(lambda s: s["play_state"] == "stopped", "it stands")
        self.screen.key("Control_L+q")
        self.assertEqual(self.application.wait_for_end(), 0)

    # Looking around

    def test_the_mouse_flies_a_free_observer_and_nothing_else(self) -> None:
        state = self.start_example()
        free, ride = state["panes"][0], state["panes"][1]
        before = self.pane_picture(1)
        x, y = middle(free["rectangle"])
        self.screen.move(x, y)
        self.screen.press()
        for step in range(10):
            self.screen.move(x + step * 4, y - step * 6)
            time.sleep(0.03)
        time.sleep(1)
        self.screen.release()
        time.sleep(0.3)
        after = self.application.pane(1)
        self.assertGreater(distance(after["eye"], free["eye"]), 0.5, "it drove")
        self.assertGreater(distance(after["look"], free["look"]), 0.01, "it turned")
        self.assertLess(distance(self.application.pane(2)["eye"], ride["eye"]), 0.01, "the rider stays")
        self.assertGreater(differing(before, self.pane_picture(1)), 0.1)
        time.sleep(0.5)
        self.assertLess(distance(self.application.pane(1)["eye"], after["eye"]), 1e-6, "released is released")

    def test_a_click_activates_a_pane_and_its_menu_chooses_the_observer(self) -> None:
        state = self.start_example()
        self.screen.click(*middle(state["panes"][3]["rectangle"]))
        self.application.wait(lambda s: s["panes"][3]["active"], "pane 4 is the active one")
        self.screen.click(*middle(state["panes"][1]["rectangle"]), button=3)
        state = self.application.wait(lambda s: s["menus"], "the pane's menu is open")
        entries = {entry["text"].replace("&", ""): entry for menu in state["menus"] for entry in menu}
        observers = self.application.state()["observers"]
        if not set(observers) <= set(entries):  # they stand in a menu of their own
            submenu = next(entry for text, entry in entries.items() if "bserver" in text)
            self.screen.click(*middle(submenu["rectangle"]))
            state = self.application.wait(lambda s: len(s["menus"]) > 1, "the menu of observers")
            entries = {entry["text"].replace("&", ""): entry for menu in state["menus"] for entry in menu}
        self.assertLessEqual(set(observers), set(entries))
        self.assertTrue(entries["Ride"]["checked"])
        self.screen.save(pictures / "desktop-menu.png")
        self.screen.click(*middle(entries["Above"]["rectangle"]))
        self.application.wait(lambda s: s["panes"][1]["observer"] == "Above", "the pane looks through it")

    def test_a_double_click_selects_a_body_and_on_nothing_enlarges(self) -> None:
        state = self.start_example()
        x, y, width, height = state["panes"][2]["rectangle"]
        for share in (0.6, 0.7, 0.5):  # the car stands before the camera that chases it
            self.screen.click(x + width / 2, y + height * share, times=2)
            time.sleep(0.5)
            if self.application.state()["selected"] == "Sedan":
                break
        self.assertEqual(self.application.state()["selected"], "Sedan")
        self.assertEqual(self.application.state()["layout"], 3)

        self.screen.key("Control_L+n")  # the example has a sky; a new scene has nothing to be hit
        self.application.wait(lambda s: s["views_created"] and not s["bodies"], "a new scene")
        self.screen.click(x + width / 2, y + height / 2)
        time.sleep(0.6)
        self.screen.click(x + width / 2, y + height / 2, times=2)
        state = self.application.wait(lambda s: s["layout"] == 0, "one pane")
        area = state["view_area"]
        self.assertEqual(state["panes"][2]["rectangle"][2:], area[2:], "it fills the frame")

    # Layouts and sizes

    def test_layouts_share_the_window_and_the_bars_can_be_dragged(self) -> None:
        state = self.start_example()
        shown = {"38709": {1}, "38707": {1, 2}, "38706": {1, 3}, "38708": {1, 2, 3, 4}}
        for command, expected in shown.items():
            self.application.click_action(command)
            state = self.application.wait(
                lambda s, e=expected: {p["pane"] for p in s["panes"] if p["in_viewer"]} == e, f"panes {expected}")
            time.sleep(0.5)
            for pane in state["panes"]:
                if pane["pane"] in expected:
                    picture = self.screen.picture(inner(self.application.pane(pane["pane"])["rectangle"]))
                    self.assertGreater(spread(picture), 20, f"{command}: pane {pane['pane']}")
            if command == "38709":
                self.assertEqual(state["panes"][0]["rectangle"], state["view_area"])
                self.screen.save(pictures / "desktop-single.png")

        x, y, width, height = state["panes"][0]["rectangle"]
        self.screen.drag((x + width + 2, y + height / 2), (x + width + 122, y + height / 2))
        state = self.application.wait(lambda s: abs(s["panes"][0]["rectangle"][2] - width - 120) <= 4,
                                      "the columns' bar moved")
        x, y, width, height = state["panes"][0]["rectangle"]
        self.screen.drag((x + width / 2, y + height + 2), (x + width / 2, y + height - 78))
        state = self.application.wait(lambda s: abs(s["panes"][0]["rectangle"][3] - height + 80) <= 4,
                                      "the rows' bar moved")
        time.sleep(0.5)
        for number in range(1, 5):
            self.assertGreater(spread(self.pane_picture(number)), 20)

    def test_a_stopped_window_draws_changes_and_what_was_covered_and_nothing_else(self) -> None:
        self.start_example()
        time.sleep(1)
        drawn = self.application.state()["drawn_frames"]
        time.sleep(1)
        self.assertEqual(self.application.state()["drawn_frames"], drawn, "equal pictures are drawn")

        before = self.pane_picture(2)
        self.screen.key("Control_L+o")
        self.application.wait(lambda s: s["dialogs"] and s["dialogs"][0]["has_keyboard"], "the file dialog is open")
        time.sleep(0.3)
        self.screen.key("Escape")
        self.application.wait(lambda s: not s["dialogs"], "it has gone")
        time.sleep(0.5)
        for number in range(1, 5):
            self.assertGreater(spread(self.pane_picture(number)), 20, f"pane {number} shows what covered it")
        self.assertLess(differing(before, self.pane_picture(2)), 0.01)
        self.application.click_action("38728")  # wire frame
        time.sleep(0.5)
        self.assertGreater(differing(before, self.pane_picture(2)), 0.1)

    def test_a_window_made_small_and_large_again_draws_on(self) -> None:
        state = self.start_example("--play")
        self.screen.resize(1, 1)
        self.application.wait(lambda s: s["window"][2] < state["window"][2], "it is small")
        time.sleep(1)
        self.assertNotEqual(self.application.state()["play_state"], "", "it lives")
        self.screen.resize(1400, 900)
        state = self.application.wait(lambda s: s["window"][2] >= 1390, "it is large")
        drawn = state["drawn_frames"]
        self.application.wait(lambda s: s["drawn_frames"] > drawn + 3, "frames go on")
        time.sleep(1)
        for number in range(1, 5):
            self.assertGreater(spread(self.pane_picture(number)), 20, f"pane {number}")

    def test_a_minimised_window_rests_and_comes_back(self) -> None:
        self.start_example("--play")
        self.screen.minimise()
        self.application.wait(lambda s: s["minimised"], "it is minimised")
        time.sleep(0.5)
        before = self.application.state()
        time.sleep(2)
        after = self.application.state()
        self.assertEqual(after["frame"], before["frame"], "nothing moves that nobody sees")
        self.assertLessEqual(after["drawn_frames"], before["drawn_frames"] + 1)
        self.screen.restore()
        state = self.application.wait(lambda s: not s["minimised"] and s["drawn_frames"] > after["drawn_frames"] + 2,
                                      "it draws again")
        self.assertGreater(state["time"], after["time"] + 1, "the data are where the clock is")

    def test_a_hidden_window_comes_back_over_the_screen_and_draws(self) -> None:
        self.start_example("--play")
        hidden = self.application.state("hide")
        self.assertFalse(hidden["shown"])
        self.assertFalse(hidden["minimised"], "the cycle goes on for what else is on the screen")
        moved = self.application.wait(lambda s: s["frame"] > hidden["frame"] + 5, "the replay goes on")
        self.application.state("show")
        self.application.wait(lambda s: s["shown"] and s["maximised"] and s["drawn_frames"] > moved["drawn_frames"] + 2,
                              "it draws again")
        for number in range(1, 5):
            self.assertGreater(spread(self.pane_picture(number)), 20, f"pane {number}")

    # Keeping

    def test_a_changed_scene_is_asked_for_and_saved_whole(self) -> None:
        self.start_example()
        self.application.click_action("38728")  # wire frame
        self.application.wait(lambda s: s["modified"], "the scene counts as changed")
        self.screen.close_main_window()
        box = self.dialog("scene.xml")
        self.screen.save(pictures / "desktop-question.png")
        self.answer(box, "Cancel")
        self.assertIsNone(self.application.process.poll())
        self.screen.key("Control_L+s")
        self.application.wait(lambda s: not s["modified"], "it is saved")
        self.screen.key("Control_L+q")
        self.assertEqual(self.application.wait_for_end(), 0)
        self.assertIn("global_render_mode", self.scene.read_text())
        state = self.start(str(self.scene))
        self.assertTrue(state["actions"]["38728"]["checked"], "wire frame came back")

    def test_a_killed_program_finds_its_settings_and_scene_whole(self) -> None:
        self.start_example("--play")
        self.application.click_action("38707")
        state = self.application.wait(lambda s: s["layout"] == 1, "two columns")
        x, y, width, _ = state["docks"]["log"]["rectangle"]
        self.screen.click(x + width - 9, y + 9)  # its cross
        self.application.wait(lambda s: not s["docks"]["log"]["visible"], "the log is closed")
        self.screen.resize(1111, 777)
        time.sleep(2)
        before = self.scene.read_bytes()
        self.application.kill()
        self.assertEqual(self.scene.read_bytes(), before)
        state = self.start(str(self.scene))
        self.assertEqual(state["dialogs"], [], "nothing is damaged")
        self.assertLess(abs(state["window"][2] - 1111), 20, "the window's size came back")
        self.assertFalse(state["docks"]["log"]["visible"], "the log stayed closed")
        self.assertTrue(state["docks"]["controllerDock"]["visible"])


if __name__ == "__main__":
    unittest.main(argv=[sys.argv[0], *sys.argv[4:]], verbosity=2)
