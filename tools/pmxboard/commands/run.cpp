// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/run.h"

#include <filesystem>
#include <fstream>
#include <iostream>

#include "board/board.h"
#include "tools/pmxboard/commands/exit_codes.h"
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
    std::error_code ignored;
    for (const std::string& file : run.files)
    {
        if (file != "-" && std::filesystem::is_directory(file, ignored))
            return file + " is a directory";
        if (file != "-" && !std::ifstream(file))
            return "cannot read " + file;
    }
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

/** Each scenario on a board of its own; the exit code. */
int run_each(const RunOptions& run, const OutputOptions& output)
{
    for (const std::string& file : run.files)
    {
        std::ifstream opened;
        if (file != "-")
            opened.open(file);
        const Scenario scenario{ file, run.board.empty() ? "default" : run.board, repeat_command(run, file) };
        if (!run_scenario(file == "-" ? std::cin : opened, scenario, output, std::cerr))
            return exit_failed;
    }
    return exit_done;
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
    std::ofstream trace_file;
    if (!run.trace_file.empty())
    {
        trace_file.open(run.trace_file);
        if (!trace_file)
            return usage_error("cannot write " + run.trace_file);
        output.trace_to = &trace_file;
    }
    const TraceOptions how{ run.verbose, output.colour, !run.trace_file.empty() };
    auto trace = trace_form(run.trace_format).make(how, run.trace_file.empty() ? std::cout : trace_file);
    output.trace = trace.get();
    const int code = run_each(run, output);
    trace.reset(); // what it still has to write
    if (!run.trace_file.empty() && !trace_file.flush())
        return usage_error("cannot write " + run.trace_file);
    if (!std::cout.flush())
        return usage_error("cannot write to the standard output");
    return code;
}

} // namespace pmxboard
