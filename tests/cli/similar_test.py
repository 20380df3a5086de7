#!/usr/bin/python3
"""Similar pictures are found, and a second search reads none of them again."""
import json
import os
import subprocess
import sys
import tempfile
import time
from pathlib import Path

try:
    from PIL import Image, ImageEnhance
except ImportError:
    print("skipped: needs Pillow (python3-pil)")
    sys.exit(77)

FOTOMILL = os.environ["FOTOMILL"]
faults = []


def scene(seed):
    """Blobs of random position and brightness."""
    small = Image.new("RGB", (8, 6))
    value = seed * 7919 + 17
    pixels = []
    for _ in range(48):
        value = (value * 1103515245 + 12345) % 2**31
        pixels.append((value >> 8 & 255, value >> 12 & 255, value >> 16 & 255))
    small.putdata(pixels)
    return small.resize((400, 300), Image.Resampling.BICUBIC)


def search(data, *arguments, status=0):
    run = subprocess.run([FOTOMILL, "similar", "--data", data, "--json", *map(str, arguments)],
                         capture_output=True, text=True, check=False)
    if run.returncode != status:
        faults.append(f"{arguments}: status {run.returncode}: {run.stderr}")
    return json.loads(run.stdout or "[]")


def expect(what, groups, names):
    found = [[Path(file["file"]).name for file in group["files"]] for group in groups]
    if found != names:
        faults.append(f"{what}: {found}")


with tempfile.TemporaryDirectory() as name:
    work, data = Path(name, "pictures"), Path(name, "data")
    work.mkdir()
    one, two = scene(1), scene(2)
    one.save(work / "a.png")
    one.resize((211, 158)).save(work / "b.jpg", quality=60)
    ImageEnhance.Brightness(one).enhance(1.2).save(work / "c.bmp")
    one.transpose(Image.Transpose.ROTATE_90).save(work / "d.png")
    two.save(work / "e.png")
    two.save(work / "f.bmp")
    scene(3).save(work / "g.png")
    Path(work, "broken.png").write_bytes(b"\x89PNG\r\n\x1a\nnothing")
    for path in work.iterdir():  # recently changed files are not cached
        os.utime(path, (time.time() - 100, time.time() - 100))

    alike = [["a.png", "b.jpg", "c.bmp"], ["e.png", "f.bmp"]]
    groups = search(data, work, status=1)
    expect("alike", groups, alike)
    second = groups[0]["files"][1] if groups else {}
    if groups and (second.get("width"), second.get("height")) != (211, 158):
        faults.append(f"size: {groups[0]['files'][1]}")
    if groups and groups[0]["files"][0].get("bytes") != (work / "a.png").stat().st_size:
        faults.append("bytes")
    (work / "broken.png").unlink()
    expect("turned", search(data, work, "--transforms"),
           [["a.png", "b.jpg", "c.bmp", "d.png"], ["e.png", "f.bmp"]])
    expect("exact", search(data, work, "--exact"), [["e.png", "f.bmp"]])
    pages = work / "pages"
    pages.mkdir()
    other, cover = scene(4), scene(5)
    for name, compression, second in [("a.tif", "raw", other), ("b.tif", "tiff_lzw", other),
                                      ("c.tif", "raw", one), ("d.gif", None, other),
                                      ("e.gif", None, one), ("f.tif", "raw", None)]:
        cover.convert("P" if name.endswith("gif") else "RGB").save(
            pages / name, save_all=True, append_images=[second] if second else [],
            **({"compression": compression} if compression else {}))
    expect("pages", search(data, pages, "--exact"), [["a.tif", "b.tif"]])
    expect("named twice", search(data, work / "a.png", work / "a.png", work / "g.png"), [])
    expect("nothing", search(data, work / "a.png", work / "g.png"), [])

    # Cached files are not read again: same size and time, other contents.
    times = (work / "g.png").stat()
    Path(work, "g.png").write_bytes(b"x" * times.st_size)
    os.utime(work / "g.png", (times.st_mtime, times.st_mtime))
    expect("kept", search(data, work), alike)
    expect("kept and exact", search(data, work, "--exact"), [["e.png", "f.bmp"]])
    os.utime(work / "g.png", (times.st_mtime + 50, times.st_mtime + 50))
    search(data, work, status=1)

for fault in faults:
    print(fault)
sys.exit(1 if faults else 0)
