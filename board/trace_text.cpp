// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <algorithm>
#include <stdexcept>

#include "board/tokens.h"
#include "board/trace.h"

namespace board
{
namespace
{

constexpr std::string_view word_characters = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789_";

std::string text_of(const TraceEntry& entry, bool with_names)
{
    switch (entry.kind)
    {
    case TraceEntry::Kind::Log:
    {
        const std::string head = entry.function == "PMX_IsLog" ? "LOG" + std::to_string(entry.level) : entry.function;
        return head + ' ' + quote(entry.text);
    }
    case TraceEntry::Kind::Notice: return "NOTICE " + entry.function + ' ' + quote(entry.text);
    case TraceEntry::Kind::Store:
        return "SET " + entry.function + ' ' + entry.arguments[0].value.to_text() + " → " +
               entry.arguments[1].value.to_text() + (entry.by == entry.operation ? "" : "  (" + entry.by + ")");
    case TraceEntry::Kind::Call:
    case TraceEntry::Kind::Assert: break;
    }
    std::string line = entry.function + '(';
    for (const TraceArgument& argument : entry.arguments)
    {
        if (entry.kind == TraceEntry::Kind::Assert && argument.name == "i4Line")
            continue; // code moves; a trace does not change with it
        if (line.back() != '(')
            line += ", ";
        if (with_names)
            line += argument.name + '=';
        line += argument.value.to_text();
    }
    line += ')';
    if (entry.result)
        line += " = " + entry.result->to_text();
    return line;
}

[[noreturn]] void malformed(std::string_view line, std::string_view reason)
{
    throw std::invalid_argument(std::string(reason) + ": " + std::string(line));
}

std::string_view word(std::string_view& rest)
{
    const std::size_t end = std::min(rest.find_first_not_of(word_characters), rest.size());
    const std::string_view found = rest.substr(0, end);
    rest = tokens::trim(rest.substr(end));
    return found;
}

bool text_matches(std::string_view line, std::string_view token, const std::string& text)
{
    if (token == "*")
        return true;
    if (token.empty())
        malformed(line, "a text in double quotes is missing");
    return unquote(token) == text;
}

bool argument_matches(const TraceArgument& argument, std::string_view token)
{
    const std::size_t name_end = token.find_first_not_of(word_characters);
    if (name_end != token.npos && name_end != 0 && tokens::trim(token.substr(name_end)).starts_with('='))
    {
        if (token.substr(0, name_end) != argument.name)
            return false;
        token.remove_prefix(token.find('=') + 1);
    }
    return argument.value.matches(token);
}

struct CallLine
{
    std::string_view function;
    std::vector<std::string_view> arguments;
    std::string_view result; ///< empty when left out
};

CallLine parse_call(std::string_view line, std::string_view function, std::string_view rest)
{
    if (!rest.starts_with('('))
        malformed(line, "a call is written FUNCTION(ARGUMENTS) = RESULT");
    const std::size_t close = tokens::closing(rest, 0);
    CallLine call{ function, tokens::split(rest.substr(1, close - 1)), {} };
    rest = tokens::trim(rest.substr(close + 1));
    if (rest.empty())
        return call;
    if (!rest.starts_with('='))
        malformed(line, "behind a call's arguments only = RESULT may stand");
    call.result = tokens::trim(rest.substr(1));
    if (call.result.empty())
        malformed(line, "the result behind = is missing");
    return call;
}

bool store_matches(const TraceEntry& entry, const trace::StoreLine& store)
{
    return entry.kind == TraceEntry::Kind::Store && store.field == entry.function &&
           entry.arguments[0].value.matches(store.from) && entry.arguments[1].value.matches(store.to) &&
           (store.by.empty() || store.by == entry.by);
}

bool call_matches(const TraceEntry& entry, const CallLine& call)
{
    if (call.function != entry.function)
        return false;
    if (!call.result.empty() && !(entry.result && entry.result->matches(call.result)))
        return false;
    const std::size_t shown = entry.arguments.size() - (entry.kind == TraceEntry::Kind::Assert ? 1 : 0);
    const bool is_open = !call.arguments.empty() && (call.arguments.back() == "..." || call.arguments.back() == "…");
    const std::size_t told = call.arguments.size() - (is_open ? 1 : 0);
    if (told > shown || (told < shown && !is_open))
        return false;
    return std::equal(
        call.arguments.begin(), call.arguments.begin() + static_cast<std::ptrdiff_t>(told), entry.arguments.begin(),
        [](std::string_view token, const TraceArgument& argument) { return argument_matches(argument, token); });
}

} // namespace

trace::StoreLine trace::read_store_line(std::string_view line)
{
    constexpr const char* form = "a store is written SET FIELD OLD → NEW";
    std::string_view rest = tokens::trim(line);
    if (word(rest) != "SET")
        malformed(line, form);
    const std::size_t field_end = rest.find_first_of(" \t");
    const std::size_t arrow = std::min(rest.find("→"), rest.find("->"));
    if (arrow == rest.npos || field_end > arrow)
        malformed(line, form);
    const std::size_t arrow_size = rest.substr(arrow).starts_with("->") ? 2 : std::string_view("→").size();
    StoreLine store{ rest.substr(0, field_end),
                     tokens::trim(rest.substr(field_end, arrow - field_end)),
                     tokens::trim(rest.substr(arrow + arrow_size)),
                     {} };
    if (const std::size_t bracket = store.to.find('('); bracket != store.to.npos)
    {
        if (tokens::closing(store.to, bracket) != store.to.size() - 1)
            malformed(line, "behind a store only (WHO) may stand");
        store.by = tokens::trim(store.to.substr(bracket + 1, store.to.size() - bracket - 2));
        store.to = tokens::trim(store.to.substr(0, bracket));
        if (store.by.empty())
            malformed(line, "who stored is missing in the brackets");
    }
    const auto is_value = [](std::string_view token) {
        return !token.empty() && token.find_first_of(" \t") == token.npos;
    };
    if (!is_value(store.from) || !is_value(store.to))
        malformed(line, form);
    return store;
}

std::string TraceEntry::brief() const
{
    return text_of(*this, false);
}

std::string TraceEntry::named() const
{
    return text_of(*this, true);
}

bool TraceEntry::matches(std::string_view written) const
{
    const std::string_view line = tokens::trim(written);
    std::string_view rest = line;
    const std::string_view head = word(rest);
    if (head.empty())
        malformed(line,
                  "a line begins with a function's name, LOG and a level, Printf, UTIL_Printf, Assert, NOTICE or SET");

    if (head == "NOTICE")
    {
        const std::string_view notice = word(rest);
        if (notice.empty())
            malformed(line, "a notice is written NOTICE KIND \"text\"");
        const bool same = text_matches(line, rest, text);
        return same && kind == Kind::Notice && notice == function;
    }
    if (head == "SET" && !rest.starts_with('('))
        return store_matches(*this, trace::read_store_line(line));
    if (head == "Printf" || head == "UTIL_Printf")
    {
        const bool same = text_matches(line, rest, text);
        return same && kind == Kind::Log && head == function;
    }
    if (head.starts_with("LOG") && !rest.starts_with('('))
    {
        const auto written_level = tokens::number(head.substr(3));
        if (!written_level && !(head == "LOG" && rest.starts_with('-')))
            malformed(line, "a level stands behind LOG");
        std::int64_t wanted = written_level.value_or(0);
        if (!written_level)
        {
            rest.remove_prefix(1);
            wanted = -tokens::number(word(rest)).value_or(0);
        }
        const bool same = text_matches(line, rest, text);
        return same && kind == Kind::Log && function == "PMX_IsLog" && wanted == level;
    }

    const CallLine call = parse_call(line, head, rest);
    return (kind == Kind::Call || kind == Kind::Assert) && call_matches(*this, call);
}

} // namespace board
