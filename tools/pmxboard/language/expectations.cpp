// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <algorithm>
#include <cctype>
#include <chrono>

#include "board/board.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/picture_verbs.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/text/suggest.h"
#include "tools/record_view/record_view.h"
#include "tools/record_view/store_watch.h"

namespace pmxboard
{
namespace
{

using board::TraceEntry;
using board::Value;

[[noreturn]] void not_met(const std::string& expected, const std::string& found)
{
    throw StepFailed("expected " + expected + ", found " + found);
}

bool is_name(std::string_view token)
{
    return !token.empty() && (std::isalpha(static_cast<unsigned char>(token[0])) != 0 || token[0] == '_');
}

/** Whether a value is what was written. A number's misspelt name is a wrong line, not another value. */
bool matches(const Value& value, const std::string& written)
{
    try
    {
        if (value.kind() != Value::Kind::Number || !is_name(written) || written == "null")
            return value.matches(written);
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(error.what());
    }
    if (const auto constant = general_constant(written))
        return *constant == value.as_number();
    if (!board::names::number_of(written))
        throw LineError("no name " + written + did_you_mean(written, board::names::all()));
    return value.matches(written);
}

void expect_result(Session& session, const Words& words)
{
    if (session.last_operation().empty())
        throw LineError("no operation has run yet");
    const auto& result = session.last_outcome().result;
    if (!result)
        throw LineError(session.last_operation() + " has no result");
    if (!matches(*result, words.at("VALUE")))
        not_met("result " + words.at("VALUE"), result->to_text());
}

void expect_out(Session& session, const Words& words)
{
    if (session.last_operation().empty())
        throw LineError("no operation has run yet");
    const std::string& wanted = words.at("ARGUMENT");
    const std::string& value = words.line().word(3);
    std::vector<std::string_view> names;
    for (const OutputValue& output : session.last_outcome().outputs)
    {
        names.push_back(output.name);
        if (output.name != wanted)
            continue;
        if (words.has("untouched") != !output.value || (output.value && !matches(*output.value, value)))
            not_met("*" + output.name + " = " + value, output.value ? output.value->to_text() : "untouched");
        return;
    }
    throw LineError("the last " + session.last_operation() + " had no output " + wanted + did_you_mean(wanted, names));
}

bool entry_matches(const TraceEntry& entry, const std::string& written)
{
    try
    {
        return entry.matches(written);
    }
    catch (const std::invalid_argument& error)
    {
        throw LineError(error.what());
    }
}

/** A value of a field as it may stand in a store: a name that is none is a wrong line, not another value. */
void check_stored_value(const record_view::FieldType& field, const std::string& written)
{
    if (written != "*" && written != "null")
        read_number(board::names::family_of(field.record, field.member), written, field.path);
}

/** `SET FIELD OLD → NEW`, the field by the name that it has in the trace. */
std::string store_line(const Session& session, const Words& words)
{
    if (!session.watches_stores())
        throw LineError("stores are not watched: write stores on before the command whose stores are expected");
    const std::string written = words.from("LINE");
    const board::trace::StoreLine store = board::trace::read_store_line(written);
    try
    {
        const record_view::FieldType type = record_view::type_of(store.field);
        check_stored_value(type, std::string(store.from));
        check_stored_value(type, std::string(store.to));
    }
    catch (const record_view::FieldError& error)
    {
        throw LineError(error.what());
    }
    std::string named = "SET " + record_view::traced_name(store.field);
    named.append(" ").append(store.from).append(" → ").append(store.to);
    return store.by.empty() ? named : named.append(" (").append(store.by).append(")");
}

/** The line behind `expect call` or `expect next`, refused when no entry can ever look so. */
std::string traced_line(const Session& session, const Words& words)
{
    const std::string written = words.from("LINE");
    entry_matches(TraceEntry{}, written);
    if (words.at("LINE") == "SET")
        return store_line(session, words);
    const std::size_t bracket = written.find('(');
    if (bracket == written.npos || written.find('"') < bracket)
        return written;

    std::string function = written.substr(0, bracket);
    function.erase(function.find_last_not_of(' ') + 1);
    need_platform_function(function);
    return written;
}

/** What stands in the place of a line that was not found: the nearest thing to it. */
std::string instead_of(const std::string& written, const std::vector<TraceEntry>& window, std::size_t cursor)
{
    const std::string head = written.substr(0, written.find_first_of("( "));
    for (std::size_t i = cursor; i < window.size(); ++i)
    {
        const std::string brief = window[i].brief();
        if (brief.substr(0, brief.find_first_of("( ")) == head)
            return brief;
    }
    for (std::size_t i = 0; i < std::min(cursor, window.size()); ++i)
    {
        if (entry_matches(window[i], written))
            return "it before " + window[cursor - 1].brief() + ", which is already behind";
    }
    if (window.empty())
        return "that the last command made no call at all";
    return cursor == 0 ? "none" : "none after " + window[cursor - 1].brief();
}

void expect_call(Session& session, const Words& words)
{
    const std::string written = traced_line(session, words);
    const auto window = session.window();
    for (std::size_t i = session.cursor(); i < window.size(); ++i)
    {
        if (entry_matches(window[i], written))
        {
            session.set_cursor(i + 1);
            return;
        }
    }
    not_met("call " + written, instead_of(written, window, session.cursor()));
}

void expect_next(Session& session, const Words& words)
{
    const std::string written = traced_line(session, words);
    const auto window = session.window();
    const std::size_t next = session.cursor();
    if (next >= window.size())
        not_met("next " + written, "nothing more");
    if (!entry_matches(window[next], written))
        not_met("next " + written, window[next].brief());
    session.set_cursor(next + 1);
}

/** The moment of the entry that was matched last. */
std::chrono::microseconds moment_of_match(const Session& session)
{
    if (session.cursor() == 0)
        throw LineError("whose time? An expect call or expect next stands before it");
    return std::chrono::microseconds(session.window().at(session.cursor() - 1).time_us);
}

/** "about": a tenth of it earlier or later, and a millisecond at least. */
void check_time(const Words& words, std::chrono::microseconds found)
{
    const std::chrono::microseconds wanted = read_time(words.at("TIME"));
    const std::chrono::microseconds slack =
        words.has("about") ? std::max(wanted / 10, std::chrono::microseconds(1000)) : std::chrono::microseconds(0);
    if (found < wanted - slack || found > wanted + slack)
        not_met(words.line().from(1), std::to_string(found.count()) + "us");
}

void expect_at(Session& session, const Words& words)
{
    check_time(words, moment_of_match(session));
}

void expect_after(Session& session, const Words& words)
{
    check_time(words, moment_of_match(session) - session.begun());
}

void expect_no_more(Session& session, const Words&)
{
    const auto window = session.window();
    if (session.cursor() < window.size())
        not_met("no more", window[session.cursor()].brief());
}

void expect_none(Session& session, const Words& words)
{
    const std::string& function = words.at("FUNCTION");
    need_platform_function(function);
    for (const TraceEntry& entry : session.window())
    {
        if (entry.function == function)
            not_met("none " + function, entry.brief());
    }
}

void expect_log(Session& session, const Words& words)
{
    const std::int64_t level = read_number(board::names::Family::None, words.at("LEVEL"), "the level");
    const std::string text = read_text(words.at("\"text\""), "expect log");
    std::string of_level;
    for (const TraceEntry& entry : session.window())
    {
        if (entry.kind != TraceEntry::Kind::Log || entry.function != "PMX_IsLog" || entry.level != level)
            continue;
        if (entry.text == text)
            return;
        of_level = entry.brief();
    }
    not_met("log " + words.from("LEVEL"), of_level.empty() ? "no line of this level" : "at last " + of_level);
}

void expect_console(Session& session, const Words& words)
{
    const std::string text = read_text(words.at("\"text\""), "expect console");
    const std::string console = session.console_window();
    constexpr std::size_t most = 200;
    if (console.find(text) == console.npos)
        not_met("console " + words.at("\"text\""),
                console.size() <= most ? board::quote(console)
                                       : "…" + board::quote(std::string_view(console).substr(console.size() - most)));
}

void expect_state(Session&, const Words& words)
{
    const Value value = state_at(words.at("PATH"));
    if (!matches(value, words.at("VALUE")))
        not_met("state " + words.from("PATH"), value.to_text());
}

std::uint32_t count_in(const Words& words, const std::string& what)
{
    return named_number(words.at("N"), "the number of " + what, board::names::Family::None);
}

void expect_asserts(Session&, const Words& words)
{
    if (board::asserts() != count_in(words, "asserts"))
        not_met("asserts " + words.at("N"), std::to_string(board::asserts()));
}

void expect_misuses(Session& session, const Words& words)
{
    if (board::misuses() != count_in(words, "misuses"))
        not_met("misuses " + words.at("N"), std::to_string(board::misuses()));
    session.expect_misuses(count_in(words, "misuses"));
}

} // namespace

void check_expectation(Session& session, const Line& line)
{
    const Verb& verb = *find_verb("expect");
    std::vector<std::string> kinds;
    for (const VerbForm& form : verb.forms)
    {
        const std::string kind = Line(form.form.written()).word(1);
        if (kinds.empty() || kinds.back() != kind) // one may have several forms
            kinds.push_back(kind);
    }
    if (line.size() < 2)
    {
        std::string listed;
        for (const std::string& kind : kinds)
            listed += (listed.empty() ? "" : kind == kinds.back() ? " or " : ", ") + kind;
        throw LineError("expect what? " + listed);
    }
    if (std::find(kinds.begin(), kinds.end(), line.word(1)) == kinds.end())
        throw LineError("no expectation " + line.word(1) + did_you_mean(line.word(1), { kinds.begin(), kinds.end() }));
    const ReadForm read = read_form(verb, line);
    read.form->run(session, read.words);
}

std::vector<Verb> expectation_verbs()
{
    return {
        { "expect",
          { { "expect result VALUE", "the last operation returned it", expect_result, looks },
            { "expect out ARGUMENT VALUE|untouched", "it wrote that to an output; or it wrote nothing there",
              expect_out, looks },
            { "expect call LINE", "an entry behind the last one that was matched is this one; others may stand between",
              expect_call, looks },
            { "expect next LINE", "the very next entry is this one", expect_next, looks },
            { "expect at [about] TIME",
              "the entry that was matched last began at this time since power-on; `about`, a tenth of it earlier or "
              "later, and a millisecond at least",
              expect_at, looks },
            { "expect after [about] TIME", "it began so long after the command", expect_after, looks },
            { "expect no-more", "nothing stands behind the last one that was matched", expect_no_more, looks },
            { "expect none FUNCTION", "the platform function was not called", expect_none, looks },
            { "expect log LEVEL \"text\"", "`PMX_IsLog` was called so, whether the console showed it or not",
              expect_log, looks },
            { "expect console \"text\"", "the console printed this, among other things", expect_console, looks },
            { "expect state PATH VALUE", "it is so", expect_state, looks },
            { "expect asserts N", "so many assertions were reported since power-on", expect_asserts, looks },
            { "expect picture OUTPUT X,Y R,G,B [TOLERANCE]",
              "a viewer sees this colour there, within 2 or so much in each of the three", expect_colour, looks },
            { "expect picture OUTPUT FILE",
              "a viewer sees the picture of a file, relative to the scenario; where that is smaller, in its size. "
              "`all` are the four outputs in one picture. What differs is written beside the file",
              expect_file, looks },
            { "expect misuses N", "the board found so many misuses of the platform since power-on", expect_misuses,
              looks } },
          true },
    };
}

} // namespace pmxboard
