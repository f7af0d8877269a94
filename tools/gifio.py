"""Just enough GIF for the skin generator: write one-frame GIF89a pictures with a global
colour table and, optionally, a transparent colour index, with nothing but the standard
library. The output depends only on the pixels, so the same input gives the same bytes."""

import struct


def _lzw(indices, min_code_size):
    """Variable-length LZW codes of the GIF flavour, packed little-endian into bytes."""
    clear = 1 << min_code_size
    end = clear + 1
    out = bytearray()
    bit_buffer = 0
    bit_count = 0

    def emit(code, width):
        nonlocal bit_buffer, bit_count
        bit_buffer |= code << bit_count
        bit_count += width
        while bit_count >= 8:
            out.append(bit_buffer & 0xFF)
            bit_buffer >>= 8
            bit_count -= 8

    def reset():
        return {(i,): i for i in range(clear)}, end + 1, min_code_size + 1

    table, next_code, width = reset()
    emit(clear, width)
    prefix = ()
    for index in indices:
        candidate = prefix + (index,)
        if candidate in table:
            prefix = candidate
            continue
        emit(table[prefix], width)
        if next_code < 4096:
            table[candidate] = next_code
            next_code += 1
            # The decoder widens one code later than the encoder adds the entry.
            if next_code > (1 << width) and width < 12:
                width += 1
        else:
            emit(clear, width)
            table, next_code, width = reset()
        prefix = (index,)
    if prefix:
        emit(table[prefix], width)
    emit(end, width)
    if bit_count:
        out.append(bit_buffer & 0xFF)
    return bytes(out)


def write_gif(path, width, height, palette, indices, transparent=None):
    """palette: list of (r, g, b), at most 256; indices: row-major palette indices."""
    if not 0 < len(palette) <= 256 or len(indices) != width * height:
        raise ValueError("bad palette or pixel count")
    bits = max(1, (len(palette) - 1).bit_length())
    table = list(palette) + [(0, 0, 0)] * ((1 << bits) - len(palette))
    data = bytearray(b"GIF89a")
    data += struct.pack("<HHBBB", width, height, 0x80 | ((bits - 1) << 4) | (bits - 1), 0, 0)
    for r, g, b in table:
        data += bytes((r, g, b))
    if transparent is not None:
        data += struct.pack("<BBBBHBB", 0x21, 0xF9, 4, 0x01, 0, transparent, 0)
    data += struct.pack("<BHHHHB", 0x2C, 0, 0, width, height, 0)
    min_code_size = max(2, bits)
    data.append(min_code_size)
    stream = _lzw(indices, min_code_size)
    for pos in range(0, len(stream), 255):
        block = stream[pos : pos + 255]
        data.append(len(block))
        data += block
    data += b"\x00\x3b"
    with open(path, "wb") as f:
        f.write(data)
