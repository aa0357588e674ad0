#!/usr/bin/env python3
"""Exits 0 when two 8-bit PNG files hold the same pixels, however each was compressed."""
import struct
import sys
import zlib


def pixels(name):
    data = open(name, "rb").read()
    at, width, height, channels, packed = 8, 0, 0, 0, b""
    while at < len(data):
        size, kind = struct.unpack(">I4s", data[at:at + 8])
        body = data[at + 8:at + 8 + size]
        if kind == b"IHDR":
            width, height, depth, colour = struct.unpack(">IIBB", body[:10])
            assert depth == 8
            channels = {0: 1, 2: 3, 6: 4}[colour]
        elif kind == b"IDAT":
            packed += body
        at += size + 12
    return width, height, channels, unfilter(zlib.decompress(packed), height, width * channels, channels)


def unfilter(raw, height, stride, step):
    rows, last = [], bytearray(stride)
    for y in range(height):
        kind, row = raw[y * (stride + 1)], bytearray(raw[y * (stride + 1) + 1:(y + 1) * (stride + 1)])
        for x in range(stride if kind else 0):
            left = row[x - step] if x >= step else 0
            up, corner = last[x], last[x - step] if x >= step else 0
            if kind == 4:
                guess = left + up - corner
                best = min((abs(guess - left), 0, left), (abs(guess - up), 1, up), (abs(guess - corner), 2, corner))
                row[x] = (row[x] + best[2]) & 255
            else:
                row[x] = (row[x] + (left, up, (left + up) // 2)[kind - 1]) & 255
        rows.append(bytes(row))
        last = row
    return rows


sys.exit(0 if pixels(sys.argv[1]) == pixels(sys.argv[2]) else 1)
