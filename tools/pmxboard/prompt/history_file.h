// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The shell's history as a file, which several shells may keep at once: each line is added to its end. */
#pragma once

#include <cstddef>
#include <filesystem>
#include <string>
#include <vector>

#include "board/files.h"

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
    void load();
    void append(const std::string& entry) const;
    void give_up(const board::files::FileError& why);

    std::filesystem::path m_file; ///< empty as well when it cannot be used: that is told, and it is left alone
    std::size_t m_most;
    std::vector<std::string> m_lines;
    std::string m_last;
};

/** A line in the file: without blanks and backslashes, which are written \040 and \134, like any byte that is no
 *  letter. */
std::string history_entry(const std::string& line);
/** The reverse. */
std::string history_line(const std::string& entry);

} // namespace pmxboard
