// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/language/runner.h"

#include <algorithm>
#include <istream>
#include <ostream>

#include "board/files.h"
#include "tools/pmxboard/files/ending.h"
#include "tools/pmxboard/functions/errors.h"
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
    return std::find(line.words().begin(), line.words().end(), "diff") != line.words().end();
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
    const std::string file = scenario.name == "-" ? "<stdin>" : scenario.name;
    if (options.trace != nullptr)
        options.trace->scenario(file);
    unsigned number = 0;
    const auto location = [&] { return printable(file) + ":" + std::to_string(number) + ": "; };
    try
    {
        std::string text;
        while (board::files::next_line(lines, text))
        {
            ++number;
            set_place(printable(file) + ":" + std::to_string(number));
            session.run_line(text);
        }
        session.finish();
    }
    catch (const LineError& error)
    {
        output.flush();
        diagnostics << location() << presentable(error.what()) << '\n';
        return false;
    }
    catch (const board::files::FileError& error) // the scenario itself cannot be read any further
    {
        output.flush();
        ++number;
        throw board::files::FileError(location() + error.what());
    }
    catch (const std::exception& error)
    {
        output.flush();
        diagnostics << location() << presentable(error.what()) << '\n'
                    << "repeat: " << printable(scenario.repeat) << '\n';
        return false;
    }
    note_disagreements(output);
    if (session.expectations() != 0 && !output.is_short())
        output.text(printable(file) + ": " + std::to_string(session.expectations()) + " expectations met\n");
    return true;
}

} // namespace pmxboard
