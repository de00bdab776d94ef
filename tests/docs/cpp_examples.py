#!/usr/bin/env python3
"""Compiles every C++ example of the guides against the public headers, with the cross compiler and for Microsoft's ABI.
An example with an #include is a file. Any other is the body of a function, with the parameters that its comment gives;
all of these are in one file, after all headers."""

import sys

import examples

sys.path.append(str(examples.ROOT / "tests/abi"))
import compilers

WARNINGS = ["-fsyntax-only", "-Wall", "-Wextra", "-Wshadow", "-Wconversion", "-Werror", "-Wno-unused-variable"]


def code(example):
    guide, line = example.place.split(":")
    return f'#line {line} "{guide}"\n{example.text}'


def function(number, example):
    head = f"void Example{number}({example.value})"
    return f"{head};\n{head}\n{{\n{code(example)}}}\n"


def sources(found):
    files = [example for example in found if "#include" in example.text]
    bodies = [example for example in found if "#include" not in example.text]
    return [*map(code, files), "#include <windows.h>\n" + compilers.include_all(compilers.HEADERS) +
            "".join(function(number, example) for number, example in enumerate(bodies))]


def main():
    found = examples.all_examples("cpp")
    results = compilers.compile_all([([*compiler, *WARNINGS], source) for source in sources(found)
                                     for compiler in (compilers.gcc(), compilers.clang("x86_64-pc-windows-msvc"))])
    errors = [result.stderr for result in results if result.returncode != 0]
    if not found:
        errors.append("no guide has a C++ example")
    print("\n".join(errors) or f"{len(found)} C++ examples compile")
    return 1 if errors else 0


if __name__ == "__main__":
    sys.exit(main())
