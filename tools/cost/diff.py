# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What a change has cost: two trees measured alike, symbol by symbol and path by path."""

import card as cards


def _changed(before, now):
    """Rows that differ: name, old, new; the largest change first."""
    rows = [(name, before.get(name, 0), now.get(name, 0)) for name in {**before, **now}]
    return sorted((row for row in rows if row[1] != row[2]), key=lambda row: (-abs(row[2] - row[1]), row[0]))


def _lines(title, before, now, name_of=None):
    rows = _changed(before, now)
    if not rows:
        return [f"{title}: no change"]
    lines = [f"{title:<58}{'before':>8}{'now':>8}{'change':>8}"]
    for name, old, new in rows:
        shown = (name_of or {}).get(name, name)
        note = "  new" if name not in before else "  gone" if name not in now else ""
        lines.append(f"  {shown:<56}{old:>8}{new:>8}{new - old:>+8}{note}")
    return lines


def _by_path(card, value):
    return {f"{path['operation']} {path['kind']}": value(path) for path in card["paths"]}


def text(before, now):
    """A table for people."""
    lines = [*_lines("bytes in all", before["totals"], now["totals"]), "",
             *_lines("bytes in a kernel", before["kernel"], now["kernel"])]
    for kind, title in (("functions", "code, by function"), ("tables", "tables"), ("ram", "RAM")):
        of = [{name: row["code"] if kind == "functions" else row for name, row in card[kind].items()}
              for card in (before, now)]
        lines += ["", *_lines(title, *of, cards.plain_names({**of[0], **of[1]}))]
    recorders = [card["recorder"].get("functions", {}) for card in (before, now)]
    lines += ["", *_lines("instructions in the recorder, by function", *recorders)]
    stacks = [{name: row["stack"] for name, row in card["functions"].items()} for card in (before, now)]
    lines += ["", *_lines("worst stack, by function", *stacks, cards.plain_names({**stacks[0], **stacks[1]}))]
    for title, value in (("calls of the platform, by path", lambda path: path["calls"]),
                         ("register accesses", lambda path: path["registers"]),
                         ("log lines", lambda path: path["logs"]),
                         ("instructions in the layer, by path", lambda path: path["layer"]),
                         ("price of deciding, by path", lambda path: path["layer"] - path["floor"])):
        lines += ["", *_lines(title, _by_path(before, value), _by_path(now, value))]
    return "\n".join(lines) + "\n"
