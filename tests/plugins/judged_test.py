#!/usr/bin/env python3
"""The tools of the libraries see the pictures that the plug-ins see, and read what they write."""
import json
import os
import shutil
import subprocess
import sys
import tempfile
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]
FOTOMILL = os.environ["FOTOMILL"]
CORPUS = os.environ.get("FOTOMILL_CORPUS")
TOOLS = ["avifdec", "avifenc", "djxl", "cjxl", "heif-convert", "opj_decompress", "opj_compress",
         "dcraw_emu", "pngtopam", "exiftool"]
missing = [tool for tool in TOOLS if not shutil.which(tool)]
if missing:
    print("skipped: not installed: " + " ".join(missing))
    sys.exit(77)
EXTENSIONS = {row["extension"] for row in json.loads(
    subprocess.run([FOTOMILL, "plugins", "--json"], stdout=subprocess.PIPE, check=True).stdout)}
SAMPLES = ["bmp-true-color.bmp", "bmp-256-colors.bmp", "bmp-alpha.bmp"]
faults = []
checked = 0


def check(what, good):
    global checked
    checked += 1
    if not good:
        faults.append(what)


def run(*command):
    return subprocess.run([str(part) for part in command], stdout=subprocess.PIPE,
                          stderr=subprocess.PIPE, check=False)


def fotomill(*arguments):
    return run(FOTOMILL, "-q", *arguments)


def pixels(png):
    """The samples of a PNG file as red, green, blue, alpha."""
    pam = run("pngtopam", "-alphapam", png).stdout if png.exists() else b""
    head, _, samples = pam.partition(b"ENDHDR\n")
    if b"DEPTH 4" not in head or b"MAXVAL 255\n" not in head:
        return None
    return head.split(b"MAXVAL")[0], samples


def decode(path, png):
    """Decodes a file with the tool of its library."""
    kind = path.suffix
    if kind == ".avif":
        return run("avifdec", "-d", "8", path, png)
    if kind == ".jxl":
        return run("djxl", path, png, "--bits_per_sample=8")
    if kind in (".jp2", ".j2k"):
        return run("opj_decompress", "-i", path, "-o", png)
    if kind == ".svg":
        return run("rsvg-convert", path, "-o", png)
    return run("heif-convert", path, png)


def compare(path, folder):
    """Whether we and the tool read a file as the same picture."""
    ours, theirs = folder / (path.name + ".ours.png"), folder / (path.name + ".theirs.png")
    decode(path, theirs)
    fotomill("convert", path, "--to", "png", "--out", ours)
    expected = pixels(theirs)
    check(f"{path.name}: another picture", expected is not None and pixels(ours) == expected)


def data_folder(folder, *options):
    """A data folder with options of modules."""
    data = folder / "data"
    data.mkdir(exist_ok=True)
    (data / "Fotomill Professional 11.ini").write_text("\n".join(["[Plugins]", *options, ""]))
    return data


def test_writing(folder):
    """The tools read what we write, lossless formats exactly."""
    for name in SAMPLES:
        source = PROJECT / "samples" / name
        png = folder / (name + ".png")
        fotomill("convert", source, "--to", "png", "--out", png)
        for extension, options in [("avif", []), ("avif", ["--quality", "20"]), ("jxl", []),
                                   ("jxl", ["--quality", "40"]), ("jp2", []), ("j2k", []),
                                   ("jp2", ["--quality", "30"])]:
            if extension not in EXTENSIONS:
                continue
            written = folder / f"{name}{len(options)}.{extension}"
            result = fotomill("convert", source, "--to", extension, "--out", written, *options)
            check(f"{written.name}: {result.stderr}", result.returncode == 0)
            compare(written, folder)
        data = data_folder(folder, "FMWPL_jpegxl.so.Lossless=1", "FMWPL_jpeg2000.so.Quality=100")
        for extension in EXTENSIONS & {"jxl", "jp2"}:
            lossless = folder / (name + ".lossless." + extension)
            fotomill("--data", data, "convert", source, "--to", extension, "--out", lossless)
            back = folder / (lossless.name + ".png")
            decode(lossless, back)
            check(f"{lossless.name}: not without loss", pixels(back) == pixels(png))


def test_reading(folder):
    """We read what the tools write, with its metadata."""
    source = folder / "source.png"
    fotomill("convert", PROJECT / "samples/bmp-true-color.bmp", "--to", "png", "--out", source)
    run("exiftool", "-overwrite_original", "-Artist=A. N. Other", "-Orientation#=6",
        "-XMP-dc:Title=A title", "-DateTimeOriginal=2004:08:31 22:32:08", source)
    jpeg = folder / "source.jpg"
    fotomill("convert", source, "--to", "jpg", "--out", jpeg)
    for extension, command in [("avif", ["avifenc", "-s", "8", jpeg]), ("jxl", ["cjxl", jpeg])]:
        if extension not in EXTENSIONS:
            continue
        path = folder / ("tool." + extension)
        run(*command, path)
        result = json.loads(fotomill("exif", "--json", path).stdout or b"[{}]")
        info = json.loads(fotomill("info", "--json", path).stdout)[0]
        check(f"{path.name}: {info}", info["status"] == 0)
        text = json.dumps(result)
        check(f"{path.name}: no EXIF: {text}", "A. N. Other" in text)
        found = json.loads(fotomill("find", "--json", path).stdout)[0]
        check(f"{path.name}: not found by its tags: {found}",
              found["taken"] == "2004-08-31 22:32:08" and found["title"] == "A title")


def test_metadata(folder):
    """EXIF, XMP and the profile travel through both writers, and turned pictures stay upright."""
    source = folder / "meta.jpg"
    fotomill("convert", PROJECT / "samples/bmp-true-color.bmp", "--to", "jpg", "--out", source)
    run("exiftool", "-overwrite_original", "-Artist=A. N. Other", "-Orientation#=6",
        "-XMP-dc:Title=A title", source)
    width, height = (json.loads(fotomill("info", "--json", source).stdout)[0][key]
                     for key in ("width", "height"))
    for extension in ("avif", "jxl"):
        if extension not in EXTENSIONS:
            continue
        path = folder / ("meta." + extension)
        fotomill("convert", source, "--to", extension, "--out", path)
        png = folder / ("meta." + extension + ".png")
        fotomill("convert", path, "--to", "png", "--out", png)
        tags = json.loads(run("exiftool", "-json", png).stdout)[0]
        check(f"{extension}: {tags}", tags.get("Artist") == "A. N. Other" and
              tags.get("Title") == "A title" and tags.get("Orientation") in
              (None, "Horizontal (normal)"))
        check(f"{extension}: turned by EXIF", (tags["ImageWidth"], tags["ImageHeight"]) ==
              (height, width))


def test_transcoding(folder):
    """JPEG files come back byte for byte, from our command and from the library's tool."""
    if "jxl" not in EXTENSIONS:
        return
    jpeg, stored, again = folder / "a.jpg", folder / "a.jxl", folder / "again.jpg"
    fotomill("convert", PROJECT / "samples/bmp-true-color.bmp", "--to", "jpg", "--out", jpeg)
    check("transcode", fotomill("transcode", jpeg, "--to", "jxl").returncode == 0)
    run("djxl", stored, again)
    check("djxl restores another file", again.read_bytes() == jpeg.read_bytes())
    before = stored.read_bytes()
    result = fotomill("transcode", jpeg, "--to", "jxl")
    check("an existing file is kept", result.returncode == 1 and b"--replace" in result.stderr and
          stored.read_bytes() == before)
    (folder / "back").mkdir()
    fotomill("transcode", stored, "--to", "jpg", "--dest", folder / "back")
    check("restored", (folder / "back/a.jpg").read_bytes() == jpeg.read_bytes())
    fotomill("convert", jpeg, "--to", "jxl", "--out", folder / "pixels.jxl")
    for path, to in [(folder / "pixels.jxl", "jpg"), (PROJECT / "samples/bmp-mono.bmp", "jxl")]:
        result = fotomill("transcode", path, "--to", to, "--dest", folder / "none")
        check(f"{path.name}: {result.stderr}", result.returncode == 1 and
              not list((folder / "none").iterdir()))


def test_corpus(folder):
    unlike = {"hdr_pq_test.jxl", "pq_gradient.jxl"}  # the tool keeps the range of HDR pictures
    for name in ("avif", "heic", "jxl", "jp2", "svg"):
        for path in sorted((Path(CORPUS) / name).iterdir()):
            if path.name in unlike or name not in EXTENSIONS:
                continue
            decode(path, folder / "known.png")
            if pixels(folder / "known.png") is not None:
                compare(path, folder)
            (folder / "known.png").unlink(missing_ok=True)


def test_raw(folder):
    """Raw files are developed as by the library's program with the same options."""
    if "nef" not in EXTENSIONS:
        return
    data = data_folder(folder, "FMWPL_raw.so.Picture=2")
    for path in sorted((Path(CORPUS) / "raw").iterdir()):
        ours, theirs = folder / "ours.ppm", folder / "theirs.ppm"
        run("dcraw_emu", "-w", "-g", "2.4", "12.92", "-Z", theirs, path)
        if theirs.exists() and theirs.stat().st_size > 0:
            fotomill("--data", data, "convert", path, "--to", "ppm", "--out", ours)
            check(f"{path.name}: another picture",
                  ours.exists() and ours.read_bytes() == theirs.read_bytes())
        for file in (ours, theirs):
            file.unlink(missing_ok=True)


for test in [test_writing, test_reading, test_metadata, test_transcoding] + (
        [test_corpus, test_raw] if CORPUS else []):
    with tempfile.TemporaryDirectory() as place:
        test(Path(place))
print("\n".join(faults) if faults else f"the tools agree in {checked} cases")
sys.exit(1 if faults or checked == 0 else 0)
