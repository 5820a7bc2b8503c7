// SPDX-License-Identifier: MIT OR GPL-2.0-only
// PMX_QueryStatus: lines that are not what their labels say, numbers in an unexpected form, names and their absence.

#include <climits>
#include <cstdint>
#include <string>

#include <gtest/gtest.h>

#include "query_status.h"

namespace
{

const std::string modeLine = "Mode(12) CS(1)\n";
const std::string setUpLine = "[PMX] PMX(0) E(24 ), Mode(12) TVTP(0 ), FQ(60 ), DitalOut(1 ), u4Phase(2 ), PMode(0 ), "
                              "DBit(24 ),\n";
const std::string barLine = "[PMX] PMX(0) CBE(0 ), MuteE(0 ), AS(3 ), BgC(1081472 ), Cap(2147221503 ), Sharp(0 ), "
                            "fgAspNext(0 ),\n";
const std::string orderLine = "[PMX] PMX(0 ), u4PlaneOrder(0x76543210 ), \n";
const std::string masterLine = "[PMX] PMX(0 ), eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n";
const std::string chipLine = "[PMX] PMX(0) _arPmxConf.rDrvExtSc(DRV_NON_EXT_CHIP) \n";

std::string port(unsigned i)
{
    return "arPortInfo[" + std::to_string(i) + "]";
}

} // namespace

TEST_F(QueryStatus, E_ShowsTheBusWidthNotTheMasterEnable)
{
    expect_line({ "ucEnable", setUpLine }, 1, { setUpLine });
    expect_line({ "ucEnable", setUpLine }, 77, { setUpLine });
    expect_line({ "ucDigitalBit", setUpLine }, 30,
                { "[PMX] PMX(0) E(30 ), Mode(12) TVTP(0 ), FQ(60 ), DitalOut(1 ), u4Phase(2 ), PMode(0 ), "
                  "DBit(30 ),\n" });
}

TEST_F(QueryStatus, EightBitFieldsAreUnsigned)
{
    expect_line({ "ucDigitalBit", setUpLine }, 255,
                { "[PMX] PMX(0) E(255 ), Mode(12) TVTP(0 ), FQ(60 ), DitalOut(1 ), u4Phase(2 ), PMode(0 ), "
                  "DBit(255 ),\n" });
    expect_line({ "ucMuteEnable", barLine }, 128,
                { "[PMX] PMX(0) CBE(0 ), MuteE(128 ), AS(3 ), BgC(1081472 ), Cap(2147221503 ), Sharp(0 ), "
                  "fgAspNext(0 ),\n" });
}

TEST_F(QueryStatus, BgColor_IsSignedDecimal)
{
    expect_line({ "u4BgColor", barLine }, 0xFF108080,
                { "[PMX] PMX(0) CBE(0 ), MuteE(0 ), AS(3 ), BgC(-15695744 ), Cap(2147221503 ), Sharp(0 ), "
                  "fgAspNext(0 ),\n" });
    expect_line({ "u4BgColor", barLine }, 0xFFFFFFFF,
                { "[PMX] PMX(0) CBE(0 ), MuteE(0 ), AS(3 ), BgC(-1 ), Cap(2147221503 ), Sharp(0 ), "
                  "fgAspNext(0 ),\n" });
}

TEST_F(QueryStatus, Capability_IsSignedDecimal)
{
    expect_line({ "u4Capability", barLine }, 0x80000000,
                { "[PMX] PMX(0) CBE(0 ), MuteE(0 ), AS(3 ), BgC(1081472 ), Cap(-2147483648 ), Sharp(0 ), "
                  "fgAspNext(0 ),\n" });
    expect_line({ "u4Capability", barLine }, 0xFFFFFFFE,
                { "[PMX] PMX(0) CBE(0 ), MuteE(0 ), AS(3 ), BgC(1081472 ), Cap(-2 ), Sharp(0 ), fgAspNext(0 ),\n" });
}

TEST_F(QueryStatus, PlaneOrder_IsHexadecimalPaddedWithBlanks)
{
    const Place place = { "u4PlaneOrder", orderLine };
    expect_line(place, 0, { "[PMX] PMX(0 ), u4PlaneOrder(0x       0 ), \n" });
    expect_line(place, 0x1, { "[PMX] PMX(0 ), u4PlaneOrder(0x       1 ), \n" });
    expect_line(place, 0x06543210, { "[PMX] PMX(0 ), u4PlaneOrder(0x 6543210 ), \n" });
    expect_line(place, 0xFEDCBA98, { "[PMX] PMX(0 ), u4PlaneOrder(0xfedcba98 ), \n" });
}

TEST_F(QueryStatus, PlanePositions_EachShowsItsOwn)
{
    const char* const lines[] = {
        "[PMX] PMX(0 ), plane 0's order is 4 \n", "[PMX] PMX(0 ), plane 1's order is 3 \n",
        "[PMX] PMX(0 ), plane 2's order is 1 \n", "[PMX] PMX(0 ), plane 3's order is 0 \n",
        "[PMX] PMX(0 ), plane 4's order is 2 \n", "[PMX] PMX(0 ), plane 5's order is 5 \n",
        "[PMX] PMX(0 ), plane 6's order is 6 \n", "[PMX] PMX(0 ), plane 7's order is 7 \n",
    };
    for (unsigned i = 0; i < 8; ++i)
        expect_line({ "aucPlaneOrder[" + std::to_string(i) + "]", lines[i] }, 200 + i,
                    { "[PMX] PMX(0 ), plane " + std::to_string(i) + "'s order is " + std::to_string(200 + i) + " \n" });
}

// The master colour space shows in two lines: as a number and by name.
TEST_F(QueryStatus, MasterColorSpace)
{
    const auto expect = [this](std::int64_t number, const std::string& shown, const Lines& byName) {
        set_record("eMasterColorSpace", number);
        EXPECT_EQ(with(with(defaultReport, modeLine, { shown }), masterLine, byName), report()) << number;
    };
    expect(DRV_PMX_CS_YCBCR_601, "Mode(12) CS(0)\n", { "[PMX] PMX(0 ), eMasterColorSpace(DRV_PMX_CS_YCBCR_601)\n" });
    expect(DRV_PMX_CS_YCBCR_709, "Mode(12) CS(1)\n", { "[PMX] PMX(0 ), eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n" });
    expect(DRV_PMX_CS_RGB, "Mode(12) CS(2)\n", { "[PMX] PMX(0 ), eMasterColorSpace(DRV_PMX_CS_RGB)\n" });
    expect(3, "Mode(12) CS(3)\n", {});
    expect(256, "Mode(12) CS(256)\n", {});
    expect(0x7FFFFFFF, "Mode(12) CS(2147483647)\n", {});
    expect(0xFFFFFFFF, "Mode(12) CS(-1)\n", {});
}

TEST_F(QueryStatus, InputColorMode_OfEachPort_OtherValuesHaveNoLine)
{
    for (unsigned i = 0; i < 8; ++i)
    {
        const std::string label = "[PMX] PMX(0 ),_arPmxConf[0]." + port(i) + ".eInputColorMode";
        const Place place = { port(i) + ".eInputColorMode",
                              label + (i < 2 ? "(DRV_GFX_COLOR_MODE_YCBCR)\n" : "(DRV_GFX_COLOR_MODE_RGB)\n") };
        expect_line(place, DRV_GFX_COLOR_MODE_YCBCR, { label + "(DRV_GFX_COLOR_MODE_YCBCR)\n" });
        expect_line(place, DRV_GFX_COLOR_MODE_RGB, { label + "(DRV_GFX_COLOR_MODE_RGB)\n" });
        for (std::int64_t number : { 2LL, 3LL, 256LL, 0x7FFFFFFFLL, 0xFFFFFFFFLL })
            expect_line(place, number, {});
    }
}

TEST_F(QueryStatus, SourceColorSpace_OfEachPort_IsLabelledMaster_OtherValuesHaveNoLine)
{
    for (unsigned i = 0; i < 8; ++i)
    {
        const std::string label = "[PMX] PMX(0 ), _arPmxConf[0]." + port(i) + ".eMasterColorSpace";
        const Place place = { port(i) + ".eSrcColorSpace", label + "(DRV_PMX_CS_YCBCR_709)\n" };
        expect_line(place, DRV_PMX_CS_YCBCR_601, { label + "(DRV_PMX_CS_YCBCR_601)\n" });
        expect_line(place, DRV_PMX_CS_YCBCR_709, { label + "(DRV_PMX_CS_YCBCR_709)\n" });
        expect_line(place, DRV_PMX_CS_RGB, { label + "(DRV_PMX_CS_RGB)\n" });
        for (std::int64_t number : { 3LL, 4LL, 257LL, 0x80000000LL, 0xFFFFFFFFLL })
            expect_line(place, number, {});
    }
}

TEST_F(QueryStatus, PortNumbers)
{
    const std::string first = "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[3]'s ";
    const std::string component = first + "CompT(0 ), CompId(0 ),  Connected(0 ) \n";
    const std::string source = first + "fgE(0 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n";
    expect_line({ port(3) + ".u2CompType", component }, 65535,
                { first + "CompT(65535 ), CompId(0 ),  Connected(0 ) \n" });
    expect_line({ port(3) + ".u2CompId", component }, 32768,
                { first + "CompT(0 ), CompId(32768 ),  Connected(0 ) \n" });
    expect_line({ port(3) + ".fgConnected", component }, 255, { first + "CompT(0 ), CompId(0 ),  Connected(255 ) \n" });
    expect_line({ port(3) + ".fgEnabled", source }, 200, { first + "fgE(200 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n" });
    expect_line({ port(3) + ".u4SrcWidth", source }, 1920, { first + "fgE(0 ), SrcW(1920 ),u4SrcH(0 ), LumaK(0,) \n" });
    expect_line({ port(3) + ".u4SrcHeight", source }, 0xFFFFFFFF,
                { first + "fgE(0 ), SrcW(0 ),u4SrcH(-1 ), LumaK(0,) \n" });
    expect_line({ port(3) + ".ucLumaKey", source }, 255, { first + "fgE(0 ), SrcW(0 ),u4SrcH(0 ), LumaK(255,) \n" });
}

TEST_F(QueryStatus, ExternalChipUsage_BypassAndUnknownValuesHaveNoLine)
{
    const Place place = { "rDrvExtScl", chipLine };
    expect_line(place, DRV_NON_EXT_CHIP, { "[PMX] PMX(0) _arPmxConf.rDrvExtSc(DRV_NON_EXT_CHIP) \n" });
    expect_line(place, DRV_EXT_SCL_EXT_TX, { "[PMX] PMX(0) _arPmxConf.rDrvExtSc(DRV_EXT_SCL_EXT_TX) \n" });
    expect_line(place, DRV_EXT_SCL_INT_TX, { "[PMX] PMX(0) _arPmxConf.rDrvExtSc(DRV_EXT_SCL_INT_TX) \n" });
    expect_line(place, DRV_RX_BYPASS_TX, {});
    for (std::int64_t number : { 4LL, 256LL, 0x80000000LL, 0xFFFFFFFFLL })
        expect_line(place, number, {});
}
