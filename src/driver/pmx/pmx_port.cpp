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
        return u4PmxVdpPort((UCHAR)u2CompId);
    if (u2CompType == PMX_COMP_TYPE_OSD)
        return u4PmxOsdPort((UCHAR)u2CompId);
    // Only an unknown type is worth a message, not an unknown number of a known one.
    PMX_IsLog(8, "COMP ID to LOCAL ID Fail, CompType = %d, CompId = %d\n", u2CompType, u2CompId);
    return PMX_PORT_NUM;
}

/* Connecting and disconnecting differ in one trace and in what they store. Neither asks what the port holds: the last
 * call counts, and the master colour space waits for the next decision. */
static UINT32 u4ChangePort(UINT16 u2ThisCompId, UINT16 u2CompType, UINT16 u2CompId, bool fgConnect)
{
    vPmxLock();
    UINT32 u4LocalId = u4PmxCompId2LocalId(u2CompType, u2CompId);
    PMX_IsLog(8, "Tp,Id=%d,%d\n", u2CompType, u2CompId);
    PMX_IsLog(8, fgConnect ? "Comp(%d) connect\n" : "Comp(%d) disconnect\n", (INT32)u4LocalId);

    UINT32 u4Result = PMX_NO_SUCH_PORT;
    if (u4LocalId < PMX_PORT_NUM && u2ThisCompId == 0)
    {
        PMX_PORT_INFO_T* prPort = &prPmxConf()->arPortInfo[u4LocalId];
        prPort->fgConnected = fgConnect;
        prPort->u2CompType = fgConnect ? u2CompType : 0;
        prPort->u2CompId = fgConnect ? u2CompId : 0;
        if (!fgConnect) // a source that is connected anew is as enabled as it was
            prPort->fgEnabled = 0;
        u4Result = PMX_PORT_DONE;
    }

    vPmxUnlock();
    return u4Result;
}

UINT32 i4Pmx_Connect(UINT16, UINT16 u2ThisCompId, UINT16 u2UpstreamCompType, UINT16 u2UpstreamCompId)
{
    return u4ChangePort(u2ThisCompId, u2UpstreamCompType, u2UpstreamCompId, true);
}

UINT32 i4Pmx_Disconnect(UINT16, UINT16 u2ThisCompId, UINT16 u2UpstreamCompType, UINT16 u2UpstreamCompId)
{
    return u4ChangePort(u2ThisCompId, u2UpstreamCompType, u2UpstreamCompId, false);
}
