"""No folder sees a header of one that stands above it, and each sees its own and what lies below.

Arguments: the list of folders from the bottom up, a line "target|prefix|folder|include folder|..." each; the compiler.
"""

from __future__ import annotations

import os
import subprocess
import sys
import tempfile
from pathlib import Path
from typing import NamedTuple


class Folder(NamedTuple):
    target: str
    prefix: str
    headers: list[str]  # as an #include names them
    includes: list[str]


def read(line: str) -> Folder:
    target, prefix, path, *includes = line.split("|")
    return Folder(target, prefix, sorted(f"{prefix}/{header.name}" for header in Path(path).glob("*.h")), includes)


def check(folder: Folder, above: list[Folder], below: list[Folder]) -> list[str]:
    """What the compiler finds by the include folders of `folder` and shouldn't, or the other way round."""
    lines = []
    for other in above:
        for header in other.headers:
            lines += [f'#if __has_include("{header}")', f'#error "{folder.prefix} sees {header}, which stands above it"', "#endif"]
    # A folder that finds nothing at all would pass the lines above.
    linked = [other for other in below if any(include.endswith("/" + other.target) for include in folder.includes)]
    for header in [header for other in [folder, *linked] for header in other.headers]:
        lines += [f'#if !__has_include("{header}")', f'#error "{folder.prefix} does not find {header}"', "#endif"]
    with tempfile.TemporaryDirectory() as temporary:
        source = Path(temporary) / "directions.cpp"
        source.write_text("\n".join(lines) + "\n")
        result = subprocess.run([sys.argv[2], "-E", *(f"-I{include}" for include in folder.includes if include), source,
                                 "-o", os.devnull], capture_output=True, text=True)
    return [line for line in result.stderr.splitlines() if "error: #error" in line] or (
        [result.stderr] if result.returncode else [])


def main() -> int:
    folders = [read(line) for line in Path(sys.argv[1]).read_text().splitlines()]
    wrong = [line for i, folder in enumerate(folders) for line in check(folder, folders[i + 1:], folders[:i])]
    print("\n".join(wrong) or f"{len(folders)} folders see what lies below them and nothing above")
    return bool(wrong)


if __name__ == "__main__":
    sys.exit(main())
