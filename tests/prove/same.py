# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Two layers that do the same: an older one and today's are compiled into one program, and of each operation the
checker is asked whether both, begun in the same state with the same arguments and given the same answers, make the same
calls with the same arguments and bytes, find and leave the same state in front of each, and end alike. What compiles to
the same code needs no checker.

A call is known by its number: the platform's answers, and what others change meanwhile, hang on that alone. One call,
one part of the state and one byte of what pointers lead to are looked at, any of them, chosen in front of both runs:
what is proved of these holds of all."""

import collections
import contextlib
import dataclasses
import hashlib
import pathlib
import re
import shutil
import subprocess
import sys
import threading
import time

ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path[:0] = [str(ROOT / "cmake"), str(ROOT / "tools/cost")]

import declarations  # noqa: E402
import harness  # noqa: E402
import pointers  # noqa: E402
import verdicts  # noqa: E402
import view  # noqa: E402
from cost import tree_of  # noqa: E402
from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, functions  # noqa: E402
from tools import ToolError, run  # noqa: E402

HERE = pathlib.Path(__file__).resolve().parent
WORLDS = ("NOBODY", "ANYBODY")
OLD = "old_"  # in front of each name that the older layer defines
TEXT = "pmx_text_"
CALLS = (12, 48, 160)  # for how many calls there is room; the least that is enough is taken
# Text that may touch any field of the mixer's record; and any of a record within it.
WHOLE = re.compile(r"_arPmxConfDefault|\bPMX_CONF_T\b(?! ?\*)|(?<!\w)\*\s*(?:prConf|prPmxConf\(\))(?!\s*(?:->|\.))")
COPIED = re.compile(r"\bmem(?:cpy|set)\([^;]*(?:\bpr[A-Z]|->)|(?:^|[=(,;&|!?:])\s*\*\s*pr\w+\b(?!\s*(?:->|\.))", re.M)
SAME = "same: "  # of all that is claimed of the two so it begins
ROOM = "there is room for every call"
AT_A_CALL = f"{SAME}at a call, "
ONE_TEXT, FEW_BYTES = "one text is formatted in an operation", "no more than 8 bytes are read"
OPEN = (ROOM, ONE_TEXT, FEW_BYTES)
NOT_REACHED = "an end is not reached: what is presumed cannot be"
VALUE = re.compile(r"^  ([\w.]+)((?:\[\d+)?)l*((?:\].*?)?)=(-?\d+)", re.M)
SLICED = "--slice-formula"
OPTIONS = ["--nondet-static", "--unwind", "9", "--object-bits", "12", "--drop-unused-functions", SLICED,
           *verdicts.CHECKS]
EXPORTED = re.compile(r"^extern (?:PMX_API )?const \w+\*? (?:const )?(\w+)", re.M)
LITERAL = re.compile(r'"(?:[^"\\\n]|\\.)*"(?:\s*"(?:[^"\\\n]|\\.)*")*')


class Unlike(Exception):
    """Layers that cannot be held against each other."""


# Texts


class Texts:
    """Every text of both layers as an object by its contents: equal pointers are equal texts."""

    def __init__(self):
        self._numbers = {}

    def name(self, literal):
        whole = "".join(part[1:-1] for part in re.findall(r'"(?:[^"\\\n]|\\.)*"', literal))
        return f"{TEXT}{self._numbers.setdefault(whole, len(self._numbers))}"

    def defined(self):
        return "".join(f"const char {TEXT}{number}[1];\n" for number in range(len(self._numbers)))


def _arguments(text, at):
    """(the arguments that begin at a place behind a bracket, the place behind the closing one)"""
    found, depth, begin = [], 0, at
    while True:
        if text[at] == "," and depth == 0 or text[at] == ")" and depth == 0:
            found.append(text[begin:at].strip())
            begin = at + 1
            if text[at] == ")":
                return found, at + 1
        depth += {"(": 1, "[": 1, "{": 1, ")": -1, "]": -1, "}": -1}.get(text[at], 0)
        at += 1


def by_number_of_values(text, name, fixed, known):
    """Calls of a function that takes any number of values become calls of one that takes so many."""
    done, at = "", 0
    for match in re.finditer(rf"\b{name}\s*\(", text):
        arguments, end = _arguments(text, match.end())
        if arguments[-1] == "...":
            continue
        known.add((name, len(arguments) - fixed))
        values = [*arguments[:fixed], *(f"(__SIZE_TYPE__)({value})" for value in arguments[fixed:])]
        done += f"{text[at:match.start()]}{name}_{len(arguments) - fixed}({', '.join(values)})"
        at = end
    return done + text[at:]


def with_any_number_of_values():
    """{function of the platform: how many parameters have names}"""
    return {function.name: len(list(pointers.declared_parameters(function)))
            for header in PLATFORM_HEADERS for function in functions(ROOT / header) if "..." in function.declared}


# One layer


def _chunks(text):
    """(head, body) of all that stands at the outermost level of a source and has a body."""
    depth, begin, brace = 0, 0, None
    for at, letter in enumerate(text):
        if letter == "{":
            brace = at if brace is None else brace
            depth += 1
        elif letter == "}":
            depth -= 1
        if depth == 0 and (letter == ";" or letter == "}" and _is_function(text[begin:brace])):
            if brace is not None:
                yield text[begin:brace], text[brace:at]
            begin, brace = at + 1, None


def _is_function(head):
    return "=" not in head and not re.match(r"\s*(?:typedef|struct|union|enum)\b", head)


class Workshop:
    """Compiles for the target and for the checker, each text once, and gives texts their names."""

    def __init__(self, cbmc, folder):
        self._cbmc, self._folder = cbmc, folder
        shutil.rmtree(folder, ignore_errors=True)
        folder.mkdir(parents=True)
        self.texts, self.known, self._compiled = Texts(), set(), {}

    def run(self, program, *arguments):
        ran = self._cbmc.run(program, *arguments)
        if ran.returncode != 0:
            raise view.Failed(f"{program}:\n{(ran.stdout + ran.stderr)[-3000:]}")

    def check(self, *arguments, seconds):
        ran = self._cbmc.run("cbmc", *arguments, timeout=seconds)
        return ran.stdout + ran.stderr

    def _written(self, text, ending):
        source = self._folder / f"{hashlib.sha256(text.encode()).hexdigest()[:32]}{ending}.c"
        source.write_text(text, encoding="utf-8")
        return source, source.with_suffix(".o" if ending else ".go")

    def head(self, text):
        """What a text takes for granted: texts, and calls with so many values."""
        lines = ["typedef int INT32;", "typedef char CHAR;"]
        lines += [f"{each.result} {each.name}({each.declared});" for each in with_values(self.known)
                  if re.search(rf"\b{each.name}\b", text)]
        lines += [f"extern const char {name}[];" for name in sorted(set(re.findall(rf"\b{TEXT}\d+", text)))]
        return "\n".join(lines).replace("size_t", "__SIZE_TYPE__") + "\n"

    def compiled(self, text):
        """(code, names of all that is defined, those that are variables) of a text."""
        if text not in self._compiled:
            source, made = self._written(f"{self.head(text)}#define {view.GUARD}(i, n) (i)\n{text}", ".plain")
            compiler = ["arm-none-eabi-gcc", "-std=gnu11", *view.FLAGS, *view.APART, "-c", source, "-o", made]
            view.run(*compiler)
            code = view.code(made)
            # Functions without code of their own have a name, too.
            view.run(*compiler, "-O0", "-fkeep-inline-functions", "-fkeep-static-functions", "-fkeep-static-consts")
            symbols = [line.split()[1:] for line in view.run("arm-none-eabi-nm", "--defined-only", made).splitlines()]
            self._compiled[text] = (code, {name for _, name in symbols if not name.startswith("$")},
                                    {name for kind, name in symbols if kind in "bBdD" and not name.startswith("$")})
        return self._compiled[text]

    def for_the_checker(self, text):
        source, made = self._written(f"{self.head(text)}#define {view.GUARD}(i, n) {verdicts.GUARD}\n{text}", "")
        if not made.exists():
            self.run("goto-cc", *verdicts.COMPILER, "-c", source, "-o", made)
        return made


class Layer:
    """A tree's layer as C, its texts as objects, and what it compiles to."""

    def __init__(self, root, folder, workshop):
        shutil.rmtree(folder, ignore_errors=True)
        folder.mkdir(parents=True)
        self.root, self.folder, self.texts = root, folder, {}
        self.code, self.defined, self.writable = {}, set(), set()
        counted = with_any_number_of_values()
        for path in view.write(root, folder):
            # An assertion tells the line that it stands in, which any change moves.
            path.write_text(re.sub(r"\b__LINE__\b", "0", path.read_text(encoding="utf-8")), encoding="utf-8")
            text = view.run(*view.PREPROCESS, "-P", *view.words(), "-Iinclude", path.name, cwd=folder)
            text = re.sub(r"^ *#.*\n|^ *_Static_assert\(.*\);$", "", text, flags=re.M)
            text = re.sub(r"__attribute__\(\(visibility\([^)]*\)\)\)", "", text)
            text = LITERAL.sub(lambda match: workshop.texts.name(match[0]), text)
            for name, fixed in counted.items():
                text = by_number_of_values(text, name, fixed, workshop.known)
            self.texts[path.stem] = text
        for text in self.texts.values():
            code, defined, writable = workshop.compiled(text)
            for name, lines in code.items():
                self.code[name] = self.code.get(name, []) + lines  # two sources may have a static of one name
            self.defined |= defined
            self.writable |= writable
        self._chunks = [(set(re.findall(r"\w+", head)), body) for text in self.texts.values()
                        for head, body in _chunks(text)]

    def reached(self, name):
        """All that stands in functions and tables which an operation reaches, or may reach."""
        left, seen, found = [name], set(), []
        while left:
            one = left.pop()
            if one in seen:
                continue
            seen.add(one)
            for names, body in self._chunks:
                if one in names:
                    found.append(body)
                    left += [other for other in set(re.findall(r"\w+", body)) & self.defined if other not in seen]
        return "\n".join(found)

    def rests_on(self, name):
        """Names of functions and tables whose code makes up an operation's."""
        left, seen = [name], set()
        while left:
            one = left.pop()
            if one not in seen and one in self.code:
                seen.add(one)
                left += view.named_in(self.code[one])
        return seen

    def as_checked(self, prefix):
        """The texts that the checker reads, with a prefix before what they define."""
        names = re.compile(rf"\b({'|'.join(sorted(self.defined))})\b")
        return [names.sub(rf"{prefix}\1", text) if prefix else text for text in self.texts.values()]


# What is kept


@dataclasses.dataclass(frozen=True)
class Leaf:
    """One number or pointer of all that the layer keeps."""
    place: str  # _arPmxConf[0].arPortInfo[3].fgConnected
    type: str

    def of(self, side):
        return f"{OLD if side == 'OLD' else ''}{self.place}"

    def number(self, side):
        return f"(UINT32){'(size_t)' if self.type.endswith('*') else ''}{self.of(side)}"


def _count(text, root):
    if text.isdigit():
        return int(text)
    numbers = {each.name: each.number for path in view.headers(root)
               for each in declarations.constants(declarations.read(path))}
    numbers |= {each.name: each.number for path in view.headers(root)
                for one in declarations.enumerations(declarations.read(path)) for each in one.enumerators}
    return numbers[text]


def leaves(root):
    records = {record.name: record for path in view.headers(root)
               for record in declarations.records(declarations.read(path))}

    def below(place, type_name):
        if type_name not in records:
            yield Leaf(place, type_name)
            return
        for field in records[type_name].fields:
            for each in ([f"[{i}]" for i in range(_count(field.count, root))] if field.count else [""]):
                yield from below(f"{place}.{field.name}{each}", field.type)

    return [leaf for type_name, name in harness.objects(root)
            for leaf in below(f"{name}[0]" if name == "_arPmxConf" else name, type_name)]


def mentioned(every, text):
    """Those leaves that a text can touch: their names stand there; or, where records are copied, a name on the way."""
    if WHOLE.search(text):
        return every
    words = set(re.findall(r"\w+", text))
    ways = {name for leaf in every for name in _names(leaf)[:-1]}
    copied = COPIED.search(text) or any(
        re.search(rf"(?<!&)\b\w+(?:\(\))?(?:->|\.){name}(?:\[[^;]*?\])?\s*[;,)}}=]", text) for name in ways)
    return [leaf for leaf in every if words & set(_names(leaf)[0 if copied else -1:])]


def _names(leaf):
    """Names on the way to a leaf, the variable aside that they begin in."""
    return re.findall(r"[A-Za-z_]\w*", leaf.place)[1:] or [leaf.place]


# What is put around the two


def _noted(function, callbacks, known):
    """Statements that note what a call is given."""
    lines = []
    for at, (type_name, name) in enumerate(pointers.declared_parameters(function)):
        if type_name == "va_list":
            lines.append(f"note->value[{at}] = va_arg({name}, UINT32);")
        elif not pointers.is_pointer(type_name, callbacks):
            lines.append(f"note->value[{at}] = (UINT32){name};")
        else:
            pointer = pointers.pointer_of(function, type_name, name, callbacks)
            if pointer.kind == "symbol" and not pointer.is_written:
                lines.append(f"note->value[{at}] = symbol((const void*){name});")
            elif pointer.kind == "tag" and not pointer.is_written:
                lines.append(f"note->value[{at}] = (UINT32)(size_t){name};")
            elif pointer.kind == "text" and not pointer.is_written:
                lines += [f"note->value[{at}] = {name} == formatted ? 1 : (UINT32)(size_t){name};",
                          f"note->behind[{at}] = {name} == formatted && byte < FORMATTED ? {name}[byte] : 0;"]
            else:
                lines.append(f"note->value[{at}] = {name} == 0;")
                if pointer.is_read:
                    size = harness.size_of(function, pointer, name, known)
                    lines.append(f"note->behind[{at}] = {name} != 0 && byte < ({size}) ? ((UCHAR*){name})[byte] : 0;")
    return lines


def _answered(function, callbacks, known):
    """(declarations, statements): what is written for the caller, and answered."""
    declared, lines = [], []
    for type_name, name in pointers.declared_parameters(function):
        if not pointers.is_pointer(type_name, callbacks):
            continue
        pointer = pointers.pointer_of(function, type_name, name, callbacks)
        if not pointer.is_written:
            continue
        given = f"given_{function.name}_{name}"
        if type_name.endswith("**"):
            value = "(void*)&VIDEO_PLANE" if pointer.kind == "symbol" else f"(void*)(size_t){given}[k]"
            declared.append(f"static UINT32 {given}[CALLS];")
            lines.append(f"*{name} = {value};")
        elif pointer.kind == "by":
            for value, target in pointers.types_by_value(function, pointer, known).items():
                declared.append(f"static {target} {given}_{target}[CALLS];")
                lines.append(f"if (written[k] && {pointer.size} == {value})\n"
                             f"        *({target}*){name} = {given}_{target}[k];")
        elif pointer.kind == "text":
            lines += [f'CLAIM(formatted == 0, "{ONE_TEXT}");',
                      f"formatted = {name};", f"memcpy({name}, formattedText, FORMATTED);"]
        elif pointer.kind == "bytes":
            declared.append(f"static UCHAR {given}[CALLS][8];")
            lines += [f'CLAIM({pointer.size} <= 8, "{FEW_BYTES}");',
                      f"for (unsigned i = 0; i < 8; i++)\n        if (written[k] && i < {pointer.size})\n"
                      f"            ((UCHAR*){name})[i] = {given}[k][i];"]
        else:
            number = pointer.size or "1"
            declared.append(f"static {pointer.target} {given}[CALLS][{number}];")
            lines.append(f"for (unsigned i = 0; i < {number}; i++)\n        if (written[k])\n"
                         f"            {name}[i] = {given}[k][i];")
    if function.has_result:
        lines.append(f"return ({function.result})answers[k];")
    return declared, lines


def stand_in(function, number, callbacks, known):
    declared, answered = _answered(function, callbacks, known)
    noted = "\n        ".join(_noted(function, callbacks, known))
    lines = "\n    ".join(answered)
    before = "".join(f"{line}\n" for line in declared)
    return (f"{before}{function.result} {function.name}({function.declared})\n{{\n    COUNT k = called();\n"
            f"    if (k == watched)\n    {{\n        NOTE_T* note = &noted[side];\n"
            f"        note->function = {number};\n        {noted}\n    }}\n    othersAct(k);\n    {lines}\n}}\n")


def _with_values(function, number):
    """A function of the platform that takes any number of values, with so many of them."""
    declared = function.declared.replace("...", ", ".join(f"size_t value{i}" for i in range(number)))
    return dataclasses.replace(function, name=f"{function.name}_{number}", declared=declared.rstrip(", "))


def with_values(known):
    """The functions of the platform that take any number of values, with as many as they are called with."""
    return [_with_values(function, number) for header in PLATFORM_HEADERS for function in functions(ROOT / header)
            for name, number in sorted(known) if name == function.name]


class Platform:
    """The functions that both layers call, and which of them one is."""

    def __init__(self, known):
        self.functions = [function for header in PLATFORM_HEADERS for function in functions(ROOT / header)
                          if "..." not in function.declared] + with_values(known)

    def text(self):
        callbacks, known = harness.callback_types(ROOT), {}
        for header in PLATFORM_HEADERS:
            known |= pointers.enumerations(declarations.read(ROOT / header))
        plane = dataclasses.replace(self.functions[0], name="u4SetColorMode", has_result=True, result="UINT32",
                                    declared="void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace",
                                    contract="Tell.\n@param[in] pvTag [tag] its\n@param eColorSpace space")
        parts = [stand_in(plane, len(self.functions) + 1, callbacks, known),
                 "static const IVdp VIDEO_PLANE = { .pu4SetColorMode = u4SetColorMode };\n"]
        parts += [stand_in(function, number + 1, callbacks, known)
                  for number, function in enumerate(self.functions)]
        return "\n".join(parts)

    def name(self, number):
        """Of the function that was called; nothing: none was."""
        names = [function.name for function in self.functions] + ["pu4SetColorMode"]
        return re.sub(r"_\d+$", "", names[number - 1]) if number else ""


def _symbols(old, new):
    """A number for each object and function that a layer hands out by its address, the same for both layers."""
    shared = sorted({name for layer in (old, new) for text in layer.texts.values()
                     for name in re.findall(r"[(,]\s*&?(\w+)\s*(?=[,)])", text)} & old.defined & new.defined)
    return "\n".join(f"    if (p == (const void*)&{name} || p == (const void*)&{OLD}{name})\n        return {at + 1};"
                     for at, name in enumerate(shared) if name in _exported(ROOT))


def _exported(root):
    return {name for _, name in harness.objects(root)} | set(
        EXPORTED.findall(declarations.read(root / harness.OBJECT_HEADERS[0]))) | declared(root).keys()


def _kept(side, numbered):
    """A function that yields one of these leaves, any of them, as it stands with a layer."""
    cases = "".join(f"which == {at} ? {leaf.number(side)} :\n           " for at, leaf in numbered)
    return f"static UINT32 kept{side}(void)\n{{\n    return {cases}0;\n}}\n"


def _text(operation, every, touched, platform, texts, symbols):
    """All that is put around the two layers for one operation."""
    numbered = [(at, leaf) for at, leaf in enumerate(every) if leaf in touched]
    older = "\n".join([*(f"extern {type_name} {OLD}{name}{'[1]' if name == '_arPmxConf' else ''};"
                         for type_name, name in harness.objects(ROOT)),
                       *(f"extern __typeof__({name}) {OLD}{name};" for name in EXPORTED.findall(
                           declarations.read(ROOT / harness.OBJECT_HEADERS[0]))),
                       *(f"{function.result} {OLD}{function.name}({function.declared});"
                         for function in harness.operations(ROOT))])
    others = "\n".join(f"static {leaf.type} others{at}[CALLS];" for at, leaf in numbered)
    act = "\n".join(f"    if (side == OLD)\n        {leaf.of('OLD')} = others{at}[k];\n"
                    f"    else\n        {leaf.place} = others{at}[k];" for at, leaf in numbered)
    take_over = "\n".join(f"    {leaf.of('OLD')} = {leaf.place};" for leaf in every)
    given, change, entry = _entry(operation, harness.callback_types(ROOT))
    return f"""#include "same.h"

{texts.defined()}
{older}

typedef unsigned char COUNT;
static UINT32 answers[CALLS];
static _Bool written[CALLS];
{others}
{given}

{_kept("OLD", numbered)}
{_kept("NEW", numbered)}
static UINT32 symbol(const void* p)
{{
{symbols}
    return (UINT32)(size_t)p;
}}

static void takeOver(void)
{{
{take_over}
}}

static COUNT called(void)
{{
    COUNT k = calls[side]++;
    CLAIM(k < CALLS, "{ROOM}");
    __CPROVER_assume(k < CALLS);
    if (k == watched)
        noted[side].kept = side == OLD ? keptOLD() : keptNEW();
    return k;
}}

static void othersAct(COUNT k)
{{
    if (world == NOBODY)
        return;
{act}
{change}
}}

{platform.text()}
{_end(platform, every)}
{entry}"""


def _end(platform, every):
    """What is claimed of the call that was looked at, and of what is kept at the end."""
    number = max(len(list(pointers.declared_parameters(function))) for function in platform.functions)
    lines = [f'CLAIM(was->function == is->function, "{AT_A_CALL}which function it is");',
             "_Bool other = was->function != is->function;",
             f'CLAIM(other || was->kept == is->kept, "{AT_A_CALL}what is kept");']
    for at in range(number):
        lines += [f'CLAIM(other || was->value[{at}] == is->value[{at}], "{AT_A_CALL}argument {at + 1}");',
                  f'CLAIM(other || was->behind[{at}] == is->behind[{at}], "{AT_A_CALL}bytes of argument {at + 1}");']
    lines += [f'CLAIM({leaf.of("OLD")} == {leaf.place}, "{SAME}{leaf.place}");' for leaf in every]
    lines += [f'CLAIM(is->function == 0, "{harness.REACHED} behind a call");', f'CLAIM(0, "{harness.REACHED}");']
    body = "\n    ".join(lines)
    return (f"static void end(void)\n{{\n    const NOTE_T* was = &noted[OLD];\n"
            f"    const NOTE_T* is = &noted[NEW];\n    {body}\n}}\n")


def _entry(function, callbacks):
    """(what the caller gives, how others change it, the functions that the checker starts from)"""
    given, change, alike, arguments, ends, declared = [], [], [], ([], []), [], []
    for type_name, name in pointers.declared_parameters(function):
        plain = not pointers.is_pointer(type_name, callbacks)
        pointer = None if plain else pointers.pointer_of(function, type_name, name, callbacks)
        if plain or pointer.kind == "tag":
            declared.append(f"{type_name} {name};")
            for each in arguments:
                each.append(name)
        elif pointer.kind == "text":
            given.append(f"static CHAR {name}_text[16];")
            for each in arguments:
                each.append(f"{name}_text")
        else:
            number = pointer.size or "1"
            given.append(f"static {pointer.target} there_{name}[2][{number}];")
            declared.append(f"_Bool is_{name} = {'nondet_Bool()' if pointer.may_be_null else '1'};")
            alike.append(f"memcpy(there_{name}[OLD], there_{name}[NEW], sizeof there_{name}[NEW]);")
            for side, each in zip(("OLD", "NEW"), arguments):
                each.append(f"is_{name} ? &there_{name}[{side}][0] : 0")
            if pointer.is_read:
                given.append(f"static {pointer.target} changed_{name}[CALLS][{number}];")
                change.append(f"    for (unsigned i = 0; i < {number}; i++)\n"
                              f"        there_{name}[side][i] = changed_{name}[k][i];")
            ends.append((name, f"byte >= sizeof there_{name}[OLD] || ((UCHAR*)there_{name}[OLD])[byte] == "
                               f"((UCHAR*)there_{name}[NEW])[byte]", pointer.is_read))
    if "..." in function.declared:
        declared.append("UINT32 further;")
        for each in arguments:
            each.append("further")
    entries = []
    for world in WORLDS:
        result = [f"{function.result} {name} = " if function.has_result else "" for name in ("was", "is")]
        lines = [*declared, f"begin({world});", "takeOver();", *alike, "side = OLD;",
                 f"{result[0]}{OLD}{function.name}({', '.join(arguments[0])});", "formatted = 0;", "side = NEW;",
                 f"{result[1]}{function.name}({', '.join(arguments[1])});"]
        if function.has_result:
            lines.append(f'CLAIM(was == is, "{SAME}result");')
        lines += [f'CLAIM({condition}, "{SAME}what is left in {name}");' for name, condition, is_read in ends
                  if world == "NOBODY" or not is_read]
        lines.append("end();")
        body = "\n    ".join(lines)
        entries.append(f"void {world}_same(void)\n{{\n    {body}\n}}\n")
    return "\n".join(given), "\n".join(change), "\n".join(entries)


def declared(root):
    return {function.name: (function.result, function.declared) for function in functions(root / LAYER_HEADER)}


def hold_alike(old, new):
    """State of another form cannot be compared, nor what is kept in secret."""
    known = {name for _, name in harness.objects(ROOT)}
    for layer in (old, new):
        if layer.writable != known:
            names = ", ".join(sorted(layer.writable ^ known))
            raise Unlike(f"{layer.root}: in the layer or in the headers, but not in both: {names}")
    if leaves(old.root) != leaves(new.root):
        names = ", ".join(sorted({leaf.place for leaf in set(leaves(old.root)) ^ set(leaves(new.root))}))
        raise Unlike(f"what the layer keeps has another form: {names}")


# The comparison


@dataclasses.dataclass(frozen=True)
class Found:
    """What became of an operation: "code", "proved", "differs" or "undecided", and why."""
    how: str
    why: tuple = ()
    seconds: float = 0.0


class Pair:
    """An older layer and today's in one program."""

    def __init__(self, workshop, old, new, folder, limit):
        hold_alike(old, new)
        self.old, self.new, self._workshop, self._folder, self._limit = old, new, workshop, folder, limit
        self._platform = Platform(workshop.known)
        self._leaves = leaves(ROOT)
        self._operations = {function.name: function for function in harness.operations(ROOT)}

    def build(self):
        """Both layers, for the checker."""
        return [self._workshop.for_the_checker(text)
                for text in (*self.old.as_checked(OLD), *self.new.as_checked(""))]

    def same_code(self, name):
        """Whether an operation, and all that it rests on, compiles to the same."""
        of_old, of_new = (layer.rests_on(name) for layer in (self.old, self.new))
        return name in of_old and of_old == of_new and all(self.old.code[each] == self.new.code[each]
                                                           for each in of_old)

    def different_tables(self):
        """Tables and first values that others see and that are not the same."""
        roots = (self.old.root, self.new.root)
        names = set().union(*map(_exported, roots)).difference(*map(declared, roots))
        return sorted(name for name in names if self.old.code.get(name) != self.new.code.get(name))

    def _touched(self, name):
        return self.old.reached(name) + self.new.reached(name)

    def _program(self, name, room, last):
        """Both layers with what is put around them: room for so many calls, of which one of the first is looked at."""
        folder = self._folder / f"{name}.{room}.{last}"
        folder.mkdir(parents=True, exist_ok=True)
        text = _text(self._operations[name], self._leaves, mentioned(self._leaves, self._touched(name)),
                     self._platform, self._workshop.texts, _symbols(self.old, self.new))
        source, made = folder / "same.c", folder / "whole"
        source.write_text(text, encoding="utf-8")
        self._workshop.run("goto-cc", *verdicts.COMPILER, *view.words(), f"-DCALLS={room}", f"-DLAST={last}",
                           f"-I{self.new.folder / 'include'}", f"-I{HERE}", "-c", source, "-o", folder / "same.go")
        self._workshop.run("goto-cc", *verdicts.COMPILER, *self.build(), folder / "same.go", "-o", made)
        return made

    def _check(self, program, world, *more):
        options = [each for each in OPTIONS if each != SLICED or "--trace" not in more]  # all in a trace
        return self._workshop.check(program, *options, *more, "--function", f"{world}_same", seconds=self._limit)

    def _said(self, name, world, last=254):
        """(the program, what the checker says of it)"""
        for room in CALLS:
            program = self._program(name, room, last)
            said = Said(self._check(program, world))
            if ROOM not in said.refuted.values():
                break
        return program, said

    def _first(self, name, world, program, said):
        """Told in words, the first call at which something differs; or, when no call does, what differs at the end.
        In front of a call that was told, calls alone are looked for: the end differs all the same. That something
        differs is known, however long the checker looks for where."""
        different = said.different
        told = ["; ".join(words.removeprefix(SAME) for words in different.values())]
        with contextlib.suppress(subprocess.TimeoutExpired):
            while different:
                told, call = self._told(name, program, world, different)
                if not call:
                    break
                program, said = self._said(name, world, call - 1)
                different = {each: words for each, words in said.different.items() if words.startswith(AT_A_CALL)}
        return told

    def _told(self, name, program, world, different):
        """(in words, the call's number or 0 when none is to be looked for in front of it)"""
        at_a_call = [each for each in different if different[each].startswith(AT_A_CALL)] or list(different)
        trace = self._check(program, world, "--trace", "--property", at_a_call[0])
        values = {f"{each}{index}{rest}": int(number) for each, index, rest, number in VALUE.findall(trace)}
        given = [each for _, each in pointers.declared_parameters(self._operations[name])]
        lines = [f"{'nobody else acts' if world == 'NOBODY' else 'others change what is kept'}; "
                 + ", ".join(f"{each} = {values[each]}" for each in given if each in values)]
        words = [different[each].removeprefix(AT_A_CALL).removeprefix(SAME) for each in at_a_call]
        if not different[at_a_call[0]].startswith(AT_A_CALL):
            return [*lines, "at the end: " + "; ".join(self._named(each, values) for each in words)], 0
        number = values.get("watched", 0)
        called = [self._platform.name(values.get(f"noted[{side}].function", 0)) or "nothing" for side in (0, 1)]
        what = called[0] if called[0] == called[1] else f"{called[0]} then, {called[1]} now"
        return [*lines, f"call {number + 1}, {what}: " + "; ".join(
            [self._named(words[0], values), *self._values(words[0], values)])], number

    def _named(self, words, values):
        """What differs, and which part of what is kept it is."""
        return f"{words}: {self._leaves[values['which']].place}" if words.endswith("kept") and \
            values.get("which", len(self._leaves)) < len(self._leaves) else words

    def _values(self, words, values):
        """Both values of a number, or of a byte; an address tells nobody anything."""
        at = re.fullmatch(r"(bytes of )?argument (\d+)", words)
        if not at:
            return []
        part = "behind" if at[1] else "value"
        both = [values.get(f"noted[{side}].{part}[{int(at[2]) - 1}]", 0) for side in (0, 1)]
        return [f"{both[0]} then, {both[1]} now"] if max(both) < 1 << 20 else []

    def decide(self, name):
        """What becomes of an operation."""
        began = time.monotonic()
        try:
            for world in WORLDS:
                program, said = self._said(name, world)
                if said.different:
                    return Found("differs", tuple(self._first(name, world, program, said)), time.monotonic() - began)
                if said.undefined:
                    why = "what one of them does is not defined: " + "; ".join(said.undefined)
                    return Found("differs", (why,), time.monotonic() - began)
                if said.odd or not said.is_reached(self._calls(name)):
                    return Found("undecided", tuple(said.odd) or (NOT_REACHED,), time.monotonic() - began)
        except subprocess.TimeoutExpired:
            return Found("undecided", (f"the checker took longer than {self._limit} s",))
        return Found("proved", (), time.monotonic() - began)

    def _calls(self, name):
        """Whether an operation calls anybody, as far as its text tells."""
        words = set(re.findall(r"\w+", self.new.reached(name)))
        return any(function.name in words for function in self._platform.functions)


class Said:
    """What the checker says of two layers: what it refuted by its name, apart into what differs, what is not defined,
    and what leaves the question open."""

    def __init__(self, text):
        checked = verdicts.CHECKED.findall(text)
        self.refuted = {name: words for name, _, words, status in checked if status == "FAILURE"}
        self._ends = [words for words in self.refuted.values() if words.startswith(harness.REACHED)]
        self.different = {name: words for name, words in self.refuted.items() if words.startswith(SAME)}
        self.odd = [words for words in self.refuted.values() if words in OPEN or words.startswith("unwinding")]
        self.odd += [words for _, _, words, status in checked if status not in ("FAILURE", "SUCCESS")]
        self.odd += re.findall(r"no body for .*", text)
        self.odd += [] if checked or self.odd else [text[-300:]]
        self.odd += verdicts.incomplete(text)
        self.undefined = [f"{name.partition('.')[0]}: {words}" for name, words in self.refuted.items()
                          if words not in (*self.different.values(), *self.odd, *self._ends)]

    def is_reached(self, calls):
        return len(self._ends) == 1 + calls


# The verb


def unlike(pair):
    """{operation: in words} of those that cannot be held against each other."""
    then, now = declared(pair.old.root), declared(pair.new.root)
    other = {name: "there was none" if name not in then else "it takes or returns something else now"
             for name in now if then.get(name) != now[name]}
    return other | {name: "there is none any more" for name in then if name not in now}


def decided(pair, name):
    """What becomes of an operation; without the checker where the code is the same."""
    return Found("code") if pair.same_code(name) else pair.decide(name)


WORDS = {"code": "the same code", "proved": "proved", "differs": "differs", "undecided": "not decided"}


def compare(ktap, pool, pair, names):
    """Tells of each operation whether it is the same."""
    ktap.verdict("tables and first values", [f"{name} differs" for name in pair.different_tables()])
    other, today = unlike(pair), declared(pair.new.root).keys()
    gone = other.keys() - today if today <= set(names) else set()  # nobody can name these
    for name in sorted(other.keys() & set(names) | gone):
        ktap.verdict(name, [other[name]])
    asked = [name for name in names if name not in other]
    if not all(pair.same_code(name) for name in asked):
        pair.build()
    begun = [(name, pool.submit(decided, pair, name)) for name in asked]
    number = collections.Counter()
    for name, future in begun:
        found = future.result()
        how = f"{WORDS[found.how]}, {found.seconds:.1f} s" if found.seconds else WORDS[found.how]
        ktap.verdict(f"{name}: {how}", found.why)
        number[found.how] += 1
    print(f"# {len(asked)} operations: " + ", ".join(f"{number[how]} {words}" for how, words in WORDS.items()))


def with_revision(ktap, cbmc, pool, wanted, names, made):
    """The layer of a revision, and today's."""
    try:
        revision = run("git", "-C", ROOT, "rev-parse", "--short", "--verify", f"{wanted}^{{commit}}").strip()
        shutil.rmtree(made / "revision", ignore_errors=True)
        tree = tree_of(revision, made / "revision")
    except ToolError as reason:
        raise Unlike(str(reason)) from None
    for root, folder in ((tree, made / "view-then"), (ROOT, made / "view")):
        shutil.rmtree(folder, ignore_errors=True)
        view.write(root, folder)
        number, different = view.disagreements(root, folder)
        which = "now" if root == ROOT else revision
        ktap.verdict(f"view: {number} functions and tables compile to the layer's own, {which}",
                     [f"{name}: no compiler makes the same of source and view" for name in different])
    workshop = Workshop(cbmc, made / "same")
    old, new = (Layer(root, made / f"same/{name}", workshop) for root, name in ((tree, "then"), (ROOT, "now")))
    compare(ktap, pool, Pair(workshop, old, new, made / "same/pairs", verdicts.LIMIT), names)


class Today:
    """Today's layer, for copies with something planted to be held against it."""

    def __init__(self, cbmc, folder):
        self._workshop = Workshop(cbmc, folder)
        self._folder = folder
        self._new = Layer(ROOT, folder / "now", self._workshop)
        self._lock = threading.Lock()

    def pair(self, tree, name):
        old = Layer(tree, self._folder / f"{name}.then", self._workshop)
        return Pair(self._workshop, old, self._new, self._folder / f"{name}.pairs", verdicts.LIMIT)

    def against(self, tree, name, operation):
        """What becomes of an operation when the older layer is that of a tree."""
        with self._lock:  # what compiles each text once is shared
            pair = self.pair(tree, name)
            if pair.same_code(operation):
                return Found("code")
            pair.build()
        return pair.decide(operation)
