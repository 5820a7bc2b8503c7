// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Source events and the master colour space. */
#include "tests/lockstep/literal/literal.h"

static DRV_PMX_COLOR_SPACE_T space_of(INT32 i4SrcWidth, INT32 i4SrcHeight)
{
    if (i4SrcWidth > 720 || i4SrcHeight > 576)
        return DRV_PMX_CS_YCBCR_709;
    return DRV_PMX_CS_YCBCR_601;
}

UINT32 PMX_VdpEnabled(UCHAR ucPmxId, UCHAR ucVdpId, INT32 i4SrcWidth, INT32 i4SrcHeight, UCHAR ucLumaKey)
{
    const UINT32 u4Port = u4PmxCompId2LocalId(0x41, ucVdpId);
    if (u4Port == 8)
        return 0;
    PMX_PORT_INFO_T& port = conf.arPortInfo[u4Port];
    if (port.fgConnected == 0)
        return 0;
    port.fgEnabled = 1;
    port.eInputColorMode = DRV_GFX_COLOR_MODE_YCBCR;
    port.ucLumaKey = ucLumaKey;
    PMX_IsLog(8, "VDP_%d Enabled\n", ucVdpId);
    if (ucVdpId == 2)
    {
        PMX_IsLog(8, "Turn on OSD full range conversion\n");
        OSD_RNG_Set_Xvycc_En(1);
    }
    else if (ucVdpId == 1)
    {
        PMX_IsLog(8, "Turn off OSD full range conversion since SUB video enable. \n");
        OSD_RNG_Set_Xvycc_En(0);
    }
    port.eSrcColorSpace = space_of(i4SrcWidth, i4SrcHeight);
    if (space_of(i4SrcWidth, i4SrcHeight) == DRV_PMX_CS_YCBCR_709)
        PMX_IsLog(8, "VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_709\n", ucVdpId);
    else
        PMX_IsLog(8, "VDP_%d's Src Color Space = DRV_PMX_CS_YCBCR_601\n", ucVdpId);
    if (ucVdpId == 2)
    {
        PMX_IsLog(8, "VDP_%d's (JPG(BACKGROUND) is force to 601.\n", ucVdpId);
        port.eSrcColorSpace = DRV_PMX_CS_YCBCR_601;
    }
    PMX_DecideMasterColorSpace(ucPmxId);
    return 1;
}

UINT32 PMX_VdpDisabled(UCHAR, UCHAR ucVdpId)
{
    const UINT32 u4Port = u4PmxCompId2LocalId(0x41, ucVdpId);
    if (u4Port == 8)
        return 0;
    conf.arPortInfo[u4Port].fgEnabled = 0;
    PMX_IsLog(8, "VDP_%d Disabled\n", ucVdpId);
    if (ucVdpId == 2)
    {
        PMX_IsLog(8, "Turn off OSD full range conversion\n");
        OSD_RNG_Set_Xvycc_En(0);
    }
    return 1;
}

/* Whom a new master colour space is told to. */
static void announce()
{
    OSDSetColorSpace(static_cast<UCHAR>(conf.eMasterColorSpace));
    PMX_InformVdpColorSpace(0);
    vPostChgInputCS(conf.eMasterColorSpace);
    PMX_ColorSpaceSetup(conf.eMasterColorSpace, conf.ucMode);
}

UINT32 PMX_OsdEnabled(UCHAR, UCHAR ucOsdId, INT32 i4SrcWidth, INT32 i4SrcHeight, DRV_GFX_COLOR_MODE_T eSrcColorMode)
{
    const UINT32 u4Port = u4PmxCompId2LocalId(0xB0, ucOsdId);
    const DRV_PMX_COLOR_SPACE_T eOldCS = conf.eMasterColorSpace;
    if (u4Port == 8)
        return 0;
    PMX_PORT_INFO_T& port = conf.arPortInfo[u4Port];
    port.fgEnabled = 1;
    PMX_IsLog(8, "OSD_%d Enabled\n", ucOsdId);
    if (eSrcColorMode != DRV_GFX_COLOR_MODE_YCBCR)
    {
        PMX_IsLog(8, "OSD_%d's Src Color Space = DRV_PMX_CS_RGB\n", ucOsdId);
    }
    else
    {
        port.eInputColorMode = DRV_GFX_COLOR_MODE_YCBCR;
        port.eSrcColorSpace = space_of(i4SrcWidth, i4SrcHeight);
        conf.eMasterColorSpace = space_of(i4SrcWidth, i4SrcHeight);
        if (space_of(i4SrcWidth, i4SrcHeight) == DRV_PMX_CS_YCBCR_709)
            PMX_IsLog(8, "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_709\n", ucOsdId);
        else
            PMX_IsLog(8, "OSD_%d's Src Color Space = DRV_PMX_CS_YCBCR_601\n", ucOsdId);
    }
    if (conf.eMasterColorSpace != eOldCS)
        announce();
    return 1;
}

UINT32 PMX_OsdDisabled(UCHAR, UCHAR ucOsdId)
{
    const UINT32 u4Port = u4PmxCompId2LocalId(0xB0, ucOsdId);
    if (u4Port == 8)
        return 0;
    conf.arPortInfo[u4Port].fgEnabled = 0;
    PMX_IsLog(8, "OSD_%d Disabled\n", ucOsdId);
    PMX_DecideMasterColorSpace(0);
    return 1;
}

UINT32 PMX_DecideMasterColorSpace(UCHAR ucPmxId)
{
    DRV_PMX_COLOR_SPACE_T candidate = conf.eMasterColorSpace;
    if (conf.arPortInfo[0].fgEnabled != 0)
    {
        candidate = conf.arPortInfo[0].eSrcColorSpace;
        PMX_IsLog(8, "[PMX] VDP_COMP_1 enabled and Color Space is %d.\n", static_cast<int>(candidate));
    }
    if (conf.arPortInfo[1].fgEnabled != 0 && conf.arPortInfo[1].ucLumaKey != 0 && fgPmxHalMixPlane(ucPmxId, 1) != 0)
    {
        candidate = conf.arPortInfo[1].eSrcColorSpace;
        PMX_IsLog(8, "[PMX] VDP_COMP_2 enabled and Color Space is %d.\n", static_cast<int>(candidate));
    }
    for (int port = 2; port <= 7; ++port)
    {
        if (conf.arPortInfo[port].fgEnabled != 0 && conf.arPortInfo[port].eInputColorMode == DRV_GFX_COLOR_MODE_YCBCR)
        {
            candidate = conf.arPortInfo[port].eSrcColorSpace;
            PMX_IsLog(8, "[PMX] Gfx enabled and Color Space is %d.\n", static_cast<int>(candidate));
        }
    }
    if (candidate != conf.eMasterColorSpace)
    {
        PMX_IsLog(8, "[PMX] Master Color Space change from %d to %d.\n", static_cast<int>(conf.eMasterColorSpace),
                  static_cast<int>(candidate));
        conf.eMasterColorSpace = candidate;
        announce();
    }
    return 1;
}

void PMX_InformVdpColorSpace(UCHAR)
{
    if (x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT) != OSR_OK)
        Assert("x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT) == OSR_OK", __FILE__, __LINE__);
    for (UINT16 u2Idx = 0; u2Idx <= 1; ++u2Idx)
    {
        const UINT32 u4Port = u4PmxCompId2LocalId(0x41, u2Idx);
        if (conf.arPortInfo[u4Port].fgConnected == 0)
            continue;
        const UINT16 u2CompType = conf.arPortInfo[u4Port].u2CompType;
        const UINT16 u2CompId = conf.arPortInfo[u4Port].u2CompId;
        PMX_IsLog(8, "Inform Vdp CS(%d)\n", static_cast<int>(conf.eMasterColorSpace));
        void* piVdp = nullptr;
        void* pvTag = nullptr;
        if (i4ImQueryInterface(u2CompType, u2CompId, 6, &piVdp, &pvTag) < 0)
        {
            PMX_IsLog(5, "Query VDP Interface Fail!\n");
            Assert("0", __FILE__, __LINE__);
            continue;
        }
        static_cast<const IVdp*>(piVdp)->pu4SetColorMode(pvTag, conf.eMasterColorSpace);
        i4ImReleaseInterface(u2CompType, u2CompId, 6, pvTag);
    }
    if (x_sema_unlock(MutexPMX) != OSR_OK)
        Assert("x_sema_unlock(MutexPMX) == OSR_OK", __FILE__, __LINE__);
}

INT32 i4PmxOsdEnabled(void*, INT32, INT32, DRV_GFX_COLOR_MODE_T)
{
    return 1;
}

INT32 i4PmxOsdDisabled(void*)
{
    return 1;
}

INT32 i4PmxVdpEnabled(void*, INT32, INT32)
{
    return 1;
}

INT32 i4PmxVdpDisabled(void*)
{
    return 1;
}
