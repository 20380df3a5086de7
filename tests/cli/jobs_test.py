#!/usr/bin/python3
"""Every command line of docs/user/jobs.md works as written, in sequence, and produces a result."""
import os
import subprocess
import sys
import tempfile
from pathlib import Path

try:
    from PIL import Image, ImageDraw
except ImportError:
    sys.exit(77)

PROJECT = Path(__file__).resolve().parents[2]
FOTOMILL = Path(os.environ["FOTOMILL"])
WRITES = {"--dest": Path.is_dir,
          "--out": Path.is_file}  # the expected result for the option's value


def photo(path, seed, size=(320, 240), orientation=1):
    image = Image.radial_gradient("L").resize(size).convert("RGB")
    ImageDraw.Draw(image).rectangle([seed * 9, 40, seed * 9 + 60, 120],
                                    fill=(200, seed * 20 % 256, 40))
    exif = Image.Exif()
    exif[0x0112] = orientation
    exif[0x0132] = f"2026:07:{seed:02} 10:00:00"
    exif[0x010F] = "Maker"
    exif.get_ifd(0x8769)[0x9003] = f"2026:07:{20 - seed:02} 10:00:00"
    image.save(path, exif=exif, quality=90)


def prepare(folder):
    (folder / "holiday/day2").mkdir(parents=True)
    for i in range(1, 5):
        photo(folder / f"holiday/IMG_{i}.jpg", i, orientation=6 if i == 2 else 1)
    photo(folder / "holiday/day2/IMG_9.jpg", 9)
    photo(folder / "portrait.jpg", 7)
    os.utime(folder / "portrait.jpg", (1, 1))
    (folder / "scans").mkdir()
    page = Image.new("L", (400, 560), 255)
    for y in range(60, 500, 40):
        ImageDraw.Draw(page).line([60, y, 340, y], fill=0, width=8)
    page.rotate(1.5, fillcolor=255).save(folder / "scans/page.png")
    (folder / "old").mkdir()
    for name in ("pcx-256-colors.pcx", "mac-mono.mac", "xbm-mono.xbm"):
        (folder / "old" / name).write_bytes((PROJECT / "samples" / name).read_bytes())


def jobs():
    for line in (PROJECT / "docs/user/jobs.md").read_text(encoding="utf-8").splitlines():
        if line.startswith("    "):
            yield line.strip()


def examples():
    """The command lines of the README, without their comments."""
    readme = (PROJECT / "README.md").read_text(encoding="utf-8")
    for line in readme.split("\n## Ten examples\n")[1].split("\n## ")[0].splitlines():
        if line.startswith("    "):
            yield line.split("  #")[0].strip()


def main():
    failures, count = 0, 0
    shown = list(examples())
    if len(shown) != 10 or not set(shown) <= set(jobs()):
        failures += 1
        print("examples of the README that are not in docs/user/jobs.md:", set(shown) - set(jobs()))
    with tempfile.TemporaryDirectory() as name:
        folder = Path(name)
        prepare(folder)
        environment = dict(os.environ, PATH=f"{FOTOMILL.parent}:{os.environ['PATH']}",
                           FOTOMILL_DATA=str(folder / "data"))
        for line in jobs():
            count += 1
            result = subprocess.run(["bash", "-o", "pipefail", "-c", line], cwd=folder,
                                    env=environment, capture_output=True,
                                    text=True, stdin=subprocess.DEVNULL)
            words = line.split()
            wanted = [(folder / words[i + 1], WRITES[word]) for i, word in enumerate(words)
                      if word in WRITES]
            missing = [path.name for path, is_there in wanted if "--dry-run" not in words
                       and not is_there(path)]
            if result.returncode != 0 or missing or not (result.stdout or wanted):
                failures += 1
                print(f"{line}\n  status {result.returncode}, missing {missing}")
                print(f"{result.stdout}{result.stderr}")
        renamed = sorted(path.name for path in (folder / "holiday").glob("*.jpg"))
        if renamed != [f"IMG_{i}.jpg" for i in range(1, 5)]:
            failures += 1
            print("undone names:", renamed)
        small = [path.stat().st_size for path in (folder / "mail").glob("*.jpg")]
        if not small or max(small) > 200000:
            failures += 1
            print("mail:", small)
        with Image.open(folder / "upright/IMG_2.jpg") as turned:
            if turned.size != (240, 320):
                failures += 1
                print("upright:", turned.size)
    print(f"{count} jobs, {failures} failures")
    return failures > 0 or count < 25


sys.exit(main())
