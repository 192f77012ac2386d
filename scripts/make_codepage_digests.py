#!/usr/bin/env python3
"""Writes tests/data/codepages.fnv1a64: a digest of every code page, from a second source.

    apt-get download libwine && dpkg -x libwine_*.deb FOLDER
    scripts/make_codepage_digests.py FOLDER/usr/share/wine/nls > tests/data/codepages.fnv1a64

The maps that are compiled in come from text files (make_codepages.py); these from the binary
tables c_*.nls. A line of the output is the name of a code page and the 64-bit FNV-1a digest of its
map as text: a line "80 20AC" for every byte, or "80 private" when the code point is one of private
use, where a number has no meaning of its own.
"""

import os
import struct
import sys

from make_codepages import ROWS, SAME_MAP

# These tables hold 0 for a byte that the code page leaves undefined; ours then hold the byte. The
# rule cannot be a general one: in 20127 the byte 80 really is U+0000.
ZERO_IS_UNDEFINED = {10021}


def main():
    if len(sys.argv) != 2:
        sys.exit(__doc__)
    for page, _ in ROWS:
        print(f"CP{page} {fnv1a64(canonical(read_nls(sys.argv[1], page))):016x}")


def read_nls(folder, page):
    page = SAME_MAP.get(page, page)
    path = os.path.join(folder, f"c_{page:03}.nls")
    with open(path, "rb") as f:
        data = f.read()
    # 16-bit numbers: the header's length, the code page, ...; a word behind the header, the map.
    header, number = struct.unpack_from("<2H", data)
    if number != page:
        sys.exit(f"{path}: is code page {number}")
    code_points = struct.unpack_from("<256H", data, 2 * (header + 1))
    if page in ZERO_IS_UNDEFINED:
        return [c or byte for byte, c in enumerate(code_points)]
    return list(code_points)


def canonical(code_points):
    return "".join(f"{byte:02X} {meaning(c)}\n" for byte, c in enumerate(code_points))


def meaning(code_point):
    return "private" if 0xE000 <= code_point <= 0xF8FF else f"{code_point:04X}"


def fnv1a64(text):
    digest = 0xCBF29CE484222325
    for byte in text.encode("ascii"):
        digest = (digest ^ byte) * 0x100000001B3 % 2**64
    return digest


if __name__ == "__main__":
    main()
