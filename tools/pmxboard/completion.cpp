#include "tools/pmxboard/completion.h"

#include <algorithm>
#include <set>

#include "board/board.h"
#include "tools/pmxboard/completion_values.h"
#include "tools/pmxboard/help.h"
#include "tools/pmxboard/session.h"
#include "tools/pmxboard/verb_usage.h"

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
            return { value.begin, value.candidates };
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
    const std::string& word = words.back();
    const std::size_t at = word.find_last_of("(, ");
    if (word.find('(') == word.npos || at == word.npos)
        return part;
    part.begin = at + 1;
    const std::string function = word.substr(0, word.find('('));
    const auto index = static_cast<std::size_t>(std::count(word.begin(), word.end(), ','));
    add(part, platform_argument_names(function, index));
    return part;
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

Part of_expectation(const std::vector<std::string>& words)
{
    Part part;
    const std::string& kind = words[1];
    if (kind == "call" || kind == "next")
        return words[2] == "SET" && words.size() > 3 ? of_store(words) : of_trace_line(words);
    if (kind == "none" && words.size() == 3)
        add(part, platform_names());
    else if (kind == "state" && words.size() == 3)
        add(part, path_candidates(words.back()));
    else if (kind == "state" && words.size() == 4)
        add(part, field_value_names(words[2]));
    else if (kind == "out" && words.size() == 3)
        add(part, output_names());
    else if (kind == "out" && words.size() == 4)
        add(part, output_value_names(words[2]));
    else if (kind == "result" && words.size() == 3 && !words.back().empty())
        add(part, board::names::all());
    return part;
}

/** What a word in capitals stands for in the usage of verbs. */
Part of_placeholder(std::string_view name, const std::vector<std::string>& words, const CompletionPlace& place)
{
    Part part;
    const std::string& word = words.back();
    const std::string& before = words[words.size() - 2];
    if (name == "BOARD")
    {
        add(part, board_names());
        add(part, file_candidates(place.directory, word));
    }
    else if (name == "FILE")
        add(part, file_candidates(place.directory, word));
    else if (name == "PARTITION")
        add(part, partition_names());
    else if (name == "FUNCTION")
        add(part, words[0] == "fault"       ? faultable_names()
                  : words[0] == "neighbour" ? neighbour_names()
                                            : platform_names());
    else if (name == "OPERATION")
        add(part, names_of(operations()));
    else if (name == "ANSWER")
        add(part, names_and_general(board::names::family_of(before, "result")));
    else if (name == "PATH")
        add(part, path_candidates(word));
    else if (name == "FIELD")
        add(part, field_candidates(word));
    else if (name == "VALUE")
        add(part, field_value_names(before));
    else if (name == "MODE")
        add(part, names_in(board::names::Family::ResolutionMode));
    else if (name == "STATE")
        add(part, names_in(board::names::Family::VdpEnable));
    else if (name == "SLOT")
        add(part, names_of(ipmx_slots()));
    else if (name == "NAME" || name == "VDP" || name == "OSD")
        add(part, source_names(name == "VDP" ? "vdp" : name == "OSD" ? "osd" : ""));
    else if (name.starts_with("ARGUMENT"))
        return of_arguments_behind_a_name(words);
    return part;
}

Part of_verb(const Verb& verb, const std::vector<std::string>& words, const CompletionPlace& place)
{
    if (verb.name == "expect" && words.size() > 2)
        return of_expectation(words);
    Part all;
    for (const UsageWord& next : next_words(verb.usage, std::span(words).first(words.size() - 1)))
    {
        if (!next.is_placeholder)
        {
            all.candidates.push_back(next.text);
            continue;
        }
        Part part = of_placeholder(next.text, words, place);
        all.begin = std::max(all.begin, part.begin);
        add(all, part.candidates);
    }
    return all;
}

Part of_line(const std::vector<std::string>& words, const CompletionPlace& place);

/** Where the command begins that a verb takes behind its own words; 0 while those are not complete. */
std::size_t command_place(const std::vector<std::string>& words)
{
    std::size_t at = 1;
    if (words[0] == "meanwhile")
    {
        at = words[1] == "as" ? 4 : 2;
        if (words.size() > at && words[at] == "on")
            at += 2;
        if (words.size() > at && words[at] == "request")
            return 0;
    }
    return at < words.size() ? at : 0;
}

/** A line whose verb takes a command. */
Part of_command_taker(const Verb& verb, const std::vector<std::string>& words, const CompletionPlace& place)
{
    const std::size_t command = command_place(words);
    Part part =
        command == 0 ? Part{} : of_line({ words.begin() + static_cast<std::ptrdiff_t>(command), words.end() }, place);
    if (command == 0 || command + 1 == words.size())
    {
        for (const std::string& own : of_verb(verb, words, place).candidates)
            part.candidates.push_back(own);
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
    for (const Verb& verb : verbs())
    {
        if (verb.name == words[0])
            return verb.usage.find(" COMMAND") != verb.usage.npos ? of_command_taker(verb, words, place)
                                                                  : of_verb(verb, words, place);
    }
    return part;
}

} // namespace

Completion complete(std::string_view line, std::size_t cursor, const CompletionPlace& place)
{
    const Written written = written_until(line.substr(0, std::min(cursor, line.size())));
    if (written.is_comment)
        return { std::min(cursor, line.size()), {} };
    const std::string& word = written.words.back();
    const Part part = of_line(written.words, place);
    const std::string_view begun = std::string_view(word).substr(std::min(part.begin, word.size()));
    std::set<std::string> fitting;
    for (const std::string& candidate : part.candidates)
    {
        if (candidate.starts_with(begun) && !candidate.empty())
            fitting.insert(candidate);
    }
    Completion completion{ written.last_begin + std::min(part.begin, word.size()), {} };
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
