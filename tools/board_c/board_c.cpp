// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The board for C programs: the tool's language, and the trace, behind functions without exceptions.
#include "board/board_c.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <exception>
#include <stdexcept>
#include <string>
#include <utility>

#include "board/board.h"
#include "board/threads.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/status.h"
#include "tools/pmxboard/text/printable.h"

namespace
{

/** What C programs drive the board by: a scenario that shows nothing. */
struct Bench
{
    pmxboard::Output output{ pmxboard::OutputOptions{ .quiet = true } };
    pmxboard::Session session{ output, "default", "." };
};

Bench* bench; ///< from the first power-on to the end of the process
bool console_shown;

std::string& last_error()
{
    static std::string instance;
    return instance;
}

void tell(const char* what)
{
    last_error() = pmxboard::presentable(what);
    std::fprintf(stderr, "%s\n", last_error().c_str());
}

/** Whether the action was done; a C program has nobody who catches, so what went wrong is told here. */
template <typename Action>
bool is_done(const Action& action) noexcept
{
    try
    {
        action();
        return true;
    }
    catch (const std::exception& error)
    {
        tell(error.what());
    }
    catch (...)
    {
        tell("something unknown went wrong");
    }
    return false;
}

template <typename Action>
int done_or_failed(const Action& action) noexcept
{
    return is_done(action) ? 0 : -1;
}

pmxboard::Session& session()
{
    if (bench == nullptr)
        throw std::runtime_error("the board has no power: board_c_power_on comes first");
    return bench->session;
}

bool is_inside_a_call()
{
    return board::threads::context().depth != 0;
}

/** What cannot be done while the layer waits for an answer of the platform. */
void need_outside(const char* function)
{
    if (is_inside_a_call())
        throw std::runtime_error(std::string(function) + " waits until the platform's call has ended");
}

/** Carry a command out in the middle of a call. */
void run_inside(pmxboard::Session& running, const pmxboard::Line& line)
{
    for (const char* const outermost : { "expect", "power-on", "include", "what-if" })
    {
        if (line.word(0) == outermost)
            need_outside(outermost);
    }
    if (!pmxboard::only_looks(line))
        running.lose_steps("the program gave a command in the middle of a call");
    running.run_meanwhile(line);
}

/** A text that goes in. */
std::string given(const char* text, const char* what)
{
    if (text == nullptr || *text == '\0')
        throw std::runtime_error(std::string("no ") + what + " is given");
    return text;
}

std::string given_line(const char* text, const char* what)
{
    std::string line = given(text, what);
    if (line.find_first_of("\r\n") != line.npos)
        throw std::runtime_error(std::string("one ") + what + " at a time: this one has a line end in it");
    return line;
}

void need_place(const void* place, const char* what)
{
    if (place == nullptr)
        throw std::runtime_error(std::string("no place for ") + what + " is given");
}

/** What only might happen, or happens once more on the way to a saved state, nobody has asked for. */
void show_console()
{
    if (console_shown)
        board::set_console([](std::string_view text) {
            if (bench == nullptr || !(bench->session.imagines() || bench->session.is_restoring()))
                std::fwrite(text.data(), 1, text.size(), stdout);
        });
    else
        board::set_console({});
}

board::TraceEntry entry_at(unsigned number)
{
    const auto window = session().window();
    if (number >= window.size())
        throw std::runtime_error("there is no entry " + std::to_string(number) + "; there are " +
                                 std::to_string(window.size()));
    return window[number];
}

board::Value argument_of(const board::TraceEntry& entry, const std::string& name)
{
    std::string names;
    for (const board::TraceArgument& argument : entry.arguments)
    {
        if (argument.name == name)
            return argument.value;
        names += (names.empty() ? "; it has " : ", ") + argument.name;
    }
    throw std::runtime_error(entry.function + " has no argument " + name + names);
}

/** A line that can mean an entry: one that never can would count none. */
std::string entry_line(const char* text)
{
    std::string line = given_line(text, "call");
    static_cast<void>(board::TraceEntry{}.matches(line)); // it can be read
    const std::size_t bracket = line.find('(');
    if (bracket < line.find('"') && !line.starts_with("SET "))
        pmxboard::need_platform_function(line.substr(0, line.find_last_not_of(' ', bracket - 1) + 1));
    return line;
}

long long number_of(const board::Value& value, const std::string& what)
{
    if (value.kind() != board::Value::Kind::Number)
        throw std::runtime_error(what + " is no number: " + value.to_text());
    return value.as_number();
}

} // namespace

int board_c_power_on(const char* szBoard)
{
    return done_or_failed([szBoard] {
        need_outside("board_c_power_on");
        const std::string board = given(szBoard, "board");
        board::load_description(board); // while the one that is there can still go on
        delete std::exchange(bench, nullptr);
        bench = new Bench;
        show_console();
        bench->session.watch_changes(false);
        bench->session.power_on(board);
        bench->session.notice_others();
    });
}

int board_c_finish(void)
{
    return done_or_failed([] {
        need_outside("board_c_finish");
        session().finish();
        board::meanwhiles::rethrow_failure();
    });
}

const char* board_c_error(void)
{
    return last_error().c_str();
}

int board_c_do(const char* szLine)
{
    return done_or_failed([szLine] {
        pmxboard::Session& running = session();
        const pmxboard::Line line(given_line(szLine, "command"));
        if (line.empty())
            throw std::runtime_error("no command is given");
        if (is_inside_a_call())
            return run_inside(running, line);
        try
        {
            running.run_line(line.from(0));
        }
        catch (...)
        {
            running.open_window();
            throw;
        }
        running.open_window();
    });
}

int board_c_advance(unsigned uMilliseconds)
{
    return done_or_failed([uMilliseconds] {
        session().lose_steps("the program let time pass by board_c_advance; the command is advance");
        board::advance(std::chrono::milliseconds(uMilliseconds));
        board::meanwhiles::rethrow_failure();
    });
}

int board_c_meanwhile(const char* szFunction, unsigned uCall, int iAsThread, void (*pfAction)(void* pvArgument),
                      void* pvArgument)
{
    return done_or_failed([=] {
        session();
        std::string function = given(szFunction, "platform function");
        if (pfAction == nullptr)
            throw std::runtime_error("no action is given");
        session().lose_steps("the program armed an action of its own by board_c_meanwhile");
        board::meanwhile(std::move(function), uCall, [=] { pfAction(pvArgument); }, { .thread = iAsThread != 0 });
    });
}

int board_c_forget(void)
{
    return done_or_failed([] {
        need_outside("board_c_forget");
        session().begin_window();
    });
}

int board_c_expect(const char* szExpectation)
{
    return done_or_failed([szExpectation] {
        need_outside("board_c_expect");
        session().run_line("expect " + given_line(szExpectation, "expectation"));
    });
}

int board_c_count(const char* szCall)
{
    int count = 0;
    const bool is_counted = is_done([&] {
        const std::string line = entry_line(szCall);
        for (const board::TraceEntry& entry : session().window())
            count += entry.matches(line) ? 1 : 0;
    });
    return is_counted ? count : -1;
}

unsigned board_c_entries(void)
{
    std::size_t count = 0;
    is_done([&count] { count = session().window().size(); });
    return static_cast<unsigned>(count);
}

int board_c_entry(unsigned uEntry, BOARD_C_ENTRY_T* prEntry)
{
    return done_or_failed([=] {
        static board::TraceEntry entry;
        static std::string line;
        need_place(prEntry, "the entry");
        entry = entry_at(uEntry);
        line = entry.brief();
        *prEntry = { static_cast<int>(entry.kind),
                     line.c_str(),
                     entry.function.c_str(),
                     entry.text.c_str(),
                     entry.operation.c_str(),
                     entry.time_us,
                     entry.depth,
                     static_cast<unsigned>(entry.arguments.size()),
                     entry.result ? 1 : 0,
                     entry.result ? entry.result->as_number() : 0,
                     entry.faulted ? 1 : 0 };
    });
}

const char* board_c_argument(unsigned uEntry, const char* szArgument)
{
    static std::string text;
    const bool is_read =
        is_done([&] { text = argument_of(entry_at(uEntry), given(szArgument, "argument")).to_text(); });
    return is_read ? text.c_str() : nullptr;
}

int board_c_argument_number(unsigned uEntry, const char* szArgument, long long* pi8Number)
{
    return done_or_failed([=] {
        need_place(pi8Number, "the number");
        *pi8Number = number_of(argument_of(entry_at(uEntry), given(szArgument, "argument")), szArgument);
    });
}

int board_c_print_entries(void)
{
    return done_or_failed([] {
        for (const board::TraceEntry& entry : session().window())
            std::printf("%10llu us  %*s%s\n", static_cast<unsigned long long>(entry.time_us),
                        static_cast<int>(2 * entry.depth), "", pmxboard::printable(entry.brief()).c_str());
    });
}

const char* board_c_state(const char* szPath)
{
    static std::string text;
    const bool is_read = is_done([&] {
        session();
        text = pmxboard::state_at(given(szPath, "path")).to_text();
    });
    return is_read ? text.c_str() : nullptr;
}

int board_c_state_number(const char* szPath, long long* pi8Number)
{
    return done_or_failed([=] {
        session();
        need_place(pi8Number, "the number");
        *pi8Number = number_of(pmxboard::state_at(given(szPath, "path")), szPath);
    });
}

const char* board_c_status(void)
{
    static std::string text;
    const bool is_read = is_done([] {
        session();
        const auto status = pmxboard::status_of(pmxboard::whole_state(), board::description().name);
        text = pmxboard::to_text(status, pmxboard::StatusPart::All, {});
    });
    return is_read ? text.c_str() : nullptr;
}

int board_c_is_replaced(const char* szFunction)
{
    int answer = -1;
    is_done([&] {
        const std::string function = given(szFunction, "platform function");
        pmxboard::need_platform_function(function);
        const auto replaced = board::replaced_functions();
        answer = std::find(replaced.begin(), replaced.end(), function) != replaced.end() ? 1 : 0;
    });
    return answer;
}

void board_c_show_console(int iShown)
{
    console_shown = iShown != 0;
    is_done(show_console);
}

void board_c_console_level(int iLevel)
{
    board::set_console_level(iLevel);
}

const char* board_c_console(void)
{
    static std::string text;
    return is_done([] { text = session().console_window(); }) ? text.c_str() : nullptr;
}

unsigned board_c_asserts(void)
{
    return board::asserts();
}

unsigned board_c_misuses(void)
{
    return board::misuses();
}
