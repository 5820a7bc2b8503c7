// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/record_view/mode_table.h"

#include <stdexcept>
#include <string>

#include "board/executable_symbols.h"
#include "board/names.h"
#include "src/driver/pmx/pmx_if.h"

namespace record_view
{
namespace
{

const PMX_MODE_ROW_T* table()
{
    static const PMX_MODE_ROW_T* const found = [] {
        const auto symbol = board::executable_symbols::find("_arPmxModeRow");
        if (!symbol)
            throw std::runtime_error("the layer's mode table is not in this executable");
        if (symbol->size < sizeof(PMX_MODE_ROW_T) * (PMX_MODE_ROW_NUM + 1))
            throw std::runtime_error("the layer's mode table has " + std::to_string(symbol->size) + " bytes");
        return static_cast<const PMX_MODE_ROW_T*>(symbol->address);
    }();
    return found;
}

struct Flag
{
    UINT8 bit;
    std::string_view name;
};

#define FLAG(name)  \
    {               \
        name, #name \
    }
constexpr Flag flags[] = { FLAG(PMX_MODE_PLL_60),      FLAG(PMX_MODE_BOOT_60), FLAG(PMX_MODE_BOOT_50),
                           FLAG(PMX_MODE_PROGRESSIVE), FLAG(PMX_MODE_HD_OUT),  FLAG(PMX_MODE_TVE_HD) };

} // namespace

ModeRow mode_row(unsigned number)
{
    const PMX_MODE_ROW_T& row = table()[number < PMX_MODE_ROW_NUM ? number : PMX_MODE_ROW_NUM];
    const auto has = [&](UINT8 bit) { return (row.u1Flags & bit) != 0; };
    ModeRow mode;
    mode.number = number;
    mode.has_row = number < PMX_MODE_ROW_NUM;
    mode.name = board::names::name_of(board::names::Family::ResolutionMode, number);
    mode.width = row.u2Width;
    mode.height = row.u2Height;
    mode.is_progressive = has(PMX_MODE_PROGRESSIVE);
    mode.is_hd_out = has(PMX_MODE_HD_OUT);
    mode.is_tve_hd = has(PMX_MODE_TVE_HD);
    mode.pll_60 = has(PMX_MODE_PLL_60);
    if (has(PMX_MODE_BOOT_60) || has(PMX_MODE_BOOT_50))
        mode.boot = has(PMX_MODE_BOOT_60) ? 60 : 50;
    mode.is_always_allowed = row.u1CapBit == PMX_CAP_ALWAYS;
    mode.is_never_allowed = row.u1CapBit == PMX_CAP_NEVER;
    if (!mode.is_always_allowed && !mode.is_never_allowed)
        mode.capability = row.u1CapBit;
    mode.colour = row.u1Colour == PMX_COLOUR_SD   ? ColourGroup::Sd
                  : row.u1Colour == PMX_COLOUR_HD ? ColourGroup::Hd
                                                  : ColourGroup::None;
    mode.colour_bar = row.u1CBWidth;
    if (number < RES_MODE_NUM && szResStr[number] != nullptr)
        mode.printed_name = szResStr[number];
    for (const Flag& flag : flags)
    {
        if (has(flag.bit))
            mode.flags.push_back(flag.name);
    }
    return mode;
}

std::vector<ModeRow> mode_rows()
{
    std::vector<ModeRow> rows;
    for (unsigned number = 0; number < RES_MODE_NUM; ++number)
        rows.push_back(mode_row(number));
    return rows;
}

std::uint32_t default_capability()
{
    const auto symbol = board::executable_symbols::find("_arPmxConfDefault");
    if (!symbol)
        throw std::runtime_error("the layer's default record is not in this executable");
    return static_cast<const PMX_CONF_T*>(symbol->address)->u4Capability;
}

std::map<unsigned, std::string> capability_features()
{
    return { { PMX_CAP_BIT_GAMMA, "gamma" },           { PMX_CAP_BIT_BRIGHTNESS, "brightness" },
             { PMX_CAP_BIT_CONTRAST, "contrast" },     { PMX_CAP_BIT_HUE, "hue" },
             { PMX_CAP_BIT_SATURATION, "saturation" }, { PMX_CAP_BIT_DIGITAL_OUT, "digital port" },
             { PMX_CAP_BIT_SHARPNESS, "sharpness" },   { PMX_CAP_BIT_BLACK_LEVEL, "black level" } };
}

} // namespace record_view
