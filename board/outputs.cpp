// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/outputs.h"

#include <algorithm>
#include <stdexcept>
#include <string>
#include <utility>

#include "board/tokens.h"
#include "board/value.h"

#include "record_fields.h"

namespace board::outputs
{
namespace
{

/** Whether a name goes with any number: TRUE, OSR_OK. */
bool is_general(std::string_view name, std::int64_t number)
{
    const auto families = names::families();
    return std::none_of(families.begin(), families.end(),
                        [&](const auto& titled) { return names::name_of(titled.family, number) == name; });
}

/** The parts of "{a=1, b=2}" by name; "..." says what is so anyway: the other fields stay as they are. */
std::vector<std::pair<std::string_view, std::string_view>> members(std::string_view written)
{
    std::vector<std::pair<std::string_view, std::string_view>> found;
    for (const std::string_view part : tokens::split(tokens::inside(written, '{', '}')))
    {
        if (part == "..." || part == "…")
            continue;
        const std::size_t equals = part.find('=');
        if (equals == part.npos)
            throw std::invalid_argument("a record's field is written NAME=VALUE, not " + std::string(part));
        found.emplace_back(tokens::trim(part.substr(0, equals)), tokens::trim(part.substr(equals + 1)));
    }
    return found;
}

std::string did_you_mean(std::string_view wrong, const std::vector<std::string_view>& candidates)
{
    std::string text;
    for (const std::string& near : names::nearest(wrong, candidates))
        text += (text.empty() ? "; did you mean " : ", ") + near;
    return text.empty() ? text : text + "?";
}

} // namespace

std::int64_t read_number(std::string_view written, unsigned bits, names::Family family)
{
    auto number = tokens::number(written);
    if (!number)
    {
        number = names::number_of(written);
        const bool fits = number && (family == names::Family::None || names::name_of(family, *number) == written ||
                                     is_general(written, *number));
        if (!fits)
            throw std::invalid_argument(std::string(written) + " is neither a number nor a name that goes here" +
                                        did_you_mean(written, names::all()));
    }
    const std::int64_t lowest = -(std::int64_t{ 1 } << (bits - 1));
    const std::int64_t highest = (std::int64_t{ 1 } << bits) - 1;
    if (*number < lowest || *number > highest)
        throw std::invalid_argument(std::string(written) + " does not fit into " + std::to_string(bits) + " bits");
    return *number;
}

std::vector<std::int64_t> read_list(std::string_view written, unsigned bits)
{
    std::vector<std::int64_t> items;
    for (const std::string_view item : tokens::split(tokens::inside(written, '[', ']')))
        items.push_back(read_number(item, bits));
    return items;
}

void check_count(std::size_t found, std::size_t wanted)
{
    if (found != wanted)
        throw std::invalid_argument("it takes " + std::to_string(wanted) + " items, not " + std::to_string(found));
}

void put_bytes(void* there, std::size_t room, std::string_view written)
{
    const std::vector<std::int64_t> items = read_list(written, CHAR_BIT);
    for (std::size_t i = 0; there != nullptr && i < std::min(room, items.size()); ++i)
        static_cast<unsigned char*>(there)[i] = static_cast<unsigned char>(items[i]);
}

void put_text(char* there, std::size_t room, std::string_view written)
{
    const std::string text = unquote(written);
    if (there == nullptr || room == 0)
        return;
    const std::size_t copied = text.copy(there, room - 1);
    there[copied] = '\0';
}

void put_tag(void** there, std::string_view written)
{
    const std::int64_t number = read_number(written, 32);
    if (there != nullptr)
        *there = reinterpret_cast<void*>(static_cast<std::uintptr_t>(number));
}

template <typename Record>
void put_record(Record* there, std::string_view written)
{
    Record scratch{};
    Record& record = there != nullptr ? *there : scratch;
    for (const auto& member : members(written))
    {
        const std::string_view name = member.first; // clang takes no bindings into a lambda
        const std::string_view value = member.second;
        bool found = false;
        std::vector<std::string_view> known;
        records::each_field(record, [&](std::string_view owner, std::string_view field, auto& place) {
            known.push_back(field);
            if (field != name)
                return;
            found = true;
            using Field = std::remove_reference_t<decltype(place)>;
            static_assert(std::is_class_v<Field> || sizeof(Field) < sizeof(std::int64_t), "its range is no number");
            if constexpr (std::is_class_v<Field>)
                put_record(&place, value);
            else
                place =
                    static_cast<Field>(read_number(value, sizeof(Field) * CHAR_BIT, names::family_of(owner, field)));
        });
        if (!found)
            throw std::invalid_argument("there is no field " + std::string(name) + did_you_mean(name, known));
    }
}

#define INSTANCE(Record) template void put_record(Record*, std::string_view);
EACH_OF_RECORD_FIELDS(INSTANCE)
#undef INSTANCE

} // namespace board::outputs
