# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Makes a program of two layers and whatever runs them side by side."""

import pathlib
import sys

sys.path.insert(0, str(pathlib.Path(__file__).resolve().parents[2] / "tools" / "cost"))

import elf  # noqa: E402
import generate  # noqa: E402
import instructions  # noqa: E402
import names  # noqa: E402
import records  # noqa: E402
import signatures  # noqa: E402
from tools import compiler, in_parallel, run, write  # noqa: E402

ROOT = signatures.ROOT
HERE = ROOT / "tests" / "lockstep"
SOURCES = [HERE / f"{name}.cpp" for name in
           ("layout", "recorder", "values", "draw", "agreement", "compare", "findings", "options", "bases",
            "random_runs")]
SOURCES += [ROOT / "tools" / "record_view" / "record_layout.cpp"]


class Unlike(Exception):
    """Layers that cannot be held against each other."""


def sources_of(tree):
    """The layer's sources in a tree, named from its root: that is how assertions name their file."""
    return sorted(path.relative_to(tree) for path in (tree / "src" / "driver" / "pmx").glob("*.cpp"))


def compile_layer(tree, sources, made):
    """Objects of a layer's sources, compiled as the product is."""
    flags = instructions.product_flags(tree)["PMX_PRODUCT_FLAGS"]
    includes = [f"-I{directory}" for directory in signatures.HEADER_DIRECTORIES]
    objects = [made / f"{source.stem}.o" for source in sources]
    made.mkdir(parents=True, exist_ok=True)

    def compile_one(source, made_object):
        run(*compiler("g++"), *flags, *includes, "-c", source, "-o", made_object, cwd=tree)

    in_parallel(compile_one, sources, objects)
    return objects


def combine(objects, made):
    """All objects of a layer in one."""
    run("ld", "-r", "-o", made / "core.o", *objects)
    return made / "core.o"


def build_layer(tree, made):
    return combine(compile_layer(tree, sources_of(tree), made), made)


def renamed(layer, prefix, output):
    """A copy of a layer's object with a prefix before every name that it defines."""
    symbols = [symbol for symbol in elf.Elf(layer).symbols if not symbol.is_local and symbol.section and symbol.name]
    names = write(output.with_suffix(".names"), "".join(f"{symbol.name} {prefix}{symbol.name}\n" for symbol in symbols))
    run("objcopy", f"--redefine-syms={names}", layer, output)
    return output


def state_of(layer):
    """Size of each variable of a layer's object, by name."""
    return {symbol.name: symbol.size for symbol in elf.Elf(layer).symbols
            if symbol.type == elf.OBJECT and symbol.section and symbol.section.flags & elf.WRITE}


def hold_state_alike(layer):
    """What a layer remembers must be what is compared."""
    found, known = state_of(layer), set(generate.state())
    if found.keys() != known:
        names = ", ".join(sorted(found.keys() ^ known))
        raise Unlike(f"{layer}: these variables are in the layer or in the headers, but not in both: {names}")


def hold_literal_complete(layer):
    """The literal writing has every operation: what it lacks would not be compared."""
    has = {symbol.name for symbol in elf.Elf(layer).symbols if symbol.section and not symbol.is_local}
    header = signatures.platform_functions.LAYER_HEADER
    lacking = [f"{header}:{function.line}: tests/lockstep/literal has no {function.name}"
               for function in signatures.platform_functions.functions(ROOT / header) if function.name not in has]
    if lacking:
        raise Unlike("\n".join(lacking))


def build_harness(made, program=HERE / "revisions.cpp"):
    """Everything but the layers, with the program's own source."""
    flags = ["-std=c++20", "-O2", "-fno-pie", f"-I{ROOT}", *instructions.includes()]
    flags.append(f"-I{made}")
    write(made / "record_fields.h", records.table(names.headers(ROOT)))
    write(made / "layer_record_fields.h", records.table([ROOT / names.RECORD_HEADER], "layer_record_fields"))
    sources = [write(made / "surroundings.cpp", generate.source()), *SOURCES, program]
    objects = [made / f"{source.stem}.o" for source in sources]

    def compile_one(source, made_object):
        run(*compiler("g++"), *flags, "-w", "-c", source, "-o", made_object)

    in_parallel(compile_one, sources, objects)
    return objects


def link(harness, first, second, made):
    """The program that runs two layers."""
    objects = [renamed(layer, prefix, made / f"{prefix}layer.o")
               for layer, prefix in zip((first, second), generate.LAYERS)]
    program = made / "revisions"
    run("g++", "-no-pie", *harness, *objects, "-o", program)
    return program
