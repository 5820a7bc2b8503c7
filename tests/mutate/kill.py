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

STARTED = re.compile(r"^\[ RUN      \] (\S+)$", re.M)
FAILED = re.compile(r"^\[  FAILED  \] ([^\s,]+)", re.M)
FIRST, QUICK, SLOWER = 0.01, 0.02, 0.2  # parts of the time of all: what runs first, next, and then
WATCHED = 0.05  # what runs guarded: whoever runs the place at all shows what it may not do
MOST_PRINTED = 50_000_000  # bytes
MOST_MEMORY = 4_000_000_000
CASES = ("tests/support", "tests/layer", "tests/core", "tests/tv_type")  # include of each other
JUDGES = (pathlib.Path(__file__), pathlib.Path(__file__).with_name("runs.cpp"))
GUARDED = ".guarded"  # a program whose layer stops where it leaves an object, or does what has no meaning


class Settings:
    """How the layer is compiled, and what it is linked with: as the build says."""

    def __init__(self, path):
        told = json.loads(path.read_text(encoding="utf-8"))
        self.root, self.layer = pathlib.Path(told["root"]), pathlib.Path(told["layer"])
        self.read, self.compile, self.product = told["read"], told["compile"], told["product"]
        self.link, self.behind, self.rest = told["link"], told["behind"], told["rest"]
        self.guards = told["guards"]  # flags of the compile that stops at what a program may not do
        self.programs = {name: pathlib.Path(path) for name, path in told["programs"].items()}
        self.options = told["options"]  # of the link, by program
        self.runs, self.without = told["runs"], told["without"]
        self.checks = told["checks"]  # commands that look at the objects that ship
        self.sources = sorted(self.layer.glob("*.cpp"))

    def layer_key(self):
        """What every verdict hangs on, but for the mutant: the layer, its compilers, their flags, and what judges."""
        versions = [subprocess.run([command[0], "--version"], capture_output=True, check=True).stdout.decode()
                    for command in (self.read, self.compile, self.product, self.link)]
        return digest_of([self.compile, self.product, self.guards, versions],
                         [*sorted(self.layer.glob("*.[ch]*")), *sorted(self.root.glob("src/*/*inc/*.h")), *JUDGES])

    def ground_key(self):
        """What every case stands on: board and support as they are linked, with what, and their headers."""
        headers = [path for folder in ("board", "tools/record_view")
                   for path in sorted((self.root / folder).glob("*.h"))]
        return digest_of([self.link, self.options, self.behind], [*map(pathlib.Path, self.rest), *headers])

    def tests_key(self):
        """All cases and checks, and what they stand on."""
        checks = [path for *_, check in self.checks for path in sorted(pathlib.Path(check).parent.glob("*.py"))]
        checks += sorted((self.root / "cmake").glob("*.py"))  # who checks reads the platform's functions by them
        programs = [path for _, path in sorted(self.programs.items())]
        return digest_of([self.ground_key(), self.without], [*checks, *programs])


def digest_of(words, paths):
    digest = hashlib.sha256(json.dumps(words).encode())
    for path in paths:
        digest.update(hashlib.sha256(path.read_bytes()).digest())
    return digest.hexdigest()[:24]


def key_of(layer_key, mutant):
    return hashlib.sha256(f"{layer_key} {mutant}".encode()).hexdigest()[:24]


class Written:
    """What cases are written in. A case is the same as long as its own lines are, what its file has outside of cases,
    and what other files of the tests lend to all: those that have no cases."""

    CASE = re.compile(r"^TEST(?:_[FP])?\(.*?^}$", re.M | re.S)

    def __init__(self, root, ground_key):
        self._root, self._files = root, {}
        lent = [each for folder in CASES for each in sorted((root / folder).glob("*.[ch]*"))
                if not self.CASE.search(each.read_text(encoding="utf-8"))]
        self._lent = digest_of([ground_key], lent)

    def digest(self, file, line):
        path = self._root / file
        if path not in self._files:
            text = path.read_text(encoding="utf-8")
            cases = [(text.count("\n", 0, found.start()) + 1, found[0]) for found in self.CASE.finditer(text)]
            self._files[path] = self.CASE.sub("", text).split(), cases
        around, cases = self._files[path]
        own = [case for first, case in cases if first <= line <= first + case.count("\n")]
        return hashlib.sha256(json.dumps([self._lent, around, own]).encode()).hexdigest()[:24]


class Cases:
    """How long each case of each program takes, what of the layer it runs, and what it has seen."""

    def __init__(self, noted, users, settings):
        self._seconds = {tuple(case): seconds for case, seconds, *_ in noted}
        self._runs = {tuple(case): set(functions) for case, _, functions, _ in noted}
        self._places = {tuple(case): place for case, _, _, place in noted}
        self._users, self._lock, self._whole = users, threading.Lock(), sum(self._seconds.values())
        self._kills, self._before = collections.defaultdict(collections.Counter), {}
        self._written, self._all = Written(settings.root, settings.ground_key()), settings.tests_key()

    def digest(self, verdict, seen):
        """What a verdict hangs on, but for mutant and layer: a fault that was seen is seen as long as the case is the
        same, and one that survived has to pass every other."""
        if verdict in ("refused", "same code"):
            return ""
        place = self._places.get(plain(seen))
        return self._written.digest(*place) if place else self._all

    def note_before(self, name, seen):
        """What has seen a mutant of that name before, and most likely sees it again."""
        if plain(seen) in self._seconds:
            self._before[name] = seen

    def note(self, file, function, case):
        if case in self._seconds:
            with self._lock:
                self._kills[file, function][case] += 1

    def _functions(self, name):
        """The functions that a function or table is in, or is used by."""
        found, names = set(), [name]
        while names:
            name = names.pop()
            if name not in found:
                found.add(name)
                names += [] if any(name in functions for functions in self._runs.values()) else self._users[name]
        return found

    def _covering(self, mutant):
        """Cases that run the place, those first that do little else."""
        functions = self._functions(mutant.function)
        return sorted((case for case, runs in self._runs.items() if runs & functions),
                      key=lambda case: self._seconds[case] * len(self._runs[case]))

    def _likely(self, mutant):
        """Cases that have seen something here, those first that find most in their time."""
        with self._lock:
            kills = dict(self._kills[mutant.file, mutant.function])
        return sorted(kills, key=lambda case: (self._seconds[case] + self._whole / 10_000) / kills[case])

    def _within(self, cases, part):
        """As many of them as fit into that part of the time."""
        fitting, total = [], 0
        for case in cases:
            total += self._seconds[case]
            if total <= part * self._whole:
                fitting.append(case)
        return fitting

    def stages(self, mutant):
        """What runs in one go, one after the other: (program, cases, in how many seconds at most). Cases that do not
        run the place cannot see it: none keeps what it has from the layer for another one."""
        left = self._covering(mutant)
        goes = [self._within(self._likely(mutant), FIRST)]
        for part in (QUICK, SLOWER, None):
            left = [case for case in left if case not in set(goes[-1])]
            goes.append(self._within(left, part) if part else left)
        if mutant.name in self._before:
            program, _, case = self._before[mutant.name].partition(":")
            yield program, [case], self._limit([plain(self._before[mutant.name])], program)
        covering = self._covering(mutant)
        guarded = [(program + GUARDED, case) for program, case in self._within(covering, WATCHED) or covering[:1]]
        for go in [*goes, guarded]:
            for program in sorted({program for program, _ in go}):
                cases = [case for case in go if case[0] == program]
                yield program, [case for _, case in cases], self._limit(map(plain_case, cases), program)

    def _limit(self, cases, program):
        return 1 + (12 if program.endswith(GUARDED) else 4) * sum(map(self._seconds.get, cases))


def plain_case(case):
    return case[0].removesuffix(GUARDED), case[1]


def plain(seen):
    """(program, case) of "PROGRAM:CASE", whether guarded or not."""
    program, _, case = seen.partition(":")
    return plain_case((program, case))


class Tests:
    """Linked tests, run within limits."""

    def __init__(self, root):
        self._root = root

    def run(self, program, cases, seconds, **environment):
        """(answer, or the signal less than 0; what was printed)"""
        whole = int(seconds) + 1
        limits = ["prlimit", f"--cpu={whole}:{whole + 2}", "--core=0", f"--fsize={MOST_PRINTED}"]
        if not program.name.endswith(GUARDED):  # that one takes addresses that it never fills
            limits.append(f"--as={MOST_MEMORY}")
        command = [*limits, "--", str(program), "--gtest_fail_fast", "--gtest_color=no"]
        flags = program.with_suffix(".flags")
        flags.write_text("--gtest_filter=" + ":".join(cases) + "\n", encoding="utf-8")
        command.append(f"--gtest_flagfile={flags}")
        printed = program.with_suffix(".printed")
        environment = os.environ | {"ASAN_OPTIONS": "detect_leaks=0"} | environment
        with printed.open("wb") as out, subprocess.Popen(command, stdout=out, stderr=subprocess.STDOUT, cwd=self._root,
                                                         stdin=subprocess.DEVNULL, start_new_session=True,
                                                         env=environment) as ran:
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
        self._settings, self.folder, self._originals = settings, folder, originals
        shutil.rmtree(folder, ignore_errors=True)
        (folder / "header").mkdir(parents=True)

    def _compile(self, command, source, text, made):
        """Nothing but the text differs: the compiler is told the name that it has."""
        given = f'# 1 "{source}"\n{text}'
        where = ["-I", str(self.folder / "header"), "-I", str(self._settings.layer)]
        ran = subprocess.run([*command, *where, "-x", "c++", "-c", "-", "-o", str(made)], input=given.encode(),
                             cwd=self.folder, capture_output=True, check=False)
        return ran.returncode == 0, ran.stderr.decode(errors="replace")

    def objects(self, command, mutant, text, suffix=".o"):
        """By source: those that differ from the original's. None when one does not compile."""
        header = self.folder / "header" / mutant.file
        sources = [self._settings.layer / mutant.file]
        if mutant.file.endswith(".h"):
            header.write_text(text, encoding="utf-8")
            sources = self._settings.sources
        made = {}
        for source in sources:
            made[source] = self.folder / f"{source.stem}{suffix}"
            given = text if source.name == mutant.file else source.read_text(encoding="utf-8")
            if not self._compile(command, source, given, made[source])[0]:
                made = None
                break
        header.unlink(missing_ok=True)
        return made

    def original(self, command, suffix=".o"):
        for source in self._settings.sources:
            made, told = self._compile(command, source, source.read_text(encoding="utf-8"),
                                       self.folder / f"{source.stem}{suffix}")
            if not made:
                raise Failed(told[-3000:])

    def link(self, name, changed, *more):
        """(the program of that name, what the linker says); no program when it cannot be linked"""
        program, plain_name = self.folder / name, name.removesuffix(GUARDED)
        suffix, guards = (".o", []) if name == plain_name else (".guarded.o", self._settings.guards)
        layer = [changed.get(source, self._originals / f"{source.stem}{suffix}") for source in self._settings.sources]
        ran = subprocess.run([*self._settings.link, *guards, *self._settings.options.get(plain_name, []),
                              str(self._settings.programs[plain_name]), *self._settings.rest, *map(str, layer), *more,
                              *self._settings.behind, "-o", str(program)], capture_output=True, check=False)
        return (program if ran.returncode == 0 else None), ran.stderr.decode(errors="replace")

    def _program(self, name, mutant, text, changed):
        """The program with the mutant in it; none when it cannot be linked."""
        guarded = name.endswith(GUARDED)
        if guarded:
            changed = self.objects([*self._settings.compile, *self._settings.guards], mutant, text, ".guarded.o")
        program = self.link(name, changed)[0] if changed else None
        if guarded and program is None:
            raise Failed(f"{mutant.name} passes the tests, but cannot be made as {name}")
        return program

    def shipped(self, mutant, text):
        """What would ship, by source; none when it is the same, byte by byte."""
        changed = self.objects(self._settings.product, mutant, text, ".product.o")
        if changed is None:
            raise Failed(f"{mutant.name} compiles, but not as it would ship")
        return {source: made for source, made in changed.items()
                if made.read_bytes() != (self._originals / made.name).read_bytes()}

    def check(self, changed):
        """The check that complains of what would ship, and of what; none: ("", "")"""
        objects = [str(changed.get(source, self._originals / f"{source.stem}.product.o"))
                   for source in self._settings.sources]
        for command in self._settings.checks:
            ran = subprocess.run([*command, *objects], cwd=self.folder, capture_output=True, check=False)
            if ran.returncode != 0:
                return pathlib.Path(command[-1]).name, (ran.stdout + ran.stderr).decode(errors="replace")
        return "", ""

    def judge(self, mutant, text, cases, tests):
        """(verdict, the case that has seen it)"""
        changed, programs, shipped = self.objects(self._settings.compile, mutant, text), {}, None
        if not changed:
            return "refused", ""
        for name, some, seconds in cases.stages(mutant):
            if name not in programs:
                programs[name] = self._program(name, mutant, text, changed)
            if programs[name] is None:
                return "refused", ""
            answer, printed = tests.run(programs[name], some, seconds)
            if answer != 0:
                cases.note(mutant.file, mutant.function, (name, saw_it(printed)))
                return "hung" if answer == -signal.SIGXCPU else "killed", f"{name}:{saw_it(printed)}"
            if shipped is None:  # the compiler is quicker than the longer cases
                shipped = self.shipped(mutant, text)
            if not shipped:
                return "same code", ""
        if shipped is None:
            shipped = self.shipped(mutant, text)
        if not shipped:
            return "same code", ""
        check = self.check(shipped)[0]
        return ("killed", f"check:{check}") if check else ("survived", "")


def saw_it(printed):
    """The case that failed, or was running when the program ended."""
    failed, started = FAILED.search(printed), STARTED.findall(printed)
    return failed[1] if failed else started[-1] if started else ""


def spent(work):
    """What the work gives, and the processor's seconds of what it started."""
    before = resource.getrusage(resource.RUSAGE_CHILDREN)
    result = work()
    after = resource.getrusage(resource.RUSAGE_CHILDREN)
    return result, after.ru_utime + after.ru_stime - before.ru_utime - before.ru_stime


def names_of(program):
    """By address, the names of its functions."""
    listed = subprocess.run(["nm", "--demangle", str(program)], capture_output=True, check=True).stdout.decode()
    return {int(words[0], 16): words[2].partition("(")[0]
            for words in (line.split(" ", 2) for line in listed.splitlines()) if words[0] and words[1] in "tTwW"}


def pass_all(settings, tests, program, told, **environment):
    """Runs the cases of a program that was linked from the originals: a case that fails here would see every mutant."""
    if program is None:
        raise Failed(told[-3000:])
    answer, printed = tests.run(program, [f"-{settings.without}"], 600, **environment)
    if answer != 0:
        raise Failed(f"the tests fail without any mutant ({program.name}: {answer}):\n{printed[-2000:]}")


def note_cases(settings, bench, tests, name):
    """Of each case of a program: its name, how many seconds of the processor it takes, whoever else uses the machine,
    and which functions of the layer it runs."""
    layer = {source: bench.folder / f"{source.stem}.runs.o" for source in settings.sources}
    program, told = bench.link(name, layer, settings.runs)
    noted = bench.folder / f"{name}.runs"
    noted.unlink(missing_ok=True)
    _, seconds = spent(lambda: pass_all(settings, tests, program, told, PMX_RUNS=str(noted)))
    lines = [line.split() for line in noted.read_text(encoding="utf-8").splitlines()] if noted.exists() else []
    if not lines:
        raise Failed(f"{name} has no tests")
    whole, names = sum(int(words[1]) + 1 for words in lines), names_of(program)
    return [[[name, words[0]], seconds * (int(words[1]) + 1) / whole,
             sorted({names.get(int(address, 16), "") for address in words[4:]}), [words[2], int(words[3])]]
            for words in lines]


def prepare(settings, folder, users):
    """The original compiled, and its tests run, unless it was before: (the folder of its objects, cases, tests)."""
    originals, tests = folder / "original", Tests(settings.root)
    kept, key = originals / "cases.json", settings.layer_key() + settings.tests_key()
    told = json.loads(kept.read_text(encoding="utf-8")) if kept.exists() else {}
    if told.get("key") != key:
        bench = Bench(settings, originals, originals)
        bench.original(settings.compile)
        bench.original([*settings.compile, "-finstrument-functions"], ".runs.o")
        bench.original(settings.product, ".product.o")
        bench.original([*settings.compile, *settings.guards], ".guarded.o")
        check, complaint = bench.check({})
        if check:
            raise Failed(f"{check} fails without any mutant:\n{complaint[-2000:]}")
        told = {"key": key, "cases": [case for name in settings.programs
                                      for case in note_cases(settings, bench, tests, name)]}
        for name in settings.programs:
            pass_all(settings, tests, *bench.link(name + GUARDED, {}))
        unfinished = kept.with_suffix(".unfinished")
        unfinished.write_text(json.dumps(told), encoding="utf-8")
        unfinished.rename(kept)
    return originals, Cases(told["cases"], users, settings), tests
