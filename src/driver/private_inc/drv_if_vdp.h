// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What a video plane can be told through the interface manager (IID_IVdp). */
#ifndef DRV_IF_VDP_H
#define DRV_IF_VDP_H

#include "drv_if_pmx.h"
#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

/** What a video plane offers. Each function takes first the tag that came with the table. The mixer calls
 *  pu4SetColorMode alone and ignores its result.
 *
 *  pu4SetColorMode is called with MutexPMX held: a plane that from inside it called i4Pmx_Connect or i4Pmx_Disconnect,
 *  or made the mixer's colour space change once more, would wait for itself. So would two threads for each other if a
 *  plane driver kept a lock of its pu4SetColorMode during i4Pmx_Connect, i4Pmx_Disconnect, PMX_VdpEnabled,
 *  PMX_OsdEnabled, PMX_OsdDisabled, PMX_DecideMasterColorSpace or PMX_InformVdpColorSpace: all of them can take
 *  MutexPMX. */
typedef struct
{
    UINT32 (*pu4SetPlaybackMode)(void* pvTag);
    UINT32 (*pu4AssignSyncCtrl)(void* pvTag);
    UINT32 (*pu4StcIsValid)(void* pvTag);
    UINT32 (*pu4SetFrameAccurateStartPts)(void* pvTag);
    UINT32 (*pu4SetFrameAccurateEndPts)(void* pvTag);
    UINT32 (*pu4Flush)(void* pvTag);
    UINT32 (*pu4AssignVdecCallback)(void* pvTag);
    UINT32 (*pu4DesiredResolution)(void* pvTag);
    /** Tell the plane the mixer's colour space.
     *  @param[in] pvTag        [tag] the tag that came with the table
     *  @param     eColorSpace  a DRV_PMX_COLOR_SPACE_T value
     *  @return the plane's result, which the mixer ignores */
    UINT32 (*pu4SetColorMode)(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace);
    UINT32 (*pu4GetCurrPictureInfo)(void* pvTag);
    UINT32 (*pu4PictureSent)(void* pvTag);
} IVdp;

#ifdef __cplusplus
}
#endif

#endif
