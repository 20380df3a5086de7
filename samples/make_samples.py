#!/usr/bin/env python3
"""Draws a windmill and writes it as every kind of picture file that a user meets, one of them
damaged.

make_samples.py [FOLDER]: writes into FOLDER, by default the folder of this script. The Python
standard library is all it needs. README.md beside it says what each file is.
"""
import math
import struct
import sys
from pathlib import Path

WIDTH, HEIGHT = 150, 112


# The drawing: colors as (red, green, blue) from 0 to 1, x from 0 to 4/3, y from 0 (top) to 1.

def mix(a, b, t):
    t = min(max(t, 0.0), 1.0)
    return tuple(p + (q - p) * t for p, q in zip(a, b))


def sky(x, y):
    color = mix((0.16, 0.30, 0.58), (0.98, 0.72, 0.45), (y / 0.66) ** 1.6)
    far = math.hypot(x - 1.02, y - 0.47)
    color = mix(color, (1.0, 0.86, 0.55), 0.75 * math.exp(-(far / 0.16) ** 2))
    if far < 0.075:
        color = (1.0, 0.95, 0.76)
    for cx, cy, rx, ry in ((0.20, 0.17, 0.20, 0.030), (0.31, 0.145, 0.12, 0.035),
                           (0.93, 0.25, 0.17, 0.022), (0.85, 0.23, 0.09, 0.030)):
        inside = 1 - ((x - cx) / rx) ** 2 - ((y - cy) / ry) ** 2
        color = mix(color, (1.0, 0.93, 0.88), min(inside * 1.5, 0.8))
    return color


def land(x, y):
    """Hills, then rows of tulips that run towards the horizon; None where the sky is."""
    if y < 0.655:
        near = 0.60 + 0.025 * math.sin(7 * x + 0.6)
        distant = 0.545 + 0.035 * math.sin(4.3 * x + 2.2) + 0.012 * math.sin(13 * x)
        if y > near:
            return mix((0.24, 0.40, 0.34), (0.35, 0.52, 0.33), (y - near) / 0.06)
        return (0.42, 0.44, 0.58) if y > distant else None
    row = (x - 0.70) * 0.84 / (y - 0.60)
    across = abs(row - math.floor(row) - 0.5)
    flowers = ((0.85, 0.16, 0.20), (0.96, 0.78, 0.18), (0.80, 0.25, 0.55),
               (0.95, 0.48, 0.16))[math.floor(row) % 4]
    grass = mix((0.40, 0.58, 0.28), (0.20, 0.42, 0.18), (y - 0.655) * 3)
    color = mix((0.45, 0.52, 0.38), flowers if across < 0.27 else grass, (y - 0.655) * 9)
    return mix(color, (0.10, 0.12, 0.08), (y - 0.80) * 0.8)


def mill(x, y):
    """Sails, cap, gallery and tower; None beside them."""
    hub, top, foot = 0.345, 0.37, 0.80
    dx, dy = x - 0.46, y - hub
    for quarter in range(4):
        angle = math.radians(24 + 90 * quarter)
        along = dx * math.cos(angle) + dy * math.sin(angle)
        beside = -dx * math.sin(angle) + dy * math.cos(angle)
        if 0 < along < 0.30 and abs(beside) < 0.006:
            return (0.27, 0.17, 0.12)
        if 0.06 < along < 0.295 and 0.006 <= beside < 0.058:
            lattice = (along * 42) % 1 < 0.24 or beside > 0.051 or 0.027 < beside < 0.033
            return (0.42, 0.28, 0.19) if lattice else (0.97, 0.92, 0.80)
    if math.hypot(dx, dy) < 0.017:
        return (0.20, 0.12, 0.09)
    if y < top - 0.02 and math.hypot(dx / 1.25, y - top + 0.02) < 0.052:
        return mix((0.40, 0.20, 0.15), (0.62, 0.32, 0.20), dx * 9 + 0.5)
    half = 0.055 + (y - top) * 0.10
    if 0.635 < y < 0.655 and abs(dx) < half + 0.035:
        return (0.33, 0.21, 0.15)
    if not top - 0.02 <= y < foot or abs(dx) >= half:
        return None
    if abs(dx) < 0.018 and y > 0.725 or abs(dx) < 0.012 and 0.49 < y < 0.525:
        return (0.25, 0.16, 0.12)
    joint = 0.03 if (y * 55) % 1 < 0.25 else 0.0
    return mix((0.45 - joint, 0.30 - joint, 0.25 - joint),
               (0.93 - joint, 0.76 - joint, 0.60 - joint), dx / half / 2 + 0.5)


def draw(scale=1):
    """The picture as rows of (red, green, blue) from 0 to 255, each the mean of 3 by 3 points."""
    def pixel(column, row):
        points = []
        for i in range(9):
            x = (column + (i % 3 + 0.5) / 3) / HEIGHT / scale
            y = (row + (i // 3 + 0.5) / 3) / HEIGHT / scale
            points.append(mill(x, y) or land(x, y) or sky(x, y))
        return tuple(round(255 * min(max(sum(channel) / 9, 0), 1)) for channel in zip(*points))

    return [[pixel(column, row) for column in range(WIDTH * scale)]
            for row in range(HEIGHT * scale)]


def oval(column, row):
    """The opacity of the picture with an alpha plane: an oval with a soft rim."""
    far = math.hypot((column + 0.5) / WIDTH * 2 - 1, (row + 0.5) / HEIGHT * 2 - 1)
    return round(255 * min(max((1.0 - far) / 0.12, 0), 1))


# Fewer colors.

def chosen_palette(picture, count):
    """`count` colors: boxes of pixels are halved at the median of their widest channel, the most
    spread box first."""
    def width(box, channel):
        return max(pixel[channel] for pixel in box) - min(pixel[channel] for pixel in box)

    def spread(box):
        return max(width(box, channel) for channel in range(3)) * len(box) ** 0.5

    first = [pixel for row in picture for pixel in row]
    boxes = [(spread(first), first)]
    while len(boxes) < count:
        _, box = boxes.pop(max(range(len(boxes)), key=lambda i: boxes[i][0]))
        widest = max(range(3), key=lambda channel: width(box, channel))
        box.sort(key=lambda pixel: pixel[widest])
        boxes += [(spread(half), half) for half in (box[:len(box) // 2], box[len(box) // 2:])]
    return sorted((tuple(round(sum(channel) / len(box)) for channel in zip(*box)) for _,
                   box in boxes), key=sum)


def indexed(picture, palette, dither):
    """The picture as rows of palette indexes; with `dither` each error spreads to the neighbors
    still to come."""
    nearest = {}
    rows = [[list(pixel) for pixel in row] for row in picture]
    result = [[0] * WIDTH for _ in rows]
    for y, row in enumerate(rows):
        for x, color in enumerate(row):
            wanted = tuple(color)
            if wanted not in nearest:
                nearest[wanted] = min(range(len(palette)),
                                      key=lambda i: sum((a - b) ** 2 for a,
                                                        b in zip(wanted, palette[i])))
            result[y][x] = nearest[wanted]
            if not dither:
                continue
            for dx, dy, share in ((1, 0, 7), (-1, 1, 3), (0, 1, 5), (1, 1, 1)):
                if 0 <= x + dx < WIDTH and y + dy < HEIGHT:
                    for c in range(3):
                        error = wanted[c] - palette[result[y][x]][c]
                        rows[y + dy][x + dx][c] += error * share / 16
    return result


# BMP.

def packed(indexes, bits):
    """Indexes as bytes, the first pixel in the highest bits."""
    per_byte = 8 // bits
    indexes = indexes + [0] * (-len(indexes) % per_byte)
    return bytes(sum(index << (8 - bits * (i + 1)) for i,
                     index in enumerate(indexes[at:at + per_byte]))
                 for at in range(0, len(indexes), per_byte))


def bmp_rows(rows, row_bytes):
    """Rows from top to bottom as BMP stores them: bottom row first, each padded to a multiple of
    four bytes."""
    return b"".join(row_bytes(row) + bytes(-len(row_bytes(row)) % 4) for row in reversed(rows))


def blue_first(row):
    return b"".join(bytes((b, g, r)) for r, g, b in row)


def high_color(row, green_bits):
    """16-bit pixels: 5 bits of red and blue with 5 or 6 of green between them."""
    green_most = 2 ** green_bits - 1
    return b"".join(struct.pack("<H", r * 31 // 255 << (5 + green_bits) |
                                g * green_most // 255 << 5 | b * 31 // 255)
                    for r, g, b in row)


def bmp(bits, pixels, palette=(), compression=0, masks=b"", height=HEIGHT):
    """A file with the 40-byte header. `pixels` are the bytes behind masks and palette."""
    table = b"".join(bytes((b, g, r, 0)) for r, g, b in palette)
    offset = 54 + len(masks) + len(table)
    return (struct.pack("<2sIII", b"BM", offset + len(pixels), 0, offset)
            + struct.pack("<IiiHHIIiiII", 40, WIDTH, height, 1, bits, compression, len(pixels),
                          2835, 2835, len(palette), 0)
            + masks + table + pixels)


def os2_bmp(bits, pixels, palette):
    """A file with the 12-byte header of OS/2 1.x."""
    table = b"".join(bytes((b, g, r)) for r, g, b in palette)
    offset = 26 + len(table)
    return (struct.pack("<2sIII", b"BM", offset + len(pixels), 0, offset)
            + struct.pack("<IHHHH", 12, WIDTH, HEIGHT, 1, bits) + table + pixels)


def run_length(row, at):
    """How many equal values stand in `row` from `at` on."""
    end = at
    while end < len(row) and row[end] == row[at]:
        end += 1
    return end - at


def bmp_runs(rows, bits):
    """Rows from top to bottom in BMP's run-length code: runs of three and more, absolute runs
    between them."""
    out = b""
    for row in reversed(rows):
        at = 0
        while at < len(row):
            end = at
            while end < len(row) and run_length(row, end) < 3:
                end += 1
            while at < end:
                count = min(end - at, 254)
                if count < 3:  # an absolute run cannot be this short
                    out += bytes((1, row[at] if bits == 8 else row[at] << 4))
                    at += 1
                else:
                    data = packed(row[at:at + count], bits)
                    out += bytes((0, count)) + data + bytes(len(data) % 2)
                    at += count
            if at < len(row):
                count = min(run_length(row, at), 255)
                out += bytes((count, row[at] if bits == 8 else row[at] * 17))
                at += count
        out += b"\0\0"
    return out + b"\0\1"


# PCX.

def pcx_runs(line):
    out, at = bytearray(), 0
    while at < len(line):
        count = min(run_length(line, at), 63)
        if count > 1 or line[at] >= 0xC0:
            out.append(0xC0 | count)
        out.append(line[at])
        at += count
    return bytes(out)


def pcx(bits, rows, palette=()):
    """`rows` holds for each row its planes as byte strings; they are made an even number of bytes
    long."""
    rows = [[plane + bytes(len(plane) % 2) for plane in row] for row in rows]
    first = b"".join(bytes(color) for color in palette[:16]).ljust(48, b"\0")
    header = struct.pack("<4B6H48sBBHH58x", 10, 5, 1, bits, 0, 0, WIDTH - 1, HEIGHT - 1, 72, 72,
                         first, 0, len(rows[0]),
                         len(rows[0][0]), 1)
    trailer = b"\x0c" + b"".join(bytes(color) for color in palette) if len(palette) == 256 else b""
    return header + b"".join(pcx_runs(plane) for row in rows for plane in row) + trailer


# FITS, X bitmap, MacPaint.

def fits(rows):
    """`rows` are bytes of gray from top to bottom."""
    cards = ("SIMPLE  = T", "BITPIX  = 8", "NAXIS   = 2", f"NAXIS1  = {len(rows[0])}",
             f"NAXIS2  = {len(rows)}", "END")
    header = "".join(keyword.ljust(10) + value.rjust(20) + " " * 50
                     for keyword, value in ((card[:9], card[9:].strip()) for card in cards))
    data = b"".join(rows)
    return header.ljust(2880).encode() + data + bytes(-len(data) % 2880)


def xbm(rows, name):
    """`rows` are indexes, 0 black, in a multiple of eight columns."""
    values = [f"0x{255 - int(''.join(map(str, row[at:at + 8][::-1])), 2):02x}"
              for row in rows for at in range(0, len(row), 8)]
    lines = [", ".join(values[at:at + 12]) for at in range(0, len(values), 12)]
    return (f"#define {name}_width {len(rows[0])}\n#define {name}_height {len(rows)}\n"
            f"static char {name}_bits[] = {{\n"
            + ",\n".join(lines) + "};\n").encode()


def pack_bits(line):
    """Runs of three and more, literals between them."""
    out, at = b"", 0
    while at < len(line):
        end = at
        while end < len(line) and run_length(line, end) < 3:
            end += 1
        if end > at:
            out += bytes((end - at - 1,)) + line[at:end]
            at = end
        if at < len(line):
            count = run_length(line, at)
            out += bytes((257 - count, line[at]))
            at += count
    return out


def mac_paint(rows, name):
    """`rows` are indexes, 0 black. They stand in the middle of the page, behind a MacBinary header
    without dates."""
    left, top = (576 - len(rows[0])) // 2, (720 - len(rows)) // 2
    page = [[0] * 576 for _ in range(720)]
    for y, row in enumerate(rows):
        page[top + y][left:left + len(row)] = [1 - index for index in row]
    data = struct.pack(">I508x", 2) + b"".join(pack_bits(packed(row, 1)) for row in page)
    header = struct.pack(">xB63s4s4s10xI41x", len(name), name.encode(), b"PNTG", b"MPNT", len(data))
    return header + data


def main():
    folder = Path(sys.argv[1]) if len(sys.argv) > 1 else Path(__file__).resolve().parent
    picture = draw()
    black_white = [(0, 0, 0), (255, 255, 255)]
    gray = [[(1.5 * (0.3 * r + 0.59 * g + 0.11 * b) - 80,) * 3 for r, g, b in row]
            for row in picture]
    mono = indexed(gray, black_white, dither=True)
    colors16, colors64, colors256 = (chosen_palette(picture, count) for count in (16, 64, 256))
    picture16 = indexed(picture, colors16, dither=True)
    picture256 = indexed(picture, colors256, dither=True)
    flat16 = indexed(picture, colors16, dither=False)
    flat64 = indexed(picture, colors64, dither=False)
    with_alpha = [[(b, g, r, oval(x, y)) for x, (r, g, b) in enumerate(row)] for y,
                  row in enumerate(picture)]
    pcx256 = pcx(8, [[bytes(row)] for row in picture256], colors256)

    files = {
        "bmp-mono.bmp": bmp(1, bmp_rows(mono, lambda row: packed(row, 1)), black_white),
        "bmp-16-colors.bmp": bmp(4, bmp_rows(picture16, lambda row: packed(row, 4)), colors16),
        "bmp-256-colors.bmp": bmp(8, bmp_rows(picture256, bytes), colors256),
        "bmp-true-color.bmp": bmp(24, bmp_rows(picture, blue_first)),
        "bmp-alpha.bmp": bmp(32, bmp_rows(with_alpha, lambda row: b"".join(map(bytes, row)))),
        "bmp-rle4.bmp": bmp(4, bmp_runs(flat16, 4), colors16, compression=2),
        "bmp-rle8.bmp": bmp(8, bmp_runs(flat64, 8), colors64 + [(0, 0, 0)] * 192, compression=1),
        "bmp-high-color-555.bmp": bmp(16, bmp_rows(picture, lambda row: high_color(row, 5))),
        "bmp-high-color-565.bmp": bmp(16, bmp_rows(picture, lambda row: high_color(row, 6)),
                                      compression=3,
                                   masks=struct.pack("<III", 0xF800, 0x07E0, 0x001F)),
        "bmp-os2.bmp": os2_bmp(8, bmp_rows(picture256, bytes), colors256),
        "bmp-top-down.bmp": bmp(8, bmp_rows(picture256[::-1], bytes), colors256, height=-HEIGHT),
        "pcx-mono.pcx": pcx(1, [[packed(row, 1)] for row in mono], black_white),
        "pcx-16-colors.pcx": pcx(1, [[packed([index >> plane & 1 for index in row], 1)
                                      for plane in range(4)]
                                  for row in picture16], colors16),
        "pcx-16-colors-packed.pcx": pcx(4, [[packed(row, 4)] for row in picture16], colors16),
        "pcx-256-colors.pcx": pcx256,
        "pcx-true-color.pcx": pcx(8, [[bytes(pixel[channel] for pixel in row)
                                       for channel in range(3)] for row in picture]),
        "damaged.pcx": pcx256[:len(pcx256) // 2],
        "fits-gray.fits": fits([bytes((30 * r + 59 * g + 11 * b) // 100 for r, g, b in row)
                                for row in picture]),
        "xbm-mono.xbm": xbm([row[3:147] for row in mono], "windmill"),
        "mac-mono.mac": mac_paint(mono, "Windmill"),
    }
    for name, contents in files.items():
        (folder / name).write_bytes(contents)


if __name__ == "__main__":
    main()
