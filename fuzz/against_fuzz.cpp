// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Any bytes are a log to compare with what a scenario prints. Its first line says with which, and up to which level:
// "captions 9". Each scenario runs once in a process.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <map>
#include <sstream>
#include <string>
#include <string_view>

#include "fuzz/support/holds.h"
#include "fuzz/support/place.h"
#include "tools/pmxboard/decode/show.h"

namespace
{

using namespace pmxboard::decode;

constexpr const char* usual_scenario = "first-mode-after-boot";

std::string file_of(const std::string& scenario)
{
    return (fuzz::project() / "scenarios" / (scenario + ".pmx")).string();
}

const std::vector<Expected>& printed_by(const std::string& name)
{
    static std::map<std::string, std::vector<Expected>> known;
    const auto found = known.find(name);
    if (found != known.end())
        return found->second;
    return known[name] = run_for_texts(file_of(name), (fuzz::project() / "boards" / "default").string());
}

bool is_scenario(const std::string& name)
{
    const bool is_plain = name.find_first_not_of("abcdefghijklmnopqrstuvwxyz0123456789-") == name.npos;
    return is_plain && std::filesystem::exists(file_of(name));
}

void must_count(const Comparison& found, const Log& log, std::size_t expected)
{
    fuzz::must(found.agreeing <= log.items.size(), "no more lines agree than there are");
    fuzz::must(found.skipped + found.agreeing + found.left <= expected, "no line is counted twice");
    fuzz::must(found.first_line <= found.last_line && found.last_line <= log.lines, "lines are of the log");
    fuzz::must(!found.departure || found.departure->found.line != 0, "a departure has a line");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const std::string_view bytes(reinterpret_cast<const char*>(data), size);
    const std::string_view head = bytes.substr(0, bytes.find('\n'));
    const std::string named(head.substr(0, head.find(' ')));
    const auto& expected = printed_by(is_scenario(named) ? named : usual_scenario);
    const auto level = number_of(head.substr(std::min(named.size() + 1, head.size())));

    const Log log = read_log(bytes.substr(std::min(head.size() + 1, size)));
    if (log.items.empty())
        return 0;
    Comparison found = compare(log, expected, static_cast<int>(std::clamp<std::int64_t>(level.value_or(9), -3, 20)));
    must_count(found, log, expected.size());
    found.scenario = named;

    ShowOptions options;
    options.name = "fuzz";
    std::ostringstream people;
    show_comparison(people, found, options);
    fuzz::must_be_fit(people.str());
    std::ostringstream programs;
    show_json(programs, log, tell(log), found, options.name);
    fuzz::must_be_json(programs.str());
    return 0;
}
