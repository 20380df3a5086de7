#!/usr/bin/python3
"""apply: several outputs of one decode, files of a given size, and reduced-size decoding."""
import json
import os
import subprocess
import sys
import tempfile
from pathlib import Path

try:
    from PIL import Image, ImageChops, ImageStat
except ImportError:
    print("skipped: needs Pillow (python3-pil)")
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
faults = []


def photo(width, height):
    """Gradients with texture, like a photograph."""
    texture = Image.effect_noise((width // 4, height // 4), 40).resize((width, height),
                                                                       Image.Resampling.BICUBIC)
    slope = Image.linear_gradient("L").resize((width, height))
    return Image.merge("RGB", (slope, texture, ImageChops.add(slope, texture, 2)))


def apply(*arguments, status=0):
    run = subprocess.run([FOTOMILL, "apply", *map(str, arguments), "--json"], capture_output=True,
                         text=True, check=False)
    if run.returncode != status:
        faults.append(f"{arguments}: status {run.returncode}: {run.stderr}")
    return json.loads(run.stdout or "[]")


def expect(what, right):
    if not right:
        faults.append(what)


def outputs(work):
    recipe = work / "web.recipe"
    recipe.write_text("crop 800x600+0+0\n"
                      "output large\n  resize 400\n  save to=jpg quality=85\n"
                      "output small\n  resize 100x100 pad background=white\n  save to=webp max-bytes=2k dest=small\n"
                      "output named\n  gray\n  save to=png name=\"%F of %W\"\n")
    results = apply(work / "a.jpg", "--recipe", recipe, "--dest", work / "out")
    expect(f"outputs: {results}",
           [result.get("output") for result in results] == ["large", "small", "named"])
    places = [Path(result["destination"]).relative_to(work / "out") for result in results]
    expect(f"places: {places}",
           [str(place) for place in places] ==
           ["Cropped_ a-large.jpg", "small/Cropped_ a-small.webp", "a of 800.png"])
    sizes = [Image.open(work / "out" / place).size for place in places]
    expect(f"sizes: {sizes}", sizes == [(400, 300), (100, 100), (800, 600)])
    expect("max-bytes", 500 < (work / "out" / places[1]).stat().st_size <= 2048)
    expect("gray", Image.open(work / "out" / places[2]).getpixel((5, 5)) is not None)


def limits(work):
    results = apply(work / "a.jpg", "--do", "save max-bytes=200", "--dest", work / "tight",
                    status=1)
    expect(f"too tight: {results}", [result["status"] for result in results] == [13])
    expect("too tight: a file", not any((work / "tight").glob("*")))
    results = apply(work / "a.jpg", "--do", "save max-bytes=60k", "--dest", work / "fits")
    size = Path(results[0]["destination"]).stat().st_size
    expect(f"best quality that fits: {size}", 40 * 1024 < size <= 60 * 1024)


def reduced(work):
    """Reduced-size decoding differs by at most 3 levels; a no-op as first step prevents it, and so
    do filters that select pixels, linear light, CMYK, and small pictures."""
    def apart(source, line):
        pictures = []
        for i, steps in enumerate((line, "offset 0 0; " + line)):
            target = work / f"{i}.png"
            apply(work / source, "--do", steps, "--to", "png", "--out", target, "--overwrite",
                  "replace")
            pictures.append(Image.open(target).convert("RGB"))
        if pictures[0].size != pictures[1].size:
            faults.append(f"{source}: {line}: {pictures[0].size}, not {pictures[1].size}")
            return 0
        return max(ImageStat.Stat(ImageChops.difference(*pictures)).mean)
    for source in ("a.jpg", "odd.jpg", "turned.jpg"):
        for line in ("resize 300", "resize 12%", "resize 200x200 fill",
                     "resize 250x80 stretch filter=lanczos3", "resize 100 filter=mitchell"):
            levels = apart(source, line)
            expect(f"{source}: {line}: {levels} levels apart", levels <= 3)
    expect("nothing was decoded smaller", apart("a.jpg", "resize 300") > 0)
    for source, line in (("a.jpg", "resize 300 filter=nearest"), ("a.jpg", "resize 150 filter=box"),
                         ("a.jpg", "resize 300 linear"), ("a.jpg", "resize 900"),
                         ("a.jpg", "resize 100 only=grow"), ("ink.jpg", "resize 300"),
                         ("small.jpg", "resize 60")):
        levels = apart(source, line)
        expect(f"{source}: {line}: decoded smaller, {levels} levels apart", levels == 0)


def hints(work):
    """Missing resources of operations are named, and a macro's text is not parsed as a recipe."""
    (work / "fonts.conf").write_text("<fontconfig></fontconfig>")
    for steps, text in (("text x", "No font was found"),
                        ("output a\n  caption x", "No font was found")):
        environment = dict(os.environ, LC_ALL="C", FONTCONFIG_FILE=str(work / "fonts.conf"))
        run = subprocess.run([FOTOMILL, "apply", work / "a.jpg", "--do", steps, "--dest",
                              work / "none"], env=environment,
                             capture_output=True, text=True, check=False)
        expect(f"{steps}: {run.stderr}", run.returncode == 1 and text in run.stderr)
    (work / "b\\n1.jpg").write_bytes((work / "a.jpg").read_bytes())
    apply(work / "b\\n1.jpg", "--do", "caption %F", "--out", work / "one.png")
    apply(work / "a.jpg", "--do", "caption x", "--out", work / "other.png")
    expect("one line", Image.open(work / "one.png").size == Image.open(work / "other.png").size)


with tempfile.TemporaryDirectory() as name:
    folder = Path(name)
    photo(1600, 1200).save(folder / "a.jpg", quality=90)
    photo(1603, 1201).save(folder / "odd.jpg", quality=90)
    photo(1600, 1200).convert("CMYK").save(folder / "ink.jpg", quality=90)
    photo(500, 300).save(folder / "small.jpg", quality=90)
    exif = Image.Exif()
    exif[0x0112] = 6
    photo(1603, 1201).save(folder / "turned.jpg", quality=90, exif=exif)
    outputs(folder)
    limits(folder)
    reduced(folder)
    hints(folder)

for fault in faults:
    print(fault)
sys.exit(1 if faults else 0)
