#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs clang-tidy over the files that differ from the main line, or include what differs, and names what it finds.

With --all, and where there is nothing to compare with, over every file that the build compiles. A file whose text,
headers of the project and rules are as they were when it last passed is not read again.

usage: lint.py [--all] BUILD_DIRECTORY [JOBS]
"""

import argparse
import hashlib
import json
import os
import pathlib
import re
import shlex
import subprocess
import sys
from concurrent.futures import ThreadPoolExecutor

ROOT = pathlib.Path(__file__).resolve().parents[2]
RULES = [ROOT / ".clang-tidy", ROOT / "tests/.clang-tidy", pathlib.Path(__file__).resolve()]
NOT_FOR_ONE_SOURCE = ("-Wno-shadow", "-Wshadow=local", "-Wno-subobject-linkage")
MAIN_LINES = ("refs/remotes/origin/main", "@{upstream}")  # the first that is there


class NothingToCompareWith(Exception):
    """Why nobody can tell what has changed."""


def git(root, *arguments):
    """What git answers about the repository in which the tree lies; a hook that calls may speak of another one."""
    surroundings = {name: value for name, value in os.environ.items() if not name.startswith("GIT_")}
    try:
        return subprocess.run(["git", "-C", root, *arguments], check=True, capture_output=True, encoding="utf-8",
                              errors="surrogateescape", env={**surroundings, "GIT_OPTIONAL_LOCKS": "0"}).stdout
    except FileNotFoundError:
        raise NothingToCompareWith("git is not installed") from None
    except subprocess.CalledProcessError as error:
        reason = (error.stderr.strip().splitlines() or [f"git {arguments[0]} ended with {error.returncode}"])[0]
        raise NothingToCompareWith(reason.removeprefix("fatal: ")) from None


def main_line(root):
    """The name of the main line, and the revision where the work on it began."""
    for name in MAIN_LINES:
        try:
            shown = git(root, "rev-parse", "--abbrev-ref", "--verify", "--quiet", name).strip()
        except NothingToCompareWith:
            continue
        return shown, git(root, "merge-base", "HEAD", name).strip()
    raise NothingToCompareWith("there is no main line to compare with")


def changed(root):
    """The files that differ from the main line, committed or not, and what they were compared with."""
    top = pathlib.Path(git(root, "rev-parse", "--show-toplevel").removesuffix("\n"))
    if not top.samefile(root):
        raise NothingToCompareWith("the tree is no repository")  # but lies in somebody's
    name, base = main_line(root)
    listed = git(root, "diff", "--name-only", "--no-renames", "--no-ext-diff", "-z", base, "--")
    listed += git(root, "ls-files", "--others", "--exclude-standard", "-z")
    return {root / file for file in listed.split("\0") if file}, f"{name} ({base[:9]})"


def to_look_at(sources, root):
    """Those of the sources that a change concerns, and why just those."""
    try:
        files, base = changed(root)
    except NothingToCompareWith as error:
        return set(sources), f"all {len(sources)} files, since {error}"
    if files & set(RULES):
        return set(sources), f"all {len(sources)} files, since the rules differ from {base}"
    # What the build has noted nothing about may include anything.
    found = {source for source, read in sources.items() if source in files or not read or read & files}
    return found, f"{len(found)} of {len(sources)} files, which differ from {base} or include what does"


def commands_of(build):
    """How the build compiles every file of the project; a generated file is nobody's to clean up."""
    commands = json.loads((build / "compile_commands.json").read_text(encoding="utf-8"))
    return [{**command, "file": file, "given": command["file"]}
            for command in commands for file in compiled_with(command) if not pathlib.Path(file).is_relative_to(build)]


def compiled_with(command):
    """The sources that a command compiles: one, or those of the batch that the build has put together."""
    file = pathlib.Path(command["file"])
    if not file.name.startswith("unity_"):
        return [command["file"]]
    return re.findall(r'^#include "(.*)"$', file.read_text(encoding="utf-8"), re.M)


def arguments_of(command):
    """How a source is compiled, where it is one of a batch as well."""
    words = [word for word in shlex.split(command["command"]) if word not in NOT_FOR_ONE_SOURCE]
    return [command["file"] if word == command.get("given") else word for word in words]


def sources_of(commands, build):
    """{source: the project's files that it was last made from}."""
    made_from, sources = dependencies(build), {}
    every_source = {pathlib.Path(command["file"]) for command in commands}
    for command in commands:
        words = arguments_of(command)
        read = made_from.get(words[words.index("-o") + 1], set())
        source = pathlib.Path(command["file"])
        sources[source] = read and (read - every_source) | {source}   # a batch has read the others of it, too
    return sources


def write_commands(commands, directory):
    directory.mkdir(exist_ok=True)
    written = [{"directory": command["directory"], "file": command["file"], "arguments": arguments_of(command)}
               for command in commands]
    (directory / "compile_commands.json").write_text(json.dumps(written, indent=1), encoding="utf-8")


def dependencies(build):
    """{object: the project's files that it was last made from}, as the build noted them."""
    text = subprocess.run(["ninja", "-C", build, "-t", "deps"], check=True, capture_output=True, text=True).stdout
    found, current = {}, None
    for line in text.splitlines():
        if not line.startswith(" "):
            current = found.setdefault(line.partition(":")[0], set())
        elif (build / line.strip()).resolve().is_relative_to(ROOT):
            current.add((build / line.strip()).resolve())
    return found


def fingerprint(files):
    digest = hashlib.sha256()
    for file in sorted(files):
        digest.update(f"{file}\n".encode())
        digest.update(file.read_bytes() if file.exists() else b"absent")
    return digest.hexdigest()


def lint(build, source):
    result = subprocess.run(["clang-tidy", "--quiet", "-p", build / "lint", source], capture_output=True, text=True,
                            check=False)
    noise = re.compile(r"^\d+ warnings? (generated|treated).*\n", re.M)
    return result.returncode == 0, result.stdout + noise.sub("", result.stderr)


def passed_before(file):
    """{source: its fingerprint when it last passed}; a note that cannot be read says nothing."""
    try:
        return json.loads(file.read_text(encoding="utf-8"))
    except (FileNotFoundError, ValueError):
        return {}


def write_whole(file, text):
    """Interrupted, it leaves the file as it was."""
    beside = file.with_suffix(".new")
    beside.write_text(text, encoding="utf-8")
    beside.replace(file)


def arguments():
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--all", action="store_true", help="every file, whatever has changed")
    parser.add_argument("build", type=lambda text: pathlib.Path(text).resolve(), help="a build directory")
    parser.add_argument("jobs", type=int, nargs="?", default=os.cpu_count(), help="how many at once")
    return parser.parse_args()


def main():
    given = arguments()
    build = given.build
    commands = commands_of(build)
    if not commands:
        sys.exit(f"{build}: compiles no files of the project")
    sources = sources_of(commands, build)
    write_commands(commands, build / "lint")
    wanted, why = (set(sources), f"all {len(sources)} files") if given.all else to_look_at(sources, ROOT)
    passed_file = build / "lint-passed.json"
    passed = passed_before(passed_file)
    marks = {str(source): fingerprint({source, *read, *RULES}) for source, read in sources.items()}
    to_do = [source for source in sources if source in wanted and passed.get(str(source)) != marks[str(source)]]

    failures = 0
    passed = {source: mark for source, mark in marks.items() if passed.get(source) == mark}
    with ThreadPoolExecutor(max_workers=given.jobs) as pool:
        for source, (is_clean, text) in zip(to_do, pool.map(lambda source: lint(build, source), to_do)):
            if is_clean:
                passed[str(source)] = marks[str(source)]
            else:
                failures += 1
                print(f"{source.relative_to(ROOT)}:\n{text}")
            write_whole(passed_file, json.dumps(passed, indent=1))
    print(f"lint: {why}; {len(to_do)} read, {failures} with findings")
    return 1 if failures else 0


if __name__ == "__main__":
    try:
        sys.exit(main())
    except KeyboardInterrupt:
        sys.exit(130)
