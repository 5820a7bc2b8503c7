#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Plants small faults in the layer, one after the other, and tells those that no test sees. What was found is kept, and
found once for the same layer and the tests that it hangs on. Ends with 1 when one survives that is not on the list of
equivalents.

usage: mutate.py CACHE MADE [--seed S] [--jobs N] [NUMBER | WORD...]
       mutate.py CACHE MADE --show NAME
    CACHE     folder in which verdicts are kept
    MADE      the build's folder, with settings.json
    NUMBER    plant so many, spread over kinds and files; none: all
    WORD      plant those whose names have one of these in them
    --seed    draw others
    --jobs    plant so many at once; without it, as many as there are processors
    --show    print what a mutant changes
"""

import argparse
import collections
import concurrent.futures
import difflib
import hashlib
import json
import os
import pathlib
import queue
import sys
import threading
import time

sys.dont_write_bytecode = True
sys.path.append(str(pathlib.Path(__file__).resolve().parents[1] / "common"))

import figures  # noqa: E402
import kill  # noqa: E402
import mutants  # noqa: E402
from mutants import Failed  # noqa: E402

EQUIVALENT = pathlib.Path(__file__).resolve().parent / "equivalent.txt"
VERDICTS = ("killed", "hung", "refused", "same code", "survived")
TOLD_EVERY = 30  # seconds


def read_equivalents(path):
    """By name, why nobody can tell the mutant from the layer."""
    found = {}
    for number, line in enumerate(path.read_text(encoding="utf-8").splitlines(), start=1):
        if not line or line.startswith("#"):
            continue
        name, _, reason = line.partition(" ")
        if len(reason.split()) < 3:
            raise Failed(f"{path.name}:{number}: {name} has no reason")
        if name in found:
            raise Failed(f"{path.name}:{number}: {name} stands there twice")
        found[name] = reason.strip()
    return found


def gone(equivalents, all_mutants):
    names = {mutant.name for mutant in all_mutants}
    return [f"{name} is on the list of equivalents, and there is no such mutant" for name in equivalents
            if name not in names]


def sample(all_mutants, number, seed):
    """So many, turn by turn of each kind in each file. One more or less in a file changes little of the rest."""
    heaps = collections.defaultdict(list)
    for mutant in all_mutants:
        heaps[mutant.kind, mutant.file].append(mutant)

    def drawn(text):
        return hashlib.sha256(f"{seed} {text}".encode()).digest()

    for heap in heaps.values():
        heap.sort(key=lambda mutant: drawn(mutant.name), reverse=True)
    chosen, turn = [], sorted(heaps, key=drawn)
    while turn and len(chosen) < number:
        chosen += [heaps[each].pop() for each in turn]
        turn = [each for each in turn if heaps[each]]
    return chosen[:number]


class Texts:
    """Of the layer's files, each read once."""

    def __init__(self, layer):
        self._texts = {path.name: path.read_text(encoding="utf-8") for path in layer.glob("*.[ch]*")}

    def __getitem__(self, file):
        return self._texts[file]

    def change(self, mutant):
        before = self[mutant.file]
        return "".join(difflib.unified_diff(before.splitlines(True), mutant.applied(before).splitlines(True),
                                            mutant.file, mutant.name, n=2))

    def shortly(self, mutant):
        text = self[mutant.file]
        line = text.count("\n", 0, mutant.start) + 1
        was, becomes = (" ".join(each.split()) for each in (text[mutant.start:mutant.end], mutant.text))
        return f"{mutant.name}\n    {mutant.file}:{line}: {was[:100]}  =>  {becomes[:100]}"


class Results:
    """Verdicts, one a line; a line that was not written to its end is none. One counts as long as the layer is what it
    was, and what the verdict hangs on of the tests."""

    def __init__(self, folder, key, digest):
        folder.mkdir(parents=True, exist_ok=True)
        self._path, self._key, self._digest = folder / "results.jsonl", key, digest
        self._lock, self._kept = threading.Lock(), {}
        text = self._path.read_text(encoding="utf-8") if self._path.exists() else ""
        if text and not text.endswith("\n"):
            with self._path.open("a", encoding="utf-8") as file:
                file.write("\n")
        for line in text.splitlines():
            try:
                result = json.loads(line)
                self._kept[result["key"]] = result
            except (ValueError, KeyError):
                continue

    def get(self, mutant):
        result = self._kept.get(self._of(mutant))
        return result if result and result.get("tests") == self._digest(result["verdict"], result["by"]) else None

    def all(self):
        return list(self._kept.values())

    def _of(self, mutant):
        return kill.key_of(self._key, mutant)

    def keep(self, mutant, verdict, seen, seconds):
        result = {"key": self._of(mutant), "name": mutant.name, "verdict": verdict, "by": seen,
                  "tests": self._digest(verdict, seen), "seconds": round(seconds, 3)}
        with self._lock, self._path.open("a", encoding="utf-8") as file:
            file.write(json.dumps(result) + "\n")
            self._kept[result["key"]] = result
        return result


class Campaign:
    """Plants mutants, as many at once as there are processors."""

    def __init__(self, settings, made, prepared, results, texts):
        self._settings, self._made, self._prepared = settings, made, prepared
        self._results, self._texts = results, texts
        self._benches, self._told = queue.SimpleQueue(), time.monotonic()

    def _plant(self, mutant):
        bench, began = self._benches.get(), time.monotonic()
        _, cases, tests = self._prepared
        try:
            verdict, seen = bench.judge(mutant, mutant.applied(self._texts[mutant.file]), cases, tests)
        finally:
            self._benches.put(bench)
        return self._results.keep(mutant, verdict, seen, time.monotonic() - began)

    def _tell(self, result, number, whole):
        if result["verdict"] == "survived":
            print(f"survived: {result['name']}", file=sys.stderr)
        if time.monotonic() - self._told > TOLD_EVERY:
            self._told = time.monotonic()
            print(f"{number} of {whole}", file=sys.stderr)

    def carry_out(self, chosen, workers):
        """Tells each that survives when it has."""
        if not chosen:
            return
        originals, cases, _ = self._prepared
        for result in self._results.all():
            if result["by"]:
                cases.note(*result["name"].split(":")[:2], kill.plain(result["by"]))
                cases.note_before(result["name"], result["by"])
        for number in range(workers):
            self._benches.put(kill.Bench(self._settings, self._made / f"bench-{number}", originals))
        with concurrent.futures.ThreadPoolExecutor(workers) as pool:
            planted = [pool.submit(self._plant, mutant) for mutant in chosen]
            try:
                for number, future in enumerate(concurrent.futures.as_completed(planted), start=1):
                    self._tell(future.result(), number, len(chosen))
            except BaseException:
                pool.shutdown(cancel_futures=True)
                raise


def summary(results, spent, planted):
    """How many there were of each kind, and what became of them."""
    kinds = collections.defaultdict(collections.Counter)
    for mutant, result in results:
        for kind in (mutant.kind, "all"):
            kinds[kind][result["verdict"]] += 1
    print(f"{'':10}" + "".join(f"{verdict:>10}" for verdict in VERDICTS))
    for kind in (*mutants.KINDS, "all"):
        if kinds[kind]:
            print(f"{kind:10}" + "".join(f"{kinds[kind][verdict]:10}" for verdict in VERDICTS))
    each = f", {sum(result['seconds'] for result in planted) / len(planted):.2f} s each" if planted else ""
    print(f"{len(results)} mutants, {len(results) - len(planted)} of them judged before; {spent:.0f} s{each}")


def verdict_on(results, equivalents, texts):
    """What is wrong."""
    wrong = []
    for mutant, result in results:
        listed, survived = mutant.name in equivalents, result["verdict"] in ("survived", "same code")
        if result["verdict"] == "survived" and not listed:
            wrong.append(f"survived: {texts.shortly(mutant)}")
        if listed and not survived:
            wrong.append(f"{mutant.name} is on the list of equivalents, and {result['by'] or 'the compiler'} sees it")
    return wrong


def chosen_of(all_mutants, arguments):
    words = arguments.what
    if len(words) == 1 and words[0].isdigit():
        print(f"drawn with --seed {arguments.seed}")
        return sample(all_mutants, int(words[0]), arguments.seed)
    chosen = [mutant for mutant in all_mutants if not words or any(word in mutant.name for word in words)]
    if not chosen:
        raise Failed(f"no mutant's name has this in it: {' '.join(words)}")
    return sample(chosen, len(chosen), arguments.seed)  # well mixed: whoever stops has seen something of all


def show(all_mutants, name, texts):
    for mutant in all_mutants:
        if mutant.name == name:
            print(texts.change(mutant), end="")
            return 0
    raise Failed(f"there is no mutant {name}")


def asked_for(words):
    parser = argparse.ArgumentParser(usage="./dev mutate [--seed S] [--jobs N] [NUMBER | WORD...] | --show NAME",
                                     add_help=False)
    parser.add_argument("cache", type=pathlib.Path)
    parser.add_argument("made", type=pathlib.Path)
    parser.add_argument("--seed", type=int, default=1)
    parser.add_argument("--jobs", type=int, default=len(os.sched_getaffinity(0)))
    parser.add_argument("--show")
    parser.add_argument("--equivalents", type=pathlib.Path, default=EQUIVALENT)
    parser.add_argument("what", nargs="*")
    return parser.parse_intermixed_args(words)


def carry_out(arguments):
    began = time.monotonic()
    settings = kill.Settings(arguments.made / "settings.json")
    (all_mutants, users), texts = mutants.of_layer(settings.layer, settings.read), Texts(settings.layer)
    if arguments.show:
        return show(all_mutants, arguments.show, texts)
    equivalents = read_equivalents(arguments.equivalents)
    made = arguments.made.resolve()
    prepared = kill.prepare(settings, made, users)
    results = Results(arguments.cache, settings.layer_key(), prepared[1].digest)
    chosen = chosen_of(all_mutants, arguments)
    new = [mutant for mutant in chosen if not results.get(mutant)]
    Campaign(settings, made, prepared, results, texts).carry_out(new, max(1, arguments.jobs))
    judged = [(mutant, results.get(mutant)) for mutant in chosen]
    wrong = gone(equivalents, all_mutants) + verdict_on(judged, equivalents, texts)
    for line in wrong:
        print(line)
    if arguments.equivalents == EQUIVALENT:
        figures.note("mutate", mutants=len(all_mutants), equivalent=len(equivalents))
    summary(judged, time.monotonic() - began, [results.get(mutant) for mutant in new])
    return 1 if wrong else 0


def main():
    try:
        return carry_out(asked_for(sys.argv[1:]))
    except Failed as reason:
        print(f"mutate: {reason}", file=sys.stderr)
        return 1


if __name__ == "__main__":
    sys.exit(main())
