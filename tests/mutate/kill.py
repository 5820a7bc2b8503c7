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
import shutil
import signal
import subprocess
import threading

from mutants import Failed

STARTED = re.compile(r"^\[ RUN      \] (\S+)\.(\S+)$", re.M)
FINISHED = re.compile(r"^\[-+\] \d+ tests? from ([^\s,]+)(?:, .*)? \((\d+) ms total\)$", re.M)
FIRST_MS, QUICK_MS = 150, 60  # all that run first, and each of those that run next
MOST_PRINTED = 50_000_000  # bytes
MOST_MEMORY = 4_000_000_000


class Settings:
    """How the layer is compiled, and what it is linked with: as the build says."""

    def __init__(self, path):
        told = json.loads(path.read_text(encoding="utf-8"))
        self.root, self.layer = pathlib.Path(told["root"]), pathlib.Path(told["layer"])
        self.read, self.compile, self.product = told["read"], told["compile"], told["product"]
        self.link, self.behind = told["link"], told["behind"]
        self.sources = sorted(self.layer.glob("*.cpp"))

    def key(self):
        """What the verdicts hang on, but for the mutant."""
        digest = hashlib.sha256(json.dumps([self.compile, self.product, self.link, self.behind]).encode())
        tests = [pathlib.Path(word) for word in self.link if word.endswith((".o", ".cpp"))]
        for path in [*tests, *sorted(self.layer.glob("*.[ch]*")), *sorted(self.root.glob("src/*/*inc/*.h"))]:
            digest.update(hashlib.sha256(path.read_bytes()).digest())
        return digest.hexdigest()


def key_of(settings_key, mutant):
    return hashlib.sha256(f"{settings_key} {mutant}".encode()).hexdigest()[:24]


class Suites:
    """How long each suite takes, and which have seen what."""

    def __init__(self, milliseconds):
        self._milliseconds, self._lock = milliseconds, threading.Lock()
        self._kills = collections.defaultdict(collections.Counter)

    def note(self, file, function, suite):
        with self._lock:
            for place in (file, (file, function)):
                self._kills[place][suite] += 1

    def _likely(self, mutant):
        """Suites, those first that find most in their time."""
        with self._lock:
            here = self._kills[mutant.file, mutant.function]
            score = {suite: (here[suite] * 10 + number) / (self._milliseconds.get(suite, 0) + 2)
                     for suite, number in self._kills[mutant.file].items() if suite in self._milliseconds}
        return sorted(score, key=score.get, reverse=True)

    def stages(self, mutant):
        """What runs in one go, then what, and then all the rest."""
        first, total = [], 0
        for suite in self._likely(mutant):
            total += self._milliseconds[suite]
            if total > FIRST_MS:
                break
            first.append(suite)
        rest = [suite for suite in self._milliseconds if suite not in first]
        quick = [suite for suite in rest if self._milliseconds[suite] <= QUICK_MS]
        return [stage for stage in (first, quick, [suite for suite in rest if suite not in quick]) if stage]


class Tests:
    """The linked tests, run within limits."""

    def __init__(self, root, seconds):
        self._root, self._seconds = root, seconds

    def run(self, program, suites=None):
        """(signal or answer, what was printed)"""
        limits = ["prlimit", f"--cpu={self._seconds}:{self._seconds + 2}", "--core=0", f"--fsize={MOST_PRINTED}",
                  f"--as={MOST_MEMORY}"]
        command = [*limits, "--", str(program), "--gtest_break_on_failure", "--gtest_color=no"]
        if suites:
            command.append("--gtest_filter=" + ":".join(f"{suite}.*" for suite in suites))
        printed = program.with_suffix(".printed")
        with printed.open("wb") as out, subprocess.Popen(command, stdout=out, stderr=subprocess.STDOUT, cwd=self._root,
                                                         stdin=subprocess.DEVNULL, start_new_session=True) as ran:
            try:
                answer = ran.wait(3 * self._seconds)
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

    def link(self, changed):
        program = self._folder / "tests"
        layer = [changed.get(source, self._originals / f"{source.stem}.o") for source in self._settings.sources]
        ran = subprocess.run([*self._settings.link, *map(str, layer), *self._settings.behind, "-o", str(program)],
                             capture_output=True, check=False)
        return (program if ran.returncode == 0 else None), ran.stderr.decode(errors="replace")

    def has_same_code(self, mutant, text):
        """Whether what ships would be the same, byte by byte."""
        changed = self.objects(self._settings.product, mutant, text, ".product.o")
        return changed is not None and all(
            made.read_bytes() == (self._originals / made.name).read_bytes() for made in changed.values())

    def judge(self, mutant, text, suites, tests):
        """(verdict, the test that has seen it)"""
        changed = self.objects(self._settings.compile, mutant, text)
        program = self.link(changed)[0] if changed else None
        if program is None:
            return "refused", ""
        for stage in suites.stages(mutant):
            answer, printed = tests.run(program, stage)
            if answer != 0:
                seen = STARTED.findall(printed)
                suite, case = seen[-1] if seen else ("", "")
                if suite:
                    suites.note(mutant.file, mutant.function, suite)
                return "hung" if answer in (-signal.SIGXCPU, 128 + signal.SIGXCPU) else "killed", f"{suite}.{case}"
        return ("same code" if self.has_same_code(mutant, text) else "survived"), ""


def prepare(settings, folder):
    """The original compiled, and its tests run: (the folder of its objects, suites, tests)."""
    originals = folder / "original"
    bench = Bench(settings, originals, originals)
    bench.original(settings.compile)
    bench.original(settings.product, ".product.o")
    program, told = bench.link({})
    if program is None:
        raise Failed(told[-3000:])
    answer, printed = Tests(settings.root, 600).run(program)
    if answer != 0:
        raise Failed(f"the tests fail without any mutant ({answer}):\n{printed[-2000:]}")
    milliseconds = {suite: int(spent) for suite, spent in FINISHED.findall(printed)}
    if not milliseconds:
        raise Failed("there are no tests")
    seconds = max(3, 3 * sum(milliseconds.values()) // 1000)
    return originals, Suites(milliseconds), Tests(settings.root, seconds)
