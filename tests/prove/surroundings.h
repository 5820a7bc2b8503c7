// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the checker puts around one operation of the layer: the platform, whose answers may be anything, and what the
 *  proof keeps in mind of it. For the checker alone: what begins with __CPROVER_ or nondet_ is the checker's. */
#ifndef SURROUNDINGS_H
#define SURROUNDINGS_H

#include "drv_av_d.h"
#include "drv_if.h"
#include "drv_if_pmx.h"
#include "drv_if_vdp.h"
#include "drv_osd.h"
#include "drv_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "pmx_if.h"
#include "u_os.h"

/* Who acts while the platform is called. */
typedef enum
{
    NOBODY,
    ANYBODY,   /* and leaves anything in everything that the layer keeps */
    HANDSHAKE, /* the timer, the display part and the video plane driver, as they may */
} WORLD_T;

#define CLAIM(Expression, Text) __CPROVER_assert(Expression, Text)

/* Planes 2 to 6, one bit each. */
#define OSD_PLANES 0x7Cu

typedef struct
{
    WORLD_T world;
    unsigned locks;     /* of MutexPMX, not given back */
    unsigned tables;    /* fetched from the interface manager, not given back */
    UINT32 outOfMix;    /* planes that the layer took out, one bit each */
    HANDLE_T hTimer;    /* of the timer that exists */
    _Bool timerRuns;    /* some timer of the layer's */
    _Bool videoWaited;  /* the video plane driver's last answer */
    _Bool somebodyActs; /* from inside a call */
} MIND_T;

extern MIND_T mind;

_Bool nondet_Bool(void);
unsigned nondet_unsigned(void);

/* All that the layer keeps becomes anything; written from the headers. */
void anythingIsStored(void);

/* Somebody acts, or nobody does: in every call of the platform. */
void somebodyMayAct(void);

/* Graphics are held back only while the timer runs, or while somebody owes them their return. */
_Bool graphicsComeBack(void);

/* The flags of the record and the handshake are in their ranges, and no colour space is RGB. */
_Bool flagsInRange(void);

void begin(WORLD_T world);
void end(void);

#endif
