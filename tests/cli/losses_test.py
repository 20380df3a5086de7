#!/usr/bin/env python3
"""Nothing is lost when other programs write at the same time, without permissions, or when a run is
killed.

The program is run as an ordinary user, as root would hide half of the errors. $FOTOMILL names it.
"""
import fcntl
import os
import shutil
import signal
import struct
import subprocess
import sys
import tempfile
import time
from pathlib import Path

PROGRAM = os.environ.get("FOTOMILL") or sys.exit("FOTOMILL is not set")
NOBODY = 65534
ROOT = os.geteuid() == 0
failures = 0


def check(good, what):
    global failures
    if not good:
        failures += 1
        print(f"FAILED: {what}")


def bitmap(width, height, seed=0):
    """A 24-bit BMP with all pixels different."""
    row = (width * 3 + 3) // 4 * 4
    pixels = b"".join(bytes((x * 7 + y * 13 + seed) % 256 for x in range(row))
                      for y in range(height))
    return struct.pack("<2sIHHIIiiHHIIiiII", b"BM", 54 + len(pixels), 0, 0, 54, 40, width, height,
                       1, 24, 0, len(pixels), 0, 0, 0, 0) + pixels


class Place:
    """A folder with files, where an ordinary user runs the program."""

    def __init__(self):
        self.path = Path(tempfile.mkdtemp(prefix="losses-"))
        os.chmod(self.path, 0o777)
        self.data = self.path / "data"
        self.data.mkdir()
        self.data.chmod(0o777)

    def __enter__(self):
        return self

    def __exit__(self, *_):
        subprocess.run(["chmod", "-R", "u+rwx", str(self.path)], check=False)
        shutil.rmtree(self.path, ignore_errors=True)

    def file(self, name, contents):
        path = self.path / name
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_bytes(contents)
        if ROOT:
            os.chown(path, NOBODY, NOBODY)
            os.chown(path.parent, NOBODY, NOBODY)
        return path

    def start(self, *arguments):
        step = {"user": NOBODY, "group": NOBODY, "extra_groups": []} if ROOT else {}
        return subprocess.Popen([PROGRAM, *arguments], cwd=self.path, stdout=subprocess.PIPE,
                                stderr=subprocess.PIPE, text=True,
                                stdin=subprocess.DEVNULL,
                                env={**os.environ, "FOTOMILL_DATA": str(self.data)}, **step)

    def run(self, *arguments, timeout=60):
        process = self.start(*arguments)
        out, err = process.communicate(timeout=timeout)
        return process.returncode, out, err


def folders_that_one_may_not_enter():
    with Place() as place:
        place.file("a.bmp", bitmap(3, 2))
        place.file("locked/x", b"")
        (place.path / "locked").chmod(0)
        for arguments in (["convert", "a.bmp", "-t", "pcx", "-d", "locked"],
                          ["turn", "a.bmp", "--rotate", "180", "-d", "locked"],
                          ["convert", "a.bmp", "-t", "pcx", "-d", "locked/sub"],
                          ["contact-sheet", "a.bmp", "-t", "pcx", "-d", "locked"],
                          ["convert", "a.bmp", "-t", "pcx", "-d", "locked", "--dry-run"]):
            begin = time.monotonic()
            status, _, err = place.run(*arguments)
            check(status == 1 and "Permission denied." in err and time.monotonic() - begin < 20,
                  f"{arguments}: {status} {err}")


def reasons():
    with Place() as place:
        secret = place.file("a.bmp", bitmap(3, 2))
        secret.chmod(0)
        for command in ("info", "verify"):
            status, _, err = place.run(command, "a.bmp")
            check(status == 1 and "File open error. Permission denied." in err, f"{command}: {err}")
        secret.chmod(0o644)
        place.file("shut/b.bmp", bitmap(3, 2))
        (place.path / "shut").chmod(0o555)
        for arguments in (["convert", "a.bmp", "-t", "png", "-d", "shut"],
                          ["turn", "shut/b.bmp", "--rotate", "180", "--in-place"],
                          ["rename", "shut/b.bmp"], ["thumbs", "make", "shut/b.bmp"]):
            status, _, err = place.run(*arguments)
            check(status == 1 and "Permission denied." in err, f"{arguments}: {status} {err}")
        place.data.chmod(0o555)
        status, _, err = place.run("config", "set", "WebPQualityFactor", "50")
        check(status == 1 and (not ROOT or "Permission denied." in err),
              f"config set: {status} {err}")


def turns_at_once():
    """Two 90-degree rotations make 180 degrees, in either order, unless one is lost."""
    with Place() as place:
        expected = {}
        for i in range(60):
            name = f"p{i:02}.bmp"
            place.file(name, bitmap(40 + i, 30, i))
            check(place.run("turn", name, "--rotate", "180", "-d", "expected")[0] == 0,
                  "the expected picture")
            expected[name] = (place.path / "expected" / name).read_bytes()
        names = sorted(expected)  # single-threaded, so runs can overlap
        runs = [place.start("turn", *names, "--rotate", "right", "--in-place", "-j", "1")
                for _ in range(2)]
        for process in runs:
            _, err = process.communicate(timeout=120)
            check(process.returncode == 0, f"turn: {err}")
        for name in names:
            check((place.path / name).read_bytes() == expected[name],
                  f"{name} was not turned twice")


def replaced_meanwhile():
    """If another program saves a file while it is rotated, its changes are kept or included."""
    with Place() as place:
        old, theirs = bitmap(1500, 1200), bitmap(5, 4, 9)
        for delay in range(12):
            path = place.file("a.bmp", old)
            process = place.start("turn", "a.bmp", "--rotate", "right", "--in-place")
            time.sleep(delay * 0.02)
            fresh = place.file("fresh", theirs)
            os.rename(fresh, path)
            process.communicate(timeout=60)
            now = path.read_bytes()
            check(len(now) < 200, f"what was saved after {delay * 20} ms is lost")
        check(not [name for name in os.listdir(place.path) if name.startswith(".fmw")],
              "working files are left")


def attributes():
    with Place() as place:
        path = place.file("a.bmp", bitmap(4, 3))
        try:
            os.setxattr(path, "user.xdg.tags", b"holiday")
        except OSError:
            return
        for arguments in (["turn", "a.bmp", "--rotate", "180", "--in-place"],
                          ["convert", "a.bmp", "-t", "bmp", "--overwrite", "replace"]):
            status, _, err = place.run(*arguments)
            check(status == 0, f"{arguments}: {err}")
            check(os.listxattr(path) and os.getxattr(path, "user.xdg.tags") == b"holiday",
                  f"{arguments} dropped a tag")
        if not ROOT:
            return
        os.chown(path, 1, 1)
        path.chmod(0o666)
        os.chown(place.path, NOBODY, NOBODY)
        status, _, err = place.run("turn", "a.bmp", "--rotate", "180", "--in-place")
        check(status == 0 and "Not kept from the replaced file: group, owner." in err,
              f"owner: {status} {err}")


def renames_killed():
    with Place() as place:
        for attempt in range(15):
            names = [f"in{attempt}/n{i}.jpg" for i in range(300)]
            for name in names:
                place.file(name, name.encode())
            process = place.start("rename", f"in{attempt}")
            time.sleep(0.004 + 0.003 * attempt)
            process.send_signal(signal.SIGKILL)
            process.communicate()
            status, _, err = place.run("rename", "--undo")
            there = sorted(p.name for p in (place.path / f"in{attempt}").iterdir())
            check(status == 0 and there == sorted(n.split("/")[1] for n in names),
                  f"undo after a kill: {status} {err[:300]}")


def held_locks():
    with Place() as place:
        place.run("config", "set", "WebPQualityFactor", "70")
        ini = [p for p in place.data.iterdir() if p.suffix.lower() == ".ini"]
        check(len(ini) == 1, f"no configuration file: {list(place.data.iterdir())}")
        lock = Path(str(ini[0]) + ".lock")
        lock.touch()
        lock.chmod(0o666)
        with open(lock, "w") as held:
            fcntl.flock(held, fcntl.LOCK_EX)
            begin = time.monotonic()
            status, _, err = place.run("config", "set", "WebPQualityFactor", "71")
            took = time.monotonic() - begin
            check(status == 1 and 9 < took < 20, f"config set: status {status} after {took:.1f} s")
            check("Waiting for" in err and f"process {os.getpid()}" in err
                  and "It is locked by" in err, err)


def two_cleanings():
    with Place() as place:
        for i in range(300):
            place.file(f"p/x{i}.THN", b"orphan")
        runs = [place.start("thumbs", "clean", "p") for _ in range(2)]
        for process in runs:
            _, err = process.communicate(timeout=60)
            check(process.returncode == 0 and "could not be deleted" not in err,
                  f"thumbs clean: {err[:300]}")


def links_of_the_system():
    with Place() as place:
        place.file("a.bmp", bitmap(4, 3))
        link = place.path / "stdout"
        link.symlink_to("/proc/self/fd/1")
        status, _, err = place.run("convert", "a.bmp", "--out", "stdout", "-t", "png",
                                   "--overwrite", "replace")
        check(status != 0 and link.is_symlink(), f"a link to an open file: {status} {err}")


def working_files_of_killed_runs():
    with Place() as place:
        place.file("a.bmp", bitmap(4, 3))
        ended = subprocess.Popen(["true"])
        ended.wait()
        space = os.stat("/proc/self/ns/pid").st_ino & 0xFFFF
        stale = place.file(f".fmw-{ended.pid:x}-{space:04x}-1.tmp", b"left")
        status, _, err = place.run("turn", "a.bmp", "--rotate", "180", "--in-place")
        check(status == 0 and not stale.exists(), f"a killed run's working file: {status} {err}")


def gif(frames):
    """A GIF with many frames of one pixel."""
    frame = bytes.fromhex("2c00000000010001000002024401 00")
    return b"GIF89a" + bytes.fromhex("01000100800000 000000ffffff") + frame * frames + b"\x3b"


def changes_killed():
    """Tags of GIF and PSD files, and times: each file is the old or the new one, and times can be
    undone."""
    psd = b"8BPS\0\1" + bytes(6) + bytes.fromhex("0001 00000001 00000001 0008 0001") + bytes(14)
    with Place() as place:
        for name, old in (("t.gif", gif(3)), ("t.psd", psd)):
            place.file("one/" + name, old)
        place.run("tag", "one", "--in-place", "--rating", "3")
        made = {name: (place.path / "one" / name).read_bytes() for name in ("t.gif", "t.psd")}
        check(made["t.gif"] != gif(3) and made["t.psd"] != psd, "the tags are in the files")
        for attempt in range(12):
            folder = place.path / f"in{attempt}"
            for i in range(150):
                place.file(f"in{attempt}/n{i}.gif", gif(3))
                place.file(f"in{attempt}/n{i}.psd", psd)
            times = {p.name: p.stat().st_mtime_ns for p in folder.iterdir()}
            process = place.start("touch", f"in{attempt}", "--at", "2024-05-31")
            time.sleep(0.004 + 0.002 * attempt)
            process.send_signal(signal.SIGKILL)
            process.communicate()
            status, _, err = place.run("touch", "--undo")
            check(status == 0 and times == {p.name: p.stat().st_mtime_ns for p in folder.iterdir()},
                  f"the times after a kill: {status} {err[:300]}")
            process = place.start("tag", f"in{attempt}", "--in-place", "--rating", "3")
            time.sleep(0.004 + 0.004 * attempt)
            process.send_signal(signal.SIGKILL)
            process.communicate()
            for path in folder.iterdir():
                if path.suffix not in (".gif", ".psd"):
                    continue  # a working file
                found = path.read_bytes()
                check(found in (gif(3) if path.suffix == ".gif" else psd, made["t" + path.suffix]),
                      f"{path.name} after a kill")


def main():
    for case in (folders_that_one_may_not_enter, reasons, turns_at_once, replaced_meanwhile,
                 attributes, renames_killed, changes_killed,
                 held_locks, two_cleanings, links_of_the_system, working_files_of_killed_runs):
        if len(sys.argv) > 1 and case.__name__ not in sys.argv[1:]:
            continue
        begin = time.monotonic()
        case()
        print(f"{case.__name__}: {time.monotonic() - begin:.1f} s")
    print("failed" if failures else "ok")
    return 1 if failures else 0


sys.exit(main())
