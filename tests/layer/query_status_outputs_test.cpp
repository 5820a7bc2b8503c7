// SPDX-License-Identifier: MIT OR GPL-2.0-only
// PMX_QueryStatus: the lines of the four outputs, every value of their enumerations with the blanks that go with it.

#include <array>
#include <cstdint>
#include <string>

#include <gtest/gtest.h>

#include "query_status.h"

namespace
{

// The report's own names: from 39 on they are one entry behind the enumeration, and they end at 41.
constexpr std::array<const char*, 42> reportedModes = {
    /*  0 */ "RES_480I",
    /*  1 */ "RES_576I",
    /*  2 */ "RES_480P",
    /*  3 */ "RES_576P",
    /*  4 */ "RES_480P_1440",
    /*  5 */ "RES_576P_1440",
    /*  6 */ "RES_480P_2880",
    /*  7 */ "RES_576P_2880",
    /*  8 */ "RES_720P60HZ",
    /*  9 */ "RES_720P50HZ",
    /* 10 */ "RES_1080I60HZ",
    /* 11 */ "RES_1080I50HZ",
    /* 12 */ "RES_1080P60HZ",
    /* 13 */ "RES_1080P50HZ",
    /* 14 */ "RES_1080P30HZ",
    /* 15 */ "RES_1080P25HZ",
    /* 16 */ "RES_480I_2880",
    /* 17 */ "RES_576I_2880",
    /* 18 */ "RES_1080P24HZ",
    /* 19 */ "RES_1080P23_976HZ",
    /* 20 */ "RES_1080P29_97HZ",
    /* 21 */ "RES_3D_1080P23HZ",
    /* 22 */ "RES_3D_1080P24HZ",
    /* 23 */ "RES_3D_720P60HZ",
    /* 24 */ "RES_3D_720P50HZ",
    /* 25 */ "RES_3D_720P30HZ",
    /* 26 */ "RES_3D_720P25HZ",
    /* 27 */ "RES_3D_576P50HZ",
    /* 28 */ "RES_3D_480P60HZ",
    /* 29 */ "RES_3D_1080I60HZ",
    /* 30 */ "RES_3D_1080I50HZ",
    /* 31 */ "RES_3D_1080I30HZ",
    /* 32 */ "RES_3D_1080I25HZ",
    /* 33 */ "RES_3D_576I25HZ",
    /* 34 */ "RES_3D_480I30HZ",
    /* 35 */ "RES_3D_576I50HZ",
    /* 36 */ "RES_3D_480I60HZ",
    /* 37 */ "RES_2D_480I60HZ",
    /* 38 */ "RES_2D_576I50HZ",
    /* 39 */ "RES_PANEL_AUO_B089AW01",
    /* 40 */ "RES_MODE_NUM",
    /* 41 */ "RES_AUTO",
};

// Blanks around the line's end are part of the line, and which ones differs from value to value.
constexpr std::array<const char*, 10> inputFormats = {
    "eDgiFmt(CCIR_NON_USED) \n ",    "eDgiFmt(CCIR_YCMIX_8BIT)  \n",  "eDgiFmt(CCIR_YCMIX_10BIT)  \n",
    "eDgiFmt(CCIR_YCMIX_12BIT)  \n", "eDgiFmt(CCIR_YC422_16BIT)  \n", "eDgiFmt(CCIR_YC422_20BIT) \n",
    "eDgiFmt(CCIR_YC422_24BIT)  \n", "eDgiFmt(CCIR_YC444_24BIT)  \n", "eDgiFmt(CCIR_YC444_30BIT)  \n",
    "eDgiFmt(CCIR_YC444_36BIT) \n ",
};
constexpr std::array<const char*, 10> outputFormats = {
    "eDgoFmt(CCIR_NON_USED) \n ",    "eDgoFmt(CCIR_YCMIX_8BIT)  \n",
    "eDgoFmt(CCIR_YCMIX_10BIT)  \n", "eDgiFmt(CCIR_YCMIX_12BIT)  \n" /* labelled as the input */,
    "eDgoFmt(CCIR_YC422_16BIT)  \n", "eDgoFmt(CCIR_YC422_20BIT)  \n",
    "eDgoFmt(CCIR_YC422_24BIT) \n ", "eDgoFmt(CCIR_YC444_24BIT) \n ",
    "eDgoFmt(CCIR_YC444_30BIT)  \n", "eDgoFmt(CCIR_YC444_36BIT)  \n",
};
constexpr std::array<const char*, 3> inputModes = { "eDgiMode(CCIR_INVALID) \n ", "eDgiMode(CCIR_601_MODE)  \n",
                                                    "eDgiMode(CCIR_656_MODE)  \n" };
constexpr std::array<const char*, 3> outputModes = { "eDgoMode(CCIR_INVALID) \n ", "eDgoMode(CCIR_601_MODE) \n ",
                                                     "eDgoMode(CCIR_656_MODE)  \n" };

std::string output(unsigned i)
{
    return "arOutputConf[" + std::to_string(i) + "]";
}

std::string label(unsigned i)
{
    return "[PMX] PMX(0 ), _arPmxConf[0]." + output(i) + ".";
}

class QueryStatusOutputs : public QueryStatus
{
protected:
    // A field of the digital port's set-up shows as its value's line, on each output; other values have none.
    template <std::size_t number>
    void expect_port_lines(const std::string& field, const std::array<const char*, number>& lines) const
    {
        for (unsigned i = 0; i < 4; ++i)
        {
            const std::string start = "[PMX]PMX(0,) _arPmxConf[0]." + output(i) + ".eCcirDrvInfo.";
            const Place place = { output(i) + ".eCcirDrvInfo." + field, start + lines[0] };
            for (std::size_t value = 0; value < number; ++value)
                expect_line(place, static_cast<std::int64_t>(value), { start + lines[value] });
            for (std::int64_t value = static_cast<std::int64_t>(number); value <= 12; ++value)
                expect_line(place, value, {});
            for (std::int64_t value : { 256LL, 0x7FFFFFFFLL, 0x80000000LL, 0xFFFFFFFFLL })
                expect_line(place, value, {});
        }
    }
};

} // namespace

TEST_F(QueryStatusOutputs, ResMode_ByTheReportsOwnNames_NoneAbove41)
{
    for (unsigned i = 0; i < 4; ++i)
    {
        const Place place = { output(i) + ".eResMode",
                              label(i) +
                                  (i == PMX_OUTPUT_CVBS ? "eResMode(RES_480I)\n" : "eResMode(RES_1080P60HZ)\n") };
        for (std::size_t mode = 0; mode < reportedModes.size(); ++mode)
            expect_line(place, static_cast<std::int64_t>(mode),
                        { label(i) + "eResMode(" + reportedModes[mode] + ")\n" });
        for (std::int64_t mode = 42; mode <= 60; ++mode)
            expect_line(place, mode, {});
        for (std::int64_t mode : { 255LL, 256LL, 0x7FFFFFFFLL, 0x80000000LL, 0xFFFFFFFFLL })
            expect_line(place, mode, {});
    }
}

TEST_F(QueryStatusOutputs, ResMode_640x480IsReportedAsThePanel)
{
    expect_line({ "arOutputConf[1].eResMode", label(1) + "eResMode(RES_1080P60HZ)\n" }, RES_2D_640x480HZ,
                { label(1) + "eResMode(RES_PANEL_AUO_B089AW01)\n" });
}

TEST_F(QueryStatusOutputs, ResMode_ThePanelAndTopAndBottom60HzAreReportedAsTheEndOfAnOlderList)
{
    const Place place = { "arOutputConf[2].eResMode", label(2) + "eResMode(RES_1080P60HZ)\n" };
    expect_line(place, RES_PANEL_AUO_B089AW01, { label(2) + "eResMode(RES_MODE_NUM)\n" });
    expect_line(place, RES_3D_720P60HZ_TB, { label(2) + "eResMode(RES_AUTO)\n" });
}

TEST_F(QueryStatusOutputs, ResMode_FromTopAndBottom50HzOnThereIsNoLine)
{
    const Place place = { "arOutputConf[0].eResMode", label(0) + "eResMode(RES_1080P60HZ)\n" };
    for (std::int64_t mode = RES_3D_720P50HZ_TB; mode <= RES_AUTO; ++mode)
        expect_line(place, mode, {});
}

TEST_F(QueryStatusOutputs, OutputEnable)
{
    for (unsigned i = 0; i < 4; ++i)
    {
        const Place place = { output(i) + ".fgOutputEnable", label(i) + "fgOutputEnable(1)\n" };
        expect_line(place, 0, { label(i) + "fgOutputEnable(0)\n" });
        expect_line(place, 255, { label(i) + "fgOutputEnable(255)\n" });
    }
}

TEST_F(QueryStatusOutputs, VFreq_IsSignedDecimal)
{
    for (unsigned i = 0; i < 4; ++i)
    {
        const Place place = { output(i) + ".u4VFreq", label(i) + "u4VFreq(60)\n" };
        expect_line(place, 50, { label(i) + "u4VFreq(50)\n" });
        expect_line(place, 0xFFFFFFFF, { label(i) + "u4VFreq(-1)\n" });
    }
}

TEST_F(QueryStatusOutputs, DgiFmt)
{
    expect_port_lines("eDgiFmt", inputFormats);
}

TEST_F(QueryStatusOutputs, DgoFmt_12BitIsLabelledAsTheInput)
{
    expect_port_lines("eDgoFmt", outputFormats);
}

TEST_F(QueryStatusOutputs, DgiMode)
{
    expect_port_lines("eDgiMode", inputModes);
}

TEST_F(QueryStatusOutputs, DgoMode)
{
    expect_port_lines("eDgoMode", outputModes);
}

TEST_F(QueryStatusOutputs, OmittedLinesLeaveTheOrderOfTheOthersAlone)
{
    for (const char* field : { "eResMode", "eCcirDrvInfo.eDgiFmt", "eCcirDrvInfo.eDgoMode" })
        set_record("arOutputConf[3]." + std::string(field), 99);
    set_record("rDrvExtScl", 99);
    set_record("eMasterColorSpace", 99);
    for (unsigned i = 0; i < 8; ++i)
        set_record("arPortInfo[" + std::to_string(i) + "].eInputColorMode", 99);
    const Lines lines = report();
    ASSERT_EQ(78u - 13u, lines.size());
    const Lines tail(lines.end() - 4, lines.end());
    EXPECT_EQ((Lines{ "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[3].fgOutputEnable(1)\n",
                      "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[3].u4VFreq(60)\n",
                      "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[3].eCcirDrvInfo.eDgiMode(CCIR_INVALID) \n ",
                      "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[3].eCcirDrvInfo.eDgoFmt(CCIR_NON_USED) \n " }),
              tail);
}

TEST_F(QueryStatusOutputs, ResMode_LowSixteenBitsOfAKnownOne_NoLine)
{
    const Place place = { "arOutputConf[1].eResMode", label(1) + "eResMode(RES_1080P60HZ)\n" };
    for (std::int64_t mode = 0; mode < static_cast<std::int64_t>(reportedModes.size()); ++mode)
    {
        expect_line(place, 0x10000 + mode, {});
        expect_line(place, 0x100 + mode, {});
    }
}

TEST_F(QueryStatusOutputs, ResMode_IsReadBehindTheFrequencysLine)
{
    board::at_every_call([](const board::TraceEntry& entry) {
        if (entry.text == label(1) + "u4VFreq(60)\n")
            set_record("arOutputConf[1].eResMode", RES_480P);
    });
    const Lines lines = report();
    board::at_every_call({});
    EXPECT_EQ(with(defaultReport, label(1) + "eResMode(RES_1080P60HZ)\n", { label(1) + "eResMode(RES_480P)\n" }),
              lines);
}
