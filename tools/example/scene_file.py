"""The scene as a file, "example.xml": its bodies, the observers, and the four panes (docs/scene-file.md)."""

from __future__ import annotations

from collections import Counter
from pathlib import Path
from uuid import UUID, uuid5
from xml.sax.saxutils import escape

from observers import BACK, FREE, OBSERVERS, VIEWS, Observer
from run import CHANNELS
from scene import PRODUCT, Entry, Placed

LAYOUT, SETTINGS, VIEW, OBSERVER, STATIC, MOVABLE, DEFAULT_OBSERVER = 1, 2, 3, 5, 6, 7, 9
_MIXED = 5
_IDS = UUID("7f0e5b52-3c0f-4b0d-9d4b-2f6a3a1c8e11")   # of this file; ids stay the same from run to run

Value = int | float | str | tuple[float, ...]


def write_scene(entries: dict[str, Entry], placed: list[Placed], path: Path) -> None:
    """Writes the records in the order in which they are loaded."""
    records = [_record(SETTINGS, "RenderSettings", "RenderSettings", global_render_mode=_MIXED)]
    records += [_observer(observer) for observer in OBSERVERS if observer.mode == FREE]
    records += [_movable(entries, name, index) for index, name in enumerate(CHANNELS)]
    records += _statics(entries, placed)
    records += [_observer(observer) for observer in OBSERVERS if observer.mode != FREE]
    records += [_record(VIEW, _id(f"view {view.pane}"), view.observer, observer=view.observer,
                        view_angle=float(view.angle), front_clip_plane=float(view.front), back_clip_plane=BACK,
                        view_pos=view.pane) for view in VIEWS]
    records.append(_record(LAYOUT, _id("window layout"), "Window_Layout", splitter_position=(0.5, 0.5)))
    path.write_text('<?xml version="1.0" encoding="UTF-8"?>\n'
                    '<vtattr:Scene xmlns:vtattr="urn:panoramic:attributes" version="1">\n'
                    + "".join(records) + "</vtattr:Scene>\n", encoding="utf-8")


def _id(name: str) -> str:
    return str(uuid5(_IDS, name))


def _observer(observer: Observer) -> str:
    if observer.mode == FREE:
        roll, pitch, heading = observer.turn
        return _record(DEFAULT_OBSERVER, observer.name, observer.name, behaviour=FREE, position=observer.place,
                       orientation=(roll, -pitch, heading))   # a free observer's pitch counts downwards
    target = {"attached_to": observer.body} if observer.body else {}
    return _record(OBSERVER, _id(f"observer {observer.name}"), observer.name, behaviour=observer.mode, **target,
                   translation=observer.place, rotation=observer.turn)


def _movable(entries: dict[str, Entry], name: str, index: int) -> str:
    """A body is called like its channel, and bound to it by number and by name."""
    model = entries[name] if name in entries else entries["Wheel"]
    return _record(MOVABLE, _id(f"body {name}"), name, file_path=_library_path(model), simulation_data_stream=index,
                   simulation_data_index=name)


def _statics(entries: dict[str, Entry], placed: list[Placed]) -> list[str]:
    many = Counter(each.name for each in placed)
    seen: Counter[str] = Counter()
    records = []
    for each in placed:
        seen[each.name] += 1
        name = f"{each.name} {seen[each.name]}" if many[each.name] > 1 else each.name
        place = {"position": (each.x, each.y, each.z)} if any((each.x, each.y, each.z)) else {}
        turn = {"rotation": (0.0, 0.0, each.turn % 360)} if each.turn % 360 else {}
        records.append(_record(STATIC, _id(f"static {name}"), name, file_path=_library_path(entries[each.name]),
                               **place, **turn))
    return records


def _library_path(entry: Entry) -> str:
    token = "%Vantor_Objects%" if entry.library == PRODUCT else "%Customer_Objects%"
    return "\\".join([token, *entry.path.removeprefix(entry.library + "/").split("/")])


def _record(kind: int, internal_id: str, name: str, **attributes: Value) -> str:
    lines = [f'  <vtattr:Object type="{kind}">']
    for key, value in {"object_type": kind, "internal_id": internal_id, "name": name, **attributes}.items():
        form, text = _value(value)
        lines.append(f'    <vtattr:Attribute name="{key}" type="{form}"><vtattr:value>{escape(text)}</vtattr:value>'
                     "</vtattr:Attribute>")
    return "\n".join([*lines, "  </vtattr:Object>", ""])


def _value(value: Value) -> tuple[str, str]:
    """The name of an attribute's type and the value as text."""
    if isinstance(value, str):
        return "string", value
    if isinstance(value, int):
        return "int", str(value)
    if isinstance(value, float):
        return "float", _number(value)
    return "floatTupel3" if len(value) == 3 else "floatList", " ".join(_number(part) for part in value)


def _number(value: float) -> str:
    text = f"{value:.2f}".rstrip("0").rstrip(".")
    return "0" if text == "-0" else text
