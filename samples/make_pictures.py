"""Draws one picture of each format besides JPEG: PNG, GIF, animated GIF, BMP and WBMP.

usage: make_pictures.py FOLDER
Everything is written by hand, with nothing but the standard library, so that the files are nobody's work but
this script's.
"""
import math
import pathlib
import struct
import sys
import zlib


def scene(width, height, sun=0.3):
    """Rows of (r, g, b): hills before an evening sky, the sun at a part of the width."""
    def pixel(x, y):
        u, v = x / width, y / height
        if v > 0.62 + 0.08 * math.sin(9 * u) + 0.03 * math.sin(31 * u):
            shade = 1 - v + 0.2 * math.sin(40 * u + 25 * v)
            return int(30 + 60 * shade), int(70 + 120 * shade), int(40 + 40 * shade)
        distance = math.hypot((u - sun) * width / height, v - 0.4)
        glow = max(0.0, 1 - 2.2 * distance)
        if distance < 0.09:
            return 255, 240, 190
        return (min(255, int(70 + 110 * v + 150 * glow)), min(255, int(90 + 90 * v + 90 * glow)),
                min(255, int(170 - 60 * v + 20 * glow)))
    return [[pixel(x, y) for x in range(width)] for y in range(height)]


def png(rows):
    def chunk(kind, data):
        return struct.pack(">I", len(data)) + kind + data + struct.pack(">I", zlib.crc32(kind + data))
    lines = b"".join(b"\0" + bytes(c for p in row for c in p) for row in rows)
    header = struct.pack(">IIBBBBB", len(rows[0]), len(rows), 8, 2, 0, 0, 0)
    return (b"\x89PNG\r\n\x1a\n" + chunk(b"IHDR", header) + chunk(b"IDAT", zlib.compress(lines, 9))
            + chunk(b"IEND", b""))


def bmp(rows):
    width, height = len(rows[0]), len(rows)
    padding = b"\0" * (-3 * width % 4)
    data = b"".join(bytes(c for r, g, b in row for c in (b, g, r)) + padding for row in reversed(rows))
    return (b"BM" + struct.pack("<IHHI", 54 + len(data), 0, 0, 54)
            + struct.pack("<IiiHHIIiiII", 40, width, height, 1, 24, 0, len(data), 2835, 2835, 0, 0) + data)


def wbmp(rows):
    """Black and white by ordered dither."""
    def number(value):
        groups = [value & 127]
        while value := value >> 7:
            groups.append(value & 127 | 128)
        return bytes(reversed(groups))
    matrix = ((0, 8, 2, 10), (12, 4, 14, 6), (3, 11, 1, 9), (15, 7, 13, 5))
    data = bytearray()
    for y, row in enumerate(rows):
        bits = [sum(p) / 3 > (matrix[y % 4][x % 4] + 0.5) * 16 for x, p in enumerate(row)]
        bits += [False] * (-len(bits) % 8)
        data += bytes(sum(bit << (7 - i) for i, bit in enumerate(bits[at:at + 8])) for at in range(0, len(bits), 8))
    return b"\0\0" + number(len(rows[0])) + number(len(rows)) + bytes(data)


# 6 x 7 x 6 levels of red, green and blue.
PALETTE = bytes(c for r in range(6) for g in range(7) for b in range(6) for c in (51 * r, 255 * g // 6, 51 * b))


def index(pixel):
    r, g, b = pixel
    return (round(r / 51) * 7 + round(g * 6 / 255)) * 6 + round(b / 51)


def lzw(indices):
    """Codes of 9 to 12 bits, least significant bit first; a clear code when the table is full."""
    clear, end = 256, 257
    out, held, bits = bytearray(), 0, 0

    def emit(code, size):
        nonlocal held, bits
        held |= code << bits
        bits += size
        while bits >= 8:
            out.append(held & 255)
            held >>= 8
            bits -= 8
    table, size = {}, 9
    emit(clear, size)
    prefix = indices[0]
    for value in indices[1:]:
        if (prefix, value) in table:
            prefix = table[prefix, value]
            continue
        emit(prefix, size)
        code = len(table) + 258
        if code == 4096:
            emit(clear, size)
            table, size = {}, 9
        else:
            table[prefix, value] = code
            if code == 1 << size:
                size += 1
        prefix = value
    emit(prefix, size)
    emit(end, size)
    emit(0, -bits % 8)
    return bytes(out)


def gif(frames):
    width, height = len(frames[0][0]), len(frames[0])
    out = b"GIF89a" + struct.pack("<HHBBB", width, height, 0xF7, 0, 0) + PALETTE.ljust(768, b"\0")
    if len(frames) > 1:
        out += b"\x21\xFF\x0BNETSCAPE2.0\x03\x01\0\0\0"
    for rows in frames:
        data = lzw([index(p) for row in rows for p in row])
        blocks = b"".join(bytes([len(data[at:at + 255])]) + data[at:at + 255] for at in range(0, len(data), 255))
        out += b"\x21\xF9\x04\x04\x08\0\0\0" if len(frames) > 1 else b""
        out += b"\x2C" + struct.pack("<HHHHB", 0, 0, width, height, 0) + b"\x08" + blocks + b"\0"
    return out + b"\x3B"


def main():
    folder = pathlib.Path(sys.argv[1])
    folder.mkdir(parents=True, exist_ok=True)
    rows = scene(400, 300)
    files = {"evening.png": png(rows), "evening.gif": gif([rows]), "evening.bmp": bmp(rows), "evening.wbmp": wbmp(rows),
             "sunset.gif": gif([scene(160, 120, 0.2 + 0.08 * i) for i in range(8)])}
    for name, data in files.items():
        (folder / name).write_bytes(data)


if __name__ == "__main__":
    main()
