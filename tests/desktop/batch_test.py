#!/usr/bin/env python3
"""Batches of the real program: converting, collisions, errors that keep the box open, abort."""
import os
import struct
import subprocess

from driven_desktop import Desktop, Failure, make_pictures, needs_manager, run


def start_convert(desktop):
    """Convert with the dialog's initial settings."""
    desktop.focus("Fotomill Professional")
    desktop.key("ctrl+a", "ctrl+e")
    desktop.wait(r"prompt destination")
    desktop.focus("^Convert$")
    desktop.screenshot("destination")


def confirm(desktop):
    desktop.key("Return")
    desktop.wait(r"prompt format Write files to the \w+ format")
    desktop.focus("^Destination$")
    desktop.key("Return")


def convert_and_collide(folder):
    pictures, out = folder / "pictures", folder / "out"
    make_pictures(pictures, ["one.bmp", "two.bmp"])
    out.mkdir()
    (out / "one.png").write_bytes(b"old")
    (folder / "data").mkdir()
    (folder / "data/FMWDestinationHistory.txt").write_text(f"{out}\n")
    with Desktop(folder, pictures, settings=["CloseProgressWhenDone=0",
                                             "OverwriteKeepBoth=0"]) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        start_convert(desktop)
        confirm(desktop)
        # The overwrite prompt: Escape skips and leaves the file alone.
        desktop.wait(r"prompt overwrite .*one.png")
        desktop.focus("^Overwrite File$")
        desktop.screenshot("overwrite")
        desktop.key("Escape")
        desktop.wait(r"batch-line .*one.bmp.*skipped")
        desktop.wait(r"batch-line .*two.bmp -> .*two.png")
        desktop.wait(r"batch-line One file was processed|batch-line 2 files were processed")
        desktop.wait(r"batch stays-open")
        desktop.focus("^Progress$")
        desktop.screenshot("progress")
        desktop.key("Escape")
        assert (out / "one.png").read_bytes() == b"old"
        assert (out / "two.png").read_bytes()[:4] == b"\x89PNG"
        # With another name typed, both files are kept.
        start_convert(desktop)
        confirm(desktop)
        desktop.wait(r"prompt overwrite .*one.png")
        desktop.focus("^Overwrite File$")
        desktop.key("ctrl+a")
        desktop.type("three")
        desktop.key("Return")
        desktop.wait(r"prompt overwrite .*two.png")
        desktop.focus("^Overwrite File$")
        desktop.key("Return")
        desktop.wait(r"batch ended status=0")
        assert (out / "one.png").read_bytes() == b"old"
        assert sorted(path.name for path in out.iterdir()) == ["one.png", "three.png", "two.png"]
        # Files that replaced nothing can be undone.
        desktop.focus("^Progress$")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo output of one.bmp done=1")
        assert sorted(path.name for path in out.iterdir()) == ["one.png", "two.png"]
        # Skip all answers for the other files, too.
        start_convert(desktop)
        confirm(desktop)
        desktop.wait(r"prompt overwrite .*one.png")
        desktop.focus("^Overwrite File$")
        desktop.key("alt+l")
        desktop.wait(r"batch-line .*one.bmp.*skipped")
        desktop.wait(r"batch-line .*two.bmp.*skipped")
        desktop.wait(r"batch ended status=0")


def destination_step(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["one.bmp"])
    with Desktop(folder, pictures, settings=["DefaultFileExtension=jpg", "DestForceSourceDir=1",
                                             "WarnDestinationWrite=0"]) as desktop:
        desktop.wait(r"lines=1 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+e")
        desktop.wait(r"destination First: .*/pictures/one.jpg ")
        desktop.focus("^Convert$")
        # A bare name is a subfolder of the current folder.
        desktop.key("alt+i", "Tab", "ctrl+a")
        desktop.type("out")
        desktop.wait(r"destination First: .*/pictures/out/one.jpg ")
        # Shift opens the format's options; Cancel returns to the previous step.
        desktop.key("shift+Return")
        desktop.wait(r"prompt options jpg")
        desktop.focus("^JPG options$")
        desktop.key("Escape")
        desktop.focus("^Convert$")
        desktop.key("shift+Return")
        desktop.wait(r"prompt options jpg")
        desktop.focus("^JPG options$")
        desktop.key("Return")
        desktop.wait(rf'prompt confirm Folder "{pictures}/out" does not exist')
        desktop.focus("^Fotomill Professional$", native=True)
        desktop.key("Return")
        desktop.wait(rf"batch-line .*one.bmp -> {pictures}/out/one.jpg")
        desktop.wait(r"batch closes")


def size_quality_and_name(folder):
    """A smaller JPEG with a pattern for its name; the values come back."""
    pictures = folder / "pictures"
    make_pictures(pictures, ["one.bmp"])
    with Desktop(folder, pictures, settings=["DefaultFileExtension=jpg",
                                             "DestForceSourceDir=1"]) as desktop:
        desktop.wait(r"lines=1 .*missing=0 listing=0")
        start_convert(desktop)
        desktop.key("alt+s", "ctrl+a")
        desktop.type("50%")
        desktop.key("alt+q", "Down", "Tab", "ctrl+a")
        desktop.type("40")
        desktop.key("alt+n", "ctrl+a")
        desktop.type("%F-small")
        desktop.wait(r"destination First: .*/one-small.jpg ")
        desktop.screenshot("destination-all")
        confirm(desktop)
        desktop.wait(r"batch-line .*one.bmp -> .*one-small.jpg")
        desktop.wait(r"batch closes")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()
    data = (pictures / "one-small.jpg").read_bytes()
    frame = data.index(b"\xff\xc0") + 5
    assert data[frame:frame + 4] == bytes([0, 56, 0, 75]), data[frame:frame + 4]
    text = (folder / "data/Fotomill Professional 11.ini").read_text()
    assert "DestinationNamePattern=%F-small\n" in text and "DestinationResize=50%\n" in text, text


def destination_in_parts(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["one.bmp"])
    given = ["DefaultFileExtension=jpg", "DestForceSourceDir=1", "WarnDestinationWrite=0",
             "PromptBeforeOverwrite=0", "PromptForFileComments=1"]
    for more, parts in ((["DestinationWindowCombined=0"], ["format", "folder"]),
                        (["PromptForDestination=0"], ["format"])):
        with Desktop(folder, pictures, settings=given + more) as desktop:
            desktop.wait(r"browser .*missing=0 listing=0")
            desktop.focus("Fotomill Professional")
            desktop.key("Home", "ctrl+e")
            desktop.wait(r"destination-part format")
            desktop.focus("^Convert$")
            desktop.key("alt+m")
            desktop.type(f"with {parts[-1]}")
            desktop.screenshot("destination-" + parts[-1])
            desktop.key("Return")
            if len(parts) > 1:
                desktop.wait(r"destination-part folder")
                desktop.screenshot("destination-folder-part")
                desktop.key("Return")
            desktop.wait(r"batch-line .*one.bmp -> .*one.jpg")
            desktop.wait(r"batch closes")
            desktop.focus("Fotomill Professional")
            desktop.key("ctrl+q")
            desktop.wait_end()
        assert f"with {parts[-1]}".encode() in (pictures / "one.jpg").read_bytes()
        text = (desktop.data / "Fotomill Professional 11.ini").read_text()
        assert "DefaultFileExtension=jpg\n" in text and "LastFormatSelected=15\n" in text, text


def name_prompt(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.bmp", "c.bmp"])
    with Desktop(folder, pictures, settings=["DefaultFileExtension=png", "DestForceSourceDir=1",
                                             "PromptForDestName=1",
                                             "WarnDestinationWrite=0"]) as desktop:
        desktop.wait(r"lines=3 .*missing=0 listing=0")
        start_convert(desktop)
        desktop.key("Return")
        desktop.wait(r"prompt name .*/a.png")
        desktop.focus("^Destination name$")
        desktop.screenshot("destination-name")
        # The field holds the name without its extension, which stays whatever is typed.
        desktop.key("ctrl+a")
        desktop.type("first.one")
        desktop.key("Return")
        desktop.wait(r"batch-line .*a.bmp -> .*/first.one.png")
        desktop.wait(r"prompt name .*/b.png")
        desktop.focus("^Destination name$")
        desktop.key("alt+l")
        desktop.wait(r"batch-line .*b.bmp: skipped")
        desktop.wait(r"batch-line .*c.bmp: skipped")
        desktop.wait(r"batch ended")
        # Abort is in the prompt, as the box behind it cannot be reached.
        start_convert(desktop)
        desktop.key("Return")
        desktop.wait(r"prompt name .*/a.png")
        desktop.focus("^Destination name$")
        desktop.key("alt+a")
        desktop.wait(r"batch-line No files were processed")
        desktop.wait(r"batch ended")
        assert sorted(path.name for path in pictures.glob("*.png")) == ["first.one.png"]


def previews_when_wanted(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp"])
    (pictures / "a.png").write_bytes(b"old")
    with Desktop(folder, pictures, settings=["DefaultFileExtension=png", "DestForceSourceDir=1",
                                             "OverwritePromptPreviews=0", "WarnDestinationWrite=0"]) as desktop:
        desktop.wait(r"lines=2 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "ctrl+e")
        desktop.wait(r"prompt destination")
        desktop.focus("^Convert$")
        desktop.key("Return")
        desktop.wait(r"prompt overwrite .*a.png")
        desktop.focus("^Overwrite File$")
        desktop.key("Tab", "Tab", "Tab", "Tab", "space")
        desktop.wait(r"overwrite previews")
        desktop.screenshot("overwrite-previews")
        desktop.key("space")
        desktop.wait(r"overwrite no-previews")
        desktop.key("Escape")
        desktop.wait(r"batch-line .*a.bmp: skipped")


def box_shows_work(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a" * 120 + ".bmp", "b.bmp"])
    with Desktop(folder, pictures, settings=["DefaultFileExtension=png", "DefaultViewMode=0",
                                             "CloseProgressWhenDone=0",
                                             "DestForceSourceDir=1", "ProgressShowMissingThumbnails=1",
                                             "WarnDestinationWrite=0"]) as desktop:
        desktop.wait(r"lines=2 .*listing=0 view=0")
        start_convert(desktop)
        desktop.key("Return")
        # The browser's details have no thumbnails; the box has its own.
        desktop.wait(r"progress-thumbnail .*b.bmp", again=True)
        desktop.wait(r"progress-status 2 files were processed")
        desktop.focus("^Progress$")
        desktop.screenshot("progress-thumbnails")
        desktop.key("shift+Tab")
        desktop.key("Right")
        desktop.wait(r"progress-list left=[1-9]")


def other_program(desktop):
    """A window of another program, in front; its title."""
    folder = desktop.folder / "other"
    (folder / "data").mkdir(parents=True, exist_ok=True)
    environment = dict(desktop.environment, FOTOMILL_DATA=str(folder / "data"),
                       XDG_RUNTIME_DIR=str(folder),
                       FOTOMILL_DESKTOP_LOG=str(folder / "log"))
    program = subprocess.Popen([desktop.program.args[0], str(folder)], env=environment,
                               stdin=subprocess.DEVNULL,
                               stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
    desktop.focus("^other - Fotomill", settle=False, native=True)
    return program


@needs_manager
def raised_at_the_end(folder):
    for raises in (0, 1):
        pictures = folder / f"pictures{raises}"
        make_pictures(pictures, ["p.bmp"])
        for number in range(6000):
            os.link(pictures / "p.bmp", pictures / f"p{number}.bmp")
        with Desktop(folder, pictures, settings=["DefaultFileExtension=tif", "DestForceSourceDir=1",
                                                 "CloseProgressWhenDone=0", "WarnDestinationWrite=0",
                                                 "PromptBeforeOverwrite=0", f"ProgressRaiseAppWindow={raises}"]) as desktop:
            desktop.wait(r"lines=6001 .*listing=0")
            start_convert(desktop)
            desktop.key("Return")
            desktop.wait(r"batch opened")
            # A second one opens its box when the first has ended.
            desktop.focus("^pictures[01] - Fotomill", settle=False)
            desktop.key("Home", "ctrl+e")
            desktop.wait(r"prompt destination")
            desktop.focus("^Convert$", settle=False)
            desktop.key("Return")
            desktop.wait(r"batch waiting=1")
            program = other_program(desktop)
            try:
                if "batch stays-open" in desktop.log_text():
                    raise Failure("the batch was faster than the test")
                desktop.wait(r"batch stays-open")
                desktop.wait(r"batch stays-open")
                desktop.settle()
                front = desktop.xdotool("getactivewindow", "getwindowname")
                assert ("batch raised" in desktop.log_text()) == bool(raises)
                assert front[:1] == (["Progress"] if raises else ["other"]), (raises, front)
            finally:
                program.terminate()
                program.wait()


def errors_stay_and_abort_stops(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["p.bmp"])
    for number in range(4000):
        os.link(pictures / "p.bmp", pictures / f"p{number}.bmp")
    (pictures / "a.gif").write_bytes(b"GIF89a and no more")
    with Desktop(folder, pictures, settings=["DestForceSourceDir=1",
                                             "DefaultFileExtension=tif"]) as desktop:
        desktop.wait(r"lines=4002 .*listing=0")
        start_convert(desktop)
        confirm(desktop)
        desktop.wait(r"batch-line .*a.gif: ")
        # Another batch waits for this one.
        desktop.focus("Fotomill Professional", settle=False)
        desktop.key("Home", "ctrl+e")
        desktop.wait(r"prompt destination")
        desktop.focus("^Convert$", settle=False)
        desktop.key("Return")
        desktop.wait(r"batch waiting=1")
        desktop.focus("^Progress$", settle=False)
        desktop.key("alt+a")
        desktop.wait(r"batch-line There were errors")
        line = desktop.wait(r"batch-line \d+ files were processed")
        assert int(line.split()[1]) < 4002, line
        desktop.wait(r"batch stays-open")
        desktop.wait(r"batch ended")
        written = [path for path in pictures.iterdir() if path.suffix == ".tif"]
        for path in written:
            if path.read_bytes()[:2] not in (b"II", b"MM") or path.stat().st_size < 1000:
                raise Failure(f"{path.name} is not whole")
        # It starts, while the first one's box stays open for reading.
        desktop.wait(r"prompt format")
        desktop.focus("^Destination$")
        desktop.key("Return")
        desktop.wait(r"batch-line .*a.gif: ")
        desktop.wait(r"batch ended")
        desktop.screenshot("errors")
        assert len(desktop.xdotool("search", "--onlyvisible", "--name", "^Progress$")) == 2


def resize_to_a_named_size(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["one.bmp", "two.bmp"])
    with Desktop(folder, pictures, settings=["DefaultFileExtension=bmp", "DestForceSourceDir=1",
                                             "WarnDestinationWrite=0", "Transform640=16,16",
                                             "PrefixTransform=Small_"]) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+shift+e")
        desktop.wait(r"destination First: .*/pictures/Small_one.bmp ")
        desktop.focus("^Resize$")
        desktop.screenshot("resize")
        desktop.key("alt+s", "Down", "alt+2")
        desktop.wait(r"batch-line .*one.bmp -> .*/Small_one.bmp")
        desktop.wait(r"batch-line .*two.bmp -> .*/Small_two.bmp")
        desktop.wait(r"batch ended status=0")
        for name in ("Small_one.bmp", "Small_two.bmp"):
            sizes = struct.unpack_from("<ii", (pictures / name).read_bytes(), 18)
            assert max(sizes) == 16, sizes


run(convert_and_collide, destination_step, size_quality_and_name,
    destination_in_parts, resize_to_a_named_size,
    name_prompt, previews_when_wanted,
    box_shows_work, raised_at_the_end, errors_stay_and_abort_stops)
