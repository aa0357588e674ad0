#!/usr/bin/env bash
# One page of the gallery looks as its picture in docs/gallery, and loads without a line from Warning on. At most 0.01%
# of the pixels, 48, may have a channel that differs by more than 8 of 255: less than the corners of one border that
# are sharp instead of round. Usage: compare_page.sh PLAYER COMPARE-PICTURES PAGE PICTURE [PLAYER OPTIONS]
set -uo pipefail
player=$1 compare=$2 page=$3 picture=$4
shift 4
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

"$player" --size 800x600 --strict --log warning --png "$work/page.png" "$@" "$page" >"$work/out.txt" 2>"$work/err.txt"
code=$?
if [ $code -ne 0 ] || [ -s "$work/err.txt" ]; then
    echo "$page: exit code $code"
    head -n 10 "$work/err.txt"
    exit 1
fi
"$compare" "$picture" "$work/page.png" --allow 0.01
