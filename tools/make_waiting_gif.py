#!/usr/bin/env python3
"""Writes data/gif/aguarde.gif, the animated GIF of the gallery: a "please wait" ring of
twelve dots with one bright dot going round, on a transparent background.

Frame 1 draws the whole ring; every later frame redraws only the square of the dot that
turns bright and is put back (disposal 3) afterwards, except every third frame, which
leaves its dot (disposal 1) so that a trail builds up, and the last, which is cleared
(disposal 2). Pure Python, no dependencies; the output is the same on every run.

    tools/make_waiting_gif.py [OUTPUT]
"""
import math
import struct
import sys
from pathlib import Path

SIZE = 48
DOTS = 12
RADIUS = 17
DOT = 4  # dot radius
BOX = 2 * DOT + 2  # square a dot is redrawn in
PALETTE = [(0, 0, 0), (0x1F, 0x4E, 0x79), (0xA9, 0xC4, 0xDE), (0xF2, 0x8C, 0x28)]
TRANSPARENT = 0
RING, DIM, BRIGHT = 1, 2, 3


def lzw(indices, min_code):
    """Classic GIF LZW: returns the data sub-blocks with their terminator."""
    clear, end = 1 << min_code, (1 << min_code) + 1
    bits, next_code = min_code + 1, clear + 2
    table = {}
    out, acc, nacc = bytearray(), 0, 0

    def put(code):
        nonlocal acc, nacc
        acc |= code << nacc
        nacc += bits
        while nacc >= 8:
            out.append(acc & 0xFF)
            acc >>= 8
            nacc -= 8

    put(clear)
    prefix = indices[0]
    for pixel in indices[1:]:
        key = (prefix, pixel)
        if key in table:
            prefix = table[key]
            continue
        put(prefix)
        prefix = pixel
        if next_code < 4096:
            table[key] = next_code
            next_code += 1
            if next_code > (1 << bits) and bits < 12:
                bits += 1
        else:
            put(clear)
            table.clear()
            bits, next_code = min_code + 1, clear + 2
    put(prefix)
    put(end)
    if nacc:
        out.append(acc & 0xFF)
    blocks = bytearray([min_code])
    for i in range(0, len(out), 254):
        chunk = out[i:i + 254]
        blocks += bytes([len(chunk)]) + chunk
    return bytes(blocks + b"\0")


def dot_centre(k):
    angle = 2 * math.pi * k / DOTS - math.pi / 2
    return SIZE / 2 + RADIUS * math.cos(angle), SIZE / 2 + RADIUS * math.sin(angle)


def paint(pixels, width, left, top, k, index):
    cx, cy = dot_centre(k)
    for y in range(len(pixels) // width):
        for x in range(width):
            if (left + x + 0.5 - cx) ** 2 + (top + y + 0.5 - cy) ** 2 <= DOT * DOT:
                pixels[y * width + x] = index


def frame(left, top, width, height, pixels, disposal, delay):
    gce = b"\x21\xF9\x04" + bytes([disposal << 2 | 1]) + struct.pack("<H", delay) + bytes([TRANSPARENT, 0])
    descriptor = b"\x2C" + struct.pack("<HHHH", left, top, width, height) + b"\0"
    return gce + descriptor + lzw(pixels, 2)


def main():
    output = Path(sys.argv[1] if len(sys.argv) > 1 else Path(__file__).resolve().parent.parent / "data/gif/aguarde.gif")
    gif = bytearray(b"GIF89a" + struct.pack("<HH", SIZE, SIZE) + bytes([0xF1, 0, 0]))
    for colour in PALETTE:
        gif += bytes(colour)
    gif += b"\x21\xFF\x0BNETSCAPE2.0\x03\x01\0\0\0"

    ring = [TRANSPARENT] * (SIZE * SIZE)
    for k in range(DOTS):
        paint(ring, SIZE, 0, 0, k, DIM)
    paint(ring, SIZE, 0, 0, 0, BRIGHT)
    gif += frame(0, 0, SIZE, SIZE, ring, 1, 8)
    for k in range(1, DOTS):
        cx, cy = dot_centre(k)
        left, top = int(cx) - BOX // 2, int(cy) - BOX // 2
        pixels = [TRANSPARENT] * (BOX * BOX)
        paint(pixels, BOX, left, top, k, BRIGHT)
        disposal = 2 if k == DOTS - 1 else 1 if k % 3 == 0 else 3
        gif += frame(left, top, BOX, BOX, pixels, disposal, 8)
    gif += b"\x3B"
    output.parent.mkdir(parents=True, exist_ok=True)
    output.write_bytes(bytes(gif))


if __name__ == "__main__":
    main()
