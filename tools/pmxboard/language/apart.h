// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Something done in a copy of the process, which ends with it. */
#pragma once

#include <functional>
#include <iosfwd>
#include <string>

namespace pmxboard
{

struct Apart
{
    std::string shown;  ///< what was written there
    std::string answer; ///< what came back; only when it ended well
    std::string death;  ///< how the copy died instead: "Segmentation fault", "exit code 1"; empty when it did not
};

/** Call a function in a forked copy of the process. It writes to the stream and returns an answer; what it wrote before
 *  it died is kept. Throws std::runtime_error when there can be no copy. */
Apart run_apart(const std::function<std::string(std::ostream& shown)>& function);

} // namespace pmxboard
