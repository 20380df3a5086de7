#!/usr/bin/env python3
"""File operations of the real program and their undo; thumbnail files; session restore."""
import os

from driven_desktop import Desktop, make_pictures, run


def names(folder):
    return sorted(path.name for path in folder.iterdir())


def rename_delete_undo_paste(folder):
    pictures, other = folder / "pictures", folder / "other"
    make_pictures(pictures, ["a.bmp", "b.bmp"])
    other.mkdir()
    with Desktop(folder, pictures, settings=["UpdateThumbnailsFlag=0"]) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        # The base name is selected: typing replaces it and keeps the extension.
        desktop.key("Home", "F2")
        desktop.type("zebra")
        desktop.key("Return")
        desktop.wait(r"files Rename done=1 failed=0")
        desktop.wait(r"lines=2 .*listing=0 .*focus=zebra.bmp")
        assert names(pictures) == ["b.bmp", "zebra.bmp"], names(pictures)
        desktop.key("Delete")
        desktop.wait(r"files Deletion of zebra.bmp done=1")
        desktop.wait(r"lines=1 .*focus=b.bmp")
        assert names(pictures) == ["b.bmp"]
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo deletion of zebra.bmp done=1")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo rename of a.bmp done=1")
        desktop.wait(r"listed 2")
        assert names(pictures) == ["a.bmp", "b.bmp"], names(pictures)
        # Copy and paste between folders; within one folder, copies get the prefix for duplicates.
        desktop.key("ctrl+a", "ctrl+c", "ctrl+v")
        desktop.wait(r"files Copy of 2 files done=2 failed=0")
        assert names(pictures) == ["Duplicate of a.bmp", "Duplicate of b.bmp", "a.bmp",
                                   "b.bmp"], names(pictures)
        desktop.key("ctrl+l")
        desktop.type(str(other) + "\n")
        desktop.wait(r"lines=0 .*listing=0 .*folder=.*other$")
        desktop.key("ctrl+v")
        desktop.wait(r"files Copy of 2 files done=2 failed=0")
        assert names(other) == ["a.bmp", "b.bmp"]
        desktop.wait(r"lines=2 .*listing=0 .*folder=.*other$")
        desktop.key("alt+Left")
        desktop.wait(r"lines=4 .*listing=0 .*folder=.*pictures$")
        # A clipboard picture is pasted as a file, and undone.
        desktop.key("Home", "Return")
        desktop.wait(r"view place=1/4 .*status=0 .*/a.bmp")
        desktop.focus("View$")
        desktop.key("ctrl+c", "Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+v")
        desktop.wait(r"files Paste done=1 failed=0")
        assert "Picture from clipboard.png" in names(pictures), names(pictures)
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo output of Picture from clipboard.png done=1")
        desktop.wait(r"lines=4 .*listing=0")
        # Deleting a file in the view window shows the next one.
        desktop.key("Home", "Return")
        desktop.wait(r"view place=1/4 .*status=0 .*/a.bmp")
        desktop.focus("View$")
        desktop.key("Delete")
        desktop.wait(r"files Deletion of a.bmp done=1")
        desktop.wait(r"view place=1/3 .*status=0 .*/b.bmp")
        assert names(pictures) == ["Duplicate of a.bmp", "Duplicate of b.bmp",
                                   "b.bmp"], names(pictures)


def names_that_are_not_utf8(folder):
    """Such a folder from the command line, such files from the clipboard."""
    pictures, other = os.fsencode(folder) + b"/caf\xe9", folder / "other"
    os.mkdir(pictures)
    make_pictures(folder / "made", ["a.bmp", "b.bmp"])
    other.mkdir()
    os.rename(folder / "made/a.bmp", pictures + b"/na\xefve.bmp")
    os.rename(folder / "made/b.bmp", pictures + b"/p%20 q#.bmp")
    with Desktop(folder, os.fsdecode(pictures), settings=["UpdateThumbnailsFlag=0"]) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+c")
        desktop.key("ctrl+l")
        desktop.type(str(other) + "\n")
        desktop.wait(r"lines=0 .*listing=0 .*folder=.*other$")
        desktop.key("ctrl+v")
        desktop.wait(r"files Copy of 2 files done=2 failed=0")
        assert sorted(os.listdir(os.fsencode(other))) == [b"na\xefve.bmp",
                                                          b"p%20 q#.bmp"], os.listdir(other)


def rename_in_sequence(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.bmp", "c.bmp"])
    with Desktop(folder, pictures, settings=["UpdateThumbnailsFlag=0"]) as desktop:
        desktop.wait(r"lines=3 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "shift+F2")
        desktop.wait(r"prompt sequential-rename")
        desktop.focus("^Sequential Rename$")
        desktop.key("ctrl+a")
        desktop.type("beach")
        desktop.screenshot("sequential-rename")
        desktop.key("Return")
        desktop.wait(r"batch ended")
        desktop.wait(r"listed 3")
        assert names(pictures) == ["beach0001.bmp", "beach0002.bmp",
                                   "beach0003.bmp"], names(pictures)
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo rename of 3 files done=3")
        assert names(pictures) == ["a.bmp", "b.bmp", "c.bmp"], names(pictures)
        # With the number in front the base name has no part in it, whatever it is.
        desktop.key("ctrl+a", "shift+F2")
        desktop.wait(r"prompt sequential-rename")
        desktop.focus("^Sequential Rename$")
        desktop.key("ctrl+a")
        desktop.type("no/name")
        desktop.key("alt+p", "Return")
        desktop.wait(r"batch ended")
        renamed = [name[4:] for name in names(pictures)]
        assert renamed == ["a.bmp", "b.bmp", "c.bmp"], renamed
        ini = (desktop.data / "Fotomill Professional 11.ini").read_text()
        assert "SequentialRenameBaseName=beach\n" in ini, ini
        # By a pattern, with a preview from the files.
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "shift+F2")
        desktop.wait(r"prompt sequential-rename")
        desktop.focus("^Sequential Rename$")
        desktop.key("alt+a", "ctrl+a")
        desktop.type("%W x %H no %02c")
        desktop.wait(r"rename-preview 3 failed=0")
        desktop.screenshot("rename-pattern")
        desktop.key("Return")
        desktop.wait(r"batch ended")
        found = names(pictures)
        assert [name[-9:] for name in found] == [f"no {i:02}.bmp" for i in (1, 2, 3)], found


# From the list to the bar above it, and there to its first button.
TO_KEEP = ["shift+Tab"] * 4 + ["Return"]


def thumbnails_and_session(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.bmp"])
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"offer 2")
        desktop.focus("Fotomill Professional")
        desktop.screenshot("update-thumbnails")
        desktop.key(*TO_KEEP)
        desktop.wait(r"offer-ended changed")
        assert (pictures / "a.THN").stat().st_size == 27912
        desktop.key("ctrl+5", "ctrl+t")
        desktop.wait(r"browser tabs=2 .*view=4")
        desktop.key("Home", "Right")
        desktop.wait(r"focus=b.bmp")
        desktop.key("ctrl+k")
        desktop.focus("Find")
        desktop.type("save tabs")
        desktop.key("Return")
        desktop.wait(r"prompt tab-set-name")
        desktop.focus("Save tabs")
        desktop.type("work")
        desktop.key("Return")
        desktop.wait(r"tab-set saved work")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()
        desktop.arguments = []
        desktop.start()
        desktop.wait(r"browser tabs=2 lines=2 .*listing=0 view=4 .*focus=b.bmp folder=.*pictures$")
        assert (desktop.data / "work.fmwtabset").read_text().count("[Tab]") == 2


def turn_and_take_back(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.jpg"])
    paths = [pictures / "a.bmp", pictures / "b.jpg"]
    before = [path.read_bytes() for path in paths]
    def changed():
        return [path.read_bytes() != old for path, old in zip(paths, before)]

    with Desktop(folder, pictures, settings=["UpdateThumbnailsFlag=0"]) as desktop:
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Return")
        desktop.wait(r"view place=1/2 .*status=0 .*a.bmp")
        desktop.focus("View$")
        # A rotation affects only the view until it is saved.
        desktop.key("r", "space")
        desktop.wait(r"view-turned 6 .*a.bmp")
        desktop.wait(r"view place=2/2 .*b.jpg")
        desktop.key("BackSpace", "l")
        desktop.wait(r"view-turned 8 .*a.bmp")
        desktop.screenshot("view-turned")
        assert changed() == [False, False], changed()
        desktop.key("ctrl+s")
        desktop.wait(r"files Rotation of a.bmp done=1 failed=0")
        desktop.wait(r"view place=1/2 .*status=0 .*a.bmp")
        old, new = before[0], paths[0].read_bytes()
        assert (old[18:22], old[22:26]) == (new[22:26], new[18:22]), "sides did not change places"
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo rotation of a.bmp done=1 failed=0")
        desktop.wait(r"view place=1/2 .*status=0 .*a.bmp")
        assert changed() == [False, False], changed()
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+alt+r")
        desktop.wait(r"batch ended status=0")
        desktop.wait(r"lines=2 .*missing=0 listing=0")
        assert changed() == [True, True], changed()
        desktop.screenshot("browser-turned")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo rotation of 2 files done=2 failed=0")
        assert changed() == [False, False], changed()
        desktop.key("ctrl+y")
        desktop.wait(r"files Redo rotation of 2 files done=2 failed=0")
        assert changed() == [True, True], changed()
        # Another undo leaves a file alone that was modified since.
        paths[1].write_bytes(paths[1].read_bytes() + b"more")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo rotation of 2 files done=1 failed=1")
        assert changed() == [False, True], changed()
        desktop.focus("Some files failed", native=True)
        desktop.key("Return")


def search_results_in_a_tab(folder):
    """Found files of several folders in one tab, on which functions work."""
    pictures = folder / "pictures"
    make_pictures(pictures, ["tree.bmp", "sea1.bmp"])
    (pictures / "deep").mkdir()
    make_pictures(pictures / "deep/er", ["sea2.bmp", "hill.bmp"])
    with Desktop(folder, pictures,
                 settings=["UpdateThumbnailsFlag=0", "DestForceSourceDir=1",
                           "WarnDestinationWrite=0", "DefaultFileExtension=png"]) as desktop:
        desktop.wait(r"lines=3 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+shift+f")
        desktop.wait(r"prompt search")
        desktop.focus("Find pictures")
        desktop.key("ctrl+a")
        desktop.type("sea*")
        desktop.screenshot("search")
        desktop.key("Return")
        desktop.wait(r"search found=2 examined=4$")
        desktop.wait(r"tabs=2 lines=2 .*missing=0 listing=0 .*folder=.*pictures$")
        desktop.focus("Find pictures")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.screenshot("search-results")
        desktop.key("Home", "ctrl+a", "4")
        desktop.wait(r"files Tags of 2 files done=2 failed=0")
        desktop.wait(r"tags rated=2")
        assert b"<xmp:Rating>4<" in (pictures / "deep/er/sea2.bmp.xmp").read_bytes()
        desktop.key("ctrl+e")
        desktop.wait(r"prompt destination")
        desktop.focus("^Convert$")
        desktop.key("Return")
        desktop.wait(rf"batch-line {pictures}/deep/er/sea2.bmp -> {pictures}/deep/er/sea2.png")
        desktop.wait(r"batch ended status=0")
        desktop.focus("Fotomill Professional")
        # Copies go where those of the last search went.
        (folder / "found").mkdir()
        desktop.key("Home", "ctrl+a", "F7")
        desktop.wait(r"prompt folder")
        desktop.focus("^Copy 2 files to$")
        desktop.key("ctrl+a")
        desktop.type(str(folder / "found"))
        desktop.key("Return")
        desktop.wait(r"files Copy of 2 files done=2 failed=0")
        copies = sorted(path.name for path in (folder / "found").glob("*.bmp"))
        assert copies == ["sea1.bmp", "sea2.bmp"], copies
        stored = (desktop.data / "Fotomill Professional 11.ini").read_text()
        assert f"PictureSearchDestination={folder}/found" in stored
        assert (desktop.data / "FMWPicturesearchHistory.txt").read_text() == f"{pictures}\n"
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "F2")
        desktop.type("ocean")
        desktop.key("Return")
        desktop.wait(r"files Rename done=1 failed=0")
        desktop.wait(r"tabs=2 lines=2 .*selected=1 .*listing=0 .*focus=deep/er/ocean.bmp")
        assert (pictures / "deep/er/ocean.bmp").exists()
        desktop.key("ctrl+a", "Delete")
        desktop.wait(r"files Deletion of 2 files done=2")
        desktop.wait(r"tabs=2 lines=0 ")
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo deletion of 2 files done=2")
        desktop.wait(r"tabs=2 lines=2 ")
        assert (pictures / "sea1.bmp").exists()


def delete_for_good(folder):
    """The question shows thumbnails; Enter and Escape keep the files."""
    pictures = folder / "pictures"
    make_pictures(pictures, [f"{i}.bmp" for i in range(7)])
    settings = ["UpdateThumbnailsFlag=0", "DeleteShowPreview=1"]
    with Desktop(folder, pictures, settings=settings) as desktop:
        desktop.wait(r"lines=7 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        for answer in ("Escape", "Return", "alt+d"):
            desktop.key("ctrl+a", "shift+Delete")
            desktop.wait(r"prompt delete")
            desktop.wait(r"delete-previews 5")
            desktop.focus("^Delete$")
            if answer == "Return":
                desktop.screenshot("delete")
            assert len(names(pictures)) == 7
            desktop.key(answer)
            if answer == "alt+d":
                desktop.wait(r"lines=0 .*listing=0")
            desktop.focus("Fotomill Professional")
        assert names(pictures) == []


run(search_results_in_a_tab, rename_delete_undo_paste, names_that_are_not_utf8,
    rename_in_sequence, thumbnails_and_session, turn_and_take_back, delete_for_good)
