# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The paths that are measured: for each operation a cheapest and a dearest one, written in the scenario language.

    [PMX_SetTvType cheapest]
    PMX_SetTvType 1 PMX_TV_TYPE_PAL

Further paths of an operation, of interest for themselves, have names of their own.

The last line of a path is the one that is measured; those before it make its situation. A path that does not begin with
`power-on` begins with `power-on` and `PMX_Init`. An operation with one path alone has it under `only`; one that stands
nowhere has the example that the tool shows for it.
"""

import dataclasses
import re

KINDS = ("cheapest", "dearest", "only")


@dataclasses.dataclass(frozen=True)
class Path:
    operation: str
    kind: str
    set_up: tuple
    line: str
    number: int  # line of its heading

    @property
    def name(self):
        return f"{self.operation} {self.kind}"

    @property
    def lines(self):
        first = (*self.set_up, self.line)[0]
        return (*(() if first.startswith("power-on") else ("power-on", "PMX_Init")), *self.set_up, self.line)


class PathError(Exception):
    """The table of paths is not what it should be."""


def read(text, operations, examples=None):
    """All paths of a table, held against the names of all operations. `examples`: (lines before it, line) of each."""
    sections = []
    for number, line in enumerate(text.splitlines(), start=1):
        line = line.split("#", 1)[0].strip()
        heading = re.fullmatch(r"\[(\w+) ([a-z-]+)\]", line)
        if heading:
            sections.append((heading[1], heading[2], [], number))
        elif line and not sections:
            raise PathError(f"{number}: a line before the first heading")
        elif line:
            sections[-1][2].append(line)
    paths = [_path(*section) for section in sections]
    listed = {path.operation for path in paths}
    paths += [Path(operation, "only", ("power-on", *before), line, 0)
              for operation, (before, line) in (examples or {}).items() if operation not in listed]
    _check(paths, operations)
    return paths


def _path(operation, kind, lines, number):
    if not lines:
        raise PathError(f"{number}: no lines")
    if lines[-1].split()[0] != operation:
        raise PathError(f"{number}: the last line calls {lines[-1].split()[0]}, not {operation}")
    return Path(operation, kind, tuple(lines[:-1]), lines[-1], number)


def _check(paths, operations):
    found = {}
    for path in paths:
        if path.operation not in operations:
            raise PathError(f"{path.number}: {path.operation} is no operation of the layer")
        if path.kind in found.setdefault(path.operation, []):
            raise PathError(f"{path.number}: {path.name} stands here twice")
        found[path.operation].append(path.kind)
    for operation in operations:
        kinds = [kind for kind in KINDS if kind in found.get(operation, [])]
        if kinds not in (["cheapest", "dearest"], ["only"]):
            raise PathError(f"{operation} has {' and '.join(kinds) or 'no path'}; it needs a cheapest and a dearest "
                            "path, or an only one")
