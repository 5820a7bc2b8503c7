// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The parallel digital port, and the colour format of the digital picture. Switch, width and mode
 * wait in the record until PMX_SetEnable has the mixer on; phase and colour format never wait. */
#include "drv_av_d.h"
#include "drv_pmx.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "x_avd.h"
#include "x_plane_mxr.h"

/* HDMI's code for each PLA_MXR_DIGITAL_OUTPUT_FMT_T. */
static constexpr UINT8 HDMI_COLOR_MODES[] = { HDMI_YCBCR_444, HDMI_RGB, HDMI_XV_YCC, HDMI_YCBCR_422, HDMI_RGB_FULL };
static_assert(sizeof HDMI_COLOR_MODES == PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB + 1);

void vPmxProgramDigitalOut(void)
{
    const PMX_CONF_T* prConf = prPmxConf();

    PMX_HalSetDigitalOut(0, prConf->ucDigitalOut, prConf->ucProprietaryMode, prConf->ucDigitalBit);
    PMX_HalSetDigitalOutRgb(0, prConf->ucDigitalRgb);
}

UINT32 PMX_SetDigitalOutEnable(UCHAR ucPmxId, UCHAR ucEnable)
{
    if (ucPmxId != 0 || !fgPmxHasCap(PMX_CAP_BIT_DIGITAL_OUT))
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId),
                              PMX_WHY(FEATURE_BIT, 0, PMX_CAP_BIT_DIGITAL_OUT, prPmxConf()->u4Capability));

    PMX_CONF_T* prConf = prPmxConf();
    prConf->ucDigitalOut = ucEnable;
    if (prConf->ucEnable != 0)
        vPmxProgramDigitalOut();
    else
        PMX_NOTE(STORED_ALONE);
    return 1;
}

UINT32 PMX_GetDigitalOutEnable(UCHAR ucPmxId, UCHAR* pucEnable)
{
    return u4PmxGiveFeatureByte(ucPmxId, PMX_CAP_BIT_DIGITAL_OUT, prPmxConf()->ucDigitalOut, pucEnable);
}

UINT32 PMX_SetDigitalOutPara(UCHAR ucPmxId, UCHAR ucDigitalBit, UCHAR ucProprietaryMode)
{
    if (ucPmxId != 0 || !fgPmxHasCap(PMX_CAP_BIT_DIGITAL_OUT))
        return PMX_WHY_EITHER(ucPmxId != 0, PMX_WHY(MIXER_ID, 0, ucPmxId),
                              PMX_WHY(FEATURE_BIT, 0, PMX_CAP_BIT_DIGITAL_OUT, prPmxConf()->u4Capability));

    PMX_CONF_T* prConf = prPmxConf();
    prConf->ucDigitalBit = ucDigitalBit;
    prConf->ucProprietaryMode = ucProprietaryMode;
    if (prConf->ucEnable != 0)
        vPmxProgramDigitalOut();
    else
        PMX_NOTE(STORED_ALONE);
    return 1;
}

UINT32 PMX_SetDigitalOutPhase(UCHAR ucPmxId, UINT32 u4Phase)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    PMX_NOTE(CLOCK_AT_ONCE, u4Phase);
    PMX_HalSetDigitalOutPhase(0, u4Phase);
    prPmxConf()->u4Phase = (UCHAR)u4Phase; // the record keeps 8 bits, the hardware got them all
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
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    // Stored and programmed before it is looked at: only HDMI has no code for a value above the last.
    prPmxConf()->ucDigitalRgb = ucRgb;
    PMX_HalSetDigitalOutRgb(0, ucRgb);
    if (ucRgb >= sizeof HDMI_COLOR_MODES)
        return PMX_WHY(COLOUR_FORMAT, 0, ucRgb);

    UINT8 ucColorMode = HDMI_COLOR_MODES[ucRgb];
    fgPmxDrvSetAvd(PMX_CHG_HDMI_COLOR_SPACE, &ucColorMode, 1);
    return 1;
}

UINT32 PMX_GetDigitalOutRgb(UCHAR ucPmxId, UCHAR* pucRgb)
{
    return u4PmxGiveByte(ucPmxId, prPmxConf()->ucDigitalRgb, pucRgb);
}
