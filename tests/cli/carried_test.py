#!/usr/bin/python3
"""What a picture says of itself beside its pixels goes along, or the pixels are changed so that it looks the same. Pillow judges."""
import json
import os
import subprocess
import sys
import tempfile
from pathlib import Path

try:
    from PIL import Image, ImageCms, ImageOps
except ImportError:
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
ORIENTATION = 0x0112
failures = 0


def check(good, what):
    global failures
    if not good:
        failures += 1
        print(f"FAILED: {what}")


def run(*arguments):
    return subprocess.run([FOTOMILL, *map(str, arguments)], stdout=subprocess.PIPE,
                          stderr=subprocess.PIPE, text=True, check=False)


def scene(width=64, height=48):
    """A picture without symmetry, smooth enough for JPEG."""
    picture = Image.new("RGB", (width, height))
    picture.putdata([(x * 255 // width, y * 255 // height,
                      (x + 2 * y) * 255 // (width + 2 * height)) for y in range(height)
                      for x in range(width)])
    return picture


def difference(a, b):
    """The largest difference of two pictures' samples; 999 for those of different sizes."""
    a, b = a.convert("RGB"), b.convert("RGB")
    if a.size != b.size:
        return 999
    return max(abs(x - y) for x, y in zip(a.tobytes(), b.tobytes()))


def exif(orientation):
    block = Image.Exif()
    block[ORIENTATION] = orientation
    block[0x010F] = "Maker"
    return block


def wide_profile():
    """An RGB profile far from sRGB: the sRGB one with red and green exchanged."""
    profile = bytearray(ImageCms.ImageCmsProfile(ImageCms.createProfile("sRGB")).tobytes())
    count = int.from_bytes(profile[128:132], "big")
    entries = {bytes(profile[132 + 12 * i:136 + 12 * i]): 132 + 12 * i for i in range(count)}
    red, green = entries[b"rXYZ"], entries[b"gXYZ"]
    swapped = profile[green + 4:green + 12], profile[red + 4:red + 12]
    profile[red + 4:red + 12], profile[green + 4:green + 12] = swapped
    return bytes(profile)


def orientations(folder):
    for tag in (3, 5, 6, 8):
        source = folder / f"turned{tag}.jpg"
        scene().save(source, quality=95, subsampling=0, exif=exif(tag))
        upright = ImageOps.exif_transpose(Image.open(source))
        for format_ in ("bmp", "tga", "pcx", "gif", "png", "tif", "webp"):
            made = folder / f"turned{tag}.{format_}"
            run("convert", source, "-o", made, "--reduce", "--overwrite", "replace")
            seen = Image.open(made)
            seen.load()  # Pillow turns TIFF pictures upright by itself
            seen = seen if format_ == "tif" else ImageOps.exif_transpose(seen)
            limit = {"gif": 90, "webp": 60}.get(format_, 2)
            check(difference(seen, upright) <= limit,
                  f"orientation {tag} in {format_}: {difference(seen, upright)}")
        # the setting turns it off
        made = folder / "asis.bmp"
        run("--set", "ExifAdjustOrientation=0", "convert", source, "-o", made, "--overwrite",
            "replace")
        check(difference(Image.open(made), Image.open(source)) <= 2,
              f"orientation {tag} is left alone when ExifAdjustOrientation is 0")
        for keys in (["convert", source, "--metadata", "strip"],
                     ["--set", "PreserveEXIF=0", "convert", source]):
            for format_ in ("jpg", "png"):
                made = folder / f"bare{tag}.{format_}"
                run(*keys, "-o", made, "--overwrite", "replace")
                picture = Image.open(made)
                check(not picture.getexif(), f"{keys[1]} to {format_} leaves no EXIF")
                check(difference(picture, upright) <= 12,
                      f"strip turns {tag} upright in {format_}: {difference(picture, upright)}")


def profiles(folder):
    wide = wide_profile()
    (folder / "wide.icc").write_bytes(wide)
    srgb = ImageCms.createProfile("sRGB")
    source = folder / "wide.png"
    scene().save(source, icc_profile=wide)
    meant = ImageCms.profileToProfile(scene(), ImageCms.ImageCmsProfile(str(folder / "wide.icc")),
                                      srgb)
    check(difference(meant, scene()) > 60, "the profile matters")
    for format_, more in (("bmp", []), ("tga", []), ("pcx", []), ("png", ["--profile", "srgb"]),
                          ("tif", ["--profile", "srgb"])):
        made = folder / f"made.{format_}"
        run("convert", source, "-o", made, "--overwrite", "replace", *more)
        picture = Image.open(made)
        check(difference(picture, meant) <= 3,
              f"colors become sRGB in {format_} {more}: {difference(picture, meant)}")
        check("icc_profile" not in picture.info, f"no profile is left in {format_}")
    for format_, more in (("png", []), ("tif", []), ("jpg", ["--quality", "100"]),
                          ("webp", ["--set-lossless"]), ("psd", [])):
        for strip in ([], ["--metadata", "strip"]):
            made = folder / f"kept.{format_}"
            before = ["--set", "WebPLossless=1"] if format_ == "webp" else []
            run(*before, "convert", source, "-o", made, "--overwrite", "replace",
                *[m for m in more if m != "--set-lossless"], *strip)
            picture = Image.open(made)
            check(picture.info.get("icc_profile") == wide,
                  f"the profile goes along in {format_} {strip}")
            check(difference(picture, scene()) <= (40 if format_ == "jpg" else 0),
                  f"pixels stay in {format_} {strip}: {difference(picture, scene())}")
    # palettes
    scene().quantize(64).save(folder / "few.png", icc_profile=wide)
    run("convert", folder / "few.png", "-o", folder / "few.bmp")
    few = ImageCms.profileToProfile(scene().quantize(64).convert("RGB"),
                                    ImageCms.ImageCmsProfile(str(folder / "wide.icc")), srgb)
    check(difference(Image.open(folder / "few.bmp"), few) <= 3, "color tables are converted")
    # a given profile
    scene().save(folder / "plain.png")
    run("convert", folder / "plain.png", "-o", folder / "given.png", "--profile",
        folder / "wide.icc")
    given = Image.open(folder / "given.png")
    back = ImageCms.profileToProfile(given.convert("RGB"),
                                     ImageCms.ImageCmsProfile(str(folder / "wide.icc")), srgb)
    check(given.info.get("icc_profile") == wide and difference(given, scene()) > 60,
          "colors are converted to a given profile")
    inside = [abs(a - b) for a, b in zip(back.tobytes(), scene().tobytes())]
    check(sum(inside) / len(inside) < 3,
          f"and mean what they meant: {sum(inside) / len(inside):.2f}")
    scene().convert("L").save(folder / "gray.png")
    run("convert", folder / "gray.png", "-o", folder / "graygiven.png", "--profile",
        folder / "wide.icc")
    check(Image.open(folder / "graygiven.png").info.get("icc_profile") == wide,
          "gray pictures take an RGB profile too")
    # a profile of inks does not go into a picture of light
    ink = Image.new("CMYK", (16, 16), (0, 128, 128, 0))
    fake = bytearray(wide)
    fake[16:20] = b"CMYK"
    ink.save(folder / "ink.jpg", icc_profile=bytes(fake))
    run("convert", folder / "ink.jpg", "-o", folder / "ink.png")
    check("icc_profile" not in Image.open(folder / "ink.png").info, "a profile of inks is left out")
    # usage
    (folder / "no.icc").write_bytes(b"no profile")
    for arguments, message in ((["-o", folder / "x.bmp", "--profile", folder / "wide.icc"],
                                "BMP files cannot hold a color profile."),
                               (["-o", folder / "x.png", "--profile", folder / "no.icc"],
                                "is not an ICC profile of RGB colors."),
                               (["-o", folder / "x.png", "--profile", folder / "missing.icc"],
                                "cannot be read.")):
        result = run("convert", folder / "plain.png", *arguments)
        check(result.returncode == 2 and message in result.stderr,
              f"usage: {result.returncode} {result.stderr}")
    result = run("apply", folder / "few.bmp", "--do", "flip horizontal", "--profile",
                 folder / "wide.icc")
    check(result.returncode == 1 and "BMP files cannot hold a color profile." in result.stderr,
          f"apply: {result.returncode} {result.stderr}")


with tempfile.TemporaryDirectory() as name:
    orientations(Path(name))
    profiles(Path(name))
sys.exit(1 if failures else 0)
