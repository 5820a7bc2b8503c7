// SPDX-License-Identifier: MIT OR GPL-2.0-only
// How a session comes back to a saved state: by the commands that led there, carried out again without a word.
#include <exception>
#include <utility>

#include "board/board.h"
#include "board/meanwhile.h"
#include "board/threads.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/apart.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
namespace
{

/** Whether a line has part in the state, or in how the session goes on. */
bool is_step(const Line& line)
{
    if (line.word(0) == "expect")
        return line.size() > 1 && line.word(1) == "misuses";
    const Command command = find_command(line.word(0));
    if (command.operation != nullptr)
        return true;
    const std::string_view name = command.verb->name;
    return name == "trace" || name == "stores" || (!only_looks(line) && name != "restore");
}

/** Where an image lies: elsewhere in another installation, and what it holds is compared by itself. */
bool is_path_of_image(const Change& change)
{
    const auto is_path = [](const std::optional<board::Value>& value) {
        return value && value->kind() == board::Value::Kind::Text && !value->string().starts_with("word ");
    };
    return change.path.starts_with("flash.partitions[") && change.path.ends_with("].image") && is_path(change.older) &&
           is_path(change.newer);
}

std::string first_difference(const StateDump& wanted, const StateDump& found)
{
    std::vector<Change> changes = pmxboard::changes(wanted.state, found.state);
    std::erase_if(changes, is_path_of_image);
    if (changes.empty())
        return {};
    const Change& first = changes.front();
    const auto text = [](const std::optional<board::Value>& value) {
        return value ? printable(value->to_text(), 60) : std::string("nothing");
    };
    const std::size_t others = changes.size() - 1;
    return printable(first.path, 60) + " becomes " + text(first.newer) + ", and the file has " + text(first.older) +
           (others == 0 ? "" : "; " + std::to_string(others) + " more");
}

/** While it lives nothing is shown. */
class Hush
{
public:
    Hush(Output& output, bool& is_restoring) : m_output(output), m_restoring(is_restoring)
    {
        m_output.hush(true);
        m_restoring = true;
    }
    ~Hush()
    {
        m_output.hush(false);
        m_restoring = false;
    }
    Hush(const Hush&) = delete;
    Hush& operator=(const Hush&) = delete;

private:
    Output& m_output;
    bool& m_restoring;
};

} // namespace

void Session::keep_step(const Line& line, bool failed)
{
    if (line.word(0) != "power-on" && is_step(line))
        m_steps.add({ m_directory.string(), line.from(0), failed });
}

/** What failed then fails now, too, and nothing else does; where that leads is looked at in the end. */
void Session::run_step(const Step& step)
{
    const Line line(step.line);
    if (line.empty() || !is_step(line))
        throw LineError("it does nothing to a state");
    m_directory = step.directory;
    if (line.word(0) == "power-on")
        return run_line(step.line);
    try
    {
        run_line(step.line);
    }
    catch (const LineError&)
    {
        throw;
    }
    catch (const std::exception& error)
    {
        if (!step.failed)
            throw StepFailed(std::string("it fails, which it did not then: ") + error.what());
        return;
    }
    if (step.failed)
        throw StepFailed("it is done, and failed then");
}

void Session::run_steps(const StateDump& dump, const std::string& name)
{
    const std::filesystem::path directory = m_directory;
    std::size_t number = 0;
    try
    {
        const Hush hush(m_output, m_restoring);
        board::meanwhiles::forget_all(); // what was armed here is nobody's any more
        m_powered = false;
        for (const Step& step : dump.steps.all())
        {
            ++number;
            run_step(step);
            // The board is what its file says: it must say what it said then.
            if (number == 1 && !dump.steps.board().empty() && dump.steps.board() != m_steps.board())
                throw StepFailed("its board file says something else than it did then");
        }
    }
    catch (const std::exception& error)
    {
        m_directory = directory;
        throw StepFailed(name + " cannot be restored: its command " + std::to_string(number) + ", " +
                         printable(dump.steps.all()[number - 1].line, 60) + ": " + error.what());
    }
    m_directory = directory;
    // Through the same form, so that a difference is one of content.
    const StateDump found = read_dump(to_json(StateDump{ board::description().name, whole_state() }));
    if (const std::string difference = first_difference(dump, found); !difference.empty())
        throw StepFailed(name + " cannot be restored: its commands lead to another state: " + difference);
}

void Session::restore(const StateDump& dump, const std::string& name)
{
    if (!dump.steps.lost().empty())
        throw StepFailed(name + " cannot be restored: " + dump.steps.lost());
    if (const auto waiting = board::threads::waiting(); !waiting.empty())
        throw StepFailed("a thread waits in the midst of a call, and would never go on: " + waiting.front());
    m_output.flush();
    // In a copy of the process first: a file that leads elsewhere leaves everything as it is.
    const Apart apart = run_apart([&](std::ostream&) {
        try
        {
            run_steps(dump, name);
        }
        catch (const std::exception& error)
        {
            return std::string(error.what());
        }
        return std::string("restored");
    });
    if (apart.answer != "restored")
        throw StepFailed(apart.death.empty()
                             ? apart.answer
                             : name + " cannot be restored: its commands end the program: " + apart.death);
    const std::string command = m_last_command;
    auto before = std::move(m_before);
    const unsigned expectations = m_expectations;
    run_steps(dump, name);
    m_last_command = command;
    m_before = std::move(before);
    m_expectations = expectations;
    m_output.powered_on();
    begin_window();
}

} // namespace pmxboard
