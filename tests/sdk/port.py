#!/usr/bin/env python3
"""The vcpkg port describes this tree: its manifest has the tree's version, its portfile runs and leaves a package as
vcpkg wants it, and the targets that it tells users of are installed."""

import json
import re
import subprocess
import sys
import tempfile
from pathlib import Path

ROOT = Path(__file__).resolve().parents[2]
PORT = ROOT / "ports/orvixcore"
INSTALL = (ROOT / "cmake/OrvixInstall.cmake").read_text(encoding="utf-8")
FIELDS = {"name": str, "version": str, "description": str, "license": type(None), "supports": str, "dependencies": list}


def manifest_errors():
    manifest = json.loads((PORT / "vcpkg.json").read_text(encoding="utf-8"))
    types = {name: type(value) for name, value in manifest.items()}
    if types != FIELDS:
        yield f"vcpkg.json has the fields {types}"
        return
    header = (ROOT / "include/OrvixVersion.h").read_text(encoding="utf-8")
    version = ".".join(re.search(rf"ORVIX_VERSION_{part} (\d+)", header)[1] for part in ("MAJOR", "MINOR", "PATCH"))
    if manifest["version"] != version:
        yield f"vcpkg.json has the version {manifest['version']}, the header {version}"
    if manifest["name"] != PORT.name:
        yield f"the port {PORT.name} is called {manifest['name']}"
    names = [item if isinstance(item, str) else item["name"] for item in manifest["dependencies"]]
    if names != sorted(names) or not all(re.fullmatch(r"[a-z0-9]+(-[a-z0-9]+)*", name) for name in names):
        yield f"the dependencies are {names}"
    for tool in ("vcpkg-cmake", "vcpkg-cmake-config"):
        if {"name": tool, "host": True} not in manifest["dependencies"]:
            yield f"{tool} is not a dependency of the host"


def portfile_errors():
    with tempfile.TemporaryDirectory(prefix="orvix-port-") as folder:
        result = subprocess.run(["cmake", f"-DPORTFILE={PORT}/portfile.cmake", f"-DCURRENT_PACKAGES_DIR={folder}", "-P",
                                 Path(__file__).with_name("port.cmake")], text=True, capture_output=True)
        package = Path(folder)
        files = {str(file.relative_to(package)) for file in package.rglob("*") if file.is_file()}
    if result.returncode != 0:
        yield result.stderr
        return
    package = re.search(r"^set\(package (\S+)\)", INSTALL, re.M)[1]
    for call in (f"vcpkg_cmake_configure SOURCE_PATH;{ROOT};", f"CONFIG_PATH;{package}", "copyright check enabled"):
        if call not in result.stdout:
            yield f"no '{call}' in\n{result.stdout}"
    kept = {"bin/OrvixCore.dll", "include/IOrvixServices.h", "share/OrvixCore/docs/sdk.md", "debug/bin/OrvixCore.dll",
            "share/orvixcore/usage"}
    if files != kept:
        yield f"the package has {sorted(files)}"
    for option in re.findall(r"-D(\w+)=", result.stdout):
        if f"option({option} " not in (ROOT / "CMakeLists.txt").read_text(encoding="utf-8"):
            yield f"the tree has no option {option}"


def usage_errors():
    exported = re.search(r"^install\(TARGETS ([\w ]+) EXPORT", INSTALL, re.M)[1].split()
    named = re.findall(r"OrvixCore::(\w+)", (PORT / "usage").read_text(encoding="utf-8"))
    if not named:
        yield "usage names no target"
    yield from (f"usage names {target}, which is not installed" for target in named if target not in exported)


def main():
    errors = [*manifest_errors(), *portfile_errors(), *usage_errors()]
    print("\n".join(errors) or "the port fits the tree")
    return 1 if errors else 0


if __name__ == "__main__":
    sys.exit(main())
