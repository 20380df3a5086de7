#!/usr/bin/env python3
"""How the program opens files: other programs for media, the File menu, folders' own settings."""
import struct
import zlib

from driven_desktop import Desktop, Failure, make_pictures, run


def register_player(home, script, marker):
    """A program for WAV files that runs for a while, and none for MIDI files."""
    applications = home / ".local/share/applications"
    applications.mkdir(parents=True)
    (home / ".config").mkdir(exist_ok=True)
    (home / ".local/share/mime").mkdir()
    (home / ".local/share/mime/globs2").write_text("50:audio/x-wav:*.wav\n50:audio/midi:*.mid\n")
    script.write_text(f'#!/bin/sh\nsleep 2.5\nprintf "%s" "$2" >{marker}\n')
    script.chmod(0o755)
    (applications / "player.desktop").write_text(
        f"[Desktop Entry]\nType=Application\nName=Player\nExec={script} 100%% %u\n"
        "MimeType=audio/x-wav;\n")
    (applications / "mimeinfo.cache").write_text("[MIME Cache]\naudio/x-wav=player.desktop;\n")


def media_and_recent_files(folder):
    pictures, marker = folder / "pictures", folder / "played"
    make_pictures(pictures, ["a.bmp"])
    for name in ("b c.wav", "d.mid"):
        (pictures / name).write_bytes(b"RIFF")
    register_player(folder / "home", folder / "player", marker)
    with Desktop(folder, pictures, settings=["ShowStartupWindow=1", "LogoDelay=700",
                                             "NormalThumbFontSize=12"]) as desktop:
        desktop.wait(r"startup-window 700")
        desktop.screenshot("startup")
        desktop.wait(r"browser .*lines=3 .*listing=0", again=True)
        desktop.wait(r"startup-window closed")
        desktop.focus("Fotomill Professional")
        desktop.screenshot("large-names")
        # A sound is played by its program, and the window comes back when that ends.
        desktop.key("Home", "Right", "Return")
        desktop.wait(r"external-program starts for .*b c.wav")
        desktop.wait(r"open-with Player$")
        desktop.wait(r"external-program ended, raised")
        if marker.read_text() != str(pictures / "b c.wav"):
            raise Failure(marker.read_text())
        desktop.key("Right", "Return")
        desktop.wait(r"prompt The external player for the file type you selected cannot be found")
        desktop.focus("^Fotomill Professional$", native=True)
        desktop.key("Return")
        # Opened by name, then by the list of recent files.
        desktop.focus(" - Fotomill Professional")
        desktop.key("ctrl+o")
        desktop.wait(r"prompt open")
        desktop.focus("^Open picture$", native=True)
        desktop.screenshot("open")
        desktop.type(str(pictures / "a.bmp"))
        desktop.settle()
        desktop.key("alt+o")
        desktop.wait(r"recent-files 1$")
        desktop.wait(r"view place=1/1 .*status=0 .*a.bmp")
        recent = (desktop.data / "FileMenuHistory.txt").read_text()
        assert recent == f"{pictures}/a.bmp,0\n", recent
        desktop.focus("View$")
        desktop.key("Escape")
        desktop.focus(" - Fotomill Professional")
        desktop.key("alt+f", "e", "1")
        desktop.wait(r"view place=1/1 .*status=0 .*a.bmp")
        desktop.focus("View$")
        desktop.key("Escape")
        desktop.focus(" - Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()
        text = (desktop.data / "Fotomill Professional 11.ini").read_text()
        assert f"OpenPath={pictures}\n" in text, text


def many_programs_at_once(folder):
    """Too many to be waited for: each would keep a thread from the rest of the program."""
    pictures = folder / "pictures"
    pictures.mkdir()
    for number in range(17):
        (pictures / f"{number}.wav").write_bytes(b"RIFF")
    register_player(folder / "home", folder / "player", folder / "played")
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"browser .*lines=17 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "shift+F10")
        desktop.wait(r"programs Player;")
        desktop.settle()
        desktop.key("Up", "Right", "Return")
        desktop.wait(r"open-with Player$")
        for _ in range(17):
            ended = desktop.wait(r"external-program ended")
            assert "raised" not in ended, ended


def override_that_appears(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp"])
    with Desktop(folder, pictures, settings=["WatchFolders=0"]) as desktop:
        desktop.wait(r"browser .*listing=0 view=3 sort=0")
        desktop.focus("Fotomill Professional")
        (pictures / "fmwpro.override").write_text("[Fotomill]\nViewMode=0\nSortMode=2\n")
        desktop.key("F5")
        desktop.wait(r"browser .*view=0 sort=2")
        # What the user chooses stays until the folder says something else.
        desktop.key("ctrl+4", "F5")
        desktop.wait(r"browser .*view=3 sort=2")
        (pictures / "fmwpro.override").write_text("[Fotomill]\nViewMode=4\nSortMode=2\n")
        desktop.key("F5")
        desktop.wait(r"browser .*view=4 sort=2")


def large_png(path, side=13000):
    """A gray picture that takes a while to decode."""
    def chunk(kind, body):
        checksum = zlib.crc32(kind + body)
        return struct.pack(">I", len(body)) + kind + body + struct.pack(">I", checksum)

    pixels = zlib.compress((b"\4" + bytes(side)) * side, 1)
    header = struct.pack(">2I5B", side, side, 8, 0, 0, 0, 0)
    path.write_bytes(b"\x89PNG\r\n\x1a\n" + chunk(b"IHDR", header) +
                     chunk(b"IDAT", pixels) + chunk(b"IEND", b""))


def loading_is_told(folder):
    large_png(folder / "large.png")
    for wanted in ("0", "1"):
        with Desktop(folder, folder / "large.png",
                     settings=[f"ShowProgressWhenViewing={wanted}"]) as desktop:
            desktop.wait(r"view place=1/1 .*status=0 .*large.png")
            told = " view-progress " in desktop.log_text()
            assert told == (wanted == "1"), desktop.log_text()


def welcome_once(folder):
    """The welcome comes at the first start without a file, and only once, even if skipped."""
    ini = folder / "data/Fotomill Professional 11.ini"
    program = Desktop(folder)
    ini.unlink()
    with program as desktop:
        desktop.wait(r"prompt welcome")
        desktop.focus("^Welcome$")
        desktop.screenshot("welcome")
        desktop.key("Escape")
        desktop.wait(r"welcome skipped")
        desktop.wait(r"browser tabs=1 .*listing=0")
        assert "ShowWelcomeWizard=0" in ini.read_text()
        assert "UpdateThumbnailsFlag=0" not in ini.read_text()
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()
        desktop.start()
        desktop.wait(r"browser tabs=1 .*listing=0")
        assert "prompt welcome" not in desktop.log_text()


def welcome_answered(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp"])
    with Desktop(folder, settings=["ShowWelcomeWizard=1"]) as desktop:
        desktop.wait(r"prompt welcome")
        desktop.focus("^Welcome$")
        desktop.key("ctrl+a")
        desktop.type(str(folder / "none"))
        desktop.key("Return")  # this folder does not exist
        desktop.key("ctrl+a")
        desktop.type(str(pictures))
        desktop.key("Tab", "Tab", "Down", "Down", "Tab", "End")
        desktop.screenshot("welcome-answered")
        desktop.key("alt+s")
        desktop.wait(r"welcome answered")
        desktop.wait(r"browser tabs=1 lines=1 .*folder=.*pictures$")
        text = (desktop.data / "Fotomill Professional 11.ini").read_text()
        for line in ("DefaultThumbnailMode=1", "UpdateThumbnailsFlag=0", "Language=de"):
            assert line in text, text
        assert str(pictures) in (desktop.data / "FMWFavourites.txt").read_text()
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+k")
        desktop.wait(r"finder found=")
        desktop.focus("^Befehl suchen$")


run(media_and_recent_files, many_programs_at_once, override_that_appears, loading_is_told,
    welcome_once, welcome_answered)
