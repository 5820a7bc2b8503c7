// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/prompt/help.h"

#include <algorithm>

#include "board/board.h"
#include "tools/pmxboard/functions/contracts.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/prompt/about_mode.h"
#include "tools/pmxboard/prompt/about_operation.h"
#include "tools/pmxboard/text/suggest.h"
#include "tools/record_view/record_view.h"

namespace pmxboard
{
namespace
{

using board::names::Family;

std::string constant_text(const std::string& name, std::int64_t number, const Look& look)
{
    for (const auto& [family, title] : board::names::families())
    {
        if (board::names::name_of(family, number) != name)
            continue;
        if (family == Family::ResolutionMode)
            return mode_text(record_view::mode_row(static_cast<unsigned>(number)), look);
        std::string text = look.bold(name) + " = " + std::to_string(number) + ", one of the ";
        text.append(title).append(":\n");
        for (const std::string_view other : names_in(family))
            text +=
                "  " + std::to_string(board::names::number_of(other).value_or(0)) + "  " + std::string(other) + "\n";
        return text;
    }
    const bool is_packed = number > 0xFFFF;
    const auto base = is_packed ? board::Value::Base::Hex : board::Value::Base::Decimal;
    return look.bold(name) + " = " + board::Value::number(number, {}, base).to_text() + ", and goes with any number\n";
}

/** Without the marks of code. */
std::string unmarked(std::string_view text)
{
    std::string plain(text);
    std::erase(plain, '`');
    return plain;
}

std::string verb_text(const Verb& verb, const Look& look)
{
    std::string text = look.bold(verb.name) + "\n";
    for (const VerbForm& form : verb.forms)
        text += wrapped(form.form.written(), look.width, 2, 4) + wrapped(unmarked(form.meaning), look.width, 6, 6);
    return text;
}

std::string field_text(const std::string& path, const Look& look)
{
    const board::Value value = record_view::get(path);
    std::string text = look.bold(path) + ", a field of the layer";
    if (value.kind() == board::Value::Kind::List || value.kind() == board::Value::Kind::Record)
        return text + "; state " + path + " shows it\n";
    const record_view::FieldType type = record_view::type_of(path);
    text += ": " + std::to_string(type.range().lowest) + " to " + std::to_string(type.range().highest) + "\n";
    if (const std::string_view told = text_of_field(type.record, type.member); !told.empty())
        text += wrapped(told, look.width, 2, 2);
    std::string names;
    for (const std::string_view name : names_in(board::names::family_of(type.record, type.member)))
        names.append(names.empty() ? "" : ", ").append(name);
    return names.empty() ? text : text + wrapped(names, look.width, 2, 2);
}

std::string slot_text(const Operation& slot, const Look& look)
{
    std::string text =
        look.bold(slot.name) + ", a slot of the table that the mixer registers\n  ipmx " + slot.name + " tag";
    for (std::size_t i = 1; i < slot.parameters.size(); ++i)
        text += slot.parameters[i].is_output ? "" : " " + slot.parameters[i].name;
    return text + "\n";
}

/** What people ask for who do not know its name. */
struct Topic
{
    std::string_view word;
    std::string_view text;
    std::string_view more; ///< lines as they stand
};

constexpr std::string_view about_waiting =
    "Graphics leave the picture when a mode change finds the display part switching the sink, so that nobody sees them "
    "jump. They come back when it has switched and says so by PMX_SetFormatChangeFlag, or after ten seconds, when the "
    "display timer runs out; while the video plane waits for its sync control, when that calls PMX_SetOsdEnable.";

constexpr std::string_view looking_at_waiting =
    "  status graphics    whether they wait now, since when, until when and for whom\n"
    "  why osd            the same, and for which request\n"
    "  status             what outputs and planes show, too\n"
    "  display-part …     how long the display part takes\n"
    "  advance 3s         let time pass\n"
    "  For example: scenarios/first-look.pmx\n";

constexpr std::string_view about_break =
    "break FUNCTION stops the layer at the end of each call of a platform function, where lines are carried out until "
    "continue. break off forgets all such functions, break lists them. In the shell alone; a scenario has meanwhile.";

constexpr std::string_view about_record =
    "record FILE keeps the lines that are carried out from here on, with what operations answered, as a scenario; "
    "record off, or the end of the shell, ends it. A line that fails is not in it, nor one that is typed at a "
    "breakpoint: meanwhile FUNCTION on N COMMAND says the same in a scenario.";

constexpr Topic topics[] = { { "wait", about_waiting, looking_at_waiting },
                             { "graphics", about_waiting, looking_at_waiting },
                             { "break", about_break, "" },
                             { "record", about_record, "" } };

std::string topic_text(const Topic& topic, const Look& look)
{
    return look.bold(topic.word) + "\n" + wrapped(topic.text, look.width, 2, 2) + std::string(topic.more);
}

} // namespace

std::vector<std::string_view> help_words()
{
    std::vector<std::string_view> words = names_of(operations());
    for (const Verb& verb : verbs())
        words.push_back(verb.name);
    for (const auto& function : board::platform_functions())
        words.push_back(function.name);
    for (const Operation& slot : ipmx_slots())
        words.push_back(slot.name);
    for (const Topic& topic : topics)
        words.push_back(topic.word);
    const auto& constants = board::names::all();
    words.insert(words.end(), constants.begin(), constants.end());
    return words;
}

std::string help_on(const std::string& word, const Look& look)
{
    if (const Operation* const operation = find(operations(), word))
        return operation_text(*operation, look);
    if (const Verb* const verb = find_verb(word))
        return verb_text(*verb, look);
    if (contract_of(word) != nullptr)
        return platform_text(word, look);
    if (const Operation* const slot = find(ipmx_slots(), word))
        return slot_text(*slot, look);
    for (const Topic& topic : topics)
    {
        if (topic.word == word)
            return topic_text(topic, look);
    }
    if (const auto number = board::names::number_of(word))
        return constant_text(word, *number, look);
    if (record_view::has(word))
        return field_text(word, look);
    std::vector<std::string_view> words = help_words();
    const std::vector<std::string> fields = record_view::fields();
    words.insert(words.end(), fields.begin(), fields.end());
    throw LineError("no help on " + word + did_you_mean(word, words));
}

std::string guide_tables()
{
    const auto cell = [](std::string_view text) {
        std::string escaped;
        for (const char c : text)
            escaped.append(c == '|' ? "\\" : "").append(1, c);
        return escaped;
    };
    std::string text = "| Command | Meaning |\n|---|---|\n";
    for (const Verb& verb : verbs())
    {
        if (verb.has_kinds)
            text += "\n| Expectation | Is met when |\n|---|---|\n";
        for (const VerbForm& form : verb.forms)
            text += "| `" + cell(form.form.written()) + "` | " + cell(form.meaning) + " |\n";
    }
    return text;
}

std::string shell_help(const Look& look)
{
    std::vector<std::string> names;
    for (const Verb& verb : verbs())
        names.emplace_back(verb.name);
    return wrapped("A line is a command of the scenario language: an operation of the layer with its arguments, or a "
                   "verb. What it does is shown at once; an error leaves everything as it is.",
                   look.width, 0, 0) +
           "\n" + look.bold("For example") +
           "\n  PMX_SetTvType 0 PMX_TV_TYPE_PAL\n  state ucTvType\n  expect state ucTvType PMX_TV_TYPE_PAL\n\n" +
           look.bold("Verbs") + "\n" + in_columns(names, look.width) + "\n" + look.bold("Help") +
           "\n  help WORD   on an operation, a verb, a constant, a function of the platform\n"
           "              or a field; Tab completes all of them\n"
           "  quit        or Ctrl-D ends; Ctrl-C drops the line; Ctrl-R looks into the history\n";
}

} // namespace pmxboard
