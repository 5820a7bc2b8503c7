// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Every platform call, typed, in order. A platform function records itself and is a fault point in one line:
 *
 *      void TVE_SetEnable(UINT32 u4Tve, BOOL fgEnable)
 *      try
 *      {
 *          BOARD_CALL(TVE_SetEnable, u4Tve, fgEnable);
 *          …update the model…
 *      }
 *      BOARD_CALL_END(TVE_SetEnable)
 *
 *      INT32 x_timer_stop(HANDLE_T hTimer)
 *      try
 *      {
 *          BOARD_CALL_R(x_timer_stop, hTimer);          // answers and leaves here when a fault is scripted
 *          …
 *          return boardCall.answer(OSR_OK);             // records the result
 *      }
 *      BOARD_CALL_END(x_timer_stop)                     // what went wrong here ends here: the answer is a failure's
 *
 *  Arguments: numbers, enumerations and names of functions are recorded as they are; a pointer to a changeable number
 *  (HANDLE_T*, INT32*) is an output and is recorded by what it points to when the call ends. Other pointers are
 *  wrapped: BOARD_CALL(PMX_HalPlaneOrder, ucPmxId, u4Number, array(pu4PlaneOrder, 8)), text(szName), bytes(pvDest,
 *  u4Count), record(prRecord), ignored(pvArg). */
#pragma once

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <type_traits>
#include <utility>
#include <vector>

#include "board/value.h"

namespace board
{

struct TraceArgument
{
    std::string name;
    Value value;
};

struct TraceEntry
{
    enum class Kind
    {
        Call,   ///< a platform function
        Log,    ///< PMX_IsLog, Printf, UTIL_Printf: `text` is what was formatted
        Assert, ///< Assert: arguments expression, file, line
        Notice, ///< the board itself: a misuse of the platform, an expiry, a plug
        Store   ///< somebody stored into the layer's objects: arguments from, to; only while stores are watched
    };

    std::uint64_t sequence = 0; ///< counted from 1 at power-on
    std::uint64_t time_us = 0;  ///< virtual time since power-on
    Kind kind = Kind::Call;
    std::string function; ///< "TVE_SetEnable", "PMX_IsLog", "Assert", a notice's kind ("misuse", …), a store's field
    std::vector<TraceArgument> arguments;
    std::optional<Value> result; ///< absent for functions without one
    bool faulted = false;        ///< a scripted fault answered
    std::int32_t level = 0;      ///< PMX_IsLog's level
    bool shown = true;           ///< a log line: whether the console's level admitted it
    std::string text;            ///< formatted text of a log line; a notice's message
    std::string operation;       ///< outermost operation of the layer that was running, empty outside of one
    std::string by;              ///< of a store: the operation, platform function or neighbour that made it
    unsigned depth = 0;          ///< nesting: 1 inside a platform call that called back into the layer
    unsigned thread = 0;         ///< 0, or the number of the thread that it happened in; see threads.h

    /** One line, arguments by position: `TVE_SetEnable(0, 1)`, `x_sema_lock(1, X_SEMA_OPTION_WAIT) = 0`,
     *  `LOG8 "Mute Enable\n"`, `Printf "…"`, `UTIL_Printf "…"`, `Assert("expression", "file")`, `NOTICE misuse "…"`,
     *  `SET ucMode RES_480I → RES_480P`; behind a store stands who made it, `(poke)`, unless the operation did. */
    std::string brief() const;
    /** The same with arguments by name: `TVE_SetEnable(u4Tve=0, fgEnable=1)`. */
    std::string named() const;
    /** One JSON object, keys as documented in docs/board.md. */
    std::string to_json() const;
    /** Whether a line written by a person in the form of brief() means this entry: numbers in any base or by name, "*"
     *  for any argument, "->" for the arrow; "= result" may be left out, and who stored. Throws std::invalid_argument
     *  with the reason when the line is not well formed. */
    bool matches(std::string_view line) const;
};

namespace trace
{

/** Everything since power-on or the last clear. */
const std::vector<TraceEntry>& entries();
void clear();
/** Called with every finished entry (a call when it returns, so that its result is there; `sequence` gives the order of
 *  beginning). */
void set_sink(std::function<void(const TraceEntry&)> sink);

/** Somebody who knows the layer's objects and compares them. */
struct StoreWatch
{
    std::function<void()> look;       ///< tell, by store(), what changed since it looked last
    std::function<void()> begin_anew; ///< the objects are as at load: from here on
};

/** The watch is looked through whenever those who may store take turns: when a platform call, an operation of the layer
 *  or something else begins and ends. What it finds was stored by whoever ran until then. Empty functions end it. */
void set_store_watch(StoreWatch watch);
/** Somebody is done who is not known here. */
void look();
/** A line that a person wrote for a store, taken apart: `SET FIELD OLD → NEW (WHO)`. */
struct StoreLine
{
    std::string_view field;
    std::string_view from;
    std::string_view to;
    std::string_view by; ///< empty when left out
};
/** Throws std::invalid_argument with the reason when the line is not well formed. */
StoreLine read_store_line(std::string_view line);

/** Add a store by whoever runs. */
void store(std::string field, Value from, Value to);

/** Who stores while it lives, beside operations of the layer and platform functions: "poke", "meanwhile". */
class By
{
public:
    explicit By(std::string name);
    ~By();
    By(const By&) = delete;
    By& operator=(const By&) = delete;

private:
    std::string m_name;
    std::string_view m_before;
};

/** Names the outermost operation while it lives; a nested scope only tells who stores. */
class Operation
{
public:
    explicit Operation(const std::string& name);
    ~Operation();
    Operation(const Operation&) = delete;
    Operation& operator=(const Operation&) = delete;

private:
    By m_by;
    bool m_outermost;
};

/** Register the name of an object that crosses an interface by address, so that it is recorded by name. */
void name_object(const void* object, std::string name);
template <typename Function>
    requires std::is_function_v<Function>
void name_object(Function* function, std::string name)
{
    name_object(reinterpret_cast<const void*>(function), std::move(name));
}

/** Add an entry of the board itself. */
void notice(std::string kind, std::string text);

} // namespace trace

/** A scripted answer of a platform function. */
struct Fault
{
    enum class When
    {
        On,   ///< the n-th call from now alone
        From, ///< the n-th call from now and every later one
        Always,
        For ///< every call for a time of the board's clock
    };
    /** What an output is set to, written as in a scenario: "7", "[0x0C, 0]", "{u4ValidAutoRes=RES_480P}". */
    struct Output
    {
        std::string name;
        std::string value;
    };

    std::string function;
    std::int64_t answer = 0;
    When when = When::On;
    unsigned n = 1;
    std::string arguments{};          ///< "PMX_SET_HDMI_RES_CHG, ...": calls with these alone; empty: all of them
    std::chrono::microseconds time{}; ///< of When::For
    std::vector<Output> outputs{};    ///< the others are left alone
};

namespace faults
{

/** Script a fault; a later one for the same function and arguments replaces it. Of several that are due at a call the
 *  one that was set last answers. Throws std::invalid_argument when there is no such function, argument or output, or
 *  the function has no result; the message names the nearest valid ones. */
void set(const Fault& fault);
/** Take back all faults of a function. */
void clear(std::string_view function);
/** Take back the one for these arguments, however they are written. */
void clear(std::string_view function, std::string_view arguments);
void clear_all();
std::vector<Fault> active(); ///< with what is left of calls and time

/** "fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, ...)" taken apart: the function, and what stands in the brackets. Throws
 *  std::invalid_argument when they do not close. */
std::pair<std::string, std::string> read_call(std::string_view written);
/** As a scenario has it: "x_timer_create -1 on 2 phTimer=7". */
std::string to_text(const Fault& fault);

} // namespace faults

/** A parameter of a platform function. */
struct PlatformParameter
{
    std::string_view name;
    bool is_number; ///< handed over by value
    bool is_read;   ///< the call says what it holds
    bool is_output;
    /** Refuses what cannot be put into the output, as std::invalid_argument. Null: nobody but the function can. */
    void (*check)(std::string_view written);
};

/** A platform function of the headers. */
struct PlatformFunction
{
    std::string_view name;
    bool has_result;
    std::span<const PlatformParameter> parameters; ///< but those that vary
};
/** All of them, generated from the headers when the board is built. */
std::span<const PlatformFunction> platform_functions();

} // namespace board

#include "board/trace_call.h"
