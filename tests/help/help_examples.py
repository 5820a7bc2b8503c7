#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs every example that the --help of the tool and of its sub-commands ends with.

usage: help_examples.py TOOL ROOT

Behind the line "Examples:" stand commands, two columns in, each explained six columns in. They run one after the other
in a directory of their own that has the scenarios and boards at hand, with the tool found by its name. Each ends with
0, or with what its explanation says: "(exit code 1)". What it asks of a terminal it does not get.
"""

import os
import pathlib
import re
import subprocess
import sys
import tempfile

AT_HAND = ("scenarios", "boards", "examples", "docs", "tests")
EXPLAINED_CODE = re.compile(r"\(exit code (\d+)\)")


def run(tool, *arguments):
    return subprocess.run([tool, *arguments], capture_output=True, text=True, check=False, stdin=subprocess.DEVNULL)


def subcommands(tool):
    """The names that the tool's own help lists."""
    listed = run(tool, "--help").stdout.partition("Subcommands:")[2]
    return re.findall(r"^  ([a-z][\w-]*)", listed.partition("\n\n")[0], re.M)


def examples(help_text):
    """(command, explanation) of every example."""
    found = []
    for line in help_text.partition("Examples:\n")[2].splitlines():
        if re.match(r"  \S", line):
            found.append((line.strip(), ""))
        elif line.startswith("      ") and found:
            command, explanation = found[-1]
            found[-1] = (command, (explanation + " " + line.strip()).strip())
        elif line.strip():
            break
    return found


def complaint(command, explanation, directory, environment):
    """What is wrong with an example, or nothing."""
    code = EXPLAINED_CODE.search(explanation)
    expected = int(code.group(1)) if code else 0
    result = subprocess.run(["bash", "-c", command], cwd=directory, env=environment, capture_output=True, text=True,
                            stdin=subprocess.DEVNULL, timeout=60, check=False)
    if not explanation:
        return "is not explained"
    if result.returncode != expected:
        return f"exit code {result.returncode}, expected {expected}\n{result.stdout[-2000:]}{result.stderr}"
    return ""


def check(tool, root):
    """(number of examples, failures)"""
    count, failures = 0, 0
    named = subcommands(tool)
    if not named:
        print("the tool lists no sub-commands")
        failures += 1
    for name in ["", *named]:
        help_text = run(tool, *filter(None, [name, "--help"])).stdout
        found = examples(help_text)
        if not found:
            print(f"{name or 'pmxboard'} --help: no examples")
            failures += 1
        with tempfile.TemporaryDirectory() as directory:
            home = pathlib.Path(directory)
            (home / "bin").mkdir()
            (home / "bin/pmxboard").symlink_to(tool)
            for part in AT_HAND:
                if (root / part).exists():
                    (home / part).symlink_to(root / part)
            environment = {**os.environ, "PATH": f"{home / 'bin'}:{os.environ['PATH']}", "HOME": directory}
            for command, explanation in found:
                count += 1
                wrong = complaint(command, explanation, home, environment)
                failures += bool(wrong)
                print(f"{name or 'pmxboard'}: {command}" + (f"\n    FAILED: {wrong}" if wrong else ""))
    return count, failures


def main():
    tool, root = (pathlib.Path(argument).resolve() for argument in sys.argv[1:3])
    count, failures = check(tool, root)
    print(f"{count} examples, {failures} failures")
    return 1 if failures or count == 0 else 0


if __name__ == "__main__":
    sys.exit(main())
