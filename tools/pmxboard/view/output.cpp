// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/view/output.h"

#include <cstdio>
#include <iostream>

#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
Output::Output(const OutputOptions& options) : m_options(options), m_paint{ options.colour }, m_trace(options.trace)
{
    if (m_trace == nullptr)
        show_trace_as("text");
}

/** A trace of one's own. */
void Output::show_trace_as(std::string_view form)
{
    const TraceOptions how{ m_options.verbose, m_options.colour, m_options.trace_to != nullptr };
    m_own_trace = trace_form(form).make(how, m_options.to != nullptr ? *m_options.to : std::cout);
    m_trace = m_own_trace.get();
}

/** Whether programs read what people otherwise do. */
bool Output::is_machine_read() const
{
    return m_trace->is_for_programs() && m_options.trace_to == nullptr;
}

std::ostream* Output::people() const
{
    return m_hushed || m_options.quiet || is_machine_read() ? nullptr : m_options.to;
}

void Output::imagine(std::ostream& to)
{
    const bool as_lines = for_programs();
    m_options.to = &to;
    m_options.trace_to = nullptr;
    m_options.draw = {}; // what is imagined asks nobody
    show_trace_as(as_lines ? "jsonl" : "text");
    m_trace_shown = true;
}

void Output::powered_on()
{
    if (!m_hushed)
        m_trace->powered_on();
}

void Output::operation_begins(const std::string& name)
{
    if (!m_hushed)
        m_trace->operation_begins(name);
}

void Output::command(std::string_view line)
{
    if (m_hushed)
        return;
    m_trace->command(line);
    if (people() != nullptr && m_options.echo)
        *people() << m_paint("> " + printable_lines(line), Colour::Bold) << '\n';
}

void Output::expectation(std::string_view line)
{
    if (!m_hushed)
        m_trace->expectation(line);
    if (people() != nullptr && m_options.verbose)
        *people() << "> " + printable_lines(line) << '\n';
}

void Output::outcome(const Outcome& outcome)
{
    if (m_hushed)
        return;
    m_trace->operation_ends(outcome);
    flush();
    if (people() == nullptr)
        return;
    if (outcome.result)
        *people() << m_paint("  = " + outcome.result->to_text(), Colour::Green) << '\n';
    for (const OutputValue& output : outcome.outputs)
    {
        const std::string value = output.value ? " = " + output.value->to_text() : " untouched";
        *people() << m_paint("  *" + output.name + value, Colour::Green) << '\n';
    }
}

void Output::failure(const std::string& message)
{
    if (!m_hushed)
        m_trace->failure(message);
}

void Output::tell(std::string_view text)
{
    if (!m_hushed && !text.empty())
        m_trace->told(std::string(text));
}

void Output::text(std::string_view text)
{
    flush();
    tell(text);
    if (people() != nullptr)
        *people() << text;
}

void Output::remark(std::string_view text)
{
    flush();
    tell(text);
    if (people() != nullptr)
        *people() << m_paint(printable_lines(text), Colour::Magenta) << '\n';
}

void Output::shown(const std::string& json_line, std::string_view text)
{
    tell(text);
    added(json_line, text);
}

void Output::added(const std::string& json_line, std::string_view text)
{
    flush();
    if (m_hushed)
        return;
    if (for_programs())
        *m_options.to << json_line << '\n';
    else if (people() != nullptr)
        *people() << text;
}

void Output::imagined(std::string_view line, const std::string& written, const std::string& outcome)
{
    if (!for_programs())
    {
        text(written);
        return;
    }
    std::string calls = written.substr(0, written.find_last_not_of('\n') + 1);
    for (std::size_t end = calls.find('\n'); end != calls.npos; end = calls.find('\n', end))
        calls[end] = ',';
    shown("{\"kind\":\"what-if\",\"command\":" + board::Value::text(std::string(line)).to_json() + ",\"calls\":[" +
              calls + "],\"outcome\":" + outcome + "}",
          {});
}

void Output::entry(const board::TraceEntry& entry)
{
    if (m_hushed)
        return;
    const bool is_read = m_options.trace_to != nullptr || m_trace->is_for_programs() || people() != nullptr;
    std::string line = m_trace->entry(entry, is_read && m_trace_shown && m_options.filter.shows(entry));
    if (entry.depth == 0)
        write_trace(line);
    else if (!line.empty())
        m_nested.push_back({ false, std::move(line) });
    if (entry.depth == 0)
        release_nested();
}

void Output::console(std::string_view text)
{
    if (m_hushed)
        return;
    const auto& entries = board::trace::entries();
    if (!entries.empty() && entries.back().depth > 0)
        m_nested.push_back({ true, std::string(text) });
    else
        write_console(text);
}

void Output::write_trace(const std::string& line)
{
    if (m_options.trace_to != nullptr)
        *m_options.trace_to << line;
    else if (for_programs())
        *m_options.to << line;
    else if (people() != nullptr)
        *people() << line;
}

void Output::write_console(std::string_view text)
{
    for (const char c : text)
    {
        if (c != '\n')
        {
            m_console_line += c;
            continue;
        }
        if (people() != nullptr && !m_trace->stands_for_console())
            *people() << "  | " << printable_lines(m_console_line) << '\n';
        m_console_line.clear();
    }
}

void Output::release_nested()
{
    const std::vector<Nested> waiting = std::move(m_nested);
    m_nested.clear();
    for (const Nested& nested : waiting)
    {
        if (nested.is_console)
            write_console(nested.text);
        else
            write_trace(nested.text);
    }
}

void Output::flush()
{
    // What is not told has changed nothing yet, its clock included.
    if (!m_hushed)
        m_trace->settle();
    release_nested();
    // A blank that the next console line begins with is no line of its own.
    if (m_console_line.find_first_not_of(' ') != std::string::npos)
        write_console("\n");
    if (m_options.to != nullptr)
        m_options.to->flush();
    if (m_options.trace_to != nullptr)
        m_options.trace_to->flush();
}

} // namespace pmxboard
