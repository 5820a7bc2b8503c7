#include "tools/pmxboard/cli.h"

#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>

// The one place of the tool that knows the argument parser: it compiles slowly.
#include <CLI/CLI.hpp>

#include "board/board.h"
#include "tools/pmxboard/runner.h"

namespace pmxboard
{
namespace
{

constexpr const char* version = "pmxboard 0.1.0";

constexpr const char* run_examples = R"(Examples:
  pmxboard run scenarios/cold-boot.pmx
      start the mixer on the default board and watch every platform call
  pmxboard run --quiet scenarios/*.pmx && echo fine
      run scenarios as tests: only failures are shown
  printf 'PMX_Init\nPMX_GetMode 0\n' | pmxboard run -
      try something out
  pmxboard run --trace json --trace-file calls.jsonl scenarios/cold-boot.pmx
      keep the calls for a program, one JSON object a line
  pmxboard run --board boards/default --verbose scenarios/cold-boot.pmx
      choose the board, and see arguments by name

The language of scenarios is described in docs/scenarios.md.
Exit codes: 0 done, 1 a step failed, 2 wrong usage.)";

struct RunOptions
{
    std::vector<std::string> files;
    std::string board;
    std::string trace = "text";
    std::string trace_file;
    bool quiet = false;
    bool verbose = false;
};

int usage_error(const std::string& message)
{
    std::cerr << "pmxboard: " << message << '\n';
    return exit_usage;
}

bool wants_colour()
{
    const char* const refused = std::getenv("NO_COLOR");
    return (refused == nullptr || *refused == '\0') && isatty(STDOUT_FILENO) == 1;
}

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

int run_files(const RunOptions& run)
{
    OutputOptions output;
    output.quiet = run.quiet;
    output.verbose = run.verbose;
    output.colour = wants_colour();
    output.trace = run.trace == "json" ? TraceForm::Json : run.trace == "off" ? TraceForm::Off : TraceForm::Text;
    output.to = &std::cout;

    std::error_code ignored;
    for (const std::string& file : run.files)
    {
        if (file != "-" && std::filesystem::is_directory(file, ignored))
            return usage_error(file + " is a directory");
        if (file != "-" && !std::ifstream(file))
            return usage_error("cannot read " + file);
    }
    try
    {
        if (!run.board.empty())
            board::load_description(run.board);
    }
    catch (const board::DescriptionError& error)
    {
        return usage_error(error.what());
    }
    std::ofstream trace_file;
    if (!run.trace_file.empty())
    {
        trace_file.open(run.trace_file);
        if (!trace_file)
            return usage_error("cannot write " + run.trace_file);
        output.trace_to = &trace_file;
    }

    for (const std::string& file : run.files)
    {
        std::ifstream opened;
        if (file != "-")
            opened.open(file);
        const Scenario scenario{ file, run.board.empty() ? "default" : run.board, repeat_command(run, file) };
        if (!run_scenario(file == "-" ? std::cin : opened, scenario, output, std::cerr))
            return exit_failed;
    }
    if (!run.trace_file.empty() && !trace_file.flush())
        return usage_error("cannot write " + run.trace_file);
    return exit_done;
}

} // namespace

int run_command_line(int count, const char* const* arguments)
{
    CLI::App app{ "The mixer layer on a virtual board." };
    app.set_version_flag("--version", version);
    app.require_subcommand(1);
    app.footer(run_examples);

    RunOptions run;
    CLI::App* const sub =
        app.add_subcommand("run", "Run scenarios, each on a board of its own; stop at the first that fails.");
    sub->add_option("FILE", run.files, "Scenarios; - reads the standard input")->required();
    sub->add_option("--board", run.board, "Board to power on: a name under boards/, a directory or a .toml file")
        ->type_name("NAME|FILE");
    sub->add_option("--trace", run.trace, "How to show platform calls: text, json (one object a line) or off")
        ->check(CLI::IsMember({ "text", "json", "off" }))
        ->type_name("text|json|off");
    sub->add_option("--trace-file", run.trace_file, "Write the trace there instead of among the rest")
        ->type_name("FILE");
    sub->add_flag("-q,--quiet", run.quiet, "Show failures only");
    sub->add_flag("-v,--verbose", run.verbose, "Show arguments by name, and expectations");
    sub->footer(run_examples);

    try
    {
        app.parse(count, arguments);
    }
    catch (const CLI::ParseError& error)
    {
        return app.exit(error) == 0 ? exit_done : exit_usage;
    }
    return run_files(run);
}

} // namespace pmxboard
