// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The flight recorder: what went in and out of the layer, kept in a ring of memory that somebody lends it. It stands
 *  between the layer and its neighbours in pmx_if_recorded.o, which goes in the place of pmx_if.o. What stands in the
 *  ring: docs/recorder.md. */
#ifndef PMX_RECORDER_H
#define PMX_RECORDER_H

#include "drv_if_pmx.h"
#include "x_typedef.h"

#ifdef __cplusplus
extern "C" {
#endif

/* The first words of a recording: in memory the letters PMXFLIGHTREC, when the processor is a little-endian one. */
#define PMX_RECORDER_MAGIC_0 0x46584D50u
#define PMX_RECORDER_MAGIC_1 0x4847494Cu
#define PMX_RECORDER_MAGIC_2 0x43455254u
#define PMX_RECORDER_VERSION 2u

#define PMX_RECORDER_SNAPSHOTS 16u /* positions that are remembered: more than a ring ever holds */
#define PMX_RECORDER_A_RING 8u     /* a snapshot is due when so many'th part of the ring was written since the last */
#define PMX_RECORDER_LEAST_WORDS 2048u
#define PMX_RECORDER_LONGEST 255u /* words of one event */

/** What stands before the ring; words alone, so that it reads the same in every dump. */
typedef struct
{
    UINT32 au4Magic[3];
    UINT32 u4Version;
    UINT32 u4Interface;    /**< which operations and functions the numbers mean: a check sum of the headers */
    UINT32 u4PointerSize;  /**< bytes */
    UINT32 u4ExportedSize; /**< bytes of the objects that neighbours see, at the head of the state */
    UINT32 u4StateSize;    /**< bytes of the whole state */
    UINT32 u4RingWords;    /**< a power of two; behind the ring stand PMX_RECORDER_LONGEST + 1 words more, then texts */
    UINT32 u4TickNs;       /**< nanoseconds of what times are counted in */
    UINT32 u4Head;         /**< words ever written, modulo 2^32; what is older than a ring is lost */
    UINT32 u4SnapshotCount; /**< snapshots ever taken; the last ones stand below, each at its number's remainder */
    UINT32 au4Snapshot[PMX_RECORDER_SNAPSHOTS]; /**< where they begin, counted like u4Head */
} PMX_RECORDER_T;

/** What an event is; PMX_RECORDER_ANSWERED is added when its answer stands in it, because nothing came between. */
typedef DRV_ENUM(PMX_RECORDER_KIND_T)
{
    PMX_RECORDER_OPERATION = 1, /**< somebody calls the layer */
    PMX_RECORDER_CALL = 2,      /**< the layer calls somebody */
    PMX_RECORDER_RETURN = 3,    /**< either of them ends, and something came between */
    PMX_RECORDER_CHANGE = 4,    /**< a neighbour has written into the layer's objects */
    PMX_RECORDER_SNAPSHOT = 5,  /**< the whole state, while no operation runs */
    PMX_RECORDER_NOTHING = 6    /**< what was to be one, and an operation began meanwhile */
} PMX_RECORDER_KIND_T;
#define PMX_RECORDER_ANSWERED 0x80u

/** A text of the layer, which stays what it is: events have where it stands, and here is what that means. Threads write
 *  without a lock: where the first word does not fit the second, or is 0, there is no text yet. */
typedef struct
{
    UINT32 u4Key;  /**< the low 32 bits of its address, combined with the next word by exclusive or */
    UINT32 u4Code; /**< as a format: how many values it takes, 5 bits, and above that a bit for each that is a text */
    UINT32 u4Sum;  /**< its check sum */
    UINT32 u4Claimed; /**< whoever finds 0 here and adds 1 may fill the place */
} PMX_RECORDER_TEXT_T;

#define PMX_RECORDER_TEXTS 512u /* places for them; a text stands at its own or one of the next */

/** Bytes that a ring of so many bytes needs, a power of two. */
#define PMX_RECORDER_MEMORY(RingBytes)                                               \
    (sizeof(PMX_RECORDER_T) + (RingBytes) + (size_t)4 * (PMX_RECORDER_LONGEST + 1) + \
     PMX_RECORDER_TEXTS * sizeof(PMX_RECORDER_TEXT_T))

/** Who lends the ring, and knows what the layer does not. */
typedef struct
{
    void* pvMemory;            /**< at an address that is a multiple of 4 */
    UINT32 u4Size;             /**< bytes: PMX_RECORDER_MEMORY of the largest ring that fits is used */
    UINT32 (*pu4Time)(void);   /**< ticks from some moment on, modulo 2^32; called in any context */
    UINT32 (*pu4Thread)(void); /**< a number below 255 for the thread or context that calls */
    UINT32 u4TickNs;           /**< nanoseconds of a tick */
    BOOL fgWatchAll;           /**< look for changes from outside in the private objects, too: for test benches */
} PMX_RECORDER_SETUP_T;

/** Begin a recording, while no operation runs. Until then, and behind PMX_RecorderStop, everything passes unrecorded.
 *  @return TRUE; FALSE when the memory is too small or does not lie on a multiple of 4 */
PMX_API BOOL fgPmxRecorderStart(const PMX_RECORDER_SETUP_T* prSetup);

/** End the recording, while no operation runs. What was recorded stays where it is. */
PMX_API void PMX_RecorderStop(void);

#ifdef __cplusplus
}
#endif

#endif
