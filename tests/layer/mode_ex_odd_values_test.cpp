// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Per-output mode setting with flags, switches and numbers that are neither 0 nor 1: what counts as set, as a change,
 *  as a sink, and what is handed on and kept. */
#include <array>
#include <vector>

#include "tests/layer/mode_ex.h"

using namespace mode_ex;

using OddRequest = mode_ex::Test;
using OddState = mode_ex::Test;

namespace
{

/** What a request does while the mixer stays in 1080p with a composite output of 480i. */
struct Change
{
    bool hdmi_differs = false;
    bool encoders = false;
    unsigned digital_port_on = 1;
    unsigned hdmi_on = 1;
    unsigned component_on = 1;
    unsigned composite_on = 1;
    unsigned osd5 = 0;
    const char* route = "_i4Osd5Out_CVBSOnly(1, RES_480I)\n";
};

const std::string released = R"(
    fgVdpIsWaitforSyncCtrl() = 0
    vPmxMixPlane(0, 2)
    vPmxMixPlane(0, 3)
    vPmxMixPlane(0, 4)
    vPmxMixPlane(0, 5)
    vPmxMixPlane(0, 6)
)";

std::string number(unsigned value)
{
    return std::to_string(value);
}

std::string encoders(const Change& change)
{
    const std::string hd_and_osd5 = ", 1, " + number(change.osd5) + ") = 1\n";
    return change.route + ("TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080P60HZ, " + number(change.component_on)) +
           hd_and_osd5 + "TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, " + number(change.composite_on) + hd_and_osd5 +
           "TVE_SetEnable(0, " + number(change.component_on) + ")\nTVE_SetEnable(1, " + number(change.composite_on) +
           ")\n";
}

std::string calls_of(const Change& change)
{
    const Sent sent{ .hdmi_mode = RES_1080P60HZ,
                     .format = RES_1080P60HZ,
                     .osd5 = change.osd5,
                     .digital_port_on = change.digital_port_on,
                     .hdmi_on = change.hdmi_on };
    std::string lines = change.hdmi_differs ? "" : "fgIsHotPlugChgRes() = 0\n";
    lines += "TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, " + number(change.osd5) + ")\n";
    if (change.hdmi_differs)
        lines += pll_and_port(sent);
    if (change.encoders)
        lines += encoders(change);
    if (change.hdmi_differs)
        lines += hdmi_change(sent);
    lines += "VDP_SetTvFormat(RES_1080P60HZ, 0)\n";
    if (!change.hdmi_differs)
        lines += "vSendAvdNotifyScomResChgOK()\n";
    lines += "PMX_HalScalerReset(0)\n";
    return lines + (change.hdmi_differs ? "i4GetHotPlugStatus() = 1\n" : released);
}

/** The default request with these switches. */
Request switched(const std::array<UCHAR, 4>& enables)
{
    return { .digital_port = output(enables[0], RES_1080P60HZ),
             .hdmi = output(enables[1], RES_1080P60HZ),
             .component = output(enables[2], RES_1080P60HZ),
             .composite = output(enables[3], RES_480I) };
}

/** The log lines before the first call, as they are printed. */
std::string logged_first(const Request& request)
{
    std::string text;
    bool called = false;
    board::at_every_call([&](const board::TraceEntry& entry) {
        called = called || entry.kind == board::TraceEntry::Kind::Call;
        if (!called && entry.kind == board::TraceEntry::Kind::Log)
            text += entry.text;
    });
    EXPECT_EQ(1u, set_mode(request));
    board::at_every_call({});
    return text;
}

} // namespace

TEST_F(OddRequest, SetModeEx_Logs_EveryNumberAsGiven)
{
    running();
    Request request{ .digital_port = output(2, RES_1080P60HZ),
                     .hdmi = output(255, RES_1080P60HZ),
                     .component = output(3, RES_1080P60HZ),
                     .composite = output(128, RES_480I),
                     .osd5 = 255 };
    request.digital_port.eCcirDrvInfo.eDgoMode = static_cast<CCIR_IN_OUT_MODE_T>(0x10102);
    request.digital_port.eCcirDrvInfo.eDgoFmt = static_cast<CCIR_IN_OUT_FORMAT_T>(0x80000003);
    request.digital_port.eCcirDrvInfo.eDgiMode = static_cast<CCIR_IN_OUT_MODE_T>(0xFFFF7FFF);
    request.digital_port.eCcirDrvInfo.eDgiFmt = static_cast<CCIR_IN_OUT_FORMAT_T>(0x101FF);
    EXPECT_EQ("SetModeEx\n"
              "CCIR(2, RES_1080P60HZ)\n"
              "HDMI(255, RES_1080P60HZ)\n"
              "CAV (3, RES_1080P60HZ)\n"
              "CVBS(128, RES_480I)\n"
              "CCIR(65794, -2147483645, -32769, 66047)\n"
              "OSD5(255)\n"
              "HD Exist(1)\n",
              logged_first(request));
}

TEST_F(OddRequest, SetModeEx_EnabledByAnotherNumber_IsAChangeOfThatOutput)
{
    const std::vector<std::array<UCHAR, 2>> changes{ { 1, 2 }, { 2, 1 }, { 1, 255 }, { 255, 2 }, { 2, 255 } };
    for (unsigned changed = 0; changed < 4; ++changed)
    {
        for (const auto& [last, now] : changes)
        {
            SCOPED_TRACE("output " + number(changed) + " from " + number(last) + " to " + number(now));
            std::array<UCHAR, 4> enables{ 1, 1, 1, 1 };
            enables[changed] = last;
            power_on();
            running(switched(enables));
            enables[changed] = now;
            EXPECT_EQ(1u, set_mode(switched(enables)));
            EXPECT_CALLS(calls_of({ .hdmi_differs = changed == PMX_OUTPUT_HDMI,
                                    .encoders = changed == PMX_OUTPUT_CAV || changed == PMX_OUTPUT_CVBS,
                                    .digital_port_on = enables[0],
                                    .hdmi_on = enables[1],
                                    .component_on = enables[2],
                                    .composite_on = enables[3] }));
            EXPECT_EQ(now, record("arOutputConf[" + number(changed) + "].fgOutputEnable"));
        }
    }
}

TEST_F(OddRequest, SetModeEx_EnabledByTheSameOddNumberAgain_IsNoChange)
{
    for (const UCHAR enable : { 2, 255 })
    {
        const Request request = switched({ enable, enable, enable, enable });
        power_on();
        running(request);
        const RecordSnapshot before;
        EXPECT_EQ(1u, set_mode(request));
        EXPECT_CALLS(calls_of({}));
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(OddRequest, SetModeEx_AnyOtherFifthOsdMode_IsAChangeAndHandedOnAsGiven)
{
    struct Step
    {
        UINT8 osd5;
        const char* route;
    };
    const char* const both = "_i4Osd5Out(1, RES_480I)\n";
    const char* const composite_only = "_i4Osd5Out_CVBSOnly(1, RES_480I)\n";
    running();
    for (const Step& step : std::vector<Step>{ { 1, composite_only },
                                               { 2, both },
                                               { 3, composite_only },
                                               { 2, both },
                                               { 255, composite_only },
                                               { 1, composite_only },
                                               { 254, composite_only },
                                               { 0, composite_only } })
    {
        SCOPED_TRACE(unsigned{ step.osd5 });
        const RecordSnapshot before;
        EXPECT_EQ(1u, set_mode({ .osd5 = step.osd5 }));
        EXPECT_CALLS(calls_of({ .encoders = true, .osd5 = step.osd5, .route = step.route }));
        EXPECT_RECORD_CHANGED(before, "fgOSD5");
        EXPECT_EQ(step.osd5, record("fgOSD5"));
        EXPECT_EQ(1u, set_mode({ .osd5 = step.osd5 }));
        EXPECT_CALLS(calls_of({ .osd5 = step.osd5 }));
    }
}

TEST_F(OddRequest, SetModeEx_FifthOsdModeOfAnHdmiChange_IsSentAsGiven)
{
    for (const UINT8 osd5 : { 2, 3, 255 })
    {
        power_on();
        running({ .osd5 = osd5 });
        EXPECT_EQ(1u, set_mode({ .hdmi = output(2, RES_1080P60HZ), .osd5 = osd5 }));
        EXPECT_CALLS(calls_of({ .hdmi_differs = true, .hdmi_on = 2, .osd5 = osd5 }));
    }
}

TEST_F(OddRequest, SetModeEx_FullChange_FifthOsdModeAndChipUsageGoOutAndAreKeptAsGiven)
{
    for (const unsigned odd : { 2u, 4u, 255u })
    {
        SCOPED_TRACE(odd);
        power_on();
        running();
        const RecordSnapshot before;
        EXPECT_EQ(1u, set_mode({ .digital_port = output(2, RES_1080P60HZ),
                                 .chip = static_cast<DRV_EXT_CHIP_USAGE_T>(odd),
                                 .osd5 = static_cast<UINT8>(odd) }));
        const Sent sent{
            .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ, .chip = odd, .osd5 = odd, .digital_port_on = 2
        };
        const char* const route = odd == 2 ? "_i4Osd5Out(1, RES_480I)\n" : "_i4Osd5Out_CVBSOnly(1, RES_480I)\n";
        EXPECT_CALLS("fgIsHotPlugChgRes() = 0\nTVE_SetMuteCtrol(1, RES_1080P60HZ, RES_480I, 1, " + number(odd) + R"()
            OSD_BASE_SetDisplayMode(RES_1080P60HZ)
            TVE_SetBlackScreen(0, 0)
            TVE_SetBlackScreen(1, 0)
        )" + pll_and_port(sent) +
                     R"(
            PMX_HalSetMode(0, RES_1080P60HZ)
            PMX_HalSelectVdoutCconv(0, 1)
            PMX_HalSelectScalerCconv(0, 0)
            PMX_HalSetCC_A(0, 0, 0)
            PMX_HalSetScaler709601(0, 1, 1)
            VDP_SetTvFormat(RES_1080P60HZ, 1)
            PMX_HalSetTvType(0, 0)
        )" + encoders({ .osd5 = odd, .route = route }) +
                     R"(
            PMX_HalScalerReset(0)
            vPostChgRes(RES_1080P60HZ)
            VDP_GlobalOutputChange()
            VDP_VsyncSendCmd(0, 2)
            VDP_VsyncSendCmd(1, 2)
            VDP_VsyncSendCmd(2, 2)
        )" + hdmi_change(sent) +
                     "OSD_BASE_SetFlag_PMXChangeResDone()\ni4GetHotPlugStatus() = 1\n");
        EXPECT_RECORD_CHANGED(before, "rDrvExtScl", "fgOSD5", "arOutputConf[0].fgOutputEnable");
        EXPECT_EQ(odd, record("rDrvExtScl"));
        EXPECT_EQ(odd, record("fgOSD5"));
        EXPECT_EQ(2, record("arOutputConf[0].fgOutputEnable"));
    }
}

TEST_F(OddState, SetModeEx_AnyNonZeroSetModeCalled_IsSet_AndBecomesOne)
{
    for (const int called : { 2, 255 })
    {
        power_on();
        running();
        set_record("fgSetModeCalled", called);
        EXPECT_EQ(1u, set_mode({}));
        EXPECT_CALLS(calls_of({}));
        EXPECT_EQ(1, record("fgSetModeCalled"));
    }
}

TEST_F(OddState, SetModeEx_BootFlagOtherThanOne_IsNoFirstCall_AndStays)
{
    for (const int boot : { 0, 2, 255 })
    {
        power_on();
        running();
        set_record("_fgBootUp", boot);
        const RecordSnapshot before;
        EXPECT_EQ(1u, set_mode({}));
        EXPECT_CALLS(calls_of({}));
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(OddState, SetModeEx_AnyNonZeroTimerFlag_AsksForTheSink)
{
    for (const int set : { 1, 2, 255 })
    {
        power_on();
        running();
        set_record("status.fgTimerAlreadySet", set);
        const RecordSnapshot before;
        EXPECT_EQ(1u, set_mode({}));
        std::string lines = calls_of({});
        lines.replace(lines.find(released), released.size(), "i4GetHotPlugStatus() = 1\n");
        EXPECT_CALLS(lines);
        EXPECT_RECORD_UNCHANGED(before);
    }
}

TEST_F(OddState, SetModeEx_HeldBack_TheTimerFlagIsOneWhateverItWas)
{
    for (const int set : { 0, 2, 255 })
    {
        power_on();
        running();
        set_record("status.fgTimerAlreadySet", set);
        set_record("status.fgPmxFormatChangeFlag", 255);
        EXPECT_EQ(1u, set_mode({ .hdmi = on(RES_720P60HZ) }));
        EXPECT_EQ(1, record("status.fgTimerAlreadySet"));
        EXPECT_EQ(255, record("status.fgPmxFormatChangeFlag"));
    }
}
