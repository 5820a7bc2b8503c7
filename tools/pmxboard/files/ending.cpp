// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/files/ending.h"

#include <fcntl.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <climits>
#include <cstring>
#include <exception>
#include <iterator>
#include <string>

namespace pmxboard
{
namespace
{

/** An unfinished file's name, where a signal handler can read it. */
struct Temporary
{
    std::atomic<pid_t> owner{ 0 }; ///< 0: the place is free
    char name[PATH_MAX] = {};
    void (*write_rest)(void* writer) = nullptr;
    void* writer = nullptr;
};

Temporary temporaries[4];
char place_now[512] = "pmxboard";

constexpr int breakdowns[] = { SIGSEGV, SIGBUS, SIGFPE, SIGILL, SIGABRT, SIGTRAP, SIGSYS };
constexpr int interrupts[] = { SIGINT, SIGTERM, SIGHUP, SIGQUIT };
constexpr int code_of_signal = 128; ///< as shells have it
constexpr int code_of_failed_step = 1;

/* What follows runs in signal handlers: system calls alone. */

void say(const char* text)
{
    [[maybe_unused]] const ssize_t ignored = write(STDERR_FILENO, text, std::strlen(text));
}

/** How many bytes belong to a character of UTF-8 behind its first one. */
unsigned bytes_behind(unsigned char first)
{
    return first < 0xC2 || first > 0xF4 ? 0 : first >= 0xF0 ? 3 : first >= 0xE0 ? 2 : 1;
}

/** What somebody else has written, without what a terminal would obey. */
void say_foreign(const char* text)
{
    char line[1024];
    std::size_t size = 0;
    unsigned open = 0; // bytes that the character which has begun still lacks
    unsigned char before = 0;
    for (; *text != '\0' && size + 1 < sizeof line; ++text)
    {
        const auto byte = static_cast<unsigned char>(*text);
        const bool goes_on = open > 0 && (byte & 0xC0) == 0x80;
        const bool is_of_two = goes_on && before == 0xC2;
        const bool is_high_control = byte >= 0x80 && byte < 0xA0 && (!goes_on || is_of_two);
        if (is_high_control && is_of_two)
            --size;
        line[size++] = byte < ' ' || byte == 0x7F || is_high_control ? '?' : *text;
        open = goes_on ? open - 1 : bytes_behind(byte);
        before = byte;
    }
    line[size] = '\0';
    say(line);
}

void remove(const Temporary& temporary)
{
    unlink(temporary.name);
}

void keep_what_can_be_kept(const Temporary& temporary)
{
    if (temporary.write_rest == nullptr)
    {
        remove(temporary);
        return;
    }
    temporary.write_rest(temporary.writer);
    say("pmxboard: what was written until then is in ");
    say_foreign(temporary.name);
    say("\n");
}

void for_each_temporary(void (*action)(const Temporary&))
{
    for (const Temporary& temporary : temporaries)
    {
        if (temporary.owner == getpid())
            action(temporary);
    }
}

void on_closed_pipe(int number)
{
    for_each_temporary(remove);
    _exit(code_of_signal + number);
}

void on_interrupt(int number)
{
    // Ctrl-C is for somebody who wants none of it.
    for_each_temporary(number == SIGINT ? remove : keep_what_can_be_kept);
    signal(number, SIG_DFL);
    raise(number);
}

void on_breakdown(int number)
{
    say_foreign(place_now);
    say(": the step broke the program down: ");
    say(number == SIGSEGV   ? "memory that is not there (SIGSEGV)"
        : number == SIGBUS  ? "memory that is not there (SIGBUS)"
        : number == SIGFPE  ? "a division that has no result (SIGFPE)"
        : number == SIGABRT ? "it gave up (SIGABRT)"
                            : "a signal");
    say("\n");
    for_each_temporary(keep_what_can_be_kept);
    _exit(code_of_failed_step);
}

void handle(int number, void (*handler)(int), int flags = 0)
{
    struct sigaction action
    {
    };
    action.sa_handler = handler;
    action.sa_flags = flags;
    sigemptyset(&action.sa_mask);
    sigaction(number, &action, nullptr);
}

/** Checked builds tell more about a breakdown than this does. */
bool is_checked_build()
{
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    return true;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(memory_sanitizer) || __has_feature(thread_sanitizer)
    return true;
#else
    return false;
#endif
#else
    return false;
#endif
}

/** Handlers run on a stack of their own: the usual one may be what has run out. */
void use_another_stack()
{
    static char memory[65536];
    stack_t stack{};
    stack.ss_sp = memory;
    stack.ss_size = sizeof memory;
    sigaltstack(&stack, nullptr);
}

/** An exception that nobody catches: it met code that knows none. */
[[noreturn]] void on_uncaught()
{
    say_foreign(place_now);
    say(": the step broke the program down: ");
    try
    {
        if (const auto error = std::current_exception())
            std::rethrow_exception(error);
        say("without an exception");
    }
    catch (const std::exception& error)
    {
        say_foreign(error.what());
    }
    catch (...)
    {
        say("something unknown was thrown");
    }
    say("\n");
    for_each_temporary(keep_what_can_be_kept);
    _exit(code_of_failed_step);
}

/** A file that is opened must not become the standard output of a program that was started without one. */
void open_what_is_closed()
{
    for (const int file : { STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO })
    {
        // The wrong way round, so that to use it goes on failing.
        if (fcntl(file, F_GETFD) < 0)
            open("/dev/null", file == STDIN_FILENO ? O_WRONLY : O_RDONLY);
    }
}

} // namespace

void end_in_order()
{
    open_what_is_closed();
    signal(SIGXFSZ, SIG_IGN);
    handle(SIGPIPE, on_closed_pipe);
    for (const int number : interrupts)
    {
        struct sigaction before
        {
        };
        sigaction(number, nullptr, &before);
        if (before.sa_handler != SIG_IGN) // nohup's wish
            handle(number, on_interrupt);
    }
    if (is_checked_build())
        return;
    use_another_stack();
    for (const int number : breakdowns)
        handle(number, on_breakdown, SA_ONSTACK | static_cast<int>(SA_RESETHAND));
    std::set_terminate(on_uncaught);
}

void set_place(std::string_view place)
{
    const std::size_t size = std::min(place.size(), sizeof place_now - 1);
    std::memcpy(place_now, place.data(), size);
    place_now[size] = '\0';
}

std::string current_place()
{
    return place_now;
}

void end_as_it_comes()
{
    if (is_checked_build())
        return;
    for (const int number : breakdowns)
        handle(number, SIG_DFL);
    std::set_terminate(std::abort);
}

void remember_temporary(const char* name, void (*write_rest)(void* writer), void* writer)
{
    for (Temporary& temporary : temporaries)
    {
        if (temporary.owner != 0 || std::strlen(name) >= sizeof temporary.name)
            continue;
        std::strcpy(temporary.name, name);
        temporary.write_rest = write_rest;
        temporary.writer = writer;
        temporary.owner = getpid();
        return;
    }
}

void forget_temporary(const char* name)
{
    for (Temporary& temporary : temporaries)
    {
        if (std::strcmp(temporary.name, name) == 0)
            temporary.owner = 0;
    }
}

InterruptsWait::InterruptsWait()
{
    sigset_t waiting;
    sigemptyset(&waiting);
    for (const int number : interrupts)
        sigaddset(&waiting, number);
    pthread_sigmask(SIG_BLOCK, &waiting, &m_before);
}

InterruptsWait::~InterruptsWait()
{
    pthread_sigmask(SIG_SETMASK, &m_before, nullptr);
}

} // namespace pmxboard
