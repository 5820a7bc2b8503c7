// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Colour conversions between the mixer's colour space and the output's. */
#include "drv_pmx.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

/* How the two converters are set, and what the console says of them. */
typedef struct
{
    UINT8 u1CCAEnable;  // converter A
    UINT8 u1CCADir;     // 0: 601 to 709, 1: 709 to 601
    UINT8 u1ScalerConv; // the scaler's converter, 709 to 601
    const CHAR* szCCA;
    const CHAR* szScalerConv;
} CONVERSION_T;

/* For each standard of the output, from PMX_COLOUR_SD on, the two colour spaces that planes are mixed in. */
static constexpr CONVERSION_T CONVERSIONS[] = {
    // SD: the scaler's picture is not looked at
    { 0, 0, 0, "CC_A disable\n", "Scaler CC disable, don't care\n" },          // 601
    { 1, 1, 0, "CC_A enable, 709->601\n", "Scaler CC disable, don't care\n" }, // 709
    // HD
    { 1, 0, 0, "CC_A enable, 601->709\n", "Scaler CC disable\n" }, // 601
    { 0, 0, 1, "CC_A disable\n", "Scaler CC enable, 709->601\n" }, // 709
};
static_assert(COUNT_OF(CONVERSIONS) / 2 == PMX_COLOUR_HD && PMX_COLOUR_SD == 1 && DRV_PMX_CS_YCBCR_601 == 0 &&
              DRV_PMX_CS_YCBCR_709 == 1);

void PMX_ColorSpaceSetup(DRV_PMX_COLOR_SPACE_T eMixerOutCS, UCHAR ucOutputMode)
{
    PMX_IsLog(9, "Mode(%d), eMixerOutCS(%d)\n", ucOutputMode, (INT32)eMixerOutCS);
    PMX_HalSelectVdoutCconv(0, 1);
    PMX_HalSelectScalerCconv(0, 0);

    UINT8 u1Colour = prPmxModeRow(ucOutputMode)->u1Colour;
    if (u1Colour == PMX_COLOUR_NONE) // the converters keep what they were set to
    {
        PMX_NOTE(NO_STANDARD, ucOutputMode);
        return;
    }

    // The mixer is never set up for RGB, although the enumeration has it.
    if (eMixerOutCS > DRV_PMX_CS_YCBCR_709)
    {
        PMX_NOTE(COLOUR_SPACE, eMixerOutCS);
        PMX_IsLog(5, "Invalid Color Space Id\n");
        Assert("0", __FILE__, __LINE__);
        return;
    }

    size_t zRow = 2 * ((size_t)u1Colour - PMX_COLOUR_SD) + eMixerOutCS;
    const CONVERSION_T* prConversion = &CONVERSIONS[zRow];
    PMX_HalSetCC_A(0, prConversion->u1CCAEnable, prConversion->u1CCADir);
    PMX_IS_LOG_TEXT(9, prConversion->szCCA);
    PMX_HalSetScaler709601(0, prConversion->u1ScalerConv, prConversion->u1ScalerConv);
    PMX_IS_LOG_TEXT(8, prConversion->szScalerConv);
}
