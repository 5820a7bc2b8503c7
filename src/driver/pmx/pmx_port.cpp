// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* Input ports: which upstream component feeds which, and the lock over connecting them. */
#include "drv_pmx.h"
#include "pmx_if.h"
#include "u_os.h"

void vPmxLock(void)
{
    if (x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT) != OSR_OK)
        Assert("x_sema_lock(MutexPMX, X_SEMA_OPTION_WAIT) == OSR_OK", __FILE__, __LINE__);
}

void vPmxUnlock(void)
{
    if (x_sema_unlock(MutexPMX) != OSR_OK)
        Assert("x_sema_unlock(MutexPMX) == OSR_OK", __FILE__, __LINE__);
}

UINT32 u4PmxCompId2LocalId(UINT16 u2CompType, UINT16 u2CompId)
{
    if (u2CompType == PMX_COMP_TYPE_VDP)
        return u4PmxVdpPort(u2CompId);
    if (u2CompType == PMX_COMP_TYPE_OSD)
        return u4PmxOsdPort(u2CompId);
    // Only an unknown type is worth a message, not an unknown number of a known one.
    PMX_IsLog(8, "COMP ID to LOCAL ID Fail, CompType = %d, CompId = %d\n", u2CompType, u2CompId);
    return PMX_WHY(NO_PORT, PMX_PORT_NUM, u2CompType, u2CompId);
}

/* The port that a component changes; null when there is no such port, or no such mixer. The source events look at it
 * without the mutex: whoever changes it writes field by field, in the order that stands there. */
static volatile PMX_PORT_INFO_T* prPortToChange(UINT16 u2ThisCompId, UINT32 u4LocalId)
{
    if (u2ThisCompId != 0 || u4LocalId >= PMX_PORT_NUM)
    {
        PMX_NOTE_IF(u4LocalId < PMX_PORT_NUM, MIXER_ID, u2ThisCompId); // else the port's own reason was told
        return nullptr;
    }
    return &prPmxConf()->arPortInfo[u4LocalId];
}

/* Whoever is connected already is replaced. A source that comes back is as enabled as it was. */
UINT32 i4Pmx_Connect(UINT16, UINT16 u2ThisCompId, UINT16 u2UpstreamCompType, UINT16 u2UpstreamCompId)
{
    vPmxLock();
    UINT32 u4LocalId = u4PmxCompId2LocalId(u2UpstreamCompType, u2UpstreamCompId);
    PMX_IsLog(8, "Tp,Id=%d,%d\n", u2UpstreamCompType, u2UpstreamCompId);
    PMX_IsLog(8, "Comp(%d) connect\n", (INT32)u4LocalId);

    volatile PMX_PORT_INFO_T* prPort = prPortToChange(u2ThisCompId, u4LocalId);
    if (prPort != nullptr)
    {
        prPort->fgConnected = TRUE;
        prPort->u2CompType = u2UpstreamCompType;
        prPort->u2CompId = u2UpstreamCompId;
    }
    vPmxUnlock();
    return prPort != nullptr ? PMX_PORT_DONE : PMX_NO_SUCH_PORT;
}

/* Whoever is connected there is cleared, named or not. The master colour space waits for the next decision. */
UINT32 i4Pmx_Disconnect(UINT16, UINT16 u2ThisCompId, UINT16 u2UpstreamCompType, UINT16 u2UpstreamCompId)
{
    vPmxLock();
    UINT32 u4LocalId = u4PmxCompId2LocalId(u2UpstreamCompType, u2UpstreamCompId);
    PMX_IsLog(8, "Tp,Id=%d,%d\n", u2UpstreamCompType, u2UpstreamCompId);
    PMX_IsLog(8, "Comp(%d) disconnect\n", (INT32)u4LocalId);

    volatile PMX_PORT_INFO_T* prPort = prPortToChange(u2ThisCompId, u4LocalId);
    if (prPort != nullptr)
    {
        prPort->fgConnected = FALSE;
        prPort->u2CompType = 0;
        prPort->u2CompId = 0;
        prPort->fgEnabled = FALSE;
    }
    vPmxUnlock();
    return prPort != nullptr ? PMX_PORT_DONE : PMX_NO_SUCH_PORT;
}
