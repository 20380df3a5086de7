#!/usr/bin/python3
"""Searching for pictures: what exiftool writes into them is found, a second search reads nothing
again, and what cannot be read is reported. $FOTOMILL names the program."""
import json
import os
import shutil
import signal
import subprocess
import sys
import time
from pathlib import Path

from place import Place, bitmap, check, finish

try:
    from PIL import Image
except ImportError:
    print("skipped: needs Pillow (python3-pil)")
    sys.exit(77)

# File, tags for exiftool.
PICTURES = {
    "sea.jpg": ["-XMP-dc:Subject=Sea", "-XMP-dc:Subject=Places/Rome", "-XMP:Rating=4",
                "-XMP:Label=Red", "-Make=Canon", "-Model=Canon EOS 40D",
                "-DateTimeOriginal=2024:05:31 14:03:09", "-XMP-dc:Description=At the beach"],
    "hill.jpg": ["-IPTC:Keywords=Hill", "-Make=NIKON CORPORATION", "-Model=NIKON D70",
                 "-DateTimeOriginal=2023:12:31 23:59:59", "-IPTC:Caption-Abstract=Above Zürich"],
    "tree.png": ["-XMP-dc:Subject=Sea of trees", "-XMP:Rating=2"],
    "plain.jpg": [],
}
ROWS = [
    # options, names found
    (["--name", "e"], ["sea.jpg", "tree.png"]),
    (["--name", "*.PNG"], ["tree.png"]),
    (["--keyword", "sea"], ["sea.jpg"]),
    (["--keyword", "sea*"], ["sea.jpg", "tree.png"]),
    (["--keyword", "rome"], ["sea.jpg"]),
    (["--keyword", "hill"], ["hill.jpg"]),
    (["--keyword", "sea", "--keyword", "rome"], ["sea.jpg"]),
    (["--keyword", "sea", "--keyword", "hill"], []),
    (["--keyword", "sea", "--name", "hill", "--any"], ["hill.jpg", "sea.jpg"]),
    (["--comment", "zürich"], ["hill.jpg"]),
    (["--comment", "BEACH"], ["sea.jpg"]),
    (["--text", "nikon"], ["hill.jpg"]),
    (["--rating", "3.."], ["sea.jpg"]),
    (["--rating", "..2"], ["hill.jpg", "plain.jpg", "tree.png"]),
    (["--label", "red"], ["sea.jpg"]),
    (["--camera", "eos"], ["sea.jpg"]),
    (["--taken", "2024"], ["sea.jpg"]),
    (["--taken", "2023-12-31..2024-05-31"], ["hill.jpg", "sea.jpg"]),
    (["--taken", "..2023"], ["hill.jpg"]),
    (["--format", "png"], ["tree.png"]),
    (["--format", "jpeg", "--width", "40"], ["hill.jpg", "plain.jpg"]),
    (["--height", "..20"], ["sea.jpg", "tree.png"]),
    (["--size", "100G.."], []),
    (["--set", "PictureKeywordMatch=1", "--set", "PictureSearchKeywordField=rome, sea"],
     ["sea.jpg"]),
    (["--set", "PictureSearchWildcardField=*.png"], ["tree.png"]),
    (["--set", "PictureSearchWildcardField=*.png", "--name", "*"],
     ["hill.jpg", "plain.jpg", "sea.jpg", "tree.png"]),
]
LONG_AGO = 1_600_000_000


def make(folder):
    folder.mkdir()
    for name, tags in PICTURES.items():
        size = (40, 30) if name in ("hill.jpg", "plain.jpg") else (30, 20)
        Image.new("RGB", size, "gray").save(folder / name)
        if tags:
            subprocess.run(["exiftool", "-q", "-overwrite_original", *tags, str(folder / name)],
                           check=True)
        os.utime(folder / name, (LONG_AGO, LONG_AGO))


def names(out):
    return sorted(Path(line).name for line in out.splitlines())


def found_facts(place):
    make(place.path / "p")
    for attempt in ("first", "second"):
        for options, expected in ROWS:
            status, out, _ = place.run("find", "p", *options)
            check(names(out), expected, f"{attempt} {options}")
            check(status, 0 if expected else 1, f"{attempt} {options}: status")
    status, out, _ = place.run("find", "p", "--keyword", "sea", "--json")
    check(json.loads(out),
          [{"file": "p/sea.jpg", "bytes": (place.path / "p/sea.jpg").stat().st_size,
            "format": "JPG", "width": 30, "height": 20, "taken": "2024-05-31 14:03:09",
            "camera": "Canon EOS 40D", "title": "", "description": "At the beach", "comment": "",
            "keywords": ["Sea", "Places/Rome"], "rating": 4, "label": "Red", "status": 0,
            "message": "Ok"}], "JSON")
    for wrong in (["--rating", "x"], ["--taken", "2024-13"], ["--size", "5..k"],
                  ["--format", "xyz"], ["--name", ""], ["--width", "9..1"]):
        check(place.run("find", "p", *wrong)[0], 2, f"{wrong}: refused")


def unchanged_files(place):
    """What is known of a file is used until its size or time changes, or a file beside it that
    holds its metadata."""
    (place.path / "p").mkdir()
    path = place.path / "p/a.jpg"
    make(place.path / "made")
    shutil.copy(place.path / "made/sea.jpg", path)
    os.utime(path, (LONG_AGO, LONG_AGO))
    check(place.run("find", "p", "--keyword", "sea")[0], 0, "read")
    with open(path, "r+b") as file:  # in place: the same file, size and time
        file.write(b"x" * path.stat().st_size)
    os.utime(path, (LONG_AGO, LONG_AGO))
    check(place.run("find", "p", "--keyword", "sea")[0], 0, "not read again")
    os.utime(path, (LONG_AGO, LONG_AGO + 1))
    check(place.run("find", "p", "--keyword", "sea")[0], 1, "read again")
    (place.path / "data/Fotomill.index").write_bytes(b"no index at all")
    _, out, err = place.run("find", "made", "--keyword", "sea")
    check((names(out), "Fotomill.index.damaged" in err), (["sea.jpg"], True), "damaged index")
    check((place.path / "data/Fotomill.index.damaged").read_bytes(), b"no index at all", "kept")
    check("damaged" in place.run("find", "made", "--keyword", "sea")[2], False, "a new one is made")


def failures(place):
    place.files("p/a.bmp", "p/closed/b.bmp", "p/secret.bmp")
    place.files("p/cut.bmp", contents=bitmap()[:-3])
    place.files("p/nothing.png", contents=b"\x89PNG\r\n\x1a\nnothing")
    (place.path / "p/closed").chmod(0)
    (place.path / "p/secret.bmp").chmod(0)
    for attempt in ("first", "second"):
        status, out, err = place.run("find", "-r", "p", "none.bmp", "--width", "3")
        check((status, names(out)), (1, ["a.bmp", "cut.bmp"]), f"{attempt}: readable files")
        lines = err.splitlines()
        for name in ("p/closed", "p/secret.bmp", "none.bmp"):
            check(sum(line.startswith(name + ":") for line in lines), 1, f"{attempt}: {name}")
        status, out, _ = place.run("find", "p", "--damaged")
        check(names(out), ["cut.bmp", "nothing.png"], f"{attempt}: damaged files")


def two_at_once(place):
    """Neither loses what the other one has read."""
    for folder in "ab":
        place.files(*(f"{folder}/{i:03}.bmp" for i in range(300)), time=LONG_AGO * 10**9)
    runs = [place.start("find", folder, "--width", "3") for folder in "ab"]
    for run in runs:
        run.communicate(timeout=60)
        check(run.returncode, 0, "status")
    size = (place.path / "data/Fotomill.index").stat().st_size
    place.run("find", "a", "b", "--width", "3")
    check((place.path / "data/Fotomill.index").stat().st_size, size, "nothing is read again")


def interrupted(place):
    (place.path / "p").mkdir()
    Image.new("RGB", (2000, 1500)).save(place.path / "p/0.png")
    os.utime(place.path / "p/0.png", (LONG_AGO, LONG_AGO))
    for i in range(1, 3000):
        os.link(place.path / "p/0.png", place.path / f"p/{i}.png")
    index = place.path / "data/Fotomill.index"
    kept = 0
    for patience in (0.5, 2, 8, 16):  # a slow machine may not have read much yet
        run = place.start("find", "p", "--damaged")
        time.sleep(patience)
        run.send_signal(signal.SIGTERM)
        begun = time.monotonic()
        run.communicate(timeout=60)
        check(run.returncode, 143, "SIGTERM: status")
        check(time.monotonic() - begun < 1, True, "SIGTERM: within a second")
        kept = index.stat().st_size if index.exists() else 0
        if kept > 1000:
            break
    check(kept > 1000, True, f"what was read is kept: {kept} bytes")


def main():
    if shutil.which("exiftool") is None:
        print("skipped: needs exiftool (libimage-exiftool-perl)")
        return 77
    for test in (found_facts, unchanged_files, failures, two_at_once, interrupted):
        with Place(ordinary=True) as place:
            test(place)
    return finish()


if __name__ == "__main__":
    sys.exit(main())
