#!/usr/bin/python3
"""Faces: detection, and cropping, red-eye correction and framing based on it. The faces are
drawings that the detector recognizes. Skipped without the detector or Pillow."""
import json
import os
import subprocess
import sys
import tempfile
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[1] / "support"))
from drawn_faces import picture
from PIL import Image, ImageDraw

FOTOMILL = os.environ["FOTOMILL"]
WORK = tempfile.TemporaryDirectory()
FOLDER = Path(WORK.name)
FACES = [(200, 220, 90), (470, 260, 55)]  # center and size, the larger one first
failures = 0


def run(*arguments):
    return subprocess.run([FOTOMILL, "--data", str(FOLDER / "data"), *map(str, arguments)],
                          capture_output=True, text=True,
                          cwd=FOLDER)


def check(name, good, said=""):
    global failures
    if not good:
        failures += 1
        print(f"{name}: {said}")


def found(*arguments):
    result = run("faces", "--json", *arguments)
    return json.loads(result.stdout), result


def covers(face, drawn, scale=1):
    """Whether a rectangle is that face: around its center, of plausible size."""
    x, y, size = (value * scale for value in drawn)
    inside = (face["x"] < x < face["x"] + face["width"]
              and face["y"] < y < face["y"] + face["height"])
    return inside and size < face["width"] < 3.2 * size


if "not installed" in run("faces", "--set",
                          "FaceDetectThumbnailCascade=haarcascade_frontalface_alt.xml",
                          FOLDER / "none.png").stderr:
    sys.exit(77)
picture(FACES).save(FOLDER / "two.png")
picture([]).save(FOLDER / "none.png")
probe = run("faces", "two.png")
if "not installed" in probe.stderr:
    sys.exit(77)

# Positions.
answer, _ = found("two.png", "none.png")
check("both, the largest first", len(answer[0]["faces"]) == 2
      and all(map(covers, answer[0]["faces"], FACES)), answer)
check("a picture without", answer[1]["faces"] == [] and answer[1]["status"] == 0, answer)
check("lines", probe.stdout.count("\n") == 2 and probe.stdout.startswith("two.png: ")
      and probe.returncode == 0, probe)
large = picture(FACES).resize((3840, 2880))
large.save(FOLDER / "large.png")
answer, _ = found("large.png")
check("pixels of a large picture", len(answer[0]["faces"]) == 2
      and covers(answer[0]["faces"][0], FACES[0], 6), answer)
exif = Image.Exif()
exif[0x0112] = 6
picture(FACES).rotate(90, expand=True).save(FOLDER / "turned.jpg", quality=95, exif=exif)
answer, _ = found("turned.jpg")
check("upright", answer[0]["width"] == 640 and len(answer[0]["faces"]) == 2
      and covers(answer[0]["faces"][0], FACES[0]), answer)
answer, _ = found("--set", "FaceDetectPercentage=30", "two.png")
check("the smallest that counts", len(answer[0]["faces"]) == 1
      and covers(answer[0]["faces"][0], FACES[0]), answer)

# Without a detector.
for cascade in ("nothing.xml", "", "two.png"):
    answer, result = found("--set", f"FaceDetectThumbnailCascade={cascade}", "two.png")
    check(f"classifier {cascade!r}", answer[0]["status"] == 22 and "not installed" in result.stderr
          and result.returncode == 1, result)
(FOLDER / "bad.xml").write_text("<opencv_storage><cascade></cascade></opencv_storage>")
answer, result = found("--set", f"FaceDetectThumbnailCascade={FOLDER}/bad.xml", "two.png")
check("a classifier that is none", answer[0]["status"] == 22 and result.returncode == 1, result)
answer, result = found("missing.png")
check("no such file", answer[0]["status"] == 1 and answer[0]["faces"] == [], result)

# Cropping and correction.
picture(FACES[1:]).save(FOLDER / "right.png")
run("apply", "right.png", "--do", "crop 200x200 gravity=faces", "--out", "cut.png")
cut = Image.open(FOLDER / "cut.png").convert("RGB")
check("crop to faces", cut.size == (200, 200)
      and cut.getpixel((100, 105))[0] > 180 > cut.getpixel((4, 4))[0], cut.getpixel((100, 105)))
run("apply", "none.png", "--do", "crop 200x100 gravity=faces", "--out", "center.png")
check("crop without a face", Image.open(FOLDER / "center.png").size == (200, 100))
both = picture(FACES, red_eyes=True)
ImageDraw.Draw(both).ellipse([600, 20, 620, 40], fill=(230, 20, 20))
both.save(FOLDER / "red.png")
run("apply", "red.png", "--do", "red-eye faces", "--out", "eyes.png")
eyes = Image.open(FOLDER / "eyes.png").convert("RGB")
eye = tuple(round(v) for v in (FACES[0][0] + .38 * FACES[0][2], FACES[0][1] - .2 * FACES[0][2]))
check("red eyes in faces", both.getpixel(eye)[0] > 180 and eyes.getpixel(eye)[0] < 120,
      eyes.getpixel(eye))
check("red outside of faces", eyes.getpixel((610, 30)) == (230, 20, 20), eyes.getpixel((610, 30)))
check("red-eye needs one of them", run("apply", "red.png", "--do", "red-eye", "--out",
                                       "x.png").returncode == 2)

# Thumbnails: a face takes several times the space it has in the whole picture.
def skin(path):
    image = Image.open(path).convert("RGB")
    return sum(r > 190 > b for r, g, b in image.getdata()) / (image.width * image.height)


shown = {}
for name, settings in (("whole", []), ("framed", ["--set", "FaceDetectThumbnailEnable=1"])):
    folder = FOLDER / name
    folder.mkdir()
    picture(FACES[1:]).save(folder / "a.png")
    run(*settings, "thumbs", "make", folder)
    run("thumbs", "show", next(folder.glob("*.THN")), "--out", folder / "thumb.png")
    shown[name] = skin(folder / "thumb.png")
check("thumbnail", shown["framed"] > 3 * shown["whole"] > 0, shown)
for value in (0, 1):
    run("contact-sheet", "right.png", "--to", "png", "--dest", f"sheet{value}", "--cell", "160",
        "--no-names",
        "--set", f"CatalogFacedetectOptions={value}")
    shown[value] = skin(next((FOLDER / f"sheet{value}").glob("*.png")))
check("contact sheet", shown[1] > 3 * shown[0] > 0, shown)

print("faces are found" if failures == 0 else f"{failures} failures")
sys.exit(failures > 0)
