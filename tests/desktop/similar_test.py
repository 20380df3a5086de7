#!/usr/bin/env python3
"""The Find similar window of the real program: search, ticks and trash, stop, compare, changes."""
import struct

from driven_desktop import Desktop, make_pictures, run

NAMES = ["a.bmp", "b.png", "c.jpg"]  # the same picture


def bmp_of_stripes(width, height):
    """A picture of its own."""
    row = bytes(255 * (x // (width // 5) % 2) for x in range(width) for _ in range(3))
    row += bytes(-len(row) % 4)
    size = 54 + height * len(row)
    return (b"BM" + struct.pack("<I4xI", size, 54)
            + struct.pack("<IiiHH24x", 40, width, height, 1, 24) + row * height)


def fill(folder):
    """Similar pictures, one in a subfolder, and one that is different."""
    pictures = folder / "pictures"
    make_pictures(pictures, NAMES)
    make_pictures(pictures / "sub", ["d.bmp"])
    (pictures / "other.bmp").write_bytes(bmp_of_stripes(100, 80))
    return pictures


def listing(folder):
    return sorted(path.name for path in folder.rglob("*.*"))


def search(desktop, lines, groups, pictures, problems=0):
    """Opens the window and searches."""
    desktop.wait(rf"lines={lines} .*missing=0 listing=0")
    desktop.focus("Fotomill Professional")
    desktop.key("ctrl+shift+s")
    desktop.wait(r"prompt similar")
    desktop.focus("^Find similar pictures$")
    desktop.key("Return")
    desktop.wait(rf"similar groups={groups} pictures={pictures} .*problems={problems}$")
    desktop.wait(r"similar ended")


SETTINGS = ["UpdateThumbnailsFlag=0"]


def trash_and_undo(folder):
    pictures = fill(folder)
    everything = listing(pictures)
    with Desktop(folder, pictures, settings=SETTINGS) as desktop:
        search(desktop, 5, 1, 4)
        desktop.key("ctrl+a")
        desktop.screenshot("similar")
        desktop.key("Delete")
        desktop.wait(r"files Deletion of 3 files done=3 failed=0")
        desktop.wait(r"similar-states groups=0 pictures=0")
        assert len(listing(pictures)) == len(everything) - 3, listing(pictures)
        assert (pictures / "other.bmp").exists()
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo deletion of 3 files done=3")
        desktop.wait(r"similar-states groups=1 pictures=4")
        assert listing(pictures) == everything, listing(pictures)
        # All are ticked: the question keeps the best one.
        desktop.focus("^Find similar pictures$")
        desktop.key("ctrl+a", "Home", "space", "Delete")
        desktop.wait(r"prompt similar-all")
        desktop.focus("^Move to the trash$", native=True)
        desktop.key("alt+k")
        desktop.wait(r"files Deletion of 3 files done=3 failed=0")
        desktop.wait(r"similar-states groups=0 pictures=0")
        desktop.focus("^Find similar pictures$")
        desktop.key("ctrl+z")
        desktop.wait(r"similar-states groups=1 pictures=4")
        assert listing(pictures) == everything, listing(pictures)


def changed_and_vanished_files(folder):
    """They stay what they are, and are said."""
    pictures = fill(folder)
    broken = pictures / "broken.bmp"
    broken.write_bytes(b"BM and no more")
    with Desktop(folder, pictures, settings=SETTINGS) as desktop:
        search(desktop, 6, 1, 4, problems=1)
        desktop.key("alt+r")
        desktop.wait(r"prompt similar-problems")
        desktop.focus("^Not compared$")
        desktop.screenshot("similar-problems")
        desktop.key("Escape")
        desktop.focus("^Find similar pictures$")
        desktop.key("ctrl+a")
        (pictures / "b.png").unlink()
        changed = (pictures / "c.jpg").read_bytes() + b"\0"
        (pictures / "c.jpg").write_bytes(changed)
        desktop.key("Delete")
        desktop.wait(r"prompt similar-left 2")
        desktop.focus("^Move to the trash$", native=True)
        desktop.screenshot("similar-left")
        desktop.key("Return")
        desktop.wait(r"files Deletion of d.bmp done=1 failed=0")
        desktop.wait(r"similar-states groups=1 pictures=2")
        assert (pictures / "c.jpg").read_bytes() == changed
        desktop.focus("^Find similar pictures$")
        desktop.screenshot("similar-changed")
        # A changed file cannot be ticked, until it is searched again.
        desktop.key("End", "space", "Delete")
        desktop.key("alt+s")
        desktop.wait(r"similar groups=1 pictures=2 ")
        desktop.wait(r"similar ended")
        assert (pictures / "c.jpg").read_bytes() == changed


def the_last_one_stays(folder):
    """Another program deletes the picture that was to be kept."""
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.png"])
    with Desktop(folder, pictures, settings=SETTINGS) as desktop:
        search(desktop, 2, 1, 2)
        desktop.key("ctrl+a")
        (pictures / "a.bmp").unlink()
        desktop.key("Delete")
        desktop.wait(r"prompt similar-left 1")
        desktop.focus("^Move to the trash$", native=True)
        desktop.key("Return")
        desktop.focus("^Find similar pictures$")
        desktop.key("Escape")
        assert listing(pictures) == ["b.png"], listing(pictures)


def stop_and_close(folder):
    pictures = fill(folder)
    large = bmp_of_stripes(3000, 2000)
    for i in range(60):  # 1 GB, sparse where it is black
        with (pictures / f"x{i}.bmp").open("wb") as file:
            file.write(large[:54 + 9000])
            file.truncate(len(large))
    with Desktop(folder, pictures, settings=SETTINGS) as desktop:
        desktop.wait(r"lines=\d+ .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+shift+s")
        desktop.wait(r"prompt similar")
        desktop.focus("^Find similar pictures$")
        # From the field, which is disabled while the search runs.
        desktop.key("alt+o", "Return")
        desktop.wait(r"similar begun")
        desktop.key("Escape")
        line = desktop.wait(r"similar groups=\d+ .* stopped")
        desktop.wait(r"similar ended")
        compared = int(line.split("compared=")[1].split()[0])
        assert compared < 60, line
        desktop.focus("^Find similar pictures$")
        desktop.key("alt+s")
        desktop.wait(r"similar begun")
        desktop.key("alt+c")  # closes the window while it searches
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()


def compare_and_view(folder):
    pictures = fill(folder)
    with Desktop(folder, pictures, settings=SETTINGS) as desktop:
        search(desktop, 5, 1, 4)
        desktop.key("Return")
        desktop.wait(r"compare pane=./4 status=0")
        desktop.focus("^Compare - 4 pictures$")
        desktop.settle()
        desktop.key("Escape")
        desktop.focus("^Find similar pictures$")
        desktop.key("Right", "v")
        desktop.wait(r"view place=2/4 .*status=0")
        desktop.focus("View$")
        desktop.key("Escape")
        # The sharpest one, which is measured first; then pixel by pixel.
        desktop.focus("^Find similar pictures$")
        desktop.key("alt+e", "Down")
        desktop.wait(r"similar ended")
        desktop.key("alt+f", "End")
        desktop.key("alt+s")
        desktop.wait(r"similar groups=1 pictures=3 ")  # not the JPEG file


if __name__ == "__main__":
    run(trash_and_undo, changed_and_vanished_files, the_last_one_stays, stop_and_close,
        compare_and_view)
