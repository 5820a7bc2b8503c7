// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/language/session.h"

#include <algorithm>
#include <istream>
#include <memory>
#include <utility>

#include "board/board.h"
#include "board/board_check.h"
#include "board/console.h"
#include "board/files.h"
#include "board/threads.h"
#include "tools/pmxboard/files/ending.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/paths.h"
#include "tools/record_view/record_view.h"
#include "tools/record_view/store_watch.h"

namespace pmxboard
{
namespace
{

/** Where the outcome of a command goes that runs inside a platform call, in each thread; null when none does. */
thread_local Outcome* meanwhile_outcome = nullptr;

/** Throws LineError: it is the line that names the file. */
std::unique_ptr<std::istream> open_included(const std::string& path)
try
{
    return board::files::open_lines(path);
}
catch (const board::files::FileError& error)
{
    throw LineError(error.what());
}

constexpr const char* others_called = "the program has called the layer or the platform itself, which no command says";

/** While it lives a command runs: one more. */
class Running
{
public:
    explicit Running(unsigned& count) : m_count(count) { ++m_count; }
    ~Running() { --m_count; }
    Running(const Running&) = delete;
    Running& operator=(const Running&) = delete;

private:
    unsigned& m_count;
};

/** An outcome in a notice: "= 1, *pucMode = RES_480P". */
std::string outcome_text(const Outcome& outcome)
{
    std::string text = outcome.result ? ", = " + outcome.result->to_text() : std::string();
    for (const OutputValue& output : outcome.outputs)
        text += ", *" + output.name + (output.value ? " = " + output.value->to_text() : std::string(" untouched"));
    return text.empty() ? text : text.substr(2);
}

} // namespace

Session::Session(Output& output, std::string board, std::filesystem::path directory)
    : m_output(output), m_board(std::move(board)), m_directory(std::move(directory))
{
    board::set_console([this](std::string_view text) { m_output.console(text); });
    board::trace::set_sink([this](const board::TraceEntry& entry) {
        if (entry.kind == board::TraceEntry::Kind::Notice && entry.function == "misuse")
            m_last_misuse = entry.text;
        if (m_notices_others && m_running == 0)
            m_steps.lose(others_called);
        m_output.entry(entry);
    });
    record_view::watch_stores(m_output.hears_stores());
}

Session::~Session()
{
    board::set_console({});
    board::trace::set_sink({});
    board::meanwhiles::forget_all();
    board::threads::end_all();
    record_view::watch_stores(false);
}

void Session::run_line(std::string_view text)
{
    const Line line(text);
    if (line.empty())
        return;
    look_for_others();
    const Running running(m_running);
    if (line.word(0) == "expect")
    {
        m_output.expectation(line.from(0));
        need_power({});
        check_expectation(*this, line);
        ++m_expectations;
        if (line.word(1) == "misuses")
            keep_step(line);
        return;
    }
    m_output.command(line.from(0));
    const std::size_t commands_before = m_commands;
    try
    {
        run_command(line);
    }
    catch (const LineError&)
    {
        m_output.flush();
        board::meanwhiles::forget_failures(); // the first one that was told is enough
        throw;
    }
    catch (...)
    {
        m_output.flush();
        board::meanwhiles::forget_failures();
        keep_step(line, true); // it has failed in the middle of what it did
        take_state();
        throw;
    }
    m_output.flush();
    keep_step(line);
    take_state();
    if (m_shows_explanations && m_commands != commands_before && m_explanation && m_explanation->refusal() != nullptr)
        m_output.added(to_json_line(*m_explanation), to_text(*m_explanation, m_output.look()));
}

void Session::notice_others()
{
    m_notices_others = true;
    take_state();
}

/** What has an entry in the trace was noticed when it happened. */
void Session::look_for_others()
{
    if (m_left && m_running == 0 && m_steps.lost().empty() && !pmxboard::changes(*m_left, whole_state()).empty())
        m_steps.lose(others_called);
}

void Session::take_state()
{
    m_left.reset();
    if (m_notices_others && m_running <= 1 && m_steps.lost().empty())
        m_left = whole_state();
}

void Session::run_command(const Line& line)
{
    const std::string& name = line.word(0);
    const bool acts = !only_looks(line);
    need_power(name);
    if (acts)
    {
        forget_the_past();
        remember(line);
        explain_ahead(line);
    }
    begin_window();
    carry_out(line);
    board::trace::look();
    if (m_window_end == std::string::npos)
        end_window();
    board::meanwhiles::rethrow_failure();
}

void Session::carry_out(const Line& line)
{
    const Command command = find_command(line.word(0));
    if (command.verb != nullptr)
    {
        const ReadForm read = read_form(*command.verb, line);
        read.form->run(*this, read.words);
    }
    else
        run(*command.operation, read_arguments(*command.operation, std::span(line.words()).subspan(1)));
}

void Session::run_meanwhile(const Line& line)
{
    Outcome outcome;
    Outcome* const outer = std::exchange(meanwhile_outcome, &outcome);
    try
    {
        carry_out(line);
    }
    catch (...)
    {
        meanwhile_outcome = outer;
        throw;
    }
    meanwhile_outcome = outer;
    if (const std::string text = outcome_text(outcome); !text.empty())
        board::trace::notice("meanwhile", text);
}

void Session::run_stopped(const Line& line)
{
    const std::string& name = line.word(0);
    const bool only_looked = only_looks(line);
    if (name == "expect" || name == "power-on" || name == "include" || name == "what-if" || name == "restore")
        throw LineError(name + " waits until the layer has gone on: continue");
    const Steps before = std::exchange(m_steps, {});
    m_steps.begin({});
    m_steps.lose("it was saved while the layer was stopped in the middle of a call");
    try
    {
        if (only_looked)
            carry_out(line);
        else
            run_meanwhile(line);
    }
    catch (...)
    {
        m_steps = before;
        throw;
    }
    m_steps = before;
    if (!only_looked)
        m_steps.lose("a line was typed while the layer was stopped in the middle of a call");
}

bool Session::is_meanwhile()
{
    return meanwhile_outcome != nullptr;
}

void Session::watch_stores(bool on)
{
    m_watches_stores = on;
    record_view::watch_stores(on || m_output.hears_stores());
}

/** Nobody looks further back than the last command. In large pieces, so that it costs next to nothing. */
void Session::forget_the_past()
{
    constexpr std::size_t many_entries = 4096;
    constexpr std::size_t much_text = 65536;
    if (board::trace::entries().size() > many_entries)
        board::trace::clear();
    if (board::console::printed() > much_text)
        board::console::forget();
}

void Session::remember(const Line& line)
{
    m_last_command = line.from(0);
    m_before.reset();
    if (m_watches && m_powered)
        m_before = whole_state();
}

/** Whether a command calls the layer, and does nothing besides that a copy should not do, too: files are read once. */
bool Session::leads_into_layer(const Line& line)
{
    static constexpr std::string_view verbs[] = { "outputs",      "ipmx",        "source",  "suspend", "resume",
                                                  "display-part", "video-plane", "advance", "sink" };
    const bool shows_picture = line.words().size() > 2 && line.word(0) == "source" && line.word(2) == "picture";
    if (shows_picture)
        return false;
    return find_command(line.word(0)).operation != nullptr ||
           std::find(std::begin(verbs), std::end(verbs), line.word(0)) != std::end(verbs);
}

/** While everything is as the command will find it. A command that cannot be explained is carried out all the same. */
void Session::explain_ahead(const Line& line)
{
    if (m_imagined != 0 || m_restoring)
        return;
    ++m_commands;
    m_explanation.reset();
    if (!m_explains || !leads_into_layer(line) || (m_explained_alone && *m_explained_alone != m_commands))
        return;
    try
    {
        m_explanation = explain(*this, line.from(0), quick);
        if (!m_shows_explanations)
            return;
        if (const Reason* const refusal = m_explanation->refusal(); refusal != nullptr)
            m_output.refusal(sentence_of(*refusal));
        m_output.explanation(to_json_line(*m_explanation));
    }
    catch (const std::exception&)
    {
        m_explanation.reset(); // the command itself will tell what is wrong
    }
}

void Session::forget_outcome()
{
    m_last_operation.clear();
    m_last_outcome = {};
}

std::vector<Change> Session::changes() const
{
    return m_before ? pmxboard::changes(*m_before, whole_state()) : std::vector<Change>();
}

void Session::imagine(std::string_view text, std::ostream& shown)
{
    constexpr unsigned deepest = 8;
    if (m_imagined == deepest)
        throw LineError("what-if stands at most " + std::to_string(deepest) + " times within itself");
    const Running imagined(m_imagined);
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
        if (!is_meanwhile())
            m_output.operation_begins(operation.name);
        outcome = operation.run(values);
    }
    set_outcome(operation.name, std::move(outcome));
}

void Session::set_outcome(std::string operation, Outcome outcome)
{
    if (is_meanwhile())
    {
        *meanwhile_outcome = std::move(outcome);
        return;
    }
    m_last_operation = std::move(operation);
    m_last_outcome = std::move(outcome);
    m_output.outcome(m_last_outcome);
}

void Session::power_on(const std::string& board)
{
    if (m_powered)
    {
        board::threads::end_all();
        check_misuses();
        check_meanwhiles();
    }
    const std::string& name = board.empty() ? m_board : board;
    const std::filesystem::path beside = m_directory / name;
    std::error_code error;
    const bool is_file = name.find('/') != name.npos || name.ends_with(".toml");
    const bool from_scenario = !board.empty() && is_file && std::filesystem::exists(beside, error);
    std::string check;
    const Running running(m_running);
    try
    {
        board::CheckedDescription loaded = board::load_checked(from_scenario ? beside.string() : name);
        check = std::move(loaded.check);
        board::power_on(loaded.description);
    }
    catch (const board::DescriptionError& wrong)
    {
        throw StepFailed(std::string("the board cannot be powered on: ") + wrong.what());
    }
    m_powered = true;
    const Step step{ board.empty() ? std::string() : m_directory.string(), "power-on " + word_of_file(name) };
    m_steps.begin(step, std::move(check));
    // What is seen goes on through a power-on.
    if (m_watches_stores)
        m_steps.add({ .directory = step.directory, .line = "stores on" });
    if (!m_output.shows_trace())
        m_steps.add({ .directory = step.directory, .line = "trace off" });
    m_before.reset();
    m_output.powered_on();
    m_misuses_expected = 0;
    m_last_operation.clear();
    m_last_outcome = {};
    begin_window();
}

void Session::begin_window()
{
    if (is_meanwhile())
        return;
    m_window_begin = board::trace::entries().size();
    m_window_end = std::string::npos;
    m_cursor = 0;
    m_begun = board::now();
    m_console_begin = board::console::printed();
    m_console_end = std::string::npos;
}

void Session::end_window()
{
    if (is_meanwhile())
        return;
    m_window_end = board::trace::entries().size();
    m_console_end = board::console::printed();
}

void Session::open_window()
{
    m_window_end = std::string::npos;
    m_console_end = std::string::npos;
}

std::vector<board::TraceEntry> Session::window() const
{
    const auto& all = board::trace::entries();
    const std::size_t end = std::min(m_window_end, all.size());
    const std::size_t begin = std::min(m_window_begin, end);
    std::vector<board::TraceEntry> window(all.begin() + static_cast<std::ptrdiff_t>(begin),
                                          all.begin() + static_cast<std::ptrdiff_t>(end));
    // What a scenario expects does not depend on how it is shown.
    if (!m_watches_stores)
        std::erase_if(window, [](const auto& entry) { return entry.kind == board::TraceEntry::Kind::Store; });
    return window;
}

std::string Session::console_window() const
{
    return board::console::printed(m_console_begin, m_console_end);
}

std::filesystem::path Session::file(const std::string& name) const
{
    return m_directory / file_name(name);
}

std::string word_of_file(const std::string& name)
{
    const std::string quoted = board::quote(name);
    const bool is_plain = quoted.size() == name.size() + 2 && name.find_first_of(" #[]{}()") == name.npos;
    return is_plain ? name : quoted;
}

std::string file_name(const std::string& word)
try
{
    const std::string name = word.starts_with('"') ? board::unquote(word) : word;
    if (name.empty() || name.find('\0') != name.npos)
        throw LineError("a file has a name, and no \\x00 in it");
    return name;
}
catch (const std::invalid_argument& error)
{
    throw LineError(error.what());
}

void Session::check_misuses() const
{
    if (board::misuses() <= m_misuses_expected)
        return;
    throw StepFailed("the platform was misused " + std::to_string(board::misuses()) + " times, and " +
                     std::to_string(m_misuses_expected) + " were expected; the last: " + m_last_misuse);
}

/** What was to happen and has not: the scenario's author has miscounted, or armed the wrong function. */
void Session::check_meanwhiles() const
{
    const auto armed = board::meanwhiles::armed();
    board::meanwhiles::forget_all();
    if (armed.empty())
        return;
    const auto& first = armed.front();
    throw StepFailed(first.name + ": never happened; " + first.function + " was called " + std::to_string(first.calls) +
                     " times since");
}

void Session::include(const std::string& name)
{
    constexpr std::size_t deepest = 8; // so that the way to a mistake can be told
    const std::filesystem::path path = file(name);
    std::error_code error;
    std::filesystem::path really = std::filesystem::weakly_canonical(path, error);
    if (error)
        really = path; // told when it is opened
    if (std::find(m_included.begin(), m_included.end(), really) != m_included.end())
        throw LineError(path.string() + " includes itself");
    if (m_included.size() == deepest)
        throw LineError("files include each other more than " + std::to_string(deepest) + " deep");
    // Files that include each other twice would grow without end.
    constexpr unsigned most = 1000;
    m_includes = m_included.empty() ? 1 : m_includes + 1;
    if (m_includes > most)
        throw LineError("one include leads to more than " + std::to_string(most) + " files");
    const std::filesystem::path directory = std::exchange(m_directory, path.parent_path());
    m_included.push_back(really);
    try
    {
        run_file(path.string(), file_name(name));
    }
    catch (...)
    {
        m_included.pop_back();
        m_directory = directory;
        throw;
    }
    m_included.pop_back();
    m_directory = directory;
}

/** What goes wrong is told with the place. */
void Session::run_file(const std::string& path, const std::string& name)
{
    const auto lines = open_included(path);
    const std::string from = current_place();
    unsigned number = 1;
    const auto place = [&] { return name + ":" + std::to_string(number); };
    try
    {
        for (std::string text; board::files::next_line(*lines, text); ++number)
        {
            set_place(from + ": " + place());
            run_line(text);
        }
    }
    catch (const LineError& error)
    {
        throw LineError(place() + ": " + error.what());
    }
    catch (const std::exception& error)
    {
        throw StepFailed(place() + ": " + error.what());
    }
    set_place(from);
}

void Session::finish()
{
    m_output.flush();
    if (!m_powered)
        return;
    board::threads::end_all();
    m_output.flush();
    check_misuses();
    check_meanwhiles();
}

} // namespace pmxboard
