#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the layer of an older revision and today's side by side over random operations, and tells what they do
differently: calls and their order, arguments, bytes behind pointers, texts, results, outputs and stored values, and
where stores stand among the calls.

usage: compare_revisions.py --made DIR REVISION [OPTION...]

Options go to the comparing program: --count N, --seed S, --operation NAME, --undisturbed, --no-padding, --all.
"""

import argparse
import pathlib
import subprocess
import sys

sys.dont_write_bytecode = True

import layers  # noqa: E402
import signatures  # noqa: E402
from cost import tree_of  # noqa: E402
from tools import ToolError, run  # noqa: E402


def declarations(root):
    header = root / signatures.platform_functions.LAYER_HEADER
    return {function.name: (function.result, function.declared)
            for function in signatures.platform_functions.functions(header)}


def hold_alike(old_tree, old, new):
    """Layers whose operations or state have another form cannot be compared."""
    before, now = declarations(old_tree), declarations(layers.ROOT)
    changed = sorted(name for name in before.keys() & now.keys() if before[name] != now[name])
    if changed:
        raise layers.Unlike("these operations take or return something else now: " + ", ".join(changed))
    for layer in (old, new):
        layers.hold_state_alike(layer)
    sizes = [layers.state_of(layer) for layer in (old, new)]
    changed = sorted(name for name in sizes[0] if sizes[0][name] != sizes[1][name])
    if changed:
        raise layers.Unlike("these variables have another size now: " + ", ".join(changed))


def main():
    parser = argparse.ArgumentParser(prog="dev compare", description=__doc__.splitlines()[0])
    parser.add_argument("--made", type=pathlib.Path, required=True, help="a directory for what is built")
    parser.add_argument("revision", help="a revision of the repository")
    given, options = parser.parse_known_args()
    made = given.made.resolve()
    name = run("git", "-C", layers.ROOT, "rev-parse", "--short", "--verify", f"{given.revision}^{{commit}}").strip()
    old_tree = tree_of(name, made / "old" / name)
    old = layers.build_layer(old_tree, made / "old" / name)
    new = layers.build_layer(layers.ROOT, made / "new")
    hold_alike(old_tree, old, new)
    program = layers.link(layers.build_harness(made), old, new, made)
    return subprocess.run([program, "--names", name, "now", *options], check=False).returncode


if __name__ == "__main__":
    try:
        sys.exit(main())
    except (ToolError, layers.Unlike) as error:
        sys.exit(f"compare: {error}")
