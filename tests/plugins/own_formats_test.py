#!/usr/bin/env python3
"""Textures, icons and pictures with a high dynamic range, judged by Pillow, netpbm, ImageMagick and
ffmpeg; damaged ones fail and leave nothing behind."""
import json
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
    print("skipped: Pillow is not installed")
    sys.exit(77)
PROJECT = Path(__file__).resolve().parents[2]
FOTOMILL = os.environ["FOTOMILL"]
EXTENSIONS = {row["extension"] for row in json.loads(
    subprocess.run([FOTOMILL, "plugins", "--json"], stdout=subprocess.PIPE, check=True).stdout)}
MUTATIONS = int(  # damaged files of each format
    os.environ.get("FOTOMILL_MUTATIONS", "40"))
faults = []
checked = 0


def check(what, good):
    global checked
    checked += 1
    if not good:
        faults.append(str(what))


def run(*command):
    return subprocess.run([str(part) for part in command], stdout=subprocess.PIPE,
                          stderr=subprocess.PIPE, check=False)


def convert(source, to, *options):
    """Converts a file with our program; the path of the result."""
    out = source.with_name(source.name + "." + to)
    result = run(FOTOMILL, "-q", *options, "convert", source, "--to", to, "--out", out)
    check(f"{source.name} to {to}: {result.stderr.decode()}", result.returncode == 0)
    return out


def rgba(path):
    return Image.open(path).convert("RGBA") if path.exists() else Image.new("RGBA", (1, 1))


def alike(what, one, other, most=0):
    """Whether no sample of two pictures differs by more than `most`."""
    same = one.size == other.size and all(
        abs(a - b) <= most for a, b in zip(one.convert("RGBA").tobytes(),
                                           other.convert("RGBA").tobytes()))
    check(f"{what}: another picture", same)


def sources(folder):
    """Samples in color, with alpha and in gray, as PNG."""
    for name in ("bmp-true-color", "bmp-alpha", "bmp-mono"):
        copy = folder / (name + ".bmp")
        shutil.copy(PROJECT / "samples" / copy.name, copy)
        yield copy, rgba(convert(copy, "png"))


# ---- DDS ----

def dds(width, height, data, code=bytes(4), number=None, copies=1, masks=None, surfaces=1):
    pixels = struct.pack("<II4s5I", 32, 4, code, 0, 0, 0, 0, 0)
    if masks:
        pixels = struct.pack("<8I", *masks)
    head = b"DDS " + struct.pack("<7I", 124, 0x1007, height, width, 0, 0, copies) + bytes(44)
    head += pixels + struct.pack("<5I", 0x1000, 0, 0, 0, 0)
    if number is not None:
        head += struct.pack("<5I", number, 3, 0, surfaces, 0)
    return head + data


def bc7_blocks(mode, count, chance):
    """Blocks of one mode, with any other bits."""
    for _ in range(count):
        bits = chance.getrandbits(128) >> (mode + 1) << (mode + 1) | 1 << mode
        yield bits.to_bytes(16, "little")


def test_dds(folder):
    chance = random.Random(1)
    files = {code: dds(62, 50, chance.randbytes(16 * 13 * size), code.encode())
             for code, size in [("DXT1", 8), ("DXT3", 16), ("DXT5", 16), ("ATI1", 8), ("ATI2", 16)]}
    for mode in range(8):
        blocks = b"".join(bc7_blocks(mode, 16 * 16, chance))
        files[f"BC7-{mode}"] = dds(64, 64, blocks, b"DX10", 98)
    files["rgba"] = dds(7, 5, chance.randbytes(140), masks=(
        32, 0x41, 0, 32, 0xff, 0xff00, 0xff0000, 0xff000000))
    for name, contents in files.items():
        path = folder / (name + ".dds")
        path.write_bytes(contents)
        alike(name, rgba(convert(path, "png")), rgba(path))
    for source, expected in sources(folder):
        alike(source.name, rgba(convert(source, "dds")), expected)


def test_dds_values(folder):
    """Forms that Pillow does not read, by their definitions."""
    eight = bytes((0x88, 0xc6, 0xfa)) * 2  # the values 0 to 7, twice
    signed = [0, 255, 51, 102, 153, 204, 0, 255] * 2
    cases = [
        ("565", dds(2, 1, struct.pack("<2H", 0xf800, 0x0410), b"DX10", 85),
         [(255, 0, 0, 255), (0, 130, 132, 255)]),
        ("luminance", dds(2, 1, b"\x07\xfe", masks=(32, 0x20000, 0, 8, 0xff, 0, 0, 0)),
         [(7, 7, 7, 255), (254, 254, 254, 255)]),
        ("alpha", dds(2, 1, b"\x07\xff", b"DX10", 65), [(0, 0, 0, 7), (0, 0, 0, 255)]),
        ("signed", dds(4, 4, b"\x81\x7f" + eight, b"BC4S"), [(v, v, v, 255) for v in signed]),
        ("signed two", dds(4, 4, b"\x81\x7f" + eight + b"\x81\x7f" + eight, b"DX10", 84),
         [(v, v, 0, 255) for v in signed]),
        ("no mode", dds(1, 1, bytes(16), b"DX10", 98), [(0, 0, 0, 0)]),
        ("two pages", dds(1, 1, bytes(4) + b"\1\2\3\xff", b"DX10", 28, surfaces=2),
         [(0, 0, 0, 0)]),
    ]
    for name, contents, expected in cases:
        path = folder / (name + ".dds")
        path.write_bytes(contents)
        seen = list(rgba(convert(path, "png")).getdata())
        check(f"{name}: {seen}", seen == expected)
    second = folder / "second.png"
    many = folder / "many.dds"
    many.write_bytes(dds(1, 1, bytes(4), b"DX10", 28, surfaces=0xffffffff))
    pages = json.loads(run(FOTOMILL, "info", "--json", many).stdout)[0]["pages"]
    check(f"surfaces that are not there: {pages}", 1 < pages < 99)
    run(FOTOMILL, "-q", "convert", folder / "two pages.dds", "--page", "2", "--to", "png", "--out",
        second)
    check("the second page", list(rgba(second).getdata()) == [(1, 2, 3, 255)])


def test_thumbnails(folder):
    """Smaller copies serve for thumbnails: they are green here, the picture itself is red."""
    mips = b"\0\0\xff" * 256 * 256 + b"\0\xff\0" * (128 * 128 + 64 * 64)
    (folder / "a.dds").write_bytes(dds(256, 256, mips, copies=3, masks=(
        32, 0x40, 0, 24, 0xff0000, 0xff00, 0xff, 0)))
    red, green = Image.new("RGBA", (512, 512), "red"), Image.new("RGBA", (256, 256), (0, 255, 0))
    red.save(folder / "a.icns", append_images=[green, green.resize((128, 128))])
    for path in (folder / "a.dds", folder / "a.icns"):
        if path.suffix[1:] in EXTENSIONS:
            small = folder / (path.name + ".png")
            run(FOTOMILL, "-q", "thumbs", "draw", path, "--side", "64", "--out", small)
            check(f"{path.name}: {rgba(small).getpixel((9, 9))}",
                  rgba(small).getpixel((9, 9)) == (0, 255, 0, 255))


# ---- ICNS ----

def icns(*entries):
    body = b"".join(kind + struct.pack(">I", len(data) + 8) + data for kind, data in entries)
    return b"icns" + struct.pack(">I", len(body) + 8) + body


def packed(samples):
    """Components packed as runs of 3 to 130 and bytes as they are."""
    out, place = b"", 0
    while place < len(samples):
        run_length = 1
        while run_length < 130 and samples[place:place + 1] == samples[
                place + run_length:place + run_length + 1]:
            run_length += 1
        if run_length > 2:
            out += bytes((run_length + 125,)) + samples[place:place + 1]
        else:
            run_length = 1
            out += b"\0" + samples[place:place + 1]
        place += run_length
    return out


def test_icns(folder):
    color = rgba(convert(next(sources(folder))[0], "png"))
    color.resize((256, 256)).save(folder / "png.icns")
    alike("png.icns", rgba(convert(folder / "png.icns", "png")), rgba(folder / "png.icns"))
    for kind, mask, side, skipped in [(b"is32", b"s8mk", 16, b""), (b"il32", b"l8mk", 32, b""),
                                      (b"ih32", b"h8mk", 48, b""),
                                      (b"it32", b"t8mk", 128, bytes(4)),
                                      (b"ic05", b"", 32, b"ARGB")]:
        picture = color.resize((side, side))
        picture.putalpha(Image.linear_gradient("L").resize((side, side)))
        red, green, blue, alpha = (packed(band.tobytes()) for band in picture.split())
        colors = skipped + (b"" if mask else alpha) + red + green + blue
        masks = [(mask, picture.getchannel("A").tobytes())] if mask else []
        path = folder / f"{side}{len(mask)}.icns"
        path.write_bytes(icns((b"TOC ", bytes(8)), (kind, colors), *masks))
        alike(path.name, rgba(convert(path, "png")), picture)
    plain = color.resize((16, 16)).convert("RGB")
    (folder / "plain.icns").write_bytes(icns((b"is32", plain.tobytes())))
    alike("not packed", rgba(convert(folder / "plain.icns", "png")), plain)
    only = folder / "jp2.icns"
    only.write_bytes(icns((b"ic08", b"\0\0\0\x0cjP  \r\n\x87\n" + bytes(40))))
    message = run(FOTOMILL, "info", only).stderr.decode()
    check(f"only JPEG 2000: {message}", "Unsupported format." in message)


# ---- HDR ----

def test_hdr(folder):
    """One picture of 8 x 2 pixels in all three ways of storing and all orders of the axes."""
    chance = random.Random(2)
    rows = [[bytes((chance.randrange(128, 256), 40, 7, 128))] * 5 +
            [bytes((9, 200, chance.randrange(256), 127 + i)) for i in range(3)] for _ in range(2)]
    flat = b"".join(b"".join(row) for row in rows)
    runs = b"".join(row[0] + b"\1\1\1\4" + b"".join(row[5:]) for row in rows)
    columns = b"".join(rows[y][x] for x in range(8) for y in range(2))
    new = b""
    for row in rows:
        new += b"\2\2\0\x08"
        for part in range(4):
            single, *rest = (pixel[part] for pixel in row[5:])
            new += bytes((133, row[0][part], 129, single, 2, *rest))
    files = {"flat": ("-Y 2 +X 8", flat), "runs": ("-Y 2 +X 8", runs), "new": ("-Y 2 +X 8", new),
             "columns": ("+X 8 -Y 2", columns)}
    for name, (axes, pixels) in files.items():
        path = folder / (name + ".hdr")
        head = f"#?RGBE\n# a comment\nFORMAT=32-bit_rle_rgbe\n\n{axes}\n"
        path.write_bytes(head.encode() + pixels)
    known = rgba(convert(folder / "flat.hdr", "png"))
    value = rows[0][0][0] / 256
    top = round(255 * (1.055 * value**(1 / 2.4) - 0.055))
    check(f"light: {known.getpixel((0, 0))}", known.getpixel((0, 0))[0] == top)
    for name in files:
        alike(name, rgba(convert(folder / (name + ".hdr"), "png")), known)
    turned = known.transpose(Image.Transpose.ROTATE_180)
    (folder / "turned.hdr").write_bytes(b"#?RADIANCE\n\n+Y 2 -X 8\n" + flat)
    alike("turned", rgba(convert(folder / "turned.hdr", "png")), turned)
    data = folder / "data"
    data.mkdir()
    (data / "Fotomill Professional 11.ini").write_text("[Plugins]\nFMWPL_hdr.so.Exposure=-1\n")
    shutil.copy(folder / "flat.hdr", folder / "dark.hdr")
    darker = rgba(convert(folder / "dark.hdr", "png", "--data", data)).getpixel((0, 0))
    options = next(row["options"] for row in json.loads(
        run(FOTOMILL, "--data", data, "plugins", "--json").stdout) if row["extension"] == "hdr")
    check(f"listed: {options}", options[0]["value"] == -1)
    half = round(255 * (1.055 * (value / 2)**(1 / 2.4) - 0.055))
    check(f"exposure: {darker}", darker[0] == half)
    for source, expected in sources(folder):
        written = convert(source, "hdr")
        if source.name == "bmp-alpha.bmp":
            continue
        if source.name == "bmp-true-color.bmp":  # 150 x 112 pixels
            check("runs are packed", written.stat().st_size < 2 * 150 * 112)
        alike(source.name, rgba(convert(written, "png")), expected, 2)
        if shutil.which("convert"):
            run("convert", written, "-colorspace", "sRGB", "-depth", "8", folder / "peer.ppm")
            alike(f"{source.name}: peer", rgba(folder / "peer.ppm"), rgba(Path(f"{written}.png")),
                  1)


# ---- EXR ----

def exr(names, samples, shown=(0, 0, 0, 0)):
    """A picture of one pixel of floats at the origin."""
    channels = b"".join(name.encode() + struct.pack("<xi4xii", 2, 1, 1) for name in names) + b"\0"
    attributes = [("channels", "chlist", channels), ("compression", "compression", b"\0"),
                  ("dataWindow", "box2i", bytes(16)),
                  ("displayWindow", "box2i", struct.pack("<4i", *shown)),
                  ("lineOrder", "lineOrder", b"\0"),
                  ("pixelAspectRatio", "float", struct.pack("<f", 1)),
                  ("screenWindowCenter", "v2f", bytes(8)),
                  ("screenWindowWidth", "float", struct.pack("<f", 1))]
    head = struct.pack("<ii", 20000630, 2) + b"".join(
        f"{name}\0{kind}\0".encode() + struct.pack("<i", len(value)) + value
        for name, kind, value in attributes) + b"\0"
    data = struct.pack(f"<{len(samples)}f", *samples)
    return head + struct.pack("<Qii", len(head) + 8, 0, len(data)) + data


def test_exr_windows(folder):
    least, most = -2**31, 2**31 - 1
    cases = [
        ("one", exr("BGR", (1, 0, 1)), [(255, 0, 255, 255)]),
        ("shown elsewhere", exr("BGR", (1, 1, 1), (5, 5, 6, 5)), [(0, 0, 0, 255)] * 2),
        ("left of it", exr("BGR", (1, 0, 1), (-1, 0, 0, 0)), [(0, 0, 0, 255), (255, 0, 255, 255)]),
        ("upside down", exr("BGR", (1, 1, 1), (1, 1, 0, 0)), "Damaged file."),
        ("huge", exr("BGR", (1, 1, 1), (least, least, most, most)), "Damaged file."),
        ("named layer", exr(["a.B", "a.G", "a.R"], (1, 1, 1)), "Unsupported format."),
        ("depths", exr("Z", (1,)), "Unsupported format."),
    ]
    for name, contents, expected in cases:
        path = folder / (name + ".exr")
        path.write_bytes(contents)
        if isinstance(expected, str):
            message = run(FOTOMILL, "convert", path, "--to", "png").stderr.decode()
            check(f"{name}: {message}", expected in message)
        else:
            seen = list(rgba(convert(path, "png")).getdata())
            check(f"{name}: {seen}", seen == expected)


def test_exr(folder):
    if not shutil.which("ffmpeg"):
        return
    table = [v / 255 for v in range(256)]
    curve = [round(255 * (12.92 * v if v <= 0.0031308 else 1.055 * v**(1 / 2.4) - 0.055))
             for v in table]
    png = convert(next(sources(folder))[0], "png")
    for compression in ("none", "rle", "zip1", "zip16"):
        for kind in ("half", "float"):
            path = folder / f"{compression}-{kind}.exr"
            run("ffmpeg", "-v", "error", "-y", "-i", png, "-compression", compression, "-format",
                kind, path)
            alike(path.name, rgba(convert(path, "png")),
                  rgba(png).convert("RGB").point(curve * 3), 1)


# ---- PAM ----

def test_pam(folder):
    for source, expected in sources(folder):
        written = convert(source, "pam")
        (folder / "peer.png").write_bytes(run("pamtopng", written).stdout)
        alike(source.name, rgba(folder / "peer.png"), expected)
        deep = folder / (source.name + ".deep.pam")
        deep.write_bytes(run("pamdepth", "65535", written).stdout)
        alike(deep.name, rgba(convert(deep, "png")), expected)
    check("the depth is lost", b"bits" in run(FOTOMILL, "convert", deep, "--to", "png", "--out",
                                              folder / "lost.png").stderr)


# ---- damaged files ----

def samples(folder):
    """A small file of each format."""
    source = next(sources(folder))[0]
    rgba(convert(source, "png")).resize((64, 48)).save(folder / "small.png")
    for extension in ("dds", "hdr", "pam"):
        yield convert(folder / "small.png", extension)
    rgba(folder / "small.png").resize((64, 64)).save(folder / "small.icns")
    yield folder / "small.icns"
    (folder / "bc7.dds").write_bytes(dds(16, 16, b"".join(bc7_blocks(3, 16, random.Random(3))),
                                         b"DX10", 98))
    yield folder / "bc7.dds"
    (folder / "packed.icns").write_bytes(icns((b"is32", b"\xff\1\xfb\1" * 3),
                                              (b"s8mk", bytes(256))))
    yield folder / "packed.icns"
    if shutil.which("ffmpeg"):
        run("ffmpeg", "-v", "error", "-y", "-i", folder / "small.png", folder / "small.exr")
        yield folder / "small.exr"


def mutated(contents, chance):
    """A file with a few changed bytes, most near its start, or cut off."""
    changed = bytearray(contents)
    for _ in range(chance.choice((1, 2, 4, 16))):
        place = chance.randrange(min(len(changed), chance.choice((32, 160, len(changed)))))
        changed[place] = chance.choice((0, 1, 0x7f, 0x80, 0xff, chance.randrange(256)))
    return bytes(changed[:chance.randrange(len(changed))] if chance.random() < 0.2 else changed)


def test_damaged(folder):
    chance = random.Random(4)
    temporary = folder / "temporary"
    temporary.mkdir()
    for sample in list(samples(folder)):
        if sample.suffix[1:] not in EXTENSIONS:
            continue
        hostile = folder / (sample.name + ".files")
        hostile.mkdir()
        for i in range(MUTATIONS):
            (hostile / f"{i}{sample.suffix}").write_bytes(mutated(sample.read_bytes(), chance))
        half = sample.read_bytes()[:sample.stat().st_size // 2]
        (hostile / f"half{sample.suffix}").write_bytes(half)
        result = subprocess.run([FOTOMILL, "verify", hostile], stdout=subprocess.PIPE,
                                stderr=subprocess.PIPE, check=False, timeout=600,
                                env={**os.environ, "TMPDIR": str(temporary), "LC_ALL": "C"})
        check(f"{sample.name}: {result.returncode}", result.returncode == 1)
        if sample.suffix != ".icns":  # the first entries may be complete
            check(f"{sample.name}: half of it", f"half{sample.suffix}".encode() in result.stderr)
        check(f"{sample.name}: left {list(temporary.iterdir())}", not list(temporary.iterdir()))


for extension, test in [("dds", test_dds), ("dds", test_dds_values), ("dds", test_thumbnails),
                        ("icns", test_icns), ("hdr", test_hdr), ("exr", test_exr),
                        ("exr", test_exr_windows),
                        ("pam", test_pam), ("pam", test_damaged)]:
    if extension in EXTENSIONS:
        with tempfile.TemporaryDirectory() as place:
            test(Path(place))
print("\n".join(faults) if faults else f"the judges agree in {checked} cases")
sys.exit(1 if faults or checked == 0 else 0)
