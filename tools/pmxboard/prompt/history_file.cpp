// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/prompt/history_file.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <iostream>
#include <sstream>
#include <thread>
#include <utility>

#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
namespace
{

using board::files::FileError;

/** How a history begins, and nothing else does. */
constexpr std::string_view heading = "_HiStOrY_V2_\n";
/** What is longer is shortened, so that it never comes near to the largest that is read. */
constexpr std::size_t long_enough = 4 * board::files::mebibyte;
constexpr std::size_t largest = 2 * long_enough;
/** What is longer was pasted by mistake. */
constexpr std::size_t longest_entry = 16384;
/** Another shell needs the file for a moment only. */
constexpr std::chrono::seconds patience{ 3 };

[[noreturn]] void cannot_write(const std::filesystem::path& file, const char* why)
{
    throw FileError("cannot write " + file.string() + ": " + why);
}

class Descriptor
{
public:
    Descriptor() = default;
    ~Descriptor() { reset(-1); }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;

    int get() const { return m_number; }
    void reset(int number)
    {
        if (m_number >= 0)
            close(m_number);
        m_number = number;
    }

private:
    int m_number = -1;
};

/** The file, open and locked: while one shell writes, the others wait. Throws FileError. */
class Locked
{
public:
    explicit Locked(const std::filesystem::path& file) : m_name(file)
    {
        const auto limit = std::chrono::steady_clock::now() + patience;
        while (!is_had() && std::chrono::steady_clock::now() < limit)
            std::this_thread::sleep_for(std::chrono::milliseconds(2));
        if (m_file.get() < 0)
            cannot_write(m_name, "another program keeps it locked");
        if (size() != 0 && read_at(0, heading.size()) != heading)
            throw FileError(m_name.string() + " is no history of this shell");
    }

    std::size_t size() const { return static_cast<std::size_t>(m_status.st_size); }

    /** The whole entry, or nothing of it. */
    void append(const std::string& entry) const
    {
        std::string text = size() == 0 ? std::string(heading) : std::string();
        // A shell that was killed has left a part of its entry.
        if (size() != 0 && read_at(size() - 1, 1) != "\n")
            text = "\n";
        text += entry + "\n";
        const ssize_t written = write(m_file.get(), text.data(), text.size());
        if (written == static_cast<ssize_t>(text.size()))
            return;
        const int error = written < 0 ? errno : ENOSPC;
        if (written > 0 && ftruncate(m_file.get(), m_status.st_size) != 0)
            cannot_write(m_name, "its last line is in part there");
        cannot_write(m_name, std::strerror(error));
    }

private:
    /** Open and locked; false when somebody else has it, or has replaced it meanwhile. */
    bool is_had()
    {
        // Not to wait for a pipe that nobody reads.
        m_file.reset(open(m_name.c_str(), O_RDWR | O_APPEND | O_CREAT | O_CLOEXEC | O_NONBLOCK | O_NOCTTY, 0600));
        if (m_file.get() < 0)
            cannot_write(m_name, std::strerror(errno));
        // Where there are no locks, nobody else has it.
        const bool is_taken = flock(m_file.get(), LOCK_EX | LOCK_NB) != 0 && (errno == EWOULDBLOCK || errno == EINTR);
        if (fstat(m_file.get(), &m_status) != 0)
            cannot_write(m_name, std::strerror(errno));
        if (!S_ISREG(m_status.st_mode))
            cannot_write(m_name, "it is no plain file");
        if (!is_taken && is_called_so())
            return true;
        m_file.reset(-1);
        return false;
    }

    bool is_called_so() const
    {
        struct stat named
        {
        };
        return stat(m_name.c_str(), &named) == 0 && named.st_ino == m_status.st_ino && named.st_dev == m_status.st_dev;
    }

    std::string read_at(std::size_t place, std::size_t count) const
    {
        std::string text(count, '\0');
        const ssize_t got = pread(m_file.get(), text.data(), count, static_cast<off_t>(place));
        text.resize(got > 0 ? static_cast<std::size_t>(got) : 0);
        return text;
    }

    std::filesystem::path m_name;
    Descriptor m_file;
    struct stat m_status
    {
    };
};

/** The entries of a history, the oldest first. Throws FileError when it is none. */
std::vector<std::string> read_entries(const std::filesystem::path& file)
{
    const std::string text = board::files::read(file, largest);
    if (!text.empty() && !text.starts_with(heading))
        throw FileError(file.string() + " is no history of this shell");
    std::vector<std::string> entries;
    std::istringstream lines(text.substr(std::min(heading.size(), text.size())));
    for (std::string entry; std::getline(lines, entry);)
        entries.push_back(std::move(entry));
    return entries;
}

/** Now and then what nobody looks at any more goes. Throws FileError. */
void shorten(const std::filesystem::path& file, std::size_t most)
{
    const Locked others(file);
    const std::vector<std::string> entries = read_entries(file);
    auto first = entries.end();
    std::size_t size = 0;
    while (first != entries.begin() && entries.end() - first < static_cast<std::ptrdiff_t>(most) &&
           size + (first - 1)->size() < long_enough / 2)
        size += (--first)->size() + 1;
    NewFile shorter(file.string(), NewFile::Over::Anything);
    shorter.stream() << heading;
    for (; first != entries.end(); ++first)
        shorter.stream() << *first << '\n';
    shorter.commit();
}

bool is_octal(char c)
{
    return c >= '0' && c <= '7';
}

} // namespace

std::string history_entry(const std::string& line)
{
    std::string entry;
    for (const char c : line)
    {
        const auto byte = static_cast<unsigned char>(c);
        if (byte > ' ' && byte < 0x7F && c != '\\')
            entry += c;
        else
            entry.append({ '\\', static_cast<char>('0' + (byte >> 6)), static_cast<char>('0' + (byte >> 3 & 7)),
                           static_cast<char>('0' + (byte & 7)) });
    }
    return entry;
}

std::string history_line(const std::string& entry)
{
    std::string line;
    for (std::size_t i = 0; i < entry.size(); ++i)
    {
        const bool is_code = entry[i] == '\\' && i + 3 < entry.size() && is_octal(entry[i + 1]) &&
                             is_octal(entry[i + 2]) && is_octal(entry[i + 3]);
        if (!is_code)
        {
            line += entry[i];
            continue;
        }
        line += static_cast<char>((entry[i + 1] - '0') * 64 + (entry[i + 2] - '0') * 8 + (entry[i + 3] - '0'));
        i += 3;
    }
    return line;
}

HistoryFile::HistoryFile(std::filesystem::path file, std::size_t most) : m_file(std::move(file)), m_most(most)
{
    try
    {
        if (!m_file.empty())
            load();
    }
    catch (const FileError& wrong)
    {
        give_up(wrong);
    }
}

void HistoryFile::load()
{
    std::error_code error;
    const auto status = std::filesystem::status(m_file, error);
    if (!std::filesystem::exists(status))
        return; // or it is not seen: then it cannot be written either, which is told
    if (!std::filesystem::is_regular_file(status))
        throw FileError(m_file.string() + " is no plain file");
    const std::vector<std::string> entries = read_entries(m_file);
    for (const std::string& entry : entries)
    {
        std::string line = history_line(entry);
        line.resize(std::min(line.size(), line.find('\0')));
        if (!line.empty())
            m_lines.push_back(std::move(line));
    }
    if (m_lines.size() > m_most)
        m_lines.erase(m_lines.begin(), m_lines.end() - static_cast<std::ptrdiff_t>(m_most));
    if (!m_lines.empty())
        m_last = m_lines.back();
    if (entries.size() > 4 * m_most)
        shorten(m_file, m_most);
}

void HistoryFile::add(const std::string& line)
{
    if (m_file.empty() || line == m_last)
        return;
    m_last = line;
    const std::string entry = history_entry(line);
    if (entry.size() > longest_entry)
        return;
    try
    {
        append(entry);
    }
    catch (const FileError& wrong)
    {
        give_up(wrong);
    }
}

void HistoryFile::append(const std::string& entry) const
{
    if (const Locked file(m_file); file.size() < long_enough)
    {
        file.append(entry);
        return;
    }
    shorten(m_file, m_most);
    Locked(m_file).append(entry);
}

/** Told once; the shell goes on without. */
void HistoryFile::give_up(const FileError& why)
{
    std::cerr << "pmxboard: no history is kept: " << printable(why.what(), longest_message) << '\n';
    m_file.clear();
}

} // namespace pmxboard
