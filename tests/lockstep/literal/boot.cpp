// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Boot resolution, video PLL, TV type. */
#include "tests/lockstep/literal/literal.h"

UINT8 PMX_GetHDMIDefaultRes(void)
{
    UINT32 u4TestData = 0;
    const INT32 i4_id = get_part_id_by_name("fast_init_param");
    UTIL_Printf("TESTPMX: Get pard ID:%d.\n", i4_id);
    i4NFBPartitionRead(i4_id, 0, &u4TestData, 4);
    const UINT32 u4ResultData = u4TestData & 0xFF;
    UTIL_Printf("TESTPMX: Get Test Data :%d, 0x%8x.\n", static_cast<int>(u4ResultData), u4TestData);
    return static_cast<UINT8>(u4ResultData);
}

void vSetPLLGP_HDMIDDS(BYTE bResIndex)
{
    const UINT32 control_a = 0xFD00003C;
    const UINT32 synthesiser = 0xFD000040;
    const UINT32 control_b = 0xFD000044;
    x_reg_write32(control_b, x_reg_read32(control_b) | 0x7);
    x_reg_write32(synthesiser, mode_facts::facts_of(bResIndex).is(mode_facts::pll_60) ? 0x03D2F1AA : 0x03D1745E);
    x_reg_write32(control_a, x_reg_read32(control_a) | 0x2);
    x_reg_write32(control_b, x_reg_read32(control_b) | 0x4000);
    x_thread_delay(1);
    x_reg_write32(control_a, x_reg_read32(control_a) | 0x4);
    x_reg_write32(control_a, x_reg_read32(control_a) & ~0x4u);
    x_reg_write32(synthesiser, x_reg_read32(synthesiser) | 0x1);
    x_reg_write32(synthesiser, x_reg_read32(synthesiser) & ~0x1u);
    x_thread_delay(1);
    x_reg_write32(control_a, x_reg_read32(control_a) | 0x10000);
    x_reg_write32(control_b, x_reg_read32(control_b) | 0x10);
}

UINT32 PMX_SetTvType(UCHAR ucPmxId, UCHAR ucTvType)
{
    if (ucPmxId != 0)
        return 0;
    conf.ucTvType = ucTvType;
    PMX_HalSetTvType(ucPmxId, ucTvType);
    return 1;
}

UINT32 PMX_GetTvType(UCHAR ucPmxId, UCHAR* pucTvType)
{
    if (ucPmxId != 0 || pucTvType == nullptr)
        return 0;
    *pucTvType = conf.ucTvType;
    return 1;
}
