#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The cost card: what the layer costs in bytes, stack, calls and instructions. Writes docs/cost.md for people and
docs/cost.json for programs.

usage: cost.py --build DIR                   measure, and write both
       cost.py --build DIR --json            print the card as JSON, and write nothing
       cost.py --build DIR --list [WORD]     print prices, and sizes, of what has WORD in its name
       cost.py --build DIR --diff REVISION   print what has changed since a revision
       cost.py --build DIR --check           hold what is measured against the card

DIR is a build of the virtual board.
"""

import argparse
import io
import json
import pathlib
import sys
import tarfile

sys.dont_write_bytecode = True

import arm  # noqa: E402
import callgraph  # noqa: E402
import card as cards  # noqa: E402
import check  # noqa: E402
import diff  # noqa: E402
import goals as goal_list  # noqa: E402
import instructions  # noqa: E402
import paths as path_list  # noqa: E402
import recorded  # noqa: E402
import signatures  # noqa: E402
import whole_file  # noqa: E402
from tools import ToolError, run_binary  # noqa: E402

ROOT = signatures.ROOT
TOOL = ROOT / "tools" / "cost"
DOCUMENT = ROOT / "docs" / "cost.md"
DATA = ROOT / "docs" / "cost.json"
README = ROOT / "README.md"  # shows the five figures


def on_card():
    return json.loads(DATA.read_text(encoding="utf-8"))


def measure(build, tree, made):
    """The card of the layer of a tree. What takes a kernel is measured by ./dev kernel --cost, and kept."""
    board = instructions.Board(build)
    listed = path_list.read((TOOL / "paths.txt").read_text(encoding="utf-8"), signatures.operations(), board.examples)
    counts = instructions.count(listed, board, tree, made / "host")
    return cards.make(listed, counts, arm.measure(tree, made / "target"),
                      recorded.measure(tree, made / "target" / "recorder"),
                      on_card()["in_kernel"])


def goals_and_explanations():
    return goal_list.load(TOOL / "goals.toml"), goal_list.load(TOOL / "explained.toml").get("missed", [])


def goal_complaints(card):
    goals, explanations = goals_and_explanations()
    every_goal = [*goal_list.of_sizes(goals, card), *goal_list.of_prices(goals, card),
                  *goal_list.of_recorder(goals, card), *goal_list.of_kernel(goals, card)]
    return list(goal_list.complaints(every_goal, explanations))


def write_files(card):
    goals, explanations = goals_and_explanations()
    whole_file.write(DATA, cards.as_json(card))
    whole_file.write(DOCUMENT, cards.render(card, goals, explanations))
    return goals


def take(in_kernel):
    """Puts what was measured in a kernel on the card; the goals and explanations that do not go with it."""
    card = {**on_card(), "in_kernel": in_kernel}
    write_files(card)
    return goal_complaints(card)


def write_card(card):
    goals = write_files(card)
    for name, value, text in cards.five_figures(card, goals):
        print(f"{name}: {value} ({text.replace('`', '')})")
    return goal_complaints(card)


def check_card(card):
    """Everything that is wrong with the committed card."""
    old = on_card()
    goals, explanations = goals_and_explanations()
    if missing := list(check.operations(old, signatures.places())):
        return missing
    complaints, notes = check.all_of(old, card)
    if DOCUMENT.read_text(encoding="utf-8") != cards.render(old, goals, explanations):
        complaints.append("docs/cost.md is not what docs/cost.json, the goals and the explanations make")
    readme = README.read_text(encoding="utf-8")
    complaints += [f"README.md does not show | {' | '.join(row)} |" for row in cards.figure_rows(old, goals)
                   if f"| {' | '.join(row)} |" not in readme]
    complaints += goal_complaints(old)
    for note in notes:
        print(note)
    return complaints


def tree_of(revision, made):
    """The layer's sources of a revision."""
    tree = made / "tree"
    packed = run_binary("git", "-C", ROOT, "archive", revision, "src", "cmake", "examples")  # with layer.flags
    with tarfile.open(fileobj=io.BytesIO(packed)) as archive:
        archive.extractall(tree, filter="data") if hasattr(tarfile, "data_filter") else archive.extractall(tree)
    return tree


def list_card(card, word):
    for name, row in sorted(card["functions"].items(), key=lambda row: -row[1]["code"]):
        if word in name:
            print(f"code {row['code']:>5}  texts {row['texts']:>5}  frame {row['frame']:>4}  stack {row['stack']:>4}  "
                  f"{' > '.join(row['through'])}")
    for kind in ("tables", "ram"):
        plain = cards.plain_names(card[kind])
        for name, size in sorted(card[kind].items(), key=lambda row: -row[1]):
            if word in plain[name]:
                print(f"{kind} {size:>5}  {plain[name]}")
    print("in all", card["totals"])
    for path in sorted(card["paths"], key=lambda path: path["floor"] - path["layer"]):
        if word in path["operation"]:
            print(f"price {path['layer'] - path['floor']:>4} = {path['layer']:>5} - {path['floor']:>4}  calls "
                  f"{path['calls']:>3}  registers {path['registers']:>3}  logs {path['logs']:>3}  {path['operation']} "
                  f"{path['kind']}")


def arguments():
    parser = argparse.ArgumentParser(prog="dev cost", description="What the layer costs: writes docs/cost.md and "
                                                                  "docs/cost.json.")
    parser.add_argument("--build", type=pathlib.Path, required=True, help="a build of the virtual board")
    what = parser.add_mutually_exclusive_group()
    what.add_argument("--json", action="store_true", help="print the card as JSON, and write nothing")
    what.add_argument("--list", nargs="?", const="", metavar="WORD",
                      help="print prices and sizes of what has WORD in its name")
    what.add_argument("--diff", metavar="REVISION", help="print what has changed since a revision of the repository")
    what.add_argument("--check", action="store_true", help="hold what is measured against the card")
    return parser.parse_args()


def main():
    given = arguments()
    build = given.build.resolve()
    made = build / "cost"
    card = measure(build, ROOT, made)
    if given.json:
        print(cards.as_json(card), end="")
        return []
    if given.list is not None:
        list_card(card, given.list)
        return []
    if given.diff:
        print(diff.text(measure(build, tree_of(given.diff, made / "before"), made / "before"), card), end="")
        return []
    return check_card(card) if given.check else write_card(card)


if __name__ == "__main__":
    try:
        found = main()
    except (ToolError, path_list.PathError, callgraph.CallGraphError, signatures.Unclear) as error:
        sys.exit(f"cost: {error}")
    for complaint in found:
        print(f"cost: {complaint}", file=sys.stderr)
    if found:
        sys.exit("cost: ./dev cost renews the card; look at what it says before committing it")
