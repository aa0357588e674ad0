#!/usr/bin/env bash
# One page, the same pixels in every thread mode: synchronous, one layout thread, one layout and one
# resource thread, one layout and three resource threads. Usage: modes.sh PLAYER PAGE [RUNS]
set -euo pipefail
player=$1
page=$2
runs=${3:-1}
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

expected=
for ((run = 1; run <= runs; ++run)); do
    for mode in "--sync-layout --workers 0" "--workers 0" "--workers 1" "--workers 3"; do
        # shellcheck disable=SC2086
        "$player" --size 800x600 --strict $mode --png "$work/out.png" "$page" >"$work/out.txt" 2>"$work/err.txt" || {
            echo "run $run, mode $mode failed:"
            cat "$work/err.txt"
            exit 1
        }
        # A data race report of the sanitizer goes to standard error and leaves the exit code alone.
        ! grep -q 'WARNING: ThreadSanitizer' "$work/err.txt" || { cat "$work/err.txt"; exit 1; }
        sum=$(cat "$work/out.png" "$work/out.txt" | sha256sum)
        [ -z "$expected" ] || [ "$sum" = "$expected" ] || { echo "run $run, mode $mode gives other pixels"; exit 1; }
        expected=$sum
    done
done
echo "$runs runs in 4 modes: the same pixels and the same console lines"
