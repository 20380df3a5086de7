#!/usr/bin/env python3
"""A dry run reports the failures of the real run, and changes nothing. $FOTOMILL names the
program."""
import sys

from place import Place, bitmap, check, finish


def failed(err):
    """The failed files and their messages, without the closing lines."""
    return [line for line in err.splitlines() if ": " in line]


def snapshot(place):
    return {path.relative_to(place.path): path.read_bytes() if path.is_file() else None
            for path in place.path.rglob("*") if not {"data", "tmp"} & set(path.parts)}


# Arguments, whether the folder "shut" is writable, whether a file fails.
ROWS = [
    (["rename", "shut"], False, True),
    (["rename", "shut"], True, False),
    (["rename", "f", "shut/gone.bmp"], True, True),
    (["turn", "shut", "--rotate", "left", "--in-place"], False, True),
    (["turn", "f", "--rotate", "left", "--dest", "shut/deep/er"], False, True),
    (["turn", "f", "--rotate", "left", "--dest", "f/a.bmp/x"], False, True),
    (["turn", "bad", "--rotate", "left", "--dest", "out"], False, True),
    (["turn", "f", "--rotate", "left", "--dest", "out/deep"], False, False),
    (["thumbs", "make", "shut"], False, True),
    (["thumbs", "make", "bad", "f"], False, True),
    (["convert", "shut", "--to", "pcx"], False, True),
    (["convert", "f", "--to", "pcx", "--dest", "shut/deep"], False, True),
    (["convert", "f/a.bmp", "--out", "none/x.pcx"], False, True),
    (["convert", "f/a.bmp", "--out", "x.pcx"], False, False),
]


def main():
    for arguments, writable, fails in ROWS:
        with Place(ordinary=True) as place:
            place.files("shut/a.bmp", "shut/b.bmp", "f/a.bmp", "bad/good.bmp", "bad/protected.bmp")
            place.files("bad/short.bmp", contents=bitmap(30, 30)[:200])
            place.files("bad/a.pcx", contents=b"no picture")
            (place.path / "bad/protected.bmp").chmod(0)
            (place.path / "shut").chmod(0o777 if writable else 0o555)
            (place.path / "bad/protected.bmp").chmod(0o644)
            before = snapshot(place)
            status, out, err = place.run(*arguments, "--dry-run")
            check(snapshot(place), before, f"{arguments}: what a dry run leaves")
            check(place.names("data"), [], f"{arguments}: the data folder after a dry run")
            check(status, 1 if fails else 0, f"{arguments}: status of the dry run")
            real = place.run(*arguments)
            check((real[0], real[1], failed(real[2])), (status, out, failed(err)),
                  f"{arguments}: the run after it")
    return finish()


if __name__ == "__main__":
    sys.exit(main())
