#!/usr/bin/env python3
"""Draws the NIB box's marks into resources/nib/: a navy tick (16 and 32 pixels) for a
valid number and a red no-entry disc (32 pixels) for a wrong one. Standard library only,
so the output is the same on every machine."""

import math
from pathlib import Path

import pngio

SAMPLES = 4  # supersampling per axis, for smooth edges


def render(size, inside):
    """inside(x, y) -> colour or None, in unit coordinates 0..1; coverage-averaged."""
    rows = []
    for py in range(size):
        row = []
        for px in range(size):
            acc = [0.0, 0.0, 0.0, 0.0]
            for sy in range(SAMPLES):
                for sx in range(SAMPLES):
                    x = (px + (sx + 0.5) / SAMPLES) / size
                    y = (py + (sy + 0.5) / SAMPLES) / size
                    colour = inside(x, y)
                    if colour:
                        for i in range(3):
                            acc[i] += colour[i]
                        acc[3] += 1
            n = SAMPLES * SAMPLES
            alpha = acc[3] / n
            if acc[3]:
                row.append(tuple(round(acc[i] / acc[3]) for i in range(3)) + (round(alpha * 255),))
            else:
                row.append((0, 0, 0, 0))
        rows.append(row)
    return rows


def distance_to_segment(x, y, ax, ay, bx, by):
    dx, dy = bx - ax, by - ay
    t = max(0.0, min(1.0, ((x - ax) * dx + (y - ay) * dy) / (dx * dx + dy * dy)))
    return math.hypot(x - (ax + t * dx), y - (ay + t * dy))


def tick(x, y):
    navy = (0, 0, 128)
    width = 0.11
    if distance_to_segment(x, y, 0.14, 0.52, 0.40, 0.80) < width:
        return navy
    if distance_to_segment(x, y, 0.40, 0.80, 0.88, 0.18) < width:
        return navy
    return None


def no_entry(x, y):
    r = math.hypot(x - 0.5, y - 0.5)
    if r > 0.47:
        return None
    if abs(y - 0.5) < 0.09 and abs(x - 0.5) < 0.30:
        return (255, 255, 255)
    return (204, 0, 0) if r < 0.43 else (128, 0, 0)


def main():
    out = Path(__file__).resolve().parent.parent / "resources" / "nib"
    out.mkdir(parents=True, exist_ok=True)
    pngio.write(out / "validpic16.png", 16, 16, render(16, tick), alpha=True)
    pngio.write(out / "validpic32.png", 32, 32, render(32, tick), alpha=True)
    pngio.write(out / "Image1.png", 32, 32, render(32, no_entry), alpha=True)


if __name__ == "__main__":
    main()
