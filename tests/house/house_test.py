#!/usr/bin/env python3
"""Checks the structure of the sources: include layers, system dependencies, file lengths.

house_test.py [PROJECT] prints each violation as FILE:LINE: MESSAGE and fails if there are any. It
first checks a small tree with one violation of every rule, so that a rule that no longer triggers
fails as well.
"""
import re
import sys
import tempfile
from collections import Counter
from pathlib import Path

# The layers of src/ from the bottom up. A file may include from its own folder and from folders of
# lower layers.
FLOORS = [
    ["platform"],
    ["core"],
    ["texts"],
    ["picture"],
    ["containers"],
    ["archive"],
    ["processing"],
    ["drawing"],
    ["formats"],
    ["metadata"],
    ["registry"],
    ["plugins"],
    ["catalog"],
    ["files"],
    ["operations"],
    ["settings"],  # lower layers get settings as options of a job
    ["batch"],
    ["pages"],
    ["printing"],
    ["cli", "desktop"],
]
FLOOR = {room: floor for floor, rooms in enumerate(FLOORS) for room in rooms}

# System headers and macros are allowed only in a system's own folder. Files are accessed through
# src/platform. The plug-in authors' headers are standalone, so they may check the system, and
# modules may include nothing else of the program.
SYSTEM_HEADERS = {"src/plugins/fotomill_plugin.h", "src/plugins/fotomill_plugin_kit.h",
                  "src/plugins/fotomill_plugin_exports.h", "src/plugins/fotomill_plugin_light.h"}
SYSTEM_FOLDERS = {"src/platform/posix", "src/platform/windows"}
SYSTEM_HEADER = re.compile(
    r"(sys|linux|net|netinet|arpa|asm)/.*|(unistd|fcntl|dirent|dlfcn|pthread|poll|pwd|grp|termios|"
    r"spawn|mntent|glob|ftw|sched|utime|signal|csignal|libgen|strings|windows|windowsx|winsock2|"
    r"winioctl|shlobj|shellapi|direct|io|process)(\.h)?|"
    r"filesystem|fstream")
SYSTEM_MACRO = re.compile(
    r"\s*#\s*(if|elif|ifdef|ifndef).*(_WIN32|_WIN64|\bWIN32|__WINDOWS__|__linux|__unix|__APPLE__|"
    r"__MINGW|_MSC_VER|__FreeBSD__|__ANDROID__)")
# Only the pool and system-specific code start threads. All other code gives tasks to the pool.
THREAD = re.compile(r"std::(j?thread\b(?!::)|async\b)|\bpthread_create\b|\bwxThread\b")
THREAD_FOLDERS = ("src/core/workers/worker_pool.", "src/platform/")
INCLUDE = re.compile(r'\s*#\s*include\s*(["<])([^">]+)[">]')

# Layers above the settings that may access them only where jobs are created.
SETTINGS_DOORS = {"batch": {"batch/new_job.cpp"}, "pages": set()}

LONGEST_FILE = 900
COLUMNS = 100
# What may be wider: rows of tables and texts, which are easier to read in one piece.
ROW = re.compile(r'\s*[{|(]|\s*"(?!"")|\s*[A-Z_0-9]+\(|\s*\.\w+ = ".*"[},;]*$')
# To be wrapped when they change next: nearly every source is compiled again then.
STILL_WIDE = {"src/core/choice_lists.h"}
MOST_FILES = 40  # in one folder of src/, including headers

# Models must not depend on windows, so that they can be tested without a display.
MODELS, WINDOWS = "desktop/models/", "desktop/windows/"
DRAWERS = {"util", "utils", "misc", "common", "helper", "helpers", "stuff"}


def room_of(path):
    """The layer folder of a file, given as its path below src/."""
    parts = path.split("/")
    return parts[0] if len(parts) > 1 else None


def include_breaches(path, line):
    """Violations in one include line of the file src/`path`."""
    match = INCLUDE.match(line)
    if not match or f"src/{path}" in SYSTEM_HEADERS:
        return
    quoted, target = match.group(1) == '"', match.group(2)
    own, other = room_of(path), room_of(target)
    in_system_folder = any(f"src/{path}".startswith(folder + "/") for folder in SYSTEM_FOLDERS)
    if quoted and other not in FLOOR:
        yield f'"{target}" is not named from src/ with its room'
    elif (quoted and other == "settings" and own in SETTINGS_DOORS
          and path not in SETTINGS_DOORS[own]):
        yield (f"{own} may not include settings ({target}); "
               "a job gets what it needs where it is made")
    elif quoted and other != own and FLOOR[other] >= FLOOR.get(own, -1):
        yield f"{own} may not include {other} ({target})"
    elif quoted and any(f"src/{target}".startswith(folder + "/")
                        for folder in SYSTEM_FOLDERS) and not in_system_folder:
        yield f"{target} belongs to one system; include its door in src/platform"
    if not quoted and SYSTEM_HEADER.fullmatch(target) and not in_system_folder:
        yield f"<{target}> belongs behind a door of src/platform"
    if not quoted and target.startswith("wx/") and own != "desktop":
        yield f"<{target}> outside src/desktop"
    if path.startswith(MODELS) and (quoted and target.startswith(WINDOWS) or not quoted
                                    and target.startswith("wx/")):
        yield f"a model may not include {target}"


def circle_breaches(includes):
    """Files that include each other, directly or indirectly. `includes` maps a file to what it
    includes."""
    state = {}

    def visit(path, trail):
        if state.get(path) == "done":
            return
        if path in trail:
            yield path, 1, "includes itself: " + " -> ".join(trail[trail.index(path):] + [path])
            return
        for target in includes.get(path, []):
            yield from visit(target, trail + [path])
        state[path] = "done"

    for path in sorted(includes):
        yield from visit(path, [])


def crowd_breaches(sources):
    """Folders of src/ with too many sources to navigate. `sources` are paths below the project."""
    crowds = Counter(Path(name).parent.as_posix() for name in sources if name.startswith("src/"))
    for folder, count in sorted(crowds.items()):
        if count > MOST_FILES:
            yield folder, 1, f"holds {count} sources, {MOST_FILES} are the most"


def width_breaches(name, lines):
    """Lines that are too wide and not in a table, which clang-format leaves alone."""
    if name.endswith(".def") or name in STILL_WIDE:
        return
    table = False
    for number, line in enumerate(lines, 1):
        if line.strip() in ("// clang-format off", "// clang-format on"):
            table = line.endswith("off")
        if len(line) > COLUMNS and not table and not ROW.match(line):
            yield name, number, f"wider than {COLUMNS} columns"


def breaches(project):
    """All violations in a project as (file, line, message)."""
    includes = {}
    sources = [path for folder in ("src", "tests", "fuzz", "bench", "samples", "plugins")
               for path in sorted((project / folder).rglob("*"))
               if path.suffix in {".cpp", ".c", ".h", ".def", ".py", ".sh"}]
    if not sources:
        yield str(project), 1, "has no sources"
    for source in sources:
        name = source.relative_to(project).as_posix()
        for part in Path(name).parts:
            if part.split(".")[0] in DRAWERS:
                yield name, 1, f'"{part}" is a drawer, not a subject'
        lines = source.read_text(encoding="utf-8").splitlines()
        if len(lines) > LONGEST_FILE:
            yield name, len(lines), f"longer than {LONGEST_FILE} lines"
        yield from width_breaches(name, lines)
        if name.startswith("plugins/"):
            for number, line in enumerate(lines, 1):
                match = INCLUDE.match(line)
                if match and match.group(1) == '"' and "/" in match.group(2):
                    yield name, number, f"a module may not include {match.group(2)}"
        if not name.startswith("src/"):
            continue
        path = name[len("src/"):]
        if path.split("/")[0] not in FLOOR:
            yield name, 1, "is in no room that this test knows"
        includes[name] = ["src/" + match.group(2) for match in map(INCLUDE.match, lines) if match
                          and match.group(1) == '"']
        for number, line in enumerate(lines, 1):
            for message in include_breaches(path, line):
                yield name, number, message
            if THREAD.search(line.split("//")[0]) and not name.startswith(THREAD_FOLDERS):
                yield name, number, "begins a thread; have src/core/workers do it"
            in_system_folder = any(name.startswith(folder + "/") for folder in SYSTEM_FOLDERS)
            if SYSTEM_MACRO.match(line) and name not in SYSTEM_HEADERS and not in_system_folder:
                yield name, number, "asks which system it runs on outside src/platform"
    yield from circle_breaches(includes)
    yield from crowd_breaches(source.relative_to(project).as_posix() for source in sources)


# One violation of each rule: file, contents, part of the message (None: must pass).
EXAMPLES = [
    ("src/core/text.cpp", '#include "core/text.h"\n#include <string>\n', None),
    ("src/core/text.h", '#include "platform/files.h"\n', None),
    ("src/platform/files.h", "", None),
    ("src/platform/posix/files.cpp",
     '#include "platform/files.h"\n#include <unistd.h>\n#ifdef __linux__\n#endif\n', None),
    ("src/registry/registry.cpp", '#include "formats/bmp/bmp.h"\n', None),
    ("src/formats/bmp/bmp.h", '#include "picture/packed_image.h"\n', None),
    ("src/picture/palette.h", '#include "formats/bmp/bmp.h"\n', "picture may not include formats"),
    ("src/formats/pcx/pcx.cpp", '#include "registry/registry.h"\n',
     "formats may not include registry"),
    ("src/plugins/bridge.cpp", '#include "catalog/thumb.h"\n', "plugins may not include catalog"),
    ("src/drawing/text.cpp", '#include "settings/settings.h"\n',
     "drawing may not include settings"),
    ("src/batch/run.cpp", '#include "settings/settings.h"\n', "a job gets what it needs"),
    ("src/batch/new_job.cpp", '#include "settings/settings.h"\n', None),
    ("src/settings/settings.h", "", None),
    ("src/cli/info.cpp", '#include "desktop/window.h"\n', "cli may not include desktop"),
    ("src/core/near.cpp", '#include "near.h"\n', "not named from src/"),
    ("src/core/own.cpp", '#include "platform/posix/own.h"\n', "belongs to one system"),
    ("src/core/open.cpp", "#include <sys/stat.h>\n", "behind a door"),
    ("src/core/stream.cpp", "#include <fstream>\n", "behind a door"),
    ("src/core/switch.cpp", "#if defined(_WIN32)\n#endif\n", "asks which system"),
    ("src/core/workers/worker_pool.cpp", "std::thread one;  // std::this_thread::yield()\n", None),
    ("src/core/thread.cpp", "const auto work = std::async(Work);\n", "begins a thread"),
    ("src/desktop/loader.h", "  std::vector<std::thread> workers_;\n", "begins a thread"),
    ("src/desktop/sleep.cpp", "std::this_thread::yield();  // no std::thread\n", None),
    ("src/core/window.cpp", "#include <wx/wx.h>\n", "outside src/desktop"),
    ("src/core/egg.h", '#include "core/hen.h"\n', "includes itself"),
    ("src/core/hen.h", '#include "core/egg.h"\n', None),
    ("src/core/long.cpp", "\n" * (LONGEST_FILE + 1), "longer than"),
    ("src/core/wide.cpp", "int i; // " + 91 * "." + "\n", "wider than"),
    ("src/core/table.cpp", "// clang-format off\nint i; // " + 91 * "." + "\n// clang-format on\n"
     '  .help = "' + 91 * "." + '",\n    {"' + 91 * "." + '"},\n', None),
    ("tests/wide.py", '"""' + 98 * "." + "\n" + '"""', "wider than"),
    ("src/core/common.h", "", "is a drawer"),
    ("plugins/qoi/qoi.cpp", '#include "fotomill_plugin.h"\n#include "core/text.h"\n',
     "a module may not include core/text.h"),
    ("src/attic/box.cpp", "", "no room"),
    ("src/desktop/models/list.cpp", "#include <wx/string.h>\n",
     "a model may not include wx/string.h"),
    ("src/desktop/models/tree.cpp", '#include "desktop/windows/frame.h"\n',
     "a model may not include desktop/windows/frame.h"),
    ("src/desktop/windows/frame.h", '#include "desktop/models/tree.h"\n#include <wx/frame.h>\n',
     None),
    ("src/texts", None, "holds 41 sources"),
    *[(f"src/texts/step{number}.h", "", None) for number in range(MOST_FILES + 1)],
]


def own_faults():
    """Examples where the rules do not report what EXAMPLES say."""
    with tempfile.TemporaryDirectory() as folder:
        for name, contents, _ in EXAMPLES:
            if contents is None:  # a folder with the files of the following examples
                continue
            path = Path(folder, name)
            path.parent.mkdir(parents=True, exist_ok=True)
            path.write_text(contents)
        found = {}
        for name, _, message in breaches(Path(folder)):
            found.setdefault(name, []).append(message)
    for name, _, expected in EXAMPLES:
        messages = found.get(name, [])
        if not (any(expected in message for message in messages) if expected else not messages):
            yield f"example {name}: expected {expected}, found {messages}"


def main():
    project = Path(sys.argv[1]) if len(sys.argv) > 1 else Path(__file__).resolve().parents[2]
    faults = list(own_faults())
    faults += [f"{name}:{line}: {message}" for name, line, message in breaches(project)]
    print("\n".join(faults) if faults else "the house is in order")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
