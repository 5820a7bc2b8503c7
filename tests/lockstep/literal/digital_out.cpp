// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The parallel digital port, the digital picture's colour format; external chip and closed captions. */
#include "tests/lockstep/literal/literal.h"

static bool has_digital_out()
{
    return (conf.u4Capability & 0x2000000) != 0;
}

UINT32 PMX_SetDigitalOutEnable(UCHAR ucPmxId, UCHAR ucEnable)
{
    if (ucPmxId != 0)
        return 0;
    if (!has_digital_out())
        return 0;
    conf.ucDigitalOut = ucEnable;
    if (conf.ucEnable != 0)
    {
        PMX_HalSetDigitalOut(0, ucEnable, conf.ucProprietaryMode, conf.ucDigitalBit);
        PMX_HalSetDigitalOutRgb(0, conf.ucDigitalRgb);
    }
    return 1;
}

UINT32 PMX_SetDigitalOutPara(UCHAR ucPmxId, UCHAR ucDigitalBit, UCHAR ucProprietaryMode)
{
    if (ucPmxId != 0)
        return 0;
    if (!has_digital_out())
        return 0;
    conf.ucDigitalBit = ucDigitalBit;
    conf.ucProprietaryMode = ucProprietaryMode;
    if (conf.ucEnable != 0)
    {
        PMX_HalSetDigitalOut(0, conf.ucDigitalOut, conf.ucProprietaryMode, conf.ucDigitalBit);
        PMX_HalSetDigitalOutRgb(0, conf.ucDigitalRgb);
    }
    return 1;
}

UINT32 PMX_SetDigitalOutPhase(UCHAR ucPmxId, UINT32 u4Phase)
{
    if (ucPmxId != 0)
        return 0;
    PMX_HalSetDigitalOutPhase(0, u4Phase);
    conf.u4Phase = static_cast<UCHAR>(u4Phase & 0xFF);
    return 1;
}

UINT32 PMX_SetDigitalOutDrv(UINT32 u4Drving)
{
    PMX_HalSetDigitalOutDrv(u4Drving);
    return 1;
}

UINT32 PMX_SetDigitalOutRgb(UCHAR ucPmxId, UCHAR ucRgb)
{
    if (ucPmxId != 0)
        return 0;
    conf.ucDigitalRgb = ucRgb;
    PMX_HalSetDigitalOutRgb(0, ucRgb);
    UINT8 ucColorMode = 0;
    switch (ucRgb)
    {
    case 0: ucColorMode = 2; break;
    case 1: ucColorMode = 0; break;
    case 2: ucColorMode = 4; break;
    case 3: ucColorMode = 3; break;
    case 4: ucColorMode = 1; break;
    default: return 0;
    }
    fgPmxDrvSetAvd(0, &ucColorMode, 1);
    return 1;
}

UINT32 PMX_GetDigitalOutEnable(UCHAR ucPmxId, UCHAR* pucEnable)
{
    if (ucPmxId != 0 || pucEnable == nullptr)
        return 0;
    if (!has_digital_out())
        return 0;
    *pucEnable = conf.ucDigitalOut;
    return 1;
}

UINT32 PMX_GetDigitalOutRgb(UCHAR ucPmxId, UCHAR* pucRgb)
{
    if (ucPmxId != 0 || pucRgb == nullptr)
        return 0;
    *pucRgb = conf.ucDigitalRgb;
    return 1;
}

UINT32 PMX_SetExternalChipSetting(PLA_MXR_EXTERNAL_CHIP_SETTING_E eSetType, INT32 i4Value)
{
    if (static_cast<UINT32>(eSetType) > 14)
        return 0;
    fgPmxDrvSetAvd(static_cast<UINT32>(eSetType) + 17, &i4Value, 1);
    return 1;
}

UINT32 PMX_SetClosedCaptionOnOff(UCHAR ucPmxId, PLA_MXR_CLOSED_CAPTION_ON_OFF_T eClosedCaptionOnOff)
{
    if (ucPmxId != 0)
        return 1;
    if (eClosedCaptionOnOff == PLA_MXR_CLOSED_CAPTION_ON)
        VDP_EnableCC(1);
    else
        VDP_EnableCC(0);
    return 1;
}
