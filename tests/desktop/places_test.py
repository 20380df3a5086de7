#!/usr/bin/env python3
"""What is selected and in sight after undo, at a start and after a resize; folders that cannot be
shown."""
import os
import shutil
import signal

from driven_desktop import PROJECT, Desktop, make_pictures, run

QUIET = ["UpdateThumbnailsFlag=0"]


def names(folder):
    return sorted(path.name for path in folder.iterdir())


def selection_after_undo(folder):
    """Delete after an undo or redo takes the files that it concerned, and no other."""
    pictures, other = folder / "pictures", folder / "other"
    make_pictures(pictures, ["a.bmp", "b.bmp", "c.bmp", "d.bmp"])
    other.mkdir()
    with Desktop(folder, pictures, settings=QUIET) as desktop:
        desktop.wait(r"lines=4 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "F2")
        desktop.type("z")
        desktop.key("Return")
        desktop.wait(r"selected=1 .*listing=0 .*focus=z.bmp")
        desktop.key("Home", "shift+Right", "Delete")
        desktop.wait(r"files Deletion of 2 files done=2")
        desktop.wait(r"lines=2 .*selected=1 .*listing=0 .*focus=d.bmp")
        desktop.key("ctrl+z")
        desktop.wait(r"lines=4 .*selected=2 .*listing=0 .*focus=b.bmp")
        desktop.key("End", "ctrl+z")
        desktop.wait(r"lines=4 .*selected=1 .*listing=0 .*focus=a.bmp")
        desktop.key("End", "ctrl+y")
        desktop.wait(r"lines=4 .*selected=1 .*listing=0 .*focus=z.bmp")
        desktop.key("Home", "Delete")
        desktop.wait(r"files Deletion of b.bmp done=1")
        desktop.wait(r"lines=3 .*listing=0")
        desktop.key("End", "ctrl+z")
        desktop.wait(r"lines=4 .*selected=1 .*listing=0 .*focus=b.bmp")
        # Without a selection, Delete would take the focused file.
        desktop.key("Home", "ctrl+c", "ctrl+v")
        desktop.wait(r"lines=5 .*selected=1 .*listing=0 .*focus=Duplicate of b.bmp")
        desktop.key("ctrl+z")
        desktop.wait(r"lines=4 .*selected=0 .*listing=0 .*focus=- ")
        make_pictures(pictures, ["e.bmp"])  # listing the folder again changes nothing
        desktop.wait(r"lines=5 .*selected=0 .*listing=0 .*focus=- ")
        desktop.key("Delete", "Home")
        desktop.wait(r"selected=1 .*focus=b.bmp")
        left = names(pictures)
        assert left == ["b.bmp", "c.bmp", "d.bmp", "e.bmp", "z.bmp"], left


def place_at_a_start(folder):
    """The list comes before the window has its size."""
    pictures = folder / "a/b/c/pictures"
    pictures.mkdir(parents=True)
    for number in range(30):
        (folder / f"a/other{number}").mkdir()
    for number in range(400):
        shutil.copy(PROJECT / "samples/bmp-true-color.bmp", pictures / f"{number:04}.bmp")
    with Desktop(folder, pictures, settings=QUIET, size=(1600, 1000)) as desktop:
        desktop.wait(r"lines=400 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", *["Page_Down"] * 9)
        focus = "0252.bmp"
        desktop.wait(f"selected=1 .*seen=1 focus={focus}")
        # Hiding the tree and another size keep the focused file in sight.
        for change in ("F9", "F9", (700, 500), (1500, 900), (900, 600)):
            if isinstance(change, str):
                desktop.key(change)
            else:
                window = desktop.focus("Fotomill Professional")
                desktop.xdotool("windowsize", window, *change)
            desktop.settle()
            for selected in (0, 1):  # reported with what is in sight
                desktop.key("space")
                desktop.wait(rf"selected={selected} .*seen=1 focus={focus}")
        desktop.key("ctrl+q")
        desktop.wait_end()
        assert "CRITICAL" not in desktop.output.read_text(), desktop.output.read_text()
        desktop.arguments = []
        for _ in range(3):
            desktop.start()
            desktop.wait(rf"lines=400 .*listing=0 .*focus={focus}")
            desktop.focus("Fotomill Professional")
            desktop.key("space")
            desktop.wait(rf"selected=0 .*seen=1 focus={focus}")
            desktop.key("space", "ctrl+q")
            desktop.wait_end()
            complaints = desktop.output.read_text()
            assert not complaints, complaints


def folders_that_cannot_be_shown(folder):
    pictures, gone = folder / "pictures", folder / "gone"
    make_pictures(pictures, ["a.bmp"])
    gone.mkdir()
    closed = pictures / "closed"
    closed.mkdir()
    with Desktop(folder, pictures, settings=QUIET) as desktop:
        desktop.wait(r"lines=2 .*listing=0")
        desktop.focus("Fotomill Professional")
        # A typed path: no folder, a file, and one that is there.
        for typed, problem in ((folder / "none", "There is no folder .*none"),
                               (pictures / "a.bmp", ".*a.bmp is not a folder")):
            desktop.key("ctrl+l")
            desktop.type(f"{typed}\n")
            desktop.wait(f"folder-problem {problem}")
            desktop.screenshot("folder-problem")
            desktop.key("space")  # the button leads up
            desktop.wait(rf"listing=0 .*folder={typed.parent}$")
        desktop.key("ctrl+l")
        desktop.type(f"{gone}\n")
        desktop.wait(rf"lines=0 .*listing=0 .*folder={gone}$")
        desktop.key("ctrl+t")
        desktop.wait(r"tabs=2 ")
        desktop.key("ctrl+l")
        desktop.type(f"{pictures}\n")
        desktop.wait(rf"lines=2 .*listing=0 .*folder={pictures}$")
        if os.getuid() != 0:
            closed.chmod(0)
            desktop.key("Home", "Return")
            desktop.wait("folder-problem .*closed cannot be read. Permission denied.")
            closed.chmod(0o700)
            desktop.key("space")
            desktop.wait(rf"lines=2 .*listing=0 .*folder={pictures}$")
        desktop.key("ctrl+q")
        desktop.wait_end()
        # The tab of a folder that is gone is closed.
        gone.rmdir()
        desktop.arguments = []
        desktop.start()
        desktop.wait(rf"tabs=1 .*listing=0 .*folder={pictures}$")


def changes_by_others(folder):
    """The list of a view window and the tree follow the folder; messages go away."""
    pictures = folder / "pictures"
    make_pictures(pictures, ["b.bmp", "d.bmp"])
    with Desktop(folder, pictures, settings=QUIET) as desktop:
        desktop.wait(r"lines=2 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Return")
        desktop.wait(r"view place=1/2 .*b.bmp")
        make_pictures(pictures, ["a.bmp", "c.bmp"])
        desktop.wait("view-list 2/4")
        # The picture of a deleted file stays until another one is chosen.
        (pictures / "b.bmp").unlink()
        desktop.wait("view-list 2/4")
        desktop.focus("View$")
        desktop.key("space")
        desktop.wait(r"view place=2/3 .*c.bmp")
        # Deleting a file that others deleted meanwhile is not about the trash.
        os.kill(desktop.program.pid, signal.SIGSTOP)
        desktop.key("Delete")
        (pictures / "c.bmp").unlink()
        os.kill(desktop.program.pid, signal.SIGCONT)
        desktop.wait("files Deletion of c.bmp done=0 failed=1")
        desktop.wait("prompt failures")
        desktop.focus("Some files failed", native=True)
        desktop.key("Return", "Escape")
        desktop.focus("Fotomill Professional")
        (folder / "new").mkdir()  # beside the folder shown, in the tree
        desktop.wait(rf"tree-names \d+ {folder}$")
        # A name that is being typed survives a change of the list.
        desktop.key("Home", "F2")
        desktop.settle()
        desktop.type("x")
        make_pictures(pictures, ["0.bmp"])
        desktop.wait(r"lines=3 .*listing=0")
        desktop.type("y")
        desktop.key("Return")
        desktop.wait("files Rename done=1")
        desktop.wait(r"lines=3 .*listing=0 .*focus=xy.bmp")
        assert sorted(os.listdir(pictures)) == ["0.bmp", "d.bmp", "xy.bmp"]
        desktop.key("Left", "Delete")
        desktop.wait("status Deletion of d.bmp")
        desktop.wait("status$")


run(selection_after_undo, place_at_a_start, folders_that_cannot_be_shown, changes_by_others)
