# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Counts what the flight recorder executes on the 32-bit target: the program of recorded.c runs in an emulator that
tells every instruction, and those of the recorder are counted, call by call."""

import bisect
import re
import sys

import arm
import elf
import instructions
import signatures
from tools import ToolError, in_parallel, run, write

sys.path.insert(0, str(signatures.ROOT / "linux"))

import stand_ins  # noqa: E402

COMPILER = "arm-none-eabi-gcc"
EMULATOR = "qemu-arm"
CHANGES = 40  # some of them with a snapshot
WARM_UP = 4   # until every text was read once
CALL, OPERATION = "pmx_recorder_", "PMX_SetModeEx"
# The operating system and the interface manager beside those stand-ins.
SYSTEM = {
    "x_sema_create": "*phSema = 1;\nreturn OSR_OK;",
    "x_timer_create": "*phTimer = 2;\nreturn OSR_OK;",
    "get_part_id_by_name": "return -1;",
    "i4NFBPartitionRead": "return -1;",
    "i4ImQueryInterface": "return -1;",
}
UNWINDER = [f"--defsym=__aeabi_unwind_cpp_pr{i}=0" for i in (0, 1)]  # nobody unwinds here
LINE = re.compile(r"^Trace \d+: \S+ \[[0-9a-f]+/([0-9a-f]+)/")


def _system():
    """C functions of what the stand-ins leave out."""
    functions = [function for header in stand_ins.PLATFORM_HEADERS for function in
                 stand_ins.functions(signatures.ROOT / header)]
    known = {function.name for listed in stand_ins.neighbours().values() for function in listed}
    text = "".join(f'#include "{header}"\n' for header in ("u_os.h", "drv_if.h"))
    for function in functions:
        if function.name not in known:
            body = SYSTEM.get(function.name, "return 0;" if function.has_result else "")
            text += f"{function.result} {function.name}({function.declared})\n{{\n{body}\n}}\n"
    return text


def _build(root, made):
    """The program, its layer and its recorder in ARM state, as in a kernel."""
    form = instructions.product_flags(root)["PMX_TARGET_ARM_FORM_kernel"]
    made.mkdir(parents=True, exist_ok=True)
    sources = sorted((root / "src" / "driver" / "pmx").glob("*.cpp"))
    objects = [made / f"{source.stem}.o" for source in sources]
    flags = arm.compile_flags(root, form)
    in_parallel(lambda source, made_of: run(arm.COMPILER, *flags, "-c", source, "-o", made_of), sources, objects)
    run("arm-none-eabi-ld", "-r", "-o", made / "core.o", *objects)
    run("arm-none-eabi-objcopy", "--localize-hidden", made / "core.o", made / "layer.o")
    recorder = root / "recorder"
    run(sys.executable, recorder / "wrap.py", "arm-none-eabi-objcopy", made / "layer.o", "recorded", made / "under.o")
    run(sys.executable, recorder / "write_shim.py", made / "layer.o", made / "shim.c")
    target = instructions.product_flags(root)["PMX_TARGET_ARM"]
    flags = [*target, "-marm", "-O2", "-ffreestanding", "-w", "-fno-tree-loop-distribute-patterns", f"-I{recorder}",
             *instructions.includes(root)]
    write(made / "stand_ins.c", stand_ins.stand_ins([]))
    write(made / "system.c", _system())
    program = root / "tools" / "cost" / "recorded.c"
    for source, name in ((made / "shim.c", "shim"), (made / "stand_ins.c", "stand_ins"), (made / "system.c", "system"),
                         (program, "program")):
        run(COMPILER, *flags, f"-DCHANGES={CHANGES}", "-c", source, "-o", made / f"{name}.o")
    run("arm-none-eabi-ld", "-static", "--no-warn-mismatch", *UNWINDER, "-o", made / "recorded", "--start-group",
        *(made / f"{name}.o" for name in ("program", "shim", "under", "stand_ins", "system")), "--end-group",
        run(COMPILER, *target, "-marm", "-print-libgcc-file-name").strip())
    return made / "recorded", made / "shim.o"


def _trace(program, made):
    """The address of every instruction that was executed."""
    log = made / "trace"
    run(EMULATOR, "-singlestep", "-d", "exec,nochain", "-D", log, program)
    with open(log, encoding="utf-8") as lines:
        for line in lines:
            found = LINE.match(line)
            if found:
                yield int(found[1], 16)


def _changes(program, shim, made):
    """Of each change of the mode what the recorder executes in the operation and in each call, as (function,
    instructions). What is copied for the recorder counts as the recorder's."""
    own = elf.Elf(shim).functions()
    symbols = sorted((symbol.value, symbol.name) for symbol in elf.Elf(program).symbols
                     if symbol.type == elf.FUNC and symbol.section)
    starts = [start for start, _ in symbols]
    changes, counts, current, is_own = [], None, None, False
    for address in _trace(program, made):
        start, name = symbols[bisect.bisect_right(starts, address) - 1]
        if name == "vChangeBegins":
            counts = []
        elif name == "vChangeEnds" and counts is not None:
            changes.append(counts)
            counts = None
        if counts is None:
            continue
        is_own = name in own or (is_own and name in ("memcpy", "memset"))
        if name in own and name.startswith((CALL, OPERATION)):
            if address == start:
                counts.append([name.removeprefix(CALL), 0])
            current = next(row for row in reversed(counts) if row[0] == name.removeprefix(CALL))
        if is_own:
            current[1] += 1
    if len(changes) != CHANGES:
        raise ToolError(f"{EMULATOR} told {len(changes)} changes of {CHANGES}")
    return changes


def measure(root, made):
    """What the card says of the recorder; nothing of a tree without one."""
    if not (root / "recorder").is_dir():
        return {}
    program, shim = _build(root, made)
    changes = _changes(program, shim, made)[WARM_UP:]
    dearest = max(changes, key=lambda change: sum(count for _, count in change))
    calls = [(name, count) for name, count in dearest if name != OPERATION]
    functions = {}
    for name, count in (row for change in changes for row in change):
        functions[name] = max(count, functions.get(name, 0))
    return {"change": sum(count for _, count in dearest), "calls": len(calls),
            "call": round(sum(count for _, count in calls) / len(calls)), "code": _code(shim), "functions": functions}


def _code(shim):
    return sum(section.size for section in elf.Elf(shim).sections if section.flags & elf.EXEC)
