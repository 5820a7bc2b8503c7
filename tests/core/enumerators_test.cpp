// The numbers of the mixer's own enumerations and constants: other drivers, flash images and middleware were built
// with them.

#include <gtest/gtest.h>

#include "drv_if.h"
#include "drv_pmx.h"
#include "numbers.h"
#include "pmx_if.h"

using namespace numbers;

TEST(Enumerators, ResolutionModes)
{
    expect_numbers({
        NUMBER(RES_480I, 0),
        NUMBER(RES_576I, 1),
        NUMBER(RES_480P, 2),
        NUMBER(RES_576P, 3),
        NUMBER(RES_480P_1440, 4),
        NUMBER(RES_576P_1440, 5),
        NUMBER(RES_480P_2880, 6),
        NUMBER(RES_576P_2880, 7),
        NUMBER(RES_720P60HZ, 8),
        NUMBER(RES_720P50HZ, 9),
        NUMBER(RES_1080I60HZ, 10),
        NUMBER(RES_1080I50HZ, 11),
        NUMBER(RES_1080P60HZ, 12),
        NUMBER(RES_1080P50HZ, 13),
        NUMBER(RES_1080P30HZ, 14),
        NUMBER(RES_1080P25HZ, 15),
        NUMBER(RES_480I_2880, 16),
        NUMBER(RES_576I_2880, 17),
        NUMBER(RES_1080P24HZ, 18),
        NUMBER(RES_1080P23_976HZ, 19),
        NUMBER(RES_1080P29_97HZ, 20),
        NUMBER(RES_2D_480I60HZ, 37),
        NUMBER(RES_2D_576I50HZ, 38),
        NUMBER(RES_2D_640x480HZ, 39),
        NUMBER(RES_PANEL_AUO_B089AW01, 40),
        NUMBER(RES_4K2K23976HZ, 47),
        NUMBER(RES_4K2K24HZ, 48),
        NUMBER(RES_2160P, 49),
        NUMBER(RES_2160P_4096, 50),
        NUMBER(RES_MODE_NUM, 51),
        NUMBER(RES_AUTO, 52),
    });
}

TEST(Enumerators, ResolutionModes3D)
{
    expect_numbers({
        NUMBER(RES_3D_1080P23HZ, 21),          NUMBER(RES_3D_1080P24HZ, 22),          NUMBER(RES_3D_720P60HZ, 23),
        NUMBER(RES_3D_720P50HZ, 24),           NUMBER(RES_3D_720P30HZ, 25),           NUMBER(RES_3D_720P25HZ, 26),
        NUMBER(RES_3D_576P50HZ, 27),           NUMBER(RES_3D_480P60HZ, 28),           NUMBER(RES_3D_1080I60HZ, 29),
        NUMBER(RES_3D_1080I50HZ, 30),          NUMBER(RES_3D_1080I30HZ, 31),          NUMBER(RES_3D_1080I25HZ, 32),
        NUMBER(RES_3D_576I25HZ, 33),           NUMBER(RES_3D_480I30HZ, 34),           NUMBER(RES_3D_576I50HZ, 35),
        NUMBER(RES_3D_480I60HZ, 36),           NUMBER(RES_3D_720P60HZ_TB, 41),        NUMBER(RES_3D_720P50HZ_TB, 42),
        NUMBER(RES_3D_1080I60HZ_SBS_HALF, 43), NUMBER(RES_3D_1080I50HZ_SBS_HALF, 44), NUMBER(RES_3D_1080P23HZ_TB, 45),
        NUMBER(RES_3D_1080P24HZ_TB, 46),
    });
}

TEST(Enumerators, DigitalPort)
{
    expect_numbers({
        NUMBER(CCIR_INVALID, 0),
        NUMBER(CCIR_601_MODE, 1),
        NUMBER(CCIR_656_MODE, 2),

        NUMBER(CCIR_NON_USED, 0),
        NUMBER(CCIR_YCMIX_8BIT, 1),
        NUMBER(CCIR_YCMIX_10BIT, 2),
        NUMBER(CCIR_YCMIX_12BIT, 3),
        NUMBER(CCIR_YC422_16BIT, 4),
        NUMBER(CCIR_YC422_20BIT, 5),
        NUMBER(CCIR_YC422_24BIT, 6),
        NUMBER(CCIR_YC444_24BIT, 7),
        NUMBER(CCIR_YC444_30BIT, 8),
        NUMBER(CCIR_YC444_36BIT, 9),
    });
}

TEST(Enumerators, Colours)
{
    expect_numbers({
        NUMBER(DRV_GFX_COLOR_MODE_YCBCR, 0),
        NUMBER(DRV_GFX_COLOR_MODE_RGB, 1),

        NUMBER(DRV_PMX_CS_YCBCR_601, 0),
        NUMBER(DRV_PMX_CS_YCBCR_709, 1),
        NUMBER(DRV_PMX_CS_RGB, 2),
    });
}

TEST(Enumerators, Planes_NamesCountFrom1ValuesFrom0)
{
    expect_numbers({
        NUMBER(DRV_PMX_PLANE_1, 0),
        NUMBER(DRV_PMX_PLANE_2, 1),
        NUMBER(DRV_PMX_PLANE_3, 2),
        NUMBER(DRV_PMX_PLANE_4, 3),
        NUMBER(DRV_PMX_PLANE_5, 4),
        NUMBER(DRV_PMX_PLANE_6, 5),
        NUMBER(DRV_PMX_PLANE_7, 6),
        NUMBER(DRV_PMX_PLANE_8, 7),
    });
}

TEST(Enumerators, Outputs)
{
    expect_numbers({
        NUMBER(PMX_OUTPUT_CCIR, 0),
        NUMBER(PMX_OUTPUT_HDMI, 1),
        NUMBER(PMX_OUTPUT_CAV, 2),
        NUMBER(PMX_OUTPUT_CVBS, 3),
        NUMBER(PMX_OUTPUT_NUM, 4),
    });
}

TEST(Enumerators, ExternalChipUsage)
{
    expect_numbers({
        NUMBER(DRV_NON_EXT_CHIP, 0),
        NUMBER(DRV_EXT_SCL_EXT_TX, 1),
        NUMBER(DRV_EXT_SCL_INT_TX, 2),
        NUMBER(DRV_RX_BYPASS_TX, 3),
    });
}

TEST(Constants, ComponentsAndInterfaces)
{
    expect_numbers({
        NUMBER(PMX_COMP_TYPE_VDP, 65),
        NUMBER(PMX_COMP_TYPE_PMX, 66),
        NUMBER(PMX_COMP_TYPE_OSD, 176),
        NUMBER(IID_IVdp, 6),
        NUMBER(IID_IPMX, 9),
    });
}

TEST(Constants, TvTypesAndResult)
{
    expect_numbers({
        NUMBER(PMX_TV_TYPE_NTSC, 0),
        NUMBER(PMX_TV_TYPE_PAL, 3),
        NUMBER(PMX_SET_OK, 1),
    });
}

TEST(Constants, Ports)
{
    expect_numbers({ NUMBER(PMX_PORT_NUM, 8), NUMBER(PMX_PLANE_NUM, 8) });
}

TEST(Enumerators, Are32BitsWide)
{
    EXPECT_TRUE((all_are_32_bits_wide<PMX_RESOLUTION_MODE_T, CCIR_IN_OUT_MODE_T, CCIR_IN_OUT_FORMAT_T>));
    EXPECT_TRUE((all_are_32_bits_wide<DRV_GFX_COLOR_MODE_T, DRV_PMX_COLOR_SPACE_T, DRV_PMX_PLANE_T>));
    EXPECT_TRUE((all_are_32_bits_wide<DRV_EXT_CHIP_USAGE_T, decltype(PMX_OUTPUT_CCIR)>));
}

TEST(Enumerators, HoldEvery32BitNumber)
{
    EXPECT_EQ(0xFFFFFFFFu, static_cast<UINT32>(static_cast<PMX_RESOLUTION_MODE_T>(0xFFFFFFFFu)));
    EXPECT_EQ(0x80000001u, static_cast<UINT32>(static_cast<DRV_PMX_COLOR_SPACE_T>(0x80000001u)));
}
