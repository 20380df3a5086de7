#!/usr/bin/env python3
"""Faces in the real program: searches for pictures with faces, thumbnails framed on them."""
import struct
import subprocess
from pathlib import Path

from driven_desktop import PROJECT, Desktop, make_pictures, run


def draw(folder):
    """A picture with a small face, and one without. False without Pillow."""
    pictures = folder / "pictures"
    make_pictures(pictures, ["none.bmp"])
    drawn = subprocess.run([PROJECT / "tests/support/drawn_faces.py", pictures / "face.bmp",
                            "470,260,55"])
    if drawn.returncode == 77:
        print("Pillow is not installed: left out")
    return drawn.returncode == 0


def skin(desktop):
    """The number of pixels on the screen in the color of the face."""
    desktop.settle()
    screen = (Path(desktop.frames.name) / "Xvfb_screen0").read_bytes()
    header, colors = struct.unpack(">I", screen[:4])[0], struct.unpack(">I", screen[76:80])[0]
    pixels = screen[header + 12 * colors:]
    return sum(abs(b - 160) < 9 and abs(g - 184) < 9 and abs(r - 222) < 9
               for b, g, r in zip(pixels[0::4], pixels[1::4], pixels[2::4]))


def only_pictures_with_faces(folder):
    if not draw(folder):
        return
    with Desktop(folder, folder / "pictures", settings=["PictureFaceDetectMatch=1"]) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+shift+f")
        desktop.wait(r"prompt search")
        desktop.focus("^Find pictures$")
        desktop.key("alt+s")
        found = desktop.wait(r"search found=\d+ examined=2")
        desktop.screenshot("search-faces")
        if "found=2" in found:
            return print("the face detector is not installed: left out")
        assert "found=1" in found, found
        desktop.wait(r"lines=1 .*listing=0")


def thumbnails_are_framed(folder):
    if not draw(folder):
        return
    counts = []
    for framed in (0, 1):
        with Desktop(folder, folder / "pictures",
                     settings=["UpdateThumbnailsFlag=0",
                               f"FaceDetectVirtualThumbnails={framed}"]) as desktop:
            desktop.wait(r"lines=2 .*missing=0 listing=0")
            counts.append(skin(desktop))
            desktop.screenshot(f"faces-{framed}")
    if counts[0] == counts[1]:
        return print("the face detector is not installed: left out")
    assert counts[1] > 3 * counts[0] > 0, counts


if __name__ == "__main__":
    run(only_pictures_with_faces, thumbnails_are_framed)
