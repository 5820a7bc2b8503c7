// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/prompt/completion.h"

#include <algorithm>
#include <cctype>
#include <set>

#include "board/board.h"
#include "tools/pmxboard/functions/mode_names.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/prompt/completion_values.h"
#include "tools/pmxboard/prompt/help.h"

namespace pmxboard
{
namespace
{

/** The words before the cursor, the last one as far as it goes; it may be empty, and its brackets open. */
struct Written
{
    std::vector<std::string> words;
    std::size_t last_begin = 0;
    bool is_comment = false;
};

Written written_until(std::string_view text)
{
    Written written;
    std::string word;
    std::size_t depth = 0;
    bool quoted = false;
    written.last_begin = 0;
    for (std::size_t i = 0; i < text.size(); ++i)
    {
        const char c = text[i];
        if (quoted && c == '\\' && i + 1 < text.size())
            word += text[i++];
        else if (c == '"')
            quoted = !quoted;
        else if (!quoted && (c == '[' || c == '{' || c == '('))
            ++depth;
        else if (!quoted && depth > 0 && (c == ']' || c == '}' || c == ')'))
            --depth;
        else if (!quoted && depth == 0 && c == '#')
        {
            written.is_comment = true;
            return written;
        }
        else if (!quoted && depth == 0 && (c == ' ' || c == '\t'))
        {
            if (!word.empty())
                written.words.push_back(word);
            word.clear();
            written.last_begin = i + 1;
            continue;
        }
        word += text[i];
    }
    written.words.push_back(word);
    return written;
}

/** What completes one word: candidates for a part of it. */
struct Part
{
    std::size_t begin = 0; ///< in the word
    std::vector<std::string> candidates;
    std::string argument = {};
};

template <typename Names>
void add(Part& part, const Names& names)
{
    for (const auto& name : names)
        part.candidates.emplace_back(name);
}

Part of_arguments(const Operation& operation, std::span<const std::string> words)
{
    std::size_t place = 0;
    for (const Parameter& parameter : operation.parameters)
    {
        if (parameter.is_output)
            continue;
        if (place++ == words.size() - 1)
        {
            const ValuePart value = value_candidates(parameter, words.back());
            return { value.begin, value.candidates, value.place };
        }
    }
    return {};
}

const Operation* callable(const std::string& name)
{
    for (const auto* const table : { &operations(), &neighbours(), &ipmx_slots() })
    {
        if (const Operation* const found = find(*table, name))
            return found;
    }
    return nullptr;
}

/** The arguments of the nearest function that the words before name. */
Part of_arguments_behind_a_name(const std::vector<std::string>& words)
{
    for (std::size_t i = words.size() - 1; i-- > 1;)
    {
        const Operation* const operation = callable(words[i]);
        if (operation == nullptr)
            continue;
        // Behind a slot the tag is written as a word of its own.
        return of_arguments(*operation, std::span(words).subspan(i + 1));
    }
    return {};
}

/** Within the bracket of a platform function. */
Part of_call_arguments(const std::string& word)
{
    Part part;
    const std::size_t at = word.find_last_of("(, ");
    if (word.find('(') == word.npos || at == word.npos)
        return part;
    part.begin = at + 1;
    const std::string function = word.substr(0, word.find('('));
    const auto index = static_cast<std::size_t>(std::count(word.begin(), word.end(), ','));
    add(part, platform_argument_names(function, index));
    return part;
}

/** An expectation's LINE: a platform function and its bracket. */
Part of_trace_line(const std::vector<std::string>& words)
{
    Part part;
    if (words.size() == 3 && words.back().find('(') == std::string::npos)
    {
        for (const auto& function : board::platform_functions())
            part.candidates.push_back(std::string(function.name) + "(");
        add(part, std::vector<std::string>{ "LOG0", "LOG1", "LOG5", "LOG8", "LOG9", "NOTICE", "SET" });
        return part;
    }
    return of_call_arguments(words.back());
}

/** A store's field and values. */
Part of_store(const std::vector<std::string>& words)
{
    Part part;
    if (words.size() == 4)
        add(part, field_candidates(words.back()));
    else if (words.size() == 5 || words.size() == 7)
        add(part, field_value_names(words[3]));
    else if (words.size() == 6)
        part.candidates.emplace_back("→");
    return part;
}

/** What may fill each place of the verbs' forms. */
struct Filling
{
    std::string_view place;
    void (*add)(Part& part, const std::vector<std::string>& words, const CompletionPlace& where);
};

const std::string& before_last(const std::vector<std::string>& words)
{
    return words[words.size() - 2];
}

constexpr Filling fillings[] = {
    { "BOARD",
      [](Part& part, const auto& words, const auto& where) {
          add(part, board_names());
          add(part, file_candidates(where.directory, words.back()));
      } },
    { "FILE", [](Part& part, const auto& words,
                 const auto& where) { add(part, file_candidates(where.directory, words.back())); } },
    { "PARTITION", [](Part& part, const auto&, const auto&) { add(part, partition_names()); } },
    { "FUNCTION",
      [](Part& part, const auto& words, const auto&) {
          if (words[0] == "fault" && words.back().find('(') != std::string::npos)
          {
              part = of_call_arguments(words.back());
              return;
          }
          add(part, words[0] == "fault"       ? faultable_names()
                    : words[0] == "neighbour" ? neighbour_names()
                                              : platform_names());
      } },
    { "ANSWER",
      [](Part& part, const auto& words, const auto&) {
          const std::string& call = before_last(words);
          add(part, names_and_general(board::names::family_of(call.substr(0, call.find('(')), "result")));
      } },
    { "PARAMETER=VALUE", [](Part& part, const auto& words,
                            const auto&) { add(part, settable_outputs(words[1].substr(0, words[1].find('(')))); } },
    { "PATH", [](Part& part, const auto& words, const auto&) { add(part, path_candidates(words.back())); } },
    { "FIELD", [](Part& part, const auto& words, const auto&) { add(part, field_candidates(words.back())); } },
    { "VALUE",
      [](Part& part, const auto& words, const auto&) {
          if (words[1] == "out")
              add(part, output_value_names(before_last(words)));
          else if (words[1] != "result")
              add(part, field_value_names(before_last(words)));
          else if (!words.back().empty())
              add(part, board::names::all());
      } },
    { "MODE", [](Part& part, const auto&, const auto&) { add(part, names_in(board::names::Family::ResolutionMode)); } },
    { "STATE", [](Part& part, const auto&, const auto&) { add(part, names_in(board::names::Family::VdpEnable)); } },
    { "SLOT", [](Part& part, const auto&, const auto&) { add(part, names_of(ipmx_slots())); } },
    { "NAME", [](Part& part, const auto&, const auto&) { add(part, source_names("")); } },
    { "VDP", [](Part& part, const auto&, const auto&) { add(part, source_names("vdp")); } },
    { "OSD", [](Part& part, const auto&, const auto&) { add(part, source_names("osd")); } },
    { "OUTPUT", [](Part& part, const auto&, const auto&) { add(part, output_words); } },
    { "SETTING",
      [](Part& part, const auto& words, const auto&) {
          const std::size_t equals = words.back().find('=');
          if (equals == std::string::npos)
          {
              for (const std::string_view output : output_words)
                  part.candidates.push_back(std::string(output) + "=");
              return;
          }
          part.begin = equals + 1;
          part.candidates.emplace_back("off");
          add(part, short_mode_names());
      } },
    { "ARGUMENT",
      [](Part& part, const auto& words, const auto&) {
          if (words[0] == "expect")
              add(part, output_names());
          else
              part = of_arguments_behind_a_name(words);
      } },
    { "LINE",
      [](Part& part, const auto& words, const auto&) {
          part = words[2] == "SET" && words.size() > 3 ? of_store(words) : of_trace_line(words);
      } },
};

Part of_line(const std::vector<std::string>& words, const CompletionPlace& place);

void fill(Part& part, std::string_view place, const std::vector<std::string>& words, const CompletionPlace& where)
{
    for (const Filling& filling : fillings)
    {
        if (filling.place != place)
            continue;
        Part filled;
        filling.add(filled, words, where);
        part.begin = std::max(part.begin, filled.begin);
        part.argument = filled.argument;
        add(part, filled.candidates);
    }
}

Part of_verb(const Verb& verb, const std::vector<std::string>& words, const CompletionPlace& where)
{
    Part part;
    std::size_t command = 0; // behind as many words of the verb as any form takes; 0: there is none
    for (const VerbForm& form : verb.forms)
        command = std::max(command, form.form.command_within(words).value_or(0));
    if (command != 0)
        part = of_line({ words.begin() + static_cast<std::ptrdiff_t>(command), words.end() }, where);
    for (const VerbForm& form : verb.forms)
    {
        for (const FormWord& next : form.form.next(std::span(words).first(words.size() - 1)))
        {
            if (next.is_place)
                fill(part, next.text, words, where);
            else
                part.candidates.push_back(next.text);
        }
    }
    return part;
}

Part of_line(const std::vector<std::string>& words, const CompletionPlace& place)
{
    Part part;
    if (words.size() == 1)
    {
        add(part, names_of(operations()));
        for (const Verb& verb : verbs())
            part.candidates.emplace_back(verb.name);
        add(part, place.words);
        return part;
    }
    if (words[0] == "help" && words.size() == 2)
    {
        add(part, help_words());
        return part;
    }
    if (const Operation* const operation = find(operations(), words[0]))
        return of_arguments(*operation, std::span(words).subspan(1));
    if (const Verb* const verb = find_verb(words[0]))
        return of_verb(*verb, words, place);
    return part;
}

bool begins_so(std::string_view candidate, std::string_view begun)
{
    return candidate.starts_with(begun);
}

bool begins_so_in_any_case(std::string_view candidate, std::string_view begun)
{
    const auto same = [](unsigned char one, unsigned char other) { return std::tolower(one) == std::tolower(other); };
    return candidate.size() >= begun.size() && std::equal(begun.begin(), begun.end(), candidate.begin(), same);
}

std::set<std::string> fitting_among(const std::vector<std::string>& candidates, std::string_view begun,
                                    bool (*fits)(std::string_view, std::string_view))
{
    std::set<std::string> fitting;
    for (const std::string& candidate : candidates)
    {
        if (!candidate.empty() && fits(candidate, begun))
            fitting.insert(candidate);
    }
    return fitting;
}

} // namespace

Completion complete(std::string_view line, std::size_t cursor, const CompletionPlace& place)
{
    const Written written = written_until(line.substr(0, std::min(cursor, line.size())));
    if (written.is_comment)
        return { std::min(cursor, line.size()), {}, {} };
    const std::string& word = written.words.back();
    const Part part = of_line(written.words, place);
    const std::string_view begun = std::string_view(word).substr(std::min(part.begin, word.size()));
    std::set<std::string> fitting = fitting_among(part.candidates, begun, begins_so);
    if (fitting.empty())
        fitting = fitting_among(part.candidates, begun, begins_so_in_any_case);
    Completion completion{ written.last_begin + std::min(part.begin, word.size()), {}, part.argument };
    // In the order in which they were found: modes by number, arguments as declared.
    for (const std::string& candidate : part.candidates)
    {
        if (fitting.erase(candidate) == 1)
            completion.candidates.push_back(candidate);
    }
    return completion;
}

std::string Completion::common() const
{
    if (candidates.empty())
        return {};
    std::string_view shared = candidates.front();
    for (const std::string& candidate : candidates)
    {
        const auto differs = std::mismatch(shared.begin(), shared.end(), candidate.begin(), candidate.end());
        shared = shared.substr(0, static_cast<std::size_t>(differs.first - shared.begin()));
    }
    return std::string(shared);
}

bool is_whole(std::string_view candidate)
{
    return !candidate.empty() && std::string_view(".[/(=").find(candidate.back()) == std::string_view::npos;
}

} // namespace pmxboard
