#!/usr/bin/env bash
# --dump-style prints every longhand of the first match, one a line, in the order of the property table, which is that
# of docs/css.md. Usage: dump_style.sh PLAYER CSS_REFERENCE
set -uo pipefail
player=$1
reference=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

cat >"$work/page.html" <<'PAGE'
<style>
p { color: red; font-size: 2em; margin: 1px 2px }
#second { background-image: linear-gradient(#fff, #000); transform: rotate(3deg) }
</style>
<p id="first" style="width: 5px"></p><p id="second"></p>
PAGE
"$player" --dump-style p "$work/page.html" >"$work/first.txt" || exit 1
"$player" --dump-style '#second' "$work/page.html" >"$work/second.txt" || exit 1

# Longhands are the rows with six columns.
sed -n 's/^| `\([a-z0-9-]*\)` |.*|.*|.*|.*|.*|$/\1/p' "$reference" >"$work/names.txt"
failures=0
complain() {
    echo "$1"
    failures=1
}
[ "$(wc -l <"$work/names.txt")" -eq 118 ] || complain "docs/css.md does not list 118 longhands"
sed 's/: .*//' "$work/first.txt" | diff "$work/names.txt" - || complain "other names or another order"

expect() { grep -qxF "$2" "$work/$1.txt" || complain "$1 lacks \"$2\": $(grep "^${2%%:*}:" "$work/$1.txt")"; }
expect first "width: 5px"
expect first "color: rgba(255, 0, 0, 1.000000)"
expect first "font-size: 32px"
expect first "margin-left: 2px"
expect second "width: auto"
expect second "background-image: linear-gradient(180deg, rgba(255, 255, 255, 1.000000), rgba(0, 0, 0, 1.000000))"
expect second "transform: rotateZ(3deg)"

for selector in nothing '#third' 'p:nth-child(1)' '{'; do
    "$player" --log none --dump-style "$selector" "$work/page.html" >"$work/out.txt" 2>"$work/err.txt"
    [ $? -eq 2 ] && [ ! -s "$work/out.txt" ] || complain "a selector without match: $selector"
done
exit $failures
