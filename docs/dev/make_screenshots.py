#!/usr/bin/env python3
"""Makes the pictures of docs/user/desktop.md: paints landscapes, shows them in the real program, keeps what is on the screen.

make_screenshots.py; needs Xvfb and xdotool, and the release build.
"""
import math
import random
import struct
import subprocess
import sys
import tempfile
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]
sys.path.insert(0, str(PROJECT / "tests/desktop"))
from driven_desktop import Desktop  # noqa: E402

NAMES = ["Aurora.jpg", "Autumn hills.png", "Blue hour.tif", "Canyon.jpg", "Coast at noon.bmp",
         "Dunes.webp", "Early light.jpg",
         "Evening.pcx", "Fjord.jpg", "Foothills.tga", "Green valley.jpg", "Harvest moon.png",
         "Heather.jpg", "Ice field.tif",
         "Lavender.jpg", "Meadow.webp", "Mist.jpg", "Moor.png", "North ridge.jpg", "Ochre.gif",
         "Pass.jpg", "Red sky.bmp",
         "River bend.jpg", "Savanna.png", "Second winter.jpg", "Summer haze.tga", "Tundra.jpg",
         "Violet dusk.webp"]


def landscape(seed, width, height):
    """Rows of blue, green, red, bottom row first: sky, sun, four ranges of hills."""
    dice = random.Random(seed)
    top = [dice.randint(30, 190) for _ in range(3)]
    low = [dice.randint(150, 255) for _ in range(3)]
    sun = (dice.randint(width // 6, width * 5 // 6), dice.randint(height // 8, height // 3),
           dice.randint(height // 16, height // 9))
    phases = [(dice.random() * 6, dice.random() * 6) for _ in range(4)]
    ranges = [bytes(min(255, int(level * (0.8 - 0.17 * layer))) for level in top)
              for layer in range(4)]
    ridges = [[height * (0.45 + 0.14 * layer) - height / 15 * math.sin(x / (width / 10 + 20 * layer) + phases[layer][0])
               - height / 27 * math.sin(x / (width / 24) + phases[layer][1]) for x in range(width)]
               for layer in range(4)]
    rows = []
    for y in range(height):
        part = y / height
        sky = bytes(int(a * (1 - part) + b * part) for a, b in zip(top, low))
        row = []
        for x in range(width):
            color = b"\xd0\xec\xff" if (x - sun[0]) ** 2 + (y - sun[1]) ** 2 < sun[2] ** 2 else sky
            for layer in range(4):
                if y > ridges[layer][x]:
                    color = ranges[layer]
            row.append(color)
        rows.append(b"".join(row) + bytes(-3 * width % 4))
    return b"".join(reversed(rows))


def write_bitmap(path, seed, width, height):
    pixels = landscape(seed, width, height)
    path.write_bytes(struct.pack("<2sIHHI", b"BM", 54 + len(pixels), 0, 0, 54) +
                     struct.pack("<IiiHHIIiiII", 40, width, height, 1, 24, 0, len(pixels), 2835,
                                 2835, 0, 0) + pixels)


def make_pictures(folder):
    (folder / "Panoramas").mkdir()
    for seed, name in enumerate(NAMES):
        target = folder / name
        width, height = (1120, 680) if name == "Fjord.jpg" else [(480, 320), (320, 440), (560, 260),
                                                                 (480, 360)][seed % 4]
        bitmap = target.with_suffix(".bmp")
        write_bitmap(bitmap, seed + 40, width, height)
        if target.suffix != ".bmp":
            subprocess.run([PROJECT / "build/release/fotomill", "convert", bitmap, "--out", target,
                            "--reduce"], check=True,
                           stdout=subprocess.DEVNULL)
            bitmap.unlink()


def keep(desktop, name):
    desktop.screenshot(name)
    made = PROJECT / f"build/screenshots/{name}.png"
    # Written anew by our own encoder, which takes a fraction of the space.
    subprocess.run([PROJECT / "build/release/fotomill", "convert", made, "--out",
                    PROJECT / f"docs/user/{name}.png", "--overwrite", "replace"],
                   check=True, stdout=subprocess.DEVNULL)


def main():
    with tempfile.TemporaryDirectory(prefix="fotomill-") as place:
        folder = Path(place)
        for name in ("Documents", "Pictures/Family", "Pictures/Landscapes", "Pictures/Scans"):
            (folder / "home" / name).mkdir(parents=True)
        pictures = folder / "home/Pictures/Landscapes"
        make_pictures(pictures)
        settings = ["UpdateThumbnailsFlag=0", "WarnDestinationWrite=0", "CloseProgressWhenDone=0",
                    "DestForceSourceDir=1",
                    "DefaultFileExtension=pcx"]
        with Desktop(folder, pictures, settings=settings, size=(1180, 760)) as desktop:
            desktop.wait(r"missing=0 listing=0")
            desktop.focus("Fotomill Professional")
            desktop.xdotool("mousemove", 1179, 759)
            desktop.key("Home")
            desktop.wait(r"selected=1")
            desktop.type("fj")
            desktop.wait(r"focus=Fjord.jpg")
            keep(desktop, "desktop-browser")
            desktop.key("Return")
            desktop.wait(r"view place=.* status=0")
            desktop.focus("View")
            desktop.key("i")
            keep(desktop, "desktop-view")
            desktop.key("Escape")
            desktop.focus("Fotomill Professional")
            desktop.key("ctrl+a", "ctrl+p")
            desktop.wait(r"pages-preview .* status=0")
            desktop.focus("^Print and pages")
            desktop.key("Home")
            desktop.wait(r"pages kind=contact")
            desktop.wait(r"pages-preview .* status=0")
            keep(desktop, "desktop-pages")
            desktop.key("Escape")
            desktop.wait(r"pages closed")
            desktop.focus("Fotomill Professional")
            desktop.key("ctrl+comma")
            desktop.wait(r"setup page=Browsing")
            desktop.focus("Setup")
            desktop.wait(r"setup list has the keyboard")
            desktop.key("Down", "Down", "Down", "Down")
            desktop.wait(r"setup page=Saving")
            keep(desktop, "desktop-setup")
            desktop.key("Escape")
            desktop.wait(r"setup closed")
            desktop.focus("Fotomill Professional")
            desktop.key("ctrl+f")
            desktop.type(".jpg")
            desktop.wait(r"lines=13 ")
            desktop.key("Return", "ctrl+a", "ctrl+e")
            desktop.wait(r"prompt destination")
            desktop.focus("^Convert$")
            desktop.key("Return")
            desktop.wait(r"batch stays-open")
            keep(desktop, "desktop-batch")


main()
