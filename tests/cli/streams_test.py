#!/usr/bin/env python3
"""Pictures and lists from standard input, pictures and results to standard output, and readers that
close the pipe. $FOTOMILL names the program."""
import json
import os
import signal
import subprocess
import sys
import threading
import time

from place import Place, bitmap, check, finish


def pictures():
    with Place() as place:
        place.files("a.bmp")
        check(place.run("convert", "a.bmp", "--out", "a.pcx")[0], 0, "the expected picture")
        check(place.run("convert", "a.bmp", "--out", "a.wbmp", "--reduce")[0], 0,
              "a picture without signature")
        check(place.run("history", "clear")[0], 0, "no history")
        source, pcx, wbmp = ((place.path / name).read_bytes()
                             for name in ("a.bmp", "a.pcx", "a.wbmp"))
        turned = place.run_bytes("apply", "a.bmp", "--do", "flip horizontal", "--out", "-")[1]
        check(turned[:2], b"BM", "apply keeps the format")
        rows = [
            # arguments, standard input, standard output, results
            (["convert", "-", "--to", "pcx"], source, pcx, "- -> -"),
            (["convert", "-", "--to", "pcx", "--out", "-"], source, pcx, "- -> -"),
            (["convert", "a.bmp", "--to", "pcx", "--out", "-"], None, pcx, "a.bmp -> -"),
            (["convert", "-", "--out", "new.pcx"], source, b"- -> new.pcx\n", ""),
            (["convert", "-", "--from", "wbmp", "--to", "wbmp"], wbmp, wbmp, "- -> -"),
            (["apply", "-", "--do", "flip horizontal"], source, turned, "- -> -"),
            (["convert", "-", "--to", "pcx", "--dry-run"], source, b"", "- -> -"),
            (["convert", "-", "--to", "pcx", "--json"], source, pcx,
             '{"file":"-","destination":"-","status":0,"message":"Ok"}'),
        ]
        for arguments, given, out, line in rows:
            found = place.run_bytes(*arguments, given=given)
            check(found[:2], (0, out), arguments)
            check(line in found[2].decode(), True, f"{arguments}: {found[2]}")
        check((place.path / "new.pcx").read_bytes(), pcx, "the output of standard input")
        info = json.loads(place.run("info", "-", "--json", given=source)[1])[0]
        check((info["file"], info["format"], info["width"]), ("-", "BMP", 3),
              "info of standard input")
        check(place.run("info", "-", given=source)[1].splitlines()[0], "-", "info as text")
        check(place.run("exif", "-", given=source)[::2],
              (0, "-: This file has no EXIF.\nOne file was processed.\n"), "exif")
        check(place.names("tmp"), [], "temporary files")
        check("std" in place.run("history", "list")[1], False, "temporary files in the history")


def wrong_uses():
    with Place() as place:
        place.files("a.bmp", "b.bmp")
        whole = bitmap(30, 30)
        rows = [
            (["convert", "-", "--to", "pcx"], b"", 1,
             "-: File read error. Standard input is empty."),
            (["convert", "-", "--to", "pcx"], b"no picture at all", 1,
             "-: Unsupported format. Name the format with --from."),
            (["info", "-"], b"FLIF" + bytes(20), 1,
             "It looks like FLIF. Name the format with --from."),
            (["convert", "-", "--to", "pcx"], whole[:300], 1, "-: "),
            (["convert", "-", "-", "--to", "pcx"], whole, 2, "only once"),
            (["convert", "-", "--files-from", "-", "--to", "pcx"], whole, 2, "only once"),
            (["convert", "-", "--to", "pcx", "--dest", "out"], whole, 2, "needs --out"),
            (["convert", "-", "--to", "pcx", "--out", "out/"], whole, 2, "needs --out"),
            (["convert", "-", "a.bmp", "--to", "pcx"], whole, 2, "exactly one picture"),
            (["convert", "a.bmp", "b.bmp", "--to", "pcx", "--out", "-"], None, 2,
             "exactly one picture"),
            (["convert", "a.bmp", "--out", "-"], None, 2, "--to"),
            (["convert", "-", "--from", "bmx", "--to", "pcx"], whole, 2, 'Unknown format "bmx"'),
            (["info", "a.bmp", "--from", "bmp"], None, 2, "--from is for standard input"),
            (["verify", "-"], whole, 1, "-: File open error."),
        ]
        for arguments, given, status, text in rows:
            found = place.run(*arguments, given=given)
            check(found[0], status, f"{arguments}: {found[2]}")
            check(found[1] if status == 2 or arguments[0] == "convert" else "", "",
                  f"{arguments}: standard output")
            check(text in found[2], True, f"{arguments}: {found[2]}")
        check(place.names(), ["a.bmp", "b.bmp", "data", "tmp"], "no output")
        check(place.names("tmp"), [], "no temporary file")


def ends_in_time(place, arguments, stdin):
    process = place.start(*arguments, stdin=stdin)
    time.sleep(0.5)
    process.send_signal(signal.SIGTERM)
    begin = time.monotonic()
    try:
        process.communicate(timeout=10)
    except subprocess.TimeoutExpired:
        process.kill()
        process.communicate()
    check((process.returncode, time.monotonic() - begin < 3), (143, True),
          f"{arguments}: asked to end")


def lists():
    with Place() as place:
        place.files("a/b/x.bmp", "a/y.bmp", "one.bmp", "with\rin it.bmp")

        def taken(*arguments, given=None, **more):
            out = place.run("convert", "-t", "pcx", "-d", "out", "--dry-run", *arguments,
                            given=given, **more)[1]
            return [line.split(" -> ")[0] for line in out.split("\n") if line]

        (place.path / "dos").write_bytes(b"a/y.bmp\r\none.bmp\r\n\r\na/b/x.bmp")
        expected = ["a/y.bmp", "one.bmp", "a/b/x.bmp"]
        check(taken("--files-from", "dos"), expected, "a list with CR LF")
        check(taken("--files-from", "-", given=b"a/y.bmp\r\none.bmp\r\n\r\na/b/x.bmp"), expected,
              "the same on standard input")
        check(taken("--files-from", "-", "-0", given=b"with\rin it.bmp\0"), ["with\rin it.bmp"],
              "CR in a name")
        os.mkfifo(place.path / "fifo")

        def write():
            time.sleep(0.3)
            with open(place.path / "fifo", "w", encoding="utf-8") as fifo:
                fifo.write("one.bmp\n")
                fifo.flush()
                time.sleep(0.3)
                fifo.write("a/y.bmp\n")

        writer = threading.Thread(target=write)
        writer.start()
        check(taken("--files-from", "fifo"), ["one.bmp", "a/y.bmp"], "a FIFO")
        writer.join()
        for contents, names in ((b"one.bmp\n", ["one.bmp"]), (b"", [])):
            end, start = os.pipe()
            os.write(start, contents)
            os.close(start)
            check(taken("--files-from", f"/dev/fd/{end}", pass_fds=[end]), names,
                  f"a process substitution of {contents}")
            os.close(end)
        for name in ("none", "a", "/dev/zero"):
            status, _, err = place.run("info", "--files-from", name)
            check((status, f'The list of names "{name}" cannot be read' in err), (2, True),
                  f"{name} as a list: {err}")
        ends_in_time(place, ["info", "--files-from", "fifo"], subprocess.DEVNULL)
        for arguments in (["info", "-"], ["info", "--files-from", "-"],
                          ["convert", "-", "--to", "pcx"]):
            ends_in_time(place, arguments, subprocess.PIPE)

        listed = (f"a/b/x.bmp\n./a/../one.bmp\n{place.path}/a/y.bmp\n"
                  f"/{str(place.path)[1:]}/../{place.path.name}/a/b\n")
        status, out, _ = place.run("convert", "-t", "pcx", "-d", "tree", "--keep-tree",
                                   "--files-from", "-", given=listed.encode())
        check((status, [line.split(" -> ")[1] for line in out.splitlines()]),
              (0, ["tree/a/b/x.pcx", "tree/one.pcx", "tree/a/y.pcx", "tree/a/b/x [1].pcx"]),
              "a tree from a list")
        (place.path / "sub").mkdir()
        process = subprocess.run([os.environ["FOTOMILL"], "convert", "-t", "pcx", "-d", "o",
                                  "--keep-tree", "--files-from", "-"],
                                 input=b"../one.bmp\n", cwd=place.path / "sub", capture_output=True,
                                 check=False)
        check(f"-> o{place.path}/one.pcx" in process.stdout.decode(), True,
              f"a file that is elsewhere: {process.stdout}")


def folders():
    with Place() as place:
        place.files("a.bmp", "b.bmp")
        check(place.run("convert", "a.bmp", "b.bmp", "-t", "pcx", "-o", "new/deep/")[0], 0,
              "a folder as --out")
        check(place.names("new/deep"), ["a.pcx", "b.pcx"], "outputs in it")
        check(place.run("turn", "a.bmp", "--rotate", "left", "-o", "t/")[1], "a.bmp -> t/a.bmp\n",
              "turn into a folder")
        check(place.run("turn", "a.bmp", "--rotate", "left", "-o", "t.bmp")[1], "a.bmp -> t.bmp\n",
              "turn into a file")
        check(place.run("turn", "a.bmp", "--rotate", "left", "-o", "t.bmp")[1],
              "a.bmp -> t [1].bmp\n", "which exists")
        for arguments in (["a.bmp", "-o", "t.pcx"], ["a.bmp", "b.bmp", "-o", "u.bmp"], ["a.bmp"]):
            check(place.run("turn", "--rotate", "left", *arguments)[0], 2, f"turn {arguments}")


def readers_that_go():
    with Place() as place:
        names = [f"f/{i:03}.bmp" for i in range(200)]
        place.files(*names)
        rows = [
            (["info", "f"], 0, None),
            (["info", "f", "--json"], 0, None),
            (["verify", "f", "f/none.bmp"], 0, None),
            (["convert", "f", "-t", "pcx", "-d", "out"], 0, "out"),
            (["thumbs", "make", "f"], 0, None),
            (["rename", "f", "--base", "x"], 0, "f"),
            (["rename", "--undo"], 0, None),
        ]
        for arguments, status, folder in rows:
            reader, writer = os.pipe()
            os.close(reader)  # closed before the program starts
            process = place.start(*arguments, stdout=writer)
            os.close(writer)
            err = process.stderr.read().decode()
            process.stderr.close()
            check(process.wait(60), status, f"{arguments}: {err}")
            check("could not be written" in err, False, f"{arguments}: {err}")
            check("processed" in err, folder is not None or arguments[0] in ("thumbs", "rename"),
                  f"{arguments}: the count line")
            if folder:
                check(len([name for name in place.names(folder) if not name.endswith("THN")]), 200,
                      f"{arguments}: files")
        check(place.names("f").count("000.bmp"), 1, "renamed back")
        with open("/dev/full", "w", encoding="utf-8") as full:
            run = subprocess.run([os.environ["FOTOMILL"], "info", "f/000.bmp"], stdout=full,
                                 stderr=subprocess.PIPE, cwd=place.path,
                                 check=False)
        check((run.returncode, b"could not be written" in run.stderr), (1, True), "a full disk")


def main():
    for case in (pictures, wrong_uses, lists, folders, readers_that_go):
        case()
    return finish()


if __name__ == "__main__":
    sys.exit(main())
