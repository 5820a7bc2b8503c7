// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/text/suggest.h"

#include "board/names.h"

namespace pmxboard
{

std::string did_you_mean(std::string_view wrong, const std::vector<std::string_view>& candidates)
{
    std::string text;
    for (const std::string& name : board::names::nearest(wrong, candidates))
        text += (text.empty() ? "; did you mean " : ", ") + name;
    return text.empty() ? text : text + "?";
}

} // namespace pmxboard
