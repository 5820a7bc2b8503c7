// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Per-output mode setting while the mixer's format stays: only what changed is sent. */
#include "board/hdmi_av.h"
#include "tests/layer/mode_ex.h"

using namespace mode_ex;

using SameFormat = mode_ex::Test;

namespace
{

const Sent sent_1080p{ .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ };

const char* const end_without_hdmi = R"(
    VDP_SetTvFormat(RES_1080P60HZ, 0)
    vSendAvdNotifyScomResChgOK()
    PMX_HalScalerReset(0)
)";

const char* const end_with_hdmi = R"(
    VDP_SetTvFormat(RES_1080P60HZ, 0)
    PMX_HalScalerReset(0)
    i4GetHotPlugStatus() = 1
    LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n"
)";

/** Behind the log lines of the entries: what was asked and found out, with component's and composite's mode. */
std::string found(bool asked, const char* modes, unsigned osd5 = 0)
{
    return std::string(asked ? "fgIsHotPlugChgRes() = 0\n" : "") + "LOG9 \"HD Exist(1)\\n\"\nTVE_SetMuteCtrol(0, " +
           modes + ", 1, " + std::to_string(osd5) + ")\n";
}

} // namespace

TEST_F(SameFormat, SetModeEx_NothingChanged_TellsOnlyThatItIsDone)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({}));
    EXPECT_TRACE(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(1, RES_1080P60HZ)\n"
        LOG9 "HDMI(1, RES_1080P60HZ)\n"
        LOG9 "CAV (1, RES_1080P60HZ)\n"
        LOG9 "CVBS(1, RES_480I)\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(0)\n"
        fgIsHotPlugChgRes() = 0
        LOG9 "HD Exist(1)\n"
        TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, 0)
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        vSendAvdNotifyScomResChgOK()
        PMX_HalScalerReset(0)
        LOG0 "[PMX] fgHdmiExist:0, Not wait display part...\n"
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
        LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SameFormat, SetModeEx_HdmiModeAlone_OnlyHdmiIsSent)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .hdmi = on(RES_720P60HZ) }));
    const Sent sent{ .hdmi_mode = RES_720P60HZ, .format = RES_1080P60HZ };
    EXPECT_TRACE(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(1, RES_1080P60HZ)\n"
        LOG9 "HDMI(1, RES_720P60HZ)\n"
        LOG9 "CAV (1, RES_1080P60HZ)\n"
        LOG9 "CVBS(1, RES_480I)\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(0)\n"
    )" + found(false, "RES_1080P60HZ, RES_480I") +
                 pll_and_port(sent) + hdmi_change(sent) + end_with_hdmi);
    EXPECT_RECORD_CHANGED(before, "arOutputConf[1].eResMode");
    EXPECT_EQ(RES_720P60HZ, record("arOutputConf[1].eResMode"));
}

TEST_F(SameFormat, SetModeEx_HdmiSwitchedOff_IsSentWithTheMixersFormat)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .hdmi = off(RES_1080P60HZ) }));
    const Sent sent{ .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ, .hdmi_on = 0 };
    EXPECT_CALLS("TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, 0)\n" + pll_and_port(sent) + hdmi_change(sent) + R"(
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        PMX_HalScalerReset(0)
        i4GetHotPlugStatus() = 1
    )");
    EXPECT_RECORD_CHANGED(before, "arOutputConf[1].fgOutputEnable");
}

TEST_F(SameFormat, SetModeEx_HdmiOffInAnotherMode_CountsAsAChangeThoughItShowsTheSame)
{
    running({ .hdmi = off(RES_1080P60HZ) });
    EXPECT_EQ(1u, set_mode({ .hdmi = off(RES_720P60HZ) }));
    const Sent sent{ .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ, .hdmi_on = 0 };
    EXPECT_CALLS("TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, 0)\n" + pll_and_port(sent) + hdmi_change(sent) + R"(
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        PMX_HalScalerReset(0)
        i4GetHotPlugStatus() = 1
    )");
}

TEST_F(SameFormat, SetModeEx_HotPlugWantsTheResolution_HdmiIsSentAgain)
{
    running();
    board::hdmi_av::request_resolution(true);
    board::trace::clear();
    EXPECT_EQ(1u, set_mode({}));
    EXPECT_CALLS("fgIsHotPlugChgRes() = 1\nTVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, 0)\n" +
                 pll_and_port(sent_1080p) + hdmi_change(sent_1080p) + R"(
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        PMX_HalScalerReset(0)
        i4GetHotPlugStatus() = 1
    )");
}

TEST_F(SameFormat, SetModeEx_HotPlugAnswersOtherThanOne_NothingIsSent)
{
    running();
    for (const int answer : { 0, 2, 255 })
    {
        board::faults::set({ "fgIsHotPlugChgRes", answer });
        EXPECT_EQ(1u, set_mode({}));
        EXPECT_CALLS("fgIsHotPlugChgRes() = " + std::to_string(answer) + R"(
            TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, 0)
            VDP_SetTvFormat(RES_1080P60HZ, 0)
            vSendAvdNotifyScomResChgOK()
            PMX_HalScalerReset(0)
            fgVdpIsWaitforSyncCtrl() = 0
            vPmxMixPlane(0, 2)
            vPmxMixPlane(0, 3)
            vPmxMixPlane(0, 4)
            vPmxMixPlane(0, 5)
            vPmxMixPlane(0, 6)
        )");
    }
}

TEST_F(SameFormat, SetModeEx_ComponentModeAlone_OnlyTheEncodersAreSet)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .component = on(RES_480I) }));
    EXPECT_TRACE(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(1, RES_1080P60HZ)\n"
        LOG9 "HDMI(1, RES_1080P60HZ)\n"
        LOG9 "CAV (1, RES_480I)\n"
        LOG9 "CVBS(1, RES_480I)\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(0)\n"
    )" + found(true, "RES_480I, RES_480I") +
                 R"(
        _i4Osd5Out(1, RES_480I)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_480I, 1, 1, 0) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, 1, 1, 0) = 1
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 1)
    )" + end_without_hdmi +
                 not_waiting);
    EXPECT_RECORD_CHANGED(before, "arOutputConf[2].eResMode");
}

TEST_F(SameFormat, SetModeEx_ComponentSwitchedOff_RunsTheMixersFormat)
{
    running({ .component = on(RES_1080I60HZ) });
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .component = off(RES_1080I60HZ) }));
    EXPECT_CALLS(R"(
        fgIsHotPlugChgRes() = 0
        TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, 0)
        _i4Osd5Out_CVBSOnly(1, RES_480I)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080P60HZ, 0, 1, 0) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, 1, 1, 0) = 1
        TVE_SetEnable(0, 0)
        TVE_SetEnable(1, 1)
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        vSendAvdNotifyScomResChgOK()
        PMX_HalScalerReset(0)
        fgVdpIsWaitforSyncCtrl() = 0
        vPmxMixPlane(0, 2)
        vPmxMixPlane(0, 3)
        vPmxMixPlane(0, 4)
        vPmxMixPlane(0, 5)
        vPmxMixPlane(0, 6)
    )");
    EXPECT_RECORD_CHANGED(before, "arOutputConf[2].fgOutputEnable");
}

TEST_F(SameFormat, SetModeEx_CompositeModeAlone_OnlyTheEncodersAreSet)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .composite = on(RES_576I) }));
    EXPECT_TRACE(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(1, RES_1080P60HZ)\n"
        LOG9 "HDMI(1, RES_1080P60HZ)\n"
        LOG9 "CAV (1, RES_1080P60HZ)\n"
        LOG9 "CVBS(1, RES_576I)\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(0)\n"
    )" + found(true, "RES_1080P60HZ, RES_576I") +
                 R"(
        _i4Osd5Out_CVBSOnly(1, RES_576I)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080P60HZ, 1, 1, 0) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_576I, 1, 1, 0) = 1
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 1)
    )" + end_without_hdmi +
                 not_waiting);
    EXPECT_RECORD_CHANGED(before, "arOutputConf[3].eResMode");
}

TEST_F(SameFormat, SetModeEx_CompositeSwitchedOff_RunsTheMixersFormat)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .composite = off(RES_480I) }));
    EXPECT_CALLS(R"(
        fgIsHotPlugChgRes() = 0
        TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_1080P60HZ, 1, 0)
        _i4Osd5Out_CVBSOnly(1, RES_1080P60HZ)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080P60HZ, 1, 1, 0) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_1080P60HZ, 0, 1, 0) = 1
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 0)
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        vSendAvdNotifyScomResChgOK()
        PMX_HalScalerReset(0)
        fgVdpIsWaitforSyncCtrl() = 0
        vPmxMixPlane(0, 2)
        vPmxMixPlane(0, 3)
        vPmxMixPlane(0, 4)
        vPmxMixPlane(0, 5)
        vPmxMixPlane(0, 6)
    )");
    EXPECT_RECORD_CHANGED(before, "arOutputConf[3].fgOutputEnable");
}

TEST_F(SameFormat, SetModeEx_FifthOsdAlone_OnlyTheEncodersAreSet)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .osd5 = 2 }));
    EXPECT_TRACE(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(1, RES_1080P60HZ)\n"
        LOG9 "HDMI(1, RES_1080P60HZ)\n"
        LOG9 "CAV (1, RES_1080P60HZ)\n"
        LOG9 "CVBS(1, RES_480I)\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(2)\n"
    )" + found(true, "RES_1080P60HZ, RES_480I", 2) +
                 R"(
        _i4Osd5Out(1, RES_480I)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080P60HZ, 1, 1, 2) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, 1, 1, 2) = 1
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 1)
    )" + end_without_hdmi +
                 not_waiting);
    EXPECT_RECORD_CHANGED(before, "fgOSD5");
    EXPECT_EQ(2, record("fgOSD5"));
}

TEST_F(SameFormat, SetModeEx_EverythingButTheFormat_HdmiAndEncodersAreInterleaved)
{
    running();
    EXPECT_EQ(1u, set_mode({ .hdmi = on(RES_720P60HZ), .component = on(RES_720P60HZ), .osd5 = 1 }));
    const Sent sent{ .hdmi_mode = RES_720P60HZ, .format = RES_1080P60HZ, .osd5 = 1 };
    EXPECT_CALLS("TVE_SetMuteCtrol(0, RES_720P60HZ, RES_480I, 1, 1)\n" + pll_and_port(sent) + R"(
        _i4Osd5Out_CVBSOnly(1, RES_480I)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_720P60HZ, 1, 1, 1) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, 1, 1, 1) = 1
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 1)
    )" + hdmi_change(sent) +
                 R"(
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        PMX_HalScalerReset(0)
        i4GetHotPlugStatus() = 1
    )");
}

TEST_F(SameFormat, SetModeEx_DigitalPortAlone_IsStoredAndSentToNobody)
{
    running({ .digital_port = off(RES_480P) });
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .digital_port = off(RES_576P) }));
    EXPECT_CALLS(R"(
        fgIsHotPlugChgRes() = 0
        TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, 0)
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        vSendAvdNotifyScomResChgOK()
        PMX_HalScalerReset(0)
        fgVdpIsWaitforSyncCtrl() = 0
        vPmxMixPlane(0, 2)
        vPmxMixPlane(0, 3)
        vPmxMixPlane(0, 4)
        vPmxMixPlane(0, 5)
        vPmxMixPlane(0, 6)
    )");
    EXPECT_RECORD_CHANGED(before, "arOutputConf[0].eResMode");
}
