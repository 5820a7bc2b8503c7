#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Whether checks that are not run again while their inputs stay the same name all of these: each is run under strace,
and whatever it opens to read, looks up or lists in the tree and its build folders, and has not made itself, has to be
named.

usage: inputs.py [--tests PATTERN] [--jobs NUMBER] BUILD

See unchanged.py: which names there are in the folder where a check runs is known of every check.
"""

import argparse
import concurrent.futures
import json
import os
import pathlib
import re
import subprocess
import sys
import tempfile
import threading

import unchanged

ROOT = str(pathlib.Path(__file__).resolve().parents[2])
CALLS = "trace=%file,getdents64,fchdir,clone,clone3,fork,vfork"
TRACE = ("strace", "-f", "--seccomp-bpf", "-y", "-qq", "-s", "4096", "-e", CALLS, "-e", "signal=none", "-o")
WATCHED = [ROOT]
# What programs that count leave: removed before they are run.
OWN = (".gcda",)

LINE = re.compile(r"(\d+) +(?:<\.\.\. (\w+) resumed>)?(.*)")
CALL = re.compile(r"(\w+)\((.*)\) += (-?\d+|\?)(?:<(.*?)>)?(?: .*)?")
TEXT = r'"((?:[^"\\]|\\.)*)"'
# A path, and the folder that it begins in where that is told.
PATH = re.compile(rf"(?:(?:AT_FDCWD|\d+)<(?P<folder>[^>]*)>, )?{TEXT}")
PATH_OF_FILE = re.compile(r"\d+<([^>]*)>")
CHILDREN = ("clone", "clone3", "fork", "vfork")
OPENED = ("open", "openat", "creat")
# What makes a file, by the last path that it names.
MAKING = ("link", "linkat", "mkdir", "mkdirat", "mknod", "mknodat", "rename", "renameat", "renameat2", "symlink",
          "symlinkat")
# What had to be found to be removed says nothing.
REMOVING = ("rmdir", "unlink", "unlinkat")
# What changes a file, and reads nothing.
CHANGING = ("chmod", "chown", "fchmodat", "fchownat", "lchown", "truncate", "utime", "utimensat", "utimes")


def plain(text):
    """A text as strace writes it."""
    return text.encode("latin-1").decode("unicode_escape").encode("latin-1").decode("utf-8", "surrogateescape")


def calls_of(lines):
    """(process, call, arguments, result, path that the result is of) in the order of their ends; a call that another
    process interrupts is one. One that makes a child may end behind the child's first: that it begins is told, too."""
    begun = {}
    for line in lines:
        process, resumed, rest = LINE.fullmatch(line.rstrip("\n")).groups()
        if resumed:
            rest = begun.pop(process, "") + rest
        elif rest.endswith("<unfinished ...>"):
            rest = rest.removesuffix("<unfinished ...>")
            begun[process] = rest
            if rest.startswith(CHILDREN):
                yield process, "begins", "", "", None
            continue
        if found := CALL.fullmatch(rest):
            yield process, *found.groups()


class Looked:
    """What was looked at and had not been made before, with how: "read", "looked up" or "listed"."""

    def __init__(self, folder):
        self.folder = folder
        self.folders = {}
        self.parent = ""    # of whom appears next
        self.made = set()
        self.found = {}

    def take(self, process, name, arguments, result, of_result):
        if process not in self.folders:
            self.folders[process] = self.folders.get(self.parent, self.folder)
        if name == "begins":
            self.parent = process
        elif name in CHILDREN:
            self.folders.setdefault(result, self.folders[process])
        elif name == "getdents64":
            self.note(PATH_OF_FILE.match(arguments)[1], "listed")
        elif name == "fchdir" and result == "0":
            self.folders[process] = PATH_OF_FILE.match(arguments)[1]
        else:
            self.take_paths(process, name, arguments, result, of_result)

    def take_paths(self, process, name, arguments, result, of_result):
        if "AT_EMPTY_PATH" in arguments:
            return    # of what is open already
        paths = [os.path.normpath(os.path.join(found["folder"] or self.folders[process], plain(found[2])))
                 for found in PATH.finditer(arguments)]
        if not paths:
            return
        if name in ("symlink", "symlinkat"):
            del paths[:-1]
        failed = result.startswith("-") or result == "?"
        if name == "chdir" and not failed:
            self.folders[process] = paths[0]
        elif name in OPENED:
            self.take_opened(of_result or paths[0], arguments if name != "creat" else "O_WRONLY|O_TRUNC", failed)
        elif name in MAKING:
            for path in paths[:-1]:
                self.note(path, "looked up")
            if not failed:
                self.made.add(paths[-1])
        elif name in REMOVING:
            if not failed and self.found.get(paths[-1]) != "read":
                self.found.pop(paths[-1], None)
                self.made.add(paths[-1])    # whatever is there next
        elif name not in CHANGING:
            self.note(paths[0], "read" if name.startswith("execve") else "looked up")

    def take_opened(self, path, how, failed):
        afresh = "O_TRUNC" in how or "O_EXCL" in how
        if "O_WRONLY" not in how and not afresh:
            self.note(path, "looked up" if failed or "O_PATH" in how or "O_DIRECTORY" in how else "read")
        elif afresh and not failed:
            self.made.add(path)

    def is_made(self, path):
        while path not in ("/", ""):
            if path in self.made:
                return True
            path = os.path.dirname(path)
        return False

    def note(self, path, how):
        if not self.is_made(path) and self.found.get(path) != "read":
            self.found[path] = how


def looked_at(trace, folder):
    looked = Looked(folder)
    with open(trace, encoding="latin-1") as lines:
        for call in calls_of(lines):
            looked.take(*call)
    return looked.found


def is_below(path, folder):
    return path == folder or path.startswith(folder.rstrip("/") + "/")


def not_named(found, named, place):
    """(path, how) of what does not stand among the files and folders that are named. Folders may be looked up, and so
    may what would lie in the place where the check runs, whose names it may list."""
    named = {os.path.realpath(path) for path in named}
    for path, how in sorted(found.items()):
        path = os.path.realpath(path)
        if how == "read" and os.path.isdir(path):
            how = "looked up"
        if path.endswith(OWN) or "__pycache__" in path or not any(is_below(path, one) for one in WATCHED):
            continue
        if any(is_below(path, one) for one in named):
            continue
        if how == "looked up" and (os.path.isdir(path) or is_told_by(path, place)) or path == place:
            continue
        yield path, how


def is_told_by(path, place):
    """Whether the names in a place tell that there is such a path, or none."""
    first, _, more = os.path.relpath(path, place).partition("/")
    return not first.startswith(".") and (not more or not os.path.lexists(os.path.join(place, first)))


class Check:
    """A test of ctest that is run by unchanged.py."""

    def __init__(self, test):
        words = test["command"]
        begin = next(number for number, word in enumerate(words) if word.endswith("/unchanged.py")) + 1
        properties = {one["name"]: one["value"] for one in test["properties"]}
        self.name = test["name"]
        _, self.inputs, self.command = unchanged.taken_apart(words[begin:])
        self.folder = properties.get("WORKING_DIRECTORY", ROOT)
        self.alone = properties.get("RESOURCE_LOCK", [])
        self.environment = dict(entry.split("=", 1) for entry in properties.get("ENVIRONMENT", []))

    def surroundings(self):
        """As the check has them; leaks are looked for by a tracer of their own, which cannot be a second one."""
        found = {**unchanged.surroundings(), **self.environment}
        found["ASAN_OPTIONS"] = found.get("ASAN_OPTIONS", "") + ":detect_leaks=0"
        return found

    def complaints(self, trace):
        surroundings = self.surroundings()
        ended = subprocess.run([*TRACE, trace, *self.command], cwd=self.folder, env=surroundings, text=True,
                               stdin=subprocess.DEVNULL, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                               errors="replace", check=False)
        if ended.returncode not in (0, 77):
            yield f"ended with {ended.returncode}:\n{ended.stdout[-2000:]}"
        named = [*(path.removeprefix("?") for path in self.inputs), *unchanged.named_by(self.command)]
        for path, how in not_named(looked_at(trace, self.folder), named, self.folder):
            yield f"{path} was {how}, and is not named"


def checks_of(build, pattern):
    listed = subprocess.run(["ctest", "--test-dir", build, "--show-only=json-v1"], check=True, capture_output=True)
    for test in json.loads(listed.stdout)["tests"]:
        if any(word.endswith("/unchanged.py") for word in test.get("command", [])) and re.search(pattern, test["name"]):
            yield Check(test)


def looked_over(check, alone):
    with tempfile.TemporaryDirectory() as folder, alone if check.alone else threading.Lock():
        return [f"{check.name}: {complaint}" for complaint in check.complaints(os.path.join(folder, "trace"))]


def main():
    parser = argparse.ArgumentParser(usage=__doc__.split("usage: ")[1].split("\n")[0])
    parser.add_argument("--tests", default="")
    parser.add_argument("--jobs", type=int, default=2)
    parser.add_argument("build")
    arguments = parser.parse_args()
    os.chdir(ROOT)
    WATCHED.append(os.path.realpath(arguments.build))
    checks = list(checks_of(arguments.build, arguments.tests))
    if not checks:
        sys.exit(f"no checks: {arguments.tests}")
    wrong, alone = 0, threading.Lock()
    with concurrent.futures.ThreadPoolExecutor(arguments.jobs) as pool:
        for complaints in pool.map(lambda check: looked_over(check, alone), checks):
            wrong += bool(complaints)
            for complaint in complaints:
                print(complaint, flush=True)
    print(f"{len(checks)} checks, {wrong} of them read what they do not name")
    return 1 if wrong else 0


if __name__ == "__main__":
    sys.exit(main())
