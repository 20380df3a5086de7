"""Shared by the scripts that compare pictures before and after a change: pictures of the corpus,
their tags as exiftool sees them, and their pixels. Needs Pillow."""
import json
import os
import subprocess
from pathlib import Path

from PIL import Image

SUFFIXES = {".jpg", ".jpeg", ".tif", ".tiff", ".png", ".webp", ".wdp", ".hdp"}


def corpus_pictures(*more):
    """Undamaged pictures below $FOTOMILL_CORPUS, also with further suffixes; none if it is not
    set."""
    corpus = Path(os.environ.get("FOTOMILL_CORPUS") or "/nonexistent")
    wanted = SUFFIXES.union(more)
    found = (p for p in corpus.rglob("*") if p.suffix.lower() in wanted and "bad" not in p.parts)
    return sorted(found)


def save_gif(picture, path, **more):
    """Two frames that are repeated, with a comment."""
    frames = [picture.convert("P"), picture.rotate(180).convert("P")]
    frames[0].save(path, save_all=True, append_images=frames[1:], loop=0, duration=80,
                   comment="SECRET-comment", **more)


def save_psd(picture, path, *resources):
    """A Photoshop file without layers; each of the resources is a number with its data."""
    block = b"".join(b"8BIM" + number.to_bytes(2, "big") + bytes(2)
                     + len(data).to_bytes(4, "big") + data + bytes(len(data) % 2)
                     for number, data in [(1005, bytes([0, 72, 0, 0, 0, 1, 0, 1] * 2)), *resources])
    width, height = picture.size
    Path(path).write_bytes(
        b"8BPS\0\1" + bytes(6) + b"\0\3" + height.to_bytes(4, "big") + width.to_bytes(4, "big")
        + b"\0\x08\0\3" + bytes(4) + len(block).to_bytes(4, "big") + block + bytes(4) + bytes(2)
        + b"".join(band.tobytes() for band in picture.convert("RGB").split()))


def tags(folder, *options):
    """What exiftool finds in each file: tags with their groups, by file name."""
    out = subprocess.run(
        ["exiftool", "-j", "-n", "-G1", "-a", "-u", "-b", "-x", "System:all", "-x",
         "Composite:all", *options, str(folder)],
        stdout=subprocess.PIPE, stderr=subprocess.DEVNULL, check=False).stdout
    return {Path(facts["SourceFile"]).name: facts for facts in json.loads(out or "[]")}


def pixels(path):
    try:
        with Image.open(path) as picture:
            return picture.size, picture.tobytes()
    except Exception:  # whatever Pillow cannot read, it must not read differently afterwards
        return None
