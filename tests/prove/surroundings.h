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

/* What is proved is proved of the target's numbers. */
_Static_assert(sizeof(void*) == 4 && sizeof(long) == 4 && (char)-1 > 0 && sizeof(PMX_CONF_T) == 436, "");

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
    unsigned locks;    /* of MutexPMX, not given back */
    _Bool everLocked;  /* MutexPMX was taken */
    _Bool mayNotSleep; /* whoever called may not */
    unsigned tables;   /* fetched from the interface manager, not given back */
    UINT16 u2CompType; /* whose table was fetched last */
    UINT16 u2CompId;
    void* pvTag;        /* and with which tag */
    void* given;        /* by the caller, who has other plans with it by now; or nothing */
    UINT32 outOfMix;    /* planes that the layer took out, one bit each */
    HANDLE_T hTimer;    /* of the timer that exists; 0: none does */
    _Bool timerRuns;    /* some timer of the layer's */
    _Bool expiryBegun;  /* of one that was stopped since */
    _Bool videoWaited;  /* the video plane driver's last answer */
    _Bool videoOwes;    /* it answered that it waits, and has not called PMX_SetOsdEnable since */
    _Bool somebodyActs; /* from inside a call */
    _Bool everFetched;  /* a table was */
    _Bool expired;      /* from inside a call the timer did */
    _Bool raised;       /* the display part raised its flag */
    _Bool lowered;      /* or lowered it */
    _Bool videoCalled;  /* the video plane driver called PMX_SetOsdEnable */
} MIND_T;

extern MIND_T mind;

_Bool nondet_Bool(void);
unsigned nondet_unsigned(void);

/* All that the layer keeps becomes anything; written from the headers. */
void anythingIsStored(void);

/* Somebody acts, or nobody does: in every call of the platform. */
void somebodyMayAct(void);

/* Graphics are held back only while the timer runs, or while the video plane driver owes them their return. */
_Bool graphicsComeBack(void);

/* The timer that the layer would start, or delete, is the one that exists. */
_Bool knowsTheTimer(void);

/* What contracts give as reasons, said once more: the mode of the first output that is enabled, else HDMI's; whether no
 * two planes name one source; an upstream component's port, PMX_PORT_NUM: none; whether one is connected there. */
UCHAR mixersMode(const PMX_RESOLUTION_T* prOutConf);
_Bool sourcesDiffer(UINT32 u4PlaneOrder);
UINT32 portOf(UINT16 u2CompType, UINT16 u2CompId);
_Bool isConnected(UINT32 u4Port);

/* The flags of the record and the handshake are in their ranges, and no colour space is RGB. */
_Bool flagsInRange(void);

void begin(WORLD_T world);
void end(void);

#endif
