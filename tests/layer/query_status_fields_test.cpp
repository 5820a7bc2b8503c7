// SPDX-License-Identifier: MIT OR GPL-2.0-only
// PMX_QueryStatus: every field where it belongs. All numbers of the record are different, so that an exchanged field
// shows.

#include <cstdint>
#include <string>

#include <gtest/gtest.h>

#include "query_status.h"

namespace
{

struct Setting
{
    const char* field;
    std::int64_t number;
};

constexpr Setting settings[] = {
    { "ucEnable", 201 }, // the one field that the report leaves out, with the slots of the video planes
    { "ucMode", 11 },
    { "ucTvType", 12 },
    { "ucVfreq", 13 },
    { "ucDigitalOut", 14 },
    { "u4Phase", 15 },
    { "ucProprietaryMode", 16 },
    { "ucDigitalBit", 17 },
    { "ucDigitalRgb", 18 },
    { "ucCAVBlackLv", 19 },
    { "ucCVBSBlackLv", 20 },
    { "ucGamma", 21 },
    { "ucBrightness", 22 },
    { "ucContrast", 23 },
    { "ucHue", 24 },
    { "ucSaturation", 25 },
    { "ucCBEnable", 26 },
    { "ucMuteEnable", 27 },
    { "u4AspectRatio", 70028 },
    { "u4BgColor", 70029 },
    { "u4Capability", 70030 },
    { "ucSharpness", 31 },
    { "fgAspNext", 32 },
    { "u4AspNext", 70033 },
    { "fgSetModeCalled", 34 },
    { "ucCavYcInputDelay", 35 },
    { "ucCavYcOutputDelay", 36 },
    { "ucCvbsYcInputDelay", 37 },
    { "ucCvbsYcOutputDelay", 38 },
    { "ucCavSyncLvl", 39 },
    { "ucCvbsSyncLvl", 40 },
    { "ucCvbsBurstLvl", 41 },
    { "ucCavYLvl", 42 },
    { "ucCvbsYLvl", 43 },
    { "fgDigestEnable", 44 },
    { "u4DigestAsp", 70045 },
    { "fgForceMode", 47 },
    { "fgOSD5", 48 },
    { "u4PlaneOrder", 0x46474849 },
    { "eMasterColorSpace", DRV_PMX_CS_RGB },
    { "rDrvExtScl", DRV_EXT_SCL_INT_TX },
};

// Small enumerations: different from port to port as far as they go.
constexpr std::int64_t colorModes[] = { 0, 1, 1, 0, 1, 0, 0, 1 };
constexpr std::int64_t colorSpaces[] = { 0, 1, 2, 1, 2, 0, 2, 0 };

struct Output
{
    std::int64_t eResMode;
    std::int64_t eDgoMode;
    std::int64_t eDgoFmt;
    std::int64_t eDgiMode;
    std::int64_t eDgiFmt;
};
constexpr Output outputs[] = {
    { RES_576P, CCIR_INVALID, CCIR_YCMIX_8BIT, CCIR_656_MODE, CCIR_YCMIX_10BIT },
    { RES_1080P30HZ, CCIR_601_MODE, CCIR_YC422_16BIT, CCIR_INVALID, CCIR_YC422_20BIT },
    { RES_3D_720P30HZ, CCIR_656_MODE, CCIR_YC444_24BIT, CCIR_601_MODE, CCIR_YC444_30BIT },
    { RES_3D_480I60HZ, CCIR_601_MODE, CCIR_YCMIX_12BIT, CCIR_656_MODE, CCIR_YC444_36BIT },
};

class DistinctRecord : public QueryStatus
{
protected:
    void SetUp() override
    {
        QueryStatus::SetUp();
        for (const Setting& setting : settings)
            set_record(setting.field, setting.number);
        for (unsigned i = 0; i < 8; ++i)
            set_record("aucPlaneOrder[" + std::to_string(i) + "]", 101 + i);
        for (unsigned i = 0; i < 8; ++i)
            set_port(i);
        for (unsigned i = 0; i < 4; ++i)
            set_output(i);
    }

    static void set_port(unsigned i)
    {
        const std::string port = "arPortInfo[" + std::to_string(i) + "].";
        set_record(port + "u2CompType", 1001 + 10 * i);
        set_record(port + "u2CompId", 1002 + 10 * i);
        set_record(port + "fgConnected", 110 + i);
        set_record(port + "fgEnabled", 120 + i);
        set_record(port + "eInputColorMode", colorModes[i]);
        set_record(port + "eSrcColorSpace", colorSpaces[i]);
        set_record(port + "u4SrcWidth", 70103 + 10 * i);
        set_record(port + "u4SrcHeight", 70104 + 10 * i);
        set_record(port + "ucLumaKey", 130 + i);
    }

    static void set_output(unsigned i)
    {
        const std::string output = "arOutputConf[" + std::to_string(i) + "].";
        set_record(output + "fgOutputEnable", 140 + i);
        set_record(output + "eResMode", outputs[i].eResMode);
        set_record(output + "u4VFreq", 70200 + i);
        set_record(output + "eCcirDrvInfo.eDgoMode", outputs[i].eDgoMode);
        set_record(output + "eCcirDrvInfo.eDgoFmt", outputs[i].eDgoFmt);
        set_record(output + "eCcirDrvInfo.eDgiMode", outputs[i].eDgiMode);
        set_record(output + "eCcirDrvInfo.eDgiFmt", outputs[i].eDgiFmt);
    }
};

const std::string distinctSettings = R"(
    LOG0 "Mode(11) CS(2)\n"
    LOG0 "[PMX] PMX(0) E(17 ), Mode(11) TVTP(12 ), FQ(13 ), DitalOut(14 ), u4Phase(15 ), PMode(16 ), DBit(17 ),\n"
    LOG0 "[PMX] PMX(0)  DRGB(18 ), CAVBlackLv(19 ), CVBSBlackLv(20 ), G(21) Bright(22 ), Contrast(23 ), )"
                                     R"(Hue(24 ),Saturation(25 ),\n"
    LOG0 "[PMX] PMX(0) CBE(26 ), MuteE(27 ), AS(70028 ), BgC(70029 ), Cap(70030 ), Sharp(31 ), fgAspNext(32 ),\n"
    LOG0 "[PMX] PMX(0 ),  AspN(70033 ), fgSMCal(34 ), CAVIdel(35 ), CAVOdel(36 ), CvbsIdel(37 ), )"
                                     R"(CvbsOdel(38 ), CavScL(39 ), CvbsScL(40 ), \n"
    LOG0 "[PMX] PMX(0 ), CvbsBurstLvl(41 ), CavYLvl(42 ), CvbsYLvl(43 ), fgDigestEnable(44 ), )"
                                     R"(DigestAsp(70045 ), fgForceMode(47 ), \n"
    LOG0 "[PMX] PMX(0 ), u4PlaneOrder(0x46474849 ), \n"
    LOG0 "[PMX] PMX(0 ), fgOSD5(48 ), \n"
    LOG0 "[PMX] PMX(0 ), plane 0's order is 101 \n"
    LOG0 "[PMX] PMX(0 ), plane 1's order is 102 \n"
    LOG0 "[PMX] PMX(0 ), plane 2's order is 103 \n"
    LOG0 "[PMX] PMX(0 ), plane 3's order is 104 \n"
    LOG0 "[PMX] PMX(0 ), plane 4's order is 105 \n"
    LOG0 "[PMX] PMX(0 ), plane 5's order is 106 \n"
    LOG0 "[PMX] PMX(0 ), plane 6's order is 107 \n"
    LOG0 "[PMX] PMX(0 ), plane 7's order is 108 \n"
    LOG0 "[PMX] PMX(0 ), eMasterColorSpace(DRV_PMX_CS_RGB)\n"
)";

const std::string distinctPorts = R"(
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[0]'s CompT(1001 ), CompId(1002 ),  Connected(110 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[0]'s fgE(120 ), SrcW(70103 ),u4SrcH(70104 ), LumaK(130,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[0].eInputColorMode(DRV_GFX_COLOR_MODE_YCBCR)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[0].eMasterColorSpace(DRV_PMX_CS_YCBCR_601)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[1]'s CompT(1011 ), CompId(1012 ),  Connected(111 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[1]'s fgE(121 ), SrcW(70113 ),u4SrcH(70114 ), LumaK(131,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[1].eInputColorMode(DRV_GFX_COLOR_MODE_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[1].eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[2]'s CompT(1021 ), CompId(1022 ),  Connected(112 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[2]'s fgE(122 ), SrcW(70123 ),u4SrcH(70124 ), LumaK(132,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[2].eInputColorMode(DRV_GFX_COLOR_MODE_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[2].eMasterColorSpace(DRV_PMX_CS_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[3]'s CompT(1031 ), CompId(1032 ),  Connected(113 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[3]'s fgE(123 ), SrcW(70133 ),u4SrcH(70134 ), LumaK(133,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[3].eInputColorMode(DRV_GFX_COLOR_MODE_YCBCR)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[3].eMasterColorSpace(DRV_PMX_CS_YCBCR_709)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[4]'s CompT(1041 ), CompId(1042 ),  Connected(114 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[4]'s fgE(124 ), SrcW(70143 ),u4SrcH(70144 ), LumaK(134,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[4].eInputColorMode(DRV_GFX_COLOR_MODE_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[4].eMasterColorSpace(DRV_PMX_CS_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[5]'s CompT(1051 ), CompId(1052 ),  Connected(115 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[5]'s fgE(125 ), SrcW(70153 ),u4SrcH(70154 ), LumaK(135,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[5].eInputColorMode(DRV_GFX_COLOR_MODE_YCBCR)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[5].eMasterColorSpace(DRV_PMX_CS_YCBCR_601)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[6]'s CompT(1061 ), CompId(1062 ),  Connected(116 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[6]'s fgE(126 ), SrcW(70163 ),u4SrcH(70164 ), LumaK(136,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[6].eInputColorMode(DRV_GFX_COLOR_MODE_YCBCR)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[6].eMasterColorSpace(DRV_PMX_CS_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[7]'s CompT(1071 ), CompId(1072 ),  Connected(117 ) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0], arPortInfo[7]'s fgE(127 ), SrcW(70173 ),u4SrcH(70174 ), LumaK(137,) \n"
    LOG0 "[PMX] PMX(0 ),_arPmxConf[0].arPortInfo[7].eInputColorMode(DRV_GFX_COLOR_MODE_RGB)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arPortInfo[7].eMasterColorSpace(DRV_PMX_CS_YCBCR_601)\n"
)";

const std::string distinctOutputs = R"(
    LOG0 "[PMX] PMX(0) _arPmxConf.rDrvExtSc(DRV_EXT_SCL_INT_TX) \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[0].fgOutputEnable(140)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[0].u4VFreq(70200)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[0].eResMode(RES_576P)\n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[0].eCcirDrvInfo.eDgiFmt(CCIR_YCMIX_10BIT)  \n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[0].eCcirDrvInfo.eDgiMode(CCIR_656_MODE)  \n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[0].eCcirDrvInfo.eDgoFmt(CCIR_YCMIX_8BIT)  \n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[0].eCcirDrvInfo.eDgoMode(CCIR_INVALID) \n "
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[1].fgOutputEnable(141)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[1].u4VFreq(70201)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[1].eResMode(RES_1080P30HZ)\n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[1].eCcirDrvInfo.eDgiFmt(CCIR_YC422_20BIT) \n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[1].eCcirDrvInfo.eDgiMode(CCIR_INVALID) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[1].eCcirDrvInfo.eDgoFmt(CCIR_YC422_16BIT)  \n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[1].eCcirDrvInfo.eDgoMode(CCIR_601_MODE) \n "
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[2].fgOutputEnable(142)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[2].u4VFreq(70202)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[2].eResMode(RES_3D_720P30HZ)\n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[2].eCcirDrvInfo.eDgiFmt(CCIR_YC444_30BIT)  \n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[2].eCcirDrvInfo.eDgiMode(CCIR_601_MODE)  \n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[2].eCcirDrvInfo.eDgoFmt(CCIR_YC444_24BIT) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[2].eCcirDrvInfo.eDgoMode(CCIR_656_MODE)  \n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[3].fgOutputEnable(143)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[3].u4VFreq(70203)\n"
    LOG0 "[PMX] PMX(0 ), _arPmxConf[0].arOutputConf[3].eResMode(RES_3D_480I60HZ)\n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[3].eCcirDrvInfo.eDgiFmt(CCIR_YC444_36BIT) \n "
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[3].eCcirDrvInfo.eDgiMode(CCIR_656_MODE)  \n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[3].eCcirDrvInfo.eDgiFmt(CCIR_YCMIX_12BIT)  \n"
    LOG0 "[PMX]PMX(0,) _arPmxConf[0].arOutputConf[3].eCcirDrvInfo.eDgoMode(CCIR_601_MODE) \n "
)";

} // namespace

TEST_F(DistinctRecord, QueryStatus_EveryFieldStandsWhereItBelongs)
{
    PMX_QueryStatus();
    EXPECT_TRACE(distinctSettings + distinctPorts + distinctOutputs);
}

TEST_F(DistinctRecord, QueryStatus_ChangesNothing)
{
    const RecordSnapshot before;
    PMX_QueryStatus();
    EXPECT_RECORD_UNCHANGED(before);
}
