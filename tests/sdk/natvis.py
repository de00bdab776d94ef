#!/usr/bin/env python3
"""Visual Studio's view of the records fits the records: each has one, its expressions compile as members of the
class, and the constants that it names have the published numbers."""

import re
import sys
import xml.etree.ElementTree as ElementTree
from pathlib import Path

ROOT = Path(__file__).resolve().parents[2]
sys.path.append(str(ROOT / "tests/abi"))
import compilers

FOLDERS = ["base", "records", "config"]
STATES = [source for folder in FOLDERS for source in (ROOT / folder).glob("*.cpp")
          if re.search(r"^struct \w+::State$", source.read_text(encoding="utf-8"), re.M)]
# A namespace whose constants are shown as the whole text of a record.
TEXTS = {"OrvixNotifyParams": "OrvixNotificationID"}


def name(element):
    return element.tag.partition("}")[2]


def records():
    """The exported classes that have data."""
    found = set()
    for header in compilers.HEADERS:
        path = next(folder / header for folder in compilers.FOLDERS if (folder / header).exists())
        for class_name, body in re.findall(r"^class ORVIX_API (\w+)[^;{]*\n\{(.*?)^\};",
                                           path.read_text(encoding="utf-8"), re.M | re.S):
            if re.search(r"^    [^/(]*\bm_\w+", body, re.M):
                found.add(class_name)
    return found


def expressions(view):
    """What the debugger evaluates for an object, as C++."""
    for element in view.iter():
        if "Condition" in element.attrib:
            yield element.attrib["Condition"]
        text = (element.text or "").strip()
        if name(element) == "DisplayString":
            yield from re.findall(r"\{(.*?)\}", text)
        elif text:
            yield text


def constants(view):
    """The named numbers: (namespace, constant, number)."""
    for element in view.iter():
        if name(element) == "Synthetic" and element.attrib["Name"].startswith("Orvix"):
            for item in element.iter():
                if name(item) == "Item":
                    number = re.fullmatch(r"\(m_\w+ & (\w+)\) != 0", item.attrib["Condition"])[1]
                    yield element.attrib["Name"], item.attrib["Name"], number
        elif name(element) == "DisplayString" and view.attrib["Name"] in TEXTS and "Condition" in element.attrib:
            yield (TEXTS[view.attrib["Name"]], element.text,
                   re.fullmatch(r"m_\w+ == (\w+)", element.attrib["Condition"])[1])


def published(namespace):
    """The header of a namespace, and the names of its constants."""
    for header in (ROOT / "include").glob("*.h"):
        body = re.search(rf"^namespace {namespace}$(.*?)^\}}", header.read_text(encoding="utf-8"), re.M | re.S)
        if body:
            return header, set(re.findall(r"constexpr [\w: ]+ (\w+) = ", body[1]))
    raise LookupError(f"no header has the namespace {namespace}")


def program(views):
    """A program that evaluates everything. The private states of the records are in the library's own sources."""
    headers = {f"{view.attrib['Name']}.h" for view in views}
    headers.update(published(namespace)[0] for view in views for namespace, _, _ in constants(view))
    lines = [f'#include "{file}"' for file in [*headers, *STATES]]
    for view in views:
        record = view.attrib["Name"]
        lines.append(f"struct {record}View : {record} {{ void Evaluate() {{")
        for expression in expressions(view):
            plain = re.sub(r",\w+$", "", expression).replace("OrvixCore.dll!", "")
            lines.append(f"static_cast<void>({plain});")
        lines.append("} };")
        lines += [f"static_assert({namespace}::{constant} == {number});"
                  for namespace, constant, number in constants(view)]
    return "\n".join(lines) + "\n"


def main():
    views = [view for view in ElementTree.parse(ROOT / "cmake/OrvixCore.natvis").getroot() if name(view) == "Type"]
    shown = {view.attrib["Name"] for view in views}
    errors = [f"the record {record} has no view" for record in sorted(records() - shown)]
    errors += [f"{record} is no record" for record in sorted(shown - records())]
    for view in views:
        named = {}
        for namespace, constant, _ in constants(view):
            named.setdefault(namespace, set()).add(constant)
        errors += [f"{view.attrib['Name']} does not show {namespace}::{constant}"
                   for namespace, found in named.items() for constant in sorted(published(namespace)[1] - found)]
    command = [*compilers.gcc(), *(f"-I{ROOT / folder}" for folder in FOLDERS), "-DORVIXCORE_STATIC", "-fsyntax-only",
               "-fno-access-control"]
    result = compilers.compile_source(command, program(views))
    if result.returncode != 0:
        errors.append(result.stderr)
    print("\n".join(errors) or f"{len(views)} records are shown as they are")
    return 1 if errors else 0


if __name__ == "__main__":
    sys.exit(main())
