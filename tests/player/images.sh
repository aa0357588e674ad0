#!/usr/bin/env bash
# A page of raster images has the same pixels in every thread mode, and a capture of it brings its images along.
# Usage: images.sh PLAYER REPLAY
set -euo pipefail
here=$(dirname "$0")
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
python3 - "$work" <<'END'
import struct, sys, zlib
def png(name, width, height, pixel):
    rows = b"".join(b"\0" + b"".join(bytes(pixel(x, y)) for x in range(width)) for y in range(height))
    chunk = lambda kind, body: struct.pack(">I", len(body)) + kind + body + struct.pack(">I", zlib.crc32(kind + body))
    with open(f"{sys.argv[1]}/{name}", "wb") as file:
        file.write(b"\x89PNG\r\n\x1a\n" + chunk(b"IHDR", struct.pack(">IIBBBBB", width, height, 8, 6, 0, 0, 0)) +
                   chunk(b"IDAT", zlib.compress(rows)) + chunk(b"IEND", b""))
png("photo.png", 64, 48, lambda x, y: (x * 4, y * 5, 128, 255))
png("frame.png", 30, 30, lambda x, y: (200, 150, 0, 255) if min(x, y, 29 - x, 29 - y) < 10 else (0, 0, 0, 0))
png("hole.png", 40, 40, lambda x, y: (0, 0, 0, 255 if (x - 20) ** 2 + (y - 20) ** 2 < 300 else 40))
END
cat >"$work/index.html" <<'END'
<html><head><style>
body { margin: 0; background-color: #ddd; }
div { position: absolute; width: 160px; height: 100px; }
#b { left: 180px; background: url(photo.png) no-repeat 50% 50%; }
#c { left: 360px; background-image: url(photo.png); background-size: cover; border-radius: 30px; }
#d { top: 120px; background-image: url(hole.png), url(photo.png); background-size: 25px 25px, 100% 100%; }
#e { top: 120px; left: 180px; border: 10px solid black; border-image: url(frame.png) 10 / 20px round; box-sizing: border-box; }
#f { top: 120px; left: 360px; background-color: #26c; mask-image: url(hole.png); mask-size: contain; }
#g { top: 240px; background-image: url(photo.png); transform: rotate(20deg) scale(0.4); opacity: 0.6; }
</style></head><body>
<div style="background-image: url(photo.png)"></div><div id=b></div><div id=c></div><div id=d></div>
<div id=e></div><div id=f></div><div id=g></div>
</body></html>
END
"$here/modes.sh" "$1" "$work/index.html"
"$here/replay.sh" "$1" "$2" "$work/index.html"
# With placeholders while images are on their way, and with some that never come.
for seed in 1 2 3; do
    "$1" --size 800x600 --unruly $seed --log error "$work/index.html" >/dev/null 2>"$work/err.txt"
    [ ! -s "$work/err.txt" ] || { echo "seed $seed"; cat "$work/err.txt"; exit 1; }
done
