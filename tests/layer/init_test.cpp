// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Start-up. */
#include "tests/layer/sequences.h"
#include "tests/support/layer_fixture.h"

using Lifecycle = LayerTest;

namespace
{

/** Start-up between the creation of the mutex and the registration, for the boot word 0x0000010C. */
std::string first_reset()
{
    return sequences::reset({ .boot_word = 0x0000010C, .mode = RES_1080P60HZ });
}

std::int64_t line_of_the_assertion()
{
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (entry.kind == board::TraceEntry::Kind::Assert)
            return entry.arguments.at(2).value.as_number();
    }
    return 0;
}

} // namespace

TEST_F(Lifecycle, Init_FirstCall_RunsTheWholeSequence)
{
    PMX_Init();
    EXPECT_TRACE(R"(
        LOG1 "PMX_Init\n"
        x_sema_create(1, X_SEMA_TYPE_MUTEX, 1) = 0
        get_part_id_by_name("fast_init_param") = 0
        UTIL_Printf "TESTPMX: Get pard ID:0.\n"
        i4NFBPartitionRead(0, 0, [0x0C, 0x01, 0x00, 0x00], 4) = 4
        UTIL_Printf "TESTPMX: Get Test Data :12, 0x     10c.\n"
        UTIL_Printf "[PMX]_arPmxConf[ucPmxId].ucMode=12\n"
        x_reg_read32(0xFD000044) = 0
        x_reg_write32(0xFD000044, 0x7)
        x_reg_write32(0xFD000040, 0x03D2F1AA)
        x_reg_read32(0xFD00003C) = 0
        x_reg_write32(0xFD00003C, 0x2)
        x_reg_read32(0xFD000044) = 0x7
        x_reg_write32(0xFD000044, 0x4007)
        x_thread_delay(1)
        x_reg_read32(0xFD00003C) = 0x2
        x_reg_write32(0xFD00003C, 0x6)
        x_reg_read32(0xFD00003C) = 0x6
        x_reg_write32(0xFD00003C, 0x2)
        x_reg_read32(0xFD000040) = 0x03D2F1AA
        x_reg_write32(0xFD000040, 0x03D2F1AB)
        x_reg_read32(0xFD000040) = 0x03D2F1AB
        x_reg_write32(0xFD000040, 0x03D2F1AA)
        x_thread_delay(1)
        x_reg_read32(0xFD00003C) = 0x2
        x_reg_write32(0xFD00003C, 0x10002)
        x_reg_read32(0xFD000044) = 0x4007
        x_reg_write32(0xFD000044, 0x4017)
        PMX_HalSetDigitalOut(0, 0, 0, 0)
        PMX_HalSetMode(0, RES_1080P60HZ)
        PMX_HalSetTvType(0, 0)
        PMX_HalSetBg(0, 0x108080)
        PMX_HalPlaneOrder(0, 3, [4, 3, 1, 0, 2, 5, 6, 7])
        PMX_HalInitPlaneOrder(0)
        fgPmxHalSwapPlane1_2(0) = FALSE
        vPmxNotMixPlane(0, 1)
        VDP_GlobalOutputChange()
        VDP_SetTvFormat(RES_1080P60HZ, 1)
        i4ImRegisterInterface2(66, 0, 9, _rPMXIF, 0) = 0
        x_timer_create(2) = 0
        LOG0 "[PMX] create a timer \n"
        PMX_VsyncInit()
        PMX_HalSetDigitalOutDrv(3)
        register_pm_ops(pmx_pm_ops) = 0
    )");
    EXPECT_EQ(1, record("_PmxInitiated"));
    EXPECT_EQ(1, record("MutexPMX"));
    EXPECT_EQ(2, record("status.hPMXTimer"));
    EXPECT_EQ(RES_1080P60HZ, record("ucMode"));
    EXPECT_EQ(0, record("ucEnable"));
    EXPECT_EQ(1, record("_fgBootUp"));
}

TEST_F(Lifecycle, Init_TheTimerIsCreatedBehindTheReset_SoItsHandleSurvives)
{
    set_record("status.hPMXTimer", 77);
    std::int64_t at_reset = -1;
    at_call("PMX_HalSetMode", [&] { at_reset = record("status.hPMXTimer"); });
    PMX_Init();
    EXPECT_EQ(0, at_reset);
    EXPECT_EQ(2, record("status.hPMXTimer"));
    EXPECT_EQ(0, record("status.fgPmxFormatChangeFlag"));
    EXPECT_EQ(0, record("status.fgPmxEnabeOsdFlag"));
    EXPECT_EQ(0, record("status.fgTimerAlreadySet"));
}

TEST_F(Lifecycle, Init_TimerIsNotStarted)
{
    started();
    board::advance(std::chrono::seconds(60));
    EXPECT_NO_TRACE();
}

TEST_F(Lifecycle, Init_MarksTheLayerAsStartedBeforeAnythingCanFail)
{
    std::int64_t at_first_call = -1;
    at_call("x_sema_create", [&] { at_first_call = record("_PmxInitiated"); });
    PMX_Init();
    EXPECT_EQ(1, at_first_call);
}

TEST_F(Lifecycle, Init_SecondCall_OnlyLogs)
{
    started();
    const RecordSnapshot before;
    PMX_Init();
    EXPECT_TRACE(R"(LOG1 "PMX_Init\n")");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Lifecycle, Init_InitiatedByAnyOtherNumber_OnlyLogs)
{
    for (const int number : { 1, 2, 255 })
    {
        set_record("_PmxInitiated", number);
        const RecordSnapshot before;
        PMX_Init();
        EXPECT_TRACE(R"(LOG1 "PMX_Init\n")");
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(Lifecycle, Init_MutexCannotBeCreated_AssertsAndGoesOn)
{
    for (const std::int64_t answer : { -1, 1, 0x10000, 0x7FFFFFFF })
    {
        SCOPED_TRACE(answer);
        power_on();
        fail("x_sema_create", answer);
        PMX_Init();
        EXPECT_GT(line_of_the_assertion(), 0);
        EXPECT_TRACE(R"(
            LOG1 "PMX_Init\n"
            x_sema_create(0, X_SEMA_TYPE_MUTEX, 1) = )" +
                     std::to_string(answer) + R"(
            Assert("i4Ret == OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
            )" + first_reset() +
                     R"(
            i4ImRegisterInterface2(66, 0, 9, _rPMXIF, 0) = 0
            x_timer_create(1) = 0
            LOG0 "[PMX] create a timer \n"
            PMX_VsyncInit()
            PMX_HalSetDigitalOutDrv(3)
            register_pm_ops(pmx_pm_ops) = 0
        )");
        EXPECT_EQ(1, record("_PmxInitiated"));
        EXPECT_EQ(0, record("MutexPMX"));
        expect_asserts(1);
    }
}

TEST_F(Lifecycle, Init_MutexCannotBeCreated_HandleStaysAsItWas)
{
    set_record("MutexPMX", 77);
    fail("x_sema_create", -1);
    PMX_Init();
    EXPECT_EQ(77, record("MutexPMX"));
    expect_asserts(1);
}

TEST_F(Lifecycle, Init_TimerCannotBeCreated_AssertsAndGoesOn)
{
    for (const std::int64_t answer : { -1, 1 })
    {
        SCOPED_TRACE(answer);
        power_on();
        fail("x_timer_create", answer);
        PMX_Init();
        EXPECT_GT(line_of_the_assertion(), 0);
        EXPECT_TRACE(R"(
            LOG1 "PMX_Init\n"
            x_sema_create(1, X_SEMA_TYPE_MUTEX, 1) = 0
            )" + first_reset() +
                     R"(
            i4ImRegisterInterface2(66, 0, 9, _rPMXIF, 0) = 0
            x_timer_create(0) = )" +
                     std::to_string(answer) + R"(
            Assert("x_timer_create(&_arPmxDispPartStatus.hPMXTimer)==OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
            LOG0 "[PMX] create a timer \n"
            PMX_VsyncInit()
            PMX_HalSetDigitalOutDrv(3)
            register_pm_ops(pmx_pm_ops) = 0
        )");
        EXPECT_EQ(1, record("_PmxInitiated"));
        EXPECT_EQ(0, record("status.hPMXTimer"));
        expect_asserts(1);
    }
}

TEST_F(Lifecycle, Init_RegistrationsFail_OnlyTheInterfaceIsLogged)
{
    fail("i4ImRegisterInterface2", -3);
    fail("register_pm_ops", -1);
    PMX_Init();
    EXPECT_TRACE(R"(
        LOG1 "PMX_Init\n"
        x_sema_create(1, X_SEMA_TYPE_MUTEX, 1) = 0
        )" + first_reset() +
                 R"(
        i4ImRegisterInterface2(66, 0, 9, _rPMXIF, 0) = -3
        LOG9 "Fail to register IID_IPMX of PMX Comp 0\n"
        x_timer_create(2) = 0
        LOG0 "[PMX] create a timer \n"
        PMX_VsyncInit()
        PMX_HalSetDigitalOutDrv(3)
        register_pm_ops(pmx_pm_ops) = -1
    )");
    EXPECT_EQ(1, record("_PmxInitiated"));
}

TEST_F(Lifecycle, Init_EveryOperatingSystemCallFails_GoesOnToItsEnd)
{
    fail("x_sema_create", -1);
    fail("x_timer_create", -1);
    fail("i4ImRegisterInterface2", -1);
    fail("register_pm_ops", -1);
    fail("get_part_id_by_name", -1);
    fail("i4NFBPartitionRead", -1);
    PMX_Init();
    EXPECT_TRACE(R"(
        LOG1 "PMX_Init\n"
        x_sema_create(0, X_SEMA_TYPE_MUTEX, 1) = -1
        Assert("i4Ret == OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
        )" + sequences::failed_boot_read("-1") +
                 sequences::reset_tail({ .boot_word = 0, .mode = RES_480I }) + R"(
        i4ImRegisterInterface2(66, 0, 9, _rPMXIF, 0) = -1
        LOG9 "Fail to register IID_IPMX of PMX Comp 0\n"
        x_timer_create(0) = -1
        Assert("x_timer_create(&_arPmxDispPartStatus.hPMXTimer)==OSR_OK", "src/driver/pmx/pmx_lifecycle.cpp")
        LOG0 "[PMX] create a timer \n"
        PMX_VsyncInit()
        PMX_HalSetDigitalOutDrv(3)
        register_pm_ops(pmx_pm_ops) = -1
    )");
    EXPECT_EQ(1, record("_PmxInitiated"));
    expect_asserts(2);
}
