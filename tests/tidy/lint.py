#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs clang-tidy over every file that the build compiles, and names what it finds.

A file whose text, headers of the project and rules are as they were when it last passed is not read again.

usage: lint.py BUILD_DIRECTORY [JOBS]
"""

import hashlib
import json
import os
import pathlib
import re
import subprocess
import sys
from concurrent.futures import ThreadPoolExecutor

ROOT = pathlib.Path(__file__).resolve().parents[2]
RULES = [ROOT / ".clang-tidy", ROOT / "tests/.clang-tidy", pathlib.Path(__file__)]


# How the build has a source include what it precompiled; clang-tidy reads the header itself.
PRECOMPILED = re.compile(r" -Winvalid-pch| -fpch-preprocess| -include (\S+/cmake_pch\.hxx)\b")


def commands_of(build):
    """How the build compiles every file of the project; a generated file is nobody's to clean up."""
    commands = json.loads((build / "compile_commands.json").read_text(encoding="utf-8"))
    return [command for command in commands if not pathlib.Path(command["file"]).is_relative_to(build)]


def sources_of(commands, build):
    """{source: the project's files that it was last made from, itself not among them}."""
    made_from, sources = dependencies(build), {}
    for command in commands:
        read = set(made_from.get(re.search(r" -o (\S+)", command["command"])[1], ()))
        for match in PRECOMPILED.finditer(command["command"]):
            if match[1]:
                read |= made_from.get(f"{pathlib.Path(match[1]).relative_to(build)}.gch", set())
        sources[pathlib.Path(command["file"])] = read
    return sources


def write_commands(commands, directory):
    directory.mkdir(exist_ok=True)
    written = [{**command, "command": PRECOMPILED.sub("", command["command"])} for command in commands]
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


def main():
    build = pathlib.Path(sys.argv[1]).resolve()
    jobs = int(sys.argv[2]) if len(sys.argv) > 2 else os.cpu_count()

    commands = commands_of(build)
    if not commands:
        sys.exit(f"{build}: compiles no files of the project")
    sources = sources_of(commands, build)
    write_commands(commands, build / "lint")
    passed_file = build / "lint-passed.json"
    passed = json.loads(passed_file.read_text(encoding="utf-8")) if passed_file.exists() else {}
    marks = {str(source): fingerprint({source, *read, *RULES}) for source, read in sources.items()}
    to_do = [source for source in sources if passed.get(str(source)) != marks[str(source)]]

    failures = 0
    passed = {source: mark for source, mark in marks.items() if passed.get(source) == mark}
    with ThreadPoolExecutor(max_workers=jobs) as pool:
        for source, (is_clean, text) in zip(to_do, pool.map(lambda source: lint(build, source), to_do)):
            if is_clean:
                passed[str(source)] = marks[str(source)]
            else:
                failures += 1
                print(f"{source.relative_to(ROOT)}:\n{text}")
            passed_file.write_text(json.dumps(passed, indent=1), encoding="utf-8")
    print(f"lint: {len(sources)} files, {len(to_do)} read, {failures} with findings")
    return 1 if failures else 0


if __name__ == "__main__":
    sys.exit(main())
