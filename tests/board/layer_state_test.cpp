// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>

#include "board/board.h"
#include "board/executable_symbols.h"

#include "drv_pmx.h"

namespace
{

constexpr const char* objects[] = { "_arPmxConf",  "bComp0OnTop",   "_arPmxDispPartStatus",
                                    "MutexPMX",    "_PmxInitiated", "_fg2DCap",
                                    "_PmxTestOsd", "_fgBootUp",     "PMX_debug_level" };

unsigned char* bytes_of(const char* name, std::size_t& size)
{
    const auto object = board::executable_symbols::find(name);
    size = object ? object->size : 0;
    return object ? static_cast<unsigned char*>(object->address) : nullptr;
}

/** Every changeable object of the layer, byte by byte. */
std::string dump()
{
    std::string text;
    for (const char* name : objects)
    {
        std::size_t size = 0;
        const unsigned char* const bytes = bytes_of(name, size);
        text += std::string(name) + ":";
        for (std::size_t i = 0; i < size; ++i)
        {
            char digits[4];
            std::snprintf(digits, sizeof digits, " %02x", bytes[i]);
            text += digits;
        }
        text += ";";
    }
    return text;
}

std::string trace_of_start_up()
{
    board::trace::clear();
    PMX_Init();
    std::string text;
    for (const board::TraceEntry& entry : board::trace::entries())
        text += entry.brief() + "\n";
    return text;
}

// Taken before main begins, when nothing has touched the layer yet.
const std::string fresh = dump();

TEST(LayerState, PowerOn_MakesTheLayerAsInAFreshProcess)
{
    EXPECT_NE(std::string::npos, fresh.find("_fgBootUp: 01;")) << fresh;
    for (int cycle = 0; cycle < 2; ++cycle)
    {
        board::power_on({});
        EXPECT_EQ(fresh, dump());
        PMX_Init();
        _PmxTestOsd = 1;
        _fg2DCap = 1;
        _fgBootUp = 0;
        PMX_debug_level = 0xFFFFFFFF;
        for (const char* name : objects)
        {
            std::size_t size = 0;
            unsigned char* const bytes = bytes_of(name, size);
            ASSERT_NE(nullptr, bytes) << name;
            std::memset(bytes, 0x5A, size);
        }
        EXPECT_NE(fresh, dump());
    }
    board::power_on({});
    EXPECT_EQ(fresh, dump());
}

TEST(LayerState, StartUp_IsTheSameAfterEveryPowerOn)
{
    board::power_on({});
    const std::string first = trace_of_start_up();
    EXPECT_NE(std::string::npos, first.find("x_sema_create(1, X_SEMA_TYPE_MUTEX, 1) = 0")) << first;
    EXPECT_EQ(1, _PmxInitiated);
    board::power_on({});
    EXPECT_EQ(0, _PmxInitiated);
    EXPECT_EQ(0u, MutexPMX);
    EXPECT_EQ(1, _fgBootUp);
    EXPECT_EQ(first, trace_of_start_up());
    board::power_on({});
}

TEST(LayerState, Sizes_AreThoseOfTheObjects)
{
    std::size_t size = 0;
    EXPECT_EQ(static_cast<void*>(&MutexPMX), bytes_of("MutexPMX", size));
    EXPECT_EQ(sizeof MutexPMX, size);
    EXPECT_EQ(static_cast<void*>(&_arPmxDispPartStatus), bytes_of("_arPmxDispPartStatus", size));
    EXPECT_EQ(sizeof _arPmxDispPartStatus, size);
    EXPECT_EQ(static_cast<void*>(&_fgBootUp), bytes_of("_fgBootUp", size));
    EXPECT_EQ(1u, size);
}

} // namespace
