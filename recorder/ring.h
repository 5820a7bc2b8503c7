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
#define PMX_RECORDER_ADD(pu4Word, u4Number) __atomic_fetch_add(pu4Word, u4Number, __ATOMIC_RELAXED)
#define PMX_RECORDER_LOAD(pu4Word) __atomic_load_n(pu4Word, __ATOMIC_RELAXED)
#endif

#ifdef __GNUC__
#define PMX_RARE __attribute__((noinline, cold))
#define PMX_SHARED __attribute__((noinline)) /* too large to stand in each function */
#define PMX_SELDOM(fgCondition) __builtin_expect((fgCondition) != 0, 0)
#else
#define PMX_RARE
#define PMX_SHARED
#define PMX_SELDOM(fgCondition) (fgCondition)
#endif

#define PMX_TEXTS 256u /* places for texts: a power of two, and more than the layer has in a run */

static struct
{
    PMX_RECORDER_T* prRecorder; /* null: nothing is recorded; the ring stands behind it */
    UINT32 u4Mask;
    UINT32 (*pu4Time)(void);
    UINT32 (*pu4Thread)(void);
    UINT32 u4Lap;          /* how many snapshots there have been in all recordings */
    UINT32 u4Running;      /* operations, in all threads */
    UINT32 u4LastSnapshot; /* where it begins */
    BOOL fgWatchAll;
} rNow;

/* What neighbours see, and, where that is watched, what they do not, as it was when the layer was last left. */
static PMX_WATCHED_T rShadow;
static UCHAR aucShadow[PMX_STATE_SIZE];

typedef struct
{
    UINT32* pu4Words;
    UINT32 u4At;
    UINT32 u4Head; /* its first word */
} PMX_EVENT_T;

/* A text that the layer has handed over, which stays what it is: where it stands, its check sum and what it says as a
 * format. Threads write without a lock: the first word fits the others or the place does not count. */
typedef struct
{
    size_t zKey;
    UINT32 u4Sum;
    UINT32 u4Code;
    UINT32 u4Told; /* the lap in which it was told */
} PMX_TEXT_T;

static PMX_TEXT_T arText[PMX_TEXTS];

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
    prEvent->u4At = u4At;
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

/* The first so many bytes of the state as an event. */
static UINT32 u4WriteState(UINT32 u4Kind, UINT32 u4Size)
{
    UCHAR aucState[PMX_STATE_SIZE];
    PMX_EVENT_T rEvent;
    UINT32* pu4To;
    memset(aucState, 0, sizeof aucState);
    vPmxTakeExported(aucState);
    vPmxTakePrivate(aucState);
    pu4To = pu4Begin(&rEvent, u4Kind << 8 | (2 + PMX_WORDS(u4Size)));
    pu4PutRaw(pu4To - 1, aucState, u4Size);
    return rEvent.u4At;
}

/* Texts are told anew behind each: of a ring that has run over, what stands before the first one that is left is
 * lost. */
static PMX_RARE void vTakeSnapshot(void)
{
    PMX_RECORDER_T* const prRecorder = rNow.prRecorder;
    rNow.u4LastSnapshot = u4WriteState(PMX_RECORDER_SNAPSHOT, PMX_STATE_SIZE);
    prRecorder->au4Snapshot[prRecorder->u4SnapshotCount % PMX_RECORDER_SNAPSHOTS] = rNow.u4LastSnapshot;
    ++prRecorder->u4SnapshotCount;
    ++rNow.u4Lap;
}

/* The layer is left: from here on others write. */
static inline void vLeave(void)
{
    vPmxWatch(&rShadow);
    if (PMX_SELDOM(rNow.fgWatchAll))
        vPmxTakePrivate(aucShadow);
}

static PMX_RARE void vEnterChanged(UINT32 u4Differs)
{
    UCHAR aucNow[PMX_STATE_SIZE];
    UINT32 i;
    if (rNow.fgWatchAll != FALSE)
    {
        vPmxTakePrivate(aucNow);
        for (i = PMX_EXPORTED_SIZE; i < PMX_STATE_SIZE; ++i)
            u4Differs |= (UINT32)aucNow[i] ^ aucShadow[i];
    }
    if (u4Differs != 0)
        u4WriteState(PMX_RECORDER_CHANGE, rNow.fgWatchAll != FALSE ? PMX_STATE_SIZE : PMX_EXPORTED_SIZE);
}

/* The layer is entered: what did they write? */
static inline void vEnter(void)
{
    const UINT32 u4Differs = u4PmxDiffers(&rShadow);
    if (PMX_SELDOM(u4Differs | rNow.fgWatchAll))
        vEnterChanged(u4Differs);
}

/* The end of an event as one of its own, with room for what was written behind pointers. */
static PMX_RARE UINT32* pu4Return(const PMX_EVENT_T* prEvent, UINT32 u4Answer, UINT32 u4Words)
{
    PMX_EVENT_T rEnd;
    UINT32* const pu4To = pu4Begin(&rEnd, PMX_RECORDER_RETURN << 8 | (prEvent->u4Head & 0xFF0000u) | (4 + u4Words));
    pu4To[-1] = u4Answer;
    *pu4To = prEvent->u4At;
    return pu4To + 1;
}

/* An event ends. The answer goes into it when it is still the last one. Where what was written goes, is answered: so
 * many words. */
static inline UINT32* pu4End(const PMX_EVENT_T* prEvent, UINT32 u4Answer, UINT32 u4Words)
{
    const UINT32 u4Count = prEvent->u4Head & 0xFF;
    if (PMX_SELDOM(PMX_RECORDER_LOAD(&rNow.prRecorder->u4Head) != prEvent->u4At + u4Count))
        return pu4Return(prEvent, u4Answer, u4Words);
    prEvent->pu4Words[2] = u4Answer;
    prEvent->pu4Words[0] = prEvent->u4Head | PMX_RECORDER_ANSWERED << 8;
    return prEvent->pu4Words + u4Count - u4Words;
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

static PMX_SHARED UINT32* pu4Done(const PMX_EVENT_T* prEvent, UINT32 u4Answer, UINT32 u4Words)
{
    vLeave();
    PMX_RECORDER_ADD(&rNow.u4Running, 0xFFFFFFFFu);
    return pu4End(prEvent, u4Answer, u4Words);
}

static inline UINT32 u4Place(const char* szText)
{
    return (UINT32)(size_t)szText * 2654435769u >> 24;
}
DRV_STATIC_ASSERT(PMX_TEXTS == 256, "a place is told by eight bits");

static inline bool fgIs(const PMX_TEXT_T* prText, const char* szText)
{
    return (prText->zKey ^ prText->u4Code ^ prText->u4Sum) == (size_t)szText;
}

/* Its place; one that is read for the first time gets one, in the end another one's. */
static PMX_TEXT_T* prTextOf(const char* szText)
{
    const UINT32 u4First = u4Place(szText);
    PMX_TEXT_T* prText;
    UINT32 i;
    for (i = 0; i < PMX_TEXTS / 16; ++i)
    {
        prText = &arText[(u4First + i) % PMX_TEXTS];
        if (fgIs(prText, szText))
            return prText;
        if (prText->zKey == 0)
            break;
    }
    if (i == PMX_TEXTS / 16)
        prText = &arText[u4First];
    prText->u4Told = 0;
    prText->u4Code = u4PmxCode(szText);
    prText->u4Sum = u4PmxText(szText);
    prText->zKey = (size_t)szText ^ prText->u4Code ^ prText->u4Sum;
    return prText;
}

static PMX_RARE UINT32 u4TellSlowly(const char* szText)
{
    PMX_TEXT_T* prText;
    PMX_EVENT_T rEvent;
    UINT32* pu4To;
    if (szText == 0)
        return 0;
    prText = prTextOf(szText);
    if (rNow.prRecorder != 0 && prText->u4Told != rNow.u4Lap)
    {
        const UINT32 u4Lap = rNow.u4Lap;
        pu4To = pu4Begin(&rEvent, PMX_RECORDER_TEXT << 8 | 5);
        pu4To[-1] = (UINT32)(size_t)szText;
        pu4To[0] = prText->u4Sum;
        pu4To[1] = prText->u4Code;
        prText->u4Told = u4Lap;
    }
    return prText->u4Code;
}

/* What a text of the layer says as a format. Where something is recorded, it was told from here on. */
static inline UINT32 u4Tell(const char* szText)
{
    const PMX_TEXT_T* const prText = &arText[u4Place(szText)];
    if (PMX_SELDOM(!fgIs(prText, szText) || prText->u4Told != rNow.u4Lap))
        return u4TellSlowly(szText);
    return prText->u4Code;
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
    rNow.pu4Thread = prSetup->pu4Thread;
    rNow.u4Mask = u4Words - 1;
    rNow.u4Running = 0;
    rNow.fgWatchAll = prSetup->fgWatchAll;
    rNow.prRecorder = prNew;
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
    rNow.prRecorder = 0;
}

#endif
