// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The fixture itself: what it must refuse, it refuses. */
#include <gtest/gtest-spi.h>

#include <algorithm>

#include "drv_tve.h"
#include "pmx_hal.h"
#include "tests/support/layer_fixture.h"
#include "u_os.h"

using Fixture = LayerTest;

TEST_F(Fixture, PowerOn_BoardIsQuietAndReadsTheBootWord)
{
    EXPECT_NO_TRACE();
    UINT32 word = 0;
    EXPECT_EQ(4, i4NFBPartitionRead(get_part_id_by_name("fast_init_param"), 0, &word, 4));
    EXPECT_EQ(0x0000010Cu, word);
    boot_word(0xA1B2C3D4);
    EXPECT_EQ(4, i4NFBPartitionRead(get_part_id_by_name("fast_init_param"), 0, &word, 4));
    EXPECT_EQ(0xA1B2C3D4u, word);
    power_on();
    EXPECT_EQ(4, i4NFBPartitionRead(get_part_id_by_name("fast_init_param"), 0, &word, 4));
    EXPECT_EQ(0xA1B2C3D4u, word);
    no_boot_partition();
    EXPECT_GT(0, get_part_id_by_name("fast_init_param"));
}

TEST_F(Fixture, ExpectTrace_LinesThatHold_PassesAndClears)
{
    TVE_SetEnable(0, 1);
    PMX_IsLog(8, "quoted \"%s\"\n", "text");
    EXPECT_EQ(0u, x_reg_read32(0xFD000040));
    EXPECT_TRACE(R"(
        TVE_SetEnable(0, 0x1)

        LOG8 "quoted \"text\"\n"
        x_reg_read32(0xFD000040) = 0
    )");
    EXPECT_NO_TRACE();
    EXPECT_EQ(0u, x_reg_read32(0xFD000040));
    EXPECT_TRACE("x_reg_read32(0xFD000040)");
}

TEST_F(Fixture, ExpectTrace_WrongArgument_FailsAndMarksTheLine)
{
    TVE_SetBrightness(1);
    TVE_SetContrast(2);
    EXPECT_NONFATAL_FAILURE(EXPECT_TRACE("TVE_SetBrightness(1)\nTVE_SetContrast(3)"),
                            "The trace is different at line 2.\n"
                            "Expected:\n"
                            "    TVE_SetBrightness(1)\n"
                            "->  TVE_SetContrast(3)\n"
                            "Actual:\n"
                            "    TVE_SetBrightness(1)\n"
                            "->  TVE_SetContrast(2)\n");
    EXPECT_NO_TRACE();
}

TEST_F(Fixture, ExpectTrace_WrongFunctionTextLevelOrResult_Fails)
{
    TVE_SetBrightness(1);
    EXPECT_NONFATAL_FAILURE(EXPECT_TRACE("TVE_SetContrast(1)"), "different at line 1");
    PMX_IsLog(1, "text\n");
    EXPECT_NONFATAL_FAILURE(EXPECT_TRACE(R"(LOG1 "text")"), "different at line 1");
    PMX_IsLog(1, "text\n");
    EXPECT_NONFATAL_FAILURE(EXPECT_TRACE(R"(LOG2 "text\n")"), "different at line 1");
    Printf("text\n");
    EXPECT_NONFATAL_FAILURE(EXPECT_TRACE(R"(UTIL_Printf "text\n")"), "different at line 1");
    EXPECT_EQ(0u, x_reg_read32(0xFD000040));
    EXPECT_NONFATAL_FAILURE(EXPECT_TRACE("x_reg_read32(0xFD000040) = 1"), "different at line 1");
}

TEST_F(Fixture, ExpectTrace_MissingAdditionalOrSwappedLine_Fails)
{
    TVE_SetBrightness(1);
    EXPECT_NONFATAL_FAILURE(EXPECT_TRACE("TVE_SetBrightness(1)\nTVE_SetContrast(2)"), "->  (nothing more)");
    TVE_SetBrightness(1);
    TVE_SetContrast(2);
    EXPECT_NONFATAL_FAILURE(EXPECT_TRACE("TVE_SetBrightness(1)"), "->  TVE_SetContrast(2)");
    TVE_SetBrightness(1);
    TVE_SetContrast(2);
    EXPECT_NONFATAL_FAILURE(EXPECT_TRACE("TVE_SetContrast(2)\nTVE_SetBrightness(1)"), "different at line 1");
    TVE_SetBrightness(1);
    EXPECT_NONFATAL_FAILURE(EXPECT_NO_TRACE(), "->  TVE_SetBrightness(1)");
}

TEST_F(Fixture, ExpectTrace_MalformedLine_FailsWithTheReason)
{
    TVE_SetBrightness(1);
    EXPECT_NONFATAL_FAILURE(EXPECT_TRACE("TVE_SetBrightness(1"), "The expected line is not well formed");
    EXPECT_NO_TRACE();
}

TEST_F(Fixture, ExpectCalls_LeavesOutLogLinesAndRegisterReadsAlone)
{
    PMX_IsLog(1, "text\n");
    UTIL_Printf("text\n");
    TVE_SetBrightness(1);
    EXPECT_EQ(0u, x_reg_read32(0xFD000040));
    x_reg_write32(0xFD000040, 2);
    EXPECT_CALLS(R"(
        TVE_SetBrightness(1)
        x_reg_write32(0xFD000040, 2)
    )");
    x_reg_write32(0xFD000040, 2);
    EXPECT_NONFATAL_FAILURE(EXPECT_CALLS(""), "->  x_reg_write32(0xFD000040, 0x2)");
    Assert("x", "y", 1);
    EXPECT_NONFATAL_FAILURE(EXPECT_CALLS(""), "Assert");
    expect_asserts(1);
}

TEST_F(Fixture, Record_ReadsAndWritesByName)
{
    EXPECT_EQ(0, record("ucMode"));
    set_record("ucMode", 2);
    set_record("arPortInfo[3].eSrcColorSpace", DRV_PMX_CS_RGB);
    set_record("status.hPMXTimer", 9);
    set_record("MutexPMX", 8);
    EXPECT_EQ(2, record("ucMode"));
    EXPECT_EQ(2, record("arPortInfo[3].eSrcColorSpace"));
    EXPECT_EQ(9u, _arPmxDispPartStatus.hPMXTimer);
    EXPECT_EQ(8u, MutexPMX);
    EXPECT_EQ(0, record("piVdp1"));
    EXPECT_THROW(record("arPortInfo"), std::invalid_argument);
    EXPECT_THROW(record("ucMood"), std::invalid_argument);
}

TEST_F(Fixture, ExpectRecord_OnlyTheListedFieldsMayAndMustChange)
{
    const RecordSnapshot before;
    EXPECT_RECORD_UNCHANGED(before);
    set_record("ucMode", 2);
    set_record("arOutputConf[1].u4VFreq", 50);
    set_record("status.fgTimerAlreadySet", 1);
    set_record("_fg2DCap", 1);
    EXPECT_RECORD_CHANGED(before, "ucMode", "arOutputConf[1].u4VFreq", "status.fgTimerAlreadySet", "_fg2DCap");
    EXPECT_NONFATAL_FAILURE(EXPECT_RECORD_UNCHANGED(before), "_fg2DCap changed from 0 to 1");
    EXPECT_NONFATAL_FAILURE(
        EXPECT_RECORD_CHANGED(before, "ucMode", "arOutputConf[1].u4VFreq", "status.fgTimerAlreadySet"),
        "_fg2DCap changed from 0 to 1");
    const RecordSnapshot after;
    EXPECT_NONFATAL_FAILURE(EXPECT_RECORD_CHANGED(after, "ucMode"), "ucMode did not change");
    EXPECT_NONFATAL_FAILURE(EXPECT_RECORD_CHANGED(after, "ucMood"), "ucMood did not change: there is no such field");
}

TEST_F(Fixture, PowerOn_UnexpectedAssertionOrMisuse_Fails)
{
    Assert("x", "y", 1);
    EXPECT_NONFATAL_FAILURE(power_on(), "failed assertions since power-on");
    expect_asserts(1);
    EXPECT_NONFATAL_FAILURE(power_on(), "failed assertions since power-on");

    HANDLE_T mutex = 0;
    ASSERT_EQ(OSR_OK, x_sema_create(&mutex, X_SEMA_TYPE_MUTEX, 1));
    EXPECT_NE(OSR_OK, x_sema_unlock(mutex));
    ASSERT_EQ(1u, notices().size());
    EXPECT_TRUE(notices().front().starts_with("NOTICE misuse \"")) << notices().front();
    EXPECT_NONFATAL_FAILURE(power_on(), "misuses of the platform since power-on");
    EXPECT_TRUE(notices().empty());
}

TEST_F(Fixture, PowerOn_LayerIsAsLoaded)
{
    const RecordSnapshot fresh;
    started();
    set_record("bComp0OnTop", 1);
    set_record("_fgBootUp", 0);
    set_record("PMX_debug_level", 7);
    EXPECT_FALSE(fresh.changes().empty());
    power_on();
    EXPECT_RECORD_UNCHANGED(fresh);
    EXPECT_EQ(1, record("_fgBootUp"));
}

TEST_F(Fixture, AtCall_RunsWhenTheNamedCallReturns)
{
    unsigned seen = 0;
    at_call("TVE_SetContrast", [&] { ++seen; });
    TVE_SetBrightness(1);
    EXPECT_EQ(0u, seen);
    TVE_SetContrast(2);
    EXPECT_EQ(1u, seen);
}

TEST_F(Fixture, WatchStores_TheTraceShowsThem)
{
    started();
    watch_stores();
    PMX_SetTvType(0, PMX_TV_TYPE_PAL);
    EXPECT_TRACE(R"(
        SET ucTvType PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL
        PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)
    )");
    set_record("ucMode", RES_480P);
    EXPECT_TRACE("SET ucMode RES_1080P60HZ → RES_480P (outside)");
    EXPECT_NO_TRACE();
}

TEST_F(Fixture, Meanwhile_HappensInsideTheCall)
{
    started();
    watch_stores();
    board::meanwhile("PMX_HalSetTvType", 1, [] { set_record("ucMode", RES_480P); });
    PMX_SetTvType(0, PMX_TV_TYPE_PAL);
    EXPECT_TRACE(R"(
        SET ucTvType PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL
        PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)
        SET ucMode RES_1080P60HZ → RES_480P (meanwhile)
    )");
}

TEST_F(Fixture, Meanwhile_ThatNeverHappens_Fails)
{
    board::meanwhile("PMX_HalSetTvType", 2, [] {});
    PMX_HalSetTvType(0, 0);
    EXPECT_NONFATAL_FAILURE(power_on(), "never happened: meanwhile inside PMX_HalSetTvType, after 1 calls");
    board::meanwhile("PMX_HalSetTvType", 1, [] { throw std::runtime_error("wrong"); });
    PMX_HalSetTvType(0, 0);
    EXPECT_NONFATAL_FAILURE(power_on(), "wrong");
}
