// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Source events, and the master colour space that follows from them. Port fields are written on the sources' threads
 * without the mutex; only informing the video planes takes it. */
#include "drv_av_d.h"
#include "drv_if.h"
#include "drv_if_vdp.h"
#include "drv_osd.h"
#include "drv_pmx.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

#define VDP_SUB 1        /* second video */
#define VDP_BACKGROUND 2 /* still-picture background, on the second video's port */

/* Wider than 720 or taller than 576 is BT.709. */
static DRV_PMX_COLOR_SPACE_T eColorSpaceOfSize(INT32 i4SrcWidth, INT32 i4SrcHeight)
{
    return i4SrcWidth > 720 || i4SrcHeight > 576 ? DRV_PMX_CS_YCBCR_709 : DRV_PMX_CS_YCBCR_601;
}

/* Tell everybody the master colour space. */
static void vAnnounceMasterColorSpace(void)
{
    const PMX_CONF_T* prConf = prPmxConf();

    OSDSetColorSpace((UCHAR)prConf->eMasterColorSpace);
    PMX_InformVdpColorSpace(0);
    vPostChgInputCS(prConf->eMasterColorSpace);
    PMX_ColorSpaceSetup(prConf->eMasterColorSpace, prConf->ucMode);
}

UINT32 PMX_VdpEnabled(UCHAR ucPmxId, UCHAR ucVdpId, INT32 i4SrcWidth, INT32 i4SrcHeight, UCHAR ucLumaKey)
{
    UINT32 u4Port = u4PmxVdpPort(ucVdpId);
    if (u4Port >= PMX_PORT_NUM)
        return 0;
    PMX_PORT_INFO_T* prPort = &prPmxConf()->arPortInfo[u4Port];
    if (prPort->fgConnected == FALSE)
        return PMX_WHY(NOT_CONNECTED, 0, ucVdpId, u4Port);

    prPort->fgEnabled = TRUE;
    prPort->eInputColorMode = DRV_GFX_COLOR_MODE_YCBCR;
    prPort->ucLumaKey = ucLumaKey;
    PMX_IsLog(8, "VDP_%d Enabled\n", ucVdpId);
    if (ucVdpId == VDP_BACKGROUND)
    {
        PMX_IsLog(8, "Turn on OSD full range conversion\n");
        OSD_RNG_Set_Xvycc_En(TRUE);
    }
    else if (ucVdpId == VDP_SUB)
    {
        PMX_IsLog(8, "Turn off OSD full range conversion since SUB video enable. \n");
        OSD_RNG_Set_Xvycc_En(FALSE);
    }

    prPort->eSrcColorSpace = eColorSpaceOfSize(i4SrcWidth, i4SrcHeight);
    PMX_IsLog(8,
              prPort->eSrcColorSpace == DRV_PMX_CS_YCBCR_709 ? "VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_709\n"
                                                             : "VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_601\n",
              ucVdpId);
    if (ucVdpId == VDP_BACKGROUND) // still pictures are BT.601 at any size
    {
        PMX_IsLog(8, "VDP_%d's (JPG(BACKGROUND) is force to 601.\n", ucVdpId);
        prPort->eSrcColorSpace = DRV_PMX_CS_YCBCR_601;
    }

    PMX_DecideMasterColorSpace(ucPmxId);
    return 1;
}

/* Unlike PMX_OsdDisabled no new decision: the master colour space stays until one is made. */
UINT32 PMX_VdpDisabled(UCHAR, UCHAR ucVdpId)
{
    UINT32 u4Port = u4PmxVdpPort(ucVdpId);
    if (u4Port >= PMX_PORT_NUM)
        return 0;

    prPmxConf()->arPortInfo[u4Port].fgEnabled = FALSE;
    PMX_IsLog(8, "VDP_%d Disabled\n", ucVdpId);
    if (ucVdpId == VDP_BACKGROUND)
    {
        PMX_IsLog(8, "Turn off OSD full range conversion\n");
        OSD_RNG_Set_Xvycc_En(FALSE);
    }
    return 1;
}

/* YCbCr graphics become the master at once, past the priority rule and without its message. */
UINT32 PMX_OsdEnabled(UCHAR, UCHAR ucOsdId, INT32 i4SrcWidth, INT32 i4SrcHeight, DRV_GFX_COLOR_MODE_T eSrcColorMode)
{
    UINT32 u4Port = u4PmxOsdPort(ucOsdId);
    if (u4Port >= PMX_PORT_NUM)
        return 0;

    PMX_CONF_T* prConf = prPmxConf();
    PMX_PORT_INFO_T* prPort = &prConf->arPortInfo[u4Port];
    DRV_PMX_COLOR_SPACE_T eOldCS = prConf->eMasterColorSpace;
    prPort->fgEnabled = TRUE;
    PMX_IsLog(8, "OSD_%d Enabled\n", ucOsdId);
    if (eSrcColorMode == DRV_GFX_COLOR_MODE_YCBCR)
    {
        DRV_PMX_COLOR_SPACE_T eSrcCS = eColorSpaceOfSize(i4SrcWidth, i4SrcHeight);
        prPort->eInputColorMode = DRV_GFX_COLOR_MODE_YCBCR;
        prPort->eSrcColorSpace = eSrcCS;
        PMX_NOTE(MASTER_FROM_PORT, eSrcCS, u4Port);
        prConf->eMasterColorSpace = eSrcCS;
        PMX_IsLog(8,
                  eSrcCS == DRV_PMX_CS_YCBCR_709 ? "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_709\n"
                                                 : "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_601\n",
                  ucOsdId);
    }
    else // a port that had YCbCr graphics goes on counting as such
    {
        PMX_NOTE_IF(prPort->eInputColorMode != DRV_GFX_COLOR_MODE_YCBCR, RGB_NOT_COUNTED, u4Port);
        PMX_NOTE_IF(prPort->eInputColorMode == DRV_GFX_COLOR_MODE_YCBCR, COUNTS_AS_YCBCR, u4Port);
        PMX_IsLog(8, "OSD_%d's Src Color Space = DRV_PMX_CS_RGB\n", ucOsdId);
    }
    if (prConf->eMasterColorSpace != eOldCS)
    {
        PMX_NOTE(MASTER_CHANGES, eOldCS, prConf->eMasterColorSpace);
        vAnnounceMasterColorSpace();
    }
    else
    {
        PMX_NOTE(MASTER_STAYS, eOldCS);
    }
    return 1;
}

UINT32 PMX_OsdDisabled(UCHAR, UCHAR ucOsdId)
{
    UINT32 u4Port = u4PmxOsdPort(ucOsdId);
    if (u4Port >= PMX_PORT_NUM)
        return 0;

    prPmxConf()->arPortInfo[u4Port].fgEnabled = FALSE;
    PMX_IsLog(8, "OSD_%d Disabled\n", ucOsdId);
    PMX_DecideMasterColorSpace(0);
    return 1;
}

UINT32 PMX_DecideMasterColorSpace(UCHAR ucPmxId)
{
    PMX_CONF_T* prConf = prPmxConf();
    const PMX_PORT_INFO_T* prPort = prConf->arPortInfo;
    DRV_PMX_COLOR_SPACE_T eCandidate = prConf->eMasterColorSpace;

    // Each rule that applies overrules those before it.
    if (prPort[PMX_PORT_VDP_MAIN].fgEnabled != FALSE)
    {
        eCandidate = prPort[PMX_PORT_VDP_MAIN].eSrcColorSpace;
        PMX_NOTE(MASTER_FROM_PORT, eCandidate, PMX_PORT_VDP_MAIN);
        PMX_IsLog(8, "[PMX] VDP_COMP_1 enabled and Color Space is %d.\n", (INT32)eCandidate);
    }
    if (prPort[PMX_PORT_VDP_SUB].fgEnabled != FALSE && prPort[PMX_PORT_VDP_SUB].ucLumaKey != 0 &&
        fgPmxHalMixPlane(ucPmxId, DRV_PMX_PLANE_2) != FALSE)
    {
        eCandidate = prPort[PMX_PORT_VDP_SUB].eSrcColorSpace;
        PMX_NOTE(MASTER_FROM_PORT, eCandidate, PMX_PORT_VDP_SUB);
        PMX_IsLog(8, "[PMX] VDP_COMP_2 enabled and Color Space is %d.\n", (INT32)eCandidate);
    }
    else
    {
        PMX_NOTE_IF(prPort[PMX_PORT_VDP_SUB].fgEnabled != FALSE, SECOND_NOT_COUNTED,
                    prPort[PMX_PORT_VDP_SUB].ucLumaKey);
    }
    for (UINT32 i = PMX_PORT_OSD_FIRST; i < PMX_PORT_NUM; i++)
    {
        if (prPort[i].fgEnabled != FALSE && prPort[i].eInputColorMode == DRV_GFX_COLOR_MODE_YCBCR)
        {
            eCandidate = prPort[i].eSrcColorSpace;
            PMX_NOTE(MASTER_FROM_PORT, eCandidate, i);
            PMX_IsLog(8, "[PMX] Gfx enabled and Color Space is %d.\n", (INT32)eCandidate);
        }
        else
        {
            PMX_NOTE_IF(prPort[i].fgEnabled != FALSE, RGB_NOT_COUNTED, i);
        }
    }

    if (eCandidate != prConf->eMasterColorSpace)
    {
        PMX_NOTE(MASTER_CHANGES, prConf->eMasterColorSpace, eCandidate);
        PMX_IsLog(8, "[PMX] Master Color Space change from %d to %d.\n", (INT32)prConf->eMasterColorSpace,
                  (INT32)eCandidate);
        prConf->eMasterColorSpace = eCandidate;
        vAnnounceMasterColorSpace();
    }
    else
    {
        PMX_NOTE(MASTER_STAYS, eCandidate);
    }
    return 1;
}

/* The plane is told what the master colour space is when it is called: a source may have changed it since the line. */
static void vInformVdp(UINT16 u2CompType, UINT16 u2CompId)
{
    const PMX_CONF_T* prConf = prPmxConf();
    void* pvIf = nullptr;
    void* pvTag = nullptr;

    PMX_IsLog(8, "Inform Vdp CS(%d)\n", (INT32)prConf->eMasterColorSpace);
    if (i4ImQueryInterface(u2CompType, u2CompId, IID_IVdp, &pvIf, &pvTag) < 0)
    {
        PMX_NOTE(NO_TABLE, u2CompType, u2CompId);
        PMX_IsLog(5, "Query VDP Interface Fail!\n");
        Assert("0", __FILE__, __LINE__);
        return; // nothing was obtained that could be called or given back
    }
    const IVdp* piVdp = (const IVdp*)pvIf;
    piVdp->pu4SetColorMode(pvTag, prConf->eMasterColorSpace);
    i4ImReleaseInterface(u2CompType, u2CompId, IID_IVdp, pvTag);
}

void PMX_InformVdpColorSpace(UCHAR)
{
    vPmxLock();
    for (UINT32 u4Port = PMX_PORT_VDP_MAIN; u4Port <= PMX_PORT_VDP_SUB; u4Port++)
    {
        const PMX_PORT_INFO_T* prPort = &prPmxConf()->arPortInfo[u4Port];
        if (prPort->fgConnected != FALSE)
            vInformVdp(prPort->u2CompType, prPort->u2CompId);
    }
    vPmxUnlock();
}

/* Source events through IPMX are inert: only the direct calls count. */

INT32 i4PmxOsdEnabled(void*, INT32, INT32, DRV_GFX_COLOR_MODE_T)
{
    return PMX_WHY(INERT, 1);
}

INT32 i4PmxOsdDisabled(void*)
{
    return PMX_WHY(INERT, 1);
}

INT32 i4PmxVdpEnabled(void*, INT32, INT32)
{
    return PMX_WHY(INERT, 1);
}

INT32 i4PmxVdpDisabled(void*)
{
    return PMX_WHY(INERT, 1);
}
