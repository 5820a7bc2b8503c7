// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/trace.h"

#include "record_fields.h"

namespace board
{

template <typename Record>
Value to_value(const Record& record)
{
    Value value;
    records::each_field(record, [&value](std::string_view owner, std::string_view name, const auto& field) {
        if constexpr (std::is_class_v<std::remove_cvref_t<decltype(field)>>)
            value.add(std::string(name), to_value(field));
        else
        {
            const auto number = static_cast<std::int64_t>(field);
            value.add(std::string(name), Value::number(number, names::name_of(names::family_of(owner, name), number)));
        }
    });
    return value;
}

#define INSTANCE(Record) template Value to_value(const Record&);
EACH_OF_RECORD_FIELDS(INSTANCE)
#undef INSTANCE

} // namespace board
