# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Counts the instructions of each path, inside the layer and inside its floor: records the paths on the virtual board,
builds the measuring program from the recording, and runs it under callgrind."""

import dataclasses
import functools
import json
import pathlib
import re

import elf
import program
import signatures
import wrappers
from tools import ToolError, compiler, in_parallel, run, write

ROOT = signatures.ROOT
TOOL = ROOT / "tools" / "cost"
PICTURE = "board/picture/libpmx_picture.a"  # where the build can compute pictures
LIBRARIES = ("tools/libpmxboard_language.a", "tools/librecord_view.a", PICTURE, "board/libpmx_board.a")


@dataclasses.dataclass(frozen=True)
class Count:
    calls: int       # of the platform, in all
    registers: int   # accesses among them
    logs: int        # lines among them
    layer: int       # instructions executed in the layer
    floor: int       # in the straight line of the same calls

    @property
    def price(self):
        return self.layer - self.floor


def product_flags(root=ROOT):
    """The product's flags by list name, as its one place of flags has them."""
    lines = run("cmake", f"-DROOT={root}", "-P", TOOL / "flags.cmake").splitlines()
    return {line.split()[0]: line.split()[1:] for line in lines if line}


def includes(root=ROOT):
    return [f"-I{root / directory}" for directory in signatures.HEADER_DIRECTORIES]


def build_layer(root, made):
    """The layer of a tree, compiled as the product is: all its objects in one."""
    flags = product_flags(root)["PMX_PRODUCT_FLAGS"]
    sources = sorted((root / "src" / "driver" / "pmx").glob("*.cpp"))
    objects = [made / "layer" / f"{source.stem}.o" for source in sources]
    (made / "layer").mkdir(parents=True, exist_ok=True)

    def compile_one(source, made_object):
        run(*compiler("g++"), *flags, *includes(root), "-c", source, "-o", made_object)

    in_parallel(compile_one, sources, objects)
    run("ld", "-r", "-o", made / "core.o", *objects)
    return made / "core.o"


@dataclasses.dataclass(frozen=True)
class Board:
    """A build of the virtual board and the scenario language."""

    build: pathlib.Path

    @functools.cached_property
    def _cache(self):
        return (self.build / "CMakeCache.txt").read_text(encoding="utf-8")

    @property
    def source(self):
        """The tree that it was built from."""
        return pathlib.Path(re.search(r"^CMAKE_HOME_DIRECTORY:INTERNAL=(.*)$", self._cache, re.M)[1])

    @property
    def flags(self):
        sanitized = re.search(r"^PMX_SANITIZE:BOOL=(ON|TRUE|1)$", self._cache, re.M)
        return ["-fsanitize=address,undefined"] if sanitized else []

    @functools.cached_property
    def examples(self):
        """(lines before it, line) of the tool's example of each operation."""
        told = json.loads(run(self.build / "pmxboard", "ops", "--json"))
        return {each["name"]: (each["example_needs"], each["example"]) for each in told if each["example"]}

    @property
    def libraries(self):
        """What the tool is linked from, with the line editor's library where the build has found it."""
        line_editor = re.search(r"^LIBEDIT_LIBRARY:FILEPATH=(/.*)$", self._cache, re.M)
        paths = [self.build / library for library in LIBRARIES]
        pictures = ("-lpng", "-lpixman-1") if (self.build / PICTURE).exists() else ()
        return [*(path for path in paths if pictures or path != self.build / PICTURE), "-ltomlplusplus", *pictures,
                *(line_editor.groups() if line_editor else ())]


def reachable(core, made):
    """A copy of the layer's object with every object of its state reachable by name."""
    copy = made / "layer.o"
    local = [symbol.name for symbol in elf.Elf(core).symbols
             if symbol.is_local and symbol.type == elf.OBJECT and symbol.section
             and symbol.section.flags & elf.WRITE]
    run("objcopy", *(f"--globalize-symbol={name}" for name in local), core, copy)
    return copy


def record(paths, board, layer, made, objects):
    """What each path's last line calls and is answered, on the board."""
    source = write(made / "wrappers.cpp", wrappers.source(objects))
    host = ["-std=c++20", "-O1", "-fno-pie", f"-I{board.source}", f"-I{ROOT}", *includes(board.source), *board.flags]
    for name, text in (("wrappers", source), ("recorder", TOOL / "recorder.cpp")):
        run(*compiler("g++"), *host, "-w", "-c", text, "-o", made / f"{name}.o")
    run("g++", "-no-pie", *board.flags, made / "recorder.o", made / "wrappers.o", layer, *board.libraries,
        *(f"-Wl,--wrap={name}" for name in wrappers.wrapped()), "-o", made / "recorder")
    told = "".join("\n".join([f"path {i}", *path.lines]) + "\n" for i, path in enumerate(paths))
    try:
        recorded = [json.loads(line) for line in run(made / "recorder", input=told, cwd=board.source).splitlines()]
    except ToolError as error:
        raise ToolError(re.sub(r"path (\d+)", lambda found: f"[{paths[int(found[1])].name}]", str(error))) from None
    for path, found in zip(paths, recorded, strict=True):
        if found["name"] != path.operation:
            raise ToolError(f"[{path.name}] measured {found['name']}")
    return recorded


def build_program(recorded, paths, layer, made, objects):
    flags = product_flags()["PMX_PRODUCT_FLAGS"]
    floors = write(made / "floors.cpp", program.floors(recorded))
    harness = write(made / "harness.cpp", program.harness(recorded, [path.name for path in paths], objects))
    run(*compiler("g++"), *flags, *includes(), "-w", "-c", floors, "-o", made / "floors.o")
    run(*compiler("g++"), "-std=c++20", "-O1", "-fno-pie", "-w", *includes(), "-c", harness, "-o", made / "harness.o")
    run("g++", "-no-pie", made / "harness.o", made / "floors.o", layer, "-o", made / "measure")
    (made / "states").write_bytes(b"".join(bytes.fromhex(path["state"]) for path in recorded))


def self_costs(text):
    """Instructions by function that it executed itself, for each part of a callgrind output: name of the part and the
    counts. Lines behind `calls=` are what was executed in the callee."""
    parts, name, function, skip = {}, None, None, False
    for line in text.splitlines():
        if line.startswith("desc: Trigger: Client Request: "):
            name = line.removeprefix("desc: Trigger: Client Request: ")
            parts[name] = {}
        elif line.startswith("fn="):
            function = line[3:]
        elif line.startswith("calls="):
            skip = True
        elif re.match(r"[0-9+*-]", line):
            if not skip and name is not None:
                parts[name][function] = parts[name].get(function, 0) + int(line.split()[1])
            skip = False
        elif line.startswith("part:"):
            name = None
    return parts


def callgrind(made):
    output = made / "callgrind.out"
    for old in made.glob("callgrind.out*"):
        old.unlink()
    run("valgrind", "--tool=callgrind", f"--callgrind-out-file={output}", "--combine-dumps=yes", "--demangle=no",
        "--compress-strings=no", "--compress-pos=no", "--dump-line=no", made / "measure", made / "states")
    return self_costs(output.read_text(encoding="utf-8"))


def count(paths, board, root, made):
    """The Count of each path, by its name: the layer of the tree `root` on a board."""
    core = build_layer(root, made)
    objects = elf.Elf(core).objects()
    layer = reachable(core, made)
    recorded = record(paths, board, layer, made, objects)
    build_program(recorded, paths, layer, made, objects)
    parts = callgrind(made)
    functions = elf.Elf(core).functions()
    counts = {}
    for i, (path, found) in enumerate(zip(paths, recorded, strict=True)):
        names = [call["name"] for call in found["calls"]]
        in_layer = sum(cost for name, cost in parts[f"layer/{path.name}"].items() if name in functions)
        in_floor = parts[f"floor/{path.name}"][f"floor_{i}"]
        counts[path.name] = Count(len(names), sum(name in signatures.REGISTERS for name in names),
                                  sum(name in signatures.LOGS for name in names), in_layer, in_floor)
    return counts
