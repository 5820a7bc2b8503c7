// SPDX-License-Identifier: MIT OR GPL-2.0-only
// PMX_QueryStatus: the whole report, word for word. Field engineers read it and their tools parse it, blanks and all.

#include <string>

#include <gtest/gtest.h>

#include "query_status.h"

namespace
{

const std::string defaultSettings = R"(
    LOG0 "Mode(12) CS(1)\n"
    LOG0 "[PMX] PMX(0) E(24 ), Mode(12) TVTP(0 ), FQ(60 ), DitalOut(1 ), u4Phase(2 ), PMode(0 ), DBit(24 ),\n"
    LOG0 "[PMX] PMX(0)  DRGB(0 ), CAVBlackLv(0 ), CVBSBlackLv(0 ), G(0) Bright(128 ), Contrast(128 ), )"
                                    R"(Hue(128 ),Saturation(128 ),\n"
    LOG0 "[PMX] PMX(0) CBE(0 ), MuteE(0 ), AS(3 ), BgC(1081472 ), Cap(2147221503 ), Sharp(0 ), fgAspNext(0 ),\n"
    LOG0 "[PMX] PMX(0 ),  AspN(3 ), fgSMCal(0 ), CAVIdel(0 ), CAVOdel(0 ), CvbsIdel(0 ), CvbsOdel(0 ), )"
                                    R"(CavScL(0 ), CvbsScL(0 ), \n"
    LOG0 "[PMX] PMX(0 ), CvbsBurstLvl(0 ), CavYLvl(0 ), CvbsYLvl(0 ), fgDigestEnable(0 ), DigestAsp(0 ), )"
                                    R"(fgForceMode(0 ), \n"
    LOG0 "[PMX] PMX(0 ), u4PlaneOrder(0x76543210 ), \n"
    LOG0 "[PMX] PMX(0 ), fgOSD5(0 ), \n"
    LOG0 "[PMX] PMX(0 ), plane 0's order is 4 \n"
    LOG0 "[PMX] PMX(0 ), plane 1's order is 3 \n"
    LOG0 "[PMX] PMX(0 ), plane 2's order is 1 \n"
    LOG0 "[PMX] PMX(0 ), plane 3's order is 0 \n"
    LOG0 "[PMX] PMX(0 ), plane 4's order is 2 \n"
    LOG0 "[PMX] PMX(0 ), plane 5's order is 5 \n"
    LOG0 "[PMX] PMX(0 ), plane 6's order is 6 \n"
    LOG0 "[PMX] PMX(0 ), plane 7's order is 7 \n"
    LOG0 "[PMX] PMX(0 ), eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
)";

const std::string defaultPorts = R"(
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[0]'s CompT(0 ), CompId(0 ),  Connected(0 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[0]'s fgE(0 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[0].eInputColorMode(DRV_GFX_COLOR_MODE_YCBCR)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[0].eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[1]'s CompT(0 ), CompId(0 ),  Connected(0 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[1]'s fgE(0 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[1].eInputColorMode(DRV_GFX_COLOR_MODE_YCBCR)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[1].eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[2]'s CompT(0 ), CompId(0 ),  Connected(0 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[2]'s fgE(0 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[2].eInputColorMode(DRV_GFX_COLOR_MODE_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[2].eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[3]'s CompT(0 ), CompId(0 ),  Connected(0 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[3]'s fgE(0 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[3].eInputColorMode(DRV_GFX_COLOR_MODE_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[3].eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[4]'s CompT(0 ), CompId(0 ),  Connected(0 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[4]'s fgE(0 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[4].eInputColorMode(DRV_GFX_COLOR_MODE_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[4].eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[5]'s CompT(0 ), CompId(0 ),  Connected(0 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[5]'s fgE(0 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[5].eInputColorMode(DRV_GFX_COLOR_MODE_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[5].eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[6]'s CompT(0 ), CompId(0 ),  Connected(0 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[6]'s fgE(0 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[6].eInputColorMode(DRV_GFX_COLOR_MODE_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[6].eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[7]'s CompT(0 ), CompId(0 ),  Connected(0 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[7]'s fgE(0 ), SrcW(0 ),u4SrcH(0 ), LumaK(0,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[7].eInputColorMode(DRV_GFX_COLOR_MODE_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[7].eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
)";

const std::string defaultOutputs = R"(
    LOG0 "[PMX] PMX(0) _arPmxConf.rDrvExtSc(DRV_NON_EXT_CHIP) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[0].fgOutputEnable(1)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[0].u4VFreq(60)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[0].eResMode(RES_1080P60HZ)\n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[0].eCcirDrvInfo.eDgiFmt(CCIR_NON_USED) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[0].eCcirDrvInfo.eDgiMode(CCIR_INVALID) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[0].eCcirDrvInfo.eDgoFmt(CCIR_NON_USED) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[0].eCcirDrvInfo.eDgoMode(CCIR_INVALID) \n "
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[1].fgOutputEnable(1)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[1].u4VFreq(60)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[1].eResMode(RES_1080P60HZ)\n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[1].eCcirDrvInfo.eDgiFmt(CCIR_NON_USED) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[1].eCcirDrvInfo.eDgiMode(CCIR_INVALID) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[1].eCcirDrvInfo.eDgoFmt(CCIR_NON_USED) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[1].eCcirDrvInfo.eDgoMode(CCIR_INVALID) \n "
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[2].fgOutputEnable(1)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[2].u4VFreq(60)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[2].eResMode(RES_1080P60HZ)\n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[2].eCcirDrvInfo.eDgiFmt(CCIR_NON_USED) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[2].eCcirDrvInfo.eDgiMode(CCIR_INVALID) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[2].eCcirDrvInfo.eDgoFmt(CCIR_NON_USED) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[2].eCcirDrvInfo.eDgoMode(CCIR_INVALID) \n "
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[3].fgOutputEnable(1)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[3].u4VFreq(60)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[3].eResMode(RES_480I)\n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[3].eCcirDrvInfo.eDgiFmt(CCIR_NON_USED) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[3].eCcirDrvInfo.eDgiMode(CCIR_INVALID) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[3].eCcirDrvInfo.eDgoFmt(CCIR_NON_USED) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[3].eCcirDrvInfo.eDgoMode(CCIR_INVALID) \n "
)";

} // namespace

TEST_F(QueryStatus, DefaultRecordAfterColdStart)
{
    PMX_QueryStatus();
    EXPECT_TRACE(defaultSettings + defaultPorts + defaultOutputs);
}

TEST_F(QueryStatus, IsTheSameEveryTime)
{
    const Lines first = report();
    EXPECT_EQ(78u, first.size());
    EXPECT_EQ(first, report());
}

TEST_F(QueryStatus, GoesToAConsoleThatAdmitsLevel0Only)
{
    const auto console_of_a_report = [] {
        const std::string before = board::console_text();
        PMX_QueryStatus();
        return board::console_text().substr(before.size());
    };
    std::string all;
    for (const std::string& line : report())
        all += line;

    board::set_console_level(0);
    EXPECT_EQ(all, console_of_a_report());
    board::set_console_level(-1);
    EXPECT_EQ("", console_of_a_report());
}

TEST_F(QueryStatus, OnlyPrints_NoLockAndNoOtherCall)
{
    PMX_QueryStatus();
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        EXPECT_EQ("PMX_IsLog", entry.function);
        EXPECT_EQ(0, entry.level);
    }
    EXPECT_EQ(78u, board::trace::entries().size());
}

TEST_F(QueryStatus, ChangesNothing)
{
    const RecordSnapshot before;
    PMX_QueryStatus();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(QueryStatus, BeforeTheFirstReset_ReportsAZeroRecord)
{
    power_on();
    const Lines lines = report();
    ASSERT_EQ(78u, lines.size());
    EXPECT_EQ("Mode(0) CS(0)\n", lines[0]);
    EXPECT_EQ("[PMX] PMX(0 ), u4PlaneOrder(0x       0 ), \n", lines[6]);
    EXPECT_EQ("[PMX] PMX(0 ), eMasterColorSpace(DRV_PMX_CS_YCBCR_601)\n", lines[16]);
    EXPECT_EQ("[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[0].eResMode(RES_480I)\n", lines[52]);
}
