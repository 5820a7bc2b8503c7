# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What the contracts promise of results and of what is stored, in the checker's words. A result is told as "1; 0 for
this, that or when so": whatever is named yields the refusal, and nothing else does. What a contract says in other words
is said here once more; a contract of which nothing is known is an error."""

import re

import pointers
from platform_functions import parts

SUCCESS = re.compile(r"(1|0|PMX_SET_OK|PMX_PORT_DONE)(?:, connected or not|, whatever the driver answers"
                     r"|, also (?:for an unknown swap mode|for a mixer id other than 0"
                     r"|when the value is the stored one and nothing is done))?$")
REFUSAL = re.compile(r"(0|PMX_NO_SUCH_PORT) (?:also )?(?:for|when) (.*?)(?:, (?:and|which) then .*)?$")
HDMI_REFUSES = "answers.asked_fgPmxDrvSetAvd && answers.fgPmxDrvSetAvd == FALSE"

# What contracts give as a reason, and what it is. All of it is looked at in front of the call, but for the platform's
# last answers. In braces stands what differs from operation to operation.
REASONS = {
    "a mixer id other than 0": "{id} != 0",
    "a tag whose low 8 bits are not 0": "(UCHAR)(size_t)pvTag != 0",
    "a null pointer": "{nulls}",
    "either pointer is null": "{nulls}",
    "a mode that PMX_CheckCap refuses": "PMX_CheckCap(0, ucMode) == 0",
    "a refused mode": "PMX_CheckCap(0, ucMode) == 0",
    "a mixer format that PMX_CheckCap refuses": "prOutConf != 0 && PMX_CheckCap(0, mixersMode(prOutConf)) == 0",
    "another frequency": "u2VSyncFreq != 50 && u2VSyncFreq != 60 && u2VSyncFreq != 24 && u2VSyncFreq != 30 &&"
                         " u2VSyncFreq != 25",
    "the driver has no answer": "answers.asked_fgPmxDrvGetAvdInfo && answers.fgPmxDrvGetAvdInfo == FALSE",
    "a position above 7": "ucPlaneOrder > 7",
    "two planes name one source": "!sourcesDiffer(u4PlaneOrder)",
    "the hardware refuses the order": "answers.PMX_HalSetPlaneOrder != 0",
    "the hardware cannot report its order": "answers.PMX_HalGetPlaneOrder != 0",
    "a component without a port": "{port} == PMX_PORT_NUM",
    "a plane without a port": "{port} == PMX_PORT_NUM",
    "with one that nobody connected": "!isConnected({port})",
    "the HDMI/AV driver refuses it": HDMI_REFUSES,
    "a value above 4": "ucRgb > 4",
    "an unknown setting": "eSetType > PLA_MXR_EXT_DEEP_COLOR",
}
CAPABILITY = re.compile(r"capability bit (\d+) is clear")
LACKS = "(_arPmxConf[0].u4Capability >> {} & 1) == 0"

# What is told in words of its own.
OTHER_WORDS = {
    "i4PMX_Uninit": ["result == (answers.x_sema_delete != OSR_OK ? -1 : 0)"],
    "i4PmxRegisterIM": ["result == answers.i4ImRegisterInterface2"],
    "i4PmxUnregisterIM": ["result == answers.i4ImUnregisterInterface2"],
    "PMX_CheckCap": ["result == 0 || result == 1"],
    "PMX_IsForceMode": ["result == (before_arPmxConf.fgForceMode != FALSE)"],
    "fgPMX_DisplayModeReady": ["result == (before_arPmxDispPartStatus.fgPmxFormatChangeFlag == FALSE)"],
    "PMX_ProgressiveOut": ["result == 0 || result == 1", "ucPmxId == 0 || result == 0"],
    "fgPmxFmtHDOutput": ["result == FALSE || result == TRUE"],
    "PMX_SetHdmiDeepColor": ["result == (ucPmxId != 0 || answers.fgPmxDrvSetAvd != FALSE)",
                             "ucPmxId == 0 || !answers.asked_fgPmxDrvSetAvd"],
    "PMX_VdpGetPlanePosition": ["result == DRV_PMX_PLANE_1 || result == DRV_PMX_PLANE_2",
                                "ucVdpHwId <= 1 || result == DRV_PMX_PLANE_1"],
    "i4PmxGetPlanePosition": ["result == DRV_PMX_PLANE_1 || result == DRV_PMX_PLANE_2"],
    "u4PmxCompId2LocalId": ["result == portOf(u2CompType, u2CompId)"],
    "PMX_SetAspectRatioNext": [f"result == ({HDMI_REFUSES} ? 0 : _arPmxConf[0].u4AspectRatio)"],
    "PMX_IsUnderDigestMode": ["result == (ucPmxId == 0 ? before_arPmxConf.fgDigestEnable : FALSE)"],
}
# Of these the contract says what an answer means, or how it comes about, which is not claimed.
UNSAID = {"PMX_GetHDMIDefaultRes": "which of the partition's bytes it is",
          "PMX_CheckCap": "which modes are admitted",
          "PMX_ProgressiveOut": "which modes are progressive",
          "fgPmxFmtHDOutput": "which modes are HD",
          "i4PmxGetPlanePosition": "which of the two planes it is",
          "PMX_VdpGetPlanePosition": "which of the two planes it is"}

# When nothing is done although nothing is refused, or nothing can tell so.
_STARTED = "_PmxInitiated == 1"
NOTHING_DONE = {
    "PMX_Init": "_PmxInitiated != 0",
    "PMX_Reset": "ucPmxId != 0",
    "PMX_Uninit": f"!({_STARTED})",
    "i4PMX_Uninit": f"!({_STARTED})",
    "PMX_Stop": f"!({_STARTED})",
    "PMX_SetEnable": "ucEnable == _arPmxConf[0].ucEnable",
    "PMX_SetCBEnable": "ucEnable == _arPmxConf[0].ucCBEnable",
    "PMX_SetMuteEnable": "ucEnable == _arPmxConf[0].ucMuteEnable",
    "PMX_SetHdmiDeepColor": "ucPmxId != 0",
    "PMX_SetClosedCaptionOnOff": "ucPmxId != 0",
    **{f"d_PMX_{verb}{what}": LACKS.format(f"PMX_CAP_BIT_{what.upper()}") for verb in ("Set", "Get")
       for what in ("Brightness", "Contrast", "Hue", "Saturation", "Sharpness")},
}

# What a refusal may leave, as those contracts say: when, and what is there then. Else each byte is what it was.
STORED_ALL_THE_SAME = {
    "PMX_SetArbPlaneOrder": ("answers.PMX_HalSetPlaneOrder != 0", {"_arPmxConf.u4PlaneOrder": "u4PlaneOrder"}),
    "PMX_SetAspectRatio": (HDMI_REFUSES, {"_arPmxConf.u4AspectRatio": "u4AspectRatio"}),
    "PMX_SetAspectRatioEx": (HDMI_REFUSES, {"_arPmxConf.u4AspectRatio": "u4AspectRatio",
                                            "_arPmxConf.fgAspNext": "FALSE", "_arPmxConf.u4AspNext": "0"}),
    # Its result is a ratio: one that is 0 and was not refused is no refusal.
    "PMX_SetAspectRatioNext": ("before_arPmxConf.fgAspNext != FALSE",
                               {"_arPmxConf.u4AspectRatio": "before_arPmxConf.u4AspNext",
                                "_arPmxConf.fgAspNext": "FALSE"}),
    "PMX_SetDigitalOutRgb": ("ucPmxId == 0 && ucRgb > 4", {"_arPmxConf.ucDigitalRgb": "ucRgb"}),
    # A refused format lowers the format-change flag, and what follows of it.
    "PMX_SetModeEx": ("ucPmxId == 0 && prOutConf != 0",
                      {"_arPmxDispPartStatus.fgPmxFormatChangeFlag": "FALSE",
                       "_arPmxDispPartStatus.fgPmxEnabeOsdFlag": "mind.videoWaited"}),
}


class Unclear(Exception):
    """A contract says of its result what nothing here understands."""


def _told_by(function, callbacks):
    """What stands in the braces of reasons."""
    names = [name for _, name in pointers.declared_parameters(function)]
    nulls = [f"{name} == 0" for type_name, name in pointers.declared_parameters(function)
             if pointers.is_pointer(type_name, callbacks) and name != "pvTag"]
    component = next((place for name, place in (("u2UpstreamCompId", "u2UpstreamCompType, u2UpstreamCompId"),
                                                ("ucVdpId", "PMX_COMP_TYPE_VDP, ucVdpId"),
                                                ("ucOsdId", "PMX_COMP_TYPE_OSD, ucOsdId")) if name in names), "")
    return {"id": next((name for name in ("ucPmxId", "u2ThisCompId") if name in names), ""),
            "nulls": " || ".join(nulls), "port": f"portOf({component})" if component else ""}


def _reason(function, words, told):
    capability = CAPABILITY.fullmatch(words)
    if capability:
        return LACKS.format(capability[1])
    pattern = REASONS.get(words)
    if not pattern or any(f"{{{name}}}" in pattern and not value for name, value in told.items()):
        raise Unclear(f"{function.name}: a result for what reason? {words}")
    return pattern.format(**told)


def results(function, callbacks):
    """(success, refusal, [(the contract's words, condition)]) of a result that is told in the usual words, or none."""
    first, *others = parts(function.contract)[2].split("; ")
    success = SUCCESS.match(first)
    refused = [REFUSAL.match(clause) for clause in others]
    if not success or not all(refused):
        return None
    told = _told_by(function, callbacks)
    words = [re.sub(r"^(?:for|when|if) ", "", reason) for clause in refused
             for reason in re.split(r",? or |, ", clause[2])]
    return success[1], refused[0][1] if refused else "", [(each, _reason(function, each, told)) for each in words]


def of_result(function, callbacks):
    """(conditions to look at in front of the call, [(claim, words)] behind it) of a result. Claims find in refused[]
    what was seen then."""
    if not function.has_result:
        return [], []
    usual = results(function, callbacks)
    if not usual:
        if function.name not in OTHER_WORDS and function.name not in UNSAID:
            raise Unclear(f"{function.name}: what is returned, and when? {parts(function.contract)[2]}")
        return [], [(condition, condition) for condition in OTHER_WORDS.get(function.name, ())]
    success, refusal, reasons = usual
    before, names, claims = [], [], []
    for words, condition in reasons:
        if "answers." in condition:
            names.append(f"({condition})")
        else:
            names.append(f"refused[{len(before)}]")
            before.append(condition)
        claims.append((f"!{names[-1]} || result == {refusal}", f"{refusal}: {words}"))
    claims.append((" || ".join([*names, f"result == {success}"]), f"{success}: all else"))
    return before, claims


def refusal_of(function, callbacks):
    """The condition of a refusal, or nothing for an operation that refuses nothing."""
    usual = results(function, callbacks) if function.has_result else None
    if usual:
        return f"result == {usual[1]}" if usual[1] else ""
    return "result == 0" if function.name in ("PMX_SetAspectRatioNext", "PMX_SetHdmiDeepColor") else ""


def stores_nothing(function, every):
    """Whether the contract says so: it reads, asks, finds or prints. `every`: {name: function} of all operations."""
    brief = parts(function.contract)[0]
    same = re.match(r"IPMX: (\w+)\.$", brief)
    if same:
        return stores_nothing(every[same[1]], every)
    return bool(re.match(r"(?:Read|Find|Print|Ask(?! for)) |The module's own formatted print\b", brief)
                or re.search(r"\bnot stored\b|; does nothing\.$|The record is left alone\.$", brief))


def may_sleep(context):
    return bool(re.search(r"\bmay sleep\b|; sleeps\b|the framework's thread|power management", context))


def answers_looked_at():
    """Functions of the platform whose last answer is kept in mind."""
    told = repr((REASONS, OTHER_WORDS, STORED_ALL_THE_SAME))
    return sorted(set(re.findall(r"answers\.(?!asked_)(\w+)", told)))
