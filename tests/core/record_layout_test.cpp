// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The records' fields in their order and of their types: what debuggers' scripts and crash dumps rely on, and what
// other drivers were compiled with.

#include <cstddef>
#include <string>
#include <type_traits>
#include <vector>

#include <gtest/gtest.h>

#include "drv_av_d.h"
#include "drv_if_pmx.h"
#include "drv_if_vdp.h"
#include "pmx_if.h"

namespace
{

struct Field
{
    std::string name;
    std::size_t offset;
    std::size_t size;
    std::size_t alignment;
    bool ofItsType;
};

#define FIELD(Record, Type, member)                                                                   \
    {                                                                                                 \
#member, offsetof(Record, member), sizeof(Record::member), alignof(decltype(Record::member)), \
            std::is_same_v < decltype(Record::member), Type>                                          \
    }

std::size_t aligned(std::size_t offset, std::size_t alignment)
{
    return (offset + alignment - 1) / alignment * alignment;
}

// The record is these fields, one behind the other with natural padding, and none besides.
template <typename Record>
void expect_fields(std::size_t number, const std::vector<Field>& fields)
{
    EXPECT_EQ(number, fields.size());
    std::size_t end = 0;
    for (const Field& field : fields)
    {
        EXPECT_EQ(aligned(end, field.alignment), field.offset) << field.name;
        EXPECT_TRUE(field.ofItsType) << field.name;
        end = field.offset + field.size;
    }
    EXPECT_EQ(aligned(end, alignof(Record)), sizeof(Record)) << "behind the last field";
}

} // namespace

TEST(Layout, BasicTypes)
{
    EXPECT_EQ(1u, sizeof(CHAR));
    EXPECT_EQ(1u, sizeof(UCHAR));
    EXPECT_EQ(1u, sizeof(UINT8));
    EXPECT_EQ(1u, sizeof(BYTE));
    EXPECT_EQ(1u, sizeof(BOOL));
    EXPECT_EQ(1u, sizeof(INT8));
    EXPECT_EQ(2u, sizeof(UINT16));
    EXPECT_EQ(4u, sizeof(UINT32));
    EXPECT_EQ(4u, sizeof(INT32));
    EXPECT_EQ(4u, sizeof(HANDLE_T));
    EXPECT_TRUE(std::is_unsigned_v<UCHAR> && std::is_unsigned_v<UINT8> && std::is_unsigned_v<BYTE>);
    EXPECT_TRUE(std::is_unsigned_v<BOOL> && std::is_unsigned_v<UINT16> && std::is_unsigned_v<UINT32>);
    EXPECT_TRUE(std::is_unsigned_v<HANDLE_T>);
    EXPECT_TRUE(std::is_signed_v<INT8> && std::is_signed_v<INT32>);
}

TEST(Layout, CcirDrvInfo)
{
    expect_fields<CCIR_DRV_INFO_T>(4, {
                                          FIELD(CCIR_DRV_INFO_T, CCIR_IN_OUT_MODE_T, eDgoMode),
                                          FIELD(CCIR_DRV_INFO_T, CCIR_IN_OUT_FORMAT_T, eDgoFmt),
                                          FIELD(CCIR_DRV_INFO_T, CCIR_IN_OUT_MODE_T, eDgiMode),
                                          FIELD(CCIR_DRV_INFO_T, CCIR_IN_OUT_FORMAT_T, eDgiFmt),
                                      });
    EXPECT_EQ(16u, sizeof(CCIR_DRV_INFO_T));
}

TEST(Layout, Resolution)
{
    expect_fields<PMX_RESOLUTION_T>(4, {
                                           FIELD(PMX_RESOLUTION_T, BOOL, fgOutputEnable),
                                           FIELD(PMX_RESOLUTION_T, PMX_RESOLUTION_MODE_T, eResMode),
                                           FIELD(PMX_RESOLUTION_T, UINT32, u4VFreq),
                                           FIELD(PMX_RESOLUTION_T, CCIR_DRV_INFO_T, eCcirDrvInfo),
                                       });
    EXPECT_EQ(28u, sizeof(PMX_RESOLUTION_T));
}

TEST(Layout, PortInfo)
{
    expect_fields<PMX_PORT_INFO_T>(9, {
                                          FIELD(PMX_PORT_INFO_T, UINT16, u2CompType),
                                          FIELD(PMX_PORT_INFO_T, UINT16, u2CompId),
                                          FIELD(PMX_PORT_INFO_T, BOOL, fgConnected),
                                          FIELD(PMX_PORT_INFO_T, BOOL, fgEnabled),
                                          FIELD(PMX_PORT_INFO_T, DRV_GFX_COLOR_MODE_T, eInputColorMode),
                                          FIELD(PMX_PORT_INFO_T, DRV_PMX_COLOR_SPACE_T, eSrcColorSpace),
                                          FIELD(PMX_PORT_INFO_T, UINT32, u4SrcWidth),
                                          FIELD(PMX_PORT_INFO_T, UINT32, u4SrcHeight),
                                          FIELD(PMX_PORT_INFO_T, UCHAR, ucLumaKey),
                                      });
    EXPECT_EQ(28u, sizeof(PMX_PORT_INFO_T));
}

TEST(Layout, DisplayPartStatus)
{
    expect_fields<PMX_DISPLAY_PART_STATUS_T>(4, {
                                                    FIELD(PMX_DISPLAY_PART_STATUS_T, HANDLE_T, hPMXTimer),
                                                    FIELD(PMX_DISPLAY_PART_STATUS_T, BOOL, fgPmxFormatChangeFlag),
                                                    FIELD(PMX_DISPLAY_PART_STATUS_T, BOOL, fgPmxEnabeOsdFlag),
                                                    FIELD(PMX_DISPLAY_PART_STATUS_T, BOOL, fgTimerAlreadySet),
                                                });
    EXPECT_EQ(8u, sizeof(PMX_DISPLAY_PART_STATUS_T));
}

namespace
{

const std::vector<Field> configurationFields = {
    FIELD(PMX_CONF_T, UCHAR, ucEnable),
    FIELD(PMX_CONF_T, UCHAR, ucMode),
    FIELD(PMX_CONF_T, UCHAR, ucTvType),
    FIELD(PMX_CONF_T, UCHAR, ucVfreq),
    FIELD(PMX_CONF_T, UCHAR, ucDigitalOut),
    FIELD(PMX_CONF_T, UCHAR, u4Phase), // 8 bits in spite of its prefix
    FIELD(PMX_CONF_T, UCHAR, ucProprietaryMode),
    FIELD(PMX_CONF_T, UCHAR, ucDigitalBit),
    FIELD(PMX_CONF_T, UCHAR, ucDigitalRgb),
    FIELD(PMX_CONF_T, UCHAR, ucCAVBlackLv),
    FIELD(PMX_CONF_T, UCHAR, ucCVBSBlackLv),
    FIELD(PMX_CONF_T, UCHAR, ucGamma),
    FIELD(PMX_CONF_T, UCHAR, ucBrightness),
    FIELD(PMX_CONF_T, UCHAR, ucContrast),
    FIELD(PMX_CONF_T, UCHAR, ucHue),
    FIELD(PMX_CONF_T, UCHAR, ucSaturation),
    FIELD(PMX_CONF_T, UCHAR, ucCBEnable),
    FIELD(PMX_CONF_T, UCHAR, ucMuteEnable),
    FIELD(PMX_CONF_T, UINT32, u4AspectRatio),
    FIELD(PMX_CONF_T, UINT32, u4BgColor),
    FIELD(PMX_CONF_T, UINT32, u4Capability),
    FIELD(PMX_CONF_T, UCHAR[8], aucPlaneOrder),
    FIELD(PMX_CONF_T, UCHAR, ucSharpness),
    FIELD(PMX_CONF_T, IVdp*, piVdp1),
    FIELD(PMX_CONF_T, void*, pvTag1),
    FIELD(PMX_CONF_T, IVdp*, piVdp2),
    FIELD(PMX_CONF_T, void*, pvTag2),
    FIELD(PMX_CONF_T, PMX_PORT_INFO_T[8], arPortInfo),
    FIELD(PMX_CONF_T, DRV_PMX_COLOR_SPACE_T, eMasterColorSpace),
    FIELD(PMX_CONF_T, PMX_RESOLUTION_T[4], arOutputConf),
    FIELD(PMX_CONF_T, BOOL, fgAspNext),
    FIELD(PMX_CONF_T, UINT32, u4AspNext),
    FIELD(PMX_CONF_T, BOOL, fgSetModeCalled),
    FIELD(PMX_CONF_T, UCHAR, ucCavYcInputDelay),
    FIELD(PMX_CONF_T, UCHAR, ucCavYcOutputDelay),
    FIELD(PMX_CONF_T, UCHAR, ucCvbsYcInputDelay),
    FIELD(PMX_CONF_T, UCHAR, ucCvbsYcOutputDelay),
    FIELD(PMX_CONF_T, UCHAR, ucCavSyncLvl),
    FIELD(PMX_CONF_T, UCHAR, ucCvbsSyncLvl),
    FIELD(PMX_CONF_T, UCHAR, ucCvbsBurstLvl),
    FIELD(PMX_CONF_T, UCHAR, ucCavYLvl),
    FIELD(PMX_CONF_T, UCHAR, ucCvbsYLvl),
    FIELD(PMX_CONF_T, BOOL, fgDigestEnable),
    FIELD(PMX_CONF_T, UINT32, u4DigestAsp),
    FIELD(PMX_CONF_T, DRV_EXT_CHIP_USAGE_T, rDrvExtScl),
    FIELD(PMX_CONF_T, UINT32, u4PlaneOrder),
    FIELD(PMX_CONF_T, BOOL, fgForceMode),
    FIELD(PMX_CONF_T, UINT8, fgOSD5),
};

} // namespace

TEST(Layout, Configuration)
{
    expect_fields<PMX_CONF_T>(48, configurationFields);
}

TEST(Layout, SetHdmiResParameter)
{
    using Record = PMX_SET_HDMI_RES_PARAMETER_T;
    expect_fields<Record>(11, {
                                  FIELD(Record, UINT8, u1ScaleMode),
                                  FIELD(Record, UINT8, ucHdmiOutDisplayResolution),
                                  FIELD(Record, UINT8, ucFmtOutResolution),
                                  FIELD(Record, UINT8, ucCCIROutResolution),
                                  FIELD(Record, UINT8, ucHdmiOutMode),
                                  FIELD(Record, CCIR_DRV_INFO_T, eCcirDrvInfo),
                                  FIELD(Record, BOOL, fgOsdMsg),
                                  FIELD(Record, UINT8, ucCCIROutMode),
                                  FIELD(Record, BOOL, fgCCIROutEnable),
                                  FIELD(Record, BOOL, fgHdmiOutEnable),
                                  FIELD(Record, UINT16, u2_Vfreq),
                              });
}

TEST(Layout, SetTvSysParameter)
{
    using Record = PMX_SET_TV_SYS_PARAMETER_T;
    expect_fields<Record>(2, { FIELD(Record, UINT16, u2_Vfreq), FIELD(Record, BOOL, fgAutoEnable) });
}

TEST(Layout, GetValidResAndVfreqParameter)
{
    using Record = PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T;
    expect_fields<Record>(4, {
                                 FIELD(Record, UINT32, u4ResCheck),
                                 FIELD(Record, UINT16, u2VsyncFreq),
                                 FIELD(Record, UINT32, u4ValidAutoRes),
                                 FIELD(Record, UINT16, u2ValidAutoVfreq),
                             });
}

TEST(Layout, VideoPlaneTable)
{
    using Member = UINT32 (*)(void*);
    using SetColorMode = UINT32 (*)(void*, DRV_PMX_COLOR_SPACE_T);
    expect_fields<IVdp>(11, {
                                FIELD(IVdp, Member, pu4SetPlaybackMode),
                                FIELD(IVdp, Member, pu4AssignSyncCtrl),
                                FIELD(IVdp, Member, pu4StcIsValid),
                                FIELD(IVdp, Member, pu4SetFrameAccurateStartPts),
                                FIELD(IVdp, Member, pu4SetFrameAccurateEndPts),
                                FIELD(IVdp, Member, pu4Flush),
                                FIELD(IVdp, Member, pu4AssignVdecCallback),
                                FIELD(IVdp, Member, pu4DesiredResolution),
                                FIELD(IVdp, SetColorMode, pu4SetColorMode),
                                FIELD(IVdp, Member, pu4GetCurrPictureInfo),
                                FIELD(IVdp, Member, pu4PictureSent),
                            });
}
