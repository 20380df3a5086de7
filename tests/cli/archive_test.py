#!/usr/bin/python3
"""The archive commands: what is extracted and what is not, and archives that other programs judge.
$FOTOMILL names the program."""
import hashlib
import hmac
import io
import json
import os
import shutil
import signal
import struct
import subprocess
import time
import zipfile
from pathlib import Path

import archive_files as make
from place import Place, bitmap, check, finish

PICTURE = bitmap()
NOISE = os.urandom(5000)


def outcome(place, *arguments):
    """Exit status and {file: status} of a command with --json."""
    status, out, err = place.run(*arguments, "--json")
    try:
        return status, {
            element.get("file", element.get("name")): element.get("status", 0)
            for element in json.loads(out)
        }
    except ValueError:
        return status, f"{out}{err}"


def tree(folder):
    return {
        str(path.relative_to(folder)): path.read_bytes()
        for path in sorted(folder.rglob("*"))
        if path.is_file()
    }


def reading(place):
    entries = [
        ("a.bmp", PICTURE),
        ("deep/er/b.txt", b"text"),
        ("deep/ü.txt", b"umlaut"),
        ("empty/", b"", 0o40755),
        ("none.txt", b""),
    ]
    expected = {name: contents for name, contents, *_ in entries if not name.endswith("/")}
    kinds = {
        "deflated.zip": make.zip_bytes(entries),
        "stored.zip": make.zip_bytes(entries, zipfile.ZIP_STORED),
        "bzip2.zip": make.zip_bytes(entries, zipfile.ZIP_BZIP2),
        "lzma.zip": make.zip_bytes(entries, zipfile.ZIP_LZMA),
        "five.rar": make.rar5([(name, contents) for name, contents, *_ in entries if contents]),
        "four.rar": make.rar4([("a.bmp", PICTURE), ("deep\\er\\b.txt", b"text")]),
    }
    for name, contents in kinds.items():
        place.files(name, contents=contents)
        want = {
            path: data
            for path, data in expected.items()
            if not name.endswith("rar") or (data and (name[1] == "i" or "ü" not in path))
        }
        if name == "four.rar":
            want = {"a.bmp": PICTURE, "deep/er/b.txt": b"text"}
        status, out, _ = place.run("archive", "list", name)
        check(
            (status, {line.split("\t")[2] for line in out.splitlines()} - {"empty/"}),
            (0, set(want)),
            f"list {name}",
        )
        check(outcome(place, "archive", "test", name), (0, dict.fromkeys(want, 0)), f"test {name}")
        check(
            outcome(place, "archive", "extract", name, "--dest", f"of-{name}")[0],
            0,
            f"extract {name}",
        )
        check(tree(place.path / f"of-{name}"), want, f"files of {name}")
    check(
        int((place.path / "of-stored.zip/a.bmp").stat().st_mtime),
        int(time.mktime(make.TIME + (0, 0, -1))),
        "time is kept",
    )
    place.run(
        "--set",
        "ArchivePreserveTimestamps=0",
        "--set",
        "ArchivePreservePaths=0",
        "archive",
        "extract",
        "stored.zip",
        "deep",
        "--dest",
        "flat",
    )
    check(sorted(tree(place.path / "flat")), ["b.txt", "ü.txt"], "without paths, one folder")
    check((place.path / "flat/b.txt").stat().st_mtime > time.time() - 600, True, "without times")
    check(
        outcome(place, "archive", "extract", "stored.zip", "*.bmp", "absent", "--dest", "some"),
        (1, {"absent": 1, "a.bmp": 0}),
        "a pattern, and a name that is not there",
    )
    place.files("cp437.zip", contents=make.raw_name_zip(b"gr\x81n.txt", b"x"))
    place.files("utf8.zip", contents=make.raw_name_zip("grün.txt".encode(), b"x"))
    for name in ("cp437.zip", "utf8.zip"):
        check(
            json.loads(place.run("archive", "list", name, "--json")[1])[0]["name"],
            "grün.txt",
            f"name in {name}",
        )
    place.run("archive", "extract", "utf8.zip")
    check((place.path / "grün.txt").read_bytes(), b"x", "without --dest it is beside the archive")
    place.run("--set", "ArchiveExtractPath=chosen", "archive", "extract", "utf8.zip")
    check(place.names("chosen"), ["grün.txt"], "ArchiveExtractPath")


def hostile(place):
    inner = {
        "../up.txt": 29,
        "a/../../up.txt": 29,
        "/absolute.txt": 29,
        "C:/x.txt": 29,
        "a/b\\c.txt": 29,
        "..": 29,
        "new\nline": 29,
        "x" * 256: 29,
        "a//b": 29,
        "good.txt": 0,
    }
    place.files("names.zip", contents=make.zip_bytes([(name, b"evil") for name in inner]))
    place.files(
        "names.rar",
        contents=make.rar5(
            [(name, b"evil") for name in ("../up.txt", "/absolute.txt", "good.txt")]
        ),
    )
    outside = set(place.names()) | {"in"}
    status, found = outcome(place, "archive", "extract", "names.zip", "--dest", "in/deep")
    check((status, {name: found.get(name) for name in inner}), (1, inner), "unsafe names")
    check(
        outcome(place, "archive", "extract", "names.rar", "--dest", "in/rar"),
        (1, {"../up.txt": 29, "/absolute.txt": 29, "good.txt": 0}),
        "unsafe names in RAR",
    )
    check(
        (set(place.names()), sorted(tree(place.path / "in"))),
        (outside, ["deep/good.txt", "rar/good.txt"]),
        "nothing outside",
    )
    place.files(
        "kinds.zip",
        contents=make.zip_bytes(
            [
                ("link", b"/etc/passwd", 0o120777),
                ("link/x", b"through"),
                ("device", b"", 0o20644),
                ("twice", b"1"),
                ("twice", b"2"),
            ]
        ),
    )
    status, found = outcome(place, "archive", "extract", "kinds.zip", "--dest", "kinds")
    check(
        (status, found),
        (1, {"link": 8, "device": 8, "link/x": 0, "twice": 0}),
        "links, devices, duplicates",
    )
    check(tree(place.path / "kinds"), {"link/x": b"through", "twice": b"1"}, "what is left of them")
    place.files("bomb.zip", contents=make.zip_bytes([("zeros", bytes(300 << 20)), ("more", b"x")]))
    check(
        outcome(place, "archive", "extract", "bomb.zip", "--dest", "bomb"),
        (1, {"zeros": 8}),
        "a bomb",
    )
    check(tree(place.path / "bomb"), {}, "no file of a bomb")
    check(
        "far more than its own size" in place.run("archive", "test", "bomb.zip")[2],
        True,
        "a bomb is named",
    )


def damaged(place):
    good = make.zip_bytes([("a.txt", b"first" * 50), ("b.txt", NOISE)])
    bad = bytearray(good)
    bad[good.index(b"b.txt") + 100] ^= 1
    split = bytearray(good)
    struct.pack_into("<HH", split, split.rindex(b"PK\5\6") + 4, 2, 2)
    rows = {
        "flipped.zip": (bytes(bad), {"a.txt": 0, "b.txt": 2}, ""),
        "cut.zip": (good[:-30], {"cut.zip": 2}, ""),
        "text.zip": (b"this is no archive", {"text.zip": 2}, ""),
        "empty.zip": (b"", {"empty.zip": 2}, ""),
        "split.zip": (bytes(split), {"split.zip": 8}, "split archive"),
        "volume5.rar": (
            make.rar5([("a", b"x")], archive_flags=1),
            {"volume5.rar": 8},
            "split archive",
        ),
        "volume4.rar": (
            make.rar4([("a", b"x")], archive_flags=1),
            {"volume4.rar": 8},
            "split archive",
        ),
        "locked5.rar": (make.locked_rar5(), {"locked5.rar": 25}, "RAR"),
        "locked4.rar": (make.rar4([("a", b"x")], archive_flags=0x80), {"locked4.rar": 25}, "RAR"),
        "secret4.rar": (make.rar4([("a", b"x" * 16)], file_flags=4), {"a": 25}, "RAR"),
    }
    for name, (contents, expected, hint) in rows.items():
        place.files(name, contents=contents)
        status, found = outcome(place, "archive", "extract", name, "--dest", f"of-{name}")
        check((status, found), (1, expected), name)
        folder = place.path / f"of-{name}"
        check(
            set(tree(folder)) if folder.exists() else set(),
            {file for file, code in expected.items() if code == 0},
            f"files of {name}",
        )
        check(hint in place.run("archive", "test", name)[2], True, f"message for {name}")
    check(
        outcome(place, "archive", "list", "absent.zip"),
        (1, {"absent.zip": 1}),
        "an archive that is not there",
    )
    check(place.run("archive", "list", "data")[0], 1, "a folder")


def passwords(place):
    place.files("right", contents=b"sesame\n")
    place.files("wrong", contents=b"simsalabim\r\n")
    place.files("blank", contents=b"\n")
    place.files("old.zip", contents=make.zip_crypto("a.bmp", PICTURE, b"sesame"))
    place.files("b.txt", contents=b"secret" * 100)
    place.files("c.jpg", contents=NOISE)
    check(
        place.run("archive", "create", "new.zip", "b.txt", "c.jpg", "--password-file", "right")[0],
        0,
        "an encrypted archive",
    )
    for archive, names in (("old.zip", ["a.bmp"]), ("new.zip", ["b.txt", "c.jpg"])):
        for arguments, code in (
            ([], 25),
            (["--password-file", "wrong"], 25),
            (["--password-file", "right"], 0),
        ):
            what = f"{archive} {arguments}"
            check(
                outcome(place, "archive", "extract", archive, "--dest", f"p-{archive}", *arguments),
                (1 if code else 0, dict.fromkeys(names, code)),
                what,
            )
            folder = place.path / f"p-{archive}"
            check(
                sorted(tree(folder)) if folder.exists() else [],
                [] if code else names,
                f"files: {what}",
            )
    check((place.path / "p-new.zip/b.txt").read_bytes(), b"secret" * 100, "decrypted")
    check("password" in place.run("archive", "test", "new.zip")[2], True, "a password is asked for")
    check(place.run("info", "old.zip", "--json")[1].count('"status":25'), 1, "an encrypted picture")
    check(place.run("archive", "test", "new.zip", "--password-file", "blank")[0], 2, "no password")
    check(
        place.run("archive", "test", "new.zip", "--password-file", "absent")[0],
        2,
        "no password file",
    )
    judge_aes((place.path / "new.zip").read_bytes(), b"sesame")


def judge_aes(data, password):
    """AES-256 as WinZip describes it: keys, verification value and authentication code."""
    with zipfile.ZipFile(io.BytesIO(data)) as archive:
        for info in archive.infolist():
            extra = info.extra
            at = extra.index(b"\x01\x99")
            version, vendor, strength = struct.unpack_from("<H2sB", extra, at + 4)
            check(
                (info.compress_type, vendor, strength, version in (1, 2)),
                (99, b"AE", 3, True),
                f"AES of {info.filename}",
            )
            header = info.header_offset
            start = header + 30 + sum(struct.unpack_from("<HH", data, header + 26))
            body = data[start : start + info.compress_size]
            keys = hashlib.pbkdf2_hmac("sha1", password, body[:16], 1000, 66)
            check(body[16:18], keys[64:], "verification value")
            check(
                body[-10:],
                hmac.new(keys[32:64], body[18:-10], "sha1").digest()[:10],
                "authentication code",
            )


def writing(place):
    place.files("pics/a.bmp", "pics/sub/b.bmp", "pics/sub/c.jpg", "pics/grün.txt", "pics/a.THN")
    (place.path / "pics/link").symlink_to("/etc")
    os.utime(place.path / "pics/a.bmp", (1_600_000_000, 1_600_000_000))
    names = ["pics/a.THN", "pics/a.bmp", "pics/grün.txt", "pics/sub/b.bmp", "pics/sub/c.jpg"]
    check(place.run("archive", "create", "dry.zip", "pics", "--dry-run")[0], 0, "a dry run")
    check("dry.zip" in place.names(), False, "writes nothing")
    status, found = outcome(
        place, "archive", "create", "made.zip", "pics", "./pics/a.bmp", "absent"
    )
    check((status, sorted(found)), (1, sorted([*names, "absent", "./pics/a.bmp"])), "created")
    with zipfile.ZipFile(place.path / "made.zip") as archive:
        check(archive.testzip(), None, "zipfile reads it")
        check(sorted(archive.namelist()), names, "its names")
        check(archive.read("pics/a.bmp"), PICTURE, "its contents")
        kinds = {info.filename: info.compress_type for info in archive.infolist()}
        check(
            (kinds["pics/a.bmp"], kinds["pics/sub/c.jpg"]),
            (zipfile.ZIP_DEFLATED, zipfile.ZIP_STORED),
            "how they are packed",
        )
        check(archive.getinfo("pics/a.bmp").date_time[0], 2020, "its time")
    if shutil.which("unzip"):
        check(
            subprocess.run(
                ["unzip", "-tq", place.path / "made.zip"], capture_output=True, check=False
            ).returncode,
            0,
            "unzip -t",
        )
    check(
        outcome(place, "archive", "extract", "made.zip", "--dest", "again", "pics")[0],
        0,
        "extracted again",
    )
    check(tree(place.path / "again"), {name: PICTURE for name in names}, "the same files")
    place.run(
        "--set",
        "ArchivePreservePaths=0",
        "--set",
        "ArchiveAddThumbnails=1",
        "archive",
        "create",
        "flat.zip",
        "pics/a.bmp",
    )
    with zipfile.ZipFile(place.path / "flat.zip") as archive:
        check(archive.namelist(), ["a.bmp", "a.THN"], "without paths, with the thumbnail")
    check(place.run("archive", "create", "x.rar", "pics")[0], 2, "RAR is not written")
    check(place.run("archive", "create", "none.zip", "absent")[0], 1, "nothing to archive")
    check("none.zip" in place.names(), False, "no empty archive")
    before = (place.path / "made.zip").read_bytes()
    check(
        place.run("archive", "create", "made.zip", "pics/a.bmp", "--overwrite", "skip")[0],
        0,
        "skip",
    )
    place.run("archive", "create", "made.zip", "pics/a.bmp")
    check(
        ((place.path / "made.zip").read_bytes() == before, "made [1].zip" in place.names()),
        (True, True),
        "the old one is kept",
    )
    place.run("archive", "create", "made.zip", "pics/a.bmp", "--overwrite", "replace")
    check((place.path / "made.zip").read_bytes() == before, False, "replaced if asked for")
    if os.geteuid() == 0 and not place.user:
        return
    (place.path / "locked").mkdir(mode=0o555)
    check(
        place.run("archive", "create", "locked/x.zip", "pics")[0],
        1,
        "a folder without write permission",
    )


def collisions(place):
    place.files("two.zip", contents=make.zip_bytes([("a/x.txt", b"1"), ("b/x.txt", b"2")]))
    place.files("out/x.txt", contents=b"mine")
    extract = ("--set", "ArchivePreservePaths=0", "archive", "extract", "two.zip", "--dest", "out")
    check(place.run(*extract, "--overwrite", "ask")[0], 2, "ask needs a terminal")
    place.run(*extract, "--overwrite", "skip")
    check(tree(place.path / "out"), {"x.txt": b"mine"}, "skip")
    status, out, _ = place.run(*extract, "--dry-run")
    check(
        (out, tree(place.path / "out")),
        ("a/x.txt -> out/x [1].txt\nb/x.txt -> out/x [2].txt\n", {"x.txt": b"mine"}),
        "a dry run",
    )
    place.run(*extract)
    check(
        tree(place.path / "out"),
        {"x.txt": b"mine", "x [1].txt": b"1", "x [2].txt": b"2"},
        "keep both",
    )
    place.run(*extract, "--overwrite", "replace")
    check(tree(place.path / "out")["x.txt"], b"1", "replace, but not what was just extracted")
    check(tree(place.path / "out")["x [3].txt"], b"2", "the second one")
    place.files("folder.zip", contents=make.zip_bytes([("y", b"file"), ("y/z", b"below")]))
    check(
        outcome(place, "archive", "extract", "folder.zip", "--dest", "mixed"),
        (1, {"y": 0, "y/z": 10}),
        "a file that is a folder too",
    )


def pictures(place):
    wide = bitmap(7, 2)
    place.files(
        "mixed.zip",
        contents=make.zip_bytes(
            [
                ("__MACOSX/._p2.bmp", b"junk"),
                (".hidden.bmp", b"junk"),
                ("readme.txt", b"text"),
                ("inner.zip", make.zip_bytes([("x.bmp", wide)])),
                ("p10.bmp", PICTURE),
                ("p2.bmp", wide),
            ]
        ),
    )
    place.files("roll/p1.bmp")
    place.files("roll/notes.zip", contents=make.zip_bytes([("readme.txt", b"text")]))
    check(place.run("verify", "roll")[0], 0, "archives in a folder are read only when named")
    facts = json.loads(place.run("info", "mixed.zip", "--json")[1])[0]
    check(
        (facts["status"], facts["format"], facts["width"], facts["pages"]),
        (0, "ZIP", 7, 2),
        "the first picture in natural order",
    )
    check(
        place.run("convert", "mixed.zip", "--to", "bmp", "--dest", "pages", "--page", "all")[0],
        0,
        "all pages",
    )
    check(
        sorted(len(data) for data in tree(place.path / "pages").values()),
        sorted([len(PICTURE), len(wide)]),
        "a file a picture",
    )
    place.files(
        "texts.zip",
        contents=make.zip_bytes([("a.txt", b"text"), ("b.zip", make.zip_bytes([("x.bmp", wide)]))]),
    )
    check(json.loads(place.run("info", "texts.zip", "--json")[1])[0]["status"], 20, "no picture")
    check(place.run("verify", "mixed.zip")[0], 0, "verify")
    check(place.run("thumbs", "make", "mixed.zip")[0], 0, "a thumbnail")
    check(
        sorted(path.name for path in (place.path / "tmp").iterdir()),
        [],
        "no temporary files are left",
    )


def interrupted(place):
    make.sparse_zip(place.path / "large.zip", 3 << 30)
    process = place.start("archive", "test", "large.zip")
    time.sleep(0.4)
    process.send_signal(signal.SIGTERM)
    begun = time.monotonic()
    process.communicate(timeout=20)
    check(
        (process.returncode, time.monotonic() - begun < 1),
        (143, True),
        "SIGTERM is seen within a second",
    )


for ordinary in (False, True):
    for part in (reading, hostile, damaged, passwords, writing, collisions, pictures, interrupted):
        if ordinary and part in (hostile, damaged, interrupted):
            continue
        with Place(ordinary) as where:
            part(where)
raise SystemExit(finish())
