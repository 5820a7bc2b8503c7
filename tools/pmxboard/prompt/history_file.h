// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The shell's history as a file, which several shells may keep at once: each line is added to its end. */
#pragma once

#include <cstddef>
#include <filesystem>
#include <string>
#include <vector>

namespace pmxboard
{

class HistoryFile
{
public:
    /** @param file  empty: nothing is kept
     *  @param most  lines that are of interest */
    HistoryFile(std::filesystem::path file, std::size_t most);

    /** What was there when the shell began, the oldest line first. */
    const std::vector<std::string>& lines() const { return m_lines; }
    /** Add a line; not one that repeats the last. */
    void add(const std::string& line);

private:
    void load(std::size_t most);
    void shorten(std::size_t size_when_read) const;

    std::filesystem::path m_file; ///< empty as well when it is somebody else's: that is told, and left alone
    std::vector<std::string> m_lines;
    std::string m_last;
};

/** A line in the file: without blanks and backslashes, which are written \040 and \134, like any byte that is no
 *  letter. */
std::string history_entry(const std::string& line);
/** The reverse. */
std::string history_line(const std::string& entry);

} // namespace pmxboard
