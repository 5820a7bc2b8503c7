// SPDX-License-Identifier: MIT OR GPL-2.0-only
/* The platform as the threads find it. What several threads reach is a relaxed atomic on purpose: it orders nothing, so
 * that the mutex of the layer is the only thing in the program that does, and no race hides behind a stand-in. */
#ifndef TESTS_THREADS_STAND_INS_H
#define TESTS_THREADS_STAND_INS_H

#include "u_os.h"

namespace stand_ins
{

/* What PMX_THREADS_NO_LOCK=1 and PMX_THREADS_CONNECT_INSIDE=1 in the environment break. */
struct Faults
{
    bool no_lock;        // x_sema_lock and x_sema_unlock do nothing, and succeed
    bool connect_inside; // a video plane connects itself from inside pu4SetColorMode
};

const Faults& faults();

/* Something that the layer or a thread must not do: counted, and the first ones printed. */
void breach(const char* what);
unsigned breaches();

/* Whether the calling thread holds the layer's mutex. */
bool holds_mutex();

/* Let the display timer run out in the calling thread. False: it was not running. */
bool expire_timer();

/* The semaphores and timers that exist. */
unsigned objects();

/* How often pu4SetColorMode was called, and the interfaces that were fetched and not given back. */
unsigned colour_modes_set();
int interfaces_held();

} // namespace stand_ins

#endif
