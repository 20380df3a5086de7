#!/usr/bin/env python3
"""The Crop window of the real program: one picture, a whole selection, ratio and angle."""
import re
import struct
import subprocess

from driven_desktop import PROJECT, needs_manager, run
from edit_test import applied, browser_of

WIDTH, HEIGHT = 150, 112  # of the sample


def size_of(bmp):
    return struct.unpack("<2i", bmp.read_bytes()[18:26])


def open_crop(desktop, count):
    desktop.key("ctrl+a", "shift+F4")
    desktop.wait(rf"crop-picture 1/{count} {WIDTH}x{HEIGHT}")
    desktop.focus("^Crop: ")


def one_jpeg_without_loss(folder):
    with browser_of(folder, "a.jpg") as (desktop, pictures):
        picture = pictures / "a.jpg"
        before = picture.read_bytes()
        # From the view window, which then shows the new picture.
        desktop.key("Home", "ctrl+Return")
        desktop.wait(r"view-painted .*a.jpg")
        desktop.focus("View$")
        desktop.key("c")
        desktop.wait(rf"crop-picture 1/1 {WIDTH}x{HEIGHT}")
        desktop.focus("^Crop: ")
        # Ctrl moves the lower right corner, Shift by ten; both edges of blocks stay.
        desktop.key("ctrl+shift+Left", "ctrl+shift+Up", "ctrl+Left")
        desktop.wait(rf"crop-area {WIDTH - 11}x{HEIGHT - 10}\+0\+0")
        desktop.screenshot("crop-one")
        desktop.key("Return", "Return")
        desktop.wait(r"crop closed")
        desktop.wait(r"batch-line .*Cropped losslessly")
        desktop.wait(r"batch ended status=0")
        desktop.wait(r"view place=1/1 .*a.jpg")
        assert len(picture.read_bytes()) < len(before)
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo change of a.jpg done=1")
        assert picture.read_bytes() == before


def through_a_selection(folder):
    names = ["a.bmp", "b.bmp", "c.bmp"]
    with browser_of(folder, *names) as (desktop, pictures):
        open_crop(desktop, 3)
        desktop.key("ctrl+shift+Left")
        desktop.wait(rf"crop-area {WIDTH - 10}x{HEIGHT}\+0\+0")
        desktop.key("Return")
        # The next one has the same part suggested.
        desktop.wait(r"crop-picture 2/3")
        desktop.wait(rf"crop-area {WIDTH - 10}x{HEIGHT}\+0\+0")
        desktop.key("Insert")
        desktop.wait(r"crop-picture 3/3")
        desktop.key("shift+Right")
        desktop.wait(rf"crop-area {WIDTH - 10}x{HEIGHT}\+10\+0")
        desktop.key("BackSpace")
        desktop.wait(r"crop-picture 2/3")
        desktop.key("Insert")
        desktop.wait(r"crop-picture 3/3")
        desktop.wait(rf"crop-area {WIDTH - 10}x{HEIGHT}\+10\+0")
        desktop.key("Return", "Return")
        desktop.wait(r"crop closed")
        desktop.wait(r"batch ended status=0")
        sizes = [size_of(pictures / name) for name in names]
        assert sizes == [(WIDTH - 10, HEIGHT), (WIDTH, HEIGHT), (WIDTH - 10, HEIGHT)], sizes


def pictures_that_cannot_be_read(folder):
    with browser_of(folder, "a.bmp", "b.bmp") as (desktop, pictures):
        damaged = pictures / "b.bmp"
        damaged.write_bytes(damaged.read_bytes()[:40])
        before = damaged.read_bytes()
        open_crop(desktop, 2)
        desktop.key("ctrl+shift+Left")
        desktop.wait(rf"crop-area {WIDTH - 10}x{HEIGHT}\+0\+0")
        desktop.key("Return")
        desktop.wait(r"crop-problem")
        # The rectangle of the other picture is not used for this one.
        known = desktop.log_text().count(" crop-area ")
        desktop.key("ctrl+Left", "a", "Return")
        desktop.screenshot("crop-problem")
        assert desktop.log_text().count(" crop-area ") == known
        desktop.key("alt+r")
        desktop.wait(r"crop closed")
        desktop.wait(r"batch-line .*a.bmp")
        desktop.wait(r"One file was processed")
        assert size_of(pictures / "a.bmp") == (WIDTH - 10, HEIGHT)
        assert damaged.read_bytes() == before


@needs_manager
def copies_with_ratio_and_angle(folder):
    with browser_of(folder, "a.bmp") as (desktop, pictures):
        open_crop(desktop, 1)
        desktop.focus("^Crop properties$")
        desktop.key("alt+r", "ctrl+a")
        desktop.type("1:1")
        desktop.wait(rf"crop-area {HEIGHT}x{HEIGHT}\+\d+\+0")
        desktop.key("alt+a", "ctrl+a")
        desktop.type("3")
        desktop.key("Tab")
        desktop.wait(r"crop-angle 3")
        desktop.wait(r"crop-picture 1/1")
        area = desktop.wait(r"crop-area ").split()[1]
        desktop.screenshot("crop-properties")
        desktop.focus("^Crop: ")
        desktop.key("alt+s")
        desktop.wait(r"prompt destination")
        desktop.focus("^Save$")
        desktop.key("Return")
        desktop.wait(r"batch ended status=0")
        made, = pictures.glob("*.png")
        wanted = applied(pictures / "a.bmp", f"straighten 3; crop {area}", folder / "peer", "png")
        assert made.read_bytes() == wanted


def a_horizon_is_drawn(folder):
    with browser_of(folder, "a.bmp") as (desktop, pictures):
        before = (pictures / "a.bmp").read_bytes()
        open_crop(desktop, 1)
        window = desktop.focus("^Crop: ")
        desktop.key("F9", "h")  # the panel is closed, as it may cover the picture
        desktop.settle()
        desktop.xdotool("mousemove", "--window", window, 500, 300, "mousedown", 1)
        desktop.xdotool("mousemove", "--window", window, 600, 310)
        desktop.screenshot("crop-horizon")
        desktop.xdotool("mousemove", "--window", window, 700, 320, "mouseup", 1)
        desktop.wait(r"crop-angle -5.71")
        desktop.wait(r"crop-picture 1/1")
        area = desktop.wait(r"crop-area ").split()[1]
        desktop.key("Return", "Return")
        desktop.wait(r"batch ended status=0")
        made = (pictures / "a.bmp").read_bytes()
        (pictures / "a.bmp").write_bytes(before)
        recipe = f"straighten -5.71; crop {area}"
        assert made == applied(pictures / "a.bmp", recipe, folder / "peer", "bmp")


def the_rectangle_goes_around_faces(folder):
    face = 200, 220, 90  # center and size
    with browser_of(folder, "a.bmp") as (desktop, pictures):
        drawn = subprocess.run([PROJECT / "tests/support/drawn_faces.py", pictures / "a.bmp",
                                ",".join(map(str, face))])
        if drawn.returncode == 77:
            return print("Pillow is not installed: left out")
        desktop.key("ctrl+a", "shift+F4")
        desktop.wait(r"crop-picture 1/1 640x480")
        desktop.focus("^Crop: ")
        desktop.key("f")
        status, count = desktop.wait(r"crop-faces ").split()[1:]
        if status == "22":
            return print("the face detector is not installed: left out")
        assert (status, count) == ("0", "1")
        area = desktop.wait(r"crop-area ").split()[1]
        width, height, x, y = map(int, re.split(r"[x+]", area))
        assert x < face[0] < x + width and y < face[1] < y + height, area
        assert face[2] < width < 5 * face[2] and height < 480, area


if __name__ == "__main__":
    run(one_jpeg_without_loss, through_a_selection, pictures_that_cannot_be_read,
        copies_with_ratio_and_angle, a_horizon_is_drawn, the_rectangle_goes_around_faces)
