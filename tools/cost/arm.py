# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The layer on the 32-bit target, compiled for size: bytes of code, texts, tables and RAM by symbol, and stack by the
compiler's own call graph. Of the form for kernels the bytes in all, and those of its unwind tables."""

import collections
import dataclasses
import re

import callgraph
import elf
import instructions
import signatures
from tools import ToolError, in_parallel, run, write

COMPILER = "arm-none-eabi-g++"
FORM = ("-mthumb", "-Os")
BEFORE = ("-march=armv7-a", "-mfloat-abi=soft")  # the target of revisions whose flags do not tell it

# Texts and tables apart, so that each is counted for itself; the linker merges texts as for a product.
LAYOUT = """SECTIONS
{
    .code : { *(.text .text.*) }
    .texts : { *(.rodata.str*) }
    .tables : { *(.rodata .rodata.*) }
    .data : { *(.data .data.*) }
    .bss (NOLOAD) : { *(.bss .bss.* COMMON) }
    /DISCARD/ : { *(.ARM.attributes .comment .note* .debug* .ARM.exidx*) }
}
"""


@dataclasses.dataclass(frozen=True)
class Sizes:
    code: dict      # bytes by function
    tables: dict    # by table
    ram: dict       # by object
    texts: dict     # bytes of the texts that a function hands on; one that several use counts for each
    files: dict     # code, texts, tables, ram by file
    totals: dict    # of each, as linked
    kernel: dict    # the same of the form for kernels, and its unwind tables; nothing of a tree without that form
    repeated: list  # texts that are stored more than once
    frames: dict    # stack frame by function
    graph: callgraph.Graph


def compile_flags(root, form):
    flags = instructions.product_flags(root)
    code = [flag for flag in flags["PMX_PRODUCT_CODE"] if not flag.startswith(("-O", "-g"))]
    return [*flags["PMX_PRODUCT_LANGUAGE"], *code, *(flags["PMX_TARGET_ARM"] or BEFORE), *form, "-w",
            *instructions.includes(root)]


def _sources(root):
    return sorted((root / "src" / "driver" / "pmx").glob("*.cpp"))


def _compile(root, made):
    sources = _sources(root)
    made.mkdir(parents=True, exist_ok=True)
    for old in made.glob("*.ci"):
        old.unlink()
    flags = compile_flags(root, FORM)

    def compile_one(source):
        run(COMPILER, *flags, "-fcallgraph-info=su,da", "-c", source, "-o", made / f"{source.stem}.o")
        # Once more for the texts: only in a section of its own can a function's texts be told from the others'.
        run(COMPILER, *flags, "-ffunction-sections", "-c", source, "-o", made / f"{source.stem}.texts.o")

    in_parallel(compile_one, sources)
    return [source.stem for source in sources]


def _texts_by_function(stems, made):
    texts = {}
    for stem in stems:
        read = elf.Elf(made / f"{stem}.texts.o")
        for section in read.sections:
            found = re.fullmatch(r"\.rodata\.(.+)\.str\d+\.\d+", section.name)
            if found:
                texts.setdefault(found[1], set()).update(_texts([(section, read.bytes_of(section))]))
    return {name: sum(len(text) + 1 for text in listed) for name, listed in sorted(texts.items())}


def _of_section(name):
    """What a section of an object file counts as."""
    for prefix, kind in ((".text", "code"), (".rodata.str", "texts"), (".rodata", "tables"), (".data", "ram"),
                         (".bss", "ram")):
        if name.startswith(prefix):
            return kind
    return None


def _texts(sections):
    """The texts of an object file's sections that the linker may merge."""
    for section, content in sections:
        if section.flags & elf.MERGE and section.flags & elf.STRINGS:
            yield from content.split(b"\0")[:-1]


def _kept(texts):
    """The texts that a linker keeps: each once, and none that is the end of another."""
    kept = []
    for text in sorted(set(texts), key=lambda text: text[::-1], reverse=True):
        if not kept or not kept[-1].endswith(text):
            kept.append(text)
    return set(kept)


def _files(stems, made):
    """Bytes by file and kind. A text counts in the first file that has it."""
    everything = {stem: elf.Elf(made / f"{stem}.o") for stem in stems}
    texts = {stem: list(_texts([(section, read.bytes_of(section)) for section in read.sections]))
             for stem, read in everything.items()}
    left = _kept(text for listed in texts.values() for text in listed)
    files = {}
    for stem, read in everything.items():
        row = collections.Counter()
        for section in read.sections:
            kind = _of_section(section.name)
            if kind not in (None, "texts"):
                row[kind] += section.size
        own = left & set(texts[stem])
        left -= own
        row["texts"] = sum(len(text) + 1 for text in own)
        files[stem] = {kind: row[kind] for kind in ("code", "texts", "tables", "ram")}
    return files


def _by_symbol(linked, section_names, kinds):
    return {symbol.name: symbol.size for symbol in sorted(linked.symbols, key=lambda symbol: symbol.name)
            if symbol.section and symbol.section.name in section_names and symbol.type in kinds and symbol.size}


def _link(made, objects):
    layout = write(made / "layout.ld", LAYOUT)
    run("arm-none-eabi-ld", "-O2", "-e", "0", "--unresolved-symbols=ignore-all", "--no-warn-mismatch", "-T", layout,
        "-o", made / "layer.elf", *objects)
    return elf.Elf(made / "layer.elf")


def _totals(linked):
    sizes = {section.name: section.size for section in linked.sections}
    return {"code": sizes.get(".code", 0), "texts": sizes.get(".texts", 0), "tables": sizes.get(".tables", 0),
            "ram": sizes.get(".data", 0) + sizes.get(".bss", 0)}


def _kernel(root, made):
    """The form for kernels. A module's linker leaves the unwind tables as they are in the objects."""
    form = instructions.product_flags(root)["PMX_TARGET_ARM_FORM_kernel"]
    if not form:
        return {}
    made.mkdir(parents=True, exist_ok=True)
    flags, sources = compile_flags(root, form), _sources(root)
    objects = [made / f"{source.stem}.o" for source in sources]
    in_parallel(lambda source, made_of: run(COMPILER, *flags, "-c", source, "-o", made_of), sources, objects)
    unwind = sum(section.size for made_of in objects for section in elf.Elf(made_of).sections
                 if section.name.startswith((".ARM.exidx", ".ARM.extab")))
    return {**_totals(_link(made, objects)), "unwind": unwind}


def measure(root, made):
    """The Sizes of the layer of a tree."""
    stems = _compile(root, made)
    linked = _link(made, [made / f"{stem}.o" for stem in stems])
    [texts] = [section for section in linked.sections if section.name == ".texts"]
    stored = collections.Counter(linked.bytes_of(texts).split(b"\0")[:-1])
    graph = callgraph.read([(made / f"{stem}.ci").read_text(encoding="utf-8") for stem in stems],
                           signatures.platform())
    return Sizes(
        code=_by_symbol(linked, {".code"}, {elf.FUNC}), tables=_by_symbol(linked, {".tables"}, {elf.OBJECT}),
        ram=_by_symbol(linked, {".data", ".bss"}, {elf.OBJECT}), texts=_texts_by_function(stems, made),
        files=_files(stems, made), totals=_totals(linked), kernel=_kernel(root, made / "kernel"),
        repeated=sorted(text.decode() for text, times in stored.items() if times > 1 and text),
        frames=graph.frames, graph=graph)
