// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "fuzz/support/scenario.h"

#include <algorithm>
#include <cctype>
#include <chrono>
#include <sstream>
#include <stdexcept>

#include "board/duration.h"
#include "fuzz/support/holds.h"
#include "fuzz/support/place.h"
#include "tools/pmxboard/language/runner.h"

namespace fuzz
{
namespace
{

constexpr std::size_t most_lines = 150;
constexpr std::size_t most_copies = 2; ///< of the process, which what-if makes
constexpr auto longest_time = std::chrono::minutes(1);

bool is_long_time(const std::string& word)
try
{
    const auto time = board::read_duration(word);
    return time && *time > longest_time;
}
catch (const std::invalid_argument&)
{
    return false; // longer than any line may say
}

/** Whether a time stands anywhere in the line, within another command, too. */
bool takes_long(std::string_view line)
{
    std::string word;
    for (const char c : line)
    {
        if (std::isalnum(static_cast<unsigned char>(c)) != 0)
            word += c;
        else if (is_long_time(std::exchange(word, {})))
            return true;
    }
    return is_long_time(word);
}

bool has(std::string_view line, std::string_view part)
{
    return line.find(part) != line.npos;
}

/** Whether it names a file that may not be in the directory of its scenario, however that is quoted. */
bool leads_out(std::string_view line)
{
    if (!has(line, "flash") && !has(line, "power-on") && !has(line, "picture"))
        return false;
    return has(line, "..") || has(line, "\\") || has(line, " /") || has(line, "\t/") || has(line, "\"/");
}

/** Whether it writes pictures, or those in which others differ. */
bool draws(std::string_view line)
{
    return has(line, "shot") || (has(line, "expect") && has(line, "picture"));
}

/** Lines that are included would not have come through here, nor those of a saved state. */
bool includes(std::string_view line)
{
    return has(line, "include") || has(line, "restore");
}

} // namespace

std::string harmless(std::string_view bytes)
{
    std::string kept;
    std::size_t copies = 0;
    for (std::size_t number = 0; number < most_lines && !bytes.empty(); ++number)
    {
        const std::string_view line = bytes.substr(0, bytes.find('\n'));
        bytes.remove_prefix(std::min(line.size() + 1, bytes.size()));
        const bool is_copy = has(line, "what-if");
        // To explain what is refused the process is copied hundreds of times.
        const bool explains = has(line, "explain") || has(line, "why");
        if (has(line, "save") || draws(line) || explains || includes(line) || leads_out(line) || takes_long(line) ||
            (is_copy && ++copies > most_copies))
            continue;
        kept.append(line).append(1, '\n');
    }
    return kept;
}

Shown run(const std::string& lines, pmxboard::OutputOptions options)
{
    std::istringstream in(lines);
    std::ostringstream people;
    std::ostringstream diagnostics;
    options.to = &people;
    const pmxboard::Scenario scenario{ (place() / "fuzz.pmx").string(), (project() / "boards" / "default").string(),
                                       "pmxboard run fuzz.pmx" };
    const bool done = pmxboard::run_scenario(in, scenario, options, diagnostics);
    must_be_fit(people.str());
    must_be_fit(diagnostics.str());
    must(done == diagnostics.str().empty(), "a scenario that fails says why, and no other");
    return { done, people.str(), diagnostics.str() };
}

} // namespace fuzz
