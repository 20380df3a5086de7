#!/usr/bin/env python3
"""A folder whose file system does not answer: the windows say so and stay usable."""
import os
import sys
from pathlib import Path

from driven_desktop import PROJECT, Desktop, make_pictures, run

PROGRAM = Path(os.environ.get("FOTOMILL_DESKTOP", PROJECT / "build/release/fotomill-desktop"))
MODULE = Path(os.environ.get("SLOW_FILES", PROGRAM.parent / "tests/slow_files.so"))
QUIET = ["UpdateThumbnailsFlag=0"]


def slow(folder):
    """A folder that hangs from now on, and what makes it hang."""
    pictures, hanging = folder / "slow", folder / "hanging"
    make_pictures(pictures, ["a.bmp", "b.bmp", "c.bmp"])
    os.environ.update(LD_PRELOAD=str(MODULE), SLOW_FOLDER=str(pictures),
                      SLOW_WHILE=str(hanging), SLOW_LOG=str(folder / "asked"))
    return pictures, hanging


def asked_by_windows(folder):
    asked = folder / "asked"
    return asked.read_text() if asked.exists() else ""


def hanging_folder(folder):
    pictures, hanging = slow(folder)
    quick = folder / "quick"
    make_pictures(quick, ["d.bmp"])
    hanging.touch()
    try:
        with Desktop(folder, pictures, settings=QUIET) as desktop:
            # A start with it, a typed path, a tab: each says that it waits, and none blocks.
            desktop.wait("status Waiting for .*slow")
            hanging.unlink()
            desktop.wait(r"tabs=1 lines=3 .*listing=0")
            desktop.focus("Fotomill Professional")
            desktop.key("ctrl+l")
            desktop.type(f"{quick}\n")
            desktop.wait(r"lines=1 .*listing=0 .*quick$")
            hanging.touch()
            desktop.key("ctrl+l")
            desktop.type(f"{pictures}\n")
            desktop.wait("folder-problem Waiting for .*slow")
            desktop.screenshot("waiting")
            desktop.key("ctrl+t")
            desktop.wait("tabs=2")
            desktop.key("ctrl+l")
            desktop.type(f"{quick}\n")
            desktop.wait(r"tabs=2 lines=1 .*listing=0 .*quick$")
            desktop.key("ctrl+q")
            desktop.wait_end()
            # The next start has tabs of both folders.
            desktop.arguments = []
            desktop.start()
            desktop.wait(r"tabs=2 lines=1 .*listing=0 .*quick$")
            desktop.focus("Fotomill Professional")
            desktop.key("ctrl+shift+Tab")
            desktop.wait(r"tabs=2 lines=0 .*listing=1 .*slow$")
            hanging.unlink()
            desktop.wait(r"tabs=2 lines=3 .*listing=0 .*slow$")
            desktop.key("ctrl+q")
            desktop.wait_end()
    finally:
        hanging.unlink(missing_ok=True)
        del os.environ["LD_PRELOAD"]
    assert not asked_by_windows(folder), asked_by_windows(folder)


def hanging_pictures(folder):
    pictures, hanging = slow(folder)
    try:
        with Desktop(folder, pictures, settings=QUIET) as desktop:
            desktop.wait(r"lines=3 .*missing=0 listing=0")
            desktop.focus("Fotomill Professional")
            hanging.touch()
            # View and compare windows close while they wait for their pictures.
            desktop.key("Home", "Return")
            desktop.focus("View$")
            desktop.key("Right", "Escape")
            desktop.focus("Fotomill Professional")
            desktop.key("ctrl+a", "ctrl+shift+Return")
            desktop.focus("Compare")
            desktop.key("Escape")
            desktop.focus("Fotomill Professional")
            desktop.key("Home", "shift+F10")
            desktop.settle()
            desktop.key("Escape", "End")
            desktop.wait("selected=1 .*focus=c.bmp")
            hanging.unlink()
            desktop.key("Delete")
            desktop.wait("files Deletion of c.bmp")
            desktop.wait(r"lines=2 .*listing=0")
            desktop.key("ctrl+q")
            desktop.wait_end()
    finally:
        hanging.unlink(missing_ok=True)
        del os.environ["LD_PRELOAD"]
    assert not asked_by_windows(folder), asked_by_windows(folder)


if not MODULE.exists():
    print(f"{MODULE} was not built: left out")
    sys.exit(77)
run(hanging_folder, hanging_pictures)
