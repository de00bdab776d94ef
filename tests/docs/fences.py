#!/usr/bin/env python3
"""Every fence of the guides is read by some test, and what is for a shell parses."""

import subprocess
import sys

import examples

# What reads the fences of a language.
READERS = {
    "cmake": "tests/sdk/outside.py",
    "console": "tool_examples_test.cpp: its command lines",
    "cpp": "cpp_examples.py",
    "json": "tool_examples_test.cpp",
    "mermaid": "nobody: a picture",
    "sh": "this test",
    "text": "nobody: not to be typed or read by a program",
    "xml": "xml_examples_test.cpp",
}


def shell_errors(example):
    parsed = subprocess.run(["bash", "-n"], input=example.text, text=True, capture_output=True)
    yield from parsed.stderr.splitlines()
    for command in (line.split()[0] for line in example.text.splitlines() if line.strip()):
        if command.startswith("scripts/") and not (examples.ROOT / command).is_file():
            yield f"there is no {command}"


def errors(guide):
    lines = guide.read_text(encoding="utf-8").splitlines()
    found = list(examples.examples(guide))
    if sum(line.lstrip(" >").startswith("```") for line in lines) != 2 * len(found):
        yield f"{guide.relative_to(examples.ROOT)}: a fence is indented, has no end or more than a language"
    for example in found:
        if example.language not in READERS:
            yield f"{example.place}: no test reads a fence of the language '{example.language}'"
        if example.language == "cmake" and not (example.mark == "file" and example.place.startswith("docs/sdk.md:")):
            yield f"{example.place}: only the files of docs/sdk.md are built"
        if example.language == "sh":
            yield from (f"{example.place}: {error}" for error in shell_errors(example))


def main():
    found = [error for guide in examples.GUIDES for error in errors(guide)]
    print("\n".join(found) or f"the fences of {len(examples.GUIDES)} guides are read")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
