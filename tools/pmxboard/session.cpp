#include "tools/pmxboard/session.h"

#include <algorithm>

#include "board/board.h"
#include "tools/pmxboard/step_error.h"

namespace pmxboard
{
namespace
{

const Verb* find_verb(std::string_view name)
{
    const auto& all = verbs();
    const auto found = std::find_if(all.begin(), all.end(), [name](const Verb& verb) { return verb.name == name; });
    return found == all.end() ? nullptr : &*found;
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

} // namespace

Session::Session(Output& output, std::string board, std::filesystem::path directory)
    : m_output(output), m_board(std::move(board)), m_directory(std::move(directory))
{
    board::set_console([this](std::string_view text) { m_output.console(text); });
    board::trace::set_sink([this](const board::TraceEntry& entry) { m_output.entry(entry); });
}

Session::~Session()
{
    board::set_console({});
    board::trace::set_sink({});
}

void Session::run_line(std::string_view text)
{
    const Line line(text);
    if (line.empty())
        return;
    if (line.word(0) == "expect")
    {
        m_output.expectation(line.from(0));
        need_power({});
        check_expectation(*this, line);
        ++m_expectations;
        return;
    }
    m_output.command(line.from(0));
    try
    {
        run_command(line);
    }
    catch (...)
    {
        m_output.flush();
        throw;
    }
    m_output.flush();
}

void Session::run_command(const Line& line)
{
    const std::string& name = line.word(0);
    const Verb* const verb = find_verb(name);
    const Operation* const operation = find(operations(), name);
    if (verb == nullptr && operation == nullptr)
        unknown_command(name);
    need_power(name);
    if (verb == nullptr || !verb->only_looks)
        remember(line);
    begin_window();
    if (verb != nullptr)
        verb->run(*this, line);
    else
        run(*operation, read_arguments(*operation, std::span(line.words()).subspan(1)));
    if (m_window_end == std::string::npos)
        end_window();
}

void Session::remember(const Line& line)
{
    m_last_command = line.from(0);
    m_before.reset();
    if (m_watches && m_powered)
        m_before = whole_state();
}

std::vector<Change> Session::changes() const
{
    return m_before ? pmxboard::changes(*m_before, whole_state()) : std::vector<Change>();
}

void Session::imagine(std::string_view text, std::ostream& shown)
{
    m_imagines = true;
    m_output.imagine(shown);
    run_command(Line(text));
    m_output.flush();
}

void Session::need_power(std::string_view command)
{
    if (!m_powered && command != "power-on")
        power_on({});
}

void Session::run(const Operation& operation, const Values& values)
{
    Outcome outcome;
    {
        const board::trace::Operation scope(operation.name);
        m_output.operation_begins(operation.name);
        outcome = operation.run(values);
    }
    set_outcome(operation.name, std::move(outcome));
}

void Session::set_outcome(std::string operation, Outcome outcome)
{
    m_last_operation = std::move(operation);
    m_last_outcome = std::move(outcome);
    m_output.outcome(m_last_outcome);
}

void Session::power_on(const std::string& board)
{
    if (m_powered)
        check_misuses();
    const std::string& name = board.empty() ? m_board : board;
    const std::filesystem::path beside = m_directory / name;
    const bool is_file = name.find('/') != name.npos || name.ends_with(".toml");
    const bool from_scenario = !board.empty() && is_file && std::filesystem::exists(beside);
    try
    {
        const board::Description description = board::load_description(from_scenario ? beside.string() : name);
        board::power_on(description);
    }
    catch (const board::DescriptionError& error)
    {
        throw StepFailed(std::string("the board cannot be powered on: ") + error.what());
    }
    m_powered = true;
    m_before.reset();
    m_output.powered_on();
    m_misuses_expected = 0;
    m_last_operation.clear();
    m_last_outcome = {};
    begin_window();
}

void Session::begin_window()
{
    m_window_begin = board::trace::entries().size();
    m_window_end = std::string::npos;
    m_cursor = 0;
    m_console_begin = board::console_text().size();
    m_console_end = std::string::npos;
}

void Session::end_window()
{
    m_window_end = board::trace::entries().size();
    m_console_end = board::console_text().size();
}

std::vector<board::TraceEntry> Session::window() const
{
    const auto& all = board::trace::entries();
    const std::size_t end = std::min(m_window_end, all.size());
    const std::size_t begin = std::min(m_window_begin, end);
    return { all.begin() + static_cast<std::ptrdiff_t>(begin), all.begin() + static_cast<std::ptrdiff_t>(end) };
}

std::string Session::console_window() const
{
    const std::string all = board::console_text();
    const std::size_t begin = std::min(m_console_begin, all.size());
    return all.substr(begin, m_console_end == std::string::npos ? m_console_end : m_console_end - begin);
}

std::filesystem::path Session::file(const std::string& name) const
{
    return m_directory / name;
}

void Session::check_misuses() const
{
    if (board::misuses() <= m_misuses_expected)
        return;
    std::string last;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (entry.kind == board::TraceEntry::Kind::Notice && entry.function == "misuse")
            last = entry.text;
    }
    throw StepFailed("the platform was misused " + std::to_string(board::misuses()) + " times, and " +
                     std::to_string(m_misuses_expected) + " were expected; the last: " + last);
}

void Session::finish()
{
    m_output.flush();
    if (m_powered)
        check_misuses();
}

} // namespace pmxboard
