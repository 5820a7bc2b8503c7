#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Types the sessions that a document shows, and holds what comes against what it shows.

usage: run_sessions.py [--most N] DOCUMENT TOOL

In a ```console block, `$ COMMAND` is typed at the shell and `pmx> COMMAND` at the prompt of the `pmxboard shell` before
it. The lines behind a command are what it shows, all of it; `…` stands for any number of lines. The commands of a block
run in a directory of their own, with an empty build folder and the document's scenarios at hand; build/release/pmxboard
is the given tool there. With --most, no block may hold more
commands.
"""

import argparse
import os
import pathlib
import subprocess
import sys
import tempfile

SHELL, PROMPT, LEFT_OUT = "$ ", "pmx> ", "…"


class Command:
    def __init__(self, number, text):
        self.number, self.text, self.shown = number, text, []

    def is_like(self, lines):
        """Whether lines are what the document shows."""
        # Each part between two gaps is taken at the first place where it fits; the last one has to reach the end.
        parts, at = [[]], 0
        for line in self.shown:
            if line == LEFT_OUT:
                parts.append([])
            else:
                parts[-1].append(line)
        if len(parts) == 1:
            return parts[0] == lines
        first, last = parts[0], parts[-1]
        if lines[:len(first)] != first or len(lines) < len(first) + len(last):
            return False
        at, end = len(first), len(lines) - len(last)
        if lines[end:] != last:
            return False
        for part in parts[1:-1]:
            while lines[at:at + len(part)] != part and at + len(part) <= end:
                at += 1
            if at + len(part) > end:
                return False
            at += len(part)
        return True


def sessions(text):
    """The commands of each block."""
    inside, commands = False, []
    for number, line in enumerate(text.splitlines(), start=1):
        if line.startswith("```"):
            if inside:
                yield commands
            inside, commands = line.strip() == "```console", []
        elif inside and line.startswith((SHELL, PROMPT)):
            commands.append(Command(number, line))
        elif inside and commands:
            commands[-1].shown.append(line)


def typed(command, at_prompt, directory, environment):
    """(output lines, what goes wrong) of a shell command that gets lines typed at its prompt."""
    lines = "".join(prompted.text.removeprefix(PROMPT) + "\n" for prompted in at_prompt)
    script = command.text.removeprefix(SHELL).replace("build/release/pmxboard", "pmxboard")
    result = subprocess.run(["bash", "-c", script], cwd=directory, env=environment,
                            input=lines, capture_output=True, text=True, encoding="utf-8", timeout=60, check=False)
    wrong = "" if result.returncode == 0 and not result.stderr else f"exit code {result.returncode}\n{result.stderr}"
    return result.stdout.splitlines(), wrong


def split_at_echoes(lines, at_prompt):
    """What came before the first echo, and behind each of them."""
    parts, waiting = [[]], [prompted.text.removeprefix(PROMPT) for prompted in at_prompt]
    for line in lines:
        if waiting and line == "> " + waiting[0]:
            waiting.pop(0)
            parts.append([])
        else:
            parts[-1].append(line)
    return parts + [[] for _ in waiting]


def complaints(commands, directory, environment):
    """(line number, what is wrong) of a block."""
    groups = []
    for command in commands:
        if command.text.startswith(SHELL):
            groups.append([command])
        elif groups:
            groups[-1].append(command)
        else:
            yield command.number, "is typed at the prompt of no shell"
    for first, *at_prompt in groups:
        lines, wrong = typed(first, at_prompt, directory, environment)
        if wrong:
            yield first.number, wrong
        for command, part in zip([first, *at_prompt], split_at_echoes(lines, at_prompt)):
            if not command.is_like(part):
                yield command.number, "shows something else:\n" + "\n".join(part)


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("--most", type=int, default=sys.maxsize)
    parser.add_argument("document", type=pathlib.Path)
    parser.add_argument("tool", type=pathlib.Path)
    options = parser.parse_args()
    found = [commands for commands in sessions(options.document.read_text(encoding="utf-8")) if commands]
    failures = 0 if found else 1
    for commands in found:
        with tempfile.TemporaryDirectory() as directory:
            (pathlib.Path(directory) / "bin").mkdir()
            (pathlib.Path(directory) / "bin/pmxboard").symlink_to(options.tool.resolve())
            (pathlib.Path(directory) / "build").mkdir()
            (pathlib.Path(directory) / "scenarios").symlink_to(options.document.resolve().parent / "scenarios")
            environment = {**os.environ, "PATH": f"{directory}/bin:{os.environ['PATH']}", "HOME": directory}
            wrong = list(complaints(commands, directory, environment))
        if len(commands) > options.most:
            wrong.append((commands[0].number, f"{len(commands)} commands; at most {options.most} are wanted"))
        failures += len(wrong)
        for number, message in wrong:
            print(f"{options.document.name}:{number}: {message}")
        print(f"{options.document.name}:{commands[0].number}: {len(commands)} commands, {len(wrong)} failures")
    if not found:
        print(f"{options.document.name}: no sessions found")
    return 1 if failures else 0


if __name__ == "__main__":
    sys.exit(main())
