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
from concurrent.futures import ThreadPoolExecutor
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


HELPERS = {
    "CMakeLists.txt": """
        cmake_minimum_required(VERSION 3.25)
        project(helpers LANGUAGES CXX)
        find_package(OrvixCore 0.1 REQUIRED)
        add_executable(helpers helpers.cpp)
        target_link_libraries(helpers PRIVATE OrvixCore::Settings OrvixCore::Waiting OrvixCore::BuildOptions)
        """,
    "helpers.cpp": """
        #include <OrvixProviderSettings.h>
        #include <OrvixWaitingWindow.h>
        #include <windows.h>
        int main()
        {
            const OrvixProviderSettings settings(L"C:\\\\none", L"Depot");
            OrvixWaitingWindow window(nullptr, L"Depot", L"Cancel");
            return !settings.AreFound() && !window.IsCancelled() ? 0 : 1;
        }
        """,
}


def write_helpers(folder):
    """A program that uses nothing but the static libraries of the SDK."""
    folder.mkdir()
    for name, text in HELPERS.items():
        (folder / name).write_text(text, encoding="utf-8")
    return folder


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
    if not source.endswith("/core/OrvixServices.cpp"):
        raise Failure(f"GetIOrvixServices has the source {source}")
    for file in [*modules, *sdk.rglob("*.debug")]:
        if f"{examples.ROOT}/".encode() in file.read_bytes():
            raise Failure(f"{file.name} names {examples.ROOT}")
    return len(modules)


def follow_readme(template, sdk, folder):
    """Types the commands of a template's README.md; the build folder, and what the last command prints."""
    copy = shutil.copytree(template, folder / f"my {template.name}")
    page = (copy / "README.md").read_text(encoding="utf-8")
    lines = [line for fence in examples.FENCE.finditer(page) if fence["language"] == "sh"
             for line in fence["text"].splitlines()]
    if len(lines) != 3:
        raise Failure(f"{template.name}/README.md has {len(lines)} commands")
    commands = copy / "commands"
    commands.mkdir()
    (commands / "wine").write_text(f"#!/bin/sh\nexec '{WINE}' \"$@\"\n", encoding="utf-8")
    (commands / "wine").chmod(0o755)
    environment = {**os.environ, "ORVIX_SDK": str(sdk), "PATH": f"{commands}:{os.environ['PATH']}"}
    for line in lines:
        output = run("bash", "-c", line, cwd=copy, env=environment)
    return copy / "build", output


def check_host(host, plugins, provider, folder):
    """The host of the guide finds a provider and starts it."""
    found = run(WINE, host / "host.exe", f"Z:{plugins}", cwd=folder)
    if found.split("\n") != [f"0: {provider} starts", ""]:
        raise Failure(f"the host finds in {plugins}:\n{found}")


def check_template_host(host, plugins, provider, folder):
    """The template host shows the files of a project with a provider."""
    project = folder / "project ü"
    project.mkdir(exist_ok=True)
    (project / "größe.txt").touch()
    shown = run(WINE, host / "myhost.exe", f"Z:{plugins}", provider, f"Z:{project}", cwd=folder)
    if not re.fullmatch(r"not controlled: Z:\\.*\\project ü\\größe\.txt\n", shown):
        raise Failure(f"the template host shows with {provider}:\n{shown}")


def check_programs(folder, sdk):
    """Builds everything outside the tree, and runs the hosts with the plug-ins."""
    share = sdk / "share/OrvixCore"
    with ThreadPoolExecutor(os.cpu_count()) as pool:
        jobs = [pool.submit(follow_readme, share / "templates/plugin", sdk, folder),
                pool.submit(build, share / "samples/archive", sdk),
                pool.submit(build, share / "samples/desk", sdk),
                pool.submit(build, folder / "plugin", sdk),
                pool.submit(build, folder / "host", sdk),
                pool.submit(build, write_helpers(folder / "helpers"), sdk),
                pool.submit(follow_readme, share / "templates/host", sdk, folder)]
        (my_plugin, rules), sample, desk, plugin, host, helpers, (my_host, found) = (job.result() for job in jobs)
    sample = sample / "bin/plugins"
    if not all((desk / name).exists() for name in ("desk.exe", "OrvixCore.dll", "OrvixCoreUI.dll", "braeutil.dll")):
        raise Failure("the sample host is not complete")
    if not re.search(r"^\d+ rules, .*\b0 failed", rules, re.M):
        raise Failure(f"the template plug-in breaks its contract:\n{rules}")
    if found != "Archive\nGit\n":
        raise Failure(f"the template host finds:\n{found}")
    run(WINE, helpers / "helpers.exe")
    check_host(host, plugin, "Depot", folder)
    check_host(host, sample, "Archive", folder)
    check_template_host(my_host, my_plugin, "My provider", folder)
    check_template_host(my_host, sample, "Archive", folder)


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
        check_programs(folder, sdk)
        check_who_is_served(folder, sdk)
    print(f"three hosts and three plug-ins work outside the tree, and {count} modules have debug files")


if __name__ == "__main__":
    try:
        main()
    except Failure as failure:
        sys.exit(str(failure))
