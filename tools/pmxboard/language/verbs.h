// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The verbs of the language. Each stands in one place with all that there is to it: how it is written, what that
 *  means, and what it does. Usage, completion, help and the guide's tables come from there. */
#pragma once

#include <array>
#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "board/sources.h"
#include "tools/pmxboard/functions/operation.h"
#include "tools/pmxboard/language/grammar.h"

namespace pmxboard
{

class Session;

/** One way to write a verb. */
struct VerbForm
{
    Form form;
    std::string_view meaning; ///< with `code` in it; empty: that of the form before it
    void (*run)(Session& session, const Words& words);
    bool only_looks = false; ///< `diff` and `why` go on telling of the command before it
};
inline constexpr bool looks = true; ///< as a form's last word

struct Verb
{
    std::string_view name;
    std::vector<VerbForm> forms;
    bool has_kinds = false; ///< the second word tells what is meant: the forms of another one are of no interest
};

/** All of them, in the order of the guide. */
const std::vector<Verb>& verbs();
/** Null pointer when there is none of this name. */
const Verb* find_verb(std::string_view name);

/** How a line that is wrong should be written, as a LineError: "write: trace on, or trace off". */
[[noreturn]] void wrong_usage(const Verb& verb, const Line& line);

/** A line with the form that it is in. */
struct ReadForm
{
    const VerbForm* form;
    Words words;
};
/** Throws the verb's usage as a LineError when the line is in none. */
ReadForm read_form(const Verb& verb, const Line& line);

/** What a line begins with: one of the two is null. */
struct Command
{
    const Verb* verb = nullptr;
    const Operation* operation = nullptr;
};
/** Throws LineError with the nearest names. */
Command find_command(const std::string& name);

/** Whether a line only looks: the form that it is in does. One that is in none, when every form of its verb does.
 *  Throws LineError when nothing is called so. */
bool only_looks(const Line& line);

/* What verbs read from their words. */

/** The platform has a function of this name; else a LineError. */
void need_platform_function(const std::string& name);
/** A plain number in a range. */
std::int64_t number_in(const std::string& word, const std::string& what, std::int64_t lowest, std::int64_t highest);
/** A number or a name of a family, of 32 bits. */
std::uint32_t named_number(const std::string& word, const std::string& what, board::names::Family family);
/** `10s`, `500ms` or `2us`. */
std::chrono::microseconds read_time(const std::string& word);
/** `1920x1080`: width and height; nothing when it is something else. */
std::optional<std::pair<std::int32_t, std::int32_t>> read_size(std::string_view word);

/** What outputs are called, by index; the last name is another one of the last output. */
inline constexpr std::array<std::string_view, 5> output_words = { "digital", "hdmi", "component", "composite", "cvbs" };
/** The index of an output: `digital`, `hdmi`, `component`, or `composite`, which is also `cvbs`. Throws LineError. */
std::size_t output_called(const std::string& name);
/** The source of a name. Throws LineError with the nearest names. */
board::sources::Id source_called(const std::string& name);

/* The verbs by what they are about. */

std::vector<Verb> board_verbs();
std::vector<Verb> device_verbs();
std::vector<Verb> source_verbs();
std::vector<Verb> output_verbs();
std::vector<Verb> state_verbs();
std::vector<Verb> what_if_verbs();
std::vector<Verb> why_verbs();
std::vector<Verb> meanwhile_verbs();
std::vector<Verb> picture_verbs();
std::vector<Verb> view_verbs();
std::vector<Verb> neighbour_verbs();
std::vector<Verb> expectation_verbs();

} // namespace pmxboard
