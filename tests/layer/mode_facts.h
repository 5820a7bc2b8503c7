// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What each resolution mode decides, typed here anew and once for all tests: a line for a mode. What the layer's own
 *  table says of it is never looked at. */
#pragma once

#include <algorithm>
#include <cstdint>
#include <iterator>
#include <set>
#include <string>
#include <vector>

#include "drv_if_pmx.h"

namespace mode_facts
{

/** Whose colours an output carries. */
enum class Colours
{
    Sd,  ///< ITU-R BT.601
    Hd,  ///< ITU-R BT.709
    None ///< the converters are left alone
};

/** Facts that a mode has or has not. */
enum Fact : unsigned
{
    pll_60 = 1,      ///< runs the 60 Hz family's word: 24 Hz does not, 23.976 Hz does
    boot_60 = 2,     ///< may come from the boot loader, and then in a system with 60 fields a second
    boot_50 = 4,     ///< the same with 50
    progressive = 8, ///< is reported so
    hd_out = 16,     ///< is reported as an HD output
    tve_hd = 32,     ///< an HD format for the TV encoder and for plane delays; 29.97 Hz is not among them
};

/** In place of the number of the bit of the capability word that admits a mode. */
inline constexpr int always = -1;
inline constexpr int never = -2;

struct Mode
{
    UINT32 mode;
    UINT32 number; ///< that the enumerator must have
    const char* enumerator;
    int capability; ///< number of a bit, or `always` or `never`
    UINT32 width;
    UINT32 height;
    Colours colours;
    unsigned bar; ///< width of the colour bar
    unsigned facts;

    bool is(Fact fact) const { return (facts & fact) != 0; }
};

#define MODE(mode, number, capability, width, height, colours, bar, facts)           \
    {                                                                                \
        mode, number, #mode, capability, width, height, Colours::colours, bar, facts \
    }
inline constexpr Mode all_modes[] = {
    MODE(RES_480I, 0, 0, 720, 480, Sd, 22, pll_60 | boot_60),
    MODE(RES_576I, 1, 1, 720, 576, Sd, 22, boot_50),
    MODE(RES_480P, 2, 2, 720, 480, Sd, 22, pll_60 | boot_60 | progressive),
    MODE(RES_576P, 3, 3, 720, 576, Sd, 22, boot_50 | progressive),
    MODE(RES_480P_1440, 4, always, 720, 480, Sd, 30, pll_60 | progressive),
    MODE(RES_576P_1440, 5, always, 720, 576, Sd, 30, progressive),
    MODE(RES_480P_2880, 6, always, 720, 480, Sd, 30, pll_60 | progressive),
    MODE(RES_576P_2880, 7, always, 720, 576, Sd, 30, progressive),
    MODE(RES_720P60HZ, 8, 4, 1280, 720, Hd, 20, pll_60 | boot_60 | progressive | hd_out | tve_hd),
    MODE(RES_720P50HZ, 9, 5, 1280, 720, Hd, 20, boot_50 | progressive | hd_out | tve_hd),
    MODE(RES_1080I60HZ, 10, 6, 1920, 1080, Hd, 30, pll_60 | boot_60 | hd_out | tve_hd),
    MODE(RES_1080I50HZ, 11, 7, 1920, 1080, Hd, 30, boot_50 | hd_out | tve_hd),
    MODE(RES_1080P60HZ, 12, 8, 1920, 1080, Hd, 30, pll_60 | boot_60 | progressive | hd_out | tve_hd),
    MODE(RES_1080P50HZ, 13, 9, 1920, 1080, Hd, 30, boot_50 | progressive | hd_out | tve_hd),
    MODE(RES_1080P30HZ, 14, 10, 1920, 1080, Hd, 30, pll_60 | progressive | hd_out | tve_hd),
    MODE(RES_1080P25HZ, 15, 11, 1920, 1080, Hd, 30, progressive | hd_out | tve_hd),
    MODE(RES_480I_2880, 16, always, 720, 480, Sd, 30, pll_60),
    MODE(RES_576I_2880, 17, always, 720, 576, Sd, 30, 0),
    MODE(RES_1080P24HZ, 18, 12, 1920, 1080, Hd, 30, progressive | hd_out | tve_hd),
    MODE(RES_1080P23_976HZ, 19, 13, 1920, 1080, Hd, 30, pll_60 | hd_out | tve_hd),
    MODE(RES_1080P29_97HZ, 20, 14, 1920, 1080, Hd, 30, pll_60 | hd_out),
    MODE(RES_3D_1080P23HZ, 21, 15, 1920, 1080, Hd, 30, pll_60 | progressive | hd_out | tve_hd),
    MODE(RES_3D_1080P24HZ, 22, 15, 1920, 1080, Hd, 30, progressive | hd_out | tve_hd),
    MODE(RES_3D_720P60HZ, 23, 15, 1280, 720, Hd, 30, pll_60 | progressive | hd_out | tve_hd),
    MODE(RES_3D_720P50HZ, 24, 15, 1280, 720, Hd, 30, progressive | hd_out | tve_hd),
    MODE(RES_3D_720P30HZ, 25, 15, 1280, 720, Hd, 30, pll_60 | progressive | hd_out | tve_hd),
    MODE(RES_3D_720P25HZ, 26, 15, 1280, 720, Hd, 30, progressive | hd_out | tve_hd),
    MODE(RES_3D_576P50HZ, 27, 15, 720, 576, Sd, 30, progressive),
    MODE(RES_3D_480P60HZ, 28, 15, 720, 480, Sd, 30, pll_60 | progressive),
    MODE(RES_3D_1080I60HZ, 29, 15, 1920, 1080, Hd, 30, pll_60 | hd_out | tve_hd),
    MODE(RES_3D_1080I50HZ, 30, 15, 1920, 1080, Hd, 30, hd_out | tve_hd),
    MODE(RES_3D_1080I30HZ, 31, 15, 1920, 1080, Hd, 30, pll_60 | hd_out | tve_hd),
    MODE(RES_3D_1080I25HZ, 32, 15, 1920, 1080, Hd, 30, hd_out | tve_hd),
    MODE(RES_3D_576I25HZ, 33, 15, 720, 576, Sd, 30, 0),
    MODE(RES_3D_480I30HZ, 34, 15, 720, 480, Sd, 30, pll_60),
    MODE(RES_3D_576I50HZ, 35, 15, 720, 576, Sd, 30, 0),
    MODE(RES_3D_480I60HZ, 36, 15, 720, 480, Sd, 30, pll_60),
    MODE(RES_2D_480I60HZ, 37, 0, 720, 480, Sd, 30, pll_60),
    MODE(RES_2D_576I50HZ, 38, never, 1920, 1080, None, 30, hd_out), // not of 576 lines: kept so
    MODE(RES_2D_640x480HZ, 39, 16, 640, 480, Sd, 30, pll_60 | progressive),
    MODE(RES_PANEL_AUO_B089AW01, 40, always, 1024, 600, Sd, 30, pll_60 | progressive | hd_out | tve_hd),
    MODE(RES_3D_720P60HZ_TB, 41, 4, 1280, 720, Hd, 30, pll_60 | hd_out | tve_hd),
    MODE(RES_3D_720P50HZ_TB, 42, 5, 1280, 720, Hd, 30, hd_out | tve_hd),
    MODE(RES_3D_1080I60HZ_SBS_HALF, 43, 6, 1920, 1080, Hd, 30, pll_60 | hd_out | tve_hd),
    MODE(RES_3D_1080I50HZ_SBS_HALF, 44, 7, 1920, 1080, Hd, 30, hd_out | tve_hd),
    MODE(RES_3D_1080P23HZ_TB, 45, 14, 1920, 1080, Hd, 30,
         pll_60 | hd_out | tve_hd), // not the bit of 23.976 Hz: kept so
    MODE(RES_3D_1080P24HZ_TB, 46, 12, 1920, 1080, Hd, 30, hd_out | tve_hd),
};
#undef MODE

struct Number
{
    UINT32 mode;
    UINT32 number; ///< that the enumerator must have
    const char* enumerator;
};

/** The enumerators without facts of their own. */
inline constexpr Number other_enumerators[] = {
    { RES_4K2K23976HZ, 47, "RES_4K2K23976HZ" }, { RES_4K2K24HZ, 48, "RES_4K2K24HZ" }, { RES_2160P, 49, "RES_2160P" },
    { RES_2160P_4096, 50, "RES_2160P_4096" },   { RES_MODE_NUM, 51, "RES_MODE_NUM" }, { RES_AUTO, 52, "RES_AUTO" },
};

/** Number of modes that have facts of their own; the numbers from there on share what follows. */
inline constexpr UINT32 known = std::size(all_modes);
inline constexpr Mode any_other = { known, known, "", never, 1920, 1080, Colours::None, 30, hd_out };

inline const Mode& facts_of(UINT32 mode)
{
    return mode < known ? all_modes[mode] : any_other;
}

/** Every number that a byte holds, and some that it does not: the low byte of many of those names a mode, which must
 *  not count. */
inline std::vector<UINT32> all_numbers()
{
    std::vector<UINT32> numbers;
    for (UINT32 number = 0; number <= 256 + 2 * known; ++number)
        numbers.push_back(number);
    for (UINT32 number : { 0x00010000u, 0x0001000Au, 0x7FFFFFFFu, 0x80000000u, 0x8000000Cu, 0xFFFFFF00u, 0xFFFFFFFFu })
        numbers.push_back(number);
    return numbers;
}

/** The numbers of all_numbers() that have no facts of their own. */
inline std::vector<UINT32> unknown()
{
    std::vector<UINT32> numbers = all_numbers();
    std::erase_if(numbers, [](UINT32 number) { return number < known; });
    return numbers;
}

/** The printable name of a mode, like its enumerator but for RES_2D_640x480HZ; null for other numbers. */
inline const char* printable(UINT32 mode)
{
    if (mode >= known)
        return nullptr;
    return mode == RES_2D_640x480HZ ? "RES_2D_640x480" : all_modes[mode].enumerator;
}

/** How the log names a mode. */
inline std::string name(UINT32 mode)
{
    return mode < known ? printable(mode) : "(null)";
}

/** Whether a capability word admits a mode. */
inline bool admitted(UINT32 mode, std::uint32_t word)
{
    const int bit = facts_of(mode).capability;
    return bit == always || (bit != never && ((word >> bit) & 1) != 0);
}

/** How many modes a capability word admits. */
inline unsigned number_admitted(std::uint32_t word)
{
    return static_cast<unsigned>(std::count_if(std::begin(all_modes), std::end(all_modes),
                                               [word](const Mode& mode) { return admitted(mode.mode, word); }));
}

/** The known modes that have a fact. */
inline std::set<UINT32> modes_with(Fact fact)
{
    std::set<UINT32> modes;
    for (const Mode& mode : all_modes)
    {
        if (mode.is(fact))
            modes.insert(mode.mode);
    }
    return modes;
}

} // namespace mode_facts
