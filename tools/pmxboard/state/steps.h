// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The commands that led to a state since power-on. Carried out again they lead there once more, to all of it: what the
 *  devices keep to themselves, too, and what is armed or waits. */
#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace pmxboard
{

/** Counted up when a command is kept in another way. */
inline constexpr int steps_version = 1;

struct Step
{
    std::string directory; ///< what names of files in the line are relative to
    std::string line;
    bool failed = false; ///< when it led there

    bool operator==(const Step&) const = default;
};

class Steps
{
public:
    /** Power-on: what was before does not count any more. `board` is what the board file says, in short. */
    void begin(Step step, std::string board = {});
    void add(Step step);
    /** Something happened that no line says. */
    void lose(std::string why);

    const std::vector<Step>& all() const { return m_all; }
    const std::string& board() const { return m_board; }
    /** Why these steps do not lead to the state; empty when they do. */
    const std::string& lost() const { return m_lost; }

    bool operator==(const Steps&) const = default;

private:
    std::vector<Step> m_all;
    std::string m_board;
    std::size_t m_characters = 0;
    std::string m_lost = "the board was never powered on";
};

} // namespace pmxboard
