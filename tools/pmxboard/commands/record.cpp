// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/record.h"

#include <iostream>

#include "board/board.h"
#include "board/files.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/commands/play.h"
#include "tools/pmxboard/decode/texts.h"
#include "tools/pmxboard/files/new_file.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/recording/recorded_run.h"
#include "tools/pmxboard/recording/replay.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
namespace
{

TextNames layer_texts()
{
    TextNames names;
    for (const decode::Text& text : decode::texts())
        names.emplace(check_sum_of(std::string(text.format)), text.format);
    return names;
}

void show_departure(const Departure& departure, std::size_t events)
{
    std::cout << "departs at event " << departure.event << " of " << events << ", " << departure.time << " us, thread "
              << departure.thread << (departure.operation.empty() ? "" : ", in " + departure.operation) << ": "
              << departure.why << "\n  recorded: " << printable(departure.recorded)
              << "\n  computed: " << printable(departure.computed) << "\n  record:   " << departure.record << '\n';
}

/** Played on the board, for the layer that tells its reasons sits beside the board's. */
void show_refusal(const Recording& recording, const Departure& departure)
{
    board::load_description("default");
    const std::string refusal = departure.operation.empty() ? "" : refusal_of(recording, departure.outermost);
    if (!refusal.empty())
        std::cout << "the layer's reasons:\n" << refusal;
}

std::string damage_of(const Recording& recording)
{
    return recording.damaged + "; nothing behind it is read";
}

int show_verdict(const Recording& recording, const ReplayVerdict& verdict, bool quiet)
{
    if (!recording.damaged.empty())
        std::cout << damage_of(recording) << '\n';
    if (verdict.departure)
    {
        show_departure(*verdict.departure, recording.events.size());
        show_refusal(recording, *verdict.departure);
        return exit_failed;
    }
    if (!quiet)
        std::cout << "equal: " << verdict.operations << " operations, " << verdict.calls << " calls\n";
    if (!quiet && recording.lost != 0)
        std::cout << "lost before: " << 4 * std::uint64_t{ recording.lost } << " bytes\n";
    return exit_done;
}

} // namespace

int record_scenario(const RecordOptions& options)
try
{
    const std::string board = options.board.empty() ? "default" : options.board;
    board::load_description(board);
    const auto lines = board::files::open_lines(options.scenario);
    NewFile file(options.file);
    OutputOptions output;
    output.quiet = true;
    output.to = &std::cout;
    const Scenario scenario{ options.scenario, board, "pmxboard run " + options.scenario };
    bool is_done = false;
    file.stream() << recorded(options.size, [&] { is_done = run_scenario(*lines, scenario, output, std::cerr); });
    file.commit();
    return is_done ? exit_done : exit_failed;
}
catch (const std::runtime_error& error) // a file or a board that cannot be used, a program without a recorder
{
    return usage_error(error.what());
}

int replay_file(const ReplayOptions& options)
try
{
    if (options.to_scenario)
        board::load_description("default");
    const Recording recording = read_recording(board::files::read_named(options.file));
    const TextNames texts = layer_texts();
    const bool is_replayed = !options.show && !options.json && !options.chrome && !options.to_scenario;
    if (!recording.damaged.empty() && !is_replayed)
        std::cerr << "pmxboard: " << printable(options.file) << ": " << damage_of(recording) << '\n';
    if (options.show || options.json || options.chrome)
    {
        show_events(std::cout, recording, texts,
                    options.chrome ? EventForm::Chrome
                    : options.json ? EventForm::Json
                                   : EventForm::Text);
        return exit_done;
    }
    if (options.to_scenario)
    {
        const PlayedScenario scenario = scenario_of(recording, options.file);
        std::cout << scenario.lines;
        return scenario.plays_the_same ? exit_done : exit_failed;
    }
    return show_verdict(recording, replay(recording, texts), options.quiet);
}
catch (const RecordingError& error)
{
    return usage_error(printable(options.file) + ": " + error.what());
}
catch (const board::files::FileError& error)
{
    return usage_error(error.what());
}

} // namespace pmxboard
