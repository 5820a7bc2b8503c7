// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/view/summary_trace.h"

#include <algorithm>
#include <ostream>
#include <utility>
#include <vector>

#include "tools/pmxboard/functions/contracts.h"
#include "tools/pmxboard/text/layout.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
namespace
{

using board::TraceEntry;

struct Neighbour
{
    std::string_view header;
    std::string_view name;
};
constexpr Neighbour neighbours_by_header[] = {
    { "pmx_hal.h", "mixer" },     { "drv_tve.h", "TV encoder" }, { "drv_vdp.h", "video" }, { "drv_osd.h", "OSD" },
    { "drv_if.h", "interfaces" }, { "drv_av_d.h", "HDMI/AV" },   { "u_os.h", "system" },
};

/** The driver that a function belongs to. */
std::string neighbour_of(const std::string& function)
{
    if (function.starts_with("x_reg_"))
        return "registers";
    const Contract* const contract = contract_of(function);
    const std::string_view header = contract == nullptr ? std::string_view("others") : contract->header;
    for (const Neighbour& neighbour : neighbours_by_header)
    {
        if (neighbour.header == header)
            return std::string(neighbour.name);
    }
    return std::string(header);
}

std::string in_ms(std::uint64_t us)
{
    const std::string fraction = std::to_string(1000 + us % 1000).substr(1);
    return std::to_string(us / 1000) + (us % 1000 == 0 ? "" : "." + fraction);
}

/** What nobody has just typed. */
bool is_news(const TraceEntry& entry)
{
    return entry.kind == TraceEntry::Kind::Assert ||
           (entry.kind == TraceEntry::Kind::Notice && entry.function != "source" && entry.function != "plug");
}

std::string news_of(const TraceEntry& entry)
{
    return entry.kind == TraceEntry::Kind::Notice ? entry.function + ": " + entry.text : entry.brief();
}

} // namespace

SummaryTrace::SummaryTrace(const TraceOptions& options, std::ostream& to) : m_options(options), m_to(to)
{
}

std::string SummaryTrace::entry(const TraceEntry& entry, bool shown)
{
    if (!shown)
        return {};
    if (m_count == 0 && m_events.empty())
        m_begin_us = entry.time_us;
    m_end_us = entry.time_us;
    if (entry.kind == TraceEntry::Kind::Call)
    {
        Calls& calls = m_calls[neighbour_of(entry.function)];
        calls.first = calls.count++ == 0 ? entry.sequence : calls.first;
        ++m_count;
    }
    if (is_news(entry))
        m_events += "    at " + in_ms(entry.time_us) + " ms, " + printable(news_of(entry)) + "\n";
    return {};
}

std::string SummaryTrace::in_short() const
{
    if (m_count == 0)
        return {};
    std::vector<std::pair<std::string, Calls>> in_order(m_calls.begin(), m_calls.end());
    std::sort(in_order.begin(), in_order.end(),
              [](const auto& one, const auto& other) { return one.second.first < other.second.first; });
    std::string text = std::to_string(m_count) + (m_count == 1 ? " call" : " calls");
    text += m_end_us == m_begin_us ? "" : " in " + in_ms(m_end_us - m_begin_us) + " ms";
    for (const auto& [name, calls] : in_order)
        text += (name == in_order.front().first ? ": " : ", ") + name + " " + std::to_string(calls.count);
    return wrapped(text, text_width(), 4, 6);
}

void SummaryTrace::settle()
{
    m_to << in_short() << m_events;
    m_calls.clear();
    m_events.clear();
    m_count = 0;
}

} // namespace pmxboard
