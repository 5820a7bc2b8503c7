#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Runs the port of linux/ in a real kernel, on an emulated 32-bit ARM machine, and holds what it does against the
virtual board, line by line. Prints KTAP; ends with 1 when something differs, and with 77 when the kernel is not to be
had.

usage: run.py CACHE MADE PMXBOARD OBJECT
    CACHE     folder in which the kernel is kept
    MADE      folder for modules, consoles and what else is made
    PMXBOARD  the tool
    OBJECT    the layer as it ships for kernels
"""

import base64
import concurrent.futures
import contextlib
import gzip
import pathlib
import re
import shutil
import subprocess
import sys
import time

sys.dont_write_bytecode = True

import debian  # noqa: E402
import scenarios  # noqa: E402

HERE = pathlib.Path(__file__).resolve().parent
sys.path[:0] = [str(HERE.parent / "recorder"), str(HERE.parent / "common")]

import figures  # noqa: E402
from ktap import Ktap  # noqa: E402
from recordings import Recording  # noqa: E402

ROOT = HERE.parents[1]
BOOT_SECONDS = 480  # of a boot beside four others; one takes a minute
SKIPPED = 77
# In real time nobody waits longer than this, but once.
LONGEST_WAIT_MS = 1000
LONG_WAIT = "display-part-answers"
CHECKS = 13  # of real_time.sh
MEMORY_LIMIT = 4 * 1024 * 1024  # KB; the kernel's symbol reader can run away
# A nanosecond is an instruction, and a sleep costs nothing: the same run every time, however long it takes. So it goes
# behind a run in real time, which has to be on time and mostly waits.
VIRTUAL_TIME = ["-icount", "shift=0,sleep=off"]
BEHIND_OTHERS = ["nice", "-n", "10"]
APPLETS = ("sh", "mount", "cat", "cut", "grep", "sed", "dmesg", "insmod", "rmmod", "ls", "uname", "reboot", "sleep",
           "echo", "sync", "gzip", "base64", "head")
# What a scenario does to the record behind the layer's back is recorded, too.
RECORDING = "watch_all=1"
TAKEN = "first-mode-after-boot"
# What is changed in that recording by hand; how many events behind it the layer departs, and how. It complains of what
# was not created before it makes the next call that was recorded.
CHANGES = (
    ("x_sema_create", "answer", 2, "another call", r"Assert\("),
    ("x_timer_create", "answer", 2, "another call", r"Assert\("),
    ("PMX_HalSetMode", "argument", 1, "other arguments", r"PMX_HalSetMode\("),
    ("PMX_Init", "answer", 1, "another result", r"end of PMX_Init"),
)
PROCESSORS = 2


class Failed(Exception):
    """No comparison came about."""


def run(*command, **how):
    ran = subprocess.run([str(word) for word in command], capture_output=True, text=True, check=False, **how)
    if ran.returncode != 0:
        raise Failed(f"{' '.join(map(str, command))} ended with {ran.returncode}:\n{(ran.stdout + ran.stderr)[-3000:]}")
    return ran.stdout


def module(kernel, folder, *variables, sources=HERE / "module"):
    """Builds pmx.ko with what stands around it: recorders, and a module that imports from it."""
    folder.mkdir(parents=True, exist_ok=True)
    for link in folder.iterdir():
        if link.is_symlink():
            link.unlink()
    for source in [*(ROOT / "linux").glob("*.[ch]"), *sources.iterdir()]:
        (folder / source.name).symlink_to(source)
    machine = kernel.machine
    said = run("bash", "-c", f'ulimit -v {MEMORY_LIMIT}; exec "$@" 2>&1', "make", "make", "-s", "-j2", "-C",
               kernel.headers, f"M={folder}", f"PMX={ROOT}", f"ARCH={machine.arch}", f"CROSS_COMPILE={machine.cross}",
               *variables, "modules")
    if "objtool:" in said:
        raise Failed(f"the kernel's own look at the code finds:\n{said}")
    # Where memory or races are watched, the compiler puts a constructor of its own into each object.
    settings = (kernel.headers / "include/config/auto.conf").read_text(encoding="utf-8")
    for made in folder.glob("*.ko") if not re.search("^CONFIG_K[AC]SAN=y$", settings, re.M) else ():
        if ".init_array" in run(f"{machine.cross}readelf", "-SW", made):
            raise Failed(f"{made.name} has static constructors, which a kernel does not run")
    return folder


def image(kernel, modules, commands, made, more=None, parameters="", peers=()):
    """The archive that the kernel boots from. The parameters are the module's, in scenarios; the peers are modules of
    that kernel, which are loaded first."""
    root = made / "root"
    shutil.rmtree(root, ignore_errors=True)
    for name in ("bin", "proc", "sys", "dev", "scenarios", "modules"):
        (root / name).mkdir(parents=True)
    shutil.copy(kernel.busybox, root / "bin/busybox")
    for applet in APPLETS:
        (root / "bin" / applet).symlink_to("busybox")
    shutil.copy(HERE / "init.sh", root / "init")
    (root / "init").chmod(0o755)
    for number, name in enumerate([*(kernel.machine.modules if kernel.ships else ()), *peers]):
        shutil.copy(kernel.module(name), root / f"modules/{number}-{pathlib.PurePath(name).name}")
    for path in modules.glob("*.ko"):
        run(f"{kernel.machine.cross}strip", "--strip-debug", "-o", root / path.name, path)
    for name, lines in commands.items():
        (root / "scenarios" / name).write_text("".join(line + "\n" for line in lines), encoding="utf-8")
    (root / "parameters").write_text(parameters, encoding="utf-8")
    if more:
        shutil.copy(more, root / "more.sh")
    return packed(root, made)


def packed(root, made):
    archive = made / "root.cpio.gz"
    run("bash", "-c", 'set -o pipefail; find . | cpio -o -H newc --quiet | gzip -1 >"$0"', archive, cwd=root)
    return archive


def boot(kernel, archive, console, *options, words="", memory=256, seconds=BOOT_SECONDS):
    """What the kernel's console showed. The words are for its command line."""
    machine = kernel.machine
    emulator = [*BEHIND_OTHERS, *machine.emulator] if set(VIRTUAL_TIME) <= set(options) else machine.emulator
    with console.open("wb") as shown:
        try:
            subprocess.run([*emulator, "-m", str(memory), "-nographic", "-no-reboot", "-nic", "none", "-kernel",
                            kernel.image, "-initrd", archive, "-append",
                            f"console={machine.console} panic=-1 {words}".strip(), *options], stdin=subprocess.DEVNULL,
                           stdout=shown, stderr=subprocess.STDOUT, timeout=seconds, check=False)
        except subprocess.TimeoutExpired:
            pass  # told by what is missing
    return console.read_text(encoding="utf-8", errors="replace").replace("\r", "").splitlines()


def parsed(console):
    """({scenario: (calls, results)}, what went wrong)"""
    found, wrong, name = {}, [], None
    for line in console:
        if line.startswith("SCENARIO "):
            name = line.split()[1]
            found[name] = ([], [])
        elif line == "END":
            name = None
        elif re.match(r"WRONG|COMPLAINT|Kernel panic", line):
            wrong.append(line)
            if name:
                found[name][0].append(line)
        elif name and line.startswith("| "):
            found[name][0].append(line[2:])
        elif name and line.startswith("= "):
            found[name][1].append(line[2:])
    if name:
        wrong.append(f"the kernel went away in {name}")
    if not any(line.startswith("DONE ") for line in console):
        wrong.append("the kernel did not come to its end")
    return found, wrong


def differences(what, board, kernel):
    """The first difference of two lists of lines, or nothing."""
    if board == kernel:
        return []
    at = next((i for i, pair in enumerate(zip(board, kernel)) if pair[0] != pair[1]), min(len(board), len(kernel)))
    return [f"{what} {at + 1} of {len(board)}, {len(kernel)} in the kernel",
            f"  board:  {board[at] if at < len(board) else 'nothing more'}",
            f"  kernel: {kernel[at] if at < len(kernel) else 'nothing more'}"]


def compare(ktap, title, expected, console):
    """A verdict for each scenario, and one for the boot."""
    found, wrong = parsed(console)
    lines = 0
    for name, (calls, results) in expected.items():
        if name not in found:
            ktap.verdict(f"{title} {name}", ["it did not run"])
            continue
        lines += len(calls) + len(results)
        ktap.verdict(f"{title} {name}", differences("call", calls, found[name][0]) +
                     differences("result", results, found[name][1]))
    if not expected or not lines:
        wrong.append("nothing was compared")
    ktap.verdict(f"{title} boot: {len(found)} scenarios, {lines} lines", wrong)


def recordings(console):
    """(scenario, recording) of each time that a recorded layer went."""
    name, lines = None, []
    for line in console:
        if line.startswith("RECORDING "):
            name, lines = line.split()[1], []
        elif line == "RECORDED" and name:
            yield name, gzip.decompress(base64.b64decode("".join(lines)))
            name = None
        elif name:
            lines.append(line)


def power_ons(lines):
    """How often the module goes, and tells what it recorded, in a scenario."""
    return 1 + lines[1:].count("POWER-ON")


def replays(ktap, title, program, commands, console, folder):
    """A verdict for each scenario: what the kernel recorded is what the layer does here, behind every power-on."""
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir(parents=True)
    wrong = {name: [] for name in commands}
    found = dict.fromkeys(commands, 0)
    for name, content in recordings(console):
        found[name] += 1
        file = folder / f"{name}-{found[name]}.rec"
        file.write_bytes(content)
        ran = subprocess.run([program, "replay", file], capture_output=True, text=True, check=False)
        if not re.match(r"equal: [1-9]\d* operations, [1-9]\d* calls\n$", ran.stdout):
            wrong[name] += [f"{file.name}: {line}" for line in (ran.stdout + ran.stderr).splitlines()]
    for name, lines in wrong.items():
        due = power_ons(commands[name])
        lines += [f"{found[name]} recordings of {due}"] if found[name] != due else []
        ktap.verdict(f"{title} replayed {name}", lines)


def departs(ktap, program, folder):
    """The same recording with one word changed, again and again."""
    content = (folder / f"{TAKEN}-1.rec").read_bytes()
    for name, what, behind, why, computed in CHANGES:
        recording = Recording(content)
        number, place = recording.answer(name) if what == "answer" else recording.argument(name)
        recording.words[place] ^= 0xFFFFFFFF
        file = folder / "changed-by-hand"
        file.write_bytes(recording.bytes())
        ran = subprocess.run([program, "replay", file], capture_output=True, text=True, check=False)
        expected = rf"departs at event {number + behind} of .*: {why}\n  recorded: .*\n  computed: {computed}"
        ktap.verdict(f"changed by hand: {what} of {name}", [] if re.match(expected, ran.stdout) else
                     [f"not {expected}", *((ran.stdout + ran.stderr).splitlines() or ["equal"])])


def becomes_scenario(ktap, program, folder):
    """A recording of the kernel as a scenario for the board, which passes."""
    file = folder / "written.pmx"
    ran = subprocess.run([program, "replay", "--to-scenario", folder / f"{TAKEN}-1.rec"],
                         capture_output=True, text=True, check=False)
    file.write_text(ran.stdout, encoding="utf-8")
    wrong = (ran.stdout[-500:] + ran.stderr).splitlines() if ran.returncode else []
    if not wrong:
        ran = subprocess.run([program, "run", "--quiet", file], capture_output=True, text=True, check=False)
        wrong = (ran.stdout + ran.stderr + (f"it ended with {ran.returncode}" if ran.returncode else "")).splitlines()
    ktap.verdict("a recording that becomes a scenario", wrong)


def checks(ktap, title, console, number=CHECKS):
    """A verdict for each check that the kernel made behind the scenarios."""
    made = [line.split(" ", 1) for line in console if re.match(r"RIGHT |WRONG .*: ", line)]
    for verdict, what in made:
        ktap.verdict(f"{title} {what.partition(': ')[0]}", [what] if verdict == "WRONG" else [])
    if len(made) < number:
        ktap.verdict(f"{title} {number} checks", [f"only {len(made)} were made"])


def without_pokes(commands):
    """What others do to the layer's private objects, only a test records."""
    return {name: lines for name, lines in commands.items() if not any("poke " in line for line in lines)}


def has_processors(ktap, console):
    """Whether the machine had as many as it was given."""
    told = [line for line in console if line.startswith("PROCESSORS ")]
    ktap.verdict(f"a machine of {PROCESSORS} processors", [] if told == [f"PROCESSORS {PROCESSORS}"] else
                 told or ["how many it has, it did not tell"])


def in_real_time(commands):
    """(scenarios that a user waits for, those that are left out, with the reason)"""
    chosen, left_out = {}, {}
    for name, lines in commands.items():
        slept = sum(int(line.rpartition("sleep ")[2]) for line in lines if re.search(r"(^|\w )sleep \d+$", line))
        if any(line.startswith("poke ") for line in lines):
            left_out[name] = "the object that ships keeps its record to itself"
        elif slept > LONGEST_WAIT_MS and name != LONG_WAIT:
            left_out[name] = f"waits for {slept} ms"
        else:
            chosen[name] = lines
    return chosen, left_out


def prepared(ktap, program):
    """({scenario: commands}, {scenario: what the board makes of it})"""
    commands, expected = {}, {}
    for path in sorted((ROOT / "scenarios").glob("*.pmx")):
        try:
            commands[path.stem] = list(scenarios.commands(path))
            expected[path.stem] = scenarios.on_the_board(program, path)
        except scenarios.Unknown as unknown:
            ktap.verdict(path.stem, [f"the kernel has no way to do this: {unknown}"])
    return commands, expected


def expected_of(expected, commands):
    """What is expected of these scenarios."""
    return {name: expected[name] for name in commands if name in expected}


def check_path(*paths):
    """The kernel's build cannot be told of every folder."""
    for path in paths:
        refused = re.search(r"[\s:#$'\"\\\\]", str(path))
        if refused:
            raise Failed(f"the kernel's build does not work in {path}, for the {refused[0]} in that name")


@contextlib.contextmanager
def booted(kernel, made, boots):
    """What waits for the console of each of these kernels, which run at once: {name: (archive, options…)}. Behind it
    none runs any more."""
    with concurrent.futures.ThreadPoolExecutor(len(boots)) as running:
        consoles = {name: running.submit(boot, kernel, archive, made / f"{name}.log", *options)
                    for name, (archive, *options) in boots.items()}
        yield {name: console.result for name, console in consoles.items()}


def compare_all(ktap, cache, made, program, shipped):
    kernel = debian.kernel(cache)
    built = module(kernel, made / "built")
    ktap.verdict(f"pmx.ko built by the build of {kernel.release}")
    ready = module(kernel, made / "shipped", f"PMX_OBJECT={shipped}")
    ktap.verdict("pmx.ko from the object that ships")
    recorder = module(kernel, made / "recorded", f"PMX_OBJECT={shipped}", "PMX_RECORDER=y")
    ktap.verdict("pmx.ko from the object that ships, with the recorder around it")
    commands, expected = prepared(ktap, program)
    unwatched = without_pokes(commands)
    in_time, left_out = in_real_time(commands)
    boots = {
        "virtual": (image(kernel, built, commands, made / "virtual"), *VIRTUAL_TIME),
        "recorded": (image(kernel, recorder, commands, made / "recorder", parameters=RECORDING), *VIRTUAL_TIME),
        "product": (image(kernel, recorder, unwatched, made / "product"), *VIRTUAL_TIME),
        "real": (image(kernel, ready, in_time, made / "real", HERE / "real_time.sh"),),
        "several": (image(kernel, recorder, in_time, made / "several"), "-smp", str(PROCESSORS)),
    }
    with booted(kernel, made, boots) as console_of:
        compare(ktap, "virtual time:", expected, console_of["virtual"]())
        compare(ktap, "recorded:", expected, console_of["recorded"]())
        replays(ktap, "recorded:", program, commands, console_of["recorded"](), made / "recordings")
        compare(ktap, "as on a product:", expected_of(expected, unwatched), console_of["product"]())
        replays(ktap, "as on a product:", program, unwatched, console_of["product"](), made / "product-recordings")
        departs(ktap, program, made / "recordings")
        becomes_scenario(ktap, program, made / "recordings")
        compare(ktap, "real time:", expected_of(expected, in_time), console_of["real"]())
        for name, reason in left_out.items():
            ktap.skip(f"real time: {name}", reason)
        checks(ktap, "real time:", console_of["real"]())
        has_processors(ktap, console_of["several"]())
        compare(ktap, "several processors:", expected_of(expected, in_time), console_of["several"]())
        replays(ktap, "several processors:", program, in_time, console_of["several"](), made / "several-recordings")
    figures.note("kernel", verdicts=ktap.number - ktap.skipped, skipped=ktap.skipped)


def carried_out(work, words):
    """Runs that with a verdict for whatever it finds; how the program ends."""
    paths = [pathlib.Path(word).resolve() for word in words]
    began, skipped = time.monotonic(), False
    ktap = Ktap()
    try:
        check_path(ROOT, *paths)
        work(ktap, *paths)
    except debian.Unavailable as reason:
        ktap.skip("kernel", str(reason).replace("\n", " "))
        skipped = True
    except Failed as reason:
        ktap.verdict("kernel", str(reason).splitlines())
    ktap.end()
    print(f"# {time.monotonic() - began:.0f} s")
    return 1 if ktap.failures else SKIPPED if skipped else 0


if __name__ == "__main__":
    sys.exit(carried_out(compare_all, sys.argv[1:]))
