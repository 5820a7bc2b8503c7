// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/view/trace_sink.h"

#include <algorithm>
#include <cstdio>
#include <iterator>
#include <stdexcept>

#include "tools/pmxboard/text/layout.h"
#include "tools/pmxboard/text/paint.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/pmxboard/view/chrome_trace.h"
#include "tools/pmxboard/view/summary_trace.h"

namespace pmxboard
{
namespace
{

using board::TraceEntry;

/** A line a call, for people. */
class TextTrace : public TraceSink
{
public:
    explicit TextTrace(const TraceOptions& options) : m_options(options), m_paint{ options.colour } {}

    std::string entry(const TraceEntry& entry, bool shown) override
    {
        // Where people read the console, a line that it shows need not stand in the trace as well.
        const bool on_console = entry.kind == TraceEntry::Kind::Log && entry.shown && !m_options.apart;
        return shown && !on_console ? line_of(entry) + "\n" : std::string();
    }

    bool is_for_programs() const override { return false; }

private:
    std::string line_of(const TraceEntry& entry) const
    {
        char time[32];
        std::snprintf(time, sizeof time, "%9llu.%03u  ", static_cast<unsigned long long>(entry.time_us / 1000),
                      static_cast<unsigned>(entry.time_us % 1000));
        const std::string lead = time + std::string(2 * static_cast<std::size_t>(entry.depth), ' ');
        const std::string line = lead + printable_lines(m_options.verbose ? entry.named() : entry.brief()) +
                                 (entry.faulted ? "  (scripted)" : "");
        if (m_options.apart)
            return line;
        const bool is_remarkable =
            entry.faulted || entry.kind == TraceEntry::Kind::Notice || entry.kind == TraceEntry::Kind::Assert;
        const bool is_call = entry.kind == TraceEntry::Kind::Call;
        return m_paint(is_call ? folded(line, lead.size() + 4) : line, is_remarkable ? Colour::Yellow : Colour::Grey);
    }

    TraceOptions m_options;
    Paint m_paint;
};

/** One JSON object a line. */
class JsonTrace : public TraceSink
{
public:
    std::string entry(const TraceEntry& entry, bool shown) override
    {
        return shown ? entry.to_json() + "\n" : std::string();
    }
    bool has_lines() const override { return true; }
};

class NoTrace : public TraceSink
{
public:
    std::string entry(const TraceEntry&, bool) override { return {}; }
    bool is_for_programs() const override { return false; }
};

} // namespace

std::span<const TraceForm> trace_forms()
{
    static const TraceForm all[] = {
        { "text", "", [](const TraceOptions& options, std::ostream&) { return std::make_unique<TextTrace>(options); } },
        { "jsonl", "one JSON object a line",
          [](const TraceOptions&, std::ostream&) { return std::make_unique<JsonTrace>(); } },
        { "chrome", "for chrome://tracing and Perfetto's viewer",
          [](const TraceOptions&, std::ostream& to) { return std::make_unique<ChromeTrace>(to); } },
        { "summary", "what each command did, in short",
          [](const TraceOptions& options, std::ostream& to) { return std::make_unique<SummaryTrace>(options, to); } },
        { "off", "", [](const TraceOptions&, std::ostream&) { return std::make_unique<NoTrace>(); } },
    };
    return all;
}

const TraceForm& trace_form(std::string_view name)
{
    for (const TraceForm& form : trace_forms())
    {
        if (form.name == name)
            return form;
    }
    throw std::logic_error("no form of the trace is called " + std::string(name));
}

} // namespace pmxboard
