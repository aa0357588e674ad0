#!/usr/bin/env bash
# A captured frame replays to the pixels that the player painted. Usage: replay.sh PLAYER REPLAY PAGE
set -euo pipefail
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
"$1" --size 800x600 --capture "$work/frame" --png "$work/painted.png" "$3" >/dev/null
"$2" "$work/frame" --png "$work/replayed.png"
python3 "$(dirname "$0")/same_pixels.py" "$work/painted.png" "$work/replayed.png" ||
    { echo "the replay has other pixels"; exit 1; }
# Cut files are refused with a line, at any place.
size=$(stat -c %s "$work/frame")
for part in 0 1 7 50 99; do
    head -c $((size * part / 100)) "$work/frame" >"$work/cut"
    if "$2" "$work/cut" --png "$work/no.png" 2>"$work/err.txt"; then echo "a cut file was taken"; exit 1; fi
    [ "$(wc -l <"$work/err.txt")" -ge 1 ]
done
