#!/usr/bin/env python3
"""Makes the default skin set of the skinned controls.

    tools/make_skins.py [OUT_DIR]

OUT_DIR defaults to data/skins/default of this source tree. Every picture is a GIF
whose pixels outside the drawn shape use the transparent colour index, so the controls'
masks have something to cut away. The pictures are drawn from numbers alone (no time
stamps, no randomness): running the script again gives the same bytes.
"""

import math
import sys
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parent))
from gifio import write_gif  # noqa: E402

OUT_DIR = Path(__file__).resolve().parent.parent / "data" / "skins" / "default"

TRANSPARENT = 0  # palette index 0 is the see-through colour of every picture


class Canvas:
    def __init__(self, width, height, palette):
        self.width = width
        self.height = height
        # The transparent entry is magenta, a colour no skin uses.
        self.palette = [(255, 0, 255)] + list(palette)
        self.pixels = [TRANSPARENT] * (width * height)

    def set(self, x, y, index):
        if 0 <= x < self.width and 0 <= y < self.height:
            self.pixels[y * self.width + x] = index

    def fill(self, left, top, right, bottom, index):
        for y in range(top, bottom):
            for x in range(left, right):
                self.set(x, y, index)

    def save(self, name):
        write_gif(OUT_DIR / name, self.width, self.height, self.palette, self.pixels, TRANSPARENT)


def inside_rounded(x, y, width, height, radius, top=True, bottom=True):
    """Whether pixel (x, y) lies in a rectangle whose chosen corners are rounded."""
    cx = min(max(x + 0.5, radius), width - radius)
    if top and y + 0.5 < radius:
        return math.hypot(x + 0.5 - cx, y + 0.5 - radius) <= radius
    if bottom and y + 0.5 > height - radius:
        return math.hypot(x + 0.5 - cx, y + 0.5 - (height - radius)) <= radius
    return True


def go_button(name, disc, rim):
    """A round button with a white arrow pointing right, 32 x 32."""
    size = 32
    c = Canvas(size, size, [disc, rim, (255, 255, 255)])
    centre = size / 2
    for y in range(size):
        for x in range(size):
            d = math.hypot(x + 0.5 - centre, y + 0.5 - centre)
            if d <= 15:
                c.set(x, y, 2 if d > 13.5 else 1)
    # Shaft and head of the arrow.
    c.fill(8, 14, 17, 18, 3)
    for i in range(8):
        c.fill(17 + i, 8 + i, 18 + i, 24 - i, 3)
    c.save(name)


def frame_set(top_name, back_name, bottom_name, band, border, body):
    """A frame of three slices: a coloured band with rounded top corners, a body with a
    border on both sides, and a bottom edge with rounded corners. The frame stretches
    them to its width, so they are drawn about as wide as a frame usually is."""
    width = 200
    palette = [band, border, body]
    top = Canvas(width, 24, palette)
    for y in range(24):
        for x in range(width):
            if inside_rounded(x, y, width, 48, 8, top=True, bottom=False):
                top.set(x, y, 1)
    top.save(top_name)

    back = Canvas(width, 4, palette)
    back.fill(0, 0, width, 4, 3)
    back.fill(0, 0, 1, 4, 2)
    back.fill(width - 1, 0, width, 4, 2)
    back.save(back_name)

    bottom = Canvas(width, 12, palette)
    for y in range(12):
        for x in range(width):
            if inside_rounded(x, y + 36, width, 48, 8, top=False, bottom=True):
                edge = x < 1 or x >= width - 1 or y >= 10
                bottom.set(x, y, 2 if edge else 3)
    bottom.save(bottom_name)


def growth_set():
    """The red growing panel: two 11 x 26 corners, a 26-pixel top edge, a background and a
    16-pixel bottom edge."""
    red, dark, pale, white = (200, 16, 46), (140, 10, 30), (252, 236, 238), (255, 255, 255)
    palette = [red, dark, pale, white]

    for name, left in (("gr-corner1-red.gif", True), ("gr-corner2-red.gif", False)):
        corner = Canvas(11, 26, palette)
        for y in range(26):
            for x in range(11):
                # Mirror the right corner so both round outwards.
                mx = x if left else 10 - x
                if inside_rounded(mx, y, 22, 52, 10, top=True, bottom=False):
                    corner.set(x, y, 2 if y >= 24 else 1)
        corner.save(name)

    top = Canvas(8, 26, palette)
    top.fill(0, 0, 8, 24, 1)
    top.fill(0, 24, 8, 26, 2)
    top.save("gr-top-red.gif")

    # Stretched to the panel's width: drawn about as wide as a panel usually is.
    width = 200
    background = Canvas(width, 8, palette)
    background.fill(0, 0, width, 8, 3)
    background.fill(0, 0, 1, 8, 1)
    background.fill(width - 1, 0, width, 8, 1)
    background.save("gr-background-red.gif")

    bottom = Canvas(width, 16, palette)
    bottom.fill(0, 0, width, 14, 3)
    bottom.fill(0, 0, 1, 16, 1)
    bottom.fill(width - 1, 0, width, 16, 1)
    bottom.fill(0, 14, width, 16, 1)
    bottom.save("gr-bottom-red.gif")


def main():
    global OUT_DIR
    if len(sys.argv) > 1:
        OUT_DIR = Path(sys.argv[1])
    OUT_DIR.mkdir(parents=True, exist_ok=True)

    go_button("btn_go_normal.gif", (232, 119, 34), (176, 80, 16))
    go_button("btn_go_hover.gif", (246, 160, 80), (200, 100, 30))
    go_button("btn_go_click.gif", (176, 80, 16), (120, 50, 8))

    orange, grey, white = (232, 119, 34), (170, 170, 170), (255, 255, 255)
    frame_set("topo_laranja.gif", "topo_repeat.gif", "fundo_fundo.gif", orange, grey, white)
    # The numbered preview sets of the frame, chosen by its DebugDesign value minus one.
    bands = [(0, 94, 184), (0, 140, 80), (96, 96, 96), (120, 40, 140)]
    for n, band in enumerate(bands):
        frame_set(f"quadro_{n}_top.gif", f"quadro_{n}_back.gif", f"quadro_{n}_bottom.gif", band, grey, white)

    growth_set()


if __name__ == "__main__":
    main()
