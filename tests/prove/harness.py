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
import promises  # noqa: E402
from declarations import read  # noqa: E402
from platform_functions import LAYER_HEADER, PLATFORM_HEADERS, function_pointers, functions, parts  # noqa: E402

ENTRY = "prove_"
WORLDS = ("NOBODY", "ANYBODY", "HANDSHAKE")
BY_HAND = "tests/prove/surroundings.c"
REACHED = "the end is reached"  # of all that begins so it is claimed that nothing gets there
MAY_BE_CALLED_BY_ANYBODY = re.compile(r"^(?:any\b(?! thread that may sleep)|the thread that holds it|$)")
OBJECT_HEADERS = ("src/driver/private_inc/drv_if_pmx.h", "src/driver/pmx/pmx_if.h")
OBJECT = re.compile(r"^extern (?:PMX_API )?(?!const\b)(\w+) (\w+)(?:\[\d+\])?;", re.M)

# What is presumed in the handshake's world: without it graphics stay away, as the contracts say.
PRESUMED = {
    "PMX_Init": "mind.outOfMix == 0",
    "PMX_Reset": "_arPmxDispPartStatus.fgPmxEnabeOsdFlag == FALSE",
    "PMX_Uninit": "mind.outOfMix == 0",
    "i4PMX_Uninit": "mind.outOfMix == 0",
    "PMX_SetOsdEnableFlag": "bIsOsdEnable != FALSE || mind.outOfMix == 0",
}

# Who calls: the video plane driver, which has paid what it owed, and the timer, which does not run any more.
CALLED_BY = {"PMX_SetOsdEnable": "mind.videoOwes = 0;", "_PMX_TmrIsr": "mind.timerRuns = 0;"}

# Behind these the layer does not know its timer, as their contracts say.
FORGETS_THE_TIMER = {"PMX_Reset", "PMX_Uninit", "i4PMX_Uninit"}

# What is claimed of what the platform is handed, besides what its contracts say of pointers.
HANDED = {
    "x_sema_create": ("phSema == &MutexPMX", "the layer's mutex"),
    "x_sema_delete": ("hSema == MutexPMX", "the layer's mutex"),
    "register_pm_ops": ("prOps == &pmx_pm_ops", "the layer's operations"),
    "unregister_pm_ops": ("prOps == &pmx_pm_ops", "the layer's operations"),
    "i4ImRegisterInterface2": ("pvIf == &_rPMXIF", "the layer's table"),
    "PMX_HalSetGamma": ("pucCurve != 0 || ucEnable == 0", "a curve, unless gamma is off"),
}

# What happens in a world, which is claimed never to be, and refuted.
HAPPENS = {
    ("PMX_SetModeEx", "HANDSHAKE"): ["mind.expired", "mind.raised", "mind.lowered", "mind.videoCalled"],
    ("PMX_QueryStatus", "ANYBODY"): ["_arPmxConf[0].ucMode != ucModeBefore"],
    ("PMX_InformVdpColorSpace", "NOBODY"): ["mind.everFetched", "mind.everLocked"],
}

# What is claimed besides, while nobody else acts.
ALSO = {
    "_PMX_TmrIsr": ["_arPmxDispPartStatus.fgPmxFormatChangeFlag == FALSE",
                    "_arPmxDispPartStatus.fgTimerAlreadySet == FALSE",
                    "mind.outOfMix == 0 || mind.videoWaited && _arPmxDispPartStatus.fgPmxEnabeOsdFlag != FALSE"],
    "PMX_SetFormatChangeFlag": ["_arPmxDispPartStatus.fgPmxFormatChangeFlag == bIsFormatChange",
                                "bIsFormatChange != FALSE || mind.outOfMix == 0 ||"
                                " mind.videoWaited && _arPmxDispPartStatus.fgPmxEnabeOsdFlag != FALSE"],
    "PMX_SetOsdEnable": ["mind.outOfMix == 0 || before_arPmxDispPartStatus.fgPmxEnabeOsdFlag == FALSE",
                         "_arPmxDispPartStatus.fgPmxEnabeOsdFlag == FALSE"],
    "PMX_SetModeEx": ["result == 0 || _arPmxDispPartStatus.fgPmxFormatChangeFlag == FALSE ||"
                      " mind.outOfMix == OSD_PLANES && _arPmxDispPartStatus.fgTimerAlreadySet == TRUE"],
}


def objects(root):
    """(type, name) of what the layer keeps, and somebody may change."""
    return [match for header in OBJECT_HEADERS for match in OBJECT.findall(read(root / header))]


def callback_types(root):
    return {pointer.function.name for header in (LAYER_HEADER, *PLATFORM_HEADERS)
            for pointer in function_pointers(root / header) if pointer.is_type}


def size_of(function, pointer, name, known):
    if pointer.kind == "by":
        cases = pointers.types_by_value(function, pointer, known).items()
        return "".join(f"{pointer.size} == {value} ? sizeof({type_name}) : " for value, type_name in cases) + "0"
    if pointer.kind == "bytes":
        return pointer.size
    return f"{pointer.size or 1} * sizeof *{name}"


def _looks(function, pointer, name, known):
    """What a stand-in claims of a pointer, and then does with it."""
    told = f'"{function.name}: {name} can be'
    if pointer.kind in ("tag", "symbol"):
        return [], []
    if pointer.kind == "text":
        return [f'CLAIM(__CPROVER_r_ok({name}, 1), {told} read");'], []
    size = size_of(function, pointer, name, known)
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
    if function.name in HANDED:
        condition, what = HANDED[function.name]
        claims.append(f'CLAIM({condition}, "{function.name}: {what}");')
    if not MAY_BE_CALLED_BY_ANYBODY.search(parts(function.contract)[3]):
        claims.append(f'CLAIM(!mind.mayNotSleep, "{function.name}: called where it may sleep");')
    if function.has_result:
        does.append(f"{function.result} answer = nondet_{function.name}();")
        if function.name in promises.answers_looked_at():
            does.append(f"answers.asked_{function.name} = 1;")
            does.append(f"answers.{function.name} = answer;")
        does.append("return answer;")
    answer = f"{function.result} nondet_{function.name}(void);\n" if function.has_result else ""
    body = "\n".join(f"    {line}" for line in [*claims, "somebodyMayAct();", *does])
    return f"{answer}{function.result} {function.name}({function.declared})\n{{\n{body}\n}}\n"


def stand_ins(root):
    headers = PLATFORM_HEADERS
    known = {}
    for header in headers:
        known |= pointers.enumerations(read(root / header))
    written = {match for match in re.findall(r"^\w+ (\w+)\(", read(ROOT / BY_HAND), re.M)}
    return "\n".join(stand_in(function, callback_types(root), known) for header in headers
                     for function in functions(root / header) if function.name not in written)


def _answers(root):
    """The last answers of the platform that claims look at."""
    results = {function.name: function.result for header in PLATFORM_HEADERS for function in functions(root / header)}
    fields = "\n".join(f"    _Bool asked_{name};\n    {results[name]} {name};" for name in promises.answers_looked_at())
    return f"typedef struct\n{{\n{fields}\n}} ANSWERS_T;\n\nstatic ANSWERS_T answers;\n"


def _argument(function, type_name, name, callbacks):
    """(declarations, the argument, (type, place, name) of an output, the place of an input) of a parameter."""
    if not pointers.is_pointer(type_name, callbacks):
        return [f"{type_name} {name};"], name, [], []
    pointer = pointers.pointer_of(function, type_name, name, callbacks)
    if pointer.kind == "tag":
        return [f"{type_name} {name};"], name, [], []
    if pointer.kind == "text":
        return [f"CHAR {name}_text[16];"], f"{name}_text", [], []
    there = f"{name}_there"
    lines = [f"{pointer.target} {there}[{pointer.size or 1}];"]
    if pointer.may_be_null:
        lines.append(f"{type_name} {name} = nondet_Bool() ? &{there}[0] : ({type_name})0;")
    else:
        lines.append(f"{type_name} {name} = &{there}[0];")
    return (lines, name, [(pointer.target, f"{there}[0]", name)] if pointer.is_written else [],
            [] if pointer.is_written else [there])


def _unchanged(kept, function):
    """(condition, object): a byte of what the layer keeps, any of them, is what it was."""
    when, left = promises.STORED_ALL_THE_SAME.get(function.name, ("", {}))
    for type_name, name in kept:
        fields = [field.partition(".")[2] for field in left if field.partition(".")[0] == name]
        excepted = " || ".join(f"i >= offsetof({type_name}, {field}) &&"
                               f" i < offsetof({type_name}, {field}) + sizeof (({type_name}*)0)->{field}"
                               for field in fields)
        place = _place(name)
        yield (f"i >= sizeof {name} || ((UCHAR*){place})[i] == ((UCHAR*)&before{name})[i]"
               + (f" || ({when}) && ({excepted})" if excepted else "")), name


def _leaves(function, kept, outputs, every, refusal):
    """Claims of what stays as it was: of what the layer keeps, and of what the caller gave for outputs."""
    done_nothing = " || ".join(filter(None, [refusal, "nothingDone" if function.name in promises.NOTHING_DONE else ""]))
    reads = promises.stores_nothing(function, every)
    lines = []
    if reads or done_nothing:
        lines.append("unsigned i = nondet_unsigned();")
        how = "it leaves" if reads else "a refusal leaves"
        lines += [f'CLAIM({"" if reads else f"!({done_nothing}) || "}{condition}, "{function.name}: {how} {name}");'
                  for condition, name in _unchanged(kept, function)]
    if done_nothing:
        lines += [f'CLAIM(!({done_nothing}) || {place} == before_{name}, "{function.name}: a refusal leaves {name}");'
                  for _, place, name in outputs]
    when, left = promises.STORED_ALL_THE_SAME.get(function.name, ("", {}))
    lines += [f'CLAIM(!({refusal}) || !({when}) || {field.replace("Conf.", "Conf[0].")} == {value},'
              f' "{function.name}: refused, {field} is {value}");' for field, value in left.items()]
    return lines


def _place(name):
    return name if name == "_arPmxConf" else f"&{name}"


def _call(function, arguments, result):
    return f"{result}{function.name}({', '.join(arguments)});"


def _while_nobody_acts(function, kept, callbacks, every, outputs, inputs):
    """(what is noted in front of a call, what is claimed behind it) while nobody else acts."""
    before, claims = promises.of_result(function, callbacks)
    refusal = promises.refusal_of(function, callbacks)
    noted = ["answers = (ANSWERS_T){ 0 };", "_Bool inRange = flagsInRange();"]
    noted += [f"{type_name} before{name} = {name}{'[0]' if name == '_arPmxConf' else ''};" for type_name, name in kept]
    noted += [f"{type_name} before_{name} = {place};" for type_name, place, name in outputs]
    noted += [f"UCHAR given_{place}[sizeof {place}];\n    memcpy(given_{place}, {place}, sizeof {place});"
              for place in inputs]
    noted += [f"_Bool refused[{len(before)}] = {{ {', '.join(before)} }};"] if before else []
    if function.name in promises.NOTHING_DONE:
        noted.append(f"_Bool nothingDone = {promises.NOTHING_DONE[function.name]};")
    claimed = [f'CLAIM({condition}, "{function.name}: {words}");' for condition, words in claims]
    claimed.append(f'CLAIM(!inRange || flagsInRange(), "{function.name}: flags stay in their ranges");')
    claimed += _leaves(function, kept, outputs, every, refusal)
    for place in inputs:
        claimed.append(f"unsigned at_{place} = nondet_unsigned();")
        claimed.append(f"CLAIM(at_{place} >= sizeof {place} || ((UCHAR*){place})[at_{place}] == "
                       f'given_{place}[at_{place}], "{function.name}: what is given stays");')
    claimed += [f'CLAIM({condition}, "{function.name}: {condition}");' for condition in ALSO.get(function.name, ())]
    if refusal:
        claimed += [f'CLAIM(!({refusal}), "{REACHED} by a refusal");', f'CLAIM({refusal}, "{REACHED} by a success");']
    return noted, claimed


def _in_the_handshake(function):
    noted = [f"__CPROVER_assume({PRESUMED[function.name]});"] if function.name in PRESUMED else []
    noted += [CALLED_BY[function.name]] if function.name in CALLED_BY else []
    if function.name in FORGETS_THE_TIMER:
        return noted, []
    return noted, [f'CLAIM(knowsTheTimer(), "{function.name}: the layer knows its timer");']


def operation(function, world, kept, callbacks, every):
    """The function that the checker starts from."""
    declared, arguments, outputs, inputs = [], [], [], []
    for type_name, name in pointers.declared_parameters(function):
        lines, argument, written, read_from = _argument(function, type_name, name, callbacks)
        declared += lines
        arguments.append(argument)
        outputs += written
        inputs += read_from
    if "..." in function.declared:
        arguments.append("nondet_unsigned()")
    context = parts(function.contract)[3]
    lines = [*declared, f"begin({world});"]
    if not promises.may_sleep(context):
        lines.append("mind.mayNotSleep = 1;")
    noted, claimed = [], []
    if world == "NOBODY":
        noted, claimed = _while_nobody_acts(function, kept, callbacks, every, outputs, inputs)
    elif world == "ANYBODY":
        noted = ["UCHAR ucModeBefore = _arPmxConf[0].ucMode;", *(f"mind.given = {place};" for place in inputs)]
    else:
        noted, claimed = _in_the_handshake(function)
    lines += noted
    lines.append(_call(function, arguments, f"{function.result} result = " if function.has_result else ""))
    lines += claimed
    if "takes no lock" in context:
        lines.append(f'CLAIM(!mind.everLocked, "{function.name}: takes no lock");')
    lines += [f'CLAIM(!({what}), "{REACHED} behind {what}");' for what in HAPPENS.get((function.name, world), ())]
    lines += ["end();", f'CLAIM(0, "{REACHED}");']
    body = "\n".join(f"    {line}" for line in lines)
    return f"void {world}_{function.name}(void)\n{{\n{body}\n}}\n"


def in_every_world(name):
    """Where the checker begins: in any of the worlds."""
    cases = "\n".join(f"    else if (nondet_Bool())\n        {world}_{name}();" for world in WORLDS[1:])
    return f"void {ENTRY}{name}(void)\n{{\n    if (nondet_Bool())\n        {WORLDS[0]}_{name}();\n{cases}\n}}\n"


def ends(text, name, world):
    """How many ends of an operation there are in a world of which it is claimed that nothing gets there."""
    return text[text.index(f"void {world}_{name}(void)"):].partition("\n}\n")[0].count(f'"{REACHED}')


def operations(root):
    return list(functions(root / LAYER_HEADER))


def text(root):
    """All that is written from the headers, as one source."""
    callbacks, kept = callback_types(root), objects(root)
    every = {function.name: function for function in operations(root)}
    stored = "\n".join(f"    __CPROVER_havoc_object({_place(name)});" for _, name in kept)
    calls = "\n".join("\n".join([*(operation(function, world, kept, callbacks, every) for world in WORLDS),
                                 in_every_world(function.name)]) for function in every.values())
    return f"""#include "surroundings.h"

{_answers(root)}
void anythingIsStored(void)
{{
{stored}
    if (mind.given != 0)
        __CPROVER_havoc_object(mind.given);
}}

{stand_ins(root)}
{calls}"""
