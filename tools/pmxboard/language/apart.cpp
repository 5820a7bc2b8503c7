// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/language/apart.h"

#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <ostream>
#include <stdexcept>
#include <streambuf>

#include "tools/pmxboard/files/ending.h"

namespace pmxboard
{
namespace
{

/** A file in memory that parent and copy both have. Nothing waits for anybody, however much is written. */
class MemoryFile
{
public:
    MemoryFile() : m_file(memfd_create("pmxboard", MFD_CLOEXEC))
    {
        if (m_file < 0)
            throw std::runtime_error(std::string("no memory for a copy of the process: ") + std::strerror(errno));
    }
    ~MemoryFile() { close(m_file); }
    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;

    void write(const char* text, std::size_t size) const
    {
        while (size > 0)
        {
            const ssize_t written = ::write(m_file, text, size);
            if (written <= 0)
                return;
            text += written;
            size -= static_cast<std::size_t>(written);
        }
    }

    std::string content() const
    {
        std::string text;
        char part[4096];
        ssize_t size = 0;
        while ((size = pread(m_file, part, sizeof part, static_cast<off_t>(text.size()))) > 0)
            text.append(part, static_cast<std::size_t>(size));
        return text;
    }

private:
    int m_file;
};

/** Writes through at once, so that nothing is lost when the process dies. */
class MemoryStream : public std::streambuf
{
public:
    explicit MemoryStream(const MemoryFile& file) : m_file(file) {}

protected:
    int_type overflow(int_type c) override
    {
        if (!traits_type::eq_int_type(c, traits_type::eof()))
        {
            const char one = traits_type::to_char_type(c);
            m_file.write(&one, 1);
        }
        return traits_type::not_eof(c);
    }
    std::streamsize xsputn(const char* text, std::streamsize size) override
    {
        m_file.write(text, static_cast<std::size_t>(size));
        return size;
    }

private:
    const MemoryFile& m_file;
};

[[noreturn]] void be_the_copy(const std::function<std::string(std::ostream&)>& function, const MemoryFile& shown,
                              const MemoryFile& answer)
{
    end_as_it_comes();
    prctl(PR_SET_PDEATHSIG, SIGKILL); // nobody would hear what it finds
    MemoryStream buffer(shown);
    std::ostream stream(&buffer);
    const std::string text = function(stream);
    answer.write(text.data(), text.size());
    // Without the parent's clean-up: its files, its screen and its board are none of the copy's business.
    _exit(0);
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
    const MemoryFile shown;
    const MemoryFile answer;
    std::fflush(nullptr); // or what waits in the buffers could be written by both
    const pid_t copy = fork();
    if (copy < 0)
        throw std::runtime_error(std::string("no copy of the process: ") + std::strerror(errno));
    if (copy == 0)
        be_the_copy(function, shown, answer);
    int status = 0;
    while (waitpid(copy, &status, 0) < 0)
    {
        if (errno != EINTR)
            throw std::runtime_error(std::string("lost the copy of the process: ") + std::strerror(errno));
    }
    return { shown.content(), answer.content(), death_of(status) };
}

} // namespace pmxboard
