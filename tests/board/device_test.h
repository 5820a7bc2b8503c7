// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the tests of the board's devices share: a board that was just powered on, the last call's line, members of a
 *  state. */
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <string_view>

#include "board/board.h"
#include "board/devices.h"

class DeviceTest : public ::testing::Test
{
protected:
    void SetUp() override { power_on({}); }

    void TearDown() override { power_on({}); }

    static void power_on(const board::Description& description)
    {
        board::faults::clear_all();
        board::power_on(description);
        board::trace::clear();
    }

    /** The last call's line, "nothing" when there was none since power-on. */
    static std::string last_call()
    {
        return board::trace::entries().empty() ? "nothing" : board::trace::entries().back().brief();
    }

    /** A member of a state as text. */
    static std::string member(const board::Value& state, std::string_view path)
    {
        const board::Value* value = state.find(path);
        return value != nullptr ? value->to_text() : "no member " + std::string(path);
    }

    /** Let a function answer this from now on, whatever it is asked. */
    static void answer_always(std::string function, std::int64_t answer)
    {
        board::faults::set({ std::move(function), answer, board::Fault::When::Always, 1 });
    }
};
