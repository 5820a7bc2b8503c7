#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Compiles every header of the given directories alone, twice in one file, and all together in both orders: as C and as
C++, with gcc and clang, hosted and freestanding, for the host, for the 32-bit target and as a kernel's C files see it:
a kernel of today, and one that takes <stdarg.h> from the compiler.
"""

import argparse
import functools
import itertools
import pathlib
import subprocess
import sys
import tempfile
from concurrent.futures import ThreadPoolExecutor

WARNINGS = ["-Wall", "-Wextra", "-Werror", "-pedantic", "-Wshadow", "-Wundef", "-Wredundant-decls"]
C_WARNINGS = ["-Wstrict-prototypes", "-Wmissing-prototypes", "-fno-short-enums"]
ARM = ["--target=arm-none-eabi", "-mthumb", "-mcpu=cortex-a9", "-mfloat-abi=soft", "-ffreestanding"]

# What a kernel's C files find in place of the compiler's own headers.
KERNEL_HEADERS = {
    "kernel/linux/types.h": "typedef __SIZE_TYPE__ size_t;\n#define NULL ((void*)0)\n",
    "kernel/linux/stdarg.h": "typedef __builtin_va_list va_list;\n",
}
# An older one has the first alone, and beside it one header of the compiler: no <stddef.h> there either.
OLD_KERNEL_HEADERS = {
    "old_kernel/linux/types.h": KERNEL_HEADERS["kernel/linux/types.h"],
    "old_kernel/stdarg.h": KERNEL_HEADERS["kernel/linux/stdarg.h"],
}


def variants(compilers, kernel_directory):
    """The command for every way in which a header is compiled."""
    for compiler, (standard, freestanding) in itertools.product(
            (compilers.gcc, compilers.clang), itertools.product(("c11", "c17"), ([], ["-ffreestanding"]))):
        yield [compiler, "-x", "c", f"-std={standard}", *C_WARNINGS, *freestanding]
    for compiler, (standard, freestanding) in itertools.product(
            (compilers.gxx, compilers.clangxx), itertools.product(("c++17", "c++20"), ([], ["-ffreestanding"]))):
        yield [compiler, "-x", "c++", f"-std={standard}", *freestanding]
    yield [compilers.clang, "-x", "c", "-std=c11", *C_WARNINGS, *ARM]
    yield [compilers.clangxx, "-x", "c++", "-std=c++20", "-fshort-enums", *ARM]
    for compiler, kernel in itertools.product((compilers.gcc, compilers.clang), ("kernel", "old_kernel")):
        yield [compiler, "-x", "c", "-std=c11", *C_WARNINGS, "-D__KERNEL__", "-nostdinc",
               "-I", f"{kernel_directory}/{kernel}"]


def texts(headers):
    """(what it is called, text, what else to call it and the text that shows that it is the other) for every file that
    is compiled. What a header lacks is missed twice as well, so that it is compiled alone only to tell what is wrong.
    """
    for header in headers:
        include = f'#include "{header.name}"\n'
        yield (f"{header.name} twice", include * 2 + "extern int iNotEmpty;\n",
               header.name, include + "extern int iNotEmpty;\n")
    if len(headers) > 1:
        for order, together in (("all together", headers), ("all together, backwards", headers[::-1])):
            yield order, "".join(f'#include "{header.name}"\n' for header in together), None, None


def compile_text(command, text, includes):
    result = subprocess.run([*command, *WARNINGS, *includes, "-fsyntax-only", "-"], input=text, text=True,
                            capture_output=True, check=False)
    return result.returncode, result.stderr


def complaint(includes, job):
    """(name, command, message) of what the compiler refuses, or nothing."""
    command, (name, text, other_name, other_text) = job
    code, message = compile_text(command, text, includes)
    if code == 0:
        return None
    if other_text:
        other_code, other_message = compile_text(command, other_text, includes)
        if other_code != 0:
            name, message = other_name, other_message
    return name, command, message


def main():
    parser = argparse.ArgumentParser(description="Compile every header alone.")
    for option in ("--gcc", "--gxx", "--clang", "--clangxx"):
        parser.add_argument(option, required=True)
    parser.add_argument("--only", default="", metavar="WORDS", help="of the commands those with these words in them")
    parser.add_argument("directories", nargs="+", type=pathlib.Path)
    arguments = parser.parse_args()

    headers = [header for directory in arguments.directories for header in sorted(directory.glob("*.h"))]
    if not headers:
        sys.exit("no headers found in " + " ".join(map(str, arguments.directories)))
    includes = [f"-I{directory}" for directory in arguments.directories]

    with tempfile.TemporaryDirectory() as scratch:
        for name, text in (KERNEL_HEADERS | OLD_KERNEL_HEADERS).items():
            path = pathlib.Path(scratch, name)
            path.parent.mkdir(parents=True, exist_ok=True)
            path.write_text(text)

        commands = [command for command in variants(arguments, scratch) if arguments.only in " ".join(command)]
        jobs = list(itertools.product(commands, texts(headers)))
        with ThreadPoolExecutor(max_workers=2) as pool:
            failures = [failure for failure in pool.map(functools.partial(complaint, includes), jobs) if failure]

    for name, command, message in failures:
        print(f"{name}: {' '.join(command)}\n{message}")
    print(f"{len(headers)} headers, {len(jobs)} compilations, {len(failures)} failures")
    return 1 if failures else 0


if __name__ == "__main__":
    sys.exit(main())
