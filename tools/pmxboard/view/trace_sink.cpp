// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/view/trace_sink.h"

#include <algorithm>
#include <cstdio>
#include <iterator>
#include <map>
#include <stdexcept>

#include "tools/pmxboard/text/layout.h"
#include "tools/pmxboard/text/paint.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/pmxboard/view/chrome_trace.h"
#include "tools/pmxboard/view/summary_trace.h"
#include "tools/pmxboard/view/vcd_trace.h"

namespace pmxboard
{
namespace
{

using board::TraceEntry;
using board::Value;

/** "{…, u2_Vfreq=60}": what differs between two records with the same members. */
std::string changes_in(const Value& older, const Value& newer)
{
    if (older == newer)
        return "{as before}";
    std::string text = "{…";
    for (std::size_t i = 0; i < newer.keys().size(); ++i)
    {
        if (!(older.items()[i] == newer.items()[i]))
            text += ", " + newer.keys()[i] + "=" + newer.items()[i].to_text();
    }
    return text + "}";
}

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

    void command(std::string_view) override { m_last_records.clear(); }
    bool is_for_programs() const override { return false; }

private:
    /** A long record that a call of the command had before, and this one again, by what has changed in it. */
    TraceEntry shortened(const TraceEntry& entry)
    {
        constexpr std::size_t long_record = 40;
        TraceEntry shorter = entry;
        for (board::TraceArgument& argument : shorter.arguments)
        {
            if (argument.value.kind() != Value::Kind::Record || argument.value.to_text().size() <= long_record)
                continue;
            auto& last = m_last_records[entry.function + "." + argument.name];
            const Value now = argument.value;
            if (last.keys() == now.keys())
                argument.value = Value::symbol(changes_in(last, now));
            last = now;
        }
        return shorter;
    }

    std::string line_of(const TraceEntry& entry)
    {
        char time[32];
        std::snprintf(time, sizeof time, "%9llu.%03u  ", static_cast<unsigned long long>(entry.time_us / 1000),
                      static_cast<unsigned>(entry.time_us % 1000));
        const std::string lead = time + std::string(2 * static_cast<std::size_t>(entry.depth), ' ');
        const std::string line = lead + printable_lines(text_of(entry)) + (entry.faulted ? "  (scripted)" : "");
        if (m_options.apart)
            return line;
        const bool is_remarkable =
            entry.faulted || entry.kind == TraceEntry::Kind::Notice || entry.kind == TraceEntry::Kind::Assert;
        const bool is_call = entry.kind == TraceEntry::Kind::Call;
        const std::string shown = is_call ? folded(line, lead.size() + 4, text_width()) : line;
        return is_remarkable ? m_paint(shown, Colour::Magenta) : shown;
    }

    std::string text_of(const TraceEntry& entry)
    {
        if (m_options.verbose)
            return entry.named();
        // What runs inside a call is told before it, and shown behind it: it is no "before".
        return m_options.apart || entry.depth > 0 ? entry.brief() : shortened(entry).brief();
    }

    TraceOptions m_options;
    Paint m_paint;
    std::map<std::string, Value> m_last_records; ///< of this command, by function and argument
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
        { "vcd", "waveforms, for GTKWave and its like",
          [](const TraceOptions&, std::ostream& to) { return std::make_unique<VcdTrace>(to); } },
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
