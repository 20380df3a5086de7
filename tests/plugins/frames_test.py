#!/usr/bin/env python3
"""Animations written as AVIF and JPEG XL: the libraries' tools see the frames, delays and rounds of
the source, and nothing is left behind."""
import json
import os
import re
import shutil
import subprocess
import sys
import tempfile
from pathlib import Path

try:
    from PIL import Image, ImageDraw
except ImportError:
    print("skipped: Pillow is not installed")
    sys.exit(77)
FOTOMILL = os.environ["FOTOMILL"]
missing = [tool for tool in ("avifdec", "djxl") if not shutil.which(tool)]
extensions = {row["extension"] for row in json.loads(
    subprocess.run([FOTOMILL, "plugins", "--json"], stdout=subprocess.PIPE, check=True).stdout)}
if missing or not {"avif", "jxl"} <= extensions:
    print("skipped: not installed: " + " ".join(missing or ["the modules"]))
    sys.exit(77)
DELAYS = [40, 0, 120, 160, 200]
SEEN = [max(delay, 1) for delay in DELAYS]  # both formats need durations
SIZE = (90, 61)
faults = []


def check(what, found, expected):
    if found != expected:
        faults.append(f"{what}: expected {expected!r}, found {found!r}")


def run(*command):
    return subprocess.run([str(part) for part in command], capture_output=True, check=False)


def frames(path):
    """Every frame of a file as red, green, blue, alpha."""
    picture = Image.open(path)
    for i in range(picture.n_frames):
        picture.seek(i)
        yield picture.convert("RGBA").tobytes()


def make_source(path, background):
    pictures = []
    for i in range(len(DELAYS)):
        picture = Image.new("RGBA", SIZE, background)
        ImageDraw.Draw(picture).rectangle([10 * i, 5, 10 * i + 30, 40], (200, 30 * i, 90, 255))
        pictures.append(picture)
    pictures[0].save(path, save_all=True, append_images=pictures[1:], duration=DELAYS, loop=3)


def test_jxl(source, folder, options):
    """Without loss, the frames are those of the source, pixel for pixel."""
    written, back = folder / "a.jxl", folder / "a.apng"
    result = run(FOTOMILL, "-q", *options, "convert", source, "--to", "jxl", "--out", written)
    check(f"jxl: {result.stderr}", result.returncode, 0)
    run("djxl", written, back)
    check("jxl: frames", list(frames(back)) == list(frames(source)), True)
    own = folder / "own.png"
    run(FOTOMILL, "-q", "convert", written, "--to", "png", "--out", own)
    check("jxl: our own frames", list(frames(own)) == list(frames(source)), True)
    check("jxl: rounds", Image.open(own).info["loop"], 3)
    delays = []
    again = Image.open(back)
    for i in range(again.n_frames):
        again.seek(i)
        delays.append(round(again.info["duration"]))
    check("jxl: delays", delays, SEEN)


def test_avif(source, folder, options):
    written = folder / "a.avif"
    result = run(FOTOMILL, "-q", *options, "convert", source, "--to", "avif", "--out", written,
                 "--quality", "100")
    check(f"avif: {result.stderr}", result.returncode, 0)
    report = run("avifdec", "--info", written).stdout.decode()
    check("avif: delays", re.findall(r"duration [\d.]+ \((\d+) timescales", report),
          [str(delay) for delay in SEEN])
    check("avif: size", f"{SIZE[0]}x{SIZE[1]}" in report, True)
    own = folder / "own-avif.png"
    run(FOTOMILL, "-q", "convert", written, "--to", "png", "--out", own)
    for i, (mine, theirs) in enumerate(zip(frames(own), frames(source), strict=True)):
        # the alpha, and the colors where it is not transparent, away from edges
        check(f"avif: alpha of frame {i}", mine[3::4] == theirs[3::4], True)
        inside = 4 * (20 * SIZE[0] + 10 * i + 15)
        check(f"avif: frame {i}", max(abs(mine[inside + c] - theirs[inside + c])
                                      for c in range(3)) < 8, True)


with tempfile.TemporaryDirectory() as place:
    folder = Path(place)
    for name in ("data", "temporary"):
        (folder / name).mkdir()
    os.environ["TMPDIR"] = str(folder / "temporary")
    (folder / "data/Fotomill Professional 11.ini").write_text(
        "[Plugins]\nFMWPL_jpegxl.so.Lossless=1\nFMWPL_avif.so.Subsampling=2\n")
    for kind, background in (("opaque", (9, 60, 30, 255)), ("clear", (0, 0, 0, 0))):
        make_source(folder / (kind + ".png"), background)
        for test in (test_jxl, test_avif):
            (folder / kind).mkdir(exist_ok=True)
            test(folder / (kind + ".png"), folder / kind, ["--data", folder / "data"])
    # several at a time, on several threads, also from one plug-in's format to another's
    (folder / "several").mkdir()
    sources = [folder / "opaque.png", folder / "clear.png"]
    for to in ("jxl", "avif", "png"):
        run(FOTOMILL, "-q", "--data", folder / "data", "convert", "--jobs", "2", *sources, "--to",
            to, "--dest", folder / "several")
        sources = [folder / "several" / f"{kind}.{to}" for kind in ("opaque", "clear")]
    check("several", [len(list(frames(path))) for path in sources if path.exists()],
          [len(DELAYS)] * 2)
    found = run(FOTOMILL, "find", folder / "several", "--format", "avif").stdout
    check("found by format", found.count(b".avif"), 2)
    # pages that are no frames get files of their own
    pages = [Image.new("RGB", (8 + i, 9), (i, 2, 3)) for i in range(2)]
    pages[0].save(folder / "pages.tif", save_all=True, append_images=pages[1:])
    (folder / "pages").mkdir()
    run(FOTOMILL, "-q", "convert", folder / "pages.tif", "--page", "all", "--to", "jxl", "--dest",
        folder / "pages")
    check("pages", len(list((folder / "pages").glob("*.jxl"))), 2)
    check("left behind", list((folder / "temporary").iterdir()), [])
print("\n".join(faults) if faults else "the tools see the same animations")
sys.exit(1 if faults else 0)
