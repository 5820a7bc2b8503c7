// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/report/page.h"

#include <stdexcept>

namespace pmxboard
{

std::string page_with(std::string_view json)
{
    constexpr std::string_view place = "@DATA@";
    const std::size_t found = page_template.find(place);
    if (found == page_template.npos)
        throw std::logic_error("the page has no place for its data");
    std::string page(page_template.substr(0, found));
    // In JSON it stands within texts alone; there it would end the script.
    for (const char c : json)
        page += c == '<' ? std::string("\\u003c") : std::string(1, c);
    page += page_template.substr(found + place.size());
    return page;
}

} // namespace pmxboard
