// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <algorithm>

#include <nlohmann/json.hpp>

#include "tests/layer/mode_facts.h"
#include "tools/pmxboard/decode/report.h"
#include "tools/pmxboard/decode/story.h"
#include "tools/pmxboard/decode/words.h"

namespace
{

using namespace pmxboard::decode;

std::vector<std::string> words_of(const std::string& log)
{
    StatusReport report;
    for (const Item& item : read_log(log).items)
        report.add(item);
    return report.words();
}

void expect_line(const std::vector<std::string>& lines, const std::string& line)
{
    std::string all;
    for (const std::string& one : lines)
        all += one + "\n";
    EXPECT_NE(lines.end(), std::find(lines.begin(), lines.end(), line)) << line << "\nnot in\n" << all;
}

std::string output_line(int output, const std::string& rest)
{
    return "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[" + std::to_string(output) + "]." + rest + "\n";
}

std::string ccir_line(const std::string& rest)
{
    return "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[0].eCcirDrvInfo." + rest + " \n";
}

TEST(DecodeReport, E_IsTheBusWidth)
{
    const auto words = words_of("[PMX] PMX(0) E(24 ), Mode(12) TVTP(0 ), FQ(60 ), DitalOut(1 ), u4Phase(2 ), "
                                "PMode(0 ), DBit(24 ),\n");
    expect_line(words, "mixer format 1080p 60 Hz at 60 Hz, TV type NTSC");
    expect_line(words, "E(24) is the digital port's bus width; the report does not show the master enable");
    expect_line(words, "digital port: switch on, 24 bits, phase 2, proprietary mode 0");
}

/** The modes that hang on a bit, in words: "480i (and 2D 480i 60 Hz)". */
std::string modes_on_bit(int bit)
{
    std::string first;
    std::string others;
    for (const mode_facts::Mode& mode : mode_facts::all_modes)
    {
        if (mode.capability != bit)
            continue;
        if (first.empty())
            first = mode_words(mode.enumerator);
        else
            others += (others.empty() ? "" : ", ") + mode_words(mode.enumerator);
    }
    return others.empty() ? first : first + " (and " + others + ")";
}

std::string modes_on(UINT32 bits)
{
    std::string list;
    for (int bit = 0; bit < 32; ++bit)
    {
        const std::string modes = (bits >> bit & 1) != 0 ? modes_on_bit(bit) : "";
        list += (list.empty() || modes.empty() ? "" : ", ") + modes;
    }
    return list;
}

TEST(DecodeReport, TheModesOfABitStandTogether)
{
    EXPECT_TRUE(
        modes_on(0x1011).starts_with("480i (and 2D 480i 60 Hz), 720p 60 Hz (and 3D 720p 60 Hz, top and bottom"));
}

TEST(DecodeReport, Capability_SignedDecimalBecomesBits)
{
    const auto cap = [](const std::string& word) {
        return words_of("[PMX] PMX(0) CBE(0 ), MuteE(0 ), AS(3 ), BgC(1081472 ), Cap(" + word +
                        " ), Sharp(0 ), fgAspNext(0 ),\n");
    };
    expect_line(cap("2147221503"), "capability 0x7FFBFFFF: admits every mode that has a bit");
    expect_line(cap("-1"), "capability 0xFFFFFFFF: admits every mode that has a bit");
    expect_line(cap("-2097153"), "of the features it admits gamma, contrast, hue, saturation, digital port, "
                                 "sharpness, black level; refuses brightness");
    expect_line(cap("4113"), "capability 0x00001011: admits " + modes_on(0x1011) + "; refuses " + modes_on(~0x1011u));
    expect_line(cap("0"), "capability 0x00000000: admits no mode that has a bit");
}

TEST(DecodeReport, MasterColorSpaceOfAPort_IsItsSources)
{
    const auto words =
        words_of("[PMX] PMX(0 ), eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
                 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[0]'s CompT(65 ), CompId(0 ),  Connected(1 ) \n"
                 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[0]'s fgE(1 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n"
                 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[0].eInputColorMode(DRV_GFX_COLOR_MODE_YCBCR)\n"
                 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[0].eMasterColorSpace(DRV_PMX_CS_YCBCR_601)\n");
    ASSERT_EQ(2u, words.size());
    EXPECT_NE(std::string::npos, words[1].find("source "));
    EXPECT_NE(std::string::npos, words[1].find("(labelled eMasterColorSpace)"));
    EXPECT_NE(std::string::npos, words[0].find("709")) << words[0];
    EXPECT_NE(std::string::npos, words[1].find("601")) << words[1];
}

TEST(DecodeReport, ModesFrom39_AreNamedAsTheyAreMeant)
{
    const auto mode = [](const std::string& name) {
        return words_of(output_line(1, "fgOutputEnable(1)") + output_line(1, "eResMode(" + name + ")")).front();
    };
    EXPECT_EQ("output HDMI: on, 1080p 60 Hz", mode("RES_1080P60HZ"));
    EXPECT_EQ("output HDMI: on, 2D 576i 50 Hz", mode("RES_2D_576I50HZ"));
    EXPECT_EQ("output HDMI: on, 2D 640x480 (reported as RES_PANEL_AUO_B089AW01)", mode("RES_PANEL_AUO_B089AW01"));
    EXPECT_EQ("output HDMI: on, panel 1024x600 (reported as RES_MODE_NUM)", mode("RES_MODE_NUM"));
    EXPECT_EQ("output HDMI: on, 3D 720p 60 Hz, top and bottom (reported as RES_AUTO)", mode("RES_AUTO"));
}

TEST(DecodeReport, ModeAbove41_HasNoLine)
{
    const auto words = words_of(output_line(0, "fgOutputEnable(1)") + output_line(0, "u4VFreq(50)") +
                                ccir_line("eDgiFmt(CCIR_NON_USED)"));
    expect_line(words, "output digital port: on, no line with a mode, as of those above 41");
}

TEST(DecodeReport, TwelveBitOutputFormat_IsNotTheInputs)
{
    const auto words = words_of(output_line(0, "fgOutputEnable(1)") + ccir_line("eDgiFmt(CCIR_YC422_16BIT)") +
                                ccir_line("eDgiMode(CCIR_601_MODE)") + ccir_line("eDgiFmt(CCIR_YCMIX_12BIT)") +
                                ccir_line("eDgoMode(CCIR_656_MODE)"));
    expect_line(words, "output digital port: on, mode not in the log, digital input CCIR_601_MODE CCIR_YC422_16BIT, "
                       "digital output CCIR_656_MODE CCIR_YCMIX_12BIT (the output's format, labelled as the input's)");
}

TEST(DecodeReport, TwelveBitInputFormat_StaysTheInputs)
{
    const auto words = words_of(ccir_line("eDgiFmt(CCIR_YCMIX_12BIT)") + ccir_line("eDgiMode(CCIR_656_MODE)") +
                                ccir_line("eDgoFmt(CCIR_NON_USED)") + ccir_line("eDgoMode(CCIR_INVALID)"));
    ASSERT_EQ(1u, words.size());
    EXPECT_TRUE(words[0].ends_with("digital input CCIR_656_MODE CCIR_YCMIX_12BIT")) << words[0];
}

TEST(DecodeReport, TwelveBitOutputFormatBehindItsInputsMode_IsNotTheInputs)
{
    const auto words = words_of(ccir_line("eDgiMode(CCIR_601_MODE)") + ccir_line("eDgiFmt(CCIR_YCMIX_12BIT)") +
                                ccir_line("eDgoMode(CCIR_656_MODE)"));
    ASSERT_EQ(1u, words.size());
    EXPECT_NE(std::string::npos, words[0].find(", digital output CCIR_656_MODE CCIR_YCMIX_12BIT (")) << words[0];
}

TEST(DecodeReport, NoLineOfTheExternalChip_IsToldWhereOneWasDue)
{
    const std::string last_port =
        "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[7].eMasterColorSpace(DRV_PMX_CS_YCBCR_601)\n";
    const std::string chip = "[PMX] PMX(0) _arPmxConf.rDrvExtSc(DRV_NON_EXT_CHIP) \n";
    const std::string output = output_line(0, "fgOutputEnable(1)");
    const std::string missing = "external chip: no line, as of DRV_RX_BYPASS_TX or a value without a name";
    expect_line(words_of(last_port + output), missing);
    for (const std::string& log : { last_port, output, last_port + chip + output })
    {
        const auto words = words_of(log);
        EXPECT_EQ(words.end(), std::find(words.begin(), words.end(), missing)) << log;
    }
}

TEST(DecodeReport, WhatNoPortOutputOrPositionHas_IsLeftOut)
{
    for (const std::string index : { "-1", "8", "99999999999999999999" })
    {
        const std::string lines = "[PMX] PMX(0 ), plane " + index + "'s order is 3 \n" +
                                  "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[" + index +
                                  "]'s CompT(65 ), CompId(0 ),  Connected(1 ) \n" +
                                  "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[" + index + "].fgOutputEnable(1)\n";
        EXPECT_TRUE(words_of(lines).empty()) << index;
        const Story story = tell(read_log("Mode(12) CS(1)\n" + lines));
        ASSERT_EQ(1u, story.events.size()) << index;
        EXPECT_EQ(4u, story.events[0].last_line) << index;
    }
}

TEST(DecodeReport, AnOrderThatIsNoNumberOfTheLayer_IsSaidAllTheSame)
{
    expect_line(words_of("[PMX] PMX(0 ), u4PlaneOrder(0xffffffffffffffffffff ), \n"),
                "packed order 0xffffffffffffffffffff: planes 1 to 8 show sources 0 0 0 0 0 0 0 0");
}

TEST(DecodeReport, AReportThatLostItsBegin_IsAnother)
{
    const std::string fifth = "[PMX] PMX(0 ), fgOSD5(1 ), \n";
    const std::string port = ccir_line("eDgiFmt(CCIR_YC422_16BIT)") + ccir_line("eDgiMode(CCIR_601_MODE)") +
                             ccir_line("eDgoFmt(CCIR_NON_USED)") + ccir_line("eDgoMode(CCIR_INVALID)");
    const std::string mislabelled = ccir_line("eDgiFmt(CCIR_YC422_16BIT)") + ccir_line("eDgiMode(CCIR_601_MODE)") +
                                    ccir_line("eDgiFmt(CCIR_YCMIX_12BIT)") + ccir_line("eDgoMode(CCIR_656_MODE)");
    for (const std::string& one : { fifth, port, mislabelled })
    {
        const Story story = tell(read_log(one + one));
        ASSERT_EQ(2u, story.events.size()) << one;
        EXPECT_EQ(story.events[0].last_line + 1, story.events[1].first_line) << one;
        EXPECT_EQ(2 * story.events[0].last_line, story.events[1].last_line) << one;
    }
}

TEST(DecodeReport, TwoReports_AreTwoEvents)
{
    const std::string one = "Mode(12) CS(1)\n[PMX] PMX(0 ), fgOSD5(1 ), \n";
    const Story story = tell(read_log(one + one));
    ASSERT_EQ(2u, story.events.size());
    EXPECT_EQ(2u, story.events[0].last_line);
    EXPECT_EQ(3u, story.events[1].first_line);
    expect_line(story.events[1].report->words(), "fifth OSD plane 1");
}

TEST(DecodeReport, Value_HasTheFieldsOfTheRecordPutRight)
{
    StatusReport report;
    for (const Item& item : read_log(output_line(1, "eResMode(RES_AUTO)")).items)
        report.add(item);
    EXPECT_NE(std::string::npos, report.json().dump().find("\"eResMode\":\"RES_3D_720P60HZ_TB\""))
        << report.json().dump();
}

} // namespace
