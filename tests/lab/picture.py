# SPDX-License-Identifier: MIT
"""picture.py FILE.xwd: turn the dump of a virtual screen (32 bits a pixel) into FILE.png."""

import struct
import sys
import zlib

path = sys.argv[1]
with open(path, "rb") as file:
    dump = file.read()
# The header is big-endian: its size, version, format, depth, width, height ...
header = struct.unpack(">25I", dump[:100])
(size, _, _, _, width, height, _, order, _, _, _, bits, line, *_) = header
colours = struct.unpack(">I", dump[76:80])[0]
if bits != 32:
    sys.exit(f"{path}: {bits} bits a pixel")
start = size + 12 * colours
rows = bytearray()
for y in range(height):
    row = dump[start + y * line:start + y * line + 4 * width]
    red, green, blue = (2, 1, 0) if order == 0 else (1, 2, 3)
    pixels = bytearray(3 * width)
    pixels[0::3], pixels[1::3], pixels[2::3] = row[red::4], row[green::4], row[blue::4]
    rows += b"\0" + pixels


def chunk(kind, data):
    return struct.pack(">I", len(data)) + kind + data + struct.pack(">I", zlib.crc32(kind + data))


with open(path.removesuffix(".xwd") + ".png", "wb") as file:
    file.write(b"\x89PNG\r\n\x1a\n" + chunk(b"IHDR", struct.pack(">IIBBBBB", width, height, 8, 2,
                                                                  0, 0, 0))
               + chunk(b"IDAT", zlib.compress(bytes(rows))) + chunk(b"IEND", b""))
