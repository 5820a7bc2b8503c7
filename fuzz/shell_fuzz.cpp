// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any text is a line that somebody types at the prompt: it is taken apart, completed, explained and kept, not carried
// out. What stands behind its end is another line, and would be read alike.
#include <algorithm>
#include <cctype>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

#include "fuzz/support/holds.h"
#include "fuzz/support/place.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/line.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/prompt/completion.h"
#include "tools/pmxboard/prompt/help.h"
#include "tools/pmxboard/prompt/history_file.h"

namespace
{

using namespace pmxboard;

constexpr std::size_t most_words = 8;

bool begins_in_any_case(std::string_view candidate, std::string_view replaced)
{
    const auto same = [](unsigned char one, unsigned char other) { return std::tolower(one) == std::tolower(other); };
    return candidate.size() >= replaced.size() && std::equal(replaced.begin(), replaced.end(), candidate.begin(), same);
}

void complete_at(std::string_view line, std::size_t cursor)
{
    const Completion found = complete(line, cursor, { fuzz::place(), { "help", "quit", "exit" } });
    fuzz::must(found.begin <= cursor, "what is replaced stands before the cursor");
    const std::string_view replaced = line.substr(found.begin, cursor - found.begin);
    for (const std::string& candidate : found.candidates)
        fuzz::must(begins_in_any_case(candidate, replaced), "a candidate begins with what it replaces, in any case");
    const std::string common = found.common();
    for (const std::string& candidate : found.candidates)
        fuzz::must(candidate.starts_with(common), "a candidate begins with what is common to all");
}

void explain(const std::string& word)
try
{
    fuzz::must_be_fit(help_on(word, {}));
}
catch (const LineError&)
{
    return; // no such word
}

void take_apart(std::string_view text)
try
{
    const Line line(text);
    for (std::size_t i = 0; i < std::min(line.size(), most_words); ++i)
        explain(line.word(i));
    if (line.empty())
        return;
    const Command command = find_command(line.word(0));
    if (command.verb != nullptr)
        read_form(*command.verb, line);
}
catch (const LineError&)
{
    return; // told at the prompt
}

void read_line(const std::string& line)
{
    fuzz::must(history_line(history_entry(line)) == line, "the history keeps a line as it is");
    complete_at(line, line.size());
    complete_at(line, line.size() / 2);
    take_apart(line);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    static const bool is_on = [] {
        fuzz::power_on();
        return true;
    }();
    const std::string_view bytes(reinterpret_cast<const char*>(data), size);
    if (is_on && !bytes.empty())
        read_line(std::string(bytes.substr(0, bytes.find('\n'))));
    return 0;
}
