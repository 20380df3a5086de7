#!/usr/bin/python3
"""Delays, loops and composed frames of animations written by Pillow are the same as read by
Pillow."""
import io
import json
import os
import random
import subprocess
import sys
import tempfile
from pathlib import Path

try:
    from PIL import Image, ImageDraw, features
except ImportError:
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
DELAYS = [0, 20, 70, 650, 100, 30]


def frames(seed, alpha):
    """Pictures that differ in some areas, partly transparent."""
    draw_random = random.Random(seed)
    for _ in DELAYS:
        picture = Image.new("RGBA", (61, 37), (0, 0, 0, 0) if alpha else (250, 240, 10, 255))
        draw = ImageDraw.Draw(picture)
        for _ in range(3):
            x, y = draw_random.randrange(55), draw_random.randrange(30)
            draw.rectangle((x, y, x + draw_random.randrange(25), y + draw_random.randrange(20)),
                           fill=tuple(draw_random.randrange(256) for _ in range(3)) + (255,))
        yield picture


def told(path):
    return json.loads(subprocess.run([FOTOMILL, "info", "--json", "-q", path],
                                     stdout=subprocess.PIPE, check=True).stdout)[0]


def page(path, number, folder):
    subprocess.run([FOTOMILL, "convert", "-t", "png", "--page", str(number), "-d", str(folder),
                    "--overwrite", "replace", "-q", str(path)],
                   stdout=subprocess.DEVNULL, check=True)
    return Image.open(folder / (path.stem + ".png")).convert("RGBA")


def visible(picture):
    """Pixels, with the same value for all that are fully transparent."""
    return [pixel if pixel[3] else (0, 0, 0, 0) for pixel in picture.getdata()]


def check(path, rounds, folder):
    facts = told(path)
    judge = Image.open(path)
    assert facts["pages"] == judge.n_frames == len(facts["delaysMs"]), (path, facts, judge.n_frames)
    assert facts["rounds"] == rounds, (path, facts["rounds"])
    for number, delay in enumerate(facts["delaysMs"]):
        judge.seek(number)
        judge.load()
        assert delay == judge.info.get("duration", 0), (path, number, delay,
                                                        judge.info.get("duration", 0))
        seen = page(path, number + 1, folder)
        assert visible(seen) == visible(judge.convert("RGBA")), (path, number)


def cut_in_a_frame(path, folder):
    """A file truncated within a later frame is damaged, though its first frame can be shown."""
    broken = folder / ("cut" + path.suffix)
    broken.write_bytes(path.read_bytes()[:-60])
    page(broken, 1, folder / "pages")
    assert subprocess.run([FOTOMILL, "verify", broken], stdout=subprocess.DEVNULL,
                          stderr=subprocess.DEVNULL).returncode != 0


def chunk(name, data):
    return name + len(data).to_bytes(4, "little") + data + bytes(len(data) % 2)


def animated_cursor(path, pictures, sixtieths):
    """Writes an animated cursor with icon files by Pillow."""
    icons = b""
    for picture in pictures:
        file = io.BytesIO()
        picture.resize((48, 48)).save(file, "ICO", sizes=[(48, 48)], bitmap_format="bmp")
        icons += chunk(b"icon", file.getvalue())
    steps = [0, 3, 1, 2, 5, 4, 0, 0]
    words = lambda numbers: b"".join(number.to_bytes(4, "little") for number in numbers)
    body = (b"ACON" + chunk(b"anih", words([36, len(DELAYS), len(steps), 0, 0, 0, 0, 6, 3])) +
            chunk(b"seq ", words(steps)) + chunk(b"rate", words(sixtieths)) +
            chunk(b"LIST", b"fram" + icons))
    path.write_bytes(chunk(b"RIFF", body))
    return steps


def check_animated_cursor(folder):
    pictures = list(frames(5, True))
    path = folder / "steps.ani"
    steps = animated_cursor(path, pictures, [6, 12, 3, 60, 1, 90, 6, 6])
    facts = told(path)
    assert facts["pages"] == len(steps) and facts["rounds"] == 0, facts
    assert facts["delaysMs"] == [100, 200, 50, 1000, 17, 1500, 100, 100], facts
    for number, step in enumerate(steps):
        shown = visible(page(path, number + 1, folder / "pages"))
        assert shown == visible(pictures[step].resize((48, 48))), (path, number)
    cut_in_a_frame(path, folder)


def written_cursor(folder):
    """Pillow reads the cursor embedded in an animated cursor written by the program."""
    source = folder / "opaque.png"
    next(frames(3, False)).save(source)
    path = folder / "opaque.ani"
    subprocess.run([FOTOMILL, "convert", "-q", "--out", path, "-t", "ani", source],
                   stdout=subprocess.DEVNULL, check=True)
    data = path.read_bytes()
    start = data.index(b"icon") + 8
    judge = Image.open(io.BytesIO(data[start:start + int.from_bytes(data[start - 4:start],
                                                                    "little")]))
    assert judge.format == "CUR", judge.format
    assert visible(judge.convert("RGBA")) == visible(Image.open(source).convert("RGBA"))


def main():
    with tempfile.TemporaryDirectory() as name:
        folder = Path(name)
        (folder / "pages").mkdir()
        # loops in the file: none, endless, a number of repetitions
        for disposal, alpha, loop, rounds in ((0, False, None, 1), (1, True, 0, 0), (2, True, 1, 2),
                                              (3, True, 9, 10)):
            path = folder / f"disposal{disposal}.gif"
            first, *rest = frames(disposal, alpha)
            first.save(path, save_all=True, append_images=rest, duration=DELAYS,
                       disposal=[0] + [disposal] * len(rest),
                       **({} if loop is None else {"loop": loop}))
            check(path, rounds, folder / "pages")
        cut_in_a_frame(path, folder)
        check_animated_cursor(folder)
        written_cursor(folder)
        if features.check("webp_anim"):
            for alpha, loop in ((False, 0), (True, 3)):
                path = folder / f"alpha{alpha}.webp"
                first, *rest = frames(7, alpha)
                first.save(path, save_all=True, append_images=rest, duration=DELAYS, loop=loop,
                           lossless=True)
                check(path, loop, folder / "pages")
            cut_in_a_frame(path, folder)


if __name__ == "__main__":
    main()
