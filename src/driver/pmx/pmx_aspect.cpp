// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Three aspect ratios: the one in force, one on its way in with the next mode change, and one for the digest view. */
#include "drv_av_d.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_if.h"
#include "u_os.h"
#include "x_avd.h"
#include "x_vid_dec.h"

/* Signal a normal ratio; FALSE when the HDMI/AV driver refuses it. */
static BOOL fgSignalHdmi(UINT32 u4AspectRatio)
{
    return fgPmxDrvSetAvd(PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, &u4AspectRatio, 1);
}

/* Signal a stored ratio and have the picture recomputed. 0 when HDMI refuses: then the video planes are not told. */
static UINT32 u4ApplyNormal(UINT32 u4AspectRatio, const CHAR* szDone)
{
    if (fgSignalHdmi(u4AspectRatio) == FALSE)
        return PMX_WHY(HDMI_REFUSED, 0, PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, u4AspectRatio);

    VDP_GlobalOutputChange();
    PMX_IS_LOG_TEXT(9, szDone);
    return 1;
}

UINT32 PMX_SetAspectRatio(UCHAR ucPmxId, UINT32 u4AspectRatio)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    PMX_IsLog(9, "PMX_ID(%d), Aspect Ratio(%d)\n", ucPmxId, (INT32)u4AspectRatio);
    prPmxConf()->u4AspectRatio = u4AspectRatio; // before HDMI is asked: a refusal leaves it new
    return u4ApplyNormal(u4AspectRatio, "VDP_GlobalOutputChange\n");
}

UINT32 PMX_SetAspectRatioEx(UCHAR ucPmxId, UINT32 u4AspectRatio, BOOL fgApplyOnNext)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    PMX_CONF_T* prConf = prPmxConf();
    PMX_IsLog(9, "[EX] PMX_ID(%d), Aspect Ratio(%d), Apply On Next(%d)\n", ucPmxId, (INT32)u4AspectRatio,
              fgApplyOnNext);
    if (fgApplyOnNext != FALSE)
    {
        prConf->fgAspNext = TRUE;
        prConf->u4AspNext = u4AspectRatio;
        return 1;
    }

    prConf->u4AspectRatio = u4AspectRatio;
    prConf->fgAspNext = FALSE;
    prConf->u4AspNext = 0;
    return u4ApplyNormal(u4AspectRatio, "[EX] VDP_GlobalOutputChange\n");
}

/* The result is a ratio, not a success; nothing waiting is no failure. */
UINT32 PMX_SetAspectRatioNext(UCHAR ucPmxId)
{
    PMX_CONF_T* prConf = prPmxConf();
    if (prConf->fgAspNext == FALSE)
        return PMX_WHY(NOTHING_WAITS, prConf->u4AspectRatio, prConf->u4AspectRatio);

    prConf->fgAspNext = FALSE;
    prConf->u4AspectRatio = prConf->u4AspNext;
    if (ucPmxId == 0 && fgSignalHdmi(prConf->u4AspectRatio) == FALSE)
        return PMX_WHY(HDMI_REFUSED, 0, PMX_CHG_HDMI_VIDEO_ASPECT_RATIO, prConf->u4AspectRatio);

    VDP_GlobalOutputChange();
    return prConf->u4AspectRatio;
}

/* What an aspect code is signalled as. */
typedef struct
{
    UINT8 u1Asp;      // the row's own code
    UINT8 u1TveAsp;   // TVE_ASPECT_RATIO_T
    UINT8 u1Hdmi_par; // HDMI_PICTURE_ASPECT_RATIO_T
    UINT8 u1Hdmi_afd; // HDMI_AFD_FORMT_T
} SIGNALLING_T;

// clang-format off
static constexpr SIGNALLING_T SIGNALLING[] = {
    { ASP_UNKNOW,        ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR },
    { ASP_1_1,           ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR },
    { ASP_4_3,           ASPECT_RATIO_4_3,              HDMI_PICTURE_4_3,  HDMI_AS_PICTURE_AR },
    { ASP_16_9,          ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR },
    { ASP_221_1,         ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR },
    { ASP_4_3_LB,        ASPECT_RATIO_4_3,              HDMI_PICTURE_4_3,  HDMI_AS_PICTURE_AR },
    { ASP_16_9_NORMAL,   ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR },
    { ASP_UNDEFINED,     ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR },
    { ASP_16_9_PAN_SCAN, ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR },
    { ASP_4_3_FULL,      ASPECT_RATIO_4_3,              HDMI_PICTURE_4_3,  HDMI_AS_PICTURE_AR },
    // every other code
    { ASP_4_3_FULL + 1,  ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR },
};
// clang-format on

static consteval bool fgEveryRowIsItsCode()
{
    for (UINT32 i = 0; i < COUNT_OF(SIGNALLING); i++)
    {
        if (SIGNALLING[i].u1Asp != i)
            return false;
    }
    return true;
}
static_assert(fgEveryRowIsItsCode());

static const SIGNALLING_T* prSignallingOf(UINT32 u4AspectRatio)
{
    return &SIGNALLING[u4AspectRatio <= ASP_4_3_FULL ? u4AspectRatio : ASP_4_3_FULL + 1];
}

UINT32 PMX_SetDigestAspectRatioEx(UCHAR ucPmxId, UINT32 u4AspectRatio, BOOL fgDigestEnable)
{
    if (ucPmxId != 0)
        return PMX_WHY(MIXER_ID, 0, ucPmxId);

    PMX_CONF_T* prConf = prPmxConf();
    PMX_IsLog(0, "[EX] PMX_ID(%d), Digest Aspect Ratio(%d), Digest mode enable(%d)\n", ucPmxId, (INT32)u4AspectRatio,
              fgDigestEnable);
    prConf->fgDigestEnable = fgDigestEnable != FALSE;
    prConf->u4DigestAsp = u4AspectRatio; // stored when the view is left, too
    VDP_GlobalOutputChange();
    if (fgDigestEnable != FALSE)
        return 1;

    const SIGNALLING_T* prSignalling = prSignallingOf(u4AspectRatio);
    TVE_SetAspectRatio((TVE_ASPECT_RATIO_T)prSignalling->u1TveAsp);
    // HDMI's values are shown, not sent: the sink keeps what the normal ratio signalled.
    PMX_IsLog(0, "[EX] TveAsp = %d Hdmi(par = %d,afd = %d)\n", prSignalling->u1TveAsp, prSignalling->u1Hdmi_par,
              prSignalling->u1Hdmi_afd);
    return 1;
}

UINT32 PMX_GetAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio)
{
    const PMX_CONF_T* prConf = prPmxConf();
    return u4PmxGiveWord(ucPmxId, prConf->fgDigestEnable != FALSE ? prConf->u4DigestAsp : prConf->u4AspectRatio,
                         pu4AspectRatio);
}

INT32 i4PmxGetAspectRatio(void* pvTag, UINT32* pu4AspectRatio)
{
    return (INT32)PMX_GetAspectRatio(ucPmxIdOfTag(pvTag), pu4AspectRatio);
}

BOOL PMX_IsUnderDigestMode(UCHAR ucPmxId)
{
    return ucPmxId == 0 ? prPmxConf()->fgDigestEnable : FALSE;
}

UINT32 PMX_GetNormalAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio)
{
    return u4PmxGiveWord(ucPmxId, prPmxConf()->u4AspectRatio, pu4AspectRatio);
}

UINT32 PMX_GetDigestAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio)
{
    return u4PmxGiveWord(ucPmxId, prPmxConf()->u4DigestAsp, pu4AspectRatio);
}

UINT32 PMX_GetAspectRatioMW(UCHAR ucPmxId, UINT32* pu4AspectRatio)
{
    const PMX_CONF_T* prConf = prPmxConf();
    return u4PmxGiveWord(ucPmxId, prConf->fgAspNext != FALSE ? prConf->u4AspNext : prConf->u4AspectRatio,
                         pu4AspectRatio);
}
