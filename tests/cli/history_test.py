#!/usr/bin/env python3
"""Which commands record files in the file history. $FOTOMILL names the program."""
import sys

from place import Place, check, finish


ALL = "FileHistoryFunctions=1048575"

ROWS = [
    # arguments, functions recorded
    (["convert", "a.bmp", "--to", "pcx"], ["Convert"]),
    (["rename", "a.bmp"], ["Move and copy"]),
    (["turn", "a.bmp", "--rotate", "left", "--dest", "out"], ["Transform"]),
    (["thumbs", "make", "a.bmp"], ["Catalog"]),
    (["tdb", "add", "x.tdb", "a.bmp"], ["Catalog"]),
    (["info", "a.bmp"], []),
    (["verify", "a.bmp"], []),
    (["exif", "a.bmp"], []),
    (["thumbs", "make", "a.bmp", "--dry-run"], []),
    (["convert", "a.bmp", "--to", "pcx", "--dry-run"], []),
]


def main():
    for arguments, functions in ROWS:
        for options, expected in (([], functions), (["--no-history"], [])):
            with Place() as place:
                place.files("a.bmp")
                check(place.run("--set", ALL, *arguments, *options)[0], 0,
                      f"{arguments} {options}: status")
                lines = place.run("--set", ALL, "history", "list")[1].splitlines()
                check([line.split("\t")[1] for line in lines], expected,
                      f"{arguments} {options}: history")
                check("FMWFileHistoryDatabase.fhdb" in place.names("data"), expected != [],
                      f"{arguments} {options}: its file")
    return finish()


if __name__ == "__main__":
    sys.exit(main())
