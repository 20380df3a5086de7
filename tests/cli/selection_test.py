#!/usr/bin/env python3
"""Which files of folders and lists a command takes, and in which order. $FOTOMILL names the
program."""
import struct
import sys

from place import Place, bitmap, check, finish


def dated_jpeg(date):
    """Not a picture, but EXIF with DateTimeOriginal."""
    text = date.encode() + b"\0"
    directory = struct.pack(">HHHIII", 1, 0x8769, 4, 1, 26, 0)
    directory += struct.pack(">HHHIII", 1, 0x9003, 2, len(text), 44, 0) + text
    block = b"Exif\0\0MM\0*\0\0\0\x08" + directory
    return b"\xFF\xD8\xFF\xE1" + struct.pack(">H", len(block) + 2) + block + b"\xFF\xD9"


def taken(place, *arguments, **more):
    """The files that a command takes, in order."""
    _, out, _ = place.run("convert", "--dry-run", "-t", "pcx", "-d", "out", *arguments, **more)
    return [line.split(" -> ")[0] for line in out.splitlines()]


def left_out():
    with Place() as place:
        place.files("f/a.bmp", "f/.h.bmp", "f/._a.bmp", "f/.cache/x.bmp", "f/sub/c.bmp",
                    "f/sub/.d.bmp")
        place.files("f/1.mov", "f/2.MOV", "f/sub/3.mov", "f/b.mp4", "f/README", "f/.DS_Store",
                    "f/a.THN", "f/Fotomill.tdb",
                    contents=b"?")
        rows = [
            (["f"], ["f/a.bmp"],
             "6 other files were left out: 2 .mov, 1 without extension, 1 .mp4, 2 hidden"),
            (["f", "-r"], ["f/a.bmp", "f/sub/c.bmp"],
             "8 other files were left out: 3 .mov, 1 without extension, 1 .mp4, 3 hidden"),
            (["f", "--hidden"], ["f/._a.bmp", "f/.h.bmp", "f/a.bmp"],
             "5 other files were left out: 2 .mov, 1 without extension, 1 .ds_store, 1 .mp4"),
            (["f", "--hidden", "-r"],
             ["f/._a.bmp", "f/.cache/x.bmp", "f/.h.bmp", "f/a.bmp", "f/sub/.d.bmp", "f/sub/c.bmp"],
             None),
            (["f/.cache"], ["f/.cache/x.bmp"], ""),
            (["f/.h.bmp"], ["f/.h.bmp"], ""),
        ]
        for arguments, expected, line in rows:
            check(taken(place, *arguments), expected, arguments)
            err = place.run("info", *arguments)[2].splitlines()
            if line is not None:
                check([text for text in err if "left out" in text], [line] if line else [],
                      f"{arguments}, its line")
            check(err[-1].endswith("processed."), True, f"{arguments}, the count line")
        place.files("one/x.mov", contents=b"?")
        check(place.run("verify", "one"), (0, "",
                                           "One other file was left out: 1 .mov\nNo files were processed.\n"), "a movie")
        check(place.run("verify", "one", "--quiet"), (0, "", ""), "a movie, quiet")
        check(place.run("verify", "one/x.mov")[0], 1, "a movie by its name")
        place.files(*[f"many/x.e{i}" for i in range(7)], "many/y.e6")
        errors = place.run("info", "many", "--json")[2]
        check("left out: 2 .e6, 1 .e0, 1 .e1, 1 .e2, 1 .e3, ..." in errors, True, "many kinds")


def order():
    with Place() as place:
        place.files("f/img10.bmp", contents=bitmap(), time=3_000_000_001)
        place.files("f/img2.bmp", contents=bitmap(30, 2), time=3_000_000_002)
        place.files("f/IMG1.bmp", contents=bitmap(20, 2), time=5_000_000_000)
        names = ["f/IMG1.bmp", "f/img2.bmp", "f/img10.bmp"]
        rows = [
            (["f"], names),
            (["f", "--reverse"], names[::-1]),
            (["f/img2.bmp", "f/img10.bmp", "f/IMG1.bmp"],
             ["f/img2.bmp", "f/img10.bmp", "f/IMG1.bmp"]),
            (["f/img2.bmp", "f/img10.bmp", "f/IMG1.bmp", "--sort", "name"], names),
            (["f", "--sort", "none"], ["f/IMG1.bmp", "f/img10.bmp", "f/img2.bmp"]),
            (["f", "--sort", "time"], ["f/img10.bmp", "f/img2.bmp", "f/IMG1.bmp"]),
            (["f", "--sort", "size"], ["f/img10.bmp", "f/IMG1.bmp", "f/img2.bmp"]),
            (["f", "--sort", "size", "--reverse"], ["f/img2.bmp", "f/IMG1.bmp", "f/img10.bmp"]),
        ]
        for arguments, expected in rows:
            check(taken(place, *arguments), expected, arguments)
        check(place.run("info", "f", "--sort", "date")[0], 2, "an unknown order")
        place.files("x/2.bmp", "y/1.bmp")
        check(taken(place, "y", "x", "--sort", "name"), ["x/2.bmp", "y/1.bmp"],
              "two folders sorted together")
        check(taken(place, "y", "x"), ["y/1.bmp", "x/2.bmp"], "two folders as named")
        status, out, _ = place.run("rename", "f", "--dry-run", "--sort", "time")
        check((status, out.splitlines()[0]), (0, "f/img10.bmp -> f/PICTURE0001.bmp"),
              "rename by time")


def order_by_date():
    with Place() as place:
        year = 365 * 86400 * 10**9
        place.files("b.jpg", contents=dated_jpeg("1999:08:31 22:32:08"), time=0)
        place.files("a.jpg", contents=dated_jpeg("1999:08:31 22:32:07"), time=40 * year)
        place.files("c.bmp", time=20 * year)
        place.files("d.bmp", time=40 * year)
        _, out, _ = place.run("rename", ".", "--sort", "taken", "--dry-run")
        check([line[2] for line in out.splitlines()], list("cabd"),
              "files by the date they were taken")


def main():
    for case in (left_out, order, order_by_date):
        case()
    return finish()


if __name__ == "__main__":
    sys.exit(main())
