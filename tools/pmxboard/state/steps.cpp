// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/state/steps.h"

#include <algorithm>
#include <utility>

namespace pmxboard
{
namespace
{

// A saved state stays one that can be read, and a restore one that somebody waits for.
constexpr std::size_t most_steps = 20'000;
constexpr std::size_t most_characters = std::size_t{ 4 } << 20;

} // namespace

void Steps::begin(Step step, std::string board)
{
    m_all.clear();
    m_board = std::move(board);
    m_characters = 0;
    m_lost.clear();
    add(std::move(step));
}

void Steps::add(Step step)
{
    if (!m_lost.empty())
        return;
    m_characters += step.directory.size() + step.line.size();
    if (m_all.size() == most_steps || m_characters > most_characters)
        lose("more than " + std::to_string(most_steps) + " commands, or very long ones, led to it since power-on");
    else
    {
        if (m_all.size() == m_all.capacity()) // never for more than there will be
            m_all.reserve(std::min(most_steps, 2 * m_all.size() + 16));
        m_all.push_back(std::move(step));
    }
}

void Steps::lose(std::string why)
{
    m_all.clear();
    m_board.clear();
    if (m_lost.empty())
        m_lost = std::move(why);
}

} // namespace pmxboard
