// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What happened, told from the texts in a log: operations, what they decided, and how graphics came and went. */
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/decode/log.h"
#include "tools/pmxboard/decode/reasons.h"
#include "tools/pmxboard/decode/report.h"

namespace pmxboard::decode
{

struct Event
{
    enum class Kind
    {
        Call,
        Gap,  ///< the log has not what must stand there
        Start ///< the system begins anew
    };

    std::string operation; ///< where more than one is possible, the first of them; of a call alone
    std::size_t first_line = 0;
    std::size_t last_line = 0;
    std::vector<std::size_t> lines; ///< that it stands on; between them may be those of others
    std::string time;               ///< of its first line
    std::string title;
    std::vector<std::string> details;
    bool problem = false;
    Kind kind = Kind::Call;
    std::vector<std::string> assumed; ///< what is so if nothing of it is among the lines that are missing
    std::optional<StatusReport> report;
    std::vector<Determined> reasons; ///< that its lines determine; title and details have their sentences
};

struct Story
{
    std::vector<Event> events;
    std::vector<std::string_view>
        operations; ///< of each item of the log, as far as the story tells; else its candidates
};

Story tell(const Log& log);

} // namespace pmxboard::decode
