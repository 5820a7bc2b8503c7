// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The ring. Included by the one file that is written from the headers, so that the compiler sees all of it: a recorded
 * call is a few dozen instructions. What is rare stands in functions of its own, out of the way. */
#ifndef PMX_RECORDER_RING_H
#define PMX_RECORDER_RING_H

#include "encoding.h"
#include "pmx_recorder.h"

/* Take so many words, and tell where they begin: the one thing that threads and contexts contend for. A compiler
 * without these built-ins gives its own. */
#ifndef PMX_RECORDER_ADD
#ifndef __GNUC__
#error "PMX_RECORDER_ADD, PMX_RECORDER_LOAD, PMX_RECORDER_PUBLISH and PMX_RECORDER_PUBLISHED have to be defined"
#endif
#define PMX_RECORDER_ADD(pu4Word, u4Number) __atomic_fetch_add(pu4Word, u4Number, __ATOMIC_RELAXED)
#define PMX_RECORDER_LOAD(pu4Word) __atomic_load_n(pu4Word, __ATOMIC_RELAXED)
#define PMX_RECORDER_PUBLISH(pu4Word, u4Value) __atomic_store_n(pu4Word, u4Value, __ATOMIC_RELEASE)
#define PMX_RECORDER_PUBLISHED(pu4Word) __atomic_load_n(pu4Word, __ATOMIC_ACQUIRE)
#endif

#ifdef __GNUC__
#define PMX_RARE __attribute__((__noinline__, __cold__))
#define PMX_SHARED __attribute__((__noinline__)) /* too large to stand in each function */
#define PMX_SELDOM(fgCondition) __builtin_expect((fgCondition) != 0, 0)
#else
#define PMX_RARE
#define PMX_SHARED
#define PMX_SELDOM(fgCondition) (fgCondition)
#endif

static struct
{
    PMX_RECORDER_T* prRecorder; /* null: nothing is recorded; the ring stands behind it */
    UINT32 u4Mask;
    PMX_RECORDER_TEXT_T* prText;
    UINT32 (*pu4Time)(void);
    UINT32 (*pu4Thread)(void);
    UINT32 u4Running;      /* operations, in all threads */
    UINT32 u4LastSnapshot; /* where it begins */
    PMX_PLACES_T rPlaces;
    PMX_WATCHED_T rShadow; /* what neighbours see, as it was when the layer was last left */
    UINT32 (*pu4GivenThread)(void);
} rNow;

/* The whole state at that moment, where that is watched. */
static UINT32 au4Shadow[PMX_WORDS(PMX_STATE_SIZE)];

typedef struct
{
    UINT32* pu4Words;
    UINT32 u4End;
    UINT32 u4Head; /* its first word */
} PMX_EVENT_T;

/* A place for an event, and its head, in which its length stands already. An event that begins before the ring's end
 * goes on behind it: there are as many words as the longest has. What may be interrupted is asked for before there is a
 * place to be filled. */
static inline UINT32* pu4Begin(PMX_EVENT_T* prEvent, UINT32 u4Head)
{
    const UINT32 u4Thread = rNow.pu4Thread();
    const UINT32 u4Time = rNow.pu4Time();
    PMX_RECORDER_T* const prRecorder = rNow.prRecorder;
    const UINT32 u4At = PMX_RECORDER_ADD(&prRecorder->u4Head, u4Head & 0xFF);
    UINT32* const pu4Words = (UINT32*)(prRecorder + 1) + (u4At & rNow.u4Mask);
    prEvent->pu4Words = pu4Words;
    prEvent->u4End = u4At + (u4Head & 0xFF);
    prEvent->u4Head = u4Head | u4Thread << 24;
    pu4Words[0] = prEvent->u4Head;
    pu4Words[1] = u4Time;
    return pu4Words + 3;
}

/* Bytes, the last word filled up with zeros. */
static inline UINT32* pu4PutRaw(UINT32* pu4To, const void* pvBytes, UINT32 u4Size)
{
    if (u4Size == 0)
        return pu4To;
    if (u4Size % 4 != 0)
        pu4To[PMX_WORDS(u4Size) - 1] = 0;
    PMX_COPY(pu4To, pvBytes, u4Size);
    return pu4To + PMX_WORDS(u4Size);
}

/* What a pointer leads to: how much, and then the bytes. */
static inline UINT32* pu4PutBytes(UINT32* pu4To, const void* pvBytes, UINT32 u4Size)
{
    *pu4To = pvBytes == 0 ? 0 : PMX_PRESENT | u4Size;
    return pu4PutRaw(pu4To + 1, pvBytes, u4Size);
}

/* A format from outside, and its values. */
static void vPutKept(UINT32* pu4To, const PMX_KEPT_T* prKept, const char* szFormat, const long* piValues)
{
    UINT32 i;
    *pu4To = prKept->u4Format;
    pu4To = pu4PutRaw(pu4To + 1, szFormat, PMX_KEPT(prKept->u4Format));
    for (i = 0; i < prKept->u4Count; ++i)
    {
        *pu4To++ = prKept->au4Value[i];
        if (fgPmxIsText(prKept, i))
            pu4To = pu4PutRaw(pu4To, (const char*)(size_t)piValues[i], PMX_KEPT(prKept->au4Value[i]));
    }
}

/* The state, or the exported objects at its head; the last word of either may be filled up with zeros. */
static void vTakeState(UINT32* pu4To, UINT32 u4Size)
{
    pu4To[PMX_WORDS(PMX_EXPORTED_SIZE) - 1] = 0;
    vPmxTakeExported((UCHAR*)pu4To);
    if (u4Size == PMX_EXPORTED_SIZE)
        return;
    pu4To[PMX_WORDS(PMX_STATE_SIZE) - 1] = 0;
    vPmxTakePrivate((UCHAR*)pu4To);
}

/* It as an event. */
static void vWriteState(PMX_EVENT_T* prEvent, UINT32 u4Kind, UINT32 u4Size)
{
    vTakeState(pu4Begin(prEvent, u4Kind << 8 | (2 + PMX_WORDS(u4Size))) - 1, u4Size);
}

/* While it is copied others may enter and store: whoever does has taken a place first. Then it says nothing, and the
 * next operation that finds nobody inside takes another. */
static PMX_RARE void vTakeSnapshot(void)
{
    PMX_RECORDER_T* const prRecorder = rNow.prRecorder;
    PMX_EVENT_T rEvent;
    vWriteState(&rEvent, PMX_RECORDER_NOTHING, PMX_STATE_SIZE);
    if (PMX_RECORDER_LOAD(&prRecorder->u4Head) != rEvent.u4End)
        return;
    rEvent.pu4Words[0] = rEvent.u4Head ^ (PMX_RECORDER_NOTHING ^ PMX_RECORDER_SNAPSHOT) << 8;
    rNow.u4LastSnapshot = rEvent.u4End - (rEvent.u4Head & 0xFF);
    prRecorder->au4Snapshot[prRecorder->u4SnapshotCount % PMX_RECORDER_SNAPSHOTS] = rNow.u4LastSnapshot;
    ++prRecorder->u4SnapshotCount;
}

/* The layer is left: from here on others write. */
static inline void vLeave(void)
{
    vPmxWatch(&rNow.rPlaces, &rNow.rShadow);
}

/* Where everything is watched, it is asked for in the place of the thread's number, which is when the layer was left.
 * Then the watched words never fit, and every entry looks closer. */
static UINT32 u4WatchAll(void)
{
    vTakeState(au4Shadow, PMX_STATE_SIZE);
    vPmxSpoil(&rNow.rPlaces, &rNow.rShadow);
    return rNow.pu4GivenThread();
}

/* The layer is left without an event that begins. */
static inline void vLeaveAll(void)
{
    vLeave();
    if (PMX_SELDOM(rNow.pu4Thread == u4WatchAll))
        u4WatchAll();
}

static PMX_RARE void vEnterChanged(void)
{
    UINT32 au4Now[PMX_WORDS(PMX_STATE_SIZE)];
    PMX_EVENT_T rEvent;
    UINT32 u4Differs = 0;
    UINT32 i;
    if (rNow.pu4Thread != u4WatchAll)
    {
        vWriteState(&rEvent, PMX_RECORDER_CHANGE, PMX_EXPORTED_SIZE);
        return;
    }
    vTakeState(au4Now, PMX_STATE_SIZE);
    for (i = 0; i < PMX_WORDS(PMX_STATE_SIZE); ++i)
        u4Differs |= au4Now[i] ^ au4Shadow[i];
    if (u4Differs != 0)
        vWriteState(&rEvent, PMX_RECORDER_CHANGE, PMX_STATE_SIZE);
}

/* The layer is entered: what did they write? */
static inline void vEnter(void)
{
    if (PMX_SELDOM(u4PmxDiffers(&rNow.rPlaces, &rNow.rShadow)))
        vEnterChanged();
}

/* The end of an event as one of its own, with room for what was written behind pointers. */
static PMX_RARE UINT32* pu4Return(const PMX_EVENT_T* prEvent, UINT32 u4Answer, UINT32 u4Words)
{
    PMX_EVENT_T rEnd;
    UINT32* const pu4To = pu4Begin(&rEnd, PMX_RECORDER_RETURN << 8 | (prEvent->u4Head & 0xFF0000u) | (4 + u4Words));
    pu4To[-1] = u4Answer;
    *pu4To = prEvent->u4End - (prEvent->u4Head & 0xFF);
    return pu4To + 1;
}

/* An event ends. The answer goes into it when it is still the last one. Where what was written goes, is answered: so
 * many words. */
static inline UINT32* pu4End(const PMX_EVENT_T* prEvent, UINT32 u4Answer, UINT32 u4Words)
{
    if (PMX_SELDOM(PMX_RECORDER_LOAD(&rNow.prRecorder->u4Head) != prEvent->u4End))
        return pu4Return(prEvent, u4Answer, u4Words);
    prEvent->pu4Words[2] = u4Answer;
    prEvent->pu4Words[0] = prEvent->u4Head | PMX_RECORDER_ANSWERED << 8;
    return prEvent->pu4Words + (prEvent->u4Head & 0xFF) - u4Words;
}

/* The layer calls. What goes in the head, its length too, is known when this is compiled, as a rule. */
static PMX_SHARED UINT32* pu4Call(PMX_EVENT_T* prEvent, UINT32 u4Head)
{
    vLeave();
    return pu4Begin(prEvent, u4Head);
}

static PMX_SHARED void vAnswer(const PMX_EVENT_T* prEvent, UINT32 u4Answer)
{
    vEnter();
    pu4End(prEvent, u4Answer, 0);
}

static PMX_SHARED UINT32* pu4Answer(const PMX_EVENT_T* prEvent, UINT32 u4Answer, UINT32 u4Words)
{
    vEnter();
    return pu4End(prEvent, u4Answer, u4Words);
}

/* Somebody calls the layer. */
static PMX_SHARED UINT32* pu4Operation(PMX_EVENT_T* prEvent, UINT32 u4Head)
{
    vEnter();
    if (PMX_RECORDER_ADD(&rNow.u4Running, 1u) == 0 &&
        PMX_SELDOM(PMX_RECORDER_LOAD(&rNow.prRecorder->u4Head) - rNow.u4LastSnapshot >
                   rNow.u4Mask / PMX_RECORDER_A_RING))
        vTakeSnapshot();
    return pu4Begin(prEvent, u4Head);
}

/* It runs until its end has its place: a snapshot that somebody takes stands behind that. */
static PMX_SHARED UINT32* pu4Done(const PMX_EVENT_T* prEvent, UINT32 u4Answer, UINT32 u4Words)
{
    UINT32* pu4To;
    vLeaveAll();
    pu4To = pu4End(prEvent, u4Answer, u4Words);
    PMX_RECORDER_ADD(&rNow.u4Running, 0xFFFFFFFFu);
    return pu4To;
}

static inline UINT32 u4Place(UINT32 u4Where)
{
    return (u4Where ^ u4Where >> 9) % PMX_RECORDER_TEXTS;
}

/* A text that is handed over for the first time takes a place that is free. There are more than the layer has texts. */
static PMX_RARE UINT32 u4TellFirst(const char* szText)
{
    const UINT32 u4Where = (UINT32)(size_t)szText;
    const UINT32 u4Code = u4PmxCode(szText);
    UINT32 i;
    for (i = 0; szText != 0 && i < PMX_RECORDER_TEXTS; ++i)
    {
        PMX_RECORDER_TEXT_T* const prText = &rNow.prText[(u4Place(u4Where) + i) % PMX_RECORDER_TEXTS];
        if (prText->u4Key != 0 || PMX_RECORDER_ADD(&prText->u4Claimed, 1u) != 0)
            continue;
        prText->u4Code = u4Code;
        prText->u4Sum = u4PmxText(szText);
        PMX_RECORDER_PUBLISH(&prText->u4Key, u4Where ^ u4Code);
        break;
    }
    return u4Code;
}

/* A text that does not stand at its own place. */
static PMX_SHARED UINT32 u4TellSlowly(const char* szText)
{
    const UINT32 u4Where = (UINT32)(size_t)szText;
    UINT32 u4At = u4Place(u4Where);
    UINT32 i;
    for (i = 0; i < PMX_RECORDER_TEXTS && rNow.prText[u4At].u4Key != 0; ++i)
    {
        const UINT32 u4Code = rNow.prText[u4At].u4Code;
        if ((rNow.prText[u4At].u4Key ^ u4Code) == u4Where)
            return u4Code;
        u4At = (u4At + 1) % PMX_RECORDER_TEXTS;
    }
    return u4TellFirst(szText);
}

/* What a text of the layer says as a format. Where it stands means something from here on. */
static inline UINT32 u4Tell(const char* szText)
{
    const UINT32 u4Where = (UINT32)(size_t)szText;
    const PMX_RECORDER_TEXT_T* const prText = &rNow.prText[u4Place(u4Where)];
    const UINT32 u4Code = prText->u4Code;
    if (PMX_SELDOM((prText->u4Key ^ u4Code) != u4Where))
        return u4TellSlowly(szText);
    return u4Code;
}

/* The texts among the values of a format. */
static void vTellValues(UINT32 u4Texts, const long* piValues)
{
    for (; u4Texts != 0; u4Texts >>= 1, ++piValues)
    {
        if ((u4Texts & 1) != 0)
            u4Tell((const char*)(size_t)*piValues);
    }
}

static PMX_SHARED void vTellFew(UINT32 u4Texts, long iFirst, long iSecond, long iThird, long iFourth)
{
    const long aiValue[] = { iFirst, iSecond, iThird, iFourth };
    vTellValues(u4Texts, aiValue);
}

BOOL fgPmxRecorderStart(const PMX_RECORDER_SETUP_T* prSetup)
{
    PMX_RECORDER_T* const prNew = (PMX_RECORDER_T*)prSetup->pvMemory;
    UINT32 u4Words = PMX_RECORDER_LEAST_WORDS;
    rNow.prRecorder = 0;
    if (((size_t)prSetup->pvMemory & 3) != 0 || prSetup->u4Size < PMX_RECORDER_MEMORY(4 * u4Words))
        return FALSE;
    while (u4Words <= (prSetup->u4Size - PMX_RECORDER_MEMORY(0)) / 8)
        u4Words *= 2;
    memset(prNew, 0, PMX_RECORDER_MEMORY(4 * u4Words));
    prNew->u4Version = PMX_RECORDER_VERSION;
    prNew->u4Interface = PMX_INTERFACE;
    prNew->u4PointerSize = sizeof(void*);
    prNew->u4ExportedSize = PMX_EXPORTED_SIZE;
    prNew->u4StateSize = PMX_STATE_SIZE;
    prNew->u4RingWords = u4Words;
    prNew->u4TickNs = prSetup->u4TickNs;
    rNow.pu4Time = prSetup->pu4Time;
    rNow.pu4GivenThread = prSetup->pu4Thread;
    rNow.pu4Thread = prSetup->fgWatchAll != FALSE ? u4WatchAll : prSetup->pu4Thread;
    vPmxFind(&rNow.rPlaces);
    rNow.u4Mask = u4Words - 1;
    rNow.prText = (PMX_RECORDER_TEXT_T*)((UINT32*)(prNew + 1) + u4Words + PMX_RECORDER_LONGEST + 1);
    rNow.u4Running = 0;
    rNow.prRecorder = prNew;
    vTakeSnapshot();
    vLeaveAll();
    /* A recording is one from here on. */
    prNew->au4Magic[0] = PMX_RECORDER_MAGIC_0;
    prNew->au4Magic[1] = PMX_RECORDER_MAGIC_1;
    prNew->au4Magic[2] = PMX_RECORDER_MAGIC_2;
    return TRUE;
}

void PMX_RecorderStop(void)
{
    rNow.prRecorder = 0;
}

#endif
