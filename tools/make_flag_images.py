#!/usr/bin/env python3
"""Makes the flag pictures from Debian's famfamfam-flag-png (16 x 11 flags):

- resources/COUNTRIES.bmp: the flag strip, 512 x 128 pixels, 24 bits, 16 x 16 cells in
  rows of 32, one per code of STRIP_ORDER, each flag centred on white;
- data/images/flags_iso/16/<code>.png: the same 16 x 16 flag with a transparent border,
  for every code of the strip and of ISO 3166-1 (Greece also as EL).

A country without a flag in the package gets a neutral grey cell.

usage: tools/make_flag_images.py"""

import json
import os
import struct

import pngio

FLAG_DIR = "/usr/share/flags/countries/16x11"
ISO_JSON = "/usr/share/iso-codes/json/iso_3166-1.json"
CELL = 16
COLUMNS = 32
ROWS = 8
WHITE = (255, 255, 255, 255)
CLEAR = (255, 255, 255, 0)

# The cell order of the strip: ISO codes in the order of the Portuguese country names.
STRIP_ORDER = (
    "AF;ZA;AL;DE;AD;AO;AI;AQ;AG;AN;SA;DZ;AR;AM;AW;AU;AT;AZ;BS;BD;BB;BH;BE;BZ;BJ;BM;BY;BO;BA;BW;BR;BN;BG;BF;BI;BT;"
    "CV;CM;KH;CA;QA;KZ;CF;TD;CL;CN;CY;CO;KM;CG;CD;KR;KP;CI;CR;HR;CU;DK;DM;EG;SV;AE;EC;ER;SK;SI;ES;US;EE;ET;PH;FI;"
    "FR;GA;GM;GH;GE;GS;GI;GD;GR;GL;GP;GU;GT;GY;GF;GN;GQ;GW;HT;HN;HK;HU;YE;BV;KY;CX;CC;CK;FK;FO;FJ;HM;MP;MH;UM;NF;"
    "SB;VG;VI;IN;ID;IR;IQ;IE;IS;IL;IT;JM;JP;DJ;JO;YU;KE;KI;KW;LA;LS;LV;LB;LR;LY;LI;LT;LU;MO;MK;MG;MY;MW;MV;ML;MT;"
    "MA;MQ;MU;MR;YT;MX;FM;MZ;MD;MC;MN;MS;MM;NA;NR;NP;NI;NE;NG;NU;NO;NC;NZ;OM;NL;PW;PA;PG;PK;PY;PE;PN;PF;PL;PR;PT;"
    "KG;GB;CZ;DO;RE;RO;RW;RU;WS;AS;SH;LC;VA;KN;SM;PM;ST;VC;EH;SN;SL;SC;SG;SY;SO;LK;SZ;SD;SE;CH;SR;SJ;TH;TW;TJ;TZ;"
    "IO;PS;TF;TL;TG;TK;TO;TT;TN;TC;TM;TR;TV;UA;UG;UY;UZ;VU;VE;VN;WF;ZM;ZW;"
).rstrip(";").split(";")
# Codes whose flag the package files under another code.
FLAG_FILE_OF = {"EL": "GR"}

assert len(STRIP_ORDER) == 239 and len(set(STRIP_ORDER)) == 239


def neutral_flag():
    """A plain grey flag with a darker edge, for a country the package has no flag of."""
    w, h = 16, 11
    edge, face = (144, 144, 144, 255), (224, 224, 224, 255)
    rows = [[edge if x in (0, w - 1) or y in (0, h - 1) else face for x in range(w)] for y in range(h)]
    return w, h, rows


def load_flag(code):
    path = os.path.join(FLAG_DIR, FLAG_FILE_OF.get(code, code).lower() + ".png")
    if not os.path.exists(path):
        return None
    return pngio.read_rgba(path)


def cell(flag, background):
    """The flag centred on a 16 x 16 cell of `background`, its own alpha blended over white."""
    w, h, rows = flag
    if w > CELL or h > CELL:
        raise pngio.PngError("flag larger than a cell: %dx%d" % (w, h))
    left, top = (CELL - w) // 2, (CELL - h) // 2
    out = [[background] * CELL for _ in range(CELL)]
    for y in range(h):
        for x in range(w):
            r, g, b, a = rows[y][x]
            blend = lambda c: (c * a + 255 * (255 - a) + 127) // 255
            out[top + y][left + x] = (blend(r), blend(g), blend(b), 255)
    return out


def write_bmp(path, width, height, pixel):
    """A bottom-up 24-bit BMP; pixel(x, y) gives (r, g, b)."""
    stride = (width * 3 + 3) & ~3
    body = bytearray()
    for y in range(height - 1, -1, -1):
        line = bytearray()
        for x in range(width):
            r, g, b = pixel(x, y)
            line += bytes((b, g, r))
        body += line + bytes(stride - len(line))
    info = struct.pack("<IiiHHIIiiII", 40, width, height, 1, 24, 0, len(body), 2835, 2835, 0, 0)
    header = struct.pack("<2sIHHI", b"BM", 14 + len(info) + len(body), 0, 0, 14 + len(info))
    with open(path, "wb") as f:
        f.write(header + info + body)


def main():
    root = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
    with open(ISO_JSON, encoding="utf-8") as f:
        iso_codes = [entry["alpha_2"] for entry in json.load(f)["3166-1"]]
    codes = sorted(set(STRIP_ORDER) | set(iso_codes) | set(FLAG_FILE_OF))

    flags = {}
    missing = []
    for code in codes:
        flag = load_flag(code)
        if flag is None:
            missing.append(code)
            flag = neutral_flag()
        flags[code] = flag

    strip = {}
    for index, code in enumerate(STRIP_ORDER):
        strip[index] = cell(flags[code], WHITE)

    def pixel(x, y):
        index = (y // CELL) * COLUMNS + x // CELL
        if index not in strip:
            return (255, 255, 255)
        return strip[index][y % CELL][x % CELL][:3]

    os.makedirs(os.path.join(root, "resources"), exist_ok=True)
    write_bmp(os.path.join(root, "resources", "COUNTRIES.bmp"), COLUMNS * CELL, ROWS * CELL, pixel)

    png_dir = os.path.join(root, "data", "images", "flags_iso", "16")
    os.makedirs(png_dir, exist_ok=True)
    for code in codes:
        pngio.write(os.path.join(png_dir, code + ".png"), CELL, CELL, cell(flags[code], CLEAR), alpha=True)
    print("strip of %d cells, %d pictures; neutral cells for %s" % (len(STRIP_ORDER), len(codes), " ".join(missing)))


if __name__ == "__main__":
    main()
