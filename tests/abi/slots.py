#!/usr/bin/env python3
"""Compares the virtual tables that the headers give under GCC's and Microsoft's ABI with slots.txt."""

import re
import sys
from pathlib import Path

import compilers

# Interfaces within the library whose order is fixed as well.
INTERNAL_FOLDER = compilers.ROOT / "providers"
INTERNAL_HEADERS = ["IOrvixMSSCC.h"]

# Microsoft's table has one slot for the destructor, GCC's two.
ABIS = {
    "x86_64-w64-mingw32": {
        "table": "Vtable",
        "before": ["offset_to_top (0)", "{0} RTTI"],
        "destructor": ["{0}::~{0}() [complete]", "{0}::~{0}() [deleting]"],
    },
    "x86_64-pc-windows-msvc": {
        "table": "VFTable",
        "before": ["{0} RTTI"],
        "destructor": ["{0}::~{0}() [scalar deleting]"],
    },
}
# Fixed-width names stand for the same types under both ABIs.
SAME_TYPE = {
    "std::uint32_t": "unsigned int",
    "std::int32_t": "int",
    "std::int64_t": "long long",
    "std::intptr_t": "long long",
}


def read_slots(path):
    """The table of slots: class name -> operations in order."""
    slots = {}
    for line in path.read_text(encoding="utf-8").splitlines():
        if line.startswith(" "):
            slots[name].append(line.strip())
        elif line and not line.startswith("#"):
            name = line
            slots[name] = []
    return slots


def classes_with_virtual_operations():
    """The classes of the headers' texts, so that a class missing in the table is noticed."""
    names = set()
    headers = [header for folder in compilers.FOLDERS for header in folder.glob("*.h")]
    for header in [*headers, *(INTERNAL_FOLDER / name for name in INTERNAL_HEADERS)]:
        for name, body in re.findall(r"^class (?:\w+_API )?(\w+)[^;{]*\n\{(.*?)^\};",
                                     header.read_text(encoding="utf-8"), re.M | re.S):
            if re.search(r"\bvirtual\b", re.sub(r"//.*", "", body)):
                names.add(name)
    return names


def canonical(text):
    for name, same in SAME_TYPE.items():
        text = text.replace(name, same)
    return re.sub(r"\s+(?=[*&])", "", re.sub(r"(?<=[*&])\s*(?=\w)", " ", text))


def expected_slots(name, operations, abi):
    lines = list(abi["before"])
    for operation in operations:
        lines += abi["destructor"] if operation == "destructor" else [re.sub(r"(\w+)\(", r"{0}::\1(", operation)]
    return [canonical(line.format(name)) for line in lines]


def address_of_an_operation(name, operations):
    """A use of the class's table, without which the compiler does not lay it out."""
    operation = next(operation for operation in operations if operation != "destructor")
    result, called, parameters = re.fullmatch(r"(.*?)(\w+)\((.*)\)", operation).groups()
    return f"{result}({name}::*use{name})({parameters}) = &{name}::{called};\n"


def dumped_tables(output, word):
    """The tables of the compiler's dump: class name -> slots in order."""
    tables = {}
    for name, body in re.findall(rf"^{word} for '(\w+)' \(\d+ entr\w+\)\.\n(.*?)\n\n", output + "\n\n", re.M | re.S):
        lines = re.findall(r"^ *\d+ \| (.*)$", body, re.M)
        tables[name] = [canonical(re.sub(r" \[pure\]$", "", line)) for line in lines]
    return tables


def main():
    slots = read_slots(Path(__file__).with_name("slots.txt"))
    errors = [f"{name}: is in only one of the headers and slots.txt"
              for name in sorted(classes_with_virtual_operations() ^ slots.keys())]
    source = compilers.include_all([*compilers.HEADERS, *INTERNAL_HEADERS])
    source += "".join(address_of_an_operation(name, operations) for name, operations in slots.items())

    commands = [[*compilers.clang(target), f"-I{INTERNAL_FOLDER}",
                 "-Xclang", "-fdump-vtable-layouts", "-S", "-emit-llvm", "-o", "/dev/null"]
                for target in ABIS]
    for (target, abi), result in zip(ABIS.items(), compilers.compile_all([(command, source) for command in commands])):
        if result.returncode != 0:
            errors.append(f"{target}: the headers do not compile\n{result.stderr}")
            continue
        tables = dumped_tables(result.stdout, abi["table"])
        for name, operations in slots.items():
            expected, found = expected_slots(name, operations, abi), tables.get(name, [])
            if expected != found:
                errors.append("\n".join([f"{target}: {name}", "  expected:", *(f"    {line}" for line in expected),
                                         "  found:", *(f"    {line}" for line in found)]))
    print("\n".join(errors) or f"{len(slots)} classes have the listed slots under both ABIs")
    return 1 if errors else 0


if __name__ == "__main__":
    sys.exit(main())
