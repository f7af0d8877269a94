#!/usr/bin/env python3
"""Makes the five 16x16 icons of the information button and the balloon tips.

    tools/make_tip_icons.py [SILK_DIR] [OUT_DIR]

SILK_DIR defaults to the folder of Debian's famfamfam-silk package, OUT_DIR to
resources/icons of this source tree. The disabled icons are greyed copies of the
enabled ones. The output depends only on the input pixels (no time stamps, fixed
compression), so running the script again gives the same bytes.
"""

import sys
import zlib
from pathlib import Path

import pngio

SILK_DIR = Path("/usr/share/icons/silk/16x16")
OUT_DIR = Path(__file__).resolve().parent.parent / "resources" / "icons"

# Resource name -> silk picture. The silk "error" picture is the yellow warning triangle.
ICONS = {
    "INFO": "information.png",
    "WARNING": "error.png",
    "ERROR": "exclamation.png",
}
GREYED = {"INFO_DISABLED": "INFO", "WARNING_DISABLED": "WARNING"}

SIZE = 16


def grey(rows):
    """Greyed as disabled pictures are: the brightness, lifted toward light grey and half faded."""
    out = []
    for row in rows:
        new = []
        for r, g, b, a in row:
            luma = (299 * r + 587 * g + 114 * b) // 1000
            level = 96 + luma * 140 // 255
            new.append((level, level, level, a * 3 // 4))
        out.append(new)
    return out


def main(argv):
    silk = Path(argv[1]) if len(argv) > 1 else SILK_DIR
    out = Path(argv[2]) if len(argv) > 2 else OUT_DIR
    out.mkdir(parents=True, exist_ok=True)
    pictures = {}
    for name, source in ICONS.items():
        try:
            width, height, rows = pngio.read_rgba(silk / source)
        except (OSError, pngio.PngError, zlib.error) as error:
            print("make_tip_icons: %s: %s" % (silk / source, error), file=sys.stderr)
            return 1
        if (width, height) != (SIZE, SIZE):
            print("make_tip_icons: %s is not %dx%d" % (source, SIZE, SIZE), file=sys.stderr)
            return 1
        pictures[name] = rows
    for name, base in GREYED.items():
        pictures[name] = grey(pictures[base])
    for name, rows in pictures.items():
        pngio.write(out / (name + ".png"), SIZE, SIZE, rows, alpha=True)
    return 0


if __name__ == "__main__":
    sys.exit(main(sys.argv))
