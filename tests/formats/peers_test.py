#!/usr/bin/env python3
"""Other programs read the pictures we write, and see the same pixels.

A row: the format, the sample to convert, and the command that converts standard input to a portable
anymap.
"""
import os
import shutil
import subprocess
import sys
import tempfile
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]
FOTOMILL = os.environ["FOTOMILL"]

ROWS = [
    ("sgi", "bmp-true-color.bmp", "sgitopnm"),
    ("sgi", "bmp-256-colors.bmp", "sgitopnm"),
    ("ras", "bmp-true-color.bmp", "rasttopnm"),
    ("ras", "bmp-256-colors.bmp", "rasttopnm"),
    ("ras", "bmp-16-colors.bmp", "rasttopnm"),
    ("ras", "bmp-mono.bmp", "rasttopnm"),
    ("iff", "bmp-true-color.bmp", "ilbmtoppm"),
    ("iff", "bmp-256-colors.bmp", "ilbmtoppm"),
    ("iff", "bmp-16-colors.bmp", "ilbmtoppm"),
    ("lbm", "bmp-mono.bmp", "ilbmtoppm"),
    ("wbmp", "bmp-mono.bmp", "wbmptopbm"),
    ("rle", "bmp-256-colors.bmp", "bmptopnm"),
    ("rle", "bmp-16-colors.bmp", "bmptopnm"),
    ("rle", "bmp-mono.bmp", "bmptopnm"),
    ("bga", "bmp-true-color.bmp", "bmptopnm"),
    ("bga", "bmp-256-colors.bmp", "bmptopnm"),
    ("bga", "bmp-mono.bmp", "bmptopnm"),
    ("img", "bmp-mono.bmp", "gemtopnm"),
]

# As above, for optional programs that read a file: {} in the command is the file name.
FILE_ROWS = [
    ("cut", "bmp-256-colors.bmp", "gm convert {} ppm:-"),
    ("cut", "bmp-16-colors.bmp", "gm convert {} ppm:-"),
    ("cut", "bmp-mono.bmp", "gm convert {} ppm:-"),
    ("wpg", "bmp-256-colors.bmp", "gm convert {} ppm:-"),
    ("wpg", "bmp-16-colors.bmp", "gm convert {} ppm:-"),
    ("wpg", "bmp-mono.bmp", "gm convert {} ppm:-"),
    ("img", "bmp-true-color.bmp", "ffmpeg -v error -i {} -f image2pipe -c:v ppm -"),
    ("img", "bmp-256-colors.bmp", "ffmpeg -v error -i {} -f image2pipe -c:v ppm -"),
    ("img", "bmp-16-colors.bmp", "ffmpeg -v error -i {} -f image2pipe -c:v ppm -"),
]


def bitmap_of_array(data):
    """The only bitmap of an OS/2 array as a separate file, which starts 14 bytes later."""
    offset = int.from_bytes(data[24:28], "little") - 14
    return data[14:24] + offset.to_bytes(4, "little") + data[28:]


# What the peers read of formats they do not support.
INNER = {"bga": bitmap_of_array}


def anymap(command, data):
    """Width, height and the red, green, blue bytes of the anymap that a command converts `data`
    to."""
    shown = subprocess.run(command.split(), input=data, capture_output=True, check=True).stdout
    kind, size, rest = shown.split(b"\n", 2)
    width, height = map(int, size.split())
    if kind == b"P4":
        stride = (width + 7) // 8
        bits = (rest[y * stride + x // 8] >> (7 - x % 8) & 1 for y in range(height)
                for x in range(width))
        return width, height, b"".join(b"\0\0\0" if bit else b"\xff\xff\xff" for bit in bits)
    pixels = rest.split(b"\n", 1)[1]
    return width, height, pixels if kind == b"P6" else b"".join(bytes([value] * 3)
                                                                for value in pixels)


def main():
    needed = {row[2] for row in ROWS} | {"bmptopnm"}
    missing = [name for name in needed if shutil.which(name) is None]
    if missing:
        print("not installed:", *missing)
        return 77
    failures = 0
    with tempfile.TemporaryDirectory() as folder:
        there = [row for row in FILE_ROWS if shutil.which(row[2].split()[0]) is not None]
        for extension, sample, command in ROWS + there:
            source = PROJECT / "samples" / sample
            subprocess.run([FOTOMILL, "--quiet", "convert", source, "--to", extension, "--dest",
                            folder, "--overwrite", "replace"],
                           check=True, stdout=subprocess.DEVNULL)
            file = (Path(folder) / source.stem).with_suffix("." + extension)
            made = INNER.get(extension, bytes)(file.read_bytes())
            if anymap(command.format(file), made) != anymap("bmptopnm", source.read_bytes()):
                print(f"{command} sees another picture in {sample} as {extension}")
                failures += 1
    print(f"{len(ROWS + there)} pictures, {failures} differ")
    return 1 if failures else 0


if __name__ == "__main__":
    sys.exit(main())
