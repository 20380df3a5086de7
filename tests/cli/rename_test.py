#!/usr/bin/env python3
"""Sequential renaming by options: names, numbers, and what is left for the next run. $FOTOMILL
names the program."""
import sys

from place import Place, check, finish


ROWS = [
    # options, names of three files, the configured number afterwards
    ([], ["PICTURE0001.bmp", "PICTURE0002.bmp", "PICTURE0003.bmp"], 4),
    (["--base", "sea "], ["sea 0001.bmp", "sea 0002.bmp", "sea 0003.bmp"], 1),
    (["--start", "8", "--increment", "3"], ["PICTURE0008.bmp", "PICTURE0011.bmp",
                                            "PICTURE0014.bmp"], 1),
    (["--start", "0", "--digits", "2"], ["PICTURE00.bmp", "PICTURE01.bmp", "PICTURE02.bmp"], 1),
    (["--increment", "5"], ["PICTURE0001.bmp", "PICTURE0006.bmp", "PICTURE0011.bmp"], 16),
    (["--base", "x", "--set", "SequentialRenameBaseNumber=7"],
     ["x0007.bmp", "x0008.bmp", "x0009.bmp"], 1),
    (["--base", "x", "--set", "SequentialRenamePrefix=1"], ["x0001.bmp", "x0002.bmp", "x0003.bmp"],
     1),
    (["--base", "x", "--reverse"], ["x0001.bmp", "x0002.bmp", "x0003.bmp"], 1),
]


def main():
    for options, names, number in ROWS:
        with Place() as place:
            place.files("f/a.bmp", "f/b.bmp", "f/c.bmp")
            status, out, _ = place.run("rename", "f", *options)
            check(status, 0, f"{options}: status")
            check(place.names("f"), names, f"{options}: names")
            first = "c" if "--reverse" in options else "a"
            check(out.splitlines()[0], f"f/{first}.bmp -> f/{names[0]}",
                  f"{options}: the first file")
            check(place.run("config", "get", "SequentialRenameBaseNumber")[1].split()[-1],
                  str(number), f"{options}: next number")
            check(place.run("rename", "--undo")[0], 0, f"{options}: undo")
            check(place.names("f"), ["a.bmp", "b.bmp", "c.bmp"], f"{options}: names again")
            check(place.run("config", "get", "SequentialRenameBaseNumber")[1].split()[-1], "1",
                  f"{options}: number again")
    with Place() as place:
        place.files("f/a.bmp")
        for options in (["--base", "../x"], ["--base", ""], ["--start", "-1"], ["--increment", "0"],
                        ["--undo", "--base", "x"]):
            check(place.run("rename", "f", *options)[0], 2, f"{options}: refused")
        check(place.names("f"), ["a.bmp"], "nothing was renamed")
    return finish()


if __name__ == "__main__":
    sys.exit(main())
