#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds what the tool writes for programs against the schemas: the trace of every scenario with its stores, the state
and the difference that it ends with, operations, modes, logs that are decoded, and recordings.

usage: check_schemas.py TOOL
"""

import collections
import json
import pathlib
import shutil
import subprocess
import sys
import tempfile
from concurrent.futures import ThreadPoolExecutor

sys.dont_write_bytecode = True

ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "cmake"))

from platform_functions import PLATFORM_HEADERS, functions  # noqa: E402
from schemas import Dialect, Schemas  # noqa: E402

LOOKS = """PMX_Init
what-if PMX_GetTvType 0
what-if PMX_SetTvType 0 3
explain PMX_SetMode 0 48 24 0
explain PMX_SetBrightness 3 1 1
why mode
why osd
PMX_SetCBEnable 0 1
diff
diff mixer
state
state ucMode arOutputConf
status
"""


def run(*command, text=None):
    return subprocess.run(command, capture_output=True, text=True, check=False, input=text, cwd=ROOT).stdout


def of_scenario(tool, scenario):
    """(schema, document) of a scenario, a copy of which saves the state that it ends with."""
    saved = scenario.with_suffix(".json")
    with scenario.open("a", encoding="utf-8") as copy:
        copy.write(f"\nsave {saved}\n")
    trace = run(tool, "run", "--trace-format", "jsonl", "--stores", scenario)
    return [*(("trace", json.loads(line)) for line in trace.splitlines()),
            ("state", json.loads(saved.read_text(encoding="utf-8")))]


def of_looks(tool, directory):
    found = [("trace", json.loads(line))
             for line in run(tool, "run", "--trace-format", "jsonl", "-", text=LOOKS).splitlines()]
    older, newer = directory / "older.json", directory / "newer.json"
    steps = ["PMX_Init", f"save {older}", "PMX_SetModeEx 0 [[0],[1,8],[0],[0]] 60 0 0", f"save {newer}", ""]
    run(tool, "run", "-q", "-", text="\n".join(steps))
    found += [("state", json.loads(run(tool, "state", "--json", newer, *paths)))
              for paths in ((), ("ucMode",), ("mixer", "arPortInfo[2]", "registers.words"))]
    found += [("status", json.loads(run(tool, "status", "--json", name))) for name in (older, newer)]
    found += [("diff", json.loads(run(tool, "state", "--json", older, other))) for other in (older, newer)]
    return found


def of_recordings(tool, directory):
    """Two recordings, the second one of a ring that has run over."""
    recording, scenario = directory / "recording", directory / "long.pmx"
    scenario.write_text("PMX_Init\n" + 40 * "PMX_SetMode 0 RES_480P 60 0\nPMX_SetMode 0 RES_720P50HZ 50 0\n",
                        encoding="utf-8")
    for recorded, size in (("scenarios/connect-while-informing.pmx", "1048576"), (scenario, "16384")):
        run(tool, "record", "--size", size, recording, recorded)
        yield from (("recording", json.loads(line)) for line in run(tool, "replay", "--json", recording).splitlines())


def of_commands(tool):
    contracts = [entry["name"] for entry in json.loads(run(tool, "ops", "--json"))]
    platform = [function.name for header in PLATFORM_HEADERS for function in functions(ROOT / header)]
    yield "ops", json.loads(run(tool, "ops", "--json"))
    yield "ops", json.loads(run(tool, "ops", "--json", *contracts[:3], *platform))
    yield "modes", json.loads(run(tool, "modes", "--json"))
    yield "modes", json.loads(run(tool, "modes", "--json", *map(str, range(256))))
    yield "decode", json.loads(run(tool, "decode", "--json", "--texts"))
    for log in sorted((ROOT / "tests/decode").glob("*.log")):
        yield "decode", json.loads(run(tool, "decode", "--json", log))
        for scenario in ("first-mode-after-boot", "cold-boot"):
            yield "decode", json.loads(run(tool, "decode", "--json", "--against", f"scenarios/{scenario}.pmx", log))


def documents(tool):
    with tempfile.TemporaryDirectory() as directory, ThreadPoolExecutor(2) as pool:
        copies = pathlib.Path(shutil.copytree(ROOT / "scenarios", pathlib.Path(directory) / "scenarios"))
        for found in pool.map(lambda scenario: of_scenario(tool, scenario), sorted(copies.glob("*.pmx"))):
            yield from found
        yield from of_looks(tool, pathlib.Path(directory))
        yield from of_recordings(tool, pathlib.Path(directory))
    yield from of_commands(tool)


def main():
    tool = pathlib.Path(sys.argv[1]).resolve()
    schemas = Schemas()
    for schema in schemas.by_name.values():
        Dialect.check_schema(schema)
    counted, complaints = collections.Counter(), set()
    for name, document in documents(tool):
        counted[name] += 1
        complaint = schemas.complaint(name, document)
        if complaint:
            complaints.add(f"{name}: {complaint}")
    missing = schemas.by_name.keys() - counted.keys() - {"values"}
    complaints |= {f"{name}: nothing was written that this schema is for" for name in missing}
    print("\n".join([*sorted(complaints), ", ".join(f"{number} {name}" for name, number in sorted(counted.items()))]))
    return 1 if complaints else 0


if __name__ == "__main__":
    sys.exit(main())
