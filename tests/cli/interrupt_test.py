#!/usr/bin/env python3
"""An interrupted conversion stops between two files, leaves only complete files, and reports it by
its exit status; on a terminal it prompts, shows progress, and can be interrupted at a prompt."""
import json
import os
import pty
import select
import signal
import struct
import subprocess
import sys
import tempfile
import time
from pathlib import Path

FOTOMILL = os.environ["FOTOMILL"]
COUNT = 400
faults = []


def expect(what, truth, seen=""):
    if not truth:
        faults.append(f"{what}: {seen}")


def bitmap(width, height):
    stride = (width * 3 + 3) // 4 * 4
    size = stride * height
    return (b"BM" + struct.pack("<IHHI", 54 + size, 0, 0, 54) +
            struct.pack("<IiiHHIIiiII", 40, width, height, 1, 24, 0, size, 0, 0, 0,
                        0) + (bytes(range(256)) * (size // 256 + 1))[:size])


def signalled(folder, number, jobs):
    """Interrupts a run after its first result; returns its exit status and results."""
    out = folder / f"out{number}{jobs}"
    with open(folder / "messages", "w+", encoding="utf-8") as log:
        run = subprocess.Popen([FOTOMILL, "convert", folder / "in", "--to", "bmp", "--dest", out,
                                "--json", "-j", str(jobs)],
                               stdout=subprocess.PIPE, stderr=log, text=True)
        begun = run.stdout.readline() + run.stdout.readline()
        run.send_signal(number)
        results = json.loads(begun + run.stdout.read())
        run.wait(timeout=60)
        log.seek(0)
        messages = log.read()
    name = f"signal {number} with {jobs} jobs"
    expect(f"{name}: exit status", run.returncode == 128 + number, run.returncode)
    expect(f"{name}: it stopped", 0 < len(results) < COUNT, len(results))
    written = sorted(path.name for path in out.iterdir())
    reported = sorted(Path(row["destination"]).name for row in results)
    expect(f"{name}: what is there was reported", written == reported, written[:5])
    expect(f"{name}: outputs are whole",
           all((out / file).stat().st_size == (folder / "in" / file).stat().st_size
               for file in written))
    expect(f"{name}: count line", f"{len(results)} files were processed." in messages
           or len(results) == 1, messages)


class Terminal:
    """The program on a pseudoterminal."""

    def __init__(self, *arguments):
        self.seen = ""
        self.child, self.handle = pty.fork()
        if self.child == 0:
            os.execv(FOTOMILL, [FOTOMILL, *map(str, arguments)])

    def read(self, seconds):
        ready, _, _ = select.select([self.handle], [], [], seconds)
        try:
            text = os.read(self.handle, 65536) if ready else b""
        except OSError:  # the other end is closed
            return False
        self.seen += text.decode()
        return bool(text)

    def until(self, text):
        end = time.monotonic() + 30
        while text not in self.seen and time.monotonic() < end:
            if not self.read(1) and text in self.seen:
                break
        expect("on a terminal", text in self.seen, f"no {text!r} in {self.seen!r}")

    def type(self, text):
        os.write(self.handle, text.encode())

    def end(self):
        while self.read(30):
            pass
        return os.waitstatus_to_exitcode(os.waitpid(self.child, 0)[1])


def terminal(folder):
    one = folder / "one.bmp"
    one.write_bytes(bitmap(4, 4))
    out = folder / "made" / "one.pcx"
    run = Terminal("convert", one, "--to", "pcx", "--dest", out.parent)
    expect("a folder is made without a question", run.end() == 0 and out.exists(), run.seen)

    for answer, status, name in (("n other\n", 0, "other.pcx"), ("\x03", 130, None)):
        run = Terminal("convert", one, "--to", "pcx", "--dest", out.parent)
        run.until("for the rest.")
        run.type(answer)
        expect(f"answer {answer!r}", run.end() == status, run.seen)
        expect(f"answer {answer!r}: the name", name is None or (out.parent / name).exists(),
               run.seen)
    expect("names on the terminal",
           sorted(path.name for path in out.parent.iterdir()) == ["one.pcx", "other.pcx"])

    run = Terminal("convert", folder / "in", "--to", "gif", "--reduce", "--dest", out.parent)
    run.until(" left")
    run.type("\x03")
    expect("Ctrl-C on a terminal", run.end() == 130, run.seen[-200:])


def closed_streams(folder):
    """If the output cannot be written, no picture is replaced by it."""
    small = folder / "small"
    small.mkdir()
    for i in range(20):
        (small / f"s{i}.bmp").write_bytes(bitmap(900, 900))
    (small / "list").write_text("".join(f"{small}/{name}\n" for i in range(20)
                                        for name in (f"s{i}.bmp", f"missing{i}.bmp")))
    for stream in (0, 1, 2):
        out = folder / f"closed{stream}"
        subprocess.run([FOTOMILL, "convert", "--files-from", small / "list", "--to", "bmp",
                        "--dest", out, "-j", "3"],
                       preexec_fn=lambda: os.close(stream), close_fds=False, capture_output=False,
                       stdin=None, stdout=None if stream == 1 else subprocess.DEVNULL,
                       stderr=None if stream == 2 else subprocess.DEVNULL, check=False, timeout=60)
        sizes = {path.stat().st_size for path in out.iterdir()} if out.exists() else set()
        expect(f"stream {stream} closed", sizes <= {(small / "s0.bmp").stat().st_size}, sizes)


def main():
    with tempfile.TemporaryDirectory() as name:
        folder = Path(name)
        (folder / "in").mkdir()
        picture = bitmap(640, 480)
        for i in range(COUNT):
            (folder / "in" / f"p{i:03}.bmp").write_bytes(picture)
        for number in (signal.SIGINT, signal.SIGTERM):
            for jobs in (1, 4):
                signalled(folder, number, jobs)
        closed_streams(folder)
        try:
            for handle in pty.openpty():
                os.close(handle)
        except OSError as error:
            print(f"no terminal can be had here, what happens on one was not tried: {error}")
        else:
            terminal(folder)
    print("\n".join(faults) if faults else "everything ended as it should")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
