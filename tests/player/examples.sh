#!/usr/bin/env bash
# Every example page loads, at both of its sizes, without a line from Warning on. The pages of a game's size have 100
# to 400 elements. Usage: examples.sh PLAYER EXAMPLES
set -uo pipefail
player=$1
examples=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
failures=0

for page in "$examples"/*/index.html; do
    for size in 1280x720 1920x1080; do
        "$player" --size $size --strict --log warning --boxes "$work/boxes.json" "$page" >"$work/out.txt" 2>"$work/err.txt"
        code=$?
        if [ $code -ne 0 ] || [ -s "$work/err.txt" ]; then
            echo "$page at $size: exit code $code"
            head -n 10 "$work/err.txt"
            failures=1
        fi
    done
    count=$(grep -o '"tag"' "$work/boxes.json" | wc -l)
    [[ $page == */hello/* || $page == */text/* ]] && continue
    if [ "$count" -lt 100 ] || [ "$count" -gt 400 ]; then
        echo "$page has $count elements"
        failures=1
    fi
done
exit $failures
