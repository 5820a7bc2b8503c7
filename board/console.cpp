// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The serial console: levelled and plain prints, assertions.
#include "board/console.h"

#include <algorithm>
#include <cstdarg>

#include "board/devices.h"
#include "board/format.h"

#include "u_os.h"

namespace
{

struct Console
{
    int level = 1;
    unsigned asserts = 0;
    unsigned held_back = 0; ///< lines that the level did not admit
    std::string text;
};

Console console_state;
std::function<void(std::string_view)> console_sink; // the viewer's, so it outlives the board's power

/** Formats a print's values; what the format gets wrong is the caller's misuse. */
std::string formatted(const CHAR* format, std::va_list values)
{
    board::Formatted made = board::format(format, values);
    if (!made.complaint.empty())
        board::report_misuse(std::move(made.complaint));
    return made.text;
}

} // namespace

namespace board
{

void set_console_level(int level)
{
    console_state.level = level;
}

int console_level()
{
    return console_state.level;
}

void set_console(std::function<void(std::string_view text)> sink)
{
    console_sink = std::move(sink);
}

std::string console_text()
{
    return console_state.text;
}

unsigned asserts()
{
    return console_state.asserts;
}

namespace console
{

void power_on(const Description& description)
{
    console_state = {};
    console_state.level = description.console_level;
}

Value state()
{
    Value value;
    value.add("level", Value::number(console_state.level));
    value.add("asserts", Value::number(console_state.asserts));
    value.add("held_back", Value::number(console_state.held_back));
    return value;
}

std::size_t printed()
{
    return console_state.text.size();
}

std::string printed(std::size_t begin, std::size_t end)
{
    begin = std::min(begin, console_state.text.size());
    return console_state.text.substr(begin, std::max(begin, end) - begin);
}

void forget()
{
    console_state.text.clear();
}

void print(std::string_view text)
{
    console_state.text += text;
    if (console_sink)
        console_sink(text);
}

} // namespace console
} // namespace board

extern "C" {

void PMX_IsLog(INT32 i4Level, const CHAR* szFormat, ...)
try
{
    BOARD_CALL(PMX_IsLog, i4Level, text(szFormat));
    std::va_list values;
    va_start(values, szFormat);
    const std::string line = formatted(szFormat, values);
    va_end(values);
    const bool shown = i4Level <= console_state.level;
    boardCall.log(i4Level, line, shown);
    if (shown)
        board::console::print(line);
    else
        ++console_state.held_back;
}
BOARD_CALL_END(PMX_IsLog)

void Printf(const CHAR* szFormat, ...)
try
{
    BOARD_CALL(Printf, text(szFormat));
    std::va_list values;
    va_start(values, szFormat);
    const std::string line = formatted(szFormat, values);
    va_end(values);
    boardCall.log(0, line, true);
    board::console::print(line);
}
BOARD_CALL_END(Printf)

void UTIL_Printf(const CHAR* szFormat, ...)
try
{
    BOARD_CALL(UTIL_Printf, text(szFormat));
    std::va_list values;
    va_start(values, szFormat);
    const std::string line = formatted(szFormat, values);
    va_end(values);
    boardCall.log(0, line, true);
    board::console::print(line);
}
BOARD_CALL_END(UTIL_Printf)

void Assert(const CHAR* szExpression, const CHAR* szFile, INT32 i4Line)
try
{
    BOARD_CALL(Assert, text(szExpression), text(szFile), i4Line);
    boardCall.assertion();
    ++console_state.asserts;
    const auto shown = [](const CHAR* text) { return text == nullptr ? "(null)" : text; };
    board::console::print("ASSERT " + std::string(shown(szExpression)) + ", " + shown(szFile) + ":" +
                          std::to_string(i4Line) + "\n");
}
BOARD_CALL_END(Assert)

} // extern "C"
