// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/run.h"

#include <algorithm>
#include <filesystem>
#include <iostream>
#include <istream>
#include <memory>

#include "board/board.h"
#include "board/files.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/commands/junit.h"
#include "tools/pmxboard/commands/repeat.h"
#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/graphics/drawing.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/text/paint.h"

namespace pmxboard
{
namespace
{

/** Whether two names lead to one file, of which only what is written last would be left. */
bool is_one_file(const std::string& one, const std::string& other)
{
    namespace fs = std::filesystem;
    std::error_code error;
    if (one.empty() || other.empty() || (fs::exists(one, error) && !fs::is_regular_file(one, error)))
        return false;
    const auto real = [&error](const std::string& name) {
        return fs::weakly_canonical(fs::absolute(name, error), error);
    };
    return real(one) == real(other) && !error;
}

/** What is wrong with the command line; empty when nothing is. */
std::string complaint(const RunOptions& run, const OutputOptions& output)
{
    if (std::count(run.files.begin(), run.files.end(), "-") > 1)
        return "the standard input holds one scenario only";
    if (is_one_file(run.trace_file, run.junit))
        return "--trace-file and --junit both name " + run.junit;
    try
    {
        if (!run.board.empty())
            board::load_description(run.board);
    }
    catch (const board::DescriptionError& error)
    {
        return error.what();
    }
    return output.filter.complaint();
}

/** All scenarios, open: one that cannot be read is told before any other runs. */
using Opened = std::vector<std::unique_ptr<std::istream>>;

Opened open_all(const RunOptions& run)
{
    Opened opened;
    for (const std::string& file : run.files)
        opened.push_back(board::files::open_lines(file));
    return opened;
}

/** One scenario on a board of its own; the exit code. */
int run_one(std::istream& lines, const Scenario& scenario, const OutputOptions& output)
try
{
    return run_scenario(lines, scenario, output, std::cerr) ? exit_done : exit_failed;
}
catch (const board::files::FileError& error) // what happened until then is worth as much, and so are the others
{
    scenario.failures->push_back(presentable(error.what()));
    return usage_error(error.what());
}

/** Each of them; the exit code. */
int run_each(const RunOptions& run, const Opened& opened, const OutputOptions& output, std::vector<Verdict>& verdicts)
{
    int code = exit_done;
    verdicts.reserve(run.files.size());
    for (std::size_t i = 0; i < run.files.size() && (code == exit_done || run.keep_going); ++i)
    {
        const std::string& file = run.files[i];
        Verdict& verdict = verdicts.emplace_back(Verdict{ file, {} });
        const Scenario scenario{ file,
                                 run.board.empty() ? "default" : run.board,
                                 repeat_command(run.board, file),
                                 run.keep_going,
                                 run.explain,
                                 &verdict.failures };
        code = std::max(code, run_one(*opened[i], scenario, output));
    }
    return code;
}

std::unique_ptr<NewFile> open_output(const std::string& name, NewFile::Unfinished unfinished)
{
    return name.empty() ? nullptr : std::make_unique<NewFile>(name, NewFile::Over::OutputsAlone, unfinished);
}

/** The exit code. */
int complete(NewFile* file)
try
{
    if (file != nullptr)
        file->commit();
    return exit_done;
}
catch (const board::files::FileError& error)
{
    return usage_error(error.what());
}

/** The same, with trace and verdicts where they are wanted; neither goes without the other. Throws FileError for what
 *  cannot be opened, before anything runs. */
int run_traced(const RunOptions& run, OutputOptions output)
{
    const Opened opened = open_all(run);
    const auto trace_file = open_output(run.trace_file, NewFile::Unfinished::Kept);
    const auto junit_file = open_output(run.junit, NewFile::Unfinished::Removed);
    if (trace_file)
        output.trace_to = &trace_file->stream();
    const TraceOptions how{ run.verbose, output.colour, trace_file != nullptr };
    auto trace = trace_form(run.trace_format).make(how, trace_file ? trace_file->stream() : std::cout);
    output.trace = trace.get();
    std::vector<Verdict> verdicts;
    const int code = run_each(run, opened, output, verdicts);
    trace.reset(); // what it still has to write
    if (junit_file)
        junit_file->stream() << to_junit(verdicts);
    return std::max({ code, complete(trace_file.get()), complete(junit_file.get()) });
}

} // namespace

int run_files(const RunOptions& run)
{
    OutputOptions output;
    output.quiet = run.quiet;
    output.verbose = run.verbose;
    output.colour = wants_colour(run.colour);
    output.to = &std::cout;
    output.filter = { run.only, run.operations };
    output.stores = run.stores;
    output.draw = drawing(run.graphics, output.colour);
    if (const std::string wrong = complaint(run, output); !wrong.empty())
        return usage_error(wrong);
    try
    {
        return run_traced(run, output);
    }
    catch (const board::files::FileError& error)
    {
        return usage_error(error.what());
    }
}

} // namespace pmxboard
