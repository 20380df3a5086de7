#!/usr/bin/python3
"""apply on animations: every frame goes through the operations, as Pillow computes them; delays
and rounds stay."""
import os
import subprocess
import sys
import tempfile
from pathlib import Path

try:
    from PIL import Image, ImageChops, ImageDraw, ImageOps, ImageSequence
except ImportError:
    print("skipped: needs Pillow (python3-pil)")
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
DELAYS = [40, 110, 250, 400]
ROUNDS = 3
WHITE = (255, 255, 255, 255)
faults = []


def drawn(number, clear):
    picture = Image.new("RGBA", (60, 40), (0, 0, 0, 0) if clear else (200, 220, 240, 255))
    draw = ImageDraw.Draw(picture)
    draw.rectangle((5 + 8 * number, 5, 20 + 8 * number, 25), fill=(255, 0, 0, 255))
    draw.rectangle((10, 20 + number, 30, 38), fill=(0, 90, 200, 255))
    return picture


def canvas(picture):
    larger = Image.new("RGBA", (80, 50), (0, 255, 0, 255))
    larger.paste(picture, (10, 5))
    return larger


def padded(picture):
    larger = Image.new("RGBA", (30, 30), WHITE)
    larger.paste(picture.resize((30, 20), Image.Resampling.NEAREST), (0, 5))
    return larger


def inverted(picture):
    red, green, blue, alpha = picture.split()
    colors = (ImageOps.invert(channel) for channel in (red, green, blue))
    return Image.merge("RGBA", (*colors, alpha))


def grayed(picture):
    gray = picture.convert("RGB").convert("L")
    return Image.merge("RGBA", (gray, gray, gray, picture.getchannel("A")))


# The operations, what Pillow makes of a frame, and how far a level may be off.
ROWS = (
    ("resize 200% filter=nearest",
     lambda picture: picture.resize((120, 80), Image.Resampling.NEAREST), 0),
    ("resize 30x30 pad filter=nearest background=white", padded, 0),
    ("crop 20x10+5+15", lambda picture: picture.crop((5, 15, 25, 25)), 0),
    ("canvas 80x50 background=#00ff00", canvas, 0),
    ("rotate 90", lambda picture: picture.transpose(Image.Transpose.ROTATE_270), 0),
    ("flip", ImageOps.mirror, 0),
    ("offset 7 9", lambda picture: ImageChops.offset(picture, 7, 9), 0),
    ("invert", inverted, 0),
    ("gray", grayed, 1),
    ("flip; invert; crop 30x30+0+0",
     lambda picture: inverted(ImageOps.mirror(picture)).crop((0, 0, 30, 30)), 0),
)
# Operations that leave the picture as it is within a larger one, and where its corner is then:
# (left, top) as shares of the room.
AROUND = (
    ("caption 'x %W' size=10px", (0, 0)),
    ("caption 'x %W' size=10px background=#00ff00 position=above", (0, 1)),
    ("border 5 lime", (0.5, 0.5)),
)
# Operations that draw within (left, top, right, bottom) only.
WITHIN = (
    ("watermark ### bottom-right size=20 opacity=100 margin=2 color=lime", (40, 25, 60, 40)),
    ("text ### top-left size=10px margin=0 color=lime", (0, 0, 40, 18)),
)


def apply(source, steps, folder):
    target = folder / "out" / source.name
    target.unlink(missing_ok=True)
    run = subprocess.run([FOTOMILL, "--set", "WebPLossless=1", "apply", source, "--do", steps,
                          "--dest", folder / "out", "--prefix", ""],
                         capture_output=True, text=True, check=False)
    if run.returncode != 0:
        faults.append(f"{source.name}: {steps}: {run.stderr}")
        return None
    return Image.open(target)


def frames_of(picture):
    frames = []
    for frame in ImageSequence.Iterator(picture):
        pixels = frame.convert("RGBA")  # which reads the frame, and so its delay
        frames.append((frame.info.get("duration"), pixels))
    return frames


def apart(one, other):
    """The largest difference of a level where it can be seen."""
    black = Image.new("RGBA", one.size, (0, 0, 0, 255))
    seen = (Image.alpha_composite(black, picture).convert("RGB") for picture in (one, other))
    difference = ImageChops.difference(*seen)
    return max(high for _, high in difference.getextrema())


def check_frames(source, steps, folder, frame_check):
    made = apply(source, steps, folder)
    if made is None:
        return
    frames = frames_of(made)
    if [delay for delay, _ in frames] != DELAYS or made.info.get("loop") != ROUNDS:
        delays = [delay for delay, _ in frames]
        faults.append(f"{source.name}: {steps}: {delays}, {made.info.get('loop')} rounds")
        return
    for number, (_, frame) in enumerate(frames):
        wrong = frame_check(frame, number)
        if wrong:
            faults.append(f"{source.name}: {steps}: frame {number}: {wrong}")


def check_source(source, originals, folder):
    for steps, judge, most in ROWS:
        def compared(frame, number, judge=judge, most=most):
            expected = judge(originals[number])
            if frame.size != expected.size:
                return f"{frame.size}, not {expected.size}"
            levels = apart(frame, expected)
            return f"{levels} levels apart" if levels > most else ""
        check_frames(source, steps, folder, compared)
    for steps, share in AROUND:
        def unchanged(frame, number, share=share):
            room = (frame.width - 60, frame.height - 40)
            if max(room) < 10:
                return f"{frame.size}"
            left, top = (round(length * part) for length, part in zip(room, share))
            own = frame.crop((left, top, left + 60, top + 40))
            return "the picture changed" if apart(own, originals[number]) else ""
        check_frames(source, steps, folder, unchanged)
    for steps, area in WITHIN:
        def drawn_within(frame, number, area=area):
            if frame.size != (60, 40):
                return f"{frame.size}"
            if apart(frame, originals[number]) < 100:
                return "nothing was drawn"
            rest, other = frame.copy(), originals[number].copy()
            for picture in (rest, other):
                picture.paste(WHITE, area)
            return "drawn outside of its place" if apart(rest, other) else ""
        check_frames(source, steps, folder, drawn_within)
    for steps, most in (("reduce 3", 3), ("reduce 4 dither=floyd-steinberg", 4), ("mono", 2)):
        def few(frame, _, most=most):
            colors = {pixel[:3] for _, pixel in frame.getcolors(10000) if pixel[3] > 0}
            return "" if len(colors) <= most else f"{len(colors)} colors"
        check_frames(source, steps, folder, few)


with tempfile.TemporaryDirectory() as name:
    work = Path(name)
    for clear in (False, True):
        pictures = [drawn(i, clear) for i in range(4)]
        options = {"save_all": True, "append_images": pictures[1:], "duration": DELAYS,
                   "loop": ROUNDS}
        pictures[0].save(work / "a.gif", disposal=2, **options)
        pictures[0].save(work / "a.webp", lossless=True, **options)
        pictures[0].save(work / "a.png", **options)
        for kind in ("gif", "webp", "png"):
            check_source(work / f"a.{kind}", pictures, work)

for fault in faults:
    print(fault)
sys.exit(1 if faults else 0)
