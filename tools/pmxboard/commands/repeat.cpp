// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/repeat.h"

#include <string_view>

namespace pmxboard
{
namespace
{

/** A word as a shell takes it. */
std::string shell_word(const std::string& word)
{
    constexpr std::string_view plain = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789._-/+,:=@%";
    if (!word.empty() && word.find_first_not_of(plain) == word.npos)
        return word;
    std::string quoted = "'";
    for (const char c : word)
        quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return quoted + "'";
}

} // namespace

std::string repeat_command(const std::string& board, const std::string& file)
{
    return "pmxboard run " + (board.empty() ? "" : "--board " + shell_word(board) + " ") + shell_word(file);
}

} // namespace pmxboard
