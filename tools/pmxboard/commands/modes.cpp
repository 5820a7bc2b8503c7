// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/modes.h"

#include <ostream>

#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/mode_names.h"
#include "tools/pmxboard/prompt/about_mode.h"

namespace pmxboard
{
namespace
{

using board::Value;
using record_view::ModeRow;

/** The numbers that were asked for. Throws LineError. */
std::vector<unsigned> read_modes(const std::vector<std::string>& words)
{
    std::vector<unsigned> numbers;
    for (const std::string& word : words)
        numbers.push_back(read_mode(word));
    return numbers;
}

} // namespace

int show_modes(const ModesOptions& options, std::ostream& to)
{
    std::vector<ModeRow> modes;
    try
    {
        for (const unsigned mode : read_modes(options.modes))
            modes.push_back(record_view::mode_row(mode));
    }
    catch (const LineError& error)
    {
        return usage_error(error.what());
    }
    const Look look{ text_width(), wants_colour(options.colour) };
    const bool all = modes.empty();
    if (all)
        modes = record_view::mode_rows();
    if (options.json)
    {
        std::vector<Value> list;
        for (const ModeRow& mode : modes)
            list.push_back(json_of(mode));
        to << Value::list(std::move(list)).to_json(2) << '\n';
    }
    else if (all)
        to << mode_table_text(modes, look);
    else
    {
        for (std::size_t i = 0; i < modes.size(); ++i)
            to << (i == 0 ? "" : "\n") << mode_text(modes[i], look);
    }
    return exit_done;
}

} // namespace pmxboard
