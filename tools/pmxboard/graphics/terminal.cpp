// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/graphics/terminal.h"

#include <poll.h>
#include <signal.h>
#include <sys/ioctl.h>
#include <termios.h>
#include <unistd.h>

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

/** Cut out what begins and ends so; what stood between. */
std::optional<std::string> cut(std::string& text, std::string_view begin, std::string_view end)
{
    const std::size_t from = text.find(begin);
    if (from == text.npos)
        return std::nullopt;
    const std::size_t inner = from + begin.size();
    const std::size_t to = text.find(end, inner);
    if (to == text.npos)
        return std::nullopt;
    std::string between = text.substr(inner, to - inner);
    text.erase(from, to + end.size() - from);
    return between;
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

TerminalAnswer answer_in(std::string received)
{
    TerminalAnswer answer;
    if (const auto kitty = cut(received, "\x1b_Gi=31", "\x1b\\"))
        answer.kitty = kitty->ends_with(";OK");
    if (const auto attributes = cut(received, "\x1b[?", "c"))
    {
        answer.complete = true;
        // The first number is the terminal's class; its abilities come behind that.
        const std::size_t abilities = attributes->find(';');
        answer.sixel =
            abilities != attributes->npos && (attributes->substr(abilities) + ";").find(";4;") != attributes->npos;
    }
    answer.typed = std::move(received);
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
    while (!answer.complete)
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
