"""An X server of the test's own, with a window manager, a mouse and a keyboard."""

from __future__ import annotations

import os
import subprocess
import time
from pathlib import Path
from typing import Any

import numpy as np
from PIL import Image
from Xlib import X, XK, display, protocol
from Xlib.ext import xtest

Rectangle = list[int]
"""x, y, width, height in pixels of the screen."""


class Screen:
    """Xvfb with openbox, from construction to `close`."""

    def __init__(self, width: int = 1600, height: int = 1000) -> None:
        reading, writing = os.pipe()
        self._server = subprocess.Popen(
            ["Xvfb", "-displayfd", str(writing), "-screen", "0", f"{width}x{height}x24", "-noreset", "-nolisten",
             "tcp"], pass_fds=[writing], stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        os.close(writing)
        with os.fdopen(reading) as numbers:
            number = numbers.readline().strip()
        if not number:
            raise RuntimeError("Xvfb did not start")
        self.name = f":{number}"
        self._display = display.Display(self.name)
        self._root = self._display.screen().root
        self._manager = subprocess.Popen(["openbox"], env={**os.environ, "DISPLAY": self.name},
                                         stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        self._wait_for_manager()

    def _wait_for_manager(self) -> None:
        check = self._display.intern_atom("_NET_SUPPORTING_WM_CHECK")
        for _ in range(100):
            if self._root.get_full_property(check, X.AnyPropertyType):
                return
            time.sleep(0.05)
        raise RuntimeError("openbox did not start")

    def close(self) -> None:
        self._display.close()
        for process in (self._manager, self._server):
            process.terminate()
            process.wait()

    # What is seen

    def picture(self, rectangle: Rectangle | None = None) -> np.ndarray:
        """Height x width x 3, 8 bits: red, green, blue."""
        size = self._root.get_geometry()
        x, y, width, height = rectangle or [0, 0, size.width, size.height]
        data = self._root.get_image(x, y, width, height, X.ZPixmap, 0xFFFFFFFF).data
        return np.frombuffer(data, np.uint8).reshape(height, width, 4)[:, :, 2::-1]

    def save(self, path: Path) -> None:
        path.parent.mkdir(parents=True, exist_ok=True)
        Image.fromarray(np.ascontiguousarray(self.picture())).save(path, optimize=True)

    # The mouse

    def move(self, x: float, y: float) -> None:
        xtest.fake_input(self._display, X.MotionNotify, x=int(x), y=int(y))
        self._display.sync()

    def press(self, button: int = 1) -> None:
        xtest.fake_input(self._display, X.ButtonPress, button)
        self._display.sync()

    def release(self, button: int = 1) -> None:
        xtest.fake_input(self._display, X.ButtonRelease, button)
        self._display.sync()

    def click(self, x: float, y: float, button: int = 1, times: int = 1) -> None:
        self.move(x, y)
        time.sleep(0.05)
        # In one go: the server stamps the events with its own time, and what a busy machine lets lie between two
        # requests would make two single clicks of a double one.
        for _ in range(times):
            xtest.fake_input(self._display, X.ButtonPress, button)
            xtest.fake_input(self._display, X.ButtonRelease, button)
        self._display.sync()

    def drag(self, start: tuple[float, float], end: tuple[float, float], steps: int = 8) -> None:
        self.move(*start)
        time.sleep(0.05)
        self.press()
        for step in range(1, steps + 1):
            share = step / steps
            self.move(start[0] + (end[0] - start[0]) * share, start[1] + (end[1] - start[1]) * share)
            time.sleep(0.02)
        self.release()

    # The keyboard

    def key_down(self, name: str) -> None:
        xtest.fake_input(self._display, X.KeyPress, self._display.keysym_to_keycode(XK.string_to_keysym(name)))
        self._display.sync()

    def key_up(self, name: str) -> None:
        xtest.fake_input(self._display, X.KeyRelease, self._display.keysym_to_keycode(XK.string_to_keysym(name)))
        self._display.sync()

    def key(self, names: str) -> None:
        """ "Control_L+q", "space". """
        keys = names.split("+")
        for name in keys:
            self.key_down(name)
        for name in reversed(keys):
            self.key_up(name)

    # Windows

    def main_window(self) -> Any:
        """The first window that the window manager manages."""
        listed = self._root.get_full_property(self._display.intern_atom("_NET_CLIENT_LIST"), X.AnyPropertyType)
        return self._display.create_resource_object("window", listed.value[0])

    def resize(self, width: int, height: int) -> None:
        self.main_window().configure(width=width, height=height)
        self._display.sync()

    def _tell_manager(self, message: str, *values: int) -> None:
        data = [*values, *[0] * (5 - len(values))]
        event = protocol.event.ClientMessage(window=self.main_window(), client_type=self._display.intern_atom(message),
                                             data=(32, data))
        self._root.send_event(event, event_mask=X.SubstructureRedirectMask | X.SubstructureNotifyMask)
        self._display.sync()

    def close_main_window(self) -> None:
        """What the cross in the window's corner does."""
        self._tell_manager("_NET_CLOSE_WINDOW", X.CurrentTime, 2)

    def minimise(self) -> None:
        self._tell_manager("WM_CHANGE_STATE", 3)

    def restore(self) -> None:
        self._tell_manager("_NET_ACTIVE_WINDOW", 2, X.CurrentTime)
