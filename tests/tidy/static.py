#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs cppcheck over layer, board, tool, recorder and port, and gcc's analyzer over the C files that the build
compiles: over what differs from the main line, or over everything with --all, and where a header or the rules differ.

usage: static.py [--all] BUILD_DIRECTORY

What is no finding stands with its reason in cppcheck.txt. cppcheck does not know __VA_OPT__, and reads copies that do
without.
"""

import argparse
import os
import pathlib
import re
import shlex
import subprocess
import sys
import tempfile
from concurrent.futures import ThreadPoolExecutor

sys.dont_write_bytecode = True

import lint  # noqa: E402

HERE = pathlib.Path(__file__).resolve().parent
SUPPRESSED = HERE / "cppcheck.txt"
FOLDERS = ("src", "board", "tools", "recorder", "linux", "examples")
INCLUDED = (".", "src/system/inc", "src/driver/inc", "src/driver/private_inc", "linux", "recorder")
# One way through the conditions of each file: the one that is compiled. Without it cppcheck makes up ways that nobody
# compiles, and complains of them.
WAYS = {
    ".cpp": ["--language=c++", "--std=c++20", "-D__cplusplus=202002L", "-D__GNUC__=12", "-D__x86_64__",
             "-D__SIZEOF_POINTER__=8", "-D_Pragma(x)="],
    ".c": ["--language=c", "--std=c11", "-D__KERNEL__", "-D__GNUC__=12", "-D__SIZEOF_POINTER__=4", "-D_Pragma(x)=",
           "-D__has_include(x)=0"],
}
CHECKED = ["--quiet", "--error-exitcode=1", "--enable=warning,performance,portability,information", "--inline-suppr",
           f"--suppressions-list={SUPPRESSED}", "--template={file}:{line}: {severity}: {message} [{id}]"]


def readable(text):
    """Variable arguments as cppcheck knows them; lines stay where they are."""
    return re.sub(r"__VA_OPT__\(, \)", ",", text.replace("__VA_OPT__(, ) __VA_ARGS__", ", ##__VA_ARGS__"))


def files_of(root):
    """Sources and headers, relative to the root."""
    found = [path for folder in FOLDERS for path in sorted((root / folder).rglob("*.[ch]*"))
             if path.suffix in (".h", ".c", ".cpp")]
    return [path.relative_to(root) for path in found]


def chosen(files, root, is_all):
    """The sources to look at, and why just those."""
    sources = [file for file in files if file.suffix != ".h"]
    if is_all:
        return sources, f"all {len(sources)} files"
    try:
        differing, base = lint.changed(root)
    except lint.NothingToCompareWith as error:
        return sources, f"all {len(sources)} files, since {error}"
    rules = {SUPPRESSED, pathlib.Path(__file__).resolve()}
    if differing & rules or any(root / file in differing for file in files if file.suffix == ".h"):
        return sources, f"all {len(sources)} files, since headers or rules differ from {base}"
    found = [file for file in sources if root / file in differing]
    return found, f"{len(found)} of {len(sources)} files, which differ from {base}"


def write_copies(files, root, folder):
    for file in files:
        copy = folder / file
        copy.parent.mkdir(parents=True, exist_ok=True)
        copy.write_text(readable((root / file).read_text(encoding="utf-8")), encoding="utf-8")


def cppcheck(sources, folder, suffix, is_all):
    """What cppcheck finds in those of the sources that are of this language."""
    wanted = [str(file) for file in sources if file.suffix == suffix]
    if not wanted:
        return ""
    includes = [f"-I{include}" for include in INCLUDED]
    includes.append("--suppress=missingInclude")  # of libraries and kernels, which are not read
    # Of a part nobody can say what is not found any more; nor does C have any of it.
    unmatched = [] if is_all and suffix == ".cpp" else ["--suppress=unmatchedSuppression"]
    result = subprocess.run(["cppcheck", *CHECKED, *WAYS[suffix], *unmatched, *includes, *wanted], cwd=folder,
                            capture_output=True, text=True, check=False)
    return told(result)


def told(result):
    """What a program found; that it broke down, where it says nothing else."""
    text = result.stdout + result.stderr
    return text or (f"{result.args[0]} ended with {result.returncode}\n" if result.returncode else "")


def analyzed(command):
    """What gcc's analyzer finds in a file, as the build compiles it, but for sanitizers."""
    words = [word for word in shlex.split(command["command"]) if not word.startswith(("-fsanitize", "-fno-sanitize"))]
    words[words.index("-o") + 1] = os.devnull
    compiler = next(place for place, word in enumerate(words) if re.fullmatch(r"(.*/)?(cc|gcc)(-\d+)?", word))
    result = subprocess.run([*words[compiler:], "-fanalyzer"], cwd=command["directory"], capture_output=True, text=True,
                            check=False)
    return told(result)


def c_commands(commands, sources, root, is_all):
    """How the build compiles each of these C files, and each that it has generated."""
    found = {}
    for command in commands:
        file = pathlib.Path(command["file"])
        of_project = file.is_relative_to(root) and file.relative_to(root) in sources
        if file.suffix == ".c" and (is_all or of_project):
            found[file] = command
    return list(found.values())


def main():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--all", action="store_true", help="every file, whatever has changed")
    parser.add_argument("build", type=lambda text: pathlib.Path(text).resolve(), help="a build directory")
    given = parser.parse_args()
    files = files_of(lint.ROOT)
    sources, why = chosen(files, lint.ROOT, given.all)
    is_all = len(sources) == len([file for file in files if file.suffix != ".h"])
    commands = lint.json.loads((given.build / "compile_commands.json").read_text(encoding="utf-8"))
    to_analyze = c_commands(commands, set(sources), lint.ROOT, is_all)
    with tempfile.TemporaryDirectory() as name, ThreadPoolExecutor(max_workers=os.cpu_count()) as pool:
        write_copies(files, lint.ROOT, pathlib.Path(name))
        found = [pool.submit(cppcheck, sources, name, suffix, is_all) for suffix in WAYS]
        found += [pool.submit(analyzed, command) for command in to_analyze]
        findings = [text for text in (each.result() for each in found) if text]
    print("".join(findings), end="")
    print(f"static: {why}; {len(to_analyze)} analyzed; {'findings' if findings else 'no findings'}")
    return 1 if findings else 0


if __name__ == "__main__":
    try:
        sys.exit(main())
    except KeyboardInterrupt:
        sys.exit(130)
