# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Holds what is measured against the committed card: calls to the one, bytes and instructions to two in a hundred."""

GROWTH = 0.02
EXACT = ("calls", "registers", "logs")
KINDS = ("code", "texts", "tables", "ram")


def _key(path):
    return f"{path['operation']} {path['kind']}"


def _grew(what, old, new):
    if new > old * (1 + GROWTH):
        yield f"{what}: {old} has grown to {new}"


def operations(old, places):
    """Operations that the card was made without; it cannot be drawn with them."""
    yield from (f"{place}: the card has no {name}" for name, place in places.items() if name not in old["functions"])


def calls(old, new):
    """What a platform sees of each path: it changes only with intent."""
    before, now = ({_key(path): path for path in card["paths"]} for card in (old, new))
    yield from (f"{name}: the card has no such path" for name in now if name not in before)
    yield from (f"{name}: measured no more, and still on the card" for name in before if name not in now)
    for name in (name for name in now if name in before):
        for kind in EXACT:
            if before[name][kind] != now[name][kind]:
                yield f"{name}: {kind} were {before[name][kind]} and are {now[name][kind]}"
        for kind in ("line", "after"):
            if before[name][kind] != now[name][kind]:
                yield f"{name}: the card has another path: {before[name]['line']}"


def instructions(old, new):
    before = {_key(path): path for path in old["paths"]}
    for path in new["paths"]:
        if _key(path) in before:
            yield from _grew(f"{_key(path)}: instructions", before[_key(path)]["layer"], path["layer"])


def sizes(old, new):
    for kind, before in old["kernel"].items():
        yield from _grew(f"{kind} in a kernel", before, new["kernel"][kind])
    for kind in KINDS:
        yield from _grew(f"{kind} in all", old["totals"][kind], new["totals"][kind])
        for stem, row in new["files"].items():
            if stem in old["files"]:  # a new file counts in all of them
                yield from _grew(f"{stem}.cpp: {kind}", old["files"][stem][kind], row[kind])
    for name, row in new["functions"].items():
        before = old["functions"].get(name)
        if before:
            yield from _grew(f"{row['label']}: stack", before["stack"], row["stack"])


def recorder(old, new):
    for kind in ("change", "call", "code"):
        yield from _grew(f"the recorder: {kind}", old["recorder"][kind], new["recorder"][kind])
    for name, before in old["recorder"]["functions"].items():
        yield from _grew(f"the recorder: {name}", before, new["recorder"]["functions"].get(name, 0))


def all_of(old, new):
    """Complaints, and notes on what was not compared."""
    complaints, notes = list(calls(old, new)), []
    for which, compare in (("host", instructions), ("target", sizes), ("target", recorder)):
        if old["compilers"][which] == new["compilers"][which]:
            complaints += compare(old, new)
        else:
            notes.append(f"{compare.__name__} are not compared: the card is of {old['compilers'][which]}, here is "
                         f"{new['compilers'][which]}")
    return complaints, notes
