// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The HDMI/AV driver: the sink, the commands that it was given, what it was told of the mixed picture.
#include "board/hdmi_av.h"

#include <algorithm>
#include <array>
#include <string>
#include <vector>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/display_part.h"
#include "board/shown.h"
#include "board/trace.h"
#include "drv_av_d.h"

namespace
{

using board::Value;
using board::names::Family;

/** What a command's parameter points to. */
enum class Parameter
{
    Byte,
    Word,
    Resolution,
    TvSystem
};

struct Command
{
    UINT32 number;
    Parameter parameter;
    Family family = Family::None;
};

constexpr std::array COMMANDS{
    Command{ PMX_CHG_HDMI_COLOR_SPACE, Parameter::Byte, Family::HdmiColorSpace },
    Command{ PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, Parameter::Word, Family::Aspect },
    Command{ PMX_SET_UI_TV_SYSTEM, Parameter::TvSystem },
    Command{ PMX_SET_HDMI_BRIGHTNESS, Parameter::Byte },
    Command{ PMX_SET_HDMI_CONTRAST, Parameter::Byte },
    Command{ PMX_SET_HDMI_HUE, Parameter::Byte },
    Command{ PMX_SET_HDMI_SATURATION, Parameter::Byte },
    Command{ PMX_CHG_DEEP_COLOR_BIT, Parameter::Byte },
    Command{ PMX_SET_VIDEO_PLL, Parameter::Resolution },
    Command{ PMX_SET_HDMI_RES_CHG, Parameter::Resolution },
    Command{ PMX_CHG_UI_RES_AUTO, Parameter::Byte },
    Command{ PMX_SET_HDMI_SHARPNESS, Parameter::Byte },
    Command{ PMX_SET_CCIR_RES_CHG, Parameter::Resolution },
    Command{ PMX_SET_EXT_SHARPNESS, Parameter::Byte },
    Command{ PMX_SET_EXT_BRIGHTNESS, Parameter::Byte },
    Command{ PMX_SET_EXT_CONTRAST, Parameter::Byte },
    Command{ PMX_SET_EXT_SATURATION, Parameter::Byte },
    Command{ PMX_SET_EXT_COLOR_SPACE, Parameter::Byte },
    Command{ PMX_SET_EXT_Y_C_DELAY, Parameter::Byte },
    Command{ PMX_SET_EXT_CUE_CORRECT, Parameter::Byte },
    Command{ PMX_SET_EXT_BORDER_LEVEL, Parameter::Byte },
    Command{ PMX_SET_EXT_DEINTERLACE_MODE, Parameter::Byte },
    Command{ PMX_SET_EXT_NOISE_REDUCTION, Parameter::Byte },
    Command{ PMX_SET_EXT_EDGE_ENHANCEMENT, Parameter::Byte },
    Command{ PMX_SET_EXT_DETAIL_ENHANCEMENT, Parameter::Byte },
    Command{ PMX_SET_EXT_ZOOM_IMAGE, Parameter::Byte },
    Command{ PMX_SET_EXT_GAMMA, Parameter::Byte },
    Command{ PMX_SET_EXT_DEEP_COLOR, Parameter::Byte },
};

struct HdmiAv
{
    bool sink_plugged = true;
    bool resolution_requested = false;
    std::array<Value, COMMANDS.size()> parameters; ///< of each command's last call
    std::optional<board::hdmi_av::Resolution> chosen_resolution;
    std::vector<board::hdmi_av::Resolution> sink_modes; ///< none: it takes anything
    std::optional<UCHAR> posted_resolution;
    std::optional<DRV_PMX_COLOR_SPACE_T> posted_colour_space;
    unsigned change_ok_notices = 0;
    std::optional<bool> ccir_before_mixer;
};

HdmiAv hdmi_av_state;

/** The row of a command; the end when the driver has no such command. */
auto find_command(UINT32 u4Command)
{
    return std::find_if(COMMANDS.begin(), COMMANDS.end(),
                        [u4Command](const Command& row) { return row.number == u4Command; });
}

/** What a command's parameter holds. The length of a call says nothing: it is 1 for records too. */
Value content(const Command& command, const void* parameter)
{
    switch (command.parameter)
    {
    case Parameter::Word: return board::named(command.family, *static_cast<const UINT32*>(parameter));
    case Parameter::Resolution: return board::to_value(*static_cast<const PMX_SET_HDMI_RES_PARAMETER_T*>(parameter));
    case Parameter::TvSystem: return board::to_value(*static_cast<const PMX_SET_TV_SYS_PARAMETER_T*>(parameter));
    case Parameter::Byte: break;
    }
    return board::named(command.family, *static_cast<const UINT8*>(parameter));
}

/** Of the last call of a command that changes a resolution; nothing while there was none. */
std::optional<board::hdmi_av::Told> told_by(UINT32 u4Command, std::string_view enable, std::string_view mode)
{
    const auto row = static_cast<std::size_t>(find_command(u4Command) - COMMANDS.begin());
    const Value& parameter = hdmi_av_state.parameters.at(row);
    if (parameter.kind() == Value::Kind::Null)
        return std::nullopt;
    return board::hdmi_av::Told{ parameter.find(enable)->as_number() != 0, parameter.find(mode)->as_number() };
}

Value reported(const std::array<Value, COMMANDS.size()>& parameters)
{
    Value value = Value::record({});
    for (std::size_t row = 0; row < COMMANDS.size(); ++row)
    {
        value.add(std::string(board::names::name_of(Family::AvdCommand, COMMANDS[row].number)), parameters[row]);
    }
    return value;
}

/** What the driver would choose for a sink; what was set for all questions goes before what the sink takes. */
board::hdmi_av::Resolution choice(board::hdmi_av::Resolution asked)
{
    if (hdmi_av_state.chosen_resolution)
        return *hdmi_av_state.chosen_resolution;
    const auto& modes = hdmi_av_state.sink_modes;
    if (modes.empty())
        return asked;
    const auto taken = std::find_if(modes.begin(), modes.end(), [&](const board::hdmi_av::Resolution& mode) {
        return mode.mode == asked.mode && mode.frequency == asked.frequency;
    });
    return taken != modes.end() ? *taken : modes.front();
}

Value reported(const std::optional<board::hdmi_av::Resolution>& resolution)
{
    if (!resolution)
        return Value::null();
    return Value::record({ { "mode", board::named(Family::ResolutionMode, resolution->mode) },
                           { "frequency", Value::number(resolution->frequency) } });
}

Value reported(const std::vector<board::hdmi_av::Resolution>& resolutions)
{
    std::vector<Value> values;
    for (const board::hdmi_av::Resolution& resolution : resolutions)
        values.push_back(reported(std::optional(resolution)));
    return Value::list(std::move(values));
}

} // namespace

namespace board::hdmi_av
{

void power_on(const Description& description)
{
    hdmi_av_state = {};
    hdmi_av_state.sink_plugged = description.sink_plugged;
    hdmi_av_state.resolution_requested = description.resolution_requested;
    hdmi_av_state.chosen_resolution = description.valid_resolution;
    hdmi_av_state.sink_modes = description.sink_modes;
}

Value state()
{
    const HdmiAv& av = hdmi_av_state;
    return Value::record({ { "sink_plugged", flag(av.sink_plugged) },
                           { "resolution_requested", flag(av.resolution_requested) },
                           { "commands", reported(av.parameters) },
                           { "chosen_resolution", reported(av.chosen_resolution) },
                           { "sink_modes", reported(av.sink_modes) },
                           { "posted_resolution", setting(av.posted_resolution, Family::ResolutionMode) },
                           { "posted_colour_space", setting(av.posted_colour_space, Family::ColorSpace) },
                           { "change_ok_notices", Value::number(av.change_ok_notices) },
                           { "ccir_before_mixer", setting(av.ccir_before_mixer) } });
}

Shown shown()
{
    return { hdmi_av_state.sink_plugged, told_by(PMX_SET_HDMI_RES_CHG, "fgHdmiOutEnable", "ucHdmiOutDisplayResolution"),
             told_by(PMX_SET_CCIR_RES_CHG, "fgCCIROutEnable", "ucCCIROutResolution") };
}

CallArgument command_parameter(const void* parameter, std::uint32_t number)
{
    const auto command = find_command(number);
    if (command == COMMANDS.end() || parameter == nullptr)
        return trace_arguments::ignored(parameter);
    return { content(*command, parameter) };
}

CallArgument query_parameter(void* parameter, std::uint32_t query)
{
    if (query != PMX_GET_VALID_RES_AND_VFREQ)
        return trace_arguments::ignored(parameter);
    return trace_arguments::record(static_cast<PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T*>(parameter));
}

void plug(bool plugged)
{
    trace::notice("plug", plugged ? "HDMI sink plugged in" : "HDMI sink unplugged");
    hdmi_av_state.sink_plugged = plugged;
}

void request_resolution(bool wanted)
{
    trace::notice("plug", wanted ? "hot plug wants the resolution sent again" : "hot plug wants no resolution");
    hdmi_av_state.resolution_requested = wanted;
}

void choose_resolution(std::optional<Resolution> resolution)
{
    hdmi_av_state.chosen_resolution = resolution;
}

} // namespace board::hdmi_av

using board::hdmi_av::command_parameter;
using board::hdmi_av::query_parameter;

BOOL fgPmxDrvSetAvd(UINT32 u4Command, void* pvParameter, UINT32 u4Length)
try
{
    BOARD_CALL_R(fgPmxDrvSetAvd, u4Command, command_parameter(pvParameter, u4Command), u4Length);
    const auto command = find_command(u4Command);
    if (command == COMMANDS.end() || pvParameter == nullptr)
        return boardCall.answer(FALSE);
    const auto row = static_cast<std::size_t>(command - COMMANDS.begin());
    hdmi_av_state.parameters[row] = content(*command, pvParameter);
    if (u4Command == PMX_SET_HDMI_RES_CHG)
        board::display_part::resolution_change();
    return boardCall.answer(TRUE);
}
BOARD_CALL_END(fgPmxDrvSetAvd)

BOOL fgPmxDrvGetAvdInfo(UINT32 u4Query, void* pvParameter)
try
{
    BOARD_CALL_R(fgPmxDrvGetAvdInfo, u4Query, query_parameter(pvParameter, u4Query));
    if (u4Query != PMX_GET_VALID_RES_AND_VFREQ || pvParameter == nullptr)
        return boardCall.answer(FALSE);
    auto* query = static_cast<PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T*>(pvParameter);
    const board::hdmi_av::Resolution chosen = choice({ query->u4ResCheck, query->u2VsyncFreq });
    query->u4ValidAutoRes = chosen.mode;
    query->u2ValidAutoVfreq = chosen.frequency;
    return boardCall.answer(TRUE);
}
BOARD_CALL_END(fgPmxDrvGetAvdInfo)

INT32 i4GetHotPlugStatus(void)
try
{
    BOARD_CALL_R(i4GetHotPlugStatus);
    return boardCall.answer(hdmi_av_state.sink_plugged ? 1 : 0);
}
BOARD_CALL_END(i4GetHotPlugStatus)

BOOL fgIsHotPlugChgRes(void)
try
{
    BOARD_CALL_R(fgIsHotPlugChgRes);
    return boardCall.answer(hdmi_av_state.resolution_requested ? TRUE : FALSE);
}
BOARD_CALL_END(fgIsHotPlugChgRes)

void vPostChgRes(UCHAR ucMode)
try
{
    BOARD_CALL(vPostChgRes, ucMode);
    hdmi_av_state.posted_resolution = ucMode;
}
BOARD_CALL_END(vPostChgRes)

void vPostChgInputCS(DRV_PMX_COLOR_SPACE_T eColorSpace)
try
{
    BOARD_CALL(vPostChgInputCS, eColorSpace);
    hdmi_av_state.posted_colour_space = eColorSpace;
}
BOARD_CALL_END(vPostChgInputCS)

void vSendAvdNotifyScomResChgOK(void)
try
{
    BOARD_CALL(vSendAvdNotifyScomResChgOK);
    ++hdmi_av_state.change_ok_notices;
}
BOARD_CALL_END(vSendAvdNotifyScomResChgOK)

void vSetCcirOutBeforeMixer(BOOL fgBeforeMixer)
try
{
    BOARD_CALL(vSetCcirOutBeforeMixer, fgBeforeMixer);
    hdmi_av_state.ccir_before_mixer = fgBeforeMixer != 0;
}
BOARD_CALL_END(vSetCcirOutBeforeMixer)
