// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/language/runner.h"

#include <unistd.h>

#include <algorithm>
#include <istream>
#include <ostream>

#include "board/files.h"
#include "board/threads.h"
#include "tools/pmxboard/files/ending.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/apart.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/status.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
namespace
{

std::filesystem::path directory_of(const std::string& name)
{
    return name == "-" ? std::filesystem::path(".") : std::filesystem::path(name).parent_path();
}

/** Whether a line is about `diff`, by itself or within another command. */
bool mentions_changes(const std::string& text)
try
{
    const Line line(text);
    // Nobody looks ahead into what a scenario includes.
    return std::any_of(line.words().begin(), line.words().end(),
                       [](const std::string& word) { return word == "diff" || word == "include"; });
}
catch (const LineError&)
{
    return false; // told when its turn comes
}

/** Whether a line of a file is. Keeping the state before each command costs more than most commands. What comes through
 *  a pipe is not read ahead: somebody may be typing it. */
bool asks_for_changes(std::istream& lines)
{
    const auto begin = lines.tellg();
    if (begin < 0)
    {
        lines.clear();
        return true;
    }
    bool found = false;
    try
    {
        for (std::string text; !found && board::files::next_line(lines, text);)
            found = mentions_changes(text);
    }
    catch (const board::files::FileError&)
    {
        found = false; // told when its turn comes
    }
    lines.clear();
    lines.seekg(begin);
    return found;
}

/** Who reads a run and not its state would take the record's word. */
void note_disagreements(Output& output)
{
    if (!output.for_people())
        return;
    for (const std::string& disagreement : status_of(whole_state(), {}).disagreements)
        output.remark("note: " + disagreement);
}

/** The line of this place. One that cannot be read ends the run; what was shown until then is shown. */
bool next_line(std::istream& lines, std::string& text, Output& output, const std::string& place)
try
{
    return board::files::next_line(lines, text);
}
catch (const board::files::FileError& error)
{
    output.flush();
    throw board::files::FileError(place + ": " + error.what());
}

/** Carry the lines out once more, in a copy of the process, as far as a command, and tell why that does what it does.
 *  Empty when there is nothing to tell. */
std::string explained_again(const Scenario& scenario, std::size_t command)
try
{
    constexpr unsigned longest_s = 10;
    alarm(longest_s); // a scenario may wait for something that has been read
    OutputOptions options;
    options.quiet = true;
    Output output(options);
    Session session(output, scenario.board, directory_of(scenario.name));
    session.explain_command(command);
    const auto lines = board::files::open_lines(scenario.name);
    for (std::string text; session.commands() < command && board::files::next_line(*lines, text);)
    {
        try
        {
            session.run_line(text);
        }
        catch (const std::exception&)
        {
            continue; // it was told the first time
        }
    }
    const auto& explanation = session.explanation();
    return explanation && !explanation->reasons.empty() ? to_text(*explanation, Look{ text_width(), false })
                                                        : std::string();
}
catch (const std::exception&)
{
    return {}; // the failure itself has been told
}

std::string why(const Scenario& scenario, const Session& session)
try
{
    if (session.commands() == 0 || !board::threads::waiting().empty() ||
        !std::filesystem::is_regular_file(scenario.name)) // a pipe has nothing to be read again
        return {};
    const Apart apart = run_apart([&](std::ostream&) { return explained_again(scenario, session.commands()); });
    return apart.death.empty() ? apart.answer : std::string();
}
catch (const std::exception&)
{
    return {}; // the failure itself has been told
}

/** What a scenario does not do as it says. */
class Failures
{
public:
    Failures(const Scenario& scenario, const Session& session, Output& output, std::ostream& diagnostics)
        : m_scenario(scenario), m_session(session), m_output(output), m_diagnostics(diagnostics)
    {
    }

    bool any() const { return m_any; }

    /** Do something; whether the scenario goes on behind it. */
    template <typename Step>
    bool hold(const std::string& place, const Step& step)
    {
        try
        {
            step();
            return true;
        }
        catch (const LineError& error)
        {
            tell(place, error.what());
        }
        catch (const std::exception& error)
        {
            tell(place, error.what());
            explain();
            if (!m_scenario.keep_going)
                m_diagnostics << "repeat: " << printable(m_scenario.repeat) << '\n';
        }
        return m_scenario.keep_going;
    }

private:
    void tell(const std::string& place, const char* what)
    {
        m_any = true;
        m_output.flush();
        const std::string message = place + ": " + presentable(what);
        m_diagnostics << message << '\n';
        m_output.failure(message);
        if (m_scenario.failures != nullptr)
            m_scenario.failures->push_back(message);
    }

    /** The last command before the failure; of the first few, for each takes another run. */
    void explain()
    {
        constexpr unsigned most_explained = 3;
        if (!m_scenario.explain && m_explained++ < most_explained)
            m_diagnostics << why(m_scenario, m_session);
    }

    const Scenario& m_scenario;
    const Session& m_session;
    Output& m_output;
    std::ostream& m_diagnostics;
    bool m_any = false;
    unsigned m_explained = 0;
};

} // namespace

std::string presentable(std::string_view message)
{
    return printable(message, longest_message);
}

bool run_scenario(std::istream& lines, const Scenario& scenario, const OutputOptions& options,
                  std::ostream& diagnostics)
{
    Output output(options);
    Session session(output, scenario.board, directory_of(scenario.name));
    session.watch_changes(scenario.name == "-" || asks_for_changes(lines));
    const std::string file = printable(scenario.name == "-" ? "<stdin>" : scenario.name);
    if (options.trace != nullptr)
        options.trace->scenario(file);
    session.explain_commands(scenario.explain, scenario.explain);
    Failures failures(scenario, session, output, diagnostics);
    unsigned number = 0;
    const auto place = [&] { return file + ":" + std::to_string(number); };
    bool goes_on = true;
    for (std::string text; goes_on && next_line(lines, text, output, file + ":" + std::to_string(number + 1));)
    {
        ++number;
        set_place(place());
        goes_on = failures.hold(place(), [&] { session.run_line(text); });
    }
    if (goes_on)
        failures.hold(place(), [&] { session.finish(); });
    if (failures.any())
        return false;
    if (session.is_powered())
        note_disagreements(output);
    if (session.expectations() != 0 && !output.is_short() && output.for_people())
        output.text(file + ": " + std::to_string(session.expectations()) + " expectations met\n");
    return true;
}

} // namespace pmxboard
