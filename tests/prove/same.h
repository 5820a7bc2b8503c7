// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the checker puts around two layers that are held against each other; the rest is written for each operation.
 *  For the checker alone. */
#ifndef SAME_H
#define SAME_H

#include "surroundings.h"

#define OLD 0
#define NEW 1
#define VALUES 24
#define FORMATTED 512 /* bytes of a text that is formatted */

/* What one call was given, and found. */
typedef struct
{
    UINT32 function; /* 0: there was no such call */
    UINT32 kept;
    UINT32 value[VALUES];
    UCHAR behind[VALUES];
} NOTE_T;

static WORLD_T world;
static unsigned char side;     /* whose turn it is */
static unsigned char calls[2]; /* that it made */
static NOTE_T noted[2];
static const CHAR* formatted; /* where a text was formatted */
static CHAR formattedText[FORMATTED];

/* Any call, any part of what is kept, any byte behind pointers. */
static unsigned char watched;
static unsigned which;
static unsigned byte;

static void begin(WORLD_T now)
{
    world = now;
    watched = (unsigned char)nondet_unsigned();
    which = nondet_unsigned();
    byte = nondet_unsigned();
    __CPROVER_assume(watched <= LAST);
    calls[OLD] = 0;
    calls[NEW] = 0;
    noted[OLD] = (NOTE_T){ 0 };
    noted[NEW] = (NOTE_T){ 0 };
    formatted = 0;
}

#endif
