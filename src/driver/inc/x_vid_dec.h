// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Aspect codes of decoded video, as the middleware hands them to the mixer. */
#ifndef X_VID_DEC_H
#define X_VID_DEC_H

#include "x_typedef.h"

/** Aspect code; carried in a UINT32. */
typedef DRV_ENUM(ASPECT_RATIO_T)
{
    ASP_UNKNOW = 0,
    ASP_1_1 = 1,
    ASP_4_3 = 2,
    ASP_16_9 = 3,
    ASP_221_1 = 4,
    ASP_4_3_LB = 5,
    ASP_16_9_NORMAL = 6,
    ASP_UNDEFINED = 7,
    ASP_16_9_PAN_SCAN = 8,
    ASP_4_3_FULL = 9
} ASPECT_RATIO_T;

DRV_STATIC_ASSERT(sizeof(ASPECT_RATIO_T) == 4, "enumerations are 32 bits wide");

#endif
