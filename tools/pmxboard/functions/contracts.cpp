// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/functions/contracts.h"

#include <algorithm>

namespace pmxboard
{

const Contract* contract_of(std::string_view function)
{
    const auto& all = contracts();
    const auto found = std::find_if(all.begin(), all.end(),
                                    [function](const Contract& contract) { return contract.name == function; });
    return found == all.end() ? nullptr : &*found;
}

std::string_view text_of_field(std::string_view record, std::string_view field)
{
    const auto& all = field_texts();
    const auto found = std::find_if(all.begin(), all.end(), [record, field](const FieldText& text) {
        return text.record == record && text.field == field;
    });
    return found == all.end() ? std::string_view() : found->text;
}

std::string_view first_sentence(std::string_view text)
{
    const std::size_t end = text.find(". ");
    text = text.substr(0, end);
    if (text.ends_with('.'))
        text.remove_suffix(1);
    return text;
}

} // namespace pmxboard
