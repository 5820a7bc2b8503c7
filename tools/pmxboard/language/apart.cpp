// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/language/apart.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <ostream>
#include <stdexcept>
#include <streambuf>

#include "tools/pmxboard/files/ending.h"

namespace pmxboard
{
namespace
{

/** From the copy to its parent, who reads while the copy runs: however much is written, it is kept in no file. */
class Channel
{
public:
    Channel()
    {
        if (pipe2(m_ends, O_CLOEXEC) != 0)
            throw std::runtime_error(std::string("no channel to a copy of the process: ") + std::strerror(errno));
    }
    ~Channel()
    {
        end_reading();
        end_writing();
    }
    Channel(const Channel&) = delete;
    Channel& operator=(const Channel&) = delete;

    void end_reading() { end(m_ends[0]); }
    void end_writing() { end(m_ends[1]); }

    void write(const char* text, std::size_t size) const
    {
        while (size > 0)
        {
            const ssize_t written = ::write(m_ends[1], text, size);
            if (written < 0 && errno == EINTR)
                continue;
            if (written <= 0)
                return;
            text += written;
            size -= static_cast<std::size_t>(written);
        }
    }

    /** What poll waits for; nothing when it has ended. */
    pollfd to_be_read() const { return { m_ends[0], POLLIN, 0 }; }

    /** What there is; the channel ends when there will be no more. */
    void read_into(std::string& text)
    {
        char part[65536];
        const ssize_t size = ::read(m_ends[0], part, sizeof part);
        if (size > 0)
            text.append(part, static_cast<std::size_t>(size));
        else if (size == 0 || errno != EINTR)
            end_reading();
    }

    bool has_ended() const { return m_ends[0] < 0; }

private:
    static void end(int& file)
    {
        if (file >= 0)
            close(file);
        file = -1;
    }

    int m_ends[2] = { -1, -1 };
};

/** Writes through at once, so that nothing is lost when the process dies. */
class ChannelStream : public std::streambuf
{
public:
    explicit ChannelStream(const Channel& channel) : m_channel(channel) {}

protected:
    int_type overflow(int_type c) override
    {
        if (!traits_type::eq_int_type(c, traits_type::eof()))
        {
            const char one = traits_type::to_char_type(c);
            m_channel.write(&one, 1);
        }
        return traits_type::not_eof(c);
    }
    std::streamsize xsputn(const char* text, std::streamsize size) override
    {
        m_channel.write(text, static_cast<std::size_t>(size));
        return size;
    }

private:
    const Channel& m_channel;
};

/** What it throws ends the copy: what is on the stack is the parent's. */
[[noreturn]] void be_the_copy(const std::function<std::string(std::ostream&)>& function, pid_t parent, Channel& shown,
                              Channel& answer) noexcept
{
    end_as_it_comes();
    prctl(PR_SET_PDEATHSIG, SIGKILL); // nobody would hear what it finds
    if (getppid() != parent)
        _exit(1); // it had died before
    shown.end_reading();
    answer.end_reading();
    ChannelStream buffer(shown);
    std::ostream stream(&buffer);
    const std::string text = function(stream);
    answer.write(text.data(), text.size());
    // Without the parent's clean-up: its files, its screen and its board are none of the copy's business.
    _exit(0);
}

/** Until both have ended, as they do when the copy does. */
void listen(Channel& shown, std::string& text, Channel& answer, std::string& answered)
{
    while (!shown.has_ended() || !answer.has_ended())
    {
        pollfd both[] = { shown.to_be_read(), answer.to_be_read() };
        if (poll(both, std::size(both), -1) < 0)
        {
            if (errno != EINTR)
                throw std::runtime_error(std::string("lost the copy of the process: ") + std::strerror(errno));
            continue;
        }
        if (both[0].revents != 0)
            shown.read_into(text);
        if (both[1].revents != 0)
            answer.read_into(answered);
    }
}

std::string death_of(int status)
{
    if (WIFSIGNALED(status))
        return strsignal(WTERMSIG(status));
    return WEXITSTATUS(status) == 0 ? std::string() : "exit code " + std::to_string(WEXITSTATUS(status));
}

} // namespace

Apart run_apart(const std::function<std::string(std::ostream& shown)>& function)
{
    Channel shown;
    Channel answer;
    std::fflush(nullptr); // or what waits in the buffers could be written by both
    const pid_t parent = getpid();
    const pid_t copy = fork();
    if (copy < 0)
        throw std::runtime_error(std::string("no copy of the process: ") + std::strerror(errno));
    if (copy == 0)
        be_the_copy(function, parent, shown, answer);
    shown.end_writing();
    answer.end_writing();
    Apart apart;
    listen(shown, apart.shown, answer, apart.answer);
    int status = 0;
    while (waitpid(copy, &status, 0) < 0)
    {
        if (errno != EINTR)
            throw std::runtime_error(std::string("lost the copy of the process: ") + std::strerror(errno));
    }
    apart.death = death_of(status);
    return apart;
}

} // namespace pmxboard
