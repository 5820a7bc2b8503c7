// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** On which side of a console line, or of a call, each value is stored: whoever looks from inside that call depends on
 *  it, and so does a log that was cut off. */
#include "board/video_planes.h"
#include "tests/layer/mode_ex.h"
#include "tests/layer/source_events.h"

/** A started mixer whose stores are in the trace. */
class StoreOrder : public SourceTest
{
protected:
    using Lines = std::vector<std::string>;

    void SetUp() override
    {
        SourceTest::SetUp();
        watch_stores();
    }

    /** All but stores, console lines and assertions is left out; the trace is cleared. */
    static Lines stores_and_lines()
    {
        board::trace::look();
        Lines lines;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            if (entry.kind == board::TraceEntry::Kind::Store)
                lines.push_back("SET " + entry.function);
            else if (entry.kind == board::TraceEntry::Kind::Log)
                lines.push_back(entry.text);
        }
        board::trace::clear();
        return lines;
    }
};

TEST_F(StoreOrder, SetFormatChangeFlag_EachFlagBehindItsLine)
{
    PMX_SetFormatChangeFlag(TRUE);
    EXPECT_TRACE(R"(
        LOG0 "Display Format Change :1.\n"
        SET status.fgPmxFormatChangeFlag 0 → 1
    )");
    PMX_SetFormatChangeFlag(FALSE);
    EXPECT_TRACE(R"(
        LOG0 "Display Format Change :0.\n"
        SET status.fgPmxFormatChangeFlag 1 → 0
        LOG0 "Set Osd Enable :1.\n"
        SET status.fgPmxEnabeOsdFlag 0 → 1
        fgVdpIsWaitforSyncCtrl() = 0
        LOG0 "PMX_SetOsdEnable.\n"
        vPmxMixPlane(0, 2)
        vPmxMixPlane(0, 3)
        vPmxMixPlane(0, 4)
        vPmxMixPlane(0, 5)
        vPmxMixPlane(0, 6)
        LOG0 "Set Osd Enable :0.\n"
        SET status.fgPmxEnabeOsdFlag 1 → 0
    )");
}

TEST_F(StoreOrder, TmrIsr_TimersFlagBehindItsLineAndBeforeTheNext)
{
    set_record("status.fgTimerAlreadySet", 1);
    set_record("status.fgPmxFormatChangeFlag", 1);
    board::video_planes::set_waiting_for_sync(true);
    board::trace::clear();
    _PMX_TmrIsr(0, nullptr);
    EXPECT_TRACE(R"(
        LOG0 "PMX timeout.\n"
        SET status.fgTimerAlreadySet 1 → 0
        LOG0 "Display Format Change :0.\n"
        SET status.fgPmxFormatChangeFlag 1 → 0
        LOG0 "Set Osd Enable :1.\n"
        SET status.fgPmxEnabeOsdFlag 0 → 1
        fgVdpIsWaitforSyncCtrl() = 1
    )");
}

TEST_F(StoreOrder, StopAndStartAndBothShutDowns_TheMarkBehindTheLine)
{
    PMX_Stop();
    EXPECT_TRACE(R"(
        LOG1 "PMX_Stop\n"
        SET _PmxInitiated 1 → 0
        PMX_VsyncStop()
    )");
    PMX_Init();
    Lines lines = stores_and_lines();
    lines.resize(3);
    EXPECT_EQ((Lines{ "PMX_Init\n", "SET _PmxInitiated", "SET MutexPMX" }), lines);
    PMX_Uninit();
    EXPECT_EQ((Lines{ "PMX_Uninit\n", "SET MutexPMX", "SET _PmxInitiated" }), stores_and_lines());
    PMX_Init();
    board::trace::clear();
    EXPECT_EQ(0, i4PMX_Uninit(7));
    EXPECT_EQ((Lines{ "i4PMX_Uninit u4Case 7\n", "SET MutexPMX", "SET _PmxInitiated", "i4PMX_Uninit return 0\n" }),
              stores_and_lines());
}

TEST_F(StoreOrder, Reset_TheBootModeIsStoredBeforeItIsPrinted_AndItsReplacementBehind)
{
    boot_word(RES_2160P);
    PMX_Reset(0);
    Lines lines = stores_and_lines();
    ASSERT_LE(3u, lines.size());
    lines.erase(lines.begin(), lines.end() - 3);
    EXPECT_EQ(
        (Lines{ "SET ucMode", "[PMX]_arPmxConf[ucPmxId].ucMode=" + std::to_string(RES_2160P) + "\n", "SET ucMode" }),
        lines);
    EXPECT_EQ(RES_480P, record("ucMode"));
}

TEST_F(StoreOrder, Ports_FieldsBehindTheLinesAndBeforeTheUnlock)
{
    EXPECT_EQ(source_events::done, i4Pmx_Connect(66, 0, PMX_COMP_TYPE_OSD, 2));
    const std::string stored = R"(
        SET arPortInfo[4].u2CompType * → *
        SET arPortInfo[4].u2CompId * → *
        SET arPortInfo[4].fgConnected * → *
    )";
    EXPECT_TRACE(source_events::lock() + source_events::log8("Tp,Id=%d,%d", 176, 2) +
                 source_events::log8("Comp(%d) connect", 4) + stored + source_events::unlock());
    set_record("arPortInfo[4].fgEnabled", 1);
    board::trace::clear();
    EXPECT_EQ(source_events::done, i4Pmx_Disconnect(66, 0, PMX_COMP_TYPE_OSD, 2));
    EXPECT_TRACE(source_events::lock() + source_events::log8("Tp,Id=%d,%d", 176, 2) +
                 source_events::log8("Comp(%d) disconnect", 4) + stored + "SET arPortInfo[4].fgEnabled 1 → 0\n" +
                 source_events::unlock());
}

TEST_F(StoreOrder, VdpEnabled_EnabledBeforeItsLine_ColourSpaceBeforeItsOwn)
{
    connect(main_video);
    set_record("arPortInfo[0].eInputColorMode", DRV_GFX_COLOR_MODE_RGB);
    board::trace::clear();
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 0, 720, 480, 9));
    Lines lines = stores_and_lines();
    lines.resize(7);
    EXPECT_EQ((Lines{ "SET arPortInfo[0].fgEnabled", "SET arPortInfo[0].eInputColorMode", "SET arPortInfo[0].ucLumaKey",
                      "VDP_0 Enabled\n", "SET arPortInfo[0].eSrcColorSpace",
                      "VDP_0's Src Color Space = DRV_PMX_CS_YCBCR_601\n",
                      "[PMX] VDP_COMP_1 enabled and Color Space is 0.\n" }),
              lines);
    EXPECT_EQ(1u, PMX_VdpDisabled(0, 0));
    EXPECT_EQ((Lines{ "SET arPortInfo[0].fgEnabled", "VDP_0 Disabled\n" }), stores_and_lines());
}

TEST_F(StoreOrder, VdpEnabled_Background_ItsColourSpaceIsForcedBehindTheLineThatSaysSo)
{
    connect(background);
    set_record("arPortInfo[1].eSrcColorSpace", DRV_PMX_CS_RGB);
    board::trace::clear();
    EXPECT_EQ(1u, PMX_VdpEnabled(0, 2, 1920, 1080, 0));
    EXPECT_EQ((Lines{ "SET arPortInfo[1].fgEnabled", "VDP_2 Enabled\n", "Turn on OSD full range conversion\n",
                      "SET arPortInfo[1].eSrcColorSpace", "VDP_2's Src Color Space = DRV_PMX_CS_YCBCR_709\n",
                      "VDP_2's (JPG(BACKGROUND) is force to 601.\n", "SET arPortInfo[1].eSrcColorSpace" }),
              stores_and_lines());
}

TEST_F(StoreOrder, OsdEnabled_EnabledBeforeItsLine_ColourSpacesBeforeTheirs)
{
    EXPECT_EQ(1u, PMX_OsdEnabled(0, 2, 720, 480, DRV_GFX_COLOR_MODE_YCBCR));
    Lines lines = stores_and_lines();
    ASSERT_LE(6u, lines.size());
    lines.resize(6);
    EXPECT_EQ((Lines{ "SET arPortInfo[4].fgEnabled", "OSD_2 Enabled\n", "SET arPortInfo[4].eInputColorMode",
                      "SET arPortInfo[4].eSrcColorSpace", "SET eMasterColorSpace",
                      "OSD_2's Src Color Space = DRV_PMX_CS_YCBCR_601\n" }),
              lines);
    EXPECT_EQ(1u, PMX_OsdDisabled(0, 2));
    EXPECT_EQ((Lines{ "SET arPortInfo[4].fgEnabled", "OSD_2 Disabled\n" }), stores_and_lines());
}

TEST_F(StoreOrder, DecideMasterColorSpace_StoredBehindItsLine_AndBeforeAnybodyIsTold)
{
    set_record("arPortInfo[0].fgEnabled", 1);
    set_record("arPortInfo[0].eSrcColorSpace", DRV_PMX_CS_YCBCR_601);
    board::trace::clear();
    EXPECT_EQ(1u, PMX_DecideMasterColorSpace(0));
    EXPECT_TRACE(source_events::log8("[PMX] VDP_COMP_1 enabled and Color Space is %d.", 0) +
                 source_events::log8("[PMX] Master Color Space change from %d to %d.", 1, 0) +
                 "SET eMasterColorSpace 1 → 0\n" + source_events::announce(0));
}

TEST_F(StoreOrder, AspectRatios_StoredBehindTheirLine_AndBeforeAnybodyIsTold)
{
    EXPECT_EQ(1u, PMX_SetAspectRatio(0, 2));
    EXPECT_TRACE(R"(
        LOG9 "PMX_ID(0), Aspect Ratio(2)\n"
        SET u4AspectRatio * → 2
        fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, ...)
        VDP_GlobalOutputChange()
        LOG9 "VDP_GlobalOutputChange\n"
    )");
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 9, 1));
    EXPECT_TRACE(R"(
        LOG9 "[EX] PMX_ID(0), Aspect Ratio(9), Apply On Next(1)\n"
        SET fgAspNext 0 → 1
        SET u4AspNext * → 9
    )");
    EXPECT_EQ(9u, PMX_SetAspectRatioNext(0));
    EXPECT_TRACE(R"(
        SET u4AspectRatio 2 → 9
        SET fgAspNext 1 → 0
        fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, ...)
        VDP_GlobalOutputChange()
    )");
    EXPECT_EQ(1u, PMX_SetAspectRatioEx(0, 3, 0));
    EXPECT_TRACE(R"(
        LOG9 "[EX] PMX_ID(0), Aspect Ratio(3), Apply On Next(0)\n"
        SET u4AspectRatio 9 → 3
        SET u4AspNext 9 → 0
        fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, ...)
        VDP_GlobalOutputChange()
        LOG9 "[EX] VDP_GlobalOutputChange\n"
    )");
    EXPECT_EQ(1u, PMX_SetDigestAspectRatioEx(0, 5, 1));
    EXPECT_TRACE(R"(
        LOG0 "[EX] PMX_ID(0), Digest Aspect Ratio(5), Digest mode enable(1)\n"
        SET fgDigestEnable 0 → 1
        SET u4DigestAsp * → 5
        VDP_GlobalOutputChange()
    )");
}

TEST_F(StoreOrder, PlaneOrders_StoredBehindTheirLines_AndBeforeTheHardware)
{
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x76543201));
    Lines lines = stores_and_lines();
    ASSERT_LE(18u, lines.size());
    EXPECT_EQ("[PMX]u1PlnSel[7]=7\n", lines[16]);
    EXPECT_EQ("SET u4PlaneOrder", lines[17]);
    EXPECT_EQ(1u, PMX_SetPlaneOrder(0, 7, 0));
    EXPECT_TRACE(R"(
        SET aucPlaneOrder[0] 4 → 7
        PMX_HalPlaneOrder(0, 8, *)
    )");
    EXPECT_EQ(1u, PMX_SetOrderVdpComp0(0, 1));
    EXPECT_TRACE(R"(
        SET bComp0OnTop 0 → 1
        PMX_HalSwapPlane1_2(0, 1)
        VDP_GetHwEnable(0) = *
        vPmxMixPlane(0, 1)
    )");
}

TEST_F(StoreOrder, PictureSettings_EachOnItsSideOfTheCalls)
{
    EXPECT_EQ(1u, PMX_SetBrightness(0, 33, 1));
    EXPECT_TRACE(R"(
        LOG8 "[PMX] Seting Brightness: 1,33.\n"
        SET ucBrightness 128 → 33
        PMX_HalSetBrightness(0, 33)
        TVE_SetBrightness(33)
    )");
    EXPECT_EQ(1u, PMX_SetGamma(0, 1));
    EXPECT_TRACE("SET ucGamma 0 → 1\nPMX_HalSetGamma(0, 1, *)");
    EXPECT_EQ(1u, PMX_SetBlackLv(0, 1, 2));
    EXPECT_TRACE(R"(
        LOG8 "TVE Set Black Lv, CAV(1), CVBS(2)\n"
        TVE_SetBlackLvl(1, 2)
        SET ucCAVBlackLv 0 → 1
        SET ucCVBSBlackLv 0 → 2
    )");
    EXPECT_EQ(1u, PMX_SetBg(0, 5));
    EXPECT_TRACE("SET u4BgColor * → 5\nPMX_HalSetBg(0, 5)");
    EXPECT_EQ(1u, PMX_SetTvType(0, 3));
    EXPECT_TRACE("SET ucTvType 0 → 3\nPMX_HalSetTvType(0, 3)");
    EXPECT_EQ(1u, PMX_SetDigitalOutPhase(0, 7));
    EXPECT_TRACE("PMX_HalSetDigitalOutPhase(0, 7)\nSET u4Phase 2 → 7");
    EXPECT_EQ(1u, PMX_SetDigitalOutRgb(0, 1));
    EXPECT_TRACE(R"(
        SET ucDigitalRgb 0 → 1
        PMX_HalSetDigitalOutRgb(0, 1)
        fgPmxDrvSetAvd(PMX_CHG_HDMI_COLOR_SPACE, ...)
    )");
}

TEST_F(StoreOrder, Switches_StoredBehindTheLastCall)
{
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 1));
    EXPECT_TRACE(R"(
        LOG8 "Mute Enable\n"
        PMX_HalEnableMute(0)
        SET ucMuteEnable 0 → 1
    )");
    EXPECT_EQ(1u, PMX_SetMuteEnable(0, 0));
    EXPECT_TRACE(R"(
        LOG8 "Mute Disable\n"
        PMX_HalDisableMute(0)
        SET ucMuteEnable 1 → 0
    )");
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 1));
    Lines lines = stores_and_lines();
    EXPECT_EQ((Lines{ "ColorBar Enable\n", "SET ucCBEnable" }), lines);
    EXPECT_EQ(1u, PMX_SetCBEnable(0, 0));
    EXPECT_TRACE(R"(
        LOG8 "ColorBar Disable\n"
        PMX_HalDisableCB(0)
        SET ucCBEnable 1 → 0
    )");
    EXPECT_EQ(1u, PMX_SetEnable(0, 1));
    EXPECT_TRACE(R"(
        PMX_VsyncEnable()
        PMX_HalSetDigitalOut(0, 1, 0, 24)
        PMX_HalSetDigitalOutRgb(0, 0)
        PMX_HalSetDigitalOutPhase(0, 2)
        SET ucEnable 0 → 1
    )");
}

TEST_F(StoreOrder, SetMode_StoredBetweenTheDisplayModeAndThePll)
{
    EXPECT_EQ(1u, PMX_SetMode(0, RES_720P50HZ, 50, 0));
    board::trace::look();
    Lines calls;
    for (const board::TraceEntry& entry : board::trace::entries())
        calls.push_back((entry.kind == board::TraceEntry::Kind::Store ? "SET " : "") + entry.function);
    ASSERT_LE(6u, calls.size());
    calls.resize(6);
    EXPECT_EQ((Lines{ "PMX_IsLog", "OSD_BASE_SetDisplayMode", "SET ucMode", "SET ucVfreq", "SET fgSetModeCalled",
                      "fgPmxDrvSetAvd" }),
              calls);
}

TEST_F(StoreOrder, SetModeEx_FormatBeforeTheHotPlugQuestion_OutputsBehindIt_BothBeforeTheNextLine)
{
    PMX_SetFormatChangeFlag(TRUE);
    board::trace::clear();
    EXPECT_EQ(1u, mode_ex::set_mode({ .digital_port = mode_ex::on(RES_720P60HZ),
                                      .component = mode_ex::on(RES_480P),
                                      .chip = DRV_EXT_SCL_EXT_TX,
                                      .osd5 = 1 }));
    board::trace::look();
    Lines lines;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (entry.kind == board::TraceEntry::Kind::Store)
            lines.push_back("SET " + entry.function);
        else if (entry.text == "OSD5(1)\n" || entry.text == "HD Exist(1)\n" || entry.function == "fgIsHotPlugChgRes" ||
                 entry.function == "x_timer_start")
            lines.push_back(entry.function + entry.text);
    }
    EXPECT_EQ((Lines{ "PMX_IsLogOSD5(1)\n", "SET ucMode", "SET fgSetModeCalled", "SET rDrvExtScl", "fgIsHotPlugChgRes",
                      "SET arOutputConf[0].eResMode", "SET arOutputConf[2].eResMode", "SET fgOSD5", "SET _fgBootUp",
                      "PMX_IsLogHD Exist(1)\n", "x_timer_start", "SET status.fgTimerAlreadySet" }),
              lines);
}
