#!/usr/bin/env python3
"""What commands that rename or replace pictures do to their thumbnails. $FOTOMILL names the
program."""
import json
import sys

from place import Place, check, finish

DATABASE = "Fotomill.tdb"

ROWS = [
    # arguments, pictures whose records are marked deleted, thumbnail files that are left
    (["rename", "a.bmp", "--base", "z"], ["a.bmp"], ["b.THN", "z0001.THN"]),
    (["rename", "a.bmp", "--base", "z", "--dry-run"], [], ["a.THN", "b.THN"]),
    (["turn", "a.bmp", "--rotate", "left", "--in-place"], ["a.bmp"], ["b.THN"]),
    (["turn", "a.bmp", "--rotate", "left", "--in-place", "--dry-run"], [], ["a.THN", "b.THN"]),
    (["convert", "a.bmp", "--out", "b.bmp", "--overwrite", "replace"], ["b.bmp"], ["a.THN"]),
    (["convert", "a.bmp", "--out", "b.bmp", "--overwrite", "keep-both"], [], ["a.THN", "b.THN"]),
    (["convert", "a.bmp", "--to", "pcx"], [], ["a.THN", "b.THN"]),
    (["info", "a.bmp"], [], ["a.THN", "b.THN"]),
]


def deleted(place, database):
    records = json.loads(place.run("tdb", "list", database, "--json")[1])["records"]
    return [record["path"].rsplit("/", 1)[1] for record in records if record["deleted"]]


def marks():
    for arguments, marked, left in ROWS:
        with Place() as place:
            place.files("a.bmp", "b.bmp")
            for database in (DATABASE, "data/" + DATABASE):
                check(place.run("tdb", "add", database, "a.bmp", "b.bmp")[0], 0, "tdb add")
            check(place.run("thumbs", "make", "a.bmp", "b.bmp")[0], 0, "thumbs make")
            check(place.run(*arguments)[0], 0, f"{arguments}: status")
            for database in (DATABASE, "data/" + DATABASE):
                check(deleted(place, database), marked, f"{arguments}: {database}")
            check([name for name in place.names() if name.endswith(".THN")], left,
                  f"{arguments}: thumbnail files")
            count = place.run("tdb", "compact", DATABASE)[1]
            check(count, f"2 -> {2 - len(marked)} records\n", f"{arguments}: compact")


def without_rights():
    """A database that may not be written to stops no renaming, and is read."""
    with Place(ordinary=True) as place:
        place.files("a.bmp")
        check(place.run("tdb", "add", DATABASE, "a.bmp")[0], 0, "tdb add")
        (place.path / DATABASE).chmod(0o444)
        before = (place.path / DATABASE).read_bytes()
        check(place.run("tdb", "find", DATABASE, "a.bmp", "--out", "x.THN")[0], 0, "find")
        check(place.run("tdb", "delete", DATABASE, "a.bmp")[0], 1, "delete")
        status, out, err = place.run("rename", "a.bmp", "--base", "z")
        check((status, err), (0, "One file was processed.\n"), "rename")
        check((place.path / DATABASE).read_bytes(), before, "the database")


if __name__ == "__main__":
    marks()
    without_rights()
    sys.exit(finish())
