#!/usr/bin/env python3
"""Translations: the template is current, the translations are well formed, and the program follows
--lang and the environment in texts for people only."""
import json
import os
import shutil
import subprocess
import sys
import tempfile
from pathlib import Path

PROGRAM = os.environ["FOTOMILL"]
PROJECT = Path(__file__).resolve().parents[2]
PICTURE = next(path for path in sorted((PROJECT / "samples").rglob("*"))
               if path.suffix in {".bmp", ".pcx", ".tga"})

faults = []


def run(arguments, variables=None):
    environment = {name: value for name, value in os.environ.items()
                   if name not in {"LANG", "LANGUAGE", "LC_ALL", "LC_MESSAGES"}}
    done = subprocess.run([PROGRAM, *arguments], capture_output=True, encoding="utf-8",
                          errors="replace", env={**environment, **(variables or {})}, check=False)
    return done.returncode, done.stdout, done.stderr


def expect(name, text, *parts):
    for part in parts:
        if part not in text:
            faults.append(f"{name}: no {part!r} in {text!r}")


def check_files():
    update = subprocess.run([PROJECT / "po/update", "--check"], capture_output=True,
                            encoding="utf-8", check=False)
    if update.returncode != 0:
        faults.append(update.stdout[-2000:] + update.stderr)
    for translation in sorted((PROJECT / "po").glob("*.po")):
        done = subprocess.run(["msgfmt", "--check", "-o", "/dev/null", translation],
                              capture_output=True, encoding="utf-8", check=False)
        if done.returncode != 0:
            faults.append(f"{translation.name}: {done.stderr}")


def check_help():
    expect("help", run(["--lang", "de", "help", "convert"])[1],
           "Bilder in ein anderes Format konvertieren.",
           "Aufruf: fotomill convert", "-j, --jobs N", "Beispiel: fotomill convert")
    expect("help after the command", run(["help", "convert", "--lang=de"])[1],
           "Aufruf: fotomill convert")
    expect("short help", run(["turn", "-h", "--lang", "de"])[1], "Spiegeln: horizontal")
    expect("messages", run(["--lang", "de", "conver"])[2],
           "Unbekannter Befehl „conver“. Meinten Sie „convert“?")


# variables, whether the output is German
ENVIRONMENTS = [
    ({}, False),
    ({"LANG": "de_DE.UTF-8"}, True),
    ({"LANG": "de_AT.UTF-8@euro"}, True),
    ({"LANG": "en_US.UTF-8"}, False),
    ({"LANG": "en_US.UTF-8", "LANGUAGE": "de:en"}, True),
    ({"LANG": "de_DE.UTF-8", "LANGUAGE": "en:de"}, False),
    ({"LANG": "de_DE.UTF-8", "LC_MESSAGES": "C"}, False),
    ({"LANG": "en_US.UTF-8", "LC_ALL": "de_DE.UTF-8"}, True),
    ({"LANG": "xx_XX.UTF-8", "LANGUAGE": "xx:de"}, True),
    ({"LANGUAGE": "de"}, False),
    ({"LANG": "../../de"}, False),
]


def check_environment():
    for variables, german in ENVIRONMENTS:
        expect(f"{variables}", run(["help"], variables)[1], "Befehle:" if german else "Commands:")
    expect("--lang wins", run(["--lang", "en", "help"], {"LANG": "de_DE.UTF-8"})[1], "Commands:")


def check_results():
    """Machine-readable output is the same in every language, and so are exit statuses."""
    with tempfile.TemporaryDirectory() as folder:
        missing = os.path.join(folder, "missing.bmp")
        for arguments in (["info", "--json", str(PICTURE), missing], ["formats", "--json"],
                          ["formats", "--filter"],
                          ["config", "list"], ["config", "list", "--json"],
                          ["match", "--json", "a.pict"],
                          ["convert", "--json", missing, "--to", "png", "--dest", folder]):
            english, german = run(["--lang", "en", *arguments]), run(["--lang", "de", *arguments])
            if english[:2] != german[:2]:
                faults.append(f"{arguments}: results follow the language")
        status, _, message = run(["--lang", "de", "info", missing])
        expect("failure", f"{status} {message}", "1 ",
               "missing.bmp: Fehler beim Öffnen der Datei. Die Datei gibt es nicht.",
               "Es sind Fehler aufgetreten", "Eine Datei wurde verarbeitet, 1 fehlgeschlagen.")
        status, _, message = run(["--lang", "tlh", "help"])
        expect("unknown language", f"{status} {message}",
               '2 fotomill: There is no translation "tlh"; available: en, de.')
        if json.loads(run(["--lang", "de", "info", "--json",
                           missing])[1])[0]["message"] != "File open error.":
            faults.append("a message in JSON was translated")


def check_completion():
    if shutil.which("bash"):
        expect("completion", run(["--lang", "de", "completion", "fish"])[1],
               "Bilder in ein anderes Format")


if not shutil.which("xgettext"):
    print("gettext is missing")
    sys.exit(77)
check_files()
check_help()
check_environment()
check_results()
check_completion()
print("\n".join(faults) if faults else "the translations are in order")
sys.exit(1 if faults else 0)
