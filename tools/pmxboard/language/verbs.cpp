// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/language/verbs.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <stdexcept>

#include "board/duration.h"
#include "board/trace.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/kind.h"
#include "tools/pmxboard/text/suggest.h"

namespace pmxboard
{
namespace
{

bool is_text(std::string_view word)
{
    return word.starts_with('"');
}

bool is_no_option(std::string_view word)
{
    return !word.starts_with('-');
}

bool is_time(std::string_view word)
try
{
    return board::read_duration(word).has_value();
}
catch (const std::invalid_argument&)
{
    return true; // one that is too long, which is told when it is read
}

bool is_size(std::string_view word)
{
    return read_size(word).has_value();
}

bool is_setting(std::string_view word)
{
    return word.find('=') != word.npos;
}

bool is_of_video(std::string_view word)
{
    return !word.starts_with("osd");
}

bool is_of_osd(std::string_view word)
{
    return !word.starts_with("vdp");
}

/** Words that stand before a command, or in place of it, begin none. */
bool begins_command(std::string_view word)
{
    return word != "request" && word != "as" && word != "thread" && word != "on";
}

[[noreturn]] void unknown_command(const std::string& word)
{
    const std::string name = word.substr(0, word.find('('));
    if (name != word && find(operations(), name) != nullptr)
        throw LineError(word +
                        ": arguments stand behind the name, separated by blanks: " + usage(*find(operations(), name)));
    const auto platform = board::platform_functions();
    if (std::any_of(platform.begin(), platform.end(), [&](const auto& function) { return function.name == word; }))
        throw LineError(word + " belongs to the platform; a neighbouring driver calls it: neighbour " + word + " …");

    std::vector<std::string_view> known = names_of(operations());
    for (const Verb& verb : verbs())
        known.push_back(verb.name);
    throw LineError("no command " + word + did_you_mean(word, known));
}

/** Whether a place stands in a text. */
bool stands_in(std::string_view text, std::string_view place)
{
    const auto is_letter = [&](std::size_t i) {
        return i < text.size() && std::isalpha(static_cast<unsigned char>(text[i])) != 0;
    };
    for (std::size_t at = 0; (at = text.find(place, at)) != text.npos; at += place.size())
    {
        if (!is_letter(at - 1) && !is_letter(at + place.size()))
            return true;
    }
    return false;
}

/** Forms in a row: "a, b, or c". */
std::string usage_of(const std::vector<const VerbForm*>& forms)
{
    std::string text;
    for (const VerbForm* const form : forms)
        text.append(text.empty() ? "" : form == forms.back() ? ", or " : ", ").append(form->form.written());
    for (const Place& place : places())
    {
        if (!place.explanation.empty() && stands_in(text, place.name))
            text.append("; ").append(place.name).append(" is ").append(place.explanation);
    }
    return text;
}

} // namespace

const std::vector<Place>& places()
{
    static const std::vector<Place> all = {
        { "TIME", is_time, "10s, 500ms or 2us" },
        { "SIZE", is_size, "1920x1080 or the like" },
        { "NAME", nullptr, "vdp0…vdp3 or osd0…osd5" },
        { "VDP", is_of_video, "vdp0…vdp3" },
        { "OSD", is_of_osd, "osd0…osd5" },
        { "ORDER", nullptr, "an order of planes, such as 0x76543210" },
        { "D", nullptr, "the delay of a plane, plane 1 first" },
        { "SETTING", is_setting, "OUTPUT=MODE or OUTPUT=off, such as hdmi=720p50" },
        { "OUTPUT", nullptr, "digital, hdmi, component or composite (cvbs)" },
        { "PARAMETER=VALUE", is_setting,
          "an output, such as phTimer=7, pvDest=[0x0C, 0] or pvParameter={u2ValidAutoVfreq=50}" },
        { "LINE", nullptr, "such as FUNCTION(ARGUMENT, …) = RESULT or SET FIELD OLD → NEW" },
        { "X,Y", nullptr, "a point, from the upper left corner, such as 960,540" },
        { "R,G,B", nullptr, "a colour, such as 255,128,0" },
        { "PATH", is_no_option, "" },
        { "COMMAND", begins_command, "" },
        { "\"text\"", is_text, "" },
    };
    return all;
}

const std::vector<Verb>& verbs()
{
    static const std::vector<Verb> all = [] {
        std::vector<Verb> joined;
        for (const auto& verbs_of :
             { output_verbs, board_verbs, device_verbs, source_verbs, state_verbs, what_if_verbs, why_verbs,
               meanwhile_verbs, picture_verbs, view_verbs, neighbour_verbs, expectation_verbs })
        {
            for (Verb& verb : verbs_of())
                joined.push_back(std::move(verb));
        }
        return joined;
    }();
    return all;
}

const Verb* find_verb(std::string_view name)
{
    const auto found =
        std::find_if(verbs().begin(), verbs().end(), [name](const Verb& verb) { return verb.name == name; });
    return found == verbs().end() ? nullptr : &*found;
}

void wrong_usage(const Verb& verb, const Line& line)
{
    std::vector<const VerbForm*> forms;
    for (const VerbForm& form : verb.forms)
    {
        const std::string kind = std::string(verb.name) + " " + (line.size() > 1 ? line.word(1) : "");
        if (!verb.has_kinds || (std::string(form.form.written()) + " ").starts_with(kind + " "))
            forms.push_back(&form);
    }
    throw LineError("write: " + usage_of(forms));
}

namespace
{

std::optional<ReadForm> best_form(const Verb& verb, const Line& line)
{
    std::optional<ReadForm> best;
    for (const VerbForm& form : verb.forms)
    {
        if (auto words = form.form.match(line); words && (!best || words->own > best->words.own))
            best = { &form, std::move(*words) };
    }
    return best;
}

} // namespace

ReadForm read_form(const Verb& verb, const Line& line)
{
    std::optional<ReadForm> best = best_form(verb, line);
    if (!best)
        wrong_usage(verb, line);
    return std::move(*best);
}

bool only_looks(const Line& line)
{
    const Command command = find_command(line.word(0));
    if (command.verb == nullptr)
        return false;
    if (const auto best = best_form(*command.verb, line))
        return best->form->only_looks;
    const auto& forms = command.verb->forms;
    return std::all_of(forms.begin(), forms.end(), [](const VerbForm& form) { return form.only_looks; });
}

Command find_command(const std::string& name)
{
    const Command command{ find_verb(name), find(operations(), name) };
    if (command.verb == nullptr && command.operation == nullptr)
        unknown_command(name);
    return command;
}

void need_platform_function(const std::string& name)
{
    std::vector<std::string_view> names;
    for (const auto& function : board::platform_functions())
        names.push_back(function.name);
    if (std::find(names.begin(), names.end(), name) == names.end())
        throw LineError("the platform has no function " + name + did_you_mean(name, names));
}

std::int64_t number_in(const std::string& word, const std::string& what, std::int64_t lowest, std::int64_t highest)
{
    const std::int64_t number = read_number(board::names::Family::None, word, what);
    if (number < lowest || number > highest)
        throw LineError(what + " is " + std::to_string(lowest) + " to " + std::to_string(highest) + ", not " + word);
    return number;
}

std::uint32_t named_number(const std::string& word, const std::string& what, board::names::Family family)
{
    const Kind kind{ .bits = 32, .family = family, .names = {}, .members = {} };
    return static_cast<std::uint32_t>(read_value(kind, word, what).as_number());
}

std::chrono::microseconds read_time(const std::string& word)
try
{
    return board::read_duration(word).value();
}
catch (const std::invalid_argument& error)
{
    throw LineError(error.what());
}

std::optional<std::pair<std::int32_t, std::int32_t>> read_size(std::string_view word)
{
    std::int32_t width = 0;
    std::int32_t height = 0;
    const char* const end = word.data() + word.size();
    const auto first = std::from_chars(word.data(), end, width);
    if (first.ec != std::errc() || first.ptr == end || *first.ptr != 'x')
        return std::nullopt;
    const auto second = std::from_chars(first.ptr + 1, end, height);
    if (second.ec != std::errc() || second.ptr != end)
        return std::nullopt;
    return std::pair(width, height);
}

} // namespace pmxboard
