// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Runs the lines of a scenario within a test, and looks into the project's headers. */
#pragma once

#include <fstream>
#include <iterator>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

#include "tools/pmxboard/language/runner.h"

namespace tool_test
{

struct Run
{
    bool done = false;
    std::string shown;
    std::string trace; ///< when it went somewhere else
    std::string diagnostics;
};

/** The scenario is called here.pmx, stands in the project's root and runs on the default board. */
inline Run run(const std::string& lines, pmxboard::OutputOptions options = {}, bool trace_apart = false,
               std::string_view form = "text")
{
    std::istringstream in(lines);
    std::ostringstream shown;
    std::ostringstream trace;
    std::ostringstream diagnostics;
    options.to = &shown;
    options.trace_to = trace_apart ? &trace : nullptr;
    const auto sink =
        pmxboard::trace_form(form).make({ options.verbose, options.colour, trace_apart }, trace_apart ? trace : shown);
    if (options.trace == nullptr)
        options.trace = sink.get();
    const pmxboard::Scenario scenario{ "here.pmx", "default", "pmxboard run here.pmx" };
    const bool done = pmxboard::run_scenario(in, scenario, options, diagnostics);
    return { done, shown.str(), trace.str(), diagnostics.str() };
}

/** What stands behind the echo of the last command. */
inline std::string behind_last(const std::string& shown)
{
    const std::size_t last = shown.rfind("> ");
    return shown.substr(shown.find('\n', last) + 1);
}

/** How a failed run of here.pmx ends. */
inline const std::string repeat = "\nrepeat: pmxboard run here.pmx\n";

/** With the trace in another form. */
inline Run run_traced(const std::string& lines, std::string_view form, bool trace_apart = false,
                      pmxboard::OutputOptions options = {})
{
    return run(lines, std::move(options), trace_apart, form);
}

/** What the diagnostics say of a scenario; empty when all went well. */
inline std::string diagnostics(const std::string& lines)
{
    const Run outcome = run(lines);
    return outcome.done ? outcome.diagnostics : outcome.diagnostics.empty() ? "failed in silence" : outcome.diagnostics;
}

inline std::string project_file(const std::string& path)
{
    std::ifstream file(std::string(PMX_SOURCE_DIR) + "/" + path);
    return { std::istreambuf_iterator<char>(file), {} };
}

} // namespace tool_test
