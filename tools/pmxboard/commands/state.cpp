// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/commands/state.h"

#include <filesystem>
#include <iostream>

#include "board/files.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/state/dump.h"
#include "tools/pmxboard/state/paths.h"
#include "tools/pmxboard/state/status.h"
#include "tools/pmxboard/text/paint.h"
#include "tools/pmxboard/text/printable.h"

namespace pmxboard
{
namespace
{

constexpr int exit_differs = 1;

StateDump load(const std::string& name)
{
    const std::string text = board::files::read_named(name, largest_state);
    try
    {
        return read_dump(text);
    }
    catch (const DumpError& error)
    {
        throw DumpError((name == "-" ? "<stdin>" : name) + ": " + error.what());
    }
}

/** Whether a word means a file: no path of a state looks like that. */
bool is_file(const std::string& word)
{
    std::error_code ignored;
    return word == "-" || word.find('/') != word.npos || word.ends_with(".json") ||
           std::filesystem::is_regular_file(word, ignored);
}

int print(const StateOptions& options)
{
    const StateDump dump = load(options.file);
    NamedValues values;
    for (const std::string& path : options.words)
        values.emplace_back(path, part_of(dump.state, path));
    if (options.quiet)
        return exit_done;
    if (values.empty() && options.json)
        std::cout << to_json(dump) << '\n';
    else if (options.json)
        std::cout << to_json(dump.board, values) << '\n';
    else
        std::cout << to_text(values.empty() ? NamedValues{ { "", dump.state } } : values);
    return exit_done;
}

/** The words behind the second file are paths; each leads somewhere in one of the states. */
std::vector<std::string> paths_to_compare(const StateOptions& options, const StateDump& older, const StateDump& newer)
{
    std::vector<std::string> paths;
    for (auto word = options.words.begin() + 1; word != options.words.end(); ++word)
    {
        try
        {
            part_of(older.state, *word);
        }
        catch (const LineError&)
        {
            part_of(newer.state, *word);
        }
        paths.push_back(*word);
    }
    return paths;
}

int compare(const StateOptions& options)
{
    const std::string& other = options.words.front();
    if (options.file == "-" && other == "-")
        return usage_error("the standard input holds one state only");
    const StateDump older = load(options.file);
    const StateDump newer = load(other);
    const std::vector<Change> found =
        changes_at(changes(older.state, newer.state), paths_to_compare(options, older, newer));
    if (options.json && !options.quiet)
        std::cout << to_json(found) << '\n';
    else if (!options.quiet && !found.empty())
    {
        const Paint paint{ wants_colour(options.colour) };
        std::cout << paint("--- " + printable(options.file) + "\n+++ " + printable(other), Colour::Bold) << '\n'
                  << to_text(found);
    }
    return found.empty() ? exit_done : exit_differs;
}

} // namespace

int show_status(const StatusOptions& options)
{
    try
    {
        const StateDump dump = load(options.file);
        const Status status = status_of(dump.state, dump.board);
        const Look look{ text_width(), wants_colour(options.colour) };
        std::cout << (options.json ? to_json(status) + "\n" : to_text(status, StatusPart::All, look));
        return exit_done;
    }
    catch (const std::runtime_error& error)
    {
        return usage_error(error.what());
    }
}

int show_state(const StateOptions& options)
{
    try
    {
        return !options.words.empty() && is_file(options.words.front()) ? compare(options) : print(options);
    }
    catch (const std::runtime_error& error)
    {
        return usage_error(error.what());
    }
}

} // namespace pmxboard
