#!/usr/bin/env python3
"""Every file of the tree is as .editorconfig says. The width of an indentation is left to the formatters."""

import re
import subprocess
import sys
from fnmatch import fnmatchcase

import examples


def sections():
    """The globs and the properties of each section, in the order of the file."""
    found = []
    for line in (examples.ROOT / ".editorconfig").read_text(encoding="utf-8").splitlines():
        if line.startswith("["):
            inside = line[1:-1]
            found.append((inside[1:-1].split(",") if inside.startswith("{") else [inside], {}))
        elif found and "=" in line and not line.startswith("#"):
            name, value = (part.strip() for part in line.split("="))
            found[-1][1][name] = value
    return found


def properties(path, rules):
    """What applies to a file; of several sections with the same property the last one counts."""
    name = path.rsplit("/", 1)[-1]
    merged = {}
    for globs, values in rules:
        if any(fnmatchcase(path if "/" in glob else name, glob) for glob in globs):
            merged.update(values)
    return {name: value for name, value in merged.items() if value not in ("unset", "off")}


def errors(path, rules):
    wanted = properties(path, rules)
    content = (examples.ROOT / path).read_bytes()
    if "charset" not in wanted or not content:
        return
    text = content.decode("utf-8")
    if "end_of_line" in wanted and "\r" in text:
        yield f"{path}: a line ends with CR"
    if "insert_final_newline" in wanted and not text.endswith("\n"):
        yield f"{path}: the last line has no end"
    limit = int(wanted.get("max_line_length", sys.maxsize))
    for number, line in enumerate(text.split("\n"), 1):
        if "trim_trailing_whitespace" in wanted and line != line.rstrip():
            yield f"{path}:{number}: white space at the end"
        if "indent_style" in wanted and re.match(r" *\t", line):
            yield f"{path}:{number}: a tab in the indentation"
        if len(line) > limit:
            yield f"{path}:{number}: {len(line)} columns"


def main():
    listed = subprocess.run(["git", "ls-files", "-z", "--cached", "--others", "--exclude-standard"], cwd=examples.ROOT,
                            check=True, capture_output=True).stdout.decode("utf-8").split("\0")
    files = [path for path in listed if path and (examples.ROOT / path).is_file()]
    rules = sections()
    found = [error for path in files for error in errors(path, rules)]
    print("\n".join(found) or f"{len(files)} files are as .editorconfig says")
    return 1 if found or not files else 0


if __name__ == "__main__":
    sys.exit(main())
