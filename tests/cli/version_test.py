#!/usr/bin/env python3
"""--version lists the libraries the program really loads, consistently in all formats."""
import json
import os
import re
import shutil
import subprocess
import sys

PROGRAM = os.environ["FOTOMILL"]
# The compiler's and the system's own.
SYSTEM = re.compile(r"(libc|libm|libdl|libpthread|librt|ld-linux.*|libgcc_s|libasan|libubsan)\.so")


def output(*arguments):
    return subprocess.run([PROGRAM, *arguments], capture_output=True, text=True, check=True).stdout


def plain(name):
    """libpng16.so.16, libpng -> png: the common part of names."""
    return re.sub(r"[0-9.-]+$|-turbo$", "", re.sub(r"^lib|\.so.*", "", name.lower()))


def main():
    facts = json.loads(output("--version", "--json"))
    libraries = {library["name"]: library for library in facts["libraries"]}
    faults = []

    if shutil.which("readelf"):
        dynamic = subprocess.run(["readelf", "-d", PROGRAM], capture_output=True, text=True,
                                 check=True).stdout
        needed = {plain(name) for name in re.findall(r"NEEDED.*\[(.*)\]", dynamic)
                  if not SYSTEM.match(name)}
        shared = {plain(name) for name, library in libraries.items()
                  if library["linking"] == "shared"}
        shared -= {"stdc++"} - needed
        needed = {{"z": "zlib", "webpmux": "webp"}.get(name, name) for name in needed}
        if needed - shared:
            faults.append(f"the program needs {needed - shared}, --version has {shared}")
        inside = {plain(name) for name, library in libraries.items()
                  if library["linking"] == "inside"}
        if needed & inside:
            faults.append(f"not inside, but loaded: {needed & inside}")

    lines = output("--version").splitlines()
    if lines[0] != f"{facts['name']} {facts['version']}":
        faults.append(f"first line: {lines[0]}")
    if [line.rsplit(" ", 1)[0] for line in lines[1:]] != list(libraries):
        faults.append(f"--version has other libraries than --json: {lines[1:]}")
    licenses = output("--version", "--licenses")
    for name, library in libraries.items():
        told = f": {library['license']}\n  Copyright {library['copyright']}\n"
        if not library["license"] or told not in licenses:
            faults.append(f"license of {name}: {library['license']}")

    # Topics are also in the manual.
    listed = output("help").split("\nTopics:\n")[1].split("\n\n")[0]
    topics = re.findall(r"^  ([a-z-]+) ", listed, re.MULTILINE)
    manual = os.path.join(os.environ.get("TMPDIR", "/tmp"), f"fotomill-manual-{os.getpid()}")
    try:
        output("manual", manual)
        with open(os.path.join(manual, "fotomill.1"), encoding="utf-8") as page:
            text = page.read()
        for topic in topics:
            if f'.SH "{topic.upper()}"'.replace("-", "\\-") not in text:
                faults.append(f"fotomill.1 has no section on {topic}")
    finally:
        shutil.rmtree(manual, ignore_errors=True)
    if len(topics) < 4:
        faults.append(f"topics: {topics}")
    print("\n".join(faults) if faults else "the version page and the program agree")
    return 1 if faults else 0


sys.exit(main())
