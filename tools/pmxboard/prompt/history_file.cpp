// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/prompt/history_file.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <iostream>
#include <sstream>
#include <utility>

#include "board/files.h"
#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
namespace
{

/** How a history begins, and nothing else does. */
constexpr std::string_view heading = "_HiStOrY_V2_\n";
constexpr std::size_t largest = 8 * board::files::mebibyte;

/** The file, open and locked: while one shell writes, the others wait. */
class Locked
{
public:
    Locked(const std::filesystem::path& file, int flags)
    {
        // Whoever has waited for the lock may find that the file has been replaced.
        do
        {
            shut();
            // Not to wait for a pipe that nobody reads.
            m_file = open(file.c_str(), flags | O_CLOEXEC | O_NONBLOCK, 0600);
            if (m_file < 0 || fstat(m_file, &m_status) != 0 || !S_ISREG(m_status.st_mode) ||
                flock(m_file, LOCK_EX) != 0 || fstat(m_file, &m_status) != 0)
            {
                shut();
                return;
            }
        }
        while (!is_called(file));
    }
    ~Locked() { shut(); }
    Locked(const Locked&) = delete;
    Locked& operator=(const Locked&) = delete;

    bool is_open() const { return m_file >= 0; }
    std::size_t size() const { return static_cast<std::size_t>(m_status.st_size); }
    bool append(std::string_view text) const
    {
        return write(m_file, text.data(), text.size()) == static_cast<ssize_t>(text.size());
    }

private:
    bool is_called(const std::filesystem::path& file) const
    {
        struct stat named
        {
        };
        return stat(file.c_str(), &named) == 0 && named.st_ino == m_status.st_ino && named.st_dev == m_status.st_dev;
    }

    void shut()
    {
        if (m_file >= 0)
            close(m_file);
        m_file = -1;
    }

    int m_file = -1;
    struct stat m_status
    {
    };
};

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

HistoryFile::HistoryFile(std::filesystem::path file, std::size_t most) : m_file(std::move(file))
{
    if (!m_file.empty())
        load(most);
}

void HistoryFile::load(std::size_t most)
{
    std::error_code error;
    if (!std::filesystem::exists(m_file, error))
        return;
    std::string text;
    try
    {
        if (!std::filesystem::is_regular_file(m_file, error))
            throw board::files::FileError(m_file.string() + " is no plain file");
        text = board::files::read(m_file, largest);
        if (!text.empty() && !text.starts_with(heading))
            throw board::files::FileError(m_file.string() + " is no history of this shell");
    }
    catch (const board::files::FileError& wrong)
    {
        std::cerr << "pmxboard: no history is kept: " << printable(wrong.what(), longest_message) << '\n';
        m_file.clear();
        return;
    }
    std::istringstream entries(text.substr(std::min(heading.size(), text.size())));
    for (std::string entry; std::getline(entries, entry);)
    {
        std::string line = history_line(entry);
        line.resize(std::min(line.size(), line.find('\0')));
        if (!line.empty())
            m_lines.push_back(std::move(line));
    }
    const bool is_long = m_lines.size() > 4 * most;
    if (m_lines.size() > most)
        m_lines.erase(m_lines.begin(), m_lines.end() - static_cast<std::ptrdiff_t>(most));
    if (!m_lines.empty())
        m_last = m_lines.back();
    if (is_long)
        shorten(text.size());
}

/** Now and then what nobody looks at any more goes. */
void HistoryFile::shorten(std::size_t size_when_read) const
{
    const Locked others(m_file, O_RDONLY);
    if (!others.is_open() || others.size() != size_when_read)
        return; // somebody has added to it: the next shell will do it
    std::string shorter(heading);
    for (const std::string& line : m_lines)
        shorter += history_entry(line) + "\n";
    try
    {
        NewFile file(m_file.string(), NewFile::Over::Anything);
        file.stream() << shorter;
        file.commit();
    }
    catch (const board::files::FileError& error)
    {
        std::cerr << "pmxboard: the history stays long: " << printable(error.what(), longest_message) << '\n';
    }
}

void HistoryFile::add(const std::string& line)
{
    if (m_file.empty() || line == m_last)
        return;
    m_last = line;
    const Locked file(m_file, O_WRONLY | O_APPEND | O_CREAT);
    if (!file.is_open())
        return;
    const std::string entry = history_entry(line) + "\n";
    file.append(file.size() == 0 ? std::string(heading) + entry : entry);
}

} // namespace pmxboard
