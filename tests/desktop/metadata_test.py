#!/usr/bin/env python3
"""Metadata in the real program: editing EXIF of several files, places, removal, undo."""
import os
import subprocess
import time

from driven_desktop import PROJECT, Desktop, make_pictures, run

TRACK = """<gpx xmlns="http://www.topografix.com/GPX/1/1"><trk><trkseg>
<trkpt lat="46.0" lon="11.0"><ele>200</ele><time>2024-05-31T12:00:00Z</time></trkpt>
<trkpt lat="46.2" lon="11.4"><ele>300</ele><time>2024-05-31T12:20:00Z</time></trkpt>
</trkseg></trk></gpx>"""


def fotomill(*arguments):
    program = os.environ.get("FOTOMILL", str(PROJECT / "build/release/fotomill"))
    done = subprocess.run([program, *map(str, arguments)], capture_output=True, text=True)
    assert done.returncode == 0, done.stderr
    return done.stdout


def exif_of(path):
    return dict(line.strip().split("\t", 1) for line in fotomill("exif", path).splitlines()
                if "\t" in line)


def tagged(folder, names):
    """Pictures with an artist each and the same time."""
    make_pictures(folder, names)
    for name in names:
        fotomill("exif", "set", folder / name, f"Artist={name}", "Flash=16",
                 "DateTimeOriginal=2024:05:31 14:10:00", "--in-place")


def choose(desktop, name):
    """Focuses the value of a tag."""
    desktop.key("ctrl+f", "ctrl+a")
    desktop.type(name)
    desktop.key("Tab", "Tab")  # over the check box
    desktop.settle()
    desktop.key("alt+v")


def edit_values(folder):
    pictures = folder / "pictures"
    tagged(pictures, ["one.jpg", "two.jpg"])
    old = {path: path.read_bytes() for path in pictures.iterdir()}
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+alt+e")
        desktop.wait(r"exif-edit files=2 rows=\d+")
        desktop.focus("^Edit EXIF: 2 files$")
        desktop.screenshot("exif-edit")
        # A value of both files, a wrong one first; a tag that they do not have; a flash.
        choose(desktop, "DateTime of original")
        desktop.key("ctrl+a")
        desktop.type("2024:02:30")
        desktop.wait(r"exif-edit-value DateTime of original data: invalid")
        desktop.key("ctrl+a")
        desktop.type("2024:05:30 14:10:00")
        desktop.wait(r"exif-edit-value DateTime of original data: 2024:05:30 14:10:00")
        desktop.key("alt+a")
        choose(desktop, "Image title")
        desktop.type("At the lake")
        desktop.wait(r"exif-edit-value Image title: At the lake")
        choose(desktop, "Metering")
        desktop.screenshot("exif-edit-words")
        desktop.key("Home", "Down")
        desktop.wait(r"exif-edit-value Metering mode: Average")
        desktop.screenshot("exif-edit-changed")
        desktop.key("ctrl+s")
        desktop.wait(r"prompt exif Some files do not have all of these tags")
        desktop.focus("^Edit EXIF$", native=True)
        desktop.key("alt+a")
        desktop.wait(r"prompt exif Write these values to 2 files")
        desktop.screenshot("exif-confirm")
        desktop.key("alt+w")
        desktop.wait(r"batch ended status=0")
        desktop.wait(r"exif-edit files=2")
        for path in old:
            exif = exif_of(path)
            assert exif["Person who created the image"] == path.name
            assert exif["DateTime of original data"] == "2024:05:30 14:10:00"
            assert exif["Image title"] == "At the lake"
            assert exif["Metering mode"] == "Average"
            assert exif["Flash"].startswith("Fire: N")
        # Undo gives the very files back, and the open editor shows it.
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo change of 2 files done=2")
        desktop.wait(r"exif-edit files=2")
        assert all(path.read_bytes() == data for path, data in old.items())
        # Changes are not thrown away without a question.
        desktop.focus("^Edit EXIF: 2 files$")
        choose(desktop, "Image title")
        desktop.type("x")
        desktop.wait(r"exif-edit-value Image title: x")
        desktop.key("Escape")
        desktop.wait(r"prompt exif discard")


def close_while_writing(folder):
    """A large file takes a while. The values are not thrown away before it is written."""
    if Desktop.managed:
        return  # the progress window would take the key
    pictures = folder / "pictures"
    tagged(pictures, ["one.jpg"])
    os.truncate(pictures / "one.jpg", 400 << 20)
    with Desktop(folder, pictures, settings=["ExifConfirmWrite=0"]) as desktop:
        desktop.wait(r"lines=1 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+alt+e")
        desktop.wait(r"exif-edit files=1")
        desktop.focus("^Edit EXIF: one.jpg$")
        choose(desktop, "Person")
        desktop.type("x")
        desktop.wait(r"exif-edit-value Person who created the image: ")
        desktop.key("ctrl+s", "Escape")
        desktop.wait(r"exif-edit writing")
        desktop.wait(r"prompt exif writing")
        desktop.screenshot("exif-writing")
        desktop.key("Escape")
        desktop.wait(r"batch ended status=0")
        desktop.focus("^Edit EXIF: one.jpg$")


def places_of(folder):
    return (folder / "data/Locations.gps").read_text()


def places(folder):
    pictures = folder / "pictures"
    tagged(pictures, ["one.jpg"])
    (folder / "data").mkdir()
    (folder / "data/Locations.gps").write_text("Home = 48.5,11.25\nLake = 45.5,-79.25\n")
    (folder / "walk.gpx").write_text(TRACK)
    quiet = ["ExifConfirmWrite=0", "ExifConfirmAddNew=0", "ExifCopyrightHolder=Ann Lee"]
    with Desktop(folder, pictures, settings=quiet) as desktop:
        desktop.wait(r"lines=1 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "ctrl+Return")
        desktop.wait(r"view-shown|view ")
        desktop.focus("one.jpg")
        desktop.key("e")
        desktop.wait(r"exif-edit files=1")
        desktop.focus("^Edit EXIF: one.jpg$")

        def place(*keys):
            desktop.focus("^Edit EXIF: one.jpg$")
            desktop.key("alt+p")
            desktop.wait(r"prompt place")
            desktop.focus("^Place$")
            desktop.key(*keys)

        def write():
            desktop.wait(r"exif-edit place")
            desktop.focus("^Edit EXIF: one.jpg$")
            desktop.key("ctrl+s")
            desktop.wait(r"batch ended status=0")
            desktop.wait(r"exif-edit files=1")
            return exif_of(pictures / "one.jpg")

        # A place is added to the list, renamed and deleted.
        place("alt+l", "Tab")
        desktop.type("41.9,12.5")
        desktop.wait(r"place 41")
        desktop.key("alt+t")
        desktop.wait(r"prompt place-name")
        desktop.focus("^Add to list$", native=True)
        desktop.type("Rome")
        desktop.key("Return")
        desktop.wait(r"places Rome")
        desktop.focus("^Place$")
        desktop.screenshot("place-list")
        desktop.key("alt+m")
        desktop.wait(r"prompt place-name")
        desktop.focus("^Rename$", native=True)
        desktop.key("ctrl+a")
        desktop.type("Roma")
        desktop.key("Return")
        desktop.wait(r"places Roma")
        assert places_of(folder).splitlines()[1:] == ["Lake = 45.5,-79.25",
                                                      "Roma = 41.90000,12.50000"]
        desktop.focus("^Place$")
        desktop.key("alt+d")
        desktop.wait(r"prompt place-delete")
        desktop.focus("^Delete place$", native=True)
        desktop.key("alt+d")
        desktop.wait(r"places ?$")
        assert places_of(folder) == "Home = 48.5,11.25\nLake = 45.5,-79.25\n"
        desktop.focus("^Place$")
        desktop.key("Escape")
        # From the list: the default location, Home, Lake.
        place("Down", "Down")
        desktop.wait(r"place 45.* 30' 00.00\" N, 79")
        desktop.screenshot("place")
        desktop.key("alt+s")
        desktop.focus("^Edit EXIF: one.jpg$")
        desktop.key("alt+o")
        exif = write()
        assert exif["Latitude"].startswith("45.000 30.000"), exif
        assert exif["East or West longitude"] == "West"
        assert exif["Copyright holder"] == "Ann Lee"
        # From a track; the camera was two hours ahead.
        place("alt+g")
        desktop.wait(r"place Choose a recorded track")
        desktop.key("Tab")
        desktop.type(str(folder / "walk.gpx"))
        desktop.wait(r"place 0 of 1 file was taken on this track")
        desktop.key("alt+a")
        desktop.xdotool("type", "--delay", "20", "--", "-2:00")
        desktop.wait(r"place 1 of 1 file was taken on this track")
        desktop.screenshot("place-track")
        desktop.key("alt+s")
        exif = write()
        assert exif["Latitude"].startswith("46.000 6.000 0.000"), exif
        assert exif["Altitude"] == "250.000"
        # None.
        place("alt+r")
        desktop.wait(r"place All GPS values are removed")
        desktop.key("alt+s")
        assert "Latitude" not in write()
        # The value keeps the focus while it is written, and can be edited on.
        desktop.focus("^Edit EXIF: one.jpg$")
        desktop.key("alt+a")
        choose(desktop, "Image title")
        desktop.type("A")
        desktop.wait(r"exif-edit-value Image title: A")
        desktop.key("ctrl+s")
        desktop.wait(r"exif-edit writing")
        desktop.wait(r"exif-edit files=1")
        desktop.type("B")
        desktop.wait(r"exif-edit-value Image title: \w*B")


def strip(folder):
    pictures, bare = folder / "pictures", folder / "bare"
    tagged(pictures, ["one.jpg", "two.jpg"])
    old = {path.name: path.read_bytes() for path in pictures.iterdir()}
    (folder / "data").mkdir()
    (folder / "data/FMWDestinationHistory.txt").write_text(f"{bare}\n")
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+alt+m")
        desktop.wait(r"prompt strip")
        desktop.wait(r"strip-preview .*one.jpg: EXIF; nothing")
        desktop.wait(r"strip-preview .*two.jpg: EXIF; nothing")
        desktop.focus("^Remove Metadata$")
        desktop.key("alt+r")  # keeps creator and copyright
        desktop.wait(r"strip-preview .*two.jpg: some EXIF tags; EXIF")
        desktop.screenshot("strip")
        desktop.key("alt+v")
        desktop.wait(r"batch-line .*one.jpg")
        desktop.wait(r"batch ended status=0")
        desktop.wait(r"metadata-left .*two.jpg: EXIF")
        desktop.focus("^Metadata Left$")
        desktop.screenshot("metadata-left")
        desktop.key("Escape")
        for name in old:
            exif = exif_of(pictures / name)
            assert exif["Person who created the image"] == name and "Flash" not in exif
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo change of 2 files done=2")
        assert all((pictures / name).read_bytes() == data for name, data in old.items())
        # Copies, which undo takes away again.
        desktop.key("ctrl+alt+m")
        desktop.wait(r"prompt strip")
        desktop.focus("^Remove Metadata$")
        desktop.key("alt+n", "Tab", "Down", "alt+v")
        desktop.wait(r"batch ended status=0")
        desktop.wait(r"metadata-left .*bare/two.jpg: nothing")
        desktop.focus("^Metadata Left$")
        desktop.key("Escape")
        assert all((pictures / name).read_bytes() == data for name, data in old.items())
        assert sorted(path.name for path in bare.iterdir()) == ["one.jpg", "two.jpg"]
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo output of 2 files done=2")
        assert not list(bare.iterdir())
    # Without the prompt and the preview.
    quiet = ["SecureEXIFPrompt=0", "SecureEXIFPreview=0"]
    with Desktop(folder, pictures, settings=quiet) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "ctrl+alt+m")
        desktop.wait(r"batch ended status=0")
        assert exif_of(pictures / "one.jpg") == {}
        assert (pictures / "two.jpg").read_bytes() == old["two.jpg"]
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo change of one.jpg done=1")
        assert (pictures / "one.jpg").read_bytes() == old["one.jpg"]


def file_times(folder):
    """To when they were taken, and a sequence from a given time; undone."""
    pictures = folder / "pictures"
    tagged(pictures, ["one.jpg", "two.jpg"])
    make_pictures(pictures, ["three.bmp"])
    for path in pictures.iterdir():
        os.utime(path, (1.6e9, 1.6e9))

    def times():
        return [time.strftime("%Y-%m-%d %H:%M:%S", time.localtime(path.stat().st_mtime))
                for path in sorted(pictures.iterdir())]

    old = times()
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"lines=3 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+alt+t")
        desktop.wait(r"file-time .*one.jpg: .* -> 2024-05-31 14:10:00")
        desktop.wait(r"file-time .*three.bmp: .* -> It does not say when it was taken")
        desktop.wait(r"file-time .*two.jpg: .* -> 2024-05-31 14:10:00")
        desktop.focus("^File Times$")
        desktop.screenshot("file-times")
        assert times() == old
        desktop.key("alt+s")
        desktop.wait(r"batch-line .*three.bmp: ")
        desktop.wait(r"batch ended status=0")
        assert times() == ["2024-05-31 14:10:00", old[1], "2024-05-31 14:10:00"]
        desktop.focus("^Progress$")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+alt+t")
        desktop.wait(r"prompt file-times")
        desktop.focus("^File Times$")
        desktop.key("alt+i")
        desktop.wait(r"file-times valid")
        desktop.key("Tab", "ctrl+a")
        desktop.type("2024-01-02 03:04")
        desktop.wait(r"file-time .*two.jpg: .* -> 2024-01-02 03:04:00")
        desktop.key("alt+e")
        desktop.wait(r"file-times valid")
        desktop.key("Tab", "ctrl+a")
        desktop.type("later")
        desktop.wait(r"file-times \"later\" is not a time difference")
        desktop.key("ctrl+a")
        desktop.type("0:01:00")
        desktop.wait(r"file-time .*two.jpg: .* -> 2024-01-02 03:06:00")
        desktop.screenshot("file-times-sequence")
        desktop.key("alt+s")
        desktop.wait(r"batch ended status=0")
        sequence = [f"2024-01-02 03:0{minute}:00" for minute in (4, 5, 6)]
        assert times() == sequence
        desktop.focus("Fotomill Professional")
        for key, what, count, expected in (
                ("z", "Undo", 3, ["2024-05-31 14:10:00", old[1], "2024-05-31 14:10:00"]),
                ("z", "Undo", 2, old), ("y", "Redo", 2, None), ("y", "Redo", 3, sequence)):
            desktop.key(f"ctrl+{key}")
            desktop.wait(rf"files {what} .* done={count} failed=0")
            assert expected is None or times() == expected


if __name__ == "__main__":
    run(edit_values, close_while_writing, places, strip, file_times)
