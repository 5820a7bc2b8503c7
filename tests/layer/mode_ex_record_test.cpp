// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Per-output mode setting: which fields of a request count, how wide they are, and when they are stored. */
#include "tests/layer/mode_ex.h"

using namespace mode_ex;

using RequestFields = mode_ex::Test;

namespace
{

/** The line of a function's last call since the trace was cleared; empty when there is none. */
std::string last_call(std::string_view function)
{
    std::string line;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (entry.function == function)
            line = entry.brief();
    }
    return line;
}

} // namespace

TEST_F(RequestFields, SetModeEx_ModesAbove255_AreCutToEightBitsForTheMixerAndKeptWholeInTheRecord)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .digital_port = on(0x100 + RES_1080P60HZ),
                             .hdmi = on(0x200 + RES_720P60HZ),
                             .component = on(0x10000 + RES_1080I60HZ),
                             .composite = on(0x80000000 + RES_576I) }));
    const Sent sent{ .hdmi_mode = RES_720P60HZ, .format = RES_1080P60HZ };
    EXPECT_TRACE(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(1, (null))\n"
        LOG9 "HDMI(1, (null))\n"
        LOG9 "CAV (1, (null))\n"
        LOG9 "CVBS(1, (null))\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(0)\n"
        LOG9 "HD Exist(1)\n"
        TVE_SetMuteCtrol(0, RES_1080I60HZ, RES_576I, 1, 0)
    )" + pll_and_port(sent) +
                 R"(
        _i4Osd5Out(1, RES_576I)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080I60HZ, 1, 1, 0) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_576I, 1, 1, 0) = 1
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 1)
    )" + hdmi_change(sent) +
                 R"(
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        PMX_HalScalerReset(0)
        i4GetHotPlugStatus() = 1
        LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n"
    )");
    EXPECT_RECORD_CHANGED(before, "arOutputConf[0].eResMode", "arOutputConf[1].eResMode", "arOutputConf[2].eResMode",
                          "arOutputConf[3].eResMode");
    EXPECT_EQ(0x100 + RES_1080P60HZ, record("arOutputConf[0].eResMode"));
    EXPECT_EQ(0x200 + RES_720P60HZ, record("arOutputConf[1].eResMode"));
    EXPECT_EQ(0x10000 + RES_1080I60HZ, record("arOutputConf[2].eResMode"));
    EXPECT_EQ(0x80000000 + RES_576I, record("arOutputConf[3].eResMode"));
}

TEST_F(RequestFields, SetModeEx_FormatAbove255_DisabledOutputsTakeTheCutValue)
{
    running();
    EXPECT_EQ(1u, set_mode({ .digital_port = on(0x100 + RES_1080P60HZ),
                             .hdmi = off(RES_480P),
                             .component = off(RES_480P),
                             .composite = off(RES_480I) }));
    const Sent sent{ .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ, .hdmi_on = 0 };
    EXPECT_CALLS("TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_1080P60HZ, 1, 0)\n" + pll_and_port(sent) + R"(
        _i4Osd5Out_CVBSOnly(1, RES_1080P60HZ)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080P60HZ, 0, 1, 0) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_1080P60HZ, 0, 1, 0) = 1
        TVE_SetEnable(0, 0)
        TVE_SetEnable(1, 0)
    )" + hdmi_change(sent) +
                 R"(
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        PMX_HalScalerReset(0)
        i4GetHotPlugStatus() = 1
    )");
}

TEST_F(RequestFields, SetModeEx_AllDisabledAbove255_WarnsWithTheWholeNumberAndRunsTheCutOne)
{
    started();
    const Request request{
        .digital_port = off(0), .hdmi = off(0xFFFFFF00u + RES_1080P60HZ), .component = off(0), .composite = off(0)
    };
    EXPECT_EQ(1u, set_mode(request));
    EXPECT_EQ(RES_1080P60HZ, record("ucMode"));
    EXPECT_EQ(0xFFFFFF00 + RES_1080P60HZ, record("arOutputConf[1].eResMode"));
    bool warned = false;
    for (const board::TraceEntry& entry : board::trace::entries())
        warned = warned || entry.matches(R"(LOG0 "[PMX] Warning: Disable All output, set fmt as -244.\n")");
    EXPECT_TRUE(warned);
    EXPECT_EQ("TVE_SetMuteCtrol(1, RES_1080P60HZ, RES_1080P60HZ, 1, 0)", last_call("TVE_SetMuteCtrol"));
}

TEST_F(RequestFields, SetModeEx_ModesThatDifferAboveEightBitsOnly_AreChanges)
{
    running();
    EXPECT_EQ(1u, set_mode({ .hdmi = on(0x100 + RES_1080P60HZ) }));
    EXPECT_NE("", last_call("fgPmxDrvSetAvd"));
    EXPECT_EQ("", last_call("fgIsHotPlugChgRes"));
    board::trace::clear();
    EXPECT_EQ(1u, set_mode({ .component = on(0x100 + RES_1080P60HZ) }));
    EXPECT_NE("", last_call("TVE_SetFmtEx"));
    board::trace::clear();
    EXPECT_EQ(1u, set_mode({ .component = on(0x100 + RES_1080P60HZ), .composite = on(0x100) }));
    EXPECT_NE("", last_call("TVE_SetFmtEx"));
    board::trace::clear();
    EXPECT_EQ(1u, set_mode({ .component = on(0x100 + RES_1080P60HZ), .composite = on(0x100) }));
    EXPECT_EQ("", last_call("TVE_SetFmtEx"));
}

TEST_F(RequestFields, SetModeEx_ChipUsageAbove255_IsAChangeAndCutWhereItIsSent)
{
    running();
    EXPECT_EQ(1u, set_mode({ .chip = static_cast<DRV_EXT_CHIP_USAGE_T>(0x302) }));
    EXPECT_EQ(0x302, record("rDrvExtScl"));
    EXPECT_NE(std::string::npos, last_call("fgPmxDrvSetAvd").find("ucHdmiOutMode=DRV_EXT_SCL_INT_TX,"));
    board::trace::clear();
    EXPECT_EQ(1u, set_mode({ .chip = DRV_EXT_SCL_INT_TX }));
    EXPECT_NE("", last_call("PMX_HalSetMode"));
}

TEST_F(RequestFields, SetModeEx_EntriesFrequencyAndPortSetup_AreNotStoredAndTheCallersArrayIsLeftAlone)
{
    started();
    for (unsigned output = 0; output < PMX_OUTPUT_NUM; ++output)
    {
        const std::string entry = "arOutputConf[" + std::to_string(output) + "].";
        set_record(entry + "u4VFreq", 70 + output);
        set_record(entry + "eCcirDrvInfo.eDgoMode", 1);
        set_record(entry + "eCcirDrvInfo.eDgiFmt", output);
    }
    PMX_RESOLUTION_T outputs[PMX_OUTPUT_NUM] = { on(RES_576P), off(RES_720P60HZ), off(RES_480P), off(RES_480I) };
    for (PMX_RESOLUTION_T& output : outputs)
    {
        output.u4VFreq = 25;
        output.eCcirDrvInfo = { CCIR_656_MODE, CCIR_YC444_36BIT, CCIR_656_MODE, CCIR_YC444_36BIT };
    }
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetModeEx(0, outputs, 60, DRV_NON_EXT_CHIP, 0));
    EXPECT_EQ(RES_720P60HZ, outputs[PMX_OUTPUT_HDMI].eResMode);
    EXPECT_EQ(RES_480P, outputs[PMX_OUTPUT_CAV].eResMode);
    EXPECT_EQ(RES_480I, outputs[PMX_OUTPUT_CVBS].eResMode);
    EXPECT_EQ(25u, outputs[PMX_OUTPUT_CVBS].u4VFreq);
    EXPECT_RECORD_CHANGED(before, "ucMode", "fgSetModeCalled", "_fgBootUp", "arOutputConf[0].eResMode",
                          "arOutputConf[1].fgOutputEnable", "arOutputConf[1].eResMode",
                          "arOutputConf[2].fgOutputEnable", "arOutputConf[2].eResMode",
                          "arOutputConf[3].fgOutputEnable");
    EXPECT_EQ("", last_call("x_reg_write32")) << "the argument's frequency counts, not the entries'";
}

TEST_F(RequestFields, SetModeEx_PortSetupAndEntriesFrequency_AreNoChange)
{
    running();
    Request request;
    request.digital_port.eCcirDrvInfo = { CCIR_656_MODE, CCIR_YC444_36BIT, CCIR_656_MODE, CCIR_YC444_36BIT };
    request.hdmi.eCcirDrvInfo = request.digital_port.eCcirDrvInfo;
    request.hdmi.u4VFreq = request.component.u4VFreq = request.composite.u4VFreq = 50;
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode(request));
    EXPECT_EQ("", last_call("fgPmxDrvSetAvd"));
    EXPECT_EQ("", last_call("TVE_SetFmtEx"));
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(RequestFields, SetModeEx_OnlyTheDigitalPortsSetup_IsSent)
{
    running();
    Request request{ .hdmi = on(RES_720P60HZ) };
    request.hdmi.eCcirDrvInfo = { CCIR_656_MODE, CCIR_YC444_36BIT, CCIR_656_MODE, CCIR_YC444_36BIT };
    request.component.eCcirDrvInfo = request.composite.eCcirDrvInfo = request.hdmi.eCcirDrvInfo;
    EXPECT_EQ(1u, set_mode(request));
    EXPECT_NE(std::string::npos,
              last_call("fgPmxDrvSetAvd")
                  .find("eCcirDrvInfo={eDgoMode=CCIR_INVALID, eDgoFmt=CCIR_NON_USED, eDgiMode=CCIR_INVALID, "
                        "eDgiFmt=CCIR_NON_USED}"));
}

TEST_F(RequestFields, SetModeEx_AnyNonZeroEnable_CountsAndIsStoredAndHandedOnAsGiven)
{
    running();
    EXPECT_EQ(1u, set_mode({ .digital_port = output(2, RES_1080P60HZ),
                             .hdmi = output(3, RES_720P60HZ),
                             .component = output(4, RES_1080I60HZ),
                             .composite = output(255, RES_576I) }));
    const Sent sent{ .hdmi_mode = RES_720P60HZ, .format = RES_1080P60HZ, .digital_port_on = 2, .hdmi_on = 3 };
    EXPECT_CALLS("TVE_SetMuteCtrol(0, RES_1080I60HZ, RES_576I, 1, 0)\n" + pll_and_port(sent) + R"(
        _i4Osd5Out_CVBSOnly(1, RES_576I)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080I60HZ, 4, 1, 0) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_576I, 255, 1, 0) = 1
        TVE_SetEnable(0, 4)
        TVE_SetEnable(1, 255)
    )" + hdmi_change(sent) +
                 R"(
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        PMX_HalScalerReset(0)
        i4GetHotPlugStatus() = 1
    )");
    EXPECT_EQ(2, record("arOutputConf[0].fgOutputEnable"));
    EXPECT_EQ(3, record("arOutputConf[1].fgOutputEnable"));
    EXPECT_EQ(4, record("arOutputConf[2].fgOutputEnable"));
    EXPECT_EQ(255, record("arOutputConf[3].fgOutputEnable"));
}

TEST_F(RequestFields, SetModeEx_IsStoredBetweenThePllAndTheEncoders)
{
    running();
    std::string seen;
    board::at_every_call([&seen](const board::TraceEntry& entry) {
        if (entry.kind != board::TraceEntry::Kind::Call)
            return;
        const std::string now = "mode " + std::to_string(record("ucMode")) + ", " + std::to_string(record("ucVfreq")) +
                                " Hz, component " + std::to_string(record("arOutputConf[2].eResMode")) + ", OSD5 " +
                                std::to_string(record("fgOSD5")) + "\n";
        if (!seen.ends_with(now))
            seen += entry.function + ": " + now;
    });
    EXPECT_EQ(1u, set_mode({ .digital_port = on(RES_480P), .component = on(RES_480P), .frequency = 50, .osd5 = 1 }));
    EXPECT_EQ("x_reg_read32: mode 12, 60 Hz, component 12, OSD5 0\n"
              "fgIsHotPlugChgRes: mode 2, 50 Hz, component 12, OSD5 0\n"
              "TVE_SetMuteCtrol: mode 2, 50 Hz, component 2, OSD5 1\n",
              seen);
}
