#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Proves of each operation of the layer, for all arguments, all contents of the record and all answers of the platform,
what docs/proof.md says; and that faults which are planted in copies of the sources are found. Prints KTAP; ends with 1
when something does not hold, and with 77 when the checker is not to be had.

usage: prove.py CACHE MADE [--faults | --sample NUMBER | --same-as REVISION] [OPERATION...]
    CACHE      folder in which the checker is kept, and what was proved of these very sources
    MADE       folder for all that is written on the way
    --faults   plant every fault of faults.toml
    --sample   plant so many of them, those of the day; 8 when nothing is said
    --same-as  prove instead that operations do what they did in that revision
    OPERATION  prove these alone, and plant the faults that are theirs
"""

import argparse
import concurrent.futures
import contextlib
import os
import pathlib
import shutil
import subprocess
import sys
import time
import tomllib

sys.dont_write_bytecode = True

import checker  # noqa: E402
import figures  # noqa: E402
import harness  # noqa: E402
import promises  # noqa: E402
import same  # noqa: E402
import verdicts  # noqa: E402
import view  # noqa: E402
from ktap import Ktap  # noqa: E402
from verdicts import COMPILER, GUARD, LIMIT, OPTIONS, Verdict  # noqa: E402

HERE = pathlib.Path(__file__).resolve().parent
ROOT = view.ROOT
SKIPPED = 77
KEPT = 4  # trees whose results are kept
TRIES = 3  # to keep one in a folder that another tree may delete
SAMPLE = 8  # faults that are planted in every run
COMPARED = "PMX_SetFormatChangeFlag"  # its faults are told apart in every run: others take minutes each


class Program:
    """The layer of a tree, with what is put around it, as the checker reads it."""

    def __init__(self, cbmc, root, folder, others=None):
        self._cbmc, self._folder = cbmc, folder
        shutil.rmtree(folder, ignore_errors=True)
        folder.mkdir(parents=True)
        sources = view.write(root, folder)
        self._headers = {path.name: path.read_text(encoding="utf-8") for path in (folder / "include").iterdir()}
        alike = others and others._headers == self._headers
        self._harness = others._harness if alike else harness.text(root)
        written = folder / "harness.c"
        written.write_text(self._harness, encoding="utf-8")
        names = [source.name for source in (*sources, written)] + [str(HERE / "surroundings.c")]
        self._texts = {name: (folder / name).read_text(encoding="utf-8") for name in names}
        known = {name for name in names if others._texts.get(name) == self._texts[name]} if alike else ()
        self._preprocessed = {stem: others._preprocessed[stem] if name in known else self._preprocess(name)
                              for name, stem in ((name, pathlib.PurePath(name).stem) for name in names)}
        self.key = verdicts.key(cbmc.version, self._preprocessed.values())
        self._others = others  # a program whose texts and objects are used where they are the same

    def _preprocess(self, name):
        """The same wherever the folder is: what has no fault in it is compiled once."""
        return view.run(*view.PREPROCESS, *view.defines(GUARD), "-Iinclude", f"-I{HERE}", name, cwd=self._folder)

    def _run(self, program, *arguments):
        ran = self._cbmc.run(program, *arguments)
        if ran.returncode != 0:
            raise view.Failed(f"{program} {' '.join(map(str, arguments))}:\n{(ran.stdout + ran.stderr)[-3000:]}")

    def _object(self, stem):
        others = self._others
        if others and others._preprocessed.get(stem) == self._preprocessed[stem]:
            return others._folder / f"{stem}.go"
        text, made = self._folder / f"{stem}.i", self._folder / f"{stem}.go"
        text.write_text(self._preprocessed[stem], encoding="utf-8")
        self._run("goto-cc", *COMPILER, "-c", text, "-o", made)
        return made

    def build(self):
        objects = [self._object(stem) for stem in self._preprocessed]
        self._run("goto-cc", *COMPILER, *objects, "-o", self._folder / "whole")

    def check(self, operation, world=None):
        """What the checker says of an operation, in every world or in one."""
        entry = f"{world}_{operation}" if world else f"{harness.ENTRY}{operation}"
        ends = sum(harness.ends(self._harness, operation, each) for each in ([world] if world else harness.WORLDS))
        try:
            ran = self._cbmc.run("cbmc", self._folder / "whole", *OPTIONS, "--function", entry, timeout=LIMIT)
        except subprocess.TimeoutExpired:
            return Verdict("", ends, f"the checker took longer than {LIMIT} s")
        return Verdict(ran.stdout, ends, (ran.stdout + ran.stderr)[-300:])


def last_used(folder):
    """When a folder was used; one that another tree has deleted meanwhile is the oldest."""
    try:
        return folder.stat().st_mtime
    except FileNotFoundError:
        return 0.0


class Results:
    """What was proved before of the same text. Other trees keep theirs beside it; the oldest goes."""

    def __init__(self, folder, key):
        self._folder = folder / key
        self._folder.mkdir(parents=True, exist_ok=True)
        with contextlib.suppress(FileNotFoundError):
            os.utime(self._folder)
        for other in sorted(folder.iterdir(), key=last_used)[:-KEPT]:
            shutil.rmtree(other, ignore_errors=True)

    def get(self, operation):
        try:
            number = (self._folder / operation).read_text(encoding="utf-8").strip()
        except FileNotFoundError:
            return None
        return int(number) if number.isdigit() else None  # a file that was cut short is none

    def keep(self, operation, number):
        """What another tree deletes again and again, for it is the oldest, is not kept, and is proved once more."""
        for _ in range(TRIES):
            with contextlib.suppress(FileNotFoundError):
                self._folder.mkdir(parents=True, exist_ok=True)
                unfinished = self._folder / f"{operation}.unfinished"
                unfinished.write_text(f"{number}\n", encoding="utf-8")
                unfinished.rename(self._folder / operation)
                return


def prove(program, results, operation):
    """(number of checks, what is wrong, seconds; none when it was proved before)"""
    number = results.get(operation)
    if number:
        return number, [], None
    began = time.monotonic()
    verdict = program.check(operation)
    if not verdict.wrong:
        results.keep(operation, verdict.number)
    return verdict.number, verdict.wrong, time.monotonic() - began


def all_faults():
    return tomllib.loads((HERE / "faults.toml").read_text(encoding="utf-8"))["fault"]


def faulty(fault):
    """The text of a source with a fault in it."""
    text = (ROOT / view.LAYER / fault["file"]).read_text(encoding="utf-8")
    if text.count(fault["from"]) != 1:
        raise view.Failed(f"{fault['file']} has {text.count(fault['from'])} times: {fault['from']}")
    return text.replace(fault["from"], fault["to"])


def planted(fault, folder):
    """A copy of the sources with a fault in it."""
    shutil.rmtree(folder, ignore_errors=True)
    shutil.copytree(ROOT / "src", folder / "src")
    (folder / view.LAYER / fault["file"]).write_text(faulty(fault), encoding="utf-8")
    return folder


def seen_as(fault, verdict):
    """Where a fault was seen, in the words and the file that are noted with it; or nothing."""
    return next((f"{place}: {words}" for place, words in verdict.failed
                 if fault["seen"] in words and fault.get("at", "") in place), "")


def told_apart(today, fault, folder, number):
    """What is wrong with telling a layer with a fault from one without; nothing when they are found to differ."""
    try:
        found = today.against(planted(fault, folder / "tree"), f"{number}", fault["operation"])
    except (view.Failed, same.Unlike) as reason:
        return str(reason).splitlines()
    return [] if found.how == "differs" else [f"held against today's layer: {same.WORDS[found.how]}", *found.why]


def refactorings():
    return tomllib.loads((HERE / "refactorings.toml").read_text(encoding="utf-8"))["refactoring"]


def find(base, cbmc, fault, folder):
    """What is wrong with finding a fault, and what was seen of it."""
    try:
        program = Program(cbmc, planted(fault, folder / "tree"), folder / "view", base)
        program.build()
        verdict = program.check(fault["operation"], fault.get("world", harness.WORLDS[0]))
    except view.Failed as reason:
        return str(reason).splitlines(), ""
    seen = seen_as(fault, verdict)
    return [] if seen else [f"it was not seen as: {fault['seen']}", *verdict.wrong], seen


def sample(faults, number, turn):
    """So many faults that are spread over the list, in each turn others. A quarter each is from the worlds in which
    somebody acts, as far as they have so many."""
    theirs = {world: [fault for fault in faults if fault.get("world", harness.WORLDS[0]) == world]
              for world in harness.WORLDS}
    share = {world: min(len(theirs[world]), number // 4) for world in harness.WORLDS[1:]}
    share[harness.WORLDS[0]] = min(len(theirs[harness.WORLDS[0]]), number - sum(share.values()))
    return [theirs[world][(turn + each * len(theirs[world]) // share[world]) % len(theirs[world])]
            for world in harness.WORLDS for each in range(share[world])]


def in_turn(pool, work, things):
    """(thing, what became of it), in their order."""
    begun = [(thing, pool.submit(work, thing)) for thing in things]
    for thing, future in begun:
        yield thing, future.result()


def the_view(ktap, folder):
    """What is proved compiles to the layer's own code."""
    shutil.rmtree(folder, ignore_errors=True)
    view.write(ROOT, folder)
    number, different = view.disagreements(ROOT, folder)
    wrong = [f"{name}: no compiler makes the same of source and view" for name in different]
    ktap.verdict(f"view: {number} functions and tables compile to the layer's own",
                 wrong if number else ["there are none"])


def the_operations(ktap, pool, program, results, names):
    """How many checks were made of the operations."""
    total, before = 0, 0
    for name, (number, wrong, seconds) in in_turn(pool, lambda name: prove(program, results, name), names):
        how = "proved before" if seconds is None else f"{seconds:.1f} s"
        ktap.verdict(f"{name}: {number} checks, {how}", wrong)
        total, before = total + number, before + (seconds is None)
    print(f"# {len(names)} operations, {before} of them proved before; {total} checks")
    return total


def the_faults(ktap, pool, program, cbmc, faults, folder):
    numbered = list(enumerate(faults))
    found = in_turn(pool, lambda each: find(program, cbmc, each[1], folder / f"fault-{each[0]}"), numbered)
    for (_, fault), (wrong, seen) in found:
        ktap.verdict(f"fault: {fault['what']}: {seen or fault['operation']}", wrong)


def the_comparison(ktap, pool, cbmc, faults, names, folder):
    """Layers with faults are told from today's, and refactored ones are not."""
    compared = [fault for fault in faults if fault["operation"] == COMPARED]
    changes = [change for change in refactorings() if change["operation"] in names]
    if not compared and not changes:
        return
    today = same.Today(cbmc, folder / "same")
    numbered = list(enumerate(compared))
    told = in_turn(pool, lambda each: told_apart(today, each[1], folder / f"told-{each[0]}", each[0]), numbered)
    for (_, fault), wrong in told:
        ktap.verdict(f"told apart: {fault['what']}: {fault['operation']}", wrong)
    for number, change in enumerate(changes):
        tree = planted(change, folder / f"refactored-{number}")
        found = today.against(tree, f"refactored-{number}", change["operation"])
        wrong = [] if found.how == "proved" else [same.WORDS[found.how], *found.why]
        ktap.verdict(f"refactored, and the same: {change['what']}: {change['operation']}", wrong)


def carry_out(ktap, chosen, names, faults):
    cbmc = checker.Checker(chosen.cache / "checker")
    made = chosen.made.resolve()
    the_view(ktap, made / "view")
    program = Program(cbmc, ROOT, made / "whole")
    program.build()
    day = int(time.time()) // 86400
    planting = faults if chosen.faults or chosen.operation else sample(faults, chosen.sample, day)
    with concurrent.futures.ThreadPoolExecutor(len(os.sched_getaffinity(0))) as pool:
        checks = the_operations(ktap, pool, program, Results(chosen.cache / "proved", program.key), names)
        if not checks:
            ktap.verdict("proof", ["nothing was proved"])
        the_faults(ktap, pool, program, cbmc, planting, made)
        the_comparison(ktap, pool, cbmc, faults, names, made)
    if not chosen.operation:
        figures.note("prove", operations=len(names), checks=checks, faults=len(faults))
    which = f", those of day {day}" if planting != faults else ""
    print(f"# {len(planting)} of {len(faults)} faults planted{which}")


def compare(ktap, chosen, names):
    cbmc = checker.Checker(chosen.cache / "checker")
    with concurrent.futures.ThreadPoolExecutor(len(os.sched_getaffinity(0))) as pool:
        same.with_revision(ktap, cbmc, pool, chosen.same_as, names, chosen.made.resolve())


def asked_for(words):
    """(what was asked for, the operations to prove, the faults that are theirs)"""
    parser = argparse.ArgumentParser(usage="./dev prove [--faults | --sample NUMBER | --same-as REVISION] "
                                           "[OPERATION...]", add_help=False)
    parser.add_argument("cache", type=pathlib.Path)
    parser.add_argument("made", type=pathlib.Path)
    parser.add_argument("--faults", action="store_true")
    parser.add_argument("--sample", type=int, default=SAMPLE)
    parser.add_argument("--same-as", metavar="REVISION")
    parser.add_argument("operation", nargs="*")
    chosen = parser.parse_intermixed_args(words)  # the option may stand in front of the operations
    if chosen.same_as and (chosen.faults or chosen.sample != SAMPLE):
        parser.error("--same-as plants no faults")
    if chosen.sample < 1:
        parser.error("--sample: at least 1")
    names = [function.name for function in harness.operations(ROOT)]
    for name in chosen.operation:
        if name not in names:
            parser.error(f"no such operation: {name}")
    names = chosen.operation or names
    return chosen, names, [fault for fault in all_faults() if fault["operation"] in names]


def main():
    chosen, names, faults = asked_for(sys.argv[1:])
    began, skipped, ktap = time.monotonic(), False, Ktap()
    try:
        if chosen.same_as:
            compare(ktap, chosen, names)
        else:
            carry_out(ktap, chosen, names, faults)
    except checker.Unavailable as reason:
        ktap.skip("proof", str(reason).replace("\n", " "))
        skipped = True
    except (view.Failed, promises.Unclear, same.Unlike) as reason:
        ktap.verdict("proof", str(reason).splitlines())
    ktap.end()
    spent = os.times()
    print(f"# {time.monotonic() - began:.0f} s, {spent.children_user + spent.children_system:.0f} s of processors")
    return 1 if ktap.failures else SKIPPED if skipped else 0


if __name__ == "__main__":
    sys.exit(main())
