// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The functions of the platform whose contracts a proof leans on, and what is kept in mind of them. All others are
 * written from the headers, and answer anything. */
#include "surroundings.h"

MIND_T mind;

void begin(WORLD_T world)
{
    mind.world = world;
    mind.locks = 0;
    mind.tables = 0;
    mind.outOfMix = nondet_unsigned() & OSD_PLANES;
    mind.hTimer = nondet_unsigned();
    mind.timerRuns = nondet_Bool();
    mind.videoWaited = nondet_Bool();
    mind.somebodyActs = 0;
    if (world == HANDSHAKE)
    {
        __CPROVER_assume(mind.hTimer != 0 && _arPmxDispPartStatus.hPMXTimer == mind.hTimer);
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
    return mind.outOfMix == 0 || mind.timerRuns || _arPmxDispPartStatus.fgPmxEnabeOsdFlag != FALSE;
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

void somebodyMayAct(void)
{
    if (mind.world == ANYBODY)
        anythingIsStored();
    if (mind.world != HANDSHAKE || mind.somebodyActs || nondet_Bool())
        return;

    mind.somebodyActs = 1;
    if (mind.timerRuns && nondet_Bool())
    {
        mind.timerRuns = 0;
        _PMX_TmrIsr(mind.hTimer, 0);
    }
    else if (nondet_Bool())
        PMX_SetFormatChangeFlag(nondet_Bool());
    else
        PMX_SetOsdEnable();
    mind.somebodyActs = 0;
}

INT32 nondet_INT32(void);

/* The mutex: waits for ever, and is free again whatever giving it back answers. */

INT32 x_sema_lock(HANDLE_T hSema, X_SEMA_OPTION_T eOption)
{
    CLAIM(hSema == MutexPMX, "x_sema_lock: the layer's mutex");
    CLAIM(eOption == X_SEMA_OPTION_WAIT, "x_sema_lock: waits for ever");
    CLAIM(mind.locks == 0, "locks are never nested");
    mind.locks++;
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
    return mind.world == HANDSHAKE ? hTimer == mind.hTimer : nondet_Bool();
}

INT32 x_timer_create(HANDLE_T* phTimer)
{
    CLAIM(__CPROVER_w_ok(phTimer, sizeof *phTimer), "x_timer_create: the handle can be written");
    somebodyMayAct();
    if (mind.world != HANDSHAKE && nondet_Bool())
        return -1;
    mind.hTimer = nondet_unsigned(); // the one before goes on, and nobody here knows it any more
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
    mind.timerRuns = 0;
    return OSR_OK;
}

INT32 x_timer_delete(HANDLE_T hTimer)
{
    CLAIM(mind.locks == 0, "x_timer_delete: no lock is held");
    somebodyMayAct();
    if (!isTimer(hTimer))
        return -1;
    mind.timerRuns = 0;
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
    somebodyMayAct();
    INT32 i4Result = nondet_INT32();
    *ppvIf = i4Result >= 0 ? (void*)&VIDEO_PLANE : nondet_pointer();
    *ppvTag = nondet_pointer();
    mind.tables += i4Result >= 0;
    return i4Result;
}

INT32 i4ImReleaseInterface(UINT16 u2CompType, UINT16 u2CompId, UINT32 u4IfId, void* pvTag)
{
    CLAIM(mind.tables == 1, "i4ImReleaseInterface: a table that was fetched");
    mind.tables--;
    somebodyMayAct();
    return nondet_INT32();
}

/* Which planes are in the mix. */

void vPmxMixPlane(UCHAR ucPmxId, UCHAR ucPlane)
{
    CLAIM(ucPlane < PMX_PLANE_NUM, "vPmxMixPlane: a plane");
    mind.outOfMix &= ~(1u << ucPlane);
    somebodyMayAct();
}

void vPmxNotMixPlane(UCHAR ucPmxId, UCHAR ucPlane)
{
    CLAIM(ucPlane < PMX_PLANE_NUM, "vPmxNotMixPlane: a plane");
    mind.outOfMix |= 1u << ucPlane & OSD_PLANES;
    somebodyMayAct();
}

BOOL fgVdpIsWaitforSyncCtrl(void)
{
    somebodyMayAct();
    mind.videoWaited = nondet_Bool();
    return mind.videoWaited;
}
