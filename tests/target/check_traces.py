#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""One call log: every scenario gives the same trace, byte for byte, on every target and with every compile.

Each scenario runs with all arguments named, traced in the form for people. The SHA-256 of what a program prints is held
against trace_hashes.txt; --renew writes that list from the program. The line number that the console shows with an
assertion is left out: it moves with the code.
"""

import argparse
import hashlib
import pathlib
import re
import subprocess
import sys
from concurrent.futures import ThreadPoolExecutor

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "cmake"))

import whole_file  # noqa: E402

LIST = pathlib.Path(__file__).with_name("trace_hashes.txt")
HEADING = "# SHA-256 of each scenario's trace. check_traces.py --renew writes it, when traces are meant to change.\n"


def read_list(path):
    hashes = {}
    for number, line in enumerate(path.read_text(encoding="utf-8").splitlines(), start=1):
        if not line or line.startswith("#"):
            continue
        fields = line.split()
        if len(fields) != 2 or len(fields[0]) != 64:
            sys.exit(f"{path}:{number}: no hash and scenario: {line}")
        hashes[fields[1]] = fields[0]
    return hashes


def run(command, scenario):
    """(hash, complaint) of one scenario; what goes wrong in a run is its own complaint."""
    result = subprocess.run([*command, "run", "-v", scenario], capture_output=True, check=False)
    if result.returncode != 0:
        return "", f"{scenario}: ended with {result.returncode}: {result.stderr.decode(errors='replace').strip()}"
    trace = re.sub(rb"(?m)^(  \| ASSERT .*):\d+$", rb"\1", result.stdout)
    return hashlib.sha256(trace).hexdigest(), ""


def compare(found, listed):
    """Complaints about scenarios whose trace is another one, and about scenarios in only one of the two places."""
    for scenario in sorted(found.keys() | listed.keys()):
        if scenario not in listed:
            yield f"{scenario}: not in the list of hashes"
        elif scenario not in found:
            yield f"{scenario}: listed, but there is no such scenario"
        elif found[scenario] and found[scenario] != listed[scenario]:
            yield f"{scenario}: another trace than the listed one"


def main():
    parser = argparse.ArgumentParser(description="Hold the traces of all scenarios against their hashes.")
    parser.add_argument("--renew", action="store_true", help="write the list from this program's traces")
    parser.add_argument("--list", type=pathlib.Path, default=LIST, help="the list of hashes")
    parser.add_argument("--scenarios", default="scenarios", help="directory of the scenarios")
    parser.add_argument("command", nargs=argparse.REMAINDER, help="pmxboard, after an emulator if need be")
    arguments = parser.parse_args()

    scenarios = sorted(str(path) for path in pathlib.Path(arguments.scenarios).glob("*.pmx"))
    if not scenarios:
        sys.exit(f"{arguments.scenarios}: no scenarios there")
    program = pathlib.Path(arguments.command[-1])
    if not program.exists():
        sys.exit(f"{program}: is not there; ./dev test builds it")

    with ThreadPoolExecutor(max_workers=2) as pool:
        results = dict(zip(scenarios, pool.map(lambda scenario: run(arguments.command, scenario), scenarios)))
    found = {pathlib.Path(name).name: digest for name, (digest, _) in results.items()}
    complaints = [complaint for _, complaint in results.values() if complaint]
    if arguments.renew and not complaints:
        lines = [f"{digest}  {name}\n" for name, digest in sorted(found.items())]
        whole_file.write(arguments.list, HEADING + "".join(lines))
    else:
        complaints += compare(found, read_list(arguments.list))
    for complaint in complaints:
        print(f"{complaint}\nrepeat: {' '.join(arguments.command)} run -v {arguments.scenarios}/"
              f"{complaint.split(':', 1)[0].removeprefix(arguments.scenarios + '/')}")
    if not complaints:
        print(f"{len(found)} scenarios, each with the one trace that it has everywhere")
    return 1 if complaints else 0


if __name__ == "__main__":
    sys.exit(main())
