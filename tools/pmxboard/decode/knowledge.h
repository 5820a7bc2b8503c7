// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the layer must hold as far as a log tells: a line that cannot be true tells of others that are missing. */
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "tools/pmxboard/decode/log.h"

namespace pmxboard::decode
{

/** The timer that brings graphics back runs so many seconds. */
constexpr double timer_seconds = 10;
constexpr double timer_slack = 0.5; ///< of a busy system

/** Whether so much time fits the timer, with stamps that are so exact. */
bool fits_timer(double seconds, double exact);

class Knowledge
{
public:
    /** @param level  the console's: what it does not print may have happened */
    explicit Knowledge(int level) : m_level(level) {}
    /** It may be raised: what it did not show until then may have happened. */
    void set_level(int level);

    /** Takes a line, and tells what must have stood before it; nothing when it fits. `goes_on`: it is not the first of
     *  its call; `in_mode_change`: the call sets a mode. */
    std::optional<std::string> take(const Item& item, bool goes_on, bool in_mode_change);
    /** That so much time has passed. */
    std::optional<std::string> take_time(const std::optional<Moment>& now);
    /** Lines are missing, or the system has begun anew: nothing is known. */
    void forget();

private:
    std::optional<std::string> take_flags(const Item& item);
    std::optional<std::string> take_colours(const Item& item, bool goes_on);
    std::optional<std::string> take_mode(const Item& item, bool goes_on, bool in_mode_change);
    std::optional<std::string> take_timer(const Item& item);

    int m_level;
    std::optional<bool> m_flag;   ///< the display part's
    std::optional<bool> m_return; ///< graphics wait for their return
    bool m_returning = false;     ///< the line before lets them, if they wait
    std::optional<std::int64_t> m_master;
    std::optional<std::int64_t> m_mode;
    std::optional<Moment> m_timer; ///< when it was set
};

} // namespace pmxboard::decode
