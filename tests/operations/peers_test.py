#!/usr/bin/python3
"""Operations give what Pillow gives, where Pillow computes the same."""
import os
import subprocess
import sys
import tempfile
from pathlib import Path

try:
    from PIL import Image, ImageChops, ImageFilter
except ImportError:
    print("skipped: needs Pillow (python3-pil)")
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
WIDTH, HEIGHT = 161, 97
faults = []


def sample():
    """Slopes, edges and some texture."""
    picture = Image.new("RGB", (WIDTH, HEIGHT))
    picture.putdata([((x * 255 // WIDTH) ^ (y // 3 & 31), 230 if (x // 20 + y // 15) % 2 else 40, (x * y // 7 + 60) % 256)
                     for y in range(HEIGHT) for x in range(WIDTH)])
    return picture


def perspective(picture):
    """Output (x, y) comes from (x + 0.2 y + 10, y + 5) - a map that Pillow takes as it is."""
    return picture.transform((100, 70), Image.Transform.AFFINE, (1, 0.2, 10, 0, 1, 5), Image.Resampling.BILINEAR)


# line of a recipe, what Pillow makes of the picture, most levels apart, pixels of the border that are left out
ROWS = [
    ("rotate 7 filter=bilinear mode=keep", lambda p: p.rotate(-7, Image.Resampling.BILINEAR), 2, None),
    ("rotate -24.5 filter=bilinear mode=keep", lambda p: p.rotate(24.5, Image.Resampling.BILINEAR), 2, None),
    ("rotate 90", lambda p: p.transpose(Image.Transpose.ROTATE_270), 0, 0),
    ("rotate 180", lambda p: p.transpose(Image.Transpose.ROTATE_180), 0, 0),
    ("offset 30 -11", lambda p: ImageChops.offset(p, 30, -11), 0, 0),
    ("crop 40x30+7+9", lambda p: p.crop((7, 9, 47, 39)), 0, 0),
    ("canvas 200x97 gravity=left background=#102030", lambda p: pasted(p), 0, 0),
    ("perspective 10,5 110,5 124,75 24,75 size=100x70 filter=bilinear", perspective, 2, 0),
    ("kernel '1 2 1 2 4 2 1 2 1'", lambda p: p.filter(ImageFilter.Kernel((3, 3), (1, 2, 1, 2, 4, 2, 1, 2, 1))), 1, 1),
    ("kernel '-1 -2 0 -2 9 1 0 1 0' divisor=4 bias=30",
     lambda p: p.filter(ImageFilter.Kernel((3, 3), (0, 1, 0, -2, 9, 1, -1, -2, 0), 4, 30)), 1, 1),  # Pillow counts rows from below
    ("median 2", lambda p: p.filter(ImageFilter.MedianFilter(5)), 0, 2),
    ("minimum 1", lambda p: p.filter(ImageFilter.MinFilter(3)), 0, 1),
    ("box-blur 3", lambda p: p.filter(ImageFilter.BoxBlur(3)), 1, 0),
]


def pasted(picture):
    canvas = Image.new("RGB", (200, HEIGHT), (0x10, 0x20, 0x30))
    canvas.paste(picture, (0, 0))
    return canvas


def inside(picture, expected, border):
    """The part that both compute alike: with rotations, away from where the background mixes in."""
    width, height = picture.size
    if border is None:
        return (width * 2 // 5, height // 3, width * 3 // 5, height * 2 // 3)
    return (border, border, width - border, height - border)


def judge(folder, line, peer, most, border):
    source, result = folder / "in.png", folder / "out" / "in.png"
    run = subprocess.run([FOTOMILL, "apply", source, "--do", line, "--dest", folder / "out", "--prefix", "", "--overwrite", "replace"],
                         capture_output=True, text=True, check=False)
    if run.returncode != 0 or not result.exists():
        faults.append(f"{line}: status {run.returncode}: {run.stderr}")
        return
    ours, expected = Image.open(result).convert("RGB"), peer(Image.open(source))
    if ours.size != expected.size:
        faults.append(f"{line}: {ours.size}, not {expected.size}")
        return
    box = inside(ours, expected, border)
    apart = max(high for _, high in ImageChops.difference(ours.crop(box), expected.crop(box)).getextrema())
    if apart > most:
        faults.append(f"{line}: {apart} levels apart")


with tempfile.TemporaryDirectory() as name:
    work = Path(name)
    (work / "out").mkdir()
    sample().save(work / "in.png")
    for row in ROWS:
        judge(work, *row)

for fault in faults:
    print(fault)
sys.exit(1 if faults else 0)
