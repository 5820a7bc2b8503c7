#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes what fuzzers begin with: a directory of seeds for each target, and its dictionary beside it.

usage: seeds.py TOOL DIRECTORY    in the project's root; TOOL is a pmxboard

All of it comes of the project's scenarios, boards and logs, and of what the tool tells of itself, so that a new verb,
operation, enumerator or text is in it without a further line here.
"""

import functools
import hashlib
import json
import pathlib
import re
import shutil
import subprocess
import sys
import tempfile

SCENARIOS = sorted(pathlib.Path("scenarios").glob("*.pmx"))
BOARDS = sorted([*pathlib.Path("boards").glob("*/board.toml"), *pathlib.Path("scenarios/boards").glob("*.toml")])
IMAGE = pathlib.Path("boards/default/fast_init_param.bin")
LOGS = sorted(pathlib.Path("tests/decode").glob("*.log"))
# A state is large: a few tell all that there is in one.
STATES = 4
LONGEST_ENTRY = 60
LIFE = 128  # bytes
# Of a scenario that is not met: a test of its own tells that, and what it has shown is a seed all the same.
FAILED_STEP = 1


class Tool:
    def __init__(self, program):
        self.program = str(pathlib.Path(program).resolve())

    def output(self, *arguments, may_fail=False, **options):
        run = subprocess.run([self.program, *arguments], capture_output=True, check=False, **options)
        if run.returncode != 0 and not (may_fail and run.returncode == FAILED_STEP):
            sys.exit(f"pmxboard {' '.join(map(str, arguments))}: {run.stderr.decode(errors='replace')}")
        return run.stdout

    def lines(self, *arguments):
        return self.output(*arguments).decode().splitlines()

    def json(self, *arguments):
        return json.loads(self.output(*arguments))


def examples(tool):
    """Of each operation: the lines that it needs, and its call."""
    for operation in tool.json("ops", "--json"):
        if operation.get("example"):
            yield operation["name"], "\n".join([*operation["example_needs"], operation["example"], ""])


def lives(tool):
    """Any bytes are one: as many as there are operations, that have little in common."""
    for operation in tool.json("ops", "--json"):
        yield operation["name"], hashlib.shake_128(operation["name"].encode()).digest(LIFE)


def words_of_lives(tool):
    return [bytes([mode["number"]]) for mode in tool.json("modes", "--json")]


def scenarios(tool):
    for path in SCENARIOS:
        yield path.stem, path.read_bytes()
    for name, lines in examples(tool):
        yield name, lines.encode()


def states(tool):
    with tempfile.TemporaryDirectory() as directory:
        saved = []
        for path in SCENARIOS[:STATES]:
            into = pathlib.Path(directory, path.stem + ".json")
            tool.output("run", "--quiet", "-", input=path.read_bytes() + f'\nsave "{into}"\n'.encode(),
                        cwd=path.parent, may_fail=True)
            if into.exists():
                saved.append((path.stem, into.read_bytes()))
    yield from saved
    for (one, older), (other, newer) in zip(saved, saved[1:]):
        yield f"{one}-{other}", older + b"\0" + newer


def boards(_):
    for path in BOARDS:
        name = path.parent.name + "-" + path.stem
        content = path.read_bytes()
        yield name, content
        # What stands there for whoever copies it is a board, too.
        yield name + "-all", re.sub(rb"^# (?=[\w\[]+ ?=|\[\[)", b"", content, flags=re.M)


def images(tool):
    whole = IMAGE.read_bytes()
    yield "image", whole
    yield "empty", b""
    yield "short", whole[:3]
    for mode in tool.json("modes", "--json"):
        yield mode["name"], mode["number"].to_bytes(4, "little")


def console_of(tool, path):
    """A trace has all that the layer prints, whatever the console's level is."""
    return tool.output("run", path, may_fail=True)


def damaged(tool):
    """What serial consoles and those who capture them make of a log, and what somebody takes for one."""
    path = SCENARIOS[0].with_name("display-part-never-answers.pmx")
    lines = console_of(tool, path).splitlines(keepends=True)
    yield "reboot", b"".join([*lines[:-9], b"U-Boot 2011.03 (Mar 01 2011)\n", *lines])
    yield "twice", b"".join(line + line for line in lines)
    yield "displaced", b"".join(second + first for first, second in zip(lines[::2], lines[1::2]))
    yield "stamped", b"".join(b"Nov 22 12:34:56 player kernel: [%12.6f] " % (1 + place / 1000) + line
                              for place, line in enumerate(reversed(lines)))
    yield "jsonl", tool.output("run", "--trace-format", "jsonl", path)


def logs(tool):
    yield from damaged(tool)
    for path in LOGS:
        yield path.stem, path.read_bytes()
    for path in SCENARIOS[::4]:
        yield path.stem, console_of(tool, path)
    yield "texts", "".join(row["format"] for row in tool.json("decode", "--texts", "--json")).encode()


def compared(tool):
    for path in LOGS:
        yield path.stem, b"first-mode-after-boot 9\n" + path.read_bytes()
    for one, other in zip(SCENARIOS[::5], SCENARIOS[1::5]):
        lines = console_of(tool, one).splitlines(keepends=True)
        with_gap = lines[:len(lines) // 3] + lines[len(lines) // 2:]
        yield one.stem, f"{one.stem} 9\n".encode() + b"".join(lines)
        yield f"{one.stem}-gap", f"{one.stem} 9\n".encode() + b"".join(with_gap)
        yield f"{one.stem}-{other.stem}", f"{other.stem} 1\n".encode() + b"".join(lines)


def shell_lines(tool):
    typed = dict.fromkeys(line for path in SCENARIOS[::4] for line in path.read_bytes().splitlines()
                          if line and not line.startswith(b"#"))
    for number, line in enumerate(typed):
        yield f"line-{number}", line
    for number, word in enumerate(tool.lines("complete", "")):
        # Small letters complete, too.
        for how, line in (("begun", word[:-1].lower()), ("asked", f"help {word}"), ("ended", f"{word} ")):
            yield f"word-{number}-{how}", line.encode()


def quoted(entry):
    return '"' + "".join(chr(byte) if 0x20 <= byte < 0x7F and byte not in b'"\\' else f"\\x{byte:02x}"
                         for byte in entry) + '"'


@functools.cache
def words_of_the_language(tool):
    words = tool.lines("complete", "help ")
    operations = {operation["name"] for operation in tool.json("ops", "--json")}
    for verb in set(tool.lines("complete", "")) - operations:
        words += tool.lines("complete", verb + " ")
    return [word.encode() for word in words]


def words_of_files(paths):
    found = set()
    for path in paths:
        found.update(re.findall(rb"[A-Za-z_][A-Za-z_0-9]{2,}|\[+[a-z_.]+\]+", path.read_bytes()))
    return found


def words_of_states(tool):
    keys = set()

    def walk(value):
        if isinstance(value, dict):
            keys.update(value)
        for item in value.values() if isinstance(value, dict) else value if isinstance(value, list) else []:
            walk(item)

    for _, content in states(tool):
        walk(json.loads(content.split(b"\0")[0]))
    return [f'"{key}":'.encode() for key in keys]


def words_of_texts(tool):
    found = set()
    for row in tool.json("decode", "--texts", "--json"):
        found.update(re.split(r"%[-0-9]*[a-z]+|\n", row["format"]))
        found.update(row.get("operations", []))
    return [word.encode() for word in found if len(word) > 2]


def words_of_images(tool):
    return [mode["number"].to_bytes(4, "little") for mode in tool.json("modes", "--json")]


def pictures(tool):
    with tempfile.TemporaryDirectory() as directory:
        for pattern in ("card", "bars", "ramp"):
            into = pathlib.Path(directory, pattern + ".png")
            lines = (f"PMX_Init\noutputs hdmi=480p60\nsource vdp0 start 64x64\nsource vdp0 picture {pattern}\n"
                     f"shot hdmi {into} 32x32\n")
            tool.output("run", "--quiet", "-", input=lines.encode())
            yield pattern, into.read_bytes()
    for sampling, size in (("420jpeg", 24), ("422", 32), ("444", 48), ("mono", 16)):
        yield sampling, f"YUV4MPEG2 W4 H4 F25:1 Ip A1:1 C{sampling}\nFRAME\n".encode() + bytes(range(size))


def words_of_pictures(_):
    return [b"IHDR", b"IDAT", b"PLTE", b"tRNS", b"gAMA", b"IEND", b"FRAME", b"XCOLORRANGE=FULL", b"C420jpeg", b"Cmono"]


def recordings(tool):
    for path in SCENARIOS[::8]:
        with tempfile.TemporaryDirectory() as folder:
            file = pathlib.Path(folder) / "recording"
            tool.output("record", "--size", "16384", file, path)
            yield path.stem, file.read_bytes()


def words_of_recordings(_):
    return [b"PMXFLIGHTREC"]


TARGETS = {
    "operations": (lives, words_of_lives),
    "scenario": (scenarios, words_of_the_language),
    "state": (states, words_of_states),
    "board": (boards, lambda tool: [*words_of_files(BOARDS), *words_of_the_language(tool)]),
    "flash": (images, words_of_images),
    "decode": (logs, words_of_texts),
    "against": (compared, lambda tool: [*words_of_texts(tool), *(path.stem.encode() for path in SCENARIOS)]),
    "shell": (shell_lines, words_of_the_language),
    "picture": (pictures, words_of_pictures),
    "recording": (recordings, words_of_recordings),
}


def write_target(tool, directory, name):
    seeds, words = TARGETS[name]
    folder = directory / name
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir(parents=True)
    for seed, content in seeds(tool):
        (folder / seed).write_bytes(content)
    entries = sorted({word for word in words(tool) if 0 < len(word) <= LONGEST_ENTRY})
    if not entries or not any(folder.iterdir()):
        sys.exit(f"{name}: no seeds, or no words")
    (directory / f"{name}.dict").write_text("".join(quoted(entry) + "\n" for entry in entries), encoding="ascii")


def main():
    tool = Tool(sys.argv[1])
    directory = pathlib.Path(sys.argv[2])
    for name in TARGETS:
        write_target(tool, directory, name)
    (directory / "made").touch()


if __name__ == "__main__":
    main()
