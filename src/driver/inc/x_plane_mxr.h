// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The middleware's view of the plane mixer: enumerations that its calls carry. */
#ifndef X_PLANE_MXR_H
#define X_PLANE_MXR_H

#include "x_typedef.h"

/** Colour formats of digital port and HDMI (parallel port and HDMI). */
typedef DRV_ENUM(PLA_MXR_DIGITAL_OUTPUT_FMT_T)
{
    PLA_MXR_DIGITAL_OUTPUT_FMT_YBR = 0,
    PLA_MXR_DIGITAL_OUTPUT_FMT_RGB = 1,
    PLA_MXR_DIGITAL_OUTPUT_FMT_XVYCC = 2,
    PLA_MXR_DIGITAL_OUTPUT_FMT_YBR422 = 3,
    PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB = 4
} PLA_MXR_DIGITAL_OUTPUT_FMT_T;

/** Picture-processing setting of the external chip. The HDMI/AV driver's command is the setting plus 17. */
typedef DRV_ENUM(PLA_MXR_EXTERNAL_CHIP_SETTING_E)
{
    PLA_MXR_EXT_SHARPNESS = 0,
    PLA_MXR_EXT_BRIGHTNESS = 1,
    PLA_MXR_EXT_CONTRAST = 2,
    PLA_MXR_EXT_SATURATION = 3,
    PLA_MXR_EXT_COLOR_SPACE = 4,
    PLA_MXR_EXT_Y_C_DELAY = 5,
    PLA_MXR_EXT_CUE_CORRECT = 6,
    PLA_MXR_EXT_BORDER_LEVEL = 7,
    PLA_MXR_EXT_DEINTERLACE_MODE = 8,
    PLA_MXR_EXT_NOISE_REDUCTION = 9,
    PLA_MXR_EXT_EDGE_ENHANCEMENT = 10,
    PLA_MXR_EXT_DETAIL_ENHANCEMENT = 11,
    PLA_MXR_EXT_ZOOM_IMAGE = 12,
    PLA_MXR_EXT_GAMMA = 13,
    PLA_MXR_EXT_DEEP_COLOR = 14
} PLA_MXR_EXTERNAL_CHIP_SETTING_E;

/** Closed-caption switch. */
typedef DRV_ENUM(PLA_MXR_CLOSED_CAPTION_ON_OFF_T)
{
    PLA_MXR_CLOSED_CAPTION_OFF = 0,
    PLA_MXR_CLOSED_CAPTION_ON = 1
} PLA_MXR_CLOSED_CAPTION_ON_OFF_T;

DRV_STATIC_ASSERT(sizeof(PLA_MXR_DIGITAL_OUTPUT_FMT_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(PLA_MXR_EXTERNAL_CHIP_SETTING_E) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(PLA_MXR_CLOSED_CAPTION_ON_OFF_T) == 4, "enumerations are 32 bits wide");

#endif
