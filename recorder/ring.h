// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The ring, and how arguments become words. Included by the one file that is written from the headers, so that the
 * compiler sees all of it: a recorded call is a few dozen instructions. */
#ifndef PMX_RECORDER_RING_H
#define PMX_RECORDER_RING_H

#include "encoding.h"
#include "pmx_recorder.h"

/* Take so many words, and tell where they begin: the one thing that threads and contexts contend for. A compiler
 * without these built-ins gives its own. */
#ifndef PMX_RECORDER_ADD
#define PMX_RECORDER_ADD(pu4Word, u4Number) __atomic_fetch_add(pu4Word, u4Number, __ATOMIC_RELAXED)
#define PMX_RECORDER_LOAD(pu4Word) __atomic_load_n(pu4Word, __ATOMIC_RELAXED)
#endif

static PMX_RECORDER_T* prRecorder; /* null: nothing is recorded */
static UINT32* pu4Ring;
static UINT32 u4RingMask;
static PMX_RECORDER_SETUP_T rSetup;
static UINT32 u4Running;      /* operations, in all threads */
static UINT32 u4LastSnapshot; /* where it begins */
static UINT32 u4Watched;      /* bytes of the state that are looked at for changes from outside */

/* The state as it was when the layer was last left. */
static union
{
    UCHAR aucByte[PMX_STATE_SIZE];
    UINT32 au4Word[PMX_WORDS(PMX_STATE_SIZE)];
} uShadow;

typedef struct
{
    UINT32 u4At;
    UINT32 u4Count;
    UINT32 u4Head; /* the event's first word */
} PMX_EVENT_T;

static UINT32 u4RingWrite(const UINT32* pu4Words, UINT32 u4Count)
{
    const UINT32 u4At = PMX_RECORDER_ADD(&prRecorder->u4Head, u4Count);
    UINT32 i;
    UINT32* const pu4To = pu4Ring + (u4At & u4RingMask);
    if (u4Count <= u4RingMask + 1 - (u4At & u4RingMask))
        for (i = 0; i < u4Count; ++i)
            pu4To[i] = pu4Words[i];
    else
        for (i = 0; i < u4Count; ++i)
            pu4Ring[(u4At + i) & u4RingMask] = pu4Words[i];
    PMX_RECORDER_ADD(&prRecorder->u4Events, 1u);
    return u4At;
}

static UINT32 u4HeadOf(UINT32 u4Kind, UINT32 u4Function, UINT32 u4Count)
{
    return u4Count | u4Kind << 8 | u4Function << 16 | rSetup.pu4Thread() << 24;
}

/* The first so many bytes of the state as an event. */
static UINT32 u4WriteState(UINT32 u4Kind, const UCHAR* pucBytes, UINT32 u4Size)
{
    UINT32 au4Words[2 + PMX_WORDS(PMX_STATE_SIZE)];
    const UINT32 u4Count = u4PmxPutRaw(au4Words, 2, pucBytes, u4Size);
    au4Words[0] = u4HeadOf(u4Kind, 0, u4Count);
    au4Words[1] = rSetup.pu4Time();
    return u4RingWrite(au4Words, u4Count);
}

static void vTakeSnapshot(void)
{
    UCHAR aucState[PMX_STATE_SIZE];
    UINT32 u4At;
    memset(aucState, 0, sizeof aucState);
    vPmxTakeExported(aucState);
    vPmxTakePrivate(aucState);
    u4At = u4WriteState(PMX_RECORDER_SNAPSHOT, aucState, PMX_STATE_SIZE);
    prRecorder->au4Snapshot[prRecorder->u4SnapshotCount % PMX_RECORDER_SNAPSHOTS] = u4At;
    ++prRecorder->u4SnapshotCount;
    u4LastSnapshot = u4At;
}

/* The layer is left: from here on others write. */
static void vLeave(void)
{
    vPmxTakeExported(uShadow.aucByte);
    if (u4Watched != PMX_EXPORTED_SIZE)
        vPmxTakePrivate(uShadow.aucByte);
}

/* The layer is entered: what did they write? */
static void vEnter(void)
{
    union
    {
        UCHAR aucByte[PMX_STATE_SIZE];
        UINT32 au4Word[PMX_WORDS(PMX_STATE_SIZE)];
    } uNow;
    UINT32 u4Differs = 0;
    UINT32 i;
    uNow.au4Word[PMX_WORDS(PMX_EXPORTED_SIZE) - 1] = 0;
    uNow.au4Word[PMX_WORDS(PMX_STATE_SIZE) - 1] = 0;
    vPmxTakeExported(uNow.aucByte);
    if (u4Watched != PMX_EXPORTED_SIZE)
    {
        vPmxTakePrivate(uNow.aucByte);
        for (i = PMX_EXPORTED_SIZE; i < u4Watched; ++i)
            u4Differs |= (UINT32)uNow.aucByte[i] ^ uShadow.aucByte[i];
    }
    for (i = 0; i < PMX_EXPORTED_SIZE / 4; ++i)
        u4Differs |= uNow.au4Word[i] ^ uShadow.au4Word[i];
    if (u4Differs != 0)
        u4WriteState(PMX_RECORDER_CHANGE, uNow.aucByte, u4Watched);
}

/* An event begins. Its words from the fourth on are there; behind the arguments stands room for what is written. */
static PMX_EVENT_T rBegin(UINT32 u4Kind, UINT32 u4Function, UINT32* pu4Words, UINT32 u4Count)
{
    PMX_EVENT_T rEvent;
    if (u4Kind == PMX_RECORDER_OPERATION)
    {
        vEnter();
        if (PMX_RECORDER_ADD(&u4Running, 1u) == 0 &&
            PMX_RECORDER_LOAD(&prRecorder->u4Head) - u4LastSnapshot >= (u4RingMask + 1) / PMX_RECORDER_A_RING)
            vTakeSnapshot();
    }
    else
        vLeave();
    pu4Words[0] = rEvent.u4Head = u4HeadOf(u4Kind, u4Function, u4Count);
    pu4Words[1] = rSetup.pu4Time();
    pu4Words[2] = 0;
    rEvent.u4Count = u4Count;
    rEvent.u4At = u4RingWrite(pu4Words, u4Count);
    return rEvent;
}

/* An event ends. The answer goes into it when it is still the last one; else it is an event of its own. */
static void vEnd(UINT32 u4Kind, const PMX_EVENT_T* prEvent, UINT32 u4Answer, UINT32* pu4Written, UINT32 u4Count,
                 bool fgFits)
{
    UINT32 i;
    if (u4Kind == PMX_RECORDER_OPERATION)
    {
        vLeave();
        PMX_RECORDER_ADD(&u4Running, 0xFFFFFFFFu);
    }
    else
        vEnter();
    if (fgFits && PMX_RECORDER_LOAD(&prRecorder->u4Head) == prEvent->u4At + prEvent->u4Count)
    {
        pu4Ring[(prEvent->u4At + 2) & u4RingMask] = u4Answer;
        for (i = 0; i < u4Count; ++i)
            pu4Ring[(prEvent->u4At + prEvent->u4Count - u4Count + i) & u4RingMask] = pu4Written[4 + i];
        pu4Ring[prEvent->u4At & u4RingMask] = prEvent->u4Head | PMX_RECORDER_ANSWERED << 8;
        return;
    }
    pu4Written[0] = u4HeadOf(PMX_RECORDER_RETURN, (prEvent->u4Head >> 16) & 0xFF, 4 + u4Count);
    pu4Written[1] = rSetup.pu4Time();
    pu4Written[2] = u4Answer;
    pu4Written[3] = prEvent->u4At;
    u4RingWrite(pu4Written, 4 + u4Count);
}

BOOL fgPmxRecorderStart(const PMX_RECORDER_SETUP_T* prSetup)
{
    PMX_RECORDER_T* const prNew = (PMX_RECORDER_T*)prSetup->pvMemory;
    UINT32 u4Words = PMX_RECORDER_LEAST_WORDS;
    prRecorder = 0;
    if (((size_t)prSetup->pvMemory & 3) != 0 || prSetup->u4Size < sizeof *prNew + 4 * u4Words)
        return FALSE;
    while (u4Words <= (prSetup->u4Size - sizeof *prNew) / 8)
        u4Words *= 2;
    memset(prNew, 0, sizeof *prNew);
    prNew->u4Version = PMX_RECORDER_VERSION;
    prNew->u4Interface = PMX_INTERFACE;
    prNew->u4PointerSize = sizeof(void*);
    prNew->u4ExportedSize = PMX_EXPORTED_SIZE;
    prNew->u4StateSize = PMX_STATE_SIZE;
    prNew->u4RingWords = u4Words;
    rSetup = *prSetup;
    pu4Ring = (UINT32*)(prNew + 1);
    u4RingMask = u4Words - 1;
    u4Running = 0;
    u4Watched = prSetup->fgWatchAll != FALSE ? PMX_STATE_SIZE : PMX_EXPORTED_SIZE;
    memset(pu4Ring, 0, 4 * u4Words);
    prRecorder = prNew;
    vTakeSnapshot();
    vLeave();
    /* A recording is one from here on. */
    prNew->au4Magic[0] = PMX_RECORDER_MAGIC_0;
    prNew->au4Magic[1] = PMX_RECORDER_MAGIC_1;
    prNew->au4Magic[2] = PMX_RECORDER_MAGIC_2;
    return TRUE;
}

void PMX_RecorderStop(void)
{
    prRecorder = 0;
}

#endif
