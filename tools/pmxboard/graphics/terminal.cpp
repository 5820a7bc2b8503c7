// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/graphics/terminal.h"

#include <poll.h>
#include <signal.h>
#include <sys/ioctl.h>
#include <termios.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <iostream>
#include <optional>

namespace pmxboard
{
namespace
{

/** Whether it would show a picture of one pixel. */
constexpr std::string_view kitty_question = "\x1b_Gi=31,s=1,v=1,a=q,t=d,f=24;AAAA\x1b\\";
/** The primary device attributes: every terminal answers that, and behind all that it was asked before. */
constexpr std::string_view attributes_question = "\x1b[c";
/** Reached by what is no terminal, or very far away. */
constexpr std::chrono::milliseconds longest_wait{ 2000 };

/** A terminal's answers are short; what is longer is none. */
constexpr std::size_t longest_answer = 1000;
/** Nobody types so much in that time: what is behind it stays with the terminal, and is read as keys are. */
constexpr std::size_t most_received = 65536;

/** What only a terminal sends: no key begins so. It may break off. */
struct Report
{
    std::string_view begin;
    std::string_view content;
    std::size_t length = 0;
    bool is_whole = false;
};

constexpr std::string_view kitty_begin = "\x1b_G";
constexpr std::string_view attributes_begin = "\x1b[?";

std::optional<Report> report_at(std::string_view text, std::string_view begin, bool (*is_content)(char),
                                std::string_view end)
{
    if (!text.starts_with(begin))
        return std::nullopt;
    const std::string_view rest = text.substr(begin.size(), longest_answer);
    const std::string_view content(rest.begin(), std::find_if_not(rest.begin(), rest.end(), is_content));
    const std::size_t length = begin.size() + content.size();
    const std::string_view behind = text.substr(length, end.size());
    const bool is_whole = behind == end;
    return Report{ begin, content, length + (end.starts_with(behind) ? behind.size() : 0), is_whole };
}

bool is_printed(char c)
{
    return c >= ' ' && c <= '~';
}

bool is_of_number(char c)
{
    return (c >= '0' && c <= '9') || c == ';';
}

std::optional<Report> report_at(std::string_view text)
{
    const auto kitty = report_at(text, kitty_begin, is_printed, "\x1b\\");
    return kitty ? kitty : report_at(text, attributes_begin, is_of_number, "c");
}

void take(TerminalAnswer& answer, const Report& report)
{
    const std::string_view content = report.content;
    if (!report.is_whole || answer.complete)
        return;
    if (report.begin == kitty_begin)
    {
        answer.kitty = answer.kitty || (content.starts_with("i=31;") && content.ends_with(";OK"));
        return;
    }
    answer.complete = true;
    // The first number is the terminal's class; its abilities come behind that.
    const std::size_t abilities = std::min(content.find(';'), content.size());
    answer.sixel = (std::string(content.substr(abilities)) + ";").find(";4;") != std::string::npos;
}

/** While it lives keys come as they are typed, all of them, and are not shown. No signal ends the tool meanwhile: the
 *  terminal would stay so. */
class PlainKeys
{
public:
    PlainKeys()
    {
        sigset_t all;
        sigfillset(&all);
        pthread_sigmask(SIG_BLOCK, &all, &m_signals);
        if (tcgetattr(STDIN_FILENO, &m_before) != 0)
            return;
        termios plain = m_before;
        plain.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO | ISIG | IEXTEN);
        plain.c_cc[VMIN] = 0;
        plain.c_cc[VTIME] = 0;
        m_are_plain = tcsetattr(STDIN_FILENO, TCSANOW, &plain) == 0;
    }

    ~PlainKeys()
    {
        if (m_are_plain)
            tcsetattr(STDIN_FILENO, TCSANOW, &m_before);
        pthread_sigmask(SIG_SETMASK, &m_signals, nullptr);
    }

    PlainKeys(const PlainKeys&) = delete;
    PlainKeys& operator=(const PlainKeys&) = delete;

    explicit operator bool() const { return m_are_plain; }

private:
    termios m_before{};
    sigset_t m_signals{};
    bool m_are_plain = false;
};

/** More of what comes; empty when nothing comes until then. */
std::string keys_until(std::chrono::steady_clock::time_point limit)
{
    const auto left = std::chrono::ceil<std::chrono::milliseconds>(limit - std::chrono::steady_clock::now());
    pollfd keys{ STDIN_FILENO, POLLIN, 0 };
    if (left.count() <= 0 || poll(&keys, 1, static_cast<int>(left.count())) <= 0)
        return {};
    std::array<char, 1024> bytes{};
    const ssize_t count = read(STDIN_FILENO, bytes.data(), bytes.size());
    return count <= 0 ? std::string() : std::string(bytes.data(), static_cast<std::size_t>(count));
}

} // namespace

TerminalAnswer answer_in(std::string_view received)
{
    TerminalAnswer answer;
    while (!received.empty())
    {
        if (const auto report = report_at(received))
        {
            take(answer, *report);
            received.remove_prefix(report->length);
            continue;
        }
        const std::size_t next = std::min(received.find('\x1b', 1), received.size());
        answer.typed += received.substr(0, next);
        received.remove_prefix(next);
    }
    return answer;
}

TerminalAnswer ask_terminal(bool kitty)
{
    const PlainKeys keys;
    if (!keys)
        return {};
    std::cout << (kitty ? kitty_question : "") << attributes_question << std::flush;
    const auto limit = std::chrono::steady_clock::now() + longest_wait;
    std::string received;
    TerminalAnswer answer;
    while (!answer.complete && received.size() < most_received)
    {
        const std::string more = keys_until(limit);
        if (more.empty())
            break;
        received += more;
        answer = answer_in(received);
    }
    return answer;
}

int pixels_of_columns(int columns)
{
    constexpr int usual_width = 10; // of a column
    winsize window{};
    const bool known = ioctl(STDOUT_FILENO, TIOCGWINSZ, &window) == 0 && window.ws_col != 0 && window.ws_xpixel != 0;
    return known ? columns * window.ws_xpixel / window.ws_col : columns * usual_width;
}

} // namespace pmxboard
