#!/usr/bin/env python3
"""Holds the manual page against the tool: each sub-command and each option that a --help lists is told there, nothing
that is told is missing in the tool, and mandoc finds nothing wrong with it.

usage: man_page.py TOOL PAGE
"""

import pathlib
import re
import subprocess
import sys

sys.dont_write_bytecode = True

import help_examples  # noqa: E402


def options(help_text):
    """Every name of every option that a help lists."""
    listed = help_text.partition("Options:\n")[2].partition("\n\n")[0]
    return {name for names in re.findall(r"^  (-\S+)", listed, re.M) for name in names.split(",")}


def told(page):
    """(sub-commands, options) of the manual page."""
    subcommands = set(re.findall(r"^\.It Cm (\S+)$", page, re.M))
    flags = set()
    for line in re.findall(r"^\.It (Fl .*)$", page, re.M):
        for name in re.findall(r"Fl (-?[A-Za-z][\w-]*)|, (-[\w-]+)", line):
            flags.add("-" + "".join(name))
    return subcommands, flags


def main():
    tool, path = pathlib.Path(sys.argv[1]).resolve(), pathlib.Path(sys.argv[2])
    subcommands = set(help_examples.subcommands(tool))
    helps = [help_examples.run(tool, *filter(None, [name, "--help"])).stdout for name in ["", *subcommands]]
    known = set().union(*map(options, helps))
    told_subcommands, told_options = told(path.read_text(encoding="utf-8"))
    wrong = [f"{name}: the manual page tells nothing of it"
             for name in sorted((subcommands - told_subcommands) | (known - told_options))]
    wrong += [f"{name}: the tool has no such thing"
              for name in sorted((told_subcommands - subcommands) | (told_options - known))]
    lint = subprocess.run(["mandoc", "-T", "lint", "-W", "warning", path], capture_output=True, text=True, check=False)
    wrong += (lint.stdout + lint.stderr).splitlines()
    print("\n".join(wrong) or f"{path.name}: {len(subcommands)} sub-commands and {len(known)} options are told")
    return 1 if wrong or lint.returncode != 0 or not subcommands or not known else 0


if __name__ == "__main__":
    sys.exit(main())
