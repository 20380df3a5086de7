#!/usr/bin/env python3
"""The browser and the view window of the real program, by keyboard."""
import os
import re
import signal
import time

from driven_desktop import Desktop, Failure, gif_of_frames, make_pictures, run

NAMES = ["a1.bmp", "a2.png", "a10.jpg", "b.tif"]


def register_programs(home, marker):
    """Programs for PNG files: the user's default, which creates a file; another one; one for
    terminals; a removed one."""
    data = home / ".local/share"
    (data / "applications").mkdir(parents=True)
    (home / ".config").mkdir(exist_ok=True)
    (data / "mime").mkdir()
    (data / "mime/globs2").write_text("50:image/png:*.png\n")
    for name, more in (("Another", ""), ("Console", "Terminal=true\n"), ("Marker", ""),
                       ("Unwanted", "")):
        (data / f"applications/{name}.desktop").write_text(
            f"[Desktop Entry]\nType=Application\nName={name}\nExec=touch {marker} %F\n"
            f"MimeType=image/png;\n{more}")
    (data / "applications/mimeinfo.cache").write_text(
        "[MIME Cache]\nimage/png=Another.desktop;Console.desktop;Marker.desktop;Unwanted.desktop;\n")
    (home / ".config/mimeapps.list").write_text(
        "[Default Applications]\nimage/png=Marker.desktop\n[Removed Associations]\nimage/png=Unwanted.desktop;\n")


def open_select_view(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, NAMES)
    (pictures / "broken.gif").write_bytes(b"GIF89a and no more")
    (pictures / "sub").mkdir()
    register_programs(folder / "home", folder / "opened")
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"browser tabs=1 lines=6 items=6 selected=0 missing=0 listing=0")
        desktop.screenshot("browser")
        desktop.focus("Fotomill Professional")
        # Natural sort order: a1, a2, a10.
        desktop.key("Home", "Right", "Right")
        desktop.wait(r"selected=1 .*focus=a2.png")
        desktop.key("shift+Right")
        desktop.wait(r"selected=2 .*focus=a10.jpg")
        desktop.key("ctrl+a")
        desktop.wait(r"selected=6")
        desktop.key("ctrl+i")
        desktop.wait(r"selected=0")
        desktop.key("b", "r")
        desktop.wait(r"selected=1 .*focus=broken.gif")
        # Selected by pattern, and opened with a program registered for PNG files.
        desktop.key("ctrl+s")
        desktop.wait("prompt select")
        desktop.focus("Select by pattern")
        desktop.type("a*")
        desktop.key("Return")
        desktop.wait(r"selected=3 ")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Right", "Right", "shift+F10")
        programs = desktop.wait(r"programs Marker;(.*;|)Another;.*")
        if re.search("Console|Unwanted", programs):
            raise Failure(programs)
        desktop.settle()
        desktop.key("Up", "Right", "Return")
        desktop.wait(r"open-with Marker$")
        end = time.monotonic() + 20
        while not (folder / "opened").exists():
            if time.monotonic() > end:
                raise Failure("the program was not started")
            time.sleep(0.05)
        # Changes in the folder are detected.
        make_pictures(pictures, ["c.bmp"])
        desktop.wait(r"lines=7 .*listing=0 .*focus=a2.png")
        # The tooltip of the file below the pointer.
        window = desktop.focus("Fotomill Professional")
        desktop.xdotool("mousemove", "--window", window, 330, 280)
        desktop.xdotool("mousemove", "--window", window, 335, 285)
        desktop.wait(r"tip ")
        # It does not stay above a dialog.
        desktop.key("ctrl+k")
        desktop.focus("Find command")
        desktop.wait(r"tip hidden")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.xdotool("mousemove", 5, 5)
        desktop.key("ctrl+f")
        desktop.type("a?.")
        desktop.wait(r"lines=0 items=7")
        desktop.key("BackSpace", "asterisk")
        desktop.wait(r"lines=3 items=7")
        desktop.key("Escape")
        desktop.wait(r"lines=7 items=7")
        desktop.key("ctrl+2")
        desktop.wait(r"view=1")
        desktop.screenshot("details")
        # Columns are chosen from a menu; the first optional one is the type.
        desktop.key("ctrl+k")
        desktop.focus("Find")
        desktop.type("columns")
        desktop.key("Return")
        desktop.wait(r"column-menu")
        desktop.settle()
        desktop.key("Down", "Return")
        desktop.wait(r"columns Name:\d+,-Type:\d+,Size")
        desktop.screenshot("columns")
        desktop.key("ctrl+5")
        desktop.wait(r"missing=0 .*view=4")
        desktop.key("Home", "Right", "Return")
        desktop.wait(r"view place=1/6 .*status=0 .*a1.bmp")
        desktop.focus("View")
        desktop.key("space")
        desktop.wait(r"view place=2/6 .*status=0 .*a2.png")
        # Each display option reloads the picture; zooming does not.
        for key, look in (("m", "profiles=0 checkerboard=0"), ("b", "profiles=0 checkerboard=1")):
            desktop.key(key)
            desktop.wait(f"view-look {look} keepzoom=0")
            desktop.wait(r"view place=2/6 .*status=0 .*a2.png")
        desktop.key("k", "a", "plus", "i")
        desktop.wait(r"view-painted 125% .*a2.png")
        desktop.screenshot("view")
        desktop.key("space")
        desktop.wait(r"view-painted 125% .*a10.jpg")
        desktop.key("k", "space")
        desktop.wait(r"view-look profiles=0 checkerboard=1 keepzoom=0")
        desktop.wait(r"view-painted 100% .*b.tif")
        desktop.key("End")
        desktop.wait(r"view place=6/6 .*c.bmp")
        desktop.key("BackSpace", "BackSpace")
        desktop.wait(r"view place=4/6 .*status=2 .*broken.gif|view place=4/6 .*b.tif")
        desktop.key("Escape")
        desktop.wait(r"browser .*selected=1 ")
        desktop.focus("Fotomill Professional")
        # Each folder keeps its view settings, also for the next run.
        desktop.key("ctrl+5", "Home", "Return")
        desktop.wait(r"listing=0 view=4 .*/sub$")
        desktop.key("ctrl+1")
        desktop.wait(r"view=0 .*/sub$")
        desktop.key("alt+Up")
        desktop.wait(r"listing=0 view=4 .*/pictures$")
        desktop.key("ctrl+d")
        desktop.wait(r"favorites 1")
        # The menu of visited folders, and a typed path with completion.
        desktop.key("alt+Down")
        desktop.wait(r"folder-menu 3")
        desktop.settle()
        desktop.key("Down", "Down", "Return")
        desktop.wait(r"listing=0 view=0 .*/sub$")
        desktop.key("alt+Up")
        desktop.wait(r"listing=0 view=4 .*/pictures$")
        desktop.key("ctrl+l", "End")
        desktop.wait(r"completions ")
        desktop.type("/")
        desktop.wait(r"completions 1$")
        desktop.type("s\n")
        desktop.wait(r"listing=0 view=0 .*/sub$")
        desktop.key("ctrl+q")
        desktop.wait_end()
        assert "-Type:" in (desktop.data / "MyDefaultTabs.fmwtabset").read_text()
        desktop.arguments = [str(pictures / "sub")]
        desktop.start()
        desktop.wait(r"tabs=1 .*listing=0 view=0 .*/sub$")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()


def compare(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.png", "c.jpg"])
    (pictures / "d.gif").write_bytes(b"GIF89a and no more")
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"browser .*items=4 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a")
        desktop.wait(r"selected=4")
        desktop.key("ctrl+shift+Return")
        for pane in (r"1/4 status=0 .*a.bmp", r"2/4 status=0 .*b.png", r"3/4 status=0 .*c.jpg",
                     r"4/4 status=3 .*d.gif"):
            desktop.wait("compare pane=" + pane)
        desktop.focus("Compare")
        # Linked panes zoom together, others separately.
        desktop.key("plus")
        desktop.wait(r"compare-zoom joined=1 125% 125% 125%")
        desktop.key("j", "Tab")
        desktop.wait(r"compare-focus 2/4")
        desktop.key("1")
        desktop.wait(r"compare-zoom joined=0 125% 100% 125%")
        desktop.key("shift+Tab", "3", "j")
        desktop.wait(r"compare-focus 1/4")
        desktop.wait(r"compare-zoom joined=1 (\d+%) \1 \1")
        desktop.screenshot("compare")
        # Modified files are reloaded.
        with (pictures / "c.jpg").open("ab") as file:
            file.write(b"more")
        desktop.focus("Fotomill Professional")
        desktop.key("F5")
        desktop.wait(r"compare pane=3/4 status=0 .*c.jpg")
        desktop.focus("Compare")
        desktop.key("Tab", "Tab", "Delete")
        desktop.wait(r"files Deletion of c.jpg done=1")
        desktop.wait(r"compare-focus 3/3")
        if (pictures / "c.jpg").exists():
            raise Failure("c.jpg is still there")
        for name in ("d.gif", "b.png", "a.bmp"):  # closing the last pane closes the window
            desktop.key("Delete")
            desktop.wait(f"files Deletion of {name} done=1")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()


def play_animation(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["b.bmp"])
    (pictures / "a.gif").write_bytes(gif_of_frames([30] * 5))
    (folder / "data").mkdir()
    (folder / "data/FMWSlideshow.txt").write_text("[Slideshow]\nSeconds=1\nRepeat=0\n")
    with Desktop(folder, pictures / "a.gif") as desktop:
        for frame in (1, 2, 3, 4, 5, 1):
            desktop.wait(rf"view-frame frame {frame} of 5$")
        desktop.focus("View", settle=False)
        desktop.key("space")
        paused = int(desktop.wait(r"view-frame frame . of 5, paused").split()[2])
        desktop.screenshot("animation")
        desktop.key("period")
        desktop.wait(rf"view-frame frame {paused % 5 + 1} of 5, paused")
        desktop.key("comma", "comma")
        desktop.wait(rf"view-frame frame {(paused + 3) % 5 + 1} of 5, paused")
        desktop.key("space")
        desktop.wait(r"view-frame frame 1 of 5$")
        # A slideshow waits for long animations to play once, and ends with the last picture.
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Return")
        desktop.wait(r"view-frame frame 1 of 5$")
        desktop.focus("View", settle=False)
        desktop.key("s")
        desktop.wait(r"slideshow seconds=1 random=0 repeat=0")
        desktop.wait(r"view-frame frame 5 of 5$")
        desktop.wait(r"view place=2/2 ")
        desktop.wait(r"slideshow ended")
    # If animations are disabled on the system, it only starts on request.
    (folder / "home/.config/gtk-3.0").mkdir(parents=True, exist_ok=True)
    (folder / "home/.config/gtk-3.0/settings.ini").write_text("[Settings]\ngtk-enable-animations=0\n")
    with Desktop(folder, pictures / "a.gif") as desktop:
        desktop.wait(r"view-frame frame 1 of 5, paused")
        # The frame is behind the picture and would take the focus. It may be painted first.
        desktop.seen = 0
        desktop.wait(r"painted-files")
        desktop.focus("View")
        desktop.key("space")
        desktop.wait(r"view-frame frame 2 of 5$")


def side_pane(folder):
    """Follows the focus, and comes back with its width."""
    pictures = folder / "pictures"
    make_pictures(pictures, NAMES)
    (pictures / "broken.gif").write_bytes(b"GIF89a and no more")
    (pictures / "sub").mkdir()
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"browser tabs=1 lines=6 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Right", "F3")
        desktop.wait(r"side-pane shown")
        desktop.wait(r"side .*/a1.bmp preview=\d\d+x\d\d+$")
        desktop.key("Right")
        desktop.wait(r"side .*/a2.png preview=\d\d+x\d\d+$")
        desktop.screenshot("side-pane")
        desktop.key("End")
        desktop.wait(r"side .*/broken.gif preview=0x0 remark=\S+")
        desktop.screenshot("side-pane-broken")
        desktop.key("Home")
        desktop.wait(r"side .*/sub preview=0x0$")
        desktop.key("ctrl+q")
        desktop.wait_end()
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"side-pane shown")
        desktop.wait(r"side .*/sub ")
        desktop.focus("Fotomill Professional")
        desktop.key("F3")
        desktop.wait(r"side-pane hidden")
        desktop.key("ctrl+q")
        desktop.wait_end()
    text = (folder / "data/Fotomill Professional 11.ini").read_text()
    assert "SidePaneEnable=0\n" in text, text


def view_window(folder):
    """One window is reused; its bar; full screen; notes about files."""
    pictures = folder / "pictures"
    make_pictures(pictures, NAMES)
    whole = (pictures / "a10.jpg").read_bytes()
    (pictures / "c-cut.jpg").write_bytes(whole[:len(whole) * 2 // 3])
    (pictures / "d-wrong.gif").write_bytes((pictures / "a2.png").read_bytes())
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"browser tabs=1 lines=6 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "Return")
        desktop.wait(r"view place=1/6 .*a1.bmp")
        window = desktop.focus("View$")
        desktop.wait(r"view-painted .*a1.bmp", again=True)
        desktop.xdotool("mousemove", "--window", window, 400, 300)
        desktop.xdotool("mousemove", "--window", window, 405, 305)
        desktop.wait(r"view-bar shown")
        desktop.screenshot("view-bar")
        desktop.wait(r"view-bar hidden")
        desktop.focus("Fotomill Professional")
        desktop.key("End", "Return")
        desktop.wait(r"view place=6/6 .*d-wrong.gif")
        desktop.wait(r"view-note .*")
        assert desktop.log_text().count("view-window") == 1, desktop.log_text()
        desktop.focus("View$")
        desktop.screenshot("view-note")
        desktop.key("p")
        desktop.wait(r"view place=5/6 .*status=0 .*c-cut.jpg")
        desktop.wait(r"view-note The file is damaged or incomplete")
        desktop.screenshot("view-damaged")
        desktop.key("F11")
        desktop.settle()
        desktop.xdotool("mousemove", 640, 400)
        desktop.xdotool("mousemove", 645, 405)
        desktop.wait(r"view-bar shown")
        desktop.screenshot("view-full-screen")
        desktop.key("Escape")
        desktop.settle()
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "ctrl+Return")
        desktop.wait(r"view place=1/6 .*a1.bmp")
        desktop.focus("a1.bmp - View$")
        # The menus run the same commands: the last picture.
        desktop.key("alt+g", "l")
        desktop.wait(r"view place=6/6 .*d-wrong.gif")
        assert desktop.log_text().count("view-window another") == 1, desktop.log_text()


def sizes_and_groups(folder):
    """Sizes of thumbnails, groups, subfolders, and cells of files that cannot be shown."""
    pictures = folder / "pictures"
    make_pictures(pictures, NAMES)
    make_pictures(pictures / "sub", ["c.bmp"])
    (pictures / "damaged.gif").write_bytes(b"GIF89a and no more")
    (pictures / "unknown.avi").write_bytes(b"RIFF....AVI ")
    for number, name in enumerate(NAMES):
        stamp = 1_600_000_000 + 40 * 86400 * number
        os.utime(pictures / name, (stamp, stamp))
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"browser tabs=1 lines=7 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "ctrl+plus", "ctrl+plus", "ctrl+plus")
        desktop.wait(r"thumbnail-side 256")
        desktop.wait(r"browser .*missing=0 .*view=4")
        desktop.screenshot("large-thumbnails")
        desktop.key("ctrl+4")
        desktop.wait(r"browser .*missing=0 .*view=3")
        desktop.key("ctrl+k")
        desktop.focus("^Find command$")
        desktop.type("group by month")
        desktop.key("Return")
        desktop.wait(r"groups [56]$")
        desktop.focus("Fotomill Professional")
        desktop.screenshot("groups")
        desktop.key("ctrl+k")
        desktop.focus("^Find command$")
        desktop.type("include subfolders")
        desktop.key("Return")
        desktop.wait(r"browser .*lines=7 items=7 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("c")
        desktop.wait(r"focus=sub/c.bmp")
        desktop.key("Return")
        desktop.wait(r"view place=\d/7 .*sub/c.bmp")
        desktop.focus("View$")
        desktop.key("n")
        desktop.wait(r"view place=")
        desktop.key("p")
        desktop.wait(r"view place=.*sub/c.bmp")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+2")
        desktop.wait(r"browser .*view=1")
        make_pictures(pictures, ["new.bmp"])  # the others have thumbnails by now
        desktop.wait(r"details-icons ")
        desktop.screenshot("details-icons")
        desktop.key("ctrl+q")
        desktop.wait_end()
    text = (folder / "data/Fotomill Professional 11.ini").read_text()
    assert "BrowserGrouping=2\n" in text, text


def menu_of_empty_space(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.bmp"])
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"browser .*lines=2 .*listing=0")
        window = desktop.focus("Fotomill Professional")
        desktop.xdotool("mousemove", "--window", window, 900, 600)
        for keys in (("Up", "Right", "Down", "Down", "Return"), ("Up", "Right", "Up", "Return")):
            desktop.xdotool("click", 3)
            desktop.wait(r"folder-commands")
            desktop.settle()
            desktop.key(*keys)
            desktop.settle()
        # Sorted by size, in descending order.
        desktop.key("Home")
        desktop.wait(r"browser .*sort=2 .*focus=b.bmp")


def later_starts(folder):
    pictures, other = folder / "pictures", folder / "other"
    make_pictures(pictures, NAMES)
    make_pictures(other, ["c.bmp"])
    with Desktop(folder, pictures / "a2.png") as desktop:
        # A file is shown at once; its neighbors are known when the folder has been listed.
        desktop.wait(r"view place=1/1 .*status=0 .*a2.png")
        desktop.wait(r"view-list 2/4")
        later = desktop.start_again(other)
        desktop.wait(r"taken-over .*other$")
        assert later.wait(30) == 0
        desktop.wait(r"browser tabs=2 lines=1 .*listing=0 .*folder=.*other$")
        desktop.focus("Fotomill Professional")
        # Removes a toolbar button.
        desktop.key("ctrl+k")
        desktop.wait(r"finder found=")
        desktop.focus("^Find command$")
        desktop.type("tools toolbar")
        desktop.wait(r"finder found=1$")
        desktop.key("Return")
        desktop.wait(r"prompt toolbar")
        desktop.focus("^Toolbar$")
        desktop.screenshot("toolbar")
        # every command is offered, at the end those without a button
        desktop.key("space", "End", "space", "alt+o")
        desktop.wait(r"toolbar view convert .* Help/About$")
        desktop.focus("Fotomill Professional")
        for keys, name in (("ctrl+Tab", "pictures"), ("ctrl+shift+Tab", "other")):
            desktop.key(keys)
            desktop.wait(rf"browser tabs=2 .*folder=.*{name}$")
        own = desktop.start_again("--new-instance", other)
        desktop.wait(r"browser tabs=1 lines=1 .*listing=0 .*folder=.*other$")
        own.terminate()
        own.wait()
        # A hanging instance does not block others, and does not repeat later what they have done
        # meanwhile.
        desktop.program.send_signal(signal.SIGSTOP)
        later = desktop.start_again(other)
        desktop.wait(r"browser tabs=1 lines=1 .*listing=0 .*folder=.*other$")
        desktop.program.send_signal(signal.SIGCONT)
        later.terminate()
        later.wait()
        # A killed instance leaves nothing in the way.
        desktop.program.kill()
        desktop.program.wait()
        assert "taken-over" not in desktop.log_text()[desktop.seen:]
        desktop.start()
        desktop.wait(r"^frame$")
        later = desktop.start_again(other)
        desktop.wait(r"taken-over .*other$")
        assert later.wait(30) == 0


def rate_and_label(folder):
    """Stars and labels by keys, in files and sidecars; filtered, and undone."""
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.jpg", "c.png"])
    bitmap = (pictures / "a.bmp").read_bytes()
    with Desktop(folder, pictures) as desktop:
        desktop.wait(r"tags rated=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "ctrl+a", "3")
        desktop.wait(r"files Tags of 3 files done=3 failed=0")
        desktop.wait(r"tags rated=3")
        assert (pictures / "a.bmp").read_bytes() == bitmap
        assert b"<xmp:Rating>3<" in (pictures / "a.bmp.xmp").read_bytes()
        assert b"<xmp:Rating>3<" in (pictures / "b.jpg").read_bytes()
        rated = (pictures / "c.png").read_bytes()
        desktop.key("End", "5")
        desktop.wait(r"files Tags of c.png done=1 failed=0")
        five = (pictures / "c.png").read_bytes()
        desktop.key("6")
        desktop.wait(r"files Tags of c.png done=1 failed=0")
        desktop.wait(r"tags rated=3")
        red = (pictures / "c.png").read_bytes()
        assert b"<xmp:Label>Red<" in red
        desktop.screenshot("rated")
        # Both changes of the file go back and come again.
        for key, expected in (("z", five), ("z", rated), ("y", five), ("y", red)):
            desktop.key(f"ctrl+{key}")
            desktop.wait(r"files (Undo|Redo) .* done=1 failed=0")
            desktop.wait(r"tags rated=3")
            assert (pictures / "c.png").read_bytes() == expected, key
        # The choice is the neighbor of the filter. The files have the focus after it.
        desktop.key("ctrl+f", "shift+Tab", "space")
        desktop.wait(r"tag-menu")
        desktop.settle()
        desktop.key("Down", "Down", "Down", "Down", "Down", "Down", "Return")
        desktop.wait(r"tag-filter 5 lines=1")
        desktop.screenshot("filtered")
        # A file that is changed stays in the list, with focus and selection.
        start = len(desktop.log_text())
        desktop.key("End", "7")
        desktop.wait(r"files Tags of c.png done=1 failed=0")
        desktop.wait(r"tags rated=3")
        assert "lines=0" not in desktop.log_text()[start:]
        assert "selected=0" not in desktop.log_text()[start:]
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo .* done=1 failed=0")
        desktop.wait(r"tags rated=3")
        desktop.key("End", "Return")
        desktop.wait(r"view place=1/1 .*c.png")
        rate_in_the_view_window(desktop, pictures / "c.png")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+f", "shift+Tab", "space")
        desktop.wait(r"tag-menu")
        desktop.settle()
        desktop.key("Down", "Return")
        desktop.wait(r"tag-filter 0 lines=3")
        desktop.key("Home", "ctrl+z")
        desktop.wait(r"files Undo .* done=1 failed=0")
        desktop.key("Home", "0")
        desktop.wait(r"files Tags of a.bmp done=1 failed=0")
        assert (pictures / "a.bmp").read_bytes() == bitmap
        desktop.key("ctrl+q")
        desktop.wait_end()


def rate_in_the_view_window(desktop, picture):
    """Rates and comments a picture of 5 stars, and undoes it there."""
    desktop.focus("View$")
    before = picture.read_bytes()
    desktop.key("9")
    desktop.wait(r"files Tags of c.png done=1 failed=0")
    desktop.wait(r"view place=1/1 .*c.png")
    assert b"<xmp:Label>Blue<" in picture.read_bytes()
    desktop.key("t")
    desktop.wait(r"prompt comment")
    desktop.focus("^Comment$", native=True)
    desktop.type("A pier at dusk")
    desktop.screenshot("comment")
    desktop.key("alt+o")
    desktop.wait(r"files Tags of c.png done=1 failed=0")
    desktop.wait(r"view place=1/1 .*c.png")
    assert b"A pier at dusk" in picture.read_bytes()
    desktop.focus("View$")
    desktop.screenshot("view-rated")
    for _ in range(2):
        desktop.key("ctrl+z")
        desktop.wait(r"files Undo .* done=1 failed=0")
        desktop.wait(r"view place=1/1 .*c.png")
    assert picture.read_bytes() == before
    desktop.key("Escape")


def jump(folder):
    """The jump window finds by words, shows what it finds, and selects it."""
    pictures = folder / "pictures"
    make_pictures(pictures, ["beach-night.bmp", "beach-noon.bmp", "city-night.bmp", "other.bmp"])
    with Desktop(folder, pictures, settings=["JumpWindowHotKey=71"]) as desktop:
        desktop.wait(r"lines=4 .*missing=0 listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("Home", "ctrl+j")
        desktop.wait(r"prompt jump")
        desktop.focus("^Jump to File$")
        desktop.type("ni bea")
        desktop.wait(r"jump 1 beach-night.bmp")
        desktop.key("ctrl+a")
        desktop.type("night")
        desktop.wait(r"jump 2 beach-night.bmp")
        desktop.screenshot("jump")
        desktop.key("Down")
        desktop.wait(r"jump 2 city-night.bmp")
        desktop.key("Return")
        desktop.wait(r"selected=1 .* focus=city-night.bmp")
        # The other key; within words; Escape leaves the selection alone.
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+shift+g")
        desktop.wait(r"jump 2 beach-night.bmp")
        desktop.focus("^Jump to File$")
        desktop.key("ctrl+a")
        desktop.type("the")
        desktop.wait(r"jump 0 -")
        desktop.key("alt+w")
        desktop.wait(r"jump 1 other.bmp")
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+q")
        desktop.wait_end()
        assert "focus=other" not in desktop.log_text()
        stored = (desktop.data / "Fotomill Professional 11.ini").read_text()
        assert "JumpWindowSearchStart=0" in stored and "JumpWindowSearchTerm=the" in stored


def order_and_tabs(folder):
    """The order's buttons in the bar; the strip of tabs is there for several tabs only."""
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.png", "c.bmp"])
    (pictures / "b.png").write_bytes((pictures / "b.png").read_bytes() + bytes(100000))
    with Desktop(folder, pictures, settings=["UpdateThumbnailsFlag=0"]) as desktop:
        desktop.wait(r"tab-strip 0")
        desktop.wait(r"lines=3 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("shift+Tab", "shift+Tab", "space", "Escape", "Home")
        desktop.wait(r"selected=1 .*sort=0 .*focus=c.bmp")
        desktop.key("shift+Tab", "shift+Tab", "shift+Tab", "space")
        desktop.wait(r"order-menu 6")
        desktop.key("Down", "Down", "Down", "Return")
        desktop.wait(r"sort=2 ")
        desktop.key("Home")
        desktop.wait(r"selected=1 .*sort=2 .*focus=b.png")
        desktop.key("ctrl+t")
        desktop.wait(r"tab-strip -1")
        desktop.wait(r"browser tabs=2 .*listing=0")
        desktop.screenshot("tabs")
        desktop.key("ctrl+w")
        desktop.wait(r"tab-strip 0")


run(open_select_view, jump, rate_and_label, side_pane, view_window, sizes_and_groups, compare,
    play_animation, menu_of_empty_space, later_starts, order_and_tabs)
