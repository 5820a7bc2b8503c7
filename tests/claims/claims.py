#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes docs/claims.md of tests/claims/claims.toml and of figures: those that are counted in the tree, here, and those
that runs have counted, from tests/claims/seen.json.

usage: claims.py             compare the page; 1 where it is not what would be written
       claims.py --renew     write the page
       claims.py --seen      hold what the last runs counted (build/figures) against seen.json; tell what did not run
       claims.py --take      put what the last runs counted into seen.json, and write the page
"""

import hashlib
import json
import pathlib
import re
import sys
import textwrap
import tomllib

sys.dont_write_bytecode = True
ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path[:0] = [str(ROOT / "cmake"), str(ROOT / "tests/common")]

import figures  # noqa: E402
import whole_file  # noqa: E402

HERE = pathlib.Path(__file__).resolve().parent
PAGE, CLAIMS, SEEN = ROOT / "docs/claims.md", HERE / "claims.toml", HERE / "seen.json"
WAYS = {"proved": "for all inputs, by a checker",
        "exhausted": "every case was run",
        "measured": "counted or timed, in a run that anybody can repeat",
        "sampled": "many cases were run, drawn at random or chosen",
        "read": "somebody looked"}
KEYS = {"area", "name", "way", "command", "says", "assumes", "leaves"}
HAND = {"what", "command", "date", "revision", "of", "result"}
DATE, REVISION = re.compile(r"\d{4}-\d\d-\d\d"), re.compile("[0-9a-f]{7,40}")
REASON = re.compile(r"^    X\( ?\d+, \w+, +[A-Z]+, +[A-Z_]+, +[A-Z_]+,", re.M)
MARK = re.compile(r"\{([a-z_.]+)\}")


class Wrong(Exception):
    """The claims are not fit to be written."""


def text_of(path):
    return (ROOT / path).read_text(encoding="utf-8")


def tree(folder):
    """What git rev-parse REVISION:FOLDER says of a folder with these files."""
    held = b""
    for path in sorted(folder.iterdir(), key=lambda one: one.name + "/" * one.is_dir()):
        content = b"" if path.is_dir() else path.read_bytes()
        name = tree(path) if path.is_dir() else hashlib.sha1(b"blob %d\0" % len(content) + content).hexdigest()
        mode = b"40000" if path.is_dir() else b"100755" if path.stat().st_mode & 0o100 else b"100644"
        held += b"%s %s\0" % (mode, path.name.encode()) + bytes.fromhex(name)
    return hashlib.sha1(b"tree %d\0" % len(held) + held).hexdigest()


def inventory():
    lines = (line.split() for line in text_of("tests/inventory/inventory.txt").splitlines()
             if not line.startswith("#"))
    return {name: int(number) for name, number in lines}


def in_the_tree():
    """Figures that nobody has to run anything for."""
    tests = inventory()
    return {
        "scenarios": len(list((ROOT / "scenarios").glob("*.pmx"))),
        "reasons": len(REASON.findall(text_of("src/driver/private_inc/pmx_reason.h"))),
        "fuzz_targets": len(list((ROOT / "fuzz").glob("*_fuzz.cpp"))),
        "tests.ctest": tests["ctest"],
        "tests.layer": tests["layer_tests"] + tests["core_tests"],
        "tests.board": tests["board_tests"],
        "tests.tool": tests["tool_tests"],
        "tests.picture": tests["picture_tests"],
    }


def flat(seen):
    return {f"{run}.{name}": figure for run, counted in seen.items() for name, figure in counted.items()}


def number(figure):
    return f"{figure:,}" if isinstance(figure, int) else str(figure)


def filled(text, known, used):
    def of(mark):
        name = mark.group(1)
        if name not in known:
            raise Wrong(f"nobody counts {{{name}}}")
        used.add(name)
        return number(known[name])
    return MARK.sub(of, " ".join(text.split()))


def folded(text, indent=""):
    return textwrap.wrap(text, 140, subsequent_indent=indent, break_on_hyphens=False, break_long_words=False)


def has_all(entry, keys, name):
    if set(entry) != keys:
        raise Wrong(f"{name}: has {', '.join(sorted(set(entry) ^ keys))} too many, or too few")
    for key, value in entry.items():
        if not value or not str(value).strip():
            raise Wrong(f"{name}: {key} is empty")


def claim(entry, known, used):
    say = {key: filled(entry[key], known, used) for key in ("says", "assumes", "leaves")}
    yield f"### {entry['name']}"
    yield ""
    yield from folded(f"**{entry['way'].capitalize()}**, `{entry['command']}`. {say['says']}")
    yield ""
    yield from folded(f"- Takes for granted: {say['assumes']}", "  ")
    yield from folded(f"- Leaves open: {say['leaves']}", "  ")
    yield ""


def fit(claims):
    for entry in claims["claim"]:
        has_all(entry, KEYS, entry.get("name", "a claim"))
        if entry["way"] not in WAYS:
            raise Wrong(f"{entry['name']}: no such way: {entry['way']}")
    for entry in claims["by_hand"]:
        has_all(entry, HAND, entry.get("what", "a run by hand"))
        if not DATE.fullmatch(entry["date"]) or not REVISION.fullmatch(entry["revision"]):
            raise Wrong(f"{entry['what']}: {entry['date']}, {entry['revision']} is no date and revision")
        for folder, then in entry["of"].items():
            if not REVISION.fullmatch(then):
                raise Wrong(f"{entry['what']}: {then} is not what git rev-parse {entry['revision']}:{folder} says")
            if not (ROOT / folder).is_dir():
                raise Wrong(f"{entry['what']}: there is no {folder}/")


def since(of, now):
    """What has become of the folders that a run by hand is of."""
    changed = [folder for folder in of if not now[folder].startswith(of[folder])]
    if not changed:
        return "the same"
    return "**changed**: " + ", ".join(f"`{folder}/`" for folder in changed)


def page(claims, known):
    fit(claims)
    used = set()
    yield "<!-- SPDX-License-Identifier: MIT OR GPL-2.0-only -->"
    yield "<!-- Written by tests/claims/claims.py, of tests/claims/claims.toml. -->"
    yield "# What is claimed, how it is shown, and what is not"
    yield ""
    yield from folded(claims["introduction"])
    yield ""
    yield from (f"- **{way}**: {meaning}" for way, meaning in WAYS.items())
    yield ""
    for area in dict.fromkeys(entry["area"] for entry in claims["claim"]):
        yield f"## {area}"
        yield ""
        for entry in claims["claim"]:
            if entry["area"] == area:
                yield from claim(entry, known, used)
    yield "## By hand"
    yield ""
    yield from folded("What takes too long to be run at each change, with the revision that it was run on. It says "
                      "nothing of later changes, and the table tells whether the folders that it is of had one since: "
                      "the layer (`src/`), the port (`linux/`), the board and the tool (`board/`, `tools/`).")
    yield ""
    yield "| | Command | When | Revision | Of | Since then | It showed |"
    yield "|---|---|---|---|---|---|---|"
    now = {folder: tree(ROOT / folder) for entry in claims["by_hand"] for folder in entry["of"]}
    for entry in claims["by_hand"]:
        of = ", ".join(f"`{folder}/`" for folder in entry["of"])
        what, result = filled(entry["what"], known, used), filled(entry["result"], known, used)
        yield (f"| {what} | `{entry['command']}` | {entry['date']} | {entry['revision']} | {of} | "
               f"{since(entry['of'], now)} | {result} |")
    yield ""
    yield "## Not covered"
    yield ""
    for line in claims["not_covered"]:
        yield from folded(f"- {filled(line, known, used)}", "  ")
    idle = set(known) - used
    if idle:
        raise Wrong(f"counted and told nowhere: {', '.join(sorted(idle))}")


def written():
    claims = tomllib.loads(CLAIMS.read_text(encoding="utf-8"))
    return "\n".join(page(claims, in_the_tree() | flat(json.loads(SEEN.read_text(encoding="utf-8"))))) + "\n"


def hold(seen, folder):
    """(complaint or remark, whether it is a complaint) of each run."""
    for run, figures_then in seen.items():
        path = folder / f"{run}.json"
        if not path.exists():
            yield f"SKIPPED: {run} did not run", False
            continue
        now = json.loads(path.read_text(encoding="utf-8"))
        yield f"{run}: {now}", False
        if now != figures_then:
            yield f"{run}: the page has {figures_then}: tests/claims/claims.py --take, if that is meant", True


def take(folder):
    seen = json.loads(SEEN.read_text(encoding="utf-8"))
    for path in sorted(folder.glob("*.json")):
        seen[path.stem] = json.loads(path.read_text(encoding="utf-8"))
    whole_file.write(SEEN, json.dumps(seen, indent=1, sort_keys=True) + "\n")


def main():
    wish = sys.argv[1:]
    if wish == ["--seen"]:
        complaints = 0
        for line, wrong in hold(json.loads(SEEN.read_text(encoding="utf-8")), figures.FOLDER):
            print(f"claims: {line}")
            complaints += wrong
        return 1 if complaints else 0
    if wish == ["--take"]:
        take(figures.FOLDER)
    text = written()
    if wish in (["--renew"], ["--take"]):
        whole_file.write(PAGE, text)
        return 0
    if wish:
        sys.exit(__doc__)
    if text != PAGE.read_text(encoding="utf-8"):
        print("claims: docs/claims.md is another one: tests/claims/claims.py --renew")
        return 1
    return 0


if __name__ == "__main__":
    try:
        sys.exit(main())
    except Wrong as reason:
        sys.exit(f"claims: {reason}")
