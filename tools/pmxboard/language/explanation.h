// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Why a command does what it does: carried out by the layer that tells its reasons, in a copy of the process. */
#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "board/value.h"
#include "tools/pmxboard/reasons/reason.h"
#include "tools/pmxboard/text/layout.h"

namespace pmxboard
{

class Session;

struct Explanation
{
    std::string command;
    std::string operation; ///< empty when the command called none
    std::string outcome;   ///< one JSON object, as a trace has it
    std::optional<std::int64_t> result;
    std::string answer; ///< the operation's result for people; empty without one
    std::vector<Reason> reasons;
    std::vector<std::string> accepted; ///< what would be accepted instead: commands, one after the other
    std::string headline;              ///< instead of what became of the command
    std::string failure;               ///< how the command itself would fail or end the program; empty when it does not

    /** The reason for which something was not done; null pointer when everything was. */
    const Reason* refusal() const;
};

/** How long is looked for what would be accepted. */
struct Search
{
    std::size_t tries = 0;
    std::chrono::milliseconds time{};
};
inline constexpr Search thorough{ 500, std::chrono::seconds(10) };
inline constexpr Search quick{ 100, std::chrono::milliseconds(500) };
inline constexpr Search none{};

/** Carry a command out in a copy. Throws LineError when it is none, and StepFailed when there can be no copy. */
Explanation explain(Session& session, const std::string& command, const Search& search = thorough);

/** "done", "refused", "nothing" where it was so already, or "failed". */
std::string verdict_of(const Explanation& explanation);
std::string to_text(const Explanation& explanation, const Look& look);
/** A line of a trace. */
std::string to_json_line(const Explanation& explanation);

/** The requests nearest to one that was refused, the nearest first, each as the commands that it takes. */
std::vector<std::vector<std::string>> requests_near(const Explanation& explanation);

} // namespace pmxboard
