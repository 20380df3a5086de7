#!/usr/bin/env python3
"""File times set by `touch`, as stat and exiftool see them. $FOTOMILL names the program."""
import json
import os
import shutil
import subprocess
import sys
import time

from place import Place, check, finish

LONG_AGO = 1_600_000_000
# Options, local times of the three files, relative to the first file's own time if a number.
ROWS = [
    (["--at", "2024-05-31 14:03:09"], ["2024-05-31 14:03:09"] * 3),
    (["--at", "2024:07:01T14:03"], ["2024-07-01 14:03:00"] * 3),
    (["--at", "1969-12-31"], ["1969-12-31 00:00:00"] * 3),
    (["--at", "2024-05-31 23:59:50", "--increment", "10"],
     ["2024-05-31 23:59:50", "2024-06-01 00:00:00", "2024-06-01 00:00:10"]),
    (["--increment", "1:30:00"], [0, 5400, 10800]),
    (["--increment=-0:00:05"], [0, -5, -10]),
    (["--set", "FileTimeYear=2020", "--set", "FileTimeMonth=2", "--set", "FileTimeDay=29",
      "--set", "FileTimeSequential=1", "--set", "FileTimeIncrement=3600"],
     ["2020-02-29 00:00:00", "2020-02-29 01:00:00", "2020-02-29 02:00:00"]),
]


def text(seconds):
    return time.strftime("%Y-%m-%d %H:%M:%S", time.localtime(seconds))


def undo():
    """`touch --undo` gives the very times back, but not to files that were changed since."""
    names = ["a.bmp", "b.bmp", "c.bmp"]
    with Place(ordinary=True) as place:
        place.files(*names, time=LONG_AGO * 10**9 + 5)
        log = place.path / "data" / "FMWTimesUndo.dat"

        def times():
            return [(place.path / name).stat().st_mtime_ns - LONG_AGO * 10**9 for name in names]

        place.run("touch", *names, "--at", "2024-05-31", "--set", "FileTimeUpdateAccess=1")
        dry = place.run("touch", "--undo", "--dry-run")
        check(5 in times(), False, "a dry run")
        (place.path / "empty").mkdir()
        check((place.run("touch", "--undo", "empty")[0], 5 in times()), (0, False), "no files")
        status, out, _ = place.run("touch", "--undo", "b.bmp")
        line = f"b.bmp: 2024-05-31 00:00:00 -> {text(LONG_AGO)}\n"
        check((status, out[-len(line):], times()[1]), (0, line, 5), "one file")
        check((place.path / "b.bmp").stat().st_atime_ns, LONG_AGO * 10**9 + 5, "its access time")
        check((dry[0], dry[1].count("2024-05-31 00:00:00 -> ")), (0, 3), "a dry run: report")
        (place.path / "c.bmp").write_bytes(b"new")
        new = times()[2]
        status, out, err = place.run("touch", "--undo", "--json")
        check((status, [row["status"] for row in json.loads(out)]), (1, [11, 0]), "the others")
        check(("changed since" in err, times()), (True, [5, 5, new]), "a changed file")
        # the changed one stays in the record, until the next run
        (place.path / "c.bmp").unlink()
        check(place.run("touch", "--undo")[0], 1, "a file that is gone")
        names.pop()
        place.run("touch", "a.bmp", "a.bmp", "b.bmp", "--increment", "60")
        check(times()[1] != 5, True, "changed twice")
        check((place.run("touch", "--undo")[0], times()), (0, [5, 5]), "the first time again")
        check((log.exists(), place.run("touch", "--undo")[:2]), (False, (0, "")), "nothing left")
        # ended between the record and the file
        record = b"%b\0%d 5 %d 0\0" % (os.fsencode(place.path / "a.bmp"), LONG_AGO, LONG_AGO + 50)
        place.files("data/FMWTimesUndo.dat", contents=record + b"/x\0x\0cut")
        check((place.run("touch", "--undo")[0], times()), (0, [5, 5]), "never set")
        for options in (["--at", "now"], ["--taken"], ["--increment", "5"]):
            check(place.run("touch", "--undo", *options)[0], 2, f"{options} with --undo")
        log.mkdir()
        status, _, err = place.run("touch", "--undo")
        check((status, "cannot be read" in err), (1, True), "an unreadable record")
        status, _, err = place.run("touch", "a.bmp", "--at", "now")
        check((status, "--undo" in err), (0, True), "a change without record")


def main():
    os.environ["TZ"] = "America/New_York"
    time.tzset()
    for options, expected in ROWS:
        with Place(ordinary=True) as place:
            place.files("a.bmp", "b.bmp", "c.bmp", time=LONG_AGO * 10**9 + 5)
            files = ["a.bmp", "b.bmp", "c.bmp"]
            wanted = [value if isinstance(value, str) else text(LONG_AGO + value)
                      for value in expected]
            lines = [f"{name}: {text(LONG_AGO)} -> {value}\n"
                     for name, value in zip(files, wanted)]
            for dry in (["--dry-run"], []):
                status, out, _ = place.run("touch", *files, *options, *dry)
                check((status, out), (0, "".join(lines)), f"{options} {dry}: report")
                found = subprocess.run(["stat", "-c", "%y %X"] + files, cwd=place.path,
                                       capture_output=True, text=True, check=True).stdout
                check([line[:19] for line in found.splitlines()],
                      [text(LONG_AGO)] * 3 if dry else wanted, f"{options} {dry}: times")
                check({int(line.split()[-1]) for line in found.splitlines()}, {LONG_AGO},
                      f"{options} {dry}: access times")
    with Place(ordinary=True) as place:
        place.files("a.bmp", "b.bmp", time=LONG_AGO * 10**9 + 5)
        place.run("touch", "a.bmp", "--at", "2024-05-31", "--set", "FileTimeUpdateAccess=1",
                  "--set", "FileTimeUpdateWrite=0")
        facts = (place.path / "a.bmp").stat()
        check((text(facts.st_atime), facts.st_mtime_ns),
              ("2024-05-31 00:00:00", LONG_AGO * 10**9 + 5), "access time only")
        before = time.time() - 1
        place.run("touch", "b.bmp")
        check(before <= (place.path / "b.bmp").stat().st_mtime <= time.time(), True, "now")
        for options in (["--at", "x"], ["--at", "2024-13-01"], ["--at", "2024-05-31 24:00"],
                        ["--at", "2023-02-29"],
                        ["--increment", "x"], ["--taken", "--at", "now"],
                        ["--set", "FileTimeUpdateWrite=0"]):
            check(place.run("touch", "a.bmp", *options)[0], 2, f"{options}: refused")
        for year in ("1600", "9999"):
            before = (place.path / "a.bmp").stat().st_mtime
            status, _, err = place.run("touch", "a.bmp", "--at", f"{year}-06-01")
            held = text((place.path / "a.bmp").stat().st_mtime)[:4] if status == 0 else year
            check(held, year, "a time that file systems may not store")
            if status != 0:
                check((status, "cannot store" in err, (place.path / "a.bmp").stat().st_mtime),
                      (1, True, before), "it keeps its time")
        status, out, _ = place.run("touch", "--json", "none.bmp", "a.bmp", "--at", "2024-05-31")
        check((status, [row["status"] for row in json.loads(out)]), (1, [1, 0]), "missing files")
    undo()
    with Place() as place:
        if shutil.which("exiftool") and os.path.exists("/usr/bin/python3"):
            made = subprocess.run(["/usr/bin/python3", "-c", "from PIL import Image; import sys\n"
                                   "Image.new('RGB', (8, 8)).save(sys.argv[1])",
                                   place.path / "p.jpg"], check=False)
            if made.returncode == 0:
                subprocess.run(["exiftool", "-q", "-overwrite_original",
                                "-DateTimeOriginal=2023:03:12 02:30:00", place.path / "p.jpg"],
                               check=True)
                place.files("q.bmp", time=LONG_AGO * 10**9)
                status, _, err = place.run("touch", "--taken", "p.jpg", "q.bmp")
                check((status, "q.bmp: " in err), (1, True), "a picture without a date")
                check((place.path / "q.bmp").stat().st_mtime, LONG_AGO, "keeps its time")
                # clocks skipped this time
                check(text((place.path / "p.jpg").stat().st_mtime)[:10], "2023-03-12", "--taken")
                shown = subprocess.run(["exiftool", "-s3", "-DateTimeOriginal",
                                        place.path / "p.jpg"], capture_output=True, text=True,
                                       check=True).stdout.strip()
                check(shown, "2023:03:12 02:30:00", "the picture is unchanged")
    with Place(ordinary=True) as place:
        if os.geteuid() == 0:
            place.files("x.bmp", time=LONG_AGO * 10**9)
            os.chown(place.path / "x.bmp", 0, 0)
            status, _, err = place.run("touch", "x.bmp", "--at", "2024-05-31")
            check((status, "x.bmp: " in err), (1, True), "not the owner")
            check((place.path / "x.bmp").stat().st_mtime, LONG_AGO, "not the owner: unchanged")
    return finish()


if __name__ == "__main__":
    sys.exit(main())
