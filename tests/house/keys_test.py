#!/usr/bin/env python3
"""Checks that the settings do something: every key with an entry in docs/user/settings.md, which is
what Setup and `config describe` offer, is used by the code, and every key that the code reads has
an entry.

keys_test.py [PROJECT] prints each violation and fails if there are any. It first checks small
projects with one violation each.
"""
import re
import sys
import tempfile
from pathlib import Path

TABLE, PAGE, ITEMS = ("src/settings/settings.def", "docs/user/settings.md",
                      "src/desktop/models/setup/setup_pages.cpp")
# These list keys without using them.
LISTS = {TABLE, ITEMS}
# Prefixes of results whose functions this program lacks, in one table with the others.
READ_IN_A_TABLE = {"PrefixSocialMedia", "SupercompressorSaveFilePrefix"}


def violations(project):
    keys = set(re.findall(r"^SETTING\(\w+,\s*(\w+)", (project / TABLE).read_text(), re.M))
    entries = set(re.findall(r"^### (\w+)$", (project / PAGE).read_text(), re.M))
    items = re.findall(r"^ *Item\(\w+, .*?\), *(\w+),", (project / ITEMS).read_text(), re.M)
    code = ""
    for folder in ("src", "plugins"):
        for source in sorted((project / folder).rglob("*")):
            name = source.relative_to(project).as_posix()
            if source.suffix in {".cpp", ".h", ".c", ".def"} and name not in LISTS:
                code += re.sub(r"//.*", "", source.read_text(encoding="utf-8"))
    words = set(re.findall(r"\w+", code))
    read = set(re.findall(r"\bsettings\s*\.\s*(\w+)", code)) & keys
    if not keys or not items:
        yield "found no keys or no items of Setup"
    yield from (f"{key} has an entry but is no key" for key in sorted(entries - keys))
    yield from (f"{key} has an entry but nothing uses it" for key in sorted(entries & keys - words))
    yield from (f"{key} is read but has no entry"
                for key in sorted(read - entries - READ_IN_A_TABLE))
    yield from (f"{key} is in Setup but has no entry" for key in sorted(set(items) - entries))


# What is changed in a sound project, and part of the message (None: must pass).
SOUND = {TABLE: 'SETTING(Flag, Used, 1, 0, 1)\nSETTING(Flag, Other, 2, 0, 1)\n',
         PAGE: "# Settings\n\n### Used\nDoes it.\n",
         ITEMS: '    Item(Browsing, TrLater("Start"),  Used,  "Does it"),\n',
         "src/core/use.cpp": "if (settings.Used != 0) Do();\n"}
EXAMPLES = [
    ({}, None),
    ({PAGE: SOUND[PAGE] + "\n### Gone\nWas one.\n"}, "Gone has an entry but is no key"),
    ({PAGE: SOUND[PAGE] + "\n### Other\nDoes nothing.\n",
      "src/core/note.cpp": "// Other is for later.\n"}, "Other has an entry but nothing uses it"),
    ({"src/core/read.cpp": "return settings.Other;\n"}, "Other is read but has no entry"),
    ({ITEMS: SOUND[ITEMS].replace("Used", "Other")}, "Other is in Setup but has no entry"),
    ({TABLE: ""}, "found no keys"),
]


def check_the_check():
    for change, message in EXAMPLES:
        with tempfile.TemporaryDirectory() as folder:
            for name, text in {**SOUND, **change}.items():
                path = Path(folder) / name
                path.parent.mkdir(parents=True, exist_ok=True)
                path.write_text(text)
            found = list(violations(Path(folder)))
            if message is None and found or message is not None and not any(
                    line.startswith(message) for line in found):
                sys.exit(f"keys_test.py: {change} gives {found}, not {message}")


check_the_check()
project = Path(sys.argv[1] if len(sys.argv) > 1 else Path(__file__).resolve().parents[2])
found = list(violations(project))
for line in found:
    print(line)
print(f"{len(found)} violations" if found else "the settings are in order")
sys.exit(1 if found else 0)
