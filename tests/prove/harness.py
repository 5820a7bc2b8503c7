# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes what the checker runs, from the headers: a stand-in for each function of the platform, which looks at what its
contract says of pointers and answers anything, and for each operation a call of it with any arguments, in each world,
with what its contract promises of results and refusals."""

import pathlib
import re
import sys

ROOT = pathlib.Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "cmake"))

import pointers  # noqa: E402
from declarations import read  # noqa: E402
from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, function_pointers, functions, parts  # noqa: E402

ENTRY = "prove_"
WORLDS = ("NOBODY", "ANYBODY", "HANDSHAKE")
BY_HAND = "tests/prove/surroundings.c"
OBJECT_HEADERS = ("src/driver/private_inc/drv_if_pmx.h", "src/driver/pmx/pmx_if.h")
OBJECT = re.compile(r"^extern (?:PMX_API )?(?!const\b)(\w+) (\w+)(?:\[\d+\])?;", re.M)

# What a refusal may leave in the record, as those contracts say; everywhere else it leaves each byte.
STORED_ALL_THE_SAME = {
    "PMX_SetArbPlaneOrder": ("u4PlaneOrder",),
    "PMX_SetAspectRatio": ("u4AspectRatio",),
    "PMX_SetAspectRatioEx": ("u4AspectRatio", "fgAspNext", "u4AspNext"),
    "PMX_SetAspectRatioNext": ("u4AspectRatio", "fgAspNext"),
    "PMX_SetDigitalOutRgb": ("ucDigitalRgb",),
}
# A refused format lowers the format-change flag, and what follows of it.
LOWERS_THE_FLAG = {"PMX_SetModeEx"}

# What is presumed in the handshake's world: without it graphics stay away, as the contracts say.
PRESUMED = {
    "PMX_Init": "mind.outOfMix == 0",
    "PMX_Reset": "_arPmxDispPartStatus.fgPmxEnabeOsdFlag == FALSE",
    "PMX_Uninit": "mind.outOfMix == 0",
    "i4PMX_Uninit": "mind.outOfMix == 0",
    "PMX_SetOsdEnableFlag": "bIsOsdEnable != FALSE || mind.outOfMix == 0",
}

# What is claimed besides, while nobody else acts.
ALSO = {
    "_PMX_TmrIsr": ["_arPmxDispPartStatus.fgPmxFormatChangeFlag == FALSE",
                    "_arPmxDispPartStatus.fgTimerAlreadySet == FALSE",
                    "mind.outOfMix == 0 || mind.videoWaited && _arPmxDispPartStatus.fgPmxEnabeOsdFlag != FALSE"],
    "PMX_SetFormatChangeFlag": ["_arPmxDispPartStatus.fgPmxFormatChangeFlag == bIsFormatChange",
                                "bIsFormatChange != FALSE || mind.outOfMix == 0 ||"
                                " mind.videoWaited && _arPmxDispPartStatus.fgPmxEnabeOsdFlag != FALSE"],
    "PMX_SetOsdEnable": ["mind.outOfMix == 0 || __CPROVER_old_status.fgPmxEnabeOsdFlag == FALSE",
                         "_arPmxDispPartStatus.fgPmxEnabeOsdFlag == FALSE"],
    "PMX_SetModeEx": ["result == 0 || _arPmxDispPartStatus.fgPmxFormatChangeFlag == FALSE ||"
                      " mind.outOfMix == OSD_PLANES && _arPmxDispPartStatus.fgTimerAlreadySet == TRUE"],
}


def objects(root):
    """(type, name) of what the layer keeps, and somebody may change."""
    return [match for header in OBJECT_HEADERS for match in OBJECT.findall(read(root / header))]


def _callbacks(root):
    return {pointer.function.name for header in (LAYER_HEADER, *PLATFORM_HEADERS)
            for pointer in function_pointers(root / header) if pointer.is_type}


def _size(function, pointer, name, known):
    if pointer.kind == "by":
        cases = pointers.types_by_value(function, pointer, known).items()
        return "".join(f"{pointer.size} == {value} ? sizeof({type_name}) : " for value, type_name in cases) + "0"
    if pointer.kind == "bytes":
        return pointer.size
    return f"{pointer.size or 1} * sizeof *{name}"


def _looks(function, pointer, name, known):
    """What a stand-in claims of a pointer, and then does with it."""
    told = f'"{function.name}: {name} can be'
    if pointer.kind == "tag":
        return [], []
    if pointer.kind == "symbol":
        return [f'CLAIM({name} != 0, "{function.name}: {name} is there");'], []
    if pointer.kind == "text":
        return [f'CLAIM(__CPROVER_r_ok({name}, 1), {told} read");'], []
    size = _size(function, pointer, name, known)
    may_be_null = f"{name} == 0 || " if "null when" in pointers.described(function)[name][0] else ""
    claims, does = [], []
    if pointer.kind == "by":
        claims.append(f'CLAIM(({size}) != 0, "{function.name}: {pointer.size} has a meaning");')
    if pointer.is_read:
        claims.append(f'CLAIM({may_be_null}__CPROVER_r_ok({name}, {size}), {told} read");')
    if pointer.is_written:
        claims.append(f'CLAIM(__CPROVER_w_ok({name}, {size}), {told} written");')
        does.append(f"if (nondet_Bool())\n        __CPROVER_havoc_slice({name}, {size});")
    return claims, does


def stand_in(function, callbacks, known):
    claims, does = [], []
    for type_name, name in pointers.declared_parameters(function):
        if pointers.is_pointer(type_name, callbacks):
            for found, more in zip((claims, does),
                                   _looks(function, pointers.pointer_of(function, type_name, name, callbacks), name,
                                          known)):
                found += more
    if function.has_result:
        does.append(f"return nondet_{function.name}();")
    answer = f"{function.result} nondet_{function.name}(void);\n" if function.has_result else ""
    body = "\n".join(f"    {line}" for line in [*claims, "somebodyMayAct();", *does])
    return f"{answer}{function.result} {function.name}({function.declared})\n{{\n{body}\n}}\n"


def stand_ins(root):
    headers = PLATFORM_HEADERS
    known = {}
    for header in headers:
        known |= pointers.enumerations(read(root / header))
    written = {match for match in re.findall(r"^\w+ (\w+)\(", read(ROOT / BY_HAND), re.M)}
    return "\n".join(stand_in(function, _callbacks(root), known) for header in headers
                     for function in functions(root / header) if function.name not in written)


def _argument(function, type_name, name, callbacks):
    """(declarations, the argument, the outputs that a refusal leaves alone) of a parameter."""
    if not pointers.is_pointer(type_name, callbacks):
        return [f"{type_name} {name};"], name, []
    pointer = pointers.pointer_of(function, type_name, name, callbacks)
    if pointer.kind == "tag":
        return [f"{type_name} {name};"], name, []
    if pointer.kind == "text":
        return [f"CHAR {name}_text[16];"], f"{name}_text", []
    lines = [f"{pointer.target} {name}_there[{pointer.size or 1}];"]
    if pointer.may_be_null:
        lines.append(f"{type_name} {name} = nondet_Bool() ? &{name}_there[0] : ({type_name})0;")
    else:
        lines.append(f"{type_name} {name} = &{name}_there[0];")
    return lines, name, [(pointer.target, f"{name}_there[0]")] if pointer.is_written else []


def _refusal(result):
    """What tells a refusal, or nothing for an operation that refuses nothing."""
    if re.search(r"\bPMX_NO_SUCH_PORT for\b", result):
        return "PMX_NO_SUCH_PORT"
    return "0" if re.search(r"\b(?:0 (?:for|when|also|refused)|else 0)\b", result) else ""


def promises(function, callbacks):
    """(condition, what it stands for) of each promise about the result that the contract makes in words."""
    text = parts(function.contract)[2]
    identity = next((name for type_name, name in pointers.declared_parameters(function) if name == "ucPmxId"), "")
    tagged = "(UCHAR)(size_t)pvTag" if "pvTag" in function.parameters else ""
    if re.match(r"(?:0|1)$", text):
        yield f"result == {text}", "the one result that there is"
    if re.match(r"1[;,] |1 or 0|PMX_SET_OK; 0|TRUE or FALSE|1 set, 0|1 admitted, 0|1 ready, 0|1 when", text):
        yield "!inRange || result <= 1", "1 or 0"
    if identity and re.search(r"\b0 for a mixer id other than 0", text):
        yield f"{identity} == 0 || result == 0", "another mixer is refused"
    if tagged and re.search(r"\b0 for a tag whose low 8 bits are not 0", text):
        yield f"{tagged} == 0 || result == 0", "another mixer is refused"
    if re.search(r"null pointer|either pointer is null", text):
        for type_name, name in pointers.declared_parameters(function):
            if pointers.is_pointer(type_name, callbacks) and name != "pvTag":
                yield f"{name} != 0 || result == 0", f"{name}: null is refused"
    for bit in re.findall(r"capability bit (\d+) is clear", text):
        yield f"(_arPmxConf[0].u4Capability >> {bit} & 1) != 0 || result == 0", f"without capability bit {bit} refused"


def _unchanged(kept, function, outputs):
    """A byte of what the layer keeps, any of them, is what it was; so are the outputs."""
    for type_name, name in kept:
        if function.name in LOWERS_THE_FLAG and name == "_arPmxDispPartStatus":
            continue
        fields = STORED_ALL_THE_SAME.get(function.name, ()) if type_name == "PMX_CONF_T" else ()
        excepted = "".join(f" || i >= offsetof(PMX_CONF_T, {field}) &&"
                           f" i < offsetof(PMX_CONF_T, {field}) + sizeof _arPmxConf[0].{field}" for field in fields)
        place = f"&{name}" if name != "_arPmxConf" else "_arPmxConf"
        yield f"i >= sizeof {name} || ((UCHAR*){place})[i] == ((UCHAR*)&before{name})[i]{excepted}", name
    for type_name, place in outputs:
        yield f"{place} == before_{place.removesuffix('[0]')}", place.removesuffix("_there[0]")


def _call(function, arguments, result):
    return f"{result}{function.name}({', '.join(arguments)});"


def operation(function, world, kept, callbacks):
    """The function that the checker starts from."""
    declared, arguments, outputs = [], [], []
    for type_name, name in pointers.declared_parameters(function):
        lines, argument, written = _argument(function, type_name, name, callbacks)
        declared += lines
        arguments.append(argument)
        outputs += written
    if "..." in function.declared:
        arguments.append("nondet_unsigned()")
    lines = [*declared, f"begin({world});"]
    if world == "HANDSHAKE" and function.name in PRESUMED:
        lines.append(f"__CPROVER_assume({PRESUMED[function.name]});")
    told = parts(function.contract)[2]
    refusal = _refusal(told)
    if world == "NOBODY":
        for type_name, name in kept:
            lines.append(f"{type_name} before{name} = {name}{'[0]' if name == '_arPmxConf' else ''};")
        lines += [f"{type_name} before_{place.removesuffix('[0]')} = {place};" for type_name, place in outputs]
        lines.append("_Bool inRange = flagsInRange();")
    lines.append(_call(function, arguments, f"{function.result} result = " if function.has_result else ""))
    if world == "NOBODY":
        lines += [f'CLAIM({condition}, "{function.name}: {text}");'
                  for condition, text in promises(function, callbacks)]
        lines.append(f'CLAIM(!inRange || flagsInRange(), "{function.name}: flags stay in their ranges");')
        if refusal:
            lines.append("unsigned i = nondet_unsigned();")
            lines += [f'CLAIM(result != {refusal} || {condition}, "{function.name}: a refusal leaves {name}");'
                      for condition, name in _unchanged(kept, function, outputs)]
        for condition in ALSO.get(function.name, ()):
            condition = condition.replace("__CPROVER_old_status", "before_arPmxDispPartStatus")
            lines.append(f'CLAIM({condition}, "{function.name}: {condition}");')
    lines += ["end();", 'CLAIM(0, "the end is reached");']
    body = "\n".join(f"    {line}" for line in lines)
    return f"void {world}_{function.name}(void)\n{{\n{body}\n}}\n"


def in_every_world(name):
    """Where the checker begins: in any of the worlds."""
    cases = "\n".join(f"    else if (nondet_Bool())\n        {world}_{name}();" for world in WORLDS[1:])
    return f"void {ENTRY}{name}(void)\n{{\n    if (nondet_Bool())\n        {WORLDS[0]}_{name}();\n{cases}\n}}\n"


def operations(root):
    return list(functions(root / LAYER_HEADER))


def text(root):
    """All that is written from the headers, as one source."""
    callbacks, kept = _callbacks(root), objects(root)
    stored = "\n".join(f"    __CPROVER_havoc_object({'' if name == '_arPmxConf' else '&'}{name});" for _, name in kept)
    calls = "\n".join("\n".join([*(operation(function, world, kept, callbacks) for world in WORLDS),
                                 in_every_world(function.name)]) for function in operations(root))
    return f"""#include "surroundings.h"

void anythingIsStored(void)
{{
{stored}
}}

{stand_ins(root)}
{calls}"""
