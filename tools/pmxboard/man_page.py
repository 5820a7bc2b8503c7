#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes the manual page from what the tool's --help, and that of each sub-command, say. What no help tells, the
environment and where things are, stands here.

usage: man_page.py TOOL DATE FILE    DATE as in 2026-11-22
"""

import datetime
import pathlib
import re
import subprocess
import sys

DESCRIPTION_COLUMN = 30  # of the help
ENTRY = re.compile(r"  (\S.*?)(?: {2,}(\S.*))?$")

ENVIRONMENT_AND_FILES = r""".Sh ENVIRONMENT
.Bl -tag -width PMXBOARD_GRAPHICS
.It Ev KITTY_WINDOW_ID
Where it is set the terminal takes pictures as kitty does.
.It Ev NO_COLOR
When it is set and not empty, there is no colour but with
.Fl -color Cm always .
.It Ev PMXBOARD_GRAPHICS
How
.Cm shot
draws, where
.Fl -graphics
does not say it.
.It Ev PMXBOARD_HISTORY
The file in which the shell keeps its history; empty for none.
.It Ev TERM
A terminal called
.Ql dumb
gets no colour.
.El
.Sh FILES
.Bl -tag -width indent
.It Pa share/pmx/boards
Descriptions of boards, a directory each.
.It Pa share/pmx/scenarios
Real situations as scenarios.
.It Pa share/pmx/schemas
What the tool's JSON looks like.
.It Pa share/doc/pmx
Guides: the language of scenarios, the board, calling the layer.
.It Pa ~/.local/state/pmxboard/history
History of the shell.
.El
"""
SEE_ALSO = r""".Sh SEE ALSO
.Xr diff 1 ,
.Xr less 1
"""


class NotUnderstood(Exception):
    """A help that has another form than this reads."""


def help_of(tool, *arguments):
    # By its plain name, which the help repeats: a long path would fold its lines elsewhere.
    return subprocess.run(["pmxboard", *arguments, "--help"], executable=tool, capture_output=True, text=True,
                          check=True).stdout


def section(text, heading):
    """The lines below a heading, up to the next blank line."""
    return text.partition(f"\n{heading}:\n")[2].partition("\n\n")[0].splitlines()


def entries(lines):
    """(what stands on the left, its description) of each entry of a list."""
    found = []
    for line in lines:
        entry = ENTRY.fullmatch(line)
        if entry:
            found.append((entry[1], entry[2] or ""))
        elif line.startswith(" " * DESCRIPTION_COLUMN) and found:
            name, description = found[-1]
            found[-1] = (name, f"{description} {line.strip()}".strip())
        else:
            raise NotUnderstood(line)
    return found


def escaped(text):
    """A line of text: backslashes, and what a line must not begin with."""
    text = text.replace("\\", "\\e")
    return r"\&" + text if text.startswith((".", "'")) else text


def sentences(text):
    """Text with each sentence on a line of its own, as the page's readers count on."""
    text = text if text.endswith((".", ":")) else text + "."
    return "".join(escaped(line) + "\n" for line in re.split(r"(?<=[.!?]) (?=[A-Z])", text))


def flag(entry):
    """(names, value, what else is needed) of an option as its help shows it."""
    shown, _, needed = entry.partition(" Needs: ")
    names, _, value = shown.partition(" ")
    return names.split(","), value.removesuffix(" ...").replace(" REQUIRED", ""), needed


def flag_macros(names, value):
    return " , ".join("Fl " + name.removeprefix("-") + (f" Ar {value}" if value else "") for name in names)


def synopsis(name, text):
    lines = [".Nm", f".Cm {name}"]
    for entry, _ in entries(section(text, "Options")):
        names, value, _ = flag(entry)
        if "--help" not in names:
            lines.append(".Op " + flag_macros(names[:1], value))
    usage = re.search(r"^Usage: \S+ \S+ \[OPTIONS\] *(.*)$", text, re.M)
    if not usage:
        raise NotUnderstood(text.partition("\n\n")[0])
    for word in usage[1].split():
        plain = re.fullmatch(r"(\[?)([^.\[\]]+)(\.\.\.)?\]?", word)
        lines.append((".Op Ar " if plain[1] else ".Ar ") + plain[2] + (" ..." if plain[3] else ""))
    return "\n".join(lines) + "\n"


def listed(items):
    """A list of (macros of its tag, text)."""
    rows = "".join(f".It {tag}\n{sentences(text)}" for tag, text in items)
    return f".Bl -tag -width indent\n{rows}.El\n" if rows else ""


def options(text):
    rows = []
    for entry, description in entries(section(text, "Options")):
        names, value, needed = flag(entry)
        rows.append((flag_macros(names, value), description + (f"; with {needed} only" if needed else "")))
    return rows


def positionals(text):
    return [(f"Ar {entry.split()[0]}", description) for entry, description in entries(section(text, "Positionals"))]


def examples(text):
    """(command, explanation) of the examples, and what stands behind them."""
    lines, _, rest = text.partition("\nExamples:\n")[2].partition("\n\n")
    found = []
    for line in lines.splitlines():
        if line.startswith("      ") and found:
            found[-1][1] += (" " if found[-1][1] else "") + line.strip()
        elif re.match(r"  \S", line):
            found.append([line.strip(), ""])
        else:
            raise NotUnderstood(line)
    return found, rest.split("Exit codes: ")


def of_subcommand(name, text):
    about = " ".join(text.partition("\nUsage:")[0].split())
    _, (notes, *_) = examples(text)
    body = f".Ss {name}\n{sentences(about)}" + listed([*positionals(text), *options(text)])
    return body + (".Pp\n" + sentences(" ".join(notes.split())) if notes.split() else "")


def of_examples(text):
    return "".join(f"{sentences(explanation[0].upper() + explanation[1:])}.Bd -literal -offset indent\n"
                   f"{escaped('$ ' + command)}\n.Ed\n.Pp\n" for command, explanation in examples(text)[0])


def page(tool, date):
    overview = help_of(tool)
    name, brief = pathlib.Path(tool).name, overview.splitlines()[0].rstrip(".")
    subcommands = [entry for entry, _ in entries(section(overview, "Subcommands"))]
    helps = {each: help_of(tool, each) for each in subcommands}
    if not helps:
        raise NotUnderstood("no sub-commands")
    day = datetime.date.fromisoformat(date)
    exits = listed([(f"Cm {each}", examples(text)[1][-1].strip()) for each, text in helps.items()])
    return (f".Dd {day:%B} {day.day}, {day.year}\n.Dt {name.upper()} 1\n.Os\n"
            f".Sh NAME\n.Nm {name}\n.Nd {brief[0].lower() + brief[1:]}\n"
            f".Sh SYNOPSIS\n{''.join(synopsis(*each) for each in helps.items())}.Nm\n.Fl -version\n"
            ".Sh DESCRIPTION\n.Nm\nruns the interface layer of the display plane mixer driver on a virtual board, "
            "shows every call that the layer makes to\nthe rest of the stack, and what layer and board hold.\n"
            f"{''.join(of_subcommand(*each) for each in helps.items())}"
            f".Ss Without a sub-command\n{listed(options(overview))}"
            f"{ENVIRONMENT_AND_FILES}.Sh EXIT STATUS\n{exits}"
            f".Sh EXAMPLES\n{''.join(map(of_examples, helps.values()))}".removesuffix(".Pp\n") + SEE_ALSO)


def main():
    tool, date, path = sys.argv[1:]
    try:
        pathlib.Path(path).write_text(page(tool, date), encoding="utf-8")
    except NotUnderstood as error:
        sys.exit(f"man_page.py: {tool} --help has lines in a form that is not known here: {error}")
    return 0


if __name__ == "__main__":
    sys.exit(main())
