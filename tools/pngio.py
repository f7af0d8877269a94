"""Just enough PNG for the generators of tools/: read 8-bit, non-interlaced images and write
RGB or RGBA ones, with nothing but the standard library."""

import struct
import zlib

SIGNATURE = b"\x89PNG\r\n\x1a\n"
CHANNELS = {0: 1, 2: 3, 3: 1, 4: 2, 6: 4}


class PngError(Exception):
    pass


def _chunks(data):
    pos = len(SIGNATURE)
    while pos + 8 <= len(data):
        length, kind = struct.unpack(">I4s", data[pos : pos + 8])
        if pos + 12 + length > len(data):
            raise PngError("truncated chunk " + kind.decode("latin-1"))
        yield kind, data[pos + 8 : pos + 8 + length]
        pos += 12 + length


def _paeth(a, b, c):
    p = a + b - c
    pa, pb, pc = abs(p - a), abs(p - b), abs(p - c)
    if pa <= pb and pa <= pc:
        return a
    return b if pb <= pc else c


def _unfilter(raw, width, height, bpp):
    stride = width * bpp
    rows = []
    prev = bytearray(stride)
    pos = 0
    for _ in range(height):
        kind = raw[pos]
        line = bytearray(raw[pos + 1 : pos + 1 + stride])
        pos += 1 + stride
        for i in range(stride):
            a = line[i - bpp] if i >= bpp else 0
            b = prev[i]
            c = prev[i - bpp] if i >= bpp else 0
            if kind == 1:
                line[i] = (line[i] + a) & 0xFF
            elif kind == 2:
                line[i] = (line[i] + b) & 0xFF
            elif kind == 3:
                line[i] = (line[i] + (a + b) // 2) & 0xFF
            elif kind == 4:
                line[i] = (line[i] + _paeth(a, b, c)) & 0xFF
            elif kind != 0:
                raise PngError("unknown filter %d" % kind)
        rows.append(line)
        prev = line
    return rows


def read_rgba(path):
    """Returns (width, height, rows), each row a list of (r, g, b, a) tuples."""
    with open(path, "rb") as f:
        data = f.read()
    if not data.startswith(SIGNATURE):
        raise PngError(str(path) + ": not a PNG file")
    header = None
    palette = []
    alphas = b""
    idat = b""
    for kind, body in _chunks(data):
        if kind == b"IHDR":
            header = struct.unpack(">IIBBBBB", body)
        elif kind == b"PLTE":
            palette = [tuple(body[i : i + 3]) for i in range(0, len(body) - 2, 3)]
        elif kind == b"tRNS":
            alphas = body
        elif kind == b"IDAT":
            idat += body
    if header is None:
        raise PngError(str(path) + ": no header")
    width, height, depth, colour, _, _, interlace = header
    if depth != 8 or interlace != 0 or colour not in CHANNELS:
        raise PngError("%s: unsupported form (depth %d, colour %d, interlace %d)" % (path, depth, colour, interlace))
    bpp = CHANNELS[colour]
    raw = zlib.decompress(idat)
    if len(raw) < height * (1 + width * bpp):
        raise PngError(str(path) + ": image data too short")
    rows = []
    for line in _unfilter(raw, width, height, bpp):
        px = [tuple(line[i : i + bpp]) for i in range(0, len(line), bpp)]
        if colour == 0:
            px = [(g, g, g, 255) for (g,) in px]
        elif colour == 2:
            px = [(r, g, b, 255) for (r, g, b) in px]
        elif colour == 3:
            px = [palette[i] + ((alphas[i] if i < len(alphas) else 255),) for (i,) in px]
        elif colour == 4:
            px = [(g, g, g, a) for (g, a) in px]
        rows.append(px)
    return width, height, rows


def write(path, width, height, rows, alpha):
    """Writes rows of (r, g, b, a) tuples as 8-bit RGBA (alpha) or RGB."""
    raw = bytearray()
    for row in rows:
        raw.append(0)
        for r, g, b, a in row:
            raw += bytes((r, g, b, a) if alpha else (r, g, b))

    def chunk(kind, body):
        return struct.pack(">I", len(body)) + kind + body + struct.pack(">I", zlib.crc32(kind + body))

    header = struct.pack(">IIBBBBB", width, height, 8, 6 if alpha else 2, 0, 0, 0)
    with open(path, "wb") as f:
        f.write(SIGNATURE + chunk(b"IHDR", header) + chunk(b"IDAT", zlib.compress(bytes(raw), 9)) + chunk(b"IEND", b""))
