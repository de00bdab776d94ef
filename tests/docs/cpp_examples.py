#!/usr/bin/env python3
"""Compiles every C++ example of the guides against the public headers, with the cross compiler and for Microsoft's ABI.
An example with an #include is a file. Any other is the body of a function after all headers, with the parameters that
its comment gives."""

import sys

import examples

sys.path.append(str(examples.ROOT / "tests/abi"))
import compilers

WARNINGS = ["-fsyntax-only", "-Wall", "-Wextra", "-Wshadow", "-Wconversion", "-Werror", "-Wno-unused-variable"]


def source(example):
    guide, line = example.place.split(":")
    text = f'#line {line} "{guide}"\n{example.text}'
    if "#include" in example.text:
        return text
    return (f"#include <windows.h>\n{compilers.include_all(compilers.HEADERS)}"
            f"void Example({example.value});\nvoid Example({example.value})\n{{\n{text}}}\n")


def main():
    found = examples.all_examples("cpp")
    results = compilers.compile_all([([*compiler, *WARNINGS], source(example)) for example in found
                                     for compiler in (compilers.gcc(), compilers.clang("x86_64-pc-windows-msvc"))])
    errors = [result.stderr for result in results if result.returncode != 0]
    if not found:
        errors.append("no guide has a C++ example")
    print("\n".join(errors) or f"{len(found)} C++ examples compile")
    return 1 if errors else 0


if __name__ == "__main__":
    sys.exit(main())
