#!/usr/bin/env python3
"""Makes the five 16x16 icons of the information button and the balloon tips.

    tools/make_tip_icons.py [SILK_DIR] [OUT_DIR]

SILK_DIR defaults to the folder of Debian's famfamfam-silk package, OUT_DIR to
resources/icons of this source tree. The disabled icons are greyed copies of the
enabled ones. The output depends only on the input pixels (no time stamps, fixed
compression), so running the script again gives the same bytes.
"""

import struct
import sys
import zlib
from pathlib import Path

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
PNG_SIGNATURE = b"\x89PNG\r\n\x1a\n"


class PngError(Exception):
    pass


def read_chunks(data):
    if not data.startswith(PNG_SIGNATURE):
        raise PngError("not a PNG file")
    pos = len(PNG_SIGNATURE)
    while pos + 8 <= len(data):
        length, kind = struct.unpack(">I4s", data[pos : pos + 8])
        end = pos + 8 + length
        if end + 4 > len(data):
            raise PngError("truncated chunk " + kind.decode("latin-1"))
        yield kind, data[pos + 8 : end]
        pos = end + 4
        if kind == b"IEND":
            return
    raise PngError("no IEND chunk")


def paeth(a, b, c):
    p = a + b - c
    pa, pb, pc = abs(p - a), abs(p - b), abs(p - c)
    if pa <= pb and pa <= pc:
        return a
    return b if pb <= pc else c


def unfilter(raw, width, height, bpp):
    stride = width * bpp
    if len(raw) != height * (stride + 1):
        raise PngError("image data has the wrong length")
    rows = []
    previous = bytearray(stride)
    for y in range(height):
        start = y * (stride + 1)
        kind = raw[start]
        row = bytearray(raw[start + 1 : start + 1 + stride])
        for i in range(stride):
            left = row[i - bpp] if i >= bpp else 0
            up = previous[i]
            up_left = previous[i - bpp] if i >= bpp else 0
            if kind == 1:
                row[i] = (row[i] + left) & 0xFF
            elif kind == 2:
                row[i] = (row[i] + up) & 0xFF
            elif kind == 3:
                row[i] = (row[i] + (left + up) // 2) & 0xFF
            elif kind == 4:
                row[i] = (row[i] + paeth(left, up, up_left)) & 0xFF
            elif kind != 0:
                raise PngError("unknown filter %d" % kind)
        rows.append(row)
        previous = row
    return rows


def read_rgba(path):
    """The pixels of an 8-bit RGB or RGBA, non-interlaced PNG as rows of RGBA bytes."""
    header = None
    idat = b""
    for kind, body in read_chunks(path.read_bytes()):
        if kind == b"IHDR":
            header = struct.unpack(">IIBBBBB", body)
        elif kind == b"IDAT":
            idat += body
    if header is None:
        raise PngError("no IHDR chunk")
    width, height, depth, colour, _, _, interlace = header
    if depth != 8 or colour not in (2, 6) or interlace != 0:
        raise PngError("only 8-bit RGB or RGBA pictures without interlacing are read")
    bpp = 4 if colour == 6 else 3
    rows = unfilter(zlib.decompress(idat), width, height, bpp)
    if bpp == 3:
        rows = [bytearray(b for i in range(0, len(r), 3) for b in (*r[i : i + 3], 255)) for r in rows]
    return width, height, rows


def grey(rows):
    """Greyed as disabled pictures are: the brightness, lifted toward light grey and half faded."""
    out = []
    for row in rows:
        new = bytearray(row)
        for i in range(0, len(row), 4):
            r, g, b, a = row[i : i + 4]
            luma = (299 * r + 587 * g + 114 * b) // 1000
            level = 96 + luma * 140 // 255
            new[i : i + 4] = bytes((level, level, level, a * 3 // 4))
        out.append(new)
    return out


def chunk(kind, body):
    return struct.pack(">I", len(body)) + kind + body + struct.pack(">I", zlib.crc32(kind + body))


def write_rgba(path, width, height, rows):
    raw = b"".join(b"\x00" + bytes(row) for row in rows)
    png = (
        PNG_SIGNATURE
        + chunk(b"IHDR", struct.pack(">IIBBBBB", width, height, 8, 6, 0, 0, 0))
        + chunk(b"IDAT", zlib.compress(raw, 9))
        + chunk(b"IEND", b"")
    )
    path.write_bytes(png)


def main(argv):
    silk = Path(argv[1]) if len(argv) > 1 else SILK_DIR
    out = Path(argv[2]) if len(argv) > 2 else OUT_DIR
    out.mkdir(parents=True, exist_ok=True)
    pictures = {}
    for name, source in ICONS.items():
        try:
            width, height, rows = read_rgba(silk / source)
        except (OSError, PngError, zlib.error) as error:
            print("make_tip_icons: %s: %s" % (silk / source, error), file=sys.stderr)
            return 1
        if (width, height) != (SIZE, SIZE):
            print("make_tip_icons: %s is not %dx%d" % (source, SIZE, SIZE), file=sys.stderr)
            return 1
        pictures[name] = rows
    for name, base in GREYED.items():
        pictures[name] = grey(pictures[base])
    for name, rows in pictures.items():
        write_rgba(out / (name + ".png"), SIZE, SIZE, rows)
    return 0


if __name__ == "__main__":
    sys.exit(main(sys.argv))
