#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the port of linux/ in kernels of our own that watch what is done in them: memory, undefined behaviour, locks,
sleeping, objects' lives and leaks on an emulated 32-bit ARM machine, data races on an emulated PC. Every scenario is
held against the virtual board; three threads use the layer at once; faults that are planted have to be seen, and
nothing else. Prints KTAP; ends with 1 when something is found, and with 77 when a kernel is not to be had.

usage: debug_kernel.py CACHE MADE PMXBOARD OBJECT [MINUTES]
    MINUTES   how long the three threads go on, at least
"""

import functools
import pathlib
import re
import sys

sys.dont_write_bytecode = True

import debian  # noqa: E402
import machines  # noqa: E402
import own  # noqa: E402
import races  # noqa: E402
import run  # noqa: E402

MEMORY = 512
SECONDS = 600  # of a boot: whoever watches takes time
GUEST = run.HERE / "watched.sh"
WATCHED = run.HERE / "watched"
CHECKS = {"scenarios": 2, "threads": 5, "planted": 7, "races": 3}
# Each function of the layer stays by itself, so that reports name it.
APART = "PMX_CXXFLAGS=-fno-inline -fno-ipa-icf"
# What the compiler calls where somebody watches.
INSTRUMENTED = {"debug": ("__asan_load", "__ubsan_"), "kcsan": ("__tsan_read",)}
# Some objects have nothing to look at: pmx_layout.o has no code, and others read no memory, or compute no index.
MOST_UNWATCHED = 8


def objects(folder):
    """The names of the layer's objects, and of those of the port that are in the module: not all are in each."""
    linked = {pathlib.PurePath(word).name for word in (folder / "pmx.mod").read_text(encoding="utf-8").split()}
    port = {f"{path.stem}.o" for path in (run.ROOT / "linux").glob("*.c")}
    layer = {f"{path.stem}.o" for path in (run.ROOT / "src/driver/pmx").glob("*.cpp")}
    return sorted(layer | port & linked)


def unwatched(kernel, folder, calls):
    """A complaint for each watcher whom too few objects of the layer and the port call."""
    for call in calls:
        without = [name for name in objects(folder)
                   if call not in run.run(f"{kernel.machine.cross}nm", "-u", folder / name)]
        if len(without) > MOST_UNWATCHED:
            yield f"{call} is called by none of {', '.join(without)}"


def built(ktap, kernel, folder, name, sources, *variables):
    modules = run.module(kernel, folder, *variables, sources=sources)
    ktap.verdict(f"{name}: pmx.ko of {sources.name}", list(unwatched(kernel, modules, INSTRUMENTED[name])))
    return modules


def booted(kernel, modules, made, part, *options, commands=None, minutes=0):
    archive = run.image(kernel, modules, commands or {}, made, GUEST)
    return run.boot(kernel, archive, made / f"debug-{part}.log", *options, words=f"part={part} minutes={minutes}",
                    memory=MEMORY, seconds=SECONDS + 60 * minutes)


def watch(ktap, title, console, part):
    """What the boot told, scenarios apart."""
    tell_use(console)
    run.checks(ktap, title, console, CHECKS[part])
    ktap.verdict(f"{title} boot", run.parsed(console)[1])


def tell_use(console):
    """What three threads did."""
    for line in console:
        told = re.match(r"# (\d+ calls, \d+ expiries)$", line)
        if told:
            print(f"# three threads: {told[1]}", flush=True)


def look(ktap, cache, made, program, minutes):
    """Everything but data races, which take a kernel of their own."""
    kernel = own.kernel(cache, machines.ARM, "debug", debian.kernel(cache))
    recorded = built(ktap, kernel, made / "debug-recorded", "debug", run.HERE / "module")
    watched = built(ktap, kernel, made / "debug-watched", "debug", WATCHED)
    commands, expected = run.prepared(ktap, program)
    console = booted(kernel, recorded, made, "scenarios", *run.VIRTUAL_TIME, commands=commands)
    run.compare(ktap, "watched:", expected, console)
    run.checks(ktap, "watched:", console, CHECKS["scenarios"])
    watch(ktap, "three threads:", booted(kernel, watched, made, "threads", "-smp", "2", minutes=minutes), "threads")
    watch(ktap, "planted:", booted(kernel, watched, made, "planted", *run.VIRTUAL_TIME), "planted")


def look_for_races(ktap, cache, made):
    kernel = own.kernel(cache, machines.PC, "kcsan", debian.kernel(cache / "amd64", machines.PC))
    watched = built(ktap, kernel, made / "races", "kcsan", WATCHED, APART)
    console = booted(kernel, watched, made, "races", "-smp", "2")
    watch(ktap, "races:", console, "races")
    races.judge(ktap, console)


def debug(minutes, ktap, cache, made, program, _shipped):
    try:
        look(ktap, cache, made, program, minutes)
        look_for_races(ktap, cache, made)
    except own.Broken as reason:
        raise run.Failed(str(reason)) from reason


if __name__ == "__main__":
    sys.exit(run.carried_out(functools.partial(debug, int((sys.argv[5:] or [0])[0])), sys.argv[1:5]))
