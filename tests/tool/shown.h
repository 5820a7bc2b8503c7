// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What a sub-command shows when it is called within a test. */
#pragma once

#include <gtest/gtest.h>

#include <sstream>
#include <string>

namespace tool_test
{

struct Shown
{
    int code;
    std::string out;
    std::string err;
};

/** `show` is given the stream that it writes to, and answers its exit code. */
template <typename Show>
Shown shown_by(Show show)
{
    std::ostringstream out;
    testing::internal::CaptureStderr();
    const int code = show(out);
    return { code, out.str(), testing::internal::GetCapturedStderr() };
}

} // namespace tool_test
