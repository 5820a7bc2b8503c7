// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/hdmi_av.h"

#include <string>
#include <utility>

#include "device_test.h"
#include "drv_av_d.h"
#include "x_vid_dec.h"

namespace
{

constexpr const char* NO_COMMAND =
    "{PMX_CHG_HDMI_COLOR_SPACE=null, PMX_CHG_HDMI_VIDEO_ASPECT_RATIO=null, PMX_SET_UI_TV_SYSTEM=null, "
    "PMX_SET_HDMI_BRIGHTNESS=null, PMX_SET_HDMI_CONTRAST=null, PMX_SET_HDMI_HUE=null, PMX_SET_HDMI_SATURATION=null, "
    "PMX_CHG_DEEP_COLOR_BIT=null, PMX_SET_VIDEO_PLL=null, PMX_SET_HDMI_RES_CHG=null, PMX_CHG_UI_RES_AUTO=null, "
    "PMX_SET_HDMI_SHARPNESS=null, PMX_SET_CCIR_RES_CHG=null, PMX_SET_EXT_SHARPNESS=null, "
    "PMX_SET_EXT_BRIGHTNESS=null, PMX_SET_EXT_CONTRAST=null, PMX_SET_EXT_SATURATION=null, "
    "PMX_SET_EXT_COLOR_SPACE=null, PMX_SET_EXT_Y_C_DELAY=null, PMX_SET_EXT_CUE_CORRECT=null, "
    "PMX_SET_EXT_BORDER_LEVEL=null, PMX_SET_EXT_DEINTERLACE_MODE=null, PMX_SET_EXT_NOISE_REDUCTION=null, "
    "PMX_SET_EXT_EDGE_ENHANCEMENT=null, PMX_SET_EXT_DETAIL_ENHANCEMENT=null, PMX_SET_EXT_ZOOM_IMAGE=null, "
    "PMX_SET_EXT_GAMMA=null, PMX_SET_EXT_DEEP_COLOR=null}";

const std::string HDMI_AS_NEW =
    std::string("{sink_plugged=1, resolution_requested=0, commands=") + NO_COMMAND +
    ", chosen_resolution=null, sink_modes=[], posted_resolution=null, posted_colour_space=null, "
    "change_ok_notices=0, ccir_before_mixer=null}";

class HdmiAv : public DeviceTest
{
protected:
    static std::string now(std::string_view path) { return member(board::hdmi_av::state(), path); }
};

PMX_SET_HDMI_RES_PARAMETER_T some_resolution()
{
    PMX_SET_HDMI_RES_PARAMETER_T record{};
    record.u1ScaleMode = 1;
    record.ucHdmiOutDisplayResolution = RES_1080P60HZ;
    record.ucFmtOutResolution = RES_720P60HZ;
    record.ucCCIROutResolution = RES_480P;
    record.ucHdmiOutMode = DRV_EXT_SCL_INT_TX;
    record.eCcirDrvInfo = { CCIR_656_MODE, CCIR_YCMIX_8BIT, CCIR_601_MODE, CCIR_YC422_16BIT };
    record.fgOsdMsg = 2;
    record.ucCCIROutMode = 0;
    record.fgCCIROutEnable = 1;
    record.fgHdmiOutEnable = 1;
    record.u2_Vfreq = 60;
    return record;
}

constexpr const char* SOME_RESOLUTION =
    "{u1ScaleMode=1, ucHdmiOutDisplayResolution=RES_1080P60HZ, ucFmtOutResolution=RES_720P60HZ, "
    "ucCCIROutResolution=RES_480P, ucHdmiOutMode=DRV_EXT_SCL_INT_TX, "
    "eCcirDrvInfo={eDgoMode=CCIR_656_MODE, eDgoFmt=CCIR_YCMIX_8BIT, eDgiMode=CCIR_601_MODE, "
    "eDgiFmt=CCIR_YC422_16BIT}, fgOsdMsg=2, ucCCIROutMode=0, fgCCIROutEnable=1, fgHdmiOutEnable=1, u2_Vfreq=60}";

TEST_F(HdmiAv, PowerOn_ASinkIsPluggedInAndNothingWasSent)
{
    EXPECT_EQ(HDMI_AS_NEW, board::hdmi_av::state().to_text());
}

TEST_F(HdmiAv, PowerOn_TheSinkIsAsTheBoardSays)
{
    board::Description description;
    description.sink_plugged = false;
    power_on(description);
    EXPECT_EQ("0", now("sink_plugged"));
    EXPECT_EQ(0, i4GetHotPlugStatus());
    power_on({});
    EXPECT_EQ(1, i4GetHotPlugStatus());
}

TEST_F(HdmiAv, PowerOn_RequestAndChoiceAreAsTheBoardSays)
{
    board::Description description;
    description.resolution_requested = true;
    description.valid_resolution = board::hdmi_av::Resolution{ RES_720P50HZ, 50 };
    power_on(description);
    EXPECT_EQ(TRUE, fgIsHotPlugChgRes());
    EXPECT_EQ("{mode=RES_720P50HZ, frequency=50}", now("chosen_resolution"));
    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T query{ RES_1080P60HZ, 60, 0, 0 };
    EXPECT_EQ(TRUE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query));
    EXPECT_EQ(UINT32{ RES_720P50HZ }, query.u4ValidAutoRes);
    EXPECT_EQ(50u, query.u2ValidAutoVfreq);
    power_on({});
    EXPECT_EQ(HDMI_AS_NEW, board::hdmi_av::state().to_text());
}

TEST_F(HdmiAv, PowerOn_TheSinkTakesTheModesThatTheBoardSays)
{
    board::Description description;
    description.sink_modes = { { RES_720P50HZ, 50 }, { RES_576P, 50 } };
    power_on(description);
    EXPECT_EQ("[{mode=RES_720P50HZ, frequency=50}, {mode=RES_576P, frequency=50}]", now("sink_modes"));
    const auto chosen_for = [](UINT32 mode, UINT16 frequency) {
        PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T query{ mode, frequency, 0, 0 };
        EXPECT_EQ(TRUE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query));
        return std::pair(query.u4ValidAutoRes, query.u2ValidAutoVfreq);
    };
    EXPECT_EQ(std::pair(UINT32{ RES_576P }, UINT16{ 50 }), chosen_for(RES_576P, 50));
    EXPECT_EQ(std::pair(UINT32{ RES_720P50HZ }, UINT16{ 50 }), chosen_for(RES_1080P60HZ, 60)) << "what it likes best";
    EXPECT_EQ(std::pair(UINT32{ RES_720P50HZ }, UINT16{ 50 }), chosen_for(RES_576P, 60)) << "not at this frequency";
    board::hdmi_av::choose_resolution(board::hdmi_av::Resolution{ RES_480P, 60 });
    EXPECT_EQ(std::pair(UINT32{ RES_480P }, UINT16{ 60 }), chosen_for(RES_576P, 50)) << "whatever is asked";
}

TEST_F(HdmiAv, PowerOn_ForgetsEverything)
{
    UINT8 value = 1;
    auto record = some_resolution();
    fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, &value, 1);
    fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, &record, 1);
    vPostChgRes(12);
    vPostChgInputCS(DRV_PMX_CS_RGB);
    vSendAvdNotifyScomResChgOK();
    vSetCcirOutBeforeMixer(1);
    board::hdmi_av::plug(false);
    board::hdmi_av::request_resolution(true);
    board::hdmi_av::choose_resolution(board::hdmi_av::Resolution{ RES_480P, 60 });
    EXPECT_EQ("{mode=RES_480P, frequency=60}", now("chosen_resolution"));
    power_on({});
    EXPECT_EQ(HDMI_AS_NEW, board::hdmi_av::state().to_text());
}

struct ByteCommand
{
    UINT32 number;
    std::string name;
};

const ByteCommand BYTE_COMMANDS[] = {
    { 0, "PMX_CHG_HDMI_COLOR_SPACE" },      { 4, "PMX_SET_HDMI_BRIGHTNESS" },
    { 5, "PMX_SET_HDMI_CONTRAST" },         { 6, "PMX_SET_HDMI_HUE" },
    { 7, "PMX_SET_HDMI_SATURATION" },       { 8, "PMX_CHG_DEEP_COLOR_BIT" },
    { 13, "PMX_CHG_UI_RES_AUTO" },          { 15, "PMX_SET_HDMI_SHARPNESS" },
    { 17, "PMX_SET_EXT_SHARPNESS" },        { 18, "PMX_SET_EXT_BRIGHTNESS" },
    { 19, "PMX_SET_EXT_CONTRAST" },         { 20, "PMX_SET_EXT_SATURATION" },
    { 21, "PMX_SET_EXT_COLOR_SPACE" },      { 22, "PMX_SET_EXT_Y_C_DELAY" },
    { 23, "PMX_SET_EXT_CUE_CORRECT" },      { 24, "PMX_SET_EXT_BORDER_LEVEL" },
    { 25, "PMX_SET_EXT_DEINTERLACE_MODE" }, { 26, "PMX_SET_EXT_NOISE_REDUCTION" },
    { 27, "PMX_SET_EXT_EDGE_ENHANCEMENT" }, { 28, "PMX_SET_EXT_DETAIL_ENHANCEMENT" },
    { 29, "PMX_SET_EXT_ZOOM_IMAGE" },       { 30, "PMX_SET_EXT_GAMMA" },
    { 31, "PMX_SET_EXT_DEEP_COLOR" },
};

TEST_F(HdmiAv, SetAvd_CommandsOfOneByte_TakeThatByteAndNoMore)
{
    for (const ByteCommand& command : BYTE_COMMANDS)
    {
        SCOPED_TRACE(command.name);
        power_on({});
        UINT8 value = 140;
        EXPECT_EQ(TRUE, fgPmxDrvSetAvd(command.number, &value, 1));
        EXPECT_EQ("fgPmxDrvSetAvd(" + command.name + ", 140, 1) = 1", last_call());
        std::string expected = NO_COMMAND;
        const std::string key = command.name + "=";
        expected.replace(expected.find(key) + key.size(), 4, "140");
        EXPECT_EQ(expected, now("commands"));
        value = 0;
        EXPECT_EQ("140", now("commands." + command.name));
    }
}

TEST_F(HdmiAv, SetAvd_ExternalChipSettingOver255_IsCutToItsLowByte)
{
    INT32 value = 0x12345678;
    EXPECT_EQ(TRUE, fgPmxDrvSetAvd(PMX_SET_EXT_ZOOM_IMAGE, &value, 1));
    EXPECT_EQ("fgPmxDrvSetAvd(PMX_SET_EXT_ZOOM_IMAGE, 120, 1) = 1", last_call());
    EXPECT_EQ("120", now("commands.PMX_SET_EXT_ZOOM_IMAGE"));
}

TEST_F(HdmiAv, SetAvd_ColourSpace_HasItsName)
{
    UINT8 value = HDMI_RGB_FULL;
    EXPECT_EQ(TRUE, fgPmxDrvSetAvd(PMX_CHG_HDMI_COLOR_SPACE, &value, 1));
    EXPECT_EQ("fgPmxDrvSetAvd(PMX_CHG_HDMI_COLOR_SPACE, HDMI_RGB_FULL, 1) = 1", last_call());
    EXPECT_EQ("HDMI_RGB_FULL", now("commands.PMX_CHG_HDMI_COLOR_SPACE"));
}

TEST_F(HdmiAv, SetAvd_AspectRatio_IsAWholeWord)
{
    UINT32 ratio = ASP_16_9;
    EXPECT_EQ(TRUE, fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, &ratio, 1));
    EXPECT_EQ("fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, ASP_16_9, 1) = 1", last_call());
    EXPECT_EQ("ASP_16_9", now("commands.PMX_CHG_HDMI_VIDEO_ASPECT_RATIO"));
    ratio = 0x10203;
    fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, &ratio, 1);
    EXPECT_EQ("fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, 66051, 1) = 1", last_call());
}

TEST_F(HdmiAv, SetAvd_TvSystem_IsKeptByField)
{
    PMX_SET_TV_SYS_PARAMETER_T record{ 50, TRUE };
    EXPECT_EQ(TRUE, fgPmxDrvSetAvd(PMX_SET_UI_TV_SYSTEM, &record, 1));
    EXPECT_EQ("fgPmxDrvSetAvd(PMX_SET_UI_TV_SYSTEM, {u2_Vfreq=50, fgAutoEnable=1}, 1) = 1", last_call());
    record.u2_Vfreq = 60;
    EXPECT_EQ("{u2_Vfreq=50, fgAutoEnable=1}", now("commands.PMX_SET_UI_TV_SYSTEM"));
    EXPECT_EQ("50", now("commands.PMX_SET_UI_TV_SYSTEM.u2_Vfreq"));
}

TEST_F(HdmiAv, SetAvd_ResolutionCommands_EachKeepTheirOwnRecordByField)
{
    const ByteCommand commands[] = { { 9, "PMX_SET_VIDEO_PLL" },
                                     { 10, "PMX_SET_HDMI_RES_CHG" },
                                     { 16, "PMX_SET_CCIR_RES_CHG" } };
    for (const ByteCommand& command : commands)
    {
        SCOPED_TRACE(command.name);
        power_on({});
        auto record = some_resolution();
        EXPECT_EQ(TRUE, fgPmxDrvSetAvd(command.number, &record, 1));
        EXPECT_EQ("fgPmxDrvSetAvd(" + command.name + ", " + SOME_RESOLUTION + ", 1) = 1", last_call());
        record = {};
        std::string expected = NO_COMMAND;
        const std::string key = command.name + "=";
        expected.replace(expected.find(key) + key.size(), 4, SOME_RESOLUTION);
        EXPECT_EQ(expected, now("commands"));
    }
    EXPECT_EQ("CCIR_YC422_16BIT", now("commands.PMX_SET_CCIR_RES_CHG.eCcirDrvInfo.eDgiFmt"));
}

TEST_F(HdmiAv, SetAvd_TheHdmiResolutionAlone_ReachesTheDisplayPart)
{
    auto record = some_resolution();
    const auto changes = [] { return member(board::display_part::state(), "resolution_changes"); };
    fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, &record, 1);
    fgPmxDrvSetAvd(PMX_SET_CCIR_RES_CHG, &record, 1);
    fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, nullptr, 1);
    EXPECT_EQ("0", changes());
    fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, &record, 1);
    EXPECT_EQ("1", changes());
    answer_always("fgPmxDrvSetAvd", 0);
    fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, &record, 1);
    EXPECT_EQ("1", changes()) << "a command that the driver refuses goes nowhere";
}

TEST_F(HdmiAv, SetAvd_CommandThatDoesNotExist_IsRefused)
{
    UINT8 value = 1;
    for (const UINT32 command : { 3u, 11u, 12u, 14u, 32u, 0xFFFFFFFFu })
    {
        EXPECT_EQ(FALSE, fgPmxDrvSetAvd(command, &value, 1));
        EXPECT_EQ("fgPmxDrvSetAvd(" + std::to_string(command) + ", <pointer>, 1) = 0", last_call());
    }
    EXPECT_EQ(HDMI_AS_NEW, board::hdmi_av::state().to_text());
}

TEST_F(HdmiAv, SetAvd_WithoutParameter_IsRefused)
{
    EXPECT_EQ(FALSE, fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, nullptr, 1));
    EXPECT_EQ("fgPmxDrvSetAvd(PMX_SET_VIDEO_PLL, null, 1) = 0", last_call());
    EXPECT_EQ(FALSE, fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, nullptr, 1));
    EXPECT_EQ(HDMI_AS_NEW, board::hdmi_av::state().to_text());
}

TEST_F(HdmiAv, GetAvdInfo_ValidResolution_EchoesWhatWasAsked)
{
    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T query{ RES_1080P60HZ, 60, 0, 0 };
    EXPECT_EQ(TRUE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query));
    EXPECT_EQ("fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, {u4ResCheck=RES_1080P60HZ, u2VsyncFreq=60, "
              "u4ValidAutoRes=RES_1080P60HZ, u2ValidAutoVfreq=60}) = 1",
              last_call());
    EXPECT_EQ(UINT32{ RES_1080P60HZ }, query.u4ValidAutoRes);
    EXPECT_EQ(60u, query.u2ValidAutoVfreq);
}

TEST_F(HdmiAv, GetAvdInfo_ValidResolution_IsTheChosenOneWhereThereIsOne)
{
    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T query{ RES_1080P60HZ, 60, 0, 0 };
    board::hdmi_av::choose_resolution(board::hdmi_av::Resolution{ 0x109, 50 });
    EXPECT_EQ("{mode=265, frequency=50}", now("chosen_resolution"));
    EXPECT_EQ(TRUE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query));
    EXPECT_EQ(0x109u, query.u4ValidAutoRes);
    EXPECT_EQ(50u, query.u2ValidAutoVfreq);
    EXPECT_EQ(UINT32{ RES_1080P60HZ }, query.u4ResCheck);
    board::hdmi_av::choose_resolution({});
    EXPECT_EQ("null", now("chosen_resolution"));
    EXPECT_EQ(TRUE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query));
    EXPECT_EQ(UINT32{ RES_1080P60HZ }, query.u4ValidAutoRes);
}

TEST_F(HdmiAv, GetAvdInfo_QueryThatDoesNotExist_HasNoAnswer)
{
    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T query{ RES_1080P60HZ, 60, 1, 2 };
    EXPECT_EQ(FALSE, fgPmxDrvGetAvdInfo(2, &query));
    EXPECT_EQ("fgPmxDrvGetAvdInfo(2, <pointer>) = 0", last_call());
    EXPECT_EQ(FALSE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, nullptr));
    EXPECT_EQ("fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, null) = 0", last_call());
    EXPECT_EQ(1u, query.u4ValidAutoRes);
    EXPECT_EQ(2u, query.u2ValidAutoVfreq);
    EXPECT_EQ(HDMI_AS_NEW, board::hdmi_av::state().to_text());
}

TEST_F(HdmiAv, Plug_ChangesTheStatusAndIsNoted)
{
    EXPECT_EQ(1, i4GetHotPlugStatus());
    EXPECT_EQ("i4GetHotPlugStatus() = 1", last_call());
    board::hdmi_av::plug(false);
    EXPECT_EQ("NOTICE plug \"HDMI sink unplugged\"", last_call());
    EXPECT_EQ("0", now("sink_plugged"));
    EXPECT_EQ(0, i4GetHotPlugStatus());
    EXPECT_EQ("i4GetHotPlugStatus() = 0", last_call());
    board::hdmi_av::plug(true);
    EXPECT_EQ("NOTICE plug \"HDMI sink plugged in\"", last_call());
    EXPECT_EQ(1, i4GetHotPlugStatus());
    EXPECT_EQ("1", now("sink_plugged"));
}

TEST_F(HdmiAv, RequestResolution_StaysUntilItIsWithdrawn)
{
    EXPECT_EQ(FALSE, fgIsHotPlugChgRes());
    EXPECT_EQ("fgIsHotPlugChgRes() = 0", last_call());
    board::hdmi_av::request_resolution(true);
    EXPECT_EQ("NOTICE plug \"hot plug wants the resolution sent again\"", last_call());
    EXPECT_EQ("1", now("resolution_requested"));
    EXPECT_EQ(TRUE, fgIsHotPlugChgRes());
    EXPECT_EQ(TRUE, fgIsHotPlugChgRes());
    EXPECT_EQ("fgIsHotPlugChgRes() = 1", last_call());
    board::hdmi_av::request_resolution(false);
    EXPECT_EQ("NOTICE plug \"hot plug wants no resolution\"", last_call());
    EXPECT_EQ(FALSE, fgIsHotPlugChgRes());
    EXPECT_EQ("0", now("resolution_requested"));
}

TEST_F(HdmiAv, PostChgRes_KeepsTheMode)
{
    vPostChgRes(12);
    EXPECT_EQ("vPostChgRes(RES_1080P60HZ)", last_call());
    EXPECT_EQ("RES_1080P60HZ", now("posted_resolution"));
    vPostChgRes(255);
    EXPECT_EQ("vPostChgRes(255)", last_call());
    EXPECT_EQ("255", now("posted_resolution"));
}

TEST_F(HdmiAv, PostChgInputCS_KeepsTheColourSpace)
{
    vPostChgInputCS(DRV_PMX_CS_YCBCR_601);
    EXPECT_EQ("vPostChgInputCS(DRV_PMX_CS_YCBCR_601)", last_call());
    EXPECT_EQ("DRV_PMX_CS_YCBCR_601", now("posted_colour_space"));
    vPostChgInputCS(static_cast<DRV_PMX_COLOR_SPACE_T>(7));
    EXPECT_EQ("vPostChgInputCS(7)", last_call());
    EXPECT_EQ("7", now("posted_colour_space"));
}

TEST_F(HdmiAv, NotifyScomResChgOK_IsCounted)
{
    vSendAvdNotifyScomResChgOK();
    EXPECT_EQ("vSendAvdNotifyScomResChgOK()", last_call());
    EXPECT_EQ("1", now("change_ok_notices"));
    vSendAvdNotifyScomResChgOK();
    EXPECT_EQ("2", now("change_ok_notices"));
}

TEST_F(HdmiAv, SetCcirOutBeforeMixer_KeepsTheSide)
{
    vSetCcirOutBeforeMixer(1);
    EXPECT_EQ("vSetCcirOutBeforeMixer(1)", last_call());
    EXPECT_EQ("1", now("ccir_before_mixer"));
    vSetCcirOutBeforeMixer(0);
    EXPECT_EQ("vSetCcirOutBeforeMixer(0)", last_call());
    EXPECT_EQ("0", now("ccir_before_mixer"));
}

TEST_F(HdmiAv, Fault_AnswersInsteadOfActing)
{
    UINT8 value = 2;
    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T query{ RES_1080P60HZ, 60, 0, 0 };
    answer_always("fgPmxDrvSetAvd", 0);
    answer_always("fgPmxDrvGetAvdInfo", 0);
    answer_always("i4GetHotPlugStatus", -1);
    answer_always("fgIsHotPlugChgRes", 1);
    EXPECT_EQ(FALSE, fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, &value, 1));
    EXPECT_EQ("fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, 2, 1) = 0", last_call());
    EXPECT_EQ(FALSE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query));
    EXPECT_EQ("fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, {u4ResCheck=RES_1080P60HZ, u2VsyncFreq=60, "
              "u4ValidAutoRes=RES_480I, u2ValidAutoVfreq=0}) = 0",
              last_call());
    EXPECT_EQ(0u, query.u4ValidAutoRes);
    EXPECT_EQ(-1, i4GetHotPlugStatus());
    EXPECT_EQ(TRUE, fgIsHotPlugChgRes());
    EXPECT_EQ(HDMI_AS_NEW, board::hdmi_av::state().to_text());
}

} // namespace
