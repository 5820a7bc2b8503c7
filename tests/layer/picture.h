// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The five picture adjustments side by side, for what is alike in all of them. */
#pragma once

#include <cstdint>
#include <string>

#include "drv_pmx.h"

namespace picture
{

struct Adjustment
{
    std::string name;  ///< in texts, functions and commands
    std::string field; ///< of the record
    UCHAR by_default;
    std::uint32_t capability; ///< the bit that admits it
    unsigned hdmi_command;
    bool in_mixer; ///< the mixer's hardware has it too
    UINT32 (*set)(UCHAR ucPmxId, UCHAR ucValue, UCHAR bSetTVE);
    UINT32 (*get)(UCHAR ucPmxId, UCHAR* pucValue);
    void (*short_set)(UCHAR ucValue);
    void (*short_get)(UCHAR* pucValue);
};

inline const Adjustment adjustments[] = {
    { "Brightness", "ucBrightness", 128, 0x00200000, 4, true, PMX_SetBrightness, PMX_GetBrightness, d_PMX_SetBrightness,
      d_PMX_GetBrightness },
    { "Contrast", "ucContrast", 128, 0x00400000, 5, true, PMX_SetContrast, PMX_GetContrast, d_PMX_SetContrast,
      d_PMX_GetContrast },
    { "Hue", "ucHue", 128, 0x00800000, 6, false, PMX_SetHue, PMX_GetHue, d_PMX_SetHue, d_PMX_GetHue },
    { "Saturation", "ucSaturation", 128, 0x01000000, 7, false, PMX_SetSaturation, PMX_GetSaturation,
      d_PMX_SetSaturation, d_PMX_GetSaturation },
    { "Sharpness", "ucSharpness", 0, 0x08000000, 15, false, PMX_SetSharpness, PMX_GetSharpness, d_PMX_SetSharpness,
      d_PMX_GetSharpness },
};

/** What a setter logs first: the target before the value. */
inline std::string announced(const Adjustment& adjustment, unsigned target, unsigned value)
{
    return "LOG8 \"[PMX] Seting " + adjustment.name + ": " + std::to_string(target) + "," + std::to_string(value) +
           ".\\n\"\n";
}

/** The whole trace of an admitted adjustment. */
inline std::string applied(const Adjustment& adjustment, unsigned target, unsigned value)
{
    const std::string number = std::to_string(value);
    std::string lines = announced(adjustment, target, value);
    if (adjustment.in_mixer)
        lines += "PMX_HalSet" + adjustment.name + "(0, " + number + ")\n";
    if (target != 0)
        return lines + "TVE_Set" + adjustment.name + "(" + number + ")\n";
    return lines + "fgPmxDrvSetAvd(" + std::to_string(adjustment.hdmi_command) + ", " + number + ", 1) = TRUE\n";
}

/** The whole trace of one that the capability word does not admit. */
inline std::string refused(const Adjustment& adjustment, unsigned target, unsigned value)
{
    return announced(adjustment, target, value) + "LOG8 \"[PMX] Seting " + adjustment.name +
           " fail: " + std::to_string(target) + "," + std::to_string(value) + ".\\n\"\n";
}

} // namespace picture
