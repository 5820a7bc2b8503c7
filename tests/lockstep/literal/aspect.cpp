// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Aspect ratio: normal, deferred, digest. */
#include "tests/lockstep/literal/literal.h"

UINT32 PMX_SetAspectRatio(UCHAR ucPmxId, UINT32 u4AspectRatio)
{
    if (ucPmxId != 0)
        return 0;
    PMX_IsLog(9, "PMX_ID(%d), Aspect Ratio(%d)\n", ucPmxId, static_cast<int>(u4AspectRatio));
    conf.u4AspectRatio = u4AspectRatio;
    if (fgPmxDrvSetAvd(1, &u4AspectRatio, 1) == FALSE)
        return 0;
    VDP_GlobalOutputChange();
    PMX_IsLog(9, "VDP_GlobalOutputChange\n");
    return 1;
}

UINT32 PMX_SetAspectRatioEx(UCHAR ucPmxId, UINT32 u4AspectRatio, BOOL fgApplyOnNext)
{
    if (ucPmxId != 0)
        return 0;
    PMX_IsLog(9, "[EX] PMX_ID(%d), Aspect Ratio(%d), Apply On Next(%d)\n", ucPmxId, static_cast<int>(u4AspectRatio),
              fgApplyOnNext);
    if (fgApplyOnNext != 0)
    {
        conf.fgAspNext = 1;
        conf.u4AspNext = u4AspectRatio;
        return 1;
    }
    conf.u4AspectRatio = u4AspectRatio;
    conf.fgAspNext = 0;
    conf.u4AspNext = 0;
    if (fgPmxDrvSetAvd(1, &u4AspectRatio, 1) == FALSE)
        return 0;
    VDP_GlobalOutputChange();
    PMX_IsLog(9, "[EX] VDP_GlobalOutputChange\n");
    return 1;
}

UINT32 PMX_SetAspectRatioNext(UCHAR ucPmxId)
{
    if (conf.fgAspNext == 0)
        return conf.u4AspectRatio;
    conf.fgAspNext = 0;
    conf.u4AspectRatio = conf.u4AspNext;
    if (ucPmxId == 0)
    {
        UINT32 ratio = conf.u4AspectRatio;
        if (fgPmxDrvSetAvd(1, &ratio, 1) == FALSE)
            return 0;
    }
    VDP_GlobalOutputChange();
    return conf.u4AspectRatio;
}

struct Signalling
{
    TVE_ASPECT_RATIO_T tve;
    int par;
    int afd;
};

static Signalling signalling_of(UINT32 ratio)
{
    switch (ratio)
    {
    case ASP_4_3: return { ASPECT_RATIO_4_3, HDMI_PICTURE_4_3, HDMI_AS_PICTURE_AR };
    case ASP_16_9: return { ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR };
    case ASP_221_1: return { ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR };
    case ASP_4_3_LB: return { ASPECT_RATIO_4_3, HDMI_PICTURE_4_3, HDMI_AS_PICTURE_AR };
    case ASP_16_9_NORMAL: return { ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR };
    case ASP_UNDEFINED: return { ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR };
    case ASP_16_9_PAN_SCAN: return { ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR };
    case ASP_4_3_FULL: return { ASPECT_RATIO_4_3, HDMI_PICTURE_4_3, HDMI_AS_PICTURE_AR };
    default: return { ASPECT_RATIO_16_9_FULL_FORMAT, HDMI_PICTURE_16_9, HDMI_AS_PICTURE_AR };
    }
}

UINT32 PMX_SetDigestAspectRatioEx(UCHAR ucPmxId, UINT32 u4AspectRatio, BOOL fgDigestEnable)
{
    if (ucPmxId != 0)
        return 0;
    PMX_IsLog(0, "[EX] PMX_ID(%d), Digest Aspect Ratio(%d), Digest mode enable(%d)\n", ucPmxId,
              static_cast<int>(u4AspectRatio), fgDigestEnable);
    if (fgDigestEnable != 0)
    {
        conf.fgDigestEnable = 1;
        conf.u4DigestAsp = u4AspectRatio;
        VDP_GlobalOutputChange();
        return 1;
    }
    conf.fgDigestEnable = 0;
    conf.u4DigestAsp = u4AspectRatio;
    VDP_GlobalOutputChange();
    const Signalling signalling = signalling_of(u4AspectRatio);
    TVE_SetAspectRatio(signalling.tve);
    PMX_IsLog(0, "[EX] TveAsp = %d Hdmi(par = %d,afd = %d)\n", static_cast<int>(signalling.tve), signalling.par,
              signalling.afd);
    return 1;
}

UINT32 PMX_GetAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio)
{
    if (ucPmxId != 0 || pu4AspectRatio == nullptr)
        return 0;
    if (conf.fgDigestEnable != 0)
        *pu4AspectRatio = conf.u4DigestAsp;
    else
        *pu4AspectRatio = conf.u4AspectRatio;
    return 1;
}

INT32 i4PmxGetAspectRatio(void* pvTag, UINT32* pu4AspectRatio)
{
    return static_cast<INT32>(PMX_GetAspectRatio(id_of(pvTag), pu4AspectRatio));
}

BOOL PMX_IsUnderDigestMode(UCHAR ucPmxId)
{
    if (ucPmxId != 0)
        return FALSE;
    return conf.fgDigestEnable;
}

UINT32 PMX_GetNormalAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio)
{
    if (ucPmxId != 0 || pu4AspectRatio == nullptr)
        return 0;
    *pu4AspectRatio = conf.u4AspectRatio;
    return 1;
}

UINT32 PMX_GetDigestAspectRatio(UCHAR ucPmxId, UINT32* pu4AspectRatio)
{
    if (ucPmxId != 0 || pu4AspectRatio == nullptr)
        return 0;
    *pu4AspectRatio = conf.u4DigestAsp;
    return 1;
}

UINT32 PMX_GetAspectRatioMW(UCHAR ucPmxId, UINT32* pu4AspectRatio)
{
    if (ucPmxId != 0 || pu4AspectRatio == nullptr)
        return 0;
    if (conf.fgAspNext != 0)
        *pu4AspectRatio = conf.u4AspNext;
    else
        *pu4AspectRatio = conf.u4AspectRatio;
    return 1;
}
