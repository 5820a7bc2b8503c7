#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds the objects with other names against the one that ships: every section that is loaded has the same bytes, and
every relocation in it leads to the same, whatever that is called now. What stands around it offers what it offers, and
needs what it needs.

usage: same_code.py SHIPS AROUND RENAMED...
"""

import pathlib
import subprocess
import sys

sys.dont_write_bytecode = True
sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "tools" / "cost"))

import elf  # noqa: E402

PREFIXES = ("pmx_recorded_", "pmx_recorder_", "pmx_replayed_", "pmx_replay_")
OFFERED = {"fgPmxRecorderStart", "PMX_RecorderStop"}  # by the recorder itself


def plain(name):
    for prefix in PREFIXES:
        name = name.removeprefix(prefix)
    return name


def loaded(path):
    """{section: its flags, size and bytes} of what is loaded."""
    read = elf.Elf(path)
    found = {section.name: (section.flags, section.size, section.align, read.bytes_of(section))
             for section in read.sections if section.flags & elf.ALLOC}
    if not {".text", ".rodata", ".data", ".bss"} <= found.keys():
        raise SystemExit(f"{path} lacks sections: it has {', '.join(found)}")
    return found


def relocations(path):
    """Where, what kind and to what, of each relocation in a section that is loaded."""
    listed = subprocess.run(["readelf", "--relocs", "--wide", path], capture_output=True, text=True, check=True).stdout
    section, found = "", []
    for line in listed.splitlines():
        words = line.split()
        if line.startswith("Relocation section"):
            section = words[2]
        elif len(words) >= 5 and not words[0].startswith("Offset") and ".debug" not in section:
            found.append((section, words[0], words[2], plain(words[4]), words[5:]))
    return found


def compare(ships, renamed):
    code, other = loaded(ships), loaded(renamed)
    differing = [name for name in sorted(code.keys() | other.keys()) if code.get(name) != other.get(name)]
    if differing:
        raise SystemExit(f"{renamed} differs in {', '.join(differing)}")
    leads, others = relocations(ships), relocations(renamed)
    if not leads or leads != others:
        at = next((i for i, pair in enumerate(zip(leads, others)) if pair[0] != pair[1]), min(len(leads), len(others)))
        raise SystemExit(f"{renamed} leads elsewhere: {leads[at:at + 1]} became {others[at:at + 1]}")
    return len(leads)


def offered_and_needed(path):
    symbols = [symbol for symbol in elf.Elf(path).symbols if not symbol.is_local and symbol.name]
    return ({symbol.name for symbol in symbols if symbol.section}, {symbol.name for symbol in symbols
                                                                    if not symbol.section})


def main():
    ships, around, *renamed = sys.argv[1:]
    counts = [compare(ships, path) for path in renamed]
    (offered, needed), (offers, needs) = offered_and_needed(ships), offered_and_needed(around)
    if offers != offered | OFFERED or needs - {"memcpy", "memset"} != needed - {"memcpy", "memset"}:
        raise SystemExit(f"{around} differs in {sorted(offers ^ offered ^ OFFERED)}, {sorted(needs ^ needed)}")
    print(f"{len(counts)} objects have the code of {ships}, {counts[0]} relocations each")


if __name__ == "__main__":
    main()
