// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** One resolution mode on all outputs: what is called, in which order, and what is stored when. */
#include "tests/layer/one_mode.h"
#include "tests/support/layer_fixture.h"

using SetMode = LayerTest;

TEST_F(SetMode, SetMode_WholeSequence)
{
    started();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetMode(0, RES_720P50HZ, 50, 1));
    const std::string avd = "{u1ScaleMode=0, ucHdmiOutDisplayResolution=RES_720P50HZ, "
                            "ucFmtOutResolution=RES_720P50HZ, ucCCIROutResolution=RES_720P50HZ, ucHdmiOutMode=0, "
                            "eCcirDrvInfo={eDgoMode=0, eDgoFmt=0, eDgiMode=0, eDgiFmt=0}, fgOsdMsg=0, "
                            "ucCCIROutMode=1, fgCCIROutEnable=0, fgHdmiOutEnable=1, u2_Vfreq=0}, 1)";
    EXPECT_TRACE(R"(
        LOG9 "SetMode, RES_720P50HZ\n"
        OSD_BASE_SetDisplayMode(RES_720P50HZ)
        fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, )" +
                 avd + R"(
        fgPmxDrvSetAvd(PMX_SET_CCIR_RES_CHG, )" +
                 avd + R"(
        LOG9 "Mode(9), eMixerOutCS(1)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 0, 0)
        LOG9 "CC_A disable\n"
        PMX_HalSetScaler709601(0, 1, 1)
        LOG8 "Scaler CC enable, 709->601\n"
        PMX_HalSetMode(0, RES_720P50HZ)
        PMX_HalSetScalerMode(RES_720P50HZ)
        VDP_SetTvFormat(RES_720P50HZ, 1)
        PMX_HalSetTvType(0, 3)
        TVE_SetFmtEx(0, RES_720P50HZ, 50, RES_720P50HZ, 1, 1, 1)
        TVE_SetFmtEx(1, RES_720P50HZ, 50, RES_576I, 1, 1, 1)
        PMX_HalReset(0)
        PMX_HalScalerReset(0)
        VDP_GlobalOutputChange()
        VDP_VsyncSendCmd(0, 2)
        VDP_VsyncSendCmd(1, 2)
        VDP_VsyncSendCmd(2, 2)
        fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, )" +
                 avd + R"(
        OSD_BASE_SetFlag_PMXChangeResDone()
    )");
    EXPECT_RECORD_CHANGED(before, "ucMode", "ucVfreq", "ucTvType", "fgSetModeCalled");
    EXPECT_EQ(RES_720P50HZ, record("ucMode"));
    EXPECT_EQ(50, record("ucVfreq"));
    EXPECT_EQ(3, record("ucTvType"));
    EXPECT_EQ(1, record("fgSetModeCalled"));
}

TEST_F(SetMode, SetMode_WholeSequenceAt60Hertz)
{
    started();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetMode(0, RES_480P, 60, 0));
    EXPECT_CALLS("OSD_BASE_SetDisplayMode(RES_480P)\n" + one_mode::avd_command("PMX_SET_VIDEO_PLL", RES_480P) +
                 one_mode::avd_command("PMX_SET_CCIR_RES_CHG", RES_480P) + R"(
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 1)
        PMX_HalSetScaler709601(0, 0, 0)
        PMX_HalSetMode(0, RES_480P)
        PMX_HalSetScalerMode(RES_480P)
        VDP_SetTvFormat(RES_480P, 1)
        PMX_HalSetTvType(0, 0)
        TVE_SetFmtEx(0, RES_480P, 60, RES_480P, 1, 0, 0)
        TVE_SetFmtEx(1, RES_480P, 60, RES_480I, 1, 0, 0)
        PMX_HalReset(0)
        PMX_HalScalerReset(0)
        VDP_GlobalOutputChange()
        VDP_VsyncSendCmd(0, 2)
        VDP_VsyncSendCmd(1, 2)
        VDP_VsyncSendCmd(2, 2)
    )" + one_mode::avd_command("PMX_SET_HDMI_RES_CHG", RES_480P) +
                 "OSD_BASE_SetFlag_PMXChangeResDone()");
    EXPECT_RECORD_CHANGED(before, "ucMode", "fgSetModeCalled");
    EXPECT_EQ(60, record("ucVfreq"));
    EXPECT_EQ(0, record("ucTvType"));
}

TEST_F(SetMode, SetMode_FirstCall_ProgramsEvenTheModeThatIsThere)
{
    boot_word(RES_1080I60HZ);
    started();
    EXPECT_EQ(RES_1080I60HZ, record("ucMode"));
    EXPECT_EQ(60, record("ucVfreq"));
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080I60HZ, 60, 0));
    EXPECT_TRACE(one_mode::set_mode({ RES_1080I60HZ }));
    EXPECT_RECORD_CHANGED(before, "fgSetModeCalled");
}

TEST_F(SetMode, SetMode_SameModeAgain_TellsOnlyOsdAndVideoPlane)
{
    started();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P50HZ, 50, 0));
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P50HZ, 50, 0));
    EXPECT_TRACE(R"(
        LOG9 "SetMode, RES_1080P50HZ\n"
        OSD_BASE_SetDisplayMode(RES_1080P50HZ)
        VDP_SetTvFormat(RES_1080P50HZ, 0)
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SetMode, SetMode_AnyNonZeroSetModeCalled_IsSet_AndAChangeMakesItOne)
{
    for (const int called : { 2, 255 })
    {
        power_on();
        started();
        EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P50HZ, 50, 0));
        board::trace::clear();
        set_record("fgSetModeCalled", called);
        EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P50HZ, 50, 0));
        EXPECT_TRACE(one_mode::unchanged(RES_1080P50HZ));
        EXPECT_EQ(called, record("fgSetModeCalled"));
        EXPECT_EQ(1u, PMX_SetMode(0, RES_576P, 50, 0));
        EXPECT_TRACE(one_mode::set_mode({ RES_576P, 50 }));
        EXPECT_EQ(1, record("fgSetModeCalled"));
    }
}

TEST_F(SetMode, SetMode_OnlyFifthOsdDiffers_CountsAsUnchanged)
{
    started();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_576P, 50, 0));
    board::trace::clear();
    for (const UINT8 osd5 : { 1, 2, 255 })
    {
        EXPECT_EQ(1u, PMX_SetMode(0, RES_576P, 50, osd5));
        EXPECT_TRACE(one_mode::unchanged(RES_576P));
    }
}

TEST_F(SetMode, SetMode_OnlyTheFrequencyDiffers_WholeSequence)
{
    started();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P60HZ, 60, 0));
    EXPECT_TRACE(one_mode::set_mode({ RES_1080P60HZ, 60 }));
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P60HZ, 50, 0));
    EXPECT_TRACE(one_mode::set_mode({ RES_1080P60HZ, 50 }));
    EXPECT_RECORD_CHANGED(before, "ucVfreq", "ucTvType");
}

TEST_F(SetMode, SetMode_OnlyTheModeDiffers_WholeSequence)
{
    started();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P60HZ, 60, 0));
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080I60HZ, 60, 0));
    EXPECT_TRACE(one_mode::set_mode({ RES_1080I60HZ, 60 }));
    EXPECT_RECORD_CHANGED(before, "ucMode");
}

TEST_F(SetMode, SetMode_AfterAReset_TheFirstCallProgramsAgain)
{
    started();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P60HZ, 60, 0));
    PMX_Reset(0);
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P60HZ, 60, 0));
    EXPECT_TRACE(one_mode::set_mode({ RES_1080P60HZ, 60 }));
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P60HZ, 60, 0));
    EXPECT_TRACE(one_mode::unchanged(RES_1080P60HZ));
}

TEST_F(SetMode, SetMode_OsdDriverIsToldBeforeAnythingIsStored)
{
    started();
    std::int64_t mode = -1;
    std::int64_t frequency = -1;
    std::int64_t called = -1;
    const auto look = [&] {
        mode = record("ucMode");
        frequency = record("ucVfreq");
        called = record("fgSetModeCalled");
    };
    at_call("OSD_BASE_SetDisplayMode", look);
    EXPECT_EQ(1u, PMX_SetMode(0, RES_576P, 50, 0));
    EXPECT_EQ(RES_1080P60HZ, mode);
    EXPECT_EQ(60, frequency);
    EXPECT_EQ(0, called);
}

TEST_F(SetMode, SetMode_IsStoredBeforeTheFirstCommand)
{
    started();
    std::vector<std::vector<std::int64_t>> seen;
    at_call("fgPmxDrvSetAvd", [&] {
        seen.push_back({ record("ucMode"), record("ucVfreq"), record("fgSetModeCalled"), record("ucTvType") });
    });
    EXPECT_EQ(1u, PMX_SetMode(0, RES_576P, 50, 0));
    const std::vector<std::vector<std::int64_t>> expected = { { RES_576P, 50, 1, 0 }, // TV type: not yet
                                                              { RES_576P, 50, 1, 0 },
                                                              { RES_576P, 50, 1, 3 } };
    EXPECT_EQ(expected, seen);
}

TEST_F(SetMode, SetMode_50_30And24Hertz_PalAnd576IOnComposite)
{
    started();
    for (const UCHAR frequency : { 50, 30, 24 })
    {
        set_record("ucTvType", 99);
        EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P24HZ, frequency, 2));
        const std::string hertz = std::to_string(frequency);
        std::string tail;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            if (entry.function == "PMX_HalSetTvType" || entry.function == "TVE_SetFmtEx")
                tail += entry.brief() + "\n";
        }
        EXPECT_EQ("PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n"
                  "TVE_SetFmtEx(0, RES_1080P24HZ, " +
                      hertz +
                      ", RES_1080P24HZ, 1, 1, 2) = 1\n"
                      "TVE_SetFmtEx(1, RES_1080P24HZ, " +
                      hertz + ", RES_576I, 1, 1, 2) = 1\n",
                  tail);
        EXPECT_EQ(3, record("ucTvType"));
        EXPECT_EQ(frequency, record("ucVfreq"));
        board::trace::clear();
    }
}

TEST_F(SetMode, SetMode_EveryFrequency_Exactly60IsNtsc)
{
    started();
    for (unsigned frequency = 0; frequency < 256; ++frequency)
    {
        SCOPED_TRACE(frequency);
        EXPECT_EQ(1u, PMX_SetMode(0, RES_720P60HZ, static_cast<UCHAR>(frequency), 0));
        EXPECT_TRACE(one_mode::set_mode({ RES_720P60HZ, frequency }));
        EXPECT_EQ(frequency, record("ucVfreq"));
        EXPECT_EQ(frequency == 60 ? 0 : 3, record("ucTvType"));
    }
}

TEST_F(SetMode, SetMode_FifthOsd_IsHandedToTheEncodersAsGivenAndNotStored)
{
    started();
    set_record("fgOSD5", 77);
    unsigned mode = RES_480P;
    for (const unsigned osd5 : { 0u, 1u, 2u, 3u, 127u, 128u, 254u, 255u })
    {
        SCOPED_TRACE(osd5);
        mode = mode == RES_480P ? RES_576P : RES_480P; // never the one that is there
        EXPECT_EQ(1u, PMX_SetMode(0, static_cast<UCHAR>(mode), 60, static_cast<UINT8>(osd5)));
        EXPECT_TRACE(one_mode::set_mode({ mode, 60, osd5 }));
        EXPECT_EQ(77, record("fgOSD5"));
    }
}

TEST_F(SetMode, SetMode_EveryAdmittedMode_WholeSequenceAndHdFlag)
{
    started();
    unsigned admitted = 0;
    unsigned hd = 0;
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        if (!mode_facts::admitted(mode, 0x7FFBFFFF))
            continue;
        SCOPED_TRACE(mode);
        EXPECT_EQ(1u, PMX_SetMode(0, static_cast<UCHAR>(mode), 60, 2));
        EXPECT_TRACE(one_mode::set_mode({ mode, 60, 2 }));
        EXPECT_EQ(mode, record("ucMode"));
        ++admitted;
        hd += mode_facts::facts_of(mode).is(mode_facts::tve_hd) ? 1 : 0;
    }
    EXPECT_EQ(mode_facts::number_admitted(0xFFFFFFFF), admitted);
    EXPECT_EQ(mode_facts::modes_with(mode_facts::tve_hd).size(), hd);
}

TEST_F(SetMode, SetMode_EveryOtherNumber_OnlyLogs)
{
    started();
    set_record("u4Capability", 0xFFFFFFFF);
    const RecordSnapshot before;
    unsigned refused = 0;
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        if (mode_facts::admitted(mode, 0xFFFFFFFF))
            continue;
        SCOPED_TRACE(mode);
        EXPECT_EQ(0u, PMX_SetMode(0, static_cast<UCHAR>(mode), 50, 2));
        EXPECT_TRACE(one_mode::log_of(mode));
        ++refused;
    }
    EXPECT_EQ(256u - mode_facts::number_admitted(0xFFFFFFFF), refused);
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SetMode, SetMode_HdFlag_29_97HertzIsNotHdAndThePanelIs)
{
    started();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080P29_97HZ, 60, 0));
    std::string formats;
    const auto note = [&formats] {
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            if (entry.function == "TVE_SetFmtEx")
                formats += entry.brief() + "\n";
        }
        board::trace::clear();
    };
    note();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_PANEL_AUO_B089AW01, 60, 0));
    note();
    EXPECT_EQ("TVE_SetFmtEx(0, RES_1080P29_97HZ, 60, RES_1080P29_97HZ, 1, 0, 0) = 1\n"
              "TVE_SetFmtEx(1, RES_1080P29_97HZ, 60, RES_480I, 1, 0, 0) = 1\n"
              "TVE_SetFmtEx(0, RES_PANEL_AUO_B089AW01, 60, RES_PANEL_AUO_B089AW01, 1, 1, 0) = 1\n"
              "TVE_SetFmtEx(1, RES_PANEL_AUO_B089AW01, 60, RES_480I, 1, 1, 0) = 1\n",
              formats);
}
