#!/usr/bin/env python3
"""Small files with huge claims: no command uses more than 1.25 GiB or more than seconds for one,
and one large picture does not keep the program from ending on request."""
import os
import resource
import signal
import struct
import subprocess
import sys
import tempfile
import time
import zlib
from pathlib import Path

FOTOMILL = os.environ["FOTOMILL"]
MOST_KIB = 1280 * 1024  # per file
MOST_SECONDS = 12       # each takes well below one
faults = []


def expect(what, truth, seen=""):
    if not truth:
        faults.append(f"{what}: {seen}")


def segment(marker, data):
    return bytes((0xFF, marker)) + struct.pack(">H", len(data) + 2) + data


def jpeg(width, height, components=3, frame=0xC2, head=b""):
    """A JPEG file of some size with empty scans; progressive unless the frame says otherwise."""
    parts = b"".join(bytes((i + 1, 0x11, 0)) for i in range(components))
    tables = segment(0xDB, bytes(1) + bytes([1] * 64)) + segment(0xC4,
                                                                 b"\0" + b"\1" + bytes(15) + b"\0")
    tables += segment(0xC4, b"\x10" + b"\1" + bytes(15) + b"\0")
    size = struct.pack(">BHHB", 8, height, width, components)
    scan = bytes((components,)) + b"".join(bytes((i + 1, 0)) for i in range(components))
    scan += bytes((0, 0 if frame == 0xC2 else 63, 0))
    picture = segment(frame, size + parts) + segment(0xDA, scan) + bytes(16)
    return b"\xff\xd8" + head + tables + picture + b"\xff\xd9"


def chunk(kind, data):
    return struct.pack(">I", len(data)) + kind + data + struct.pack(">I", zlib.crc32(kind + data))


def png(width, height, between=b"", rows=None):
    pixels = zlib.compress(bytes((width + 1) * height)) if rows is None else rows
    return (b"\x89PNG\r\n\x1a\n" + chunk(b"IHDR",
                                         struct.pack(">IIBBBBB", width, height, 8, 0, 0, 0,
                                                     0)) + between +
            chunk(b"IDAT", pixels) + chunk(b"IEND", b""))


def gray_png(side):
    """A picture as large as it claims."""
    packer = zlib.compressobj(1)
    row = bytes(1) + bytes(i * 7 & 255 for i in range(side))
    return png(side, side,
               rows=b"".join([packer.compress(row) for _ in range(side)] + [packer.flush()]))


def webp(width, height):
    """Lossless, all pixels equal: a header and five codes with one symbol."""
    stream = b"\x2f" + struct.pack("<I", width - 1 | height - 1 << 14)
    stream += b"\x88\x88\x08\x88\x88\x88\x88\x00\x00\x00\x00\x00"
    stream += bytes(len(stream) % 2)
    riff = b"WEBPVP8L" + struct.pack("<I", len(stream)) + stream
    return b"RIFF" + struct.pack("<I", len(riff)) + riff


def tiff(pages):
    """Many directories in a chain, with the same 8 x 8 grays."""
    entries = [(256, 3, 8), (257, 3, 8), (258, 3, 8), (259, 3, 1), (262, 3, 1), (273, 4, 8),
               (277, 3, 1), (278, 3, 8), (279, 4, 64)]
    directory = struct.pack("<H", len(entries)) + b"".join(struct.pack("<HHII", tag, kind, 1, value)
                                                           for tag, kind, value in entries)
    step = len(directory) + 4
    chain = b"".join(directory + struct.pack("<I", 72 + step * (i + 1) if i + 1 < pages else 0)
                     for i in range(pages))
    return b"II*\0" + struct.pack("<I", 72) + bytes(64) + chain


def run(name, *arguments):
    """Runs the program on a file and checks the limits; returns its exit status."""
    begun = time.monotonic()
    process = subprocess.Popen([FOTOMILL, *map(str, arguments)], stdin=subprocess.DEVNULL,
                               stdout=subprocess.DEVNULL,
                               stderr=subprocess.DEVNULL)
    while True:
        ended, status, usage = os.wait4(process.pid, os.WNOHANG)
        if ended or time.monotonic() - begun > 5 * MOST_SECONDS:
            break
        time.sleep(0.01)
    if not ended:
        process.kill()
        os.wait4(process.pid, 0)
        expect(name, False, "does not end")
        return None
    process.returncode = os.waitstatus_to_exitcode(status)
    expect(f"{name}: memory", usage.ru_maxrss <= MOST_KIB, f"{usage.ru_maxrss // 1024} MiB")
    expect(f"{name}: time", usage.ru_utime + usage.ru_stime <= MOST_SECONDS,
           f"{usage.ru_utime + usage.ru_stime:.1f} s")
    expect(f"{name}: no crash", process.returncode >= 0, process.returncode)
    return process.returncode


def claims(folder):
    """Sizes claimed in a header."""
    for name, content in (("color.jpg", jpeg(30000, 30000)), ("huge.jpg", jpeg(65500, 65500)),
                          ("gray.jpg", jpeg(30000, 30000, 1)),
                          ("apart.jpg", jpeg(18000, 18000)), ("lossless.webp", webp(16383, 16383))):
        path = folder / name
        path.write_bytes(content)
        for words in (("verify", path), ("thumbs", "draw", path, "-o", folder / "t.png",
                                         "--overwrite", "replace"),
                      ("convert", path, "--to", "bmp", "--dest", folder / "out"),
                      ("turn", "--rotate", "right", path, "-d", folder / "turned")):
            run(f"{words[0]} {name}", *words)


def counts(folder):
    """Frames, texts, segments and directories."""
    text = b"Comment\0\0" + zlib.compress(bytes(100_000_000), 9)
    files = {
        "frames.png": png(500, 500, chunk(b"acTL", struct.pack(">II", 2**31 - 1, 0))),
        "texts.png": png(16, 16, 50 * chunk(b"zTXt", text)),
        "segments.jpg": jpeg(16, 16, 1, 0xC0, 60000 * segment(0xE1, b"Exif\0\0")),
        "pages.tif": tiff(40000),
    }
    for name, content in files.items():
        (folder / name).write_bytes(content)
        expect(f"info {name}: exit status", run(f"info {name}", "info", folder / name) == 0)
        run(f"verify {name}", "verify", folder / name)
    expect("frames.png is whole", run("verify frames.png", "verify", folder / "frames.png") == 0)


def holes(folder):
    """A hole of a terabyte after the first bytes."""
    heads = {"jpg": b"\xff\xd8\xff\xe0\0\x10JFIF\0", "png": b"\x89PNG\r\n\x1a\n",
             "webp": b"RIFF\xff\xff\xff\xffWEBP", "gif": b"GIF89a\x10\0\x10\0\0\0\0",
             "tif": b"II*\0\x08\0\0\0", "bmp": b"BM", "tga": b"\0\0\2", "ico": b"\0\0\1\0\1\0",
             "hdp": b"II\xbc\1\x08\0\0\0", "xbm": b"#define"}
    for extension, head in heads.items():
        path = folder / f"hole.{extension}"
        with open(path, "wb") as file:
            file.write(head)
            try:
                file.truncate(1 << 40)
            except OSError:  # not supported by all file systems
                return
        for words in (("info", path), ("convert", path, "--to", "png", "--dest", folder / "out")):
            run(f"{words[0]} {path.name}", *words)
        path.unlink()


def ending(folder):
    """An interrupt takes effect within a picture."""
    source = folder / "large.png"
    source.write_bytes(gray_png(14000))
    out = folder / "ended"
    out.mkdir()
    begun = time.monotonic()
    process = subprocess.Popen([FOTOMILL, "convert", source, "--to", "webp", "--dest", out],
                               stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
    time.sleep(1)
    process.send_signal(signal.SIGTERM)
    asked = time.monotonic()
    process.wait(timeout=120)
    expect("SIGTERM in a picture: time", time.monotonic() - asked < 2,
           f"{time.monotonic() - asked:.1f} s")
    expect("SIGTERM in a picture: exit status", process.returncode == 128 + signal.SIGTERM
           or time.monotonic() - begun < 1.1, process.returncode)
    expect("SIGTERM in a picture: nothing is left", not list(out.iterdir()), list(out.iterdir()))


def main():
    resource.setrlimit(resource.RLIMIT_CORE, (0, 0))
    for part in (claims, counts, holes, ending):
        with tempfile.TemporaryDirectory() as name:
            (Path(name) / "out").mkdir()
            (Path(name) / "turned").mkdir()
            part(Path(name))
    for fault in faults:
        print(fault)
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
