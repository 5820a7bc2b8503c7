// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What a run shows: commands, platform calls, console, results. For people as text of 80 columns where it can be; for
 *  programs the trace as one JSON object a line. */
#pragma once

#include <cstdint>
#include <functional>
#include <iosfwd>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "board/trace.h"
#include "board/value.h"
#include "tools/pmxboard/functions/operation.h"
#include "tools/pmxboard/text/layout.h"
#include "tools/pmxboard/text/paint.h"
#include "tools/pmxboard/view/trace_filter.h"
#include "tools/pmxboard/view/trace_sink.h"

namespace board::picture
{
class Image;
}

namespace pmxboard
{

/** Draws a picture where people read: whole lines. */
using Drawing = std::function<std::string(const board::picture::Image&)>;

struct OutputOptions
{
    bool quiet = false;   ///< people see failures only
    bool verbose = false; ///< arguments by name; expectations too
    bool colour = false;
    bool echo = true;           ///< commands are shown before what they do; not where the user has just typed them
    TraceSink* trace = nullptr; ///< null pointer: for people, as text
    std::ostream* to = nullptr; ///< where people read
    std::ostream* trace_to = nullptr; ///< where the trace goes when that is somewhere else
    TraceFilter filter = {};
    bool stores = false; ///< what is stored into the layer's objects stands in the trace
    Drawing draw = {};   ///< how pictures are drawn; empty: in characters
};

class Output
{
public:
    explicit Output(const OutputOptions& options);

    /** Show or hide the trace from now on. */
    void show_trace(bool on) { m_trace_shown = on; }
    bool shows_trace() const { return m_trace_shown; }

    /** From now on nothing is real: what would be done is shown there, whatever becomes of the trace otherwise. */
    void imagine(std::ostream& to);
    /** Show nothing of what is done until this is taken back: it was seen before. */
    void hush(bool on) { m_hushed = on; }
    /** Whether stores are shown whatever the scenario says. */
    bool shows_stores() const { return m_options.stores; }
    /** Whether they are watched for the trace: shown, or heard alone. */
    bool hears_stores() const { return m_options.stores || m_trace->hears_stores(); }
    /** Whether people see anything but failures. */
    bool for_people() const { return people() != nullptr; }
    /** Whether a run is only told in short. */
    bool is_short() const { return m_trace->stands_for_console(); }
    /** Whether a program reads the standard output, as JSON lines. */
    bool for_programs() const { return is_machine_read() && m_trace->has_lines(); }

    /** How a text for people is to look. */
    Look look() const { return { text_width(), m_options.colour }; }

    /** How pictures are drawn; empty: in characters. */
    const Drawing& drawing() const { return m_options.draw; }

    void powered_on();
    void refusal(const std::string& sentence) { m_trace->refusal(sentence); }
    void explanation(const std::string& json_line) { m_trace->explanation(json_line); }
    void operation_begins(const std::string& name);
    void command(std::string_view line);
    void expectation(std::string_view line);
    void outcome(const Outcome& outcome);
    /** What the scenario does not do as it says; who reads is told elsewhere. */
    void failure(const std::string& message);
    void text(std::string_view text);
    /** A text for people, painted as what deserves a look. */
    void remark(std::string_view text);
    /** What a verb shows of the state: a line for programs, or a text for people. */
    void shown(const std::string& json_line, std::string_view text);
    /** The same, of what nobody asked for. */
    void added(const std::string& json_line, std::string_view text);
    /** What `line` would do, as imagine() wrote it down. */
    void imagined(std::string_view line, const std::string& written, const std::string& outcome);

    /** Sinks of the board. */
    void entry(const board::TraceEntry& entry);
    void console(std::string_view text);
    /** Everything that waits for its place or for the end of its line. */
    void flush();

private:
    /** A console text or a trace line of something that ran inside a platform call: shown behind that call. */
    struct Nested
    {
        bool is_console = false;
        std::string text;
    };

    void tell(std::string_view text);
    void show_trace_as(std::string_view form);
    bool is_machine_read() const;
    std::ostream* people() const;
    void write_trace(const std::string& line);
    void write_console(std::string_view text);
    void release_nested();

    OutputOptions m_options;
    Paint m_paint;
    TraceSink* m_trace;
    std::unique_ptr<TraceSink> m_own_trace;
    bool m_trace_shown = true;
    bool m_hushed = false;
    std::string m_console_line;
    std::vector<Nested> m_nested;
};

} // namespace pmxboard
