// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/report.h"

#include <algorithm>
#include <iostream>
#include <memory>

#include "board/board.h"
#include "board/files.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/report/page.h"
#include "tools/pmxboard/report/storyboard.h"

namespace pmxboard
{
namespace
{

/** Whether it did what it says. */
bool tell(Storyboard& storyboard, std::istream& lines, const std::string& file, const std::string& board)
{
    OutputOptions output;
    output.quiet = true;
    output.trace = &storyboard;
    output.stores = true;
    std::vector<std::string> failures;
    const Scenario scenario{ file, board, "pmxboard run " + file, false, true, &failures };
    const bool is_done = run_scenario(lines, scenario, output, std::cerr);
    storyboard.end_scenario(failures);
    return is_done;
}

} // namespace

int report_scenarios(const ReportOptions& options)
try
{
    if (std::count(options.files.begin(), options.files.end(), "-") > 1)
        return usage_error("the standard input holds one scenario only");
    const std::string board = options.board.empty() ? "default" : options.board;
    board::load_description(board);
    std::vector<std::unique_ptr<std::istream>> opened;
    for (const std::string& file : options.files)
        opened.push_back(board::files::open_lines(file));
    NewFile page(options.page);
    Storyboard storyboard(board);
    bool is_done = true;
    for (std::size_t i = 0; i < opened.size(); ++i)
        is_done = tell(storyboard, *opened[i], options.files[i], board) && is_done;
    page.stream() << page_with(storyboard.to_json());
    page.commit();
    return is_done ? exit_done : exit_failed;
}
catch (const std::runtime_error& error) // a file or a board that cannot be used
{
    return usage_error(error.what());
}

} // namespace pmxboard
