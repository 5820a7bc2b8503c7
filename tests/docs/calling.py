#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the examples of a document on the virtual board and holds what stands there against what it shows.

usage: calling.py [--fix] [--header HEADER] DOCUMENT TOOL

An example is a fenced ```pmx block. Its lines that begin with "> " are commands of a scenario, everything below a
command is what the tool shows: platform calls without their times, console lines behind "|", results behind "=",
outputs behind "*". A line "  ..." stands for any lines. The block ```pmx prologue holds the commands that run before
every example that does not power the board on by itself.

In a platform call a record that has the content of the one shown before it in the same example is {as before}.

--fix     rewrites the blocks that differ, all lines in full, and adds the tool's example of what no block calls
--header  every function that this header offers must be called in some example
"""

import argparse
import difflib
import json
import pathlib
import re
import subprocess
import sys

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

import whole_file  # noqa: E402

WIDTH = 110
ANY_LINES = "  ..."
MARK = "-- example --"
ENTRY = re.compile(r" *\d+\.\d{3}  (?P<depth> *)(?P<text>\S.*)")
RECORD = re.compile(r"\{[^\"]*\}")
BLOCK = re.compile(r"^```pmx(?P<prologue> prologue)?\n(?P<body>.*?)^```$", re.M | re.S)
OFFERED = re.compile(r"^PMX_API\s[\w\s*]*?\b(\w+)\(", re.M)


class Failure(Exception):
    pass


def commands(body):
    return [line.removeprefix("> ") for line in body.splitlines() if line.startswith("> ")]


def folded(line, indent):
    """A call broken behind commas where it is too long; texts stay whole."""
    lines, quoted, begin, comma = [], False, 0, 0
    for position, character in enumerate(line):
        if character == '"' and line[position - 1:position] != "\\":
            quoted = not quoted
        if position - begin + (len(indent) + 4 if begin else 0) >= WIDTH and comma > begin:
            lines.append(line[begin:comma])
            begin = comma + 1
        if character == "," and not quoted:
            comma = position + 1
    lines.append(line[begin:])
    return f"\n{indent}    ".join(lines)


def shown(output):
    """What the tool printed, as the document shows it."""
    joined = []
    for line in output.splitlines():
        continued = line.startswith(" " * 15) and not ENTRY.match(line) and joined
        if continued:
            joined[-1] += " " + line.strip()
        else:
            joined.append(line)
    lines, last_record = [], None
    for line in joined:
        entry = ENTRY.match(line)
        if entry is None:
            lines.append(line.rstrip())
            continue
        text, record = entry["text"], RECORD.search(entry["text"])
        if record:
            if record.group() == last_record:
                text = text.replace(last_record, "{as before}")
            last_record = record.group()
        indent = "  " + entry["depth"]
        lines.extend(folded(indent + text, indent).splitlines())
    return lines


class Example:
    def __init__(self, document, text, block):
        self.place = f"{document.name}:{text.count(chr(10), 0, block.start()) + 1}"
        self.body = block["body"]
        self.commands = commands(self.body)
        self.starts_itself = bool(self.commands) and self.commands[0].startswith("power-on")


def run(prologue, examples, tool):
    """The lines that each example shows. All of them run in one process, each on a board of its own."""
    script, first_lines = [], []
    for example in examples:
        first_lines.append(len(script) + 1)
        script += ["power-on"] + ([] if example.starts_itself else prologue)
        script += [f'print "{MARK}\\n"'] + example.commands + [f'print "{MARK}\\n"']
    result = subprocess.run([tool, "run", "-"], input="\n".join(script) + "\n", capture_output=True, text=True,
                            timeout=60, check=False)
    if result.returncode != 0:
        line = int((re.search(r"^\S*?:(\d+): ", result.stderr, re.M) or [0, 1])[1])
        place = [example.place for example, first in zip(examples, first_lines) if first <= line][-1]
        raise Failure(f"{place}: {result.stderr.strip() or f'exit code {result.returncode}'}")
    between = result.stdout.split(f'> print "{MARK}\\n"\n{MARK}\n')
    return [shown(output) for output in between[1::2]]


def same(expected, found):
    """Whether lines are what is expected of them, "..." standing for any."""
    if not expected:
        return not found
    if expected[0] == ANY_LINES:
        return any(same(expected[1:], found[skipped:]) for skipped in range(len(found) + 1))
    return bool(found) and expected[0] == found[0] and same(expected[1:], found[1:])


def checked(document, tool):
    """(what is wrong, the document as it should be)."""
    text = document.read_text(encoding="utf-8")
    blocks = list(BLOCK.finditer(text))
    prologue = [line for block in blocks if block["prologue"] for line in commands(block["body"])]
    examples = [Example(document, text, block) for block in blocks if not block["prologue"]]
    wrong = [f"{example.place}: no command in this example" for example in examples if not example.commands]
    if not examples:
        wrong.append(f"{document.name}: no examples found")
    if wrong:
        return wrong, text

    bodies = []
    for example, found in zip(examples, run(prologue, examples, tool)):
        expected = example.body.splitlines()
        bodies.append(example.body)
        if not same(expected, found):
            difference = difflib.unified_diff(expected, found, "document", "run", lineterm="", n=1)
            wrong.append("\n".join([f"{example.place}: the run shows something else"] + list(difference)))
            bodies[-1] = "".join(line + "\n" for line in found)
    renewed = iter(bodies)
    return wrong, BLOCK.sub(lambda block: block.group() if block["prologue"] else f"```pmx\n{next(renewed)}```", text)


def uncalled(text, header):
    """The functions of a header that no example calls."""
    called = {command.split()[0] for block in BLOCK.finditer(text) if not block["prologue"]
              for command in commands(block["body"]) if command.strip()}
    offered = OFFERED.findall(header.read_text(encoding="utf-8"))
    if not offered:
        raise Failure(f"{header.name}: offers no function")
    return [name for name in offered if name not in called]


def added(text, names, tool):
    """The document with an example, whose run is still to be shown, of each of these functions at its end."""
    told = subprocess.run([tool, "ops", "--json", *names], capture_output=True, text=True, timeout=60, check=True)
    for each in json.loads(told.stdout):
        lines = ["power-on", *each["example_needs"], each["example"]]
        text += f"\n`{each['name']}`: {each['brief']}\n\n```pmx\n" + "".join(f"> {line}\n" for line in lines) + "```\n"
    return text


def main():
    parser = argparse.ArgumentParser(usage=__doc__.split("\n\n")[1].removeprefix("usage: "))
    parser.add_argument("document", type=pathlib.Path)
    parser.add_argument("tool", type=pathlib.Path)
    parser.add_argument("--fix", action="store_true")
    parser.add_argument("--header", type=pathlib.Path)
    arguments = parser.parse_args()

    tool = arguments.tool.resolve()
    try:
        text = arguments.document.read_text(encoding="utf-8")
        lacking = uncalled(text, arguments.header) if arguments.header else []
        if arguments.fix and lacking:
            whole_file.write(arguments.document, added(text, lacking, tool))
            lacking = []
        wrong, text = checked(arguments.document, tool)
        if arguments.fix and wrong:
            whole_file.write(arguments.document, text)
            wrong, _ = checked(arguments.document, tool)
        wrong += [f"{arguments.document.name}:{text.count(chr(10))}: no example calls {name}" for name in lacking]
        if wrong:
            wrong.append("to renew the examples: cmake --build --preset debug --target renew_calling")
    except Failure as failure:
        wrong = [str(failure)]
    print("\n".join(wrong) if wrong else f"{arguments.document.name}: every example shows what a run shows")
    return 1 if wrong else 0


if __name__ == "__main__":
    sys.exit(main())
