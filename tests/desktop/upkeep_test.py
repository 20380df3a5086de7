#!/usr/bin/env python3
"""What the real program keeps of files beside the files: database records, thumbnail files, the
file history, the answers to its offers."""
import os
import struct
import subprocess
import time

from driven_desktop import PATIENCE, PROJECT, Desktop, make_pictures, run

RECORD, HEADER = 28442, 60
GLOBAL = "DefaultThumbnailMode=2"


def records(database):
    """Names of the pictures of all records, with "-" in front of what is deleted."""
    data = database.read_bytes()
    count, = struct.unpack("<i", data[12:16])
    found = []
    for i in range(count):
        record = data[HEADER + i * RECORD:HEADER + (i + 1) * RECORD]
        path = record[27912:28173].split(b"\0")[0].decode()
        found.append(("-" if record[28434] & 1 else "") + path.rsplit("/", 1)[1])
    return found


def stamp(database, i, picture):
    """Whether a record holds time and size of a picture."""
    data = database.read_bytes()[HEADER + i * RECORD:HEADER + (i + 1) * RECORD]
    facts = picture.stat()
    return data[28435:28442] == struct.pack("<I", int(facts.st_mtime)) + struct.pack(
        "<I", facts.st_size % 2**24)[:3]


def history(desktop):
    """Name and function of each entry."""
    file = desktop.data / "FMWFileHistoryDatabase.fhdb"
    entries = {}
    for line in file.read_text().splitlines() if file.exists() else []:
        fields = dict(field.split(":", 1) for field in line.split("\t") if field)
        entries[fields["PATH"].rsplit("/", 1)[1]] = int(fields["FUNCTION"])
    return entries


def quit_program(desktop):
    desktop.focus("Fotomill Professional")
    desktop.key("ctrl+q")
    desktop.wait_end()


def records_and_history_follow_files(folder):
    pictures, other = folder / "pictures", folder / "other"
    make_pictures(pictures, ["a.bmp", "b.bmp", "c.bmp", "d.jpg"])
    other.mkdir()
    with Desktop(folder, pictures, settings=["UpdateThumbnailsFlag=0", GLOBAL]) as desktop:
        database = desktop.data / "Fotomill.tdb"
        desktop.wait(r"lines=4 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Return")
        desktop.wait(r"view place=1/4 .*status=0 .*a.bmp")
        desktop.focus("View$")
        desktop.key("r")
        desktop.wait(r"view-turned")
        desktop.key("ctrl+s")
        desktop.wait(r"files Rotation of a.bmp done=1 failed=0")
        desktop.wait(r"view place=1/4 .*status=0 .*a.bmp")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.wait(r"lines=4 .*missing=0 listing=0")
        # Its entry follows; viewed and turned, then renamed.
        desktop.key("Home", "F2")
        desktop.type("z")
        desktop.key("Return")
        desktop.wait(r"files Rename done=1 failed=0")
        desktop.wait(r"lines=4 .*missing=0 listing=0 .*focus=z.bmp")
        desktop.key("Home", "ctrl+c")  # b.bmp
        desktop.key("Right", "ctrl+x")  # c.bmp
        desktop.key("ctrl+l")
        desktop.type(str(other) + "\n")
        desktop.wait(r"lines=0 .*listing=0 .*folder=.*other$")
        desktop.key("ctrl+v")
        desktop.wait(r"files Move of 1 file done=1 failed=0|files Move of c.bmp done=1 failed=0")
        desktop.wait(r"lines=1 .*missing=0 listing=0 .*folder=.*other$")
        desktop.key("alt+Left")
        desktop.wait(r"lines=3 .*missing=0 listing=0 .*folder=.*pictures$")
        desktop.key("End", "Up", "Home", "Right", "Delete")  # d.jpg
        desktop.wait(r"files Deletion of d.jpg done=1")
        desktop.wait(r"lines=2 .*listing=0")
        quit_program(desktop)
        found = records(database)
        for name in ("-a.bmp", "-c.bmp", "-d.jpg", "b.bmp", "z.bmp", "c.bmp"):
            assert name in found, found
        assert "a.bmp" not in found and "d.jpg" not in found, found
        assert stamp(database, found.index("z.bmp"), pictures / "z.bmp")
        assert history(desktop) == {"b.bmp": 12, "c.bmp": 11, "z.bmp": 11}, history(desktop)


def exif_window_is_recorded(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.jpg"])
    program = os.environ.get("FOTOMILL", str(PROJECT / "build/release/fotomill"))
    subprocess.run([program, "exif", "set", "--in-place", "--no-history", str(pictures / "b.jpg"),
                    "Artist=me"], check=True, stdout=subprocess.DEVNULL)
    with Desktop(folder, pictures, settings=["UpdateThumbnailsFlag=0"]) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Right")
        desktop.wait(r"focus=b.jpg")
        desktop.key("alt+shift+Return")
        desktop.wait(r"exif rows=")
        desktop.focus("^EXIF: b.jpg$")
        desktop.key("Escape")
        quit_program(desktop)
        assert history(desktop) == {"b.jpg": 10}, history(desktop)


def history_switched_off(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp"])
    with Desktop(folder, pictures, settings=["UpdateThumbnailsFlag=0"]) as desktop:
        desktop.wait(r"lines=1 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "ctrl+c")
        quit_program(desktop)
        assert history(desktop) == {"a.bmp": 12}, history(desktop)
    # Off, it goes at the end, even when nothing was used.
    off = ["UpdateThumbnailsFlag=0", "FileHistoryEnable=0"]
    with Desktop(folder, pictures, settings=off) as desktop:
        desktop.wait(r"lines=1 .*missing=0 listing=0")
        assert history(desktop) == {"a.bmp": 12}, "not before the end"
        quit_program(desktop)
        assert not (desktop.data / "FMWFileHistoryDatabase.fhdb").exists()


def thumbnail_files_follow(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.bmp"])
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"offer 2")
        desktop.focus("Fotomill Professional")
        desktop.key(*["shift+Tab"] * 4, "Return")
        desktop.wait(r"offer-ended changed")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "F2")
        desktop.type("z")
        desktop.key("Return")
        desktop.wait(r"files Rename done=1 failed=0")
        desktop.wait(r"lines=2 .*listing=0 .*focus=z.bmp")
        assert (pictures / "z.THN").exists() and not (pictures / "a.THN").exists()
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo rename of a.bmp done=1")
        assert (pictures / "a.THN").exists() and not (pictures / "z.THN").exists()
        desktop.wait(r"lines=2 .*listing=0")
        desktop.key("Home", "Delete")
        desktop.wait(r"files Deletion of a.bmp done=1")
        assert not (pictures / "a.THN").exists()


def asked_once(folder):
    """The offer of thumbnail files comes once: not in other folders, tabs and runs."""
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.bmp"])
    make_pictures(pictures / "below", ["c.bmp"])
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"offer 2")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Return")
        desktop.wait(r"lines=1 .*listing=0 .*folder=.*below")
        desktop.wait(r"offer-ended unchanged")
        desktop.key("ctrl+t")
        desktop.wait(r"browser tabs=2 .*listing=0")
        desktop.wait(r"offer-ended unchanged")
        quit_program(desktop)
        assert "AskForThumbnails=1" not in (desktop.data / "MyDefaultTabs.fmwtabset").read_text()
        desktop.arguments = []
        desktop.start()
        desktop.wait(r"browser tabs=2 lines=1 .*listing=0")
        desktop.wait(r"offer-ended unchanged")
        assert " offer " not in desktop.log_text()
        assert not list(pictures.rglob("*.THN"))


def never_again(folder):
    """"Never" is the setting."""
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.bmp"])
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"offer 2")
        desktop.focus("Fotomill Professional")
        desktop.key("shift+Tab", "shift+Tab", "Return")
        desktop.wait(r"offer-ended unchanged")
        quit_program(desktop)
        ini = (desktop.data / "Fotomill Professional 11.ini").read_text()
        assert "UpdateThumbnailsFlag=0" in ini and "UpdateThumbnailsOptions=104" in ini


def folders_without_pictures(folder):
    """Thumbnail files that have lost their pictures go, and the time is kept for the folder."""
    pictures = folder / "pictures"
    make_pictures(pictures, [])
    (pictures / "gone.THN").write_bytes(b"THNL")
    with Desktop(folder, pictures, settings=["UseThumbnailCompacting=1"]) as desktop:
        desktop.wait(r"lines=0 .*listing=0")
        desktop.wait(r"offer-ended")
        assert not (pictures / "gone.THN").exists()
        (pictures / "new.THN").write_bytes(b"THNL")
        quit_program(desktop)
        desktop.start()
        desktop.wait(r"lines=0 .*listing=0")
        desktop.wait(r"offer-ended")
        assert (pictures / "new.THN").exists(), "30 days are not over"


def thumbnails_beyond_the_window(folder):
    """Those of other files are made when the list has been at rest for the time of the setting."""
    pictures = folder / "pictures"
    make_pictures(pictures, [f"{i:03}.bmp" for i in range(150)])
    database = folder / "data/Fotomill.tdb"
    kept = lambda: len(records(database)) if database.exists() else 0
    settings = ["UpdateThumbnailsFlag=0", "BrowserThumbnailPrecacheDelay=60000"]
    with Desktop(folder, pictures, settings=settings) as desktop:
        desktop.wait(r"lines=150 .*missing=0 listing=0")
        quit_program(desktop)
        assert 0 < kept() < 150, kept()
    ini = folder / "data/Fotomill Professional 11.ini"
    ini.write_text(ini.read_text().replace("Delay=60000", "Delay=0"))
    with Desktop(folder, pictures) as desktop:
        end = time.monotonic() + PATIENCE
        while kept() < 150 and time.monotonic() < end:
            time.sleep(0.05)
        assert kept() == 150, kept()


run(records_and_history_follow_files, exif_window_is_recorded, history_switched_off,
    thumbnail_files_follow, asked_once, never_again, folders_without_pictures,
    thumbnails_beyond_the_window)
