// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/trace.h"

#include "record_fields.h"

namespace board
{

namespace
{

/** What is known of a record before it is read. */
struct Fields
{
    Value::Names names;
    std::vector<names::Family> families;
};

template <typename Record>
Fields fields_of(const Record& record)
{
    std::vector<std::string> names;
    std::vector<names::Family> families;
    records::each_field(record, [&](std::string_view owner, std::string_view name, const auto&) {
        names.emplace_back(name);
        families.push_back(names::family_of(owner, name));
    });
    return { Value::Names(std::move(names)), std::move(families) };
}

} // namespace

template <typename Record>
Value to_value(const Record& record)
{
    static const Fields known = fields_of(record);
    std::vector<Value> items;
    items.reserve(known.families.size());
    records::each_field(record, [&items](std::string_view, std::string_view, const auto& field) {
        if constexpr (std::is_class_v<std::remove_cvref_t<decltype(field)>>)
            items.push_back(to_value(field));
        else
        {
            const auto number = static_cast<std::int64_t>(field);
            items.push_back(Value::number(number, names::name_of(known.families[items.size()], number)));
        }
    });
    return Value::record(known.names, std::move(items));
}

#define INSTANCE(Record) template Value to_value(const Record&);
EACH_OF_RECORD_FIELDS(INSTANCE)
#undef INSTANCE

} // namespace board
