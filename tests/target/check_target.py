#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds an object for the 32-bit ARM target against what a kernel's module loader and a small stack take.

As on the host: the two lists of symbols, nothing weak, no code before the first call (see ../symbols/check_symbols.py).
Here as well: only relocations that the loader knows, no run-time helper of the compiler beyond memcpy and memset, no
floating point in any form, the widths of a kernel in its attributes, stack frames within their budget, and no unwind
tables: or, where they are asked for, an entry for each function, and the unwinder's routines that are named, no other.
"""

import argparse
import pathlib
import re
import subprocess
import sys

sys.path.insert(0, str(pathlib.Path(__file__).parent.parent / "symbols"))
import check_symbols  # pylint: disable=wrong-import-position

# What a kernel's loader for ARM modules resolves, in ARM and in Thumb state.
check_symbols.PLAIN_RELOCATIONS = {
    "R_ARM_NONE", "R_ARM_ABS32", "R_ARM_REL32", "R_ARM_PREL31",
    "R_ARM_CALL", "R_ARM_JUMP24", "R_ARM_MOVW_ABS_NC", "R_ARM_MOVT_ABS",
    "R_ARM_THM_CALL", "R_ARM_THM_JUMP24", "R_ARM_THM_MOVW_ABS_NC", "R_ARM_THM_MOVT_ABS",
}

# By their names in the run-time library, and by what they mean for the layer.
HELPERS = (
    (re.compile(r"__aeabi_(u?ldivmod|lmul|llsl|llsr|lasr|lcmp|ulcmp)|__u?(div|mod|divmod)di[34]|__muldi3"),
     "64-bit arithmetic out of line"),
    (re.compile(r"__aeabi_(u?i2[fd]|u?l2[fd]|[fdh]2\w+|[fd]\w+|c[fd]\w+)|__\w+[sdh]f\d?"),
     "floating point in software"),
    (re.compile(r"__aeabi_u?idiv(mod)?|__aeabi_uidiv\w*|__u?divsi3|__u?modsi3"), "division out of line"),
    (re.compile(r"__aeabi_unwind_\w+|__gnu_unwind\w*|_Unwind_\w+"), "unwinding"),
    (re.compile(r"__aeabi_\w+|__gnu_\w+|__sync_\w+|__atomic_\w+"), "a helper of the compiler's run-time library"),
)

UNWIND_SECTION = re.compile(r"^\.(ARM\.exidx|ARM\.extab|eh_frame|gcc_except_table)(\.|$)")
UNWIND_INDEX = re.compile(r"^Unwind section '\.ARM\.exidx[^']*' at offset \w+ contains (\d+) entr", re.M)
WIDTHS = {"Tag_ABI_PCS_wchar_t": "2", "Tag_ABI_enum_size": "int"}  # what a kernel's own objects say
ADDRESS_LINE = re.compile(r"^\s*[0-9a-f]+:\s+(?:[0-9a-f]{4,8} ?)+\s+(\S+)\s*(.*)$")
FUNCTION_LINE = re.compile(r"^[0-9a-f]+ <(.+)>:$")
FLOATING = re.compile(r"^(v[a-z]|f(ld|st)m|fm[rs]|mrc|mcr|ldc|stc|cdp)")
FRAME_BUDGET = 256


def helper_complaints(path, unwinder):
    for name, _, binding, index in check_symbols.symbols(path):
        if binding == "LOCAL" or index != "UND" or name in unwinder:
            continue
        for pattern, meaning in HELPERS:
            if pattern.fullmatch(name):
                yield f"{name}: {meaning}"
                break


def section_complaints(path, unwinder):
    for name, _, _ in check_symbols.sections(path):
        if UNWIND_SECTION.match(name) and not (unwinder and name.startswith(".ARM.ex")):
            yield f"{name}: unwind tables"


def unwind_complaints(path):
    """A backtrace ends at a function without an entry."""
    functions = sum(kind == "FUNC" and index != "UND" for _, kind, _, index in check_symbols.symbols(path))
    entries = sum(map(int, UNWIND_INDEX.findall("\n".join(check_symbols.readelf("--unwind", path)))))
    if entries != functions:
        yield f"unwind tables with {entries} entries, and {functions} functions"


def attribute_complaints(path):
    """Of an object for a kernel: its attributes say that it is soft float, and the widths of a kernel."""
    found = {}
    for line in check_symbols.readelf("--arch-specific", path):
        if re.search(r"Tag_(FP_arch|Advanced_SIMD_arch|ABI_VFP_args|ABI_HardFP_use)\b", line):
            yield f"{line.strip()}: not soft float"
        name, _, value = line.strip().partition(": ")
        found[name] = value
    for name, value in WIDTHS.items():
        if found.get(name) != value:
            yield f"{name}: {found.get(name, 'nothing')}, and {value} in a kernel"


def instruction_complaints(path, objdump):
    """Instructions of the floating-point unit, or of another coprocessor."""
    result = subprocess.run([objdump, "--disassemble", "--wide", path], capture_output=True, text=True, check=False)
    if result.returncode != 0:
        sys.exit(f"{path}: cannot be disassembled: {result.stderr.strip()}")
    function, instructions = "", 0
    for line in result.stdout.splitlines():
        named = FUNCTION_LINE.match(line)
        if named:
            function = named.group(1)
            continue
        match = ADDRESS_LINE.match(line)
        if not match:
            continue
        instructions += 1
        if FLOATING.match(match.group(1)):
            yield f"{function}: {match.group(1)} {match.group(2).strip()}: floating-point or coprocessor instruction"
    if instructions == 0:
        yield "no instructions found in it"


def frame_budgets(texts):
    """NAME=BYTES of the command line, as a dictionary."""
    budgets = {}
    for text in texts:
        name, _, limit = text.partition("=")
        if not name or not limit.isdecimal():
            sys.exit(f"{text}: no NAME=BYTES")
        budgets[name] = int(limit)
    return budgets


FRAME = re.compile(r'node: { title: "(?:.*:)?(\w[\w.]*)" label: ".*\\n(\d+) bytes \(([a-z, ]+)\)')


def frame_complaints(directory, budgets):
    """From the call graphs that the compiler wrote: in its plain lists of frames a variadic function has no name."""
    unused, seen = set(budgets), 0
    for file in sorted(directory.glob("*.ci")):
        for line in file.read_text(encoding="utf-8").splitlines():
            match = FRAME.search(line)
            if not match:
                continue
            seen += 1
            function, size, kind = match.group(1), int(match.group(2)), match.group(3)
            budget = budgets.get(function, FRAME_BUDGET)
            unused.discard(function)
            if size > budget:
                yield f"{function}: frame of {size} bytes, and {budget} are allowed"
            if kind != "static":
                yield f"{function}: a frame of no fixed size ({kind})"
    if seen == 0:
        yield f"{directory}: no stack frames (*.ci) there"
    for function in sorted(unused):
        yield f"{function}: has a frame budget, and does not exist"


def main():
    parser = argparse.ArgumentParser(description="Hold an object for the ARM target against what the target takes.")
    check_symbols.add_lists(parser)
    parser.add_argument("--objdump", required=True, help="the target's objdump")
    parser.add_argument("--hard-float-calls", action="store_true",
                        help="the object is for a system that passes floating-point numbers in registers, and has its "
                             "own widths")
    parser.add_argument("--unwinder", action="append", default=[], metavar="NAME",
                        help="the object has unwind tables, and needs this routine for them")
    parser.add_argument("--frames", type=pathlib.Path, help="directory of the compiler's call graphs, *.ci")
    parser.add_argument("--budget", action="append", default=[], metavar="NAME=BYTES",
                        help=f"frame that a function may have; {FRAME_BUDGET} when not given")
    parser.add_argument("object")
    arguments = parser.parse_args()
    if not pathlib.Path(arguments.object).exists():
        sys.exit(f"{arguments.object}: is not there; ./dev build arm-bare and ./dev build arm-linux make the objects")

    lists = check_symbols.lists_of(arguments)
    lists[1].places.update(dict.fromkeys(arguments.unwinder, "--unwinder"))
    found = list(check_symbols.complaints(arguments.object, *lists))
    found += helper_complaints(arguments.object, arguments.unwinder)
    found += section_complaints(arguments.object, arguments.unwinder)
    if arguments.unwinder:
        found += unwind_complaints(arguments.object)
    found += instruction_complaints(arguments.object, arguments.objdump)
    if not arguments.hard_float_calls:
        found += attribute_complaints(arguments.object)
    if arguments.frames:
        found += frame_complaints(arguments.frames, frame_budgets(arguments.budget))
    for complaint in found:
        print(f"{arguments.object}: {complaint}")
    if not found:
        print(f"{arguments.object}: fit for the target")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
