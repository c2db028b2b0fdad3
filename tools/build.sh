#!/usr/bin/env bash
# Configures (when needed) and builds: tools/build.sh [-p PRESET] [TARGET...]; all targets unless some are named.
# A lock lets only one build run at a time, so that several terminals don't fight over the cores.
set -euo pipefail
cd "$(dirname "$0")/.."

preset=release
[ "${1:-}" = "-p" ] && { preset=$2; shift 2; }
folder=build/$preset
mkdir -p "$folder"
exec 9>build/.lock
flock 9
SECONDS=0

configure() {
    cmake --preset "$preset" "$@" >"$folder/configure.log" 2>&1 || { cat "$folder/configure.log" >&2; exit 1; }
}

# What was configured before the libraries of the tests were installed is configured again.
if [ ! -f "$folder/build.ninja" ] || { [ -d /usr/include/gtest ] && grep -q '^GTest_DIR.*NOTFOUND' "$folder/CMakeCache.txt"; }; then
    # Sources one by one, under the sanitizers, show which don't include what they use.
    if [ "$preset" = release ]; then configure -DPANORAMIC_UNITY=ON; else configure; fi
fi
if ! ninja -C "$folder" --quiet "$@"; then
    grep -q '^PANORAMIC_UNITY:BOOL=ON' "$folder/CMakeCache.txt" || exit 1
    # Two sources may use one name in their unnamed namespaces; that is no fault of theirs.
    echo "build: again with each source by itself" >&2
    configure -DPANORAMIC_UNITY=OFF
    ninja -C "$folder" --quiet "$@"
fi
echo "build: $((SECONDS / 60)) min $((SECONDS % 60)) s ($folder)"
