/* Colour conversions between the mixer's colour space and the output's. */
#include "drv_pmx.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

static void vSetForSdOutput(DRV_PMX_COLOR_SPACE_T eMixerOutCS)
{
    if (eMixerOutCS == DRV_PMX_CS_YCBCR_601)
    {
        PMX_HalSetCC_A(0, 0, 0);
        PMX_IsLog(9, "CC_A disable\n");
    }
    else
    {
        PMX_HalSetCC_A(0, 1, 1);
        PMX_IsLog(9, "CC_A enable, 709->601\n");
    }
    PMX_HalSetScaler709601(0, 0, 0);
    PMX_IsLog(8, "Scaler CC disable, don't care\n");
}

static void vSetForHdOutput(DRV_PMX_COLOR_SPACE_T eMixerOutCS)
{
    if (eMixerOutCS == DRV_PMX_CS_YCBCR_601)
    {
        PMX_HalSetCC_A(0, 1, 0);
        PMX_IsLog(9, "CC_A enable, 601->709\n");
        PMX_HalSetScaler709601(0, 0, 0);
        PMX_IsLog(8, "Scaler CC disable\n");
    }
    else
    {
        PMX_HalSetCC_A(0, 0, 0);
        PMX_IsLog(9, "CC_A disable\n");
        PMX_HalSetScaler709601(0, 1, 1);
        PMX_IsLog(8, "Scaler CC enable, 709->601\n");
    }
}

void PMX_ColorSpaceSetup(DRV_PMX_COLOR_SPACE_T eMixerOutCS, UCHAR ucOutputMode)
{
    PMX_IsLog(9, "Mode(%d), eMixerOutCS(%d)\n", ucOutputMode, (INT32)eMixerOutCS);
    PMX_HalSelectVdoutCconv(0, 1);
    PMX_HalSelectScalerCconv(0, 0);

    UINT8 u1Colour = prPmxModeRow(ucOutputMode)->u1Colour;
    if (u1Colour == PMX_COLOUR_NONE) // the converters keep what they were set to
        return;

    // The mixer is never set up for RGB, although the enumeration has it.
    if (eMixerOutCS != DRV_PMX_CS_YCBCR_601 && eMixerOutCS != DRV_PMX_CS_YCBCR_709)
    {
        PMX_IsLog(5, "Invalid Color Space Id\n");
        Assert("0", __FILE__, __LINE__);
        return;
    }

    if (u1Colour == PMX_COLOUR_SD)
        vSetForSdOutput(eMixerOutCS);
    else
        vSetForHdOutput(eMixerOutCS);
}
