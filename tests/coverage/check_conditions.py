#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the layer's tests over a compile of it that counts conditions, and prints which of its lines, branches and
conditions they reach. A condition is reached when its value alone decided what became of the whole (MC/DC).

It fails when one is not reached and is not in the list of those that cannot be, and when the list allows for more than
is needed; counted.py tells the form of the list. Without programs it ends with 77: there is no compiler that counts so.

usage: check_conditions.py [--build DIRECTORY --profdata PROGRAM --cov PROGRAM] [--list FILE] [PROGRAM...]
"""

import argparse
import pathlib
import sys

sys.dont_write_bytecode = True
sys.path.append(str(pathlib.Path(__file__).resolve().parents[1] / "common"))

import counted  # noqa: E402
import figures  # noqa: E402
from check_coverage import SWEEPS  # noqa: E402

ROOT = pathlib.Path(__file__).resolve().parents[2]
LAYER = "src/driver/pmx/"
SKIPPED = 77


def main():
    parser = argparse.ArgumentParser(description="Check which conditions of the layer the tests reach.")
    parser.add_argument("--build", type=pathlib.Path, help="build directory")
    parser.add_argument("--profdata", help="llvm-profdata of the compiler's version")
    parser.add_argument("--cov", help="llvm-cov of the compiler's version")
    parser.add_argument("--list", type=pathlib.Path, default=ROOT / "tests/coverage/unreached.txt")
    parser.add_argument("programs", nargs="*", type=pathlib.Path)
    arguments = parser.parse_args()
    if not arguments.programs:
        print("SKIPPED: conditions were not counted: there was no clang 19 when the build was configured "
              "(./dev setup coverage, then cmake --preset debug)")
        return SKIPPED

    counts = arguments.build / "conditions"
    failed = counted.run([[str(program), "--gtest_brief=1", SWEEPS] for program in arguments.programs], counts, ROOT)
    if failed:
        sys.exit(failed)
    tools = counted.Tools(arguments.profdata, arguments.cov)
    files = counted.files_of(tools.export(arguments.programs, counts), ROOT, [LAYER])
    if not sum(file.totals()["condition"].all for file in files):
        sys.exit("no condition of the layer was counted")
    tools.page(arguments.programs, counts, [ROOT / file.name for file in files], counts / "page")

    total = counted.sum_of(files, counted.KINDS)
    figures.note("coverage", **{f"{kind}_{part}": number for kind in counted.KINDS
                                for part, number in total[kind]._asdict().items()})

    named, complaints = counted.read_list(arguments.list.read_text(encoding="utf-8"))
    named = {missing: number for missing, number in named.items() if missing.file.startswith(LAYER)}
    complaints += counted.judge(counted.all_missing(files), named)
    print("\n".join([*counted.table(files, counted.KINDS), "", *complaints]))
    print(f"conditions: {len(complaints)} complaints, {sum(named.values())} that cannot come about")
    return 1 if complaints else 0


if __name__ == "__main__":
    sys.exit(main())
