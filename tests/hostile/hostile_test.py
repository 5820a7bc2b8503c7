#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Bad input and bad luck: the tool never breaks down, never loses a file, and never calls a failure a success.

usage: hostile_test.py PMXBOARD MANY_RUNS inputs|outputs|interrupts|faults [ROUNDS]

MANY_RUNS is the same tool, started once for many runs.

ROUNDS multiplies what is drawn at random: a long campaign is the same test with more of it.
"""

import json
import os
import pathlib
import random
import resource
import select
import shutil
import signal
import stat
import subprocess
import sys
import tempfile
import threading
import time
import unittest
import xml.etree.ElementTree

sys.path.insert(0, str(pathlib.Path(__file__).parent))

import contents  # noqa: E402

PROGRAM = ""
MANY_RUNS = ""
ROUNDS = 1
PATIENCE = 20      # seconds for one run; what is linear in its input needs a fraction of one
NOBODY = 65534
CLOSED_PIPE = 128 + signal.SIGPIPE
CODES = {0: "done", 1: "a failed step", 2: "nothing that can be used"}
CONTROLS = {chr(code) for code in [*range(0x20), *range(0x7f, 0xa0)]} - {"\n", "\t"}
TO_SCENARIO = "to scenario"  # decode's reader once more: of mutated logs alone
HUGE = 1 << 20
LONGEST_NAME = "n" * 300


class ManyRuns:
    """The tool, started once; see many_runs.cpp."""

    def __init__(self):
        kept = tempfile.TemporaryDirectory()
        unittest.addModuleCleanup(kept.cleanup)
        unittest.addModuleCleanup(self.end)
        self.streams = [pathlib.Path(kept.name) / name for name in ("input", "output", "diagnostics")]
        self.process = None

    def end(self):
        if self.process:
            os.killpg(self.process.pid, signal.SIGKILL)
            self.process.communicate()
        self.process = None

    def run(self, arguments, stdin, place, user, variable):
        if not self.process:
            # Without what every run would pay for.
            checks = ":".join([os.environ.get("ASAN_OPTIONS", ""), "detect_leaks=0", "detect_stack_use_after_return=0",
                               "malloc_context_size=1"])
            self.process = subprocess.Popen([MANY_RUNS], stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                                            env={**os.environ, "ASAN_OPTIONS": checks}, start_new_session=True)
        self.streams[0].write_bytes(stdin)
        words = [place, user, variable, *self.streams, *arguments]
        self.process.stdin.write(b"".join(b"=" + os.fsencode(str(word)) + b"\0" for word in words) + b"\0")
        self.process.stdin.flush()
        if not select.select([self.process.stdout], [], [], PATIENCE)[0]:
            self.end()
            raise subprocess.TimeoutExpired(arguments, PATIENCE)
        code = os.waitstatus_to_exitcode(int(self.process.stdout.readline()))
        return subprocess.CompletedProcess(arguments, code, *(path.read_bytes() for path in self.streams[1:]))


class Directory(unittest.TestCase):
    """Each test has a directory with files of every kind that are right."""

    @classmethod
    def setUpClass(cls):
        cls.many_runs = ManyRuns()

    def setUp(self):
        kept = tempfile.TemporaryDirectory()
        self.addCleanup(kept.cleanup)
        self.place = pathlib.Path(kept.name)
        self.log = pathlib.Path("tests/decode/first-mode.log").resolve()
        self.board = pathlib.Path("boards/default/board.toml").resolve()
        self.scenario = self.write("good.pmx", b"PMX_Init\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\nstate ucMode\n")
        self.state = self.place / "good.json"
        self.good("run", "-q", self.write("save.pmx", f"PMX_Init\nsave {self.state}\n".encode()))

    def write(self, name, content):
        path = self.place / name
        path.write_bytes(content)
        return path

    def run_tool(self, *arguments, stdin=b"", user="", variable="", prepare=None):
        """The ended process. What is fed comes through a pipe; what has to begin otherwise is a process of its own."""
        if not prepare:
            return self.many_runs.run(arguments, stdin, self.place, user, variable)
        return subprocess.run([PROGRAM, *map(str, arguments)], input=stdin, capture_output=True, cwd=self.place,
                              timeout=PATIENCE, preexec_fn=prepare, check=False)

    def good(self, *arguments, **options):
        ended = self.run_tool(*arguments, **options)
        self.assertEqual((0, b""), (ended.returncode, ended.stderr), arguments)
        return ended

    def check(self, ended, what, codes=tuple(CODES)):
        """It ended as a program does that was in command all the time, and what it said is fit for a terminal."""
        self.assertIn(ended.returncode, codes, f"{what}: {ended.stderr[-300:]}")
        for breakdown in (b"broke the program down", b"Sanitizer", b"runtime error"):
            self.assertNotIn(breakdown, ended.stderr, what)
        for output in (ended.stdout, ended.stderr):
            text = output.decode("utf-8")  # raises where it is none
            self.assertFalse(CONTROLS & set(text), f"{what}: a control character")
        if ended.returncode == 2:
            self.assertTrue(ended.stderr.strip(), f"{what}: nothing is said")

    def left_behind(self):
        return [path.name for path in self.place.iterdir()
                if path.name.startswith(".pmxboard") or ".unfinished-" in path.name]


class Inputs(Directory):
    """Any content and any name, wherever something is read."""

    def every_way(self, content):
        """(how, arguments, standard input) of all that reads a file."""
        file = self.write("hostile", content)
        toml = self.write("hostile.toml", content)
        image = f"flash boot {file}\nPMX_Init\nstate flash\n".encode()
        yield "run", ("run", file), b""
        yield "run jsonl", ("run", "--trace-format", "jsonl", file), b""
        yield "run -", ("run", "-"), content
        yield "shell", ("shell",), content
        yield "state", ("state", file), b""
        yield "state -", ("state", "--json", "-"), content
        yield "restore", ("run", "-"), f"restore {file}\nPMX_Init\n".encode()
        yield "state two", ("state", self.state, file, ), b""
        yield "status", ("status", file), b""
        yield "decode", ("decode", "-v", file), b""
        yield "replay", ("replay", file), b""
        if len(content) < HUGE:  # the same reader
            yield "decode json", ("decode", "--json", "-"), content
            yield "against hostile", ("decode", file, "--against", self.scenario), b""
            yield TO_SCENARIO, ("decode", "--to-scenario", file), b""
        yield "against", ("decode", self.log, "--against", file), b""
        yield "board", ("run", "--board", toml, self.scenario), b""
        yield "power-on", ("run", "-"), f"power-on {toml}\nPMX_Init\n".encode()
        yield "image", ("run", "-"), image
        yield "include", ("run", "-"), f"include {file}\n".encode()
        yield "picture", ("run", "-"), (f"PMX_Init\noutputs hdmi=480p60\nsource vdp0 start 16x16\n"
                                        f"source vdp0 picture {file}\nshot hdmi\n").encode()

    def try_all(self, found, ways=None):
        """Each in one of the ways, or in all that there are."""
        for number, (name, content) in enumerate(found.items()):
            wanted = ways and ways[number % len(ways)]
            for way, arguments, stdin in self.every_way(content):
                if wanted == way or (wanted is None and way != TO_SCENARIO):
                    self.check(self.run_tool(*arguments, stdin=stdin), f"{name}, {way}")

    def test_any_bytes_everywhere(self):
        self.try_all(contents.shapes())

    def test_nesting_without_end(self):
        self.try_all(contents.brackets(), ("run", "state", "board", "decode", "against"))
        self.try_all(contents.brackets(), ("state -", "shell", "power-on", "include", "status"))

    def test_lines_of_scenarios(self):
        self.try_all(contents.scenario_lines(), ("run", "shell", "against", "include"))

    def test_saved_states(self):
        found = contents.states(self.state.read_bytes())
        self.assertNotIn(self.state.read_bytes(), found.values(), "as it was")
        self.try_all(found, ("state", "state -", "state two", "status", "restore"))
        steps = {name: content for name, content in found.items() if name.startswith("steps")}
        self.assertTrue(steps)
        self.try_all(steps, ("restore",))

    def test_board_files(self):
        self.try_all(contents.boards(), ("board", "power-on"))

    def test_pictures(self):
        found = contents.pictures()
        self.try_all(found, ("picture",))
        for name in ("png", "y4m"):
            self.try_all(contents.mutations(found[name], 15 * ROUNDS, len(found[name])), ("picture",))

    def test_right_but_for_a_few_bytes(self):
        lines = pathlib.Path("scenarios/picture-in-picture.pmx").read_bytes()
        for good, ways in ((lines, ("run", "shell")), (self.state.read_bytes(), ("state", "state two", "status")),
                           (self.board.read_bytes(), ("board",)),
                           (self.log.read_bytes(), ("decode", "against hostile", TO_SCENARIO))):
            self.try_all(contents.mutations(good, 40 * ROUNDS, len(good)), ways)

    def test_names_that_lead_nowhere(self):
        loop = self.place / "loop"
        loop.symlink_to(loop)
        (self.place / "directory").mkdir()
        closed = self.place / "closed"
        closed.mkdir()
        (closed / "board.toml").write_bytes(self.board.read_bytes())
        closed.chmod(0)
        self.addCleanup(closed.chmod, stat.S_IRWXU)
        for name in ("missing", "directory", loop, loop / "board.toml", LONGEST_NAME, LONGEST_NAME + "/x", "",
                     closed / "board.toml", "/proc/self/mem", "/dev/zero", "\x1b[31m\n", "a" * 5_000):
            for arguments in (("run", "-q", name), ("state", name), ("state", self.state, f"{name}/"), ("status", name),
                              ("decode", name), ("decode", self.log, "--against", name),
                              ("run", "--board", name, self.scenario), ("shell", "--board", name)):
                if name == "" and {"--board", "--against"} & set(arguments):
                    continue  # as if nothing was said
                if name == "/dev/zero" and "--board" not in arguments and not {"state", "status"} & set(arguments):
                    continue  # a quarter of a gigabyte, which takes its time
                self.check(self.run_as_nobody(*arguments), f"{name!r}: {arguments[0]}", codes=(2,))

    def run_as_nobody(self, *arguments):
        """The superuser may read everything, so somebody else does it."""
        if os.getuid() != 0:
            return self.run_tool(*arguments)
        self.place.chmod(0o777)
        return self.run_tool(*arguments, user=NOBODY)

    def test_image_that_goes_away(self):
        image = self.write("image", bytes(4096))
        self.place.chmod(0o777)
        lines = f"flash boot {image}\nprint \"go\\n\"\n"
        for gone in (lambda: image.unlink(), lambda: self.place.chmod(0)):
            self.write("image", bytes(4096))
            process = subprocess.Popen([PROGRAM, "run", "-"], stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                                       stderr=subprocess.PIPE, cwd=self.place)
            process.stdin.write(lines.encode())
            process.stdin.flush()
            while b"go" not in process.stdout.readline():
                pass
            gone()
            _, said = process.communicate(b"PMX_Init\n", timeout=PATIENCE)
            self.place.chmod(0o777)
            self.assertEqual((0, b""), (process.returncode, said))

    def test_no_more_files_can_be_opened(self):
        image = self.write("image", bytes(4096))
        lines = f"flash boot {image}\nPMX_Init\nsave full.json\n".encode()
        for limit in range(3, 9):
            ended = self.run_tool("run", "-", stdin=lines, prepare=lambda most=limit: resource.setrlimit(
                resource.RLIMIT_NOFILE, (most, most)))
            # The loader needs some, too, and so does what checks a checked build.
            if ended.returncode != 127 and b"<memory cannot be printed>" not in ended.stderr:
                self.check(ended, f"{limit} files")

    def test_a_pipe_is_opened_once(self):
        for number in range(10):
            fifo = self.place / f"fifo{number}"
            os.mkfifo(fifo)
            writer = threading.Thread(target=fifo.write_bytes, args=(b"PMX_Init\nfoo\n",))
            writer.start()
            ended = self.run_tool("run", fifo)
            writer.join()
            self.check(ended, "a pipe", codes=(1,))
            self.assertIn(f"{fifo}:2: no command foo", ended.stderr.decode())

    def test_names_with_blanks(self):
        name = self.place / "a \"b\" c"
        quoted = str(name).replace('"', '\\"')
        self.good("run", "-q", "-", stdin=f"PMX_Init\nsave \"{quoted}\"\nflash boot \"{quoted}\"\n".encode())
        self.good("state", "-q", name)

    def test_names_that_look_like_something_else(self):
        for name in ("-x.pmx", "--help", "--", "-", " ", "*", "$(x)", "%n%s", "'", '"', "#", "\\", "\u202e", "\u2028"):
            self.write(name, b"PMX_Init\nfoo\n")
            for file in (("--", name), (f"./{name}",)):
                ended = self.run_tool("run", "-q", *file)
                self.check(ended, name, codes=(1,) if name != "-" or file[0] != "--" else (0,))
            self.check(self.run_tool("shell", stdin=f"power-on {name}\nflash a {name}\n".encode()), name)

    def test_streams_that_are_closed(self):
        for closed in ((0,), (2,), (0, 1), (0, 2), (1, 2), (0, 1, 2)):
            for arguments in (("run", self.scenario), ("shell",)):
                ended = self.run_tool(*arguments, stdin=b"PMX_Init\n",
                                      prepare=lambda which=closed: [os.close(file) for file in which])
                wanted = 2 if 1 in closed or 0 in closed and arguments == ("shell",) else 0
                self.assertEqual(wanted, ended.returncode, (closed, arguments))
                self.assertNotIn(b"Sanitizer", ended.stderr)

    def test_environment(self):
        strange = ("", "/", "/dev/null", "/dev/full", "no/such", "\x1b[31m", "x" * 5_000, LONGEST_NAME)
        for name in ("PMXBOARD_HISTORY", "XDG_STATE_HOME", "HOME", "TERM", "NO_COLOR", "COLUMNS", "LANG", "EDITRC"):
            for value in strange:
                ended = self.run_tool("shell", stdin=b"PMX_Init\n", variable=f"{name}={value}")
                self.check(ended, f"{name}={value[:20]!r}", codes=(0,))

    def test_without_symbols(self):
        stripped = self.place / "stripped"
        subprocess.run(["strip", "-o", stripped, PROGRAM], check=True)
        for arguments in (("run", self.scenario), ("shell",), ("modes",), ("decode", self.log),
                          ("decode", self.log, "--against", self.scenario), ("ops",)):
            ended = subprocess.run([stripped, *map(str, arguments)], capture_output=True, input=b"PMX_Init\n",
                                   check=False, timeout=PATIENCE)
            self.check(ended, f"stripped {arguments[0]}")


class Outputs(Directory):
    """Wherever something is written."""

    def commands(self):
        yield from (("--help",), ("--version",), ("run", "--help"), ("ops",), ("ops", "--json"), ("modes",),
                    ("modes", "--json"), ("guide",), ("complete", "PMX_"), ("run", self.scenario),
                    ("run", "--trace-format", "jsonl", self.scenario),
                    ("run", "--trace-format", "chrome", self.scenario),
                    ("run", "--trace-format", "vcd", self.scenario), ("state", self.state),
                    ("state", "--json", self.state), ("status", self.state), ("status", "--json", self.state),
                    ("shell",), ("decode", self.log), ("decode", "--json", self.log), ("decode", "--texts"),
                    ("decode", self.log, "--against", self.scenario), ("decode", "--to-scenario", self.log),
                    ("replay", self.recording()))

    def recording(self):
        self.good("record", self.place / "good.rec", self.scenario)
        return self.place / "good.rec"

    def run_into(self, arguments, output, **options):
        return subprocess.run([PROGRAM, *map(str, arguments)], input=b"PMX_Init\n", stdout=output,
                              stderr=subprocess.PIPE, cwd=self.place, timeout=PATIENCE, check=False, **options)

    def test_a_full_device(self):
        with open("/dev/full", "wb") as full:
            for arguments in self.commands():
                ended = self.run_into(arguments, full)
                self.assertEqual(2, ended.returncode, arguments)
                self.assertIn(b"cannot write to the standard output", ended.stderr, arguments)

    def test_no_standard_output(self):
        for arguments in self.commands():
            ended = self.run_into(arguments, None, preexec_fn=lambda: os.close(1))
            self.assertEqual(2, ended.returncode, arguments)
            self.assertIn(b"cannot write to the standard output", ended.stderr, arguments)

    def test_a_reader_that_goes_away(self):
        for arguments in self.commands():
            reading, writing = os.pipe()
            os.close(reading)
            ended = self.run_into(arguments, writing)
            os.close(writing)
            self.assertEqual((CLOSED_PIPE, b""), (ended.returncode, ended.stderr), arguments)

    def writers(self, name):
        """(arguments, standard input, exit code) of what writes a file."""
        save = f"PMX_Init\nsave {name}\n".encode()
        for form in ("text", "jsonl", "chrome", "vcd"):
            yield ("run", "--trace-format", form, "--trace-file", name, self.scenario), b"", 2
        yield ("run", "-"), save, 1
        yield ("shell",), save, 1
        # What is more than the limit of the full disk.
        yield ("shell",), f"record {name}\n".encode() + b"PMX_GetMode 0\n" * 40, 1
        yield ("record", name, self.scenario), b"", 2
        yield ("report", self.scenario, "-o", name), b"", 2
        yield ("run", "-q", "--junit", name, *[self.scenario] * 10), b"", 2

    def test_a_full_disk(self):
        kept = self.place / "kept"
        limit = lambda: resource.setrlimit(resource.RLIMIT_FSIZE, (700, 700))  # noqa: E731
        for exists in (True, False):
            for arguments, stdin, code in self.writers(kept):
                kept.unlink(missing_ok=True)
                if exists:
                    kept.write_bytes(b"what was there")
                ended = self.run_tool(*arguments, stdin=stdin, prepare=limit)
                self.check(ended, arguments, codes=(code,))
                self.assertIn(f"cannot write {kept}: File too large", ended.stderr.decode())
                self.assertEqual(exists, kept.exists())
                self.assertTrue(not exists or kept.read_bytes() == b"what was there")
                self.assertEqual([], self.left_behind())

    def test_places_that_cannot_be_written(self):
        (self.place / "directory").mkdir()
        for name in ("/dev/full", self.place / "no/such", self.place / "directory", LONGEST_NAME,
                     "/proc/nothing"):
            for arguments, stdin, code in self.writers(name):
                self.check(self.run_tool(*arguments, stdin=stdin), f"{name}: {arguments}", codes=(code,))
        self.assertEqual([], self.left_behind())

    def test_inputs_are_no_outputs(self):
        board = self.write("board.toml", self.board.read_bytes().replace(b"../", b"../../"))
        board.write_bytes(b'name = "mine"\n')
        image = self.write("image", bytes(4096))
        link, twin = self.place / "link", self.place / "twin"
        for wanted in (board, image, self.place / "this.pmx"):
            link.unlink(missing_ok=True)
            twin.unlink(missing_ok=True)
            scenario = self.write("this.pmx", b"")
            link.symlink_to(wanted)
            os.link(wanted, twin)
            for name in (wanted, link, twin):
                lines = f"power-on {board}\nflash boot {image}\nPMX_Init\n".encode()
                scenario.write_bytes(lines + f"save {name}\n".encode())
                before = wanted.read_bytes()
                ended = self.run_tool("run", scenario)
                self.check(ended, name, codes=(1,))
                self.assertIn(b"this run reads it", ended.stderr)
                scenario.write_bytes(lines)
                before_trace = wanted.read_bytes()
                self.check(self.run_tool("run", "--trace-file", name, scenario), name, codes=(2,))
                self.assertEqual(before_trace, wanted.read_bytes())
                self.assertTrue(wanted == scenario or before == wanted.read_bytes())
        self.assertEqual([], self.left_behind())

    def test_the_program_is_no_output(self):
        program = self.place / "program"
        shutil.copy(PROGRAM, program)
        size = program.stat().st_size
        for name in (program, "/proc/self/exe"):
            ended = subprocess.run([program, "run", "--trace-file", name, self.scenario], capture_output=True,
                                   check=False, timeout=PATIENCE)
            self.check(ended, name, codes=(2,))
            self.assertIn(b"this run reads it", ended.stderr)
            self.assertEqual(size, program.stat().st_size)

    def test_verdicts_are_xml_whatever_they_quote(self):
        verdicts = self.place / "verdicts.xml"
        for odd in ("\ufffe", "\uffff", "\U0001ffff", "\x01", "\x1b[m", "\u0085", "]]>", "<&\"'>",
                    os.fsdecode(b"\xff\xed\xa0\x80")):
            scenario = self.write(f"odd{odd}", os.fsencode(f"{odd}\n"))
            self.check(self.run_tool("run", "-q", "-k", "--junit", verdicts, scenario), odd, codes=(1,))
            failure, = xml.etree.ElementTree.parse(verdicts).getroot().iter("failure")
            self.assertIn(":1: ", failure.text)

    def test_a_replaced_file_keeps_what_is_its_own(self):
        kept, link = self.write("kept", b"before"), self.place / "link"
        kept.chmod(0o640)
        link.symlink_to(kept)
        self.good("run", "-q", "-", stdin=f"PMX_Init\nsave {link}\n".encode())
        self.assertTrue(link.is_symlink())
        self.assertEqual(0o640, stat.S_IMODE(kept.stat().st_mode))
        json.loads(kept.read_text())

    def test_what_is_no_file_is_written_to_as_it_is(self):
        self.good("run", "-q", "-", stdin=b"PMX_Init\nsave /dev/null\n")
        self.assertTrue(stat.S_ISCHR(os.stat("/dev/null").st_mode))
        shown = self.good("run", "-q", "-", stdin=b"PMX_Init\nsave /dev/stdout\n").stdout
        json.loads(shown)


class Interrupts(Directory):
    """Ended at a moment that nobody has chosen."""

    def saving(self, name, times=300):
        return f"PMX_Init\n{f'save {name}' + chr(10)}".encode() + f"save {name}\n".encode() * times

    def test_killed_while_it_saves(self):
        kept = self.write("kept", self.state.read_bytes())
        lines = self.write("saving.pmx", self.saving(kept))
        chance = random.Random(7)
        for number in (signal.SIGKILL, signal.SIGINT, signal.SIGTERM, signal.SIGHUP) * (4 * ROUNDS):
            process = subprocess.Popen([PROGRAM, "run", "-q", lines], cwd=self.place, stderr=subprocess.PIPE)
            time.sleep(chance.uniform(0.005, 0.08))
            process.send_signal(number)
            _, said = process.communicate(timeout=PATIENCE)
            self.assertIn(process.returncode, (0, -number), said)
            self.assertEqual(b"", said)
            json.loads(kept.read_text())
            if number != signal.SIGKILL:
                self.assertEqual([], self.left_behind(), number)
            for left in self.left_behind():
                (self.place / left).unlink()

    def test_interrupted_when_a_file_has_just_been_made(self):
        if subprocess.run(["strace", "-o", "/dev/null", "true"], capture_output=True, check=False).returncode != 0:
            self.skipTest("nobody may trace a process here")
        kept = self.write("kept", self.state.read_bytes())
        lines = self.write("saving.pmx", self.saving(kept, times=1))
        for number in (signal.SIGINT, signal.SIGTERM, signal.SIGHUP):
            # Its mode is set between the making of a file and whatever could be told of it.
            interrupting = ["strace", "-qq", "-o", "/dev/null", "-e", "trace=fchmod",
                            "-e", f"inject=fchmod:signal={number.name}:when=1"]
            ended = subprocess.run([*interrupting, PROGRAM, "run", "-q", lines], cwd=self.place, capture_output=True,
                                   check=False, timeout=PATIENCE, env=os.environ | {"ASAN_OPTIONS": "detect_leaks=0"})
            self.assertEqual((-number, b""), (ended.returncode, ended.stderr))
            self.assertEqual([], self.left_behind(), number)
            json.loads(kept.read_text())

    def ended_while_it_traces(self, number, name="trace"):
        """What it said, and the trace that stays behind, if any; the file that it was for is as it was."""
        kept = self.write(name, b"before")
        process = subprocess.Popen([PROGRAM, "run", "--trace-file", kept, "-"], stdin=subprocess.PIPE,
                                   stdout=subprocess.PIPE, stderr=subprocess.PIPE, cwd=self.place)
        process.stdin.write(b"PMX_Init\nPMX_SetTvType 0 0\n")
        process.stdin.flush()
        while b"PMX_SetTvType" not in process.stdout.readline():
            pass
        process.send_signal(number)
        _, said = process.communicate(timeout=PATIENCE)
        self.assertNotEqual(0, process.returncode)
        left = list(self.place.glob("*.unfinished-*"))
        content = "".join(path.read_text() for path in left)
        for path in left:
            path.unlink()
        self.assertEqual((b"before", []), (kept.read_bytes(), self.left_behind()))
        return os.fsdecode(said), [path.name for path in left], content

    def test_interrupted_while_it_traces(self):
        self.assertEqual(("", [], ""), self.ended_while_it_traces(signal.SIGINT))

    def test_the_trace_of_a_run_that_somebody_ends_is_kept(self):
        for number in (signal.SIGTERM, signal.SIGHUP, signal.SIGQUIT, signal.SIGKILL, signal.SIGSEGV):
            said, left, content = self.ended_while_it_traces(number)
            self.assertEqual(1, len(left), number)
            self.assertIn("x_sema_create(1, X_SEMA_TYPE_MUTEX, 1) = 0\n", content)
            if number not in (signal.SIGKILL, signal.SIGSEGV):  # what a checked build says of the latter is its own
                self.assertEqual(f"pmxboard: what was written until then is in {self.place / left[0]}\n", said)

    def test_the_record_of_a_shell_that_somebody_ends_is_kept(self):
        process = subprocess.Popen([PROGRAM, "shell"], stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                                   stderr=subprocess.PIPE, cwd=self.place)
        process.stdin.write(b"record kept\nPMX_Init\nPMX_SetTvType 0 0\n")
        process.stdin.flush()
        while b"PMX_SetTvType" not in process.stdout.readline():
            pass
        process.send_signal(signal.SIGTERM)
        _, said = process.communicate(timeout=PATIENCE)
        left, = self.place.glob("kept*")
        self.assertEqual(f"pmxboard: what was written until then is in {left.name}\n", said.decode())
        self.assertEqual("PMX_Init\n", left.read_text()[:9])

    def test_the_name_of_a_trace_that_is_kept_is_fit_for_a_terminal(self):
        for name, shown in (("\u2013 \u0441 \u4e00", "\u2013 \u0441 \u4e00"), ("a\u009bb\tc", "a?b?c"),
                            (os.fsdecode(b"a\x9b\xe2b"), "a?\udce2b")):
            said, left, _ = self.ended_while_it_traces(signal.SIGTERM, name)
            self.assertEqual(1, len(left), name)
            self.assertIn(f"/{shown}.unfinished-", said)

    def test_a_trace_may_have_the_longest_name(self):
        longest = os.pathconf(self.place, "PC_NAME_MAX")
        for size in (longest - 18, longest - 17, longest):
            self.good("run", "-q", "--trace-file", self.place / ("n" * size), self.scenario)
            self.assertIn(b"x_sema_create", (self.place / ("n" * size)).read_bytes())
        said, left, _ = self.ended_while_it_traces(signal.SIGTERM, "\u00e9" * (longest // 2))
        self.assertEqual(1, len(left))
        self.assertTrue(left[0].startswith("\u00e9" * ((longest - 18) // 2) + ".unfinished-"))
        self.assertIn(left[0], said)

    def test_the_trace_of_what_cannot_be_read_on_is_kept(self):
        lines = self.write("long.pmx", b"PMX_Init\n" + b"x" * (2 << 20))
        for form in ("text", "jsonl", "chrome"):
            trace = self.place / form
            ended = self.run_tool("run", "--trace-format", form, "--trace-file", trace, lines)
            self.check(ended, form, codes=(2,))
            self.assertIn(f"{lines}:2: a line is longer than", ended.stderr.decode())
            self.assertIn("x_sema_create", trace.read_text())
        json.loads(trace.read_text())

    def test_many_writers_of_one_file(self):
        kept = self.write("kept", self.state.read_bytes())
        lines = self.write("saving.pmx", self.saving(kept, 40))
        writers = [subprocess.Popen([PROGRAM, "run", "-q", lines], cwd=self.place) for _ in range(4)]
        reads = 0
        while any(writer.poll() is None for writer in writers):
            json.loads(kept.read_text())
            reads += 1
        self.assertEqual([0] * 4, [writer.wait() for writer in writers])
        self.assertLess(10, reads)
        self.assertEqual([], self.left_behind())


class Faults(Directory):
    """Whatever a platform function answers, what follows is a failed step or none."""

    LINES = """PMX_Init
PMX_SetTvType 0 PMX_TV_TYPE_PAL
source vdp0 start 1920x1080
advance 1s
sink unplug
sink plug
suspend
resume
PMX_Reset
PMX_Stop
PMX_Uninit
"""

    def functions(self):
        listed = json.loads(self.good("ops", "--json", "*").stdout)
        return [one["name"] for one in listed]

    def test_every_answer(self):
        answers = ("0", "1", "-1", "2147483647", "-2147483648")
        for number, function in enumerate(self.functions()):
            for offset in range(min(ROUNDS, len(answers))):
                answer = answers[(number + offset) % len(answers)]
                lines = f"fault {function} {answer} always\n{self.LINES}"
                self.check(self.run_tool("run", "-", stdin=lines.encode()), f"{function} {answer}", codes=(0, 1))

    def test_a_table_that_nobody_has(self):
        lines = b"PMX_Init\nfault i4ImRegisterInterface2 -1 always\nfault i4ImQueryInterface 0 always\n"
        ended = self.run_tool("run", "-", stdin=lines + b"source vdp0 start 1920x1080\nsource vdp0 size 720x576\n")
        self.check(ended, "fault", codes=(0,))
        self.assertIn(b"NOTICE fault \"i4ImQueryInterface: there is no table of ", ended.stdout)


PARTS = {"inputs": Inputs, "outputs": Outputs, "interrupts": Interrupts, "faults": Faults}


def main():
    global PROGRAM, MANY_RUNS, ROUNDS  # what is tested is given on the command line
    if len(sys.argv) not in (4, 5) or sys.argv[3] not in PARTS:
        sys.exit(__doc__)
    PROGRAM, MANY_RUNS = (str(pathlib.Path(name).resolve()) for name in sys.argv[1:3])
    ROUNDS = int(sys.argv[4]) if len(sys.argv) == 5 else 1
    if shutil.which("strip") is None:
        sys.exit("strip is needed")
    suite = unittest.TestLoader().loadTestsFromTestCase(PARTS[sys.argv[3]])
    return 0 if unittest.TextTestRunner(verbosity=1).run(suite).wasSuccessful() else 1


if __name__ == "__main__":
    sys.exit(main())
