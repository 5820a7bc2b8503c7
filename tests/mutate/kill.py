# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What becomes of a mutant: one source is compiled, linked with the others and with tests that were linked together
before, and the tests run, those first that are likely to see it. One mutant at a time: tables, types and what the
compiler computes are mutated like all else, and one that does not compile spoils no other."""

import collections
import contextlib
import hashlib
import json
import os
import pathlib
import re
import resource
import shutil
import signal
import subprocess
import threading

from mutants import Failed

STARTED = re.compile(r"^\[ RUN      \] (\S+)\.(\S+)$", re.M)
FAILED = re.compile(r"^\[  FAILED  \] (\S+)\.([^\s,]+)", re.M)
FINISHED = re.compile(r"^\[-+\] \d+ tests? from ([^\s,]+)(?:, .*)? \((\d+) ms total\)$", re.M)
FIRST, QUICK, SLOWER = 0.015, 0.1, 0.4  # parts of the time of all: what runs first, next, and then
MOST_PRINTED = 50_000_000  # bytes
MOST_MEMORY = 4_000_000_000


class Settings:
    """How the layer is compiled, and what it is linked with: as the build says."""

    def __init__(self, path):
        told = json.loads(path.read_text(encoding="utf-8"))
        self.root, self.layer = pathlib.Path(told["root"]), pathlib.Path(told["layer"])
        self.read, self.compile, self.product = told["read"], told["compile"], told["product"]
        self.link, self.programs, self.behind = told["link"], told["programs"], told["behind"]
        self.sources = sorted(self.layer.glob("*.cpp"))

    def key(self):
        """What the verdicts hang on, but for the mutant."""
        digest = hashlib.sha256(json.dumps([self.compile, self.product, self.link, self.behind]).encode())
        tests = [pathlib.Path(path) for _, path in sorted(self.programs.items())]
        for path in [*tests, *sorted(self.layer.glob("*.[ch]*")), *sorted(self.root.glob("src/*/*inc/*.h"))]:
            digest.update(hashlib.sha256(path.read_bytes()).digest())
        return digest.hexdigest()


def key_of(settings_key, mutant):
    return hashlib.sha256(f"{settings_key} {mutant}".encode()).hexdigest()[:24]


class Suites:
    """How long each suite of each program takes, and which have seen what."""

    def __init__(self, seconds):
        self._seconds, self._lock, self._whole = seconds, threading.Lock(), sum(seconds.values())
        self._kills = collections.defaultdict(collections.Counter)

    def note(self, file, function, suite):
        with self._lock:
            for place in (file, (file, function)):
                self._kills[place][suite] += 1

    def _likely(self, mutant):
        """Suites, those first that find most in their time."""
        with self._lock:
            here = self._kills[mutant.file, mutant.function]
            score = {suite: (here[suite] * 10 + number) / (self._seconds[suite] + self._whole / 10_000)
                     for suite, number in self._kills[mutant.file].items() if suite in self._seconds}
        return sorted(score, key=score.get, reverse=True)

    def _within(self, suites, part):
        """As many of them as fit into that part of the time."""
        fitting, total = [], 0
        for suite in suites:
            total += self._seconds[suite]
            if total <= part * self._whole:
                fitting.append(suite)
        return fitting

    def stages(self, mutant):
        """(program, what of it runs in one go, in how many seconds at most), one after the other."""
        likely = self._likely(mutant)
        best = likely[0][0] if likely else ""
        first = self._within([suite for suite in likely if suite[0] == best], FIRST)
        rest = sorted((suite for suite in self._seconds if suite not in first), key=self._seconds.get)
        goes = [first]
        for part in (QUICK, SLOWER, None):
            fitting = self._within(rest, part) if part else rest
            rest = [suite for suite in rest if suite not in fitting]
            programs = sorted({suite[0] for suite in fitting}, key=lambda program: (program != best, program))
            goes += [[suite for suite in fitting if suite[0] == program] for program in programs]
        return [(go[0][0], [suite for _, suite in go], 1 + 4 * sum(map(self._seconds.get, go))) for go in goes if go]


class Tests:
    """Linked tests, run within limits."""

    def __init__(self, root):
        self._root = root

    def run(self, program, suites, seconds):
        """(answer, or the signal less than 0; what was printed)"""
        whole = int(seconds) + 1
        limits = ["prlimit", f"--cpu={whole}:{whole + 2}", "--core=0", f"--fsize={MOST_PRINTED}", f"--as={MOST_MEMORY}"]
        command = [*limits, "--", str(program), "--gtest_fail_fast", "--gtest_color=no"]
        if suites:
            command.append("--gtest_filter=" + ":".join(f"{suite}.*" for suite in suites))
        printed = program.with_suffix(".printed")
        with printed.open("wb") as out, subprocess.Popen(command, stdout=out, stderr=subprocess.STDOUT, cwd=self._root,
                                                         stdin=subprocess.DEVNULL, start_new_session=True) as ran:
            try:
                answer = ran.wait(10 * whole)
            except subprocess.TimeoutExpired:
                answer = -signal.SIGXCPU
            finally:
                with contextlib.suppress(ProcessLookupError):
                    os.killpg(ran.pid, signal.SIGKILL)
        return answer, printed.read_text(encoding="utf-8", errors="replace")


class Bench:
    """A folder in which one mutant after the other is made and killed."""

    def __init__(self, settings, folder, originals):
        self._settings, self._folder, self._originals = settings, folder, originals
        shutil.rmtree(folder, ignore_errors=True)
        (folder / "header").mkdir(parents=True)

    def _compile(self, command, source, text, made):
        """Nothing but the text differs: the compiler is told the name that it has."""
        given = f'# 1 "{source}"\n{text}'
        where = ["-I", str(self._folder / "header"), "-I", str(self._settings.layer)]
        ran = subprocess.run([*command, *where, "-x", "c++", "-c", "-", "-o", str(made)], input=given.encode(),
                             cwd=self._folder, capture_output=True, check=False)
        return ran.returncode == 0, ran.stderr.decode(errors="replace")

    def objects(self, command, mutant, text, suffix=".o"):
        """By source: those that differ from the original's. None when one does not compile."""
        header = self._folder / "header" / mutant.file
        sources = [self._settings.layer / mutant.file]
        if mutant.file.endswith(".h"):
            header.write_text(text, encoding="utf-8")
            sources = self._settings.sources
        made = {}
        for source in sources:
            made[source] = self._folder / f"{source.stem}{suffix}"
            given = text if source.name == mutant.file else source.read_text(encoding="utf-8")
            if not self._compile(command, source, given, made[source])[0]:
                made = None
                break
        header.unlink(missing_ok=True)
        return made

    def original(self, command, suffix=".o"):
        for source in self._settings.sources:
            made, told = self._compile(command, source, source.read_text(encoding="utf-8"),
                                       self._folder / f"{source.stem}{suffix}")
            if not made:
                raise Failed(told[-3000:])

    def link(self, name, changed):
        """(the program of that name, what the linker says); no program when it cannot be linked"""
        program = self._folder / name
        layer = [changed.get(source, self._originals / f"{source.stem}.o") for source in self._settings.sources]
        ran = subprocess.run([*self._settings.link, self._settings.programs[name], *map(str, layer),
                              *self._settings.behind, "-o", str(program)], capture_output=True, check=False)
        return (program if ran.returncode == 0 else None), ran.stderr.decode(errors="replace")

    def has_same_code(self, mutant, text):
        """Whether what ships would be the same, byte by byte."""
        changed = self.objects(self._settings.product, mutant, text, ".product.o")
        return changed is not None and all(
            made.read_bytes() == (self._originals / made.name).read_bytes() for made in changed.values())

    def judge(self, mutant, text, suites, tests):
        """(verdict, the test that has seen it)"""
        changed = self.objects(self._settings.compile, mutant, text)
        programs = {}
        for name, some, seconds in suites.stages(mutant) if changed else ():
            if name not in programs:
                programs[name] = self.link(name, changed)[0]
            if programs[name] is None:
                return "refused", ""
            answer, printed = tests.run(programs[name], some, seconds)
            if answer != 0:
                suite, case = saw_it(printed)
                suites.note(mutant.file, mutant.function, (name, suite))
                return "hung" if answer == -signal.SIGXCPU else "killed", f"{name}:{suite}.{case}"
        if not changed:
            return "refused", ""
        return ("same code" if self.has_same_code(mutant, text) else "survived"), ""


def saw_it(printed):
    """(suite, case) that failed, or was running when the program ended."""
    failed, started = FAILED.search(printed), STARTED.findall(printed)
    return failed.groups() if failed else started[-1] if started else ("", "")


def spent(work):
    """What the work gives, and the processor's seconds of what it started."""
    before = resource.getrusage(resource.RUSAGE_CHILDREN)
    result = work()
    after = resource.getrusage(resource.RUSAGE_CHILDREN)
    return result, after.ru_utime + after.ru_stime - before.ru_utime - before.ru_stime


def run_original(bench, tests, name):
    """By suite of a program, how many seconds of the processor it takes, whoever else uses the machine."""
    program, told = bench.link(name, {})
    if program is None:
        raise Failed(told[-3000:])
    (answer, printed), seconds = spent(lambda: tests.run(program, [], 600))
    if answer != 0:
        raise Failed(f"the tests fail without any mutant ({answer}):\n{printed[-2000:]}")
    milliseconds = {(name, suite): int(lasted) + 1 for suite, lasted in FINISHED.findall(printed)}
    if not milliseconds:
        raise Failed(f"{name} has no tests")
    whole = sum(milliseconds.values())
    return {suite: seconds * lasted / whole for suite, lasted in milliseconds.items()}


def prepare(settings, folder):
    """The original compiled, and its tests run: (the folder of its objects, suites, tests)."""
    originals, tests = folder / "original", Tests(settings.root)
    bench = Bench(settings, originals, originals)
    bench.original(settings.compile)
    bench.original(settings.product, ".product.o")
    seconds = {}
    for name in settings.programs:
        seconds.update(run_original(bench, tests, name))
    return originals, Suites(seconds), tests
