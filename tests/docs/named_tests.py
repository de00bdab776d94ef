#!/usr/bin/env python3
"""Every test that a page of docs/ names exists."""

import re
import sys

import examples

NAMED = re.compile(r"`([A-Z]\w+)\.([A-Z]\w+)`")
TEST = re.compile(r"^TEST(?:_F|_P)?\((\w+),\s*(\w+)\)", re.M)


def main():
    existing = {test for file in (examples.ROOT / "tests").rglob("*.cpp")
                for test in TEST.findall(file.read_text(encoding="utf-8"))}
    named = [(guide, test) for guide in examples.GUIDES if guide.parent.name == "docs"
             for test in NAMED.findall(guide.read_text(encoding="utf-8"))]
    missing = [(guide, test) for guide, test in named if test not in existing]
    for guide, test in missing:
        print(f"{guide.relative_to(examples.ROOT)}: there is no test {'.'.join(test)}")
    print(f"{len(named)} tests are named, {len(missing)} of them do not exist")
    return 1 if missing or not named else 0


if __name__ == "__main__":
    sys.exit(main())
