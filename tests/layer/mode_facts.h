/** @file
 *  What the operations on one resolution mode decide by it, typed here anew: names in the log, capability bits, the TV
 *  encoder's HD formats, the standard whose colours an output carries. */
#pragma once

#include <cstdint>
#include <map>
#include <string>

#include "drv_if_pmx.h"
#include "tests/core/mode_numbers.h"

namespace mode_facts
{

using mode_numbers::by_mode;
using mode_numbers::known;
using mode_numbers::Modes;
using mode_numbers::modes;

/** How the log names a mode: like its enumerator, but for RES_2D_640x480HZ. */
inline const std::string& name(unsigned mode)
{
    static const std::string without_name = "(null)";
    static const std::map<unsigned, std::string> names{
#define NAMED(mode) { mode, #mode }
        NAMED(RES_480I),
        NAMED(RES_576I),
        NAMED(RES_480P),
        NAMED(RES_576P),
        NAMED(RES_480P_1440),
        NAMED(RES_576P_1440),
        NAMED(RES_480P_2880),
        NAMED(RES_576P_2880),
        NAMED(RES_720P60HZ),
        NAMED(RES_720P50HZ),
        NAMED(RES_1080I60HZ),
        NAMED(RES_1080I50HZ),
        NAMED(RES_1080P60HZ),
        NAMED(RES_1080P50HZ),
        NAMED(RES_1080P30HZ),
        NAMED(RES_1080P25HZ),
        NAMED(RES_480I_2880),
        NAMED(RES_576I_2880),
        NAMED(RES_1080P24HZ),
        NAMED(RES_1080P23_976HZ),
        NAMED(RES_1080P29_97HZ),
        NAMED(RES_3D_1080P23HZ),
        NAMED(RES_3D_1080P24HZ),
        NAMED(RES_3D_720P60HZ),
        NAMED(RES_3D_720P50HZ),
        NAMED(RES_3D_720P30HZ),
        NAMED(RES_3D_720P25HZ),
        NAMED(RES_3D_576P50HZ),
        NAMED(RES_3D_480P60HZ),
        NAMED(RES_3D_1080I60HZ),
        NAMED(RES_3D_1080I50HZ),
        NAMED(RES_3D_1080I30HZ),
        NAMED(RES_3D_1080I25HZ),
        NAMED(RES_3D_576I25HZ),
        NAMED(RES_3D_480I30HZ),
        NAMED(RES_3D_576I50HZ),
        NAMED(RES_3D_480I60HZ),
        NAMED(RES_2D_480I60HZ),
        NAMED(RES_2D_576I50HZ),
        NAMED(RES_3D_720P60HZ_TB),
        NAMED(RES_3D_720P50HZ_TB),
        NAMED(RES_3D_1080I60HZ_SBS_HALF),
        NAMED(RES_3D_1080I50HZ_SBS_HALF),
        NAMED(RES_3D_1080P23HZ_TB),
        NAMED(RES_3D_1080P24HZ_TB),
        NAMED(RES_PANEL_AUO_B089AW01),
#undef NAMED
        { RES_2D_640x480HZ, "RES_2D_640x480" },
    };
    const auto found = names.find(mode);
    return found == names.end() ? without_name : found->second;
}

/** Bits of the capability word of which one admits a mode: none never, all always. */
inline constexpr std::uint32_t never = 0;
inline constexpr std::uint32_t always = 0xFFFFFFFF;

/** Whether a capability word admits a mode. */
inline bool admitted(unsigned mode, std::uint32_t capability)
{
    static const std::map<UINT32, std::uint32_t> bits = by_mode<std::uint32_t>({
        { 0x1, { RES_480I, RES_2D_480I60HZ } },
        { 0x2, { RES_576I } },
        { 0x4, { RES_480P } },
        { 0x8, { RES_576P } },
        { 0x10, { RES_720P60HZ, RES_3D_720P60HZ_TB } },
        { 0x20, { RES_720P50HZ, RES_3D_720P50HZ_TB } },
        { 0x40, { RES_1080I60HZ, RES_3D_1080I60HZ_SBS_HALF } },
        { 0x80, { RES_1080I50HZ, RES_3D_1080I50HZ_SBS_HALF } },
        { 0x100, { RES_1080P60HZ } },
        { 0x200, { RES_1080P50HZ } },
        { 0x400, { RES_1080P30HZ } },
        { 0x800, { RES_1080P25HZ } },
        { 0x1000, { RES_1080P24HZ, RES_3D_1080P24HZ_TB } },
        { 0x2000, { RES_1080P23_976HZ } },
        { 0x4000, { RES_1080P29_97HZ, RES_3D_1080P23HZ_TB /* not with 23.976 Hz: kept so */ } },
        { 0x8000,
          { RES_3D_1080P23HZ, RES_3D_1080P24HZ, RES_3D_720P60HZ, RES_3D_720P50HZ, RES_3D_720P30HZ, RES_3D_720P25HZ,
            RES_3D_576P50HZ, RES_3D_480P60HZ, RES_3D_1080I60HZ, RES_3D_1080I50HZ, RES_3D_1080I30HZ, RES_3D_1080I25HZ,
            RES_3D_576I25HZ, RES_3D_480I30HZ, RES_3D_576I50HZ, RES_3D_480I60HZ } },
        { 0x10000, { RES_2D_640x480HZ } },
        { always,
          { RES_480P_1440, RES_576P_1440, RES_480P_2880, RES_576P_2880, RES_480I_2880, RES_576I_2880,
            RES_PANEL_AUO_B089AW01 } },
        { never, { RES_2D_576I50HZ } },
    });
    const auto found = bits.find(mode);
    if (found == bits.end())
        return false;
    return found->second == always || (found->second & capability) != 0;
}

/** Formats that the TV encoder is told to be HD. 29.97 Hz is not among them. */
inline const Modes& tve_hd()
{
    static const Modes set = modes({
        RES_720P60HZ,
        RES_720P50HZ,
        RES_1080I60HZ,
        RES_1080I50HZ,
        RES_1080P60HZ,
        RES_1080P50HZ,
        RES_1080P30HZ,
        RES_1080P25HZ,
        RES_1080P24HZ,
        RES_1080P23_976HZ,
        RES_3D_1080P23HZ,
        RES_3D_1080P24HZ,
        RES_3D_720P60HZ,
        RES_3D_720P50HZ,
        RES_3D_720P30HZ,
        RES_3D_720P25HZ,
        RES_3D_1080I60HZ,
        RES_3D_1080I50HZ,
        RES_3D_1080I30HZ,
        RES_3D_1080I25HZ,
        RES_PANEL_AUO_B089AW01,
        RES_3D_720P60HZ_TB,
        RES_3D_720P50HZ_TB,
        RES_3D_1080I60HZ_SBS_HALF,
        RES_3D_1080I50HZ_SBS_HALF,
        RES_3D_1080P23HZ_TB,
        RES_3D_1080P24HZ_TB,
    });
    return set;
}

/** Whose colours an output carries. */
enum class Colours
{
    Sd,  ///< ITU-R BT.601
    Hd,  ///< ITU-R BT.709
    None ///< the converters are left alone
};

inline Colours colours(unsigned mode)
{
    static const std::map<UINT32, Colours> groups = by_mode<Colours>({
        { Colours::Sd,
          { RES_480I, RES_576I, RES_480P, RES_576P, RES_480P_1440, RES_576P_1440, RES_480P_2880, RES_576P_2880,
            RES_480I_2880, RES_576I_2880, RES_3D_576P50HZ, RES_3D_480P60HZ, RES_3D_576I25HZ, RES_3D_480I30HZ,
            RES_3D_576I50HZ, RES_3D_480I60HZ, RES_2D_480I60HZ, RES_2D_640x480HZ, RES_PANEL_AUO_B089AW01 } },
        { Colours::Hd,
          { RES_720P60HZ,
            RES_720P50HZ,
            RES_1080I60HZ,
            RES_1080I50HZ,
            RES_1080P60HZ,
            RES_1080P50HZ,
            RES_1080P30HZ,
            RES_1080P25HZ,
            RES_1080P24HZ,
            RES_1080P23_976HZ,
            RES_1080P29_97HZ,
            RES_3D_1080P23HZ,
            RES_3D_1080P24HZ,
            RES_3D_720P60HZ,
            RES_3D_720P50HZ,
            RES_3D_720P30HZ,
            RES_3D_720P25HZ,
            RES_3D_1080I60HZ,
            RES_3D_1080I50HZ,
            RES_3D_1080I30HZ,
            RES_3D_1080I25HZ,
            RES_3D_720P60HZ_TB,
            RES_3D_720P50HZ_TB,
            RES_3D_1080I60HZ_SBS_HALF,
            RES_3D_1080I50HZ_SBS_HALF,
            RES_3D_1080P23HZ_TB,
            RES_3D_1080P24HZ_TB } },
        { Colours::None, { RES_2D_576I50HZ /* unlike RES_2D_480I60HZ: kept so */ } },
    });
    const auto found = groups.find(mode);
    return found == groups.end() ? Colours::None : found->second;
}

} // namespace mode_facts
