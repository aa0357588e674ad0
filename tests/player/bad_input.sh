#!/usr/bin/env bash
# What a user may hand to the player by mistake ends with a line and the right exit code. Usage: bad_input.sh PLAYER
set -uo pipefail
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
failures=0

# expect CODE ARGUMENTS...: the exit code, and for 2 exactly one line on standard error.
expect() {
    local code=$1
    shift
    "$player" "$@" >"$work/out.txt" 2>"$work/err.txt"
    local got=$?
    if [ $got -ne "$code" ] || { [ "$code" = 2 ] && [ "$(wc -l <"$work/err.txt")" -ne 1 ]; }; then
        echo "expected $code, got $got: $*"
        head -n 5 "$work/err.txt"
        failures=1
    fi
}
player=$1

expect 2 --frames
expect 2 --frames many page.html
expect 2 --size 10 page.html
expect 2 --nonsense page.html
expect 2 "$work/missing.html"
expect 2 "$work"
: >"$work/empty.html"
expect 0 --frames 3 "$work/empty.html"
head -c 100000 /dev/urandom >"$work/binary.html"
expect 0 --frames 3 "$work/binary.html"
printf '<html><body><div style="width:10px' >"$work/cut.html"
expect 0 --frames 3 "$work/cut.html"
printf '<link rel="stylesheet" href="no.css"><script src="no.js"></script><script>throw new Error("x")</script><p>x' >"$work/lost.html"
expect 0 --frames 5 "$work/lost.html"
expect 3 --frames 5 --strict "$work/lost.html"
exit $failures
