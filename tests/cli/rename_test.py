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


# Files with their contents, pattern and options, new names with contents.
PATTERNS = [
    ("abc", ["%c"], {"1": "a", "2": "b", "3": "c"}),
    ("abc", ["%03c-%F", "--start", "8", "--increment", "2"],
     {"008-a": "a", "010-b": "b", "012-c": "c"}),
    ("12", ["%c", "--reverse"], {"1": "2", "2": "1"}),
    ("123", ["%c", "--reverse"], {"1": "3", "2": "2", "3": "1"}),
    ("123", ["%c", "--start", "2"], {"2": "1", "3": "2", "4": "3"}),
    ("a", [" %D{%Y} %F "], {"2020 a": "a"}),
    ("a", ["%%%F %E{Model}"], {"%a": "a"}),
]


def patterns():
    """Names by a pattern: files may exchange names, and undo restores them."""
    for files, options, names in PATTERNS:
        with Place() as place:
            for name in files:
                place.files(f"f/{name}.dat", contents=name.encode(), time=1_600_000_000 * 10**9)
            listed = [f"f/{name}.dat" for name in files]
            before = place.names("f")
            _, dry, _ = place.run("rename", *listed, "--pattern", *options, "--dry-run")
            check(place.names("f"), before, f"{options}: dry run")
            status, out, _ = place.run("rename", *listed, "--pattern", *options)
            check((status, out), (0, dry), f"{options}: result")
            check({path.stem: path.read_text() for path in (place.path / "f").iterdir()}, names,
                  f"{options}: names")
            check(place.run("rename", "--undo")[0], 0, f"{options}: undo")
            check({path.stem: path.read_text() for path in (place.path / "f").iterdir()},
                  {name: name for name in files}, f"{options}: names again")
    with Place() as place:
        place.files("f/1.bmp", "f/2.bmp", "f/x.bmp")
        (place.path / "f/2.bmp").write_bytes(b"keep")
        status, _, err = place.run("rename", "f/1.bmp", "f/x.bmp", "none.bmp", "--pattern", "2")
        check((status, place.names("f")), (1, ["1.bmp", "2.bmp", "x.bmp"]), "taken names")
        check((place.path / "f/2.bmp").read_bytes(), b"keep", "no file is replaced")
        check([name in err for name in ("f/1.bmp: ", "f/x.bmp: ", "none.bmp: ")], [True] * 3,
              "each failure is reported")
        status, out, _ = place.run("rename", "f/1.bmp", "f/x.bmp", "f/1.bmp", "--pattern", "same")
        check((status, place.names("f"), out), (1, ["2.bmp", "same.bmp", "x.bmp"],
                                                "f/1.bmp -> f/same.bmp\n"), "one name for two")
        for options in (["a/b"], ["%Q"], [""], [" "], [".."], ["%D{%Q}"], ["%F", "--base", "x"],
                        ["%F", "--undo"]):
            check(place.run("rename", "f", "--pattern", *options)[0], 2, f"{options}: refused")
        check(place.names("f"), ["2.bmp", "same.bmp", "x.bmp"], "nothing was renamed")


OF_NEF = """<x:xmpmeta xmlns:x="adobe:ns:meta/">
 <rdf:RDF xmlns:rdf="http://www.w3.org/1999/02/22-rdf-syntax-ns#">
  <rdf:Description rdf:about="" xmlns:photoshop="http://ns.adobe.com/photoshop/1.0/"
    photoshop:SidecarForExtension="NEF"/>
 </rdf:RDF>
</x:xmpmeta>"""

# Files with their contents, the arguments, new names with contents.
SIDECARS = [
    ("goes along", {"a.bmp": "a", "a.bmp.xmp": "A"}, ["a.bmp", "--pattern", "b"],
     {"b.bmp": "a", "b.bmp.xmp": "A"}),
    ("comment", {"a.bmp": "a", "a.bmp.txt": "A"}, ["a.bmp", "--pattern", "b"],
     {"b.bmp": "a", "b.bmp.txt": "A"}),
    ("comment, listed too", {"a.bmp": "a", "a.bmp.txt": "A"},
     ["a.bmp", "a.bmp.txt", "--base", "b", "--digits", "1"], {"b1.bmp": "a", "b1.bmp.txt": "A"}),
    ("text of another kind", {"a.bmp": "a", "a.bmp.txt": "A"},
     ["a.bmp", "--pattern", "b", "--set", "TextCommentExtension=cmt"],
     {"b.bmp": "a", "a.bmp.txt": "A"}),
    ("comments elsewhere", {"a.bmp": "a", "a.bmp.txt": "A"},
     ["a.bmp", "--pattern", "b", "--set", "FileCommentPath=notes"],
     {"b.bmp": "a", "a.bmp.txt": "A"}),
    ("in sequence", {"a.bmp": "a", "a.xmp": "A"}, ["a.bmp", "--base", "b", "--digits", "1"],
     {"b1.bmp": "a", "b1.xmp": "A"}),
    ("both kinds", {"a.nef": "a", "a.xmp": "A", "a.nef.xmp": "B"}, ["a.nef", "--pattern", "b"],
     {"b.nef": "a", "b.xmp": "A", "b.nef.xmp": "B"}),
    ("exchanged", {"1.bmp": "1", "1.bmp.xmp": "A", "2.bmp": "2", "2.bmp.xmp": "B"},
     ["1.bmp", "2.bmp", "--pattern", "%c", "--reverse"],
     {"1.bmp": "2", "1.bmp.xmp": "B", "2.bmp": "1", "2.bmp.xmp": "A"}),
    ("in a chain", {"1.bmp": "1", "1.bmp.xmp": "A", "2.bmp": "2", "2.bmp.xmp": "B"},
     ["1.bmp", "2.bmp", "--pattern", "%c", "--start", "2"],
     {"2.bmp": "1", "2.bmp.xmp": "A", "3.bmp": "2", "3.bmp.xmp": "B"}),
    ("listed too", {"a.bmp": "a", "a.bmp.xmp": "A", "b.bmp": "b"},
     ["a.bmp.xmp", "a.bmp", "b.bmp", "--pattern", "%c"],
     {"1.bmp": "a", "1.bmp.xmp": "A", "2.bmp": "b"}),
    ("listed too, the other kind", {"a.nef": "a", "a.xmp": "A"},
     ["a.nef", "a.xmp", "--pattern", "b"], {"b.nef": "a", "b.xmp": "A"}),
    ("shared with another", {"a.nef": "a", "a.jpg": "j", "a.xmp": "A"}, ["a.jpg", "--pattern", "b"],
     {"a.nef": "a", "b.jpg": "j", "a.xmp": "A"}),
    ("shared, both renamed", {"a.nef": "a", "a.jpg": "j", "a.xmp": "A"},
     ["a.jpg", "a.nef", "--pattern", "b"], {"b.nef": "a", "b.jpg": "j", "b.xmp": "A"}),
    ("named as its own", {"a.nef": "a", "a.jpg": "j", "a.xmp": OF_NEF},
     ["a.nef", "--pattern", "b"], {"b.nef": "a", "a.jpg": "j", "b.xmp": OF_NEF}),
    ("of the other", {"a.nef": "a", "a.jpg": "j", "a.xmp": OF_NEF},
     ["a.jpg", "--pattern", "b"], {"a.nef": "a", "b.jpg": "j", "a.xmp": OF_NEF}),
]


def sidecars():
    """Sidecars go along, and come back with undo."""
    def contents(place):
        return {path.name: path.read_text() for path in (place.path / "f").iterdir()}

    for what, files, options, after in SIDECARS:
        with Place() as place:
            for name, text in files.items():
                place.files(f"f/{name}", contents=text.encode())
            listed = [f"f/{option}" if option in files else option for option in options]
            _, dry, _ = place.run("rename", *listed, "--dry-run")
            check(contents(place), files, f"{what}: dry run")
            status, out, err = place.run("rename", *listed)
            check((status, out, contents(place)), (0, dry, after), f"{what}: names {err}")
            (place.path / "empty").mkdir()
            place.run("rename", "--undo", "empty")
            check(contents(place), after, f"{what}: undo of nothing")
            check(place.run("rename", "--undo")[0], 0, f"{what}: undo")
            check(contents(place), files, f"{what}: names again")
    files = {"a.bmp": "a", "a.bmp.xmp": "A", "b.bmp.xmp": "B", "c2.bmp.xmp": "C"}
    with Place() as place:
        for name, text in files.items():
            place.files(f"f/{name}", contents=text.encode())
        for dry in (["--dry-run"], []):
            status, _, err = place.run("rename", "f/a.bmp", "--pattern", "b", *dry)
            check((status, '"b.bmp.xmp" exists' in err), (1, True), f"taken by another's: {err}")
        check(contents(place), files, "no sidecar is replaced")
        place.run("rename", "f/a.bmp", "--base", "c", "--start", "2", "--digits", "1")
        check(contents(place), {"b.bmp.xmp": "B", "c2.bmp.xmp": "C", "c3.bmp": "a",
                                "c3.bmp.xmp": "A"}, "the next number is free")


def main():
    patterns()
    sidecars()
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
