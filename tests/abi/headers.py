#!/usr/bin/env python3
"""Compiles the public headers with every warning an error: each alone, and all in several orders, without and
after <windows.h>, without and with UNICODE. Accessors keep their names and classes their sizes in every case.
An exported class shows no type of the standard library, whose size another run-time may see differently."""

import random
import re
import sys

import compilers

WARNINGS = ["-fsyntax-only", "-Wall", "-Wextra", "-Wshadow", "-Wconversion", "-Wpedantic", "-Werror"]
NAMES = """
#include <type_traits>
template <class Record, class Text> void IsGetter(Text (Record::*)());
using ClientName = decltype(IsGetter<OrvixClientInfo, const wchar_t*>(&OrvixClientInfo::GetUserNameW));
using UserName = decltype(IsGetter<OrvixUserEntry, const wchar_t*>(&OrvixUserEntry::GetUserNameW));
using Message = decltype(IsGetter<OrvixFileListDialogParams, const wchar_t*>(&OrvixFileListDialogParams::GetMessageW));
"""
# The size of every exported class with data on 64-bit Windows, whatever the compiler and its configuration.
SIZES = {
    "CStr": 8,
    "OrvixClientInfo": 32,
    "OrvixExploreProviderParams": 24,
    "OrvixFileEntry": 80,
    "OrvixFileList": 16,
    "OrvixFileListDialogParams": 40,
    "OrvixNotifyParams": 32,
    "OrvixPromptTable": 16,
    "OrvixUserEntry": 16,
    "OrvixUserList": 16,
    "WStr": 8,
}
# Numbers, whose size every run-time sees alike.
PLAIN_STANDARD_TYPES = re.compile(r"\bstd::(?:u?int\d+_t|u?intptr_t|size_t|ptrdiff_t)\b")
PRELUDES = {
    "alone": "",
    "with UNICODE": "#define UNICODE\n#define _UNICODE\n",
    "after <windows.h>": "#include <windows.h>\n",
    "after <windows.h> with UNICODE": "#define UNICODE\n#define _UNICODE\n#include <windows.h>\n",
}


def exported_classes():
    """The classes of the headers' texts that a library exports: name -> body without comments."""
    classes = {}
    for header in sorted(header for folder in compilers.FOLDERS for header in folder.glob("*.h")):
        text = re.sub(r"//.*", "", header.read_text(encoding="utf-8"))
        classes.update(re.findall(r"^(?:class|struct) \w+_API (\w+)[^;{]*\{(.*?)^\};", text, re.M | re.S))
    return classes


def size_checks(classes):
    """Compile-time checks of the sizes. A class that is missing in SIZES may have a virtual table, but no data."""
    checks = [f'static_assert(sizeof({name}) == {size}, "{name}");\n' for name, size in SIZES.items()]
    checks += [f"static_assert(sizeof({name}) <= (std::is_polymorphic_v<{name}> ? sizeof(void*) : 1), "
               f'"{name} has data: add its size to SIZES");\n' for name in classes.keys() - SIZES.keys()]
    return "".join(sorted(checks))


def shown_standard_types(classes):
    """Lines of exported classes that name a type of the standard library other than a number."""
    return [f"{name} shows a type of the standard library: {line.strip()}" for name, body in classes.items()
            for line in body.splitlines() if "std::" in PLAIN_STANDARD_TYPES.sub("", line)]


def orders():
    yield "in order", compilers.HEADERS
    yield "in reverse", compilers.HEADERS[::-1]
    for seed in range(2):
        yield f"shuffled {seed}", random.Random(seed).sample(compilers.HEADERS, len(compilers.HEADERS))


def main():
    classes = exported_classes()
    errors = [f"{name}: is in SIZES, but no header exports it" for name in sorted(SIZES.keys() - classes.keys())]
    errors += shown_standard_types(classes)
    checks = NAMES + size_checks(classes)
    commands = {
        "g++": compilers.gcc(),
        "clang": compilers.clang("x86_64-w64-mingw32"),
        "clang for Microsoft's ABI": compilers.clang("x86_64-pc-windows-msvc"),
    }
    jobs = []
    for compiler, command in commands.items():
        command = [*command, *WARNINGS]
        for header in compilers.HEADERS:
            jobs.append((f"{compiler}: {header}", command, compilers.include_all([header])))
        for order, headers in orders():
            for prelude, text in PRELUDES.items():
                jobs.append((f"{compiler}: all headers {order}, {prelude}", command,
                             text + compilers.include_all(headers) + checks))

    results = compilers.compile_all([(command, source) for _, command, source in jobs])
    errors += [f"{name}\n{result.stderr}" for (name, _, _), result in zip(jobs, results) if result.returncode != 0]
    print("\n".join(errors) or f"{len(compilers.HEADERS)} headers compile in {len(jobs)} ways")
    return 1 if errors else 0


if __name__ == "__main__":
    sys.exit(main())
