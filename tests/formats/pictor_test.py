#!/usr/bin/python3
"""ffmpeg reads our Pictor pictures, and both read those created according to the specification."""
import os
import random
import shutil
import struct
import subprocess
import sys
import tempfile
from pathlib import Path

try:
    from PIL import Image
except ImportError:
    print("not installed: Pillow")
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
CGA = ["000000", "0000AA", "00AA00", "00AAAA", "AA0000", "AA00AA", "AA5500", "AAAAAA", "555555",
       "5555FF", "55FF55", "55FFFF",
       "FF5555", "FF55FF", "FFFF55", "FFFFFF"]


def rgb(names):
    return [tuple(bytes.fromhex(name)) for name in names]


def ffmpeg(source, folder):
    out = Path(folder) / "ffmpeg.ppm"
    subprocess.run(["ffmpeg", "-hide_banner", "-loglevel", "error", "-y", "-f", "image2", "-c:v",
                    "pictor", "-i", source, "-pix_fmt",
                    "rgb24", out], check=True)
    with Image.open(out) as image:
        return image.convert("RGB")


def ours(source, to, folder):
    subprocess.run([FOTOMILL, "--quiet", "convert", source, "--to", to, "--dest", folder,
                    "--overwrite", "replace"], check=True,
                   stdout=subprocess.DEVNULL)
    return (Path(folder) / Path(source).stem).with_suffix("." + to)


def packed(rows, bits):
    """Rows of values, each padded to whole bytes."""
    data = b""
    for row in rows:
        text = "".join(f"{value:0{bits}b}" for value in row)
        text += "0" * (-len(text) % 8)
        data += int(text, 2).to_bytes(len(text) // 8, "big")
    return data


def blocks(data, size):
    """Run-length coded blocks with literals, short and long runs."""
    out = []
    for begin in range(0, len(data), size):
        piece = data[begin:begin + size]
        marker = 0x77
        code, at = b"", 0
        while at < len(piece):
            run = 1
            while at + run < len(piece) and piece[at + run] == piece[at] and run < 1000:
                run += 1
            if run > 255:
                code += struct.pack("<BBHB", marker, 0, run, piece[at])
            elif run > 2 or piece[at] == marker:
                code += bytes([marker, run, piece[at]])
            else:
                code += piece[at:at + 1] * run
            at += run
        out.append(struct.pack("<HHB", len(code) + 5, len(piece), marker) + code)
    return struct.pack("<H", len(out)) + b"".join(out)


def pictor(width, rows, bits, planes, kind, palette, plain=False, block=4000):
    """`rows` are top first."""
    upward = rows[::-1]
    if planes == 1:
        data = packed(upward, bits)
    else:
        data = b"".join(packed([[value >> plane & 1 for value in row] for row in upward], 1)
                        for plane in range(planes))
    head = struct.pack("<HHHHHBBBHH", 0x1234, width, len(rows), 0, 0, (planes - 1) << 4 | bits,
                       0xFF, ord("L"), kind, len(palette))
    return head + palette + (b"\0\0" + data if plain else blocks(data, block))


def made():
    """Name, file, size, colors and pixels, whether ffmpeg supports it."""
    draw = random.Random(7)

    def rows(width, height, most):
        picture = [[draw.randrange(most) if (x // 9 + y // 5) % 3 else (y // 7) % most
                    for x in range(width)] for y in range(height)]
        picture[3] = [most - 1] * width
        return picture

    ega = bytes(draw.sample(range(64), 16))
    ega_colors = [tuple((value >> low & 1) * 0xAA + (value >> low + 3 & 1) * 0x55
                        for low in (2, 1, 0)) for value in ega]
    vga = bytes(draw.randrange(64) for _ in range(768))
    vga_colors = [tuple(value << 2 | value >> 4 for value in vga[3 * i:3 * i + 3])
                  for i in range(256)]
    jr = bytes(draw.sample(range(16), 16))
    for name, width, bits, planes, kind, palette, colors, both in (
            ("256 VGA colors", 61, 8, 1, 4, vga, vga_colors, True),
            ("16 EGA colors in planes", 64, 1, 4, 3, ega, ega_colors, True),
            ("16 EGA colors in planes, rows with padding", 61, 1, 4, 3, ega, ega_colors, False),
            ("16 PCjr colors", 62, 4, 1, 2, jr, [rgb(CGA)[i] for i in jr], True),
            ("16 colors without palette", 62, 4, 1, 0, b"", rgb(CGA), True),
            ("4 CGA colors", 64, 2, 1, 1, bytes([3, 0]), [rgb(CGA)[i] for i in (0, 11, 13, 15)],
             True),
            ("4 CGA colors, rows with padding", 61, 2, 1, 1, bytes([4, 0]),
             [rgb(CGA)[i] for i in (0, 10, 12, 14)], False),
            ("black and white", 64, 1, 1, 0, b"", [(0, 0, 0), (255, 255, 255)], True),
            ("8 colors in planes", 64, 1, 3, 3, ega[:8], ega_colors[:8], False)):
        picture = rows(width, 50, 1 << bits * planes)
        pixels = [colors[value] for row in picture for value in row]
        yield name, pictor(width, picture, bits, planes, kind, palette), (width, 50), pixels, both
        yield name + ", small blocks", pictor(width, picture, bits, planes, kind, palette,
                                              block=37), (width, 50), pixels, both
        yield name + ", plain", pictor(width, picture, bits, planes, kind, palette,
                                       plain=True), (width, 50), pixels, False


def written():
    """Name and picture."""
    draw = random.Random(9)
    for width in (64, 61):
        for colors in (2, 16, 200):
            image = Image.new("P", (width, 40))
            image.putpalette(bytes(value << 2 | value >> 4
                                   for value in (draw.randrange(64) for _ in range(3 * colors))))
            image.putdata([draw.randrange(colors) if x % 16 > 6 else y % colors for y in range(40)
                           for x in range(width)])
            yield f"{colors} colors, {width} columns", image


def main():
    if shutil.which("ffmpeg") is None:
        print("not installed: ffmpeg")
        return 77
    faults = []
    with tempfile.TemporaryDirectory() as folder:
        source = Path(folder) / "picture.pic"
        for name, file, size, pixels, both in made():
            source.write_bytes(file)
            seen = {"fotomill": Image.open(ours(source, "bmp", folder)).convert("RGB")}
            if both:
                seen["ffmpeg"] = ffmpeg(source, folder)
            faults += [f"{name}: {who}" for who, image in seen.items() if image.size != size
                       or list(image.getdata()) != pixels]
        for name, image in written():
            bitmap = Path(folder) / "written.bmp"
            image.save(bitmap)
            if ffmpeg(ours(bitmap, "pic", folder),
                      folder).tobytes() != image.convert("RGB").tobytes():
                faults.append(f"{name}: ffmpeg sees another picture")
    print("\n".join(faults) if faults else "all are right")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
