#!/usr/bin/env python3
"""outside.py BUILD COMPILER WINE VERSION: installs a build, moves it, builds the examples of docs/sdk.md, the installed
sample and the installed templates with nothing else, lets the hosts find the plug-ins, and checks the plug-ins against
their contract."""

import os
import re
import shutil
import subprocess
import sys
import tempfile
from pathlib import Path

sys.path.append(str(Path(__file__).resolve().parents[1] / "docs"))
import examples

BUILD, COMPILER, WINE, VERSION = sys.argv[1:]
TOOLS = COMPILER.rpartition("/")[2].split("-g++")[0]


class Failure(Exception):
    pass


def run(*command, **options):
    result = subprocess.run(command, text=True, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, timeout=200,
                            **options)
    if result.returncode != 0:
        raise Failure(f"{' '.join(map(str, command))}\n{result.stdout}")
    return result.stdout


def install(folder):
    """The installed tree at a place that it was not installed to."""
    run("cmake", "--install", BUILD, "--prefix", folder / "first")
    sdk = (folder / "first").rename(folder / "the sdk")
    for file in sdk.rglob("*.cmake"):
        for place in (examples.ROOT, folder):
            if str(place) in file.read_text(encoding="utf-8"):
                raise Failure(f"{file.relative_to(sdk)} names {place}")
    return sdk


def write_examples(folder):
    for example in examples.examples(examples.ROOT / "docs/sdk.md"):
        if example.mark == "file":
            file = folder / example.value
            file.parent.mkdir(exist_ok=True)
            file.write_text(example.text, encoding="utf-8")


def build(source, sdk):
    """Builds a project against the installed tree; its build folder."""
    folder = source / "build"
    run("cmake", "-S", source, "-B", folder, "-G", "Ninja", f"-DCMAKE_PREFIX_PATH={sdk}",
        "-DCMAKE_SYSTEM_NAME=Windows", f"-DCMAKE_CXX_COMPILER={COMPILER}")
    run("cmake", "--build", folder)
    return folder


def check_links(sdk):
    """The links of the pages in the SDK lead to files in it."""
    for page in sdk.rglob("*.md"):
        for link in re.findall(r"\]\(([^)#\s]+)", page.read_text(encoding="utf-8")):
            if "://" not in link and not (page.parent / link).exists():
                raise Failure(f"{page.relative_to(sdk)} links to {link}")


def place(module, address):
    """What a debugger says of an address: function, and source with line."""
    return run(f"{TOOLS}-addr2line", "-f", "-e", module, address).split("\n")[:2]


def check_debug_files(sdk, folder):
    """A debugger finds functions and lines by the file beside a module, and none in the module itself."""
    modules = [*sdk.rglob("*.dll"), *sdk.rglob("*.exe")]
    for module in modules:
        start = re.search(r"start address (\w+)", run(f"{TOOLS}-objdump", "-f", module))[1]
        if place(module, start)[0] == "??":
            raise Failure(f"no debug file tells where {module.name} starts")
        if place(shutil.copy(module, folder / "alone"), start)[0] != "??":
            raise Failure(f"{module.name} is not stripped")
    library = sdk / "bin/OrvixCore.dll"
    tables = run(f"{TOOLS}-objdump", "-p", library)
    base = int(re.search(r"^ImageBase\s+(\w+)", tables, re.M)[1], 16)
    index = re.search(r"^\s*\[ *(\d+)\].* GetIOrvixServices$", tables, re.M)[1]
    offset = int(re.search(rf"^\s*\[ *{index}\] \+base\[ *\d+\] (\w+) Export RVA", tables, re.M)[1], 16)
    source = place(library, hex(base + offset))[1].partition(":")[0]
    if not source.endswith("/core/OrvixServices.cpp") or source.startswith("/"):
        raise Failure(f"GetIOrvixServices has the source {source}")
    return len(modules)


def follow_readme(template, sdk, folder):
    """Types the commands of a template's README.md; what the last one prints."""
    copy = shutil.copytree(template, folder / f"my {template.name}")
    page = (copy / "README.md").read_text(encoding="utf-8")
    lines = [line for fence in examples.FENCE.finditer(page) if fence["language"] == "sh"
             for line in fence["text"].splitlines()]
    if len(lines) != 3:
        raise Failure(f"{template.name}/README.md has {len(lines)} commands")
    wine = folder / "commands/wine"
    wine.parent.mkdir(exist_ok=True)
    wine.write_text(f"#!/bin/sh\nexec '{WINE}' \"$@\"\n", encoding="utf-8")
    wine.chmod(0o755)
    environment = {**os.environ, "ORVIX_SDK": str(sdk), "PATH": f"{wine.parent}:{os.environ['PATH']}"}
    for line in lines:
        output = run("bash", "-c", line, cwd=copy, env=environment)
    return copy / "build", output


def check_templates(sdk, sample, folder):
    """The template plug-in meets its contract; the template host finds it and the sample, and shows the files of a
    project."""
    templates = sdk / "share/OrvixCore/templates"
    plugin, rules = follow_readme(templates / "plugin", sdk, folder)
    if not re.search(r"^\d+ rules, .*\b0 failed", rules, re.M):
        raise Failure(f"the template plug-in breaks its contract:\n{rules}")
    host, found = follow_readme(templates / "host", sdk, folder)
    if found != "Archive\n":
        raise Failure(f"the template host finds:\n{found}")
    project = folder / "project ü"
    project.mkdir()
    (project / "größe.txt").touch()
    for plugins, provider in ((plugin, "My provider"), (sample, "Archive")):
        shown = run(WINE, host / "myhost.exe", f"Z:{plugins}", provider, f"Z:{project}", cwd=folder)
        if not re.fullmatch(r"not controlled: Z:\\.*\\project ü\\größe\.txt\n", shown):
            raise Failure(f"the template host shows with {provider}:\n{shown}")


def check_who_is_served(folder, sdk):
    """The package serves its own and older versions of its major number, for 64-bit programs of its own ABI."""
    major, minor, patch = map(int, VERSION.split("."))
    cases = [
        (f"{VERSION} EXACT", "", True),
        (f"{major}.0", "", True),
        (f"{major}.{minor}.{patch + 1}", "", False),
        (f"{major + 1}", "", False),
        (VERSION, "set(CMAKE_SIZEOF_VOID_P 4)", False),
        (VERSION, "set(MSVC 1)", False),
    ]
    for version, setting, served in cases:
        (folder / "CMakeLists.txt").write_text(f"""
            cmake_minimum_required(VERSION 3.25)
            project(client LANGUAGES NONE)
            {setting}
            find_package(OrvixCore {version} QUIET PATHS "{sdk}" NO_DEFAULT_PATH)
            message(STATUS "found: ${{OrvixCore_FOUND}}")
            """, encoding="utf-8")
        answer = run("cmake", "--fresh", "-S", folder, "-B", folder / "client")
        if ("found: 1" if served else "found: 0") not in answer:
            raise Failure(f"find_package({version}) {setting}\n{answer}")


def main():
    with tempfile.TemporaryDirectory(prefix="orvix-sdk-") as name:
        folder = Path(name)
        sdk = install(folder)
        count = check_debug_files(sdk, folder)
        check_links(sdk)
        write_examples(folder)
        plugin = build(folder / "plugin", sdk)
        sample = build(sdk / "share/OrvixCore/samples/archive", sdk)
        host = build(folder / "host", sdk)
        for plugins, provider in ((plugin, "Depot"), (sample / "bin/plugins", "Archive")):
            found = run(WINE, host / "host.exe", f"Z:{plugins}", cwd=folder)
            if found.split("\n") != [f"0: {provider} starts", ""]:
                raise Failure(f"the host finds in {plugins}:\n{found}")
        check_templates(sdk, sample / "bin/plugins", folder)
        check_who_is_served(folder, sdk)
    print(f"two hosts and three plug-ins work outside the tree, and {count} modules have debug files")


if __name__ == "__main__":
    try:
        main()
    except Failure as failure:
        sys.exit(str(failure))
