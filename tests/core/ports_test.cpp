// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The ports end where they end: the record goes on behind them, with an output that has the form of one more port.

#include <cstddef>
#include <cstring>

#include <gtest/gtest.h>

#include "board/board.h"
#include "drv_pmx.h"
#include "pmx_if.h"

TEST(Ports, WhatStandsBehindThemIsNoSource)
{
    board::power_on(board::Description{});
    PMX_Init();
    PMX_CONF_T* const record = prPmxConf();
    record->arOutputConf[0].eResMode = RES_480I; // where a port has its colour mode, and where pictures of YCbCr are 0
    unsigned char* const behind =
        reinterpret_cast<unsigned char*>(record) + offsetof(PMX_CONF_T, arPortInfo) + sizeof record->arPortInfo;
    behind[offsetof(PMX_PORT_INFO_T, fgEnabled)] = TRUE; // between two of its members: nobody else looks there
    DRV_GFX_COLOR_MODE_T mode = DRV_GFX_COLOR_MODE_RGB;
    std::memcpy(&mode, behind + offsetof(PMX_PORT_INFO_T, eInputColorMode), sizeof mode);
    ASSERT_EQ(DRV_GFX_COLOR_MODE_YCBCR, mode);
    const DRV_PMX_COLOR_SPACE_T mixed = record->eMasterColorSpace;
    board::trace::clear();
    EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0));
    EXPECT_TRUE(board::trace::entries().empty());
    EXPECT_EQ(mixed, record->eMasterColorSpace);
    board::power_on(board::Description{});
}
