// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** What is handed to the HDMI/AV driver: TV system, supported resolution, deep colour, automatic resolution. */
#include <algorithm>

#include "board/hdmi_av.h"
#include "tests/support/layer_fixture.h"

using TvSystem = LayerTest;
using SupportedRes = LayerTest;
using DeepColour = LayerTest;
using UiResAuto = LayerTest;

namespace
{

/** Leave ones on the stack where the next call's locals will be. */
[[gnu::noinline]] void fill_stack()
{
    volatile unsigned char bytes[2048];
    for (volatile unsigned char& byte : bytes)
        byte = 0xFF;
}

std::string query(unsigned resolution, unsigned frequency, unsigned chosen, unsigned chosen_frequency)
{
    return "fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, {u4ResCheck=" + std::to_string(resolution) +
           ", u2VsyncFreq=" + std::to_string(frequency) + ", u4ValidAutoRes=" + std::to_string(chosen) +
           ", u2ValidAutoVfreq=" + std::to_string(chosen_frequency) + "})";
}

} // namespace

TEST_F(TvSystem, SetTVSystem_SendsFrequencyAndAutomatic)
{
    started();
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetTVSystem(0, 50, TRUE));
    EXPECT_TRACE("fgPmxDrvSetAvd(PMX_SET_UI_TV_SYSTEM, {u2_Vfreq=50, fgAutoEnable=1}, 1) = 1");
    EXPECT_EQ(1u, PMX_SetTVSystem(0, 60, FALSE));
    EXPECT_TRACE("fgPmxDrvSetAvd(PMX_SET_UI_TV_SYSTEM, {u2_Vfreq=60, fgAutoEnable=0}, 1) = 1");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(TvSystem, SetTVSystem_EveryFrequency_FiveAreSent)
{
    started();
    constexpr unsigned sent[] = { 24, 25, 30, 50, 60 };
    for (unsigned frequency = 0; frequency < 0x10000; ++frequency)
    {
        const bool is_sent = std::find(std::begin(sent), std::end(sent), frequency) != std::end(sent);
        ASSERT_EQ(is_sent ? 1u : 0u, PMX_SetTVSystem(0, static_cast<UINT16>(frequency), TRUE)) << frequency;
    }
    EXPECT_TRACE(R"(
        fgPmxDrvSetAvd(2, {u2_Vfreq=24, fgAutoEnable=1}, 1)
        fgPmxDrvSetAvd(2, {u2_Vfreq=25, fgAutoEnable=1}, 1)
        fgPmxDrvSetAvd(2, {u2_Vfreq=30, fgAutoEnable=1}, 1)
        fgPmxDrvSetAvd(2, {u2_Vfreq=50, fgAutoEnable=1}, 1)
        fgPmxDrvSetAvd(2, {u2_Vfreq=60, fgAutoEnable=1}, 1)
    )");
}

TEST_F(TvSystem, SetTVSystem_59Or48_RefusedAndNothingIsSent)
{
    started();
    EXPECT_EQ(0u, PMX_SetTVSystem(0, 59, TRUE));
    EXPECT_EQ(0u, PMX_SetTVSystem(0, 48, FALSE));
    EXPECT_NO_TRACE();
}

TEST_F(TvSystem, SetTVSystem_Automatic_IsSentAsGiven)
{
    started();
    for (unsigned automatic = 0; automatic < 256; ++automatic)
    {
        EXPECT_EQ(1u, PMX_SetTVSystem(0, 24, static_cast<BOOL>(automatic)));
        EXPECT_TRACE("fgPmxDrvSetAvd(PMX_SET_UI_TV_SYSTEM, {u2_Vfreq=24, fgAutoEnable=" + std::to_string(automatic) +
                     "}, 1)");
    }
}

TEST_F(TvSystem, SetTVSystem_DriverRefuses_OneAllTheSame)
{
    started();
    board::faults::set({ "fgPmxDrvSetAvd", FALSE });
    EXPECT_EQ(1u, PMX_SetTVSystem(0, 30, TRUE));
    EXPECT_TRACE("fgPmxDrvSetAvd(PMX_SET_UI_TV_SYSTEM, {u2_Vfreq=30, fgAutoEnable=1}, 1) = 0");
}

TEST_F(TvSystem, SetTVSystem_OtherMixerId_RefusedAndNothingIsSent)
{
    started();
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        for (const UINT16 frequency : { 24, 25, 30, 50, 60, 59 })
            EXPECT_EQ(0u, PMX_SetTVSystem(static_cast<UCHAR>(id), frequency, TRUE)) << id;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SupportedRes, ChkSupportedRes_GivesWhatTheDriverWouldChoose)
{
    started();
    board::hdmi_av::choose_resolution(board::hdmi_av::Resolution{ RES_1080I50HZ, 50 });
    const RecordSnapshot before;
    UCHAR mode = 99;
    UINT16 frequency = 99;
    EXPECT_EQ(1u, PMX_ChkSupportedRes(0, RES_1080P60HZ, 60, &mode, &frequency));
    EXPECT_EQ(RES_1080I50HZ, mode);
    EXPECT_EQ(50, frequency);
    EXPECT_TRACE(query(RES_1080P60HZ, 60, RES_1080I50HZ, 50) + " = 1");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SupportedRes, ChkSupportedRes_EveryResolutionAndWideFrequencies_AreAskedAsGiven)
{
    started();
    for (unsigned asked = 0; asked < 256; ++asked)
    {
        const unsigned hertz = asked * 257; // both bytes
        UCHAR mode = static_cast<UCHAR>(asked + 1);
        UINT16 frequency = static_cast<UINT16>(hertz + 1);
        EXPECT_EQ(1u, PMX_ChkSupportedRes(0, static_cast<UCHAR>(asked), static_cast<UINT16>(hertz), &mode, &frequency));
        EXPECT_EQ(asked, mode);
        EXPECT_EQ(hertz, frequency);
        EXPECT_TRACE(query(asked, hertz, asked, hertz));
    }
}

TEST_F(SupportedRes, ChkSupportedRes_WideAnswer_LowEightBitsOfTheResolutionAndTheWholeFrequency)
{
    started();
    board::hdmi_av::choose_resolution(board::hdmi_av::Resolution{ 0xABCDEF00u + RES_576P, 0xFEDC });
    UCHAR mode[3] = { 99, 99, 99 };
    UINT16 frequency[3] = { 99, 99, 99 };
    EXPECT_EQ(1u, PMX_ChkSupportedRes(0, RES_480I, 60, &mode[1], &frequency[1]));
    EXPECT_EQ(99, mode[0]);
    EXPECT_EQ(RES_576P, mode[1]);
    EXPECT_EQ(99, mode[2]);
    EXPECT_EQ(99, frequency[0]);
    EXPECT_EQ(0xFEDC, frequency[1]);
    EXPECT_EQ(99, frequency[2]);
}

TEST_F(SupportedRes, ChkSupportedRes_DriverHasNoAnswer_NothingIsWritten)
{
    started();
    board::faults::set({ "fgPmxDrvGetAvdInfo", FALSE, board::Fault::When::Always });
    UCHAR mode = 99;
    UINT16 frequency = 999;
    fill_stack();
    EXPECT_EQ(0u, PMX_ChkSupportedRes(0, RES_720P60HZ, 60, &mode, &frequency));
    EXPECT_EQ(99, mode);
    EXPECT_EQ(999, frequency);
    EXPECT_TRACE(query(RES_720P60HZ, 60, 0, 0) + " = 0");
    EXPECT_EQ(0u, PMX_ChkSupportedRes(0, RES_720P60HZ, 60, nullptr, nullptr));
}

TEST_F(SupportedRes, ChkSupportedRes_NullPointers_AreNotTestedAndTheDriverIsAsked)
{
    started();
    board::faults::set({ "fgPmxDrvGetAvdInfo", FALSE, board::Fault::When::Always });
    UCHAR mode = 99;
    UINT16 frequency = 999;
    EXPECT_EQ(0u, PMX_ChkSupportedRes(0, RES_576P, 50, nullptr, nullptr));
    EXPECT_TRACE(query(RES_576P, 50, 0, 0) + " = 0");
    EXPECT_EQ(0u, PMX_ChkSupportedRes(0, RES_576P, 50, &mode, nullptr));
    EXPECT_TRACE(query(RES_576P, 50, 0, 0) + " = 0");
    EXPECT_EQ(0u, PMX_ChkSupportedRes(0, RES_576P, 50, nullptr, &frequency));
    EXPECT_TRACE(query(RES_576P, 50, 0, 0) + " = 0");
    EXPECT_EQ(99, mode);
    EXPECT_EQ(999, frequency);
}

TEST_F(SupportedRes, ChkSupportedRes_DriverWritesNoAnswer_ItIsZero)
{
    started();
    board::faults::set({ "fgPmxDrvGetAvdInfo", TRUE });
    UCHAR mode = 99;
    UINT16 frequency = 999;
    fill_stack();
    EXPECT_EQ(1u, PMX_ChkSupportedRes(0, RES_720P60HZ, 60, &mode, &frequency));
    EXPECT_EQ(0, mode);
    EXPECT_EQ(0, frequency);
    EXPECT_TRACE(query(RES_720P60HZ, 60, 0, 0) + " = 1");
}

TEST_F(SupportedRes, ChkSupportedRes_AnyOtherAnswerThanFalse_IsAnAnswer)
{
    started();
    for (const int answer : { 2, 128, 255 })
    {
        board::faults::set({ "fgPmxDrvGetAvdInfo", answer });
        UCHAR mode = 99;
        UINT16 frequency = 999;
        EXPECT_EQ(1u, PMX_ChkSupportedRes(0, RES_720P60HZ, 60, &mode, &frequency));
        EXPECT_TRACE(query(RES_720P60HZ, 60, 0, 0) + " = " + std::to_string(answer));
        EXPECT_EQ(0, mode);
        EXPECT_EQ(0, frequency);
    }
}

TEST_F(SupportedRes, ChkSupportedRes_OtherMixerId_RefusedAndNothingIsAsked)
{
    started();
    const RecordSnapshot before;
    UCHAR mode = 99;
    UINT16 frequency = 999;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_ChkSupportedRes(static_cast<UCHAR>(id), RES_480P, 60, &mode, &frequency)) << id;
    EXPECT_EQ(0u, PMX_ChkSupportedRes(1, RES_480P, 60, nullptr, nullptr));
    EXPECT_EQ(99, mode);
    EXPECT_EQ(999, frequency);
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(DeepColour, SetHdmiDeepColor_EveryCode_IsSentAsOneByte)
{
    started();
    const RecordSnapshot before;
    for (unsigned code = 0; code < 256; ++code)
    {
        EXPECT_EQ(1u, PMX_SetHdmiDeepColor(0, static_cast<UCHAR>(code)));
        EXPECT_TRACE("fgPmxDrvSetAvd(PMX_CHG_DEEP_COLOR_BIT, " + std::to_string(code) + ", 1) = 1");
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(DeepColour, SetHdmiDeepColor_DriverRefuses_Zero)
{
    started();
    board::faults::set({ "fgPmxDrvSetAvd", FALSE });
    EXPECT_EQ(0u, PMX_SetHdmiDeepColor(0, 2));
    EXPECT_TRACE("fgPmxDrvSetAvd(PMX_CHG_DEEP_COLOR_BIT, 2, 1) = 0");
    EXPECT_EQ(1u, PMX_SetHdmiDeepColor(0, 2));
}

TEST_F(DeepColour, SetHdmiDeepColor_AnyOtherAnswerThanFalse_One)
{
    started();
    for (const int answer : { 1, 2, 128, 255 })
    {
        board::faults::set({ "fgPmxDrvSetAvd", answer });
        EXPECT_EQ(1u, PMX_SetHdmiDeepColor(0, 255));
        EXPECT_TRACE("fgPmxDrvSetAvd(PMX_CHG_DEEP_COLOR_BIT, 255, 1) = " + std::to_string(answer));
    }
}

TEST_F(DeepColour, SetHdmiDeepColor_OtherMixerId_OneAndNothingIsSent)
{
    started();
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(1u, PMX_SetHdmiDeepColor(static_cast<UCHAR>(id), static_cast<UCHAR>(id))) << id;
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(UiResAuto, RecordUiResAuto_EveryValue_IsSentAsGiven)
{
    started();
    const RecordSnapshot before;
    for (unsigned automatic = 0; automatic < 256; ++automatic)
    {
        PMX_RecordUiResAuto(static_cast<BOOL>(automatic));
        EXPECT_TRACE("fgPmxDrvSetAvd(PMX_CHG_UI_RES_AUTO, " + std::to_string(automatic) + ", 1) = 1");
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(UiResAuto, RecordUiResAuto_DriverRefuses_Ignored)
{
    started();
    board::faults::set({ "fgPmxDrvSetAvd", FALSE });
    PMX_RecordUiResAuto(TRUE);
    EXPECT_TRACE("fgPmxDrvSetAvd(PMX_CHG_UI_RES_AUTO, 1, 1) = 0");
}

TEST_F(UiResAuto, CommandNumbers_AreTheDriversOwn)
{
    started();
    EXPECT_EQ(1u, PMX_SetTVSystem(0, 60, TRUE));
    EXPECT_EQ(1u, PMX_SetHdmiDeepColor(0, 0));
    PMX_RecordUiResAuto(TRUE);
    UCHAR mode = 0;
    UINT16 frequency = 0;
    EXPECT_EQ(1u, PMX_ChkSupportedRes(0, RES_480P, 60, &mode, &frequency));
    EXPECT_TRACE(R"(
        fgPmxDrvSetAvd(2, *, 1)
        fgPmxDrvSetAvd(8, *, 1)
        fgPmxDrvSetAvd(13, *, 1)
        fgPmxDrvGetAvdInfo(1, *)
    )");
}
