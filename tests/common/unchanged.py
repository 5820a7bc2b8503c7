#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs a check, unless it passed with the same inputs before, which it tells: the inputs named, the files and programs
that the command names, which names there are in the folder where it runs, what is installed, and those surroundings
that the check sees at all.

For checks alone whose result follows from what they read: none that is about time, threads, terminals, or processes
that race. Whether a check reads no more than it names, inputs.py tells. CI=true, which continuous integration says, and
PMX_AGAIN=true run everything.

usage: unchanged.py STAMP INPUT... -- COMMAND...
       INPUT is a file, or a folder with all that is below it; ?PATH need not be there
"""

import hashlib
import os
import re
import shutil
import subprocess
import sys
import time

INSTALLED = "/var/lib/dpkg/status"
# What Debian's packages brought is told by their list.
SYSTEM = ("/bin/", "/etc/", "/lib", "/sbin/", "/usr/")
# The words that a check gets to see of its surroundings.
SURROUNDINGS = re.compile(r"CI|HOME|LANG|LC_\w+|PATH|TMPDIR|TZ|PYTHON\w+|"
                          r"(ASAN|CCACHE|GTEST|LSAN|PMX|PMXBOARD|UBSAN)(_\w+)?")
# Read once, and again when the file is another one: of smaller ones, looking is as dear as reading.
LARGE = 1 << 18
# A file that is this young may change once more without looking younger.
SETTLED = 2


def files_of(inputs):
    """Every file, once. What is not there is a mistake: nobody would notice that it changes."""
    found = set()
    for given in inputs:
        if given.startswith("?"):
            given = given[1:]
        elif not os.path.exists(given):
            sys.exit(f"unchanged.py: no input {given}")
        if os.path.isfile(given):
            found.add(given)
        for folder, folders, names in os.walk(given):
            folders[:] = [name for name in folders if name != "__pycache__"]
            found.update(os.path.join(folder, name) for name in names)
    return sorted(filter(os.path.isfile, found))   # and no link that leads nowhere, which editors leave meanwhile


def state_of(path):
    """What tells a program, or the list of what is installed, from another one."""
    state = os.stat(path)
    return f"{path} {state.st_size} {state.st_mtime_ns} {state.st_ctime_ns} {state.st_ino}"


def named_by(command):
    """The words of a command that are files, or lead to a program; one word may be a command of its own."""
    for word in " ".join(command).split():
        found = shutil.which(word)
        if found or os.path.isfile(word):
            yield os.path.realpath(found or word)


class Contents:
    """Digests of files. Those of large ones are kept, for many checks run the same program."""

    def __init__(self, kept):
        self.kept = kept

    def of(self, path):
        if path.startswith(SYSTEM):
            return state_of(path)
        if os.path.getsize(path) < LARGE:
            return self.read(path)
        state = state_of(path)
        note = os.path.join(self.kept, hashlib.sha256(path.encode()).hexdigest())
        known, _, digest = self.noted(note).rpartition("\n")
        if known == state:
            return digest
        digest = self.read(path)
        if state_of(path) == state and os.stat(path).st_ctime < time.time() - SETTLED:
            write(note, f"{state}\n{digest}")
        return digest

    @staticmethod
    def noted(note):
        try:
            with open(note, encoding="utf-8") as file:
                return file.read()
        except FileNotFoundError:
            return ""

    @staticmethod
    def read(path):
        with open(path, "rb") as file:
            return hashlib.file_digest(file, "sha256").hexdigest()


def write(path, text):
    """Whole, or not at all: others may read it meanwhile."""
    os.makedirs(os.path.dirname(path), exist_ok=True)
    new = f"{path}.{os.getpid()}"
    with open(new, "w", encoding="utf-8") as file:
        file.write(text)
    os.replace(new, path)


def names_in(folder):
    """What a check would find where it runs; hidden names are others' matter: editors come and go."""
    return sorted(name for name in os.listdir(folder) if not name.startswith("."))


def surroundings():
    return {name: text for name, text in sorted(os.environ.items())
            if SURROUNDINGS.fullmatch(name) and name != "PMX_AGAIN"}


def digest(inputs, command, contents):
    found = hashlib.sha256()
    texts = [sys.version, os.getcwd(), *names_in("."), state_of(INSTALLED), *command,
             *(f"{name}={text}" for name, text in surroundings().items())]
    for path in [*named_by(command), *files_of(inputs)]:
        texts += [path, contents.of(path)]
    for text in texts:
        found.update(f"{len(text)} {text}\0".encode(errors="surrogateescape"))
    return found.hexdigest()


def taken_apart(arguments):
    """The stamp, the inputs and the command."""
    if "--" not in arguments[1:]:
        sys.exit(__doc__)
    split = arguments.index("--")
    return arguments[0], arguments[1:split], arguments[split + 1:]


def passed_before(stamp, now):
    """When the check passed with the same inputs, or nothing."""
    known, _, when = Contents.noted(stamp).strip().partition(" ")
    return when if known == now else ""


def main(arguments):
    stamp, inputs, command = taken_apart(arguments)
    contents = Contents(os.path.join(os.path.dirname(stamp), "contents"))
    if not os.path.exists(INSTALLED):
        return subprocess.run(command, check=False).returncode

    is_noted = os.environ.get("CI") != "true"   # that has a fresh tree each time
    before = digest(inputs, command, contents) if is_noted else ""
    if is_noted and os.environ.get("PMX_AGAIN") != "true":
        when = passed_before(stamp, before)
        if when:
            print(f"unchanged since {when}, when it passed (./dev test --again runs it again)")
            print("<CTestLabel>unchanged</CTestLabel>")   # ctest's summary tells how many there are
            return 0
    if os.path.exists(stamp):
        os.unlink(stamp)
    code = subprocess.run(command, check=False, env=surroundings()).returncode
    # What somebody edits meanwhile is not what was looked at.
    if code == 0 and is_noted and digest(inputs, command, contents) == before:
        write(stamp, f"{before} {time.strftime('%Y-%m-%d %H:%M:%S')}\n")
    return code


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
