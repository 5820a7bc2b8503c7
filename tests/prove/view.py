# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The layer as C, for a checker that reads no C++20: the same text, but for the constructs below. What they become
need not be believed: disagreements() compiles both, and holds the code of each function, and the tables, against the
other's; and once more with a trap wherever a number overflows or is shifted too far, for such code is the same whether
that may happen or not.

With guards, each index into an array inside a record states its bound: the checker knows of whole objects alone, and a
record goes on behind its arrays. The guards are macros, and compiled to nothing."""

import contextlib
import pathlib
import re
import subprocess
import sys

ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "cmake"))

import declarations  # noqa: E402

LAYER = "src/driver/pmx"
HEADERS = ("src/system/inc", "src/driver/inc", "src/driver/private_inc", LAYER)
GUARD = "PMX_WITHIN"
# Words of C++ that C11 lacks: each has a meaning in C that is the same here.
WORDS = {"bool": "_Bool", "true": "1", "false": "0", "nullptr": "((void*)0)", "constinit": "", "consteval": "",
         "static_assert(...)": ""}
TARGET = ["-ffreestanding", "-fno-short-enums", "-mcpu=cortex-a9"]
PREPROCESS = ["arm-none-eabi-gcc", "-E", "-std=gnu11", *TARGET]
# Of each compiler its C++ and its C. What one of them makes the same of two texts means the same.
COMPILERS = [(["arm-none-eabi-g++"], ["arm-none-eabi-gcc"]),
             (["clang++", "--target=arm-none-eabi"], ["clang", "--target=arm-none-eabi"])]
FLAGS = [*TARGET, "-O1", "-w", "-fno-pic", "-fno-stack-protector", "-fno-asynchronous-unwind-tables",
         "-fno-unwind-tables", "-fdata-sections"]
TRAPS = ["-fsanitize=signed-integer-overflow,shift", "-fsanitize-undefined-trap-on-error"]
APART = ["-ffunction-sections", "-fno-section-anchors"]  # what refers to what is told by names
SECTION = re.compile(r"(?<=[ [])\.(?:data|rodata)\.?([\w.]*)")
EMPTY = re.compile(r"^ +\d+ \.bss\.(\S+) +([0-9a-f]+) ", re.M)
REFERENCE = re.compile(r"\bR_ARM_\w+\s+(?:\.(?:text|rodata|data|bss)\.)?([\w.]+)")
MANGLED = re.compile(r"\b_ZL?(\d+)(\w+)")
TEXT = re.compile(r'"(?:[^"\\\n]|\\.)*"')
MEMBER_POINTER = re.compile(r"\b((?:const )?\w+\*?) \w+::\*(\w+)")
ENUMERATION = re.compile(r"typedef DRV_ENUM\((\w+)\)\s*\{(.*?)\}\s*\1;", re.DOTALL)


class Failed(Exception):
    """The view cannot be made, or is not the layer."""


def sources(root):
    return sorted((root / LAYER).glob("*.cpp"))


def headers(root):
    return [path for folder in HEADERS for path in sorted((root / folder).glob("*.h"))]


def member_arrays(root):
    """{name: length} of the arrays inside records that somebody could index beyond."""
    records = [record for path in headers(root) for record in declarations.records(declarations.read(path))]
    return {field.name: field.count for record in records for field in record.fields if field.count}


def _guard(text, name, length):
    """NAME[index] becomes NAME[PMX_WITHIN(index, length)], whatever brackets the index has; the guard looks at it
    twice."""
    done, at = "", 0
    for match in re.finditer(rf"(?<=[>.]){name}\[|\b(?:(?<!\w )|(?<=return )|(?<=else )){name}\[", text):
        if match.start() < at:
            continue
        depth, end = 1, match.end()
        while depth:
            depth += {"[": 1, "]": -1}.get(text[end], 0)
            end += 1
        if re.search(r"\+\+|--|(?<![=!<>])=(?!=)|\(", text[match.end():end - 1]):
            raise Failed(f"{name}[{text[match.end():end - 1]}]: an index that does something cannot be guarded")
        done += f"{text[at:match.end()]}{GUARD}({text[match.end():end - 1]}, {length})]"
        at = end
    return done + text[at:]


def _guarded(text, arrays):
    for name, length in arrays.items():
        if re.search(rf"(?:->|\.){name}\s*[,)+]", text):
            raise Failed(f"{name}: handed over or moved along, an array inside a record goes on behind its end unseen")
        text = _guard(text, name, length)
    # A pointer that is set to such an array is one until its function ends.
    for name, length in arrays.items():
        for alias in re.finditer(rf"(\w+) = [\w>.()-]*(?:->|\.){name};", text):
            end = text.index("\n}", alias.end())
            text = text[:alias.end()] + _guard(text[alias.end():end], alias[1], length) + text[end:]
    return text


def _result_of(text, at):
    return re.findall(r"^(?:static )?(\w+) \w+\([^;{}]*\)\n\{", text[:at], re.M)[-1]


def as_c(text, arrays):
    """A source or header of the layer in C."""
    text = ENUMERATION.sub(r"enum \1 {\2}; typedef UINT32 \1;", text)  # in C++ any number may be in one
    text = text.replace('extern "C" ', "extern ")
    text = re.sub(r"\bconstexpr const CHAR\* (?!const\b)", "const CHAR* const ", text)
    text = re.sub(r"\bconstexpr\b", "const", text)
    text = re.sub(r"\breturn (\{ \.[^}]*\});",
                  lambda match: f"return ({_result_of(text, match.start())}){match[1]};", text)
    # A pointer to a member is the member's place.
    types = {name: type_name for type_name, name in MEMBER_POINTER.findall(text)}
    text = MEMBER_POINTER.sub(r"size_t \2", text)
    text = re.sub(r"&([A-Z]\w*)::(\w+)", r"offsetof(\1, \2)", text)
    text = re.sub(r"([\w\[\]]+)\.\*(\w+)\b", lambda match: f"(*({types[match[2]]}*)((UCHAR*)&{match[1]} + {match[2]}))",
                  text)
    text = re.sub(r"prPmxConf\(\)->\*(\w+->\w+)", r"*((UCHAR*)prPmxConf() + \1)", text)
    texts = TEXT.findall(text)
    text = _guarded(TEXT.sub('""', text), arrays)
    return re.sub('""', lambda _: texts.pop(0), text)


def write(root, folder):
    """The view of a tree's layer, below the folder; its sources."""
    arrays = member_arrays(root)
    (folder / "include").mkdir(parents=True, exist_ok=True)
    for path in headers(root):
        text = as_c(path.read_text(encoding="utf-8"), arrays)
        (folder / "include" / path.name).write_text(text, encoding="utf-8")
    written = []
    for path in sources(root):
        written.append(folder / f"{path.stem}.c")
        # Messages and assertions name the line of the source.
        text = f'#line 1 "{path.relative_to(root)}"\n' + as_c(path.read_text(encoding="utf-8"), arrays)
        written[-1].write_text(text, encoding="utf-8")
    return written


def words():
    return [f"-D{name}={value}" for name, value in WORDS.items()]


def defines(guard="(i)"):
    return [*words(), f"-D{GUARD}(i,n)={guard}"]


def run(*command, cwd=None):
    ran = subprocess.run([str(word) for word in command], capture_output=True, text=True, check=False, cwd=cwd)
    if ran.returncode != 0:
        raise Failed(f"{' '.join(map(str, command))}:\n{(ran.stdout + ran.stderr)[-3000:]}")
    return ran.stdout


def code(made):
    """{function: its instructions and what they refer to; table: its bytes, what they refer to} of an object."""
    found, name = {}, None
    shown = run("arm-none-eabi-objdump", "-dr", "--no-show-raw-insn", "--no-addresses", made)
    for line in _plain(shown).splitlines():
        head = re.fullmatch(r"<(.+)>:", line)
        if head:
            name = head[1]
            found[name] = []
        elif name and line.strip() and not line.startswith("Disassembly"):
            found[name].append(" ".join(line.split()))
    sections = _plain(run("arm-none-eabi-objdump", "-sr", made))
    for part in re.split(r"^(?=Contents of section |RELOCATION RECORDS FOR )", sections, flags=re.M):
        head, _, rest = part.partition("\n")
        section = SECTION.search(head)
        if section:
            found.setdefault(section[1], []).append(rest.strip())
    for name, size in EMPTY.findall(_plain(run("arm-none-eabi-objdump", "-h", made))):
        found[name] = [size]
    return found


def _plain(shown):
    """Without what C++ makes of the names of tables and functions."""
    return MANGLED.sub(lambda match: match[2][:int(match[1])], shown)


def named_in(lines):
    """What code or a table refers to."""
    return {match[1] for line in lines for match in REFERENCE.finditer(line)}


def _pair(root, folder, compilers, path, flags):
    """The code of a source, and of its view."""
    includes = [f"-I{root / directory}" for directory in HEADERS]
    made = [folder / f"{path.stem}.{kind}.o" for kind in ("cpp", "c")]
    run(*compilers[0], "-std=c++20", "-fno-exceptions", "-fno-rtti", *FLAGS, *flags, *includes,
        f"-ffile-prefix-map={root}/=", "-c", path, "-o", made[0])
    run(*compilers[1], "-std=gnu11", *FLAGS, *flags, *defines(), f"-I{folder / 'include'}", "-c",
        folder / f"{path.stem}.c", "-o", made[1])
    return [code(each) for each in made]


def _different(root, folder, compilers, path, flags):
    """(all that a source compiles to, what its view compiles to differently)"""
    original, made = _pair(root, folder, compilers, path, flags)
    names = original.keys() | made.keys()
    return names, {name for name in names if original.get(name) != made.get(name)}


def disagreements(root, folder):
    """(how many functions and tables the layer has, those that no compiler makes the same of in source and view)"""
    number, left = 0, set()
    for path in sources(root):
        for flags in [], TRAPS:
            names, different = _different(root, folder, COMPILERS[0], path, flags)
            for compilers in COMPILERS[1:] if different else ():
                with contextlib.suppress(Failed):  # one that cannot read the view's C says nothing of it
                    different &= _different(root, folder, compilers, path, flags)[1]
            left |= different
        number += len(names)
    return number, sorted(left)
