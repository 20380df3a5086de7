"""Shared by the scripts that compare pictures before and after a change: pictures of the corpus,
their tags as exiftool sees them, and their pixels. Needs Pillow."""
import json
import os
import subprocess
from pathlib import Path

from PIL import Image

SUFFIXES = {".jpg", ".jpeg", ".tif", ".tiff", ".png", ".webp", ".wdp", ".hdp"}


def corpus_pictures():
    """Undamaged pictures below $FOTOMILL_CORPUS; none if it is not set."""
    corpus = Path(os.environ.get("FOTOMILL_CORPUS") or "/nonexistent")
    found = (p for p in corpus.rglob("*") if p.suffix.lower() in SUFFIXES and "bad" not in p.parts)
    return sorted(found)


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
