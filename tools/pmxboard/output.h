/** @file
 *  What a run shows: commands, platform calls, console, results. For people as text of 80 columns where it can be; for
 *  programs the trace as one JSON object a line. */
#pragma once

#include <cstdint>
#include <iosfwd>
#include <string>
#include <string_view>
#include <vector>

#include "board/trace.h"
#include "board/value.h"
#include "tools/pmxboard/operation.h"

namespace pmxboard
{

enum class TraceForm
{
    Text,
    Json,
    Off
};

struct OutputOptions
{
    bool quiet = false;   ///< people see failures only
    bool verbose = false; ///< arguments by name; expectations too
    bool colour = false;
    TraceForm trace = TraceForm::Text;
    std::ostream* to = nullptr;       ///< where people read
    std::ostream* trace_to = nullptr; ///< where the trace goes when that is somewhere else
};

class Output
{
public:
    explicit Output(const OutputOptions& options);

    /** Show or hide the trace from now on. */
    void show_trace(bool on) { m_trace_shown = on; }

    void command(std::string_view line);
    void expectation(std::string_view line);
    void outcome(const Outcome& outcome);
    void text(std::string_view text);
    void state(const std::string& path, const board::Value& value, bool json);

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

    bool json_to_people() const;
    std::ostream* people() const;
    std::string render(const board::TraceEntry& entry) const;
    void write_trace(const std::string& line);
    void write_console(std::string_view text);
    void release_nested();
    std::string painted(std::string_view text, std::string_view code) const;

    OutputOptions m_options;
    bool m_trace_shown = true;
    std::string m_console_line;
    std::vector<Nested> m_nested;
};

/** How a path names an item of a list: "[3]". */
std::string item_step(std::size_t index);

/** A value as an indented tree, members that fit into a line on one. */
std::string tree(const board::Value& value, std::size_t indent = 0);

} // namespace pmxboard
