"""Drives the real desktop program on its own display: sends keys and mouse events, reads its event
log.

Tests wait for log lines, never for a time. Each test gets its own display, data folder and home;
screenshots are kept in build/screenshots.
"""
import os
import re
import shutil
import struct
import subprocess
import sys
import tempfile
import time
import traceback
import zlib
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]
BARE, OPENBOX = "bare", "openbox"  # displays without and with a window manager
PATIENCE = 60  # seconds until a test gives up waiting

# Focus follows requests and clicks; no key bindings.
OPENBOX_RULES = """<?xml version="1.0"?>
<openbox_config xmlns="http://openbox.org/3.4/rc">
<focus><focusNew>yes</focusNew></focus>
<keyboard/>
<mouse><context name="Client"><mousebind button="Left" action="Press">
<action name="Focus"/><action name="Raise"/></mousebind></context></mouse>
</openbox_config>
"""


class Failure(Exception):
    pass


def skip_without_display():
    for program in ("Xvfb", "xdotool"):
        if shutil.which(program) is None:
            print(f"{program} is not installed: left out")
            sys.exit(77)


class Desktop:
    """The program with a display, started with `arguments` and `settings` (lines of the
    configuration file)."""

    managed = False  # whether displays have a window manager; set by run()

    def __init__(self, folder, *arguments, settings=(), size=(1280, 900)):
        self.folder = Path(folder)
        self.arguments = [str(argument) for argument in arguments]
        self.size = size
        self.data = self.folder / "data"
        self.data.mkdir(exist_ok=True)
        if settings or not any(self.data.iterdir()):
            welcome = [] if "ShowWelcomeWizard=1" in settings else ["ShowWelcomeWizard=0"]
            text = "[Fotomill]\n" + "".join(line + "\n" for line in [*welcome, *settings])
            (self.data / "Fotomill Professional 11.ini").write_text(text)
        self.log = self.folder / "log"
        self.seen = 0

    def __enter__(self):
        skip_without_display()
        self.frames = tempfile.TemporaryDirectory()
        reader, writer = os.pipe()
        self.server = subprocess.Popen(
            ["Xvfb", "-displayfd", str(writer), "-screen", "0", f"{self.size[0]}x{self.size[1]}x24",
             "-fbdir", self.frames.name,
             "-nolisten", "tcp", "-noreset"], pass_fds=[writer], stdout=subprocess.DEVNULL,
             stderr=subprocess.DEVNULL)
        os.close(writer)
        with os.fdopen(reader) as line:
            number = line.readline().strip()
        if not number:
            raise Failure("Xvfb did not start")
        home = self.folder / "home"
        home.mkdir(exist_ok=True)
        runtime = self.folder / "run"
        runtime.mkdir(mode=0o700, exist_ok=True)
        self.environment = dict(
            os.environ, DISPLAY=":" + number, HOME=str(home),
            XDG_DATA_HOME=str(home / ".local/share"), XDG_CONFIG_HOME=str(home / ".config"),
            XDG_RUNTIME_DIR=str(runtime), FOTOMILL_DATA=str(self.data),
            FOTOMILL_DESKTOP_LOG=str(self.log), GDK_BACKEND="x11", NO_AT_BRIDGE="1",
            LC_ALL="C.UTF-8", LANGUAGE="en",
            GTK_THEME="Adwaita",
            ASAN_OPTIONS=os.environ.get("ASAN_OPTIONS", "") + ":detect_leaks=0")
        self.manager = self.start_manager() if self.managed else None
        self.start()
        return self

    def start_manager(self):
        """A window manager: windows are raised, maximized, and focused as on a user's screen."""
        rules = self.folder / "openbox.xml"
        rules.write_text(OPENBOX_RULES)
        manager = subprocess.Popen(["openbox", "--sm-disable", "--config-file", str(rules)],
                                   env=self.environment, stdin=subprocess.DEVNULL,
                                   stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        end = time.monotonic() + PATIENCE
        while not self.xdotool("get_num_desktops"):
            if manager.poll() is not None or time.monotonic() > end:
                raise Failure("openbox did not start")
            time.sleep(0.05)
        return manager

    def __exit__(self, kind, error, trace):
        if kind is not None:
            print(self.log_text()[-3000:], file=sys.stderr)
            print(self.output.read_text()[:6000], file=sys.stderr)
            self.screenshot("failed-" + Path(sys.argv[0]).stem)
        if self.program.poll() is None:
            self.program.terminate()
            try:
                self.program.wait(10)
            except subprocess.TimeoutExpired:
                self.program.kill()
        if self.manager is not None:
            self.manager.terminate()
            self.manager.wait()
        self.server.terminate()
        self.server.wait()
        self.frames.cleanup()

    def start(self):
        program = os.environ.get("FOTOMILL_DESKTOP",
                                 str(PROJECT / "build/release/fotomill-desktop"))
        self.output = self.folder / "output"
        self.log.write_text("")
        self.seen = 0
        with self.output.open("w") as output:
            self.program = subprocess.Popen([program, *self.arguments], env=self.environment,
                                            stdout=output, stderr=output,
                                            stdin=subprocess.DEVNULL)

    def start_again(self, *arguments):
        """A second instance of the program. Its events go to the same log."""
        return subprocess.Popen([self.program.args[0], *map(str, arguments)], env=self.environment,
                                stdin=subprocess.DEVNULL)

    # --- output ---

    def log_text(self):
        return self.log.read_text(errors="replace")

    def wait(self, pattern, again=False):
        """The first matching line after the previous match; with `again`, from the previous match
        on."""
        end = time.monotonic() + PATIENCE
        while time.monotonic() < end:
            text = self.log_text()
            for match in re.finditer(r"^\S+ (.*)$", text[self.seen:], re.M):
                if re.search(pattern, match.group(1)):
                    if not again:
                        self.seen += match.end()
                    return match.group(1)
            if self.program.poll() is not None:
                status = self.program.returncode
                raise Failure(f"the program ended with {status}, waiting for {pattern}")
            time.sleep(0.03)
        raise Failure(f"waited in vain for {pattern}")

    def wait_end(self):
        status = self.program.wait(PATIENCE)
        if status != 0:
            raise Failure(f"the program ended with {status}")

    # --- input ---

    def xdotool(self, *arguments):
        done = subprocess.run(["xdotool", *map(str, arguments)], env=self.environment,
                              capture_output=True, text=True)
        return done.stdout.split()

    def focus(self, title, settle=True, native=False):
        """Focuses the window with a title, since there may be no window manager. Waits until the
        window has been drawn, unless it keeps changing. A `native` box is the toolkit's own,
        which is not in the log."""
        end = time.monotonic() + PATIENCE
        while time.monotonic() < end:
            windows = self.xdotool("search", "--onlyvisible", "--name", title)
            if windows:
                if not self.managed:
                    self.xdotool("windowraise", windows[-1])
                if self.xdotool("getwindowfocus") != windows[-1:]:
                    known = self.log_text().count(" active ")
                    self.xdotool("windowactivate" if self.managed else "windowfocus", "--sync",
                                 windows[-1])
                    # Keys sent before the window is ready would be lost.
                    while not native and self.log_text().count(" active ") == known:
                        if time.monotonic() >= end:
                            break
                        time.sleep(0.03)
                if settle:
                    self.settle()
                return windows[-1]
            time.sleep(0.05)
        raise Failure(f"there is no window {title}")

    def key(self, *keys):
        self.xdotool("key", "--delay", "20", *keys)

    def type(self, text):
        self.xdotool("type", "--delay", "20", text)

    def settle(self):
        """Waits until the screen has stopped changing."""
        frame, still, end = None, 0, time.monotonic() + PATIENCE
        while still < 3 and time.monotonic() < end:
            time.sleep(0.1)
            now = (Path(self.frames.name) / "Xvfb_screen0").read_bytes()
            still = still + 1 if now == frame else 0
            frame = now

    def screenshot(self, name):
        self.settle()
        place = PROJECT / "build/screenshots"
        place.mkdir(parents=True, exist_ok=True)
        screen = (Path(self.frames.name) / "Xvfb_screen0").read_bytes()
        (place / (name + ".png")).write_bytes(png_of_xwd(screen))


def png_of_xwd(data):
    """Converts the frame buffer, an X window dump of Xvfb with 32 bits per pixel, to PNG."""
    header_size, _, _, _, width, height = struct.unpack(">6I", data[:24])
    stride, = struct.unpack(">I", data[48:52])
    colors, = struct.unpack(">I", data[76:80])
    start = header_size + 12 * colors
    rows = bytearray()
    for y in range(height):
        row = data[start + y * stride:start + y * stride + 4 * width]
        rgb = bytearray(3 * width)
        rgb[0::3], rgb[1::3], rgb[2::3] = row[2::4], row[1::4], row[0::4]
        rows += b"\0" + rgb

    def chunk(kind, body):
        check = struct.pack(">I", zlib.crc32(kind + body))
        return struct.pack(">I", len(body)) + kind + body + check

    head = struct.pack(">2I5B", width, height, 8, 2, 0, 0, 0)
    pixels = chunk(b"IDAT", zlib.compress(bytes(rows), 6))
    return b"\x89PNG\r\n\x1a\n" + chunk(b"IHDR", head) + pixels + chunk(b"IEND", b"")


def needs_manager(test):
    """Marks a test as not applicable to bare displays."""
    test.needs_manager = True
    return test


def run(*tests, displays=(BARE, OPENBOX)):
    """Runs test functions on these displays, with a folder for each; exits with their result. Test
    names as arguments of the script select tests."""
    skip_without_display()
    failed = 0
    for display in displays:
        if display == OPENBOX and shutil.which(OPENBOX) is None:
            print("openbox is not installed: left out")
            continue
        Desktop.managed = display == OPENBOX
        for test in tests:
            if getattr(test, "needs_manager", False) and not Desktop.managed:
                continue
            if sys.argv[1:] and test.__name__ not in sys.argv[1:]:
                continue
            failed += not succeeds(test)
    sys.exit(1 if failed else 0)


def succeeds(test):
    name = test.__name__ + (" under openbox" if Desktop.managed else "")
    with tempfile.TemporaryDirectory() as folder:
        try:
            test(Path(folder))
            print(f"{name}: ok")
            return True
        except (Failure, AssertionError) as failure:
            print(f"{name}: {failure or 'assertion failed'}")
            if isinstance(failure, AssertionError):
                traceback.print_exc()
    return False


def gif_of_frames(delays, size=(400, 300)):
    """An endless animation of single-color frames; delays in hundredths of a second."""
    def block(data):
        return b"".join(bytes([len(data[i:i + 255])]) + data[i:i + 255]
                        for i in range(0, len(data), 255)) + b"\0"

    width, height = size
    colors = bytes((40 * i * j) % 256 for i in range(1, 9) for j in (1, 2, 3))
    gif = b"GIF89a" + struct.pack("<2H3B", width, height, 0xF2, 0, 0)
    gif += colors + b"!\xff\x0bNETSCAPE2.0\3\1\0\0\0"
    for number, delay in enumerate(delays):
        # 4-bit codes, with clear codes often enough to keep them that short.
        codes = [code for i in range(width * height)
                 for code in ([8, number % 8] if i % 6 == 0 else [number % 8])] + [9]
        codes += [0] * (len(codes) % 2)
        pixels = bytes(low | high << 4 for low, high in zip(codes[0::2], codes[1::2]))
        gif += b"!\xf9\4\0" + struct.pack("<H", delay) + b"\0\0,"
        gif += struct.pack("<4H", 0, 0, width, height) + b"\0\3" + block(pixels)
    return gif + b";"


def make_pictures(folder, names):
    """Small pictures of different colors, made from a sample by the command line."""
    folder.mkdir(exist_ok=True)
    sample = PROJECT / "samples/bmp-true-color.bmp"
    for name in names:
        target = folder / name
        if target.suffix == ".bmp":
            shutil.copy(sample, target)
        else:
            program = os.environ.get("FOTOMILL", str(PROJECT / "build/release/fotomill"))
            made = folder / ("bmp-true-color" + target.suffix)
            subprocess.run([program, "convert", str(sample), "--to", target.suffix[1:], "--dest",
                            str(folder)], check=True,
                           stdout=subprocess.DEVNULL)
            made.rename(target)
