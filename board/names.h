// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Symbolic names of the numbers that cross the platform's and the layer's interfaces. */
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace board::names
{

/** A family of names; a number has at most one name in each. Behind it stands where the names come from (an enumeration
 *  of the headers, a constant, or what the names of constants begin with), and what people call them: cmake/names.py
 *  writes the tables by it. Names of None go with any number, and no number is shown by them. */
enum class Family
{
    None,           ///< TRUE, FALSE, OSR_OK, TVE_, PMX_SET_OK, PMX_PORT_DONE, PMX_NO_SUCH_PORT, VDP_CMD_: never shown
    ResolutionMode, ///< PMX_RESOLUTION_MODE_T: resolution modes
    CcirMode,       ///< CCIR_IN_OUT_MODE_T: modes of the digital port
    CcirFormat,     ///< CCIR_IN_OUT_FORMAT_T: formats of the digital port
    GfxColorMode,   ///< DRV_GFX_COLOR_MODE_T: colour modes of graphics
    ColorSpace,     ///< DRV_PMX_COLOR_SPACE_T: colour spaces of the mixer
    Plane,          ///< DRV_PMX_PLANE_T: planes of the mixer
    Output,         ///< PMX_OUTPUT_: outputs
    ExtChipUsage,   ///< DRV_EXT_CHIP_USAGE_T: uses of the external chip
    TvType,         ///< PMX_TV_TYPE_: TV types
    ComponentType,  ///< PMX_COMP_TYPE_: component types
    InterfaceId,    ///< IID_: interfaces
    SemaType,       ///< X_SEMA_TYPE_T: types of semaphores
    SemaOption,     ///< X_SEMA_OPTION_T: options of a lock
    TimerFlag,      ///< X_TIMER_FLAG_T: kinds of timers
    VdpEnable,      ///< VDP_ENABLE_T: enable states of a video plane
    TveAspect,      ///< TVE_ASPECT_RATIO_T: aspect ratios of the TV encoder
    Aspect,         ///< ASPECT_RATIO_T: aspect ratios
    HdmiColorSpace, ///< HDMI_COLOR_SPACE_T: colour spaces of HDMI
    HdmiPictureAspect, ///< HDMI_PICTURE_ASPECT_RATIO_T: picture aspect ratios of HDMI
    HdmiAfd,           ///< HDMI_AFD_FORMT_T: active formats of HDMI
    AvdCommand,        ///< PMX_AVD_COMMAND_T: commands to the HDMI/AV driver
    AvdQuery,          ///< PMX_AVD_QUERY_T: queries of the HDMI/AV driver
    DigitalFormat,     ///< PLA_MXR_DIGITAL_OUTPUT_FMT_T: formats of the digital picture
    ExtChipSetting,    ///< PLA_MXR_EXTERNAL_CHIP_SETTING_E: settings of the external chip
    ClosedCaption      ///< PLA_MXR_CLOSED_CAPTION_ON_OFF_T: closed-caption switch
};

struct FamilyTitle
{
    Family family;
    std::string_view title;
};

/** Every family but None. */
std::span<const FamilyTitle> families();

/** Name of a number in a family; empty when it has none. */
std::string_view name_of(Family family, std::int64_t number);

/** Number of a name in any family. */
std::optional<std::int64_t> number_of(std::string_view name);

/** Family of an argument, a "result" or a record's field, as the headers tell it of the function or record that it
 *  belongs to ("PMX_HalSetMode", "ucMode" is a resolution mode). */
Family family_of(std::string_view owner, std::string_view argument);

/** Every name, for completion and for suggesting the nearest one. */
const std::vector<std::string_view>& all();

/** The candidates nearest to a misspelt name, best first, at most `count`; empty when nothing is near. */
std::vector<std::string> nearest(std::string_view wrong, const std::vector<std::string_view>& candidates,
                                 std::size_t count = 3);

} // namespace board::names
