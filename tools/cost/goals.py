# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What the layer is meant to cost, which goals are missed, and whether each miss is explained."""

import dataclasses
import tomllib

# The paths of a mode change that are measured in a kernel.
CHANGES = {"mode": "another mode", "frequency": "another mode and frequency", "again": "the same again"}
RECORD = ("_arPmxConf", "_arPmxDispPartStatus")


@dataclasses.dataclass(frozen=True)
class Goal:
    name: str     # as explained.toml names it
    text: str     # for people
    limit: int
    found: int
    of: str = ""  # what it was found for

    @property
    def met(self):
        return self.found <= self.limit


def price_limit(goals, operation):
    own = goals["price"]["own"].get(operation)
    if own is not None:
        return own
    return goals["price"]["loop" if operation in goals["loops"]["operations"] else "any"]


def of_sizes(goals, card):
    """The goals for bytes."""
    size, totals = goals["size"], card["totals"]
    counted = {name: row for name, row in card["functions"].items() if name not in goals["stack"]["apart"]}
    largest = max(counted, key=lambda name: (counted[name]["frame"], name))
    deepest = max(counted, key=lambda name: (counted[name]["stack"], name))
    beyond = totals["ram"] - sum(card["ram"].get(name, 0) for name in RECORD)
    apart = ", ".join(f"`{name}`" for name in goals["stack"]["apart"])
    return [Goal("code", "code", size["code"], totals["code"]),
            Goal("texts", "texts stored more than once", 0, len(card["repeated"])),
            Goal("tables", "tables", size["tables"], totals["tables"]),
            Goal("frame", f"largest frame, {apart} apart", size["frame"], counted[largest]["frame"],
                 card["functions"][largest]["label"]),
            Goal("stack", f"worst stack path, {apart} apart", size["stack"], counted[deepest]["stack"],
                 " > ".join(counted[deepest]["through"])),
            Goal("ram", "RAM beyond the record and the handshake status", size["ram"], beyond)]


def of_prices(goals, card):
    """The goals for the price of deciding: each operation's highest."""
    highest = {}
    for path in card["paths"]:
        price = path["layer"] - path["floor"]
        if path["operation"] not in highest or price > highest[path["operation"]][0]:
            highest[path["operation"]] = price, path["kind"]
    return [Goal(operation, "price of deciding", price_limit(goals, operation), price, kind)
            for operation, (price, kind) in highest.items()]


def of_recorder(goals, card):
    """The goals for what recording costs."""
    limits, found = goals["recorder"], card["recorder"]
    return [Goal("recorded call", f"a call, on average of the {found['calls']} of that change", limits["call"],
                 found["call"]),
            Goal("recorded change", "the dearest mode change", limits["change"], found["change"])]


def of_kernel(goals, card):
    """The goals for a mode change in a kernel."""
    return [Goal(f"kernel_{name}", text, goals["in_kernel"][name], card["in_kernel"][name])
            for name, text in CHANGES.items()]


def complaints(every_goal, explanations):
    """Misses that nobody explains, explanations of what is no miss, and such of nothing at all."""
    explained = {}
    for explanation in explanations:
        for name in explanation["goals"]:
            if name in explained:
                yield f"{name} is explained twice"
            explained[name] = explanation["because"]
    names = {goal.name for goal in every_goal}
    for goal in every_goal:
        if not goal.met and goal.name not in explained:
            yield (f"{goal.name}: {goal.found} is more than the goal of {goal.limit}; tools/cost/explained.toml has to "
                   "say what the difference is for")
        if goal.met and goal.name in explained:
            yield f"{goal.name}: {goal.found} meets the goal of {goal.limit}; its explanation is stale"
    yield from (f"{name} is explained, but there is no such goal" for name in explained if name not in names)


def load(path):
    with open(path, "rb") as file:
        return tomllib.load(file)
