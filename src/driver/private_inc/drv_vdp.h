// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Video plane driver: what the mixer tells it and asks of it. Its planes' interface table is in drv_if_vdp.h. */
#ifndef DRV_VDP_H
#define DRV_VDP_H

#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

/** How far the hardware shows a video plane. */
typedef DRV_ENUM(VDP_ENABLE_T)
{
    VDP_DISABLED = 0,
    VDP_HIDDEN = 1, /**< counts as enabled */
    VDP_ENABLED = 2
} VDP_ENABLE_T;

DRV_STATIC_ASSERT(sizeof(VDP_ENABLE_T) == 4, "enumerations are 32 bits wide");

/** Tell the driver the output's TV format.
 *  @param ucMode     a PMX_RESOLUTION_MODE_T value
 *  @param fgChanged  1 after the format has been programmed anew, be the mode the same or not; 0 when the mixer's
 *                    format stays
 *  @context a thread that may sleep */
void VDP_SetTvFormat(UCHAR ucMode, BOOL fgChanged);

/** Have every video plane recompute its output geometry; the driver asks the mixer for what it needs.
 *  @context a thread that may sleep */
void VDP_GlobalOutputChange(void);

/** Commands that the mixer gives; what the driver does with them is the driver's own. */
#define VDP_CMD_OUTPUT_CHANGED 2 /**< the mixer has a new format */
#define VDP_CMD_ORDER_CHANGES 17 /**< the first video plane is about to go above or below the second */

/** Give a video plane a command that it carries out at its next vertical sync.
 *  @param u4VdpIdx  video plane 0, 1 or 2
 *  @param u4Cmd     VDP_CMD_OUTPUT_CHANGED or VDP_CMD_ORDER_CHANGES
 *  @context a thread that may sleep */
void VDP_VsyncSendCmd(UINT32 u4VdpIdx, UINT32 u4Cmd);

/** Fill a video plane with one colour.
 *  @param ucVdpId  video plane
 *  @param ucY      luma
 *  @param ucU      blue difference
 *  @param ucV      red difference
 *  @context a thread that may sleep */
void VDP_SetClearVideo(UCHAR ucVdpId, UCHAR ucY, UCHAR ucU, UCHAR ucV);

/** Ask for a video plane's hardware enable state.
 *  @param ucVdpId  video plane 0 or 1
 *  @return its state
 *  @context any thread */
VDP_ENABLE_T VDP_GetHwEnable(UCHAR ucVdpId);

/** Switch closed captions on or off.
 *  @param fgEnable  on
 *  @context a thread that may sleep */
void VDP_EnableCC(BOOL fgEnable);

/** Ask whether a change still waits for the planes' sync control. Asked in the timer's context too. After TRUE,
 *  somebody in the stack calls PMX_SetOsdEnable once it turns FALSE: until then graphics stay out of the mix.
 *  @return TRUE or FALSE
 *  @context any thread, and the timer's */
BOOL fgVdpIsWaitforSyncCtrl(void);

#ifdef __cplusplus
}
#endif

#endif
