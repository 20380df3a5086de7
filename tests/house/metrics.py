#!/usr/bin/env python3
"""Source metrics that are reported but not enforced.

metrics.py [-v] [PROJECT] prints how many public declarations in headers have a comment, and the
longest include chain; -v lists the locations. A declaration is a function, a type, an alias or a
constant in a header of src/ at namespace level or as a public method. Its comment is directly above
or on the same line.
"""
import re
import sys
from pathlib import Path

AIM_COMMENTED, AIM_CHAIN = 88, 9
INCLUDE = re.compile(r'^\s*#\s*include\s*"([^"]+)"', re.MULTILINE)
SCOPE = re.compile(r"^(namespace\b|extern \"C\")")
TYPE = re.compile(r"^(template\s*<.*>\s*)?(class|struct|union|enum( class)?)\s+\w+[^;()]*\{")
# Boilerplate, and overrides documented in the base class or on the line above.
SILENT = re.compile(
    r"^(friend\b|using namespace\b|[\w:]+;|(class|struct|enum class) [\w:]+(?: : \w+)?;|#|"
    r"explicit operator bool)"
    r"|= (delete|default)|\boverride\b|\boperator=|^~|^virtual ~|^(explicit )?(\w+)\(const \3&\)")


def without_strings(line):
    return re.sub(r'"(\\.|[^"\\])*"|\'(\\.|[^\'\\])\'', '""', line)


def declarations(text):
    """Each public declaration of a header as (line number, text, whether it has a comment)."""
    scopes = []  # of each open brace: "namespace", "public", "private" (of a class) or "body"
    above = False  # the previous line was a comment
    pending, start, commented = "", 0, False
    for number, raw in enumerate(text.splitlines(), 1):
        line = raw.strip()
        if not pending and not line:
            above = False
        if line.startswith("//"):
            above = True
            continue
        code, _, remark = without_strings(line).partition("//")
        code = code.strip()
        if not code or code.startswith("#"):
            continue
        inside = scopes[-1] if scopes else "namespace"
        access = re.match(r"(public|protected|private):", code)
        if access and inside in ("public", "private"):
            scopes[-1] = "public" if access[1] == "public" else "private"
            above = False
            continue
        if not pending:
            start, commented = number, above
        commented = commented or bool(remark)
        pending = f"{pending} {code}".strip()
        if inside == "body" or pending.startswith("}"):
            balance(scopes, code, "body")
            pending = ""
            continue
        if not re.search(r"[;{}]\s*(,)?$", code):
            continue
        if not SCOPE.match(pending) and is_declaration(pending, inside):
            yield start, pending, commented
            above = False
        kind = "body"
        if SCOPE.match(pending):
            kind = "namespace"
        elif TYPE.match(pending) and "enum" not in pending.split("{")[0]:
            kind = "private" if re.match(r"(template\s*<.*>\s*)?class\b", pending) else "public"
        balance(scopes, pending, kind)
        pending = ""


def balance(scopes, code, kind):
    for letter in code:
        if letter == "{":
            scopes.append(kind)
            kind = "body"
        elif letter == "}" and scopes:
            scopes.pop()


def is_declaration(code, inside):
    if inside not in ("namespace", "public") or SILENT.search(code):
        return False
    return inside == "namespace" or "(" in code.split("=")[0] or bool(TYPE.match(code))


def longest_chain(source):
    """The longest include chain from a file, with paths relative to src/."""
    includes = {
        path.relative_to(source).as_posix(): INCLUDE.findall(path.read_text(encoding="utf-8"))
        for path in source.rglob("*") if path.suffix in {".h", ".cpp"}}
    known = {}

    def chain(name):
        if name not in known:
            known[name] = [name]  # ends a cycle, which the house test reports
            below = [chain(target) for target in includes[name] if target in includes]
            known[name] = [name] + max(below, key=len, default=[])
        return known[name]

    return max(map(chain, sorted(includes)), key=len, default=[])


def main():
    arguments = sys.argv[1:]
    verbose = "-v" in arguments
    names = [argument for argument in arguments if argument != "-v"]
    project = Path(names[0]) if names else Path(__file__).resolve().parents[2]
    found = [(path.relative_to(project).as_posix(), *declaration)
             for path in sorted((project / "src").rglob("*.h"))
             for declaration in declarations(path.read_text(encoding="utf-8"))]
    bare = [row for row in found if not row[3]]
    chain = longest_chain(project / "src")
    if verbose:
        for name, number, code, _ in bare:
            print(f"{name}:{number}: no comment: {code[:80]}")
        print("longest chain: " + "\n  > ".join(chain))
    share = 100 * (len(found) - len(bare)) / max(1, len(found))
    print(f"{share:.1f} % of {len(found)} header declarations have a comment (aim {AIM_COMMENTED})")
    print(f"{len(chain)} files in the longest include chain (aim {AIM_CHAIN})")


if __name__ == "__main__":
    main()
