// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Where the layer's sources state an assertion, read as text: what a report of one is held against. */
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "board/trace.h"

struct AssertionPlace
{
    std::string file;               ///< "src/driver/pmx/pmx_port.cpp"
    std::int64_t line = 0;          ///< where the statement names its line
    std::vector<std::string> texts; ///< what it may report; none: what its caller says

    /** Whether this is what was reported there. */
    bool may_report(const std::string& text) const;
};

/** All of them, by file and line. */
std::vector<AssertionPlace> assertion_places();

/** A report in the trace. */
struct AssertionReport
{
    std::string text;
    std::string file;
    std::int64_t line = 0;
};

/** Those that the trace has. */
std::vector<AssertionReport> assertion_reports();

/** The place of a report; null pointer, and a failure of the test, when nothing like it stands there. */
const AssertionPlace* place_of(const AssertionReport& report, const std::vector<AssertionPlace>& places);
