// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  How a platform function records itself; included by trace.h, whose first comment shows the use.
 *
 *      BOARD_CALL         functions without a result
 *      BOARD_CALL_R       functions with one: a scripted fault answers instead of acting, and sets outputs as told
 *      BOARD_CALL_ACTING  functions that act also when a fault answers: they end in return boardCall.answer_or_fault(…)
 *      BOARD_CALL_END     behind the function's block: no exception leaves it, see contained.h, and a program may have
 *                         a function of its own in its place, see replaced.h
 *
 *  Arguments, by their own tokens: a number, an enumeration, a function, a pointer to a changeable number (an output,
 *  read when the call ends), or one of the wrappers in trace_arguments. An output that a fault or boardCall.fail(…)
 *  left alone is recorded as <unchanged> unless it is a plain number. */
#pragma once

#include <cstdarg>
#include <cstddef>
#include <cstdint>
#include <exception>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>
#include <vector>

#include "board/contained.h"
#include "board/names.h"
#include "board/outputs.h"
#include "board/value.h"

#include "drv_av_d.h"

namespace board
{

/** A record of the headers by field name. */
template <typename Record>
Value to_value(const Record& record);

/** One argument of a call that begins. */
struct CallArgument
{
    Value value;
    std::function<Value()> at_end{};   ///< an output: what it points to when the call ends
    bool unchanged_by_failure = false; ///< not worth reading when the call left it alone
    bool left_out = false;             ///< does not appear in the trace
    /** An output: puts there what somebody wrote for it, unless the pointer is null. */
    std::function<void(std::string_view)> put{};
};

namespace trace_arguments
{

template <typename T>
concept Numeric = std::is_integral_v<T> || std::is_enum_v<T>;

template <Numeric T>
Value number_value(T number, Value::Base base = Value::Base::Decimal)
{
    return Value::number(static_cast<std::int64_t>(number), {}, base);
}

template <Numeric T>
Value list_value(const T* numbers, std::size_t count, Value::Base base = Value::Base::Decimal)
{
    if (numbers == nullptr)
        return Value::null();
    std::vector<Value> items;
    items.reserve(count);
    for (std::size_t i = 0; i < count; ++i)
        items.push_back(number_value(numbers[i], base));
    return Value::list(std::move(items));
}

/** An object or function that is known by name: registered, or found in the executable's symbol table. */
Value object_value(const void* object);
Value function_value(const void* function);

/** A list of numbers; of changeable ones: an output. */
template <Numeric T>
CallArgument array(T* numbers, std::size_t count)
{
    if constexpr (std::is_const_v<T>)
        return { list_value(numbers, count) };
    else
        return { {},
                 [numbers, count] { return list_value(numbers, count); },
                 true,
                 false,
                 [numbers, count](std::string_view written) { outputs::put_list(numbers, count, written); } };
}

/** A list of numbers that goes in through a pointer to changeable ones. */
template <Numeric T>
CallArgument input(const T* numbers, std::size_t count)
{
    return { list_value(numbers, count) };
}

/** Bytes, in hexadecimal; changeable ones: an output. */
inline CallArgument bytes(const void* data, std::size_t count)
{
    return { list_value(static_cast<const std::uint8_t*>(data), count, Value::Base::Hex) };
}
inline CallArgument bytes(void* data, std::size_t count)
{
    return { {},
             [data, count] { return bytes(static_cast<const void*>(data), count).value; },
             true,
             false,
             [data, count](std::string_view written) { outputs::put_bytes(data, count, written); } };
}

/** A text that goes in. */
inline CallArgument text(const char* text)
{
    return { text == nullptr ? Value::null() : Value::text(text) };
}
/** A text that goes out, into a buffer of so many characters. */
CallArgument text(char* buffer, std::size_t size);

/** A record by its fields; a changeable one is read when the call ends. */
template <typename T>
CallArgument record(const T* record)
{
    return { record == nullptr ? Value::null() : to_value(*record) };
}
template <typename T>
    requires(!std::is_const_v<T>)
CallArgument record(T* changeable)
{
    return { changeable == nullptr ? Value::null() : to_value(*changeable),
             [changeable] { return changeable == nullptr ? Value::null() : to_value(*changeable); }, false, false,
             [changeable](std::string_view written) { outputs::put_record(changeable, written); } };
}

/** A small number that travels in a pointer. */
inline CallArgument tag(const void* tag)
{
    return { Value::number(static_cast<std::int64_t>(reinterpret_cast<std::uintptr_t>(tag))) };
}
inline CallArgument tag(void** out)
{
    return { {},
             [out] { return out == nullptr ? Value::null() : tag(static_cast<const void*>(*out)).value; },
             true,
             false,
             [out](std::string_view written) { outputs::put_tag(out, written); } };
}

/** An object by name. */
inline CallArgument object(const void* object)
{
    return { object_value(object) };
}
inline CallArgument object(void** out)
{
    return { {}, [out] { return out == nullptr ? Value::null() : object_value(*out); }, true };
}

/** A value that was made elsewhere: value("pvParameter", anything). */
inline CallArgument value(std::string_view, Value value)
{
    return { std::move(value) };
}

/** The values of a format: what they became is recorded elsewhere. */
inline CallArgument values(std::va_list)
{
    return { {}, {}, false, true };
}

/** A pointer whose content is nobody's business. */
inline CallArgument ignored(const void* pointer)
{
    return { pointer == nullptr ? Value::null() : Value::symbol("<pointer>") };
}

} // namespace trace_arguments

template <typename T>
CallArgument call_argument(T given)
{
    if constexpr (std::is_same_v<T, CallArgument>)
        return given;
    else if constexpr (std::is_same_v<T, Value>)
        return { std::move(given) };
    else if constexpr (trace_arguments::Numeric<T>)
        return { trace_arguments::number_value(given) };
    else
    {
        static_assert(std::is_pointer_v<T>, "wrap this argument");
        using Target = std::remove_pointer_t<T>;
        if constexpr (std::is_function_v<Target>)
            return { trace_arguments::function_value(reinterpret_cast<const void*>(given)) };
        else
        {
            static_assert(trace_arguments::Numeric<Target> && !std::is_const_v<Target> && !std::is_same_v<Target, char>,
                          "wrap this pointer, as trace_arguments says");
            return { {},
                     [given] { return given == nullptr ? Value::null() : trace_arguments::number_value(*given); },
                     false,
                     false,
                     [given](std::string_view written) { outputs::put_number(given, written); } };
        }
    }
}

template <typename... T>
std::vector<CallArgument> call_arguments(T... given)
{
    std::vector<CallArgument> arguments; // an initializer list would be copied out of
    arguments.reserve(sizeof...(given));
    (arguments.push_back(call_argument(std::move(given))), ...);
    return arguments;
}

/** What is known of a recording function before it is called: its name, and those of its arguments. */
struct CallSite
{
    struct Parameter
    {
        std::string name;
        names::Family family;
        Value::Base base;
    };

    CallSite(std::string_view function, std::string_view tokens);

    std::string function;
    std::vector<Parameter> parameters;
    Parameter result;
};

/** A platform call that runs. */
class CallRecord
{
public:
    CallRecord(const CallSite& site, std::vector<CallArgument> arguments);
    ~CallRecord();
    CallRecord(const CallRecord&) = delete;
    CallRecord& operator=(const CallRecord&) = delete;

    /** The scripted fault that is due. */
    const std::optional<Fault>& fault() const { return m_fault; }
    /** The call was a console print. */
    void log(std::int32_t level, std::string text, bool shown);
    /** The call was a failed assertion. */
    void assertion();

protected:
    void set_result(std::int64_t result, bool faulted);
    void leave_outputs_alone() { m_outputs_unchanged = true; }
    /** What the fault says of outputs; the others stay as they are. */
    void put_fault_outputs();
    /** An exception leaves the call. */
    bool is_broken_off() const { return std::uncaught_exceptions() > m_exceptions; }

private:
    void write_outputs();

    const CallSite& m_site;
    bool m_is_handed_on; ///< recorded already, by the call of what stands in its place
    std::vector<CallArgument> m_arguments;
    std::uint64_t m_sequence;
    std::uint64_t m_power_on;
    std::optional<Fault> m_fault;
    std::string_view m_by_before; ///< who stored before the call
    int m_exceptions = std::uncaught_exceptions();
    bool m_outputs_unchanged = false;
};

/** Yields a function's result type; the attributes of the console functions stay out of it. */
template <typename Result, typename... Parameters>
std::type_identity<Result> function_result(Result (*)(Parameters...));
template <typename Result, typename... Parameters>
std::type_identity<Result> function_result(Result (*)(Parameters..., ...));

/** A platform call that runs, with the result type of its function. */
template <typename Result>
class Call : public CallRecord
{
public:
    using CallRecord::CallRecord;
    Call(const Call&) = delete;
    Call& operator=(const Call&) = delete;
    /** What BOARD_CALL_END answers is in the trace, too. */
    ~Call()
    {
        if (is_broken_off())
            contained([this] { fail(failed_answer<Result>()); });
    }

    /** Record the result and hand it back. */
    Result answer(Result result)
    {
        set_result(static_cast<std::int64_t>(result), false);
        return result;
    }
    /** The same for a call that failed and wrote no output. */
    Result fail(Result result)
    {
        leave_outputs_alone();
        return answer(result);
    }
    /** The scripted fault's answer, in place of acting. */
    Result fault_answer()
    {
        leave_outputs_alone();
        return answer_or_fault({});
    }
    /** The scripted fault's answer where one is due; the call has acted. */
    Result answer_or_fault(Result result)
    {
        if (!fault())
            return answer(result);
        put_fault_outputs();
        const auto answered = static_cast<Result>(fault()->answer);
        set_result(static_cast<std::int64_t>(answered), true);
        return answered;
    }
};

template <>
class Call<void> : public CallRecord
{
public:
    using CallRecord::CallRecord;
};

} // namespace board

#define BOARD_CALL_RESULT(function) decltype(::board::function_result(function))::type

#define BOARD_CALL_BEGIN(function, ...)                                      \
    static const ::board::CallSite boardCallSite{ #function, #__VA_ARGS__ }; \
    ::board::Call<BOARD_CALL_RESULT(function)> boardCall                     \
    {                                                                        \
        boardCallSite, [&] {                                                 \
            using namespace ::board::trace_arguments;                        \
            return ::board::call_arguments(__VA_ARGS__);                     \
        }()                                                                  \
    }

#define BOARD_CALL(function, ...)                                                          \
    static_assert(std::is_void_v<BOARD_CALL_RESULT(function)>, #function " has a result"); \
    BOARD_CALL_BEGIN(function __VA_OPT__(, ) __VA_ARGS__)

#define BOARD_CALL_ACTING(function, ...)                                                     \
    static_assert(!std::is_void_v<BOARD_CALL_RESULT(function)>, #function " has no result"); \
    BOARD_CALL_BEGIN(function __VA_OPT__(, ) __VA_ARGS__)

#define BOARD_CALL_R(function, ...)                         \
    BOARD_CALL_ACTING(function __VA_OPT__(, ) __VA_ARGS__); \
    if (boardCall.fault())                                  \
    return boardCall.fault_answer()

#define BOARD_CALL_CONTAINED(function)                                \
    catch (...)                                                       \
    {                                                                 \
        ::board::keep_failure(#function);                             \
        return ::board::failed_answer<BOARD_CALL_RESULT(function)>(); \
    }

#define BOARD_PRAGMA(words) _Pragma(#words)

/** A definition that gives way to any other one, however many sources are compiled together, and that can be reached
 *  by a second name all the same. */
#define BOARD_CALL_END(function)   \
    BOARD_CALL_CONTAINED(function) \
    BOARD_PRAGMA(weak function)    \
    extern "C" decltype(function) board_##function __attribute__((alias(#function)));
