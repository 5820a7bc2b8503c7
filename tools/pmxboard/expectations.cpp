#include <algorithm>
#include <cctype>

#include "board/board.h"
#include "tools/pmxboard/session.h"
#include "tools/pmxboard/step_error.h"
#include "tools/pmxboard/verb_words.h"
#include "tools/record_view/record_view.h"
#include "tools/record_view/store_watch.h"

namespace pmxboard
{
namespace
{

using board::TraceEntry;
using board::Value;

struct Expectation
{
    std::string_view name;
    std::string_view usage;
    void (*check)(Session& session, const Line& line);
};

const std::vector<Expectation>& expectations();

[[noreturn]] void wrong_expectation(const Line& line)
{
    for (const Expectation& expectation : expectations())
    {
        if (expectation.name == line.word(1))
            throw LineError("write: expect " + std::string(expectation.usage));
    }
    throw std::logic_error("an expectation without a row");
}

void need_words(const Line& line, std::size_t count)
{
    if (line.size() != count)
        wrong_expectation(line);
}

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

void expect_result(Session& session, const Line& line)
{
    need_words(line, 3);
    if (session.last_operation().empty())
        throw LineError("no operation has run yet");
    const auto& result = session.last_outcome().result;
    if (!result)
        throw LineError(session.last_operation() + " has no result");
    if (!matches(*result, line.word(2)))
        not_met("result " + line.word(2), result->to_text());
}

void expect_out(Session& session, const Line& line)
{
    need_words(line, 4);
    if (session.last_operation().empty())
        throw LineError("no operation has run yet");
    std::vector<std::string_view> names;
    for (const OutputValue& output : session.last_outcome().outputs)
    {
        names.push_back(output.name);
        if (output.name != line.word(2))
            continue;
        const bool untouched = line.word(3) == "untouched";
        if (untouched != !output.value || (output.value && !matches(*output.value, line.word(3))))
            not_met("*" + output.name + " = " + line.word(3), output.value ? output.value->to_text() : "untouched");
        return;
    }
    throw LineError("the last " + session.last_operation() + " had no output " + line.word(2) +
                    did_you_mean(line.word(2), names));
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
std::string store_line(const Session& session, const Line& line)
{
    if (!session.watches_stores())
        throw LineError("stores are not watched: write stores on before the command whose stores are expected");
    const std::string written = line.from(2);
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
std::string traced_line(const Session& session, const Line& line)
{
    const std::string written = line.from(2);
    if (written.empty())
        wrong_expectation(line);
    entry_matches(TraceEntry{}, written);
    if (line.word(2) == "SET")
        return store_line(session, line);
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

void expect_call(Session& session, const Line& line)
{
    const std::string written = traced_line(session, line);
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

void expect_next(Session& session, const Line& line)
{
    const std::string written = traced_line(session, line);
    const auto window = session.window();
    const std::size_t next = session.cursor();
    if (next >= window.size())
        not_met("next " + written, "nothing more");
    if (!entry_matches(window[next], written))
        not_met("next " + written, window[next].brief());
    session.set_cursor(next + 1);
}

void expect_no_more(Session& session, const Line& line)
{
    need_words(line, 2);
    const auto window = session.window();
    if (session.cursor() < window.size())
        not_met("no more", window[session.cursor()].brief());
}

void expect_none(Session& session, const Line& line)
{
    need_words(line, 3);
    need_platform_function(line.word(2));
    for (const TraceEntry& entry : session.window())
    {
        if (entry.function == line.word(2))
            not_met("none " + line.word(2), entry.brief());
    }
}

std::string read_quoted(const Line& line, std::size_t index)
{
    const Kind text{ .form = Kind::Form::Text, .names = {}, .members = {} };
    return read_value(text, line.word(index), "expect " + line.word(1)).string();
}

void expect_log(Session& session, const Line& line)
{
    need_words(line, 4);
    const std::int64_t level = read_number(board::names::Family::None, line.word(2), "the level");
    const std::string text = read_quoted(line, 3);
    std::string of_level;
    for (const TraceEntry& entry : session.window())
    {
        if (entry.kind != TraceEntry::Kind::Log || entry.function != "PMX_IsLog" || entry.level != level)
            continue;
        if (entry.text == text)
            return;
        of_level = entry.brief();
    }
    not_met("log " + line.from(2), of_level.empty() ? "no line of this level" : "at last " + of_level);
}

void expect_console(Session& session, const Line& line)
{
    need_words(line, 3);
    const std::string text = read_quoted(line, 2);
    const std::string console = session.console_window();
    constexpr std::size_t most = 200;
    if (console.find(text) == console.npos)
        not_met("console " + line.word(2),
                console.size() <= most ? board::quote(console)
                                       : "…" + board::quote(std::string_view(console).substr(console.size() - most)));
}

void expect_state(Session&, const Line& line)
{
    need_words(line, 4);
    const Value value = state_at(line.word(2));
    if (!matches(value, line.word(3)))
        not_met("state " + line.word(2) + " " + line.word(3), value.to_text());
}

std::uint32_t read_count(const Line& line)
{
    const Kind count{ .form = Kind::Form::Number, .bits = 32, .names = {}, .members = {} };
    return static_cast<std::uint32_t>(read_value(count, line.word(2), "the number of " + line.word(1)).as_number());
}

void expect_asserts(Session&, const Line& line)
{
    need_words(line, 3);
    if (board::asserts() != read_count(line))
        not_met("asserts " + line.word(2), std::to_string(board::asserts()));
}

void expect_misuses(Session& session, const Line& line)
{
    need_words(line, 3);
    if (board::misuses() != read_count(line))
        not_met("misuses " + line.word(2), std::to_string(board::misuses()));
    session.expect_misuses(read_count(line));
}

const std::vector<Expectation>& expectations()
{
    static const std::vector<Expectation> all = {
        { "result", "result VALUE", expect_result },
        { "out", "out ARGUMENT VALUE|untouched", expect_out },
        { "call", "call LINE, such as FUNCTION(ARGUMENT, …) = RESULT or SET FIELD OLD → NEW", expect_call },
        { "next", "next LINE, such as FUNCTION(ARGUMENT, …) = RESULT or SET FIELD OLD → NEW", expect_next },
        { "no-more", "no-more", expect_no_more },
        { "none", "none FUNCTION", expect_none },
        { "log", "log LEVEL \"text\"", expect_log },
        { "console", "console \"text\"", expect_console },
        { "state", "state PATH VALUE", expect_state },
        { "asserts", "asserts N", expect_asserts },
        { "misuses", "misuses N", expect_misuses },
    };
    return all;
}

} // namespace

void check_expectation(Session& session, const Line& line)
{
    std::vector<std::string_view> names;
    for (const Expectation& expectation : expectations())
        names.push_back(expectation.name);
    if (line.size() < 2)
        throw LineError("expect what? result, out, call, next, no-more, none, log, console, state, asserts or misuses");
    for (const Expectation& expectation : expectations())
    {
        if (expectation.name == line.word(1))
        {
            expectation.check(session, line);
            return;
        }
    }
    throw LineError("no expectation " + line.word(1) + did_you_mean(line.word(1), names));
}

} // namespace pmxboard
