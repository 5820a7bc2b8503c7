// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The expected traces of the colour conversions and of one mode on all outputs, put together from their inputs. */
#pragma once

#include <cstdint>
#include <string>

#include "tests/layer/mode_facts.h"

namespace one_mode
{

/** PMX_ColorSpaceSetup for a mixer colour space, as a number: 0 BT.601, 1 BT.709, any other refused. */
inline std::string colour_setup(unsigned mode, std::uint32_t colour_space)
{
    const std::string entry = "LOG9 \"Mode(" + std::to_string(mode) + "), eMixerOutCS(" +
                              std::to_string(static_cast<std::int32_t>(colour_space)) +
                              ")\\n\"\n"
                              "PMX_HalSelectVdoutCconv(0, 1)\n"
                              "PMX_HalSelectScalerCconv(0, 0)\n";
    const mode_facts::Colours colours = mode_facts::facts_of(mode).colours;
    if (colours == mode_facts::Colours::None)
        return entry;
    if (colour_space > 1)
        return entry + "LOG5 \"Invalid Color Space Id\\n\"\n"
                       "Assert(\"0\", \"src/driver/pmx/pmx_colour.cpp\")\n";
    if (colours == mode_facts::Colours::Sd)
        return entry +
               (colour_space == 0 ? "PMX_HalSetCC_A(0, 0, 0)\n"
                                    "LOG9 \"CC_A disable\\n\"\n"
                                  : "PMX_HalSetCC_A(0, 1, 1)\n"
                                    "LOG9 \"CC_A enable, 709->601\\n\"\n") +
               "PMX_HalSetScaler709601(0, 0, 0)\n"
               "LOG8 \"Scaler CC disable, don't care\\n\"\n";
    return entry + (colour_space == 0 ? "PMX_HalSetCC_A(0, 1, 0)\n"
                                        "LOG9 \"CC_A enable, 601->709\\n\"\n"
                                        "PMX_HalSetScaler709601(0, 0, 0)\n"
                                        "LOG8 \"Scaler CC disable\\n\"\n"
                                      : "PMX_HalSetCC_A(0, 0, 0)\n"
                                        "LOG9 \"CC_A disable\\n\"\n"
                                        "PMX_HalSetScaler709601(0, 1, 1)\n"
                                        "LOG8 \"Scaler CC enable, 709->601\\n\"\n");
}

/** The record that goes with the HDMI/AV driver's commands. */
inline std::string avd_record(unsigned mode)
{
    const std::string number = std::to_string(mode);
    return "{u1ScaleMode=0, ucHdmiOutDisplayResolution=" + number + ", ucFmtOutResolution=" + number +
           ", ucCCIROutResolution=" + number +
           ", ucHdmiOutMode=0, eCcirDrvInfo={eDgoMode=0, eDgoFmt=0, eDgiMode=0, eDgiFmt=0}, fgOsdMsg=0, "
           "ucCCIROutMode=1, fgCCIROutEnable=0, fgHdmiOutEnable=1, u2_Vfreq=0}";
}

inline std::string avd_command(const char* command, unsigned mode)
{
    return std::string("fgPmxDrvSetAvd(") + command + ", " + avd_record(mode) + ", 1)\n";
}

/** What PMX_SetMode logs first. */
inline std::string log_of(unsigned mode)
{
    return "LOG9 \"SetMode, " + mode_facts::name(mode) + "\\n\"\n";
}

/** What PMX_SetMode does for an unchanged mode. */
inline std::string unchanged(unsigned mode)
{
    const std::string number = std::to_string(mode);
    return log_of(mode) + "OSD_BASE_SetDisplayMode(" + number + ")\nVDP_SetTvFormat(" + number + ", 0)\n";
}

struct Request
{
    unsigned mode = 0;
    unsigned frequency = 60;
    unsigned osd5 = 0;
    std::uint32_t colour_space = 1;
};

/** What PMX_SetMode does for an admitted mode that is new. */
inline std::string set_mode(const Request& request)
{
    const std::string mode = std::to_string(request.mode);
    const bool is_60 = request.frequency == 60;
    const std::string format = ", " + mode + ", " + std::to_string(request.frequency) + ", ";
    const std::string flags = std::string(", 1, ") +
                              (mode_facts::facts_of(request.mode).is(mode_facts::tve_hd) ? "1" : "0") + ", " +
                              std::to_string(request.osd5) + ")\n";
    std::string lines = log_of(request.mode);
    lines += "OSD_BASE_SetDisplayMode(" + mode + ")\n";
    lines += avd_command("PMX_SET_VIDEO_PLL", request.mode);
    lines += avd_command("PMX_SET_CCIR_RES_CHG", request.mode);
    lines += colour_setup(request.mode, request.colour_space);
    lines += "PMX_HalSetMode(0, " + mode + ")\n";
    lines += "PMX_HalSetScalerMode(" + mode + ")\n";
    lines += "VDP_SetTvFormat(" + mode + ", 1)\n";
    lines += is_60 ? "PMX_HalSetTvType(0, 0)\n" : "PMX_HalSetTvType(0, 3)\n";
    lines += "TVE_SetFmtEx(0" + format + mode + flags;
    lines += "TVE_SetFmtEx(1" + format + (is_60 ? "RES_480I" : "RES_576I") + flags;
    lines += "PMX_HalReset(0)\n"
             "PMX_HalScalerReset(0)\n"
             "VDP_GlobalOutputChange()\n"
             "VDP_VsyncSendCmd(0, 2)\n"
             "VDP_VsyncSendCmd(1, 2)\n"
             "VDP_VsyncSendCmd(2, 2)\n";
    lines += avd_command("PMX_SET_HDMI_RES_CHG", request.mode);
    return lines + "OSD_BASE_SetFlag_PMXChangeResDone()\n";
}

} // namespace one_mode
