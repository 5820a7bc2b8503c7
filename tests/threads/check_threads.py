#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the threads' program in one of four ways and judges what ThreadSanitizer and the program itself say.

    suppressed      nothing but what the suppression file lists races, and no call waits for ever
    exact           without the file: who touches the record without the mutex is exactly who is listed in it
    without_mutex   the same with the mutex switched off: what it protects is reported, in spite of the file
    deadlock        with a video plane that connects itself while it is being informed: the watchdog tells

usage: check_threads.py suppressed|exact|without_mutex|deadlock PROGRAM SUPPRESSION_FILE
"""

import collections
import dataclasses
import os
import re
import subprocess
import sys

# Who holds the mutex by contract.
LOCKING = {"i4Pmx_Connect", "i4Pmx_Disconnect", "PMX_InformVdpColorSpace", "vInformVdp"}
CONNECTING = {"i4Pmx_Connect", "i4Pmx_Disconnect"}
INFORMING = LOCKING - CONNECTING
CALLS = 100000
FEWER_CALLS = 20000
PATIENCE_MS = 3000
RACES = 66  # ThreadSanitizer's exit code
DEADLOCK = 3
TIME_LIMIT = 100  # seconds, below that of the test
RUNS = 5

ENTRY = re.compile(r"race_top:\^(\w+)\$")
ACCESS = re.compile(
    r"""^[ ]{2}(?:Previous[ ])?(?:atomic[ ])?(?:read|write)[ ]of[ ]size[ ]\d+[ ]at[ ]\w+[ ]by[ ]
        .*?(?P<mutex>\(mutexes:.*\))?:\n
        (?:[ ]{4}\#0[ ](?P<function>.+?)[ ]\S+[ ]\(\S+\)$)?    # missing when the stack is lost""",
    re.M | re.I | re.X)
REPORT = re.compile(r"^WARNING: ThreadSanitizer: (.+?) \(pid=\d+\)\n(.*?)^={18}$", re.M | re.S)


@dataclasses.dataclass(frozen=True)
class Access:
    function: str
    locked: bool

    def __str__(self):
        return f"{self.function} {'with' if self.locked else 'without'} the mutex"


def entries(text):
    """(functions, complaints) of a suppression file: each named once, below the reason why."""
    found, complaints, before = [], [], ""
    for number, line in enumerate(text.splitlines(), start=1):
        match = ENTRY.fullmatch(line)
        if match:
            found.append(match.group(1))
            if not before.startswith("#"):
                complaints.append(f"line {number}: no reason above {line}")
        elif line and not line.startswith("#"):
            complaints.append(f"line {number}: not race_top:^FUNCTION$: {line}")
        before = line
    complaints += [f"{name} is listed twice" for name, times in collections.Counter(found).items() if times > 1]
    complaints += [f"{name} holds the mutex and must not be listed" for name in sorted(LOCKING & set(found))]
    return set(found), complaints


def races(text):
    """(pairs of accesses, complaints about anything else that ThreadSanitizer reported)."""
    pairs, complaints = [], []
    for kind, body in REPORT.findall(text):
        accesses = [Access(match["function"], match["mutex"] is not None) for match in ACCESS.finditer(body)]
        if kind != "data race":
            complaints.append(f"ThreadSanitizer: {kind}\n{body}")
        elif len(accesses) != 2 or not all(access.function for access in accesses):
            complaints.append(f"a report without two readable stacks\n{body}")
        else:
            pairs.append(tuple(accesses))
    if text.count("WARNING: ThreadSanitizer") != len(pairs) + len(complaints):
        complaints.append("a report that cannot be read")
    return pairs, complaints


def judge_exact(pairs, listed):
    """The mutex and the list agree with what was seen."""
    complaints = set()
    for pair in pairs:
        for access in pair:
            if access.locked and access.function not in LOCKING:
                complaints.add(f"{access.function} holds the mutex, which its contract does not tell")
            elif not access.locked and access.function not in listed:
                complaints.add(f"{access.function} touches the record without the mutex and is not listed")
        if all(access.locked for access in pair):
            complaints.add(f"{pair[0]} races with {pair[1]}")
    seen = {access.function for pair in pairs for access in pair}
    complaints |= {f"{name} is listed, and no race of it was seen" for name in listed - seen}
    return sorted(complaints)


def judge_without_mutex(pairs):
    """What the mutex protects, and nothing else, gets past the suppressions."""
    complaints = {f"{first} races with {second}: not among those whom the mutex protects"
                  for first, second in pairs if not {first.function, second.function} <= LOCKING}
    complaints |= {f"{access.function} holds a mutex" for pair in pairs for access in pair if access.locked}
    seen = {frozenset(access.function for access in pair) for pair in pairs}
    if not any(names <= CONNECTING for names in seen):
        complaints.add("two connections at once were not reported")
    if not any(names & CONNECTING and names & INFORMING for names in seen):
        complaints.add("a connection while the video planes are informed was not reported")
    return sorted(complaints)


def run(program, suppressions="", calls=CALLS, arguments=(), **environment):
    """(exit code, standard output, what went to stderr)."""
    options = "exitcode=66:history_size=7:suppress_equal_addresses=0:print_suppressions=1"
    if suppressions:
        options += f":suppressions={suppressions}"
    result = subprocess.run([program, "--calls", str(calls), *arguments], capture_output=True, text=True, check=False,
                            timeout=TIME_LIMIT, env=os.environ | {"TSAN_OPTIONS": options} | environment)
    return result.returncode, result.stdout, result.stderr


def require(complaints, holds, complaint):
    if not holds:
        complaints.append(complaint)


def check_suppressed(program, suppressions, _listed):
    code, out, err = run(program, suppressions)
    pairs, complaints = races(err)
    complaints += [f"{first} races with {second}" for first, second in pairs]
    require(complaints, code == 0, f"exit code {code}")
    require(complaints, f"{CALLS} calls on 12 threads, 0 breaches\n" in out, f"not all calls were made: {out}")
    require(complaints, "ThreadSanitizer: Matched" in err, "no suppression was used: the file was not read")
    return out.strip(), complaints, out + err


def check_exact(program, _suppressions, listed):
    # Which threads meet is chance: what one run does not show, another one does.
    met, complaints, output = [], [], ""
    for _ in range(RUNS):
        code, out, err = run(program)
        pairs, found = races(err)
        met += pairs
        complaints += found
        output += out + err
        require(complaints, code == RACES, f"exit code {code}")
        require(complaints, ", 0 breaches\n" in out, f"not all calls were made: {out}")
        if complaints or listed <= {access.function for pair in met for access in pair}:
            break
    complaints += judge_exact(met, listed)
    return f"{len(met)} races, of {len(listed)} functions that take no lock", complaints, output


def check_without_mutex(program, suppressions, _listed):
    code, out, err = run(program, suppressions, FEWER_CALLS, PMX_THREADS_NO_LOCK="1")
    pairs, complaints = races(err)
    complaints += judge_without_mutex(pairs)
    require(complaints, code == RACES, f"exit code {code}")
    require(complaints, "breach: pu4SetColorMode called without the mutex\n" in out,
            "the video plane did not see that the mutex is not held")
    return f"{len(pairs)} races of what the mutex protects", complaints, out + err


def check_deadlock(program, suppressions, _listed):
    code, out, err = run(program, suppressions, FEWER_CALLS, ["--patience", str(PATIENCE_MS)],
                         PMX_THREADS_CONNECT_INSIDE="1")
    complaints = []
    require(complaints, code == DEADLOCK, f"exit code {code}")
    require(complaints, "breach: x_sema_lock by the thread that holds the mutex\n" in out, "nobody waited for itself")
    require(complaints, re.search(r"^deadlock: nothing moves any more\n(  .+: \d+ of \d+ calls made\n)+", out, re.M),
            "the watchdog did not name the threads that wait")
    return "the watchdog told", complaints, out + err


CHECKS = {"suppressed": check_suppressed, "exact": check_exact, "without_mutex": check_without_mutex,
          "deadlock": check_deadlock}


def main():
    if len(sys.argv) != 4 or sys.argv[1] not in CHECKS:
        sys.exit(__doc__)
    way, program, suppressions = sys.argv[1:]
    with open(suppressions, encoding="utf-8") as file:
        listed, complaints = entries(file.read())
    summary, found, output = CHECKS[way](program, suppressions, listed)
    complaints += found
    if complaints:
        print(output)
        print("\n".join(complaints))
        return 1
    print(f"threads, {way}: {summary}")
    return 0


if __name__ == "__main__":
    sys.exit(main())
