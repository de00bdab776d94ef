#!/usr/bin/env python3
"""tests/README.md names every test program and every script that is a test."""

import re
import sys

import examples

TEST = re.compile(r"^\s*orvix_(?:test\((\w+)|python_test\(\S+ (\S+\.py))", re.M)


def main():
    tests = examples.ROOT / "tests"
    page = (tests / "README.md").read_text(encoding="utf-8")
    found = [program or script for file in tests.rglob("CMakeLists.txt")
             for program, script in TEST.findall(file.read_text(encoding="utf-8"))]
    missing = [name for name in found if f"`{name}`" not in page]
    for name in missing:
        print(f"tests/README.md does not say what {name} is for")
    print(f"{len(found)} tests, {len(missing)} of them without a description")
    return 1 if missing or not found else 0


if __name__ == "__main__":
    sys.exit(main())
