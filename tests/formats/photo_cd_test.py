#!/usr/bin/env python3
"""The larger resolutions of Photo CD files match GraphicsMagick, which uses a different tone
curve."""
import os
import shutil
import subprocess
import sys
import tempfile
from collections import Counter
from pathlib import Path

import photo_cd_file

FOTOMILL = os.environ["FOTOMILL"]
RARE = 20000  # out-of-gamut colors differ by more
MOST_SPREAD = 5  # of the other program's values for one of ours

ROWS = [  # rotations by 90 degrees, resolutions in the file, the size to compare
    (0, 5, "3072x2048"),
    (1, 4, "1536x1024"),
    (3, 4, "1536x1024"),
]


def anymap(data):
    _, size, _, pixels = data.split(b"\n", 3)
    return size, pixels


def faults(folder, turns, sizes, shown):
    source = Path(folder) / "picture.pcd"
    source.write_bytes(photo_cd_file.make(turns, sizes))
    subprocess.run([FOTOMILL, "--quiet", "convert", source, "--to", "bmp", "--dest", folder,
                    "--overwrite", "replace"],
                   check=True, stdout=subprocess.DEVNULL)
    ours = anymap(subprocess.run(["gm", "convert", Path(folder) / "picture.bmp", "ppm:-"],
                                 capture_output=True, check=True).stdout)
    theirs = anymap(subprocess.run(["gm", "convert", "-size", shown, source, "ppm:-"],
                                   capture_output=True, check=True).stdout)
    if ours[0] != theirs[0]:
        yield f"{ours[0]} is not {theirs[0]}"
        return
    counts = Counter(zip(ours[1], theirs[1]))
    pairs = [pair for pair, count in counts.items() if count > len(ours[1]) / RARE]
    for value in range(256):
        seen = [other for own, other in pairs if own == value]
        # the curves differ where highlights are compressed
        if seen and value < 240 and max(seen) - min(seen) > MOST_SPREAD:
            yield f"{value} is {min(seen)} to {max(seen)}"
    if len(pairs) < 150:
        yield "too few values to tell"


def main():
    if shutil.which("gm") is None:
        print("not installed: gm")
        return 77
    found = 0
    for row in ROWS:
        with tempfile.TemporaryDirectory() as folder:
            for fault in faults(folder, *row):
                print(*row, fault, sep=": ")
                found += 1
    print(f"{len(ROWS)} files, {found} faults")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
