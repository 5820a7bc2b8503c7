# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""How the checker is asked, and what its answers say."""

import hashlib
import os
import pathlib
import re

import harness
import view

LIMIT = int(os.environ.get("PMX_PROVE_SECONDS", "600"))  # for one operation, in one world where two are compared
# A place beyond the longest loop: what goes round more often is an error, told as such.
# The checks are named, although the version that is wanted makes them anyway: others made none unless they were asked.
CHECKS = ["--bounds-check", "--pointer-check", "--pointer-primitive-check", "--div-by-zero-check",
          "--signed-overflow-check", "--undefined-shift-check", "--unwinding-assertions"]
OPTIONS = ["--nondet-static", "--unwind", "9", "--object-bits", "10", "--drop-unused-functions", *CHECKS]
GUARD = '(__CPROVER_assert((size_t)(i)<(n),"index within the array of a record"),(i))'
CHECKED = re.compile(r"^\[(\S+)\] (?:line (\d+) )?(.*): (SUCCESS|FAILURE|UNKNOWN|ERROR)$", re.M)
COUNTED = re.compile(r"^\*\* (\d+) of (\d+) failed", re.M)
PLACE = re.compile(r"^(\S+) function (\w+)$", re.M)
COMPILER = ["--native-compiler", "arm-none-eabi-gcc", "-mcpu=cortex-a9"]
JUDGES = [pathlib.Path(__file__).resolve().with_name(name)
          for name in ("prove.py", "verdicts.py", "checker.py", "harness.py")]  # the last counts the ends


def key(version, texts, judges=JUDGES):
    """Of what is proved: by which programs, of which texts, judged by whom."""
    judged = [path.read_text(encoding="utf-8") for path in judges]
    whole = "\0".join([version, *OPTIONS, *COMPILER, *judged, *texts])
    return hashlib.sha256(whole.encode()).hexdigest()[:32]


def incomplete(text):
    """What an output lacks that was cut off, or that has lines which nobody here understands."""
    counted, lines = COUNTED.search(text), CHECKED.findall(text)
    if not lines:
        return []  # told as such
    if not counted or not re.search(r"^VERIFICATION (?:FAILED|SUCCESSFUL)$", text, re.M):
        return ["the checker did not come to its end"]
    failed = sum(status == "FAILURE" for *_, status in lines)
    unknown = sum(status in ("UNKNOWN", "ERROR") for *_, status in lines)
    if len(lines) != int(counted[2]) or not failed <= int(counted[1]) <= failed + unknown:
        return [f"{failed} of {len(lines)} checks failed by its lines, {counted[1]} of {counted[2]} by its sum"]
    return []


class Verdict:
    """How many checks the checker made, what is wrong, and (place, words) of what was refuted: behind that much is
    unknown, and complaints of the checker itself say nothing of the layer."""

    def __init__(self, text, ends=len(harness.WORLDS), complaint=""):
        place, self.number, self.wrong, self.failed, reached = "", 0, [], [], []
        for line in text.splitlines():
            where, checked = PLACE.match(line), CHECKED.match(line)
            if where:
                place = where[1].removeprefix(f"{view.ROOT}/")
            elif checked and checked[3].startswith(harness.REACHED):
                reached.append(checked[4])
            elif checked:
                self.number += 1
                if checked[4] == "FAILURE":
                    self.failed.append((f"{place}:{checked[2]}", checked[3]))
                if checked[4] != "SUCCESS":
                    self.wrong.append(f"{place}:{checked[2]}: {checked[3]}: {checked[4]}")
        self.wrong += incomplete(text)
        # Behind what fails the checker does not know; what fails goes first.
        self.wrong.sort(key=lambda line: not line.endswith("FAILURE"))
        self.wrong += re.findall(r"no body for .*", text)
        # Of what is behind every call it is claimed that nothing gets there: who does not see that this is wrong has
        # presumed too much.
        if not reached:
            self.wrong.append(f"nothing was proved: {complaint}")
        elif reached != ["FAILURE"] * ends:
            self.wrong.append("an end is not reached: what is presumed cannot be")
