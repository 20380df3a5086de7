#!/usr/bin/env python3
"""Modules that crash or exit cost one file, and if they run in the program are reported by name,
never with status 0; one that does so while loading is tried only once."""
import os
import shutil
import subprocess
import sys
import tempfile
from pathlib import Path

FOTOMILL = Path(os.environ["FOTOMILL"])
MODULES = FOTOMILL.parent / "tests" / "modules"
faults = []


def check(what, found, expected):
    if found != expected:
        faults.append(f"{what}: expected {expected!r}, found {found!r}")


def install(folder, oddity):
    """A separate copy of the program in `folder`, with one module next to it."""
    (folder / "plugin").mkdir()
    (folder / "data").mkdir()
    if FOTOMILL.stat().st_dev == folder.stat().st_dev:
        os.link(FOTOMILL, folder / "fotomill")
    else:
        shutil.copy(FOTOMILL, folder)
    shutil.copy(MODULES / oddity / "FMWPL_odd.so", folder / "plugin" / "FMWPL_odd.so")


def run(folder, *arguments):
    # Tests the program's own signal handler, not the sanitizer's.
    sanitizer = os.environ.get("ASAN_OPTIONS", "") + ":handle_segv=0:handle_abort=0:detect_leaks=0"
    result = subprocess.run([folder / "fotomill", "--data", folder / "data", *arguments],
                            cwd=folder, capture_output=True,
                            stdin=subprocess.DEVNULL, env={**os.environ, "TMPDIR": str(folder),
                                                           "ASAN_OPTIONS": sanitizer,
                                                           "LC_ALL": "C"}, timeout=60)
    return result.returncode, result.stdout.decode(), result.stderr.decode()


def test_working(folder, oddity, status, message):
    install(folder, oddity)
    for name in ("first.odd", "last.odd"):
        (folder / name).write_bytes(b"")
    found = run(folder, "convert", "first.odd", "last.odd", "--to", "bmp", "--jobs", "1")
    check(f"{oddity}: status", found[0], status)
    check(f"{oddity}: results", found[1], "first.odd -> first.bmp\n")
    check(f"{oddity}: message", found[2].split("\n")[0], message)
    left = sorted(path.name for path in folder.iterdir())
    check(f"{oddity}: files", left, ["data", "first.bmp", "first.odd", "fotomill", "last.odd",
                                     "plugin"])
    check(f"{oddity}: the others are read again", run(folder, "verify", "first.odd")[0], 0)


def test_loading(folder):
    install(folder, "EXITS_AT_ONCE")
    module = folder / "plugin" / "FMWPL_odd.so"
    failures = folder / "data" / "PluginFailures.txt"
    for attempt in ("first", "second"):
        status, out, error = run(folder, "formats", "--filter")
        check(f"loading, {attempt}", (status, "*.BMP" in out, error), (0, True, ""))
        check(f"recorded, {attempt}", failures.read_text().count("FMWPL_odd.so"), 1)
    check("doctor", "FMWPL_odd.so" in run(folder, "doctor")[1] and
          "not used: it crashed when it was loaded" in run(folder, "doctor")[1], True)
    os.utime(module, (1, 1))
    run(folder, "formats", "--filter")
    check("a changed module is tried", failures.read_text().count("FMWPL_odd.so"), 2)


def test_number(folder):
    install(folder, "ERROR_42")
    (folder / "x.odd").write_bytes(b"")
    check("number", run(folder, "info", "x.odd")[2].split("\n")[0],
          "x.odd: error 42 of the plug-in")
    if '"status":42,"message":"error 42 of the plug-in"' not in run(folder, "info", "--json",
                                                                    "x.odd")[1]:
        faults.append("the number has no message in JSON")


ENDED = "fotomill: The plug-in FMWPL_odd.so ended the program."
for test, arguments in [(test_working, ("EXITS", 1, "last.odd: Damaged file.")),
                        (test_working, ("CRASHES", 1, "last.odd: Damaged file.")),
                        (test_working, ("GUEST_EXITS", 1, ENDED)),
                        (test_working, ("GUEST_CRASHES", -11, ENDED)),
                        (test_loading, ()), (test_number, ())]:
    with tempfile.TemporaryDirectory(dir=FOTOMILL.parent) as place:
        test(Path(place), *arguments)
print("\n".join(faults) if faults else "modules that crash or exit do no harm")
sys.exit(1 if faults else 0)
