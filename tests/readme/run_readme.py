#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the commands of a document, so that what it tells the reader to type works.

usage: run_readme.py DOCUMENT TOOL

Every line of a fenced ```sh block is a command. Verbs of ./dev are only checked to be its verbs, since the tests run
under one of them. A call of the tool runs the given one. Any other command runs as it stands, in the document's
directory.
"""

import pathlib
import re
import subprocess
import sys


def commands(text):
    """(line number, command) of every command in a block of shell commands; a trailing backslash joins lines."""
    inside = False
    command, first = "", 0
    for number, line in enumerate(text.splitlines(), start=1):
        if line.startswith("```"):
            inside = not inside and line.strip() == "```sh"
            continue
        if not inside or not line.strip() or line.lstrip().startswith("#"):
            continue
        first = first if command else number
        command += line.rstrip()
        if command.endswith("\\"):
            command = command[:-1] + " "
            continue
        yield first, command.strip()
        command = ""


def verbs(root):
    """The verbs that ./dev names in its help."""
    text = subprocess.run([root / "dev", "help"], check=True, capture_output=True, text=True).stdout
    return set(re.findall(r"^  (\w+)", text, re.M))


def check(command, root, tool):
    """What is wrong with a command, or nothing."""
    dev = re.fullmatch(r"\./dev(?:\s+([\w-]+))?(\s.*)?", command.partition("#")[0].strip())
    if dev:
        return "" if dev.group(1) in verbs(root) else f"{dev.group(1)} is no verb of ./dev"
    script = re.sub(r"(?<![\w/.-])(?:(?:\./)?build/release/)?pmxboard(?![\w/.-])", lambda _: f"'{tool}'", command)
    result = subprocess.run(["bash", "-euo", "pipefail", "-c", script], cwd=root, capture_output=True, text=True,
                            stdin=subprocess.DEVNULL, timeout=60, check=False)
    return "" if result.returncode == 0 else f"exit code {result.returncode}\n{result.stdout}{result.stderr}"


def main():
    document, tool = map(pathlib.Path, sys.argv[1:])
    found = list(commands(document.read_text(encoding="utf-8")))
    failures = 0
    for number, command in found:
        message = check(command, document.resolve().parent, tool.resolve())
        failures += bool(message)
        print(f"{document.name}:{number}: {command}" + (f"\n    FAILED: {message}" if message else ""))
    if not found:
        print(f"{document.name}: no commands found")
    return 1 if failures or not found else 0


if __name__ == "__main__":
    sys.exit(main())
