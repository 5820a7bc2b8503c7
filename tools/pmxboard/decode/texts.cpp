#include "tools/pmxboard/decode/texts.h"

#include <algorithm>

namespace pmxboard::decode
{

std::vector<std::string_view> split(std::string_view list)
{
    std::vector<std::string_view> items;
    while (!list.empty())
    {
        const std::size_t comma = std::min(list.find(','), list.size());
        items.push_back(list.substr(0, comma));
        list.remove_prefix(std::min(comma + 1, list.size()));
    }
    return items;
}

bool has(std::string_view list, std::string_view item)
{
    for (std::size_t at = list.find(item); at != list.npos; at = list.find(item, at + 1))
    {
        const std::size_t end = at + item.size();
        if ((at == 0 || list[at - 1] == ',') && (end == list.size() || list[end] == ','))
            return true;
    }
    return false;
}

std::string_view visible(std::string_view format)
{
    return format.substr(0, format.find_last_not_of(" \n") + 1);
}

} // namespace pmxboard::decode
