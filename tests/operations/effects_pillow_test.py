#!/usr/bin/python3
"""Compares effects, color reduction and resizing with Pillow, on a generated picture and, if
FOTOMILL_CORPUS is set, on a photo."""
import colorsys
import os
import subprocess
import sys
import tempfile
from pathlib import Path

try:
    from PIL import Image, ImageChops, ImageEnhance, ImageFilter, ImageOps, ImageStat
except ImportError:
    print("Pillow is missing")
    sys.exit(77)

PROGRAM = os.environ["FOTOMILL"]
faults = []


def made_picture():
    """All colors of a coarse grid, smooth gradients, and noise."""
    picture = Image.new("RGB", (240, 180))
    pixels = []
    for y in range(180):
        for x in range(240):
            if y < 60:
                pixels.append((x * 255 // 239, y * 255 // 59, (x + y) * 255 // 298))
            elif y < 120:
                pixels.append((x % 6 * 51, x // 6 % 6 * 51, (y // 10) % 6 * 51))
            else:
                seed = (x * 2654435761 ^ y * 2246822519) & 0xFFFFFFFF
                pixels.append((seed >> 24, seed >> 16 & 255, seed >> 8 & 255))
    picture.putdata(pixels)
    return picture


def photo():
    folder = Path(os.environ.get("FOTOMILL_CORPUS", "/nonexistent"), "photo")
    for path in sorted(folder.glob("*.jpg")):
        picture = Image.open(path).convert("RGB")
        picture.thumbnail((900, 900))
        return picture
    return None


def unclipped(picture):
    """As above, between 64 and 191, so that no filter overshoots."""
    return picture.point(lambda v: 64 + v // 2)


def apply(folder, source, recipe):
    """The program's result for a picture."""
    source.save(folder / "in.png")
    result = subprocess.run([PROGRAM, "apply", str(folder / "in.png"), "--do", recipe, "--to",
                             "png", "--out", str(folder / "out.png"),
                             "--overwrite", "replace"], stdin=subprocess.DEVNULL,
                             capture_output=True)
    if result.returncode != 0:
        faults.append(f"{recipe}: status {result.returncode}, {result.stderr.decode()}")
        return None
    made = Image.open(folder / "out.png")
    made.load()
    return made


def largest_difference(made, expected):
    return max(high for _, high in ImageChops.difference(made.convert("RGB"),
                                                         expected.convert("RGB")).getextrema())


def solid(picture, color):
    return Image.new("RGB", picture.size, color)


def gray(picture):
    return picture.convert("L").convert("RGB")


def hue_turned(picture, degrees):
    made = Image.new("RGB", picture.size)
    cache = {}

    def turn(color):
        if color not in cache:
            h, s, v = colorsys.rgb_to_hsv(*(c / 255 for c in color))
            cache[color] = tuple(int(c * 255 + 0.5)
                                 for c in colorsys.hsv_to_rgb((h + degrees / 360) % 1, s, v))
        return cache[color]

    made.putdata([turn(color) for color in picture.getdata()])
    return made


SEPIA = (0.393, 0.769, 0.189, 0, 0.349, 0.686, 0.168, 0, 0.272, 0.534, 0.131, 0)

# (operation, Pillow's equivalent, maximum difference in levels)
EFFECTS = [
    ("brightness 20", lambda p: p.point(lambda v: min(v + 51, 255)), 0),
    ("gamma 1.8", lambda p: p.point(lambda v: int(255 * (v / 255) ** (1 / 1.8) + 0.5)), 0),
    ("invert", ImageOps.invert, 0),
    ("gray", gray, 1),
    ("saturation 150", lambda p: ImageEnhance.Color(p).enhance(1.5), 1),
    ("saturation 0", lambda p: ImageEnhance.Color(p).enhance(0), 1),
    ("sepia", lambda p: p.convert("RGB", SEPIA), 1),
    ("solarize 100", lambda p: ImageOps.solarize(p, 100), 0),
    ("tint #ff8800 25%", lambda p: Image.blend(p, solid(p, (255, 136, 0)), 0.25), 1),
    ("colorize #b08040", lambda p: ImageOps.colorize(p.convert("L"), "black", "white",
                                                     (0xB0, 0x80, 0x40)), 3),
    ("auto-levels 0", ImageOps.autocontrast, 1),
    ("auto-levels 2", lambda p: ImageOps.autocontrast(p, cutoff=2), 1),
    ("equalize", ImageOps.equalize, 2),  # Pillow rounds its step down
    ("channels keep=green", lambda p: Image.merge("RGB", [p.getchannel("G")] * 3), 0),
    ("channels swap=red-blue", lambda p: Image.merge("RGB", p.split()[::-1]), 0),
    ("hue 75", lambda p: hue_turned(p, 75), 1),
    ("hue -140", lambda p: hue_turned(p, -140), 1),
]

# (operation, size, Pillow's filter): within one level where nothing clips, since Pillow clamps
# between its two passes
FILTERS = {"box": Image.Resampling.BOX, "triangle": Image.Resampling.BILINEAR,
           "bicubic": Image.Resampling.BICUBIC,
           "lanczos3": Image.Resampling.LANCZOS}
SIZES = [(480, 360), (360, 270), (241, 181), (97, 61), (33, 400), (700, 50)]

# (operation, Pillow's own reduction, maximum noise compared with Pillow's, dB). Both are compared
# after blurring, as seen from a distance.
REDUCTIONS = [
    ("reduce 256", lambda p: p.quantize(256, dither=Image.Dither.FLOYDSTEINBERG), 0),
    ("reduce 64", lambda p: p.quantize(64, dither=Image.Dither.FLOYDSTEINBERG), 0),
    ("reduce 16", lambda p: p.quantize(16, dither=Image.Dither.FLOYDSTEINBERG), 0),
    ("reduce 216 fixed", lambda p: p.convert("P", palette=Image.Palette.WEB), 0.5),
    ("mono bidirectional=no", lambda p: p.convert("1"), 0.5),
    ("mono", lambda p: p.convert("1"), 1.5),
    ("mono dither=stucki bidirectional=no", lambda p: p.convert("1"), 5),
    # wider kernels are coarser
    ("mono dither=sierra bidirectional=no", lambda p: p.convert("1"), 5),
    ("mono dither=burkes bidirectional=no", lambda p: p.convert("1"), 3.5),
]


def seen(picture):
    return picture.convert("RGB").filter(ImageFilter.GaussianBlur(2))


def squared_error(one, other):
    return sum(ImageStat.Stat(ImageChops.difference(one.convert("RGB"), other.convert("RGB"))).sum2)


def judge(folder, name, picture):
    for recipe, expected, tolerance in EFFECTS:
        made = apply(folder, picture, recipe)
        if made is not None and (found := largest_difference(made, expected(picture))) > tolerance:
            faults.append(f"{name}, {recipe}: {found} levels from Pillow's, {tolerance} allowed")
    calm = unclipped(picture)
    for word, pillow in FILTERS.items():
        for size in SIZES:
            recipe = f"resize {size[0]}x{size[1]} stretch {word}"
            made = apply(folder, calm, recipe)
            if made is not None and (found := largest_difference(made,
                                                                 calm.resize(size, pillow))) > 1:
                faults.append(f"{name}, {recipe}: {found} levels from Pillow's")
    for recipe, expected, decibels in REDUCTIONS:
        made = apply(folder, picture, recipe)
        if made is None:
            continue
        of_monochrome = gray(picture) if recipe.startswith("mono") else picture
        own = squared_error(seen(made), seen(of_monochrome))
        peer = squared_error(seen(expected(picture)), seen(of_monochrome))
        if own > peer * 10 ** (decibels / 10):
            faults.append(f"{name}, {recipe}: squared error {own:.0f}, Pillow's {peer:.0f}")


def judge_alpha(folder, picture):
    """Effects do not change alpha: the result equals the formula for all visible pixels."""
    alpha = picture.convert("L").point(lambda v: v if v > 40 else 0)
    with_alpha = picture.copy()
    with_alpha.putalpha(alpha)
    for recipe, expected, tolerance in EFFECTS[:8]:
        made = apply(folder, with_alpha, recipe)
        if made is None:
            continue
        made = made.convert("RGBA")
        wanted = expected(picture)
        for ground in ((0, 0, 0), (255, 255, 255)):
            one = Image.composite(made.convert("RGB"), solid(picture, ground), made.getchannel("A"))
            other = Image.composite(wanted, solid(picture, ground), alpha)
            if (found := largest_difference(one, other)) > tolerance:
                faults.append(f"{recipe} with alpha: {found} levels from Pillow's")
    made = apply(folder, with_alpha, "reduce 16")
    if made is not None and (made.mode not in ("P", "RGBA")
                             or made.convert("RGBA").getchannel("A").tobytes() != alpha.tobytes()):
        faults.append("reduce 16 does not keep alpha")


def main():
    with tempfile.TemporaryDirectory() as name:
        folder = Path(name)
        judge(folder, "made", made_picture())
        judge_alpha(folder, made_picture())
        if (picture := photo()) is not None:
            judge(folder, "photo", picture)
    print("\n".join(faults) if faults else "as Pillow computes")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
