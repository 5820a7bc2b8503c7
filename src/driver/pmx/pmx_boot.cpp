// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Boot resolution, video PLL and TV type. */
#include "drv_pmx.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

/* The PLL group's registers in the chip's I/O space. */
static constexpr UINT32 PLL_CONTROL_A = 0xFD00003C;
static constexpr UINT32 PLL_SYNTHESISER = 0xFD000040;
static constexpr UINT32 PLL_CONTROL_B = 0xFD000044;

static constexpr UINT32 SYNTHESISER_60HZ = 0x03D2F1AA;
static constexpr UINT32 SYNTHESISER_50HZ = 0x03D1745E; // 24 Hz too

static void vSetBits(UINT32 u4Address, UINT32 u4Bits)
{
    x_reg_write32(u4Address, x_reg_read32(u4Address) | u4Bits);
}

static void vClearBits(UINT32 u4Address, UINT32 u4Bits)
{
    x_reg_write32(u4Address, x_reg_read32(u4Address) & ~u4Bits);
}

UINT8 PMX_GetHDMIDefaultRes(void)
{
    const UINT32 u4HDMI_RES_OFFSET = 0;
    UINT32 u4TestData = 0;

    INT32 i4_id = get_part_id_by_name("fast_init_param");
    UTIL_Printf("TESTPMX: Get pard ID:%d.\n", i4_id);
    // Neither the id nor the result is looked at: a failed read leaves the word at 0, and 480i is a mode to start with.
    i4NFBPartitionRead(i4_id, u4HDMI_RES_OFFSET, &u4TestData, sizeof u4TestData);
    // The partition's first byte: the word is little-endian, as the processor is.
    UINT32 u4ResultData = u4TestData & 0xFF;
    UTIL_Printf("TESTPMX: Get Test Data :%d, 0x%8x.\n", (INT32)u4ResultData, u4TestData);
    return (UINT8)u4ResultData;
}

void vSetPLLGP_HDMIDDS(BYTE bResIndex)
{
    bool fg60Hz = (prPmxModeRow(bResIndex)->u1Flags & PMX_MODE_PLL_60) != 0;

    vSetBits(PLL_CONTROL_B, 0x7);
    x_reg_write32(PLL_SYNTHESISER, fg60Hz ? SYNTHESISER_60HZ : SYNTHESISER_50HZ);
    vSetBits(PLL_CONTROL_A, 0x2);
    vSetBits(PLL_CONTROL_B, 0x4000);
    x_thread_delay(1);
    vSetBits(PLL_CONTROL_A, 0x4);
    vClearBits(PLL_CONTROL_A, 0x4);
    vSetBits(PLL_SYNTHESISER, 0x1); // the word is taken over on this pulse
    vClearBits(PLL_SYNTHESISER, 0x1);
    x_thread_delay(1);
    vSetBits(PLL_CONTROL_A, 0x10000);
    vSetBits(PLL_CONTROL_B, 0x10);
}

UINT32 PMX_SetTvType(UCHAR ucPmxId, UCHAR ucTvType)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    prPmxConf()->ucTvType = ucTvType;
    PMX_HalSetTvType(ucPmxId, ucTvType);
    return PMX_SET_OK;
}

UINT32 PMX_GetTvType(UCHAR ucPmxId, UCHAR* pucTvType)
{
    return u4PmxGiveByte(ucPmxId, prPmxConf()->ucTvType, pucTvType);
}
