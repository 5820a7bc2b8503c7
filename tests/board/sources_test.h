// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the tests of the sources share: a board on which the mixer has started, and what happened on it. */
#pragma once

#include <algorithm>

#include "board/sources.h"
#include "device_test.h"
#include "drv_pmx.h"

class SourcesTest : public DeviceTest
{
protected:
    void SetUp() override
    {
        DeviceTest::SetUp();
        PMX_Init();
        board::trace::clear();
    }

    static std::string now(std::string_view path) { return member(board::sources::state(), path); }

    static board::sources::Id source(std::string_view name) { return board::sources::find(name); }

    /** What the board reported and did by itself since the trace was cleared, and the calls of some functions. */
    static std::vector<std::string> story(const std::vector<std::string_view>& functions = {})
    {
        std::vector<std::string> lines;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            const bool wanted = std::find(functions.begin(), functions.end(), entry.function) != functions.end();
            if (wanted || entry.kind == board::TraceEntry::Kind::Notice)
                lines.push_back(entry.brief());
        }
        board::trace::clear();
        return lines;
    }

    using Lines = std::vector<std::string>;
};
