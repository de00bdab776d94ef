#!/usr/bin/env python3
"""Compiles the public headers with every warning an error: each alone, and all in several orders, without and
behind <windows.h>, without and with UNICODE. Accessors keep their names and classes their sizes in every case."""

import random
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
# The size of every exported class on 64-bit Windows, whatever the compiler and its configuration.
SIZES = {
    "OrvixClientInfo": 32,
    "OrvixExploreProviderParams": 24,
    "OrvixFileEntry": 72,
    "OrvixFileList": 16,
    "OrvixFileListDialogParams": 40,
    "OrvixNotifyParams": 32,
    "OrvixPromptTable": 16,
    "OrvixUserEntry": 16,
    "OrvixUserList": 16,
}
PINS = "".join(f'static_assert(sizeof({name}) == {size}, "{name}");\n' for name, size in SIZES.items())
PRELUDES = {
    "alone": "",
    "with UNICODE": "#define UNICODE\n#define _UNICODE\n",
    "behind <windows.h>": "#include <windows.h>\n",
    "behind <windows.h> with UNICODE": "#define UNICODE\n#define _UNICODE\n#include <windows.h>\n",
}


def orders():
    yield "in order", compilers.HEADERS
    yield "in reverse", compilers.HEADERS[::-1]
    for seed in range(2):
        yield f"shuffled {seed}", random.Random(seed).sample(compilers.HEADERS, len(compilers.HEADERS))


def main():
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
                             text + compilers.include_all(headers) + NAMES + PINS))

    results = compilers.compile_all([(command, source) for _, command, source in jobs])
    errors = [f"{name}\n{result.stderr}" for (name, _, _), result in zip(jobs, results) if result.returncode != 0]
    print("\n".join(errors) or f"{len(compilers.HEADERS)} headers compile in {len(jobs)} ways")
    return 1 if errors else 0


if __name__ == "__main__":
    sys.exit(main())
