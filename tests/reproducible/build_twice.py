#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Builds the objects that ship twice, from copies of the tree in folders of different depth and name, and compares them
byte for byte: whoever builds a version gets what was tested. No compiler cache takes part.

usage: build_twice.py CMAKE TARGET OBJECT... [-- OPTION...]    OPTION for configuring; OBJECT within the build folder
"""

import hashlib
import os
import pathlib
import shutil
import subprocess
import sys
import tempfile

ROOT = pathlib.Path(__file__).resolve().parents[2]
NOT_TAKEN = shutil.ignore_patterns("build", ".*", "__pycache__", "tests", "fuzz")
# (tree, build folder): one build folder within its tree, and one far from it.
PLACES = (("a/tree", "a/tree/build/one"), ("b/rather/deep/down/another", "c/two"))


def run(*command, **options):
    done = subprocess.run([str(word) for word in command], capture_output=True, text=True, check=False, **options)
    if done.returncode != 0:
        sys.exit(f"{' '.join(map(str, command))}\n{done.stdout}{done.stderr}")


def build(cmake, target, options, tree, folder):
    shutil.copytree(ROOT, tree, ignore=NOT_TAKEN)
    environment = {**os.environ, "CCACHE_DISABLE": "1"}
    toolchain = [option.replace(str(ROOT), str(tree)) for option in options]
    run(cmake, "-G", "Ninja", "-S", tree, "-B", folder, "-DPMX_TESTS=OFF", *toolchain, env=environment)
    run(cmake, "--build", folder, "-j", "2", "--target", target, env=environment)


def differing_bytes(first, second):
    """How many bytes differ, and where the first of them stands."""
    if len(first) != len(second):
        return f"{len(first)} and {len(second)} bytes"
    places = [place for place, (one, other) in enumerate(zip(first, second)) if one != other]
    return f"{len(places)} of {len(first)} bytes, the first at {places[0]:#x}" if places else ""


def compare(folders, objects):
    """What differs, a line for each object."""
    for name in objects:
        first, second = [(folder / name).read_bytes() for folder in folders]
        found = differing_bytes(first, second)
        if found:
            yield f"{name}: {found}"
        else:
            print(f"{name}: {len(first)} bytes, SHA-256 {hashlib.sha256(first).hexdigest()}")


def main():
    arguments, _, options = " ".join(sys.argv[1:]).partition(" -- ")
    cmake, target, *objects = arguments.split()
    with tempfile.TemporaryDirectory() as directory:
        places = [[pathlib.Path(directory) / part for part in place] for place in PLACES]
        for tree, folder in places:
            build(cmake, target, options.split(), tree, folder)
        found = list(compare([folder for _, folder in places], objects))
    for complaint in found:
        print(f"not the same twice: {complaint}")
    return 1 if found or not objects else 0


if __name__ == "__main__":
    sys.exit(main())
