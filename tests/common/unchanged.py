#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs a check of sources, unless it passed with the same inputs before, which it tells: the inputs named, what is
installed, and the command with its programs. Continuous integration, which says so by CI=true, runs everything.

For checks alone whose result follows from what they read; what a test makes a program do is tried every time.

usage: unchanged.py STAMP INPUT... -- COMMAND...
       INPUT is a file, or a folder with all that is below it
"""

import hashlib
import os
import pathlib
import shutil
import subprocess
import sys
import time

INSTALLED = pathlib.Path("/var/lib/dpkg/status")


def files_of(inputs):
    """Every file, once. What is not there is a mistake: nobody would notice that it changes."""
    found = set()
    for given in map(pathlib.Path, inputs):
        if not given.exists():
            sys.exit(f"unchanged.py: no input {given}")
        below = given.rglob("*") if given.is_dir() else [given]
        found |= {path for path in below if path.is_file() and "__pycache__" not in path.parts}
    return sorted(found)


def identity(path):
    """What tells a program, or the list of what is installed, from another one."""
    state = path.stat()
    return f"{path} {state.st_size} {state.st_mtime_ns}"


def programs_of(command):
    """The words of a command that are files, or lead to a program; one word may be a command of its own."""
    for word in " ".join(command).split():
        found = shutil.which(word)
        if found or pathlib.Path(word).is_file():
            yield pathlib.Path(found or word).resolve()


def digest(inputs, command):
    found = hashlib.sha256()
    for text in (sys.version, *command, *map(identity, [INSTALLED, *programs_of(command)])):
        found.update(f"{text}\0".encode())
    for path in files_of(inputs):
        content = path.read_bytes()
        found.update(f"{path}\0{len(content)}\0".encode())
        found.update(content)
    return found.hexdigest()


def main(arguments):
    if "--" not in arguments[1:]:
        sys.exit(__doc__)
    split = arguments.index("--")
    stamp, inputs, command = pathlib.Path(arguments[0]), arguments[1:split], arguments[split + 1:]
    if not INSTALLED.exists() or os.environ.get("CI") == "true":
        return subprocess.run(command, check=False).returncode

    before = digest(inputs, command)
    if stamp.exists():
        known, _, when = stamp.read_text(encoding="utf-8").strip().partition(" ")
        if known == before:
            print(f"unchanged since {when}, when it passed (CI=true runs it again, and so does deleting {stamp})")
            return 0
    stamp.unlink(missing_ok=True)
    code = subprocess.run(command, check=False).returncode
    # What somebody edits meanwhile is not what was looked at.
    if code == 0 and digest(inputs, command) == before:
        stamp.parent.mkdir(parents=True, exist_ok=True)
        stamp.write_text(f"{before} {time.strftime('%Y-%m-%d %H:%M:%S')}\n", encoding="utf-8")
    return code


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
