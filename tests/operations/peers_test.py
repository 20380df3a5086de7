#!/usr/bin/python3
"""Operations match Pillow if Pillow computes the same."""
import os
import subprocess
import sys
import tempfile
from pathlib import Path

try:
    from PIL import Image, ImageChops, ImageDraw, ImageFilter, ImageFont, ImageOps
except ImportError:
    print("skipped: needs Pillow (python3-pil)")
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
WIDTH, HEIGHT = 161, 97
faults = []
LOGO = os.path.join(tempfile.gettempdir(), f"fotomill-peers-{os.getpid()}.png")


def sample():
    """Gradients, edges and some texture."""
    picture = Image.new("RGB", (WIDTH, HEIGHT))
    picture.putdata([((x * 255 // WIDTH) ^ (y // 3 & 31), 230 if (x // 20 + y // 15) % 2 else 40,
                      (x * y // 7 + 60) % 256)
                     for y in range(HEIGHT) for x in range(WIDTH)])
    return picture


def perspective(picture):
    """Output (x, y) comes from (x + 0.2 y + 10, y + 5), the same form as Pillow's."""
    return picture.transform((100, 70), Image.Transform.AFFINE, (1, 0.2, 10, 0, 1, 5),
                             Image.Resampling.BILINEAR)


def shadowed(picture):
    """A shadow 9 to the right and 5 down, blurred with sigma 4; Pillow truncates its Gaussian a
    little earlier."""
    canvas = Image.new("RGB", (WIDTH + 3 + 21, HEIGHT + 7 + 17), "white")
    mask = Image.new("L", canvas.size)
    mask.paste(153, (3 + 9, 7 + 5, 3 + 9 + WIDTH, 7 + 5 + HEIGHT))
    canvas.paste((0, 0, 0), (0, 0), mask.filter(ImageFilter.GaussianBlur(4)))
    canvas.paste(picture, (3, 7))
    return canvas


def rounded(picture):
    """Drawn at eight times the size and scaled down, since Pillow's corners are not
    anti-aliased."""
    mask = Image.new("L", (WIDTH * 8, HEIGHT * 8))
    ImageDraw.Draw(mask).rounded_rectangle((0, 0, WIDTH * 8 - 1, HEIGHT * 8 - 1), 20 * 8, 255)
    canvas = Image.new("RGB", picture.size, "red")
    canvas.paste(picture, (0, 0), mask.resize(picture.size, Image.Resampling.BOX))
    return canvas


def stamped(picture):
    """A logo with alpha, of the picture's size, at 60 %."""
    logo = Image.open(LOGO)
    alpha = logo.getchannel("A").point(lambda v: v * 153 / 255 + 0.5)
    logo.putalpha(alpha)
    return Image.alpha_composite(picture.convert("RGBA"), logo).convert("RGB")


# recipe line, Pillow's equivalent, maximum difference in levels, ignored border pixels
ROWS = [
    ("rotate 7 filter=bilinear mode=keep", lambda p: p.rotate(-7, Image.Resampling.BILINEAR), 2,
     None),
    ("rotate -24.5 filter=bilinear mode=keep", lambda p: p.rotate(24.5, Image.Resampling.BILINEAR),
     2, None),
    ("rotate 90", lambda p: p.transpose(Image.Transpose.ROTATE_270), 0, 0),
    ("rotate 180", lambda p: p.transpose(Image.Transpose.ROTATE_180), 0, 0),
    ("offset 30 -11", lambda p: ImageChops.offset(p, 30, -11), 0, 0),
    ("crop 40x30+7+9", lambda p: p.crop((7, 9, 47, 39)), 0, 0),
    ("canvas 200x97 gravity=left background=#102030", lambda p: pasted(p), 0, 0),
    ("perspective 10,5 110,5 124,75 24,75 size=100x70 filter=bilinear", perspective, 2, 0),
    ("kernel '1 2 1 2 4 2 1 2 1'",
     lambda p: p.filter(ImageFilter.Kernel((3, 3), (1, 2, 1, 2, 4, 2, 1, 2, 1))), 1, 1),
    ("kernel '-1 -2 0 -2 9 1 0 1 0' divisor=4 bias=30",
     lambda p: p.filter(ImageFilter.Kernel((3, 3), (0, 1, 0, -2, 9, 1, -1, -2, 0), 4, 30)), 1, 1),
     # Pillow counts rows from the bottom
    ("median 2", lambda p: p.filter(ImageFilter.MedianFilter(5)), 0, 2),
    ("minimum 1", lambda p: p.filter(ImageFilter.MinFilter(3)), 0, 1),
    ("box-blur 3", lambda p: p.filter(ImageFilter.BoxBlur(3)), 1, 0),
    ("border 13 #102030", lambda p: ImageOps.expand(p, 13, (0x10, 0x20, 0x30)), 0, 0),
    ("matt 9 fill=#405060 bevel=none outer-border outer-size=2 outer-color=red",
     lambda p: ImageOps.expand(ImageOps.expand(p, 9, (0x40, 0x50, 0x60)), 2, "red"), 0, 0),
    ("shadow 9 5 blur=4 opacity=60 color=black background=white", shadowed, 3, 0),
    ("round-corners 20 background=red", rounded, 20, 0),
    (f"watermark picture={LOGO} size=100 margin=0 opacity=60", stamped, 1, 0),
]


def pasted(picture):
    canvas = Image.new("RGB", (200, HEIGHT), (0x10, 0x20, 0x30))
    canvas.paste(picture, (0, 0))
    return canvas


def letters():
    """The coverage of the text operation and of Pillow's text, with the same font and position."""
    font = next(iter(sorted(Path("/usr/share/fonts").rglob("DejaVuSans.ttf"))), None)
    if font is None:
        return
    text, size = "Wagner & Söhne, fjord", (400, 60)
    ours = folder_picture("canvas 400x60 background=white; "
                          f"text '{text}' font='DejaVu Sans' size=30px color=black")
    expected = Image.new("L", size, 255)
    draw = ImageDraw.Draw(expected)
    draw.text((200, 30), text, 0, ImageFont.truetype(str(font), 30), anchor="mm")
    boxes = [ImageChops.invert(picture).point(lambda v: 255 if v > 60 else 0).getbbox()
             for picture in (ours, expected)]
    widths, heights = ([box[2 + i] - box[i] for box in boxes] for i in (0, 1))
    inks = [sum(255 - v for v in picture.getdata()) for picture in (ours, expected)]
    if (abs(widths[0] - widths[1]) > 4 or abs(heights[0] - heights[1]) > 2
            or not 0.93 < inks[0] / inks[1] < 1.07):
        faults.append(f"letters: {boxes}, ink {inks}")


def folder_picture(line):
    """A white pixel after a recipe."""
    with tempfile.TemporaryDirectory() as name:
        Image.new("L", (1, 1), 255).save(Path(name, "a.png"))
        run = subprocess.run([FOTOMILL, "apply", Path(name, "a.png"), "--do", line, "--out",
                              Path(name, "b.png"), "--to", "png"],
                             capture_output=True, text=True, check=False)
        if run.returncode != 0:
            faults.append(f"{line}: {run.stderr}")
            return Image.new("L", (400, 60), 255)
        return Image.open(Path(name, "b.png")).convert("L")


def inside(picture, expected, border):
    """The part that both compute the same way: for rotations, away from the blended background."""
    width, height = picture.size
    if border is None:
        return (width * 2 // 5, height // 3, width * 3 // 5, height * 2 // 3)
    return (border, border, width - border, height - border)


def judge(folder, line, peer, most, border):
    source, result = folder / "in.png", folder / "out" / "in.png"
    run = subprocess.run([FOTOMILL, "apply", source, "--do", line, "--dest", folder / "out",
                          "--prefix", "", "--overwrite", "replace"],
                         capture_output=True, text=True, check=False)
    if run.returncode != 0 or not result.exists():
        faults.append(f"{line}: status {run.returncode}: {run.stderr}")
        return
    ours, expected = Image.open(result).convert("RGB"), peer(Image.open(source))
    if ours.size != expected.size:
        faults.append(f"{line}: {ours.size}, not {expected.size}")
        return
    box = inside(ours, expected, border)
    apart = max(high for _, high in ImageChops.difference(ours.crop(box),
                                                          expected.crop(box)).getextrema())
    if apart > most:
        faults.append(f"{line}: {apart} levels apart")


with tempfile.TemporaryDirectory() as name:
    work = Path(name)
    (work / "out").mkdir()
    sample().save(work / "in.png")
    logo = sample().transpose(Image.Transpose.FLIP_LEFT_RIGHT)
    logo.putalpha(sample().getchannel("R"))
    logo.save(LOGO)
    for row in ROWS:
        judge(work, *row)
    os.unlink(LOGO)
    letters()

for fault in faults:
    print(fault)
sys.exit(1 if faults else 0)
