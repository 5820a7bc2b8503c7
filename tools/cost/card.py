# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The cost card: everything that was measured as one object, and the document that people read."""

import json
import textwrap

import arm
import goals as goal_list
import signatures
from tools import run, version

HOST, TARGET = "g++", arm.COMPILER
KINDS = ("code", "texts", "tables", "ram")


def compilers():
    return {"host": version(HOST), "target": version(TARGET)}


def plain_names(names):
    """Symbols as people call them: without parameters and without what the compiler hung on."""
    names = list(names)
    if not names:
        return {}
    plain = run("c++filt", "-p", input="\n".join(names)).splitlines()
    return {name: text.split(" [clone")[0] for name, text in zip(names, plain, strict=True)}


def _functions(sizes):
    graph = sizes.graph
    titles = {title.rsplit(":", 1)[-1]: title for title in graph.frames}
    rows = {}
    for name, code in sizes.code.items():
        title = titles[name]
        worst = graph.worst(title)
        rows[name] = {"label": graph.labels[title], "code": code, "texts": sizes.texts.get(name, 0),
                      "frame": graph.frames[title], "stack": worst.bytes, "through": list(worst.names)}
    return rows


def make(paths, counts, sizes, recorder, in_kernel):
    """The card as an object that can be written as JSON."""
    rows = []
    for path in paths:
        count = counts[path.name]
        rows.append({"operation": path.operation, "kind": path.kind, "line": path.line, "after": list(path.set_up),
                     "calls": count.calls, "registers": count.registers, "logs": count.logs, "layer": count.layer,
                     "floor": count.floor})
    return {"compilers": compilers(), "totals": {**sizes.totals, "heap": 0}, "kernel": sizes.kernel,
            "files": sizes.files,
            "functions": _functions(sizes), "tables": sizes.tables, "ram": sizes.ram, "repeated": sizes.repeated,
            "indirect": [list(row) for row in sizes.graph.indirect], "recorder": recorder, "paths": rows,
            "in_kernel": in_kernel}


def as_json(card):
    """The card with each entry on a line of its own, so that a difference shows what was measured otherwise."""
    parts = []
    for name, part in card.items():
        if isinstance(part, dict):
            entries, brackets = [f"{json.dumps(key)}: {json.dumps(value)}" for key, value in part.items()], "{}"
        else:
            entries, brackets = [json.dumps(entry) for entry in part], "[]"
        lines = "".join(f"\n  {entry}," for entry in entries).removesuffix(",") + ("\n " if entries else "")
        parts.append(f" {json.dumps(name)}: {brackets[0]}{lines}{brackets[1]}")
    return "{\n" + ",\n".join(parts) + "\n}\n"


def _thousands(number):
    return f"{number:,}"


def _table(heads, rows, numbers=()):
    """A Markdown table; the columns in `numbers` are aligned to the right."""
    lines = ["| " + " | ".join(heads) + " |",
             "|" + "|".join("--:" if head in numbers else "---" for head in heads) + "|"]
    return "\n".join([*lines, *("| " + " | ".join(str(cell) for cell in row) + " |" for row in rows)]) + "\n"


def _path(card, operation, kind):
    return next(path for path in card["paths"] if path["operation"] == operation and path["kind"] == kind)


def five_figures(card, goals):
    """What a porting engineer asks for first."""
    totals = card["totals"]
    rom = totals["code"] + totals["texts"] + totals["tables"]
    stack = next(goal for goal in goal_list.of_sizes(goals, card) if goal.name == "stack")
    start, change = _path(card, "PMX_Init", "dearest"), _path(card, "PMX_SetModeEx", "dearest")
    return [
        ("ROM", f"{_thousands(rom)} bytes", f"code {_thousands(totals['code'])}, texts {_thousands(totals['texts'])}, "
                                            f"tables {_thousands(totals['tables'])}"),
        ("RAM", f"{_thousands(totals['ram'])} bytes", "static; heap 0"),
        ("Stack", f"{stack.found} bytes", f"`{stack.of}`; {_apart(card, goals)}"),
        ("Start-up", f"{start['calls']} calls of the platform",
         f"{start['registers']} of them register accesses, {start['logs']} log lines; {start['layer']} instructions in "
         "the layer"),
        ("Dearest mode change", f"{change['calls']} calls of the platform",
         f"{change['registers']} of them register accesses, {change['logs']} log lines; {change['layer']} instructions "
         f"in the layer, {change['layer'] - change['floor']} of them to decide which calls to make"),
    ]


def figure_rows(card, goals):
    return [(f"**{name}**", value, text) for name, value, text in five_figures(card, goals)]


def _apart(card, goals):
    return ", ".join(f"`{name}` {card['functions'][name]['stack']}" for name in goals["stack"]["apart"])


def _goal_rows(every_goal):
    for goal in every_goal:
        of = f" (`{goal.of}`)" if goal.of else ""
        yield goal.text + of, _thousands(goal.limit), _thousands(goal.found), _verdict(goal)


def _verdict(goal):
    return "met" if goal.met else "**missed**"


def _explained(explanations, found):
    for explanation in explanations:
        names = ", ".join(f"`{name}` ({found[name].found}, goal {found[name].limit})" for name in explanation["goals"])
        because = " ".join(explanation["because"].split())
        yield textwrap.fill(f"- {names}: {because}", 118, subsequent_indent="  ", break_long_words=False) + "\n"


def _both(paths, key):
    return " / ".join(_thousands(key(path)) for path in paths)


def _operation_rows(card, goals):
    for operation in signatures.operations():
        named = [path for path in card["paths"] if path["operation"] == operation]
        paths = [path for path in named if path["kind"] in ("cheapest", "dearest", "only")]
        yield (f"`{operation}`", _both(paths, lambda path: path["calls"]),
               _both(paths, lambda path: path["registers"]), _both(paths, lambda path: path["logs"]),
               _both(paths, lambda path: path["layer"]), _both(paths, lambda path: path["floor"]),
               _both(paths, lambda path: path["layer"] - path["floor"]), goal_list.price_limit(goals, operation),
               " / ".join(_line(path) for path in paths))


def _line(path):
    after = path["after"]
    if len(after) > 2:
        return f"`{path['line']}` after {len(after)} lines"
    return f"`{path['line']}`" + (" after " + ", ".join(f"`{line}`" for line in after) if after else "")


def _further_rows(card):
    for path in card["paths"]:
        if path["kind"] not in ("cheapest", "dearest", "only"):
            yield (f"`{path['operation']}`, {path['kind']}", path["calls"], path["registers"], path["logs"],
                   path["layer"], path["floor"], path["layer"] - path["floor"])


def _size_rows(card):
    for operation in signatures.operations():
        row = card["functions"][operation]
        below = " > ".join(row["through"][1:])
        yield (f"`{operation}`", row["code"], row["texts"], row["frame"], row["stack"], f"`{below}`" if below else "")


def _helper_rows(card):
    for name, row in card["functions"].items():
        if name not in signatures.operations():
            yield f"`{row['label']}`", row["code"], row["texts"], row["frame"], row["stack"]


def _kernel_rows(card):
    yield tuple(_thousands(card["kernel"][kind]) for kind in (*KINDS, "unwind"))


def _recorder_rows(card):
    """Functions that cost the same stand together, the dearest first."""
    functions = card["recorder"]["functions"]
    for count in sorted(set(functions.values()), reverse=True):
        yield ", ".join(f"`{name}`" for name, found in functions.items() if found == count), count


def _change_rows(kernel_goals):
    for goal in kernel_goals:
        yield goal.text, *(_thousands(number) for number in (goal.limit, goal.found)), _verdict(goal)


def _console_rows(found):
    yield "nothing", _thousands(found["again"])
    yield "puts its lines aside, at level 0, as [linux](../linux/README.md) does", _thousands(found["again, put aside"])
    yield "prints them by `printk`, at level 0", _thousands(found["again, printed"])


def _objects(listed):
    plain = plain_names(listed)
    return [(f"`{plain[name]}`", _thousands(size))
            for name, size in sorted(listed.items(), key=lambda row: (-row[1], row[0]))]


def render(card, goals, explanations):
    """The document."""
    sizes, prices = goal_list.of_sizes(goals, card), goal_list.of_prices(goals, card)
    missed = [goal for goal in prices if not goal.met]
    changes, in_kernel = goal_list.of_kernel(goals, card), card["in_kernel"]
    found = {goal.name: goal for goal in (*sizes, *prices, *changes, *goal_list.of_recorder(goals, card))}
    explained = [explanation for explanation in explanations if set(explanation["goals"]) <= set(found)]
    figures = _table(("", "", ""), figure_rows(card, goals))
    recording = goal_list.of_recorder(goals, card)
    indirect = ", ".join(f"`{name}` ({place.split(':')[0]})" for name, place in card["indirect"]) or "none"
    executed = ("Operation", "Calls", "Registers", "Log lines", "Layer", "Floor", "Price", "Goal", "Paths")
    further = ("Path", "Calls", "Registers", "Log lines", "Layer", "Floor", "Price")
    sized = ("Operation", "Code", "Texts", "Frame", "Stack", "Below it")
    helper = ("Helper", "Code", "Texts", "Frame", "Stack")
    files = ("File", "Code", "Texts", "Tables", "RAM")
    return f"""# What the layer costs

Written by `./dev cost`, which measures all of it anew; `./dev cost --diff REVISION` shows what a change has cost.

{figures}
Bytes are those of the 32-bit target: Thumb-2, `-Os`. Instructions are those that the host's `-O2` build executes,
counted one by one; they tell how much work there is, and whether it grew.

## Goals

{_table(("Bytes", "Goal", "Found", ""), _goal_rows(sizes), ("Goal", "Found"))}
The price of deciding is at most {goals["price"]["any"]} instructions, \
{goals["price"]["loop"]} where an operation loops over
eight ports or planes, {goals["price"]["own"]["PMX_SetMode"]} for `PMX_SetMode` and \
{goals["price"]["own"]["PMX_SetModeEx"]} for `PMX_SetModeEx`: met by {len(prices) - len(missed)} of {len(prices)}
operations.

{"What the difference is for, where a goal is missed:" if explained else "No goal is missed."}

{"".join(_explained(explained, found))}
## What is counted

- **Calls**: of platform functions, log lines and register accesses included, and of the one function that a video plane
  offers in its table. `memcpy` and `memset` are not among them.
- **Registers**: calls of `x_reg_read32` and `x_reg_write32`. **Log lines**: of `PMX_IsLog`, `Printf` and `UTIL_Printf`.
- **Layer**: instructions executed in the layer's own functions from the call of the operation to its return. The
  platform's functions, `memcpy` and `memset` are not counted.
- **Floor**: what the cheapest possible layer would execute for the same path, one that knows beforehand what will be
  asked and answered: a straight line of the same calls with the same arguments, all of them constants, and the same
  result. It is written from the path's recording, compiled with the product's flags and counted in the same run;
  the run compares every call of both, argument by argument.
- **Price**, layer less floor, is what deciding costs: looking at arguments and at the record, remembering, looping.

Each operation has a cheapest and a dearest path, `/` between their numbers; `tools/cost/paths.txt` has them whole, with
what was done before. Each begins with `power-on` and `PMX_Init` on the default board, unless it has its own `power-on`.
What the platform answers is what the virtual board answered when the path was recorded.

## What each operation executes

{_table(executed, _operation_rows(card, goals), executed[1:-1])}
Further paths of interest:

{_table(further, _further_rows(card), further[1:])}
## What each operation takes

Code is the operation's own function, and what the compiler put into it. Texts are those that it hands on; one that
several functions hand on is stored once, and counts here for each. Stack is frame and worst path below it within the
layer; the platform's functions come on top.

{_table(sized, _size_rows(card), sized[1:-1])}
{_table(helper, _helper_rows(card), helper[1:])}
Calls through a pointer: {indirect}. There is no recursion.

## What each file takes

A text counts for the first file that has it. The linker's alignment makes the sum differ by a few bytes.

{_table(files, [*((f"`{stem}.cpp`", *(_thousands(row[kind]) for kind in KINDS)) for stem, row in card["files"].items()),
                ("**as linked**", *(f"**{_thousands(card['totals'][kind])}**" for kind in KINDS))], files[1:])}
## In a kernel

The form for kernels is in ARM state, optimised for size like the other, and has tables by which a backtrace finds its
way through the layer. They count apart: nothing of the layer looks at them.

{_table(("Code", "Texts", "Tables", "RAM", "Unwind tables"), _kernel_rows(card), ("Code", "Texts", "Tables", "RAM",
"Unwind tables"))}
Instructions of a whole `PMX_SetModeEx` there, with its calls of empty platform functions:

{_table(("Mode change", "Goal", "Found", ""), _change_rows(changes), ("Goal", "Found"))}
For comparison: another mode by the kernel's own display driver for an emulated card, bochs, from system call to
return, takes {_thousands(in_kernel["bochs"])}.

The same again, with a console that does

{_table(("", "Instructions"), _console_rows(in_kernel), ("Instructions",))}
So the console decides what a mode change costs: [what to do about it](porting.md#what-the-console-costs).

Written by `./dev kernel --cost`, in virtual time, in which an instruction takes a nanosecond; measured twice in one
boot of Linux {in_kernel["kernel"]}, with the same result.

## The flight recorder

What [recording](recorder.md) adds to the layer, counted on the 32-bit target, one by one, by an emulator: the layer in
the form for kernels, the recorder in ARM state, `-O2`, {_thousands(card["recorder"]["code"])} bytes of code.
All outputs change their modes, and the dearest of many such changes has a snapshot in it. The product's own functions
for time and thread number are not counted.

{_table(("Instructions", "Goal", "Found", ""), _goal_rows(recording), ("Goal", "Found"))}
{_table(("At most for", "Instructions"), _recorder_rows(card), ("Instructions",))}
## Tables

{_table(("Table", "Bytes"), _objects(card["tables"]), ("Bytes",))}
## RAM

{_table(("Object", "Bytes"), _objects(card["ram"]), ("Bytes",))}
Heap: 0.

## Compilers

- target: `{card["compilers"]["target"]}`
- host: `{card["compilers"]["host"]}`
"""
