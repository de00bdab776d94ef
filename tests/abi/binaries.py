#!/usr/bin/env python3
"""binaries.py FOLDER: compares the export and import tables of the libraries in a build's bin folder with
binaries.txt."""

import re
import subprocess
import sys
from pathlib import Path


def read_lists(path):
    """The name lists: (library, "exports" or "may import") -> names."""
    lists = {}
    for line in path.read_text(encoding="utf-8").splitlines():
        if line.startswith(" "):
            if not line.strip().startswith("#"):
                lists[key].add(line.strip())
        elif line and not line.startswith("#"):
            key = tuple(line.split(" ", 1))
            lists[key] = set()
    return lists


def exports(tables):
    """Every entry of the export table; one without a name is given as its ordinal."""
    count = int(re.search(r"^\tExport Address Table \t\t(\w+)$", tables, re.M).group(1), 16)
    names = re.findall(r"^\t\[ *\d+\] ([^+\s]\S*)$", tables.split("[Ordinal/Name Pointer] Table")[1], re.M)
    return {*names, *(f"unnamed entry {index}" for index in range(len(names), count))}


def main():
    folder = Path(sys.argv[1])
    errors = []
    for (library, kind), listed in read_lists(Path(__file__).with_name("binaries.txt")).items():
        tables = subprocess.check_output(["x86_64-w64-mingw32-objdump", "-p", folder / library], text=True)
        if kind == "exports":
            found = exports(tables)
            errors += [f"{library} does not export {name}" for name in sorted(listed - found)]
            errors += [f"{library} must not export {name}" for name in sorted(found - listed)]
        else:
            found = set(re.findall(r"DLL Name: (\S+)", tables))
            errors += [f"{library} must not import {name}" for name in sorted(found - listed)]
    print("\n".join(errors) or "exports and imports are as listed")
    return 1 if errors else 0


if __name__ == "__main__":
    sys.exit(main())
