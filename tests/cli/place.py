"""Shared by the scripts of this folder: a folder with files where the program is run, and
checks."""
import os
import shutil
import struct
import subprocess
import sys
import tempfile
from pathlib import Path

PROGRAM = os.environ.get("FOTOMILL") or sys.exit("FOTOMILL is not set")
NOBODY = 65534
failures = 0


def check(found, expected, what):
    global failures
    if found != expected:
        failures += 1
        print(f"FAILED: {what}: expected {expected!r}, found {found!r}")


def finish():
    """The exit status of a script."""
    return 1 if failures else 0


def bitmap(width=3, height=2):
    """A black BMP of 24 bits."""
    row = (width * 3 + 3) // 4 * 4
    return struct.pack("<2sIHHIIiiHHIIiiII", b"BM", 54 + row * height, 0, 0, 54, 40, width, height,
                       1, 24, 0, row * height,
                       0, 0, 0, 0) + bytes(row * height)


class Place:
    """With `ordinary`, the program is run by a user without root privileges."""

    def __init__(self, ordinary=False):
        self.user = {"user": NOBODY, "group": NOBODY,
                     "extra_groups": []} if ordinary and os.geteuid() == 0 else {}

    def __enter__(self):
        self.path = Path(tempfile.mkdtemp(prefix="place-"))
        for name in ("data", "tmp"):
            (self.path / name).mkdir()
        for path in (self.path, self.path / "data", self.path / "tmp"):
            path.chmod(0o777)
        self.environment = {**os.environ, "FOTOMILL_DATA": str(self.path / "data"),
                            "TMPDIR": str(self.path / "tmp")}
        return self

    def __exit__(self, *_):
        subprocess.run(["chmod", "-R", "u+rwx", str(self.path)], check=False)
        shutil.rmtree(self.path)

    def files(self, *names, contents=None, time=None):
        """Creates files with their folders; bitmaps unless contents are given. `time` is in
        nanoseconds."""
        for name in names:
            path = self.path / name
            path.parent.mkdir(parents=True, exist_ok=True)
            path.write_bytes(bitmap() if contents is None else contents)
            if self.user:
                os.chown(path, NOBODY, NOBODY)
                os.chown(path.parent, NOBODY, NOBODY)
            if time is not None:
                os.utime(path, ns=(time, time))

    def names(self, folder="."):
        return sorted(path.name for path in (self.path / folder).iterdir())

    def start(self, *arguments, stdin=subprocess.DEVNULL, stdout=subprocess.PIPE, **more):
        return subprocess.Popen([PROGRAM, *arguments], cwd=self.path, stdin=stdin, stdout=stdout,
                                stderr=subprocess.PIPE,
                                env=self.environment, **self.user, **more)

    def run_bytes(self, *arguments, given=None, **more):
        """Exit status, standard output and standard error; `given` is standard input."""
        process = self.start(*arguments, stdin=subprocess.DEVNULL
                             if given is None else subprocess.PIPE, **more)
        try:
            out, err = process.communicate(given, timeout=60)
        except subprocess.TimeoutExpired:
            process.kill()
            process.communicate()
            return None, b"", b"it did not end"
        return process.returncode, out, err

    def run(self, *arguments, given=None, **more):
        """As above, as text."""
        status, out, err = self.run_bytes(*arguments, given=given, **more)
        return status, out.decode(), err.decode()
