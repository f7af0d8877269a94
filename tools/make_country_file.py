#!/usr/bin/env python3
"""Writes data/iso3166.txt, the country list of the country dialog, from Debian's iso-codes:
one line per country, "numeric<TAB>alpha-2<TAB>alpha-3<TAB>Portuguese name", CR LF line
ends, Windows-1252, sorted by the Portuguese name.

Greece is written as EL, the code the tax-number checks and the EU lists use.

usage: tools/make_country_file.py [output]"""

import gettext
import json
import os
import sys
import unicodedata

ISO_JSON = "/usr/share/iso-codes/json/iso_3166-1.json"
LOCALE_DIR = "/usr/share/locale"
CODE_RENAMES = {"GR": "EL"}


def sort_key(name):
    # Accents must not move a name away from its letter: "Áustria" sorts among the A's.
    plain = "".join(c for c in unicodedata.normalize("NFD", name) if not unicodedata.combining(c))
    return (plain.casefold(), name)


def countries():
    with open(ISO_JSON, encoding="utf-8") as f:
        entries = json.load(f)["3166-1"]
    portuguese = gettext.translation("iso_3166-1", localedir=LOCALE_DIR, languages=["pt"])
    rows = []
    for entry in entries:
        code = CODE_RENAMES.get(entry["alpha_2"], entry["alpha_2"])
        name = portuguese.gettext(entry["name"])
        rows.append((entry["numeric"], code, entry["alpha_3"], name))
    rows.sort(key=lambda row: sort_key(row[3]))
    return rows


def main():
    root = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
    output = sys.argv[1] if len(sys.argv) > 1 else os.path.join(root, "data", "iso3166.txt")
    lines = ["\t".join(row) + "\r\n" for row in countries()]
    os.makedirs(os.path.dirname(output), exist_ok=True)
    with open(output, "wb") as f:
        f.write("".join(lines).encode("cp1252"))
    print("%s: %d countries" % (output, len(lines)))


if __name__ == "__main__":
    main()
