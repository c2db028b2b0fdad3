#!/usr/bin/env bash
# Builds the data point of docs/plugins.md outside the tree, against an installed Panoramic, and loads it there.
# Usage: outside_point.sh SOURCE BUILD WORK: the source tree, its build folder, a folder to work in.
set -euo pipefail
source=$1 build=$2 work=$3
rm -rf "$work"
mkdir -p "$work/point"

# What stands between ```LANGUAGE and ``` in the page.
block() { awk -v begin="\`\`\`$1" '$0 == "```" { on = 0 } on { print } $0 == begin { on = 1 }' "$source/docs/plugins.md"; }
block cpp > "$work/point/Wave.cpp"
block cmake > "$work/point/CMakeLists.txt"

step() { "$@" > "$work/log.txt" 2>&1 || { cat "$work/log.txt"; echo "outside_point: failed: $*"; exit 1; }; }
step cmake --install "$build" --prefix "$work/installed"
step cmake -S "$work/point" -B "$work/point/build" -DCMAKE_PREFIX_PATH="$work/installed" -DCMAKE_BUILD_TYPE=Release
step cmake --build "$work/point/build"

# Each header says for itself all that it needs.
find "$work/installed/include/panoramic" -name '*.h' -printf '#include "%p"\n' | sort > "$work/headers.txt"
[ -s "$work/headers.txt" ]
while read -r line; do
    echo "$line" > "$work/one.cpp"
    step "${CXX:-c++}" -std=c++20 -fsyntax-only -Wall -Werror -I "$work/installed/include/panoramic" "$work/one.cpp"
done < "$work/headers.txt"

PANORAMIC_PLUGIN_PATH=$work/point/build "$work/installed/bin/panoramic" points -v > "$work/points.txt" 2>&1
grep -q '^Wave  *kind 3 (source)  Wave 2$' "$work/points.txt" || { cat "$work/points.txt"; exit 1; }
