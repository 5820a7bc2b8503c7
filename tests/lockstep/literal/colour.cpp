// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Colour conversions between the mixer's colour space and the output's. */
#include "tests/lockstep/literal/literal.h"

void PMX_ColorSpaceSetup(DRV_PMX_COLOR_SPACE_T eMixerOutCS, UCHAR ucOutputMode)
{
    PMX_IsLog(9, "Mode(%d), eMixerOutCS(%d)\n", ucOutputMode, static_cast<int>(eMixerOutCS));
    PMX_HalSelectVdoutCconv(0, 1);
    PMX_HalSelectScalerCconv(0, 0);
    const mode_facts::Colours group = mode_facts::facts_of(ucOutputMode).colours;
    if (group == mode_facts::Colours::None)
        return;
    if (group == mode_facts::Colours::Sd && eMixerOutCS == DRV_PMX_CS_YCBCR_601)
    {
        PMX_HalSetCC_A(0, 0, 0);
        PMX_IsLog(9, "CC_A disable\n");
        PMX_HalSetScaler709601(0, 0, 0);
        PMX_IsLog(8, "Scaler CC disable, don't care\n");
    }
    else if (group == mode_facts::Colours::Sd && eMixerOutCS == DRV_PMX_CS_YCBCR_709)
    {
        PMX_HalSetCC_A(0, 1, 1);
        PMX_IsLog(9, "CC_A enable, 709->601\n");
        PMX_HalSetScaler709601(0, 0, 0);
        PMX_IsLog(8, "Scaler CC disable, don't care\n");
    }
    else if (group == mode_facts::Colours::Hd && eMixerOutCS == DRV_PMX_CS_YCBCR_601)
    {
        PMX_HalSetCC_A(0, 1, 0);
        PMX_IsLog(9, "CC_A enable, 601->709\n");
        PMX_HalSetScaler709601(0, 0, 0);
        PMX_IsLog(8, "Scaler CC disable\n");
    }
    else if (group == mode_facts::Colours::Hd && eMixerOutCS == DRV_PMX_CS_YCBCR_709)
    {
        PMX_HalSetCC_A(0, 0, 0);
        PMX_IsLog(9, "CC_A disable\n");
        PMX_HalSetScaler709601(0, 1, 1);
        PMX_IsLog(8, "Scaler CC enable, 709->601\n");
    }
    else
    {
        PMX_IsLog(5, "Invalid Color Space Id\n");
        Assert("0", __FILE__, __LINE__);
    }
}
