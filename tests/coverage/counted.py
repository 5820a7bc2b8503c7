# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What clang's counting compile tells of sources: which lines were never run, which outcomes of a condition never came
about, and which conditions of a decision never decided alone; and the list of what cannot be.

An entry of the list is three lines or more, entries are set apart by blank lines:

    FILE KIND NUMBER
        the line of source
    why it never comes about

KIND is line, branch or condition. Lines that follow one another are one entry, which has the first one's text, and says
how many they are; branches and conditions are those of all lines of the file with that text. A text stands for its
line, so that entries stay right when code moves.
"""

import bisect
import collections
import json
import os
import re
import shutil
import subprocess

KINDS = ("line", "branch", "condition")
NEVER = {"line": "lines never run", "branch": "branches never taken", "condition": "conditions that never decided"}
SHARDS = 2  # so many processes run the tests of a program


class Missing(collections.namedtuple("Missing", "file kind text")):
    """What never came about, and where."""

    def __str__(self):
        return f"{self.file}: {self.text}"


class Total(collections.namedtuple("Total", "come_about all")):
    """How many of how many."""

    def __add__(self, other):
        return Total(self.come_about + other.come_about, self.all + other.all)

    def __str__(self):
        # Never rounded up to a hundred.
        percent = f"{1000 * self.come_about // self.all / 10:.1f}%" if self.all else ""
        return f"{self.come_about:6} of {self.all:5}{percent:>7}"


class File:
    """What was counted in one file, whatever was compiled of it how often: templates, and headers."""

    def __init__(self, name, report, source):
        self.name = name
        self.source = source.splitlines()
        self.segments = [Segment(*segment) for segment in report["segments"]]
        self.places = [(segment.line, segment.column) for segment in self.segments]
        self.lines = dict(lines_of(self.segments))
        self.branches = self._branches(report.get("branches", []))
        self.conditions = self._conditions(report.get("mcdc_records", []))

    def _branches(self, records):
        """{place: how often true, how often false}, without conditions that the compiler answers itself."""
        counts = collections.defaultdict(lambda: [0, 0])
        for first, column, last, end, true, false, *_ in records:
            outcomes = counts[first, column, last, end]
            outcomes[0] += true
            outcomes[1] += false
        return {place: outcomes for place, outcomes in counts.items() if any(outcomes) or not self._count_at(place)}

    def _count_at(self, place):
        """How often what stands there was come to: both outcomes of a constant condition are counted as none."""
        index = bisect.bisect_right(self.places, place[:2]) - 1
        return self.segments[index].count if index >= 0 else 0

    def _conditions(self, records):
        """{place of the decision: of each condition, whether it decided alone}"""
        decisions = {}
        for *place, _, _, conditions in records:
            known = decisions.setdefault(tuple(place), [False] * len(conditions))
            decisions[tuple(place)] = [one or other for one, other in zip(known, conditions)]
        return decisions

    def count_also(self, other):
        """What the same file has come to elsewhere."""
        if other is self:
            return
        for number, count in other.lines.items():
            self.lines[number] = max(count, self.lines.get(number, 0))
        for place, outcomes in other.branches.items():
            self.branches[place] = [one + more for one, more in zip(self.branches.get(place, [0, 0]), outcomes)]

    def text(self, number):
        return self.source[number - 1].strip()

    def totals(self):
        """{kind: Total}"""
        branches = [count > 0 for outcomes in self.branches.values() for count in outcomes]
        conditions = [alone for decision in self.conditions.values() for alone in decision]
        found = {"line": [count > 0 for count in self.lines.values()], "branch": branches, "condition": conditions}
        return {kind: Total(sum(which), len(which)) for kind, which in found.items()}

    def missing(self):
        """Counter of Missing."""
        found = collections.Counter()
        first = before = None
        for number in sorted(number for number, count in self.lines.items() if count == 0):
            if before is None or number != before + 1:
                first = number
            before = number
            found[Missing(self.name, "line", self.text(first))] += 1
        for place, outcomes in self.branches.items():
            found[Missing(self.name, "branch", self.text(place[0]))] += outcomes.count(0)
        for place, conditions in self.conditions.items():
            found[Missing(self.name, "condition", self.text(place[0]))] += conditions.count(False)
        return +found


Segment = collections.namedtuple("Segment", "line column count has_count is_entry is_gap")


def lines_of(segments):
    """(number, count) of each line that has code: the most that anything was run that begins on it or reaches into it.

    A segment says what holds from its place up to the next one's.
    """
    reaching = None
    by_line = collections.defaultdict(list)
    for segment in segments:
        by_line[segment.line].append(segment)
    numbers = range(segments[0].line, segments[-1].line + 1) if segments else ()
    for number in numbers:
        here = by_line.get(number, [])
        entries = [segment for segment in here if segment.has_count and segment.is_entry and not segment.is_gap]
        skipped = bool(here) and not here[0].has_count and here[0].is_entry
        if not skipped and (entries or (reaching and reaching.has_count)):
            counts = [segment.count for segment in entries]
            yield number, max([*counts, reaching.count] if reaching and reaching.has_count else counts)
        reaching = here[-1] if here else reaching


class Tools(collections.namedtuple("Tools", "profdata cov")):
    """The two programs that read what was counted."""

    def export(self, programs, counts):
        """The report of these programs over all that was counted in that directory."""
        merged = self.merge(counts)
        return json.loads(self._out(self.cov, "export", "--skip-functions", f"--instr-profile={merged}",
                                    *in_order(programs)))["data"][0]

    def page(self, programs, counts, sources, directory):
        """The same to look at, line by line: index.html."""
        self._out(self.cov, "show", "--format=html", f"--output-dir={directory}", "--show-branches=count",
                  f"--instr-profile={counts / 'merged'}", *in_order(programs), "--sources", *map(str, sources))

    def merge(self, counts):
        files = sorted(str(file) for file in counts.glob("*.profraw"))
        self._out(self.profdata, "merge", "--sparse", "-o", counts / "merged", *files)
        return counts / "merged"

    @staticmethod
    def _out(*command):
        return subprocess.run([str(word) for word in command], check=True, stdout=subprocess.PIPE, text=True).stdout


def in_order(programs):
    """As the tool wants them: the first one, and others."""
    first, *others = (str(program) for program in programs)
    return [first, *(word for other in others for word in ("--object", other))]


def files_of(export, root, beginnings):
    """Files below these directories, by name."""
    found = []
    for report in export["files"]:
        name = os.path.relpath(report["filename"], root)
        if name.startswith(tuple(beginnings)):
            found.append(File(name, report, (root / name).read_text(encoding="utf-8")))
    return sorted(found, key=lambda file: file.name)


def part_of_tests(part, parts):
    return {"GTEST_TOTAL_SHARDS": str(parts), "GTEST_SHARD_INDEX": str(part)} if parts > 1 else {}


def run(commands, counts, root):
    """Runs the commands one by one, programs of GoogleTest in parts; what is printed by the first that fails."""
    shutil.rmtree(counts, ignore_errors=True)
    counts.mkdir(parents=True)
    # Processes of one program put their counts into a few files together.
    environment = dict(os.environ, LLVM_PROFILE_FILE=f"{counts}/%{SHARDS}m.profraw", PYTHONDONTWRITEBYTECODE="1")
    for command in commands:
        parts = SHARDS if any(word.startswith("--gtest") for word in command) else 1
        running = [subprocess.Popen(command, cwd=root, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True,
                                    env=environment | part_of_tests(part, parts))
                   for part in range(parts)]
        texts = [process.communicate()[0] for process in running]
        for process, text in zip(running, texts):
            if process.returncode != 0:
                return f"{' '.join(command)}: ended with {process.returncode}\n{text}"
    return ""


def all_missing(files):
    return {missing: number for file in files for missing, number in file.missing().items()}


def read_list(text, place=Missing, called="KIND", words="|".join(KINDS)):
    """({place: number}, complaints) of the list of what cannot be."""
    named, complaints = {}, []
    text = re.sub(r"^#.*\n", "", text, flags=re.M)
    for entry in re.split(r"\n\s*\n", text.strip("\n")):
        lines = [line.strip() for line in entry.splitlines()]
        if not lines:
            continue
        head = re.fullmatch(rf"(\S+) ({words}) ([1-9]\d*)", lines[0])
        if not head or len(lines) < 3:
            complaints.append(f"not an entry (FILE {called} NUMBER, the line of source, why): {lines[0]}")
            continue
        one = place(head[1], head[2], lines[1])
        if one in named:
            complaints.append(f"listed twice: {head[2]}: {one}")
        named[one] = int(head[3])
    return named, complaints


def judge(missing, known):
    """What never came about and is not known, and what is known and came about."""
    for one in [*missing, *(one for one in known if one not in missing)]:
        never, expected = missing.get(one, 0), known.get(one, 0)
        if never != expected:
            yield f"{one}\n    {never} {NEVER[one.kind]}, {expected} in the list"


def sum_of(files, kinds):
    return {kind: sum((file.totals()[kind] for file in files), Total(0, 0)) for kind in kinds}


def table(files, kinds):
    """One row a file, and their sum."""
    yield f"{'':52}" + "".join(f"{kind:>22}" for kind in kinds)
    for file in files:
        here = file.totals()
        yield f"{file.name:52}" + "".join(f"{here[kind]!s:>22}" for kind in kinds)
    total = sum_of(files, kinds)
    yield f"{'all':52}" + "".join(f"{total[kind]!s:>22}" for kind in kinds)
