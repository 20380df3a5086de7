#!/usr/bin/python3
"""FlashPix pictures created according to the specification are read correctly; JPEG tiles are
compared with Pillow."""
import io
import os
import subprocess
import sys
import tempfile
from pathlib import Path

import flashpix_file as fpx

try:
    from PIL import Image
except ImportError:
    print("not installed: Pillow")
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
SIDE = 64


def pattern(width, height, channels):
    """Smooth, so that JPEG keeps it."""
    mode = {1: "L", 3: "RGB", 4: "CMYK"}[channels]
    image = Image.new(mode, (width, height))
    image.putdata([tuple((x * (c + 1) + y * 2 + 40 * c) % 500 // 2 for c in range(channels))
                   if channels > 1 else (x + 2 * y) % 500 // 2
                   for y in range(height) for x in range(width)])
    return image


def cut(image):
    """The tiles of a picture, padded with black."""
    for top in range(0, image.height, SIDE):
        for left in range(0, image.width, SIDE):
            yield image.crop((left, top, left + SIDE, top + SIDE))


def jpeg(image, **options):
    out = io.BytesIO()
    image.save(out, "JPEG", quality=90, **options)
    return out.getvalue()


def without_tables(stream):
    """A JPEG stream split into tables and the rest, without JFIF."""
    tables, rest, at = b"\xff\xd8", b"\xff\xd8", 2
    while True:
        marker, length = stream[at + 1], int.from_bytes(stream[at + 2:at + 4], "big")
        segment = stream[at:at + 2 + length]
        if marker == 0xDA:
            return tables + b"\xff\xd9", rest + stream[at:]
        if marker in (0xDB, 0xC4):
            tables += segment
        elif marker != 0xE0:
            rest += segment
        at += 2 + length


def joined(tiles, width, height, mode):
    image = Image.new(mode, (width, height))
    across = (width + SIDE - 1) // SIDE
    for i, tile in enumerate(tiles):
        image.paste(tile, (i % across * SIDE, i // across * SIDE))
    return image


def decoded(streams):
    return [Image.open(io.BytesIO(stream)) for stream in streams]


def cases():
    """Name, file, expected picture, and maximum difference of a sample."""
    for name, width, height in (("one tile", 10, 7), ("six tiles", 130, 70)):
        for channels, space in ((1, fpx.GRAY), (3, fpx.RGB)):
            image = pattern(width, height, channels)
            tiles = [(0, 0, tile.tobytes()) for tile in cut(image)]
            for scatter in (False, True):
                yield (f"plain, {name}, {channels} channels, scattered: {scatter}",
                       fpx.flashpix(width, height, tiles, space, channels, scatter=scatter), image,
                       0)
    image = pattern(64, 64, 3)
    yield ("a table of chains that the header has no room for",
           fpx.flashpix(64, 64, [(0, 0, image.tobytes())], fpx.RGB, 3,
                        extra={"Other": bytes(9 << 20)}), image, 0)
    image = Image.new("RGB", (70, 64), (10, 20, 30))
    image.paste((200, 100, 0), (64, 0, 70, 64))
    yield "one color", fpx.flashpix(70, 64, [(1, 0x1E140A, b""), (1, 0x0064C8, b"")], fpx.RGB,
                                    3), image, 0
    gray = Image.new("L", (64, 64), 77)
    yield "one gray", fpx.flashpix(64, 64, [(1, 77, b"")], fpx.GRAY, 1), gray, 0

    image = pattern(130, 70, 3)
    for name, options in (("4:4:4", {"subsampling": 0}), ("4:2:0", {"subsampling": 2}),
                          ("progressive", {"progressive": True})):
        streams = [jpeg(tile, **options) for tile in cut(image)]
        tiles = [(2, 0x010000, stream) for stream in streams]
        expected = joined(decoded(streams), 130, 70, "RGB")
        yield f"JPEG {name}", fpx.flashpix(130, 70, tiles, fpx.RGB, 3), expected, 2
    streams = [jpeg(tile, subsampling=0) for tile in cut(image)]
    split = [without_tables(stream) for stream in streams]
    tiles = [(2, 0x03010000, rest) for _, rest in split]
    yield ("JPEG with shared tables", fpx.flashpix(130, 70, tiles, fpx.RGB, 3,
                                                   tables={3: split[0][0]}),
           joined(decoded(streams), 130, 70, "RGB"), 2)
    coarse = [jpeg(tile.convert("L"), qtables=[[40] * 64]) for tile in cut(image)]
    split = [without_tables(stream) for stream in coarse]
    fine = jpeg(next(cut(image)).convert("L"))
    tiles = [(2, 0x05000000, split[0][1]), (2, 0, fine)] + [(2, 0x05000000, rest) for _,
                                                            rest in split[2:]]
    streams = [coarse[0], fine] + coarse[2:]
    yield ("gray JPEG, shared tables and own ones in turn",
           fpx.flashpix(130, 70, tiles, fpx.GRAY, 1, tables={5: split[0][0]}),
           joined(decoded(streams), 130, 70, "L"), 0)

    tile = bytes([100, 156, 137]) * (SIDE * SIDE)
    gray = Image.new("RGB", (20, 20), (136,) * 3)
    yield "PhotoYCC", fpx.flashpix(20, 20, [(0, 0, tile)], fpx.YCC, 3), gray, 0
    tile = bytes([60, 0, 30, 120]) * (SIDE * SIDE)
    yield "multiplied with opacity", fpx.flashpix(20, 20, [(0, 0, tile)], fpx.RGB, 4,
                                                  opacity=True), Image.new("RGB", (20, 20),
                                                                           (128, 0, 64)), 0


def shown(folder, file):
    source = Path(folder) / "picture.fpx"
    source.write_bytes(file)
    subprocess.run([FOTOMILL, "--quiet", "convert", source, "--to", "bmp", "--dest", folder,
                    "--overwrite", "replace"],
                   check=True, stdout=subprocess.DEVNULL)
    with Image.open(Path(folder) / "picture.bmp") as image:
        return image.convert("RGB")


def main():
    found = count = 0
    with tempfile.TemporaryDirectory() as folder:
        for name, file, expected, most in cases():
            count += 1
            image = shown(folder, file)
            expected = expected.convert("RGB")
            worst = image.size
            if image.size == expected.size:
                worst = max(abs(a - b) for a, b in zip(image.tobytes(), expected.tobytes()))
            if image.size != expected.size or worst > most:
                print(name, worst, sep=": ")
                found += 1
    print(f"{count} files, {found} faults")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
