// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Per-output mode setting: choosing the mixer's format, refusing it, and what the record keeps. */
#include "board/video_planes.h"
#include "tests/layer/mode_ex.h"

using namespace mode_ex;

using MixerFormat = mode_ex::Test;

namespace
{

constexpr const char* refused_change = R"(
    LOG0 "[PMX] PMX_SetModeEx, PMX_CheckCap error, set format change flag, wait display part...\n"
)";

/** Mixer format of the next request, as the OSD driver is told it. */
UINT32 format_of(const Request& request)
{
    PMX_RESOLUTION_MODE_T format = RES_MODE_NUM;
    board::at_every_call([&format](const board::TraceEntry& entry) {
        if (entry.function == "OSD_BASE_SetDisplayMode")
            format = static_cast<PMX_RESOLUTION_MODE_T>(entry.arguments.at(0).value.as_number());
    });
    LayerTest::set_record("fgSetModeCalled", 0);
    EXPECT_EQ(1u, set_mode(request));
    board::at_every_call({});
    return format;
}

} // namespace

TEST_F(MixerFormat, SetModeEx_FirstEnabledOutput_InTheOrderPortHdmiComponentComposite)
{
    running();
    Request request{ .digital_port = on(RES_480P),
                     .hdmi = on(RES_720P60HZ),
                     .component = on(RES_1080I60HZ),
                     .composite = on(RES_576I) };
    EXPECT_EQ(RES_480P, format_of(request));
    request.digital_port.fgOutputEnable = FALSE;
    EXPECT_EQ(RES_720P60HZ, format_of(request));
    request.hdmi.fgOutputEnable = FALSE;
    EXPECT_EQ(RES_1080I60HZ, format_of(request));
    request.component.fgOutputEnable = FALSE;
    EXPECT_EQ(RES_576I, format_of(request));
    request.composite.fgOutputEnable = FALSE;
    EXPECT_EQ(RES_720P60HZ, format_of(request));
}

TEST_F(MixerFormat, SetModeEx_AllDisabled_WarnsAndRunsHdmisMode)
{
    running();
    set_record("fgSetModeCalled", 0);
    const Request request{ .digital_port = off(RES_480P),
                           .hdmi = off(RES_720P60HZ),
                           .component = off(RES_1080I60HZ),
                           .composite = off(RES_576I) };
    const Sent sent{ .hdmi_mode = RES_720P60HZ, .format = RES_720P60HZ, .digital_port_on = 0, .hdmi_on = 0 };
    EXPECT_EQ(1u, set_mode(request));
    EXPECT_TRACE(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(0, RES_480P)\n"
        LOG9 "HDMI(0, RES_720P60HZ)\n"
        LOG9 "CAV (0, RES_1080I60HZ)\n"
        LOG9 "CVBS(0, RES_576I)\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(0)\n"
        LOG0 "[PMX] Warning: Disable All output, set fmt as 8.\n"
        LOG9 "HD Exist(1)\n"
        TVE_SetMuteCtrol(1, RES_720P60HZ, RES_720P60HZ, 1, 0)
        LOG1 "PMX Start to set OSD Display mode:8.\n"
        OSD_BASE_SetDisplayMode(RES_720P60HZ)
        LOG1 "PMX Finished to set OSD Display mode.\n"
        TVE_SetBlackScreen(0, 0)
        TVE_SetBlackScreen(1, 0)
    )" + pll_and_port(sent) +
                 R"(
        PMX_HalSetMode(0, RES_720P60HZ)
        PMX_HalSetScalerMode(RES_720P60HZ)
        LOG9 "Adjust PMX_ColorSpaceSetup call sequence.\n"
        LOG9 "Mode(8), eMixerOutCS(1)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 0, 0)
        LOG9 "CC_A disable\n"
        PMX_HalSetScaler709601(0, 1, 1)
        LOG8 "Scaler CC enable, 709->601\n"
        VDP_SetTvFormat(RES_720P60HZ, 1)
        PMX_HalSetTvType(0, 0)
        _i4Osd5Out_CVBSOnly(1, RES_720P60HZ)
        TVE_SetFmtEx(0, RES_720P60HZ, 60, RES_720P60HZ, 0, 1, 0) = 1
        TVE_SetFmtEx(1, RES_720P60HZ, 60, RES_720P60HZ, 0, 1, 0) = 1
        TVE_SetEnable(0, 0)
        TVE_SetEnable(1, 0)
        PMX_HalScalerReset(0)
        vPostChgRes(RES_720P60HZ)
        VDP_GlobalOutputChange()
        VDP_VsyncSendCmd(0, 2)
        VDP_VsyncSendCmd(1, 2)
        VDP_VsyncSendCmd(2, 2)
    )" + hdmi_change(sent) +
                 R"(
        OSD_BASE_SetFlag_PMXChangeResDone()
        i4GetHotPlugStatus() = 1
        LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n"
    )");
    EXPECT_EQ(RES_720P60HZ, record("ucMode"));
    EXPECT_EQ(RES_480P, record("arOutputConf[0].eResMode"));
    EXPECT_EQ(RES_720P60HZ, record("arOutputConf[1].eResMode"));
    EXPECT_EQ(RES_1080I60HZ, record("arOutputConf[2].eResMode"));
    EXPECT_EQ(RES_576I, record("arOutputConf[3].eResMode"));
}

TEST_F(MixerFormat, SetModeEx_OnlyCompositeEnabled_AllRunItsModeAndTheRecordKeepsTheCallers)
{
    running();
    const RecordSnapshot before;
    const Request request{ .digital_port = off(RES_1080P60HZ),
                           .hdmi = off(RES_720P60HZ),
                           .component = off(RES_1080I60HZ),
                           .composite = on(RES_576I) };
    const Sent sent{ .hdmi_mode = RES_576I, .format = RES_576I, .digital_port_on = 0, .hdmi_on = 0 };
    EXPECT_EQ(1u, set_mode(request));
    EXPECT_TRACE(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(0, RES_1080P60HZ)\n"
        LOG9 "HDMI(0, RES_720P60HZ)\n"
        LOG9 "CAV (0, RES_1080I60HZ)\n"
        LOG9 "CVBS(1, RES_576I)\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(0)\n"
        LOG9 "HD Exist(0)\n"
        TVE_SetMuteCtrol(1, RES_576I, RES_576I, 0, 0)
        LOG1 "PMX Start to set OSD Display mode:1.\n"
        OSD_BASE_SetDisplayMode(RES_576I)
        LOG1 "PMX Finished to set OSD Display mode.\n"
        TVE_SetBlackScreen(0, 0)
        TVE_SetBlackScreen(1, 0)
    )" + pll_and_port(sent) +
                 R"(
        PMX_HalSetMode(0, RES_576I)
        PMX_HalSetScalerMode(RES_576I)
        LOG9 "Adjust PMX_ColorSpaceSetup call sequence.\n"
        LOG9 "Mode(1), eMixerOutCS(1)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 1)
        LOG9 "CC_A enable, 709->601\n"
        PMX_HalSetScaler709601(0, 0, 0)
        LOG8 "Scaler CC disable, don't care\n"
        VDP_SetTvFormat(RES_576I, 1)
        PMX_HalSetTvType(0, 0)
        _i4Osd5Out(0, RES_576I)
        TVE_SetFmtEx(0, RES_576I, 60, RES_576I, 0, 0, 0) = 1
        TVE_SetFmtEx(1, RES_576I, 60, RES_576I, 1, 0, 0) = 1
        TVE_SetEnable(0, 0)
        TVE_SetEnable(1, 1)
        PMX_HalScalerReset(0)
        vPostChgRes(RES_576I)
        VDP_GlobalOutputChange()
        VDP_VsyncSendCmd(0, 2)
        VDP_VsyncSendCmd(1, 2)
        VDP_VsyncSendCmd(2, 2)
    )" + hdmi_change(sent) +
                 R"(
        OSD_BASE_SetFlag_PMXChangeResDone()
        i4GetHotPlugStatus() = 1
        LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n"
    )");
    EXPECT_RECORD_CHANGED(before, "ucMode", "arOutputConf[0].fgOutputEnable", "arOutputConf[1].fgOutputEnable",
                          "arOutputConf[1].eResMode", "arOutputConf[2].fgOutputEnable", "arOutputConf[2].eResMode",
                          "arOutputConf[3].eResMode");
    EXPECT_EQ(RES_576I, record("ucMode"));
    EXPECT_EQ(RES_720P60HZ, record("arOutputConf[1].eResMode"));
    EXPECT_EQ(RES_1080I60HZ, record("arOutputConf[2].eResMode"));
}

TEST_F(MixerFormat, SetModeEx_Refused_ReleasesTheHandshakeAndStoresNothing)
{
    running();
    PMX_SetFormatChangeFlag(TRUE);
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(0u, set_mode({ .digital_port = on(RES_2160P),
                             .hdmi = on(RES_720P60HZ),
                             .frequency = 50,
                             .chip = DRV_EXT_SCL_EXT_TX,
                             .osd5 = 1 }));
    EXPECT_TRACE(std::string(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(1, (null))\n"
        LOG9 "HDMI(1, RES_720P60HZ)\n"
        LOG9 "CAV (1, RES_1080P60HZ)\n"
        LOG9 "CVBS(1, RES_480I)\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(1)\n"
    )") + refused_change +
                 lowered);
    EXPECT_RECORD_CHANGED(before, "status.fgPmxFormatChangeFlag");
}

TEST_F(MixerFormat, SetModeEx_RefusedWhileTheVideoPlaneWaits_OwesTheRelease)
{
    running();
    board::video_planes::set_waiting_for_sync(true);
    EXPECT_EQ(0u, set_mode({ .digital_port = on(RES_2D_576I50HZ) }));
    EXPECT_CALLS("fgVdpIsWaitforSyncCtrl() = 1");
    EXPECT_EQ(1, record("status.fgPmxEnabeOsdFlag"));
}

TEST_F(MixerFormat, SetModeEx_RefusedFirstCall_TheNextOneStillProgramsEverything)
{
    started();
    const RecordSnapshot before;
    EXPECT_EQ(0u, set_mode({ .digital_port = on(RES_4K2K24HZ) }));
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ(1, record("_fgBootUp"));
    board::trace::clear();
    std::string mute;
    board::at_every_call([&mute](const board::TraceEntry& entry) {
        if (entry.function == "TVE_SetMuteCtrol")
            mute = entry.brief();
    });
    EXPECT_EQ(1u, set_mode({}));
    EXPECT_EQ("TVE_SetMuteCtrol(1, RES_1080P60HZ, RES_480I, 1, 0)", mute);
    EXPECT_EQ(0, record("_fgBootUp"));
}

TEST_F(MixerFormat, SetModeEx_AllDisabledAndHdmisModeRefused_WarnsAndRefuses)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(0u, set_mode({ .digital_port = off(RES_480P),
                             .hdmi = off(RES_2160P_4096),
                             .component = off(RES_480P),
                             .composite = off(RES_480I) }));
    EXPECT_TRACE(std::string(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(0, RES_480P)\n"
        LOG9 "HDMI(0, (null))\n"
        LOG9 "CAV (0, RES_480P)\n"
        LOG9 "CVBS(0, RES_480I)\n"
        LOG9 "CCIR(0, 0, 0, 0)\n"
        LOG9 "OSD5(0)\n"
    )") + "LOG0 \"[PMX] Warning: Disable All output, set fmt as " +
                 std::to_string(RES_2160P_4096) + ".\\n\"\n" + refused_change + lowered);
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(MixerFormat, SetModeEx_NothingEnabled_TheWholeNumberOfTheHdmiModeIsTold)
{
    running();
    EXPECT_EQ(0u, set_mode({ .digital_port = off(RES_480P),
                             .hdmi = off(0x12300 | RES_2160P_4096),
                             .component = off(RES_480P),
                             .composite = off(RES_480I) }));
    EXPECT_EQ("[PMX] Warning: Disable All output, set fmt as " + std::to_string(0x12300 | RES_2160P_4096) + ".\n",
              board::trace::entries().at(7).text);
}

TEST_F(MixerFormat, SetModeEx_CapabilityDecidesOverTheMixersFormatAlone)
{
    running();
    set_record("u4Capability", 0x100);
    EXPECT_EQ(1u, set_mode({ .hdmi = on(RES_720P60HZ), .component = on(RES_2160P), .composite = on(RES_AUTO) }));
    set_record("u4Capability", 0x7FFBFFFF & ~0x100);
    const RecordSnapshot before;
    EXPECT_EQ(0u, set_mode({ .hdmi = on(RES_720P60HZ) }));
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(MixerFormat, SetModeEx_OtherMixerId_RefusedAndNothingChanges)
{
    started();
    PMX_SetFormatChangeFlag(TRUE);
    board::trace::clear();
    const RecordSnapshot before;
    PMX_RESOLUTION_T outputs[PMX_OUTPUT_NUM] = { on(RES_480P), on(RES_480P), on(RES_480P), on(RES_480I) };
    for (unsigned id = 1; id < 256; ++id)
    {
        EXPECT_EQ(0u, PMX_SetModeEx(static_cast<UCHAR>(id), outputs, 50, DRV_EXT_SCL_EXT_TX, 2)) << id;
        EXPECT_EQ(0u, PMX_SetModeEx(static_cast<UCHAR>(id), nullptr, 50, DRV_EXT_SCL_EXT_TX, 2)) << id;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(MixerFormat, SetModeEx_NullOutputs_RefusedAndNothingChanges)
{
    started();
    PMX_SetFormatChangeFlag(TRUE);
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetModeEx(0, nullptr, 50, DRV_EXT_SCL_EXT_TX, 2));
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}
