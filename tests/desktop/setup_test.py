#!/usr/bin/env python3
"""Setup, Get info, EXIF viewer and file history of the real program, by keyboard."""
from driven_desktop import Desktop, make_pictures, run


def setup_round_trip(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp"])
    with Desktop(folder, pictures, settings=["JpegCompression=80", "NotOurs=1"]) as desktop:
        ini = desktop.data / "Fotomill Professional 11.ini"
        desktop.wait(r"browser .*lines=1 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+comma")
        desktop.wait(r"setup page=Browsing")
        desktop.focus("Setup")
        desktop.wait(r"setup list has the keyboard")
        desktop.key("ctrl+f")
        desktop.wait(r"setup search")
        desktop.type("jpegcompression")
        desktop.wait(r"setup page=Format options found=1$")
        desktop.key("Return")
        desktop.screenshot("setup")
        desktop.key("F1")
        desktop.wait(r"help JpegCompression")
        desktop.focus("Help: JpegCompression")
        desktop.key("Escape")
        desktop.wait(r"help closed")
        desktop.focus("Setup")
        desktop.key("ctrl+a")
        desktop.type("a5b5-")  # only digits are taken
        desktop.key("Tab", "alt+a")
        desktop.wait(r"setup applied changed=1")
        text = ini.read_text()
        assert "JpegCompression=55\n" in text and "NotOurs=1\n" in text, text
        # Resetting a page resets its keys; Cancel changes nothing.
        desktop.key("alt+r")
        desktop.wait(r"setup reset")
        desktop.key("Escape")
        desktop.wait(r"setup closed")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+comma")
        desktop.wait(r"setup page=Browsing")
        desktop.focus("Setup")
        desktop.wait(r"setup list has the keyboard")
        desktop.key("Down", "Down", "Down", "Down", "Down")
        desktop.wait(r"setup page=Format options found=0")
        desktop.key("alt+r")
        desktop.wait(r"setup reset")
        desktop.key("alt+a")
        desktop.wait(r"setup applied changed=1")
        assert "JpegCompression=75\n" in ini.read_text(), ini.read_text()
        # A format is switched at once, however the box is closed.
        desktop.key(*["Down"] * 8)
        desktop.wait(r"setup page=Formats")
        desktop.key("Tab", "Down", "space")
        desktop.wait(r"formats .BGA. .* off")
        desktop.key("F1")
        desktop.wait(r"help Formats$")
        desktop.focus("Help: Formats")
        desktop.key("Escape")
        desktop.wait(r"help closed")
        desktop.focus("Setup")
        assert "[Formats]\nBGA=0\n" in ini.read_text(), ini.read_text()
        desktop.key("Escape")
        desktop.wait(r"setup closed")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()


def info_exif_history(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.png"])
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"browser .*lines=2 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "alt+Return")
        desktop.wait(r"info files=2")
        desktop.focus("Get info")
        desktop.screenshot("info")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("alt+shift+Return")
        desktop.wait(r"exif rows=0 ")
        desktop.focus("EXIF")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+h")
        desktop.wait(r"history rows=2 sort=0")
        desktop.focus("File history")
        desktop.screenshot("history")
        desktop.key("Delete")
        desktop.wait(r"question Remove .a.bmp. from")
        desktop.focus("History entries")
        desktop.screenshot("question")
        desktop.key("alt+r")
        desktop.wait(r"history rows=1 sort=0")
        history = (desktop.data / "FMWFileHistoryDatabase.fhdb").read_text()
        assert "b.png" in history and "a.bmp" not in history, history
        desktop.focus("File history")
        desktop.key("Return")
        desktop.wait(r"view place=1/1 .*b.png")
        desktop.focus("View")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+k")
        desktop.wait(r"finder found=")
        desktop.focus("Find command")
        desktop.type("tools clean")
        desktop.wait(r"finder found=1$")
        desktop.key("Return")
        desktop.wait(r"cleanup orphans=0")
        desktop.focus("Clean up")
        desktop.key("Escape")
        desktop.wait(r"cleanup closed")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()


def previous_version(folder):
    data = folder / "data"
    data.mkdir()
    old = data / "Fotomill Professional 10.ini"
    old.write_bytes(b"[Fotomill]\r\nJpegCompression=33\r\n")
    with Desktop(folder, folder) as desktop:
        desktop.wait(r"carried-over First start of this version: the settings were copied")
        desktop.wait(r"browser .*listing=0")
        assert (data / "Fotomill Professional 11.ini").read_bytes() == old.read_bytes()
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()


def plugin_options(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp"])
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"browser .*lines=1 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+k")
        desktop.wait(r"finder found=")
        desktop.focus("Find command")
        desktop.type("tools plug")
        desktop.wait(r"finder found=1$")
        desktop.key("Return")
        desktop.focus("^Plug-ins$")
        desktop.wait(r"plugins lines=")
        desktop.key("Home", "Return")
        desktop.focus("^Options of AVIF$")
        desktop.screenshot("plugin-options")
        desktop.key("Up", "Return")
        desktop.wait(r"plugins FMWPL_avif\.so options")
        text = (desktop.data / "Fotomill Professional 11.ini").read_text()
        assert "[Plugins]\nFMWPL_avif.so." in text, text


def keys_of_commands(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp"])
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"browser .*lines=1 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+comma")
        desktop.wait(r"setup page=Browsing")
        desktop.focus("Setup")
        desktop.wait(r"setup list has the keyboard")
        desktop.key("End")
        desktop.wait(r"setup page=Keyboard")
        # The first command is Open. A letter alone is for searching, and a key may be taken. Tab
        # leaves the field, which takes all other keys.
        # Keys without a name are ignored, and a key is the same by each of its names.
        desktop.key("Tab", "Tab", "ctrl+adiaeresis", "XF86Mail", "x", "ctrl+Return", "ctrl+c")
        desktop.wait(r"setup-key X$")
        desktop.wait(r"setup-key Ctrl\+Enter conflict=Functions/View in another window")
        desktop.wait(r"setup-key Ctrl\+C conflict=Edit/Copy")
        desktop.screenshot("keys")
        desktop.key("F12")
        desktop.wait(r"setup-key F12$")
        desktop.key("Tab", "space", "alt+a")
        desktop.wait(r"setup applied changed=1")
        desktop.key("Escape")
        desktop.wait(r"setup closed")
        assert (desktop.data / "MyKeys.txt").read_text() == "File/Open=F12\n"
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+o", "F12")
        desktop.wait(r"prompt open")
        assert desktop.log_text().count("prompt open") == 1


run(setup_round_trip, info_exif_history, previous_version, plugin_options,
    keys_of_commands)
