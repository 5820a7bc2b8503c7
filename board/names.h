/** @file
 *  Symbolic names of the numbers that cross the platform's and the layer's interfaces. */
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace board::names
{

/** A family of names; a number has at most one name in each. */
enum class Family
{
    None,
    ResolutionMode, ///< RES_…
    CcirMode,       ///< CCIR_…_MODE
    CcirFormat,     ///< CCIR_YC…
    GfxColorMode,   ///< DRV_GFX_COLOR_MODE_…
    ColorSpace,     ///< DRV_PMX_CS_…
    Plane,          ///< DRV_PMX_PLANE_…
    Output,         ///< PMX_OUTPUT_…
    ExtChipUsage,   ///< DRV_…
    TvType,         ///< PMX_TV_TYPE_…
    ComponentType,  ///< PMX_COMP_TYPE_…
    InterfaceId,    ///< IID_…
    SemaType,
    SemaOption,
    TimerFlag,
    VdpEnable,
    TveAspect,
    Aspect, ///< ASP_…
    HdmiColorSpace,
    HdmiPictureAspect,
    HdmiAfd,
    AvdCommand, ///< PMX_SET_VIDEO_PLL …
    AvdQuery,
    DigitalFormat,  ///< PLA_MXR_DIGITAL_OUTPUT_FMT_…
    ExtChipSetting, ///< PLA_MXR_EXT_…
    ClosedCaption
};

/** Name of a number in a family; empty when it has none. */
std::string_view name_of(Family family, std::int64_t number);

/** Number of a name in any family. */
std::optional<std::int64_t> number_of(std::string_view name);

/** Family of an argument or record field, found from its name and the function or record it belongs to
 *  ("PMX_HalSetMode", "ucMode" is a resolution mode). */
Family family_of(std::string_view owner, std::string_view argument);

/** Every name, for completion and for suggesting the nearest one. */
const std::vector<std::string_view>& all();

/** The candidates nearest to a misspelt name, best first, at most `count`; empty when nothing is near. */
std::vector<std::string> nearest(std::string_view wrong, const std::vector<std::string_view>& candidates,
                                 std::size_t count = 3);

} // namespace board::names
