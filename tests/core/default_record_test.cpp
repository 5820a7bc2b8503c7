// SPDX-License-Identifier: MIT OR GPL-2.0-only
// What every reset loads, field by field, and what is there before the first one.

#include <algorithm>
#include <cstring>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "board/board.h"
#include "drv_pmx.h"
#include "pmx_if.h"

using testing::Each;
using testing::ElementsAre;

namespace
{

using Bytes = std::vector<unsigned char>;

Bytes bytes_of(const PMX_CONF_T& record)
{
    Bytes bytes(sizeof(record));
    std::memcpy(bytes.data(), &record, sizeof(record));
    return bytes;
}

// Taken before main(), when nothing has run yet but the loader.
const Bytes recordAtLoad = bytes_of(_arPmxConf[0]);

constexpr const PMX_CONF_T& prDefault = _arPmxConfDefault;

void expect_default_port(const PMX_PORT_INFO_T& port, DRV_GFX_COLOR_MODE_T eColorMode)
{
    EXPECT_EQ(0u, port.u2CompType);
    EXPECT_EQ(0u, port.u2CompId);
    EXPECT_EQ(0u, port.fgConnected);
    EXPECT_EQ(0u, port.fgEnabled);
    EXPECT_EQ(eColorMode, port.eInputColorMode);
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, port.eSrcColorSpace);
    EXPECT_EQ(0u, port.u4SrcWidth);
    EXPECT_EQ(0u, port.u4SrcHeight);
    EXPECT_EQ(0u, port.ucLumaKey);
}

void expect_default_output(const PMX_RESOLUTION_T& output, PMX_RESOLUTION_MODE_T eResMode)
{
    EXPECT_EQ(1u, output.fgOutputEnable);
    EXPECT_EQ(eResMode, output.eResMode);
    EXPECT_EQ(60u, output.u4VFreq);
    EXPECT_EQ(CCIR_INVALID, output.eCcirDrvInfo.eDgoMode);
    EXPECT_EQ(CCIR_NON_USED, output.eCcirDrvInfo.eDgoFmt);
    EXPECT_EQ(CCIR_INVALID, output.eCcirDrvInfo.eDgiMode);
    EXPECT_EQ(CCIR_NON_USED, output.eCcirDrvInfo.eDgiFmt);
}

} // namespace

TEST(DefaultRecord, MixerIsOffIn1080i60)
{
    EXPECT_EQ(0u, prDefault.ucEnable);
    EXPECT_EQ(10u, prDefault.ucMode);
    EXPECT_EQ(RES_1080I60HZ, prDefault.ucMode);
    EXPECT_EQ(0u, prDefault.ucTvType);
    EXPECT_EQ(60u, prDefault.ucVfreq);
}

TEST(DefaultRecord, DigitalPort)
{
    EXPECT_EQ(1u, prDefault.ucDigitalOut);
    EXPECT_EQ(2u, prDefault.u4Phase);
    EXPECT_EQ(0u, prDefault.ucProprietaryMode);
    EXPECT_EQ(24u, prDefault.ucDigitalBit);
    EXPECT_EQ(0u, prDefault.ucDigitalRgb);
}

TEST(DefaultRecord, PictureIsNeutral)
{
    EXPECT_EQ(0u, prDefault.ucCAVBlackLv);
    EXPECT_EQ(0u, prDefault.ucCVBSBlackLv);
    EXPECT_EQ(0u, prDefault.ucGamma);
    EXPECT_EQ(128u, prDefault.ucBrightness);
    EXPECT_EQ(128u, prDefault.ucContrast);
    EXPECT_EQ(128u, prDefault.ucHue);
    EXPECT_EQ(128u, prDefault.ucSaturation);
    EXPECT_EQ(0u, prDefault.ucSharpness);
    EXPECT_EQ(0u, prDefault.ucCBEnable);
    EXPECT_EQ(0u, prDefault.ucMuteEnable);
    EXPECT_EQ(0x108080u, prDefault.u4BgColor) << "black: Y 16, U 128, V 128";
}

TEST(DefaultRecord, Capability_EveryBitBut18And31)
{
    EXPECT_EQ(0x7FFBFFFFu, prDefault.u4Capability);
    for (unsigned bit = 0; bit < 32; ++bit)
        EXPECT_EQ(bit != 18 && bit != 31, ((prDefault.u4Capability >> bit) & 1) != 0) << "bit " << bit;
}

TEST(DefaultRecord, PlaneOrders)
{
    EXPECT_THAT(prDefault.aucPlaneOrder, ElementsAre(4, 3, 1, 0, 2, 5, 6, 7));
    EXPECT_EQ(0x76543210u, prDefault.u4PlaneOrder);
}

TEST(DefaultRecord, VideoPlanesHaveNoTableNorTag)
{
    EXPECT_EQ(nullptr, prDefault.piVdp1);
    EXPECT_EQ(nullptr, prDefault.pvTag1);
    EXPECT_EQ(nullptr, prDefault.piVdp2);
    EXPECT_EQ(nullptr, prDefault.pvTag2);
}

TEST(DefaultRecord, VideoPorts)
{
    for (unsigned i = 0; i <= 1; ++i)
    {
        SCOPED_TRACE(testing::Message() << "port " << i);
        expect_default_port(prDefault.arPortInfo[i], DRV_GFX_COLOR_MODE_YCBCR);
    }
}

TEST(DefaultRecord, OsdPorts_AreRgb)
{
    for (unsigned i = 2; i <= 7; ++i)
    {
        SCOPED_TRACE(testing::Message() << "port " << i);
        expect_default_port(prDefault.arPortInfo[i], DRV_GFX_COLOR_MODE_RGB);
    }
}

TEST(DefaultRecord, MasterColorSpace)
{
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, prDefault.eMasterColorSpace);
}

TEST(DefaultRecord, Outputs_Are1080pButForComposite)
{
    for (unsigned i : { PMX_OUTPUT_CCIR, PMX_OUTPUT_HDMI, PMX_OUTPUT_CAV })
    {
        SCOPED_TRACE(testing::Message() << "output " << i);
        expect_default_output(prDefault.arOutputConf[i], RES_1080P60HZ);
    }
    expect_default_output(prDefault.arOutputConf[PMX_OUTPUT_CVBS], RES_480I);
}

TEST(DefaultRecord, ModeOfTheMixerIsNotTheModeOfItsOutputs)
{
    EXPECT_EQ(RES_1080I60HZ, prDefault.ucMode);
    EXPECT_EQ(RES_1080P60HZ, prDefault.arOutputConf[PMX_OUTPUT_HDMI].eResMode);
    EXPECT_EQ(RES_1080P60HZ, prDefault.arOutputConf[PMX_OUTPUT_CAV].eResMode);
}

TEST(DefaultRecord, AspectRatio)
{
    EXPECT_EQ(3u, prDefault.u4AspectRatio);
    EXPECT_EQ(0u, prDefault.fgAspNext);
    EXPECT_EQ(3u, prDefault.u4AspNext);
    EXPECT_EQ(0u, prDefault.fgDigestEnable);
    EXPECT_EQ(0u, prDefault.u4DigestAsp);
}

TEST(DefaultRecord, DelaysAndLevels)
{
    EXPECT_EQ(0u, prDefault.ucCavYcInputDelay);
    EXPECT_EQ(0u, prDefault.ucCavYcOutputDelay);
    EXPECT_EQ(0u, prDefault.ucCvbsYcInputDelay);
    EXPECT_EQ(0u, prDefault.ucCvbsYcOutputDelay);
    EXPECT_EQ(0u, prDefault.ucCavSyncLvl);
    EXPECT_EQ(0u, prDefault.ucCvbsSyncLvl);
    EXPECT_EQ(0u, prDefault.ucCvbsBurstLvl);
    EXPECT_EQ(0u, prDefault.ucCavYLvl);
    EXPECT_EQ(0u, prDefault.ucCvbsYLvl);
}

TEST(DefaultRecord, ModeSettingHasNotHappened)
{
    EXPECT_EQ(0u, prDefault.fgSetModeCalled);
    EXPECT_EQ(DRV_NON_EXT_CHIP, prDefault.rDrvExtScl);
    EXPECT_EQ(0u, prDefault.fgForceMode);
    EXPECT_EQ(0u, prDefault.fgOSD5);
}

TEST(Record, AtLoad_IsZero)
{
    EXPECT_THAT(recordAtLoad, Each(0));
}

TEST(Record, ThereIsOneAndTheAccessorYieldsIt)
{
    EXPECT_EQ(1u, std::size(_arPmxConf));
    EXPECT_EQ(&_arPmxConf[0], prPmxConf());
}

class RecordOnBoard : public testing::Test
{
protected:
    void SetUp() override { board::power_on(board::Description{}); }
};

TEST_F(RecordOnBoard, BeforeTheFirstReset_IsZero)
{
    EXPECT_THAT(bytes_of(_arPmxConf[0]), Each(0));
}

TEST_F(RecordOnBoard, AfterReset_IsTheDefaultButForTheBootMode)
{
    PMX_Reset(0);
    Bytes expected = bytes_of(_arPmxConfDefault);
    expected[offsetof(PMX_CONF_T, ucMode)] = RES_480I; // a bare board has no boot resolution
    EXPECT_EQ(expected, bytes_of(_arPmxConf[0]));
}

TEST_F(RecordOnBoard, AfterReset_NothingOfWhatWasThereIsLeft)
{
    std::memset(static_cast<void*>(&_arPmxConf[0]), 0xA5, sizeof(PMX_CONF_T));
    PMX_Reset(0);
    Bytes expected = bytes_of(_arPmxConfDefault);
    expected[offsetof(PMX_CONF_T, ucMode)] = RES_480I;
    EXPECT_EQ(expected, bytes_of(_arPmxConf[0]));
}

TEST_F(RecordOnBoard, AfterReset_AllPortsAreDisconnectedAndMasterColorSpaceIs709)
{
    PMX_Reset(0);
    for (const PMX_PORT_INFO_T& port : _arPmxConf[0].arPortInfo)
        EXPECT_EQ(0u, port.fgConnected);
    EXPECT_EQ(DRV_PMX_CS_YCBCR_709, _arPmxConf[0].eMasterColorSpace);
}

TEST_F(RecordOnBoard, PowerOn_MakesTheRecordZeroAgain)
{
    PMX_Reset(0);
    board::power_on(board::Description{});
    EXPECT_THAT(bytes_of(_arPmxConf[0]), Each(0));
}
