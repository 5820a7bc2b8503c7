// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Per-output mode setting when the mixer's format changes: the whole sequence. */
#include "tests/layer/mode_ex.h"
#include "tests/layer/sequences.h"

using namespace mode_ex;

using FullChange = mode_ex::Test;

namespace
{

const char* const ready_after_asking = R"(
    i4GetHotPlugStatus() = 1
    LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n"
)";

/** Log lines of a request whose digital-port set-up is all zero. */
std::string entry_lines(const char* digital_port, const char* hdmi, const char* component, const char* composite,
                        unsigned osd5 = 0)
{
    return std::string("LOG0 \"SetModeEx\\n\"\n") + "LOG9 \"CCIR(" + digital_port + ")\\n\"\nLOG9 \"HDMI(" + hdmi +
           ")\\n\"\nLOG9 \"CAV (" + component + ")\\n\"\nLOG9 \"CVBS(" + composite +
           ")\\n\"\nLOG9 \"CCIR(0, 0, 0, 0)\\n\"\nLOG9 \"OSD5(" + std::to_string(osd5) + ")\\n\"\n";
}

} // namespace

TEST_F(FullChange, SetModeEx_FirstCallAfterLoad_ProgramsEverything)
{
    started();
    Request request{ .digital_port = on(RES_1080P60HZ),
                     .hdmi = on(RES_1080P60HZ),
                     .component = on(RES_1080I60HZ),
                     .composite = on(RES_480I) };
    request.digital_port.eCcirDrvInfo = { CCIR_656_MODE, CCIR_YC422_20BIT, CCIR_601_MODE, CCIR_YC444_36BIT };
    const Sent sent{ .hdmi_mode = RES_1080P60HZ,
                     .format = RES_1080P60HZ,
                     .digital_port_setup = "{eDgoMode=2, eDgoFmt=5, eDgiMode=1, eDgiFmt=9}" };
    EXPECT_EQ(1u, set_mode(request));
    EXPECT_TRACE(R"(
        LOG0 "SetModeEx\n"
        LOG9 "CCIR(1, RES_1080P60HZ)\n"
        LOG9 "HDMI(1, RES_1080P60HZ)\n"
        LOG9 "CAV (1, RES_1080I60HZ)\n"
        LOG9 "CVBS(1, RES_480I)\n"
        LOG9 "CCIR(2, 5, 1, 9)\n"
        LOG9 "OSD5(0)\n"
        fgIsHotPlugChgRes() = 0
        LOG9 "HD Exist(1)\n"
        TVE_SetMuteCtrol(1, RES_1080I60HZ, RES_480I, 1, 0)
        LOG1 "PMX Start to set OSD Display mode:12.\n"
        OSD_BASE_SetDisplayMode(RES_1080P60HZ)
        LOG1 "PMX Finished to set OSD Display mode.\n"
        TVE_SetBlackScreen(0, 0)
        TVE_SetBlackScreen(1, 0)
    )" + pll_and_port(sent) +
                 R"(
        PMX_HalSetMode(0, RES_1080P60HZ)
        PMX_HalSetScalerMode(RES_1080P60HZ)
        LOG9 "Adjust PMX_ColorSpaceSetup call sequence.\n"
        LOG9 "Mode(12), eMixerOutCS(1)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 0, 0)
        LOG9 "CC_A disable\n"
        PMX_HalSetScaler709601(0, 1, 1)
        LOG8 "Scaler CC enable, 709->601\n"
        VDP_SetTvFormat(RES_1080P60HZ, 1)
        PMX_HalSetTvType(0, 0)
        _i4Osd5Out_CVBSOnly(1, RES_480I)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080I60HZ, 1, 1, 0) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, 1, 1, 0) = 1
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 1)
        PMX_HalScalerReset(0)
        vPostChgRes(RES_1080P60HZ)
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
    EXPECT_EQ(0, record("_fgBootUp"));
    EXPECT_EQ(1, record("fgSetModeCalled"));
}

TEST_F(FullChange, SetModeEx_FirstCallAfterLoad_IsFullWhateverTheRecordHolds)
{
    started();
    set_record("fgSetModeCalled", 1);
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({}));
    EXPECT_CALLS(R"(
        fgIsHotPlugChgRes() = 0
        TVE_SetMuteCtrol(1, RES_1080P60HZ, RES_480I, 1, 0)
        OSD_BASE_SetDisplayMode(RES_1080P60HZ)
        TVE_SetBlackScreen(0, 0)
        TVE_SetBlackScreen(1, 0)
    )" + pll_and_port({ .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ }) +
                 R"(
        PMX_HalSetMode(0, RES_1080P60HZ)
        PMX_HalSetScalerMode(RES_1080P60HZ)
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 0, 0)
        PMX_HalSetScaler709601(0, 1, 1)
        VDP_SetTvFormat(RES_1080P60HZ, 1)
        PMX_HalSetTvType(0, 0)
        _i4Osd5Out_CVBSOnly(1, RES_480I)
        TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080P60HZ, 1, 1, 0) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, 1, 1, 0) = 1
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 1)
        PMX_HalScalerReset(0)
        vPostChgRes(RES_1080P60HZ)
        VDP_GlobalOutputChange()
        VDP_VsyncSendCmd(0, 2)
        VDP_VsyncSendCmd(1, 2)
        VDP_VsyncSendCmd(2, 2)
    )" + hdmi_change({ .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ }) +
                 R"(
        OSD_BASE_SetFlag_PMXChangeResDone()
        i4GetHotPlugStatus() = 1
    )");
    EXPECT_RECORD_CHANGED(before, "_fgBootUp");
}

TEST_F(FullChange, SetModeEx_ToSdAtFiftyHertz_WithTheFifthOsd)
{
    running();
    const RecordSnapshot before;
    const Request request{ .digital_port = off(RES_1080P60HZ),
                           .hdmi = on(RES_576P),
                           .component = on(RES_576I),
                           .composite = on(RES_576I),
                           .frequency = 50,
                           .chip = DRV_EXT_SCL_EXT_TX,
                           .osd5 = 1 };
    const Sent sent{ .hdmi_mode = RES_576P, .format = RES_576P, .chip = 1, .osd5 = 1, .digital_port_on = 0 };
    EXPECT_EQ(1u, set_mode(request));
    EXPECT_TRACE(entry_lines("0, RES_1080P60HZ", "1, RES_576P", "1, RES_576I", "1, RES_576I", 1) +
                 sequences::pll(sequences::word_of_all_others, sequences::programmed_control_a,
                                sequences::programmed_control_b) +
                 R"(
        LOG9 "HD Exist(0)\n"
        TVE_SetMuteCtrol(1, RES_576I, RES_576I, 0, 1)
        LOG1 "PMX Start to set OSD Display mode:3.\n"
        OSD_BASE_SetDisplayMode(RES_576P)
        LOG1 "PMX Finished to set OSD Display mode.\n"
        TVE_SetBlackScreen(0, 0)
        TVE_SetBlackScreen(1, 0)
    )" + pll_and_port(sent) +
                 R"(
        PMX_HalSetMode(0, RES_576P)
        LOG9 "Adjust PMX_ColorSpaceSetup call sequence.\n"
        LOG9 "Mode(3), eMixerOutCS(1)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 1)
        LOG9 "CC_A enable, 709->601\n"
        PMX_HalSetScaler709601(0, 0, 0)
        LOG8 "Scaler CC disable, don't care\n"
        VDP_SetTvFormat(RES_576P, 1)
        PMX_HalSetTvType(0, 3)
        _i4Osd5Out_CVBSOnly(1, RES_576I)
        TVE_SetFmtEx(0, RES_576P, 50, RES_576I, 1, 0, 1) = 1
        TVE_SetFmtEx(1, RES_576P, 50, RES_576I, 1, 0, 1) = 1
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 1)
        PMX_HalScalerReset(0)
        vPostChgRes(RES_576P)
        VDP_GlobalOutputChange()
        VDP_VsyncSendCmd(0, 2)
        VDP_VsyncSendCmd(1, 2)
        VDP_VsyncSendCmd(2, 2)
    )" + hdmi_change(sent) +
                 "OSD_BASE_SetFlag_PMXChangeResDone()\n" + ready_after_asking);
    EXPECT_RECORD_CHANGED(before, "ucMode", "ucTvType", "ucVfreq", "arOutputConf[0].fgOutputEnable",
                          "arOutputConf[1].eResMode", "arOutputConf[2].eResMode", "arOutputConf[3].eResMode",
                          "rDrvExtScl", "fgOSD5");
    EXPECT_EQ(RES_576P, record("ucMode"));
    EXPECT_EQ(3, record("ucTvType"));
    EXPECT_EQ(50, record("ucVfreq"));
    EXPECT_EQ(DRV_EXT_SCL_EXT_TX, record("rDrvExtScl"));
    EXPECT_EQ(1, record("fgOSD5"));
}

namespace
{

/** All of a full change to 1080p in the outputs of a fresh Request, behind the PLL and the question about hot plug. */
std::string full_1080p(unsigned frequency, unsigned tv_type, const Sent& sent)
{
    const std::string hertz = std::to_string(frequency);
    return R"(
        LOG9 "HD Exist(1)\n"
        TVE_SetMuteCtrol(1, RES_1080P60HZ, RES_480I, 1, 0)
        LOG1 "PMX Start to set OSD Display mode:12.\n"
        OSD_BASE_SetDisplayMode(RES_1080P60HZ)
        LOG1 "PMX Finished to set OSD Display mode.\n"
        TVE_SetBlackScreen(0, 0)
        TVE_SetBlackScreen(1, 0)
    )" + pll_and_port(sent) +
           R"(
        PMX_HalSetMode(0, RES_1080P60HZ)
        PMX_HalSetScalerMode(RES_1080P60HZ)
        LOG9 "Adjust PMX_ColorSpaceSetup call sequence.\n"
        LOG9 "Mode(12), eMixerOutCS(1)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 0, 0)
        LOG9 "CC_A disable\n"
        PMX_HalSetScaler709601(0, 1, 1)
        LOG8 "Scaler CC enable, 709->601\n"
        VDP_SetTvFormat(RES_1080P60HZ, 1)
        PMX_HalSetTvType(0, )" +
           std::to_string(tv_type) + R"()
        _i4Osd5Out_CVBSOnly(1, RES_480I)
        TVE_SetFmtEx(0, RES_1080P60HZ, )" +
           hertz + R"(, RES_1080P60HZ, 1, 1, 0) = 1
        TVE_SetFmtEx(1, RES_1080P60HZ, )" +
           hertz + R"(, RES_480I, 1, 1, 0) = 1
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 1)
        PMX_HalScalerReset(0)
        vPostChgRes(RES_1080P60HZ)
        VDP_GlobalOutputChange()
        VDP_VsyncSendCmd(0, 2)
        VDP_VsyncSendCmd(1, 2)
        VDP_VsyncSendCmd(2, 2)
    )" + hdmi_change(sent) +
           "OSD_BASE_SetFlag_PMXChangeResDone()\n" + ready_after_asking;
}

const std::string entry_1080p = entry_lines("1, RES_1080P60HZ", "1, RES_1080P60HZ", "1, RES_1080P60HZ", "1, RES_480I");

} // namespace

TEST_F(FullChange, SetModeEx_FrequencyAlone_SetsThePllFirst)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .frequency = 24 }));
    EXPECT_TRACE(entry_1080p +
                 sequences::pll(sequences::word_of_60hz_family, sequences::programmed_control_a,
                                sequences::programmed_control_b) +
                 "fgIsHotPlugChgRes() = 0\n" +
                 full_1080p(24, PMX_TV_TYPE_PAL, { .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ }));
    EXPECT_RECORD_CHANGED(before, "ucVfreq", "ucTvType");
    EXPECT_EQ(24, record("ucVfreq"));
}

TEST_F(FullChange, SetModeEx_ExternalChipAlone_IsAFullChangeWithoutThePll)
{
    running();
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({ .chip = DRV_RX_BYPASS_TX }));
    EXPECT_TRACE(entry_1080p + "fgIsHotPlugChgRes() = 0\n" +
                 full_1080p(60, PMX_TV_TYPE_NTSC,
                            { .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ, .chip = DRV_RX_BYPASS_TX }));
    EXPECT_RECORD_CHANGED(before, "rDrvExtScl");
    EXPECT_EQ(DRV_RX_BYPASS_TX, record("rDrvExtScl"));
}

TEST_F(FullChange, SetModeEx_NoModeSetSinceReset_IsAFullChange)
{
    running();
    set_record("fgSetModeCalled", 0);
    const RecordSnapshot before;
    EXPECT_EQ(1u, set_mode({}));
    EXPECT_TRACE(entry_1080p + "fgIsHotPlugChgRes() = 0\n" +
                 full_1080p(60, PMX_TV_TYPE_NTSC, { .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ }));
    EXPECT_RECORD_CHANGED(before, "fgSetModeCalled");
    EXPECT_EQ(1, record("fgSetModeCalled"));
}

TEST_F(FullChange, SetModeEx_AfterALaterReset_IsAFullChangeBecauseTheRecordIsNew)
{
    running({ .frequency = 50 });
    PMX_Reset(0);
    board::trace::clear();
    EXPECT_EQ(1u, set_mode({}));
    EXPECT_TRACE(entry_1080p + "fgIsHotPlugChgRes() = 0\n" +
                 full_1080p(60, PMX_TV_TYPE_NTSC, { .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ }));
}

TEST_F(FullChange, SetModeEx_ColoursAreSetFromTheMastersColourSpace)
{
    running();
    set_record("eMasterColorSpace", DRV_PMX_CS_YCBCR_601);
    EXPECT_EQ(1u, set_mode({ .chip = DRV_EXT_SCL_EXT_TX }));
    std::string lines =
        entry_1080p + "fgIsHotPlugChgRes() = 0\n" +
        full_1080p(60, PMX_TV_TYPE_NTSC, { .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ, .chip = 1 });
    const std::size_t start = lines.find("LOG9 \"Mode(12)");
    lines.replace(start, lines.find("VDP_SetTvFormat") - start, R"(LOG9 "Mode(12), eMixerOutCS(0)\n"
        PMX_HalSelectVdoutCconv(0, 1)
        PMX_HalSelectScalerCconv(0, 0)
        PMX_HalSetCC_A(0, 1, 0)
        LOG9 "CC_A enable, 601->709\n"
        PMX_HalSetScaler709601(0, 0, 0)
        LOG8 "Scaler CC disable\n"
        )");
    EXPECT_TRACE(lines);
}

TEST_F(FullChange, SetModeEx_TestSwitchSet_OsdDriverIsNotToldTheDisplayMode)
{
    for (const int value : { 1, 2, 255 })
    {
        power_on();
        running();
        set_record("_PmxTestOsd", value);
        EXPECT_EQ(1u, set_mode({ .chip = DRV_EXT_SCL_INT_TX }));
        std::string lines =
            entry_1080p + "fgIsHotPlugChgRes() = 0\n" +
            full_1080p(60, PMX_TV_TYPE_NTSC, { .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ, .chip = 2 });
        const std::size_t start = lines.find("LOG1");
        lines.erase(start, lines.find("TVE_SetBlackScreen") - start);
        EXPECT_TRACE(lines);
        EXPECT_EQ(value, record("_PmxTestOsd"));
    }
}
