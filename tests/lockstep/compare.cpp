// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tests/lockstep/compare.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <string_view>
#include <type_traits>

#include "drv_av_d.h"
#include "drv_if_pmx.h"

namespace lockstep
{
namespace
{

std::string number(std::uint64_t value)
{
    char text[32];
    if (value <= 9999 || value >= 0xFFFFFFFFFFFF0000)
        std::snprintf(text, sizeof text, "%lld", static_cast<long long>(value));
    else
        std::snprintf(text, sizeof text, "0x%llx", static_cast<unsigned long long>(value));
    return text;
}

std::string quoted(const unsigned char* bytes, std::size_t size)
{
    std::string text = "\"";
    for (std::size_t i = 0; i < size; ++i)
    {
        if (bytes[i] == '\n')
            text += "\\n";
        else
            text += static_cast<char>(bytes[i]);
    }
    return text + "\"";
}

std::string hex(const unsigned char* bytes, std::size_t size)
{
    std::string text = "[";
    char digits[4];
    for (std::size_t i = 0; i < size; ++i)
    {
        std::snprintf(digits, sizeof digits, i % 4 == 0 && i != 0 ? " %02x" : "%02x", bytes[i]);
        text += digits;
    }
    return text + "]";
}

std::string shown_pointer(std::uint64_t value)
{
    if (value == 0)
        return "null";
    if (value >= to_named)
        return named_addresses[value - to_named].name;
    if (value >= to_elsewhere)
        return "&...";
    return "&" + (value >= to_state ? field_at({}, value - to_state) : "caller+" + std::to_string(value - to_caller));
}

/* Parameters of a function; those behind the last are the values of a format. */
Kind kind_of(const Function& function, unsigned i)
{
    return i < function.count ? function.parameters[i].kind : Kind::values;
}

std::string name_of(const Function& function, unsigned i)
{
    const bool is_value = kind_of(function, i) == Kind::values;
    return is_value ? "value " + std::to_string(i + 2 - function.count) : function.parameters[i].name;
}

std::string shown(const Trace& trace, const Call& call, unsigned i)
{
    const Function& function = platform[call.function];
    const Given& given = trace.given[call.first + i];
    const unsigned char* const bytes = trace.bytes.data() + given.at;
    const Kind kind = kind_of(function, i);
    if (kind == Kind::data)
        return given.value == 0 ? "null" : hex(bytes, given.size);
    if (kind == Kind::text || (kind == Kind::values && given.size != 0))
        return given.value == 0 ? "null" : quoted(bytes, given.size);
    if (kind == Kind::place || kind == Kind::table || kind == Kind::symbol)
        return shown_pointer(given.value);
    return number(given.value);
}

std::string shown_call(const Trace& trace, const Call& call)
{
    std::string text = std::string(platform[call.function].name) + "(";
    for (unsigned i = 0; i < call.count; ++i)
        text += (i == 0 ? "" : ", ") + shown(trace, call, i);
    return text + ")";
}

template <typename T>
void cover(std::vector<bool>& covered, std::size_t at)
{
    for (std::size_t i = 0; i < sizeof(T); ++i)
        covered.at(at + i) = true;
}

#define COVER(Record, field) cover<decltype(Record::field)>(covered, offsetof(Record, field))

/* Which bytes behind a pointer belong to fields; those of an array or a number all do. */
std::vector<bool> fields_of(const std::string& function, std::uint64_t command, std::size_t size)
{
    std::vector<bool> covered(size, false);
    if (function == "fgPmxDrvGetAvdInfo")
    {
        using Record = PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T;
        COVER(Record, u4ResCheck);
        COVER(Record, u2VsyncFreq);
        COVER(Record, u4ValidAutoRes);
        COVER(Record, u2ValidAutoVfreq);
    }
    else if (function == "fgPmxDrvSetAvd" && size == sizeof(PMX_SET_HDMI_RES_PARAMETER_T))
    {
        using Record = PMX_SET_HDMI_RES_PARAMETER_T;
        COVER(Record, u1ScaleMode);
        COVER(Record, ucHdmiOutDisplayResolution);
        COVER(Record, ucFmtOutResolution);
        COVER(Record, ucCCIROutResolution);
        COVER(Record, ucHdmiOutMode);
        COVER(Record, eCcirDrvInfo);
        COVER(Record, fgOsdMsg);
        COVER(Record, ucCCIROutMode);
        COVER(Record, fgCCIROutEnable);
        COVER(Record, fgHdmiOutEnable);
        COVER(Record, u2_Vfreq);
    }
    else if (function == "fgPmxDrvSetAvd" && command == PMX_SET_UI_TV_SYSTEM)
    {
        COVER(PMX_SET_TV_SYS_PARAMETER_T, u2_Vfreq);
        COVER(PMX_SET_TV_SYS_PARAMETER_T, fgAutoEnable);
    }
    else
        covered.assign(size, true);
    return covered;
}

#undef COVER

/* Differing bytes behind a pointer: "bytes", "padding" when no field differs, nothing when nothing counts. */
std::string bytes_differ(const Function& function, std::uint64_t command, const Given& first, const unsigned char* a,
                         const unsigned char* b, bool padding_counts)
{
    if (std::memcmp(a, b, first.size) == 0)
        return "";
    const std::vector<bool> fields = fields_of(function.name, command, first.size);
    for (std::size_t i = 0; i < first.size; ++i)
    {
        if (a[i] != b[i] && fields[i])
            return "bytes";
    }
    return padding_counts ? "padding" : "";
}

std::string argument_differs(const Trace& first, const Trace& second, const Call& a, const Call& b, unsigned i,
                             const Comparison& comparison)
{
    const Given& x = first.given[a.first + i];
    const Given& y = second.given[b.first + i];
    const std::string_view function = platform[a.function].name;
    if (function == "Assert" && (i == 2 || (i == 1 && !comparison.places_of_checks)))
        return "";
    const Kind kind = kind_of(platform[a.function], i);
    const bool is_text = kind == Kind::text || (kind == Kind::values && (x.size != 0 || y.size != 0));
    if (x.size != y.size)
        return is_text ? "text" : "bytes";
    if (x.value != y.value)
        return "argument";
    const std::string differing =
        bytes_differ(platform[a.function], first.given[a.first].value, x, first.bytes.data() + x.at,
                     second.bytes.data() + y.at, comparison.padding);
    return differing == "bytes" && is_text ? "text" : differing;
}

/* Two lines, one for either layer. */
std::string both(const Comparison& comparison, const std::string& first, const std::string& second)
{
    return std::string("    ") + comparison.names[0] + ": " + first + "\n    " + comparison.names[1] + ": " + second +
           "\n";
}

std::string call_or_end(const Trace& trace, std::size_t i)
{
    return i < trace.calls.size() ? shown_call(trace, trace.calls[i]) : "returns";
}

std::optional<std::size_t> first_difference(const unsigned char* a, const unsigned char* b, std::size_t size)
{
    if (std::memcmp(a, b, size) == 0)
        return std::nullopt;
    return static_cast<std::size_t>(std::mismatch(a, a + size, b).first - a);
}

/* The value of the field that a byte belongs to. */
std::string field_value(const Operation& operation, const unsigned char* image, std::size_t offset)
{
    for (const std::vector<Field>* fields : { &state_fields(), &array_fields(operation) })
    {
        for (const Field& field : *fields)
        {
            if (offset < field.offset || offset >= field.offset + field.size)
                continue;
            return number(get(image, field));
        }
    }
    return number(image[offset]);
}

template <typename T>
bool same_bytes(const std::vector<T>& a, const std::vector<T>& b)
{
    static_assert(std::has_unique_object_representations_v<T>);
    return a.size() == b.size() && (a.empty() || std::memcmp(a.data(), b.data(), a.size() * sizeof(T)) == 0);
}

/* Almost always, and found out at once. */
bool same_calls(const Trace& first, const Trace& second)
{
    return first.bytes == second.bytes && same_bytes(first.calls, second.calls) &&
           same_bytes(first.given, second.given);
}

} // namespace

std::string shown_operation(const Operation& operation, const Arguments& arguments, const Image& before)
{
    const Function& function = operation.function;
    std::string text = std::string(function.name) + "(";
    for (unsigned i = 0; i < function.count; ++i)
    {
        const Parameter& parameter = function.parameters[i];
        const Kind kind = parameter.kind;
        text += (i == 0 ? "" : ", ") + std::string(parameter.name);
        if (kind == Kind::data || kind == Kind::place)
            text += arguments[i] == 0 ? " = null" : "";
        else if (kind == Kind::number || kind == Kind::tag)
            text += " = " + number(arguments[i]);
    }
    text += ")";
    for (const Field& field : array_fields(operation))
        text += "\n        " + field.name + " = " + number(get(before, field));
    return text;
}

std::string shown_calls(const Trace& trace, unsigned mark)
{
    std::string text;
    for (std::size_t i = 0; i < trace.calls.size(); ++i)
        text += (i == mark ? "  > " : "    ") + std::to_string(i) + " " + shown_call(trace, trace.calls[i]) + "\n";
    return text;
}

std::optional<Difference> compare_calls(const Operation& operation, const Trace& first, const Trace& second,
                                        const Comparison& comparison)
{
    const std::size_t count = same_calls(first, second) ? 0 : std::max(first.calls.size(), second.calls.size());
    for (std::size_t i = 0; i < count; ++i)
    {
        const auto texts = [&] {
            return "  call " + std::to_string(i) + ":\n" +
                   both(comparison, call_or_end(first, i), call_or_end(second, i));
        };
        if (i == first.calls.size() || i == second.calls.size() || first.calls[i].function != second.calls[i].function)
        {
            const Trace& longer = i < first.calls.size() ? first : second;
            return Difference{ "order", platform[longer.calls[i].function].name, texts() };
        }
        const Call& a = first.calls[i];
        const Call& b = second.calls[i];
        const Function& function = platform[a.function];
        if (a.count != b.count)
            return Difference{ "text", std::string(function.name) + " values", texts() };
        for (unsigned k = 0; k < a.count; ++k)
        {
            const std::string kind = argument_differs(first, second, a, b, k, comparison);
            if (!kind.empty())
                return Difference{ kind, std::string(function.name) + " " + name_of(function, k), texts() };
        }
    }
    if (first.result != second.result)
        return Difference{ "result", "",
                           "  result:\n" + both(comparison, number(first.result), number(second.result)) };
    const auto at = first_difference(first.after.data(), second.after.data(), image_size());
    if (!at)
        return std::nullopt;
    const std::string name = field_at(operation, *at);
    return Difference{ *at >= caller_offset() ? "output" : "state after", name,
                       "  " + name + " afterwards:\n" +
                           both(comparison, field_value(operation, first.after.data(), *at),
                                field_value(operation, second.after.data(), *at)) };
}

std::optional<Difference> compare_stores(const Operation& operation, const Trace& first, const Trace& second,
                                         const Comparison& comparison)
{
    const std::size_t size = image_size();
    if (first.images == second.images)
        return std::nullopt;
    const std::size_t count = std::min(first.calls.size(), second.calls.size());
    for (std::size_t i = 0; i < count; ++i)
    {
        const unsigned char* const a = first.images.data() + i * size;
        const unsigned char* const b = second.images.data() + i * size;
        const auto at = first_difference(a, b, size);
        if (!at)
            continue;
        const std::string name = field_at(operation, *at);
        return Difference{ "store", name + " at " + platform[first.calls[i].function].name,
                           "  " + name + " when call " + std::to_string(i) + " comes, " +
                               shown_call(first, first.calls[i]) + ":\n" +
                               both(comparison, field_value(operation, a, *at), field_value(operation, b, *at)) };
    }
    return std::nullopt;
}

} // namespace lockstep
