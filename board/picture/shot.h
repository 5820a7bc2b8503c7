// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What a viewer sees on an output. */
#pragma once

#include <array>
#include <string>
#include <string_view>

#include "board/picture/hardware.h"

namespace board::picture
{

struct Shot
{
    OutputId output{};
    Image picture;        ///< R'G'B', as the set shows it; without a signal a card that tells why
    std::string why_dark; ///< which switch is off; empty where there is a signal
};

/** "digital", "HDMI", "component", "composite". */
std::string_view name_of(OutputId output);

/** What travels to the set, of the colour formats that HDMI and the digital port have. */
Space on_the_wire(OutputId output, const Hardware& hardware, Standard standard);

/** How a picture is computed. */
struct Effort
{
    unsigned threads = 0; ///< 0: as many as the machine runs at once
    int divisor = 1;      ///< everything is so many times smaller, where it need not be looked at closely
};

Shot shot_of(const Hardware& hardware, OutputId output, const Effort& effort = {});
/** All of them, in the layer's order, of one picture of the mixer. */
std::array<Shot, all_outputs.size()> all_shots(const Hardware& hardware, const Effort& effort = {});

/** All of them in one picture, two by two. */
Image sheet_of(const std::array<Shot, all_outputs.size()>& shots, int width, int height);

} // namespace board::picture
