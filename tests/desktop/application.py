"""The program under test, with settings of its own and the hook that tells its state."""

from __future__ import annotations

import json
import os
import signal
import socket
import subprocess
import tempfile
import time
from collections.abc import Callable
from pathlib import Path
from typing import Any

from screen import Rectangle, Screen

State = dict[str, Any]


def middle(rectangle: Rectangle) -> tuple[float, float]:
    x, y, width, height = rectangle
    return x + width / 2, y + height / 2


class Application:
    """`panoramic-desktop` on a screen. Its settings live in `home`, which outlives it."""

    def __init__(self, program: Path, screen: Screen, home: Path, arguments: list[str]) -> None:
        self.screen = screen
        self._socket_path = tempfile.mktemp(prefix="panoramic-hook-")
        self.environment = {**os.environ, "DISPLAY": screen.name, "PANORAMIC_TEST_HOOK": self._socket_path,
                            "XDG_CONFIG_HOME": str(home / "config"), "XDG_CACHE_HOME": str(home / "cache"),
                            "XDG_STATE_HOME": str(home / "state"), "XDG_DATA_HOME": str(home / "data"),
                            "QT_QPA_PLATFORM": "xcb", "LC_ALL": "C.UTF-8"}
        self._log = open(home / "desktop.log", "ab")
        self.process = subprocess.Popen([str(program), *arguments], env=self.environment, stdout=self._log,
                                        stderr=self._log)
        self._hook: socket.socket | None = None

    def state(self, line: str = "state") -> State:
        """The program's state now, after it has obeyed `line`; waits for the program to listen first."""
        if self._hook is None:
            self._hook = self._connect()
        self._hook.sendall(line.encode() + b"\n")
        answer = b""
        while not answer.endswith(b"\n"):
            part = self._hook.recv(1 << 20)
            if not part:
                raise RuntimeError("the program has ended")
            answer += part
        return json.loads(answer)

    def _connect(self) -> socket.socket:
        deadline = time.monotonic() + 60
        while time.monotonic() < deadline and self.process.poll() is None:
            hook = socket.socket(socket.AF_UNIX)
            try:
                hook.connect(self._socket_path)
                hook.settimeout(60)
                return hook
            except OSError:
                hook.close()
                time.sleep(0.05)
        raise RuntimeError("the program doesn't listen")

    def wait(self, holds: Callable[[State], bool], what: str, seconds: float = 20) -> State:
        """The first state of which `holds` is true."""
        deadline = time.monotonic() + seconds
        while True:
            state = self.state()
            if holds(state):
                return state
            if time.monotonic() > deadline:
                self.screen.save(Path(os.environ.get("PANORAMIC_TEST_PICTURES", tempfile.gettempdir())) /
                                 "desktop-timeout.png")
                told = {key: value for key, value in state.items() if key not in ("actions", "menu_bar", "log")}
                raise AssertionError(f"not within {seconds} s: {what}\nlast state: {json.dumps(told)}")
            time.sleep(0.05)

    def wait_for_pictures(self) -> State:
        state = self.wait(lambda s: s.get("views_created") and s["drawn_frames"] > 0, "views are drawn", 60)
        time.sleep(0.3)
        return state

    def pane(self, number: int) -> State:
        return self.state()["panes"][number - 1]

    def click_action(self, name: str) -> None:
        """The button of a tool bar."""
        place = self.state()["actions"][name]["tool_bar"]
        assert place, f"{name} has no button on show"
        self.screen.click(*middle(place))

    def click_menu(self, title: str, name: str) -> None:
        self.screen.click(*middle(self.state()["menu_bar"][title]))
        state = self.wait(lambda s: s["actions"][name]["menu"], f"the menu {title} is open")
        self.screen.click(*middle(state["actions"][name]["menu"]))

    def memory(self) -> int:
        """Resident bytes."""
        for line in Path(f"/proc/{self.process.pid}/status").read_text().splitlines():
            if line.startswith("VmRSS"):
                return int(line.split()[1]) * 1024
        raise RuntimeError("no VmRSS")

    def cpu_seconds(self) -> float:
        """Of all threads since the start."""
        fields = Path(f"/proc/{self.process.pid}/stat").read_text().rpartition(")")[2].split()
        return (int(fields[11]) + int(fields[12])) / os.sysconf("SC_CLK_TCK")

    def handles(self) -> int:
        return len(os.listdir(f"/proc/{self.process.pid}/fd"))

    def kill(self) -> None:
        self.process.send_signal(signal.SIGKILL)
        self._end()

    def wait_for_end(self, seconds: float = 30) -> int:
        status = self.process.wait(seconds)
        self._end()
        return status

    def _end(self) -> None:
        self.process.wait()
        if self._hook:
            self._hook.close()
        self._log.close()
