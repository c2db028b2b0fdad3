#!/usr/bin/env bash
# Configures (when needed) and builds: tools/build.sh [-p PRESET] [TARGET...]
# A lock lets only one build run at a time, so that several terminals don't fight over the cores.
set -euo pipefail
cd "$(dirname "$0")/.."

preset=release
[ "${1:-}" = "-p" ] && { preset=$2; shift 2; }
mkdir -p "build/$preset"
exec 9>build/.lock
flock 9
[ -f "build/$preset/build.ninja" ] || cmake --preset "$preset" >"build/$preset/configure.log" || { cat "build/$preset/configure.log" >&2; exit 1; }
ninja -C "build/$preset" --quiet "$@"
