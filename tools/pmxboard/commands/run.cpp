// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/run.h"

#include <algorithm>
#include <iostream>
#include <istream>
#include <memory>

#include "board/board.h"
#include "board/files.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/commands/junit.h"
#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/text/paint.h"

namespace pmxboard
{
namespace
{

/** A word as a shell takes it. */
std::string shell_word(const std::string& word)
{
    constexpr std::string_view plain = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789._-/+,:=@%";
    if (!word.empty() && word.find_first_not_of(plain) == word.npos)
        return word;
    std::string quoted = "'";
    for (const char c : word)
        quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return quoted + "'";
}

std::string repeat_command(const RunOptions& run, const std::string& file)
{
    return "pmxboard run " + (run.board.empty() ? "" : "--board " + shell_word(run.board) + " ") + shell_word(file);
}

/** What is wrong with the command line; empty when nothing is. */
std::string complaint(const RunOptions& run, const OutputOptions& output)
{
    if (std::count(run.files.begin(), run.files.end(), "-") > 1)
        return "the standard input holds one scenario only";
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

/** Each scenario on a board of its own; the exit code. */
int run_each(const RunOptions& run, const Opened& opened, const OutputOptions& output, std::vector<Verdict>& verdicts)
{
    int code = exit_done;
    for (std::size_t i = 0; i < run.files.size() && (code == exit_done || run.keep_going); ++i)
    {
        const std::string& file = run.files[i];
        Verdict& verdict = verdicts.emplace_back(Verdict{ file, {} });
        const Scenario scenario{ file, run.board.empty() ? "default" : run.board, repeat_command(run, file),
                                 run.keep_going, &verdict.failures };
        if (!run_scenario(*opened[i], scenario, output, std::cerr))
            code = exit_failed;
    }
    return code;
}

/** The same, with the trace where it is wanted. Throws FileError. */
int run_traced(const RunOptions& run, OutputOptions output)
{
    const Opened opened = open_all(run);
    std::unique_ptr<NewFile> trace_file;
    if (!run.trace_file.empty())
    {
        trace_file = std::make_unique<NewFile>(run.trace_file, NewFile::Over::OutputsAlone, NewFile::Unfinished::Kept);
        output.trace_to = &trace_file->stream();
    }
    const TraceOptions how{ run.verbose, output.colour, trace_file != nullptr };
    auto trace = trace_form(run.trace_format).make(how, trace_file ? trace_file->stream() : std::cout);
    output.trace = trace.get();
    const auto complete = [&] {
        trace.reset(); // what it still has to write
        if (trace_file)
            trace_file->commit();
    };
    std::vector<Verdict> verdicts;
    try
    {
        const int code = run_each(run, opened, output, verdicts);
        complete();
        if (!run.junit.empty())
            write_file(run.junit, to_junit(verdicts));
        return code;
    }
    catch (...) // a scenario that cannot be read on: what happened until then is worth as much
    {
        if (trace)
            complete();
        throw;
    }
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
