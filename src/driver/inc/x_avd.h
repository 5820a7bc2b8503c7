// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  HDMI codes shared by the HDMI/AV driver and its callers. */
#ifndef X_AVD_H
#define X_AVD_H

#include "x_typedef.h"

/** Colour formats of the HDMI signal; one byte in PMX_CHG_HDMI_COLOR_SPACE. */
typedef DRV_ENUM(HDMI_COLOR_SPACE_T)
{
    HDMI_RGB = 0,
    HDMI_RGB_FULL = 1,
    HDMI_YCBCR_444 = 2,
    HDMI_YCBCR_422 = 3,
    HDMI_XV_YCC = 4,
    HDMI_YCBCR_444_FULL = 5, /**< never asked for by the mixer */
    HDMI_YCBCR_422_FULL = 6  /**< never asked for by the mixer */
} HDMI_COLOR_SPACE_T;

/** Picture aspect ratio M1 M0 of the auxiliary video information frame (CEA-861). */
typedef DRV_ENUM(HDMI_PICTURE_ASPECT_RATIO_T)
{
    HDMI_PICTURE_4_3 = 1,
    HDMI_PICTURE_16_9 = 2
} HDMI_PICTURE_ASPECT_RATIO_T;

/** Active format aspect ratio R3 to R0 of the auxiliary video information frame (CEA-861). */
typedef DRV_ENUM(HDMI_AFD_FORMT_T)
{
    HDMI_AS_PICTURE_AR = 8 /**< same as the picture aspect ratio */
} HDMI_AFD_FORMT_T;

DRV_STATIC_ASSERT(sizeof(HDMI_COLOR_SPACE_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(HDMI_PICTURE_ASPECT_RATIO_T) == 4, "enumerations are 32 bits wide");
DRV_STATIC_ASSERT(sizeof(HDMI_AFD_FORMT_T) == 4, "enumerations are 32 bits wide");

#endif
