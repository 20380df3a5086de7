#!/usr/bin/env python3
"""netpbm reads what the sample plug-in writes as the same picture, and vice versa."""
import os
import shutil
import subprocess
import sys
import tempfile
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]
FOTOMILL = os.environ["FOTOMILL"]
if not shutil.which("bmptopnm") or not shutil.which("pnmtoplainpnm"):
    print("skipped: netpbm is not installed")
    sys.exit(77)


def netpbm(*command, data=b""):
    return subprocess.run(command, input=data, stdout=subprocess.PIPE, stderr=subprocess.DEVNULL,
                          check=True).stdout


def convert(source, extension, folder):
    subprocess.run([FOTOMILL, "-q", "convert", str(source), "--to", extension, "--dest", folder],
                   check=True,
                   stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
    return Path(folder) / (Path(source).stem + "." + extension)


failed = 0
with tempfile.TemporaryDirectory() as folder:
    for name in ("bmp-true-color.bmp", "bmp-256-colors.bmp", "bmp-mono.bmp"):
        source = PROJECT / "samples" / name
        if not source.exists():
            print(f"{name}: no such sample")
            failed += 1
            continue
        colors = netpbm("ppmtoppm", data=netpbm("bmptopnm", str(source)))
        expected = netpbm("pnmtoplainpnm", data=netpbm("pnmtopnm", data=colors))
        written = convert(source, "ppm", folder)
        if netpbm("pnmtoplainpnm", data=written.read_bytes()) != expected:
            print(f"{name}: netpbm sees another picture")
            failed += 1
        plain = Path(folder) / ("plain-" + source.stem + ".ppm")
        plain.write_bytes(expected)
        again = convert(plain, "bmp", folder)
        if netpbm("pnmtoplainpnm", data=netpbm("ppmtoppm",
                                               data=netpbm("bmptopnm", str(again)))) != expected:
            print(f"{name}: the plain file reads as another picture")
            failed += 1
print("netpbm and the plug-in agree" if failed == 0 else f"{failed} failed")
sys.exit(1 if failed else 0)
