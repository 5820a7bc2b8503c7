// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/knowledge.h"

#include <cmath>

namespace pmxboard::decode
{
namespace
{

// From these levels on the console shows whatever changes the value.
constexpr int level_of_master = 8;
constexpr int level_of_mode = 9;
constexpr int level_of_shutdown = 1;

constexpr std::int64_t master_at_reset = 1; // BT.709

bool begins(const Item& item, std::string_view begin)
{
    return item.text->format.starts_with(begin);
}

/** Sets what is known to what a line says, and tells whether that is something else. */
template <typename Value>
bool is_news(std::optional<Value>& known, Value value)
{
    const bool news = known && *known != value;
    known = value;
    return news;
}

} // namespace

bool fits_timer(double seconds, double exact)
{
    return std::abs(seconds - timer_seconds) <= timer_slack + exact;
}

void Knowledge::set_level(int level)
{
    if (m_level < level_of_master && level >= level_of_master)
        m_master.reset();
    if (m_level < level_of_mode && level >= level_of_mode)
        m_mode.reset();
    m_level = level;
}

void Knowledge::forget()
{
    *this = Knowledge(m_level);
}

std::optional<std::string> Knowledge::take(const Item& item, bool goes_on, bool in_mode_change)
{
    if (begins(item, "[PMX]_arPmxConf[ucPmxId].ucMode=")) // a reset
    {
        const std::optional<Moment> timer = m_timer; // goes on running
        forget();
        m_timer = timer;
        m_flag = false;
        m_return = false;
        m_master = master_at_reset;
        return {};
    }
    if (const auto missing = take_flags(item))
        return missing;
    if (const auto missing = take_colours(item, goes_on))
        return missing;
    if (const auto missing = take_mode(item, goes_on, in_mode_change))
        return missing;
    return take_timer(item);
}

std::optional<std::string> Knowledge::take_flags(const Item& item)
{
    const bool returning = m_returning;
    m_returning = begins(item, "PMX_SetOsdEnable.");
    const auto raised = [&] { return item.values.front() != "0"; };
    if (begins(item, "Display Format Change :"))
        m_flag = raised();
    else if (begins(item, "[PMX] fgPMX_DisplayModeReady") && is_news(m_flag, raised()))
        return std::string("\"Display Format Change :") + (raised() ? "1\"" : "0\"");
    else if (begins(item, "[PMX] VDP_SetClearVideo") && is_news(m_flag, true))
        return "\"Display Format Change :1\"";
    if (!begins(item, "Set Osd Enable :"))
        return {};
    const bool waits = item.value("fgPmxEnabeOsdFlag") != "0";
    const bool out_of_nothing = returning && !waits && m_return && !*m_return;
    m_return = waits;
    return out_of_nothing ? std::optional<std::string>("\"Set Osd Enable :1\"") : std::nullopt;
}

std::optional<std::string> Knowledge::take_colours(const Item& item, bool goes_on)
{
    if (m_level < level_of_master)
        return {};
    constexpr const char* missing = "another change of the master colour space";
    if (begins(item, "[PMX] Master Color Space change"))
    {
        const auto space = item.number("eColorSpace");
        const bool news = space && is_news(m_master, *space);
        m_master = item.number("eNewColorSpace");
        return news ? std::optional<std::string>(missing) : std::nullopt;
    }
    if (begins(item, "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR"))
        m_master = begins(item, "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_709") ? 1 : 0;
    const bool tells =
        begins(item, "Inform Vdp") || begins(item, "Mode(%d) CS(") || (begins(item, "Mode(%d), ") && goes_on);
    const auto space = tells ? item.number("eColorSpace") : std::nullopt;
    return space && is_news(m_master, *space) ? std::optional<std::string>(missing) : std::nullopt;
}

std::optional<std::string> Knowledge::take_mode(const Item& item, bool goes_on, bool in_mode_change)
{
    if (m_level < level_of_mode)
        return {};
    const bool is_report = begins(item, "Mode(%d) CS(");
    const bool is_colours = begins(item, "Mode(%d), ") && goes_on;
    if (!is_report && !is_colours && !begins(item, "PMX Start to set OSD"))
        return {};
    const auto mode = item.number("ucMode");
    const bool sets = !is_report && (!is_colours || in_mode_change);
    if (sets || !mode || !is_news(m_mode, *mode))
    {
        m_mode = mode;
        return {};
    }
    return "a mode change";
}

std::optional<std::string> Knowledge::take_timer(const Item& item)
{
    if (begins(item, "PMX_Uninit") || begins(item, "i4PMX_Uninit") || item.text->is_assertion())
        m_timer.reset(); // deleted, or it may not have started
    if (begins(item, "Display Format Change Timer Set"))
        m_timer = item.moment;
    if (!begins(item, "PMX timeout"))
        return {};
    const auto passed = between(m_timer, item.moment);
    m_timer.reset();
    if (!passed || fits_timer(*passed, item.moment->exact))
        return {};
    return "another \"Display Format Change Timer Set.\"";
}

std::optional<std::string> Knowledge::take_time(const std::optional<Moment>& now)
{
    const auto passed = between(m_timer, now);
    if (m_level < level_of_shutdown || !passed || *passed <= timer_seconds + timer_slack + now->exact)
        return {};
    m_timer.reset();
    return "\"PMX timeout.\"";
}

} // namespace pmxboard::decode
