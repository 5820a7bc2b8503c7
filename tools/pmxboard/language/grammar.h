// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  How a line of the language is written, as data. A form is words, and in capitals or quotes the places that a line
 *  fills:
 *
 *      fault FUNCTION ANSWER [on N|from N|always]
 *      state [PATH…] [--json]
 *      print "text"
 *
 *  [words] may be left out, a|b is a choice, PLACE… at the end repeats; COMMAND and LINE take the rest of the line, and
 *  a word with two dashes stands anywhere. What may fill a place is told in one table, places(). */
#pragma once

#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "tools/pmxboard/language/line.h"

namespace pmxboard
{

/** A place that not every word fills, or that does not explain itself. */
struct Place
{
    std::string_view name;
    bool (*takes)(std::string_view word); ///< null pointer: any word
    std::string_view explanation;         ///< behind the usage of a line that is written wrong; may be empty
};
const std::vector<Place>& places();

/** A word of a form. */
struct FormWord
{
    std::string text;      ///< "plug", or "MODE"
    bool is_place = false; ///< stands for something
};

/** What a line says in the places of its form. */
class Words
{
public:
    explicit Words(const Line& line) : m_line(&line) {}
    void add(std::string_view of_form, std::size_t index) { m_found.emplace_back(of_form, index); }

    const Line& line() const { return *m_line; }
    /** Whether the line has this word of the form, or fills this place. */
    bool has(std::string_view of_form) const;
    /** What fills a place. */
    const std::string& at(std::string_view place) const;
    /** What fills a place that repeats. */
    std::vector<std::string> all(std::string_view place) const;
    /** The line as written, from the place on. */
    std::string from(std::string_view place) const;

    /** How many words are the form's own, and not what fills a place. */
    std::size_t own = 0;

private:
    const Line* m_line;
    std::vector<std::pair<std::string, std::size_t>> m_found; ///< with the index in the line
};

class Form
{
public:
    Form(const char* written);

    std::string_view written() const { return m_written; }
    std::optional<Words> match(const Line& line) const;
    /** What may follow the words of a line that begin with the verb. */
    std::vector<FormWord> next(std::span<const std::string> before) const;
    /** Where among these words the command begins that stands in the form's place COMMAND; nothing when none does. */
    std::optional<std::size_t> command_within(std::span<const std::string> words) const;

private:
    /** One word after the other, each with its choices. */
    struct Sequence
    {
        std::vector<std::vector<FormWord>> words;
        bool repeats = false; ///< the last one
    };

    const std::vector<FormWord>* choices_at(const Sequence& sequence, std::size_t index) const;

    std::string_view m_written;
    std::vector<Sequence> m_sequences; ///< without and with what may be left out
    std::vector<std::string> m_options;
};

} // namespace pmxboard
