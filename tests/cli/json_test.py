#!/usr/bin/env python3
"""Every command with output supports JSON; -v and -q work everywhere; dumb terminals get no
colors."""
import json
import os
import pty
import subprocess
import sys
import tempfile
from pathlib import Path

PROGRAM = os.environ["FOTOMILL"]
SAMPLE = Path(__file__).resolve().parents[2] / "samples" / "bmp-256-colors.bmp"
faults = []


def run(folder, *arguments):
    result = subprocess.run([PROGRAM, "--data", str(folder / "data"), *arguments], cwd=folder,
                            stdin=subprocess.DEVNULL,
                            capture_output=True, text=True, env={**os.environ, "LC_ALL": "C"})
    return result.returncode, result.stdout, result.stderr


def check(what, found, expected):
    if found != expected:
        faults.append(f"{what}: expected {expected!r}, found {found!r}")


# (arguments, status, relevant members of the first element)
COMMANDS = [
    ("history add a.bmp --function View", 0, {"functionName": "View", "recorded": True}),
    ("history list", 0, {"functionName": "View"}),
    ("history clear -n", 0, {"deleted": False}),
    ("history clear", 0, {"deleted": True}),
    ("thumbs make a.bmp", 0, {"file": "a.bmp", "made": True}),
    ("thumbs show a.THN --out t.bmp", 0, {"file": "a.THN", "destination": "t.bmp", "status": 0,
                                          "message": "Ok"}),
    ("thumbs show a.THN --out t.bmp", 1, {"file": "t.bmp", "status": 10}),
    ("thumbs draw a.bmp --out d.bmp", 0, {"destination": "d.bmp"}),
    ("thumbs draw none.bmp --out e.bmp", 1, {"file": "none.bmp", "status": 1}),
    ("thumbs list .", 0, {"status": "current"}),
    ("tdb add x.tdb a.bmp none.bmp", 1, {"file": "a.bmp", "status": 0}),
    ("tdb find x.tdb a.bmp --out f.THN", 0, {"file": "a.bmp", "destination": "f.THN"}),
    ("tdb delete x.tdb a.bmp", 0, {"file": "a.bmp", "status": 0}),
    ("tdb delete x.tdb a.bmp", 1, {"status": 20}),
    ("tdb compact x.tdb", 0, {"database": "x.tdb", "before": 1, "after": 0}),
    ("thumbs clean .", 0, {"file": "./f.THN", "status": 0}),
    ("doctor", 0, {"item": "Version"}),
    ("config describe UndoLevels", 0, {"name": "UndoLevels", "used": True}),
    ("config path", 0, {"exists": False}),
    ("formats", 0, {"index": 0}),
    ("plugins", 0, {"canRead": True}),
    ("operations", 0, {}),
    ("match x.bmp", 0, {"index": 2}),
    ("rename a.bmp -n", 0, {}),
    ("turn --rotate left a.bmp -n --in-place", 0, {}),
]


def test_json(folder):
    for line, status, members in COMMANDS:
        found = run(folder, *line.split(), "--json")
        check(line, found[0], status)
        try:
            elements = json.loads(found[1])
        except ValueError:
            faults.append(f"{line}: no JSON in {found[1]!r}")
            continue
        first = elements[0] if elements else {}
        check(line, {key: first.get(key) for key in members}, members)


def test_global_options(folder):
    names = [line.split("  ")[1] for line in run(folder, "help")[1].split("\n\n")[2].split("\n")[1:]
             if line.startswith("  ")]
    for name in names:
        if name == "help":
            continue
        page = run(folder, "help", *name.split())[1]
        for option in ("-v, --verbose", "-q, --quiet"):
            if option not in page:
                faults.append(f"{name} does not know {option}")
    status, _, error = run(folder, "-v", "verify", str(SAMPLE))
    check("verbose", (status, error.count("It took ")), (0, 1))
    check("quiet", run(folder, "verify", "-v", "-q", str(SAMPLE))[2], "")
    (folder / "bad.bmp").write_bytes(b"BM")
    check("count line", run(folder, "verify", str(SAMPLE), "bad.bmp")[2].split("\n")[1:],
          ["There were errors", "2 files were processed, 1 failed.", ""])
    lines = run(folder, "convert", str(SAMPLE), "bad.bmp", "--to", "pcx", "--dest",
                "out")[2].split("\n")
    check("lines of a batch", lines[1:], ["One file failed.", "There were errors",
                                          "2 files were processed.", ""])


def error_on_terminal(folder, terminal):
    master, slave = pty.openpty()
    subprocess.run([PROGRAM, "verify", "bad.bmp"], cwd=folder, stdin=subprocess.DEVNULL,
                   stdout=subprocess.DEVNULL, stderr=slave,
                   env={**{k: v for k, v in os.environ.items() if k != "NO_COLOR"},
                        "TERM": terminal})
    os.close(slave)
    text = os.read(master, 10000)
    os.close(master)
    return text


with tempfile.TemporaryDirectory() as place:
    folder = Path(place)
    (folder / "a.bmp").write_bytes(SAMPLE.read_bytes())
    test_json(folder)
    test_global_options(folder)
    check("color on a terminal", b"\x1b[31m" in error_on_terminal(folder, "xterm"), True)
    check("no color on a dumb one", b"\x1b[31m" in error_on_terminal(folder, "dumb"), False)
print("\n".join(faults) if faults else "commands speak JSON")
sys.exit(1 if faults else 0)
