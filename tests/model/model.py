#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Has the model checker Spin show that graphics come back, whatever the handshake's neighbours do and in whichever
order, unless a cause has arisen that docs/calling.md names; and holds the model against the layer.

usage: model.py WRITER

WRITER is handshake_graph_writer, which lists every transition that the layer makes on the board; the model has to have
the same. Faults are planted in the model, and each has to be found. Without Spin the check ends with 77."""

import pathlib
import re
import shutil
import subprocess
import sys
import tempfile

sys.dont_write_bytecode = True
sys.path.append(str(pathlib.Path(__file__).resolve().parents[1] / "common"))

import figures  # noqa: E402

HERE = pathlib.Path(__file__).resolve().parent
MODEL = HERE / "handshake.pml"
CLAIM = "graphics_come_back"
CAUSE = re.compile(r"^ltl (never_\w+)", re.M)
SEARCH = ("-E", "-w18")  # a process may wait for ever; 2 to the 18 states fit well into the first table
COMPLETE = re.compile(r"errors: (\d+)$", re.M)

# What is planted in the model, each with the text that it replaces, and whether the claim or the layer tells it.
PLANTED = (
    ("claim", "the timer is not started", "    armed = has_timer;", "    skip;"),
    ("claim", "the timer that runs out lowers no flag", "    timer_set = false;\n    lower()", "    timer_set = false"),
    ("claim", "a lowered flag owes nothing", "    flag = false;\n    owed = true;", "    flag = false;"),
    ("claim", "a lowered flag mixes nothing", "    :: !waiting -> mix()", "    :: !waiting -> skip"),
    ("claim", "PMX_SetOsdEnable mixes nothing", "    :: owed -> mix()", "    :: owed -> owed = false"),
    ("claim", "a refused mode takes graphics out", '"mode: refused", lower()', '"mode: refused", mixed = false'),
    ("claim", "nobody serves timers", "    :: atomic { armed || old_armed; TIMER", "    :: atomic { false; TIMER"),
    ("claim", "timers that the layer does not know stop", "atomic { armed || old_armed;", "atomic { armed;"),
    ("claim", "the video plane driver forgets its call", "awaited = false; SET_OSD_ENABLE }",
     "awaited = false; look(none) }"),
    ("claim", "a display part that is dutiful never answers", "        :: atomic { answering = false; FLAG_LOWERED }",
     "        :: atomic { false; FLAG_LOWERED }"),
    ("layer", "T stays set", "    timer_set = false;\n    lower()", "    lower()"),
    ("layer", "a request that changes nothing does not look at T", "!mode_set || timer_set)", "!mode_set)"),
    ("layer", "a start keeps its timer", "        reset();\n        has_timer = true;", "        has_timer = true;"),
)


class Broken(Exception):
    """A program that does not do its work."""


def run(*command, folder):
    result = subprocess.run(command, cwd=folder, capture_output=True, text=True, check=False)
    if result.returncode != 0:
        raise Broken(f"{' '.join(map(str, command))} ended with {result.returncode}:\n{result.stdout}{result.stderr}")
    return result.stdout


def checker(folder, text, macros, options):
    """The program that looks at every state of a model."""
    (folder / "model.pml").write_text(text, encoding="utf-8")
    run("spin", *macros, "-a", "model.pml", folder=folder)
    run("gcc", "-O0", "-w", *options, "-o", "pan", "pan.c", folder=folder)
    return folder / "pan"


def searched(report):
    """How many errors an exhaustive search has found."""
    found = COMPLETE.search(report)
    if not found or "max search depth too small" in report or "Search not completed" in report and found[1] == "0":
        raise Broken(f"the search did not come to its end:\n{report}")
    return int(found[1])


def transitions(folder, text):
    """Those of the model, as the layer's are listed."""
    report = run(checker(folder, text, ["-DGRAPH"], ["-DSAFETY", "-DNOREDUCE"]), *SEARCH, folder=folder)
    if searched(report) != 0:
        raise Broken(report)
    return {line for line in report.splitlines() if line.count(" | ") == 2}


def violated(folder, text, others=()):
    """Those of the claim and of others that do not hold."""
    program = checker(folder, text, [], ["-DNFAIR=3"])
    return [claim for claim in (CLAIM, *others)
            if searched(run(program, *SEARCH, "-a", "-f", "-N", claim, folder=folder))]


def planted(text, what, old, new):
    if text.count(old) != 1:
        raise Broken(f"cannot be planted any more: {what}")
    return text.replace(old, new)


def differences(model, layer):
    return [f"only the {name} has  {line}" for name, lines in (("model", model - layer), ("layer", layer - model))
            for line in sorted(lines)]


def check(writer, folder):
    """What is wrong, a line each."""
    run(writer, "transitions", folder / "layer.txt", folder=folder)
    layer = set((folder / "layer.txt").read_text(encoding="utf-8").splitlines())
    text = MODEL.read_text(encoding="utf-8")
    wrong = differences(transitions(folder, text), layer)
    print(f"{len(layer)} transitions of the layer, {len(wrong)} different in the model")
    causes = CAUSE.findall(text)
    refuted = violated(folder, text, causes)
    if CLAIM in refuted:
        wrong.append("graphics stay away, and no cause is named: spin -a, and pan -a -f, tell how")
    wrong += [f"no cause: {claim}" for claim in causes if claim not in refuted]
    print(f"{CLAIM}: {'violated' if CLAIM in refuted else 'holds'}, but for {len(causes)} causes")
    for by, what, old, new in PLANTED:
        fault = planted(text, what, old, new)
        found = violated(folder, fault) if by == "claim" else differences(transitions(folder, fault), layer)
        print(f"{'found' if found else 'NOT FOUND'} by the {by}: {what}")
        if not found:
            wrong.append(f"planted and not found: {what}")
    figures.note("model", transitions=len(layer), causes=len(causes), planted=len(PLANTED))
    return wrong


def main():
    if len(sys.argv) != 2:
        sys.exit("usage: model.py WRITER")
    if not shutil.which("spin"):
        print("spin is missing: ./dev setup model installs it", file=sys.stderr)
        return 77
    try:
        with tempfile.TemporaryDirectory() as folder:
            wrong = check(pathlib.Path(sys.argv[1]).resolve(), pathlib.Path(folder))
    except (Broken, OSError) as error:
        sys.exit(str(error))
    for line in wrong[:40]:
        print(line, file=sys.stderr)
    return 1 if wrong else 0


if __name__ == "__main__":
    sys.exit(main())
