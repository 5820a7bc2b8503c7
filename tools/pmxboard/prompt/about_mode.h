// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What there is to tell about a resolution mode: all that the layer decides from it. */
#pragma once

#include <string>
#include <vector>

#include "board/value.h"
#include "tools/pmxboard/text/layout.h"
#include "tools/record_view/mode_table.h"

namespace pmxboard
{

/** One line each, with a heading; 80 columns. */
std::string mode_table_text(const std::vector<record_view::ModeRow>& modes, const Look& look);
/** A line for each fact. */
std::string mode_text(const record_view::ModeRow& mode, const Look& look);
board::Value json_of(const record_view::ModeRow& mode);

} // namespace pmxboard
