/** @file
 *  What verbs read from their lines. A line that is written wrong is answered with the verb's usage. */
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <string>

#include "tools/pmxboard/line.h"

namespace pmxboard
{

/** Throws the usage of the verb that the line begins with, as a LineError. */
[[noreturn]] void wrong_usage(const Line& line);

/** The line has so many words, the verb among them. */
void need_words(const Line& line, std::size_t least, std::size_t most);

/** The platform has a function of this name. */
void need_platform_function(const std::string& name);

/** A plain number in a range. */
std::int64_t number_in(const std::string& word, const std::string& what, std::int64_t lowest, std::int64_t highest);

/** `on` or `off`. */
bool read_switch(const Line& line, const std::string& word);

/** A text in quotes. */
std::string read_text(const Line& line, const std::string& word);

/** `10s`, `500ms` or `2us`. */
std::chrono::microseconds read_time(const Line& line, const std::string& word);

} // namespace pmxboard
