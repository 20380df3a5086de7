#!/usr/bin/env python3
"""Runs `fotomill config` and `--set` with temporary data folders."""
import json
import os
import subprocess
import sys
import tempfile
from pathlib import Path

PROGRAM = os.environ["FOTOMILL"]
NAME = "Fotomill Professional 11.ini"
faults = []


def run(folder, *arguments):
    result = subprocess.run([PROGRAM, "--data", str(folder), *arguments], stdin=subprocess.DEVNULL,
                            capture_output=True)
    return result.returncode, result.stdout, result.stderr.decode("utf-8", "replace")


def check(what, found, expected):
    if found != expected:
        faults.append(f"{what}: expected {expected!r}, found {found!r}")


# (arguments after "config", exit status, standard output, part of standard error, file afterwards);
# None: the file is unchanged
STEPS = [
    (["get", "JpegCompression"], 0, b"75\n", "", None),
    (["set", "JpegCompression", "80"], 0, b"JpegCompression: 75 -> 80\n", "",
     b"[Fotomill]\nJpegCompression=80\n"),
    (["set", "--dry-run", "JpegCompression", "90"], 0, b"JpegCompression: 80 -> 90\n", "", None),
    (["get", "JpegCompression", "FXBrightness"], 0, b"80\n0\n", "", None),
    (["list", "--changed"], 0, b"JpegCompression=80\n", "", None),
    (["set", "PrefixCrop", "Cut out "], 0, b"PrefixCrop: Cropped_  -> Cut out \n", "",
     b"[Fotomill]\nJpegCompression=80\nPrefixCrop=Cut out \n"),
    (["set", "PrefixCrop", "../up"], 2, b"", "Invalid destination.", None),
    (["set", "PrefixCrop", "x" * 33], 2, b"", "at most 32 characters", None),
    (["set", "-n", "UseAlphaChannels", "No"], 0, b"UseAlphaChannels: 1 -> 0\n", "", None),
    (["set", "-n", "WriteOS2Bitmaps", "on"], 0, b"WriteOS2Bitmaps: 0 -> 1\n", "", None),
    (["set", "UseAlphaChannels", "maybe"], 2, b"", "UseAlphaChannels takes yes or no (1 or 0).",
     None),
    (["set", "-n", "AlphaBackground", "#FF8000"], 0, b"AlphaBackground: 16777215 -> 33023\n", "",
     None),
    (["set", "-n", "AlphaBackground", "#F80"], 0, b"AlphaBackground: 16777215 -> 35071\n", "",
     None),
    (["set", "-n", "AlphaBackground", "navy"], 0, b"AlphaBackground: 16777215 -> 8388608\n", "",
     None),
    (["set", "-n", "AlphaBackground", "33023"], 0, b"AlphaBackground: 16777215 -> 33023\n", "",
     None),
    (["set", "AlphaBackground", "#FF80"], 2, b"", "#RRGGBB", None),
    (["set", "AlphaBackground", "transparent"], 2, b"", "a name such as orange", None),
    (["set", "-n", "SecureDelete", "1"], 0, b"SecureDelete: 0 -> 1\n",
     "This build does not use SecureDelete.", None),
    (["describe", "PngCompression"], 0,
     b"PngCompression=9\n    Default: 9\n    Takes a number from 0 to 9.\n"
     b"    Compression effort of PNG files, 0 to 9. Always lossless; 9 takes longest\n"
     b"    and gives the smallest files.\n", "", None),
    (["describe", "ThumbnailMatte"], 0, None, "", None),
    (["describe", "PngCompresion"], 2, b"", "PngCompression", None),
    (["set", "VersionNumber", "1"], 2, b"", "internal value", None),
    (["set", "FindSimilarDistance", "1"], 2, b"", "FindSimlarDistance", None),
    (["get", "jpegcompression"], 2, b"", "JpegCompression", None),
    (["unset", "-n", "PrefixCrop"], 0, b"PrefixCrop: Cut out  -> Cropped_ \n", "", None),
    (["unset", "PrefixCrop"], 0, b"PrefixCrop: Cut out  -> Cropped_ \n", "",
     b"[Fotomill]\nJpegCompression=80\n"),
    (["unset", "PrefixCrop"], 0, b"PrefixCrop: Cropped_  -> Cropped_ \n", "", None),
    (["set", "JpegCompression"], 2, b"", "", None),
]


def test_steps(folder):
    contents = None
    for arguments, status, out, error, after in STEPS:
        name = " ".join(arguments)
        found = run(folder, "config", *arguments)
        check(name, found[:2], (status, found[1] if out is None else out))
        if error not in found[2]:
            faults.append(f"{name}: {error!r} is not in {found[2]!r}")
        contents = contents if after is None else after
        path = folder / NAME
        check(f"file after {name}", path.read_bytes() if path.exists() else None, contents)
    check("path", run(folder, "config", "path")[1], str(folder / NAME).encode() + b"\n")


def test_set_wins_for_one_run(folder):
    (folder / NAME).write_bytes(b"[Fotomill]\nJpegCompression=80\n")
    check("--set", run(folder, "--set", "JpegCompression=5", "config", "get",
                       "JpegCompression")[:2], (0, b"5\n"))
    check("file", run(folder, "config", "get", "JpegCompression")[1], b"80\n")
    for wrong, part in [("JpegComp=5", "JpegCompression"), ("JpegCompression", "KEY=VALUE"),
                        ("JpegCompression=x", "number"),
                        ("=1", "nearest")]:
        status, out, error = run(folder, "--set", wrong, "config", "list")
        check(f"--set {wrong}", (status, out, part in error), (2, b"", True))


def test_json(folder):
    keys = json.loads(run(folder, "config", "list", "--json")[1])
    check("fields", {tuple(key) for key in keys},
          {("name", "type", "value", "default", "used", "values", "description")})
    by_name = {key["name"]: key for key in keys}
    check("first and last", (keys[0]["name"], keys[-1]["name"]),
          ("AllowDestinationOverrides", "WriteOS2Bitmaps"))
    check("levels", by_name["TextCharacterLevels"]["value"], "\u00ff.:-+|=%o#&XOB@")
    quality = by_name["JpegCompression"]
    check("number", (quality["name"], quality["type"], quality["value"], quality["default"],
                     quality["values"], quality["used"]),
          ("JpegCompression", 0x44, 75, 75, "a number from 0 to 100", True))
    check("unused", (by_name["SecureDelete"]["used"],
                     by_name["SecureDelete"]["description"]),
          (False, ""))
    used = run(folder, "config", "list", "--used")[1].decode("latin-1").split("\n")
    check("used", [line.split("=")[0] for line in used[:-1]],
          [key["name"] for key in keys if key["used"]])
    described = run(folder, "config", "describe", "ThumbnailMatte")[1]
    check("color for people", b"ThumbnailMatte=#CCCCCC\n    Default: #CCCCCC\n" in described, True)
    check("verbose list", b"PngCompression=9\n    Default: 9\n" in run(folder, "config", "list",
                                                                       "-v")[1], True)
    text = run(folder, "config", "list")[1].split(b"\n")
    check("same rows as text", [line.split(b"=")[0].decode() for line in text[:-1]],
          [key["name"] for key in keys])


def test_many_at_once(folder):
    names = [key["name"] for key in json.loads(run(folder, "config", "list", "--json")[1])
             if key["type"] == 4][:40]
    command = [PROGRAM, "--data", str(folder), "config", "set"]
    for process in [subprocess.Popen([*command, name, "77"], stdout=subprocess.DEVNULL,
                                     stderr=subprocess.DEVNULL) for name in names]:
        check("exit status", process.wait(), 0)
    lines = (folder / NAME).read_text().split("\n")
    check("every process's key", sorted(lines[1:-1]), sorted(f"{name}=77" for name in names))
    check("folder", os.listdir(folder), [NAME])


def test_previous_version(folder):
    old = folder / "Fotomill Professional 10.ini"
    old.write_bytes(b"[Fotomill]\r\nJpegCompression=33\r\n")
    note = ('fotomill: First start of this version: the settings were copied from '
            '"Fotomill Professional 10.ini".\n')
    check("first start", run(folder, "config", "get", "JpegCompression"), (0, b"33\n", note))
    check("copy", (folder / NAME).read_bytes(), old.read_bytes())
    old.write_bytes(b"[Fotomill]\r\nJpegCompression=44\r\n")
    check("second start", run(folder, "config", "get", "JpegCompression"), (0, b"33\n", ""))
    os.remove(folder / NAME)
    check("quiet", run(folder, "--quiet", "config", "get", "JpegCompression"), (0, b"44\n", ""))


def test_unreadable(folder):
    os.mkdir(folder / NAME)
    status, out, error = run(folder, "config", "set", "JpegCompression", "80")
    check("set", (status, out), (1, b""))
    check("message", error,
          f"{folder / NAME}: The configuration file cannot be read; left unchanged.\n")
    check("get", run(folder, "config", "get", "JpegCompression")[:2], (0, b"75\n"))


def main():
    for name, test in list(globals().items()):
        if name.startswith("test_"):
            with tempfile.TemporaryDirectory() as folder:
                before = len(faults)
                test(Path(folder))
                faults[before:] = [f"{name}: {fault}" for fault in faults[before:]]
    print("\n".join(faults))
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
