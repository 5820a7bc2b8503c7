// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The layer's table of resolution modes, as it lies in the linked layer. */
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace record_view
{

/** Which standard a mode's outputs carry. */
enum class ColourGroup
{
    None, ///< the converters are left alone
    Sd,
    Hd
};

/** Everything that the layer decides from a resolution mode. */
struct ModeRow
{
    unsigned number = 0;
    bool has_row = false;  ///< false: every number without a row shares one, and this is it
    std::string_view name; ///< the enumerator; empty for a number that is no mode
    unsigned width = 0;
    unsigned height = 0;
    bool is_progressive = false;  ///< as it is reported
    bool is_hd_out = false;       ///< as it is reported
    bool is_tve_hd = false;       ///< for the TV encoders and for plane delays
    bool pll_60 = false;          ///< the video PLL runs the word of the 60 Hz family
    std::optional<unsigned> boot; ///< it may come from the boot loader, and then with this TV type: 60 or 50
    bool is_always_allowed = false;
    bool is_never_allowed = false;
    std::optional<unsigned> capability; ///< the bit that admits it, where one does
    ColourGroup colour = ColourGroup::None;
    unsigned colour_bar = 0;                      ///< width, in the hardware's unit
    std::optional<std::string_view> printed_name; ///< what the layer prints; nothing: a null text
    std::vector<std::string_view> flags;          ///< the row's flags by name
};

/** The row that the layer uses for a mode number. */
ModeRow mode_row(unsigned number);

/** The modes that there are, by number. */
std::vector<ModeRow> mode_rows();

/** The capability word that a reset puts into the record. */
std::uint32_t default_capability();

/** What hangs on the bits of the capability word that are no modes', by bit. */
std::map<unsigned, std::string> capability_features();

} // namespace record_view
