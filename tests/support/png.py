# SPDX-License-Identifier: MIT
"""Pictures of a screen as PNG files."""

import struct
import zlib


def save_png(path, width, height, pixels, order="BGRX"):
    """Writes a picture; gives its path. `pixels`: rows of four bytes a pixel without padding, as an
    X server gives them; `order` names the bytes."""
    places = [order.index(colour) for colour in "RGB"]
    rows = bytearray((3 * width + 1) * height)
    for y in range(height):
        row = pixels[4 * width * y:4 * width * (y + 1)]
        begin = (3 * width + 1) * y + 1  # after the byte that says how the row is filtered: not
        for number, place in enumerate(places):
            rows[begin + number:begin + 3 * width:3] = row[place::4]
    with open(path, "wb") as file:
        file.write(b"\x89PNG\r\n\x1a\n")
        for kind, data in ((b"IHDR", struct.pack(">IIBBBBB", width, height, 8, 2, 0, 0, 0)),
                           (b"IDAT", zlib.compress(rows)), (b"IEND", b"")):
            file.write(struct.pack(">I", len(data)) + kind + data +
                       struct.pack(">I", zlib.crc32(kind + data)))
    return path
