#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes a copy of a layer's object with a prefix before every name that it defines, for two of them to fit into one
program. The first of them must not remember more than what is compared; the second must have every operation.

usage: rename.py LAYER PREFIX OUTPUT
"""

import pathlib
import sys

sys.dont_write_bytecode = True

import generate  # noqa: E402
import layers  # noqa: E402
from tools import ToolError  # noqa: E402


def main():
    layer, prefix, output = pathlib.Path(sys.argv[1]), sys.argv[2], pathlib.Path(sys.argv[3])
    if prefix == generate.LAYERS[0]:
        layers.hold_state_alike(layer)
    else:
        layers.hold_literal_complete(layer)
    layers.renamed(layer, prefix, output)


if __name__ == "__main__":
    try:
        main()
    except (ToolError, layers.Unlike) as error:
        sys.exit(f"rename: {error}")
