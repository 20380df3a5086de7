#!/usr/bin/env python3
"""Archives in the real program: as folders, in the archive manager, created from a selection."""
import re
import zipfile

from driven_desktop import Desktop, make_pictures, run


def archive_of_pictures(folder, name="trip.zip"):
    made = folder / "made"
    make_pictures(made, ["one.png", "two.jpg"])
    folder.joinpath("pictures").mkdir()
    with zipfile.ZipFile(folder / "pictures" / name, "w", zipfile.ZIP_DEFLATED) as archive:
        archive.write(made / "one.png", "one.png")
        archive.write(made / "two.jpg", "sub/two.jpg")
        archive.writestr("notes.txt", "notes " * 500)
    return folder / "pictures"


def archive_as_folder(folder):
    pictures = archive_of_pictures(folder)
    with Desktop(folder, pictures, settings=["WarnDestinationWrite=0"]) as desktop:
        desktop.wait(r"lines=1 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Return")
        desktop.wait(r"archive-folder .*trip.zip$")
        desktop.wait(r"folder-note .*trip.zip")
        desktop.wait(r"browser tabs=2 .*missing=0 listing=0 .*/trip.zip")
        desktop.screenshot("archive-folder")
        # Nothing is changed there, by commands, keys of tags or in other windows.
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "Delete", "F2", "ctrl+alt+e", "5")
        desktop.wait(r"prompt archive-stays")
        desktop.focus("^Archive$", native=True)
        desktop.key("Return")
        assert not re.search(r"^\S+ (files|exif-edit|prompt delete)", desktop.log_text(), re.M)
        # Convert out of it: next to the archive, not into the temporary folder.
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+f")
        desktop.type("one")
        desktop.key("Return")
        desktop.wait(r"lines=1 ")
        desktop.key("ctrl+a", "ctrl+e")
        desktop.wait(r"prompt destination")
        desktop.focus("^Convert$")
        desktop.key("Return")
        desktop.wait(rf"batch-line .*one.png -> {pictures}/one\.\w+")
        desktop.wait(r"batch ended status=0")
        assert any(path.stem == "one" for path in pictures.iterdir())


def drag_to_home(desktop, place):
    """Drags a file of the list to the first folder of the tree."""
    window = desktop.focus("Fotomill Professional")
    desktop.key("ctrl+a")
    desktop.wait(r"selected=3 ")
    desktop.xdotool("mousemove", "--window", window, 100, 300)
    desktop.xdotool("click", "--repeat", 150, "--delay", 5, 4)
    desktop.xdotool("mousemove", "--window", window, *place)
    desktop.settle()
    desktop.xdotool("mousedown", 1)
    desktop.settle()
    for part in range(1, 6):
        x, y = (start + (end - start) * part // 5 for start, end in zip(place, (100, 97)))
        desktop.xdotool("mousemove", "--window", window, x, y)
        desktop.settle()
    desktop.wait(r"drag 3 copy")
    desktop.xdotool("mouseup", 1)
    desktop.wait(r"files Copy of 3 files done=3")


def copies_out(folder):
    """Files are dragged out of an archive in both views, and opened with another program."""
    pictures = archive_of_pictures(folder)
    home, marker = folder / "home", folder / "opened"
    programs = home / ".local/share/applications"
    programs.mkdir(parents=True)
    (home / ".local/share/mime").mkdir()
    (home / ".local/share/mime/globs2").write_text("50:image/png:*.png\n")
    (programs / "Marker.desktop").write_text(
        f"[Desktop Entry]\nType=Application\nName=Marker\nExec=touch {marker} %F\n"
        "MimeType=image/png;\n")
    (programs / "mimeinfo.cache").write_text("[MIME Cache]\nimage/png=Marker.desktop;\n")
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"lines=1 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Return")
        desktop.wait(r"browser tabs=2 .*missing=0 listing=0 .*/trip.zip")
        for view, place in (("ctrl+4", (420, 240)), ("ctrl+2", (400, 290))):
            desktop.focus("Fotomill Professional")
            desktop.key(view)
            drag_to_home(desktop, place)
            for name in ("one.png", "notes.txt", "sub/two.jpg"):
                (home / name).unlink()
            (home / "sub").rmdir()
        desktop.key("End", "shift+F10")
        desktop.wait(r"programs Marker;")
        desktop.settle()
        desktop.key("Up", "Right", "Return")
        desktop.wait(r"prompt external")
        desktop.focus("^Archive$", native=True)
        desktop.screenshot("archive-open-with")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        assert not marker.exists()
        desktop.key("shift+F10")
        desktop.wait(r"programs Marker;")
        desktop.settle()
        desktop.key("Up", "Right", "Return")
        desktop.wait(r"prompt external")
        desktop.focus("^Archive$", native=True)
        desktop.key("alt+o")
        desktop.wait(r"external-program ended")
        assert marker.exists()


def manager(folder):
    pictures = archive_of_pictures(folder)
    out = folder / "out"
    (folder / "data").mkdir()
    (folder / "data/FMWArchiveHistory.txt").write_text(f"{out}\n")
    with Desktop(folder, pictures, settings=["ArchiveSortMode=100", "CloseProgressWhenDone=1"],
                 ) as desktop:
        desktop.wait(r"lines=1 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "ctrl+alt+a")
        desktop.wait(r"archive rows=3 first=sub/two.jpg")
        desktop.focus("^Archive: trip.zip$")
        desktop.screenshot("archive-manager")
        desktop.key("alt+t")
        for name in ("one.png", "sub/two.jpg", "notes.txt"):
            desktop.wait(rf"batch-line {name} -> intact")
        desktop.wait(r"batch ended status=0")
        desktop.focus("^Progress$")
        desktop.key("Escape")
        desktop.focus("^Archive: trip.zip$")
        desktop.key("alt+e")
        desktop.wait(r"prompt extract")
        desktop.focus("^Extract$")
        desktop.screenshot("archive-extract")
        desktop.key("alt+e")
        desktop.wait(rf"batch-line sub/two.jpg -> {out}/sub/two.jpg")
        desktop.wait(r"batch ended status=0")
        assert (out / "notes.txt").read_text() == "notes " * 500
        # A second time, the files exist: the question is about the first, Escape skips it.
        desktop.focus("^Archive: trip.zip$")
        desktop.key("alt+e")
        desktop.wait(r"prompt extract")
        desktop.focus("^Extract$")
        desktop.key("alt+e")
        desktop.wait(r"prompt overwrite .*one.png")
        desktop.focus("^Overwrite File$")
        desktop.key("alt+l")  # skip all
        desktop.wait(r"batch ended status=0")
        # View the picture; a text is only opened after a question.
        desktop.focus("^Archive: trip.zip$")
        desktop.key("alt+v")
        desktop.wait(r"archive-view .*two.jpg")
        desktop.wait(r"view .*status=0 .*two.jpg")


def create(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["one.png", "two.png"])
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+alt+z")
        desktop.wait(r"prompt archive")
        desktop.focus("^Create archive$")
        desktop.key("alt+p")
        desktop.type("secret")
        desktop.key("alt+g")
        desktop.type("secret")
        desktop.screenshot("archive-create")
        desktop.key("alt+v")
        desktop.wait(r"batch-line .*one.png -> .*pictures.zip")
        desktop.wait(r"batch ended status=0")
        with zipfile.ZipFile(pictures / "pictures.zip") as archive:
            assert archive.namelist() == ["one.png", "two.png"]
            assert all(info.flag_bits & 1 for info in archive.infolist())


if __name__ == "__main__":
    run(archive_as_folder, copies_out, manager, create)
