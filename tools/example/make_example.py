#!/usr/bin/env python3
"""Makes the bundled example: object libraries, road course, landscape, and a run of two vehicles.

    make_example.py                 writes share/panoramic/example
    make_example.py --out FOLDER    writes it there instead
    make_example.py --check         makes it in a temporary folder and compares that with what is committed

The output is the same on every machine, up to the last digits of the numbers: seeds are fixed, and
the check allows for what different versions of numpy and zlib do differently.
"""

from __future__ import annotations

import argparse
import sys
import tempfile
from pathlib import Path

from comparison import compare_folders, shader_difference
from course import Course
from images import write_png
from models import write_collada, write_vrml
from run import CHANNELS, write_csv, write_run
from scene import PICTURES, library, placements, road_description, static_argument
from scene_file import write_scene
from shots import write_pane_shots, write_shots
from terrain import Terrain

SHARE = Path(__file__).resolve().parents[2] / "share" / "panoramic"


def make(folder: Path, say=print) -> None:
    course = Course()
    terrain = Terrain(course)
    entries = {entry.name: entry for entry in library(course, terrain)}
    pictures: dict[str, object] = {}
    for entry in entries.values():
        model = entry.make()
        say(f"  {entry.path}: {model.triangle_count()} triangles")
        write = write_vrml if entry.extension == "wrl" else write_collada
        write(model, folder / entry.path)
        for material in model.materials.values():
            name = material.texture.removesuffix(".png")
            if name:
                if name not in pictures:
                    pictures[name] = PICTURES[name]()
                write_png(folder / entry.folder / material.texture, pictures[name])
    (folder / entries["Course"].folder / "Imported.xml").write_text(road_description(), encoding="utf-8")

    say("  example.xml, example.args, run.mdf, example.csv, example.shots, panes.shots")
    write_run(course, folder / "run.mdf")
    write_csv(course, folder / "example.csv")
    write_shots(course, folder / "example.shots")
    write_pane_shots(folder / "panes.shots")
    standing = placements(course, terrain)
    write_scene(entries, standing, folder / "example.xml")
    lines = []
    for placed in standing:
        lines += ["--static", static_argument(entries[placed.name], placed)]
    for channel in CHANNELS:
        lines += ["--movable", f"{channel}={entries.get(channel, entries['Wheel']).path}"]
    lines += ["--data", "run.mdf"]
    (folder / "example.args").write_text("\n".join(lines) + "\n", encoding="utf-8")


def check() -> int:
    differences = shader_difference(SHARE / "Assets")
    with tempfile.TemporaryDirectory() as temporary:
        make(Path(temporary), say=lambda text: None)
        differences += compare_folders(Path(temporary), SHARE / "example")
    for line in differences:
        print(line, file=sys.stderr)
    if not differences:
        print("the example is what the generator makes")
    return 1 if differences else 0


def main() -> int:
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--check", action="store_true", help="compare with the committed output, write nothing")
    parser.add_argument("--out", type=Path, default=SHARE / "example", help="folder to write to")
    arguments = parser.parse_args()
    if arguments.check:
        return check()
    print(f"making {arguments.out}")
    make(arguments.out)
    return 0


if __name__ == "__main__":
    sys.exit(main())
