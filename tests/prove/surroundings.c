// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The functions of the platform whose contracts a proof leans on, and what is kept in mind of them. All others are
 * written from the headers, and answer anything. */
#include "surroundings.h"

MIND_T mind;

void begin(WORLD_T world)
{
    mind = (MIND_T){ .world = world };
    mind.outOfMix = nondet_unsigned() & OSD_PLANES;
    mind.hTimer = nondet_unsigned();
    mind.timerRuns = nondet_Bool();
    mind.expiryBegun = nondet_Bool();
    mind.videoWaited = nondet_Bool();
    mind.videoOwes = nondet_Bool();
    if (world == HANDSHAKE)
    {
        __CPROVER_assume(mind.hTimer != 0 && knowsTheTimer());
        __CPROVER_assume(graphicsComeBack());
    }
}

void end(void)
{
    CLAIM(mind.locks == 0, "as many unlocks as locks");
    CLAIM(mind.tables == 0, "each table that was fetched is given back");
    if (mind.world == HANDSHAKE)
        CLAIM(graphicsComeBack(), "graphics that are held back come back");
}

_Bool graphicsComeBack(void)
{
    return mind.outOfMix == 0 || mind.timerRuns || (_arPmxDispPartStatus.fgPmxEnabeOsdFlag != FALSE && mind.videoOwes);
}

_Bool knowsTheTimer(void)
{
    return _arPmxDispPartStatus.hPMXTimer == mind.hTimer;
}

UCHAR mixersMode(const PMX_RESOLUTION_T* prOutConf)
{
    for (unsigned i = 0; i < PMX_OUTPUT_NUM; i++)
    {
        if (prOutConf[i].fgOutputEnable != FALSE)
            return (UCHAR)prOutConf[i].eResMode;
    }
    return (UCHAR)prOutConf[PMX_OUTPUT_HDMI].eResMode;
}

_Bool sourcesDiffer(UINT32 u4PlaneOrder)
{
    for (unsigned i = 0; i < PMX_PLANE_NUM; i++)
    {
        for (unsigned j = 0; j < i; j++)
        {
            if (((u4PlaneOrder >> 4 * i ^ u4PlaneOrder >> 4 * j) & 7) == 0)
                return 0;
        }
    }
    return 1;
}

UINT32 portOf(UINT16 u2CompType, UINT16 u2CompId)
{
    unsigned id = u2CompId & 0xFF;
    if (u2CompType == PMX_COMP_TYPE_VDP && id <= 3)
        return id == 0 ? 0 : 1;
    return u2CompType == PMX_COMP_TYPE_OSD && id <= 5 ? 2 + id : PMX_PORT_NUM;
}

_Bool isConnected(UINT32 u4Port)
{
    return u4Port < PMX_PORT_NUM && _arPmxConf[0].arPortInfo[u4Port].fgConnected != FALSE;
}

_Bool flagsInRange(void)
{
    const PMX_CONF_T* prConf = &_arPmxConf[0];

    _Bool fgInRange = prConf->fgAspNext <= 1 && prConf->fgSetModeCalled <= 1 && prConf->fgDigestEnable <= 1 &&
                      prConf->fgForceMode <= 1 && prConf->eMasterColorSpace <= DRV_PMX_CS_YCBCR_709;
    for (unsigned i = 0; i < PMX_PORT_NUM; i++)
    {
        const PMX_PORT_INFO_T* prPort = &prConf->arPortInfo[i];
        fgInRange = fgInRange && prPort->fgConnected <= 1 && prPort->fgEnabled <= 1 &&
                    prPort->eInputColorMode <= DRV_GFX_COLOR_MODE_RGB && prPort->eSrcColorSpace <= DRV_PMX_CS_YCBCR_709;
    }
    return fgInRange && _PmxInitiated <= 1 && _fgBootUp <= 1 && _fg2DCap <= 1 &&
           _arPmxDispPartStatus.fgTimerAlreadySet <= 1;
}

/* The timer's context: nobody sleeps there. */
static void expire(void)
{
    _Bool mayNotSleep = mind.mayNotSleep;
    mind.mayNotSleep = 1;
    _PMX_TmrIsr(mind.hTimer, 0);
    mind.mayNotSleep = mayNotSleep;
}

void somebodyMayAct(void)
{
    if (mind.world == ANYBODY)
        anythingIsStored();
    if (mind.world != HANDSHAKE || mind.somebodyActs || nondet_Bool())
        return;

    mind.somebodyActs = 1;
    if ((mind.timerRuns || mind.expiryBegun) && nondet_Bool())
    {
        if (mind.expiryBegun)
            mind.expiryBegun = 0;
        else
            mind.timerRuns = 0;
        mind.expired = 1;
        expire();
    }
    else if (nondet_Bool())
    {
        BOOL fgRaised = nondet_Bool();
        mind.raised = mind.raised || fgRaised;
        mind.lowered = mind.lowered || !fgRaised;
        PMX_SetFormatChangeFlag(fgRaised);
    }
    else
    {
        mind.videoOwes = 0;
        mind.videoCalled = 1;
        PMX_SetOsdEnable();
    }
    mind.somebodyActs = 0;
}

INT32 nondet_INT32(void);

/* The mutex: waits for ever, and is free again whatever giving it back answers. */

INT32 x_sema_lock(HANDLE_T hSema, X_SEMA_OPTION_T eOption)
{
    CLAIM(hSema == MutexPMX, "x_sema_lock: the layer's mutex");
    CLAIM(eOption == X_SEMA_OPTION_WAIT, "x_sema_lock: waits for ever");
    CLAIM(mind.locks == 0, "locks are never nested");
    CLAIM(!mind.mayNotSleep, "x_sema_lock: called where it may sleep");
    mind.locks++;
    mind.everLocked = 1;
    somebodyMayAct();
    return nondet_INT32();
}

INT32 x_sema_unlock(HANDLE_T hSema)
{
    CLAIM(hSema == MutexPMX, "x_sema_unlock: the layer's mutex");
    CLAIM(mind.locks == 1, "no unlock without a lock");
    mind.locks--;
    somebodyMayAct();
    return nondet_INT32();
}

/* The timer: with the handle of one that exists it does as it is told, with another it fails. Elsewhere than in the
 * handshake's world it may fail as it likes. */

static _Bool isTimer(HANDLE_T hTimer)
{
    return mind.world == HANDSHAKE ? hTimer != 0 && hTimer == mind.hTimer : nondet_Bool();
}

INT32 x_timer_create(HANDLE_T* phTimer)
{
    CLAIM(phTimer == &_arPmxDispPartStatus.hPMXTimer, "x_timer_create: the layer's timer");
    CLAIM(!mind.mayNotSleep, "x_timer_create: called where it may sleep");
    somebodyMayAct();
    mind.hTimer = 0; // the one before goes on, and nobody here knows it any more
    if (nondet_Bool())
        return -1;
    mind.hTimer = nondet_unsigned();
    __CPROVER_assume(mind.hTimer != 0);
    *phTimer = mind.hTimer;
    return OSR_OK;
}

INT32 x_timer_start(HANDLE_T hTimer, UINT32 u4DelayMs, X_TIMER_FLAG_T eFlag, x_timer_cb_fct pfCallback, void* pvArg)
{
    CLAIM(pfCallback == _PMX_TmrIsr, "x_timer_start: the layer's expiry function");
    CLAIM(eFlag == X_TIMER_FLAG_ONCE, "x_timer_start: expires once");
    _Bool fgStarts = isTimer(hTimer);
    mind.timerRuns = mind.timerRuns || fgStarts;
    somebodyMayAct();
    return fgStarts ? OSR_OK : -1;
}

INT32 x_timer_stop(HANDLE_T hTimer)
{
    somebodyMayAct();
    if (!isTimer(hTimer))
        return -1;
    mind.expiryBegun = mind.expiryBegun || (mind.timerRuns && nondet_Bool());
    mind.timerRuns = 0;
    return OSR_OK;
}

INT32 x_timer_delete(HANDLE_T hTimer)
{
    CLAIM(mind.locks == 0, "x_timer_delete: no lock is held");
    CLAIM(!mind.mayNotSleep, "x_timer_delete: called where it may sleep");
    somebodyMayAct();
    if (!isTimer(hTimer))
        return -1;
    if (mind.world == HANDSHAKE && mind.expiryBegun)
        expire(); // one that has begun is waited for
    mind.expiryBegun = 0;
    mind.timerRuns = 0;
    mind.hTimer = 0;
    return OSR_OK;
}

/* Formatting ends the text, whatever its length. */

INT32 x_vsnprintf(CHAR* szBuffer, size_t zSize, const CHAR* szFormat, va_list rArgs)
{
    CLAIM(zSize > 0 && __CPROVER_w_ok(szBuffer, zSize), "x_vsnprintf: the buffer can be written");
    CLAIM(__CPROVER_r_ok(szFormat, 1), "x_vsnprintf: the format can be read");
    somebodyMayAct();
    __CPROVER_havoc_slice(szBuffer, zSize);
    size_t zEnd = nondet_unsigned();
    __CPROVER_assume(zEnd < zSize);
    szBuffer[zEnd] = 0;
    return nondet_INT32();
}

/* A query that succeeds yields a whole table, one that fails anything. */

static UINT32 u4SetColorMode(void* pvTag, DRV_PMX_COLOR_SPACE_T eColorSpace)
{
    CLAIM(mind.locks == 1, "pu4SetColorMode: the mutex is held");
    CLAIM(mind.tables == 1, "pu4SetColorMode: the table is held");
    CLAIM(pvTag == mind.pvTag, "pu4SetColorMode: the table's own tag");
    CLAIM(!mind.mayNotSleep, "pu4SetColorMode: called where it may sleep");
    somebodyMayAct();
    return nondet_unsigned();
}

static const IVdp VIDEO_PLANE = { .pu4SetColorMode = u4SetColorMode };

void* nondet_pointer(void);

INT32 i4ImQueryInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void** ppvIf, void** ppvTag)
{
    CLAIM(__CPROVER_w_ok(ppvIf, sizeof *ppvIf), "i4ImQueryInterface: the table's place can be written");
    CLAIM(__CPROVER_w_ok(ppvTag, sizeof *ppvTag), "i4ImQueryInterface: the tag's place can be written");
    CLAIM(u4IfId == IID_IVdp, "i4ImQueryInterface: a video plane's table");
    CLAIM(mind.locks == 1, "i4ImQueryInterface: the mutex is held");
    somebodyMayAct();
    INT32 i4Result = nondet_INT32();
    *ppvIf = i4Result >= 0 ? (void*)&VIDEO_PLANE : nondet_pointer();
    *ppvTag = nondet_pointer();
    mind.tables += i4Result >= 0;
    mind.everFetched = mind.everFetched || i4Result >= 0;
    mind.u2CompType = u2CompType;
    mind.u2CompId = u2CompId;
    mind.pvTag = *ppvTag;
    return i4Result;
}

INT32 i4ImReleaseInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void* pvTag)
{
    CLAIM(mind.tables == 1, "i4ImReleaseInterface: a table that was fetched");
    CLAIM(u2CompType == mind.u2CompType && u2CompId == mind.u2CompId && u4IfId == IID_IVdp && pvTag == mind.pvTag,
          "i4ImReleaseInterface: the table that was fetched");
    CLAIM(mind.locks == 1, "i4ImReleaseInterface: the mutex is held");
    mind.tables--;
    somebodyMayAct();
    return nondet_INT32();
}

/* Which planes of mixer 0 are in the mix. */

void vPmxMixPlane(UCHAR ucPmxId, UCHAR ucPlane)
{
    CLAIM(ucPlane < PMX_PLANE_NUM, "vPmxMixPlane: a plane");
    if (ucPmxId == 0)
        mind.outOfMix &= ~(1u << ucPlane);
    somebodyMayAct();
}

void vPmxNotMixPlane(UCHAR ucPmxId, UCHAR ucPlane)
{
    CLAIM(ucPlane < PMX_PLANE_NUM, "vPmxNotMixPlane: a plane");
    if (ucPmxId == 0)
        mind.outOfMix |= 1u << ucPlane & OSD_PLANES;
    somebodyMayAct();
}

BOOL fgVdpIsWaitforSyncCtrl(void)
{
    somebodyMayAct();
    mind.videoWaited = nondet_Bool();
    mind.videoOwes = mind.videoWaited;
    return mind.videoWaited;
}
