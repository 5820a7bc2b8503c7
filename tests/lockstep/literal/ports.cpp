// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Input ports. */
#include "tests/lockstep/literal/literal.h"

UINT32 u4PmxCompId2LocalId(UINT16 u2CompType, UINT16 u2CompId)
{
    if (u2CompType == 0x41)
    {
        const UCHAR ucVdpId = static_cast<UCHAR>(u2CompId & 0xFF);
        if (ucVdpId == 0)
            return 0;
        if (ucVdpId <= 3)
            return 1;
        return 8;
    }
    if (u2CompType == 0xB0)
    {
        const UCHAR ucOsdId = static_cast<UCHAR>(u2CompId & 0xFF);
        if (ucOsdId <= 5)
            return ucOsdId + 2u;
        return 8;
    }
    PMX_IsLog(8, "COMP ID to LOCAL ID Fail, CompType = %d, CompId = %d\n", u2CompType, u2CompId);
    return 8;
}

UINT32 i4Pmx_Connect(UINT16, UINT16 u2ThisCompId, UINT16 u2UpstreamCompType, UINT16 u2UpstreamCompId)
{
    if (x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT) != OSR_OK)
        Assert("x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT) == OSR_OK", __FILE__, __LINE__);
    const UINT32 u4LocalId = u4PmxCompId2LocalId(u2UpstreamCompType, u2UpstreamCompId);
    PMX_IsLog(8, "Tp,Id=%d,%d\n", u2UpstreamCompType, u2UpstreamCompId);
    PMX_IsLog(8, "Comp(%d) connect\n", static_cast<int>(u4LocalId));
    if (u4LocalId > 7 || u2ThisCompId != 0)
    {
        if (x_sema_unlock(MutexPMX) != OSR_OK)
            Assert("x_sema_unlock(MutexPMX) == OSR_OK", __FILE__, __LINE__);
        return 0xF1000002;
    }
    conf.arPortInfo[u4LocalId].fgConnected = 1;
    conf.arPortInfo[u4LocalId].u2CompType = u2UpstreamCompType;
    conf.arPortInfo[u4LocalId].u2CompId = u2UpstreamCompId;
    if (x_sema_unlock(MutexPMX) != OSR_OK)
        Assert("x_sema_unlock(MutexPMX) == OSR_OK", __FILE__, __LINE__);
    return 0x71000000;
}

UINT32 i4Pmx_Disconnect(UINT16, UINT16 u2ThisCompId, UINT16 u2UpstreamCompType, UINT16 u2UpstreamCompId)
{
    if (x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT) != OSR_OK)
        Assert("x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT) == OSR_OK", __FILE__, __LINE__);
    const UINT32 u4LocalId = u4PmxCompId2LocalId(u2UpstreamCompType, u2UpstreamCompId);
    PMX_IsLog(8, "Tp,Id=%d,%d\n", u2UpstreamCompType, u2UpstreamCompId);
    PMX_IsLog(8, "Comp(%d) disconnect\n", static_cast<int>(u4LocalId));
    if (u4LocalId > 7 || u2ThisCompId != 0)
    {
        if (x_sema_unlock(MutexPMX) != OSR_OK)
            Assert("x_sema_unlock(MutexPMX) == OSR_OK", __FILE__, __LINE__);
        return 0xF1000002;
    }
    conf.arPortInfo[u4LocalId].fgConnected = 0;
    conf.arPortInfo[u4LocalId].u2CompType = 0;
    conf.arPortInfo[u4LocalId].u2CompId = 0;
    conf.arPortInfo[u4LocalId].fgEnabled = 0;
    if (x_sema_unlock(MutexPMX) != OSR_OK)
        Assert("x_sema_unlock(MutexPMX) == OSR_OK", __FILE__, __LINE__);
    return 0x71000000;
}
