#!/usr/bin/env python3
"""Makes the subject selector's seven button icons in resources/subject/, one per kind
letter, from Debian's famfamfam-silk icons (package famfamfam-silk). The deceased's icon
is drawn over a greyed figure; the others are the silk icons re-encoded as RGBA, so the
output depends only on the package and this script."""

import sys
from pathlib import Path

import pngio

SILK = Path("/usr/share/icons/silk/16x16")

# Kind letter -> silk icon: taxpayer, spouse, dependant, ascendant, deceased, both
# taxpayers ("Agregado"), undivided estate.
SOURCES = {
    "A": "user.png",
    "B": "user_female.png",
    "D": "user_green.png",
    "S": "user_gray.png",
    "F": "user_suit.png",
    "C": "group.png",
    "H": "house.png",
}

# A small dark cross at the top right, with a light rim so it reads on any background.
CROSS = [
    "..###.",
    "..#X#.",
    "###X##",
    "#XXXX#",
    "###X##",
    "..#X#.",
    "..#X#.",
    "..###.",
]


def greyed(rows):
    out = []
    for row in rows:
        line = []
        for r, g, b, a in row:
            v = (r * 30 + g * 59 + b * 11) // 100
            v = 64 + v * 3 // 4
            line.append((v, v, v, a))
        out.append(line)
    return out


def with_cross(rows, width):
    rows = [list(row) for row in rows]
    left = width - len(CROSS[0])
    for y, pattern in enumerate(CROSS):
        for x, cell in enumerate(pattern):
            if cell == "X":
                rows[y][left + x] = (32, 32, 32, 255)
            elif cell == "#":
                rows[y][left + x] = (255, 255, 255, 255)
    return rows


def main():
    out = Path(__file__).resolve().parent.parent / "resources" / "subject"
    out.mkdir(parents=True, exist_ok=True)
    for letter, name in SOURCES.items():
        source = SILK / name
        if not source.exists():
            sys.exit("missing %s: install the famfamfam-silk package" % source)
        width, height, rows = pngio.read_rgba(str(source))
        if letter == "F":
            rows = with_cross(greyed(rows), width)
        pngio.write(str(out / (letter + ".png")), width, height, rows, True)


if __name__ == "__main__":
    main()
