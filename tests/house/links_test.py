#!/usr/bin/env python3
"""Every link in the documentation leads to an existing file and heading, every file mentioned on a
page exists, and every page can be reached from the README. Pages for users, which are installed
separately, only link within their folder."""
import re
import sys
import tempfile
from pathlib import Path

LINK = re.compile(r"\]\(([^)\s]+)\)")
# Paths in backticks that name a single file: no patterns, no placeholders.
PATH = re.compile(
    r"`((?:src|docs|tests|packaging|samples|fuzz|bench|modules|po)/[A-Za-z0-9_./-]*[a-z0-9_-])`")
FILLED_IN = re.compile(r"\b[A-Z]{4,}\b")
# The port, and the fictitious format in docs/dev/formats.md.
PLANNED = re.compile(r"^src/platform/windows|/gri?d\b|/grid_")
USER = "docs/user/"


def anchors(text):
    """The link targets of headings."""
    titles = re.findall(r"^#+ (.*)$", text, re.MULTILINE)
    return {re.sub(r"[^\w\- ]", "", title.lower()).replace(" ", "-") for title in titles}


def faults_of(project):
    pages = sorted(path for pattern in ("*.md", "docs/**/*.md", "samples/*.md")
                   for path in project.glob(pattern))
    linked = {project / "README.md"}
    for page in pages:
        text = page.read_text(encoding="utf-8")
        name = page.relative_to(project).as_posix()
        for link in LINK.findall(text):
            if re.match(r"[a-z]+:", link):
                continue
            path, _, anchor = link.partition("#")
            target = (page.parent / path).resolve() if path else page
            if not target.exists():
                yield f"{name}: {link} leads nowhere"
                continue
            linked.add(target)
            if name.startswith(USER) and not target.is_relative_to(project / USER):
                yield f"{name}: {link} is not installed"
            if anchor and anchor not in anchors(target.read_text(encoding="utf-8")):
                yield f"{name}: {link}: there is no such heading"
        for path in PATH.findall(text):
            known = FILLED_IN.search(path) or PLANNED.search(path)
            if not known and not (project / path).exists():
                yield f"{name}: there is no {path}"
    for page in pages:
        if page not in linked and page.relative_to(project).as_posix().startswith("docs/"):
            yield f"{page.relative_to(project)}: no page links to it"


def trial_faults():
    """The findings in a small tree with one error of each kind."""
    with tempfile.TemporaryDirectory() as name:
        project = Path(name).resolve()
        for path, text in {
            "README.md": "# A\n[a](docs/user/a.md) [b](docs/none.md) `src/none.cpp` [c](docs/user/a.md#some-title)",
            "docs/user/a.md": "# Some `title`\n[r](../../README.md) [s](#other)",
            "docs/dev/b.md": "# B",
        }.items():
            (project / path).parent.mkdir(parents=True, exist_ok=True)
            (project / path).write_text(text, encoding="utf-8")
        return sorted(fault.split(": ", 1)[1] for fault in faults_of(project))


def main():
    expected = ["#other: there is no such heading", "../../README.md is not installed",
                "docs/none.md leads nowhere", "no page links to it", "there is no src/none.cpp"]
    faults = [] if trial_faults() == sorted(expected) else [
        f"the test itself is wrong: {trial_faults()}"]
    faults += faults_of(Path(__file__).resolve().parents[2])
    print("\n".join(faults) if faults else "every link leads somewhere")
    return 1 if faults else 0


sys.exit(main())
