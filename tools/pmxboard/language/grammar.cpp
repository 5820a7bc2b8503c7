// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/language/grammar.h"

#include <algorithm>
#include <cctype>
#include <stdexcept>

namespace pmxboard
{
namespace
{

constexpr std::string_view ellipsis = "…";

bool takes_rest(std::string_view place)
{
    return place == "COMMAND" || place == "LINE";
}

bool is_place(std::string_view word)
{
    return word.starts_with('"') || std::isupper(static_cast<unsigned char>(word.front())) != 0;
}

std::vector<std::string_view> split(std::string_view text, char separator)
{
    std::vector<std::string_view> parts;
    for (std::size_t at = 0; at <= text.size();)
    {
        const std::size_t end = std::min(text.find(separator, at), text.size());
        if (end > at)
            parts.push_back(text.substr(at, end - at));
        at = end + 1;
    }
    return parts;
}

/** `on|off`, `MODE|asked` */
std::vector<FormWord> choices(std::string_view word)
{
    std::vector<FormWord> all;
    for (const std::string_view choice : split(word, '|'))
        all.push_back({ std::string(choice), is_place(choice) });
    return all;
}

/** Whether a word of a line may be this one of a form. */
bool accepts(const FormWord& of_form, std::string_view word)
{
    if (!of_form.is_place)
        return of_form.text == word;
    for (const Place& place : places())
    {
        if (place.name == of_form.text)
            return place.takes == nullptr || place.takes(word);
    }
    return true;
}

const FormWord* accepting(const std::vector<FormWord>& choices, std::string_view word)
{
    // A word of the form's own before a place, which might take it as well.
    for (const bool place : { false, true })
    {
        for (const FormWord& choice : choices)
        {
            if (choice.is_place == place && accepts(choice, word))
                return &choice;
        }
    }
    return nullptr;
}

} // namespace

bool Words::has(std::string_view of_form) const
{
    return std::any_of(m_found.begin(), m_found.end(), [&](const auto& found) { return found.first == of_form; });
}

const std::string& Words::at(std::string_view place) const
{
    for (const auto& [name, index] : m_found)
    {
        if (name == place)
            return m_line->word(index);
    }
    throw std::logic_error("a form without " + std::string(place));
}

std::vector<std::string> Words::all(std::string_view place) const
{
    std::vector<std::string> words;
    for (const auto& [name, index] : m_found)
    {
        if (name == place)
            words.push_back(m_line->word(index));
    }
    return words;
}

std::string Words::from(std::string_view place) const
{
    for (const auto& [name, index] : m_found)
    {
        if (name == place)
            return m_line->from(index);
    }
    return {};
}

Form::Form(const char* text) : m_written(text), m_sequences(1)
{
    const std::string_view written = m_written;
    for (std::size_t at = 0; at < written.size();)
    {
        const bool is_group = written[at] == '[';
        const std::size_t end = std::min(written.find(is_group ? ']' : ' ', at), written.size());
        std::string_view part = written.substr(at, end - at);
        at = std::min(written.find_first_not_of("] ", end), written.size());
        if (!is_group)
        {
            for (Sequence& sequence : m_sequences)
                sequence.words.push_back(choices(part));
            continue;
        }
        part.remove_prefix(1);
        if (part.starts_with("--"))
        {
            m_options.emplace_back(part);
            continue;
        }
        // [on N|from N|always]: each with all that its choice has.
        const std::vector<Sequence> without = m_sequences;
        for (const std::string_view choice : split(part, '|'))
        {
            for (Sequence sequence : without)
            {
                sequence.repeats = choice.ends_with(ellipsis);
                for (std::string_view word : split(choice, ' '))
                {
                    if (word.ends_with(ellipsis))
                        word.remove_suffix(ellipsis.size());
                    sequence.words.push_back(choices(word));
                }
                m_sequences.push_back(std::move(sequence));
            }
        }
    }
}

const std::vector<FormWord>* Form::choices_at(const Sequence& sequence, std::size_t index) const
{
    const auto& last = sequence.words.back();
    const bool goes_on = sequence.repeats || (last.front().is_place && takes_rest(last.front().text));
    if (index >= sequence.words.size())
        return goes_on ? &last : nullptr;
    return &sequence.words[index];
}

std::optional<Words> Form::match(const Line& line) const
{
    std::optional<Words> best;
    for (const Sequence& sequence : m_sequences)
    {
        Words words(line);
        std::size_t place = 0;
        bool fits = true;
        for (std::size_t i = 0; fits && i < line.size(); ++i)
        {
            if (std::find(m_options.begin(), m_options.end(), line.word(i)) != m_options.end())
            {
                words.add(line.word(i), i);
                continue;
            }
            const auto* const here = choices_at(sequence, place);
            const bool within_rest = place >= sequence.words.size() && !sequence.repeats;
            const FormWord* const choice = here == nullptr ? nullptr
                                           : within_rest   ? &here->front()
                                                           : accepting(*here, line.word(i));
            fits = choice != nullptr;
            if (fits && !within_rest)
                words.add(choice->text, i);
            words.own += fits && !choice->is_place;
            ++place;
        }
        if (fits && place >= sequence.words.size() && (!best || words.own > best->own))
            best = std::move(words);
    }
    return best;
}

std::vector<FormWord> Form::next(std::span<const std::string> before) const
{
    std::vector<FormWord> found;
    for (const Sequence& sequence : m_sequences)
    {
        bool fits = true;
        std::size_t place = 0;
        for (const std::string& word : before)
        {
            if (std::find(m_options.begin(), m_options.end(), word) != m_options.end())
                continue;
            const auto* const here = choices_at(sequence, place++);
            fits = fits && here != nullptr && accepting(*here, word) != nullptr;
        }
        const auto* const here = fits ? choices_at(sequence, place) : nullptr;
        if (here != nullptr)
            found.insert(found.end(), here->begin(), here->end());
        for (const std::string& option : m_options)
        {
            if (fits && place >= sequence.words.size())
                found.push_back({ option, false });
        }
    }
    return found;
}

std::optional<std::size_t> Form::command_within(std::span<const std::string> words) const
{
    std::optional<std::size_t> begin;
    for (const Sequence& sequence : m_sequences)
    {
        const std::size_t last = sequence.words.size() - 1;
        bool fits = sequence.words[last].front().text == "COMMAND" && last < words.size();
        for (std::size_t i = 0; fits && i < last; ++i)
            fits = accepting(sequence.words[i], words[i]) != nullptr;
        if (fits && (!begin || last > *begin))
            begin = last;
    }
    return begin;
}

} // namespace pmxboard
