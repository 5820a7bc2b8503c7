// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/decode.h"

#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>

#include "board/board.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/decode/show.h"
#include "tools/pmxboard/text/paint.h"

namespace pmxboard
{
namespace
{

/** All bytes of a file; nothing when it cannot be read. */
std::optional<std::string> content(const std::string& file)
{
    std::error_code ignored;
    if (file == "-")
        return std::string(std::istreambuf_iterator<char>(std::cin), {});
    if (std::filesystem::is_directory(file, ignored))
        return {};
    std::ifstream in(file, std::ios::binary);
    if (!in)
        return {};
    return std::string(std::istreambuf_iterator<char>(in), {});
}

decode::Comparison compared(const decode::Log& log, const DecodeOptions& options)
{
    const int level = options.level.value_or(log.level.value_or(decode::level_plain));
    const auto expected = decode::run_for_texts(options.against, options.board);
    decode::Comparison comparison = decode::compare(log, expected, level);
    comparison.scenario = options.against;
    return comparison;
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
    const std::optional<std::string> bytes = content(options.file);
    if (!bytes)
        return usage_error("cannot read " + options.file);

    const decode::Log log = decode::read_log(*bytes);
    std::optional<decode::Comparison> comparison;
    if (!options.against.empty())
    {
        if (log.items.empty())
            return usage_error("nothing in " + options.file + " comes from the mixer layer: nothing to compare");
        try
        {
            comparison = compared(log, options);
        }
        catch (const decode::ScenarioFailed& failure)
        {
            return usage_error(failure.what());
        }
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
    std::cout.flush();
    return comparison && comparison->departure ? exit_failed : exit_done;
}

} // namespace pmxboard
