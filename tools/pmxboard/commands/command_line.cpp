// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/command_line.h"

#include <functional>
#include <iostream>
#include <optional>
#include <sstream>
#include <string_view>
#include <vector>

// The one place of the tool that knows the argument parser: it compiles slowly.
#include <CLI/CLI.hpp>

#include "pmx_version.h"
#include "tools/pmxboard/commands/decode.h"
#include "tools/pmxboard/commands/examples.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/commands/modes.h"
#include "tools/pmxboard/commands/ops.h"
#include "tools/pmxboard/commands/record.h"
#include "tools/pmxboard/commands/report.h"
#include "tools/pmxboard/commands/run.h"
#include "tools/pmxboard/commands/shell.h"
#include "tools/pmxboard/commands/state.h"
#include "tools/pmxboard/graphics/drawing.h"
#include "tools/pmxboard/prompt/help.h"
#include "tools/pmxboard/text/layout.h"
#include "tools/pmxboard/text/printable.h"
#include "tools/pmxboard/text/suggest.h"
#include "tools/pmxboard/view/trace_sink.h"

namespace pmxboard
{
namespace
{

constexpr const char* version = "pmxboard " PMX_VERSION_TEXT;

/** What the chosen sub-command does when everything is parsed; set by the sub-command's own callback. */
using Chosen = std::function<int()>;

/** --color, for every sub-command that paints what it prints; see wants_colour(). */
void add_colour(CLI::App* sub, std::string& when)
{
    sub->add_option("--color,--colour", when, "Colour: auto (on a terminal, unless NO_COLOR is set), always or never")
        ->check(CLI::IsMember({ "auto", "always", "never" }).description(""))
        ->type_name("auto|always|never");
}

/** --graphics, for every sub-command that carries out `shot`; see drawing(). */
void add_graphics(CLI::App* sub, std::string& how)
{
    // The parser would look into the variable for every sub-command, and not say what it does not like.
    sub->add_option("--graphics", how,
                    "How shot draws: auto (as well as a terminal can), none (without colour), blocks, sixel or kitty; "
                    "where it is missing PMXBOARD_GRAPHICS says so")
        ->check(CLI::IsMember(ways_to_draw()).description(""))
        ->type_name("auto|none|blocks|sixel|kitty");
}

/** The parser's own help, its descriptions folded to 80 columns. Examples stay as they are, for they are copied. */
std::string folded_help(const CLI::App* app, const std::string& name, CLI::AppFormatMode mode)
{
    constexpr unsigned description_column = 30; // where the parser begins descriptions
    std::istringstream lines(CLI::Formatter().make_help(app, name, mode));
    std::string text;
    bool in_examples = false;
    for (std::string line; std::getline(lines, line);)
    {
        in_examples = in_examples || line.starts_with("Examples:");
        text += in_examples || line.empty() ? line + "\n" : wrapped(line, usual_width, 0, description_column);
    }
    return text;
}

/** --only and --op; see TraceFilter. */
void add_filter(CLI::App* sub, std::vector<std::string>& only, std::vector<std::string>& operations)
{
    sub->add_option("--only", only,
                    "Show only platform functions whose names begin so, and stores for SET; it may be repeated")
        ->delimiter(',')
        ->allow_extra_args(false)
        ->type_name("PREFIX[,PREFIX]");
    sub->add_option("--op", operations, "Show only what these operations of the layer cause; it may be repeated")
        ->delimiter(',')
        ->allow_extra_args(false)
        ->type_name("NAME[,NAME]");
}

/* One function for each sub-command: its options, and what it does with them. */

void add_run(CLI::App& app, Chosen& chosen)
{
    const auto run = std::make_shared<RunOptions>();
    CLI::App* const sub =
        app.add_subcommand("run", "Run scenarios, each on a board of its own; stop at the first that fails.");
    sub->add_option("FILE", run->files, "Scenarios; - reads the standard input")->required();
    sub->add_option("--board", run->board, "Board to power on: a name under boards/, a directory or a .toml file")
        ->type_name("NAME|FILE");
    std::vector<std::string> forms;
    std::string types;
    std::string meanings;
    for (const TraceForm& form : trace_forms())
    {
        const bool is_last = &form == &trace_forms().back();
        forms.emplace_back(form.name);
        types.append(types.empty() ? "" : "|").append(form.name);
        meanings.append(meanings.empty() ? "" : is_last ? " or " : ", ").append(form.name);
        meanings += form.meaning.empty() ? "" : " (" + std::string(form.meaning) + ")";
    }
    sub->add_option("--trace-format", run->trace_format, "How to show platform calls: " + meanings)
        ->check(CLI::IsMember(forms).description(""))
        ->type_name(types);
    sub->add_option("--trace-file", run->trace_file, "Write the trace there instead of among the rest")
        ->type_name("FILE");
    sub->add_flag("-k,--keep-going", run->keep_going, "Go on behind what fails, and tell all of it");
    sub->add_flag("--explain", run->explain, "Tell why what is refused is refused, and what would be accepted");
    sub->add_option("--junit", run->junit, "Write what became of each scenario there, as XML for build servers")
        ->type_name("FILE");
    sub->add_flag("--stores", run->stores, "Show what is stored into the layer's record between two calls");
    add_filter(sub, run->only, run->operations);
    add_colour(sub, run->colour);
    add_graphics(sub, run->graphics);
    sub->add_flag("-q,--quiet", run->quiet, "Show failures only");
    sub->add_flag("-v,--verbose", run->verbose, "Show arguments by name, and expectations");
    sub->footer(run_examples);
    sub->callback([run, &chosen] { chosen = [run] { return run_files(*run); }; });
}

void add_state(CLI::App& app, Chosen& chosen)
{
    const auto state = std::make_shared<StateOptions>();
    CLI::App* const sub = app.add_subcommand("state", "Show a saved state, or what differs between two.");
    sub->add_option("FILE", state->file, "A state that a scenario saved; - reads the standard input")->required();
    sub->add_option("OTHER|PATH", state->words,
                    "Another state to compare with, and paths of what is wanted; all when there are none")
        ->type_name("");
    sub->add_flag("--json", state->json, "JSON for programs");
    add_colour(sub, state->colour);
    sub->add_flag("-q,--quiet", state->quiet, "Show nothing, but end with the exit code");
    sub->footer(state_examples);
    sub->callback([state, &chosen] { chosen = [state] { return show_state(*state); }; });
}

void add_status(CLI::App& app, Chosen& chosen)
{
    const auto status = std::make_shared<StatusOptions>();
    CLI::App* const sub =
        app.add_subcommand("status", "Show what a saved state means: outputs, planes, whether graphics wait.");
    sub->add_option("FILE", status->file, "A state that a scenario saved; - reads the standard input")->required();
    sub->add_flag("--json", status->json, "JSON for programs");
    add_colour(sub, status->colour);
    sub->footer(status_examples);
    sub->callback([status, &chosen] { chosen = [status] { return show_status(*status); }; });
}

void add_shell(CLI::App& app, Chosen& chosen)
{
    const auto shell = std::make_shared<ShellOptions>();
    CLI::App* const sub =
        app.add_subcommand("shell", "The scenario language at a prompt, or line by line from a pipe.");
    sub->add_option("--board", shell->board, "Board to power on: a name under boards/, a directory or a .toml file")
        ->type_name("NAME|FILE");
    add_filter(sub, shell->only, shell->operations);
    add_colour(sub, shell->colour);
    add_graphics(sub, shell->graphics);
    sub->add_flag("-q,--quiet", shell->quiet, "Show failures only");
    sub->add_flag("-v,--verbose", shell->verbose, "Show arguments by name, and expectations");
    sub->footer(shell_examples);
    sub->callback([shell, &chosen] { chosen = [shell] { return run_shell(*shell); }; });

    const auto line = std::make_shared<std::string>();
    CLI::App* const completion = app.add_subcommand("complete", "What may stand at the end of a line of the shell.");
    completion->add_option("LINE", *line, "The line as far as it is written")->required();
    completion->group("");
    completion->callback([line, &chosen] { chosen = [line] { return print_completions(*line, std::cout); }; });
}

void add_guide(CLI::App& app, Chosen& chosen)
{
    CLI::App* const sub = app.add_subcommand("guide", "The tables of the guide to scenarios.");
    sub->group("");
    sub->callback([&chosen] {
        chosen = [] {
            std::cout << guide_tables();
            return exit_done;
        };
    });
}

void add_ops(CLI::App& app, Chosen& chosen)
{
    const auto ops = std::make_shared<OpsOptions>();
    CLI::App* const sub = app.add_subcommand("ops", "The operations of the layer: arguments, contract, example.");
    sub->add_option("NAME", ops->names, "Operations, or functions of the platform; * stands for anything");
    sub->add_flag("--json", ops->json, "JSON for programs");
    add_colour(sub, ops->colour);
    sub->footer(ops_examples);
    sub->callback([ops, &chosen] { chosen = [ops] { return show_operations(*ops, std::cout); }; });
}

void add_modes(CLI::App& app, Chosen& chosen)
{
    const auto modes = std::make_shared<ModesOptions>();
    CLI::App* const sub =
        app.add_subcommand("modes", "The resolution modes, with all that the layer decides from them.");
    sub->add_option("NAME", modes->modes, "Modes, by name, in short (720p50) or by number");
    sub->add_flag("--json", modes->json, "JSON for programs");
    add_colour(sub, modes->colour);
    sub->footer(modes_examples);
    sub->callback([modes, &chosen] { chosen = [modes] { return show_modes(*modes, std::cout); }; });
}

void add_decode(CLI::App& app, Chosen& chosen)
{
    const auto decode = std::make_shared<DecodeOptions>();
    CLI::App* const sub = app.add_subcommand(
        "decode", "Read a captured console log: what the layer did, and where it departs from a scenario.");
    sub->add_option("FILE", decode->file, "A log; - reads the standard input");
    sub->add_option("--against", decode->against, "Show where it departs from what the layer prints in this scenario")
        ->type_name("SCENARIO");
    sub->add_option("--level", decode->level,
                    "Compare lines of this level of PMX_IsLog and below; else the highest that the log shows")
        ->check(CLI::Range(0, 31).description(""))
        ->needs("--against")
        ->type_name("0-31");
    sub->add_option("--board", decode->board,
                    "Board for the scenario: a name under boards/, a directory or a .toml file")
        ->needs("--against")
        ->type_name("NAME|FILE");
    sub->add_flag("--to-scenario", decode->to_scenario,
                  "Write a scenario that prints the same, as far as the log tells")
        ->excludes("--against");
    sub->add_flag("--texts", decode->texts, "Show every text that the layer prints, with operation and step");
    sub->add_flag("--json", decode->json, "JSON for programs")->excludes("--to-scenario");
    add_colour(sub, decode->colour);
    sub->add_flag("-q,--quiet", decode->quiet, "Show problems only; with --against a departure only");
    sub->add_flag("-v,--verbose", decode->verbose, "Show every line, with operation and step");
    sub->footer(decode_examples);
    sub->callback([decode, &chosen] { chosen = [decode] { return decode_log(*decode); }; });
}

/** Help, or what is wrong with the command line, which may quote anything. */
int told(const CLI::App& app, const CLI::ParseError& error)
{
    std::ostringstream wrong;
    const bool is_help = app.exit(error, std::cout, wrong) == 0;
    std::cerr << printable_lines(wrong.str());
    return is_help ? exit_done : exit_usage;
}

void add_record(CLI::App& app, Chosen& chosen)
{
    const auto record = std::make_shared<RecordOptions>();
    CLI::App* const sub =
        app.add_subcommand("record", "Record what goes in and out of the layer while a scenario runs.");
    sub->add_option("FILE", record->file, "Where to write the recording")->required();
    sub->add_option("SCENARIO", record->scenario, "The scenario")->required();
    sub->add_option("--board", record->board, "Board to power on: a name under boards/, a directory or a .toml file")
        ->type_name("NAME|FILE");
    sub->add_option("--size", record->size, "Bytes of the recorder's memory; 1 MiB unless given")
        ->check(CLI::Range(RecordOptions::least_size, RecordOptions::largest_size).description(""))
        ->type_name("BYTES");
    sub->footer(record_examples);
    sub->callback([record, &chosen] { chosen = [record] { return record_scenario(*record); }; });
}

void add_replay(CLI::App& app, Chosen& chosen)
{
    const auto replay = std::make_shared<ReplayOptions>();
    CLI::App* const sub = app.add_subcommand("replay", "Run a recording once more, and find the first departure.");
    sub->add_option("FILE", replay->file, "A recording, or a memory dump with one; - reads the standard input")
        ->required();
    CLI::Option* const show = sub->add_flag("--show", replay->show, "Show what was recorded, and replay nothing");
    CLI::Option* const json = sub->add_flag("--json", replay->json, "The same as JSON, an object a line");
    CLI::Option* const chrome = sub->add_flag("--chrome", replay->chrome, "The same for a viewer of Chrome traces");
    CLI::Option* const written =
        sub->add_flag("--to-scenario", replay->to_scenario, "Print a scenario that plays the same on the board");
    for (CLI::Option* const one : { show, json, chrome, written })
    {
        for (CLI::Option* const other : { show, json, chrome, written })
        {
            if (one != other)
                one->excludes(other);
        }
    }
    sub->add_flag("-q,--quiet", replay->quiet, "Show departures only");
    sub->footer(replay_examples);
    sub->callback([replay, &chosen] { chosen = [replay] { return replay_file(*replay); }; });
}

void add_report(CLI::App& app, Chosen& chosen)
{
    const auto report = std::make_shared<ReportOptions>();
    CLI::App* const sub =
        app.add_subcommand("report", "Tell scenarios as a storyboard: one page for a browser, with pictures.");
    sub->add_option("SCENARIO", report->files, "Scenarios; - reads the standard input")->required();
    sub->add_option("-o,--output", report->page, "Where to write the page")->required()->type_name("FILE");
    sub->add_option("--board", report->boards,
                    "Board to power on: a name under boards/, a directory or a .toml file; named several times, each "
                    "scenario runs on each")
        ->type_name("NAME|FILE")
        ->allow_extra_args(false);
    sub->footer(report_examples);
    sub->callback([report, &chosen] { chosen = [report] { return report_scenarios(*report); }; });
}

/** A first word that is no sub-command, which the parser would not name; the exit code. */
std::optional<int> misspelt(const CLI::App& app, int count, const char* const* arguments)
{
    const std::string word = count > 1 ? arguments[1] : "";
    std::vector<std::string> names;
    std::string told;
    for (const CLI::App* const sub : app.get_subcommands([](const CLI::App*) { return true; }))
    {
        if (word.empty() || word.starts_with('-') || sub->get_name() == word)
            return std::nullopt;
        if (sub->get_group().empty()) // hidden
            continue;
        names.push_back(sub->get_name());
        told += (told.empty() ? "" : ", ") + sub->get_name();
    }
    const std::string nearest = did_you_mean(word, { names.begin(), names.end() });
    return usage_error("no sub-command " + word + (nearest.empty() ? "; there are " + told : nearest));
}

/** `help run`, as other tools have it, is `run --help`. */
std::vector<const char*> with_help_as_option(int count, const char* const* arguments)
{
    std::vector<const char*> words(arguments, arguments + count);
    if (count > 1 && std::string_view(words[1]) == "help")
    {
        words.erase(words.begin() + 1);
        words.push_back("--help");
    }
    return words;
}

} // namespace

int run_command_line(int count, const char* const* arguments)
{
    const std::vector<const char*> words = with_help_as_option(count, arguments);
    CLI::App app{ "The mixer layer on a virtual board." };
    app.formatter_fn(folded_help);
    app.set_version_flag("--version", version);
    app.require_subcommand(1);
    app.footer(overview_examples);

    Chosen chosen;
    add_run(app, chosen);
    add_state(app, chosen);
    add_status(app, chosen);
    add_shell(app, chosen);
    add_guide(app, chosen);
    add_ops(app, chosen);
    add_modes(app, chosen);
    add_decode(app, chosen);
    add_record(app, chosen);
    add_replay(app, chosen);
    add_report(app, chosen);
    if (const auto code = misspelt(app, static_cast<int>(words.size()), words.data()))
        return *code;
    try
    {
        app.parse(static_cast<int>(words.size()), words.data());
    }
    catch (const CLI::ParseError& error)
    {
        return with_all_printed(told(app, error));
    }
    try
    {
        return with_all_printed(chosen());
    }
    catch (const std::exception& error) // a tool without its symbols, a machine without memory
    {
        return usage_error(error.what());
    }
}

} // namespace pmxboard
