// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The handshake with the display part, function by function. */
#include "board/video_planes.h"
#include "tests/layer/mode_ex.h"

using DisplayPart = LayerTest;

namespace
{

struct Flags
{
    std::int64_t format_change;
    std::int64_t enable_osd;
    std::int64_t timer_set;

    bool operator==(const Flags&) const = default;
};

Flags flags()
{
    return { LayerTest::record("status.fgPmxFormatChangeFlag"), LayerTest::record("status.fgPmxEnabeOsdFlag"),
             LayerTest::record("status.fgTimerAlreadySet") };
}

void set_flags(const Flags& flags)
{
    LayerTest::set_record("status.fgPmxFormatChangeFlag", flags.format_change);
    LayerTest::set_record("status.fgPmxEnabeOsdFlag", flags.enable_osd);
    LayerTest::set_record("status.fgTimerAlreadySet", flags.timer_set);
}

/** What PMX_SetFormatChangeFlag(FALSE) calls, each line with the flags as they stand at the end of the call. */
std::string lowering_with_flags()
{
    std::string seen;
    board::at_every_call([&seen](const board::TraceEntry& entry) {
        const Flags now = flags();
        seen += "F" + std::to_string(now.format_change) + " E" + std::to_string(now.enable_osd) + "  " + entry.brief() +
                "\n";
    });
    PMX_SetFormatChangeFlag(FALSE);
    board::at_every_call({});
    return seen;
}

} // namespace

TEST_F(DisplayPart, SetFormatChangeFlag_Raised_OnlyLogsAndStores)
{
    started();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetFormatChangeFlag(TRUE));
    EXPECT_TRACE(R"(LOG0 "Display Format Change :1.\n")");
    EXPECT_RECORD_CHANGED(before, "status.fgPmxFormatChangeFlag");
    EXPECT_EQ(1, record("status.fgPmxFormatChangeFlag"));
}

TEST_F(DisplayPart, SetFormatChangeFlag_AnyNonZeroNumber_IsStoredAsGivenAndRaises)
{
    started();
    for (unsigned number = 1; number < 256; ++number)
    {
        EXPECT_EQ(1u, PMX_SetFormatChangeFlag(static_cast<BOOL>(number)));
        EXPECT_TRACE("LOG0 \"Display Format Change :" + std::to_string(number) + ".\\n\"");
        EXPECT_EQ((Flags{ number, 0, 0 }), flags());
    }
}

TEST_F(DisplayPart, SetFormatChangeFlag_Raised_LeavesAnOwedReleaseOwedAndTheTimerFlagAlone)
{
    started();
    set_flags({ 0, 1, 1 });
    EXPECT_EQ(1u, PMX_SetFormatChangeFlag(TRUE));
    EXPECT_TRACE(R"(LOG0 "Display Format Change :1.\n")");
    EXPECT_EQ((Flags{ 1, 1, 1 }), flags());
}

TEST_F(DisplayPart, SetFormatChangeFlag_Lowered_MixesTheFiveOsdPlanesInOrder)
{
    started();
    set_flags({ 1, 0, 1 });
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetFormatChangeFlag(FALSE));
    EXPECT_TRACE(R"(
        LOG0 "Display Format Change :0.\n"
        LOG0 "Set Osd Enable :1.\n"
        fgVdpIsWaitforSyncCtrl() = 0
        LOG0 "PMX_SetOsdEnable.\n"
        vPmxMixPlane(0, 2)
        vPmxMixPlane(0, 3)
        vPmxMixPlane(0, 4)
        vPmxMixPlane(0, 5)
        vPmxMixPlane(0, 6)
        LOG0 "Set Osd Enable :0.\n"
    )");
    EXPECT_RECORD_CHANGED(before, "status.fgPmxFormatChangeFlag");
    EXPECT_EQ((Flags{ 0, 0, 1 }), flags());
}

TEST_F(DisplayPart, SetFormatChangeFlag_LoweredWhileAlreadyLow_MixesAllTheSame)
{
    started();
    const RecordSnapshot before;
    for (int time = 0; time < 2; ++time)
    {
        EXPECT_EQ(1u, PMX_SetFormatChangeFlag(FALSE));
        EXPECT_TRACE(mode_ex::lowered);
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(DisplayPart, SetFormatChangeFlag_LoweredWhileTheVideoPlaneWaits_OwesTheRelease)
{
    started();
    set_flags({ 1, 0, 1 });
    board::video_planes::set_waiting_for_sync(true);
    EXPECT_EQ(1u, PMX_SetFormatChangeFlag(FALSE));
    EXPECT_TRACE(R"(
        LOG0 "Display Format Change :0.\n"
        LOG0 "Set Osd Enable :1.\n"
        fgVdpIsWaitforSyncCtrl() = 1
    )");
    EXPECT_EQ((Flags{ 0, 1, 1 }), flags());

    board::video_planes::set_waiting_for_sync(false);
    EXPECT_EQ(1u, PMX_SetOsdEnable());
    EXPECT_TRACE(R"(
        LOG0 "PMX_SetOsdEnable.\n"
        vPmxMixPlane(0, 2)
        vPmxMixPlane(0, 3)
        vPmxMixPlane(0, 4)
        vPmxMixPlane(0, 5)
        vPmxMixPlane(0, 6)
        LOG0 "Set Osd Enable :0.\n"
    )");
    EXPECT_EQ((Flags{ 0, 0, 1 }), flags());
}

TEST_F(DisplayPart, SetFormatChangeFlag_Lowered_AnyOtherAnswerThanFalseMeansWaiting)
{
    started();
    for (const int answer : { 1, 2, 255 })
    {
        board::faults::set({ "fgVdpIsWaitforSyncCtrl", answer });
        EXPECT_EQ(1u, PMX_SetFormatChangeFlag(FALSE));
        EXPECT_CALLS("fgVdpIsWaitforSyncCtrl() = " + std::to_string(answer));
        EXPECT_EQ((Flags{ 0, 1, 0 }), flags());
    }
}

TEST_F(DisplayPart, SetFormatChangeFlag_StoresBehindItsLogLine_AndOwesTheReleaseUntilAllPlanesAreMixed)
{
    started();
    set_flags({ 1, 0, 1 });
    EXPECT_EQ(R"(F1 E0  LOG0 "Display Format Change :0.\n"
F0 E0  LOG0 "Set Osd Enable :1.\n"
F0 E1  fgVdpIsWaitforSyncCtrl() = 0
F0 E1  LOG0 "PMX_SetOsdEnable.\n"
F0 E1  vPmxMixPlane(0, DRV_PMX_PLANE_3)
F0 E1  vPmxMixPlane(0, DRV_PMX_PLANE_4)
F0 E1  vPmxMixPlane(0, DRV_PMX_PLANE_5)
F0 E1  vPmxMixPlane(0, DRV_PMX_PLANE_6)
F0 E1  vPmxMixPlane(0, DRV_PMX_PLANE_7)
F0 E1  LOG0 "Set Osd Enable :0.\n"
)",
              lowering_with_flags());
    EXPECT_EQ((Flags{ 0, 0, 1 }), flags());
}

TEST_F(DisplayPart, SetOsdEnableFlag_LogsAndStoresTheNumberAsGiven)
{
    started();
    for (unsigned number = 0; number < 256; ++number)
    {
        EXPECT_EQ(1u, PMX_SetOsdEnableFlag(static_cast<BOOL>(number)));
        EXPECT_TRACE("LOG0 \"Set Osd Enable :" + std::to_string(number) + ".\\n\"");
        EXPECT_EQ((Flags{ 0, number, 0 }), flags());
    }
}

TEST_F(DisplayPart, SetOsdEnableFlag_ChangesNothingElse)
{
    started();
    set_flags({ 1, 0, 1 });
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetOsdEnableFlag(TRUE));
    EXPECT_RECORD_CHANGED(before, "status.fgPmxEnabeOsdFlag");
}

TEST_F(DisplayPart, SetOsdEnable_NothingOwed_OnlyLogs)
{
    started();
    set_flags({ 1, 0, 1 });
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetOsdEnable());
    EXPECT_TRACE(R"(LOG0 "PMX_SetOsdEnable.\n")");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(DisplayPart, SetOsdEnable_Owed_MixesAndForgets)
{
    started();
    for (const int owed : { 1, 2, 255 })
    {
        set_flags({ 1, owed, 1 });
        const RecordSnapshot before;
        EXPECT_EQ(1u, PMX_SetOsdEnable());
        EXPECT_TRACE(R"(
            LOG0 "PMX_SetOsdEnable.\n"
            vPmxMixPlane(0, 2)
            vPmxMixPlane(0, 3)
            vPmxMixPlane(0, 4)
            vPmxMixPlane(0, 5)
            vPmxMixPlane(0, 6)
            LOG0 "Set Osd Enable :0.\n"
        )");
        EXPECT_RECORD_CHANGED(before, "status.fgPmxEnabeOsdFlag");
        EXPECT_EQ((Flags{ 1, 0, 1 }), flags());
    }
}

TEST_F(DisplayPart, SetOsdEnable_Owed_DoesNotAskWhetherTheVideoPlaneStillWaits)
{
    started();
    set_flags({ 0, 1, 0 });
    board::video_planes::set_waiting_for_sync(true);
    EXPECT_EQ(1u, PMX_SetOsdEnable());
    EXPECT_CALLS("vPmxMixPlane(0, 2)\nvPmxMixPlane(0, 3)\nvPmxMixPlane(0, 4)\nvPmxMixPlane(0, 5)\nvPmxMixPlane(0, 6)");
    EXPECT_EQ((Flags{ 0, 0, 0 }), flags());
}

TEST_F(DisplayPart, DisplayModeReady_FlagClear_Ready)
{
    started();
    set_flags({ 0, 1, 1 });
    const RecordSnapshot before;
    EXPECT_EQ(1, fgPMX_DisplayModeReady());
    EXPECT_TRACE(R"(LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n")");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(DisplayPart, DisplayModeReady_AnyNonZeroFlag_NotReady)
{
    started();
    for (unsigned number = 1; number < 256; ++number)
    {
        set_flags({ number, 0, 0 });
        EXPECT_EQ(0, fgPMX_DisplayModeReady());
        EXPECT_TRACE("LOG9 \"[PMX] fgPMX_DisplayModeReady is " + std::to_string(number) + ".\\n\"");
        EXPECT_EQ(number, record("status.fgPmxFormatChangeFlag"));
    }
}

TEST_F(DisplayPart, Handshake_BeforeInit_IsAcceptedAtAnyTime)
{
    EXPECT_EQ(1u, PMX_SetFormatChangeFlag(TRUE));
    EXPECT_EQ(0, fgPMX_DisplayModeReady());
    EXPECT_EQ(1u, PMX_SetOsdEnable());
    EXPECT_EQ(1u, PMX_SetFormatChangeFlag(FALSE));
    EXPECT_EQ(1, fgPMX_DisplayModeReady());
    EXPECT_EQ((Flags{ 0, 0, 0 }), flags());
}
