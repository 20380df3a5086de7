#!/usr/bin/python3
"""Changed keywords, ratings, labels and comments: exiftool sees the change and nothing else, exiv2
reads the files, and the pixels stay the same. Sidecars and comment files are where other programs
expect them. $FOTOMILL names the program; FOTOMILL_CORPUS adds real pictures."""
import json
import os
import re
import shutil
import subprocess
import sys
from pathlib import Path

from place import Place, bitmap, check, finish

try:
    from PIL import Image, PngImagePlugin

    import judged_pictures
    from judged_pictures import corpus_pictures, pixels, save_gif, save_psd
except ImportError:
    sys.exit(77)
if not shutil.which("exiftool"):
    sys.exit(77)

CHANGES = ["--rating", "4", "--label", "green", "--keywords", "Seen, Zoë", "--comment", "Bär & Co"]
# What the changes above may set, with its value; in other places only if it was there.
NEW = {
    "XMP-dc:Subject": ["Seen", "Zoë"],
    "XMP-xmp:Rating": 4,
    "XMP-xmp:Label": "Green",
    "XMP-dc:Description": "Bär & Co",
}
KEPT_IN_STEP = {
    "IPTC:Keywords": ["Seen", "Zoë"],
    "IPTC:Caption-Abstract": "Bär & Co",
    "IFD0:ImageDescription": "Bär & Co",
    "IFD0:Rating": 4,
    "IFD0:RatingPercent": 75,
    "XMP-microsoft:RatingPercent": 75,
    "XMP-digiKam:ColorLabel": 4,
    "XMP-digiKam:TagsList": None,
    "XMP-lr:HierarchicalSubject": None,
    "XMP-microsoft:LastKeywordXMP": None,
    "Photoshop:IPTCDigest": None,
}
# What follows from any change, or is not a tag.
FOLLOWS = {
    "SourceFile",
    "File:CurrentIPTCDigest",
    "IPTC:CodedCharacterSet",
    "RIFF:WebP_Flags",
    "GIF:GIFVersion",
    "File:FileType",
    "MPImage2:MPImageStart",
    "PNG:Rawprofiletypeiptc",
}
IPTC = b"".join(
    b"\x1c\x02" + bytes([number, 0, len(text)]) + text
    for number, text in (
        (5, b"Title"),
        (25, b"old"),
        (25, b"Caf\xe9"),
        (90, b"Town"),
        (120, b"cap"),
    )
)
RESOURCES = (
    b"8BIM\x04\x04\0\0"
    + len(IPTC).to_bytes(4, "big")
    + IPTC
    + bytes(len(IPTC) % 2)
    + b"8BIM\x03\xed\0\0"
    + (16).to_bytes(4, "big")
    + bytes([0, 72, 0, 0, 0, 1, 0, 1] * 2)
)


def tags(folder):
    return judged_pictures.tags(folder, "-charset", "iptc=Latin1", "-x", "ExifTool:all")


def with_segment(data, marker, payload):
    head = b"\xff" + bytes([marker]) + (len(payload) + 2).to_bytes(2, "big")
    return data[:2] + head + payload + data[2:]


def sources(place):
    """Pictures of every kind in the folder "all": by Pillow, and undamaged ones of the corpus."""
    folder = place.path / "all"
    folder.mkdir()
    picture = Image.radial_gradient("L").convert("RGB").resize((40, 24))
    exif = Image.Exif()
    exif[0x010E], exif[0x4746] = "Old title", 2
    for suffix in ("jpg", "tif", "png", "webp"):
        picture.save(folder / f"plain.{suffix}")
        picture.save(folder / f"exif.{suffix}", exif=exif)
    picture.save(folder / "lossless.webp", lossless=True)
    jpeg = (folder / "plain.jpg").read_bytes()
    (folder / "iptc.jpg").write_bytes(with_segment(jpeg, 0xED, b"Photoshop 3.0\0" + RESOURCES))
    text = PngImagePlugin.PngInfo()
    body = f"\niptc\n{len(RESOURCES):8}\n{RESOURCES.hex()}\n"
    text.add_text("Raw profile type iptc", body, zip=True)
    picture.save(folder / "iptc.png", pnginfo=text)
    picture.save(folder / "iptc.tif", tiffinfo={33723: IPTC, 34377: RESOURCES[-28:]})
    picture.convert("P").save(folder / "plain.gif")
    save_gif(picture, folder / "frames.gif")
    save_psd(picture, folder / "plain.psd")
    save_psd(picture, folder / "iptc.psd", (1028, IPTC), (1058, exif.tobytes()[6:]))
    for number, path in enumerate(corpus_pictures(".gif", ".psd")):
        shutil.copy(path, folder / f"{number:03}-{path.name}")
    return folder


def change_everything():
    with Place() as place:
        before_folder, after_folder = sources(place), place.path / "changed"
        before = tags(before_folder)
        _, out, err = place.run("tag", "all", *CHANGES, "--dest", "changed", "--json")
        after = tags(after_folder)
        results = json.loads(out)
        inside = 0
        for element in results:
            name = Path(element["file"]).name
            check(element["status"], 0, f"{name}: changed, or described in a sidecar")
            check(pixels(after_folder / name), pixels(before_folder / name), f"{name}: pixels")
            old, new = before[name], after[name]
            if name + ".xmp" in after:
                check(
                    (after_folder / name).read_bytes(),
                    (before_folder / name).read_bytes(),
                    f"{name}: a copy",
                )
                new = after[name + ".xmp"]
                check({k: v for k, v in new.items() if k in NEW}, NEW, f"{name}: sidecar")
                continue
            inside += 1
            for key, value in NEW.items():
                check(new.get(key), value, f"{name}: {key}")
            changed = {key for key in set(old) | set(new) if old.get(key) != new.get(key)}
            for key in sorted(changed - FOLLOWS - set(NEW)):
                has_iptc = key.startswith("IPTC:") and any(k.startswith("IPTC:") for k in old)
                if key in KEPT_IN_STEP and (key in old or has_iptc):
                    check(new.get(key), KEPT_IN_STEP[key] or new.get(key), f"{name}: {key}")
                else:
                    check((old.get(key), new.get(key)), "the same", f"{name}: {key}")
            for key in ("IPTC:Keywords", "IPTC:Caption-Abstract", "IFD0:Rating"):
                if key in old:
                    check(new.get(key), KEPT_IN_STEP[key], f"{name}: {key} follows")
        check(
            inside >= len(results) - 6, True, f"{inside} of {len(results)} hold their tags: {err}"
        )
        for name in [n for n in after if n[0].isalpha() and not n.endswith(".xmp")]:
            seen = (
                subprocess.run(
                    ["exiv2", "-pa", str(after_folder / name)],
                    stderr=subprocess.PIPE,
                    stdout=subprocess.PIPE,
                    check=False,
                )
                if shutil.which("exiv2")
                else None
            )
            check(seen.stderr if seen else b"", b"", f"{name}: exiv2 has no complaint")
        # the same again changes nothing, and removing leaves only what was there before
        kept = {p.name: p.read_bytes() for p in after_folder.iterdir()}
        place.run("tag", "changed", *CHANGES, "--in-place")
        check(
            [n for n, data in kept.items() if (after_folder / n).read_bytes() != data],
            [],
            "a second time",
        )
        place.run(
            "tag",
            "changed",
            "--rating",
            "0",
            "--label",
            "none",
            "--keywords",
            "",
            "--comment",
            "",
            "--in-place",
        )
        for name, new in tags(after_folder).items():
            if name + ".xmp" in kept:
                continue
            left = {"XMP-dc:Subject", "XMP-xmp:Label", "XMP-dc:Description", "IPTC:Keywords"} & set(
                new
            )
            check((left, new.get("XMP-xmp:Rating", 0)), (set(), 0), f"{name}: removed")


def keep_sidecars():
    """Which sidecar is read and written, and that it keeps all else."""
    with Place() as place:
        corpus = Path(os.environ.get("FOTOMILL_CORPUS") or "/nonexistent") / "xmp"
        for path in sorted(corpus.glob("*.xmp")):
            if path.name == "xmpsdk.xmp":
                continue  # exiftool takes it for a plain text
            place.files("a.bmp")
            shutil.copy(path, place.path / "a.bmp.xmp")
            before = tags(place.path / "a.bmp.xmp")["a.bmp.xmp"]
            status, out, _ = place.run(
                "tag",
                "a.bmp",
                "--in-place",
                "--rating",
                "3",
                "--add-keyword",
                "new",
                "--label",
                "red",
            )
            after = tags(place.path / "a.bmp.xmp")["a.bmp.xmp"]
            rest = {
                k: (before.get(k), after.get(k))
                for k in set(before) | set(after)
                if before.get(k) != after.get(k) and k not in NEW and k not in KEPT_IN_STEP
            }
            if status != 0:
                check(after, before, f"{path.name}: left alone")
                (place.path / "a.bmp.xmp").unlink()
                continue
            check((after.get("XMP-xmp:Rating"), rest), (3, {}), f"{path.name}: all else")
            old = before.get("XMP-dc:Subject", [])
            check(
                after["XMP-dc:Subject"] if old else "new",
                (old if isinstance(old, list) else [old]) + ["new"] if old else "new",
                f"{path.name}: added",
            )
            (place.path / "a.bmp.xmp").unlink()
        packet = (
            '<x:xmpmeta xmlns:x="adobe:ns:meta/"><rdf:RDF xmlns:rdf="http://www.w3.org/1999/02/'
            '22-rdf-syntax-ns#"><rdf:Description rdf:about="" xmlns:p="http://ns.adobe.com/'
            'photoshop/1.0/" p:SidecarForExtension="%s"/></rdf:RDF></x:xmpmeta>'
        )
        for extension, written in (("BMP", "b.xmp"), ("CR2", "b.bmp.xmp")):
            place.files("b.bmp")
            (place.path / "b.xmp").write_text(packet % extension)
            place.run("tag", "b.bmp", "--in-place", "--rating", "5")
            changed = {p.name for p in place.path.glob("b*.xmp") if "xmp:Rating" in p.read_text()}
            check(changed, {written}, f"b.xmp of a {extension} file")
            info = json.loads(place.run("info", "b.bmp", "--json")[1])[0]
            check(info.get("tags"), {"rating": 5}, "what a sidecar says is read")
            for old in place.path.glob("b*.xmp"):
                old.unlink()
        Image.new("RGB", (8, 8)).save(place.path / "c.jpg")
        data = (place.path / "c.jpg").read_bytes()
        place.run("tag", "c.jpg", "--sidecar", "--comment", "Beside")
        check(
            (
                (place.path / "c.jpg").read_bytes(),
                "Beside" in (place.path / "c.jpg.xmp").read_text(),
            ),
            (data, True),
            "--sidecar leaves the picture alone",
        )
        for comment in ("Beside", "Other"):
            place.run("tag", "c.jpg", "--dest", comment, "--comment", comment)
            copied = (place.path / comment / "c.jpg.xmp").read_text()
            check(comment in copied, True, "the sidecar goes with the copy")
        place.run("tag", "c.jpg", "--in-place", "--comment", "Both")
        check(
            [tags(place.path / n)[n]["XMP-dc:Description"] for n in ("c.jpg", "c.jpg.xmp")],
            ["Both", "Both"],
            "an existing sidecar follows",
        )
        (place.path / "c.jpg.xmp").write_text("<broken")
        data = (place.path / "c.jpg").read_bytes()
        status, _, err = place.run("tag", "c.jpg", "--in-place", "--comment", "New")
        check(
            (
                status,
                (place.path / "c.jpg.xmp").read_text(),
                "sidecar c.jpg.xmp cannot be changed" in err,
            ),
            (1, "<broken", True),
            "a damaged sidecar is left alone",
        )
        check((place.path / "c.jpg").read_bytes(), data, "and so is its picture")
        (place.path / "c.jpg.xmp").unlink()
        (place.path / "real").write_text(packet % "")
        (place.path / "c.jpg.xmp").symlink_to("real")
        status, _, err = place.run("tag", "c.jpg", "--in-place", "--comment", "New")
        check((status, "is a link" in err, (place.path / "c.jpg.xmp").is_symlink()),
              (1, True, True), "a link to a sidecar is kept")
        check((place.path / "c.jpg").read_bytes(), data, "and so is its picture")
        (place.path / "c.jpg.xmp").unlink()
        words = "".join(f"<rdf:li>{i}</rdf:li>" for i in range(200000))
        (place.path / "c.jpg.xmp").write_text((packet % "").replace("/></rdf:RDF>",
            f'><dc:subject xmlns:dc="http://purl.org/dc/elements/1.1/"><rdf:Bag>{words}</rdf:Bag>'
            "</dc:subject></rdf:Description></rdf:RDF>"))
        check(place.run("tag", "c.jpg", "--sidecar", "--add-keyword", "one")[0], 0, "many keywords")
        check(len(re.findall("<rdf:li>", (place.path / "c.jpg.xmp").read_text())), 200001,
              "all of them are kept")
        err = place.run("exif", "strip", "c.jpg", "--in-place")[2]
        check("sidecar c.jpg.xmp still has metadata" in err, True, "exif strip names the sidecar")


def keep_split_packets():
    """Properties of the second part of a split packet are not written a second time."""
    head = (
        '<x:xmpmeta xmlns:x="adobe:ns:meta/"><rdf:RDF xmlns:rdf="http://www.w3.org/1999/02/22-rdf-'
        'syntax-ns#"><rdf:Description rdf:about="" xmlns:n="http://ns.adobe.com/xmp/note/" '
        'xmlns:xmp="http://ns.adobe.com/xap/1.0/" %s></rdf:Description></rdf:RDF></x:xmpmeta>'
    )
    second = (head % 'xmp:Label="Blue"').encode()
    with Place() as place:
        import hashlib

        digest = hashlib.md5(second).hexdigest().upper()
        Image.new("RGB", (8, 8)).save(place.path / "a.jpg")
        data = (place.path / "a.jpg").read_bytes()
        size = len(second)
        half = size // 2
        for start in (half, 0):
            part = second[start:half] if start < half else second[start:]
            data = with_segment(
                data,
                0xE1,
                b"http://ns.adobe.com/xmp/extension/\0"
                + digest.encode()
                + size.to_bytes(4, "big")
                + start.to_bytes(4, "big")
                + part,
            )
        first = head % f'n:HasExtendedXMP="{digest}"'
        data = with_segment(data, 0xE1, b"http://ns.adobe.com/xap/1.0/\0" + first.encode())
        (place.path / "a.jpg").write_bytes(data)
        info = json.loads(place.run("info", "a.jpg", "--json")[1])[0]
        check(info.get("tags"), {"label": "Blue"}, "the second part is read")
        place.run("tag", "a.jpg", "--in-place", "--rating", "2")
        check(tags(place.path / "a.jpg")["a.jpg"].get("XMP-xmp:Rating"), 2, "another tag")
        place.run("tag", "a.jpg", "--in-place", "--label", "red")
        check(
            (
                tags(place.path / "a.jpg")["a.jpg"]["XMP-xmp:Label"],
                tags(place.path / "a.jpg.xmp")["a.jpg.xmp"]["XMP-xmp:Label"],
            ),
            ("Blue", "Red"),
            "a tag of the second part goes to a sidecar",
        )


def write_comment_files():
    with Place() as place:
        place.files("a.bmp")
        setting = [
            "--set",
            "WriteFileComments=1",
            "--set",
            f"FileCommentPath={place.path}/notes",
            "--set",
            "TextCommentExtension=note",
        ]
        place.run(*setting, "tag", "a.bmp", "--in-place", "--comment", "Größe")
        note = place.path / "notes" / "a.bmp.note"
        check(note.read_text() if note.exists() else None, "Größe\n", "a comment file")
        note.write_text("By hand\n")
        info = json.loads(place.run(*setting, "info", "a.bmp", "--json")[1])[0]
        check(info["tags"]["comment"], "By hand", "comment files are read")
        place.run("tag", "a.bmp", "--in-place", "--comment", "x")
        check(
            (note.read_text(), (place.path / "a.bmp.txt").exists()),
            ("By hand\n", False),
            "none is written unless wanted",
        )


def hold_arguments():
    with Place(ordinary=True) as place:
        place.files("a.bmp")
        for arguments, message in [
            (["--in-place"], "Choose --rating"),
            (["--in-place", "--rating", "6"], "is not one of"),
            (["--rating", "3"], "Choose --dest DIR, --out FILE or --in-place."),
            (["--rating", "3", "--sidecar", "--in-place"], "cannot be combined"),
            (["--comment", "a", "--comment", "b", "--in-place"], "was given twice"),
            (["--comment", "a\x01", "--in-place"], "control characters"),
        ]:
            status, out, err = place.run("tag", "a.bmp", *arguments)
            check((status, out, message in err), (2, "", True), f"{arguments}: {err}")
        place.path.chmod(0o555)
        status, _, err = place.run("tag", "a.bmp", "--in-place", "--rating", "1")
        check((status, "cannot be created" in err), (1, True), f"a locked folder: {err}")
        place.path.chmod(0o777)
        status, out, _ = place.run("tag", "a.bmp", "--in-place", "--rating", "1", "--dry-run")
        check((status, list(place.path.glob("*.xmp"))), (0, []), "a dry run writes nothing")


for case in (
    change_everything,
    keep_sidecars,
    keep_split_packets,
    write_comment_files,
    hold_arguments,
):
    case()
sys.exit(finish())
