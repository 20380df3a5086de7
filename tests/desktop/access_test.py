#!/usr/bin/env python3
"""Accessibility of the real program: every control that takes the focus has a name, and is reached
with Tab."""
import os
import re
import subprocess
import sys
import time
from pathlib import Path

try:
    from gi.repository import Gio, GLib
except ImportError:
    # the system's bindings require its own Python
    if sys.executable != "/usr/bin/python3" and Path("/usr/bin/python3").exists():
        os.execv("/usr/bin/python3", ["/usr/bin/python3", *sys.argv])
    print("python3-gi is not installed: left out")
    sys.exit(77)

from driven_desktop import BARE, PATIENCE, Desktop, Failure, make_pictures, run

ACCESSIBLE = "org.a11y.atspi.Accessible"
# State bits of the accessibility interface.
ENABLED, FOCUSABLE, FOCUSED, SHOWING, MANAGES_DESCENDANTS = 8, 11, 12, 25, 31
# Scrolled frames pass the focus on to their contents; Tab reaches the selected one of several radio
# buttons.
PASSED_ON = {"scroll pane", "viewport"}
NOT_BY_TAB = PASSED_ON | {"radio button", "menu", "menu item", "check menu item", "radio menu item",
                          "icon"}


class Heard:
    """The current state of one accessible object."""

    def __init__(self, reader, reference):
        self.reader, self.reference = reader, reference
        self.role = reader.call(reference, ACCESSIBLE, "GetRoleName")
        low, high = reader.call(reference, ACCESSIBLE, "GetState")
        self.states = low | high << 32
        self.name = reader.property(reference, "Name")
        self.description = reader.property(reference, "Description")

    def has(self, state):
        return bool(self.states >> state & 1)

    def __repr__(self):
        return f"{self.role} {self.name!r} ({self.description!r})"

    def below(self):
        """All its descendants on the screen."""
        if self.has(MANAGES_DESCENDANTS):
            return
        for child in self.reader.call(self.reference, ACCESSIBLE, "GetChildren"):
            heard = Heard(self.reader, child)
            if heard.has(SHOWING):
                yield heard
                yield from heard.below()


class ReadDesktop(Desktop):
    """The program with its own accessibility bus, and a listener."""

    def start(self):
        del self.environment["NO_AT_BRIDGE"]
        self.bus = subprocess.Popen(["dbus-daemon", "--session", "--print-address=1", "--nofork",
                                     "--nopidfile"], env=self.environment,
                                    stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, text=True)
        self.environment["DBUS_SESSION_BUS_ADDRESS"] = address = self.bus.stdout.readline().strip()
        flags = (Gio.DBusConnectionFlags.AUTHENTICATION_CLIENT
                 | Gio.DBusConnectionFlags.MESSAGE_BUS_CONNECTION)
        session = Gio.DBusConnection.new_for_address_sync(address, flags, None, None)
        try:
            where, = session.call_sync("org.a11y.Bus", "/org/a11y/bus", "org.a11y.Bus",
                                       "GetAddress", None, None, 0, -1, None).unpack()
        except GLib.Error:
            self.bus.terminate()
            print("at-spi2-core is not installed: left out")
            sys.exit(77)
        self.connection = Gio.DBusConnection.new_for_address_sync(where, flags, None, None)
        self.focused = []
        self.connection.signal_subscribe(None, "org.a11y.atspi.Event.Object", "StateChanged", None,
                                         "focused", 0, self.on_focus)
        self.call(("org.a11y.atspi.Registry", "/org/a11y/atspi/registry"),
                  "org.a11y.atspi.Registry", "RegisterEvent",
                  GLib.Variant("(s)", ("object:state-changed:focused",)))
        super().start()

    def __exit__(self, *error):
        super().__exit__(*error)
        self.bus.terminate()
        self.bus.wait()

    def on_focus(self, connection, sender, path, interface, signal, arguments):
        if arguments.unpack()[1]:
            self.focused.append((sender, path))

    def call(self, reference, interface, method, arguments=None):
        answer = self.connection.call_sync(*reference, interface, method, arguments, None, 0, 20000,
                                           None).unpack()
        return answer[0] if len(answer) == 1 else answer

    def property(self, reference, name):
        return self.call(reference, "org.freedesktop.DBus.Properties", "Get",
                         GLib.Variant("(ss)", (ACCESSIBLE, name)))

    def window(self, title):
        """The accessible text of the top window with a title."""
        root = Heard(self, ("org.a11y.atspi.Registry", "/org/a11y/atspi/accessible/root"))
        for program in self.call(root.reference, ACCESSIBLE, "GetChildren"):
            for child in self.call(program, ACCESSIBLE, "GetChildren"):
                window = Heard(self, child)
                if re.search(title + "$", window.name) and window.has(SHOWING):
                    return window
        raise Failure(f"no window {title} is heard of")

    def takers(self, title):
        return [heard for heard in self.window(title).below() if heard.has(FOCUSABLE)
                or heard.role == "combo box"]

    def check(self, title, tab=True):
        """Every control of a window has a name, and Tab reaches each one that is enabled."""
        self.settle()
        takers = self.takers(title)
        nameless = [str(heard) for heard in takers if not heard.name.strip()]
        if not takers or nameless:
            known = [str(heard) for heard in takers]
            raise Failure(f"{title}: of {known} these have no name: {nameless}")
        print(f"{title}: {len(takers)} controls")
        if not tab:
            return
        self.focused.clear()
        end = time.monotonic() + PATIENCE
        missed = takers
        while missed:
            if time.monotonic() > end:
                raise Failure(f"{title}: Tab never comes to {[str(heard) for heard in missed]}")
            self.xdotool("key", "--delay", 5, *["Tab"] * (len(takers) + 2))
            self.settle()
            while GLib.MainContext.default().iteration(False):
                pass
            # A choice is represented by its button, which is found by name only.
            met = set(self.focused)
            for reference in set(self.focused):
                try:
                    met.add(self.property(reference, "Name"))
                except GLib.Error:  # it no longer exists
                    pass
            missed = [heard for heard in takers
                      if heard.has(ENABLED) and heard.role not in NOT_BY_TAB
                      and not {heard.reference, heard.name} & met]


# Windows opened from the browser: the keys to open them, or words for the command finder, or
# nothing if it is open; the log line, the title.
WINDOWS = [
    ("ctrl+e", r"prompt destination", "Convert"),
    ("shift+F2", r"prompt sequential-rename", "Sequential Rename"),
    ("alt+Return", r"info files=", "Get info: 2 files"),
    ("alt+shift+Return", r"exif rows=", "EXIF: a.bmp"),
    ("F4", r"edit-preview exact=1", "Edit: 2 pictures"),
    ("shift+F4", r"crop-picture 1/2", "Crop properties"),
    ("", None, "Crop: 2 pictures"),  # its panel was closed
    ("ctrl+alt+t", r"prompt file-times", "File Times"),
    ("ctrl+j", r"prompt jump", "Jump to File"),
    ("ctrl+shift+f", r"prompt search", "Find pictures"),
    ("ctrl+alt+e", r"exif-edit files=", "Edit EXIF: 2 files"),
    ("ctrl+alt+m", r"prompt strip", "Remove Metadata"),
    ("ctrl+alt+z", r"prompt archive", "Create archive"),
    ("ctrl+shift+s", r"prompt similar", "Find similar pictures"),
    ("ctrl+h", r"history rows=", "File history"),
    ("ctrl+k", r"finder found=", "Find command"),
    ("ctrl+p", r"pages-preview", "Print and pages: 2 pictures"),
    ("tools compact", None, "Compact thumbnail database"),
    ("tools clean", r"cleanup orphans=", "Clean up thumbnails"),
    ("tools plug", None, "Plug-ins"),
    ("tools toolbar", r"prompt toolbar", "Toolbar"),
    ("help manual", r"help ", "Help: .*"),
    ("help about", r"about libraries=", "About Fotomill Professional"),
]


def every_window_is_heard(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.png"])
    with ReadDesktop(folder, pictures) as desktop:
        desktop.wait(r"offer 2")
        desktop.focus("Fotomill Professional")
        desktop.check("Fotomill Professional", tab=False)
        for keys, line, title in WINDOWS:
            if keys:
                desktop.focus("Fotomill Professional")
                desktop.key("ctrl+a", "ctrl+k" if " " in keys else keys)
            if " " in keys:
                desktop.wait(r"finder found=")
                desktop.focus("Find command")
                desktop.type(keys)
                desktop.wait(r"finder found=1$")
                desktop.key("Return")
            if line:
                desktop.wait(line)
            desktop.focus(f"^{title}$")
            desktop.check(title)
            desktop.key("Escape")
        # The canvases describe their contents.
        for keys, place in (("Right", "b.png, 2 of 2, selected"),
                            ("Left", "a.bmp, 1 of 2, selected")):
            desktop.focus("Fotomill Professional")
            desktop.key(keys)
            desktop.wait(r"selected=1 .* focus=" + place.split(",")[0])
            names = [heard.name for heard in desktop.takers("Fotomill Professional")]
            assert place in names, names
        desktop.key("Return")
        desktop.wait(r"view-painted .*a.bmp")
        desktop.focus("View$")
        desktop.check("a.bmp - View", tab=False)
        desktop.key("Escape")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+comma")
        desktop.wait(r"setup page=Browsing")
        desktop.focus("Setup")
        pages = 0
        while True:
            desktop.check("Setup")
            pages += 1
            desktop.key("ctrl+f", "Tab", "Down")
            desktop.settle()
            page = re.findall(r"setup page=(\w+)", desktop.log_text())
            if pages == len(page):
                break
        assert pages > 5, page


def batch_windows_are_heard(folder):
    pictures = folder / "pictures"
    make_pictures(pictures, ["a.bmp", "b.png"])
    (pictures / "a.gif").write_bytes(b"GIF89a and no more")
    with ReadDesktop(folder, pictures, settings=["CloseProgressWhenDone=0", "DestForceSourceDir=1",
                                                 "DestinationWindowCombined=0",
                                                 "DefaultFileExtension=png"]) as desktop:
        desktop.wait(r"lines=3 .*listing=0")
        desktop.focus("Fotomill Professional")
        desktop.key("ctrl+a", "ctrl+e")
        desktop.wait(r"prompt destination")
        desktop.focus("^Convert$")
        desktop.key("Return")
        desktop.wait(r"destination-part folder")
        desktop.key("Return")
        desktop.wait(r"prompt format")
        desktop.focus("^Destination$")
        desktop.check("Destination")
        desktop.key("Return")
        desktop.wait(r"prompt overwrite")
        desktop.focus("^Overwrite File$")
        desktop.check("Overwrite File")
        desktop.key("Escape")
        desktop.wait(r"batch stays-open")
        desktop.focus("^Progress$")
        desktop.check("Progress")


run(every_window_is_heard, batch_windows_are_heard, displays=[BARE])
