// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* A TV encoder driver of somebody else: every function of drv_tve.h. */
#include "own_encoder.h"

#include "u_os.h"

unsigned uFormatsSet;
UCHAR aucTargetFormat[2];
UINT32 u4SetFormatAnswer = TVE_SET_OK;

UINT32 TVE_SetFmtEx(UINT32 u4Tve, UCHAR ucMainFmt, UCHAR ucVFreq, UCHAR ucTargetFmt, BOOL fgEnable, BOOL fgHD,
                    UINT8 fgOSD5)
{
    (void)ucMainFmt;
    (void)ucVFreq;
    (void)fgEnable;
    (void)fgHD;
    (void)fgOSD5;
    x_thread_delay(3); /* it uses the rest of the platform as any driver does */
    uFormatsSet++;
    if (u4Tve <= TVE_2)
        aucTargetFormat[u4Tve] = ucTargetFmt;
    return u4SetFormatAnswer;
}

void TVE_SetEnable(UINT32 u4Tve, BOOL fgEnable)
{
    (void)u4Tve;
    (void)fgEnable;
}

void TVE_SetMuteCtrol(BOOL fgFmtChange, UCHAR ucCavFmt, UCHAR ucCvbsFmt, BOOL fgHD, UINT8 fgOSD5)
{
    (void)fgFmtChange;
    (void)ucCavFmt;
    (void)ucCvbsFmt;
    (void)fgHD;
    (void)fgOSD5;
}

void TVE_SetBlackScreen(UINT32 u4Tve, BOOL fgOn)
{
    (void)u4Tve;
    (void)fgOn;
}

#define OWN_SETTING(name)    \
    void name(UCHAR ucValue) \
    {                        \
        (void)ucValue;       \
    }

OWN_SETTING(TVE_SetBrightness)
OWN_SETTING(TVE_SetContrast)
OWN_SETTING(TVE_SetHue)
OWN_SETTING(TVE_SetSaturation)
OWN_SETTING(TVE_SetSharpness)
OWN_SETTING(TVE_CVBSSetup_En)
OWN_SETTING(TVE_CVBSPal60_En)
OWN_SETTING(TVE_Identify_Mediatype)

void TVE_SetBlackLvl(UCHAR ucCAVEn, UCHAR ucCVBSEn)
{
    (void)ucCAVEn;
    (void)ucCVBSEn;
}

void TVE_SetAspectRatio(TVE_ASPECT_RATIO_T eAspect)
{
    (void)eAspect;
}
