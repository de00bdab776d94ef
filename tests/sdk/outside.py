#!/usr/bin/env python3
"""outside.py BUILD COMPILER WINE VERSION: installs a build, moves it, builds the examples of docs/sdk.md and the
installed sample with nothing else, and lets the host find both plug-ins."""

import subprocess
import sys
import tempfile
from pathlib import Path

sys.path.append(str(Path(__file__).resolve().parents[1] / "docs"))
import examples

BUILD, COMPILER, WINE, VERSION = sys.argv[1:]


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
        write_examples(folder)
        plugin = build(folder / "plugin", sdk)
        sample = build(sdk / "share/OrvixCore/samples/archive", sdk)
        host = build(folder / "host", sdk)
        for plugins, provider in ((plugin, "Depot"), (sample / "bin/plugins", "Archive")):
            found = run(WINE, host / "host.exe", f"Z:{plugins}", cwd=folder)
            if found.split("\n") != [f"0: {provider} starts", ""]:
                raise Failure(f"the host finds in {plugins}:\n{found}")
        check_who_is_served(folder, sdk)
    print("a host and two plug-ins work outside the tree")


if __name__ == "__main__":
    try:
        main()
    except Failure as failure:
        sys.exit(str(failure))
