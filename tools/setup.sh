#!/usr/bin/env bash
# Installs the packages of tools/packages.txt that this machine lacks; tools/setup.sh run: only those in front of the
# heading "tests". Quiet when there is nothing to do.
set -euo pipefail
cd "$(dirname "$0")/.."

last=()
[ "${1:-}" = run ] && last=(-e '/^# tests/,$d')
mapfile -t wanted < <(sed "${last[@]}" -e 's/#.*//' -e 's/[[:space:]]//g' tools/packages.txt | grep -v '^$')
missing=()
for package in "${wanted[@]}"; do
    dpkg-query -W -f='${Status}' "$package" 2>/dev/null | grep -q 'ok installed' || missing+=("$package")
done
[ ${#missing[@]} -eq 0 ] && exit 0

as_root=()
if [ "$(id -u)" -ne 0 ]; then
    command -v sudo >/dev/null || { echo "setup: these packages are missing and neither root nor sudo is at hand: ${missing[*]}" >&2; exit 1; }
    as_root=(sudo)
fi
echo "setup: installing ${missing[*]}"
log=$(mktemp)
if ! { "${as_root[@]}" apt-get update -q &&
       "${as_root[@]}" env DEBIAN_FRONTEND=noninteractive apt-get install -y -q --no-install-recommends "${missing[@]}"; } >"$log" 2>&1; then
    tail -20 "$log" >&2
    echo "setup: apt-get failed; the whole log is $log" >&2
    exit 1
fi
rm -f "$log"
