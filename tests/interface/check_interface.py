#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the binary interface of the object that ships against the one that is committed: what it offers, what it needs,
and each type that the headers show. What the platform provides comes from the skeleton of a port, which has a body for
every function. Whatever differs is named; that is not always wrong, but never meant to happen unnoticed.

usage: check_interface.py [--renew] COMMITTED OBJECT SKELETON COMPILER
"""

import pathlib
import subprocess
import sys
import tempfile

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

import whole_file  # noqa: E402

ROOT = pathlib.Path(__file__).resolve().parents[2]
HEADERS = ("src/system/inc", "src/driver/inc", "src/driver/private_inc")
# What the target's objects are compiled with, as far as it shows at the interface; and all types, used or not.
FLAGS = ("-std=c11", "-ffreestanding", "-march=armv7-a", "-mthumb", "-mfloat-abi=soft", "-fno-short-enums",
         "-fshort-wchar", "-g", "-fno-eliminate-unused-debug-types")
WITHOUT_PLACES = ("--no-show-locs", "--no-comp-dir-path", "--no-corpus-path", "--no-elf-needed")


def run(*command, **options):
    done = subprocess.run([str(word) for word in command], capture_output=True, text=True, check=False, **options)
    if done.returncode != 0:
        sys.exit(f"{' '.join(map(str, command[:4]))} … failed:\n{done.stdout}{done.stderr}")
    return done.stdout


def dump(to, objects, skeleton, compiler, headers):
    """Write what objects and skeleton offer together, seen through the headers."""
    with tempfile.TemporaryDirectory() as directory:
        made, both = pathlib.Path(directory) / "skeleton.o", pathlib.Path(directory) / "both.o"
        run(compiler, *FLAGS, *(f"-I{header}" for header in headers), "-c", skeleton.name, "-o", made,
            cwd=skeleton.parent)
        run(compiler.removesuffix("gcc") + "ld", "-r", "-o", both, made, *objects)
        shown = [word for header in headers for word in ("--headers-dir", header)]
        run("abidw", *WITHOUT_PLACES, "--load-all-types", "--drop-private-types", *shown, "--out-file", to, both)


def differences(committed, found):
    """What abidiff tells, empty when nothing differs."""
    told = subprocess.run(["abidiff", "--harmless", "--non-reachable-types", committed, found], capture_output=True,
                          text=True, check=False)
    if told.returncode & 3:
        sys.exit(f"abidiff failed: {told.stdout}{told.stderr}")
    return told.stdout if told.returncode != 0 else ""


def main():
    committed, shipped, skeleton, compiler = [word for word in sys.argv[1:] if word != "--renew"]
    headers = [ROOT / header for header in HEADERS]
    with tempfile.TemporaryDirectory() as directory:
        found = pathlib.Path(directory) / "interface.xml"
        dump(found, [shipped], pathlib.Path(skeleton), compiler, headers)
        if "--renew" in sys.argv[1:]:
            whole_file.write(committed, found.read_text(encoding="utf-8"))
            return 0
        told = differences(committed, found)
    print(told + "The interface is not the committed one. If that is meant: CONTRIBUTING.md, Versions." if told
          else "the interface is the committed one")
    return 1 if told else 0


if __name__ == "__main__":
    sys.exit(main())
