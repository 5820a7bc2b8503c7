// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  How the layer's files name the reason of a refusal or a decision; the reasons are in pmx_reason.h. In what ships
 *  an answer is its value alone and a note is nothing: what they are given is not even evaluated, and around them not
 *  a byte of code changes (tests/reasons compares the objects). */
#ifndef PMX_WHY_H
#define PMX_WHY_H

#ifdef PMX_REASONS

#include "pmx_reason.h"

#define PMX_TELL_REASON(eReason, u4A, u4B, ...) vPmxReason(eReason, (UINT32)(u4A), (UINT32)(u4B))

/* PMX_WHY(name, what is answered, the reason's values...): an answer that refuses. */
#define PMX_WHY(Name, Answer, ...) (PMX_TELL_REASON(PMX_REASON_##Name, __VA_ARGS__ __VA_OPT__(, ) 0, 0), (Answer))

/* PMX_WHY_EITHER(which, reason, other reason): a condition of several parts that refuses is one condition, for split
 * into several it compiles to other code; which part it was is asked here. */
#define PMX_WHY_EITHER(fgFirst, First, Second) ((UINT32)((fgFirst) ? First : Second))

/* PMX_NOTE(name, the reason's values...): a decision, or that a call does nothing and answers success, or nothing. */
#define PMX_NOTE(Name, ...) PMX_TELL_REASON(PMX_REASON_##Name, __VA_ARGS__ __VA_OPT__(, ) 0, 0)

/* PMX_NOTE_IF(condition, name, the reason's values...): the same, of what no statement of the code asks. */
#define PMX_NOTE_IF(fgCondition, Name, ...)            \
    do                                                 \
    {                                                  \
        if (fgCondition)                               \
            PMX_NOTE(Name __VA_OPT__(, ) __VA_ARGS__); \
    }                                                  \
    while (0)

#else

#define PMX_WHY(Name, Answer, ...) (Answer)
#define PMX_WHY_EITHER(fgFirst, First, Second) Second
#define PMX_NOTE(Name, ...) ((void)0)
#define PMX_NOTE_IF(fgCondition, Name, ...) ((void)0)

#endif

#endif
