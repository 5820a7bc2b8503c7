#include "tools/pmxboard/cli.h"

#include <functional>

// The one place of the tool that knows the argument parser: it compiles slowly.
#include <CLI/CLI.hpp>

#include "tools/pmxboard/command.h"
#include "tools/pmxboard/examples.h"
#include "tools/pmxboard/run_command.h"

namespace pmxboard
{
namespace
{

constexpr const char* version = "pmxboard 0.1.0";

/** What the chosen sub-command does when everything is parsed; set by the sub-command's own callback. */
using Chosen = std::function<int()>;

/* One function for each sub-command: its options, and what it does with them. */

void add_run(CLI::App& app, Chosen& chosen)
{
    const auto run = std::make_shared<RunOptions>();
    CLI::App* const sub =
        app.add_subcommand("run", "Run scenarios, each on a board of its own; stop at the first that fails.");
    sub->add_option("FILE", run->files, "Scenarios; - reads the standard input")->required();
    sub->add_option("--board", run->board, "Board to power on: a name under boards/, a directory or a .toml file")
        ->type_name("NAME|FILE");
    sub->add_option("--trace", run->trace, "How to show platform calls: text, json (one object a line) or off")
        ->check(CLI::IsMember({ "text", "json", "off" }))
        ->type_name("text|json|off");
    sub->add_option("--trace-file", run->trace_file, "Write the trace there instead of among the rest")
        ->type_name("FILE");
    sub->add_flag("-q,--quiet", run->quiet, "Show failures only");
    sub->add_flag("-v,--verbose", run->verbose, "Show arguments by name, and expectations");
    sub->footer(run_examples);
    sub->callback([run, &chosen] { chosen = [run] { return run_files(*run); }; });
}

} // namespace

int run_command_line(int count, const char* const* arguments)
{
    CLI::App app{ "The mixer layer on a virtual board." };
    app.set_version_flag("--version", version);
    app.require_subcommand(1);
    app.footer(run_examples);

    Chosen chosen;
    add_run(app, chosen);
    try
    {
        app.parse(count, arguments);
    }
    catch (const CLI::ParseError& error)
    {
        return app.exit(error) == 0 ? exit_done : exit_usage;
    }
    return chosen();
}

} // namespace pmxboard
