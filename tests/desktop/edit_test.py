#!/usr/bin/env python3
"""The Edit window of the real program: steps with preview, saved as copies or into the files."""
import contextlib
import os
import re
import struct
import subprocess

from driven_desktop import PROJECT, Desktop, make_pictures, run

# Copies go beside their pictures, without questions.
COPIES = ["DestForceSourceDir=1", "DefaultFileExtension=png", "WarnDestinationWrite=0"]


@contextlib.contextmanager
def browser_of(folder, *names, settings=COPIES):
    """The program with these pictures listed, and their folder."""
    pictures = folder / "pictures"
    make_pictures(pictures, names)
    with Desktop(folder, pictures, settings=settings) as desktop:
        desktop.wait(rf"lines={len(names)} .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        yield desktop, pictures


def applied(picture, recipe, folder, extension):
    """The file that the command line makes of a picture."""
    folder.mkdir(exist_ok=True)
    program = os.environ.get("FOTOMILL", str(PROJECT / "build/release/fotomill"))
    subprocess.run([program, "apply", str(picture), "--do", recipe, "--to", extension, "--dest",
                    str(folder), "--prefix", ""], check=True, stdout=subprocess.DEVNULL)
    return (folder / picture.name).with_suffix("." + extension).read_bytes()


def find_command(desktop, words):
    desktop.key("ctrl+k")
    desktop.wait(r"finder found=")
    desktop.focus("Find command")
    desktop.type(words)
    desktop.wait(r"finder found=1$")
    desktop.key("Return")


def open_effects(desktop):
    """Brightness, the first operation of the family, with the slider focused."""
    desktop.focus("Fotomill Professional")
    desktop.key("ctrl+a")
    find_command(desktop, "functions effects")
    desktop.wait(r"edit-preview exact=1 original=0 status=0")
    desktop.focus("^Edit: ")


def copies_are_those_of_the_command_line(folder):
    with browser_of(folder, "a.bmp", "b.bmp") as (desktop, pictures):
        open_effects(desktop)
        # The slider goes up by tens; each key is a change.
        desktop.key("Page_Up")
        steps = desktop.wait(r"edit-steps brightness \S+$").split(" ", 1)[1]
        desktop.wait(r"edit-preview exact=1 original=0 status=0")
        desktop.key("ctrl+z")
        desktop.wait(r"edit-steps brightness$")
        desktop.key("ctrl+y")
        desktop.wait(rf"edit-steps {steps}$")
        # Before and after, in two ways; then another picture of the selection.
        for key, mode in (("ctrl+2", 1), ("ctrl+3", 2)):
            desktop.key(key)
            desktop.wait(rf"edit-mode {mode}")
            desktop.wait(r"edit-preview exact=1 original=1 status=0")
            desktop.screenshot(f"edit-mode-{mode}")
        desktop.key("ctrl+Page_Down")
        desktop.wait(r"edit-preview exact=1 original=0 status=0")
        desktop.key("ctrl+e")
        desktop.wait(r"prompt destination")
        desktop.focus("^Save$")
        desktop.key("Return")
        desktop.wait(r"edit closed")  # the batch goes on without the window
        desktop.wait(r"batch ended status=0")
        names = sorted(path.name for path in pictures.glob("*.png"))
        assert len(names) == 2, names
        made = pictures / names[0]
        assert made.read_bytes() == applied(pictures / "a.bmp", steps, folder / "peer", "png")
        # They can be undone.
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo output of 2 files done=2")
        assert not list(pictures.glob("*.png"))


def files_change_and_come_back(folder):
    with browser_of(folder, "a.bmp", "b.jpg",
                    settings=["CreateBackups=1"]) as (desktop, pictures):
        before = {path.name: path.read_bytes() for path in pictures.iterdir()}
        open_effects(desktop)
        desktop.key("Page_Up")
        steps = desktop.wait(r"edit-steps brightness \S+$").split(" ", 1)[1]
        desktop.key("ctrl+Return")
        desktop.wait(r"edit closed")
        desktop.wait(r"batch ended status=0")
        peer = applied(pictures / "a.bmp.bak", steps, folder / "peer", "bmp")
        assert (pictures / "a.bmp").read_bytes() == peer
        assert (pictures / "b.jpg").read_bytes() != before["b.jpg"]
        for name, old in before.items():
            assert (pictures / (name + ".bak")).read_bytes() == old, name
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo change of 2 files done=2")
        for name, old in before.items():
            assert (pictures / name).read_bytes() == old, name
        desktop.key("ctrl+y")
        desktop.wait(r"files Redo change of 2 files done=2")
        assert (pictures / "a.bmp").read_bytes() == peer
        # The window starts with the values of the last time, and asks before it drops changes.
        open_effects(desktop)
        assert re.findall(r"edit-steps (.*)", desktop.log_text())[-1] == steps
        desktop.key("Page_Up")
        desktop.wait(r"edit-steps brightness \S+$")
        # Quitting asks as well.
        for answer in ("Return", "alt+d"):
            desktop.focus("Fotomill Professional")
            desktop.key("ctrl+q")
            desktop.wait(r"prompt discard-steps")
            desktop.focus("^Edit$", native=True)
            desktop.key(answer)
        desktop.wait(r"edit closed")
        desktop.wait_end()


def recipes_are_saved_and_run(folder):
    with browser_of(folder, "a.bmp") as (desktop, pictures):
        open_effects(desktop)
        desktop.key("Page_Up", "ctrl+s")
        desktop.wait(r"prompt recipe-name")
        desktop.focus("^Save recipe$", native=True)
        desktop.type("zz mine")
        desktop.key("Return")
        path = folder / "data/recipes/zz mine.recipe"
        desktop.wait(r"edit-saved .*/zz mine.recipe")
        assert path.read_text().startswith("brightness ")
        # A recipe with its own output cannot be edited: saved again, it would lose that.
        other = folder / "data/recipes/zzz saves.recipe"
        other.write_text("gray; save to=png\n")
        desktop.focus("^Edit: ")
        desktop.key("alt+i", "Up", "Return")
        desktop.wait(r"prompt recipe-problem zzz saves")
        desktop.focus("^zzz saves$", native=True)
        desktop.key("Return")
        # A shipped one replaces the steps; undo brings them back.
        desktop.focus("^Edit: ")
        desktop.key("alt+i", "Return")
        desktop.wait(r"edit-recipe black-and-white steps=2")
        desktop.wait(r"edit-steps gray")
        desktop.key("ctrl+z")
        desktop.wait(r"edit-steps brightness")
        other.unlink()
        desktop.key("ctrl+d")
        desktop.wait(r"edit-steps$")
        desktop.key("Escape")
        desktop.wait(r"prompt discard-steps")
        desktop.focus("^Edit$", native=True)
        desktop.key("alt+d")
        desktop.wait(r"edit closed")
        # The last entry of the Functions menu lists the recipes; the own one is the last of them.
        desktop.focus("Fotomill Professional")
        desktop.key("alt+u", "Up", "Right", "Up", "Return")
        desktop.wait(r"prompt destination")
        desktop.focus("^Save$")
        desktop.key("Return")
        desktop.wait(r"batch ended status=0")
        made, = pictures.glob("*.png")
        assert made.read_bytes() == applied(pictures / "a.bmp", path.read_text(), folder / "peer",
                                            "png")
        # A recipe of several outputs decides formats and names.
        desktop.focus("Fotomill Professional")
        desktop.key("alt+u", "Up", "Right", "Up", "Up", "Return")
        desktop.wait(r"destination The recipe decides")
        desktop.focus("^Save$")
        desktop.key("Return")
        desktop.wait(r"batch ended status=0")
        names = sorted(path.name for path in pictures.glob("*.jpg"))
        assert [name[-11:] for name in names] == ["a-large.jpg", "a-small.jpg"], names


def quick_actions_ask_nothing(folder):
    with browser_of(folder, "a.bmp", "b.jpg", "c.bmp",
                    settings=["Transform640=64,48", "WatermarkText=mine"]) as (desktop, pictures):
        (pictures / "c.bmp").write_bytes((pictures / "c.bmp").read_bytes()[:40])
        before = {path.name: path.read_bytes() for path in pictures.iterdir()}
        desktop.key("ctrl+a", "ctrl+alt+2")
        desktop.wait(r"quick-action resize 64x48")
        # What failed is listed with its reason; the others are done and stay selected.
        desktop.wait(r"batch-line .*c.bmp: Damaged file")
        desktop.wait(r"batch stays-open")
        desktop.wait(r"lines=3 items=3 selected=3 missing=0 listing=0")
        resized = {path.name: path.read_bytes() for path in pictures.iterdir()}
        assert struct.unpack("<2i", resized["a.bmp"][18:26]) == (64, 48)
        assert resized["b.jpg"] != before["b.jpg"] and resized["c.bmp"] == before["c.bmp"]
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo change of 2 files done=2")
        assert before == {path.name: path.read_bytes() for path in pictures.iterdir()}
        # The same from the view window, which shows the new picture, and by name.
        desktop.key("ctrl+shift+a", "Home", "ctrl+Return")
        desktop.wait(r"view-painted .*a.bmp")
        desktop.focus("View$")
        desktop.key("F11")  # without the menu bar
        desktop.settle()
        desktop.key("ctrl+alt+6")
        desktop.wait(r"quick-action auto-levels")
        desktop.wait(r"batch ended status=0")
        desktop.wait(r"view place=1/3 .*a.bmp")
        assert (pictures / "a.bmp").read_bytes() != before["a.bmp"]
        desktop.focus("View$")
        desktop.key("F11")
        desktop.settle()
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo change of a.bmp done=1")
        assert (pictures / "a.bmp").read_bytes() == before["a.bmp"]
        desktop.focus("Fotomill Professional")
        find_command(desktop, "quick watermark")
        desktop.wait(r"quick-action watermark")
        desktop.wait(r"batch ended status=0")
        changed = (pictures / "a.bmp").read_bytes()
        (pictures / "a.bmp").write_bytes(before["a.bmp"])
        assert changed == applied(pictures / "a.bmp", "watermark mine", folder / "peer", "bmp")


def right_click_chooses_the_operation(folder):
    data = folder / "data"
    data.mkdir()
    # Effects is the first button.
    (data / "FMWToolbar.txt").write_text("effects\n")
    for once, then in ((0, "contrast"), (1, "brightness")):
        (data / "FMWOperations.txt").unlink(missing_ok=True)
        with browser_of(folder, "a.bmp",
                        settings=[f"RightClickOneTimeFunctions={once}"]) as (desktop, _):
            window = desktop.focus("Fotomill Professional")
            desktop.xdotool("mousemove", "--window", window, 20, 50, "click", 3)
            desktop.wait(r"operation-menu effects brightness")
            desktop.settle()
            desktop.screenshot("operation-menu")
            desktop.key("Down", "Down", "Return")
            desktop.wait(r"edit-steps contrast$")
            desktop.focus("^Edit: ")
            desktop.key("Escape")
            desktop.wait(r"edit closed")
            desktop.focus("Fotomill Professional")
            find_command(desktop, "functions effects")
            desktop.wait(rf"edit-steps {then}$")


if __name__ == "__main__":
    run(copies_are_those_of_the_command_line, files_change_and_come_back,
        recipes_are_saved_and_run, quick_actions_ask_nothing, right_click_chooses_the_operation)
