#!/usr/bin/python3
"""Pages of pictures, judged by Poppler: sizes, places, embedded pictures, texts, bookmarks."""
import json
import os
import re
import resource
import shutil
import signal
import subprocess
import sys
import tempfile
import time
from pathlib import Path

try:
    from PIL import Image, ImageCms
except ImportError:
    print("skipped: needs Pillow (python3-pil)")
    sys.exit(77)
if not shutil.which("pdftoppm"):
    print("skipped: needs poppler-utils")
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
POINT = 25.4 / 72
faults = []


def check(found, expected, what):
    if found != expected:
        faults.append(f"{what}: expected {expected!r}, found {found!r}")


def near(found, expected, tolerance, what):
    if abs(found - expected) > tolerance:
        faults.append(f"{what}: expected {expected}, found {found}")


def run(*arguments, status=0, environment=None):
    done = subprocess.run([FOTOMILL, *map(str, arguments)], capture_output=True, check=False,
                          env={**os.environ, **(environment or {})})
    if done.returncode != status:
        faults.append(f"{arguments}: status {done.returncode}, expected {status}: {done.stderr}")
    return done


def judge(*arguments):
    done = subprocess.run([str(argument) for argument in arguments], capture_output=True,
                          check=False)
    if done.returncode != 0 or b"rror" in done.stderr:
        faults.append(f"{arguments}: {done.stderr}")
    return done.stdout.decode(errors="replace")


def sizes(pdf):
    """The pages' sizes in millimeters."""
    return [tuple(round(float(side) * POINT, 2) for side in match) for match in
            re.findall(r"Page +\d+ size: +([\d.]+) x ([\d.]+)",
                       judge("pdfinfo", "-l", "99", pdf))]


def painted(pdf, page=1, dpi=254, least=20):
    """The bounding box in millimeters of what is not white on a page."""
    target = pdf.with_suffix("")
    judge("pdftoppm", "-r", dpi, "-f", page, "-l", page, "-gray", "-singlefile", pdf, target)
    with Image.open(target.with_suffix(".pgm")) as image:
        box = image.point(lambda level: 255 if level < 255 - least else 0).getbbox()
    return [side * 25.4 / dpi for side in box]


def embedded(pdf, folder):
    """The embedded JPEG files."""
    folder.mkdir()
    judge("pdfimages", "-all", pdf, folder / "i")
    return sorted(folder.iterdir())


def image_list(pdf):
    """Rows of pdfimages as lists of words."""
    return [line.split() for line in judge("pdfimages", "-list", pdf).splitlines()[2:]]


def test_print(work):
    """Exact sizes; JPEG bytes, orientation and color profiles survive."""
    pdf = work / "print.pdf"
    run("pages", "print", work / "wide.jpg", "--size", "10x15cm", "--no-turn", "--out", pdf)
    check(sizes(pdf), [(210.0, 297.0)], "an A4 page")
    left, top, right, bottom = painted(pdf)
    for side, expected in ((left, 30), (right, 180), (top, 98.5), (bottom, 198.5)):
        near(side, expected, 0.1, "the place of a print")
    files = embedded(pdf, work / "one")
    check([path.read_bytes() for path in files], [(work / "wide.jpg").read_bytes()],
          "embedded JPEG")
    run("pages", "print", work / "wide.jpg", "--out", pdf, status=1)  # exists
    run("pages", "print", work / "wide.jpg", "--size", "10x15cm", "--crop-marks", "--out", pdf,
        "--overwrite", "replace", "--paper", "Letter")
    check(sizes(pdf), [(279.4, 215.9)], "a Letter page, turned")
    left, top, right, bottom = painted(pdf)
    near(right - left, 150 + 2 * 7, 0.15, "the reach of crop marks")
    near(bottom - top, 100 + 2 * 7, 0.15, "the reach of crop marks")

    # each EXIF orientation: only the top left quarter of the upright picture is white
    for number in range(1, 9):
        pdf = work / f"turned{number}.pdf"
        run("pages", "print", work / f"turned{number}.jpg", "--size", "60x40mm", "--no-turn",
            "--out", pdf)
        judge("pdftoppm", "-r", 25.4, "-gray", "-singlefile", pdf, work / "quarters")
        with Image.open(work / "quarters.pgm") as page:
            quarters = [page.getpixel((x, y)) > 128 for y in (138, 158) for x in (90, 120)]
            corners = [page.getpixel((x, y)) > 128 for y in (127, 169) for x in (73, 136)]
        check(quarters, [True, False, False, False], f"orientation {number}")
        check(corners, [True] * 4, f"size for orientation {number}")

    pdf = work / "texts.pdf"
    run("pages", "print", work / "wide.jpg", "--out", pdf, "--title", "Above %F", "--comment",
        "%W pixels", "--names")
    words = judge("pdftotext", "-layout", pdf, "-").split()
    check(words, ["Above", "wide", "wide.jpg", "600", "pixels"], "texts from top to bottom")

    pdf = work / "profile.pdf"
    run("pages", "print", work / "profile.jpg", work / "profile.png", work / "gray.jpg",
        "--out", pdf)
    check([row[5] for row in image_list(pdf)], ["icc", "icc", "gray"], "color spaces")


def test_pixels(work):
    """Pictures that are not JPEG keep every pixel, palettes and transparency included."""
    pdf = work / "pixels.pdf"
    run("pages", "print", work / "photo.png", work / "palette.png", work / "alpha.png",
        work / "bits.png", "--out", pdf)
    kinds = [(row[2], row[5], row[7]) for row in image_list(pdf)]
    check(kinds, [("image", "rgb", "8"), ("image", "index", "8"), ("image", "rgb", "8"),
                  ("smask", "gray", "8"), ("image", "index", "1")], "kinds of pictures")
    files = embedded(pdf, work / "all")
    for place, name in ((0, "photo.png"), (1, "palette.png"), (4, "bits.png")):
        with Image.open(files[place]) as found, Image.open(work / name) as source:
            check(found.convert("RGB").tobytes() == source.convert("RGB").tobytes(), True, name)
    with Image.open(files[3]) as found, Image.open(work / "alpha.png") as source:
        check(found.convert("L").tobytes() == source.getchannel("A").tobytes(), True, "opacity")
    bright = work / "bright.pdf"
    run("pages", "print", work / "wide.jpg", "--brightness", "20", "--out", bright)
    path = embedded(bright, work / "bright")[0]
    with Image.open(path) as found, Image.open(work / "wide.jpg") as source:
        before, after = source.getpixel((300, 100)), found.convert("RGB").getpixel((300, 100))
        near(after[2] - before[2], 51, 4, "brightness")


def test_contact(work):
    """Texts, bookmarks, reduced pictures, and failed files are left out."""
    pdf = work / "contact.pdf"
    names = [work / name for name in ("wide.jpg", "photo.png", "Zo\u00eb & fi \u05e9\u05dc.png",
                                      "a-very-long-name-that-does-not-fit-below-a-picture.png",
                                      "broken.jpg", "palette.png")]
    done = run("pages", "contact", *names, "--grid", "2x2", "--out", pdf, "--json", status=1)
    rows = json.loads(done.stdout)
    check([(Path(row["file"]).name, row.get("page")) for row in rows],
          [(path.name, None if path.name == "broken.jpg" else page)
           for path, page in zip(names, (1, 1, 1, 1, 0, 2))], "results")
    check(len(sizes(pdf)), 2, "pages")
    text = judge("pdftotext", pdf, "-")
    for name in ("wide.jpg", "Zo\u00eb & fi", names[3].name, "palette.png"):
        check(name in text, True, f"{name} is found")
    check("broken.jpg" in text, False, "a broken file is left out")
    fonts = judge("pdffonts", pdf).splitlines()[2:]
    check(all(" yes yes yes " in font for font in fonts) and len(fonts) > 0, True,
          f"embedded, subset, with texts: {fonts}")
    check(pdf.stat().st_size < 300000, True, "only the letters needed are embedded")
    raw = pdf.read_bytes()
    check(raw.count(b"/Dest ["), 5, "bookmarks")
    check(b"/Title (wide.jpg)" in raw and "Zo\u00eb".encode("utf-16-be").hex().upper().encode()
          in raw, True, "titles of bookmarks")
    for row in image_list(pdf):
        check(int(row[12]) <= 302, True, "resolution of reduced pictures")

    # the same pages as pictures
    run("pages", "contact", *names[:2], "--grid", "2x1", "--to", "png", "--dest", work / "png",
        "--dpi", "100", "--margin", "12.7mm", "--no-names")
    with Image.open(work / "png" / "Catalog_00001.png") as page:
        check(page.size, (827, 1169), "pixels of A4 at 100 dpi")
        near(page.info["dpi"][0], 100, 0.1, "resolution")
        box = page.convert("L").point(lambda level: 255 if level < 250 else 0).getbbox()
        near(box[0], 50, 1, "margin")
        near(box[2], 827 - 50, 1, "margin")


def test_photo(work):
    """Copies share one embedded picture; cut lines measure the prints."""
    pdf = work / "photo.pdf"
    run("pages", "photo", work / "wide.jpg", "--size", "9x13cm", "--copies", "4", "--size",
        "2:passport", "--out", pdf, "--margin", "5")
    check(len({row[10] for row in image_list(pdf)}), 1, "embedded once")
    run("pages", "photo", work / "wide.jpg", "--size", "35x45mm", "--paper", "100x100mm", "--out",
        work / "small.pdf")
    left, top, right, bottom = painted(work / "small.pdf")
    near(right - left, 45, 0.15, "width of a print")
    near(bottom - top, 35, 0.15, "height of a print")
    run("pages", "photo", work / "wide.jpg", "--size", "30x40cm", "--out", work / "x.pdf", status=2)


def test_large(work):
    """Posters, solids and catalogs, as drawn."""
    pdf = work / "poster.pdf"
    run("pages", "poster", work / "wide.jpg", "--size", "60x40cm", "--out", pdf)
    check(sizes(pdf), [(210.0, 297.0)] * 9, "eight sheets and the sketch")
    check(len({row[10] for row in image_list(pdf)}), 1, "embedded once")
    text = judge("pdftotext", pdf, "-")
    check("Sheet 6 of 8 (row 2, column 2)" in text, True, "sheet numbers")
    check("wide.jpg: 60.0 x 40.0 cm on 8 sheets" in text, True, "the sketch's title")
    # the picture's red grows evenly over the sheets: column 2 begins 180 mm to the right
    judge("pdftoppm", "-r", 127, "-f", 2, "-l", 2, "-singlefile", pdf, work / "second")
    with Image.open(work / "second.ppm") as sheet:
        red = sheet.convert("RGB").getpixel((5 * 60, 5 * 100))[0]
    near(red, (180 + 50) / 600 * 255, 2, "what is on the second sheet")

    run("pages", "poster", work / "wide.jpg", "--size", "5000x5000", "--paper", "40x40mm",
        "--out", work / "x.pdf", status=2)

    pdf = work / "cube.pdf"
    run("pages", "cube", work / "wide.jpg", "--size", "5cm", "--out", pdf,
        "--set", "PrintDodecDashedLines=0")
    left, top, right, bottom = painted(pdf)
    near(right - left, 150.2, 0.15, "width of a cube's net")
    near(bottom - top, 210.2, 0.15, "height of a cube's net")
    run("pages", "cube", work / "wide.jpg", "--size", "8cm", "--out", work / "x.pdf", status=2)
    done = run("pages", "cube", *[work / "wide.jpg"] * 7, "--out", work / "seven.pdf", "--json",
               status=1)
    check([row["status"] == 0 for row in json.loads(done.stdout)], [True] * 6 + [False],
          "a picture that has no face")
    pdf = work / "dodecahedron.pdf"
    run("pages", "dodecahedron", work / "wide.jpg", work / "photo.png", "--out", pdf)
    check(len(image_list(pdf)), 12, "faces")

    pdf = work / "catalog.pdf"
    run("pages", "catalog", work / "wide.jpg", work / "palette.png", "--out", pdf, "--footer",
        "P. %P", "--details", "%W by %H")
    text = judge("pdftotext", pdf, "-")
    for words in ("P. 1", "600 by 400", "palette.png"):
        check(words in text, True, f"{words} in a catalog")
    check(pdf.read_bytes().count(b"/URI (file://"), 2, "links")
    run("pages", "catalog", work / "wide.jpg", "--out", pdf, "--footer", "%Q", status=2)


def test_outputs(work):
    """What is refused, and printing."""
    for arguments in ((), ("--out", "a.png"), ("--out", "a.pdf", "--printer", "x"),
                      ("--to", "png"), ("--to", "nonsense", "--dest", work / "q"),
                      ("--out", "a.pdf", "--paper", "A77"), ("--out", "a.pdf", "--margin", "99cm"),
                      ("--out", "a.pdf", "--grid", "0x3"), ("--out", "a.pdf", "--grid", "3")):
        run("pages", "contact", work / "wide.jpg", *arguments, status=2)
    check((work / "q").exists() or Path("a.pdf").exists(), False, "nothing is written")
    run("pages", "contact", work / "broken.jpg", "--out", work / "none.pdf", status=1)
    check((work / "none.pdf").exists(), False, "no pages, no file")
    run("pages", "contact", work / "wide.jpg", "--out", work / "dry.pdf", "-n")
    check((work / "dry.pdf").exists(), False, "a dry run writes nothing")
    hint = run("convert", work / "wide.jpg", "--to", "pdf", "--dest", work, status=2).stderr
    check(b"pages print" in hint, True, "hint of convert")
    # the second page does not fit into a file of 40 KB
    arguments = ("pages", "print", work / "gray.jpg", work / "noise.png", work / "gray.jpg",
                 "--to", "png", "--dpi", "40", "--dest", work / "full", "--json")
    done = subprocess.run(
        [FOTOMILL, *arguments], capture_output=True, check=False, restore_signals=False,
        preexec_fn=lambda: resource.setrlimit(resource.RLIMIT_FSIZE, (40000, 40000)))
    check(done.returncode, 1, "a page that cannot be written")
    check([row["page"] for row in json.loads(done.stdout)], [1, 0, 0], "files on pages")
    check(b"Print_00002.png: Error writing" in done.stderr, True, f"its name in {done.stderr}")
    check([path.name for path in (work / "full").iterdir()], ["Print_00001.png"], "pages written")
    papers = json.loads(run("pages", "papers", "--json").stdout)
    a4 = {"name": "A4", "kind": "paper", "width": 210.0, "height": 297.0}
    check(a4 in papers, True, "papers")

    commands = work / "bin"
    commands.mkdir()
    printer = commands / "lp"
    printer.write_text('#!/bin/sh\n[ "$3" = full ] || exit 3\nfor last; do :; done\n'
                       f'cp "$last" "{work}/printed.pdf"\n')
    printer.chmod(0o755)
    path = {"PATH": f"{commands}:{os.environ['PATH']}"}
    run("pages", "contact", work / "wide.jpg", "--printer", "full", environment=path)
    check(sizes(work / "printed.pdf"), [(210.0, 297.0)], "printed page")
    refused = run("pages", "contact", work / "wide.jpg", "--printer", "empty", environment=path,
                  status=1)
    check(b"did not take" in refused.stderr, True, "a printer that fails")
    # a printer that never answers does not keep the program
    printer.write_text(f'#!/bin/sh\ntouch "{work}/waits"\nexec sleep 60\n')
    waiting = subprocess.Popen([FOTOMILL, "pages", "contact", str(work / "wide.jpg"),
                                "--printer", "x"], env=dict(os.environ, **path), stderr=subprocess.DEVNULL)
    while not (work / "waits").exists() and waiting.poll() is None:
        time.sleep(0.02)
    start = time.monotonic()
    waiting.terminate()
    check(waiting.wait(30), 128 + signal.SIGTERM, "status after SIGTERM")
    check(time.monotonic() - start < 5, True, "the end while lp runs")


def make_pictures(work):
    """The pictures of the tests."""
    wide = Image.new("RGB", (600, 400))
    wide.putdata([(x * 255 // 600, y * 255 // 400, 90) for y in range(400) for x in range(600)])
    wide.save(work / "wide.jpg", quality=95)
    photo = wide.resize((150, 100))
    photo.save(work / "photo.png")
    photo.save(work / "a-very-long-name-that-does-not-fit-below-a-picture.png")
    photo.save(work / "Zo\u00eb & fi \u05e9\u05dc.png")
    photo.quantize(200).save(work / "palette.png")
    photo.convert("1").save(work / "bits.png")
    clear = photo.convert("RGBA")
    clear.putalpha(photo.getchannel("R"))
    clear.save(work / "alpha.png")
    # another RGB profile than sRGB: what a reader would take it for matters not
    profile = ImageCms.ImageCmsProfile(ImageCms.createProfile("sRGB")).tobytes()
    photo.save(work / "profile.jpg", icc_profile=profile)
    photo.save(work / "profile.png", icc_profile=profile)
    photo.convert("L").save(work / "gray.jpg")
    Image.effect_noise((400, 500), 90).save(work / "noise.png")
    upright = Image.new("RGB", (120, 80))
    upright.paste((255, 255, 255), (0, 0, 60, 40))
    back = {1: None, 2: Image.Transpose.FLIP_LEFT_RIGHT, 3: Image.Transpose.ROTATE_180,
            4: Image.Transpose.FLIP_TOP_BOTTOM, 5: Image.Transpose.TRANSPOSE,
            6: Image.Transpose.ROTATE_90, 7: Image.Transpose.TRANSVERSE,
            8: Image.Transpose.ROTATE_270}
    for number, turn in back.items():
        stored = upright if turn is None else upright.transpose(turn)
        exif = Image.Exif()
        exif[0x0112] = number
        stored.save(work / f"turned{number}.jpg", exif=exif, quality=95)
    (work / "broken.jpg").write_bytes((work / "wide.jpg").read_bytes()[:2000])


def main():
    with tempfile.TemporaryDirectory() as name:
        work = Path(name)
        make_pictures(work)
        for test in (test_print, test_pixels, test_contact, test_photo, test_large,
                     test_outputs):
            before = len(faults)
            test(work)
            for fault in faults[before:]:
                print(f"FAILED: {test.__name__}: {fault}")
    return 1 if faults else 0


sys.exit(main())
