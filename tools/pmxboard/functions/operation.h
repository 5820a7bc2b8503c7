// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A function that a scenario can call: its arguments and their kinds, found from its type, and the call itself.
 *
 *      operation<PMX_SetTvType>("PMX_SetTvType", { "ucPmxId", "ucTvType" })
 *      operation<PMX_SetPlaneOrderArray>("PMX_SetPlaneOrderArray", { "ucPmxId", { "pu4PlaneOrder", 8 } })
 *
 *  Numbers and enumerations are written as such; a tag (void*) as the number that it carries; a text (const char*) in
 *  quotes. A pointer to a number that may be changed is an output, which is not written: the tool provides it. A
 *  pointer to numbers that stay as they are, or to records, is a list of as many items as its name is given with. The
 *  last parameter before values of any kind and number is their format. */
#pragma once

#include <cstdint>
#include <cstring>
#include <functional>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <tuple>
#include <type_traits>
#include <utility>
#include <vector>

#include "board/names.h"
#include "board/value.h"
#include "drv_if_pmx.h"
#include "tools/pmxboard/functions/format_check.h"
#include "tools/pmxboard/functions/kind.h"

namespace pmxboard
{

/** One value for each parameter. An output is null when a null pointer is to be passed, and any number otherwise. */
using Values = std::vector<board::Value>;

struct OutputValue
{
    std::string name;
    std::optional<board::Value> value; ///< absent when the function left it as it was
};

struct Outcome
{
    std::optional<board::Value> result; ///< absent for a function without one
    std::vector<OutputValue> outputs;   ///< of the pointers that were not null
};

/** One JSON object: result, and outputs by name. */
std::string to_json(const Outcome& outcome);

struct Parameter
{
    std::string name;
    bool is_output = false;
    bool may_be_null = false;
    Kind kind;
};

struct Operation
{
    std::string name;
    std::vector<Parameter> parameters;
    std::function<Outcome(const Operation& self, const Values&)> call;
    std::function<void(const Values&)> check = {}; ///< what the kinds alone cannot refuse; throws LineError
    board::names::Family result_family = board::names::Family::None;

    Outcome run(const Values& values) const { return call(*this, values); }
};

/** How a parameter is called, and what its type does not tell: the number of items behind a pointer to a list, and
 *  whether the function copes with a null pointer. */
struct ParameterName
{
    ParameterName(const char* written, std::size_t items = 1) : name(written), count(items) {}

    std::string name;
    std::size_t count = 1;
    bool may_be_null = true;
};

/** An output whose pointer the function does not test: no null may be written for it. */
inline ParameterName never_null(const char* written)
{
    ParameterName name = written;
    name.may_be_null = false;
    return name;
}

/** Read the written arguments of an operation. Outputs are not written, but `null` may stand for one.
 *  Throws LineError. */
Values read_arguments(const Operation& operation, std::span<const std::string> words);

/** "PMX_SetTvType ucPmxId ucTvType": how it is written. */
std::string usage(const Operation& operation);

/** The operation of this name; null pointer when there is none. */
const Operation* find(const std::vector<Operation>& table, std::string_view name);
std::vector<std::string_view> names_of(const std::vector<Operation>& table);

/** Every function of the layer. */
const std::vector<Operation>& operations();
/** Functions of the platform that a neighbouring driver would call, numbers in and nothing out. */
const std::vector<Operation>& neighbours();

/** Functions of the table that the mixer registers; the tag stands first. */
const std::vector<Operation>& ipmx_slots();

/** A number that a function answers or writes, by its name in the family or, of a large one, by the name that goes with
 *  any number: PMX_PORT_DONE. Large ones are packed, and read in hexadecimal. */
board::Value yielded(board::names::Family family, std::int64_t number);

/** What an output holds before the call; a function that leaves it so has not written it. */
constexpr unsigned char untouched_byte = 0xA5;

/** One argument, from its value to what the function takes, and back for an output. */
template <typename T>
struct Argument
{
    static_assert(std::is_integral_v<T> || std::is_enum_v<T>, "this type of argument needs an Argument of its own");

    explicit Argument(const board::Value& value) : passed(static_cast<T>(value.as_number())) {}
    void report(const Parameter&, Outcome&) const {}

    static Parameter describe(std::string_view owner, const ParameterName& name)
    {
        return { .name = name.name,
                 .is_output = false,
                 .may_be_null = false,
                 .kind = { .form = Kind::Form::Number,
                           .bits = 8 * sizeof(T),
                           .is_signed = std::is_signed_v<T>,
                           .family = board::names::family_of(owner, name.name),
                           .count = 0,
                           .names = {},
                           .members = {} } };
    }

    T passed;
};

/** A tag: a number carried in a pointer. */
template <>
struct Argument<void*>
{
    explicit Argument(const board::Value& value) : passed(nullptr)
    {
        const auto number = static_cast<std::uintptr_t>(value.as_number());
        std::memcpy(&passed, &number, sizeof passed);
    }
    void report(const Parameter&, Outcome&) const {}

    static Parameter describe(std::string_view owner, const ParameterName& name)
    {
        return Argument<std::uint32_t>::describe(owner, name);
    }

    void* passed;
};

/** An output. */
template <typename T>
    requires(!std::is_const_v<T> && (std::is_integral_v<T> || std::is_enum_v<T>))
struct Argument<T*>
{
    explicit Argument(const board::Value& value)
        : is_null(value.kind() == board::Value::Kind::Null), number(untouched())
    {
        passed = is_null ? nullptr : &number;
    }
    Argument(const Argument&) = delete;
    Argument& operator=(const Argument&) = delete;

    void report(const Parameter& parameter, Outcome& outcome) const
    {
        if (is_null)
            return;
        const auto value = static_cast<std::int64_t>(number);
        outcome.outputs.push_back({ parameter.name, std::nullopt });
        if (number != untouched())
            outcome.outputs.back().value = yielded(parameter.kind.family, value);
    }

    static Parameter describe(std::string_view owner, const ParameterName& name)
    {
        Parameter parameter = Argument<T>::describe(owner, name);
        parameter.is_output = true;
        parameter.may_be_null = name.may_be_null;
        return parameter;
    }

    static T untouched()
    {
        T number{};
        std::memset(&number, untouched_byte, sizeof number);
        return number;
    }

    bool is_null;
    T number;
    T* passed;
};

/** A text that the function reads. */
template <>
struct Argument<const char*>
{
    explicit Argument(const board::Value& value) : text(value.string()), passed(text.c_str()) {}
    Argument(const Argument&) = delete;
    Argument& operator=(const Argument&) = delete;
    void report(const Parameter&, Outcome&) const {}

    static Parameter describe(std::string_view, const ParameterName& name);

    std::string text;
    const char* passed;
};

/** A list of numbers that the function reads. */
template <typename T>
    requires(std::is_integral_v<T> || std::is_enum_v<T>)
struct Argument<const T*>
{
    explicit Argument(const board::Value& value)
    {
        for (const board::Value& item : value.items())
            numbers.push_back(static_cast<T>(item.as_number()));
        passed = value.kind() == board::Value::Kind::Null ? nullptr : numbers.data();
    }
    Argument(const Argument&) = delete;
    Argument& operator=(const Argument&) = delete;
    void report(const Parameter&, Outcome&) const {}

    static Parameter describe(std::string_view owner, const ParameterName& name)
    {
        Parameter parameter = Argument<T>::describe(owner, name);
        parameter.kind.members = { parameter.kind };
        parameter.kind.form = Kind::Form::List;
        parameter.kind.count = name.count;
        parameter.may_be_null = true;
        return parameter;
    }

    std::vector<T> numbers;
    const T* passed;
};

/** A record that a scenario writes as {…}: what its fields are, and how it is filled from such a value. */
template <typename T>
struct RecordKind;

template <>
struct RecordKind<PMX_RESOLUTION_T>
{
    static Kind kind();
    static PMX_RESOLUTION_T from(const board::Value& value);
};

/** A caller's array of outputs while the operation runs that it was given to. */
class LentOutputs
{
public:
    explicit LentOutputs(std::span<PMX_RESOLUTION_T> outputs);
    ~LentOutputs();
    LentOutputs(const LentOutputs&) = delete;
    LentOutputs& operator=(const LentOutputs&) = delete;

    /** Of the operation that began last among those that run; empty when none runs that was given one. */
    static std::span<PMX_RESOLUTION_T> innermost();

private:
    std::span<PMX_RESOLUTION_T> m_outputs;
};

/** A list of records that the function may change, or its caller while it runs. */
template <typename T>
    requires std::is_class_v<T>
struct Argument<T*>
{
    explicit Argument(const board::Value& value)
    {
        for (const board::Value& item : value.items())
            records.push_back(RecordKind<std::remove_const_t<T>>::from(item));
        passed = value.kind() == board::Value::Kind::Null ? nullptr : records.data();
        lent.emplace(records);
    }
    Argument(const Argument&) = delete;
    Argument& operator=(const Argument&) = delete;
    void report(const Parameter&, Outcome&) const {}

    static Parameter describe(std::string_view, const ParameterName& name)
    {
        return { .name = name.name,
                 .is_output = false,
                 .may_be_null = true,
                 .kind = { .form = Kind::Form::List,
                           .bits = 0,
                           .is_signed = false,
                           .family = board::names::Family::None,
                           .count = name.count,
                           .names = {},
                           .members = { RecordKind<std::remove_const_t<T>>::kind() } } };
    }

    std::vector<std::remove_const_t<T>> records;
    T* passed;
    std::optional<LentOutputs> lent;
};

/** Call `function` with the values, one for each of its parameters A… */
template <typename R, typename... A, typename Function, std::size_t... I>
Outcome call_with(const Function& function, const Operation& operation, const Values& values, std::index_sequence<I...>)
{
    std::tuple<Argument<A>...> arguments{ values[I]... };
    Outcome outcome;
    if constexpr (std::is_void_v<R>)
    {
        function(std::get<I>(arguments).passed...);
    }
    else
    {
        const auto number = static_cast<std::int64_t>(function(std::get<I>(arguments).passed...));
        outcome.result = yielded(operation.result_family, number);
    }
    (std::get<I>(arguments).report(operation.parameters[I], outcome), ...);
    return outcome;
}

template <typename R, typename... A>
Outcome call_function(R (*function)(A...), const Operation& operation, const Values& values)
{
    return call_with<R, A...>(function, operation, values, std::index_sequence_for<A...>{});
}

/** Without the values that it takes besides. The pointer is of plain type: what the text wants is checked before, not
 *  by the compiler. */
template <typename R, typename... A>
Outcome call_function(R (*function)(A..., ...), const Operation& operation, const Values& values)
{
    return call_with<R, A...>(function, operation, values, std::index_sequence_for<A...>{});
}

template <typename... A, std::size_t... I>
std::vector<Parameter> describe(std::string_view owner, const std::vector<ParameterName>& names,
                                std::index_sequence<I...>)
{
    if (names.size() != sizeof...(A))
        throw std::logic_error(std::string(owner) + " has another number of parameters");
    return { Argument<A>::describe(owner, names[I])... };
}

template <typename R, typename... A>
std::vector<Parameter> parameters_of(R (*)(A...), std::string_view owner, const std::vector<ParameterName>& names)
{
    return describe<A...>(owner, names, std::index_sequence_for<A...>{});
}

template <typename R, typename... A>
std::vector<Parameter> parameters_of(R (*)(A..., ...), std::string_view owner, const std::vector<ParameterName>& names)
{
    return describe<A...>(owner, names, std::index_sequence_for<A...>{});
}

/** What the kinds of a function's arguments cannot refuse, where there is such a thing. */
template <typename R, typename... A>
std::function<void(const Values&)> check_of(R (*)(A...), const std::vector<Parameter>&)
{
    return {};
}
template <typename R, typename... A>
std::function<void(const Values&)> check_of(R (*)(A..., ...), const std::vector<Parameter>& parameters)
{
    static_assert(std::is_same_v<std::tuple_element_t<sizeof...(A) - 1, std::tuple<A...>>, const char*>);
    return [format = parameters.back().name](const Values& values) { check_format(format, values.back().string()); };
}

template <auto function>
Operation operation(const char* name, const std::vector<ParameterName>& names)
{
    Operation made;
    made.name = name;
    made.parameters = parameters_of(function, name, names);
    made.result_family = board::names::family_of(name, "result");
    made.check = check_of(function, made.parameters);
    made.call = [](const Operation& self, const Values& values) { return call_function(function, self, values); };
    return made;
}

} // namespace pmxboard
