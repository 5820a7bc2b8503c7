// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/report.h"

#include <algorithm>
#include <iostream>
#include <memory>
#include <sstream>

#include "board/board.h"
#include "board/files.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/commands/repeat.h"
#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/language/apart.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/report/onlooker.h"
#include "tools/pmxboard/report/page.h"
#include "tools/pmxboard/report/storyboard.h"

namespace pmxboard
{
namespace
{

/** One of the page's runs. */
struct Planned
{
    std::string file;
    std::string board; ///< empty where none was named
    std::unique_ptr<std::istream> lines;
};

/** The usual one where none is named. */
std::string board_of(const std::string& named)
{
    return named.empty() ? "default" : named;
}

/** As they are named; an empty name where none is. */
std::vector<std::string> boards_of(const ReportOptions& options)
{
    return options.boards.empty() ? std::vector<std::string>{ "" } : options.boards;
}

/** All of them, open: what cannot be read is told before any runs. */
std::vector<Planned> planned(const ReportOptions& options)
{
    std::vector<Planned> runs;
    for (const std::string& file : options.files)
    {
        for (const std::string& board : boards_of(options))
            runs.push_back({ file, board, board::files::open_lines(file) });
    }
    return runs;
}

/** One run on a board of its own; the exit code. */
int look_at(const Planned& run, Onlooker& onlooker)
{
    OutputOptions output;
    output.quiet = true;
    output.trace = &onlooker;
    output.stores = true;
    const Scenario scenario{ run.file, board_of(run.board), repeat_command(run.board, run.file), false, true };
    try
    {
        const bool is_done = run_scenario(*run.lines, scenario, output, std::cerr);
        onlooker.end_scenario();
        return is_done ? exit_done : exit_failed;
    }
    catch (const board::files::FileError& error) // what happened until then is worth as much, and so are the others
    {
        onlooker.end_scenario(presentable(error.what()));
        return usage_error(error.what());
    }
}

/** The same in a copy of the process: a step that breaks it down leaves the page what was told until then. */
int tell(Storyboard& storyboard, const Planned& run)
{
    const Apart apart = run_apart([&](std::ostream& told) {
        Onlooker onlooker([&](const board::Json& event) { told << board::written(event) << '\n'; });
        return std::to_string(look_at(run, onlooker));
    });
    std::istringstream told(apart.shown);
    for (std::string event; std::getline(told, event) && !told.eof();) // one without an end was not told
        storyboard.hear(board::Json::parse(event));
    if (storyboard.is_in_run() == apart.death.empty()) // it broke down before its beginning or behind its end
        throw std::runtime_error(presentable(run.file) + " cannot be told: " + apart.death);
    if (apart.death.empty())
        return std::stoi(apart.answer);
    std::cerr << storyboard.broke_down(apart.death) << '\n';
    return exit_failed;
}

} // namespace

int report_scenarios(const ReportOptions& options)
try
{
    const auto standard_inputs = std::count(options.files.begin(), options.files.end(), "-");
    if (standard_inputs > 1 || (standard_inputs == 1 && options.boards.size() > 1))
        return usage_error("the standard input holds one scenario only, and is read once");
    for (const std::string& board : boards_of(options))
        board::load_description(board_of(board));
    const std::vector<Planned> runs = planned(options);
    NewFile page(options.page);
    Storyboard storyboard;
    int code = exit_done;
    for (const Planned& run : runs)
        code = std::max(code, tell(storyboard, run));
    page.stream() << page_with(storyboard.to_json());
    page.commit();
    return code;
}
catch (const std::runtime_error& error) // a file or a board that cannot be used
{
    return usage_error(error.what());
}

} // namespace pmxboard
