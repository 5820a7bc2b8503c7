// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  A form in which the trace is shown. A new one is a class, and a row of trace_forms(). */
#pragma once

#include <functional>
#include <memory>
#include <span>
#include <string>
#include <string_view>

#include "board/trace.h"
#include "tools/pmxboard/functions/operation.h"

namespace pmxboard
{

/** Hears what happens in a run. Whatever it has nothing to say to it leaves alone. */
class TraceSink
{
public:
    TraceSink() = default;
    TraceSink(const TraceSink&) = delete;
    TraceSink& operator=(const TraceSink&) = delete;
    virtual ~TraceSink() = default;

    /** What runs from here on. */
    virtual void scenario(const std::string&) {}
    virtual void powered_on() {}
    virtual void command(std::string_view) {}
    /** What the scenario expects of the last command; looked at behind this. */
    virtual void expectation(std::string_view) {}
    /** Why the operation that begins next will refuse. */
    virtual void refusal(const std::string&) {}
    /** Why the command does what it does, as one JSON object: told in front of what it does. */
    virtual void explanation(const std::string&) {}
    virtual void operation_begins(const std::string&) {}
    virtual void operation_ends(const Outcome&) {}
    /** What a command shows to people: of a state, of a picture, of what would be done. */
    virtual void told(const std::string&) {}
    /** What the scenario does not do as it says. */
    virtual void failure(const std::string&) {}
    /** The command is done: everything that it began has ended. */
    virtual void settle() {}
    /** What is to be written for an entry now; nothing for one that is only to be heard (`shown` false). */
    virtual std::string entry(const board::TraceEntry& entry, bool shown) = 0;

    /** Whether programs read it: then nothing for people stands in the same stream. */
    virtual bool is_for_programs() const { return true; }
    /** Whether it tells of the console's lines, too, which then are not shown. */
    virtual bool stands_for_console() const { return false; }
    /** Whether it has to hear of each store at its moment, shown or not. */
    virtual bool hears_stores() const { return false; }
    /** Whether each line stands for itself, so that others may stand between. */
    virtual bool has_lines() const { return false; }
};

struct TraceOptions
{
    bool verbose = false; ///< arguments by name
    bool colour = false;
    bool apart = false; ///< it goes somewhere else than what people read
};

struct TraceForm
{
    std::string_view name;    ///< as --trace-format has it
    std::string_view meaning; ///< where the name does not tell it
    std::function<std::unique_ptr<TraceSink>(const TraceOptions& options, std::ostream& to)> make;
};

/** All forms, the usual one first. */
std::span<const TraceForm> trace_forms();
/** The form of this name. */
const TraceForm& trace_form(std::string_view name);

} // namespace pmxboard
