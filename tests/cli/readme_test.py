#!/usr/bin/env python3
"""README.md lists exactly the program's commands and formats."""
import json
import os
import re
import subprocess
import sys
from pathlib import Path


def output(*arguments):
    run = subprocess.run([os.environ["FOTOMILL"], *arguments], capture_output=True, text=True,
                         check=True)
    return run.stdout


def table_rows(readme, first_heading):
    """The cells of each row of the table whose first column has that heading."""
    rows = []
    inside = False
    for line in readme.splitlines():
        cells = [cell.strip()
                 for cell in line.strip().strip("|").split("|")] if line.startswith("|") else []
        if cells and cells[0] == first_heading:
            inside = True
        elif not cells:
            inside = False
        elif inside and not set(cells[0]) <= set("-:"):
            rows.append(cells)
    return rows


def difference(what, promised, there):
    for name in sorted(set(promised) | set(there)):
        if promised.get(name) != there.get(name):
            said, known = promised.get(name, "nothing"), there.get(name, "nothing")
            yield f"{what} {name}: README.md says {said}, the program {known}"


def main():
    readme = (Path(__file__).resolve().parents[2] / "README.md").read_text(encoding="utf-8")

    commands = output("--help").split("Commands:")[1].split("\n\n")[0]
    there = {name: "yes" for name in re.findall(r"^  ([a-z][a-z -]*?)  ", commands, re.MULTILINE)
             if name != "help"}
    promised = {name: "yes" for cells in table_rows(readme, "command")
                for name in re.findall(r"`([^`]+)`", cells[0])}
    faults = list(difference("command", promised, there))

    can = {True: "yes", False: "no"}
    there = {row["extension"]: f"read {can[row['read']]}, write {can[row['write']]}"
             for row in json.loads(output("formats", "--json")) if row["read"] or row["write"]}
    promised = {extension.strip(): f"read {cells[2]}, write {cells[3]}"
                for cells in table_rows(readme, "format") for extension in cells[1].split(",")}
    faults += difference("format", promised, there)

    if not there or not promised:
        faults.append("nothing was compared")
    print("\n".join(faults) if faults else "README.md and the program agree")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
