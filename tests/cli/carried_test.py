#!/usr/bin/python3
"""Metadata is kept, or the pixels are converted so that the picture looks the same. Pillow is the
reference."""
import json
import os
import struct
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
    """An asymmetric picture, smooth enough for JPEG."""
    picture = Image.new("RGB", (width, height))
    picture.putdata([(x * 255 // width, y * 255 // height,
                      (x + 2 * y) * 255 // (width + 2 * height)) for y in range(height)
                      for x in range(width)])
    return picture


def difference(a, b):
    """The maximum difference between two pictures' samples; 999 if the sizes differ."""
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
    """An RGB profile far from sRGB: sRGB with red and green exchanged."""
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
            seen.load()  # Pillow rotates TIFF pictures upright by itself
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
                # decoders round rows and columns differently
                limit = 4 if "strip" in keys and format_ == "jpg" else 12
                check(difference(picture, upright) <= limit, 
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
    # ink profiles do not fit RGB pictures
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


def pixels_of(path):
    """The compressed pixels of a file, byte for byte."""
    data = path.read_bytes()
    if path.suffix == ".jpg":
        return data[data.index(b"\xff\xda"):data.index(b"\xff\xd9", data.index(b"\xff\xda")) + 2]
    if path.suffix == ".png":
        kept, at = b"", 8
        while at < len(data):
            size = int.from_bytes(data[at:at + 4], "big")
            if data[at + 4:at + 8] in (b"IHDR", b"PLTE", b"IDAT", b"fdAT", b"fcTL", b"acTL",
                                       b"tRNS"):
                kept += data[at:at + 12 + size]
            at += 12 + size
        return kept
    if path.suffix == ".webp":
        kept, at = b"", 12
        while at < len(data):
            size = int.from_bytes(data[at + 4:at + 8], "little")
            if data[at:at + 4] in (b"VP8 ", b"VP8L", b"ALPH", b"ANIM", b"ANMF"):
                kept += data[at:at + 8 + size]
            at += 8 + size + size % 2
        return kept
    with Image.open(path) as picture:
        kept = b""
        for page in range(picture.n_frames):
            picture.seek(page)
            for offset, size in zip(picture.tag_v2[273], picture.tag_v2[279]):
                kept += data[offset:offset + size]
        return kept


def strips(folder):
    """--metadata strip removes segments without encoding again."""
    wide = wide_profile()
    block = exif(1)
    block[0x8298] = "Copyright SECRET"
    block[0x9286] = "Secret comment SECRET"
    texts = {"comment": b"SECRET"}
    scene().save(folder / "bare.jpg", quality=91, exif=block, icc_profile=wide, dpi=(200, 200),
                 **texts)
    scene().save(folder / "steps.jpg", quality=91, exif=block, progressive=True, dpi=(200, 200),
                 **texts)
    from PIL import PngImagePlugin, TiffImagePlugin
    info = PngImagePlugin.PngInfo()
    info.add_text("Author", "SECRET")
    info.add_itxt("Comment", "SECRET", zip=False)
    scene().save(folder / "bare.png", exif=block, icc_profile=wide, pnginfo=info)
    first, second = scene(), scene().transpose(Image.Transpose.FLIP_LEFT_RIGHT)
    first.save(folder / "moving.png", save_all=True, append_images=[second], duration=[100, 200],
               pnginfo=info)
    Image.frombytes("I;16", (16, 16), bytes(range(256)) * 2).save(folder / "deep.png", pnginfo=info)
    scene().save(folder / "bare.webp", quality=50, exif=block, icc_profile=wide,
                 xmp=b"<x>SECRET</x>")
    first.save(folder / "moving.webp", save_all=True, append_images=[second], duration=[100, 200],
               exif=block)
    tags = TiffImagePlugin.ImageFileDirectory_v2()
    tags[270], tags[315], tags[33432] = "SECRET description", "SECRET", "SECRET"
    tags[700] = b"<x>SECRET</x>"
    first.save(folder / "bare.tif", tiffinfo=tags, compression="tiff_lzw", icc_profile=wide,
               dpi=(200, 200), save_all=True, append_images=[second])
    scene().save(folder / "jpeg.tif", tiffinfo=tags, compression="jpeg", quality=60)
    with open(folder / "gps.tif", "wb") as out:
        scene().save(out, "TIFF", exif=block)
    sources = [folder / n for n in ("bare.jpg", "steps.jpg", "bare.png", "moving.png", "deep.png",
                                    "bare.webp", "moving.webp", "bare.tif", "jpeg.tif", "gps.tif")]
    for source in sources:
        made = folder / "out" / source.name
        result = run("convert", source, "-o", made, "--metadata", "strip", "-v")
        check(result.returncode == 0 and "Copied without encoding." in result.stderr,
              f"{source.name}: {result.stderr}")
        if not made.exists():
            continue
        check(b"SECRET" in source.read_bytes() or b"SECRET".hex() == "",
              f"{source.name} has something to drop")
        check(b"SECRET" not in made.read_bytes() and b"Maker" not in made.read_bytes(),
              f"nothing is left in {source.name}")
        check(pixels_of(made) == pixels_of(source), f"the pixels of {source.name} are untouched")
        with Image.open(source) as before, Image.open(made) as after:
            check(after.info.get("icc_profile") == before.info.get("icc_profile"),
                  f"the profile of {source.name} stays")
            check(after.info.get("dpi") == before.info.get("dpi"),
                  f"the resolution of {source.name} stays")
            check(getattr(after, "n_frames", 1) == getattr(before, "n_frames", 1),
                  f"the pages of {source.name} stay")
            for page in range(getattr(after, "n_frames", 1)):
                before.seek(page)
                after.seek(page)
                check(difference(before, after) == 0, f"page {page} of {source.name}")
        shrinks = made.stat().st_size < source.stat().st_size
        check(shrinks or (source.suffix == ".tif" and made.stat().st_size == source.stat().st_size),
              f"{source.name} gets smaller")
    # requests beyond that are encoded
    for more in (["--quality", "30"], ["--profile", "srgb"], ["--page", "1"]):
        source = folder / ("bare.tif" if more[0] == "--page" else "bare.jpg")
        made = folder / "out2" / source.name
        run("convert", source, "-o", made, "--metadata", "strip", "--overwrite", "replace", *more)
        check(pixels_of(made) != pixels_of(source), f"{more} encodes")
    # rotated losslessly if possible, else with the source's own quality
    for size, exact in (((64, 48), True), ((61, 45), False)):
        source, made = folder / "camera.jpg", folder / "turned.jpg"
        scene(*size).save(source, quality=93, exif=exif(6))
        result = run("convert", source, "-o", made, "--metadata", "strip", "--overwrite", "replace")
        upright = ImageOps.exif_transpose(Image.open(source))
        with Image.open(made) as picture:
            check(not picture.getexif(), "a turned picture has no EXIF")
            check(difference(picture, upright) <= (4 if exact else 12),
                  f"it is upright: {difference(picture, upright)}")
            tables = [sorted(table) for p in (picture, Image.open(source))
                      for table in p.quantization.values()]
            check(len(tables) == 4 and tables[:2] == tables[2:], "with its own quality")
        check(("re-encoded" in result.stderr) == (not exact), f"it says so: {result.stderr}")
    # a 16-bit TIFF with an orientation keeps tag and bit depth
    Image.frombytes("I;16", (16, 8), bytes(range(256))).save(folder / "deep.tif",
                                                             tiffinfo={274: 6, 270: "SECRET"})
    run("convert", folder / "deep.tif", "-o", folder / "out" / "deep.tif", "--metadata", "strip")
    with Image.open(folder / "out" / "deep.tif") as picture:
        check(picture.mode.startswith("I;16") and picture.tag_v2.get(274) == 6
              and b"SECRET" not in (folder / "out" / "deep.tif").read_bytes(), "deep TIFF")


def qualities(folder):
    for name, options in (("low", {"quality": 40, "subsampling": 2}),
                          ("high", {"quality": 97, "subsampling": 0}),
                          ("half", {"quality": 80, "subsampling": 1}), ("gray", {"quality": 55})):
        picture = scene().convert("L") if name == "gray" else scene()
        source = folder / f"{name}.jpg"
        picture.save(source, **options)
        for more, kept in ((["convert", source, "--quality", "keep"], True),
                           (["convert", source], False),
                           (["apply", source, "--do", "crop 32x32"], True),
                           (["apply", source, "--do", "rotate 90; flip vertical"], True),
                           (["apply", source, "--do", "rotate 7"], False),
                           (["apply", source, "--do", "resize 32x32"], False),
                           (["apply", source, "--do", "resize 32x32", "--quality", "keep"], True),
                           (["apply", source, "--do", "crop 32x32; save quality=60"], False),
                           (["apply", source, "--do", "crop 32x32", "--quality", "60"], False),
                           (["convert", source, "--auto-orient"], True)):
            made = folder / "quality.jpg"
            result = run(*more, "-o", made, "--overwrite", "replace")
            check(result.returncode == 0, f"{more}: {result.stderr}")
            with Image.open(made) as after, Image.open(source) as before:
                same = (after.quantization == before.quantization
                        and (name == "gray" or after.layer == before.layer))
                check(same == kept,
                      f"{name} {more[2:]}: quantization {'kept' if same else 'changed'}")
    for wrong in ("0", "101", "best", "5x"):
        result = run("convert", folder / "low.jpg", "-o", folder / "x.jpg", "--quality", wrong)
        check(result.returncode == 2
              and f'--quality: "{wrong}" is neither keep nor a whole number from 1 to 100.'
              in result.stderr, f"--quality {wrong}: {result.stderr}")


def left_out(folder):
    from PIL import PngImagePlugin
    info = PngImagePlugin.PngInfo()
    info.add_text("Author", "one")
    info.add_text("Title", "two")
    Image.frombytes("I;16", (16, 16), bytes(range(256)) * 2).save(folder / "deep.png")
    scene().save(folder / "texts.png", pnginfo=info)
    Image.new("RGBA", (8, 8), (255, 0, 0, 99)).save(folder / "clear.png")
    scene().save(folder / "pages.tif", save_all=True, append_images=[scene(), scene()])
    frames = [scene().rotate(i) for i in range(5)]
    frames[0].save(folder / "moving.gif", save_all=True, append_images=frames[1:])
    scene().save(folder / "camera.jpg", exif=exif(1), comment=b"hello")
    iptc = b"Photoshop 3.0\0" + b"8BIM\x04\x04\0\0\0\0\0\x0a\x1c\x02\x78\0\x05hello"
    data = (folder / "camera.jpg").read_bytes()
    (folder / "news.jpg").write_bytes(data[:2] + b"\xff\xed"
                                      + (len(iptc) + 2).to_bytes(2, "big") + iptc + data[2:])
    note = Image.Exif()
    note._ifds[0x8769] = {0x927C: b"Maker\0note of some length"}
    note[0x8769] = note._ifds[0x8769]
    scene().save(folder / "note.jpg", exif=note)
    scene().save(folder / "plain.png")
    for source, to, message in (
            ("deep.png", "png", "Left out: more than 8 bits per sample."),
            ("texts.png", "png", "Left out: other texts."),
            ("clear.png", "jpg", "Left out: transparency."), ("clear.png", "png", None),
            ("pages.tif", "png", "Left out: 2 more pages."),
            ("moving.gif", "bmp", "Left out: 4 more frames."),
            ("camera.jpg", "bmp", "Left out: EXIF, comment."), ("camera.jpg", "png", None),
            ("news.jpg", "png", "Left out: IPTC."), ("note.jpg", "tif", "Left out: maker note."),
            ("note.jpg", "png", None), ("plain.png", "bmp", None)):
        result = run("convert", folder / source, "-o", folder / f"left.{to}", "--overwrite",
                     "replace", "--reduce")
        lines = [line for line in result.stderr.splitlines() if "Left out" in line]
        wanted = [] if message is None else [f"{folder / source}: {message}"]
        check(result.returncode == 0 and lines == wanted, f"{source} to {to}: {result.stderr}")
    result = run("convert", folder / "pages.tif", "-o", folder / "left.png", "--page", "2",
                 "--overwrite", "replace")
    check("Left out" not in result.stderr, "a page that was chosen leaves nothing out")
    result = run("convert", folder / "pages.tif", "-o", folder / "left.png", "--page", "all",
                 "--overwrite", "replace")
    check("Left out" not in result.stderr, "all pages as numbered files leave nothing out")
    result = run("convert", folder / "camera.jpg", "-o", folder / "left.bmp", "--metadata", "strip",
                 "--overwrite", "replace")
    check("Left out" not in result.stderr, "what was to be dropped is not missed")
    result = run("convert", folder / "camera.jpg", "-o", folder / "left.bmp", "--overwrite",
                 "replace", "-q")
    check(result.stderr == "", "--quiet is quiet")
    result = run("convert", folder / "camera.jpg", "-o", folder / "left.bmp", "--overwrite",
                 "replace", "--json")
    check(json.loads(result.stdout)[0]["note"] == "Left out: EXIF, comment.", "JSON has the note")


def salvages(folder):
    whole = scene(200, 160)
    sources = {}
    for name, options in (("cut.jpg", {"quality": 95}),
                          ("steps.jpg", {"quality": 95, "progressive": True}), ("cut.png", {}),
                          ("cut.gif", {"interlace": 0}),
                          ("cut.bmp", {}), ("cut.webp", {"quality": 90}),
                          ("lossless.webp", {"lossless": True}), ("cut.pcx", {}), ("cut.tga", {}),
                          ("runs.tga", {"compression": "tga_rle"})):
        whole.save(folder / name, **options)
    # TIFF that starts with its directory, as written by scanners
    strips_ = b"".join(whole.crop((0, y, 200, y + 8)).tobytes() for y in range(0, 160, 8))
    entries = [(256, 4, 1, 200), (257, 4, 1, 160), (258, 3, 1, 8), (259, 3, 1, 1), (262, 3, 1, 2),
               (273, 4, 20, 300), (277, 3, 1, 3), (278, 4, 1, 8), (279, 4, 20, 400)]
    head = b"II*\0\x08\0\0\0" + len(entries).to_bytes(2, "little")
    for tag, kind, count, value in entries:
        head += struct.pack("<HHII", tag, kind, count, value)
    head = (head + b"\0" * 4).ljust(300, b"\0") + b"".join((500 + 4800 * i).to_bytes(4, "little")
                                                           for i in range(20))
    sizes = (4800).to_bytes(4, "little") * 20
    (folder / "cut.tif").write_bytes(head.ljust(400, b"\0") + sizes + b"\0" * 20 + strips_)
    names = ["cut.jpg", "steps.jpg", "cut.png", "cut.gif", "cut.bmp", "cut.webp", "lossless.webp",
             "cut.pcx", "cut.tga", "runs.tga", "cut.tif"]
    for name in names:
        path = folder / name
        made = folder / "salvaged.png"
        run("convert", path, "-o", made, "--overwrite", "replace")
        good = Image.open(made).convert("RGB")
        data = path.read_bytes()
        path.write_bytes(data[:len(data) * 6 // 10])
        made.unlink()
        result = run("convert", path, "-o", made, "--overwrite", "replace")
        check(result.returncode == 1 and not made.exists()
              and "Use --salvage to convert what is there." in result.stderr,
              f"{name} fails: {result.returncode} {result.stderr}")
        result = run("convert", path, "-o", made, "--overwrite", "replace", "--salvage")
        check(result.returncode == 0
              and "The file is incomplete; what is missing is blank." in result.stderr,
              f"{name} is salvaged: {result.returncode} {result.stderr}")
        if made.exists():
            part = Image.open(made).convert("RGB")
            rows = (160 - 40, 160) if name in ("cut.bmp", "cut.tga",
                                               "runs.tga") else (0, 8) if path.suffix == ".webp" else (0, 40)
            box = (0, rows[0], 200, rows[1])
            most = 40 if name == "steps.jpg" else 8
            check(part.size == good.size and difference(part.crop(box), good.crop(box)) <= most,
                  f"the rows of {name} that are there")
        result = run("verify", path)
        check(result.returncode == 1, f"verify calls {name} damaged")
        drawn = folder / "drawn.png"
        result = run("thumbs", "draw", path, "--side", "96", "--out", drawn, "--overwrite",
                     "replace")
        check(result.returncode == 0 and "only a part is shown" in result.stderr,
              f"{name} is drawn small: {result.stderr}")
        result = run("thumbs", "make", "--force", path)
        check(result.returncode == 0 and "only a part is shown" in result.stderr,
              f"{name} gets a thumbnail: {result.stderr}")
        # no pixels: nothing to salvage
        path.write_bytes(data[:len(data) // 100 if name != "cut.tif" else 300])
        result = run("convert", path, "-o", made, "--overwrite", "replace", "--salvage")
        check(result.returncode in (0, 1) and not result.stderr.startswith("Traceback"),
              f"{name} without pixels: {result.returncode}")
        check("Use --salvage" not in result.stderr,
              f"{name}: what was tried is not proposed: {result.stderr}")


def codecs(folder):
    import io
    # gray pixels in old-style JPEG in TIFF
    gray = scene().convert("L")
    stream = io.BytesIO()
    gray.save(stream, "JPEG", quality=90)
    data = stream.getvalue()
    for strips in (True, False):
        entries = [(256, 4, 1, 64), (257, 4, 1, 48), (258, 3, 1, 8), (259, 3, 1, 6), (262, 3, 1, 1),
                   (277, 3, 1, 1), (278, 4, 1, 48), (513, 4, 1, 200), (514, 4, 1, len(data))]
        entries = sorted(entries + ([(273, 4, 1, 200), (279, 4, 1, len(data))] if strips else []))
        head = b"II*\0" + struct.pack("<IH", 8, len(entries))
        head += b"".join(struct.pack("<HHII", *entry) for entry in entries)
        (folder / "old.tif").write_bytes((head + b"\0" * 4).ljust(200, b"\0") + data)
        result = run("convert", folder / "old.tif", "-o", folder / "old.png", "--overwrite",
                     "replace")
        check(result.returncode == 0 and difference(Image.open(folder / "old.png"),
                                                    Image.open(stream)) <= 1,
                                                    f"gray old-style JPEG: {result.stderr}")
    lab, srgb = ImageCms.createProfile("LAB"), ImageCms.createProfile("sRGB")
    colors = ImageCms.applyTransform(scene(), ImageCms.buildTransform(srgb, lab, "RGB", "LAB"))
    colors.save(folder / "lab.tif")
    run("convert", folder / "lab.tif", "-o", folder / "lab.png")
    back = ImageCms.applyTransform(colors, ImageCms.buildTransform(lab, srgb, "LAB", "RGB"))
    check(difference(Image.open(folder / "lab.png"), back) <= 2,
          f"CIELab: {difference(Image.open(folder / 'lab.png'), back)}")
    for opacity, told in ((0, False), (90, True), (255, True)):
        Image.merge("RGBA", (*scene().split(),
                             Image.new("L", (64, 48), opacity))).save(folder / "clear.tga")
        made = folder / "clear.png"
        run("convert", folder / "clear.tga", "-o", made, "--overwrite", "replace")
        said = json.loads(run("info", "--json", folder / "clear.tga").stdout)[0]["alpha"]
        check(bool(said) == told and (Image.open(made).mode == "RGBA") == told,
              f"alpha of a TGA with opacity {opacity}: {said}")


def frames_of(path):
    """Composed frames with their delays, and the number of loops."""
    with Image.open(path) as picture:
        frames = []
        for i in range(getattr(picture, "n_frames", 1)):
            picture.seek(i)
            picture.load()
            frames.append((picture.convert("RGBA"), picture.info.get("duration", 0)))
        return frames, picture.info.get("loop")


def far(a, b):
    """The mean difference of opaque pixels; transparent ones must agree."""
    total, count = 0, 0
    for p, q in zip(a.getdata(), b.getdata()):
        if (p[3] < 128) != (q[3] < 128):
            return 999
        if p[3] >= 128:
            total += sum(abs(x - y) for x, y in zip(p[:3], q[:3]))
            count += 3
    return total / max(count, 1)


def animations(folder):
    from PIL import ImageDraw
    def drawn(i, clear):
        picture = Image.new("RGBA", (60, 40), (0, 0, 0, 0) if clear else (20, 90, 160, 255))
        ImageDraw.Draw(picture).rectangle((5 * i, 3 * i, 5 * i + 20, 3 * i + 15),
                                          fill=(250 - 30 * i, 40 * i, 60, 255))
        return picture
    delays = [100, 70, 200, 40]
    for clear in (False, True):
        frames = [drawn(i, clear) for i in range(4)]
        for loop in (0, 3):
            frames[0].save(folder / "source.gif", save_all=True, append_images=frames[1:],
                           duration=delays, loop=loop, disposal=2 if clear else 1)
            frames[0].save(folder / "source.webp", save_all=True, append_images=frames[1:],
                           duration=delays, loop=loop, lossless=True)
            frames[0].save(folder / "source.png", save_all=True, append_images=frames[1:],
                           duration=delays, loop=loop)
            for source in ("gif", "webp", "png"):
                path = folder / f"source.{source}"
                before = [frame for frame, _ in frames_of(path)[0]]
                for to in ("gif", "webp", "png"):
                    made = folder / f"made.{to}"
                    result = run("--set", "WebPLossless=1", "convert", path, "-o", made,
                                 "--overwrite", "replace")
                    what = f"{source} to {to}, {'clear' if clear else 'opaque'}, loop {loop}"
                    check(result.returncode == 0 and "Left out" not in result.stderr,
                          f"{what}: {result.returncode} {result.stderr}")
                    after, plays = frames_of(made)
                    check(len(after) == 4, f"{what}: {len(after)} frames")
                    check([d for _, d in after] == delays,
                          f"{what}: delays {[d for _, d in after]}")
                    once = 0 if source == "gif" else 1
                    loops = loop if to != "gif" or loop == 0 else loop - once
                    played = 0 if plays == 0 else plays
                    check(played in (loops, loop, loop + 1, loop - 1), f"{what}: played {plays}")
                    # Versions of Pillow write other colors, or read GIF frames that are cleared
                    # differently: our frames equal what was drawn or what Pillow reads.
                    worst = min(max(far(a, b) for (a, _), b in zip(after, wanted))
                                for wanted in (frames, before))
                    check(worst == 0, f"{what}: frames differ by {worst}")
    # round trips keep the number of loops
    for loop in (0, 2, 5):
        frames[0].save(folder / "source.gif", save_all=True, append_images=frames[1:],
                       duration=delays, loop=loop)
        run("convert", folder / "source.gif", "-o", folder / "way.webp", "--overwrite", "replace")
        run("convert", folder / "way.webp", "-o", folder / "way.png", "--overwrite", "replace")
        run("convert", folder / "way.png", "-o", folder / "back.gif", "--overwrite", "replace")
        check(frames_of(folder / "back.gif")[1] == loop,
              f"loop {loop} becomes {frames_of(folder / 'back.gif')[1]}")
    # steps apply to each frame; many colors need --reduce
    busy = [Image.effect_noise((60, 40), 90 + i).convert("RGB") for i in range(3)]
    busy = [Image.merge("RGB", (b.split()[0], b.transpose(Image.Transpose.ROTATE_180).split()[0],
                                b.transpose(Image.Transpose.FLIP_LEFT_RIGHT).split()[0]))
                                for b in busy]
    busy[0].save(folder / "busy.webp", save_all=True, append_images=busy[1:], duration=50,
                 lossless=True)
    result = run("convert", folder / "busy.webp", "-o", folder / "busy.gif")
    check(result.returncode == 1 and "Too many colors." in result.stderr
          and not (folder / "busy.gif").exists(), f"many colors: {result.stderr}")
    result = run("convert", folder / "busy.webp", "-o", folder / "busy.gif", "--reduce")
    check(result.returncode == 0 and len(frames_of(folder / "busy.gif")[0]) == 3,
          f"reduced: {result.stderr}")
    result = run("apply", folder / "busy.webp", "-o", folder / "small.webp", "--do", "resize 30x20")
    small, _ = frames_of(folder / "small.webp")
    check(len(small) == 3 and small[0][0].size == (30, 20), f"frames are resized: {result.stderr}")
    # a single frame on request
    run("convert", folder / "source.webp", "-o", folder / "one.png", "--page", "3")
    one, _ = frames_of(folder / "one.png")
    check(len(one) == 1 and far(one[0][0], drawn(2, True)) == 0, "a frame that was asked for")
    run("convert", folder / "source.png", "-o", folder / "two.bmp", "--page", "2")
    check((folder / "two.bmp").exists(), "a frame of an animated PNG")
    # files truncated within the last frame, or before one in the header's count
    for source, cut in (("gif", 20), ("png", 60), ("png", 12)):
        path, made = folder / f"cut.{source}", folder / "cut_made.webp"
        data = (folder / f"source.{source}").read_bytes()
        if cut == 12:
            cut = len(data) - data.rindex(b"fcTL") + 4
        path.write_bytes(data[:-cut])
        result = run("convert", path, "-o", made, "--overwrite", "replace")
        check(result.returncode == 1 and not made.exists() and "Use --salvage" in result.stderr,
              f"{path.name} without {cut} bytes: {result.stderr}")
        check(run("verify", path).returncode == 1, f"verify {path.name} without {cut} bytes")
        result = run("convert", path, "-o", made, "--salvage")
        check(result.returncode == 0 and "The file is incomplete" in result.stderr
              and len(frames_of(made)[0]) == 3,
              f"salvaged {path.name} without {cut} bytes: {result.stderr}")
        made.unlink(missing_ok=True)
    result = run("convert", folder / "source.gif", "-o", folder / "never.gif", "--dry-run")
    check(result.returncode == 0 and result.stderr == "One file was processed.\n",
          f"a dry run leaves no frames out: {result.stderr}")
    frames[0].convert("RGB").save(folder / "junk.jpg", icc_profile=b"no profile" * 20)
    result = run("convert", folder / "junk.jpg", "-o", folder / "junk.bmp", "-v")
    check("does not match the picture and was left out." in result.stderr
          and "converted" not in result.stderr, f"a profile that is none: {result.stderr}")
    for name in ("on.jpg", "on.png", "on.webp", "on.tif"):
        scene(60, 40).save(folder / name, exif=exif(6))
        for adjust in (0, 1):
            made = folder / f"up{adjust}{name}"
            run("--set", f"ExifAdjustOrientation={adjust}", "convert", folder / name, "-o", made,
                "--auto-orient", "--metadata", "strip")
            check(Image.open(made).size == (40, 60),
                  f"{name} stripped and upright: {Image.open(made).size}")
    scene().convert("CMYK").save(folder / "inks.jpg")
    result = run("convert", folder / "inks.jpg", "-o", folder / "inks.png")
    check("Left out: inks or extra channels." in result.stderr, f"inks of a JPEG: {result.stderr}")
    frames[0].save(folder / "said.gif", save_all=True, append_images=frames[1:], comment=b"hello")
    run("convert", folder / "said.gif", "-o", folder / "again.gif")
    check(Image.open(folder / "again.gif").info.get("comment") == b"hello", "a GIF's comment")
    result = run("convert", folder / "said.gif", "-o", folder / "said.webp")
    check("Left out: comment." in result.stderr, f"a GIF's comment is left out: {result.stderr}")


def pages(folder):
    sheets = [scene(40 + 10 * i, 30).rotate(90 * i, expand=True) for i in range(11)]
    sheets[0].save(folder / "doc.tif", save_all=True, append_images=sheets[1:])
    icon = scene(64, 64).convert("RGBA")
    icon.save(folder / "app.ico", sizes=[(16, 16), (32, 32), (64, 64)])
    for to, count in (("tif", 11), ("dcx", 11)):
        result = run("convert", folder / "doc.tif", "-o", folder / f"all.{to}", "--page", "all")
        with Image.open(folder / f"all.{to}") as made:
            check(result.returncode == 0 and made.n_frames == count,
                  f"all pages in one {to}: {result.stderr}")
        for i in range(count):
            with Image.open(folder / f"all.{to}") as made:  # newer Pillow keeps the first size
                made.seek(i)
                check(difference(made, sheets[i]) == 0, f"page {i + 1} of {to}")
    result = run("convert", folder / "doc.tif", "-t", "png", "--page", "all", "-d", folder / "out")
    check("Left out" not in result.stderr, f"nothing is left out: {result.stderr}")
    names = sorted(p.name for p in (folder / "out").iterdir())
    check(names == [f"doc-{i:02}.png" for i in range(1, 12)], f"numbered pages: {names}")
    for i, name in enumerate(names):
        check(difference(Image.open(folder / "out" / name), sheets[i]) == 0, f"{name} is its page")
    result = run("convert", folder / "doc.tif", "-t", "png", "--page", "all", "-d", folder / "out")
    check((folder / "out" / "doc-03 [1].png").exists()
          and len(list((folder / "out").iterdir())) == 22, "numbered names are kept apart")
    (folder / "out2" / "doc.png").touch()
    for _ in range(2):
        run("convert", folder / "doc.tif", "-t", "png", "--page", "all", "-d", folder / "out2",
            "--overwrite", "skip")
        check(len(list((folder / "out2").iterdir())) == 12, "numbered names decide what is skipped")
    result = run("convert", folder / "doc.tif", "-t", "png", "--page", "all", "-o", "-")
    check(result.returncode == 1 and result.stdout == ""
          and "choose one with --page" in result.stderr, f"pages into a stream: {result.stderr}")
    result = run("convert", folder / "doc.tif", "-t", "png", "-o", folder / "out")
    check(result.returncode == 2 and "is a folder; end its name with /" in result.stderr,
          f"a folder as --out: {result.stderr}")
    run("convert", folder / "app.ico", "-o", folder / "again.ico", "--page", "all")
    with Image.open(folder / "again.ico") as made:
        check(made.info["sizes"] == {(16, 16), (32, 32), (64, 64)},
              f"all icons: {made.info.get('sizes')}")
    same = [scene(), scene().transpose(Image.Transpose.FLIP_LEFT_RIGHT)]
    same[0].save(folder / "same.tif", save_all=True, append_images=same[1:])
    result = run("convert", folder / "same.tif", "-o", folder / "same.gif", "--page", "all",
                 "--reduce")
    check(len(frames_of(folder / "same.gif")[0]) == 2, f"pages in a GIF: {result.stderr}")
    for key, source, to, count in (("MultipleImageGIF", "same.tif", "gif", 2),
                                   ("IconCompleteStack", "app.ico", "ico", 3)):
        for value in (0, 1):
            run("convert", folder / source, "--set", f"{key}={value}", "-o",
                folder / f"{key}{value}.{to}", "--reduce")
            with Image.open(folder / f"{key}{value}.{to}") as made:
                held = len(made.info["sizes"]) if to == "ico" else made.n_frames
                check(held == (count if value else 1), f"{key}={value}: {held}")
    result = run("convert", folder / "doc.tif", "-o", folder / "odd.webp", "--page", "all")
    check(result.returncode == 1
          and "The frames have different sizes; choose one with --page." in result.stderr
          and not (folder / "odd.webp").exists(), f"different sizes: {result.stderr}")
    for wrong in ("0", "none", "-1"):
        result = run("convert", folder / "doc.tif", "-o", folder / "x.png", f"--page={wrong}")
        check(result.returncode == 2
              and "is neither all nor a whole number of at least 1." in result.stderr,
              f"--page {wrong}: {result.stderr}")


with tempfile.TemporaryDirectory() as name:
    for part in (orientations, profiles, strips, qualities, left_out, salvages, codecs, animations,
                 pages):
        folder = Path(name) / part.__name__
        (folder / "out").mkdir(parents=True)
        (folder / "out2").mkdir()
        part(folder)
sys.exit(1 if failures else 0)
