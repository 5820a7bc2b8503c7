// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Which lines make one call of the layer, in which order a call prints them, and where a log has not what must stand
 *  there. */
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "tools/pmxboard/decode/log.h"

namespace pmxboard::decode
{

/** A place where lines are missing, or stand in another order. */
struct Gap
{
    std::size_t at = 0; ///< before the item of this place in the log's order; of a call without an end, behind its last
    std::string what;   ///< must stand there
    bool is_end = false; ///< of a call: it may come much later, when others were called in between
};

struct Calls
{
    std::vector<Gap> gaps;                 ///< in the order of the log
    std::vector<std::size_t> twice;        ///< places of lines that can only be there because lines were doubled
    std::vector<std::size_t> begins;       ///< of each place that where its call begins, as far as the log has it
    std::vector<bool> is_known;            ///< of each place, whether some call prints it in a known order
    std::optional<std::string> unfinished; ///< what must come behind the last line
};

/** Goes through a log in the order of its items. */
Calls read_calls(const Log& log);

} // namespace pmxboard::decode
