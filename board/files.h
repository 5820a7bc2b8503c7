// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  How files are read here, all of them: with limits, and so that a read that failed is never taken for an end. */
#pragma once

#include <cstddef>
#include <filesystem>
#include <iosfwd>
#include <memory>
#include <stdexcept>
#include <string>

namespace board::files
{

/** A file that cannot be used: its name, and why. */
class FileError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

inline constexpr std::size_t mebibyte = std::size_t{ 1 } << 20;
/** More than any log, scenario or script has. */
inline constexpr std::size_t largest = 256 * mebibyte;
inline constexpr std::size_t longest_line = mebibyte;

/** All bytes of a file. Throws FileError. */
std::string read(const std::filesystem::path& file, std::size_t most = largest);
/** The same of a file that nobody looks at again: this process may write it. */
std::string read_once(const std::filesystem::path& file, std::size_t most = largest);
/** The first bytes of a file, at most so many; as read_once(), it is not remembered. */
std::string read_start(const std::filesystem::path& file, std::size_t most);
/** As read() where "-" is the standard input. */
std::string read_named(const std::string& name, std::size_t most = largest);

/** A file for next_line(), "-" being the standard input. It is opened once; a plain one is read at once, anything else
 *  as it comes, for somebody may be typing it. Throws FileError, now or when it is read. */
std::unique_ptr<std::istream> open_lines(const std::string& name);
/** The next line without its end; false when there is none. Throws FileError for one that is too long. */
bool next_line(std::istream& lines, std::string& line);

/** Remember a file as one that this process reads; reading it does so, too, but for read_once(). */
void note_input(const std::filesystem::path& file);
/** Whether the process reads this file, whatever it is called. */
bool is_input(const std::filesystem::path& file);

} // namespace board::files
