"""The compilers that read the public headers, and a way to run them on generated sources."""

import os
import subprocess
from concurrent.futures import ThreadPoolExecutor
from pathlib import Path

ROOT = Path(__file__).resolve().parents[2]
FOLDERS = [ROOT / "include", ROOT / "companions/braeutil/include"]
HEADERS = sorted(header.name for folder in FOLDERS for header in folder.glob("*.h"))
COMMON = ["-std=c++20", "-x", "c++", *(f"-I{folder}" for folder in FOLDERS)]
MINGW_HEADERS = "/usr/x86_64-w64-mingw32/include"


def gcc():
    return ["x86_64-w64-mingw32-g++-posix", *COMMON]


def clang(target):
    """Clang for either ABI with libc++'s and mingw-w64's headers, so that no Microsoft header is needed."""
    resources = Path(subprocess.check_output(["clang++-16", "-print-resource-dir"], text=True).strip())
    folders = [resources.parents[2] / "include/c++/v1", resources / "include", MINGW_HEADERS]
    return ["clang++-16", f"--target={target}", *COMMON, "-nostdinc", *(f"-isystem{folder}" for folder in folders),
            "-fno-ms-compatibility", "-fms-extensions", "-fgnuc-version=12.2",
            "-D__MINGW32__", "-D__MINGW64__", "-D_UCRT", "-D_LIBCPP_NO_VCRUNTIME"]


def compile_source(command, source):
    return subprocess.run([*command, "-"], input=source, text=True, capture_output=True, timeout=120)


def compile_all(jobs):
    """Compiles (command, source) pairs on every core; the results in the order of the jobs."""
    with ThreadPoolExecutor(os.cpu_count()) as pool:
        return list(pool.map(lambda job: compile_source(*job), jobs))


def include_all(headers):
    return "".join(f'#include "{header}"\n' for header in headers)
