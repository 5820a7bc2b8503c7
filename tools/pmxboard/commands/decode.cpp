// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/decode.h"

#include <iostream>

#include "board/files.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/decode/show.h"
#include "tools/pmxboard/decode/to_scenario.h"
#include "tools/pmxboard/decode/trace_lines.h"
#include "tools/pmxboard/text/paint.h"

namespace pmxboard
{
namespace
{

decode::Comparison compared(const decode::Log& log, const DecodeOptions& options)
{
    const int level = options.level.value_or(log.level.value_or(decode::level_plain));
    const auto expected = decode::run_for_texts(options.against, options.board);
    decode::Comparison comparison = decode::compare(log, expected, level);
    comparison.scenario = options.against;
    return comparison;
}

int decode_file(const DecodeOptions& options)
{
    const std::string bytes = board::files::read_named(options.file);
    if (decode::is_viewer_trace(bytes))
        return usage_error(options.file + " is a trace for a viewer, which has no console; decode reads a log, or the "
                                          "trace format jsonl");
    const decode::Log log = decode::read_log(bytes);
    if (options.to_scenario)
    {
        decode::write_scenario(std::cout, log, options.file == "-" ? "the standard input" : options.file);
        return exit_done;
    }
    std::optional<decode::Comparison> comparison;
    if (!options.against.empty())
    {
        if (log.items.empty())
            return usage_error("nothing in " + options.file + " comes from the mixer layer: nothing to compare");
        comparison = compared(log, options);
    }

    const decode::Story story = decode::tell(log);
    decode::ShowOptions show;
    show.quiet = options.quiet;
    show.verbose = options.verbose;
    show.paint.on = wants_colour(options.colour);
    show.name = options.file == "-" ? "standard input" : options.file;
    if (options.json)
        decode::show_json(std::cout, log, story, comparison, show.name);
    else if (!comparison || options.verbose)
        decode::show_log(std::cout, log, story, show);
    if (comparison && !options.json && (comparison->departure || !options.quiet))
        decode::show_comparison(std::cout, *comparison, show);
    return comparison && comparison->departure ? exit_failed : exit_done;
}

} // namespace

int decode_log(const DecodeOptions& options)
{
    if (options.texts)
    {
        (options.json ? decode::show_texts_json : decode::show_texts)(std::cout);
        return exit_done;
    }
    if (options.file.empty())
        return usage_error("decode needs a FILE; - reads the standard input");
    if (options.file == "-" && options.against == "-")
        return usage_error("the standard input holds a log or a scenario, not both");
    try
    {
        return decode_file(options);
    }
    catch (const std::runtime_error& error) // a file that cannot be used, a scenario that fails
    {
        return usage_error(error.what());
    }
}

} // namespace pmxboard
