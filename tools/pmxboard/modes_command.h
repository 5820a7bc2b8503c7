/** @file
 *  `pmxboard modes`: the resolution modes and all that the layer decides from them. */
#pragma once

#include <iosfwd>
#include <string>
#include <vector>

#include "tools/pmxboard/help.h"
#include "tools/record_view/mode_table.h"

namespace pmxboard
{

struct ModesOptions
{
    std::vector<std::string> modes; ///< numbers and names; none: all
    bool json = false;
    std::string colour = "auto";
};

/** The exit code. */
int show_modes(const ModesOptions& options, std::ostream& to);

/** All that is decided from a mode, one line each. */
std::string mode_text(const record_view::ModeRow& mode, const Look& look);

} // namespace pmxboard
