#!/usr/bin/python3
"""Changed EXIF: exiftool sees the change and nothing else, exiv2 reads the files, and the pixels
stay the same. Also tests wrong usage. $FOTOMILL names the program; FOTOMILL_CORPUS adds real
pictures."""
import json
import shutil
import subprocess
import sys
from pathlib import Path

from place import Place, check, finish

try:
    from PIL import Image

    from judged_pictures import corpus_pictures, pixels, save_gif, save_psd, tags
except ImportError:
    sys.exit(77)

# What follows from any change, or is not a tag; and what a new directory begins with.
FOLLOWS = {
    "SourceFile",
    "File:ExifByteOrder",
    "RIFF:WebP_Flags",
    "File:FileType",
    "MPImage2:MPImageStart",
}  # it counts from its index
VERSIONS = {"ExifIFD:ExifVersion", "GPS:GPSVersionID"}


def sources(place):
    """Pictures of every kind in the folder "all": by Pillow, and undamaged ones of the corpus."""
    folder = place.path / "all"
    folder.mkdir()
    picture = Image.radial_gradient("L").convert("RGB").resize((40, 24))
    for suffix in ("jpg", "tif", "png", "webp"):
        picture.save(folder / f"made.{suffix}")
    picture.save(folder / "lossless.webp", lossless=True)
    # "Raw profile type": EXIF a second time, in a text
    found = (p for p in corpus_pictures() if b"Raw profile type" not in p.read_bytes())
    for number, path in enumerate(found):
        shutil.copy(path, folder / f"{number:03}-{path.name}")
    return folder


def judge(place, command, arguments, expected):
    """Runs a command over all pictures. `expected`: new values of tags by last word; None: gone."""
    before_folder = place.path / "all"
    after_folder = place.path / "changed"
    before = tags(before_folder)
    _, out, err = place.run("exif", command, "all", *arguments, "--dest", "changed", "--json")
    good = 0
    results = {Path(element["file"]).name: element for element in json.loads(out)}
    after = tags(after_folder)
    for name, element in results.items():
        if element["status"] != 0:
            check(f"{element['file']}: {element['message']} " in err, True, f"{name}: a reason")
            check((after_folder / name).exists(), False, f"{name}: failed and left no file")
            continue
        good += 1
        if not before:
            continue
        old, new = before[name], after[name]
        changed = {key for key in set(old) | set(new) if old.get(key) != new.get(key)} - FOLLOWS
        changed -= {
            key for key in VERSIONS if key not in old and new.get(key) in ("0230", "2 3 0 0")
        }
        for tag, value in expected.items():
            found = [
                str(new[key])
                for key in new
                if key.split(":")[-1] == tag
                and ":" in key
                and key.split(":")[0] in ("IFD0", "ExifIFD", "GPS")
            ]
            check(found, [] if value is None else [value], f"{command} {name}: {tag}")
        rest = {
            key: (old.get(key), new.get(key))
            for key in changed
            if key.split(":")[-1] not in expected
        }
        check(rest, {}, f"{command} {name}: all else")
        check(
            pixels(after_folder / name), pixels(before_folder / name), f"{command} {name}: pixels"
        )
    if shutil.which("exiv2"):
        for name in [n for n in results if n.startswith("made") or n.startswith("lossless")]:
            seen = subprocess.run(
                ["exiv2", "-pa", str(after_folder / name)],
                stdout=subprocess.PIPE,
                stderr=subprocess.PIPE,
                check=False,
            )
            check(seen.stderr, b"", f"{command} {name}: exiv2 has no complaint")
    shutil.rmtree(after_folder)
    return good


def change_everything():
    with Place() as place:
        count = len(list(sources(place).iterdir()))
        good = judge(
            place,
            "set",
            ["Artist=Zoë Q", "ISO=250", "Exposure time=1/250", "GPSAltitude=12.5"],
            {"Artist": "Zoë Q", "ISO": "250", "ExposureTime": "0.004", "GPSAltitude": "12.5"},
        )
        check(good >= count - 2, True, f"nearly all of {count} can be changed, not {good}")


def extend_webp():
    """A plain file gets a header that tells of its transparency."""
    with Place() as place:
        for mode, transparent in (("RGB", False), ("RGBA", True)):
            Image.new(mode, (9, 5), "red" if mode == "RGB" else (255, 0, 0, 9)).save(
                place.path / "a.webp", lossless=True
            )
            check((place.path / "a.webp").read_bytes()[12:16], b"VP8L", "a plain file")
            place.run("exif", "set", "a.webp", "--in-place", "Artist=x")
            data = (place.path / "a.webp").read_bytes()
            check(
                (data[12:16], data[20] & 0x18, data[24:30], len(data) - 8),
                (
                    b"VP8X",
                    0x18 if transparent else 0x08,
                    bytes([8, 0, 0, 4, 0, 0]),
                    int.from_bytes(data[4:8], "little"),
                ),
                f"{mode}: its new header",
            )


def hold_arguments():
    """What is a file, a tag or a mistake."""
    with Place() as place:
        picture = Image.new("RGB", (8, 8))
        picture.save(place.path / "a.jpg")
        shutil.copy(place.path / "a.jpg", place.path / "Flash")
        shutil.copy(place.path / "a.jpg", place.path / "x=y.jpg")
        before = {p.name: p.read_bytes() for p in place.path.iterdir() if p.is_file()}
        for arguments, message in [
            (["set", "a.jpg", "--in-place"], "Name at least one TAG=VALUE."),
            (["unset", "a.jpg", "--in-place"], "Name at least one TAG."),
            (["set", "a.jpg", "Artist=x"], "Choose --dest DIR, --out FILE or --in-place."),
            (["set", "a.jpg", "Artist=x", "--in-place", "--out", "b.jpg"], "cannot be combined"),
            (
                ["set", "a.jpg", "Artst=x", "--in-place"],
                'There is no EXIF tag "Artst". Did you mean "Artist"?',
            ),
            (
                ["unset", "a.jpg", "Artst", "--in-place"],
                'There is no EXIF tag "Artst". Did you mean "Artist"?',
            ),
            (["set", "a.jpg", "Artist=x", "Artist=y", "--in-place"], "was given twice."),
            (["set", "a.jpg", "0x0100=4", "--in-place"], "cannot be changed."),
            (["unset", "a.jpg", "MakerNote", "--in-place"], "cannot be changed."),
            (["set", "a.jpg", "ISO=0", "--in-place"], "1 to 32767."),
            (["set", "a.jpg", "Artist=x", "--out", "b.png"], "exif set keeps the format."),
            (["set", "Artist=x", "--in-place"], "No files given."),
        ]:
            status, out, err = place.run("exif", *arguments)
            check((status, out, message in err), (2, "", True), f"{arguments}: {err}")
        check(
            {p.name: p.read_bytes() for p in place.path.iterdir() if p.is_file()},
            before,
            "nothing was touched",
        )
        status, out, _ = place.run(
            "exif", "unset", "./Flash", "Flash", "--in-place", "--no-history"
        )
        check(status, 0, "a file named like a tag")
        status, out, _ = place.run("exif", "set", "x=y.jpg", "Artist=me", "--in-place")
        check((status, out), (0, "x=y.jpg -> x=y.jpg\n"), "a file with an equals sign")
        status, out, err = place.run("exif", "set", "x=y.jpg", "Artist=me", "--in-place")
        check((status, out, "already so." in err), (0, "", True), "nothing to do")
        status, _, err = place.run("exif", "set", "nothing.jpg", "Artist=me", "--in-place")
        check((status, "nothing.jpg: File open error." in err), (1, True), "a missing file")


SECRET = "SECRET-VALUE"
SECONDS = 38400000  # of the latitude 15.844, in millionths
XMP = (
    b'<?xpacket begin="" id="W5M0MpCehiHzreSzNTczkc9d"?><x:xmpmeta xmlns:x="adobe:ns:meta/">'
    b'<rdf:RDF '
    b'xmlns:rdf="http://www.w3.org/1999/02/22-rdf-syntax-ns#"><rdf:Description rdf:about="" '
    b'xmlns:exif="http://ns.adobe.com/exif/1.0/" xmlns:dc="http://purl.org/dc/elements/1.1/" '
    b'exif:GPSLatitude="SECRET-PLACE" dc:source="SECRET-VALUE">'
    b'<exif:GPSLongitude>SECRET-PLACE</exif:GPSLongitude></rdf:Description>'
    b'</rdf:RDF></x:xmpmeta>'
    b'<?xpacket end="w"?>'
)


def told(place):
    """Pictures that tell a lot; their names."""
    from PIL import ImageCms, PngImagePlugin

    picture = Image.radial_gradient("L").convert("RGB").resize((40, 24))
    exif = Image.Exif()
    exif[0x010E], exif[0x013B], exif[0x8298], exif[0x0112] = (
        SECRET,
        SECRET + "-artist",
        SECRET + "-right",
        6,
    )
    profile = ImageCms.ImageCmsProfile(ImageCms.createProfile("sRGB")).tobytes()
    text = PngImagePlugin.PngInfo()
    text.add_text("Comment", SECRET)
    text.add_text("Title", SECRET, zip=True)
    text.add_itxt("XML:com.adobe.xmp", XMP.decode())
    text.add(b"tIME", bytes([7, 232, 5, 31, 14, 3, 0]))
    picture.save(place.path / "t.png", exif=exif, icc_profile=profile, pnginfo=text)
    picture.save(place.path / "t.webp", exif=exif, icc_profile=profile, xmp=XMP)
    picture.save(place.path / "t.jpg", exif=exif, icc_profile=profile, comment=SECRET)
    data = (place.path / "t.jpg").read_bytes()
    iptc = (
        b"Photoshop 3.0\0"
        + b"8BIM\x04\x04\0\0"
        + (17).to_bytes(4, "big")
        + b"\x1c\x02\x50\0\x0c"
        + SECRET.encode()
        + b"\0"
    )
    segments = b"".join(
        b"\xff" + bytes([marker]) + (len(body) + 2).to_bytes(2, "big") + body
        for marker, body in [
            (0xE1, b"http://ns.adobe.com/xap/1.0/\0" + XMP),
            (0xED, iptc),
            (0xEC, b"Ducky" + SECRET.encode()),
        ]
    )
    scan = data.index(b"\xff\xdb")
    (place.path / "t.jpg").write_bytes(data[:scan] + segments + data[scan:])
    tags = {
        0x010E: SECRET,
        0x013B: SECRET,
        700: XMP,
        33723: b"\x1c\x02" + SECRET.encode(),
        34675: profile,
        0x0112: 6,
    }
    from PIL import TiffImagePlugin

    directory = TiffImagePlugin.ImageFileDirectory_v2()
    for tag, value in tags.items():
        directory[tag] = value
    picture.save(place.path / "t.tif", tiffinfo=directory)
    names = ["t.png", "t.webp", "t.jpg", "t.tif"]
    place.run(
        "exif",
        "set",
        *names,
        "--in-place",
        "GPSLatitude=15.844",
        "GPSLatitudeRef=N",
        "ISO=100",
        "DateTimeOriginal=2024:05:31 14:03:00",
    )
    data = (place.path / "t.jpg").read_bytes()
    behind = (
        b"\xff\xd8" + data[data.index(b"\xff\xe1") : data.index(b"\xff\xdb")] + b"\xff\xd9"
    )  # a picture behind the picture
    (place.path / "t.jpg").write_bytes(data + behind.replace(b"-artist", b"-before"))
    return names


def has_place(data):
    return any(
        SECONDS.to_bytes(4, order) + (1000000).to_bytes(4, order) in data
        for order in ("little", "big")
    )


def remove_for_good():
    """Nothing of what is removed is in the new file, and what is kept is."""
    with Place() as place:
        names = told(place)
        for name in names:
            old = (place.path / name).read_bytes()
            place.run("exif", "set", name, "--in-place", f"Artist={SECRET}-other")
            changed = (place.path / name).read_bytes()
            check(
                b"SECRET-VALUE-artist" in changed,
                False,
                f"{name}: the old value of a tag that was set",
            )
            (place.path / name).write_bytes(old)
            status, out, err = place.run("exif", "strip", name, "--out", "bare-" + name, "--json")
            bare = (place.path / ("bare-" + name)).read_bytes()
            check((status, b"SECRET" in bare), (0, False), f"{name}: strip")
            # in PNG it is compressed anew by nobody: the profile is as it was
            check(
                json.loads(out)[0]["note"],
                "Left in the file: orientation, color profile.",
                f"{name}: what is left",
            )
            check(
                pixels(place.path / ("bare-" + name)), pixels(place.path / name), f"{name}: pixels"
            )
            status, out, _ = place.run(
                "exif", "strip", name, "--out", "none-" + name, "--keep", "none", "--json"
            )
            check(
                json.loads(out)[0]["note"],
                "Nothing is left beside the picture.",
                f"{name}: --keep none",
            )
            status, out, _ = place.run(
                "exif", "strip", name, "--out", "kept-" + name, "--keep", "copyright,xmp", "--json"
            )
            kept = (place.path / ("kept-" + name)).read_bytes()
            check(
                (b"SECRET-PLACE" in kept, b"dc:source" in kept),
                (True, True),
                f"{name}: XMP is kept",
            )
            check(
                json.loads(out)[0]["note"],
                "Left in the file: EXIF, XMP.",
                f"{name}: copyright, xmp",
            )
            status, out, err = place.run("exif", "strip", "bare-" + name, "--in-place")
            check((status, "already so." in err), (0, True), f"{name}: stripped twice")
            status, _, err = place.run("exif", "strip", name, "--out", "gps-" + name, "--gps-only")
            gone = (place.path / ("gps-" + name)).read_bytes()
            check(
                (status, len(gone), b"SECRET-PLACE" in gone),
                (0, len(old), False),
                f"{name}: --gps-only {err}",
            )
            check(
                gone.count(b"SECRET-VALUE"), old.count(b"SECRET-VALUE"), f"{name}: all else stays"
            )
            check(
                (has_place(old), has_place(gone)),
                (True, False),
                f"{name}: the numbers of the place",
            )
            check(
                (has_place(bare), b"2024:05:31" in bare),
                (False, False),
                f"{name}: numbers and times",
            )
            facts = place.run("exif", "gps-" + name)[1]
            check(
                "DIRECTORY GPS" in facts or "Latitude" in facts, False, f"{name}: no GPS is shown"
            )
        status, _, err = place.run("exif", "strip", "t.jpg", "--in-place", "--keep", "gsp")
        check((status, 'Did you mean "gps"?' in err), (2, True), "an unknown word")
        place.files("x.bmp")
        status, _, err = place.run("exif", "strip", "x.bmp", "--in-place")
        check(
            (status, "Unsupported format. Metadata can be removed from" in err),
            (1, True),
            "another format",
        )


def strip_gif_and_psd():
    """All but the picture goes, and what is kept stays the same bytes."""
    with Place() as place:
        picture = Image.radial_gradient("L").convert("RGB").resize((40, 24))
        iptc = b"\x1c\x02\x19\0\x06SECRET\x1c\x02\x5a\0\x0cSECRET-PLACE"
        save_gif(picture, place.path / "t.gif")
        save_psd(
            picture,
            place.path / "t.psd",
            (1028, iptc),
            (1036, b"SECRET thumbnail"),
            (1086, b"SECRET/a.psd"),
        )
        packet = ["-XMP-photoshop:City=SECRET-PLACE", "-XMP-dc:Title=SECRET title"]
        for name, left in [
            ("t.gif", "Nothing is left beside the picture."),
            ("t.psd", "Nothing is left beside the picture."),
        ]:
            if shutil.which("exiftool"):
                subprocess.run(
                    ["exiftool", "-q", "-overwrite_original", *packet, place.path / name],
                    check=True,
                )
            old = (place.path / name).read_bytes()
            check(b"SECRET" in old, True, f"{name}: there is something")
            status, out, err = place.run("exif", "strip", name, "--out", "bare-" + name, "--json")
            bare = (place.path / ("bare-" + name)).read_bytes()
            check((status, b"SECRET" in bare), (0, False), f"{name}: {err}")
            check(json.loads(out)[0]["note"], left, f"{name}: what is left")
            check(
                pixels(place.path / ("bare-" + name)), pixels(place.path / name), f"{name}: pixels"
            )
            status, _, err = place.run("exif", "strip", "bare-" + name, "--in-place")
            check((status, "already so." in err), (0, True), f"{name}: stripped twice")
            place.run("exif", "strip", name, "--out", "gps-" + name, "--gps-only")
            gone = (place.path / ("gps-" + name)).read_bytes()
            check(
                (len(gone), b"SECRET-PLACE" in gone, gone.count(b"SECRET")),
                (len(old), False, old.count(b"SECRET") - old.count(b"SECRET-PLACE")),
                f"{name}: --gps-only",
            )
            status, _, err = place.run("exif", "set", name, "Artist=x", "--in-place")
            check((status, "EXIF can be changed in" in err), (1, True), f"{name}: no EXIF")
            check((place.path / name).read_bytes(), old, f"{name}: left alone")
        with Image.open(place.path / "bare-t.gif") as frames:
            check((frames.n_frames, frames.info["loop"]), (2, 0), "frames and loop")


def move_between():
    """copy, shift and owner."""
    with Place() as place:
        told(place)
        Image.new("RGB", (8, 8)).save(place.path / "plain.jpg")
        status, _, err = place.run(
            "exif", "shift", "t.jpg", "t.png", "plain.jpg", "--dest", "later", "+1:30:00"
        )
        check(
            (status, "plain.jpg: Information error. It has no date or time." in err),
            (1, True),
            f"shift: {err}",
        )
        for name in ("t.jpg", "t.png"):
            check(
                "DateTime of original data\t2024:05:31 15:33:00"
                in place.run("exif", "later/" + name)[1],
                True,
                f"shift {name}",
            )
        place.run("exif", "shift", "later/t.jpg", "--in-place", "--by=-24:00")
        check(
            "2024:05:30 15:33:00" in place.run("exif", "later/t.jpg")[1],
            True,
            "shift to the day before",
        )
        for wrong in (
            ["t.jpg", "--in-place"],
            ["t.jpg", "--in-place", "+1:99"],
            ["t.jpg", "--in-place", "--by=1:00"],
        ):
            check(place.run("exif", "shift", *wrong)[0], 2, f"shift {wrong}")
        status, _, err = place.run("exif", "copy", "t.jpg", "plain.jpg", "--in-place")
        seen = place.run("exif", "plain.jpg")[1]
        check(
            (
                status,
                "SECRET-VALUE-artist" in seen,
                "2024:05:31 14:03:00" in seen,
                "Orientation" in seen,
                "DIRECTORY GPS" in seen,
            ),
            (0, True, True, False, True),
            f"copy: {err}{seen}",
        )
        check(
            place.run("exif", "copy", "later/none.jpg", "plain.jpg", "--in-place")[0],
            2,
            "copy from nothing",
        )
        check(place.run("exif", "owner", "plain.jpg", "--in-place")[0], 2, "nobody is the owner")
        status, _, err = place.run(
            "--set",
            "ExifCopyrightHolder=Ann",
            "--set",
            "ExifNewImageTitle=Lake",
            "exif",
            "owner",
            "plain.jpg",
            "--in-place",
        )
        seen = place.run("exif", "plain.jpg")[1]
        check(
            (
                status,
                "Copyright holder\tAnn" in seen,
                "Image title\tLake" in seen,
                "SECRET-VALUE-artist" in seen,
            ),
            (0, True, True, True),
            f"owner: {err}",
        )


TRACK = """<?xml version="1.0"?>
<gpx version="1.1" xmlns="http://www.topografix.com/GPX/1/1"><trk><trkseg>
<trkpt lat="48.0" lon="11.0"><ele>500</ele><time>2024-05-31T12:00:00Z</time></trkpt>
<trkpt lat="48.2" lon="11.4"><ele>520</ele><time>2024-05-31T12:06:00Z</time></trkpt>
</trkseg></trk></gpx>"""


def go_places():
    """gps: from a track, a list, by hand; the link."""
    with Place() as place:
        told(place)
        place.files("walk.gpx", contents=TRACK.encode())
        place.files("data/Locations.gps", contents=b"# places\nHome = 45.5,-79.25\n")
        link = "https://www.openstreetmap.org/?mlat=%s&mlon=%s#map=15/%s/%s"
        for arguments, where in [
            (["--gpx", "walk.gpx", "--offset=-2:00"], ("48.10000", "11.20000")),
            (["--at", "-33.5,151.25"], ("-33.50000", "151.25000")),
            (["--place", "home"], ("45.50000", "-79.25000")),
        ]:
            for name in ("t.jpg", "t.png", "t.webp", "t.tif"):
                status, _, err = place.run(
                    "exif",
                    "gps",
                    name,
                    "--out",
                    "new-" + name,
                    "--overwrite",
                    "replace",
                    *arguments,
                )
                check(status, 0, f"gps {arguments} {name}: {err}")
                facts = json.loads(place.run("info", "new-" + name, "--json")[1])[0]
                check(facts["location"]["link"], link % (where * 2), f"gps {arguments} {name}")
                if shutil.which("exiftool"):
                    seen = tags(place.path / ("new-" + name))["new-" + name]
                    check(
                        (f"{seen['GPS:GPSLatitude']:.5f}", seen["GPS:GPSLatitudeRef"]),
                        (where[0].lstrip("-"), "S" if where[0][0] == "-" else "N"),
                        f"gps {arguments} {name}: exiftool",
                    )
        check("Location" in place.run("info", "new-t.jpg")[1], True, "info tells the place")
        for arguments, message in [
            ([], "Choose one of --gpx, --at and --place."),
            (["--at", "1,2", "--place", "x"], "Choose one of"),
            (["--at", "91,0"], "is not LAT,LON"),
            (["--at", "1,2", "--offset", "+1:00"], "--offset needs --gpx."),
            (["--gpx", "walk.gpx", "--offset", "1"], "is not an offset"),
            (["--place", "sea"], 'There is no place "sea"'),
        ]:
            status, out, err = place.run("exif", "gps", "t.jpg", "--in-place", *arguments)
            check((status, out, message in err), (2, "", True), f"gps {arguments}: {err}")
        place.files("empty.gpx", contents=b'<gpx version="1.1"/>')
        for track, number, message in [
            ("t.jpg", 2, 't.jpg: Damaged file. "t.jpg" is not a GPX track.'),
            ("none.gpx", 1, "none.gpx: File open error."),
            ("data", 1, "data: File open error."),
            ("empty.gpx", 7, "has no points with a time."),
        ]:
            before = (place.path / "t.jpg").read_bytes()
            status, out, err = place.run(
                "exif", "gps", "t.jpg", "--in-place", "--json", "--gpx", track
            )
            found = [(row["file"], row["status"]) for row in json.loads(out)]
            check((status, found, message in err), (1, [(track, number)], True), f"{track}: {err}")
            check((place.path / "t.jpg").read_bytes(), before, f"{track}: nothing was touched")
        status, _, err = place.run("exif", "gps", "t.jpg", "--in-place", "--gpx", "walk.gpx")
        check(
            (status, "The track has no point within 30 minutes of its time." in err),
            (1, True),
            "gps: too early",
        )


def main():
    if not shutil.which("exiftool"):
        print("exiftool is not installed: nobody judges the changed files")
    hold_arguments()
    extend_webp()
    remove_for_good()
    strip_gif_and_psd()
    move_between()
    go_places()
    change_everything()
    return finish()


if __name__ == "__main__":
    sys.exit(main())
