// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/files.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <istream>
#include <set>
#include <sstream>
#include <streambuf>
#include <utility>

namespace board::files
{
namespace
{

/** Files that this process reads, by device and number: one file may have many names. */
std::set<std::pair<dev_t, ino_t>>& inputs()
{
    static std::set<std::pair<dev_t, ino_t>> instance;
    return instance;
}

void note(const struct stat& status)
{
    if (S_ISREG(status.st_mode))
        inputs().insert({ status.st_dev, status.st_ino });
}

[[noreturn]] void cannot_read(const std::string& name)
{
    if (errno == EISDIR)
        throw FileError(name + " is a directory");
    throw FileError("cannot read " + name + ": " + std::strerror(errno));
}

/** A file that is open for reading. */
class Reader
{
public:
    explicit Reader(std::string name, bool is_noted = true)
        : m_name(std::move(name)), m_file(open(m_name.c_str(), O_RDONLY | O_CLOEXEC)), m_is_noted(is_noted)
    {
        if (m_file < 0)
            cannot_read(m_name);
        look();
    }
    /** The standard input, which stays open. */
    Reader() : m_name("the standard input"), m_file(STDIN_FILENO), m_is_own(false) { look(); }
    ~Reader()
    {
        if (m_is_own)
            close(m_file);
    }
    Reader(const Reader&) = delete;
    Reader& operator=(const Reader&) = delete;

    bool is_plain() const { return m_is_plain; }

    /** What there is, at least a byte; 0 at the end. */
    std::size_t read_some(char* into, std::size_t size) const
    {
        ssize_t count = 0;
        while ((count = ::read(m_file, into, size)) < 0)
        {
            if (errno != EINTR)
                cannot_read(m_name);
        }
        return static_cast<std::size_t>(count);
    }

    std::string read_all(std::size_t most) const
    {
        std::string text;
        char part[65536];
        while (const std::size_t count = read_some(part, sizeof part))
        {
            if (count > most - text.size())
                throw FileError(m_name + " is larger than " + std::to_string(most / mebibyte) + " MiB");
            text.append(part, count);
        }
        return text;
    }

    std::string read_start(std::size_t most) const
    {
        std::string text;
        char part[65536];
        while (const std::size_t count = read_some(part, std::min(sizeof part, most - text.size())))
            text.append(part, count);
        return text;
    }

private:
    void look()
    {
        struct stat status
        {
        };
        if (fstat(m_file, &status) != 0)
            cannot_read(m_name);
        m_is_plain = S_ISREG(status.st_mode);
        if (m_is_noted)
            note(status);
    }

    std::string m_name;
    int m_file;
    bool m_is_own = true;
    bool m_is_noted = true;
    bool m_is_plain = false;
};

/** Hands on what comes, when it comes. */
class ReaderBuffer : public std::streambuf
{
public:
    explicit ReaderBuffer(std::unique_ptr<Reader> reader) : m_reader(std::move(reader)) {}

protected:
    int_type underflow() override
    {
        const std::size_t count = m_reader->read_some(m_part, sizeof m_part);
        setg(m_part, m_part, m_part + count);
        return count == 0 ? traits_type::eof() : traits_type::to_int_type(*m_part);
    }

private:
    std::unique_ptr<Reader> m_reader;
    char m_part[4096];
};

/** A stream that owns its buffer. */
class ReaderStream : public std::istream
{
public:
    explicit ReaderStream(std::unique_ptr<Reader> reader) : std::istream(nullptr), m_buffer(std::move(reader))
    {
        rdbuf(&m_buffer);
    }

private:
    ReaderBuffer m_buffer;
};

std::unique_ptr<Reader> reader_of(const std::string& name)
{
    return name == "-" ? std::make_unique<Reader>() : std::make_unique<Reader>(name);
}

} // namespace

std::string read(const std::filesystem::path& file, std::size_t most)
{
    return Reader(file.string()).read_all(most);
}

std::string read_once(const std::filesystem::path& file, std::size_t most)
{
    return Reader(file.string(), false).read_all(most);
}

std::string read_start(const std::filesystem::path& file, std::size_t most)
{
    return Reader(file.string(), false).read_start(most);
}

std::string read_named(const std::string& name, std::size_t most)
{
    return reader_of(name)->read_all(most);
}

std::unique_ptr<std::istream> open_lines(const std::string& name)
{
    auto reader = reader_of(name);
    if (reader->is_plain())
        return std::make_unique<std::istringstream>(reader->read_all(largest));
    return std::make_unique<ReaderStream>(std::move(reader));
}

bool next_line(std::istream& lines, std::string& line)
{
    using Traits = std::istream::traits_type;
    line.clear();
    // From the buffer itself: the stream would keep to itself why a read has failed.
    std::streambuf& from = *lines.rdbuf();
    for (auto c = from.sbumpc(); !Traits::eq_int_type(c, Traits::eof()); c = from.sbumpc())
    {
        if (c == '\n')
            return true;
        if (line.size() == longest_line)
            throw FileError("a line is longer than " + std::to_string(longest_line) + " bytes: " + line.substr(0, 60));
        line += Traits::to_char_type(c);
    }
    return !line.empty();
}

void note_input(const std::filesystem::path& file)
{
    struct stat status
    {
    };
    if (stat(file.c_str(), &status) == 0)
        note(status);
}

bool is_input(const std::filesystem::path& file)
{
    struct stat status
    {
    };
    return stat(file.c_str(), &status) == 0 && inputs().contains({ status.st_dev, status.st_ino });
}

} // namespace board::files
